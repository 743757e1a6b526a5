// The assembly emitter's operands: type tables, operand texts, leaf visits and file-level data.
#include "emit/x86/decompile_asm.h"

#include "core/type_facts.h"
#include "support/decimal.h"

#include <zoa/stmt.h>

#include <cstdio>
#include <cstring>
#include <ostream>
#include <typeinfo>

namespace ZOA {

namespace {

// The assembler's texts of a DataType; sizes and signedness are typeFacts'.
struct TypeTexts {
    std::string_view prefix;  // size keyword of a memory operand
    const char* directive;    // data directive of one element
};

const TypeTexts typeTexts[DATA_TYPE_COUNT + 1] = {
    {"BYTE PTR ", ".byte "},    // CHAR_U
    {"DWORD PTR ", ".int "},    // INT_U
    {"DWORD PTR ", ".quad "},   // INT64_U
    {"BYTE PTR ", ".byte "},    // CHAR_S
    {"DWORD PTR ", ".int "},    // INT_S
    {"DWORD PTR ", ".quad "},   // INT64_S
    {"", ".float "},            // FLOAT
    {"", ".double "},           // DOUBLE
    {"DWORD PTR ", ".long "},   // POINTER
    {"", ""},                   // VOID
    {"", ""},                   // anything outside the enumeration
};

const TypeTexts& textsOf(DataType t) {
    unsigned int i = static_cast<unsigned int>(t);
    return typeTexts[i < DATA_TYPE_COUNT ? i : DATA_TYPE_COUNT];
}

struct NameForm {
    const char* prefix;  // address or value operand
    bool fromText;       // symbol is the name's text when it has one
};

// By NameKind.
const NameForm nameForms[] = {
    {"OFFSET FLAT:", false},  // LABEL_REF: ".La" and the label id
    {"OFFSET FLAT:", true},   // SUBPROG_REF
    {"OFFSET FLAT:", false},  // CONST_ARRAY_REF
    {"OFFSET FLAT:", true},   // DATA_ARRAY_REF
    {"OFFSET FLAT:", false},  // STRINGLIT_REF: the text is the literal, not a symbol
    {"DWORD PTR ", true},     // STATIC_DATA_REF
    {"DWORD PTR ", true},     // EXTERN_DATA_REF
};
constexpr unsigned int NAME_KIND_COUNT = sizeof(nameForms) / sizeof(nameForms[0]);

// memText of a NAME (see the class comment).
void setNameText(NAME* n, String& text) {
    unsigned int kind = static_cast<unsigned int>(n->getKind());
    if (kind >= NAME_KIND_COUNT) return;
    const NameForm& form = nameForms[kind];
    text = form.prefix;
    if (n->getKind() == LABEL_REF) {
        text += ".La";
        appendDecimal(text, n->getId());
    } else if (form.fromText && !n->getStringValue().empty()) {
        text += n->getStringValue();
    } else {
        text += n->isDeclaredLocal() ? "nl" : "ng";
        appendDecimal(text, n->getId());
    }
}

}  // namespace

unsigned int DecompileASM::valueSize(ExprBase* e) {
    if (!e) return 0;
    if (e->getNodeType() == BUF_TEMP_NODE) return static_cast<BUF_TEMP*>(e)->getArraySize();
    return sizeOfType(e->getDataType());
}

std::string_view DecompileASM::sizePrefixText(ExprBase* e) { return e ? textsOf(e->getDataType()).prefix : ""; }

// The table's texts are literals, so the view's data is terminated.
const char* DecompileASM::sizePrefix(ExprBase* e) { return sizePrefixText(e).data(); }

const char* DecompileASM::dataDirective(DataType t) { return textsOf(t).directive; }

bool DecompileASM::isSignedValue(ExprBase* e) { return e && isSignedType(e->getDataType()); }

DecompileASM::ExprAnnotation* DecompileASM::annotationOf(const ExprBase* e) {
    TreeAnnotation* a = e ? e->getAnnotation() : nullptr;
    return a && typeid(*a) == typeid(ExprAnnotation) ? static_cast<ExprAnnotation*>(a) : nullptr;
}

DecompileASM::ExprAnnotation* DecompileASM::ensureAnnotation(ExprBase* e) {
    ExprAnnotation* a = annotationOf(e);
    if (a) return a;
    a = new ExprAnnotation(0);
    if (e->getNodeType() == NAME_NODE) setNameText(static_cast<NAME*>(e), a->memText);
    e->setAnnotation(a, true);
    return a;
}

DecompileASM::OperandParts DecompileASM::operandParts(ExprBase* e, bool useRegister, bool byteForm) {
    OperandParts p{"", ""};
    if (!e) return p;
    NodeType kind = e->getNodeType();
    ExprAnnotation* a = kind == NAME_NODE ? ensureAnnotation(e) : annotationOf(e);
    if (kind != CONST_NODE) p.prefix = byteForm ? "BYTE PTR " : sizePrefixText(e);
    if (!a) return p;
    if (a->reg == NO_REGISTER || !useRegister) {
        if (kind == NAME_NODE) p.prefix = "";
        p.text = {a->memText.data(), a->memText.size()};
    } else {
        AsmRegister r = byteForm ? registerOfClass(a->reg, LOW_BYTE) : a->reg;
        p.text = registerText(r, a->isIndirect);
    }
    return p;
}

std::string DecompileASM::operandText(ExprBase* e, bool useRegister) {
    OperandParts p = operandParts(e, useRegister, false);
    std::string s(p.prefix);
    s.append(p.text);
    return s;
}

std::string DecompileASM::byteOperandText(ExprBase* e) {
    OperandParts p = operandParts(e, true, true);
    std::string s(p.prefix);
    s.append(p.text);
    return s;
}

void DecompileASM::putOperand(ExprBase* e, bool useRegister) {
    OperandParts p = operandParts(e, useRegister, false);
    sink << p.prefix << p.text;
}

void DecompileASM::putByteOperand(ExprBase* e) {
    OperandParts p = operandParts(e, true, true);
    sink << p.prefix << p.text;
}

void DecompileASM::putLabel(LABEL* l) {
    put(".La");
    if (l) putUnsigned(l->getId());
}

// "t<id> = <offset>": makes t<id>[ebp] address the temporary's slot.
void DecompileASM::writeTempSymbol(TEMP* t) {
    if (!t) return;
    ExprAnnotation* a = annotationOf(t);
    line() << 't';
    putUnsigned(t->getId());
    put(" = ");
    putInt(a ? a->frameOffset : 0);
    endLine();
}

// Nodes carry no comments (TreeBase::getComment is always null), so this
// writes nothing today; it stays as the one place where a node's comment
// would become a "# CONST: ..." line, should nodes ever keep one.
void DecompileASM::writeNodeComment(TreeBase* node) {
    const char* comment = node ? node->getComment() : nullptr;
    if (!comment || !*comment) return;
    line() << "# CONST: " << comment;
    endLine();
}

void DecompileASM::writeCutNote() {
    line() << "# " << CUT_NOTE;
    endLine();
}

void DecompileASM::visit(NAME* n) {
    if (n) ensureAnnotation(n);
}

void DecompileASM::visit(CONST* c) {
    writeNodeComment(c);
    ExprAnnotation* a = ensureAnnotation(c);
    if (!a->memText.empty() || a->reg != NO_REGISTER) return;
    char buf[64];
    int n = 0;
    switch (c->getDataType()) {
    case CHAR_U:
    case INT_U:
    case CHAR_S:
    case INT_S:
        // The low 32 bits as a signed int, as printf's "%d" shows them.
        n = static_cast<int>(writeDecimal(buf, static_cast<long long>(static_cast<int>(static_cast<unsigned int>(c->getIValue())))));
        break;
    case INT64_U: n = static_cast<int>(writeDecimal(buf, static_cast<unsigned long long>(c->getIValue()))); break;
    case INT64_S: n = static_cast<int>(writeDecimal(buf, c->getIValue())); break;
    case FLOAT:
    case DOUBLE:
        // A huge double needs more room than buf: print it into memText itself.
        n = std::snprintf(buf, sizeof buf, "%f", c->getFValue());
        if (n >= static_cast<int>(sizeof buf)) {
            a->memText.resize(static_cast<std::size_t>(n));
            std::snprintf(&a->memText[0], static_cast<std::size_t>(n) + 1, "%f", c->getFValue());
            return;
        }
        break;
    case POINTER:
        if (c->getPValue()) {
            a->memText = static_cast<const char*>(c->getPValue());
            return;
        }
        buf[0] = '0';
        n = 1;
        break;
    case VOID:
        buf[0] = '0';
        n = 1;
        break;
    }
    if (n > 0) a->memText.assign(buf, static_cast<std::size_t>(n));
}

void DecompileASM::visit(TEMP* t) {
    ExprAnnotation* a = ensureAnnotation(t);
    if (a->reg != NO_REGISTER || !a->memText.empty()) return;
    a->memText = "t";
    appendDecimal(a->memText, t->getId());
    a->memText += "[ebp]";
}

// Writes the data of one file-level name; see the class comment for the
// symbols and for names without values.
void DecompileASM::defineName(NAME* n) {
    writeData(n);
    endEntry();
}

void DecompileASM::writeData(NAME* n) {
    if (!n) return;
    ExprAnnotation* a = ensureAnnotation(n);
    const String& text = a->memText;
    std::size_t skip = text.find("OFFSET FLAT:") != String::npos ? 12 : text.find("DWORD PTR ") != String::npos ? 10 : 0;
    if (skip > text.size()) skip = text.size();
    const char* sym = text.c_str() + skip;
    const ExprList& values = n->getList();
    ExprBase* first = values.empty() ? nullptr : values.front();

    switch (n->getKind()) {
    case CONST_ARRAY_REF:
    case DATA_ARRAY_REF: {
        bool zeroFilled = n->isPrivateData() && values.empty();
        if (n->getKind() == DATA_ARRAY_REF && values.empty() && !zeroFilled) return;
        DataType t = first ? first->getDataType() : VOID;
        line() << (n->getKind() == CONST_ARRAY_REF ? ".section .rodata" : ".section .data");
        endLine();
        line() << ".align ";
        putUnsigned(n->getAlignment() ? n->getAlignment() : 4);
        endLine();
        if (zeroFilled) {
            // createZeroData: its bytes, at least one.
            unsigned int bytes = n->getZeroBytes() ? n->getZeroBytes() : 1;
            line() << ".type " << sym << ",@object";
            endLine();
            line() << ".size " << sym << ',';
            putUnsigned(bytes);
            endLine();
            sink << sym << ':';
            endLine();
            line() << ".zero ";
            putUnsigned(bytes);
            endLine();
            endLine();
            return;
        }
        line() << ".type " << sym << ",@object";
        endLine();
        line() << ".size " << sym << ',';
        putUnsigned(values.size() * sizeOfType(t));
        endLine();
        sink << sym << ':';
        endLine();
        for (ExprBase* e : values) {
            line() << dataDirective(t);
            if (e && e->getNodeType() == NAME_NODE) {
                sink << static_cast<NAME*>(e)->getStringValue();
                endLine();
                endLine();
                continue;
            }
            visitExpr(e);
            putOperand(e, true);
            endLine();
        }
        endLine();
        return;
    }
    case STRINGLIT_REF:
        line() << ".section .rodata";
        endLine();
        line() << ".align 4";
        endLine();
        sink << sym << ':';
        endLine();
        line() << ".string \"" << n->getStringValue() << '"';
        endLine();
        endLine();
        return;
    case STATIC_DATA_REF: {
        if (values.empty()) return;
        unsigned int size = sizeOfType(n->getDataType());
        // Private data (createData) may be written.
        line() << (n->isPrivateData() ? ".section .data" : ".section .rodata");
        endLine();
        line() << ".align ";
        putUnsigned(n->getAlignment() ? n->getAlignment() : size);
        endLine();
        line() << ".type " << sym << ",@object";
        endLine();
        line() << ".size " << sym << ',';
        putUnsigned(size);
        endLine();
        sink << sym << ':';
        endLine();
        line() << dataDirective(n->getDataType());
        visitExpr(first);
        putOperand(first, true);
        endLine();
        endLine();
        return;
    }
    case LABEL_REF:
    case SUBPROG_REF:
    case EXTERN_DATA_REF: return;
    }
}

}  // namespace ZOA
