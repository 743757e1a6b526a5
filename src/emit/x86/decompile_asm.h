// DecompileASM: writes a unit as 32-bit x86 assembly for the GNU assembler, Intel syntax.
#ifndef ZOA_EMIT_X86_DECOMPILE_ASM_H
#define ZOA_EMIT_X86_DECOMPILE_ASM_H

#include "emit/decompile_base.h"
#include "support/text_sink.h"
#include "emit/used_temps.h"

#include <zoa/expr.h>
#include <zoa/memmgr.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace ZOA {

// Register numbers. A family of aliasing registers shares the low bits: the
// byte registers are 0 to 7 (high byte even, low byte odd), then the 16-bit
// (16..23, no text, never allocated), 32-bit (32..39) and 64-bit (48..55) forms.
enum AsmRegister : unsigned int {
    AH = 0, AL = 1, BH = 2, BL = 3, CH = 4, CL = 5, DH = 6, DL = 7,
    AX = 16, BX = 17, CX = 18, DX = 19, DI = 20, SI = 21, BP = 22, SP = 23,
    EAX = 32, EBX = 33, ECX = 34, EDX = 35, EDI = 36, ESI = 37, EBP = 38, ESP = 39,
    RAX = 48, RBX = 49, RCX = 50, RDX = 51, RDI = 52, RSI = 53, RBP = 54, RSP = 55,
    NO_REGISTER = 64
};

// Width classes for registerOfClass / stealRegister.
enum RegClass { LOW_BYTE = 0, HIGH_BYTE = 1, DWORD = 2, QWORD = 3 };

// A single-pass tree walker. Every expression it touches gets an ExprAnnotation
// saying where its value is: in a register (possibly as an address) or as the
// text of a memory or immediate operand. Four general registers per width, no
// spilling; everything is released at label starts and between the statements
// of a SEQ.
//
// Choices where the instruction selection leaves room:
//  - NAME operands. A name gets its annotation when it is first met (visit,
//    operand text, register assignment or defineName), with memText
//    "OFFSET FLAT:sym" for names that stand for an address (LABEL_REF,
//    SUBPROG_REF, CONST_ARRAY_REF, DATA_ARRAY_REF, STRINGLIT_REF) and
//    "DWORD PTR sym" for names that stand for a value (STATIC_DATA_REF,
//    EXTERN_DATA_REF; a value name is read as a dword whatever its type, so
//    use it where a memory operand may stand, e.g. as the right operand of +).
//    sym is ".La<id>" for a LABEL_REF; the name's text for a name made from
//    text (SUBPROG_REF, EXTERN_DATA_REF, DATA_ARRAY_REF, STATIC_DATA_REF);
//    otherwise "ng<id>" for file-level and "nl<id>" for local names (the same
//    symbols as the C output). Local names are not written as data in this
//    mode, so their symbols stay undefined.
//  - defineName with an empty value list: a CONST_ARRAY_REF writes an empty
//    object (size 0, its label only, so references still assemble); a
//    DATA_ARRAY_REF or STATIC_DATA_REF made from text writes nothing: it names
//    data defined elsewhere. A null element writes its directive alone.
//  - Private data (createData, createZeroData) goes to .data: zero-filled data
//    as ".zero <bytes>" (at least one). A name's alignment request replaces
//    the ".align" it would get; a BUF_TEMP's is not honoured here (its frame
//    slot keeps the frame's alignment).
//  - POINTER constants print "0" when null, else the text they point to (the
//    client stores e.g. "OFFSET FLAT:sym" there); VOID constants print "0".
//  - alloca without an argument allocates nothing: only the result (the stack
//    top above the outgoing argument area) is computed.
//  - Null children are skipped; an operand that is null or has no annotation
//    has an empty text (its size prefix alone), as with any untranslated
//    operator. A TEMP that has no frame slot still prints t<id>[ebp] and so
//    leaves an undefined symbol for the assembler to report.
//  - Unknown register numbers print "unknown register" (bracketed or not).
//  - Nesting deeper than MAX_WALK_DEPTH (a cycle made with the copy
//    assignments): a line "# <CUT_NOTE>" where the bound is reached; the rest
//    of that statement of the label is left out.
class DecompileASM : public DecompileBase {
public:
    // Where an expression's value is. Arena-allocated; stays on the node.
    class ExprAnnotation : public TreeAnnotation {
    public:
        explicit ExprAnnotation(int offset) : frameOffset(offset) {}
        int frameOffset;                 // ebp offset of an argument or local slot, else 0
        AsmRegister reg = NO_REGISTER;   // register holding the value (or its address)
        bool isIndirect = false;         // reg holds the address: written in brackets
        bool isAddressBase = false;      // a TEMP whose register became a MEM's address
        bool isAssigned = false;         // a register was assigned; cleared on release
        String memText;                  // memory or immediate operand text; never cleared
    };

    static constexpr unsigned int HOLDER_SLOTS = 20;

    DecompileASM(std::ostream& os, bool isGcc);
    ~DecompileASM() override;

    // Where the per-subprogram note goes (std::cout unless set).
    void setNoteStream(std::ostream& os) { notes = &os; }

#define ZOA_NODE_KIND(kind, Class) void visit(Class*) override;
#include "core/node_kinds.def"

    void defineName(NAME* n) override;
    void declareNamePrototype(NAME* n) override;
    void declareSubprogPrototype(SUBPROG* sp) override;
    void declareCallPrototype(CALL* c) override;

