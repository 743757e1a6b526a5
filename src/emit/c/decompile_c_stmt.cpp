// DecompileC: statements, labels, subprograms, data definitions and prototypes.
#include "emit/c/decompile_c.h"

#include "core/string_text.h"
#include "emit/c/c_rules.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>

namespace ZOA {

namespace {

NAME* asLabelAddress(ExprBase* e) {
    if (!e || e->getNodeType() != NAME_NODE) return nullptr;
    NAME* n = static_cast<NAME*>(e);
    return n->isLabelRef() ? n : nullptr;
}

}  // namespace

void DecompileC::printStmt(StmtBase* s) {
    if (!s) return;
    unsigned int saved = indentLevel;
    acceptNested(s);
    indentLevel = saved;
}

void DecompileC::writeGoto(LABEL* target, unsigned int level) {
    if (!target) {
        pad(level) << ";\n";
        return;
    }
    pad(level) << "goto LAB";
    writeUnsigned(target->getId());
    sink << ";\n";
}

void DecompileC::visit(EXP* e) {
    ExprBase* x = e->getExpr();
    // Sound: a value computed for nothing is no warning.
    if (sound && x) {
        pad(indentLevel) << (discardNeedsNot(x) ? "(void)!" : "(void)");
        printFlat(x);
    } else if (x) {
        acceptNested(x);
    }
    sink << ";\n";
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
        pad(indentLevel) << "__asm {\n";
        pad(indentLevel + 1) << "MOV EAX, LAB";
        writeUnsigned(label->getId());
        sink << '\n';
        if (dst && dst->getNodeType() == MEM_NODE) {
            pad(indentLevel + 1) << "MOV EDX, [";
            printFlat(static_cast<MEM*>(dst)->getExpr());
            sink << "]\n";
            pad(indentLevel + 1) << "MOV [EDX], EAX\n";
        } else {
            pad(indentLevel + 1) << "MOV ";
            printFlat(dst);
            sink << ", EAX\n";
        }
        pad(indentLevel) << "};\n";
        return;
    }
    if (dst) {
        unsigned int saved = indentLevel;
        acceptNested(dst);
        indentLevel = saved;
    }
    sink << " = ";
    if (sound && dst) writeSoundCast(dst->getDataType(), src);
    else if (ctext::moveCastsToCharPointer(src)) sink << "(char *)";
    printFlat(src);
    sink << ";\n";
}

void DecompileC::visit(JUMP* j) {
    if (j->getKind() == DIRECT_LABEL) {
        if (!fallsThrough(j)) writeGoto(j->getTarget(), indentLevel);
        return;
    }
    ExprBase* e = j->getExpr();
    if (isGcc) {
        pad(indentLevel) << "goto *";
        printFlat(e);
        sink << ";\n";
        return;
    }
    MEM* mem = e && e->getNodeType() == MEM_NODE ? static_cast<MEM*>(e) : nullptr;
    if (mem) {
        // Load the target into the address temporary, then jump through it.
        if (ExprBase* addr = mem->getExpr()) {
            unsigned int saved = indentLevel;
            acceptNested(addr);
            indentLevel = saved;
        }
        sink << " = ";
        printFlat(mem);
        sink << ";\n";
    }
    pad(indentLevel) << "__asm {\n";
    pad(indentLevel + 1) << "JMP ";
    if (mem) {
        sink << '[';
        printFlat(mem->getExpr());
        sink << ']';
    } else {
        printFlat(e);
    }
    sink << '\n';
    pad(indentLevel) << "}\n";
}

void DecompileC::visit(CJUMP* c) {
    pad(indentLevel) << "if (";
    // Sound: a pointer compared with a number compares their bits.
    ExprBase* l = c->getLeft();
    ExprBase* r = c->getRight();
    bool mixed = sound && l && r && (l->getDataType() == POINTER) != (r->getDataType() == POINTER);
    if (mixed) writeSoundCast(INT_U, l);
    printFlat(l);
    writeBinopText(c->getRelOp());
    if (mixed) writeSoundCast(INT_U, r);
    printFlat(r);
    sink << ")\n";
    writeGoto(c->getIfTrue(), indentLevel + 1);
    if (fallsThrough(c)) return;
    pad(indentLevel) << "else\n";
    writeGoto(c->getIfFalse(), indentLevel + 1);
}

