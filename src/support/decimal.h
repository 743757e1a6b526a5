// Plain decimal numbers for the outputs: the bytes printf's %d/%u/%lld/%llu give, with no locale.
#ifndef ZOA_SUPPORT_DECIMAL_H
#define ZOA_SUPPORT_DECIMAL_H

#include <charconv>
#include <cstddef>
#include <cstdint>
#include <type_traits>

namespace ZOA {

// Room that writeDecimal needs for any 64-bit value, sign included.
constexpr std::size_t MAX_DECIMAL_CHARS = 24;

// Writes v in decimal at p (MAX_DECIMAL_CHARS of room) and returns the length.
// Node identities are addresses of up to 15 digits: the low eight digits go in
// 32-bit pairs, about twice as fast as to_chars on such values.
inline std::size_t writeDecimal(char* p, unsigned long long v) {
    if (v < 100000000ull) {
        auto small = static_cast<std::uint32_t>(v);
        return static_cast<std::size_t>(std::to_chars(p, p + 8, small).ptr - p);  // under 10^8: 8 digits
    }
    std::size_t n = writeDecimal(p, v / 100000000ull);
    auto low = static_cast<std::uint32_t>(v % 100000000ull);
    static constexpr char pairs[] =
        "00010203040506070809101112131415161718192021222324252627282930313233343536373839"
        "40414243444546474849505152535455565758596061626364656667686970717273747576777879"
        "8081828384858687888990919293949596979899";
    char* d = p + n + 8;
    for (int i = 0; i < 4; ++i) {
        std::uint32_t two = low % 100;
        low /= 100;
        d -= 2;
        d[0] = pairs[two * 2];
        d[1] = pairs[two * 2 + 1];
    }
    return n + 8;
}

inline std::size_t writeDecimal(char* p, long long v) {
    if (v >= 0) return writeDecimal(p, static_cast<unsigned long long>(v));
    *p = '-';
    // Negated as unsigned, so that the smallest value has no overflow.
    return 1 + writeDecimal(p + 1, 0ull - static_cast<unsigned long long>(v));
}

// Either overload for any integer type.
template <class T> std::size_t writeDecimalOf(char* p, T v) {
    static_assert(std::is_integral_v<T>, "an integer");
    if constexpr (std::is_signed_v<T>) return writeDecimal(p, static_cast<long long>(v));
    else return writeDecimal(p, static_cast<unsigned long long>(v));
}

// Appends v in decimal to s (any string with append(const char*, size_t)).
template <class S, class T> void appendDecimal(S& s, T v) {
    char digits[MAX_DECIMAL_CHARS];
    s.append(digits, writeDecimalOf(digits, v));
}

}  // namespace ZOA

#endif
