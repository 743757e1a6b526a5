// The bump arena: blocks of 0x100000 bytes from malloc, rewound per translation unit.
#include <zoa/memmgr.h>

#include <cstdint>
#include <cstdlib>
#include <iterator>
#include <list>
#include <new>

namespace ZOA {
namespace {

struct Arena {
    std::list<char*> memBlkPtrs;                  // every block, in the order obtained
    std::list<char*>::iterator currentMemBlkPtr;  // the block being filled
    std::list<void*> oversized;                   // dedicated blocks of large requests
};

// The current block's free bytes, at namespace scope (zero-initialised, no
// guard) so that the fast path is a compare and an add.
struct Bump {
    char* next;  // first free byte of the current block
    char* end;   // one past the current block
};
Bump bump = {nullptr, nullptr};

// Never destroyed: blocks stay reachable (and are never freed) until the process ends.
Arena& arena() {
    static Arena* a = new Arena;
    return *a;
}

char* obtainBlock(std::size_t size) {
    void* p = std::malloc(size);
    if (!p) throw std::bad_alloc();
    return static_cast<char*>(p);
}

void enterBlock(Arena& a) {
    bump.next = *a.currentMemBlkPtr;
    bump.end = bump.next + MemMgr::BLOCK_SIZE;
}

// Moves to the next block (reusing one obtained earlier) and returns its start.
char* advanceBlock(Arena& a) {
    if (a.memBlkPtrs.empty()) {
        MemMgr::rewind();
        return bump.next;
    }
    ++a.currentMemBlkPtr;
    if (a.currentMemBlkPtr == a.memBlkPtrs.end()) {
        a.memBlkPtrs.push_back(obtainBlock(MemMgr::BLOCK_SIZE));
        a.currentMemBlkPtr = std::prev(a.memBlkPtrs.end());
    }
    enterBlock(a);
    return bump.next;
}

void* allocateOversized(Arena& a, std::size_t size) {
    a.oversized.push_back(nullptr);  // reserve the list cell first: no leak if malloc throws
    void* p = obtainBlock(size);
    a.oversized.back() = p;
    return p;
}

}  // namespace

void MemMgr::rewind() {
    Arena& a = arena();
    if (a.memBlkPtrs.empty()) a.memBlkPtrs.push_back(obtainBlock(BLOCK_SIZE));
    for (void* p : a.oversized) std::free(p);
    a.oversized.clear();
    a.currentMemBlkPtr = a.memBlkPtrs.begin();
    enterBlock(a);
}

namespace {

// Slow path: a fresh block, an oversized request, or the arena's first use.
void* allocateSlow(std::size_t size, std::size_t align) {
    Arena& a = arena();
    if (size > MemMgr::BLOCK_SIZE) return allocateOversized(a, size);
    if (bump.next) {
        std::size_t pad = (0 - reinterpret_cast<std::uintptr_t>(bump.next)) & (align - 1);
        if (static_cast<std::size_t>(bump.end - bump.next) >= pad + size) {
            char* p = bump.next + pad;
            bump.next = p + size;
            return p;
        }
    }
    // Block starts come from malloc and are aligned for every fundamental type.
    char* p = advanceBlock(a);
    bump.next = p + size;
    return p;
}

}  // namespace

void* MemMgr::allocate(unsigned int size) {
    char* p = bump.next;
    if (p && size <= static_cast<std::size_t>(bump.end - p)) {
        bump.next = p + size;
        return p;
    }
    return allocateSlow(size, 1);
}

void* MemMgr::allocateAligned(std::size_t size, std::size_t align) {
    char* p = bump.next;
    std::size_t pad = (0 - reinterpret_cast<std::uintptr_t>(p)) & (align - 1);
    if (p && size <= BLOCK_SIZE && pad + size <= static_cast<std::size_t>(bump.end - p)) {
        p += pad;
        bump.next = p + size;
        return p;
    }
    return allocateSlow(size, align);
}

void MemMgr::deallocate(void*, unsigned int) {}

unsigned int MemMgr::getMemoryUsage() {
    Arena& a = arena();
    if (a.memBlkPtrs.empty()) return 0u - 1u;
    unsigned int used = static_cast<unsigned int>(bump.next - *a.currentMemBlkPtr);
    unsigned int index = static_cast<unsigned int>(std::distance(a.memBlkPtrs.begin(), a.currentMemBlkPtr));
    return used + index - 1u;
}

}  // namespace ZOA
