// The arena used before any unit exists: it primes itself on first use.
#include <zoa/memmgr.h>

#include <gtest/gtest.h>

#include <cstring>

namespace ZOA {
namespace {

// Runs in a process of its own, so no unit has touched the arena yet.
TEST(MemMgrPriming, FirstUseBeforeAnyUnitPrimesAndKeepsLargeBlocks) {
    EXPECT_EQ(MemMgr::getMemoryUsage(), 4294967295u);
    char* big = static_cast<char*>(MemMgr::allocate(MemMgr::BLOCK_SIZE * 2));
    char* small = static_cast<char*>(MemMgr::allocate(10));
    EXPECT_EQ(static_cast<char*>(MemMgr::allocate(0)), small + 10);
    EXPECT_EQ(MemMgr::getMemoryUsage(), 9u);
    std::memset(big, 1, MemMgr::BLOCK_SIZE * 2);  // still ours after priming
    EXPECT_EQ(big[MemMgr::BLOCK_SIZE * 2 - 1], 1);
}

}  // namespace
}  // namespace ZOA
