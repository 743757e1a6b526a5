// The C emitter's text tables.
#include "emit/c/c_texts.h"

namespace ZOA::ctext {

namespace {

const std::string_view typeNames[DATA_TYPE_COUNT] = {
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

const std::string_view binopTexts[MAX_BINOP] = {
    "+", "-", "*", "/", "%", "&&", "||", "==", "!=", "<", "<=", ">", ">=", "<<", ">>", "&", "|", "^",
};

// ABS is written apart; kinds without a cast print the bare operand.
const std::string_view unopTexts[UNOP_KIND_COUNT] = {
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

}  // namespace

std::string_view typeName(DataType t) {
    unsigned int i = static_cast<unsigned int>(t);
    return i < DATA_TYPE_COUNT ? typeNames[i] : "";
}

std::string_view binopText(BinopKind op) {
    unsigned int i = static_cast<unsigned int>(op);
    return i < MAX_BINOP ? binopTexts[i] : "";
}

std::string_view unopText(UnopKind op) {
    unsigned int i = static_cast<unsigned int>(op);
    return i < UNOP_KIND_COUNT ? unopTexts[i] : "";
}

}  // namespace ZOA::ctext
