// The assembly emitter's subprograms: header, frame, prologue, epilogue and calls.
#include "emit/x86/decompile_asm.h"

#include "core/type_facts.h"

#include <zoa/stmt.h>
#include <zoa/subprog.h>

#include <iostream>

namespace ZOA {

namespace {

// Bytes an argument takes in the outgoing area.
unsigned int argumentBytes(const ExprBase* e) {
    return e && sizeOfType(e->getDataType()) == 8 ? 8 : 4;
}

bool isWideArgument(const ExprBase* e) { return argumentBytes(e) == 8; }

unsigned int roundUp(unsigned int v, unsigned int to) { return (v + to - 1) / to * to; }

}  // namespace

DecompileASM::DecompileASM(std::ostream& os, bool isGcc) : DecompileBase(os, isGcc), notes(&std::cout), sink(os) {
    for (ExprBase*& h : regHolders) h = nullptr;
    for (bool& f : regInUse) f = false;
}

DecompileASM::~DecompileASM() {}

void DecompileASM::declareNamePrototype(NAME*) {}
void DecompileASM::declareSubprogPrototype(SUBPROG*) {}
void DecompileASM::declareCallPrototype(CALL*) {}

// Frame: arguments above the return address, ebx saved at ebp-4, the used
// local temporaries below it, the outgoing argument area at esp. Every slot is
// described by a "t<id> = <offset>" symbol line.
void DecompileASM::visit(SUBPROG* sp) {
    line() << ".intel_syntax noprefix";
    endLine();
    endEntry();
    // Kept word for word on purpose: existing clients look for this note.
    *notes << "FIXME: implement dumpAllStaticData" << std::endl;
    line() << ".text";
    endLine();
    if (!sp->isStatic()) {
        sink << ".globl " << sp->getName();
        endLine();
    }
    line() << ".type " << sp->getName() << ",@function";
    endLine();
    line() << sp->getName() << ':';
    endLine();

    used.collect(sp);
    ++indentLevel;

    unsigned int s = 4;
    for (TEMP* arg : sp->getAllArgTemps()) {
        if (!arg) continue;
        unsigned int z = valueSize(arg);
        s += z > 4 ? z : 4;
        arg->setAnnotation(new ExprAnnotation(static_cast<int>(s)), true);
        writeTempSymbol(arg);
    }

    for (CALL* c : used.calls()) {
        unsigned int bytes = 0;
        for (ExprBase* a : c->getArgs()) bytes += argumentBytes(a);
        if (bytes > maxOutgoingArgBytes) maxOutgoingArgBytes = bytes;
    }

    s = 4;
    for (TEMP* t : sp->getAllTemps()) {
        if (!used.isUsed(t) || t->getType() == ARGUMENT_TEMP) continue;
        unsigned int z = valueSize(t);
        s += z;
        if (z >= 5) s = roundUp(s, 8);
        else if (z >= 2) s = roundUp(s, 4);
        t->setAnnotation(new ExprAnnotation(-static_cast<int>(s)), true);
        writeTempSymbol(t);
    }
    endLine();

    // Size keywords on register operands are odd but accepted by the
    // assembler, and kept: the exact texts have them.
    line() << "push DWORD PTR ebp";
    endLine();
    line() << "mov DWORD PTR ebp, DWORD PTR esp";
    endLine();
    unsigned int frame = roundUp(roundUp(s, 4) + maxOutgoingArgBytes, 8);
    line() << "sub esp, ";
    putUnsigned(frame);
    endLine();
    line() << "mov DWORD PTR -4[ebp], DWORD PTR ebx";
    endLine();

    buildTraces();
    for (LABEL* l : traceOrder)
        if (l) l->accept(this);
    --indentLevel;
    endLine();
    endLine();
    endEntry();
}

void DecompileASM::writeEpilogue() {
    SUBPROG* sp = curSubprog;
    TEMP* result = sp ? sp->getReturnTemp() : nullptr;
    if (sp && sp->getReturnType() != VOID && result) {
        acceptNested(result);
        claimRegister(EAX);
        line() << (isByteType(result->getDataType()) ? "movzx eax, " : "mov eax, ");
        putOperand(result, true);
        endLine();
    }
    line() << "mov DWORD PTR ebx, DWORD PTR -4[ebp]";
    endLine();
    line() << "leave";
    endLine();
    line() << "ret";
    endLine();
}

// The size is rounded up to 16 bytes and taken from esp; the block starts
// above the outgoing argument area, which stays at esp.
void DecompileASM::writeAlloca(CALL* c) {
    const ExprVector& args = c->getArgs();
    ExprBase* size = args.empty() ? nullptr : args.front();
    if (size) {
        acceptNested(size);
        AsmRegister r = loadIntoRegister(size, false);
        line() << "add " << registerText(r) << ", 15 # alloca";
        endLine();
        line() << "shr " << registerText(r) << ", 4";
        endLine();
        line() << "sal " << registerText(r) << ", 4";
        endLine();
        line() << "sub esp, " << registerText(r);
        endLine();
    }
    if (maxOutgoingArgBytes != 0) {
        line() << "lea eax, [esp+";
        putUnsigned(maxOutgoingArgBytes);
        put("]");
    } else {
        line() << "mov eax, esp";
    }
    endLine();
    claimRegister(EAX);
    assignRegister(c, EAX, false);
}

// cdecl without pushes: the arguments are stored into the outgoing area from
// the last one down, staged through eax; eax, ecx and edx do not survive the
// call, and the result is left in eax.
void DecompileASM::visit(CALL* c) {
    const String& name = c->getFunctionName();
    if (!name.empty() && (name == "alloca" || name == "_alloca")) {
        writeAlloca(c);
        return;
    }
    freeRegister(EAX);
    freeRegister(ECX);
    freeRegister(EDX);
    const ExprVector& args = c->getArgs();
    int off = -4;
    for (ExprBase* a : args) off += static_cast<int>(argumentBytes(a));
    AsmRegister staging = NO_REGISTER;
    for (unsigned int r = EAX; r <= EDX; ++r) {
        if (!regInUse[r]) {
            staging = claimRegister(static_cast<AsmRegister>(r));
            break;
        }
    }
    for (auto it = args.rbegin(); it != args.rend(); ++it) {
        ExprBase* a = *it;
        if (!a) {
            off -= 4;
            continue;
        }
        acceptNested(a);
        bool isConstant = a->getNodeType() == CONST_NODE;
        if (isWideArgument(a)) {
            if (isConstant) {
                line() << "mov DWORD PTR [esp+";
                putInt(off);
                put("], 0");
                endLine();
            } else {
                if (a->getNodeType() == MEM_NODE) {
                    ExprAnnotation* ma = annotationOf(a);
                    line() << "mov DWORD PTR eax, DWORD PTR [" << registerText(ma ? ma->reg : NO_REGISTER) << "+4]";
                    endLine();
                }
                line() << "mov DWORD PTR [esp+";
                putInt(off);
                put("], eax");
                endLine();
            }
            off -= 4;
        }
        if (!isConstant && isByteType(a->getDataType())) {
            line() << "movzx eax, ";
            putOperand(a, true);
            endLine();
        } else {
            line() << "mov DWORD PTR eax, ";
            putOperand(a, true);
            endLine();
            ExprAnnotation* aa = annotationOf(a);
            freeRegister(aa ? aa->reg : NO_REGISTER);
        }
        line() << "mov DWORD PTR [esp";
        if (off != 0) {
            put("+");
            putInt(off);
        }
        put("], eax");
        endLine();
        off -= 4;
    }
    markRegister(staging, false);
    TEMP* pointer = c->getFunctionPointer();
    if (!pointer) {
        line() << "call " << name;
    } else {
        AsmRegister r = loadIntoRegister(pointer, false);
        line() << "call " << registerText(r);
    }
    endLine();
    claimRegister(EAX);
    assignRegister(c, EAX, false);
}

}  // namespace ZOA
