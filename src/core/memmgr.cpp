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

// Short name for the bump pointer the inline fast path works on.
MemMgr::Bump& bump = MemMgr::bump;

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

// Obtains the first block and makes it current; dedicated blocks stay as they are.
void prime(Arena& a) {
    a.memBlkPtrs.push_back(obtainBlock(MemMgr::BLOCK_SIZE));
    a.currentMemBlkPtr = a.memBlkPtrs.begin();
    enterBlock(a);
}

// Moves to the next block (reusing one obtained earlier) and returns its start.
char* advanceBlock(Arena& a) {
    if (a.memBlkPtrs.empty()) {
        // First use before any unit: a rewind here would free dedicated blocks still in use.
        prime(a);
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

std::size_t padding(const char* at, std::size_t align) {
    return (0 - reinterpret_cast<std::uintptr_t>(at)) & (align - 1);
}

// A block of its own, released at the next rewind, holding size bytes at the alignment asked.
void* allocateOversized(Arena& a, std::size_t size, std::size_t align = 1) {
    a.oversized.push_back(nullptr);  // reserve the list cell first: no leak if malloc throws
    char* p = obtainBlock(size + align - 1);
    a.oversized.back() = p;
    return p + padding(p, align);
}

}  // namespace

unsigned long long MemMgr::generation = 0;

void MemMgr::rewind() {
    Arena& a = arena();
    ++generation;
    for (void* p : a.oversized) std::free(p);
    a.oversized.clear();
    if (a.memBlkPtrs.empty()) {
        prime(a);
        return;
    }
    a.currentMemBlkPtr = a.memBlkPtrs.begin();
    enterBlock(a);
}

MemMgr::Bump MemMgr::bump = {nullptr, nullptr};

// A fresh block, an oversized request, or the arena's first use.
void* MemMgr::allocateSlow(std::size_t size, std::size_t align, bool typed) {
    Arena& a = arena();
    // Typed requests leave room for their alignment when judged oversized.
    if ((typed ? size + align : size) > BLOCK_SIZE) return allocateOversized(a, size, align);
    if (!bump.next || static_cast<std::size_t>(bump.end - bump.next) < padding(bump.next, align) + size)
        advanceBlock(a);
    char* p = bump.next + padding(bump.next, align);
    bump.next = p + size;
    return p;
}

void* MemMgr::allocate(unsigned int size) {
    char* p = bump.next;
    if (p && size <= static_cast<std::size_t>(bump.end - p)) {
        bump.next = p + size;
        return p;
    }
    return allocateSlow(size, 1, false);
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
