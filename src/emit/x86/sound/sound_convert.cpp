// SoundX86: the conversions between C types in the value registers, truth values and ABS.
#include "emit/x86/sound/sound_x86.h"

namespace ZOA {

using ctypes::CT;

// A floating value rounded to its type through memory, as C stores it.
void SoundX86::roundReal(CT to) {
    const char* size = to == CT::FLOAT ? "DWORD" : "QWORD";
    const char* bytes = to == CT::FLOAT ? "4" : "8";
    ins() << "sub\tesp, " << bytes << '\n';
    ins() << "fstp\t" << size << " PTR [esp]\n";
    ins() << "fld\t" << size << " PTR [esp]\n";
    ins() << "add\tesp, " << bytes << '\n';
}

void SoundX86::intToReal(CT from) {
    if (from == CT::SCHAR || from == CT::INT) {
        ins() << "push\teax\n";
        ins() << "fild\tDWORD PTR [esp]\n";
        ins() << "add\tesp, 4\n";
        return;
    }
    ins() << (ctypes::is64(from) ? "push\tedx\n" : "push\t0\n");
    ins() << "push\teax\n";
    ins() << "fild\tQWORD PTR [esp]\n";
    ins() << "add\tesp, 8\n";
    if (from != CT::ULLONG) return;
    // fild read the top bit as a sign: add 2^64 back.
    std::string done = internalLabel();
    ins() << "test\tedx, edx\n";
    ins() << "jns\t" << done << '\n';
    ins() << "push\t1602224128\n";  // 2^64 as a float
    ins() << "fadd\tDWORD PTR [esp]\n";
    ins() << "add\tesp, 4\n";
    defineInternal(done);
}

// Truncation toward zero, as C converts: fistp under a rounding mode of chop.
void SoundX86::realToInt(CT to) {
    bool huge = to == CT::ULLONG;
    std::string small;
    if (huge) {
        // From 2^63 up, convert x - 2^63 and set the top bit again.
        small = internalLabel();
        ins() << "xor\tecx, ecx\n";
        ins() << "push\t1593835520\n";  // 2^63 as a float
        ins() << "fcom\tDWORD PTR [esp]\n";
        ins() << "fnstsw\tax\n";
        ins() << "sahf\n";
        ins() << "jb\t" << small << '\n';
        ins() << "fsub\tDWORD PTR [esp]\n";
        ins() << "mov\tecx, -2147483648\n";
        defineInternal(small);
        ins() << "add\tesp, 4\n";
    }
    ins() << "sub\tesp, 12\n";
    ins() << "fnstcw\tWORD PTR [esp]\n";
    ins() << "movzx\teax, WORD PTR [esp]\n";
    ins() << "or\teax, 3072\n";
    ins() << "mov\tWORD PTR [esp+2], ax\n";
    ins() << "fldcw\tWORD PTR [esp+2]\n";
    ins() << "fistp\tQWORD PTR [esp+4]\n";
    ins() << "fldcw\tWORD PTR [esp]\n";
    ins() << "mov\teax, DWORD PTR [esp+4]\n";
    ins() << "mov\tedx, DWORD PTR [esp+8]\n";
    ins() << "add\tesp, 12\n";
    if (huge) ins() << "xor\tedx, ecx\n";
    if (to == CT::SCHAR) ins() << "movsx\teax, al\n";
    if (to == CT::UCHAR) ins() << "movzx\teax, al\n";
}

void SoundX86::convert(VT from, CT to) {
    CT f = from.t;
    if (to == CT::VOID) {
        discard(f);
        return;
    }
    if (f == CT::VOID) {  // no value: read as zero
        if (ctypes::isReal(to)) ins() << "fldz\n";
        else ins() << "xor\teax, eax\n";
        if (ctypes::is64(to)) ins() << "xor\tedx, edx\n";
        return;
    }
    if (f == to) return;
    if (ctypes::isReal(f) && ctypes::isReal(to)) {
        if (to == CT::FLOAT) roundReal(to);
        return;
    }
    if (ctypes::isReal(to)) {
        intToReal(f);
        if (to == CT::FLOAT || ctypes::is64(f)) roundReal(to);
        return;
    }
    if (ctypes::isReal(f)) {
        realToInt(to);
        return;
    }
    if (ctypes::is64(to)) {
        if (!ctypes::is64(f)) ins() << (ctypes::isSigned(f) ? "cdq\n" : "xor\tedx, edx\n");
        return;
    }
    if (to == CT::SCHAR) ins() << "movsx\teax, al\n";
    if (to == CT::UCHAR) ins() << "movzx\teax, al\n";
}

void SoundX86::truth(CT t) {
    if (t == CT::VOID) {
        ins() << "xor\teax, eax\n";
        return;
    }
    if (ctypes::isReal(t)) {
        ins() << "fldz\n";
        ins() << "fucompp\n";
        ins() << "fnstsw\tax\n";
        ins() << "sahf\n";
        ins() << "setne\tal\n";
        ins() << "setp\tcl\n";
        ins() << "or\tal, cl\n";
        ins() << "movzx\teax, al\n";
        return;
    }
    if (ctypes::is64(t)) ins() << "or\teax, edx\n";
    else ins() << "test\teax, eax\n";
    setFlag("ne");
}

// ABS as the C writes it, (x>=0?x: -x): x is evaluated twice.
SoundX86::VT SoundX86::genAbs(ExprBase* x) {
    VT a = value(x);
    CT c = ctypes::promote(a.t);
    convert(a, c);
    if (ctypes::isReal(c)) {
        ins() << "ftst\n";
        ins() << "fnstsw\tax\n";
        ins() << "sahf\n";
        ins() << "fstp\tst(0)\n";
        setFlag("ae");
    } else if (!ctypes::isSigned(c)) {
        ins() << "mov\teax, 1\n";
    } else {
        ins() << "test\t" << (ctypes::is64(c) ? "edx, edx\n" : "eax, eax\n");
        setFlag("ns");
    }
    pushValue(CT::INT);
    convert(value(x), c);
    std::string done = internalLabel();
    ins() << "cmp\tDWORD PTR [esp], 0\n";
    ins() << "jne\t" << done << '\n';
    if (ctypes::isReal(c)) {
        ins() << "fchs\n";
    } else if (ctypes::is64(c)) {
        ins() << "neg\teax\n";
        ins() << "adc\tedx, 0\n";
        ins() << "neg\tedx\n";
    } else {
        ins() << "neg\teax\n";
    }
    defineInternal(done);
    drop(4);
    return VT{c, 1};
}

}  // namespace ZOA
