// The assembly corpus: small programs inside what the emitter translates,
// built through the public API, each with the C driver that checks it.
#include "corpus.h"

#include <zoa/zoa.h>

#include <initializer_list>
#include <list>

namespace ZOA::asmcorpus {

namespace {

// Right-nested SEQ chain: registers are released before each statement.
StmtBase* seq(std::initializer_list<StmtBase*> stmts) {
    StmtBase* chain = nullptr;
    for (auto it = stmts.end(); it != stmts.begin();) {
        --it;
        chain = chain ? new SEQ(*it, chain) : *it;
    }
    return chain;
}

MEM* at(DataType t, ExprBase* base, int offset) {
    return new MEM(t, offset ? static_cast<ExprBase*>(new BINOP(POINTER, PLUS, base, new CONST(offset))) : base);
}

BINOP* plus(ExprBase* a, ExprBase* b) { return new BINOP(INT_S, PLUS, a, b); }

const BinopKind relations[] = {EQ, NE, LT, LE, GT, GE};

void buildCount(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "count", false);
    TEMP* n = sp->getArgTemp(INT_S);
    TEMP* i = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* test = sp->createNewLabel(REGULAR_LABEL);
    LABEL* body = sp->createNewLabel(REGULAR_LABEL);
    sp->getStartLabel()->addStmt(new MOVE(i, new CONST(0)));
    sp->getStartLabel()->addStmt(new JUMP(test));
    test->addStmt(new CJUMP(LT, i, n, body, sp->getReturnLabel()));
    body->addStmt(new MOVE(i, plus(i, new CONST(1))));
    body->addStmt(new JUMP(test));
    sp->getReturnLabel()->addStmt(new MOVE(sp->getReturnTemp(), i));
}

// out[0..5] = a + b, a - b, a * b, u * v, u * 3, 7 - a
void buildArith(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(VOID, "arith", false);
    TEMP* out = sp->getArgTemp(POINTER);
    TEMP* a = sp->getArgTemp(INT_S);
    TEMP* b = sp->getArgTemp(INT_S);
    TEMP* u = sp->getArgTemp(INT_U);
    TEMP* v = sp->getArgTemp(INT_U);
    TEMP* s = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* w = sp->getTemp(INT_U, 0, IN_USE_TEMP);
    sp->getStartLabel()->addStmt(seq({
        new MOVE(s, plus(a, b)), new MOVE(at(INT_S, out, 0), s),
        new MOVE(s, new BINOP(INT_S, MINUS, a, b)), new MOVE(at(INT_S, out, 4), s),
        new MOVE(s, new BINOP(INT_S, MUL, a, b)), new MOVE(at(INT_S, out, 8), s),
        new MOVE(w, new BINOP(INT_U, MUL, u, v)), new MOVE(at(INT_U, out, 12), w),
        new MOVE(w, new BINOP(INT_U, MUL, u, new CONST(3u))), new MOVE(at(INT_U, out, 16), w),
        new MOVE(s, new BINOP(INT_S, MINUS, new CONST(7), a)), new MOVE(at(INT_S, out, 20), s),
    }));
}

// out[k] = a REL_k b, as values. One label per relation: a store through an
// address sum keeps its source register reserved until the next label.
void buildCompareValues(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(VOID, "cmpv", false);
    TEMP* out = sp->getArgTemp(POINTER);
    TEMP* a = sp->getArgTemp(INT_S);
    TEMP* b = sp->getArgTemp(INT_S);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* l = sp->getStartLabel();
    for (int k = 0; k < 6; ++k) {
        LABEL* next = k < 5 ? sp->createNewLabel(REGULAR_LABEL) : sp->getReturnLabel();
        l->addStmt(seq({new MOVE(t, new BINOP(INT_S, relations[k], a, b)), new MOVE(at(INT_S, out, 4 * k), t)}));
        l->addStmt(new JUMP(next));
        l = next;
    }
}

// Sum of 1 << k over the relations REL_k that hold, through conditional jumps.
void buildBranches(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "br", false);
    TEMP* a = sp->getArgTemp(INT_S);
    TEMP* b = sp->getArgTemp(INT_S);
    TEMP* r = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* next = sp->createNewLabel(REGULAR_LABEL);
    sp->getStartLabel()->addStmt(new MOVE(r, new CONST(0)));
    sp->getStartLabel()->addStmt(new JUMP(next));
    for (int k = 0; k < 6; ++k) {
        LABEL* yes = sp->createNewLabel(REGULAR_LABEL);
        LABEL* after = sp->createNewLabel(REGULAR_LABEL);
        next->addStmt(new CJUMP(relations[k], a, b, yes, after));
        yes->addStmt(new MOVE(r, plus(r, new CONST(1 << k))));
        yes->addStmt(new JUMP(after));
        next = after;
    }
    next->addStmt(new MOVE(sp->getReturnTemp(), r));
    next->addStmt(new JUMP(sp->getReturnLabel()));
}

