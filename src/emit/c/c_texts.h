// Fixed C texts: type names, operators and casts, indexed by the enumerations.
#ifndef ZOA_EMIT_C_C_TEXTS_H
#define ZOA_EMIT_C_C_TEXTS_H

#include "core/op_facts.h"

#include <zoa/enums.h>

#include <string_view>

// Header-only, so that the interpreter and the campaigns, which link the
// shared library and not its hidden symbols, name types as the C output does.
namespace ZOA::ctext {

namespace detail {

inline constexpr std::string_view TYPE_NAMES[DATA_TYPE_COUNT] = {
    "unsigned char ",  // CHAR_U
    "unsigned int ",   // INT_U
    "uint64 ",         // INT64_U: uint64 and int64 are left for the client to define, as always
    "char ",           // CHAR_S
    "int ",            // INT_S
    "int64 ",          // INT64_S
    "float ",          // FLOAT
    "double ",         // DOUBLE
    "char *",          // POINTER: the star binds to the name
    "void ",           // VOID
};

inline constexpr std::string_view BINOP_TEXTS[MAX_BINOP] = {
    "+", "-", "*", "/", "%", "&&", "||", "==", "!=", "<", "<=", ">", ">=", "<<", ">>", "&", "|", "^",
};

// ABS is written apart; conversions without a cast print the bare operand.
inline constexpr std::string_view UNOP_TEXTS[UNOP_KIND_COUNT] = {
    "",                 // ABS
    "-",                // NEG
    "!",                // NOT
    "~",                // BITWISE_NOT
    "(int)",            // CONV4
    "",                 // CONV5
    "(unsigned char)",  // CONV6
    "(char)",           // CONV7
    "", "", "", "", "",  // CONV8 to CONV12
    "(float)",          // CONV13
    "(double)",         // CONV14
    "(unsigned char)",  // CONV15
    "(char)",           // CONV16
    "(unsigned int)",   // CONV17
    "(int)",            // CONV18
    "",                 // CONV19
    "(int)",            // CONV20
    "(unsigned int)",   // CONV21
    "(char*)",          // CONV22
    "(int*)",           // CONV23
    "(int64)",          // CONV24
    "(char)",           // CONV25
    "(unsigned char)",  // CONV26
};

}  // namespace detail

// The text for the value, or "" for a value the table does not cover. Views,
// so that writing one needs no strlen.
constexpr std::string_view typeName(DataType t) {
    unsigned int i = static_cast<unsigned int>(t);
    return i < DATA_TYPE_COUNT ? detail::TYPE_NAMES[i] : "";
}
constexpr std::string_view binopText(BinopKind op) {
    unsigned int i = static_cast<unsigned int>(op);
    return i < MAX_BINOP ? detail::BINOP_TEXTS[i] : "";
}
constexpr std::string_view unopText(UnopKind op) {
    unsigned int i = static_cast<unsigned int>(op);
    return i < UNOP_KIND_COUNT ? detail::UNOP_TEXTS[i] : "";
}

namespace detail {

// A conversion's cast text is there exactly when conversionFacts says it
// casts, and names the type it casts to: "(" + the type name + ")", the
// pointer casts written without the blank before their star.
constexpr bool castTextAgrees(UnopKind op) {
    const ConversionFacts& f = conversionFacts(op);
    std::string_view cast = unopText(op);
    if (!f.hasCast) return cast.empty();
    if (f.to == POINTER) return cast == (f.toIntPointer ? "(int*)" : "(char*)");
    std::string_view name = typeName(f.to);
    return cast.size() == name.size() + 1 && cast.front() == '(' && cast.back() == ')' &&
           cast.substr(1, name.size() - 1) == name.substr(0, name.size() - 1) && name.back() == ' ';
}

constexpr bool everyCastTextAgrees() {
    for (unsigned int i = CONV4; i <= CONV26; ++i)
        if (!castTextAgrees(static_cast<UnopKind>(i))) return false;
    return true;
}
static_assert(everyCastTextAgrees(), "the C cast texts follow conversionFacts");

}  // namespace detail

}  // namespace ZOA::ctext

#endif
