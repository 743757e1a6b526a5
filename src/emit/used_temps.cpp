// UsedTemps: the walk and the marks.
#include "emit/used_temps.h"

#include "core/children.h"

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

    // Each statement is a walk of its own: a cut (see walk) ends only the
    // statement that holds a cycle.
    for (const auto& entry : sp->getAllLabels())
        if (entry.second) forEachChild(entry.second, LABEL_NODE, [this](TreeBase* s) { walk(s); });
    if (TEMP* t = sp->getReturnTemp()) walk(t);
    // Arguments count as used even when no statement mentions them.
    for (TEMP* t : sp->getAllTemps())
        if (t && t->getType() == ARGUMENT_TEMP) mark(t);
}

// Which nodes are reached matters for the marks, not the order; a CALL is
// listed after its operands. A nested SUBPROG is not entered.
void UsedTemps::walk(TreeBase* n) {
    NestingLevel level(nesting);
    if (!level.entered()) return;
    NodeType k = n->getNodeType();
    switch (k) {
    case TEMP_NODE:
    case BUF_TEMP_NODE: mark(static_cast<TEMP*>(n)); return;
    case CONST_NODE:
    case SUBPROG_NODE: return;
    default: break;
    }
    forEachChild(n, k, [this](TreeBase* child) { walk(child); });
    if (k == CALL_NODE) callList.push_back(static_cast<CALL*>(n));
}

}  // namespace ZOA