    // --- register model (registers.cpp)
    static const char* registerName(AsmRegister reg, bool bracketed = false);
    static std::string_view registerText(AsmRegister reg, bool bracketed = false);
    static AsmRegister registerOfClass(AsmRegister reg, RegClass cls);
    static bool isRegisterOfClass(AsmRegister reg, RegClass cls);
    void markRegister(AsmRegister reg, bool flag);
    void freeRegister(AsmRegister reg);
    AsmRegister claimRegister(AsmRegister reg);
    void resetRegisters();
    void releaseStatementRegisters(StmtBase* stmt);
    AsmRegister allocateByte();
    AsmRegister allocateDword();
    AsmRegister allocateQword();
    AsmRegister allocateForType(ExprBase* e);
    AsmRegister stealRegister(RegClass cls);
    void assignRegister(ExprBase* e, AsmRegister reg, bool indirect);
    AsmRegister loadIntoRegister(ExprBase* e, bool claim);
    // "mov x, <e>", and e recorded as living in x.
    AsmRegister loadInto(AsmRegister x, ExprBase* e);
    // "mov <d>, r" (d as a memory operand), and d recorded as living in r.
    void storeFrom(AsmRegister r, ExprBase* d);
    bool isReserved(AsmRegister reg) const { return reg < 64 && regInUse[reg]; }

    // --- operands and data (operands.cpp)
    static unsigned int valueSize(ExprBase* e);
    static const char* sizePrefix(ExprBase* e);
    static const char* dataDirective(DataType t);
    static bool isSignedValue(ExprBase* e);
    std::string operandText(ExprBase* e, bool useRegister);
    std::string byteOperandText(ExprBase* e);
    void writeTempSymbol(TEMP* t);
    void writeNodeComment(TreeBase* node);
    // The annotation of e, or null when it carries none (or a foreign one).
    static ExprAnnotation* annotationOf(const ExprBase* e);
    // The annotation of e, attached first if missing (with a NAME's memText).
    ExprAnnotation* ensureAnnotation(ExprBase* e);

    // --- expressions (expressions.cpp)
    AsmRegister emitBinop(BinopKind op, ExprBase* l, ExprBase* r);
    AsmRegister prepareAddress(MEM* mem);
    AsmRegister loadFromAddress(MEM* mem);
    AsmRegister loadAddressedValue(MEM* mem);
    void storeToAddress(MEM* mem, AsmRegister v);

protected:
    // Lines gather in the sink; each entry point hands them to the stream
    // (endEntry), so text written to the stream between entry points (and
    // the note, which may go to the same stream) stays in order.
    void endLine() { sink << '\n'; }
    void endEntry() {
        sink.flush();
        out.flush();
    }
    unsigned int maxOutgoingArgBytes = 0;
    ExprBase* regHolders[HOLDER_SLOTS];
    std::uint32_t heldSlots = 0;  // bit i set while regHolders[i] is not null
    bool regInUse[64];

private:
    struct OperandParts {
        std::string_view prefix;  // size keyword
        std::string_view text;    // register, memory or immediate text
    };
    // defineName without handing the lines to the stream.
    void writeData(NAME* n);
    static std::string_view sizePrefixText(ExprBase* e);
    OperandParts operandParts(ExprBase* e, bool useRegister, bool byteForm);
    void evict(ExprBase* holder);
    // Empties slot i of the holders after evicting its expression.
    void dropHolder(unsigned int i) {
        evict(regHolders[i]);
        regHolders[i] = nullptr;
        heldSlots &= ~(std::uint32_t{1} << i);
    }

    // Line writing: the line's indentation, tokens, the end of the line. A
    // line is gathered in the sink and handed to the stream whole at its end,
    // followed by a flush of the stream, as std::endl would: whoever reads the
    // stream sees every line as soon as it is complete.
    TextSink& line() { return sink.indent(indentLevel); }
    void put(const char* s) { sink << s; }
    void putUnsigned(unsigned long long v) { sink.writeUnsigned(v); }
    void putInt(long long v) { sink.writeInt(v); }
    void putReg(AsmRegister r, bool bracketed = false) { sink << registerText(r, bracketed); }
    void putOperand(ExprBase* e, bool useRegister);
    void putByteOperand(ExprBase* e);
    void putAddress(MEM* mem);  // "[A op B]"
    AsmRegister readAddress(AsmRegister x, MEM* mem);  // "mov x, [A op B]"
    void putLabel(LABEL* l);

    void visitExpr(ExprBase* e) {
        if (e) acceptNested(e);
    }
    void writeCutNote() override;
    void writeEpilogue();
    void writeAlloca(CALL* c);

    // MOVE rows (statements.cpp)
    void moveTempTemp(ExprBase* d, ExprBase* s);
    void moveTempFromAddress(ExprBase* d, ExprBase* s);
    void moveTempFromMem(ExprBase* d, ExprBase* s);
    void moveTempToAddress(ExprBase* d, ExprBase* s);
    void moveTempToMem(ExprBase* d, ExprBase* s);
    void moveMemMem(ExprBase* d, ExprBase* s);
    void moveTempFromBinop(ExprBase* d, ExprBase* s);
    void moveOther(ExprBase* d, ExprBase* s);

    std::ostream* notes;
    UsedTemps used;  // reused across subprograms
    TextSink sink;
    TextSink::Batch lines{sink};  // the sink gathers until endLine for the emitter's lifetime
};

}  // namespace ZOA

#endif
