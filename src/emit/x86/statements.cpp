// The assembly emitter's statements: labels, sequences, moves, jumps and conditional jumps.
#include "emit/x86/decompile_asm.h"

#include "core/type_facts.h"
#include "emit/x86/conditions.h"

#include <zoa/stmt.h>

#include <ostream>

namespace ZOA {

namespace {

bool isKind(ExprBase* e, NodeType k) { return e && e->getNodeType() == k; }

bool isAddressedByBinop(ExprBase* e) {
    return isKind(e, MEM_NODE) && isKind(static_cast<MEM*>(e)->getExpr(), BINOP_NODE);
}

bool holdsByte(ExprBase* e) { return e && isByteType(e->getDataType()); }

bool isDwordRegister(AsmRegister r) { return r >= EAX && r <= ESP; }

// The operand shapes that select a MOVE row.
enum Shape { ANY, TEMP_SHAPE, MEM_ANY, MEM_BINOP, MEM_OTHER, BINOP_SHAPE };

// The shapes e has, one bit per Shape: one node type query per operand.
unsigned int shapesOf(ExprBase* e) {
    unsigned int bits = 1u << ANY;
    switch (e ? e->getNodeType() : TREE_BASE_NODE) {
    case TEMP_NODE: return bits | 1u << TEMP_SHAPE;
    case MEM_NODE:
        return bits | 1u << MEM_ANY | 1u << (isKind(static_cast<MEM*>(e)->getExpr(), BINOP_NODE) ? MEM_BINOP : MEM_OTHER);
    case BINOP_NODE: return bits | 1u << BINOP_SHAPE;
    default: return bits;
    }
}

}  // namespace

void DecompileASM::visit(LABEL* l) {
    curLabel = l;
    putLabel(l);
    put(":");
    endLine();
    resetRegisters();
    if (l->containsStmts())
        for (StmtBase* s : l->getStmts())
            if (s) acceptNested(s);
    if (l->getKind() == EPILOGUE_LABEL) writeEpilogue();
}

void DecompileASM::visit(SEQ* s) {
    for (StmtBase* part : {s->getLeft(), s->getRight()}) {
        if (!part) continue;
        releaseStatementRegisters(part);
        acceptNested(part);
    }
}

void DecompileASM::visit(EXP* e) { visitExpr(e->getExpr()); }

void DecompileASM::visit(JUMP* j) {
    switch (j->getKind()) {
    case DIRECT_LABEL:
        if (fallsThrough(j) || !j->getTarget()) return;
        line() << "jmp ";
        putLabel(j->getTarget());
        endLine();
        return;
    case DIRECT_EXPR:
        visitExpr(j->getExpr());
        line() << "jmp ";
        putOperand(j->getExpr(), true);
        endLine();
        return;
    }
}

// The first row whose destination and source shapes match applies.
void DecompileASM::visit(MOVE* m) {
    struct Row {
        Shape dst;
        Shape src;
        void (DecompileASM::*emit)(ExprBase*, ExprBase*);
    };
    static const Row rows[] = {
        {TEMP_SHAPE, TEMP_SHAPE, &DecompileASM::moveTempTemp},
        {TEMP_SHAPE, MEM_BINOP, &DecompileASM::moveTempFromAddress},
        {TEMP_SHAPE, MEM_OTHER, &DecompileASM::moveTempFromMem},
        {MEM_BINOP, TEMP_SHAPE, &DecompileASM::moveTempToAddress},
        {MEM_OTHER, TEMP_SHAPE, &DecompileASM::moveTempToMem},
        {MEM_ANY, MEM_ANY, &DecompileASM::moveMemMem},
        {TEMP_SHAPE, BINOP_SHAPE, &DecompileASM::moveTempFromBinop},
        {ANY, ANY, &DecompileASM::moveOther},
    };
    writeNodeComment(m);
    ExprBase* d = m->getDst();
    ExprBase* s = m->getSrc();
    unsigned int dShapes = shapesOf(d);
    unsigned int sShapes = shapesOf(s);
    for (const Row& row : rows) {
        if ((dShapes >> row.dst & 1) && (sShapes >> row.src & 1)) {
            (this->*row.emit)(d, s);
            return;
        }
    }
}

void DecompileASM::moveTempTemp(ExprBase* d, ExprBase* s) {
    visitExpr(s);
    visitExpr(d);
    AsmRegister r = loadIntoRegister(s, false);
    line() << "mov ";
    putOperand(d, false);
    put(", ");
    putReg(r);
    endLine();
    assignRegister(d, r, false);
}

void DecompileASM::moveTempFromAddress(ExprBase* d, ExprBase* s) {
    visitExpr(d);
    AsmRegister r = loadFromAddress(static_cast<MEM*>(s));
    line() << "mov ";
    putOperand(d, false);
    put(", ");
    putReg(r);
    endLine();
    assignRegister(d, r, false);
}

void DecompileASM::moveTempFromMem(ExprBase* d, ExprBase* s) {
    visitExpr(s);
    visitExpr(d);
    ExprAnnotation* sa = annotationOf(s);
    AsmRegister R = sa ? sa->reg : NO_REGISTER;
    line() << "mov ";
    putReg(R);
    put(", ");
    putOperand(s, true);
    endLine();
    line() << "mov ";
    putOperand(d, false);
    put(", ");
    putReg(R);
    endLine();
    claimRegister(R);
    assignRegister(d, R, false);
}

void DecompileASM::moveTempToAddress(ExprBase* d, ExprBase* s) {
    visitExpr(s);
    AsmRegister r = loadIntoRegister(s, false);
    claimRegister(r);
    storeToAddress(static_cast<MEM*>(d), r);
}

void DecompileASM::moveTempToMem(ExprBase* d, ExprBase* s) {
    visitExpr(s);
    visitExpr(d);
    AsmRegister r = loadIntoRegister(s, false);
    line() << "mov ";
    putOperand(d, true);
    put(", ");
    putReg(r);
    endLine();
}

void DecompileASM::moveMemMem(ExprBase* d, ExprBase* s) {
    visitExpr(s);
    visitExpr(d);
    ExprAnnotation* sa = annotationOf(s);
    ExprAnnotation* da = annotationOf(d);
    AsmRegister R = sa ? sa->reg : NO_REGISTER;
    line() << "mov ";
    putReg(R);
    put(", ");
    putReg(R, true);
    endLine();
    line() << "mov ";
    putReg(da ? da->reg : NO_REGISTER, true);
    put(", ");
    putReg(R);
    endLine();
}

void DecompileASM::moveTempFromBinop(ExprBase* d, ExprBase* s) {
    visitExpr(s);
    visitExpr(d);
    BINOP* b = static_cast<BINOP*>(s);
    ExprAnnotation* sa = annotationOf(s);
    AsmRegister R = sa ? sa->reg : NO_REGISTER;
    line() << "mov ";
    putOperand(d, false);
    put(", ");
    if (d != b->getLeft() && d != b->getRight() && holdsByte(d) && isDwordRegister(R)) {
        put("BYTE PTR ");
        putReg(registerOfClass(R, LOW_BYTE));
    } else {
        putOperand(s, true);
    }
    endLine();
    assignRegister(d, R, false);
}

void DecompileASM::moveOther(ExprBase* d, ExprBase* s) {
    visitExpr(s);
    visitExpr(d);
    bool toTemp = isKind(d, TEMP_NODE);
    ExprAnnotation* sa = annotationOf(s);
    AsmRegister R = sa ? sa->reg : NO_REGISTER;
    line() << "mov ";
    putOperand(d, !toTemp);
    put(", ");
    if (R == NO_REGISTER || !holdsByte(d) || !isDwordRegister(R)) {
        putOperand(s, true);
    } else {
        put("BYTE PTR ");
        putReg(registerOfClass(R, LOW_BYTE));
    }
    endLine();
    if (toTemp && R != NO_REGISTER) assignRegister(d, R, false);
}

// Brings the operands into a comparable form, compares, jumps to ifTrue and,
// unless ifFalse is the next label printed, to ifFalse.
void DecompileASM::visit(CJUMP* c) {
    ExprBase* l = c->getLeft();
    ExprBase* r = c->getRight();
    if (isKind(l, MEM_NODE) && isKind(r, MEM_NODE)) {
        if (isAddressedByBinop(l) && isAddressedByBinop(r)) {
            // Neither operand is prepared; both are written as they stand.
        } else if (isAddressedByBinop(l)) {
            assignRegister(l, loadAddressedValue(static_cast<MEM*>(l)), false);
            visitExpr(r);
        } else if (isAddressedByBinop(r)) {
            visitExpr(l);
            assignRegister(r, loadAddressedValue(static_cast<MEM*>(r)), false);
        } else {
            visitExpr(l);
            visitExpr(r);
            AsmRegister x = allocateForType(r);
            line() << "mov ";
            sink << sizePrefixText(r);
            putReg(x);
            put(", ");
            putOperand(r, true);
            endLine();
            assignRegister(r, x, false);
        }
    } else if (isKind(l, TEMP_NODE) && isKind(r, MEM_NODE)) {
        visitExpr(l);
        loadIntoRegister(l, false);
        if (isAddressedByBinop(r)) assignRegister(r, loadAddressedValue(static_cast<MEM*>(r)), false);
        else visitExpr(r);
    } else if (isKind(l, MEM_NODE) && isKind(r, TEMP_NODE)) {
        if (isAddressedByBinop(l)) {
            assignRegister(l, loadAddressedValue(static_cast<MEM*>(l)), false);
            visitExpr(r);
        } else {
            visitExpr(l);
            visitExpr(r);
        }
    } else {
        visitExpr(l);
        visitExpr(r);
        loadIntoRegister(l, false);
    }

    line() << "cmp ";
    putOperand(l, true);
    put(", ");
    putOperand(r, true);
    endLine();

    if (c->getIfTrue()) {
        if (isRelation(c->getRelOp())) line() << 'j' << conditionCode(c->getRelOp()) << ' ';
        putLabel(c->getIfTrue());
        endLine();
    }
    if (!fallsThrough(c) && c->getIfFalse()) {
        line() << "jmp ";
        putLabel(c->getIfFalse());
        endLine();
    }
}

}  // namespace ZOA
