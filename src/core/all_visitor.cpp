// AllVisitor: the fixed whole-tree walk that collecting visitors build on.
#include <zoa/all_visitor.h>
#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>

#include <vector>

namespace ZOA {

namespace {
inline void walk(TreeBase* n, VisitorBase* v) {
    if (n) n->accept(v);
}
}  // namespace

AllVisitor::AllVisitor(TreeBase* root) { walk(root, this); }

AllVisitor::~AllVisitor() {}

void AllVisitor::visit(SUBPROG* sp) {
    // A copy, so that labels added or removed during the walk do not disturb it.
    std::vector<LABEL*> labels;
    labels.reserve(sp->getAllLabels().size());
    for (const auto& entry : sp->getAllLabels()) labels.push_back(entry.second);
    for (LABEL* l : labels) walk(l, this);
    walk(sp->getReturnTemp(), this);
}

void AllVisitor::visit(LABEL* l) {
    if (!l->containsStmts()) return;
    for (StmtBase* s : l->getStmts()) walk(s, this);
}

void AllVisitor::visit(SEQ* s) {
    walk(s->getLeft(), this);
    walk(s->getRight(), this);
}

void AllVisitor::visit(MOVE* m) {
    walk(m->getDst(), this);
    walk(m->getSrc(), this);
}

void AllVisitor::visit(EXP* e) { walk(e->getExpr(), this); }

void AllVisitor::visit(JUMP* j) {
    if (j->getKind() == DIRECT_EXPR) walk(j->getExpr(), this);
}

void AllVisitor::visit(CJUMP* c) {
    walk(c->getLeft(), this);
    walk(c->getRight(), this);
}

void AllVisitor::visit(BINOP* b) {
    walk(b->getLeft(), this);
    walk(b->getRight(), this);
}

void AllVisitor::visit(UNOP* u) { walk(u->getExpr(), this); }

void AllVisitor::visit(MEM* m) { walk(m->getExpr(), this); }

void AllVisitor::visit(CALL* c) {
    walk(c->getFunctionPointer(), this);
    for (ExprBase* a : c->getArgs()) walk(a, this);
}

void AllVisitor::visit(NAME* n) {
    for (ExprBase* e : n->getList()) walk(e, this);
}

void AllVisitor::visit(TEMP*) {}
void AllVisitor::visit(BUF_TEMP*) {}
void AllVisitor::visit(CONST*) {}

}  // namespace ZOA
