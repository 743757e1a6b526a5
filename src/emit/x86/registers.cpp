// The assembly emitter's register model: names, aliasing, reservation, allocation and loads.
#include "emit/x86/decompile_asm.h"

#include "core/type_facts.h"

#include <cstdint>
#include <string_view>

namespace ZOA {

namespace {

struct RegisterText {
    std::string_view plain;
    std::string_view bracketed;
};

// Indexed by register number; empty where a number has no text.
const RegisterText registerTexts[NO_REGISTER] = {
    {"ah", "[ah]"}, {"al", "[al]"}, {"bh", "[bh]"}, {"bl", "[bl]"},
    {"ch", "[ch]"}, {"cl", "[cl]"}, {"dh", "[dh]"}, {"dl", "[dl]"},
    {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {}, {},
    {"eax", "[eax]"}, {"ebx", "[ebx]"}, {"ecx", "[ecx]"}, {"edx", "[edx]"},
    {"edi", "[edi]"}, {"esi", "[esi]"}, {"ebp", "[ebp]"}, {"esp", "[esp]"},
    {}, {}, {}, {}, {}, {}, {}, {},
    {"rax", "[rax]"}, {"rbx", "[rbx]"}, {"rcx", "[rcx]"}, {"rdx", "[rdx]"},
    {"rdi", "[rdi]"}, {"rsi", "[rsi]"}, {"rbp", "[rbp]"}, {"rsp", "[rsp]"},
    {}, {}, {}, {}, {}, {}, {}, {},
};

AsmRegister reg(unsigned int n) { return static_cast<AsmRegister>(n); }

// Register families: a, b, c, d have byte forms; di, si, bp, sp do not.
bool hasByteForms(unsigned int family) { return family < 4; }

// The slots set in a holder mask, lowest first (the order of the slot array).
template <class F> void forEachSlot(std::uint32_t mask, F f) {
    for (; mask; mask &= mask - 1) f(static_cast<unsigned int>(__builtin_ctz(mask)));
}

}  // namespace

std::string_view DecompileASM::registerText(AsmRegister r, bool bracketed) {
    if (r == NO_REGISTER) return "";
    if (r > NO_REGISTER || registerTexts[r].plain.empty()) return "unknown register";
    return bracketed ? registerTexts[r].bracketed : registerTexts[r].plain;
}

// The texts are literals, so the view's data is terminated.
const char* DecompileASM::registerName(AsmRegister r, bool bracketed) { return registerText(r, bracketed).data(); }

AsmRegister DecompileASM::registerOfClass(AsmRegister r, RegClass cls) {
    if (r < 8) {
        switch (cls) {
        case LOW_BYTE:
        case HIGH_BYTE: return r;  // a byte register stays itself
        case DWORD: return reg(EAX + r / 2);
        case QWORD: return reg(RAX + r / 2);
        }
        return NO_REGISTER;
    }
    bool wide = (r >= EAX && r <= ESP) || (r >= RAX && r <= RSP);
    if (!wide) return NO_REGISTER;
    unsigned int family = r % 16;
    switch (cls) {
    case LOW_BYTE: return hasByteForms(family) ? reg(2 * family + 1) : NO_REGISTER;
    case HIGH_BYTE: return hasByteForms(family) ? reg(2 * family) : NO_REGISTER;
    case DWORD: return reg(EAX + family);
    case QWORD: return reg(RAX + family);
    }
    return NO_REGISTER;
}

bool DecompileASM::isRegisterOfClass(AsmRegister r, RegClass cls) {
    switch (cls) {
    case LOW_BYTE: return r <= DL;
    case HIGH_BYTE: return false;
    case DWORD: return r >= EAX && r <= ESP;
    case QWORD: return r >= RAX && r <= RSP;
    }
    return false;
}

// A byte register reserves its own number and the family's wider forms (not
// the other byte register); a wider register of a, b, c or d reserves both
// byte registers as well. bp and sp are never tracked.
void DecompileASM::markRegister(AsmRegister r, bool flag) {
    unsigned int family;
    if (r < 8) {
        family = r / 2;
        regInUse[r] = flag;
    } else if ((r >= AX && r <= SI) || (r >= EAX && r <= ESI) || (r >= RAX && r <= RSI)) {
        family = r % 16;
        if (hasByteForms(family)) {
            regInUse[2 * family] = flag;
            regInUse[2 * family + 1] = flag;
        }
    } else {
        return;
    }
    regInUse[AX + family] = flag;
    regInUse[EAX + family] = flag;
    regInUse[RAX + family] = flag;
}

void DecompileASM::evict(ExprBase* holder) {
    if (ExprAnnotation* a = annotationOf(holder)) {
        a->reg = NO_REGISTER;
        a->isIndirect = false;
        a->isAddressBase = false;
        a->isAssigned = false;
    }
}

namespace {

// Bit r of aliases[h] is set when r is one of h's forms (registerOfClass of h
// in some class): freeing r evicts a holder of h. Numbers without forms have
// none. Worked out once from registerOfClass, so the two always agree.
struct AliasTable {
    std::uint64_t aliases[NO_REGISTER] = {};
    AliasTable() {
        for (unsigned int h = 0; h < NO_REGISTER; ++h)
            for (RegClass c : {LOW_BYTE, HIGH_BYTE, DWORD, QWORD}) {
                AsmRegister r = DecompileASM::registerOfClass(reg(h), c);
                if (r < NO_REGISTER) aliases[h] |= std::uint64_t{1} << r;
            }
    }
    bool aliased(AsmRegister held, AsmRegister r) const {
        return held < NO_REGISTER && r < NO_REGISTER && (aliases[held] >> r & 1);
    }
};
const AliasTable aliasTable;

}  // namespace

// Evicts every holder of r in any width, then clears r's reservation.
void DecompileASM::freeRegister(AsmRegister r) {
    if (r == NO_REGISTER) return;
    forEachSlot(heldSlots, [&](unsigned int i) {
        ExprAnnotation* a = annotationOf(regHolders[i]);
        if (aliasTable.aliased(a ? a->reg : NO_REGISTER, r)) dropHolder(i);
    });
    markRegister(r, false);
}

AsmRegister DecompileASM::claimRegister(AsmRegister r) {
    freeRegister(r);
    markRegister(r, true);
    return r;
}

void DecompileASM::resetRegisters() {
    for (bool& f : regInUse) f = false;
    forEachSlot(heldSlots, [&](unsigned int i) { dropHolder(i); });
}

// Between statements: a local temporary that has lost its register keeps its
// slot (with isAssigned cleared, so it may be stolen from); everything else
// is released.
void DecompileASM::releaseStatementRegisters(StmtBase* stmt) {
    if (!stmt || stmt->getNodeType() == SEQ_NODE) return;
    forEachSlot(heldSlots, [&](unsigned int i) {
        ExprBase* holder = regHolders[i];
        ExprAnnotation* a = annotationOf(holder);
        AsmRegister held = a ? a->reg : NO_REGISTER;
        if (holder->getNodeType() == TEMP_NODE && static_cast<TEMP*>(holder)->getType() != ARGUMENT_TEMP &&
            held == NO_REGISTER) {
            if (a) a->isAssigned = false;
            return;
        }
        markRegister(held, false);
        dropHolder(i);
    });
}

AsmRegister DecompileASM::allocateByte() {
    for (unsigned int r = AH; r <= DL; ++r)
        if (!regInUse[r]) return claimRegister(reg(r));
    return stealRegister(LOW_BYTE);
}

AsmRegister DecompileASM::allocateDword() {
    for (unsigned int r = EAX; r <= EDX; ++r)
        if (!regInUse[r]) return claimRegister(reg(r));
    return stealRegister(DWORD);
}

AsmRegister DecompileASM::allocateQword() {
    for (unsigned int r = RAX; r <= RDX; ++r)
        if (!regInUse[r]) return claimRegister(reg(r));
    return stealRegister(QWORD);
}

namespace {
enum Width { BYTE_WIDTH, DWORD_WIDTH, QWORD_WIDTH, NO_WIDTH };
// The register width of e's type: FLOAT and POINTER in a dword, DOUBLE in a qword.
Width widthOf(const ExprBase* e) {
    switch (e ? sizeOfType(e->getDataType()) : 0) {
    case 1: return BYTE_WIDTH;
    case 4: return DWORD_WIDTH;
    case 8: return QWORD_WIDTH;
    default: return NO_WIDTH;
    }
}
}  // namespace

AsmRegister DecompileASM::allocateForType(ExprBase* e) {
    switch (widthOf(e)) {
    case BYTE_WIDTH: return allocateByte();
    case DWORD_WIDTH: return allocateDword();
    case QWORD_WIDTH: return allocateQword();
    case NO_WIDTH: return NO_REGISTER;
    }
    return NO_REGISTER;
}

// Takes a register from a temporary that merely caches its value. Holders
// normally have isAssigned set, so with every register of a width reserved
// this usually yields NO_REGISTER: values are never spilled.
AsmRegister DecompileASM::stealRegister(RegClass cls) {
    for (std::uint32_t m = heldSlots; m; m &= m - 1) {
        ExprBase* holder = regHolders[__builtin_ctz(m)];
        if (holder->getNodeType() != TEMP_NODE) continue;
        ExprAnnotation* a = annotationOf(holder);
        if (a && !a->isAssigned && !a->isAddressBase && isRegisterOfClass(a->reg, cls)) return claimRegister(a->reg);
    }
    for (std::uint32_t m = heldSlots; m; m &= m - 1) {
        ExprBase* holder = regHolders[__builtin_ctz(m)];
        if (holder->getNodeType() != TEMP_NODE) continue;
        ExprAnnotation* a = annotationOf(holder);
        if (a && !a->isAssigned) {
            AsmRegister r = a->reg;
            AsmRegister nr = registerOfClass(r, cls);
            freeRegister(r);
            return claimRegister(nr);
        }
    }
    return NO_REGISTER;
}

// Records e as living in r; reservations are left as they are.
void DecompileASM::assignRegister(ExprBase* e, AsmRegister r, bool indirect) {
    if (!e) return;
    ExprAnnotation* a = ensureAnnotation(e);
    if (e->getNodeType() == MEM_NODE) {
        forEachSlot(heldSlots, [&](unsigned int i) {
            if (regHolders[i]->getNodeType() != TEMP_NODE) return;
            ExprAnnotation* h = annotationOf(regHolders[i]);
            if (h && h->reg == r) h->isAddressBase = true;
        });
    }
    std::uint32_t freeSlots = ~heldSlots & ((std::uint32_t{1} << HOLDER_SLOTS) - 1);
    if (a->reg == NO_REGISTER && freeSlots) {
        unsigned int i = static_cast<unsigned int>(__builtin_ctz(freeSlots));
        regHolders[i] = e;
        heldSlots |= std::uint32_t{1} << i;
    }
    a->reg = r;
    a->isIndirect = indirect;
    a->isAssigned = true;
}

// A value already in a register is only resized to its type's width (and
// reserved when claim is set, which also drops e from the holders); otherwise
// it is loaded into a fresh register.
AsmRegister DecompileASM::loadIntoRegister(ExprBase* e, bool claim) {
    if (!e) return NO_REGISTER;
    ExprAnnotation* a = annotationOf(e);
    if (a && a->reg != NO_REGISTER) {
        AsmRegister r = a->reg;
        switch (widthOf(e)) {
        case BYTE_WIDTH: r = registerOfClass(r, LOW_BYTE); break;
        case DWORD_WIDTH: r = registerOfClass(r, DWORD); break;
        case QWORD_WIDTH: r = registerOfClass(r, QWORD); break;
        case NO_WIDTH: break;
        }
        a->reg = r;
        if (claim) claimRegister(r);
        return r;
    }
    AsmRegister r = allocateForType(e);
    line() << "mov ";
    putReg(r);
    put(", ");
    putOperand(e, true);
    endLine();
    assignRegister(e, r, false);
    return r;
}

}  // namespace ZOA