// Byte arithmetic in byte registers, widening and narrowing.
void buildWiden(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "widen", false);
    TEMP* c = sp->getArgTemp(CHAR_U);
    TEMP* d = sp->getArgTemp(CHAR_U);
    TEMP* x = sp->getArgTemp(INT_S);
    TEMP* small = sp->getTemp(CHAR_U, 0, IN_USE_TEMP);
    TEMP* wide = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    sp->getStartLabel()->addStmt(seq({
        new MOVE(small, new BINOP(CHAR_U, PLUS, c, d)),
        new MOVE(wide, plus(small, x)),
        new MOVE(small, plus(wide, new CONST(1))),
        new MOVE(sp->getReturnTemp(), plus(small, wide)),
    }));
}

// callee3(x, 2, x + 1) + (*fp)(x, x, 5) + bytearg('A'), fp = callee3
void buildCalls(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "calls", false);
    TEMP* x = sp->getArgTemp(INT_S);
    TEMP* fp = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* r = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* s = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* ch = sp->getTemp(CHAR_U, 0, IN_USE_TEMP);
    sp->getStartLabel()->addStmt(seq({
        new MOVE(r, new CALL(INT_S, "callee3", {x, new CONST(2), plus(x, new CONST(1))})),
        new MOVE(fp, unit.getName(SUBPROG_REF, "callee3")),
        new MOVE(s, new CALL(INT_S, fp, {x, x, new CONST(5)})),
        new MOVE(r, plus(r, s)),
        new MOVE(ch, new CONST(static_cast<unsigned char>('A'))),
        new MOVE(s, new CALL(INT_S, "bytearg", {ch})),
        new MOVE(sp->getReturnTemp(), plus(r, s)),
    }));
}

// fact(n) = n <= 1 ? 1 : n * fact(n - 1)
void buildFact(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "fact", false);
    TEMP* n = sp->getArgTemp(INT_S);
    TEMP* sub = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* base = sp->createNewLabel(REGULAR_LABEL);
    LABEL* rec = sp->createNewLabel(REGULAR_LABEL);
    sp->getStartLabel()->addStmt(new CJUMP(LE, n, new CONST(1), base, rec));
    base->addStmt(new MOVE(sp->getReturnTemp(), new CONST(1)));
    base->addStmt(new JUMP(sp->getReturnLabel()));
    rec->addStmt(new MOVE(sub, new CALL(INT_S, "fact", {new BINOP(INT_S, MINUS, n, new CONST(1))})));
    rec->addStmt(new MOVE(sp->getReturnTemp(), new BINOP(INT_S, MUL, n, sub)));
    rec->addStmt(new JUMP(sp->getReturnLabel()));
}

// p = alloca(16); p[0] = n; p[1] = 7; return sum2(p)
void buildAlloca(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "useAlloca", false);
    TEMP* n = sp->getArgTemp(INT_S);
    TEMP* p = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* r = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    sp->getStartLabel()->addStmt(seq({
        new MOVE(p, new CALL(POINTER, "alloca", {new CONST(16)})),
        new MOVE(at(INT_S, p, 0), n),
        new MOVE(at(INT_S, p, 4), new CONST(7)),
        new MOVE(r, new CALL(INT_S, "sum2", {p})),
        new MOVE(sp->getReturnTemp(), r),
    }));
}

