// DumpDot and ZOA_file::dumpDot: Graphviz digraphs of subprograms, node statistics on the diagnostic stream.
#include "dump/dot/dump_dot.h"

#include "core/children.h"
#include "core/node_kinds.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>
#include <zoa/zoa_file.h>

#include <iostream>
#include <locale>
#include <string_view>

namespace ZOA {

namespace {

// Graphviz colour by NodeType; empty for kinds never declared (the bases, and
// JUMP, which is counted but never drawn). Names come from the list of kinds.
constexpr std::string_view kindColours[NODE_TYPE_COUNT] = {
    "",             // TreeBase
    "",             // ExprBase
    "pink",         // BINOP
    "yellow",       // BUF_TEMP
    "beige",        // CALL
    "khaki",        // CONST
    "gold",         // MEM
    "greenyellow",  // NAME
    "yellow",       // TEMP
    "violet",       // UNOP
    "",             // StmtBase
    "green",        // CJUMP
    "palegreen",    // EXP
    "",             // JUMP
    "cyan",         // LABEL
    "indigo",       // MOVE
    "magenta",      // SEQ
    "skyblue",      // SUBPROG
};

// Temporaries are drawn in yellow inside the SUBPROG block; the other drawn
// kinds get a subgraph of their own.
bool hasOwnBlock(int k) { return !kindColours[k].empty() && k != TEMP_NODE && k != BUF_TEMP_NODE; }

// Leaves and labels are declared once however often the walk meets them.
bool collectedOnce(NodeType k) {
    return k == TEMP_NODE || k == BUF_TEMP_NODE || k == CONST_NODE || k == NAME_NODE || k == LABEL_NODE;
}

// Indexed by DumpDot::EdgeEnding. OPEN leaves the line open on purpose.
constexpr std::string_view edgeEndings[] = {
    ";\n",
    " [color=blue];\n",
    " [color=red];\n",
    " [color=blue, style=bold];\n",
    " [color=red, style=bold];\n",
    ";",
};

bool formatsPlainDecimal(const std::ostream& os) {
    std::ios_base::fmtflags f = os.flags();
    std::ios_base::fmtflags base = f & std::ios_base::basefield;
    if (base == std::ios_base::hex || base == std::ios_base::oct) return false;
    if (f & std::ios_base::showpos) return false;
    return std::use_facet<std::numpunct<char>>(os.getloc()).grouping().empty();
}

}  // namespace

DumpDot::DumpDot(SUBPROG* sp, std::ostream& os, Workspace* ws, std::ostream* stats)
    : ownWorkspace(ws ? nullptr : new Workspace(os)),
      workspace(ws ? *ws : *ownWorkspace),
      nodesByKind(workspace.nodesByKind),
      text(workspace.text),
      subprog(sp),
      out(os),
      plainNumbers(formatsPlainDecimal(os)) {
    for (int k = 0; k < NODE_TYPE_COUNT; ++k) nodesByKind[k].clear();
    workspace.declaredOnce.clear();
    if (!subprog) return;
    // Temporaries and labels are most of what is collected once.
    workspace.declaredOnce.reserve(subprog->getAllTemps().size() + subprog->getAllLabels().size());
    // Each label is a walk of its own, so a cut ends only the label that holds a cycle.
    forEachChild(subprog, SUBPROG_NODE, [this](TreeBase* child) { collect(child); });
    record(subprog, SUBPROG_NODE);
    writeStatistics(stats ? *stats : std::cout);
    TextSink::Batch batch(text);  // the graph reaches `out` before the next statistics
    writeGraphHeader();
    writeKindBlocks();
    writeConnections();
    lit("}\n");
}

DumpDot::~DumpDot() {
    for (int k = 0; k < NODE_TYPE_COUNT; ++k) nodesByKind[k].clear();
    workspace.declaredOnce.clear();
}

// ---- collection walk: children first, then the node itself ----

void DumpDot::collect(TreeBase* n) {
    NestingLevel level(nesting);
    if (!level.entered()) return;
    NodeType k = n->getNodeType();
    forEachChild(n, k, [this](TreeBase* child) { collect(child); });
    record(n, k);
}

void DumpDot::record(TreeBase* n, NodeType k) {
    if (!collectedOnce(k) || workspace.declaredOnce.insert(n)) nodesByKind[k].push_back(n);
}

// ---- statistics ----

void DumpDot::writeStatistics(std::ostream& os) {
    static const char stars[] = "************************************************************\n";
    // "Statictics" is misspelt on purpose: existing clients look for it.
    os << "ZOA Statictics for SUBPROG ";
    os.write(subprog->getName().data(), static_cast<std::streamsize>(subprog->getName().size()));
    os << "\n" << stars;
    os << "Size of subprogs is " << nodesByKind[SUBPROG_NODE].size() << "\n";
    long long total = 0;
    for (int k = BINOP_NODE; k <= SUBPROG_NODE; ++k) {
        if (k == STMT_BASE_NODE) continue;
        std::size_t count = nodesByKind[k].size();
        total += static_cast<long long>(count);
        std::string_view name = nodeKindName(static_cast<NodeType>(k));
        os << "Total ";
        os.write(name.data(), static_cast<std::streamsize>(name.size()));
        os << " Nodes: " << count << "\n";
    }
    os << "Total ZOA Nodes: " << total << "\n" << stars;
    os.flush();
}

// ---- digraph ----

void DumpDot::writeGraphHeader() {
    lit("digraph ZOA {\n");
    indent(1);
    lit("graph [fontname=\"Helvetica\", fontsize=20,");
    lit(" label = \"");
    text << subprog->getName();
    lit("\"]\n");
}

void DumpDot::writeKindBlocks() {
    for (int k = 0; k < NODE_TYPE_COUNT; ++k) {
        if (!hasOwnBlock(k) || nodesByKind[k].empty()) continue;
        indent(1);
        lit("subgraph ");
        text << nodeKindName(static_cast<NodeType>(k));
        lit("Type {\n");
        indent(2);
        lit("node [color=");
        text << kindColours[k];
        lit(", shape=record];\n");
        for (TreeBase* n : nodesByKind[k]) declareNode(n, 2);
        indent(1);
        lit("}\n");
    }
}

void DumpDot::declareNode(TreeBase* n, int depth) {
    NodeType k = n->getNodeType();
    indent(depth);
    lit("node [label = \"{");
    text << nodeKindName(k);
    writeFields(n);
    lit("}\"];\n");
    indent(depth);
    putIdentity(n);
    lit(";\n");
    if (k == SUBPROG_NODE) declareTemps(static_cast<SUBPROG*>(n), depth);
}

void DumpDot::writeFields(TreeBase* n) {
    switch (n->getNodeType()) {
        case UNOP_NODE: {
            auto* u = static_cast<UNOP*>(n);
            lit(" | (");
            text << (toString(u->getDataType()));
            lit(" / ");
            text << (toString(u->getOp()));
            lit(")");
            break;
        }
        case BINOP_NODE: {
            auto* b = static_cast<BINOP*>(n);
            lit(" | (");
            text << (toString(b->getDataType()));
            lit(" / ");
            text << (toString(b->getOp()));
            lit(")");
            break;
        }
        case CALL_NODE: {
            auto* c = static_cast<CALL*>(n);
            lit(" | (");
            text << (toString(c->getDataType()));
            lit(" / ");
            text << c->getFunctionName();
            lit(")");
            break;
        }
        case CONST_NODE: {
            auto* c = static_cast<CONST*>(n);
            lit(" | (");
            text << (toString(c->getDataType()));
            lit(" / ");
            writeConstValue(c);
            lit(")");
            break;
        }
        case MEM_NODE:
            lit(" | (");
            text << (toString(static_cast<MEM*>(n)->getDataType()));
            lit(")");
            break;
        case NAME_NODE: {
            auto* nm = static_cast<NAME*>(n);
            lit(" | (");
            text << (toString(nm->getDataType()));
            lit(" / ");
            putUnsigned(nm->getId());
            lit(")");
            break;
        }
        case TEMP_NODE: {
            auto* t = static_cast<TEMP*>(n);
            lit(" | (");
            text << (toString(t->getDataType()));
            lit(" / ");
            putUnsigned(t->getId());
            lit(")");
            break;
        }
        case BUF_TEMP_NODE: {
            auto* t = static_cast<BUF_TEMP*>(n);
            lit(" | (");
            text << (toString(t->getDataType()));
            lit(" / ");
            putUnsigned(t->getId());
            lit(" / ");
            putUnsigned(t->getArraySize());
            lit(")");
            break;
        }
        case LABEL_NODE:
            lit(" | ");
            putUnsigned(static_cast<LABEL*>(n)->getId());
            break;
        case SUBPROG_NODE: {
            auto* sp = static_cast<SUBPROG*>(n);
            lit(" | (");
            text << (toString(sp->getReturnType()));
            lit(" / ");
            text << sp->getName();
            lit(")");
            break;
        }
        case CJUMP_NODE:
        case EXP_NODE:
        case MOVE_NODE:
        case SEQ_NODE:
        case JUMP_NODE:
        case TREE_BASE_NODE:
        case EXPR_BASE_NODE:
        case STMT_BASE_NODE:
            break;
    }
}

void DumpDot::writeConstValue(CONST* c) {
    switch (c->getDataType()) {
        case CHAR_U:
            // The byte itself, not its number: odd, but what existing DOT files hold.
            text << static_cast<char>(static_cast<unsigned long long>(c->getIValue()) & 0xffu);
            break;
        case INT_U:
            putUnsigned(static_cast<unsigned long long>(c->getIValue()) & 0xffffffffu);
            break;
        case INT64_U:
            putUnsigned(static_cast<unsigned long long>(c->getIValue()));
            break;
        case CHAR_S:
        case INT_S:
        case INT64_S:
            putSigned(c->getIValue());
            break;
        case FLOAT:
            putFloating(static_cast<float>(c->getFValue()));
            break;
        case DOUBLE:
            putFloating(c->getFValue());
            break;
        case POINTER: {
            const char* s = static_cast<const char*>(c->getPValue());
            text << (s ? s : "(char *)0");
            break;
        }
        case VOID:
            break;
    }
}

void DumpDot::declareTemps(SUBPROG* sp, int depth) {
    const TempList& temps = sp->getAllTemps();
    if (temps.empty()) return;
    indent(depth);
    lit("node [color=");
    text << kindColours[TEMP_NODE];
    lit(", shape=record];\n");
    for (TEMP* t : temps)
        if (t) declareNode(t, depth);
}

void DumpDot::writeConnections() {
    indent(1);
    lit("subgraph ");
    // "conections" is misspelt on purpose: existing clients look for it.
    lit("conections {\n");
    for (int k = 0; k < NODE_TYPE_COUNT; ++k)
        for (TreeBase* n : nodesByKind[k]) writeEdges(n, 2);
    indent(1);
    lit("}\n");
}

void DumpDot::edge(const TreeBase* from, const TreeBase* to, EdgeEnding ending, int depth) {
    if (!to) return;
    indent(depth);
    putIdentity(from);
    lit(" -> ");
    putIdentity(to);
    text << edgeEndings[ending];
}

void DumpDot::writeEdges(TreeBase* n, int depth) {
    switch (n->getNodeType()) {
        case BINOP_NODE: {
            auto* b = static_cast<BINOP*>(n);
            edge(n, b->getLeft(), BLUE, depth);
            edge(n, b->getRight(), RED, depth);
            break;
        }
        case CALL_NODE: {
            const ExprVector& args = static_cast<CALL*>(n)->getArgs();
            for (auto it = args.rbegin(); it != args.rend(); ++it) edge(n, *it, PLAIN, depth);
            break;
        }
        case MEM_NODE:
            edge(n, static_cast<MEM*>(n)->getExpr(), PLAIN, depth);
            break;
        case NAME_NODE:
            for (ExprBase* e : static_cast<NAME*>(n)->getList()) edge(n, e, PLAIN, depth);
            break;
        case UNOP_NODE:
            edge(n, static_cast<UNOP*>(n)->getExpr(), PLAIN, depth);
            break;
        case CJUMP_NODE: {
            auto* c = static_cast<CJUMP*>(n);
            edge(n, c->getLeft(), BLUE, depth);
            edge(n, c->getRight(), RED, depth);
            edge(n, c->getIfTrue(), BLUE, depth);
            edge(n, c->getIfFalse(), RED, depth);
            break;
        }
        case EXP_NODE:
            edge(n, static_cast<EXP*>(n)->getExpr(), PLAIN, depth);
            break;
        case JUMP_NODE: {
            auto* j = static_cast<JUMP*>(n);
            edge(n, j->getExpr(), OPEN, depth);
            edge(n, j->getTarget(), OPEN, depth);
            break;
        }
        case LABEL_NODE: {
            const StmtList& stmts = static_cast<LABEL*>(n)->getStmts();
            if (!stmts.empty()) edge(n, stmts.front(), PLAIN, depth);
            break;
        }
        case MOVE_NODE: {
            auto* m = static_cast<MOVE*>(n);
            edge(n, m->getDst(), BLUE, depth);
            edge(n, m->getSrc(), RED, depth);
            break;
        }
        case SEQ_NODE: {
            auto* s = static_cast<SEQ*>(n);
            edge(n, s->getLeft(), BOLD_BLUE, depth);
            edge(n, s->getRight(), BOLD_RED, depth);
            break;
        }
        case SUBPROG_NODE: {
            auto* sp = static_cast<SUBPROG*>(n);
            edge(n, sp->getStartLabel(), PLAIN, depth);
            edge(n, sp->getReturnLabel(), PLAIN, depth);
            edge(n, sp->getReturnTemp(), PLAIN, depth);
            break;
        }
        case BUF_TEMP_NODE:
        case CONST_NODE:
        case TEMP_NODE:
        case TREE_BASE_NODE:
        case EXPR_BASE_NODE:
        case STMT_BASE_NODE:
            break;
    }
}

// ---- numbers ----

void DumpDot::putUnsigned(unsigned long long v) {
    if (!plainNumbers) {
        text.flush();
        out << v;
        return;
    }
    text.writeUnsigned(v);
}

void DumpDot::putSigned(long long v) {
    if (!plainNumbers) {
        text.flush();
        out << v;
        return;
    }
    text.writeInt(v);
}

void DumpDot::putIdentity(const TreeBase* n) {
    putUnsigned(static_cast<unsigned long long>(reinterpret_cast<std::uintptr_t>(n)));
}

template <class F> void DumpDot::putFloating(F v) {
    // The stream's own floating-point formatting, whatever its settings.
    text.flush();
    out << v;
}

bool ZOA_file::dumpDot(std::ostream& os) {
    DumpDot::Workspace workspace(os);
    for (SUBPROG* sp : subprogs) DumpDot dump(sp, os, &workspace, &getDiagnosticStream());
    return true;
}

}  // namespace ZOA
