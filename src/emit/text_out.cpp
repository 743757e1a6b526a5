// TextOut: indentation and decimal numbers written into the buffer.
#include "emit/text_out.h"

#include <charconv>

namespace ZOA {

TextOut& TextOut::writeBlanks(unsigned int n) {
    static const char blanks[] = "                                                                ";
    constexpr unsigned int perChunk = (sizeof(blanks) - 1) / 4;
    while (n > perChunk) {
        write(blanks, perChunk * 4);
        n -= perChunk;
    }
    if (n) write(blanks, n * 4);
    return *this;
}

TextOut& TextOut::writeDecimal(unsigned long long v) {
    char digits[24];
    auto r = std::to_chars(digits, digits + sizeof digits, v);
    return write(digits, static_cast<std::size_t>(r.ptr - digits));
}

TextOut& TextOut::writeInt(long long v) {
    char digits[24];
    auto r = std::to_chars(digits, digits + sizeof digits, v);
    return write(digits, static_cast<std::size_t>(r.ptr - digits));
}

}  // namespace ZOA
