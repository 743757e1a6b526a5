// The arena: bumping, block reuse after a rewind, usage figures, alignment of typed allocations.
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <cstdint>

namespace ZOA {
namespace {

TEST(MemMgr, BumpsWithoutRoundingAndReportsUsage) {
    ZOA_file unit(true, false);
    EXPECT_EQ(MemMgr::getMemoryUsage(), 4294967295u);
    EXPECT_EQ(unit.getMemoryUsage(), 4294967295u);
    char* a = static_cast<char*>(MemMgr::allocate(3));
    char* b = static_cast<char*>(MemMgr::allocate(5));
    EXPECT_EQ(b - a, 3);
    EXPECT_EQ(MemMgr::getMemoryUsage(), 7u);
    MemMgr::deallocate(b, 5);
    EXPECT_EQ(static_cast<char*>(MemMgr::allocate(0)), b + 5);
    char* c = static_cast<char*>(MemMgr::allocate(0));
    EXPECT_EQ(c, b + 5);
}

}  // namespace
}  // namespace ZOA
