// SoundX86: calls with the i386 System V convention, alloca, and libgcc's 64-bit division.
#include "emit/x86/sound/sound_x86.h"

#include <cstring>

namespace ZOA {

using ctypes::CT;

namespace {

bool named(const String& s, const char* text) {
    std::size_t n = std::strlen(text);
    return s.size() == n && std::memcmp(s.data(), text, n) == 0;
}

}  // namespace

void SoundX86::storeArgument(CT t, long long offset) {
    switch (t) {
    case CT::SCHAR:
    case CT::UCHAR:  // a whole slot, extended as the value already is
        store(CT::INT, "esp", offset);
        return;
    default: store(t, "esp", offset); return;
    }
}

// The type an argument is passed as: the declared parameter's while there
// is one, past them C's default promotions (FLOAT as DOUBLE, chars as int),
// as the C compiler passes them for the declaration the sound C writes.
// A call through a pointer declares the arguments' own types.
SoundX86::CT SoundX86::argumentType(const CallSignature* sig, std::size_t i, ExprBase* a) {
    DataType t = a ? a->getDataType() : INT_S;
    if (sig && i < sig->params.size() && sig->params[i] != VOID) t = sig->params[i];
    else if (sig && t == FLOAT) t = DOUBLE;
    CT c = ctypes::ctOf(t);
    return c == CT::VOID || (sig && i >= sig->params.size() && ctypes::bitsOf(c) == 8) ? CT::INT : c;
}

// Zero of a type in the value registers: what a value asked of a void function is.
void SoundX86::zeroValue(CT t) {
    if (ctypes::isReal(t)) {
        ins() << "fldz\n";
        return;
    }
    ins() << "xor\teax, eax\n";
    if (ctypes::is64(t)) ins() << "xor\tedx, edx\n";
}

// Arguments are evaluated left to right, as the interpreter does, each into
// its slot of an area reserved first, so that calls nested in arguments find
// the stack aligned too. Only the argument loop is here: calls nested as deep
// as the walks go keep this frame small.
SoundX86::VT SoundX86::genCall(CALL* c) {
    if (!c->getFunctionPointer() && named(c->getFunctionName(), "alloca")) return genAlloca(c);
    const CallSignature* sig = signatureOf(c);
    unsigned area = reserveArguments(c, sig);
    std::size_t i = paramStack.size() - c->getArgs().size();
    long long offset = 0;
    std::size_t k = 0;
    for (ExprBase* a : c->getArgs()) {
        CT t = paramStack[i++];
        VT v = value(a);
        // Past a declaration's fixed part the sound C casts an argument to
        // its node's type (the value the tree means) before C promotes it.
        CT own = a ? ctypes::ctOf(a->getDataType()) : CT::VOID;
        if (sig && k++ >= sig->params.size() && own != CT::VOID && own != v.t) {
            convert(v, own);
            v = VT{own, 1};
        }
        convert(v, t);
        storeArgument(t, offset);
        offset += slotBytes(t);
    }
    return makeCall(c, sig, area);
}

const CallSignature* SoundX86::signatureOf(CALL* c) const {
    const String& name = c->getFunctionName();
    return c->getFunctionPointer() ? nullptr : signatures.find(std::string_view(name.data(), name.size()));
}

// The arguments' types onto paramStack and their area, padded so that esp is
// 16-byte aligned at the call; the bytes reserved.
unsigned SoundX86::reserveArguments(CALL* c, const CallSignature* sig) {
    unsigned bytes = 0;
    std::size_t i = 0;
    for (ExprBase* a : c->getArgs()) {
        CT t = argumentType(sig, i++, a);
        paramStack.push_back(t);
        bytes += slotBytes(t);
    }
    unsigned pad = (16 - (depth + bytes) % 16) % 16;
    if (pad + bytes) {
        ins() << "sub\tesp, ";
        sink.writeUnsigned(pad + bytes);
        end();
    }
    depth += pad + bytes;
    return pad + bytes;
}

SoundX86::VT SoundX86::makeCall(CALL* c, const CallSignature* sig, unsigned area) {
    paramStack.resize(paramStack.size() - c->getArgs().size());
    const String& name = c->getFunctionName();
    if (TEMP* fp = c->getFunctionPointer()) {
        convert(genTemp(fp), CT::POINTER);
        ins() << "call\teax\n";
    } else if (name.empty()) {
        ins() << "ud2\n";  // neither a name nor a pointer
    } else {
        ins() << "call\t" << name << "@PLT\n";
    }
    drop(area);
    // The value is what the function really returns (a unit's subprogram or
    // a C library function), converted to the call's type as the C casts it.
    DataType wanted = c->getDataType();
    DataType real = sig && (sig->library || sig->defined) ? sig->returnType : wanted;
    CT ret = ctypes::ctOf(real);
    if (ret == CT::SCHAR) ins() << "movsx\teax, al\n";
    if (ret == CT::UCHAR) ins() << "movzx\teax, al\n";
    if (wanted == VOID || wanted == real) return VT{ret, 1};
    CT to = ctypes::ctOf(wanted);
    if (ret == CT::VOID) zeroValue(to);
    else convert(VT{ret, 1}, to);
    return VT{to, 1};
}

// Stack memory that lives until the subprogram returns: esp goes down by the
// size rounded to 16, and the operands already pushed move down with it.
SoundX86::VT SoundX86::genAlloca(CALL* c) {
    if (c->getArgs().empty()) ins() << "xor\teax, eax\n";
    else convert(value(c->getArgs().front()), CT::UINT);
    ins() << "add\teax, 15\n";
    ins() << "and\teax, -16\n";
    ins() << "sub\tesp, eax\n";
    for (unsigned k = 0; k < depth; k += 4) {
        ins() << "mov\tecx, DWORD PTR [esp+eax+";
        sink.writeUnsigned(k);
        sink << "]\n";
        ins() << "mov\t";
        memOperand("DWORD", "esp", k);
        sink << ", ecx\n";
    }
    ins() << "lea\teax, ";
    memOperand("DWORD", "esp", depth);
    end();
    return VT{CT::POINTER, 1};
}

void SoundX86::callHelper(const char* name) {
    unsigned pad = (16 - (depth + 16) % 16) % 16;
    ins() << "mov\tecx, DWORD PTR [esp]\n";
    ins() << "mov\tesi, DWORD PTR [esp+4]\n";
    if (pad) {
        ins() << "sub\tesp, ";
        sink.writeUnsigned(pad);
        end();
    }
    ins() << "push\tesi\n";
    ins() << "push\tecx\n";
    ins() << "push\tedx\n";
    ins() << "push\teax\n";
    ins() << "call\t" << name << "@PLT\n";
    ins() << "add\tesp, ";
    sink.writeUnsigned(pad + 16);
    end();
}

}  // namespace ZOA
