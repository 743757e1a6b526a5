// What the operators are: the relations and what each conversion converts to.
#ifndef ZOA_CORE_OP_FACTS_H
#define ZOA_CORE_OP_FACTS_H

#include <zoa/enums.h>

namespace ZOA {

// The six relations, EQ to GE: the only values a CJUMP compares with, and the
// BINOP operators that yield a truth value.
constexpr BinopKind RELATIONS[] = {EQ, NE, LT, LE, GT, GE};
constexpr bool isRelation(BinopKind op) { return op >= EQ && op <= GE; }
// The relation that holds exactly when r does not (CJUMP::notRel); MAX_BINOP
// for anything else.
constexpr BinopKind negatedRelation(BinopKind r) {
    switch (r) {
    case EQ: return NE;
    case NE: return EQ;
    case LT: return GE;
    case LE: return GT;
    case GT: return LE;
    case GE: return LT;
    default: return MAX_BINOP;
    }
}
// The relation that holds for (b, a) exactly when r holds for (a, b).
constexpr BinopKind swappedRelation(BinopKind r) {
    switch (r) {
    case EQ: return EQ;
    case NE: return NE;
    case LT: return GT;
    case LE: return GE;
    case GT: return LT;
    case GE: return LE;
    default: return MAX_BINOP;
    }
}

// What a conversion UNOP converts its operand to, as the C text writes it:
// either a cast to a fixed type (`to`), or no cast at all, in which case the
// operand is converted to the UNOP's own type by the assignment or operation
// around it. CONV23 casts to a pointer to int, not to char.
struct ConversionFacts {
    bool isConversion;  // CONV4 .. CONV26
    bool hasCast;       // the C text writes a cast
    DataType to;        // the cast's type when hasCast (POINTER for both pointer casts)
    bool toIntPointer;  // CONV23: the pointer points at 4-byte ints
};

namespace detail {
constexpr ConversionFacts NOT_A_CONVERSION = {false, false, VOID, false};
constexpr ConversionFacts BARE = {true, false, VOID, false};
constexpr ConversionFacts castTo(DataType t) { return {true, true, t, false}; }
}  // namespace detail

// Indexed by UnopKind; the last row stands for values outside the enumeration.
inline constexpr ConversionFacts CONVERSION_FACTS[UNOP_KIND_COUNT + 1] = {
    detail::NOT_A_CONVERSION,                 // ABS
    detail::NOT_A_CONVERSION,                 // NEG
    detail::NOT_A_CONVERSION,                 // NOT
    detail::NOT_A_CONVERSION,                 // BITWISE_NOT
    detail::castTo(INT_S),                    // CONV4
    detail::BARE,                             // CONV5
    detail::castTo(CHAR_U),                   // CONV6
    detail::castTo(CHAR_S),                   // CONV7
    detail::BARE,                             // CONV8
    detail::BARE,                             // CONV9
    detail::BARE,                             // CONV10
    detail::BARE,                             // CONV11
    detail::BARE,                             // CONV12
    detail::castTo(FLOAT),                    // CONV13
    detail::castTo(DOUBLE),                   // CONV14
    detail::castTo(CHAR_U),                   // CONV15
    detail::castTo(CHAR_S),                   // CONV16
    detail::castTo(INT_U),                    // CONV17
    detail::castTo(INT_S),                    // CONV18
    detail::BARE,                             // CONV19
    detail::castTo(INT_S),                    // CONV20
    detail::castTo(INT_U),                    // CONV21
    detail::castTo(POINTER),                  // CONV22: char *
    {true, true, POINTER, true},              // CONV23: int *
    detail::castTo(INT64_S),                  // CONV24
    detail::castTo(CHAR_S),                   // CONV25
    detail::castTo(CHAR_U),                   // CONV26
    detail::NOT_A_CONVERSION,                 // anything outside the enumeration
};
static_assert(sizeof(CONVERSION_FACTS) / sizeof(*CONVERSION_FACTS) == UNOP_KIND_COUNT + 1, "one row per UnopKind");

constexpr const ConversionFacts& conversionFacts(UnopKind op) {
    unsigned int i = static_cast<unsigned int>(op);
    return CONVERSION_FACTS[i < UNOP_KIND_COUNT ? i : UNOP_KIND_COUNT];
}

constexpr bool isConversion(UnopKind op) { return op >= CONV4 && op <= CONV26; }

}  // namespace ZOA

#endif
