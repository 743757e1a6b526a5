// forEachChild: the one walk over a node's children, in the order of the whole-tree walk.
#ifndef ZOA_CORE_CHILDREN_H
#define ZOA_CORE_CHILDREN_H

#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>

#include <utility>

namespace ZOA {

// Calls f(child) for each non-null child of n, in AllVisitor's order:
//   SUBPROG: its labels in ascending id, then the return temporary;
//   LABEL: its statements; SEQ: left, right; MOVE: dst, src; EXP: expr;
//   JUMP: expr, only for DIRECT_EXPR; CJUMP: left, right (not its labels);
//   BINOP: left, right; UNOP, MEM: expr; CALL: function pointer, then args;
//   NAME: its value list (not its label); TEMP, BUF_TEMP, CONST: none.
// A SUBPROG's labels are read from its map as the walk goes: f must not add
// or remove labels. Walkers that need more than the children (argument
// temporaries, jump targets) add them themselves.
// k is n's node type, for a caller that has asked it already.
template <class F> void forEachChild(TreeBase* n, NodeType k, F&& f) {
    auto visit = [&f](TreeBase* c) {
        if (c) f(c);
    };
    switch (k) {
    case SUBPROG_NODE: {
        SUBPROG* sp = static_cast<SUBPROG*>(n);
        for (const auto& entry : sp->getAllLabels()) visit(entry.second);
        visit(sp->getReturnTemp());
        return;
    }
    case LABEL_NODE: {
        LABEL* l = static_cast<LABEL*>(n);
        if (!l->containsStmts()) return;
        for (StmtBase* s : l->getStmts()) visit(s);
        return;
    }
    case SEQ_NODE:
        visit(static_cast<SEQ*>(n)->getLeft());
        visit(static_cast<SEQ*>(n)->getRight());
        return;
    case MOVE_NODE:
        visit(static_cast<MOVE*>(n)->getDst());
        visit(static_cast<MOVE*>(n)->getSrc());
        return;
    case EXP_NODE: visit(static_cast<EXP*>(n)->getExpr()); return;
    case JUMP_NODE:
        if (static_cast<JUMP*>(n)->getKind() == DIRECT_EXPR) visit(static_cast<JUMP*>(n)->getExpr());
        return;
    case CJUMP_NODE:
        visit(static_cast<CJUMP*>(n)->getLeft());
        visit(static_cast<CJUMP*>(n)->getRight());
        return;
    case BINOP_NODE:
        visit(static_cast<BINOP*>(n)->getLeft());
        visit(static_cast<BINOP*>(n)->getRight());
        return;
    case UNOP_NODE: visit(static_cast<UNOP*>(n)->getExpr()); return;
    case MEM_NODE: visit(static_cast<MEM*>(n)->getExpr()); return;
    case CALL_NODE: {
        CALL* c = static_cast<CALL*>(n);
        visit(c->getFunctionPointer());
        for (ExprBase* a : c->getArgs()) visit(a);
        return;
    }
    case NAME_NODE:
        for (ExprBase* e : static_cast<NAME*>(n)->getList()) visit(e);
        return;
    case TEMP_NODE:
    case BUF_TEMP_NODE:
    case CONST_NODE:
    case TREE_BASE_NODE:
    case EXPR_BASE_NODE:
    case STMT_BASE_NODE: return;
    }
}

template <class F> void forEachChild(TreeBase* n, F&& f) { forEachChild(n, n->getNodeType(), std::forward<F>(f)); }

}  // namespace ZOA

#endif
