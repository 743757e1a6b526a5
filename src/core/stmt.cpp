// Statement nodes and LABEL.
#include <zoa/stmt.h>
#include <zoa/visitor.h>

#include "core/op_facts.h"

namespace ZOA {

void EXP::accept(VisitorBase* v) { v->visit(this); }

void MOVE::accept(VisitorBase* v) { v->visit(this); }

void MOVE::replaceDst(ExprBase* e) {
    if (dst) dst->freeNode();
    dst = e;
}

void MOVE::replaceSrc(ExprBase* e) {
    if (src) src->freeNode();
    src = e;
}

void SEQ::accept(VisitorBase* v) { v->visit(this); }

void SEQ::replaceLeft(StmtBase* s) {
    if (left) left->freeNode();
    left = s;
}

void SEQ::replaceRight(StmtBase* s) {
    if (right) right->freeNode();
    right = s;
}

void JUMP::accept(VisitorBase* v) { v->visit(this); }

void JUMP::replaceExpr(ExprBase* e) {
    if (expr) expr->freeNode();
    expr = e;
}

void JUMP::replaceTarget(LABEL* l) {
    if (target) target->freeNode();
    target = l;
}

void CJUMP::accept(VisitorBase* v) { v->visit(this); }

BinopKind CJUMP::notRel(BinopKind r) { return negatedRelation(r); }

void CJUMP::replaceLeft(ExprBase* e) {
    if (left) left->freeNode();
    left = e;
}

void CJUMP::replaceRight(ExprBase* e) {
    if (right) right->freeNode();
    right = e;
}

void CJUMP::replaceIfTrue(LABEL* l) {
    if (ifTrue) ifTrue->freeNode();
    ifTrue = l;
}

void CJUMP::replaceIfFalse(LABEL* l) {
    if (ifFalse) ifFalse->freeNode();
    ifFalse = l;
}

void LABEL::accept(VisitorBase* v) { v->visit(this); }

void LABEL::addStmt(StmtBase* s) {
    if (!s) return;
    stmts.push_back(s);
    hasStmts = true;
    NodeType k = s->getNodeType();
    if (k == JUMP_NODE || k == CJUMP_NODE) lastStmtDone = true;
}

}  // namespace ZOA
