// StableIds: numbers nodes in order of first appearance, so that a dump does not depend on addresses.
#ifndef ZOA_DUMP_STABLE_IDS_H
#define ZOA_DUMP_STABLE_IDS_H

#include <cstddef>
#include <unordered_map>

namespace ZOA {

class StableIds {
public:
    // 0 for the first node asked about, then 1, 2, ...; the same number each
    // time for the same node.
    std::size_t of(const void* node) { return ids.emplace(node, ids.size()).first->second; }
    void clear() { ids.clear(); }

private:
    std::unordered_map<const void*, std::size_t> ids;
};

}  // namespace ZOA

#endif
