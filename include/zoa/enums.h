// The enumerations shared by the tree, the emitters and the dumps, with their printed names.
#ifndef ZOA_ENUMS_H
#define ZOA_ENUMS_H

#include <zoa/export.h>

namespace ZOA {

// What TreeBase::getNodeType() answers. Expression and statement kinds are each
// numbered in alphabetical order of their class names.
enum NodeType {
    TREE_BASE_NODE = 0,
    EXPR_BASE_NODE = 1,
    BINOP_NODE = 2,
    BUF_TEMP_NODE = 3,
    CALL_NODE = 4,
    CONST_NODE = 5,
    MEM_NODE = 6,
    NAME_NODE = 7,
    TEMP_NODE = 8,
    UNOP_NODE = 9,
    STMT_BASE_NODE = 10,
    CJUMP_NODE = 11,
    EXP_NODE = 12,
    JUMP_NODE = 13,
    LABEL_NODE = 14,
    MOVE_NODE = 15,
    SEQ_NODE = 16,
    SUBPROG_NODE = 17
};
constexpr int NODE_TYPE_COUNT = 18;

// Value types on the 32-bit target; sizes are ExprBase::sizeOfDataType.
enum DataType {
    CHAR_U = 0,   // unsigned 8-bit
    INT_U = 1,    // unsigned 32-bit
    INT64_U = 2,  // unsigned 64-bit
    CHAR_S = 3,   // signed 8-bit
    INT_S = 4,    // signed 32-bit
    INT64_S = 5,  // signed 64-bit
    FLOAT = 6,
    DOUBLE = 7,
    POINTER = 8,  // 4 bytes on the target
    VOID = 9
};
constexpr int DATA_TYPE_COUNT = 10;

// Binary operators of BINOP; EQ to GE are also the relations of CJUMP.
enum BinopKind {
    PLUS = 0,
    MINUS = 1,
    MUL = 2,
    DIV = 3,
    MOD = 4,
    AND = 5,  // logical
    OR = 6,   // logical
    EQ = 7,
    NE = 8,
    LT = 9,
    LE = 10,
    GT = 11,
    GE = 12,
    LSHIFT = 13,
    RSHIFT = 14,
    BITWISE_AND = 15,
    BITWISE_OR = 16,
    XOR = 17,
    MAX_BINOP = 18  // not an operator: what CJUMP::notRel answers for a non-relation
};

// Unary operators of UNOP: ABS, NEG, NOT and BITWISE_NOT are C's abs, -, ! and ~.
// The UNOP's own type is the type its result is declared and used as; a
// conversion's C text does not name it. Each CONVn writes one fixed cast,
// whatever the UNOP's type and the operand's (docs/conversions.md):
//   (int)            CONV4, CONV18, CONV20    (unsigned int)  CONV17, CONV21
//   (char)           CONV7, CONV16, CONV25    (float)         CONV13
//   (unsigned char)  CONV6, CONV15, CONV26    (double)        CONV14
//   (int64)          CONV24                   (char*)         CONV22
//   (int*)           CONV23
//   no cast          CONV5, CONV8 to CONV12, CONV19: the operand's value goes
//                    on as it is, converted only by the assignment or
//                    operation around the UNOP.
// So a CONV6 keeps the low byte even in an INT_S UNOP: CONV6 of 178571428 is
// 164, in the interpreter too. BINOP inserts CONV4 by itself (an 8-bit operand
// widened to int); the exact assembly translates CONV4 only.
enum UnopKind {
    ABS = 0,
    NEG = 1,
    NOT = 2,
    BITWISE_NOT = 3,
    CONV4 = 4,
    CONV5 = 5,
    CONV6 = 6,
    CONV7 = 7,
    CONV8 = 8,
    CONV9 = 9,
    CONV10 = 10,
    CONV11 = 11,
    CONV12 = 12,
    CONV13 = 13,
    CONV14 = 14,
    CONV15 = 15,
    CONV16 = 16,
    CONV17 = 17,
    CONV18 = 18,
    CONV19 = 19,
    CONV20 = 20,
    CONV21 = 21,
    CONV22 = 22,
    CONV23 = 23,
    CONV24 = 24,
    CONV25 = 25,
    CONV26 = 26
};
constexpr int UNOP_KIND_COUNT = 27;

// What a NAME refers to.
enum NameKind {
    LABEL_REF = 0,
    SUBPROG_REF = 1,
    CONST_ARRAY_REF = 2,
    DATA_ARRAY_REF = 3,
    // The text is the string as C source spells it between the quotes,
    // escapes included ("a\\n" for a and a newline), not its bytes. The exact
    // C and assembly write it as it stands (the C adds a backslash before a
    // '"' that has none); the sound outputs decode its escapes to bytes.
    STRINGLIT_REF = 4,
    STATIC_DATA_REF = 5,
    EXTERN_DATA_REF = 6
};

enum JumpKind { DIRECT_LABEL = 0, DIRECT_EXPR = 1 };

enum LabelKind { REGULAR_LABEL = 0, PROLOGUE_LABEL = 1, EPILOGUE_LABEL = 2 };

// GLOBAL_TEMP is valid but never produced by the library.
enum TempKind { REGULAR_TEMP = 0, ARGUMENT_TEMP = 1, RETURN_TEMP = 2, GLOBAL_TEMP = 3 };

enum TempState { PERMANENT_TEMP = 0, IN_USE_TEMP = 1, AVAILABLE_TEMP = 2 };

// Printed names: the enumerator spelled as above ("CHAR_U", "LABEL_REF", ...).
// A value outside the enumeration yields "?" (never null).
ZOA_API const char* toString(DataType t);
ZOA_API const char* toString(NameKind k);
ZOA_API const char* toString(JumpKind k);
ZOA_API const char* toString(LabelKind k);
ZOA_API const char* toString(TempKind k);
ZOA_API const char* toString(TempState s);
// Operator names used by the dumps: the enumerator names ("PLUS", "BITWISE_AND",
// "MAX_BINOP", "ABS", "CONV4", ...).
ZOA_API const char* toString(BinopKind op);
ZOA_API const char* toString(UnopKind op);
// Class name of a node kind ("BINOP", "BUF_TEMP", ..., "TreeBase" for the bases).
ZOA_API const char* toString(NodeType t);

}  // namespace ZOA

#endif
