// DumpDot and ZOA_file::dumpDot: Graphviz digraphs of subprograms, node statistics on the diagnostic stream.
#include "dump/dot/dump_dot.h"

#include "dump/dot/dot_escape.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>
#include <zoa/zoa_file.h>

#include <charconv>
#include <cstring>
#include <iostream>
#include <locale>
#include <string_view>

namespace ZOA {

namespace {

struct KindInfo {
    std::string_view name;    // record label and statistics name
    std::string_view colour;  // Graphviz colour name; empty when never drawn
    bool ownBlock;            // declared in a subgraph of its own
};

// Indexed by NodeType. Temporaries are drawn in yellow inside the SUBPROG
// block; JUMP nodes are counted but never declared.
constexpr KindInfo kinds[NODE_TYPE_COUNT] = {
    {"TreeBase", "", false},        {"ExprBase", "", false},
    {"BINOP", "pink", true},        {"BUF_TEMP", "yellow", false},
    {"CALL", "beige", true},        {"CONST", "khaki", true},
    {"MEM", "gold", true},          {"NAME", "greenyellow", true},
    {"TEMP", "yellow", false},      {"UNOP", "violet", true},
    {"StmtBase", "", false},        {"CJUMP", "green", true},
    {"EXP", "palegreen", true},     {"JUMP", "", false},
    {"LABEL", "cyan", true},        {"MOVE", "indigo", true},
    {"SEQ", "magenta", true},       {"SUBPROG", "skyblue", true},
};

// Indexed by DumpDot::EdgeEnding. OPEN leaves the line open on purpose.
constexpr std::string_view edgeEndings[] = {
    ";\n",
    " [color=blue];\n",
    " [color=red];\n",
    " [color=blue, style=bold];\n",
    " [color=red, style=bold];\n",
    ";",
};

constexpr std::size_t flushThreshold = 1 << 15;

// Writes v in decimal at p and returns the length. Identities are addresses of
// up to 15 digits: the low eight digits are done in 32-bit pairs, which is
// about twice as fast as to_chars on such values.
std::size_t writeDecimal(char* p, unsigned long long v) {
    if (v < 100000000ull) {
        auto small = static_cast<std::uint32_t>(v);
        return static_cast<std::size_t>(std::to_chars(p, p + 24, small).ptr - p);
    }
    std::size_t n = writeDecimal(p, v / 100000000ull);
    auto low = static_cast<std::uint32_t>(v % 100000000ull);
    static const char pairs[] =
        "00010203040506070809101112131415161718192021222324252627282930313233343536373839"
        "40414243444546474849505152535455565758596061626364656667686970717273747576777879"
        "8081828384858687888990919293949596979899";
    char* d = p + n + 8;
    for (int i = 0; i < 4; ++i) {
        std::uint32_t two = low % 100;
        low /= 100;
        d -= 2;
        d[0] = pairs[two * 2];
        d[1] = pairs[two * 2 + 1];
    }
    return n + 8;
}

bool formatsPlainDecimal(const std::ostream& os) {
    std::ios_base::fmtflags f = os.flags();
    std::ios_base::fmtflags base = f & std::ios_base::basefield;
    if (base == std::ios_base::hex || base == std::ios_base::oct) return false;
    if (f & std::ios_base::showpos) return false;
    return std::use_facet<std::numpunct<char>>(os.getloc()).grouping().empty();
}

void putView(TextBuffer& text, std::string_view v) { text.append(v.data(), v.size()); }

}  // namespace

DumpDot::DumpDot(SUBPROG* sp, std::ostream& os, Workspace* ws, std::ostream* stats, bool sound)
    : AllVisitor(sp),
      ownWorkspace(ws ? nullptr : new Workspace),
      workspace(ws ? *ws : *ownWorkspace),
      nodesByKind(workspace.nodesByKind),
      text(workspace.text),
      subprog(sp),
      out(os),
      plainNumbers(formatsPlainDecimal(os)),
      sound(sound) {
    for (int k = 0; k < NODE_TYPE_COUNT; ++k) nodesByKind[k].clear();
    workspace.ids.clear();
    workspace.declaredOnce.clear();
    text.clear();
    if (!subprog) return;
    // Temporaries and labels are most of what is collected once.
    workspace.declaredOnce.reserve(subprog->getAllTemps().size() + subprog->getAllLabels().size());
    subprog->accept(this);
    writeStatistics(stats ? *stats : std::cout);
    writeGraphHeader();
    writeKindBlocks();
    writeConnections();
    lit("}\n");
    flushText();
}

DumpDot::~DumpDot() {
    for (int k = 0; k < NODE_TYPE_COUNT; ++k) nodesByKind[k].clear();
    workspace.declaredOnce.clear();
    text.clear();
}

// ---- collection walk: children first, then the node itself ----

void DumpDot::collect(TreeBase* n) { nodesByKind[n->getNodeType()].push_back(n); }

void DumpDot::collectOnce(TreeBase* n) {
    if (workspace.declaredOnce.insert(n)) nodesByKind[n->getNodeType()].push_back(n);
}

void DumpDot::visit(UNOP* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(TEMP* n) { AllVisitor::visit(n); collectOnce(n); }
void DumpDot::visit(SUBPROG* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(SEQ* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(NAME* n) { AllVisitor::visit(n); collectOnce(n); }
void DumpDot::visit(MOVE* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(MEM* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(LABEL* n) { AllVisitor::visit(n); collectOnce(n); }
void DumpDot::visit(JUMP* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(EXP* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(CONST* n) { AllVisitor::visit(n); collectOnce(n); }
void DumpDot::visit(CJUMP* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(CALL* n) { AllVisitor::visit(n); collect(n); }
void DumpDot::visit(BUF_TEMP* n) { AllVisitor::visit(n); collectOnce(n); }
void DumpDot::visit(BINOP* n) { AllVisitor::visit(n); collect(n); }

// ---- statistics ----

void DumpDot::writeStatistics(std::ostream& os) {
    static const char stars[] = "************************************************************\n";
    os << "ZOA Statictics for SUBPROG ";
    os.write(subprog->getName().data(), static_cast<std::streamsize>(subprog->getName().size()));
    os << "\n" << stars;
    os << "Size of subprogs is " << nodesByKind[SUBPROG_NODE].size() << "\n";
    long long total = 0;
    for (int k = BINOP_NODE; k <= SUBPROG_NODE; ++k) {
        if (k == STMT_BASE_NODE) continue;
        std::size_t count = nodesByKind[k].size();
        total += static_cast<long long>(count);
        os << "Total ";
        os.write(kinds[k].name.data(), static_cast<std::streamsize>(kinds[k].name.size()));
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
    putText(subprog->getName(), false);
    lit("\"]\n");
}

void DumpDot::writeKindBlocks() {
    for (int k = 0; k < NODE_TYPE_COUNT; ++k) {
        if (!kinds[k].ownBlock || nodesByKind[k].empty()) continue;
        indent(1);
        lit("subgraph ");
        putView(text, kinds[k].name);
        lit("Type {\n");
        indent(2);
        lit("node [color=");
        putView(text, kinds[k].colour);
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
    putView(text, kinds[k].name);
    writeFields(n);
    lit("}\"];\n");
    indent(depth);
    putIdentity(n);
    lit(";\n");
    if (k == SUBPROG_NODE) declareTemps(static_cast<SUBPROG*>(n), depth);
    if (text.size() >= flushThreshold) flushText();
}

void DumpDot::writeFields(TreeBase* n) {
    switch (n->getNodeType()) {
        case UNOP_NODE: {
            auto* u = static_cast<UNOP*>(n);
            lit(" | (");
            putCString(toString(u->getDataType()));
            lit(" / ");
            putCString(toString(u->getOp()));
            lit(")");
            break;
        }
        case BINOP_NODE: {
            auto* b = static_cast<BINOP*>(n);
            lit(" | (");
            putCString(toString(b->getDataType()));
            lit(" / ");
            putCString(toString(b->getOp()));
            lit(")");
            break;
        }
        case CALL_NODE: {
            auto* c = static_cast<CALL*>(n);
            lit(" | (");
            putCString(toString(c->getDataType()));
            lit(" / ");
            putText(c->getFunctionName());
            lit(")");
            break;
        }
        case CONST_NODE: {
            auto* c = static_cast<CONST*>(n);
            lit(" | (");
            putCString(toString(c->getDataType()));
            lit(" / ");
            writeConstValue(c);
            lit(")");
            break;
        }
        case MEM_NODE:
            lit(" | (");
            putCString(toString(static_cast<MEM*>(n)->getDataType()));
            lit(")");
            break;
        case NAME_NODE: {
            auto* nm = static_cast<NAME*>(n);
            lit(" | (");
            putCString(toString(nm->getDataType()));
            lit(" / ");
            putUnsigned(nm->getId());
            lit(")");
            break;
        }
        case TEMP_NODE: {
            auto* t = static_cast<TEMP*>(n);
            lit(" | (");
            putCString(toString(t->getDataType()));
            lit(" / ");
            putUnsigned(t->getId());
            lit(")");
            break;
        }
        case BUF_TEMP_NODE: {
            auto* t = static_cast<BUF_TEMP*>(n);
            lit(" | (");
            putCString(toString(t->getDataType()));
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
            putCString(toString(sp->getReturnType()));
            lit(" / ");
            putText(sp->getName());
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
            if (sound) putUnsigned(static_cast<unsigned long long>(c->getIValue()) & 0xffu);
            else text.push_back(static_cast<char>(static_cast<unsigned long long>(c->getIValue()) & 0xffu));
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
            if (!s) s = "(char *)0";
            if (sound) putText(s, std::strlen(s));
            else putCString(s);
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
    putView(text, kinds[TEMP_NODE].colour);
    lit(", shape=record];\n");
    for (TEMP* t : temps)
        if (t) declareNode(t, depth);
}

void DumpDot::writeConnections() {
    indent(1);
    lit("subgraph ");
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
    putView(text, edgeEndings[ending]);
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
    if (text.size() >= flushThreshold) flushText();
}

// ---- text helpers ----

void DumpDot::putCString(const char* s) { text.append(s, std::strlen(s)); }

void DumpDot::indent(int depth) {
    if (depth > 0) text.fill(' ', static_cast<std::size_t>(depth) * 4);
}

void DumpDot::putUnsigned(unsigned long long v) {
    if (!plainNumbers) {
        flushText();
        out << v;
        return;
    }
    text.commit(writeDecimal(text.tail(24), v));
}

void DumpDot::putSigned(long long v) {
    if (!plainNumbers) {
        flushText();
        out << v;
        return;
    }
    char* at = text.tail(24);
    text.commit(static_cast<std::size_t>(std::to_chars(at, at + 24, v).ptr - at));
}

void DumpDot::putText(const char* s, std::size_t n, bool record) {
    if (sound) appendDotEscaped(text, s, n, record);
    else text.append(s, n);
}

void DumpDot::putIdentity(const TreeBase* n) {
    if (sound) {
        putUnsigned(workspace.ids.of(n));
        return;
    }
    putUnsigned(static_cast<unsigned long long>(reinterpret_cast<std::uintptr_t>(n)));
}

template <class F> void DumpDot::putFloating(F v) {
    // The stream's own floating-point formatting, whatever its settings.
    flushText();
    out << v;
}

void DumpDot::flushText() {
    if (text.empty()) return;
    out.write(text.data(), static_cast<std::streamsize>(text.size()));
    text.clear();
}

bool ZOA_file::dumpDot(std::ostream& os) {
    DumpDot::Workspace workspace;
    for (SUBPROG* sp : subprogs) DumpDot dump(sp, os, &workspace, &getDiagnosticStream(), profile == Profile::SOUND);
    return true;
}

}  // namespace ZOA
