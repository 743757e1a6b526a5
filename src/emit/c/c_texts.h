// Fixed C texts: type names, operators and casts, indexed by the enumerations.
// Header-only, so that the interpreter and the campaigns read the same table.
#ifndef ZOA_EMIT_C_C_TEXTS_H
#define ZOA_EMIT_C_C_TEXTS_H

#include <zoa/enums.h>

#include <string_view>

namespace ZOA::ctext {

inline constexpr std::string_view TYPE_NAMES[DATA_TYPE_COUNT] = {
    "unsigned char ",  // CHAR_U
    "unsigned int ",   // INT_U
    "uint64 ",         // INT64_U
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

// ABS is written apart; kinds without a cast print the bare operand.
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

// The text for the value, or "" for a value the table does not cover.
constexpr std::string_view typeName(DataType t) {
    unsigned int i = static_cast<unsigned int>(t);
    return i < DATA_TYPE_COUNT ? TYPE_NAMES[i] : "";
}

constexpr std::string_view binopText(BinopKind op) {
    unsigned int i = static_cast<unsigned int>(op);
    return i < MAX_BINOP ? BINOP_TEXTS[i] : "";
}

constexpr std::string_view unopText(UnopKind op) {
    unsigned int i = static_cast<unsigned int>(op);
    return i < UNOP_KIND_COUNT ? UNOP_TEXTS[i] : "";
}

}  // namespace ZOA::ctext

#endif
