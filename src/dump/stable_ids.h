// StableIds: numbers nodes in order of first appearance, so that a dump does not depend on addresses.
#ifndef ZOA_DUMP_STABLE_IDS_H
#define ZOA_DUMP_STABLE_IDS_H

#include "support/pointer_table.h"

#include <cstddef>

namespace ZOA {

class StableIds {
public:
    // 0 for the first node asked about, then 1, 2, ...; the same number each
    // time for the same (non-null) node.
    std::size_t of(const void* node) {
        ids.insertIfAbsent(node, next);
        std::size_t id = *ids.find(node);
        if (id == next) ++next;
        return id;
    }
    void clear() {
        ids.clear();
        next = 0;
    }

private:
    PointerMap<const void*, std::size_t> ids;
    std::size_t next = 0;
};

}  // namespace ZOA

#endif
