// The process-wide bump arena that holds every node, annotation and node-held container.
#ifndef ZOA_MEMMGR_H
#define ZOA_MEMMGR_H

#include <zoa/export.h>

#include <climits>
#include <cstddef>
#include <cstdint>
#include <list>
#include <map>
#include <set>
#include <string>
#include <vector>

namespace ZOA {

// MemMgr hands out memory by bumping a pointer through blocks of 0x100000 bytes
// obtained from malloc. Nothing is released piece by piece; constructing a
// ZOA_file rewinds the arena to the first byte of its first block, giving up
// everything allocated before. One thread, one translation unit at a time.
//
// Choices made where the arena's design leaves room:
//  - allocate(size) does not round: requests of 3 and 5 bytes land 3 apart.
//    Typed allocations (node and annotation operator new, MemMgr_allocator<T>)
//    go through allocateAligned, which first aligns the bump pointer to what
//    the type needs, so no object is ever misaligned on a 64-bit host.
//  - A request that cannot fit in a block (more than 0x100000 bytes, counting
//    the alignment of a typed request) is served from a dedicated malloc block
//    of its own; it does not disturb the bump pointer and is not counted by
//    getMemoryUsage(). Dedicated blocks are released at the next rewind.
//  - Allocating before the first ZOA_file exists primes the arena first.
//  - A failing malloc throws std::bad_alloc.
//  - Blocks are kept for the life of the process and reused after a rewind.
class ZOA_API MemMgr {
public:
    static constexpr unsigned int BLOCK_SIZE = 0x100000;

    // Returns size fresh bytes, adjacent to the previous request when it fits.
    static void* allocate(unsigned int size);
    // Returns size bytes whose address is a multiple of align (a power of two).
    // The common case, a request that fits the current block, is a bump of
    // the pointer done inline; everything else goes to allocateSlow.
    static void* allocateAligned(std::size_t size, std::size_t align) {
        char* p = bump.next;
        std::size_t pad = (std::uintptr_t(0) - reinterpret_cast<std::uintptr_t>(p)) & (align - 1);
        if (p && size + align <= BLOCK_SIZE && pad + size <= static_cast<std::size_t>(bump.end - p)) {
            bump.next = p + pad + size;
            return p + pad;
        }
        return allocateSlow(size, align, true);
    }
    // Does nothing: arena memory is only given up wholesale by a rewind.
    static void deallocate(void* p, unsigned int size);
    // Bytes handed out from the current block plus the current block's index,
    // minus one, in unsigned 32-bit arithmetic (4294967295 right after a rewind).
    static unsigned int getMemoryUsage();
    // Returns to the first block, obtaining it if there is none (ZOA_file does this).
    static void rewind();
    // How many rewinds there have been. A unit keeps the count it started with,
    // so it can tell that a later unit took the arena over (its nodes are gone).
    static unsigned long long getGeneration() { return generation; }

    MemMgr& operator=(const MemMgr&) { return *this; }

    // The current block's free bytes (both null before the first block).
    struct Bump {
        char* next;  // first free byte
        char* end;   // one past the block
    };
    static Bump bump;

private:
    static unsigned long long generation;
    // typed: the request came through allocateAligned (see the choices above).
    static void* allocateSlow(std::size_t size, std::size_t align, bool typed);
};

// A stateless allocator over the arena, for containers held by nodes.
template <class T>
class MemMgr_allocator {
public:
    using value_type = T;
    using pointer = T*;
    using const_pointer = const T*;
    using reference = T&;
    using const_reference = const T&;
    using size_type = std::size_t;
    using difference_type = std::ptrdiff_t;
    using propagate_on_container_move_assignment = std::true_type;
    using is_always_equal = std::true_type;
    template <class U> struct rebind { using other = MemMgr_allocator<U>; };

    MemMgr_allocator() noexcept {}
    MemMgr_allocator(const MemMgr_allocator&) noexcept {}
    template <class U> MemMgr_allocator(const MemMgr_allocator<U>&) noexcept {}
    MemMgr_allocator& operator=(const MemMgr_allocator&) noexcept { return *this; }

    T* allocate(std::size_t n, const void* /*hint*/ = nullptr) {
        return static_cast<T*>(MemMgr::allocateAligned(n * sizeof(T), alignof(T)));
    }
    void deallocate(T* p, std::size_t n) noexcept {
        MemMgr::deallocate(p, static_cast<unsigned int>(n * sizeof(T)));
    }
    std::size_t max_size() const noexcept { return UINT_MAX; }

    template <class U> bool operator==(const MemMgr_allocator<U>&) const noexcept { return true; }
    template <class U> bool operator!=(const MemMgr_allocator<U>&) const noexcept { return false; }
};

// A string that lives in the arena: names and texts held by nodes. It is a
// std::basic_string over the arena allocator that also converts to std::string
// and compares with one, so client code can treat it as a standard string.
class String : public std::basic_string<char, std::char_traits<char>, MemMgr_allocator<char>> {
public:
    using Base = std::basic_string<char, std::char_traits<char>, MemMgr_allocator<char>>;
    using Base::Base;
    String() = default;
    String(const Base& s) : Base(s) {}
    explicit String(const std::string& s) : Base(s.data(), s.size()) {}

    operator std::string() const { return std::string(data(), size()); }

    // Equality with arena strings, standard strings and C strings.
    friend bool operator==(const String& a, const String& b) { return a.equals(b.data(), b.size()); }
    friend bool operator==(const String& a, const std::string& b) { return a.equals(b.data(), b.size()); }
    friend bool operator==(const std::string& a, const String& b) { return b.equals(a.data(), a.size()); }
    friend bool operator==(const String& a, const char* b) { return a.compare(b) == 0; }
    friend bool operator==(const char* a, const String& b) { return b.compare(a) == 0; }
    friend bool operator!=(const String& a, const String& b) { return !(a == b); }
    friend bool operator!=(const String& a, const std::string& b) { return !(a == b); }
    friend bool operator!=(const std::string& a, const String& b) { return !(a == b); }
    friend bool operator!=(const String& a, const char* b) { return !(a == b); }
    friend bool operator!=(const char* a, const String& b) { return !(a == b); }
    // Concatenation gives an ordinary std::string.
    friend std::string operator+(const String& a, const char* b) { return std::string(a) + b; }
    friend std::string operator+(const char* a, const String& b) { return a + std::string(b); }
    friend std::string operator+(const String& a, const std::string& b) { return std::string(a) + b; }
    friend std::string operator+(const std::string& a, const String& b) { return a + std::string(b); }
    friend std::string operator+(const String& a, char b) { return std::string(a) + b; }

private:
    bool equals(const char* p, std::size_t n) const { return size() == n && compare(0, n, p, n) == 0; }
};

// Containers that live in the arena.
template <class T> using ArenaList = std::list<T, MemMgr_allocator<T>>;
template <class T> using ArenaVector = std::vector<T, MemMgr_allocator<T>>;
template <class K, class V>
using ArenaMap = std::map<K, V, std::less<K>, MemMgr_allocator<std::pair<const K, V>>>;
template <class T> using ArenaSet = std::set<T, std::less<T>, MemMgr_allocator<T>>;

}  // namespace ZOA

#endif
