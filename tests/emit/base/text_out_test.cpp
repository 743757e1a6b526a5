// TextOut and TextBuffer: order of pieces, batching, flushing and numbers.
#include "dump/text_buffer.h"
#include "emit/text_out.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>

namespace {

using namespace ZOA;

TEST(TextOut, DirectOutsideBatchBufferedInsideInOrder) {
    std::ostringstream os;
    TextOut t(os);
    t << "a" << 'b';
    EXPECT_EQ(os.str(), "ab");  // no batch: each piece reaches the stream at once
    {
        TextOut::Batch outer(t);
        t << "c";
        {
            TextOut::Batch inner(t);
            t << String("d");
        }
        EXPECT_EQ(os.str(), "ab");  // the inner batch's end does not flush
        t.indent(2).writeUnsigned(7);
    }
    EXPECT_EQ(os.str(), "abcd        7");

    // Pieces larger than the buffer and many small ones keep their order.
    std::string big(100000, 'x'), expected;
    {
        TextOut::Batch batch(t);
        for (int i = 0; i < 20000; ++i) {
            t.writeUnsigned(static_cast<unsigned>(i));
            t << ',';
            expected += std::to_string(i) + ",";
            if (i == 5000) {
                t << big;
                expected += big;
            }
        }
    }
    EXPECT_EQ(os.str(), "abcd        7" + expected);
}

TEST(TextOut, NumbersIgnoreStreamFlagsAndFlushOnDestruction) {
    std::ostringstream os;
    os << std::hex << std::showpos;
    {
        TextOut t(os);
        TextOut::Batch batch(t);
        t.writeUnsigned(0).writeUnsigned(9).writeUnsigned(10).writeUnsigned(99).writeUnsigned(100) << ' ';
        t.writeUnsigned(18446744073709551615ull) << ' ';
        t.writeInt(-9223372036854775807ll - 1) << ' ';
        t.writeInt(42).indent(0).indent(17);
    }
    EXPECT_EQ(os.str(), "091099100 18446744073709551615 -9223372036854775808 42" + std::string(68, ' '));
}

TEST(TextBuffer, EveryLengthCopiedExactlyAcrossGrowth) {
    std::string source, expected;
    for (int i = 0; i < 64; ++i) source += static_cast<char>('A' + i % 50);
    TextBuffer b;
    EXPECT_TRUE(b.empty());
    for (int round = 0; round < 200; ++round) {
        for (std::size_t n = 0; n <= 40; ++n) {
            b.append(source.data() + round % 20, n);  // lengths around every inline copy boundary
            expected.append(source.data() + round % 20, n);
        }
        b.push_back('|');
        b.fill(' ', static_cast<std::size_t>(round % 5));
        expected += '|' + std::string(static_cast<std::size_t>(round % 5), ' ');
    }
    char* at = b.tail(3);
    at[0] = 'x';
    at[1] = 'y';
    b.commit(2);
    expected += "xy";
    ASSERT_EQ(b.size(), expected.size());
    EXPECT_EQ(std::string(b.data(), b.size()), expected);
    b.clear();
    b.append("z", 1);
    EXPECT_EQ(std::string(b.data(), b.size()), "z");
}

}  // namespace
