// The generator's assembly mode: three-address code the assembly output translates.
#include "fuzz/gen_asm.h"

namespace ZOA::fuzz {

namespace {
const DataType asmTypes[] = {CHAR_U, INT_U, CHAR_S, INT_S};
const DataType asmPlainTypes[] = {CHAR_U, INT_U, INT_S};
}  // namespace

DataType AsmBuilder::anyType(bool) { return quirks & SIGNED_CHAR ? pick(asmTypes) : pick(asmPlainTypes); }

// The assembly output keeps values in registers only within a statement and
// frees them between the statements of a sequence: one operator on leaves per statement.
ExprBase* AsmBuilder::operand(DataType t) {
    if (TEMP* v = varOf(t, chance(70) || !(quirks & MIXED_WIDTHS))) return v;
    return constant(t);
}

ExprBase* AsmBuilder::exprInner(DataType t, unsigned) {
    switch (below(5)) {
        case 0:
        case 1:
        case 2: {
            static const BinopKind ops[] = {PLUS, MINUS, MUL};
            BinopKind op = pick(ops);
            if (op == MUL && !(quirks & MUL_RESULT)) op = PLUS;
            return new BINOP(t, op, operand(t), operand(t));
        }
        case 3: {
            DataType u = anyType(false);
            if (sizeOfType(t) == 1 && !(quirks & CHAR_RELATION)) return operand(t);
            if (u != INT_S && !(quirks & UNSIGNED_RELATION)) u = INT_S;
            return new BINOP(t, pick(RELATIONS), operand(u), operand(u));
        }
        default:
            if (isInt32Type(t) && (quirks & WIDENING)) return new UNOP(t, CONV4, operand(chance(50) ? CHAR_S : CHAR_U));
            return operand(t);
    }
}

// In a sequence the assembly output frees the registers before each part.
StmtBase* AsmBuilder::wrapped(StmtBase* s) {
    bool jump = s->getNodeType() == JUMP_NODE || s->getNodeType() == CJUMP_NODE;
    return jump ? s : new SEQ(s, nullptr);
}

void AsmBuilder::added(StmtBase* s) {
    if (!holdsByteRegister(s)) return;
    if (cur != byteLabel) byteLabel = cur, byteHolds = 0;
    if (++byteHolds == 2) newLabel();
}

// A relation's value (set<cc> into a byte register) and a char move keep
// their byte register until the next label; four of them leave a later char
// load without one. The mode starts a label after two.
bool AsmBuilder::holdsByteRegister(StmtBase* s) {
    if (s->getNodeType() != MOVE_NODE) return false;
    MOVE* m = static_cast<MOVE*>(s);
    if (m->getDst() && sizeOfType(m->getDst()->getDataType()) == 1) return true;
    ExprBase* src = m->getSrc();
    return src && src->getNodeType() == BINOP_NODE && isRelation(static_cast<BINOP*>(src)->getOp());
}

// A store through an address sum keeps its register reserved until the next
// label: the mode starts one after each store (afterStore).
void AsmBuilder::newLabel() {
    LABEL* next = sp->createNewLabel(REGULAR_LABEL);
    jumpTo(next);
    cur = next;
}

void AsmBuilder::storeInto(DataType t, ExprBase* address) {
    TEMP* v = varOf(t, true);
    if (!v) return assign();
    add(new MOVE(new MEM(t, address), v));
    afterStore();
}

DataType AsmBuilder::relationType(DataType u) {
    return u != INT_S && !(quirks & UNSIGNED_RELATION) ? INT_S : u;
}

}  // namespace ZOA::fuzz