void DecompileC::visit(LABEL* l) {
    curLabel = l;
    sink << "\nLAB";
    writeUnsigned(l->getId());
    sink << ':';
    if (l->containsStmts()) {
        for (StmtBase* s : l->getStmts()) printStmt(s);
    } else if (!curSubprog || l != curSubprog->getReturnLabel()) {
        sink << ';';
    }
    if (l->getKind() != EPILOGUE_LABEL) return;
    if (curSubprog && curSubprog->getReturnType() != VOID) {
        pad(indentLevel) << "return ";
        printFlat(curSubprog->getReturnTemp());
        sink << ';';
    } else {
        pad(indentLevel) << "return;";
    }
}

void DecompileC::writeAlignment(unsigned int bytes) {
    if (bytes == 0) return;
    sink << (isGcc ? "__attribute__((aligned(" : "__declspec(align(");
    writeUnsigned(bytes);
    sink << (isGcc ? "))) " : ")) ");
}

void DecompileC::declareTemp(TEMP* t) {
    if (!t) return;
    pad(indentLevel);
    if (t->getNodeType() == BUF_TEMP_NODE) {
        unsigned long long size = static_cast<BUF_TEMP*>(t)->getArraySize();
        writeAlignment(static_cast<BUF_TEMP*>(t)->getAlignment());
        sink << "char t";
        writeUnsigned(t->getId());
        sink << '[';
        writeUnsigned((size + 7) / 8 * 8);
        sink << ']';
    } else {
        writeTypeName(t->getDataType());
        sink << 't';
        writeUnsigned(t->getId());
    }
    if (t->getType() != ARGUMENT_TEMP) sink << ";\n";
}

void DecompileC::visit(SUBPROG* sp) {
    TextSink::Batch batch(sink);
    if (sp->isStatic()) sink << "static ";
    if (sp->isExtern()) sink << "extern ";
    writeTypeName(sp->getReturnType());
    writeFunctionName(sp->getName());
    sink << '(';

    usedTemps.begin(sp);
    bool first = true;
    for (TEMP* t : sp->getAllArgTemps()) {
        if (!first) sink << ", ";
        first = false;
        declareTemp(t);
    }
    sink << ")\n{\n";
    ++indentLevel;

    // One walk: the body is printed first, held in the sink, and marks the
    // temporaries it prints; the locals then go in front of it. Where the
    // printed body may not reach what the whole-subprogram walk reaches (a
    // cut, a label of another subprogram, values of a name too deep), that
    // walk decides and the body is printed again.
    {
        TextSink::Hold hold(sink);
        buildTraces();
        marking = true;
        unmarked = false;
        valueNames.clear();
        printBody();
        marking = false;
        for (const auto& entry : valueNames)
            if (!usedTemps.markValues(entry.first, entry.second)) unmarked = true;
        std::size_t body = hold.length();
        if (unmarked) {
            hold.truncate(0);
            usedTemps.collect(sp);
        }
        declareLocals(sp);
        if (unmarked) printBody();
        else hold.moveToFront(0, body);
    }
    sink << "\n}\n\n";
    --indentLevel;
}

// Locals: the used, non-argument temporaries in allTemps order, buffers
// first; then the local data.
void DecompileC::declareLocals(SUBPROG* sp) {
    for (int pass = 0; pass < 2; ++pass) {
        bool buffers = pass == 0;
        for (TEMP* t : sp->getAllTemps()) {
            if (!t || t->getType() == ARGUMENT_TEMP || !usedTemps.isUsed(t)) continue;
            if ((t->getNodeType() == BUF_TEMP_NODE) == buffers) declareTemp(t);
        }
    }
    for (NAME* n : sp->getAllLocalNames()) defineName(n);
}

void DecompileC::printBody() {
    if (!marking) {
        for (LABEL* l : traceOrder) printLabel(l);
        return;
    }
    // The whole walk goes through exactly this subprogram's labels: a label
    // of another one (pulled by a jump) is printed here but not walked, and
    // one placed while another subprogram was printed is walked but not
    // printed here.
    const auto& own = curSubprog->getAllLabels();
    std::size_t ownPrinted = 0;
    for (LABEL* l : traceOrder) {
        auto it = own.find(l->getId());
        if (it != own.end() && it->second == l) ++ownPrinted;
        else unmarked = true;
        printLabel(l);
    }
    std::size_t ownLabels = 0;
    for (const auto& entry : own) ownLabels += entry.second != nullptr;
    if (ownPrinted != ownLabels) unmarked = true;
}

void DecompileC::printLabel(LABEL* l) {
    unsigned int saved = indentLevel;
    l->accept(this);
    indentLevel = saved;
}

