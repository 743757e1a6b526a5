// SoundX86: data names in .data, .rodata and .bss, and the values of constants.
#include "emit/x86/sound/sound_x86.h"

#include "core/c_literal.h"
#include "core/type_facts.h"
#include "emit/c/c_rules.h"

#include <cfloat>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace ZOA {

using ctypes::CT;

namespace {

unsigned alignmentOf(DataType t) {
    unsigned s = sizeOfType(t);
    return s == 0 ? 4 : s;
}

}  // namespace

SoundX86::CVal SoundX86::constValue(CONST* k) {
    ctypes::Constant c = ctypes::soundConstant(k->getDataType(), k->getIValue(), k->getFValue());
    CVal v;
    v.t = c.type;
    v.bits = c.bits;
    v.real = c.real;
    return v;
}

SoundX86::CVal SoundX86::convertValue(const CVal& v, CT to) {
    CVal r;
    r.t = to;
    if (to == CT::VOID || v.t == CT::VOID) return r;
    if (ctypes::isReal(to)) {
        long double x = ctypes::isReal(v.t)      ? static_cast<long double>(v.real)
                        : ctypes::isSigned(v.t) ? static_cast<long double>(static_cast<long long>(v.bits))
                                                : static_cast<long double>(v.bits);
        r.real = ctypes::roundTo(to, x);
        return r;
    }
    if (ctypes::isReal(v.t)) {
        // Out of range has no meaning in C; keep the host free of undefined behaviour.
        double x = std::trunc(v.real);
        if (std::isnan(x) || x <= -9223372036854775808.0 || x >= 18446744073709551616.0) r.bits = 0;
        else r.bits = x < 0 ? static_cast<std::uint64_t>(static_cast<long long>(x)) : static_cast<std::uint64_t>(x);
        r.bits = to == CT::POINTER ? (r.bits & 0xffffffffu) : ctypes::fit(to, r.bits);
        return r;
    }
    r.bits = to == CT::POINTER ? (v.bits & 0xffffffffu) : ctypes::fit(to, v.bits);
    return r;
}

void SoundX86::symbolOf(NAME* n) {
    NameKind k = n->getKind();
    if (k == EXTERN_DATA_REF || k == SUBPROG_REF) {
        sink << n->getStringValue();
        return;
    }
    if (k == LABEL_REF) {
        labelRef(n->getLabelRef());
        return;
    }
    if (n->isDeclaredLocal()) {
        // Function-local statics: one symbol per subprogram, private to the file.
        auto it = localOwner.find(n);
        sink << ".Ln";
        sink.writeUnsigned(it == localOwner.end() ? subprogIndex : it->second);
        sink << '_';
        sink.writeUnsigned(n->getId());
        return;
    }
    if (k == STATIC_DATA_REF && n->getList().empty() && !n->getStringValue().empty()) {
        sink << n->getStringValue();
        return;
    }
    sink << "ng";
    sink.writeUnsigned(n->getId());
}

void SoundX86::writeLiteral(const String& text) {
    std::string bytes;
    if (!cLiteralValue(text.data(), text.size(), bytes)) bytes.assign(text.data(), text.size());
    ins() << ".string\t\"";
    for (unsigned char c : bytes) {
        if (c >= 32 && c < 127 && c != '"' && c != '\\') {
            sink << static_cast<char>(c);
        } else {
            char esc[5] = {'\\', static_cast<char>('0' + (c >> 6)), static_cast<char>('0' + ((c >> 3) & 7)),
                           static_cast<char>('0' + (c & 7)), 0};
            sink << esc;
        }
    }
    sink << "\"\n";
}

void SoundX86::writeStringPool() {
    if (pendingStrings.empty()) return;
    sink << "\t.section\t.rodata\n";
    for (const String* s : pendingStrings) {
        sink << ".Lzs";
        sink.writeUnsigned(stringCount++);
        sink << ":\n";
        writeLiteral(*s);
    }
    pendingStrings.clear();
}

void SoundX86::writeElement(ExprBase* e, DataType et) {
    unsigned size = sizeOfType(et);
    if (size == 0) return;
    if (e && e->getNodeType() == NAME_NODE && size == 4) {
        NAME* n = static_cast<NAME*>(e);
        switch (n->getKind()) {
        case STRINGLIT_REF:
            // The C writes the quoted literal: a string of its own.
            ins() << ".long\t.Lzs";
            sink.writeUnsigned(stringCount + pendingStrings.size());
            end();
            pendingStrings.push_back(&n->getStringValue());
            return;
        case LABEL_REF:
        case SUBPROG_REF:
        case CONST_ARRAY_REF:
        case DATA_ARRAY_REF:
            ins() << ".long\t";
            symbolOf(n);
            end();
            return;
        default: break;
        }
    }
    CVal v;
    if (e && e->getNodeType() == CONST_NODE) v = convertValue(constValue(static_cast<CONST*>(e)), ctypes::ctOf(et));
    std::uint64_t bits = v.bits;
    if (et == FLOAT) {
        float f = static_cast<float>(v.real);
        std::uint32_t b;
        std::memcpy(&b, &f, 4);
        bits = b;
    } else if (et == DOUBLE) {
        std::memcpy(&bits, &v.real, 8);
    }
    ins() << (size == 1 ? ".byte\t" : size == 4 ? ".long\t" : ".quad\t");
    sink.writeUnsigned(size == 8 ? bits : bits & (size == 1 ? 0xffu : 0xffffffffu));
    end();
}

void SoundX86::defineName(NAME* n) {
    if (!n) return;
    const ExprList& values = n->getList();
    NameKind k = n->getKind();
    // The values' natural alignment, raised to the one asked (as the C's aligned attribute does).
    auto head = [&](const char* section, unsigned natural) {
        sink << '\t' << section << "\n\t.balign\t";
        sink.writeUnsigned(n->getAlignment() > natural ? n->getAlignment() : natural);
        sink << '\n';
        symbolOf(n);
        sink << ":\n";
    };
    switch (k) {
    case CONST_ARRAY_REF:
    case DATA_ARRAY_REF: {
        ExprBase* first = values.empty() ? nullptr : values.front();
        if (!first || sizeOfType(first->getDataType()) == 0) {
            // Zero-filled data of its size; with nothing to size it by, a byte, as the C's char[1].
            head(".bss", 1);
            ins() << ".zero\t";
            sink.writeUnsigned(n->getZeroBytes() ? n->getZeroBytes() : 1);
            end();
            return;
        }
        DataType et = first->getDataType();
        head(".data", alignmentOf(et));
        for (ExprBase* e : values) writeElement(e, et);
        return;
    }
    case STRINGLIT_REF:
        head(".section\t.rodata", 1);
        writeLiteral(n->getStringValue());
        return;
    case STATIC_DATA_REF: {
        DataType t = n->getDataType();
        unsigned size = sizeOfType(t) ? sizeOfType(t) : 4;
        if (values.empty()) {
            head(".bss", alignmentOf(t));
            ins() << ".zero\t";
            sink.writeUnsigned(size);
            end();
            return;
        }
        head(".data", alignmentOf(t));
        if (sizeOfType(t) == 0) ins() << ".zero\t4\n";
        else writeElement(values.front(), t);
        return;
    }
    case EXTERN_DATA_REF:
    case LABEL_REF:
    case SUBPROG_REF: return;
    }
}

void SoundX86::defineLocalNames(SUBPROG* sp) {
    for (NAME* n : sp->getAllLocalNames()) defineName(n);
}

}  // namespace ZOA
