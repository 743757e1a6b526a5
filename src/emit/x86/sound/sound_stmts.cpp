// SoundX86: the frame of a subprogram, its statements and its return.
#include "emit/x86/sound/sound_x86.h"

#include "core/op_facts.h"
#include "core/type_facts.h"

#include <zoa/stmt.h>

namespace ZOA {

using ctypes::CT;

// Arguments sit above the return address in 4- or 8-byte slots; locals below
// the saved ebx, esi and edi, each given its slot when first used (the frame's
// size is set after the body). The caller keeps esp 16-byte aligned at the
// call, so ebp is 8 modulo 16 and offsets are chosen for the alignment wanted.
void SoundX86::layoutFrame(SUBPROG* sp) {
    slots.clear();
    below = 12;
    long long argOffset = 8;
    for (TEMP* t : sp->getAllArgTemps()) {
        if (!t) continue;
        slots.emplace(t, argOffset);
        argOffset += slotBytes(ctypes::ctOf(t->getDataType()));
    }
}

long long SoundX86::slotOf(TEMP* t) {
    auto it = slots.find(t);
    if (it != slots.end()) return it->second;
    long long size = 8;
    long long align = 8;
    if (t->getNodeType() == BUF_TEMP_NODE) {
        size = (static_cast<long long>(static_cast<BUF_TEMP*>(t)->getArraySize()) + 7) / 8 * 8;
        if (size == 0) size = 8;
        align = 16;
        // The frame is 16-byte aligned at most: room to round the address up at run time.
        unsigned asked = static_cast<BUF_TEMP*>(t)->getAlignment();
        if (asked > 16) size += asked - 16;
    }
    below += size;
    while ((8 - below) % align != 0) below += 4;
    slots.emplace(t, -below);
    return -below;
}

SoundX86::VT SoundX86::bufferAddress(BUF_TEMP* b) {
    ins() << "lea\teax, ";
    memOperand("DWORD", "ebp", slotOf(b));
    end();
    unsigned asked = b->getAlignment();
    if (asked > 16) {
        ins() << "add\teax, ";
        sink.writeUnsigned(asked - 1);
        end();
        ins() << "and\teax, ";
        num(-static_cast<long long>(asked));
        end();
    }
    return VT{CT::POINTER, 1};
}

void SoundX86::store(CT t, std::string_view base, long long offset) {
    switch (t) {
    case CT::SCHAR:
    case CT::UCHAR:
        ins() << "mov\t";
        memOperand("BYTE", base, offset);
        sink << ", al\n";
        return;
    case CT::INT:
    case CT::UINT:
    case CT::POINTER:
        ins() << "mov\t";
        memOperand("DWORD", base, offset);
        sink << ", eax\n";
        return;
    case CT::LLONG:
    case CT::ULLONG:
        ins() << "mov\t";
        memOperand("DWORD", base, offset);
        sink << ", eax\n";
        ins() << "mov\t";
        memOperand("DWORD", base, offset + 4);
        sink << ", edx\n";
        return;
    case CT::FLOAT:
        ins() << "fstp\t";
        memOperand("DWORD", base, offset);
        end();
        return;
    case CT::DOUBLE:
        ins() << "fstp\t";
        memOperand("QWORD", base, offset);
        end();
        return;
    case CT::VOID: return;
    }
}

void SoundX86::storeTemp(TEMP* t, VT v) {
    CT to = ctypes::ctOf(t->getDataType());
    convert(v, to);
    store(to, "ebp", slotOf(t));
}

void SoundX86::statement(StmtBase* s) {
    if (!s) return;
    NestingLevel level(nesting);
    if (!level.entered()) {  // a cycle: the rest of the statement is left out
        if (level.cutHere()) writeCutNote();
        return;
    }
    switch (s->getNodeType()) {
    case SEQ_NODE:
        statement(static_cast<SEQ*>(s)->getLeft());
        statement(static_cast<SEQ*>(s)->getRight());
        return;
    case EXP_NODE:
        if (ExprBase* e = static_cast<EXP*>(s)->getExpr()) discard(gen(e).t);
        return;
    case MOVE_NODE: move(static_cast<MOVE*>(s)); return;
    case JUMP_NODE: {
        JUMP* j = static_cast<JUMP*>(s);
        if (j->getKind() == DIRECT_LABEL) {
            if (fallsThrough(j)) return;
            if (!j->getTarget()) {
                ins() << "ud2\n";
                return;
            }
            ins() << "jmp\t";
            labelRef(j->getTarget());
            end();
            return;
        }
        VT v = gen(j->getExpr());
        convert(v, CT::POINTER);
        ins() << "jmp\teax\n";
        return;
    }
    case CJUMP_NODE: {
        CJUMP* c = static_cast<CJUMP*>(s);
        VT v = genBinop(c->getRelOp(), c->getLeft(), c->getRight());
        if (!isRelation(c->getRelOp()) && c->getRelOp() != AND && c->getRelOp() != OR) truth(v.t);
        ins() << "test\teax, eax\n";
        if (c->getIfTrue()) {
            ins() << "jne\t";
            labelRef(c->getIfTrue());
            end();
        } else {
            std::string skip = internalLabel();
            ins() << "je\t" << skip << '\n';
            ins() << "ud2\n";
            defineInternal(skip);
        }
        if (fallsThrough(c)) return;
        if (c->getIfFalse()) {
            ins() << "jmp\t";
            labelRef(c->getIfFalse());
            end();
        } else {
            ins() << "ud2\n";
        }
        return;
    }
    default: return;
    }
}

void SoundX86::move(MOVE* m) {
    ExprBase* d = m->getDst();
    ExprBase* src = m->getSrc();
    NodeType k = d ? d->getNodeType() : STMT_BASE_NODE;
    if (k == TEMP_NODE) {
        storeTemp(static_cast<TEMP*>(d), gen(src));
        return;
    }
    if (k == MEM_NODE) {
        // The address first, as the C evaluates it; kept on the stack meanwhile.
        MEM* mem = static_cast<MEM*>(d);
        convert(gen(mem->getExpr()), CT::POINTER);
        pushValue(CT::POINTER);
        CT to = ctypes::ctOf(mem->getDataType());
        convert(gen(src), to);
        ins() << "mov\tecx, DWORD PTR [esp]\n";
        store(to, "ecx", 0);
        drop(4);
        return;
    }
    NAME* n = k == NAME_NODE ? static_cast<NAME*>(d) : nullptr;
    if (n && (n->getKind() == STATIC_DATA_REF || n->getKind() == EXTERN_DATA_REF)) {
        CT to = ctypes::ctOf(n->getDataType());
        convert(gen(src), to);
        if (n->getKind() == EXTERN_DATA_REF) {
            ins() << "mov\tecx, DWORD PTR ";
            symbolOf(n);
            sink << "@GOT[ebx]\n";
        } else {
            ins() << "lea\tecx, ";
            symbolOf(n);
            sink << "@GOTOFF[ebx]\n";
        }
        store(to, "ecx", 0);
        return;
    }
    // Nothing a C assignment could store into: the source is still evaluated.
    if (src) discard(gen(src).t);
}

void SoundX86::returnSequence() {
    if (curSubprog->getReturnType() != VOID && curSubprog->getReturnTemp()) {
        VT v = genTemp(curSubprog->getReturnTemp());
        CT rt = ctypes::ctOf(curSubprog->getReturnType());
        convert(v, rt);
    }
    ins() << "lea\tesp, [ebp-12]\n";
    ins() << "pop\tedi\n";
    ins() << "pop\tesi\n";
    ins() << "pop\tebx\n";
    ins() << "pop\tebp\n";
    ins() << "ret\n";
}

}  // namespace ZOA
