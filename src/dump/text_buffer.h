// TextBuffer: a growable character buffer whose appends are inline copies.
#ifndef ZOA_DUMP_TEXT_BUFFER_H
#define ZOA_DUMP_TEXT_BUFFER_H

#include "core/short_copy.h"

#include <cstddef>
#include <cstring>
#include <memory>

namespace ZOA {

// Holds text on its way to a stream. Unlike std::string an append is a bounds
// check and a memcpy (no out-of-line call, no terminating NUL); the storage
// grows geometrically and is kept across clear().
class TextBuffer {
public:
    void append(const char* s, std::size_t n) {
        if (n > capacity - used) grow(n);
        copyShort(storage.get() + used, s, n);
        used += n;
    }
    // n copies of c.
    void fill(char c, std::size_t n) {
        if (n > capacity - used) grow(n);
        char* p = storage.get() + used;
        for (std::size_t i = 0; i < n; ++i) p[i] = c;
        used += n;
    }
    void push_back(char c) {
        if (used == capacity) grow(1);
        storage[used++] = c;
    }
    // Room for n more characters at the end: write them, then commit(count).
    char* tail(std::size_t n) {
        if (n > capacity - used) grow(n);
        return storage.get() + used;
    }
    void commit(std::size_t n) { used += n; }

    const char* data() const { return storage.get(); }
    std::size_t size() const { return used; }
    bool empty() const { return used == 0; }
    void clear() { used = 0; }

private:
    void grow(std::size_t n) {
        std::size_t want = capacity * 2 > used + n ? capacity * 2 : used + n;
        if (want < 4096) want = 4096;
        std::unique_ptr<char[]> bigger(new char[want]);
        if (used) std::memcpy(bigger.get(), storage.get(), used);
        storage = std::move(bigger);
        capacity = want;
    }

    std::unique_ptr<char[]> storage;
    std::size_t used = 0;
    std::size_t capacity = 0;
};

}  // namespace ZOA

#endif
