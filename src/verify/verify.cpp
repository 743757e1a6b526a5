// Verifier: walks subprograms and file-level names and reports trees the outputs cannot translate.
#include <zoa/verify.h>
#include <zoa/zoa.h>

#include "core/children.h"
#include "core/identifiers.h"
#include "core/op_facts.h"
#include "support/pointer_table.h"

#include <unordered_map>

namespace ZOA::verify {

namespace {

bool isTemp(TreeBase* t) { return t->getNodeType() == TEMP_NODE || t->getNodeType() == BUF_TEMP_NODE; }
std::string quoted(const String& s) { return "'" + std::string(s.data(), s.size()) + "'"; }

class Checker {
public:
    Checker(std::vector<Diagnostic>& out, bool asmMode, ZOA_file* unit) : out(out), asmMode(asmMode), unit(unit) {}

    void subprog(SUBPROG& sp);
    void fileNames();

private:
    std::vector<Diagnostic>& out;
    bool asmMode;
    ZOA_file* unit;
    SUBPROG* sp = nullptr;
    PointerSet<const TreeBase*> seen;
    PointerSet<const TEMP*> ownTemps;
    std::unordered_map<const TEMP*, SUBPROG*> owners;  // filled at the first foreign temporary
    std::vector<TreeBase*> todo;

    void report(Severity s, TreeBase* n, std::string msg) { out.push_back({s, n, sp, std::move(msg)}); }
    void error(TreeBase* n, std::string msg) { report(Severity::ERROR, n, std::move(msg)); }

