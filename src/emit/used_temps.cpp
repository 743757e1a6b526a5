// UsedTemps: the walk and the marks.
#include "emit/used_temps.h"

#include <zoa/stmt.h>

namespace ZOA {

void UsedTemps::collect(SUBPROG* sp) {
    own.clear();
    used.clear();
    others.clear();
    callList.clear();
    if (!sp) return;
    for (TEMP* t : sp->getAllTemps()) {
        if (!t) continue;
        unsigned int id = t->getId();
        if (id >= own.size()) own.resize(id + 1, nullptr);
        if (!own[id]) own[id] = t;  // a second temporary with the id goes to the map
    }
    used.assign(own.size(), 0);

    for (const auto& entry : sp->getAllLabels()) walk(entry.second);
    walk(sp->getReturnTemp());
    // Arguments count as used even when no statement mentions them.
    for (TEMP* t : sp->getAllTemps())
        if (t && t->getType() == ARGUMENT_TEMP) mark(t);
}

// The children in AllVisitor's order; the order does not matter for the
// marks, only which nodes are reached.
void UsedTemps::walk(TreeBase* n) {
    if (!n) return;
    switch (n->getNodeType()) {
    case TEMP_NODE:
    case BUF_TEMP_NODE: mark(static_cast<TEMP*>(n)); return;
    case CONST_NODE: return;
    case BINOP_NODE:
        walk(static_cast<BINOP*>(n)->getLeft());
        walk(static_cast<BINOP*>(n)->getRight());
        return;
    case UNOP_NODE: walk(static_cast<UNOP*>(n)->getExpr()); return;
    case MEM_NODE: walk(static_cast<MEM*>(n)->getExpr()); return;
    case NAME_NODE:
        for (ExprBase* e : static_cast<NAME*>(n)->getList()) walk(e);
        return;
    case CALL_NODE: {
        CALL* c = static_cast<CALL*>(n);
        walk(c->getFunctionPointer());
        for (ExprBase* a : c->getArgs()) walk(a);
        callList.push_back(c);
        return;
    }
    case MOVE_NODE:
        walk(static_cast<MOVE*>(n)->getDst());
        walk(static_cast<MOVE*>(n)->getSrc());
        return;
    case EXP_NODE: walk(static_cast<EXP*>(n)->getExpr()); return;
    case JUMP_NODE:
        if (static_cast<JUMP*>(n)->getKind() == DIRECT_EXPR) walk(static_cast<JUMP*>(n)->getExpr());
        return;
    case CJUMP_NODE:
        walk(static_cast<CJUMP*>(n)->getLeft());
        walk(static_cast<CJUMP*>(n)->getRight());
        return;
    case SEQ_NODE:
        walk(static_cast<SEQ*>(n)->getLeft());
        walk(static_cast<SEQ*>(n)->getRight());
        return;
    case LABEL_NODE: {
        LABEL* l = static_cast<LABEL*>(n);
        if (!l->containsStmts()) return;
        for (StmtBase* s : l->getStmts()) walk(s);
        return;
    }
    case TREE_BASE_NODE:
    case EXPR_BASE_NODE:
    case STMT_BASE_NODE:
    case SUBPROG_NODE: return;
    }
}

}  // namespace ZOA
