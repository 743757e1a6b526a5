// The outputs' shared plumbing: TextSink, decimal numbers, PointerSet and PointerMap.
#include "support/decimal.h"
#include "support/pointer_table.h"
#include "support/text_sink.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

namespace {

using namespace ZOA;

TEST(TextSink, DirectOutsideBatchBufferedInsideInOrder) {
    std::ostringstream os;
    TextSink t(os);
    t << "a" << 'b';
    EXPECT_EQ(os.str(), "ab");  // no batch: each piece reaches the stream at once
    {
        TextSink::Batch outer(t);
        t << "c";
        {
            TextSink::Batch inner(t);
            t << String("d");
        }
        EXPECT_EQ(os.str(), "ab");  // the inner batch's end does not flush
        t.indent(2).writeUnsigned(7);
    }
    EXPECT_EQ(os.str(), "abcd        7");

    // Pieces larger than the buffer and many small ones keep their order.
    std::string big(100000, 'x'), expected;
    {
        TextSink::Batch batch(t);
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

TEST(TextSink, NumbersIgnoreStreamFlagsAndFlushOnDestruction) {
    std::ostringstream os;
    os << std::hex << std::showpos;
    {
        TextSink t(os);
        TextSink::Batch batch(t);
        t.writeUnsigned(0).writeUnsigned(9).writeUnsigned(10).writeUnsigned(99).writeUnsigned(100) << ' ';
        t.writeUnsigned(18446744073709551615ull) << ' ';
        t.writeInt(-9223372036854775807ll - 1) << ' ';
        t.writeInt(42).indent(0).indent(17);
    }
    EXPECT_EQ(os.str(), "091099100 18446744073709551615 -9223372036854775808 42" + std::string(68, ' '));
}

TEST(TextSink, EveryLengthCopiedExactlyAcrossTheBufferEnd) {
    std::string source, expected;
    for (int i = 0; i < 64; ++i) source += static_cast<char>('A' + i % 50);
    std::ostringstream os;
    {
        TextSink t(os);
        TextSink::Batch batch(t);
        // About 2.5 buffers: lengths around every inline copy boundary meet the end.
        for (int round = 0; round < 4000; ++round) {
            std::size_t n = static_cast<std::size_t>(round % 41);
            t.write(source.data() + round % 20, n) << '|';
            t.writeUnsigned(static_cast<unsigned long long>(round) * 100000007ull);
            expected.append(source.data() + round % 20, n);
            expected += '|' + std::to_string(static_cast<unsigned long long>(round) * 100000007ull);
        }
    }
    EXPECT_EQ(os.str(), expected);
}

// A Hold keeps what follows it in memory however long it grows, while what
// came before may go out; a later piece moves in front of the held text.
TEST(TextSink, HoldGrowsPastTheBufferAndMovesATailToItsFront) {
    std::ostringstream os;
    std::string prefix(20000, 'p'), body, tail = "TAIL";
    for (int i = 0; i < 30000; ++i) body += std::to_string(i % 97) + ' ';
    {
        TextSink t(os);
        TextSink::Batch batch(t);
        t << prefix;
        TextSink::Hold hold(t);
        t << "junk";
        hold.truncate(0);
        for (int i = 0; i < 30000; ++i) t.writeUnsigned(static_cast<unsigned long long>(i % 97)) << ' ';
        EXPECT_EQ(hold.length(), body.size());
        std::size_t end = hold.length();
        t << tail;
        hold.moveToFront(0, end);
        EXPECT_LT(os.str().size(), prefix.size() + 1);  // only the prefix may be out yet
    }
    EXPECT_EQ(os.str(), prefix + tail + body);
}

TEST(Decimal, MatchesPrintfAroundEveryBoundary) {
    char buf[MAX_DECIMAL_CHARS];
    std::vector<unsigned long long> values = {0, 9, 10, 99999999, 100000000, 100000001, 18446744073709551615ull};
    for (unsigned long long p = 1; p < 10000000000000000000ull; p *= 10) {
        values.push_back(p - 1);
        values.push_back(p);
    }
    for (unsigned long long v : values) {
        EXPECT_EQ(std::string(buf, writeDecimal(buf, v)), std::to_string(v));
        long long s = static_cast<long long>(v);
        EXPECT_EQ(std::string(buf, writeDecimal(buf, s)), std::to_string(s));
    }
    std::string appended;
    appendDecimal(appended, 7u);
    appendDecimal(appended, -3);
    EXPECT_EQ(appended, "7-3");
}

TEST(PointerTable, SetAndMapAcrossGrowthAndClear) {
    std::vector<int> objects(1000);
    PointerSet<const int*> set;
    PointerMap<const int*, int> map;
    for (int round = 0; round < 2; ++round) {
        for (int i = 0; i < 1000; ++i) {
            EXPECT_TRUE(set.insert(&objects[i]));
            map.insertIfAbsent(&objects[i], i);
        }
        for (int i = 0; i < 1000; i += 2) {
            EXPECT_FALSE(set.insert(&objects[i]));
            map.insertIfAbsent(&objects[i], -1);  // kept: already a key
            map.assign(&objects[i + 1], i + 1000);
        }
        EXPECT_EQ(set.size(), 1000u);
        ASSERT_EQ(map.size(), 1000u);
        for (int i = 0; i < 1000; ++i) {
            ASSERT_NE(map.find(&objects[i]), nullptr);
            EXPECT_EQ(*map.find(&objects[i]), i % 2 ? i - 1 + 1000 : i);
        }
        int seen = 0;
        map.forEach([&](const int* key, int) {
            EXPECT_TRUE(map.contains(key));
            ++seen;
        });
        EXPECT_EQ(seen, 1000);
        int outside = 0;
        EXPECT_FALSE(set.contains(&outside));
        EXPECT_EQ(map.find(&outside), nullptr);
        set.clear();
        map.clear();
        EXPECT_EQ(set.size(), 0u);
        EXPECT_FALSE(map.contains(&objects[0]));
    }
}

}  // namespace
