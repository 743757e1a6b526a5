// TextSink: deep indentation and numbers beyond the inline cases.
#include "support/text_sink.h"

#include "support/decimal.h"

namespace ZOA {

TextSink& TextSink::writeBlanks(unsigned int n) {
    static const char blanks[] = "                                                                ";
    constexpr unsigned int perChunk = (sizeof(blanks) - 1) / 4;
    while (n > perChunk) {
        write(blanks, perChunk * 4);
        n -= perChunk;
    }
    if (n) write(blanks, n * 4);
    return *this;
}

template <class T> TextSink& TextSink::writeNumber(T v) {
    if (depth != 0 && CAPACITY - used >= MAX_DECIMAL_CHARS) {
        used += writeDecimal(buf.get() + used, v);
        return *this;
    }
    char digits[MAX_DECIMAL_CHARS];
    return write(digits, writeDecimal(digits, v));
}

template TextSink& TextSink::writeNumber(unsigned long long);
template TextSink& TextSink::writeNumber(long long);

}  // namespace ZOA
