// UsedTemps: the temporaries and calls a subprogram really uses, collected in one cheap walk.
#ifndef ZOA_EMIT_USED_TEMPS_H
#define ZOA_EMIT_USED_TEMPS_H

#include "support/pointer_table.h"

#include <zoa/expr.h>
#include <zoa/nesting.h>
#include <zoa/subprog.h>

#include <vector>

namespace ZOA {

// Node identity to NodeType; keeps its capacity across clear(), so a walker
// that reuses one map does no heap allocation per node.
using UsedMap = PointerMap<TreeBase*, NodeType>;

// Walks a subprogram's labels and statements (forEachChild, stopping
// MAX_WALK_DEPTH levels down, so a cycle ends the walk); the return and
// argument temporaries count as used. The subprogram's own temporaries are
// marked in a vector indexed by id; any other temporary that turns up
// (another subprogram's, or a copy sharing an id) goes to a map.
// The buffers keep their capacity, so one collector reused across
// subprograms allocates nothing per node.
class UsedTemps {
public:
    void collect(SUBPROG* sp);

    // For a walker that marks as it goes (the C output marks what it
    // prints): begin() forgets the last subprogram and marks sp's return
    // and argument temporaries; mark() the temporaries met.
    void begin(SUBPROG* sp);
    void mark(TEMP* t) {
        unsigned int id = t->getId();
        if (id < own.size() && own[id] == t) used[id] = 1;
        else others.assign(t, TEMP_NODE);
    }
    // Marks the temporaries in n's values, which collect() walks and a
    // printer does not. `level` is the depth at which collect() would meet n
    // or more; false when collect() could have been cut below n, so that
    // only collect() itself gives its marks.
    bool markValues(NAME* n, unsigned int level);

    bool isUsed(const TEMP* t) const {
        if (!t) return false;
        unsigned int id = t->getId();
        if (id < own.size() && own[id] == t) return used[id] != 0;
        return others.contains(t);
    }
    // Every CALL reached, in walk order; a call reached twice is listed twice.
    const std::vector<CALL*>& calls() const { return callList; }

private:
    void walk(TreeBase* n);
    bool markBelow(TreeBase* n, unsigned int level);

    std::vector<const TEMP*> own;     // the subprogram's temporaries by id
    std::vector<unsigned char> used;  // by id
    UsedMap others;
    std::vector<CALL*> callList;
    NestingGuard nesting;
};

}  // namespace ZOA

#endif