void DecompileC::writeQuotedString(const String& s) {
    if (sound) {
        sink << quoteCString(decodeStringText(s.data(), s.size()));
        return;
    }
    sink << '"';
    const char* p = s.data();
    std::size_t n = s.size();
    std::size_t runStart = 0;
    for (std::size_t i = 0; i < n; ++i) {
        if (!ctext::quoteNeedsEscape(std::string_view(p, n), i)) continue;
        sink.write(p + runStart, i - runStart);
        sink << "\\\"";
        runStart = i + 1;
    }
    sink.write(p + runStart, n - runStart);
    sink << '"';
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
            pad(indentLevel) << "static ";
            writeAlignment(n->getAlignment());
            sink << "char ";
            writeDataPrefix(n);
            sink << '[';
            writeUnsigned(n->getZeroBytes() ? n->getZeroBytes() : 1);
            sink << "];\n";
            return;
        }
        pad(indentLevel) << "static ";
        writeAlignment(n->getAlignment());
        if (firstValue) writeTypeName(firstValue->getDataType());
        writeDataPrefix(n);
        bool labelTable = firstValue && firstValue->getNodeType() == NAME_NODE &&
                          static_cast<NAME*>(firstValue)->getKind() == LABEL_REF;
        if (!isGcc && labelTable) {
            sink << '[';
            writeUnsigned(values.size());
            sink << "];\n__asm {\n";
            long long offset = 0;
            for (ExprBase* e : values) {
                sink << "MOV EAX, ";
                if (NAME* l = asLabelAddress(e)) {
                    sink << "LAB";
                    writeUnsigned(l->getLabelRef()->getId());
                } else {
                    printFlat(e);
                }
                sink << ";\nMOV DWORD PTR ";
                writeDataPrefix(n);
                sink << '+';
                writeInt(offset);
                sink << ", EAX;\n";
                offset += 4;
            }
            sink << "}\n";
            return;
        }
        sink << "[] = {";
        bool first = true;
        for (ExprBase* e : values) {
            if (!first) sink << ", ";
            first = false;
            NameKind k = e && e->getNodeType() == NAME_NODE ? static_cast<NAME*>(e)->getKind() : LABEL_REF;
            if (sound && firstValue && !(e && e->getNodeType() == NAME_NODE && firstValue->getDataType() == POINTER))
                writeSoundCast(firstValue->getDataType(), e);
            if (k == SUBPROG_REF) {
                sink << "(void *)";
                writeFunctionName(static_cast<NAME*>(e)->getStringValue());
            }
            else if (k == STRINGLIT_REF) writeQuotedString(static_cast<NAME*>(e)->getStringValue());
            else printFlat(e);
        }
        sink << "};\n";
        return;
    }
    case STRINGLIT_REF:
        pad(indentLevel) << "static const char *";
        writeDataPrefix(n);
        sink << " = ";
        writeQuotedString(n->getStringValue());
        sink << ";\n";
        return;
    case STATIC_DATA_REF:
        pad(indentLevel) << "static ";
        writeAlignment(n->getAlignment());
        writeTypeName(n->getDataType());
        if (!firstValue) {
            // Made from a text: defined under the name references print.
            if (n->getStringValue().empty()) writeDataPrefix(n);
            else sink << n->getStringValue();
            sink << ";\n";
            return;
        }
        writeDataPrefix(n);
        sink << " = ";
        printFlat(firstValue);
        sink << ";\n";
        return;
    case EXTERN_DATA_REF:
        pad(indentLevel) << "extern ";
        writeTypeName(n->getDataType());
        sink << n->getStringValue() << ";\n";
        return;
    case LABEL_REF:
    case SUBPROG_REF:
        return;
    }
}

void DecompileC::declareCallPrototype(CALL* c) {
    if (!c) return;
    if (c->isCallStatic()) sink << "static ";
    writeTypeName(c->getDataType());
    sink << c->getFunctionName() << '(';
    writeArgTypes(c);
    sink << ");\n";
}

void DecompileC::declareSubprogPrototype(SUBPROG* sp) {
    if (!sp) return;
    if (sp->isStatic()) sink << "static ";
    if (sp->isExtern()) sink << "extern ";
    writeTypeName(sp->getReturnType());
    writeFunctionName(sp->getName());
    sink << '(';
    bool first = true;
    for (TEMP* t : sp->getAllArgTemps()) {
        if (!first) sink << ", ";
        first = false;
        if (t) writeTypeName(t->getDataType());
    }
    sink << ')';
    writeAsmLabel(sp->getName());
    // A static function nothing calls is no error in the sound text.
    if (sound && isGcc && sp->isStatic()) sink << " __attribute__((unused))";
    sink << ";\n";
}

void DecompileC::declareNamePrototype(NAME* n) {
    if (!n) return;
    sink << "void ";
    writeFunctionName(n->getStringValue());
    sink << "()";
    writeAsmLabel(n->getStringValue());
    sink << ";\n";
}

}  // namespace ZOA
