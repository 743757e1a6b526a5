// DecompileC: writes a unit as C source, GCC and MSVC flavours.
#ifndef ZOA_EMIT_C_DECOMPILE_C_H
#define ZOA_EMIT_C_DECOMPILE_C_H

#include "emit/decompile_base.h"
#include "support/text_sink.h"
#include "emit/used_temps.h"

#include <zoa/enums.h>

namespace ZOA {

// Expressions are fully parenthesised; temporaries are "t<id>", labels
// "LAB<id>", data names "ng<id>" (file level) or "nl<id>" (local). The two
// flavours differ only in label addresses, computed jumps and tables of label
// addresses (GCC: "&&LAB<id>" and "goto *"; MSVC: __asm blocks).
//
// Choices for trees the fixed texts do not cover, made so that the C still
// compiles and means what the tree says:
//  - A STATIC_DATA_REF made from a constant has no text; references to it print
//    the "ng<id>"/"nl<id>" its definition declares. One made from a text keeps
//    printing the text.
//  - A data definition whose value list is empty (names made from a kind and a
//    text, or from an empty list): a CONST_ARRAY_REF or DATA_ARRAY_REF becomes
//    "static char ng<id>[1];" (references print ng<id>); a STATIC_DATA_REF
//    becomes "static <type><name>;" with <name> the text, or ng<id>/nl<id>
//    when the text is empty.
//  - A STRINGLIT_REF element of an array initializer is written as the quoted
//    literal (the same escaping as string definitions), which is a constant
//    expression meaning the literal's address; SUBPROG_REF elements stay
//    "(void *)<name>".
//  - MSVC label-address move into a destination other than a MEM: the address
//    is stored with "MOV <destination>, EAX" (for a TEMP: "MOV t5, EAX").
//  - In the MSVC table of label addresses an element that is not a label
//    address is moved as itself ("MOV EAX, <element>;").
//  - A missing child (null expression) prints as nothing; a missing jump
//    target prints ";" in place of its goto. Nothing ever crashes on a broken
//    tree.
//  - Nesting deeper than MAX_WALK_DEPTH (a cycle made with the copy
//    assignments): "/* <CUT_NOTE> */" where the bound is reached; the rest of
//    that statement of the label is left out and printing goes on after it.
class DecompileC : public DecompileBase {
public:
    DecompileC(std::ostream& os, bool isGcc);
    ~DecompileC() override;

#define ZOA_NODE_KIND(kind, Class) void visit(Class*) override;
#include "core/node_kinds.def"

    void defineName(NAME* n) override;
    void declareNamePrototype(NAME* n) override;
    void declareSubprogPrototype(SUBPROG* sp) override;
    void declareCallPrototype(CALL* c) override;

    // C type name with its separating blank ("int ", "char *"); nothing for
    // values outside the enumeration.
    void writeTypeName(DataType t);
    // Leaves, temporaries and constants bare, everything else in parentheses.
    void writeOperand(ExprBase* e);
    // " <op> "; two blanks for a value without operator.
    void writeBinopText(BinopKind op);
    void writeUnopText(UnopKind op);
    // Declaration of a parameter (no terminator) or a local (";\n").
    void declareTemp(TEMP* t);
    // A C string literal; a quote is escaped unless a backslash precedes it.
    void writeQuotedString(const String& s);

private:
    // Prints e with indentLevel 0, restoring the level afterwards.
    void printFlat(ExprBase* e);
    // Prints e, of node type t, at the current indentation (0 inside printFlat).
    void printExpr(ExprBase* e, NodeType t);
    // Prints a statement or label, keeping indentLevel as it was.
    void printStmt(StmtBase* s);
    void writeCutNote() override;
    void printLabel(LABEL* l);
    void writeArgList(CALL* c);
    void writeArgTypes(CALL* c);
    void writeDataPrefix(NAME* n);
    void writeGoto(LABEL* target, unsigned int level);
    void writeInt(long long v);
    void writeUnsigned(unsigned long long v);

    TextSink& pad(unsigned int n) { return sink.indent(n); }

    UsedTemps usedTemps;  // reused across subprograms
    TextSink sink;     // everything this emitter writes goes through it
};

}  // namespace ZOA

#endif
