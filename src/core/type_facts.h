// What each DataType is on the 32-bit target: one table, read by every output.
#ifndef ZOA_CORE_TYPE_FACTS_H
#define ZOA_CORE_TYPE_FACTS_H

#include <zoa/enums.h>

namespace ZOA {

struct TypeFacts {
    unsigned int size;  // bytes of a value (ExprBase::sizeOfDataType)
    bool isInteger;     // CHAR_U .. INT64_S
    bool isSigned;      // has a sign: the signed integers, FLOAT and DOUBLE
    bool isFloating;    // FLOAT, DOUBLE
};

// Indexed by DataType; the last row stands for values outside the enumeration.
inline constexpr TypeFacts TYPE_FACTS[DATA_TYPE_COUNT + 1] = {
    // size, integer, signed, floating
    {1, true, false, false},   // CHAR_U
    {4, true, false, false},   // INT_U
    {8, true, false, false},   // INT64_U
    {1, true, true, false},    // CHAR_S
    {4, true, true, false},    // INT_S
    {8, true, true, false},    // INT64_S
    {4, false, true, true},    // FLOAT
    {8, false, true, true},    // DOUBLE
    {4, false, false, false},  // POINTER
    {0, false, false, false},  // VOID
    {0, false, false, false},  // anything outside the enumeration
};
static_assert(sizeof(TYPE_FACTS) / sizeof(*TYPE_FACTS) == DATA_TYPE_COUNT + 1, "one row per DataType");

// The facts of t; values outside the enumeration get VOID's (size 0, nothing true).
constexpr const TypeFacts& typeFacts(DataType t) {
    unsigned int i = static_cast<unsigned int>(t);
    return TYPE_FACTS[i < DATA_TYPE_COUNT ? i : DATA_TYPE_COUNT];
}

constexpr unsigned int sizeOfType(DataType t) { return typeFacts(t).size; }
constexpr bool isIntegerType(DataType t) { return typeFacts(t).isInteger; }
constexpr bool isFloatingType(DataType t) { return typeFacts(t).isFloating; }
constexpr bool isSignedType(DataType t) { return typeFacts(t).isSigned; }
constexpr bool isByteType(DataType t) { return isIntegerType(t) && sizeOfType(t) == 1; }
constexpr bool isInt32Type(DataType t) { return isIntegerType(t) && sizeOfType(t) == 4; }
constexpr bool isInt64Type(DataType t) { return isIntegerType(t) && sizeOfType(t) == 8; }

}  // namespace ZOA

#endif
