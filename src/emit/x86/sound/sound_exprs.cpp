// SoundX86: expressions into eax, edx:eax or st(0), and the conversions between C types.
#include "emit/x86/sound/sound_x86.h"

#include "core/op_facts.h"
#include "emit/x86/conditions.h"

#include <cstdint>
#include <cstring>

namespace ZOA {

using ctypes::CT;

void SoundX86::setFlag(std::string_view cc) {
    ins() << "set" << cc << "\tal\n";
    ins() << "movzx\teax, al\n";
}

void SoundX86::pushValue(CT t) {
    if (t == CT::VOID) return;
    if (ctypes::isReal(t)) {
        ins() << "sub\tesp, 8\n";
        ins() << "fstp\tQWORD PTR [esp]\n";
    } else if (ctypes::is64(t)) {
        ins() << "push\tedx\n";
        ins() << "push\teax\n";
    } else {
        ins() << "push\teax\n";
    }
    depth += stackBytes(t);
}

void SoundX86::loadStacked(CT t, long long offset) {
    if (t == CT::VOID) return;
    if (ctypes::isReal(t)) {
        ins() << "fld\t";
        memOperand("QWORD", "esp", offset);
        end();
        return;
    }
    ins() << "mov\teax, ";
    memOperand("DWORD", "esp", offset);
    end();
    if (ctypes::is64(t)) {
        ins() << "mov\tedx, ";
        memOperand("DWORD", "esp", offset + 4);
        end();
    }
}

void SoundX86::drop(unsigned bytes) {
    if (!bytes) return;
    ins() << "add\tesp, ";
    sink.writeUnsigned(bytes);
    end();
    depth -= bytes;
}

void SoundX86::discard(CT t) {
    if (ctypes::isReal(t)) ins() << "fstp\tst(0)\n";
}

void SoundX86::loadFrom(CT t, std::string_view base, long long offset) {
    switch (t) {
    case CT::SCHAR:
    case CT::UCHAR:
        ins() << (t == CT::SCHAR ? "movsx" : "movzx") << "\teax, ";
        memOperand("BYTE", base, offset);
        end();
        return;
    case CT::INT:
    case CT::UINT:
    case CT::POINTER:
        ins() << "mov\teax, ";
        memOperand("DWORD", base, offset);
        end();
        return;
    case CT::LLONG:
    case CT::ULLONG:
        ins() << "mov\tedx, ";
        memOperand("DWORD", base, offset + 4);
        end();
        ins() << "mov\teax, ";
        memOperand("DWORD", base, offset);
        end();
        return;
    case CT::FLOAT:
    case CT::DOUBLE:
        ins() << "fld\t";
        memOperand(t == CT::FLOAT ? "DWORD" : "QWORD", base, offset);
        end();
        return;
    case CT::VOID: return;
    }
}

SoundX86::VT SoundX86::value(ExprBase* e) {
    VT v = gen(e);
    if (v.t != CT::VOID) return v;
    ins() << "xor\teax, eax\n";
    return VT{CT::INT, 1};
}

SoundX86::VT SoundX86::gen(ExprBase* e) {
    if (!e) return VT{};
    NestingLevel level(nesting);
    if (!level.entered()) {  // a cycle: a zero stands for what is not followed
        if (level.cutHere()) writeCutNote();
        ins() << "xor\teax, eax\n";
        return VT{CT::INT, 1};
    }
    switch (e->getNodeType()) {
    case CONST_NODE: return genConst(static_cast<CONST*>(e));
    case NAME_NODE: return genName(static_cast<NAME*>(e));
    case TEMP_NODE:
    case BUF_TEMP_NODE: return genTemp(static_cast<TEMP*>(e));
    case MEM_NODE: return genMem(static_cast<MEM*>(e));
    case UNOP_NODE: return genUnop(static_cast<UNOP*>(e));
    case BINOP_NODE: {
        BINOP* b = static_cast<BINOP*>(e);
        return genBinop(b->getOp(), b->getLeft(), b->getRight());
    }
    case CALL_NODE: return genCall(static_cast<CALL*>(e));
    default: return VT{};
    }
}

SoundX86::VT SoundX86::genConst(CONST* c) {
    CVal v = constValue(c);
    if (v.t == CT::POINTER && c->getPValue()) {
        // A pointer constant holds operand text the client wrote for the assembler.
        ins() << "mov\teax, " << static_cast<const char*>(c->getPValue()) << '\n';
        return VT{CT::POINTER, 1};
    }
    if (v.t == CT::VOID) return VT{};
    if (ctypes::isReal(v.t)) {
        std::uint64_t bits;
        std::memcpy(&bits, &v.real, 8);
        ins() << "push\t";
        num(static_cast<std::int32_t>(bits >> 32));
        end();
        ins() << "push\t";
        num(static_cast<std::int32_t>(bits));
        end();
        ins() << "fld\tQWORD PTR [esp]\n";
        ins() << "add\tesp, 8\n";
        return VT{v.t, 1};
    }
    ins() << "mov\teax, ";
    num(static_cast<std::int32_t>(v.bits));
    end();
    if (ctypes::is64(v.t)) {
        ins() << "mov\tedx, ";
        num(static_cast<std::int32_t>(v.bits >> 32));
        end();
    }
    return VT{v.t, 1};
}

SoundX86::VT SoundX86::genName(NAME* n) {
    switch (n->getKind()) {
    case LABEL_REF:
        if (!n->getLabelRef() || !labelOwner.count(n->getLabelRef())) {
            ins() << "xor\teax, eax\n";
            return VT{CT::POINTER, 1};
        }
        [[fallthrough]];  // a label's address is a local symbol
    case CONST_ARRAY_REF:
    case DATA_ARRAY_REF:
    case STRINGLIT_REF:
        ins() << "lea\teax, ";
        symbolOf(n);
        sink << "@GOTOFF[ebx]\n";
        return VT{CT::POINTER, 1};
    case SUBPROG_REF:
        ins() << "mov\teax, DWORD PTR ";
        symbolOf(n);
        sink << "@GOT[ebx]\n";
        return VT{CT::POINTER, 1};
    case STATIC_DATA_REF:
        ins() << "lea\tecx, ";
        symbolOf(n);
        sink << "@GOTOFF[ebx]\n";
        break;
    case EXTERN_DATA_REF:
        ins() << "mov\tecx, DWORD PTR ";
        symbolOf(n);
        sink << "@GOT[ebx]\n";
        break;
    }
    CT t = ctypes::ctOf(n->getDataType());
    loadFrom(t, "ecx", 0);
    return VT{t, 1};
}

SoundX86::VT SoundX86::genTemp(TEMP* t) {
    if (t->getNodeType() == BUF_TEMP_NODE) return bufferAddress(static_cast<BUF_TEMP*>(t));
    CT c = ctypes::ctOf(t->getDataType());
    loadFrom(c, "ebp", slotOf(t));
    return VT{c, 1};
}

SoundX86::VT SoundX86::genMem(MEM* m) {
    convert(value(m->getExpr()), CT::POINTER);
    CT t = ctypes::ctOf(m->getDataType());
    ins() << "mov\tecx, eax\n";
    loadFrom(t, "ecx", 0);
    return VT{t, 1};
}

SoundX86::VT SoundX86::genUnop(UNOP* u) {
    UnopKind op = u->getOp();
    ExprBase* x = u->getExpr();
    switch (op) {
    case ABS: return genAbs(x);  // out of line: its label keeps the deep walks' frames small
    case NEG:
    case BITWISE_NOT: {
        VT a = value(x);
        CT c = ctypes::promote(a.t);
        convert(a, c);
        if (ctypes::isReal(c)) {
            if (op == NEG) ins() << "fchs\n";
        } else if (ctypes::is64(c)) {
            if (op == NEG) {
                ins() << "neg\teax\n";
                ins() << "adc\tedx, 0\n";
                ins() << "neg\tedx\n";
            } else {
                ins() << "not\teax\n";
                ins() << "not\tedx\n";
            }
        } else {
            ins() << (op == NEG ? "neg\teax\n" : "not\teax\n");
        }
        return VT{c, 1};
    }
    case NOT:
        truth(value(x).t);
        ins() << "xor\teax, 1\n";
        return VT{CT::INT, 1};
    default: break;
    }
    const ConversionFacts& f = conversionFacts(op);
    VT to{f.hasCast ? ctypes::ctOf(f.to) : ctypes::ctOf(u->getDataType()), f.toIntPointer ? 4u : 1u};
    convert(value(x), to.t);
    return to;
}

SoundX86::VT SoundX86::genLogical(BinopKind op, ExprBase* l, ExprBase* r) {
    std::string done = internalLabel();
    truth(value(l).t);
    ins() << (op == AND ? "je\t" : "jne\t") << done << '\n';
    truth(value(r).t);
    defineInternal(done);
    return VT{CT::INT, 1};
}

// The common type of two operands; a pointer, having no arithmetic here, counts as unsigned int.
static CT arithmeticType(CT a, CT b) {
    auto p = [](CT t) { return t == CT::POINTER ? CT::UINT : ctypes::promote(t); };
    return ctypes::common(p(a), p(b));
}

// The type of a right operand usable in place, as a frame slot or an
// immediate: an int or unsigned int temporary or constant; VOID otherwise.
static CT directType(ExprBase* r) {
    if (!r) return CT::VOID;
    if (r->getNodeType() == TEMP_NODE) {
        CT t = ctypes::ctOf(r->getDataType());
        return t == CT::INT || t == CT::UINT ? t : CT::VOID;
    }
    if (r->getNodeType() == CONST_NODE) {
        CT t = SoundX86::constValue(static_cast<CONST*>(r)).t;
        return t == CT::INT || t == CT::UINT ? t : CT::VOID;
    }
    return CT::VOID;
}

void SoundX86::directOperand(ExprBase* r) {
    if (r->getNodeType() == TEMP_NODE) memOperand("DWORD", "ebp", slotOf(static_cast<TEMP*>(r)));
    else num(static_cast<std::int32_t>(constValue(static_cast<CONST*>(r)).bits));
}

// A 32-bit operation whose right operand needs no evaluation: no stack traffic.
bool SoundX86::genDirect(BinopKind op, VT a, ExprBase* r, VT& result) {
    CT rt = directType(r);
    if (rt == CT::VOID) return false;
    bool constant = r->getNodeType() == CONST_NODE;
    if (a.t == CT::POINTER) {
        if (!isRelation(op) && ((op != PLUS && op != MINUS) || a.scale != 1)) return false;
        ins() << (isRelation(op) ? "cmp" : op == PLUS ? "add" : "sub") << "\teax, ";
        directOperand(r);
        end();
        if (isRelation(op)) {
            setFlag(UNSIGNED_CONDITION_CODES[op - EQ]);
            result = VT{CT::INT, 1};
        } else {
            result = a;
        }
        return true;
    }
    CT c = arithmeticType(a.t, rt);
    if (c != CT::INT && c != CT::UINT) return false;
    bool sign = c == CT::INT;
    const char* inst = nullptr;
    switch (op) {
    case PLUS: inst = "add"; break;
    case MINUS: inst = "sub"; break;
    case BITWISE_AND: inst = "and"; break;
    case BITWISE_OR: inst = "or"; break;
    case XOR: inst = "xor"; break;
    case MUL:
    case DIV:
    case MOD: break;
    default:
        if (!isRelation(op)) return false;
        inst = "cmp";
        break;
    }
    convert(a, c);
    if (op == MUL) {
        ins() << "imul\teax, ";
        if (constant) sink << "eax, ";
        directOperand(r);
        end();
    } else if (op == DIV || op == MOD) {
        ins() << "mov\tecx, ";
        directOperand(r);
        end();
        ins() << (sign ? "cdq\n" : "xor\tedx, edx\n");
        ins() << (sign ? "idiv\tecx\n" : "div\tecx\n");
        if (op == MOD) ins() << "mov\teax, edx\n";
    } else {
        mnemonic(inst);
        sink << "\teax, ";
        directOperand(r);
        end();
    }
    result = VT{c, 1};
    if (isRelation(op)) {
        setFlag((sign ? CONDITION_CODES : UNSIGNED_CONDITION_CODES)[op - EQ]);
        result = VT{CT::INT, 1};
    }
    return true;
}

SoundX86::VT SoundX86::genBinop(BinopKind op, ExprBase* l, ExprBase* r) {
    if (op == AND || op == OR) return genLogical(op, l, r);
    VT a = value(l);
    VT direct;
    if (op != LSHIFT && op != RSHIFT && genDirect(op, a, r, direct)) return direct;
    pushValue(a.t);
    VT b = value(r);
    bool pa = a.t == CT::POINTER, pb = b.t == CT::POINTER;
    if (isRelation(op)) return genCompare(op, a, b);
    if ((op == PLUS || op == MINUS) && (pa || pb)) return genPointerArith(op, a, b);
    if (op == LSHIFT || op == RSHIFT) return genShift(op, a, b);
    return genArith(op, a, b);
}

SoundX86::VT SoundX86::genArith(BinopKind op, VT a, VT b) {
    CT c = arithmeticType(a.t, b.t);
    if (ctypes::isReal(c) && op != PLUS && op != MINUS && op != MUL && op != DIV) c = CT::INT;  // no meaning in C
    convert(b, c);
    pushValue(c);
    loadStacked(a.t, stackBytes(c));
    convert(a, c);
    operate(op, c);
    drop(stackBytes(c) + stackBytes(a.t));
    return VT{c, 1};
}

void SoundX86::operate(BinopKind op, CT c) {
    if (ctypes::isReal(c)) {
        const char* m = op == PLUS ? "fadd" : op == MINUS ? "fsub" : op == MUL ? "fmul" : "fdiv";
        ins() << m << "\tQWORD PTR [esp]\n";
        roundReal(c);
        return;
    }
    bool wide = ctypes::is64(c);
    bool sign = ctypes::isSigned(c);
    const char* lo = nullptr;
    const char* hi = nullptr;
    switch (op) {
    case PLUS: lo = "add", hi = "adc"; break;
    case MINUS: lo = "sub", hi = "sbb"; break;
    case BITWISE_AND: lo = hi = "and"; break;
    case BITWISE_OR: lo = hi = "or"; break;
    case XOR: lo = hi = "xor"; break;
    case MUL:
        if (!wide) {
            ins() << "imul\teax, DWORD PTR [esp]\n";
            return;
        }
        ins() << "mov\tecx, DWORD PTR [esp+4]\n";
        ins() << "imul\tecx, eax\n";
        ins() << "imul\tedx, DWORD PTR [esp]\n";
        ins() << "add\tecx, edx\n";
        ins() << "mul\tDWORD PTR [esp]\n";
        ins() << "add\tedx, ecx\n";
        return;
    case DIV:
    case MOD:
        if (wide) {
            callHelper(op == DIV ? (sign ? "__divdi3" : "__udivdi3") : (sign ? "__moddi3" : "__umoddi3"));
            return;
        }
        ins() << (sign ? "cdq\n" : "xor\tedx, edx\n");
        ins() << (sign ? "idiv" : "div") << "\tDWORD PTR [esp]\n";
        if (op == MOD) ins() << "mov\teax, edx\n";
        return;
    default:  // no C text: a zero
        ins() << "xor\teax, eax\n";
        if (wide) ins() << "xor\tedx, edx\n";
        return;
    }
    ins() << lo << "\teax, DWORD PTR [esp]\n";
    if (wide) ins() << hi << "\tedx, DWORD PTR [esp+4]\n";
}

SoundX86::VT SoundX86::genCompare(BinopKind op, VT a, VT b) {
    // With a pointer on either side both compare as unsigned addresses.
    CT c = a.t == CT::POINTER || b.t == CT::POINTER ? CT::POINTER : arithmeticType(a.t, b.t);
    convert(b, c);
    pushValue(c);
    loadStacked(a.t, stackBytes(c));
    convert(a, c);
    unsigned bytes = stackBytes(c) + stackBytes(a.t);
    bool sign = ctypes::isSigned(c);
    if (ctypes::isReal(c)) {
        // x87 compares: "above" fails when unordered, as C's < and > do with a NaN.
        if (op == LT || op == LE) {
            ins() << "fld\tQWORD PTR [esp]\n";
            ins() << "fcompp\n";
        } else {
            ins() << "fcomp\tQWORD PTR [esp]\n";
        }
        ins() << "fnstsw\tax\n";
        ins() << "sahf\n";
        if (op == EQ || op == NE) {
            ins() << (op == EQ ? "sete\tal\n" : "setne\tal\n");
            ins() << (op == EQ ? "setnp\tcl\n" : "setp\tcl\n");
            ins() << (op == EQ ? "and\tal, cl\n" : "or\tal, cl\n");
            ins() << "movzx\teax, al\n";
        } else {
            setFlag(op == LT || op == GT ? "a" : "ae");
        }
        drop(bytes);
        return VT{CT::INT, 1};
    }
    if (ctypes::is64(c)) {
        if (op == EQ || op == NE) {
            ins() << "xor\teax, DWORD PTR [esp]\n";
            ins() << "xor\tedx, DWORD PTR [esp+4]\n";
            ins() << "or\teax, edx\n";
            setFlag(op == EQ ? "e" : "ne");
        } else if (op == LT || op == GE) {
            ins() << "cmp\teax, DWORD PTR [esp]\n";
            ins() << "sbb\tedx, DWORD PTR [esp+4]\n";
            setFlag(op == LT ? (sign ? "l" : "b") : (sign ? "ge" : "ae"));
        } else {  // right - left: GT is right < left
            ins() << "mov\tecx, DWORD PTR [esp]\n";
            ins() << "mov\tesi, DWORD PTR [esp+4]\n";
            ins() << "cmp\tecx, eax\n";
            ins() << "sbb\tesi, edx\n";
            setFlag(op == GT ? (sign ? "l" : "b") : (sign ? "ge" : "ae"));
        }
        drop(bytes);
        return VT{CT::INT, 1};
    }
    ins() << "cmp\teax, DWORD PTR [esp]\n";
    setFlag((sign ? CONDITION_CODES : UNSIGNED_CONDITION_CODES)[op - EQ]);
    drop(bytes);
    return VT{CT::INT, 1};
}

SoundX86::VT SoundX86::genPointerArith(BinopKind op, VT a, VT b) {
    // The left operand is on the stack, the right one in the value registers.
    const char* inst = op == PLUS ? "add" : "sub";
    if (a.t == CT::POINTER && b.t == CT::POINTER) {
        ins() << "mov\tecx, eax\n";
        ins() << "mov\teax, DWORD PTR [esp]\n";
        ins() << inst << "\teax, ecx\n";
        if (op == MINUS && a.scale > 1) {  // a difference counts elements
            ins() << "mov\tecx, ";
            sink.writeUnsigned(a.scale);
            end();
            ins() << "cdq\n";
            ins() << "idiv\tecx\n";
        }
        drop(4);
        return VT{CT::INT, 1};
    }
    unsigned scale = a.t == CT::POINTER ? a.scale : b.scale;
    auto scaled = [&](CT t) {  // an integer operand's low word, times the step
        if (ctypes::isReal(t)) realToInt(CT::INT);
        if (scale > 1) {
            ins() << "imul\teax, eax, ";
            sink.writeUnsigned(scale);
            end();
        }
    };
    if (a.t == CT::POINTER) {
        scaled(b.t);
        ins() << "mov\tecx, eax\n";
        ins() << "mov\teax, DWORD PTR [esp]\n";
    } else {
        ins() << "mov\tecx, eax\n";
        if (ctypes::isReal(a.t)) {
            ins() << "push\tecx\n";
            ins() << "fld\tQWORD PTR [esp+4]\n";
            scaled(a.t);
            ins() << "pop\tecx\n";
        } else {
            ins() << "mov\teax, DWORD PTR [esp]\n";
            scaled(a.t);
        }
    }
    ins() << inst << "\teax, ecx\n";
    drop(stackBytes(a.t));
    return VT{CT::POINTER, scale};
}

SoundX86::VT SoundX86::genShift(BinopKind op, VT a, VT b) {
    if (ctypes::isReal(b.t)) realToInt(CT::INT);
    ins() << "mov\tecx, eax\n";
    CT c = a.t == CT::POINTER ? CT::UINT : ctypes::promote(a.t);
    if (ctypes::isReal(c)) c = CT::INT;  // no meaning in C
    if (ctypes::isReal(a.t)) ins() << "push\tecx\n";
    loadStacked(a.t, ctypes::isReal(a.t) ? 4 : 0);
    convert(a, c);
    if (ctypes::isReal(a.t)) ins() << "pop\tecx\n";
    bool sign = ctypes::isSigned(c);
    if (!ctypes::is64(c)) {
        ins() << (op == LSHIFT ? "shl" : sign ? "sar" : "shr") << "\teax, cl\n";
    } else {
        std::string done = internalLabel();
        ins() << "and\tecx, 63\n";
        if (op == LSHIFT) {
            ins() << "shld\tedx, eax, cl\n";
            ins() << "shl\teax, cl\n";
        } else {
            ins() << "shrd\teax, edx, cl\n";
            ins() << (sign ? "sar" : "shr") << "\tedx, cl\n";
        }
        ins() << "test\tcl, 32\n";
        ins() << "je\t" << done << '\n';
        if (op == LSHIFT) {
            ins() << "mov\tedx, eax\n";
            ins() << "xor\teax, eax\n";
        } else {
            ins() << "mov\teax, edx\n";
            ins() << (sign ? "sar\tedx, 31\n" : "xor\tedx, edx\n");
        }
        defineInternal(done);
    }
    drop(stackBytes(a.t));
    return VT{c, 1};
}

}  // namespace ZOA
