// DecompileC: construction, the shared writers and the text of every expression.
#include "emit/c/decompile_c.h"

#include "emit/c/c_rules.h"
#include "emit/c/c_texts.h"

#include <zoa/expr.h>

#include <cstdint>
#include <cstdio>

namespace ZOA {

DecompileC::DecompileC(std::ostream& os, bool isGcc, bool sound) : DecompileBase(os, isGcc), sound(sound), sink(os) {}
DecompileC::~DecompileC() {}

void DecompileC::writeCutNote() {
    unmarked = true;  // the whole walk may cut elsewhere
    sink << "/* " << CUT_NOTE << " */";
}

void DecompileC::writeInt(long long v) { sink.writeInt(v); }

void DecompileC::writeUnsigned(unsigned long long v) { sink.writeUnsigned(v); }

void DecompileC::writeTypeName(DataType t) { sink << ctext::typeName(t); }

void DecompileC::writeBinopText(BinopKind op) { sink << ' ' << ctext::binopText(op) << ' '; }

void DecompileC::writeUnopText(UnopKind op) { sink << ctext::unopText(op); }

void DecompileC::printFlat(ExprBase* e) {
    if (!e) return;
    unsigned int saved = indentLevel;
    indentLevel = 0;
    printExpr(e, e->getNodeType());
    indentLevel = saved;
}

// Statements print their expressions through here: one type query, then a
// direct call of the printer, where accept would cost two virtual calls.
void DecompileC::printExpr(ExprBase* e, NodeType t) {
    switch (t) {
    case TEMP_NODE:
    case BUF_TEMP_NODE:
        usedTemps.mark(static_cast<TEMP*>(e));
        sink << 't';
        writeUnsigned(static_cast<TEMP*>(e)->getId());
        return;
    case CONST_NODE: DecompileC::visit(static_cast<CONST*>(e)); return;
    case NAME_NODE: DecompileC::visit(static_cast<NAME*>(e)); return;
    default: break;
    }
    // Only the kinds with operands go a level deeper.
    NestingLevel level(nesting);
    if (!level.entered()) {
        if (level.cutHere()) writeCutNote();
        return;
    }
    switch (t) {
    case BINOP_NODE: DecompileC::visit(static_cast<BINOP*>(e)); return;
    case MEM_NODE: DecompileC::visit(static_cast<MEM*>(e)); return;
    case UNOP_NODE: DecompileC::visit(static_cast<UNOP*>(e)); return;
    case CALL_NODE: DecompileC::visit(static_cast<CALL*>(e)); return;
    default: e->accept(this); return;
    }
}

// Operands print with no indentation.
void DecompileC::writeOperand(ExprBase* e) {
    if (!e) return;
    unsigned int saved = indentLevel;
    indentLevel = 0;
    NodeType t = e->getNodeType();
    bool bare = t == TEMP_NODE || t == BUF_TEMP_NODE || t == CONST_NODE;
    if (!bare) sink << '(';
    printExpr(e, t);
    if (!bare) sink << ')';
    indentLevel = saved;
}

void DecompileC::writeDataPrefix(NAME* n) {
    sink << (n->isDeclaredLocal() ? "nl" : "ng");
    writeUnsigned(n->getId());
}

void DecompileC::visit(TEMP* t) {
    usedTemps.mark(t);
    pad(indentLevel) << 't';
    writeUnsigned(t->getId());
}

void DecompileC::visit(BUF_TEMP* t) {
    usedTemps.mark(t);
    pad(indentLevel) << 't';
    writeUnsigned(t->getId());
}

void DecompileC::visit(CONST* c) {
    pad(indentLevel);
    if (sound && writeSoundConst(c)) return;
    long long v = c->getIValue();
    std::uint32_t low = static_cast<std::uint32_t>(v);
    char buf[64];
    int n = 0;
    switch (c->getDataType()) {
    case CHAR_U:
        sink << "(unsigned char)";
        writeUnsigned(low);
        return;
    case INT_U:
        writeUnsigned(low);
        sink << 'U';
        return;
    case INT64_U:
        writeUnsigned(static_cast<unsigned long long>(v));
        sink << "LL";
        return;
    case CHAR_S:
        sink << "(char)";
        writeInt(static_cast<std::int32_t>(low));
        return;
    case INT_S:
        writeInt(static_cast<std::int32_t>(low));
        return;
    case INT64_S:
        writeInt(v);
        sink << "LL";
        return;
    case FLOAT:
        n = ctext::formatFloatLiteral(buf, c->getFValue());
        sink.write(buf, static_cast<std::size_t>(n));
        return;
    case DOUBLE:
        n = std::snprintf(buf, sizeof buf, "%#.17G", c->getFValue());
        sink.write(buf, static_cast<std::size_t>(n));
        return;
    case POINTER:
        if (const char* text = static_cast<const char*>(c->getPValue())) sink << text;
        else sink << "(char *)0";
        return;
    case VOID:
        return;
    }
}

void DecompileC::visit(NAME* n) {
    if (marking && !n->getList().empty()) valueNames.emplace_back(n, nesting.level());
    switch (n->getKind()) {
    case LABEL_REF:
        sink << "&&LAB";
        writeUnsigned(n->getId());
        return;
    case SUBPROG_REF:
        sink << (sound ? "((char *)" : "(void *)");
        writeFunctionName(n->getStringValue());
        if (sound) sink << ')';
        return;
    case CONST_ARRAY_REF:
    case DATA_ARRAY_REF:
    case STRINGLIT_REF:
        // Sound: a char pointer, so arithmetic on it counts bytes.
        if (!sound) break;
        sink << "((char *)";
        writeDataPrefix(n);
        sink << ')';
        return;
    case STATIC_DATA_REF:
        // Made from a constant: no text, defined under its generated name.
        if (n->getStringValue().empty()) break;
        sink << n->getStringValue();
        return;
    case EXTERN_DATA_REF:
        sink << n->getStringValue();
        return;
    }
    writeDataPrefix(n);
}

void DecompileC::visit(MEM* m) {
    pad(indentLevel) << "*((";
    writeTypeName(m->getDataType());
    sink << "*)";
    writeOperand(m->getExpr());
    sink << ')';
}

void DecompileC::visit(UNOP* u) {
    ExprBase* x = u->getExpr();
    sink << '(';
    if (u->getOp() == ABS) {
        writeOperand(x);
        sink << ">=0?";
        writeOperand(x);
        sink << ": -";
        writeOperand(x);
    } else if (sound && u->getOp() == NOT) {
        writeTruth(x, " == 0");
    } else {
        writeUnopText(u->getOp());
        sink << '(';
        writeOperand(x);
        sink << ')';
    }
    sink << ')';
}

// Sound: operands of logical operators are compared with 0, so that no number
// stands in a boolean context (gcc warns on that even after folding, where no
// pragma reaches).
void DecompileC::writeTruth(ExprBase* x, const char* comparison) {
    sink << '(';
    writeOperand(x);
    sink << comparison << ')';
}

void DecompileC::visit(BINOP* b) {
    sink << '(';
    if (sound && (b->getOp() == AND || b->getOp() == OR)) {
        writeTruth(b->getLeft(), " != 0");
        writeBinopText(b->getOp());
        writeTruth(b->getRight(), " != 0");
    } else {
        writeOperand(b->getLeft());
        writeBinopText(b->getOp());
        writeOperand(b->getRight());
    }
    sink << ')';
}

void DecompileC::writeArgTypes(CALL* c) {
    bool first = true;
    for (ExprBase* a : c->getArgs()) {
        if (!first) sink << ", ";
        first = false;
        if (a) writeTypeName(a->getDataType());
    }
}

void DecompileC::writeArgList(CALL* c, const std::vector<DataType>* params) {
    sink << '(';
    std::size_t i = 0;
    for (ExprBase* a : c->getArgs()) {
        if (i != 0) sink << ", ";
        if (params && i < params->size()) writeSoundCast((*params)[i], a);
        // Past the fixed part the value is the node's own, then promoted:
        // the C type of an operator's text is the promoted one, not the node's.
        else if (params && a) writeSoundCast(a->getDataType(), a);
        ++i;
        printFlat(a);
    }
    sink << ')';
}

void DecompileC::visit(CALL* c) {
    pad(indentLevel);
    if (TEMP* fp = c->getFunctionPointer()) {
        sink << "((";
        writeTypeName(c->getDataType());
        sink << " (*)(";
        writeArgTypes(c);
        sink << "))";
        writeOperand(fp);
        sink << ')';
    } else if (sound) {
        writeSoundCall(c);
        return;
    } else {
        const String& name = c->getFunctionName();
        if (ctext::callCastsToCharPointer(std::string_view(name.data(), name.size()))) sink << "(char *)";
        sink << name;
    }
    writeArgList(c);
}

}  // namespace ZOA
