// DecompileC: statements, labels, subprograms, data definitions and prototypes.
#include "emit/c/decompile_c.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>

namespace ZOA {

namespace {

bool isArrayName(ExprBase* e) {
    if (!e || e->getNodeType() != NAME_NODE) return false;
    NameKind k = static_cast<NAME*>(e)->getKind();
    return k == CONST_ARRAY_REF || k == DATA_ARRAY_REF || k == STRINGLIT_REF;
}

// Array and string names are arrays or const pointers in C: a move of one,
// or of one level of arithmetic on one, gets a (char *) cast.
bool needsCharPointerCast(ExprBase* src) {
    if (isArrayName(src)) return true;
    if (!src || src->getNodeType() != BINOP_NODE) return false;
    BINOP* b = static_cast<BINOP*>(src);
    return isArrayName(b->getLeft()) || isArrayName(b->getRight());
}

NAME* asLabelAddress(ExprBase* e) {
    if (!e || e->getNodeType() != NAME_NODE) return nullptr;
    NAME* n = static_cast<NAME*>(e);
    return n->isLabelRef() ? n : nullptr;
}

}  // namespace

void DecompileC::printStmt(StmtBase* s) {
    if (!s) return;
    unsigned int saved = indentLevel;
    s->accept(this);
    indentLevel = saved;
}

void DecompileC::writeGoto(LABEL* target, unsigned int level) {
    if (!target) {
        indent(level) << ";\n";
        return;
    }
    indent(level) << "goto LAB";
    writeUnsigned(target->getId());
    out << ";\n";
}

void DecompileC::visit(EXP* e) {
    if (ExprBase* x = e->getExpr()) x->accept(this);
    out << ";\n";
}

void DecompileC::visit(SEQ* s) {
    printStmt(s->getLeft());
    printStmt(s->getRight());
}

void DecompileC::visit(MOVE* m) {
    ExprBase* dst = m->getDst();
    ExprBase* src = m->getSrc();
    NAME* label = isGcc ? nullptr : asLabelAddress(src);
    if (label) {
        indent(indentLevel) << "__asm {\n";
        indent(indentLevel + 1) << "MOV EAX, LAB";
        writeUnsigned(label->getId());
        out << '\n';
        if (dst && dst->getNodeType() == MEM_NODE) {
            indent(indentLevel + 1) << "MOV EDX, [";
            printFlat(static_cast<MEM*>(dst)->getExpr());
            out << "]\n";
            indent(indentLevel + 1) << "MOV [EDX], EAX\n";
        } else {
            indent(indentLevel + 1) << "MOV ";
            printFlat(dst);
            out << ", EAX\n";
        }
        indent(indentLevel) << "};\n";
        return;
    }
    if (dst) {
        unsigned int saved = indentLevel;
        dst->accept(this);
        indentLevel = saved;
    }
    out << " = ";
    if (needsCharPointerCast(src)) out << "(char *)";
    printFlat(src);
    out << ";\n";
}

void DecompileC::visit(JUMP* j) {
    if (j->getKind() == DIRECT_LABEL) {
        if (!fallsThrough(j)) writeGoto(j->getTarget(), indentLevel);
        return;
    }
    ExprBase* e = j->getExpr();
    if (isGcc) {
        indent(indentLevel) << "goto *";
        printFlat(e);
        out << ";\n";
        return;
    }
    MEM* mem = e && e->getNodeType() == MEM_NODE ? static_cast<MEM*>(e) : nullptr;
    if (mem) {
        // Load the target into the address temporary, then jump through it.
        if (ExprBase* addr = mem->getExpr()) {
            unsigned int saved = indentLevel;
            addr->accept(this);
            indentLevel = saved;
        }
        out << " = ";
        printFlat(mem);
        out << ";\n";
    }
    indent(indentLevel) << "__asm {\n";
    indent(indentLevel + 1) << "JMP ";
    if (mem) {
        out << '[';
        printFlat(mem->getExpr());
        out << ']';
    } else {
        printFlat(e);
    }
    out << '\n';
    indent(indentLevel) << "}\n";
}

void DecompileC::visit(CJUMP* c) {
    indent(indentLevel) << "if (";
    printFlat(c->getLeft());
    writeBinopText(c->getRelOp());
    printFlat(c->getRight());
    out << ")\n";
    writeGoto(c->getIfTrue(), indentLevel + 1);
    if (fallsThrough(c)) return;
    indent(indentLevel) << "else\n";
    writeGoto(c->getIfFalse(), indentLevel + 1);
}

void DecompileC::visit(LABEL* l) {
    curLabel = l;
    out << "\nLAB";
    writeUnsigned(l->getId());
    out << ':';
    if (l->containsStmts()) {
        for (StmtBase* s : l->getStmts()) printStmt(s);
    } else if (!curSubprog || l != curSubprog->getReturnLabel()) {
        out << ';';
    }
    if (l->getKind() != EPILOGUE_LABEL) return;
    if (curSubprog && curSubprog->getReturnType() != VOID) {
        indent(indentLevel) << "return ";
        printFlat(curSubprog->getReturnTemp());
        out << ';';
    } else {
        indent(indentLevel) << "return;";
    }
}

void DecompileC::declareTemp(TEMP* t) {
    if (!t) return;
    indent(indentLevel);
    if (t->getNodeType() == BUF_TEMP_NODE) {
        unsigned long long size = static_cast<BUF_TEMP*>(t)->getArraySize();
        out << "char t";
        writeUnsigned(t->getId());
        out << '[';
        writeUnsigned((size + 7) / 8 * 8);
        out << ']';
    } else {
        writeTypeName(t->getDataType());
        out << 't';
        writeUnsigned(t->getId());
    }
    if (t->getType() != ARGUMENT_TEMP) out << ";\n";
}

void DecompileC::visit(SUBPROG* sp) {
    if (sp->isStatic()) out << "static ";
    if (sp->isExtern()) out << "extern ";
    writeTypeName(sp->getReturnType());
    out << sp->getName() << '(';

    usedMap.clear();
    UsedNodes used(sp, &usedMap);

    bool first = true;
    for (TEMP* t : sp->getAllArgTemps()) {
        if (!first) out << ", ";
        first = false;
        declareTemp(t);
    }
    out << ")\n{\n";
    ++indentLevel;

    // Locals: the used, non-argument temporaries in allTemps order, buffers first.
    for (int pass = 0; pass < 2; ++pass) {
        bool buffers = pass == 0;
        for (TEMP* t : sp->getAllTemps()) {
            if (!t || t->getType() == ARGUMENT_TEMP) continue;
            const NodeType* v = usedMap.find(t);
            if (!v || *v != TEMP_NODE) continue;
            if ((t->getNodeType() == BUF_TEMP_NODE) == buffers) declareTemp(t);
        }
    }
    for (NAME* n : sp->getAllLocalNames()) defineName(n);

    buildTraces();
    for (LABEL* l : traceOrder) printLabel(l);

    out << "\n}\n\n";
    --indentLevel;
}

void DecompileC::printLabel(LABEL* l) {
    unsigned int saved = indentLevel;
    l->accept(this);
    indentLevel = saved;
}

void DecompileC::writeQuotedString(const String& s) {
    out << '"';
    const char* p = s.data();
    std::size_t n = s.size();
    std::size_t runStart = 0;
    for (std::size_t i = 0; i < n; ++i) {
        if (p[i] != '"' || (i > 0 && p[i - 1] == '\\')) continue;
        out.write(p + runStart, static_cast<std::streamsize>(i - runStart));
        out << "\\\"";
        runStart = i + 1;
    }
    out.write(p + runStart, static_cast<std::streamsize>(n - runStart));
    out << '"';
}

void DecompileC::defineName(NAME* n) {
    if (!n) return;
    const ExprList& values = n->getList();
    ExprBase* firstValue = values.empty() ? nullptr : values.front();
    switch (n->getKind()) {
    case CONST_ARRAY_REF:
    case DATA_ARRAY_REF: {
        if (values.empty()) {
            // Nothing to size or type it by: a one-byte array keeps references valid.
            indent(indentLevel) << "static char ";
            writeDataPrefix(n);
            out << "[1];\n";
            return;
        }
        indent(indentLevel) << "static ";
        if (firstValue) writeTypeName(firstValue->getDataType());
        writeDataPrefix(n);
        bool labelTable = firstValue && firstValue->getNodeType() == NAME_NODE &&
                          static_cast<NAME*>(firstValue)->getKind() == LABEL_REF;
        if (!isGcc && labelTable) {
            out << '[';
            writeUnsigned(values.size());
            out << "];\n__asm {\n";
            long long offset = 0;
            for (ExprBase* e : values) {
                out << "MOV EAX, ";
                if (NAME* l = asLabelAddress(e)) {
                    out << "LAB";
                    writeUnsigned(l->getLabelRef()->getId());
                } else {
                    printFlat(e);
                }
                out << ";\nMOV DWORD PTR ";
                writeDataPrefix(n);
                out << '+';
                writeInt(offset);
                out << ", EAX;\n";
                offset += 4;
            }
            out << "}\n";
            return;
        }
        out << "[] = {";
        bool first = true;
        for (ExprBase* e : values) {
            if (!first) out << ", ";
            first = false;
            NameKind k = e && e->getNodeType() == NAME_NODE ? static_cast<NAME*>(e)->getKind() : LABEL_REF;
            if (k == SUBPROG_REF) out << "(void *)" << static_cast<NAME*>(e)->getStringValue();
            else if (k == STRINGLIT_REF) writeQuotedString(static_cast<NAME*>(e)->getStringValue());
            else printFlat(e);
        }
        out << "};\n";
        return;
    }
    case STRINGLIT_REF:
        indent(indentLevel) << "static const char *";
        writeDataPrefix(n);
        out << " = ";
        writeQuotedString(n->getStringValue());
        out << ";\n";
        return;
    case STATIC_DATA_REF:
        indent(indentLevel) << "static ";
        writeTypeName(n->getDataType());
        if (!firstValue) {
            // Made from a text: defined under the name references print.
            if (n->getStringValue().empty()) writeDataPrefix(n);
            else out << n->getStringValue();
            out << ";\n";
            return;
        }
        writeDataPrefix(n);
        out << " = ";
        printFlat(firstValue);
        out << ";\n";
        return;
    case EXTERN_DATA_REF:
        indent(indentLevel) << "extern ";
        writeTypeName(n->getDataType());
        out << n->getStringValue() << ";\n";
        return;
    case LABEL_REF:
    case SUBPROG_REF:
        return;
    }
}

void DecompileC::declareCallPrototype(CALL* c) {
    if (!c) return;
    if (c->isCallStatic()) out << "static ";
    writeTypeName(c->getDataType());
    out << c->getFunctionName() << '(';
    writeArgTypes(c);
    out << ");\n";
}

void DecompileC::declareSubprogPrototype(SUBPROG* sp) {
    if (!sp) return;
    if (sp->isStatic()) out << "static ";
    if (sp->isExtern()) out << "extern ";
    writeTypeName(sp->getReturnType());
    out << sp->getName() << '(';
    bool first = true;
    for (TEMP* t : sp->getAllArgTemps()) {
        if (!first) out << ", ";
        first = false;
        if (t) writeTypeName(t->getDataType());
    }
    out << ");\n";
}

void DecompileC::declareNamePrototype(NAME* n) {
    if (!n) return;
    out << "void " << n->getStringValue() << "();\n";
}

}  // namespace ZOA
