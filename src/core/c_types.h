// The C types of values and C's promotions and usual arithmetic conversions on the 32-bit target.
#ifndef ZOA_CORE_C_TYPES_H
#define ZOA_CORE_C_TYPES_H

#include <zoa/enums.h>

#include <cfloat>
#include <cmath>
#include <cstdint>

namespace ZOA::ctypes {

// The type a value has in the C text: the declared types, plus what the text
// makes of them (a constant too large for int is a long long, ...). The order
// is that of interp::CType.
enum class CT : unsigned char { SCHAR, UCHAR, INT, UINT, LLONG, ULLONG, FLOAT, DOUBLE, POINTER, VOID };

constexpr bool isInt(CT t) { return t <= CT::ULLONG; }
constexpr bool isReal(CT t) { return t == CT::FLOAT || t == CT::DOUBLE; }
constexpr bool isSigned(CT t) { return t == CT::SCHAR || t == CT::INT || t == CT::LLONG; }
constexpr bool isChar(CT t) { return t == CT::SCHAR || t == CT::UCHAR; }
constexpr bool is64(CT t) { return t == CT::LLONG || t == CT::ULLONG; }
constexpr unsigned bitsOf(CT t) {
    constexpr unsigned char w[] = {8, 8, 32, 32, 64, 64, 32, 64, 32, 0};
    return w[static_cast<int>(t)];
}
constexpr int rankOf(CT t) {
    constexpr signed char r[] = {0, 0, 1, 1, 2, 2, 0, 0, 0, 0};
    return r[static_cast<int>(t)];
}

// The C type of a declared type (POINTER is char *).
constexpr CT ctOf(DataType t) {
    constexpr CT m[] = {CT::UCHAR, CT::UINT, CT::ULLONG, CT::SCHAR, CT::INT,
                        CT::LLONG, CT::FLOAT, CT::DOUBLE, CT::POINTER, CT::VOID};
    return static_cast<unsigned>(t) < 10 ? m[t] : CT::VOID;
}

// Integer promotion: chars become int.
constexpr CT promote(CT t) { return isChar(t) ? CT::INT : t; }

// The usual arithmetic conversions of two promoted operand types.
constexpr CT common(CT a, CT b) {
    if (a == CT::DOUBLE || b == CT::DOUBLE) return CT::DOUBLE;
    if (a == CT::FLOAT || b == CT::FLOAT) return CT::FLOAT;
    if (a == b) return a;
    if (rankOf(a) == rankOf(b)) return isSigned(a) ? b : a;  // the unsigned one
    CT hi = rankOf(a) > rankOf(b) ? a : b;
    CT lo = rankOf(a) > rankOf(b) ? b : a;
    if (!isSigned(hi)) return hi;
    if (bitsOf(hi) > bitsOf(lo)) return hi;  // the wider signed type holds every value
    return hi == CT::LLONG ? CT::ULLONG : CT::UINT;
}

// Cuts v to the width of t and extends it back by t's signedness.
constexpr std::uint64_t fit(CT t, std::uint64_t v) {
    unsigned w = bitsOf(t);
    if (w == 64 || w == 0) return v;
    std::uint64_t mask = (std::uint64_t{1} << w) - 1;
    v &= mask;
    if (isSigned(t) && ((v >> (w - 1)) & 1)) v |= ~mask;
    return v;
}

// x rounded to t (FLOAT or DOUBLE) as a store to memory rounds it.
inline double roundTo(CT t, long double x) {
    if (t != CT::FLOAT) return static_cast<double>(x);
    if (!(std::fabs(x) <= FLT_MAX)) {
        // Beyond the float range: round to FLT_MAX or to infinity, as the FPU does.
        if (std::isnan(x)) return static_cast<double>(x);
        const long double halfwayToInfinity = 0x1.ffffffp127L;
        double r = std::fabs(x) < halfwayToInfinity ? FLT_MAX : HUGE_VAL;
        return std::signbit(x) ? -r : r;
    }
    return static_cast<double>(static_cast<float>(x));
}

// A constant as the sound C text writes it: with its own type (ULL, the most
// negative int as an expression, floats to the bit), so the integer bits are
// cut to that type and a FLOAT is rounded to float. POINTER and VOID
// constants have no value here (bits and real 0).
struct Constant {
    CT type;
    std::uint64_t bits = 0;
    double real = 0;
};
inline Constant soundConstant(DataType t, long long i, double f) {
    CT ct = ctOf(t);
    if (isReal(ct)) return {ct, 0, roundTo(ct, f)};
    if (isInt(ct)) return {ct, fit(ct, static_cast<std::uint64_t>(i)), 0};
    return {ct, 0, 0};
}

}  // namespace ZOA::ctypes

#endif
