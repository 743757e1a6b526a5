// UsedTemps: the walk and the marks.
#include "emit/used_temps.h"

#include "core/children.h"

#include <zoa/stmt.h>

namespace ZOA {

void UsedTemps::begin(SUBPROG* sp) {
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
    if (TEMP* t = sp->getReturnTemp()) mark(t);
    // Arguments count as used even when no statement mentions them.
    for (TEMP* t : sp->getAllTemps())
        if (t && t->getType() == ARGUMENT_TEMP) mark(t);
}

void UsedTemps::collect(SUBPROG* sp) {
    begin(sp);
    if (!sp) return;
    // Each statement is a walk of its own: a cut (see walk) ends only the
    // statement that holds a cycle.
    for (const auto& entry : sp->getAllLabels())
        if (entry.second) forEachChild(entry.second, LABEL_NODE, [this](TreeBase* s) { walk(s); });
}

bool UsedTemps::markValues(NAME* n, unsigned int level) {
    if (level + 1 >= MAX_WALK_DEPTH) return false;
    bool whole = true;
    forEachChild(n, NAME_NODE, [&](TreeBase* c) { whole = whole && markBelow(c, level + 1); });
    return whole;
}

bool UsedTemps::markBelow(TreeBase* n, unsigned int level) {
    NodeType k = n->getNodeType();
    switch (k) {
    case TEMP_NODE:
    case BUF_TEMP_NODE: mark(static_cast<TEMP*>(n)); return true;
    case CONST_NODE:
    case SUBPROG_NODE: return true;
    default: break;
    }
    if (level >= MAX_WALK_DEPTH) return false;
    bool whole = true;
    forEachChild(n, k, [&](TreeBase* c) { whole = whole && markBelow(c, level + 1); });
    return whole;
}

// Which nodes are reached matters for the marks, not the order; a CALL is
// listed after its operands. A nested SUBPROG is not entered.
void UsedTemps::walk(TreeBase* n) {
    NodeType k = n->getNodeType();
    switch (k) {
    case TEMP_NODE:
    case BUF_TEMP_NODE: mark(static_cast<TEMP*>(n)); return;
    case CONST_NODE:
    case SUBPROG_NODE: return;
    default: break;
    }
    NestingLevel level(nesting);
    if (!level.entered()) return;
    forEachChild(n, k, [this](TreeBase* child) { walk(child); });
    if (k == CALL_NODE) callList.push_back(static_cast<CALL*>(n));
}

}  // namespace ZOA