// tab[i] + k[2] + s, plus one when that exceeds tab[3]; tab comes from the
// driver, k (100, 200, 300) and s (1000) from the unit's data.
void buildTable(ZOA_file& unit) {
    NAME* tab = unit.getName(DATA_ARRAY_REF, "tab");
    NAME* k = unit.getName(std::list<ExprBase*>{new CONST(100), new CONST(200), new CONST(300)});
    NAME* s = unit.getName(new CONST(1000));
    SUBPROG* sp = unit.createSubprog(INT_S, "table", false);
    TEMP* i = sp->getArgTemp(INT_S);
    TEMP* off = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* v = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* w = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* more = sp->createNewLabel(REGULAR_LABEL);
    LABEL* done = sp->createNewLabel(REGULAR_LABEL);
    sp->getStartLabel()->addStmt(seq({
        new MOVE(off, new BINOP(INT_S, MUL, i, new CONST(4))),
        new MOVE(v, new MEM(INT_S, new BINOP(POINTER, PLUS, tab, off))),
        new MOVE(w, at(INT_S, k, 8)),
        new MOVE(v, plus(v, w)),
        new MOVE(v, plus(v, s)),
        new CJUMP(GT, v, at(INT_S, tab, 12), more, done),
    }));
    more->addStmt(new MOVE(v, plus(v, new CONST(1))));
    more->addStmt(new JUMP(done));
    done->addStmt(new MOVE(sp->getReturnTemp(), v));
    done->addStmt(new JUMP(sp->getReturnLabel()));
}

// Every row of the move table between memory and temporaries.
void buildMoves(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(VOID, "moves", false);
    TEMP* p = sp->getArgTemp(POINTER);
    TEMP* q = sp->getArgTemp(POINTER);
    TEMP* a = sp->getArgTemp(INT_S);
    TEMP* t3 = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* t4 = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* t5 = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* t6 = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* start = sp->getStartLabel();
    // The first three share register records (one label, no SEQ).
    start->addStmt(new MOVE(t3, a));
    start->addStmt(new MOVE(at(INT_S, p, 0), t3));
    start->addStmt(new MOVE(t4, at(INT_S, p, 0)));
    start->addStmt(seq({
        new MOVE(t4, plus(t4, new CONST(1))),
        new MOVE(at(INT_S, p, 4), t4),
        new MOVE(t5, at(INT_S, p, 4)),
        new MOVE(t6, plus(t5, t5)),
        new MOVE(at(INT_S, q, 0), t6),
        new MOVE(at(INT_S, q, 4), at(INT_S, p, 0)),
        new MOVE(at(INT_S, q, 8), new CONST(5)),
        new MOVE(t3, new CONST(7)),
        new MOVE(at(INT_S, q, 12), t3),
    }));
}

// Texts that follow the rules but compute a different result than the tree
// means; kept as text only.
void buildQuirks(ZOA_file& unit) {
    // A signed byte is widened with movzx: -1 becomes 255.
    SUBPROG* sx = unit.createSubprog(INT_S, "sx", false);
    TEMP* c = sx->getArgTemp(CHAR_S);
    TEMP* x = sx->getArgTemp(INT_S);
    sx->getStartLabel()->addStmt(new MOVE(sx->getReturnTemp(), plus(c, x)));
    // Comparisons of unsigned values use the signed condition codes.
    SUBPROG* ult = unit.createSubprog(INT_S, "ult", false);
    TEMP* u = ult->getArgTemp(INT_U);
    TEMP* v = ult->getArgTemp(INT_U);
    ult->getStartLabel()->addStmt(new MOVE(ult->getReturnTemp(), new BINOP(INT_S, LT, u, v)));
    // MUL leaves its left operand recorded in eax, which now holds the product.
    SUBPROG* mul = unit.createSubprog(INT_S, "mulreuse", false);
    TEMP* a = mul->getArgTemp(INT_S);
    TEMP* b = mul->getArgTemp(INT_S);
    TEMP* p = mul->getTemp(INT_S, 0, IN_USE_TEMP);
    mul->getStartLabel()->addStmt(new MOVE(p, new BINOP(INT_S, MUL, a, b)));
    mul->getStartLabel()->addStmt(new MOVE(mul->getReturnTemp(), plus(a, p)));
    // A function pointer that no statement visited before the call has no operand text.
    SUBPROG* apply = unit.createSubprog(INT_S, "apply", false);
    TEMP* fp = apply->getArgTemp(POINTER);
    TEMP* arg = apply->getArgTemp(INT_S);
    apply->getStartLabel()->addStmt(new MOVE(apply->getReturnTemp(), new CALL(INT_S, fp, {arg})));
    // A call as an argument stores its own arguments over the outer call's.
    SUBPROG* nest = unit.createSubprog(INT_S, "nest", false);
    TEMP* y = nest->getArgTemp(INT_S);
    nest->getStartLabel()->addStmt(
        new MOVE(nest->getReturnTemp(), new CALL(INT_S, "g2", {new CALL(INT_S, "g1", {new CONST(3), new CONST(4)}), y})));
}

}  // namespace

