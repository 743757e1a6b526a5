// DecompileC: writes a unit as C source, GCC and MSVC flavours.
#ifndef ZOA_EMIT_C_DECOMPILE_C_H
#define ZOA_EMIT_C_DECOMPILE_C_H

#include "emit/decompile_base.h"
#include "support/text_sink.h"
#include "emit/used_temps.h"

#include <zoa/enums.h>

#include <string>
#include <utility>
#include <vector>

namespace ZOA {

class CallSignatures;
struct CallSignature;
class ZOA_file;

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
//
// The sound profile (sound == true) changes only what the exact texts get
// wrong (decompile_c_sound.cpp): every array-kind data name is written as
// "((char *)ng<id>)", so address arithmetic on it counts bytes, as in the
// tree; constants carry what their type needs (ULL, (-9223372036854775807LL
// - 1), digits that read back to the same bits, __builtin_inf()/nan in the GCC
// flavour and overflowing constant expressions in the MSVC one); external
// calls follow CallSignatures; a SUBPROG_REF in an expression is
// "((char *)<name>)". The unit layout is writeSoundUnit's.
class DecompileC : public DecompileBase {
public:
    DecompileC(std::ostream& os, bool isGcc, bool sound = false);
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
    void writeTruth(ExprBase* x, const char* comparison);
    // A function's name as the C text spells it, and the asm label that then
    // keeps its symbol (decompile_c_sound.cpp).
    bool spelledApart(const String& name) const;
    void writeFunctionName(const String& name);
    void writeAsmLabel(const String& name);
    // " <op> "; two blanks for a value without operator.
    void writeBinopText(BinopKind op);
    void writeUnopText(UnopKind op);
    // Declaration of a parameter (no terminator) or a local (";\n").
    void declareTemp(TEMP* t);
    // A C string literal; a quote is escaped unless a backslash precedes it.
    void writeQuotedString(const String& s);

    // Sound profile: refuses a unit whose names cannot be written (a message
    // per name on diag, returns false, writes nothing); otherwise writes the
    // whole unit: the int64/uint64 typedefs (guarded), external function
    // declarations, every subprogram's prototype, name prototypes, data
    // definitions, then the subprograms.
    bool writeSoundUnit(ZOA_file& unit, std::ostream& diag);

private:
    // Prints e with indentLevel 0, restoring the level afterwards.
    void printFlat(ExprBase* e);
    // Prints e, of node type t, at the current indentation (0 inside printFlat).
    void printExpr(ExprBase* e, NodeType t);
    // Prints a statement or label, keeping indentLevel as it was.
    void printStmt(StmtBase* s);
    void writeCutNote() override;
    void printLabel(LABEL* l);
    // The labels in trace order.
    void printBody();
    void declareLocals(SUBPROG* sp);
    // With params (sound profile), each argument that has a parameter is
    // converted to its type, each further one to its own node type.
    void writeArgList(CALL* c, const std::vector<DataType>* params = nullptr);
    void writeArgTypes(CALL* c);
    void writeDataPrefix(NAME* n);
    void writeGoto(LABEL* target, unsigned int level);
    void writeInt(long long v);
    void writeUnsigned(unsigned long long v);
    // The flavour's alignment request and a blank; nothing for 0.
    void writeAlignment(unsigned int bytes);

    // Sound profile texts; writeSoundConst is false where the exact text is right.
    bool writeSoundConst(CONST* c);
    // "(<type>)" before e where e's C type may differ from `to`.
    void writeSoundCast(DataType to, ExprBase* e);
    // A discarded library result needs "(void)!": GCC's malloc and others
    // warn about "(void)" alone.
    bool discardNeedsNot(ExprBase* x) const;
    // "(int)", "(char *)": a cast to the type.
    void writeCast(DataType to);
    void writeSoundFloating(double v, bool isFloat);
    void writeSoundCall(CALL* c);
    void declareSignature(const std::string& name, const CallSignature& sig);

    TextSink& pad(unsigned int n) { return sink.indent(n); }

    bool sound;
    const CallSignatures* signatures = nullptr;  // sound profile, set by writeSoundUnit
    UsedTemps usedTemps;  // reused across subprograms
    // While a body is printed (see visit(SUBPROG)): the temporaries printed
    // are marked; the names with values met, with their depth; set when the
    // marks may miss what a whole walk finds.
    bool marking = false;
    bool unmarked = false;
    std::vector<std::pair<NAME*, unsigned int>> valueNames;
    TextSink sink;     // everything this emitter writes goes through it
};

}  // namespace ZOA

#endif
