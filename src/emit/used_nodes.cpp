// UsedNodes: the visits that record what a subprogram uses.
#include "emit/used_nodes.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>

namespace ZOA {

UsedNodes::UsedNodes(SUBPROG* sp, UsedMap* usedMap) : AllVisitor(sp), usedMap(usedMap) { sp->accept(this); }

void UsedNodes::visit(SUBPROG* sp) {
    AllVisitor::visit(sp);
    // Arguments count as used even when no statement mentions them.
    for (TEMP* t : sp->getAllTemps())
        if (t->getType() == ARGUMENT_TEMP) t->accept(this);
}

void UsedNodes::visit(LABEL* l) {
    AllVisitor::visit(l);
    usedMap->insertIfAbsent(l, LABEL_NODE);
}

void UsedNodes::visit(CALL* c) {
    AllVisitor::visit(c);
    usedMap->assign(c, CALL_NODE);
}

void UsedNodes::visit(TEMP* t) { usedMap->assign(t, TEMP_NODE); }

void UsedNodes::visit(BUF_TEMP* t) { usedMap->assign(t, TEMP_NODE); }

}  // namespace ZOA
