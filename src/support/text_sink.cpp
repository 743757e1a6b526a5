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
    if (depth != 0 && capacity - used >= MAX_DECIMAL_CHARS) {
        used += writeDecimal(buf.get() + used, v);
        return *this;
    }
    char digits[MAX_DECIMAL_CHARS];
    return write(digits, writeDecimal(digits, v));
}

void TextSink::overflow(const char* p, std::size_t n) {
    if (!held) {
        flush();
        put(p, n);
        return;
    }
    // What comes before the held text can go; then grow if still short.
    if (holdStart > 0) {
        put(buf.get(), holdStart);
        std::memmove(buf.get(), buf.get() + holdStart, used - holdStart);
        used -= holdStart;
        holdStart = 0;
    }
    if (n > capacity - used) {
        std::size_t grown = capacity * 2;
        while (n > grown - used) grown *= 2;
        std::unique_ptr<char[]> bigger(new char[grown]);
        std::memcpy(bigger.get(), buf.get(), used);
        buf = std::move(bigger);
        capacity = grown;
    }
    std::memcpy(buf.get() + used, p, n);
    used += n;
}

void TextSink::moveToFront(std::size_t at, std::size_t tail) {
    std::size_t n = used - tail;
    if (n == 0 || at == tail) return;
    if (n > scratchSize) {
        scratch.reset(new char[n]);
        scratchSize = n;
    }
    std::memcpy(scratch.get(), buf.get() + tail, n);
    std::memmove(buf.get() + at + n, buf.get() + at, tail - at);
    std::memcpy(buf.get() + at, scratch.get(), n);
}

template TextSink& TextSink::writeNumber(unsigned long long);
template TextSink& TextSink::writeNumber(long long);

}  // namespace ZOA
