// The arena: bumping, block reuse after a rewind, usage figures, large requests, alignment,
// and trees that take no memory from the heap.
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <list>
#include <new>
#include <vector>

namespace {
bool countingNew = false;
long newCalls = 0;

void* countedNew(std::size_t n) {
    if (countingNew) ++newCalls;
    if (void* p = std::malloc(n ? n : 1)) return p;
    throw std::bad_alloc();
}
}  // namespace

void* operator new(std::size_t n) { return countedNew(n); }
void operator delete(void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }

namespace ZOA {
namespace {

constexpr unsigned int BLOCK = MemMgr::BLOCK_SIZE;

char* take(unsigned int n) { return static_cast<char*>(MemMgr::allocate(n)); }

bool aligned(const void* p, std::size_t a) { return reinterpret_cast<std::uintptr_t>(p) % a == 0; }

// Leaves the bump pointer `off` bytes past a 64-byte boundary, the worst place for what follows.
void skewTo(unsigned int off) {
    std::uintptr_t at = reinterpret_cast<std::uintptr_t>(take(0));
    take(static_cast<unsigned int>((64 - at % 64) % 64 + off));
}

TEST(MemMgr, BumpsWithoutRoundingAndReportsUsage) {
    ZOA_file unit(true, false);
    EXPECT_EQ(MemMgr::getMemoryUsage(), 4294967295u);
    EXPECT_EQ(unit.getMemoryUsage(), 4294967295u);
    char* a = take(3);
    char* b = take(5);
    EXPECT_EQ(b - a, 3);
    EXPECT_EQ(MemMgr::getMemoryUsage(), 7u);
    MemMgr::deallocate(b, 5);
    EXPECT_EQ(take(0), b + 5);
    CONST* k = new CONST(1);
    char* after = take(0);
    delete k;  // runs the destructor, gives nothing back
    EXPECT_EQ(take(0), after);
}

TEST(MemMgr, FillsBlocksExactlyAndReusesThemAfterRewind) {
    ZOA_file first(true, false);
    char* start = take(BLOCK - 10);
    EXPECT_EQ(take(10), start + BLOCK - 10) << "a request filling the rest stays in the block";
    EXPECT_EQ(MemMgr::getMemoryUsage(), BLOCK - 1);
    char* second = take(1);
    take(5);
    EXPECT_EQ(MemMgr::getMemoryUsage(), 6u) << "exact byte count while the second block is current";
    take(BLOCK - 6);
    char* third = take(7);

    ZOA_file next(false, false);
    EXPECT_EQ(MemMgr::getMemoryUsage(), 4294967295u);
    EXPECT_EQ(take(1), start);
    EXPECT_EQ(take(BLOCK), second) << "the rest of the first block is abandoned, the second reused";
    EXPECT_EQ(take(1), third);
    EXPECT_EQ(MemMgr::getMemoryUsage(), 2u);
}

TEST(MemMgr, ServesOversizeRequestsFromADedicatedBlock) {
    ZOA_file unit(true, false);
    char* before = take(4);
    std::memset(take(BLOCK + 100), 0xab, BLOCK + 100);
    double* many = MemMgr_allocator<double>().allocate(BLOCK / sizeof(double));
    many[BLOCK / sizeof(double) - 1] = 1.0;
    EXPECT_TRUE(aligned(many, alignof(double)));
    EXPECT_EQ(take(0), before + 4) << "the bump pointer is not disturbed";
    EXPECT_EQ(MemMgr::getMemoryUsage(), 3u);
}

struct Wide : TreeAnnotation { double d = 2.5; };
struct Ext : TreeAnnotation { long double x = 1.25L; };
struct alignas(64) Line : TreeAnnotation { char bytes[64] = {}; };

TEST(MemMgr, TypedAllocationsAreAligned) {
    ZOA_file unit(true, false);
    skewTo(3);
    CONST* k = new CONST(-5LL);
    skewTo(1);
    Wide* w = new Wide;
    skewTo(8);
    Ext* e = new Ext;
    skewTo(8);
    Line* l = new Line;
    skewTo(5);
    ArenaVector<double> v(3, 0.5);
    EXPECT_TRUE(aligned(k, alignof(CONST)) && aligned(w, alignof(Wide)) && aligned(e, alignof(Ext)) &&
                aligned(l, 64) && aligned(v.data(), alignof(double)));
    EXPECT_EQ(k->getIValue() + w->d + static_cast<double>(e->x) + v[2], -0.75);
    EXPECT_EQ(MemMgr_allocator<long long>().max_size(), 4294967295u);
}

TEST(MemMgr, BuildingASubprogramAllocatesNothingOnTheHeap) {
    ZOA_file unit(true, false);
    // The client's own containers are the client's allocations: made beforehand.
    std::vector<ExprBase*> args(3, nullptr);
    std::list<ExprBase*> values(2, nullptr);
    const char* longText = "a text far longer than any short-string buffer";

    countingNew = true;
    newCalls = 0;
    SUBPROG* sp = new SUBPROG(INT_S, "a_function_with_a_rather_long_name");
    TEMP* a = sp->getArgTemp(CHAR_U);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* buf = sp->getTemp(POINTER, 64, IN_USE_TEMP);
    LABEL* loop = sp->createNewLabel(REGULAR_LABEL);
    values.front() = new CONST(1.5);
    values.back() = new CONST(2.5);
    args[0] = new BINOP(INT_S, PLUS, a, t);  // widens a with a new UNOP
    args[1] = sp->getName(STRINGLIT_REF, longText);
    args[2] = new MEM(DOUBLE, sp->getName(values));
    CALL* call = new CALL(INT_S, longText, args);
    sp->getStartLabel()->addStmt(new MOVE(new MEM(INT_S, buf), call));
    loop->addStmt(new SEQ(new EXP(sp->getName(new CONST(42))), nullptr));
    loop->addStmt(new CJUMP(LT, t, new CONST(10), loop, sp->getReturnLabel()));
    loop->addStmt(new JUMP(static_cast<ExprBase*>(sp->getName(loop))));
    sp->freeDeadLabel(sp->createNewLabel(REGULAR_LABEL));
    sp->freeAllTemps();
    countingNew = false;

    EXPECT_EQ(newCalls, 0);
    EXPECT_EQ(call->getArgs().size(), 3u);
    countingNew = true;
    std::vector<int> probe(1);  // the counter does see heap allocations
    countingNew = false;
    EXPECT_EQ(newCalls, 1);
}

}  // namespace
}  // namespace ZOA
