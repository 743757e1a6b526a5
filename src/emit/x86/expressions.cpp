// The assembly emitter's expressions: buffers, memory reads, widening, operators and addresses.
#include "emit/x86/decompile_asm.h"

#include "core/type_facts.h"
#include "emit/x86/conditions.h"

#include <ostream>

namespace ZOA {

namespace {

// By BinopKind: the two-operand instruction of PLUS and MINUS; null for the
// rest (the relations are written as cmp + set<cc> + movzx, MUL on its own,
// the others without instruction selection).
const char* const binopMnemonics[MAX_BINOP] = {
    "add ",   // PLUS
    "sub ",   // MINUS
};

const char* addressOperator(BinopKind op) {
    switch (op) {
    case PLUS: return " + ";
    case MINUS: return " - ";
    default: return "";
    }
}

BINOP* addressBinop(MEM* mem) {
    ExprBase* address = mem ? mem->getExpr() : nullptr;
    return address && address->getNodeType() == BINOP_NODE ? static_cast<BINOP*>(address) : nullptr;
}

bool isConst(const ExprBase* e) { return e && const_cast<ExprBase*>(e)->getNodeType() == CONST_NODE; }

}  // namespace

void DecompileASM::visit(BUF_TEMP* b) {
    ExprAnnotation* a = annotationOf(b);
    if (a && a->reg != NO_REGISTER) return;
    AsmRegister x = allocateForType(b);
    line() << "lea ";
    putReg(x);
    put(", ");
    sink << sizePrefixText(b);
    put("t");
    putUnsigned(b->getId());
    put("[ebp]");
    endLine();
    assignRegister(b, x, false);
}

// The address goes into a register that the MEM takes over; the read itself
// happens in the instruction that uses the MEM's operand ([reg]).
void DecompileASM::visit(MEM* m) {
    ExprBase* address = m->getExpr();
    visitExpr(address);
    AsmRegister x = loadIntoRegister(address, true);
    assignRegister(m, x, true);
}

// Only CONV4 (byte to dword) has an instruction; other operators leave no trace.
void DecompileASM::visit(UNOP* u) {
    if (u->getOp() != CONV4) return;
    ExprAnnotation* a = ensureAnnotation(u);
    if (a->reg != NO_REGISTER) return;
    visitExpr(u->getExpr());
    AsmRegister x = allocateForType(u);
    assignRegister(u, x, false);
    line() << "movzx ";
    putReg(x);
    put(", ");
    putByteOperand(u->getExpr());
    endLine();
}

void DecompileASM::visit(BINOP* b) {
    visitExpr(b->getLeft());
    visitExpr(b->getRight());
    AsmRegister x = emitBinop(b->getOp(), b->getLeft(), b->getRight());
    assignRegister(b, x, false);
}

// Computes l op r into l's register. add/sub give their register back at once
// (the result stays recorded but unreserved); a comparison's byte register is
// released, which also unreserves its dword; MUL keeps eax reserved.
AsmRegister DecompileASM::emitBinop(BinopKind op, ExprBase* l, ExprBase* r) {
    auto regOf = [](ExprBase* e) {
        ExprAnnotation* a = annotationOf(e);
        return a ? a->reg : NO_REGISTER;
    };
    AsmRegister result = NO_REGISTER;
    if (op != MUL) {
        if (isConst(l) && isConst(r)) {
            if (regOf(l) == NO_REGISTER) {
                AsmRegister x = allocateDword();
                line() << "mov ";
                putReg(x);
                put(", ");
                putOperand(l, true);
                endLine();
                assignRegister(l, x, false);
            } else {
                assignRegister(l, registerOfClass(regOf(l), DWORD), false);
            }
        } else {
            loadIntoRegister(l, false);
        }
    }
    unsigned int index = static_cast<unsigned int>(op);
    const char* mnemonic = index < MAX_BINOP ? binopMnemonics[index] : nullptr;
    if (op == MUL) {
        if (regOf(l) != EAX) {
            claimRegister(EAX);
            DataType t = l ? l->getDataType() : VOID;
            if (isByteType(t)) {
                line() << "movzx eax, ";
                putOperand(l, true);
                endLine();
            } else if (isInt32Type(t)) {
                line() << "mov eax, ";
                putOperand(l, true);
                endLine();
            }
            assignRegister(l, EAX, false);
        }
        if (isSignedValue(l)) {
            line() << "imul ";
            putReg(regOf(l));
            put(", ");
            putOperand(r, true);
            endLine();
        } else if (isConst(r)) {
            AsmRegister y = loadIntoRegister(r, false);
            line() << "mul ";
            putReg(y);
            endLine();
            freeRegister(y);
        } else {
            line() << "mul ";
            putOperand(r, true);
            endLine();
        }
        result = regOf(l);
    } else if (mnemonic) {
        AsmRegister L = regOf(l);
        line() << mnemonic;
        putReg(L);
        put(", ");
        putOperand(r, true);
        endLine();
        result = L;
        freeRegister(L);
    } else if (isRelation(op)) {
        line() << "cmp ";
        putReg(regOf(l));
        put(", ");
        putOperand(r, true);
        endLine();
        AsmRegister b = allocateByte();
        AsmRegister w = registerOfClass(b, DWORD);
        line() << "set" << conditionCode(op) << ' ';
        putReg(b);
        endLine();
        line() << "movzx ";
        putReg(w);
        put(", ");
        putReg(b);
        endLine();
        markRegister(b, false);
        result = w;
    }
    return result;
}

// For a MEM addressed by a sum or difference: both operands into registers
// (constants stay immediate) so that the address is written as [A op B].
AsmRegister DecompileASM::prepareAddress(MEM* mem) {
    BINOP* b = addressBinop(mem);
    if (!b || (b->getOp() != PLUS && b->getOp() != MINUS)) return NO_REGISTER;
    visitExpr(b->getLeft());
    visitExpr(b->getRight());
    AsmRegister last = NO_REGISTER;
    for (ExprBase* operand : {b->getLeft(), b->getRight()}) {
        if (!operand || isConst(operand)) continue;
        ExprAnnotation* a = annotationOf(operand);
        if (a && a->reg != NO_REGISTER) continue;
        AsmRegister x = allocateForType(operand);
        line() << "mov ";
        putReg(x);
        put(", ");
        putOperand(operand, true);
        endLine();
        assignRegister(operand, x, false);
        last = x;
    }
    if (last != NO_REGISTER) return last;
    ExprAnnotation* la = annotationOf(b->getLeft());
    return la ? la->reg : NO_REGISTER;
}

void DecompileASM::putAddress(MEM* mem) {
    BINOP* b = addressBinop(mem);
    put("[");
    if (b) {
        bool first = true;
        for (ExprBase* operand : {b->getLeft(), b->getRight()}) {
            if (!first) put(addressOperator(b->getOp()));
            first = false;
            if (isConst(operand)) {
                putOperand(operand, true);
            } else {
                ExprAnnotation* a = annotationOf(operand);
                putReg(a ? a->reg : NO_REGISTER);
            }
        }
    }
    put("]");
}

AsmRegister DecompileASM::loadFromAddress(MEM* mem) {
    AsmRegister x = prepareAddress(mem);
    line() << "mov ";
    putReg(x);
    put(", ");
    putAddress(mem);
    endLine();
    return x;
}

AsmRegister DecompileASM::loadAddressedValue(MEM* mem) {
    prepareAddress(mem);
    if (mem) ensureAnnotation(mem);
    AsmRegister x = allocateForType(mem);
    line() << "mov ";
    putReg(x);
    put(", ");
    putAddress(mem);
    endLine();
    return x;
}

void DecompileASM::storeToAddress(MEM* mem, AsmRegister v) {
    prepareAddress(mem);
    line() << "mov ";
    putAddress(mem);
    put(", ");
    putReg(v);
    endLine();
}

}  // namespace ZOA
