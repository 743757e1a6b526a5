// SoundX86: the sound profile's x86 back end, 32-bit GNU as Intel syntax, position independent.
#ifndef ZOA_EMIT_X86_SOUND_SOUND_X86_H
#define ZOA_EMIT_X86_SOUND_SOUND_X86_H

#include "core/c_types.h"
#include "emit/call_signatures.h"
#include "emit/decompile_base.h"
#include "support/text_sink.h"

#include <zoa/expr.h>
#include <zoa/subprog.h>

#include <cstdint>
#include <list>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace ZOA {

// Every temporary lives in a frame slot; each statement's expressions are
// evaluated into eax (32-bit values, chars extended to 32 bits by their
// signedness), edx:eax (64-bit) or st(0) (FLOAT and DOUBLE, kept rounded to
// their type), with the machine stack holding intermediate operands; nothing
// stays in a register from one statement to the next. ebx holds the GOT
// address for the whole subprogram, so the text links into PIE and non-PIE
// programs alike. Values have the meaning of the C the C output writes: C's
// promotions and usual arithmetic conversions, pointer arithmetic on bytes
// (an int * from CONV23 on four-byte steps).
class SoundX86 : public DecompileBase {
public:
    using CT = ctypes::CT;
    // A value's C type; scale is what a pointer steps by (1 for char *).
    struct VT {
        CT t = CT::VOID;
        unsigned scale = 1;
    };

    // A constant's value as the C text gives it.
    struct CVal {
        CT t = CT::VOID;
        std::uint64_t bits = 0;  // integers, extended by their signedness; addresses
        double real = 0;         // FLOAT (exact in float) and DOUBLE
    };
    static CVal constValue(CONST* c);
    static CVal convertValue(const CVal& v, CT to);

    SoundX86(std::ostream& os, ZOA_file& unit);
    ~SoundX86() override;

    // The whole unit: data, subprograms, the PC thunk.
    void writeUnit();

#define ZOA_NODE_KIND(kind, Class) void visit(Class*) override;
#include "core/node_kinds.def"

    void defineName(NAME* n) override;
    void declareNamePrototype(NAME*) override {}
    void declareSubprogPrototype(SUBPROG*) override {}
    void declareCallPrototype(CALL*) override {}
    void writeCutNote() override;

private:
    // ---- text (sound_x86.cpp)
    TextSink& ins() { return sink << '\t'; }
    void end() { sink << '\n'; }
    void num(long long v) { sink.writeInt(v); }
    void mnemonic(const char* m);  // a tab and m (out of line: a chosen text of unknown length)
    void labelRef(const LABEL* l);     // .L<subprog>_<id>, or 0 for a label of no subprogram
    std::string internalLabel();       // .Lz<n>, a fresh one
    void defineInternal(const std::string& l) { sink << l << ":\n"; }
    void symbolOf(NAME* n);            // the assembler symbol of a data name
    void memOperand(std::string_view size, std::string_view base, long long offset);  // SIZE PTR [base+offset]

    // ---- data (sound_data.cpp)
    void writeLiteral(const String& text);
    void writeElement(ExprBase* e, DataType et);
    void writeStringPool();
    void defineLocalNames(SUBPROG* sp);
    std::vector<const String*> pendingStrings;
    std::unordered_map<const NAME*, unsigned> localOwner;  // local name -> subprogram index
    unsigned stringCount = 0;

    // ---- frame and statements (sound_stmts.cpp)
    void layoutFrame(SUBPROG* sp);
    long long slotOf(TEMP* t);  // a slot is given on first use
    VT bufferAddress(BUF_TEMP* b);  // aligned as asked
    void statement(StmtBase* s);
    void move(MOVE* m);
    void returnSequence();
    void store(CT t, std::string_view base, long long offset);  // the value, of type t, to [base+offset]
    void storeTemp(TEMP* t, VT v);

    // ---- expressions (sound_exprs.cpp)
    VT gen(ExprBase* e);
    VT value(ExprBase* e);  // gen, with a void value read as int 0
    VT genConst(CONST* c);
    VT genName(NAME* n);
    VT genTemp(TEMP* t);
    VT genMem(MEM* m);
    VT genUnop(UNOP* u);
    VT genAbs(ExprBase* x);
    VT genBinop(BinopKind op, ExprBase* l, ExprBase* r);
    VT genArith(BinopKind op, VT l, VT r);
    bool genDirect(BinopKind op, VT l, ExprBase* r, VT& result);
    void directOperand(ExprBase* r);
    VT genCompare(BinopKind op, VT l, VT r);
    void operate(BinopKind op, CT c);  // left in the value registers, right at [esp]
    VT genPointerArith(BinopKind op, VT l, VT r);
    VT genShift(BinopKind op, VT l, VT r);
    VT genLogical(BinopKind op, ExprBase* l, ExprBase* r);
    void loadFrom(CT t, std::string_view base, long long offset);  // [base+offset] into the value registers
    void convert(VT from, CT to);
    void realToInt(CT to);
    void intToReal(CT from);
    void roundReal(CT to);
    void truth(CT t);
    void pushValue(CT t);
    void loadStacked(CT t, long long offset);  // a pushed value at [esp+offset] into the value registers
    void pop(CT t);
    void drop(unsigned bytes);
    void discard(CT t);
    void setFlag(std::string_view cc);  // set<cc> al; movzx eax, al

    // ---- calls (sound_calls.cpp)
    VT genCall(CALL* c);
    const CallSignature* signatureOf(CALL* c) const;  // null for a call through a pointer
    unsigned reserveArguments(CALL* c, const CallSignature* sig);
    VT makeCall(CALL* c, const CallSignature* sig, unsigned area);
    VT genAlloca(CALL* c);
    void callHelper(const char* name);  // libgcc's 64-bit division: left in edx:eax, right at [esp]
    void storeArgument(CT t, long long offset);
    static CT argumentType(const CallSignature* sig, std::size_t i, ExprBase* a);
    void zeroValue(CT t);

    static unsigned slotBytes(CT t) { return ctypes::bitsOf(t) == 64 ? 8 : 4; }
    // What a pushed value takes: FLOAT and DOUBLE are pushed as doubles.
    static unsigned stackBytes(CT t) { return t == CT::VOID ? 0 : ctypes::isReal(t) ? 8 : slotBytes(t); }
    std::vector<CT> paramStack;  // the parameter types of the calls being written

    TextSink sink;
    TextSink::Batch batch{sink};
    std::unordered_map<const LABEL*, unsigned> labelOwner;  // label -> subprogram index
    ZOA_file& unit;
    CallSignatures signatures;  // the declarations the sound C writes, so calls pass what they mean
    std::unordered_map<const TEMP*, long long> slots;  // ebp offsets
    long long below = 12;  // bytes of the frame below ebp so far
    unsigned subprogIndex = 0;
    unsigned internalCount = 0;
    unsigned depth = 0;  // bytes below the frame's aligned bottom
};

}  // namespace ZOA

#endif