const std::vector<Unit>& units() {
    static const std::vector<Unit> all = {
    {"count", buildCount,
     "#include <stdio.h>\nint count(int);\n"
     "int main(void) { printf(\"%d %d %d\\n\", count(5), count(0), count(-3)); return 0; }\n",
     "5 0 0\n"},
    {"arith", buildArith,
     "#include <stdio.h>\nvoid arith(int*, int, int, unsigned, unsigned);\n"
     "int main(void) { int r[6]; arith(r, 9, 3, 100000u, 100000u);\n"
     "  printf(\"%d %d %d %u %u %d\\n\", r[0], r[1], r[2], (unsigned)r[3], (unsigned)r[4], r[5]); return 0; }\n",
     "12 6 27 1410065408 300000 -2\n"},
    {"compare_values", buildCompareValues,
     "#include <stdio.h>\nvoid cmpv(int*, int, int);\n"
     "static void show(int a, int b) { int r[6]; cmpv(r, a, b);\n"
     "  printf(\"%d %d %d %d %d %d\\n\", r[0], r[1], r[2], r[3], r[4], r[5]); }\n"
     "int main(void) { show(1, 2); show(2, 2); show(3, 2); show(-1, 1); return 0; }\n",
     "0 1 1 1 0 0\n1 0 0 1 0 1\n0 1 0 0 1 1\n0 1 1 1 0 0\n"},
    {"branches", buildBranches,
     "#include <stdio.h>\nint br(int, int);\n"
     "int main(void) { printf(\"%d %d %d %d\\n\", br(1, 2), br(2, 2), br(3, 2), br(-5, 4)); return 0; }\n",
     "14 41 50 14\n"},
    {"widen", buildWiden,
     "#include <stdio.h>\nint widen(unsigned char, unsigned char, int);\n"
     "int main(void) { printf(\"%d %d\\n\", widen(200, 100, 1000), widen(1, 2, 3)); return 0; }\n",
     "1065 13\n"},
    {"calls", buildCalls,
     "#include <stdio.h>\nint calls(int);\n"
     "int callee3(int a, int b, int c) { return a * 100 + b * 10 + c; }\n"
     "int bytearg(unsigned char c) { return c + 1; }\n"
     "int main(void) { printf(\"%d\\n\", calls(4)); return 0; }\n",
     "936\n"},
    {"fact", buildFact,
     "#include <stdio.h>\nint fact(int);\n"
     "int main(void) { printf(\"%d %d %d\\n\", fact(5), fact(1), fact(10)); return 0; }\n",
     "120 1 3628800\n"},
    {"alloca", buildAlloca,
     "#include <stdio.h>\nint useAlloca(int);\n"
     "int sum2(int* p) { return p[0] + p[1]; }\n"
     "int main(void) { printf(\"%d %d\\n\", useAlloca(5), useAlloca(-7)); return 0; }\n",
     "12 0\n"},
    {"table", buildTable,
     "#include <stdio.h>\nint table(int);\nint tab[4] = {10, 20, 30, 40};\n"
     "int main(void) { printf(\"%d %d\\n\", table(1), table(2)); return 0; }\n",
     "1321 1331\n"},
    {"moves", buildMoves,
     "#include <stdio.h>\nvoid moves(int*, int*, int);\n"
     "int main(void) { int p[2], q[4]; moves(p, q, 10);\n"
     "  printf(\"%d %d %d %d %d %d\\n\", p[0], p[1], q[0], q[1], q[2], q[3]); return 0; }\n",
     "10 11 22 10 5 7\n"},
    {"quirks", buildQuirks, "", ""},
};
    return all;
}

}  // namespace ZOA::asmcorpus