    // Reports a missing child; the children present are walked by forEachChild.
    void child(TreeBase* parent, TreeBase* c, const char* what) {
        if (!c) error(parent, std::string(toString(parent->getNodeType())) + " has no " + what);
    }
    void target(TreeBase* parent, LABEL* l, const char* what) {
        if (!l) {
            error(parent, std::string(toString(parent->getNodeType())) + " has no " + what);
            return;
        }
        auto& labels = sp->getAllLabels();
        auto it = labels.find(l->getId());
        if (it == labels.end() || it->second != l)
            error(parent, std::string(toString(parent->getNodeType())) + " " + what + " L" + std::to_string(l->getId()) +
                              " is not a label of " + quoted(sp->getName()));
    }
    void name(NAME* n);
    // Function and data names must be C identifiers for the sound C output.
    void identifier(TreeBase* n, const String& text, const char* what);
    void temp(TEMP* t);
    void walk(TreeBase* root);
    void node(TreeBase* t);
};

void Checker::identifier(TreeBase* n, const String& text, const char* what) {
    if (text.empty() || isCIdentifier(text.data(), text.size())) return;
    const char* why = isPlainIdentifier(text.data(), text.size()) ? " is a C keyword" : " is not a C identifier";
    report(Severity::WARNING, n, std::string(what) + " " + quoted(text) + why + "; the sound C output refuses it");
}

void Checker::name(NAME* n) {
    const String& text = n->getStringValue();
    const ExprList& l = n->getList();
    std::string id = (n->isDeclaredLocal() ? "name n" : "name g") + std::to_string(n->getId());
    if (n->getKind() == SUBPROG_REF || n->getKind() == EXTERN_DATA_REF || n->getKind() == STATIC_DATA_REF)
        identifier(n, text, id.c_str());
    switch (n->getKind()) {
        case LABEL_REF:
            if (!n->getLabelRef()) error(n, id + " refers to no label");
            break;
        case SUBPROG_REF:
        case DATA_ARRAY_REF:
        case STRINGLIT_REF:
        case EXTERN_DATA_REF:
            if (text.empty() && n->getKind() != STRINGLIT_REF && !n->isPrivateData())
                error(n, id + " of kind " + toString(n->getKind()) + " has no symbol");
            break;
        case CONST_ARRAY_REF:
            if (l.empty()) error(n, id + " is a constant array without elements");
            break;
        case STATIC_DATA_REF:
            if (text.empty() && (l.size() != 1 || !l.front() || l.front()->getNodeType() != CONST_NODE))
                error(n, id + " is static data without its one constant");
            break;
    }
    for (ExprBase* e : l) child(n, e, "element");
}

void Checker::temp(TEMP* t) {
    if (!sp || ownTemps.contains(t)) return;
    if (unit && owners.empty())
        for (SUBPROG* other : unit->getSubprogs())
            for (TEMP* o : other->getAllTemps()) owners.emplace(o, other);
    auto it = owners.find(t);
    if (it != owners.end()) {
        error(t, "temporary t" + std::to_string(t->getId()) + " of " + quoted(it->second->getName()) +
                     " is used in " + quoted(sp->getName()));
        return;
    }
    report(Severity::WARNING, t, "temporary t" + std::to_string(t->getId()) + " was not made by " + quoted(sp->getName()));
}

void Checker::node(TreeBase* t) {
    if (asmMode && t->getNodeType() >= BINOP_NODE && t->getNodeType() <= UNOP_NODE) {
        DataType dt = static_cast<ExprBase*>(t)->getDataType();
        if (dt == FLOAT || dt == DOUBLE)
            report(Severity::WARNING, t, std::string("the assembly output has no ") + toString(dt) + " values");
    }
    switch (t->getNodeType()) {
        case BINOP_NODE: {
            BINOP* b = static_cast<BINOP*>(t);
            BinopKind op = b->getOp();
            if (asmMode && op != PLUS && op != MINUS && op != MUL && !isRelation(op))
                report(Severity::WARNING, t, std::string("the assembly output cannot translate BINOP ") + toString(op));
            child(t, b->getLeft(), "left operand");
            child(t, b->getRight(), "right operand");
            break;
        }
        case UNOP_NODE: {
            UNOP* u = static_cast<UNOP*>(t);
            if (asmMode && u->getOp() != CONV4)
                report(Severity::WARNING, t, std::string("the assembly output cannot translate UNOP ") + toString(u->getOp()));
            child(t, u->getExpr(), "operand");
            break;
        }
        case MEM_NODE: child(t, static_cast<MEM*>(t)->getExpr(), "address"); break;
        case CALL_NODE: {
            CALL* c = static_cast<CALL*>(t);
            if (c->getFunctionName().empty() && !c->getFunctionPointer())
                error(t, "CALL has neither a function name nor a function pointer");
            if (!c->getFunctionPointer()) identifier(t, c->getFunctionName(), "called function");
            for (ExprBase* a : c->getArgs()) child(t, a, "argument");
            break;
        }
        case NAME_NODE: {
            NAME* n = static_cast<NAME*>(t);
            if (n->getKind() == LABEL_REF && n->getLabelRef() && sp) {
                target(n, n->getLabelRef(), "label");
                return;  // its address is all a label name stands for
            }
            name(n);
            break;
        }
        case TEMP_NODE:
        case BUF_TEMP_NODE: temp(static_cast<TEMP*>(t)); break;
        case EXP_NODE: child(t, static_cast<EXP*>(t)->getExpr(), "expression"); break;
        case MOVE_NODE: {
            MOVE* m = static_cast<MOVE*>(t);
            ExprBase* d = m->getDst();
            if (d && !isTemp(d) && d->getNodeType() != MEM_NODE)
                error(t, std::string("MOVE into a ") + toString(d->getNodeType()) + ", which is neither a TEMP nor a MEM");
            child(t, d, "destination");
            child(t, m->getSrc(), "source");
            break;
        }
        case SEQ_NODE: break;  // either side may be null
        case JUMP_NODE: {
            JUMP* j = static_cast<JUMP*>(t);
            if (j->getKind() == DIRECT_LABEL) {
                if (j->getExpr()) error(t, "JUMP to a label also holds an expression");
                target(t, j->getTarget(), "target");
            } else {
                if (j->getTarget()) error(t, "JUMP to an expression also holds a target label");
                child(t, j->getExpr(), "target expression");
            }
            break;
        }
        case CJUMP_NODE: {
            CJUMP* c = static_cast<CJUMP*>(t);
            if (!isRelation(c->getRelOp()))
                error(t, std::string("CJUMP relation ") + toString(c->getRelOp()) + " is not one of EQ, NE, LT, LE, GT, GE");
            child(t, c->getLeft(), "left operand");
            child(t, c->getRight(), "right operand");
            target(t, c->getIfTrue(), "true target");
            target(t, c->getIfFalse(), "false target");
            break;
        }
        case CONST_NODE:
        case TREE_BASE_NODE:
        case EXPR_BASE_NODE:
        case STMT_BASE_NODE:
        case LABEL_NODE:
        case SUBPROG_NODE:
            break;
    }
    forEachChild(t, [this](TreeBase* c) { todo.push_back(c); });
}

void Checker::walk(TreeBase* root) {
    todo.push_back(root);
    while (!todo.empty()) {
        TreeBase* t = todo.back();
        todo.pop_back();
        if (seen.insert(t)) node(t);
    }
}

void Checker::subprog(SUBPROG& s) {
    sp = &s;
    identifier(&s, s.getName(), "subprogram");
    ownTemps.clear();
    for (TEMP* t : s.getAllTemps()) ownTemps.insert(t);
    for (NAME* n : s.getAllLocalNames()) walk(n);
    for (auto& [id, l] : s.getAllLabels())
        for (StmtBase* st : l->getStmts()) walk(st);
    sp = nullptr;
}

void Checker::fileNames() {
    if (!unit) return;
    for (NAME* n : unit->getNames()) walk(n);
}

}  // namespace

std::vector<Diagnostic> verify(ZOA_file& unit) {
    std::vector<Diagnostic> out;
    Checker c(out, unit.IsAsmMode(), &unit);
    c.fileNames();
    for (SUBPROG* sp : unit.getSubprogs()) c.subprog(*sp);
    return out;
}

std::vector<Diagnostic> verify(SUBPROG& subprog, bool asmMode, ZOA_file* unit) {
    std::vector<Diagnostic> out;
    Checker(out, asmMode, unit).subprog(subprog);
    return out;
}

std::string format(const Diagnostic& d) {
    return (d.severity == Severity::ERROR ? "error: " : "warning: ") + d.message;
}

}  // namespace ZOA::verify
