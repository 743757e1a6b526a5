// SoundX86: the unit's layout, the subprogram frame and the shared text helpers.
#include "emit/x86/sound/sound_x86.h"

#include <zoa/nesting.h>
#include <zoa/stmt.h>
#include <zoa/zoa_file.h>

#include <unordered_set>

namespace ZOA {

SoundX86::SoundX86(std::ostream& os, ZOA_file& file) : DecompileBase(os, true), sink(os), unit(file) {
    signatures.decide(unit);
    unsigned index = 0;
    for (SUBPROG* sp : unit.getSubprogs()) {
        if (!sp) continue;
        for (const auto& entry : sp->getAllLabels())
            if (entry.second) labelOwner.emplace(entry.second, index);
        for (NAME* n : sp->getAllLocalNames())
            if (n) localOwner.emplace(n, index);
        ++index;
    }
}

SoundX86::~SoundX86() {}

void SoundX86::writeUnit() {
    sink << "\t.intel_syntax noprefix\n";
    for (NAME* n : unit.getNames()) defineName(n);
    writeStringPool();
    subprogIndex = 0;
    for (SUBPROG* sp : unit.getSubprogs()) {
        if (!sp) continue;
        emitSubprogram(sp);
        ++subprogIndex;
    }
    // The thunk gcc uses for the GOT address; comdat, so it merges with gcc's own.
    sink << "\t.section\t.text.__x86.get_pc_thunk.bx,\"axG\",@progbits,__x86.get_pc_thunk.bx,comdat\n"
            "\t.globl\t__x86.get_pc_thunk.bx\n"
            "\t.hidden\t__x86.get_pc_thunk.bx\n"
            "\t.type\t__x86.get_pc_thunk.bx, @function\n"
            "__x86.get_pc_thunk.bx:\n"
            "\tmov\tebx, DWORD PTR [esp]\n"
            "\tret\n"
            "\t.section\t.note.GNU-stack,\"\",@progbits\n";
}

void SoundX86::labelRef(const LABEL* l) {
    auto it = labelOwner.find(l);
    if (it == labelOwner.end()) {
        sink << '0';
        return;
    }
    sink << ".L";
    sink.writeUnsigned(it->second);
    sink << '_';
    sink.writeUnsigned(l->getId());
}

void SoundX86::mnemonic(const char* m) { ins() << m; }

void SoundX86::writeCutNote() { sink << "# " << CUT_NOTE << '\n'; }

std::string SoundX86::internalLabel() { return ".Lz" + std::to_string(internalCount++); }

void SoundX86::memOperand(std::string_view size, std::string_view base, long long offset) {
    sink << size << " PTR [" << base;
    if (offset >= 0) sink << '+';
    num(offset);
    sink << ']';
}

void SoundX86::visit(SUBPROG* sp) {
    layoutFrame(sp);
    const String& name = sp->getName();
    sink << "\t.text\n";
    if (!sp->isStatic()) sink << "\t.globl\t" << name << '\n';
    sink << "\t.type\t" << name << ", @function\n" << name << ":\n";
    ins() << "push\tebp\n";
    ins() << "mov\tebp, esp\n";
    ins() << "push\tebx\n";
    ins() << "push\tesi\n";
    ins() << "push\tedi\n";
    ins() << "sub\tesp, OFFSET .Lf";  // the frame's size, set after the body
    sink.writeUnsigned(subprogIndex);
    end();
    ins() << "call\t__x86.get_pc_thunk.bx\n";
    ins() << "add\tebx, OFFSET FLAT:_GLOBAL_OFFSET_TABLE_\n";
    depth = 0;

    buildTraces();
    std::unordered_set<const LABEL*> placed(traceOrder.begin(), traceOrder.end());
    for (LABEL* l : traceOrder) visit(l);
    // Control falling off the last label has no meaning: stop there.
    if (traceOrder.empty() || traceOrder.back()->getKind() != EPILOGUE_LABEL) ins() << "ud2\n";
    // Labels no trace reaches are still defined, so every label address assembles.
    bool any = false;
    for (const auto& entry : sp->getAllLabels()) {
        if (!entry.second || placed.count(entry.second)) continue;
        labelRef(entry.second);
        sink << ":\n";
        any = true;
    }
    if (any) ins() << "ud2\n";
    // Locals down to `below`, then esp 16-byte aligned: 12 modulo 16 below the saved registers.
    long long frame = below - 12;
    frame += (12 - frame % 16 + 16) % 16;
    sink << "\t.set\t.Lf";
    sink.writeUnsigned(subprogIndex);
    sink << ", ";
    num(frame);
    sink << "\n\t.size\t" << name << ", .-" << name << '\n';
    defineLocalNames(sp);
    writeStringPool();
}

void SoundX86::visit(LABEL* l) {
    curLabel = l;
    labelRef(l);
    sink << ":\n";
    depth = 0;
    if (l->containsStmts())
        for (StmtBase* s : l->getStmts()) statement(s);
    if (l->getKind() == EPILOGUE_LABEL) returnSequence();
}

// Statements and expressions are reached through statement() and gen(), not the visitor.
void SoundX86::visit(BINOP*) {}
void SoundX86::visit(BUF_TEMP*) {}
void SoundX86::visit(CALL*) {}
void SoundX86::visit(CONST*) {}
void SoundX86::visit(MEM*) {}
void SoundX86::visit(NAME*) {}
void SoundX86::visit(TEMP*) {}
void SoundX86::visit(UNOP*) {}
void SoundX86::visit(CJUMP*) {}
void SoundX86::visit(EXP*) {}
void SoundX86::visit(JUMP*) {}
void SoundX86::visit(MOVE*) {}
void SoundX86::visit(SEQ*) {}

}  // namespace ZOA
