// Printed names of the shared enumerations, one table per enumeration.
#include <zoa/enums.h>

#include "core/node_kinds.h"

namespace ZOA {

namespace {

template <int N> const char* lookup(const char* const (&table)[N], int v) {
    return v >= 0 && v < N ? table[v] : "?";
}

const char* const dataTypeNames[] = {"CHAR_U", "INT_U",  "INT64_U", "CHAR_S",  "INT_S",
                                     "INT64_S", "FLOAT", "DOUBLE",  "POINTER", "VOID"};
const char* const nameKindNames[] = {"LABEL_REF",   "SUBPROG_REF",     "CONST_ARRAY_REF", "DATA_ARRAY_REF",
                                     "STRINGLIT_REF", "STATIC_DATA_REF", "EXTERN_DATA_REF"};
const char* const jumpKindNames[] = {"DIRECT_LABEL", "DIRECT_EXPR"};
const char* const labelKindNames[] = {"REGULAR_LABEL", "PROLOGUE_LABEL", "EPILOGUE_LABEL"};
const char* const tempKindNames[] = {"REGULAR_TEMP", "ARGUMENT_TEMP", "RETURN_TEMP", "GLOBAL_TEMP"};
const char* const tempStateNames[] = {"PERMANENT_TEMP", "IN_USE_TEMP", "AVAILABLE_TEMP"};
const char* const binopNames[] = {"PLUS", "MINUS", "MUL",    "DIV",    "MOD",         "AND",
                                  "OR",   "EQ",    "NE",     "LT",     "LE",          "GT",
                                  "GE",   "LSHIFT", "RSHIFT", "BITWISE_AND", "BITWISE_OR", "XOR",
                                  "MAX_BINOP"};
const char* const unopNames[] = {"ABS",    "NEG",    "NOT",    "BITWISE_NOT", "CONV4",  "CONV5",  "CONV6",
                                 "CONV7",  "CONV8",  "CONV9",  "CONV10",      "CONV11", "CONV12", "CONV13",
                                 "CONV14", "CONV15", "CONV16", "CONV17",      "CONV18", "CONV19", "CONV20",
                                 "CONV21", "CONV22", "CONV23", "CONV24",      "CONV25", "CONV26"};


static_assert(sizeof(dataTypeNames) / sizeof(*dataTypeNames) == DATA_TYPE_COUNT, "one name per DataType");
static_assert(sizeof(binopNames) / sizeof(*binopNames) == MAX_BINOP + 1, "one name per BinopKind");
static_assert(sizeof(unopNames) / sizeof(*unopNames) == UNOP_KIND_COUNT, "one name per UnopKind");

}  // namespace

const char* toString(DataType t) { return lookup(dataTypeNames, t); }
const char* toString(NameKind k) { return lookup(nameKindNames, k); }
const char* toString(JumpKind k) { return lookup(jumpKindNames, k); }
const char* toString(LabelKind k) { return lookup(labelKindNames, k); }
const char* toString(TempKind k) { return lookup(tempKindNames, k); }
const char* toString(TempState s) { return lookup(tempStateNames, s); }
const char* toString(BinopKind op) { return lookup(binopNames, op); }
const char* toString(UnopKind op) { return lookup(unopNames, op); }
const char* toString(NodeType t) {
    std::string_view name = nodeKindName(t);
    return name.empty() ? "?" : name.data();  // the names are literals: terminated
}

}  // namespace ZOA
