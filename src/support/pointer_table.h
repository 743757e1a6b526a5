// PointerSet and PointerMap: node identities hashed by address, for the outputs' "seen" and "used" marks.
#ifndef ZOA_SUPPORT_POINTER_TABLE_H
#define ZOA_SUPPORT_POINTER_TABLE_H

#include <cstddef>
#include <cstdint>
#include <type_traits>
#include <vector>

namespace ZOA {

namespace detail {
template <class K, class V> struct PointerSlot {
    K key;
    V value;
};
template <class K> struct PointerSlot<K, void> {
    K key;
};
}  // namespace detail

// Open addressing with linear probing over a power-of-two table kept at most
// half full; K is a pointer type, null keys are not allowed. clear() forgets
// only the occupied slots and keeps the capacity, so one table reused for many
// subprograms costs time linear in what was added and allocates only when a
// subprogram outgrows every earlier one. Iteration order is unspecified.
template <class K, class V> class PointerTable {
    static_assert(std::is_pointer_v<K>, "keys are node identities");
    using Slot = detail::PointerSlot<K, V>;

public:
    std::size_t size() const { return used.size(); }
    bool contains(const void* key) const { return !slots.empty() && slots[probe(key)].key; }

    // Makes room for n entries without further growth.
    void reserve(std::size_t n) {
        while (n * 2 > slots.size()) grow();
    }

    void clear() {
        for (std::size_t i : used) slots[i].key = nullptr;
        used.clear();
    }

protected:
    // The slot of key, claimed for it when absent; `added` tells which.
    Slot& claim(K key, bool& added) {
        if ((used.size() + 1) * 2 > slots.size()) grow();
        std::size_t i = probe(key);
        added = !slots[i].key;
        if (added) {
            slots[i].key = key;
            used.push_back(i);
        }
        return slots[i];
    }
    const Slot* lookup(const void* key) const {
        if (slots.empty()) return nullptr;
        const Slot& s = slots[probe(key)];
        return s.key ? &s : nullptr;
    }
    template <class F> void forEachSlot(F f) const {
        for (std::size_t i : used) f(slots[i]);
    }

private:
    std::size_t home(const void* key) const {
        // Addresses share their low bits (alignment) and high bits (one arena);
        // a 64-bit finaliser spreads the rest over the table.
        std::uint64_t h = static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(key));
        h ^= h >> 33;
        h *= 0xff51afd7ed558ccdULL;
        h ^= h >> 33;
        return static_cast<std::size_t>(h) & (slots.size() - 1);
    }
    // key's slot, or the empty slot where it would go.
    std::size_t probe(const void* key) const {
        std::size_t i = home(key);
        while (slots[i].key && slots[i].key != key) i = (i + 1) & (slots.size() - 1);
        return i;
    }
    void grow() {
        std::vector<Slot> old;
        old.swap(slots);
        slots.assign(old.empty() ? 64 : old.size() * 2, Slot{});
        std::vector<std::size_t> oldUsed;
        oldUsed.swap(used);
        used.reserve(slots.size() / 2);
        for (std::size_t j : oldUsed) {
            std::size_t i = probe(old[j].key);
            slots[i] = old[j];
            used.push_back(i);
        }
    }

    std::vector<Slot> slots;
    std::vector<std::size_t> used;  // occupied slot indices, in insertion order
};

// A set of node identities.
template <class K> class PointerSet : public PointerTable<K, void> {
public:
    // Adds key; true when it was not in the set yet.
    bool insert(K key) {
        bool added;
        this->claim(key, added);
        return added;
    }
};

// A map from node identity to a small value.
template <class K, class V> class PointerMap : public PointerTable<K, V> {
public:
    // Stores v under key, replacing an earlier value.
    void assign(K key, V v) {
        bool added;
        this->claim(key, added).value = v;
    }
    // Stores v under key only when key is not yet a key.
    void insertIfAbsent(K key, V v) {
        bool added;
        auto& slot = this->claim(key, added);
        if (added) slot.value = v;
    }
    // The value stored under key, or nullptr.
    const V* find(const void* key) const {
        auto* slot = this->lookup(key);
        return slot ? &slot->value : nullptr;
    }
    // f(key, value) for every entry, in insertion order.
    template <class F> void forEach(F f) const {
        this->forEachSlot([&f](const auto& slot) { f(slot.key, slot.value); });
    }
};

}  // namespace ZOA

#endif
