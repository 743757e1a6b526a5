// The interpreter's value rules: C's conversions, promotions and arithmetic on the 32-bit target.
#ifndef ZOA_INTERP_RULES_H
#define ZOA_INTERP_RULES_H

#include "core/c_types.h"

#include <zoa/interp.h>

#include <cstdint>
#include <string>

namespace ZOA::interp {

__extension__ typedef __int128 i128;

// How a run stops: thrown inside the machine, caught at Machine::call.
struct Stop {
    Status status;
    std::string message;
};

[[noreturn]] void stop(Status s, const std::string& why);

// CType is ctypes::CT (core/c_types.h) under its public name.
inline bool isInt(CType t) { return ctypes::isInt(static_cast<ctypes::CT>(t)); }
inline bool isReal(CType t) { return ctypes::isReal(static_cast<ctypes::CT>(t)); }
inline bool isSigned(CType t) { return ctypes::isSigned(static_cast<ctypes::CT>(t)); }
unsigned bitsOf(CType t);
// Integer conversion rank: char 0, int 1, long long 2.
int rank(CType t);
inline unsigned sizeOfC(CType t) { return bitsOf(t) / 8; }
// Cuts v to the width of t and extends it back by t's signedness.
std::uint64_t fit(CType t, std::uint64_t v);
double roundTo(CType t, long double x);
// The C spelling of t, for messages.
std::string ctypeName(CType t);

// C's value rules. With `strict`, what C leaves undefined stops the run
// (Options::strictC); without it the tree's own meaning applies.
struct Rules {
    bool strict = false;

    // As C assignment and casts convert; a POINTER result points at `scale`-byte items.
    Value convert(const Value& v, CType to, unsigned scale = 1) const;
    static Value promote(const Value& v);
    // The usual arithmetic conversions.
    static CType common(CType a, CType b);
    static bool truth(const Value& v);
    // Integer arithmetic in type t with wrap-around.
    Value intResult(CType t, i128 exact) const;
    static i128 wide(const Value& v);
    Value realResult(CType t, long double exact) const;
    Value binop(BinopKind op, Value a, Value b) const;
    Value negate(const Value& v) const;
};

}  // namespace ZOA::interp

#endif
