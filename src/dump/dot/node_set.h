// NodeSet: a set of node identities for the DOT dump's "declare once" kinds.
#ifndef ZOA_DUMP_DOT_NODE_SET_H
#define ZOA_DUMP_DOT_NODE_SET_H

#include <cstddef>
#include <cstdint>
#include <vector>

namespace ZOA {

// Open addressing with linear probing over a power-of-two table kept at most
// half full. clear() forgets only the occupied slots and keeps the capacity,
// so one set reused for many subprograms costs time linear in what was added
// and allocates only when a subprogram outgrows every earlier one.
class NodeSet {
public:
    // Adds node (not null); true when it was not in the set yet.
    bool insert(const void* node) {
        if ((used.size() + 1) * 2 > slots.size()) grow();
        std::size_t i = home(node);
        while (slots[i]) {
            if (slots[i] == node) return false;
            i = (i + 1) & (slots.size() - 1);
        }
        slots[i] = node;
        used.push_back(i);
        return true;
    }

    // Makes room for n entries without further growth.
    void reserve(std::size_t n) {
        while (n * 2 > slots.size()) grow();
    }

    void clear() {
        for (std::size_t i : used) slots[i] = nullptr;
        used.clear();
    }

    std::size_t size() const { return used.size(); }

private:
    std::size_t home(const void* node) const {
        // Addresses share their low bits (alignment) and high bits (one arena);
        // a 64-bit finaliser spreads the rest over the table.
        std::uint64_t h = static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(node));
        h ^= h >> 33;
        h *= 0xff51afd7ed558ccdULL;
        h ^= h >> 33;
        return static_cast<std::size_t>(h) & (slots.size() - 1);
    }

    void grow() {
        std::vector<const void*> old;
        old.swap(slots);
        slots.assign(old.empty() ? 64 : old.size() * 2, nullptr);
        std::vector<std::size_t> oldUsed;
        oldUsed.swap(used);
        used.reserve(slots.size() / 2);
        for (std::size_t j : oldUsed) {
            std::size_t i = home(old[j]);
            while (slots[i]) i = (i + 1) & (slots.size() - 1);
            slots[i] = old[j];
            used.push_back(i);
        }
    }

    std::vector<const void*> slots;
    std::vector<std::size_t> used;  // occupied slot indices, for clear()
};

}  // namespace ZOA

#endif
