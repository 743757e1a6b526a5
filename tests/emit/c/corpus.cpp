// The corpus programs: each builds one unit through the public API.
#include "corpus.h"

#include <zoa/zoa.h>

#include <list>
#include <sstream>

namespace ZOA::corpus {

namespace {

BINOP* bin(DataType t, BinopKind op, ExprBase* l, ExprBase* r) { return new BINOP(t, op, l, r); }
BINOP* add(ExprBase* l, ExprBase* r) { return bin(INT_S, PLUS, l, r); }
BINOP* at(ExprBase* base, ExprBase* offset) { return bin(POINTER, PLUS, base, offset); }
MEM* mem(DataType t, ExprBase* addr) { return new MEM(t, addr); }
CONST* num(int v) { return new CONST(v); }
MOVE* move(ExprBase* d, ExprBase* s) { return new MOVE(d, s); }

// int count(int n): i = 0; while (i < n) i = i + 1; return i;
void buildCountInto(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "count", false);
    TEMP* n = sp->getArgTemp(INT_S);
    TEMP* i = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* test = sp->createNewLabel(REGULAR_LABEL);
    LABEL* body = sp->createNewLabel(REGULAR_LABEL);
    sp->getStartLabel()->addStmt(move(i, num(0)));
    sp->getStartLabel()->addStmt(new JUMP(test));
    test->addStmt(new CJUMP(LT, i, n, body, sp->getReturnLabel()));
    body->addStmt(move(i, add(i, num(1))));
    body->addStmt(new JUMP(test));
    sp->getReturnLabel()->addStmt(move(sp->getReturnTemp(), i));
}

void countLoop(ZOA_file& unit) {
    buildCountInto(unit);
    unit.getSubprogs().front()->makeStatic();
}

// int fact(int n): n <= 1 ? 1 : n * fact(n - 1), through a named call.
void factorial(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "fact", false);
    TEMP* n = sp->getArgTemp(INT_S);
    TEMP* r = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* base = sp->createNewLabel(REGULAR_LABEL);
    LABEL* rec = sp->createNewLabel(REGULAR_LABEL);
    sp->getStartLabel()->addStmt(new CJUMP(LE, n, num(1), base, rec));
    base->addStmt(move(sp->getReturnTemp(), num(1)));
    base->addStmt(new JUMP(sp->getReturnLabel()));
    CALL* self = new CALL(INT_S, "fact", {bin(INT_S, MINUS, n, num(1))});
    unit.addFunctionPrototype(self);  // fact exists: no prototype
    rec->addStmt(move(r, self));
    rec->addStmt(move(sp->getReturnTemp(), bin(INT_S, MUL, n, r)));
    rec->addStmt(new JUMP(sp->getReturnLabel()));
}

// Calls through function pointers: one taken from a named function, one
// loaded from a table of function addresses.
void functionPointers(ZOA_file& unit) {
    NAME* triple = unit.getName(SUBPROG_REF, "zoa_triple");
    NAME* negate = unit.getName(SUBPROG_REF, "zoa_negate");

    SUBPROG* apply = unit.createSubprog(INT_S, "apply", false);
    TEMP* x = apply->getArgTemp(INT_S);
    TEMP* fp = apply->getTemp(POINTER, 0, IN_USE_TEMP);
    apply->getStartLabel()->addStmt(move(fp, triple));
    apply->getStartLabel()->addStmt(move(apply->getReturnTemp(), new CALL(INT_S, fp, {x})));

    SUBPROG* pick = unit.createSubprog(INT_S, "pick", false);
    TEMP* which = pick->getArgTemp(INT_S);
    TEMP* y = pick->getArgTemp(INT_S);
    TEMP* base = pick->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* f = pick->getTemp(POINTER, 0, IN_USE_TEMP);
    // Local, so that it follows the prototypes of the functions it holds.
    NAME* table = pick->getName(std::list<ExprBase*>{triple, negate});
    LABEL* s = pick->getStartLabel();
    s->addStmt(move(base, table));
    s->addStmt(move(f, mem(POINTER, at(base, bin(INT_S, MUL, which, num(4))))));
    s->addStmt(move(pick->getReturnTemp(), new CALL(INT_S, f, {y})));
}

// A string literal walked byte by byte, an int table summed in a loop and a
// table of string literals.
void tables(ZOA_file& unit) {
    NAME* lit = unit.getName(STRINGLIT_REF, "he said \"hi\"");
    std::list<ExprBase*> primes{num(3), num(1), num(4), num(1), num(5), num(9), num(2), num(6)};
    NAME* digits = unit.getName(primes);
    NAME* words = unit.getName(std::list<ExprBase*>{unit.getName(STRINGLIT_REF, "ab"), unit.getName(STRINGLIT_REF, "cdef")});

    SUBPROG* slen = unit.createSubprog(INT_S, "slen", false);
    {
        TEMP* p = slen->getTemp(POINTER, 0, IN_USE_TEMP);
        TEMP* len = slen->getReturnTemp();
        LABEL* loop = slen->createNewLabel(REGULAR_LABEL);
        LABEL* step = slen->createNewLabel(REGULAR_LABEL);
        slen->getStartLabel()->addStmt(move(p, lit));
        slen->getStartLabel()->addStmt(move(len, num(0)));
        slen->getStartLabel()->addStmt(new JUMP(loop));
        loop->addStmt(new CJUMP(NE, mem(CHAR_S, p), new CONST(char(0)), step, slen->getReturnLabel()));
        step->addStmt(move(p, at(p, num(1))));
        step->addStmt(move(len, add(len, num(1))));
        step->addStmt(new JUMP(loop));
    }

    SUBPROG* sum = unit.createSubprog(INT_S, "sumtab", false);
    {
        TEMP* n = sum->getArgTemp(INT_S);
        TEMP* i = sum->getTemp(INT_S, 0, IN_USE_TEMP);
        TEMP* p = sum->getTemp(POINTER, 0, IN_USE_TEMP);
        TEMP* acc = sum->getReturnTemp();
        LABEL* loop = sum->createNewLabel(REGULAR_LABEL);
        LABEL* body = sum->createNewLabel(REGULAR_LABEL);
        LABEL* s = sum->getStartLabel();
        s->addStmt(move(p, digits));  // byte arithmetic goes through a char pointer
        s->addStmt(move(acc, num(0)));
        s->addStmt(move(i, num(0)));
        s->addStmt(new JUMP(loop));
        loop->addStmt(new CJUMP(LT, i, n, body, sum->getReturnLabel()));
        body->addStmt(move(acc, add(acc, mem(INT_S, at(p, bin(INT_S, MUL, i, num(4)))))));
        body->addStmt(move(i, add(i, num(1))));
        body->addStmt(new JUMP(loop));
    }

    SUBPROG* pickc = unit.createSubprog(INT_S, "pickc", false);
    {
        TEMP* w = pickc->getArgTemp(INT_S);
        TEMP* j = pickc->getArgTemp(INT_S);
        TEMP* p = pickc->getTemp(POINTER, 0, IN_USE_TEMP);
        LABEL* s = pickc->getStartLabel();
        s->addStmt(move(p, words));
        s->addStmt(move(p, mem(POINTER, at(p, bin(INT_S, MUL, w, num(4))))));
        s->addStmt(move(pickc->getReturnTemp(), mem(CHAR_S, at(p, j))));
    }
}

// A 13-byte buffer temporary written and read through MEM.
void buffer(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "bufsum", false);
    TEMP* a = sp->getArgTemp(INT_S);
    TEMP* b = sp->getArgTemp(INT_S);
    TEMP* c = sp->getArgTemp(INT_S);
    TEMP* buf = sp->getTemp(POINTER, 13, IN_USE_TEMP);
    LABEL* s = sp->getStartLabel();
    s->addStmt(move(mem(INT_S, buf), a));
    s->addStmt(move(mem(INT_S, at(buf, num(4))), b));
    s->addStmt(move(mem(INT_S, at(buf, num(8))), c));
    s->addStmt(move(mem(CHAR_U, at(buf, num(12))), new CONST(static_cast<unsigned char>(1))));
    s->addStmt(move(sp->getReturnTemp(),
                    add(add(mem(INT_S, buf), bin(INT_S, MUL, mem(INT_S, at(buf, num(4))), mem(INT_S, at(buf, num(8))))),
                        mem(CHAR_U, at(buf, num(12))))));
}

// 8-bit operands widened by BINOP, a narrowing conversion, ABS and NEG.
void widening(ZOA_file& unit) {
    SUBPROG* w = unit.createSubprog(INT_S, "widen", false);
    {
        TEMP* a = w->getArgTemp(CHAR_U);
        TEMP* b = w->getArgTemp(CHAR_S);
        TEMP* k = w->getArgTemp(INT_S);
        w->getStartLabel()->addStmt(
            move(w->getReturnTemp(), bin(INT_S, MINUS, add(a, k), bin(INT_S, MUL, b, k))));
    }
    SUBPROG* n = unit.createSubprog(INT_S, "narrow", false);
    {
        TEMP* x = n->getArgTemp(INT_S);
        TEMP* c = n->getTemp(CHAR_U, 0, IN_USE_TEMP);
        n->getStartLabel()->addStmt(move(c, new UNOP(CHAR_U, CONV6, x)));
        n->getStartLabel()->addStmt(move(n->getReturnTemp(), add(c, num(0))));
    }
    SUBPROG* d = unit.createSubprog(INT_S, "absdiff", false);
    {
        TEMP* x = d->getArgTemp(INT_S);
        TEMP* y = d->getArgTemp(INT_S);
        TEMP* t = d->getTemp(INT_S, 0, IN_USE_TEMP);
        d->getStartLabel()->addStmt(move(t, bin(INT_S, MINUS, x, y)));
        d->getStartLabel()->addStmt(
            move(d->getReturnTemp(), bin(INT_S, PLUS, new UNOP(INT_S, ABS, t), new UNOP(INT_S, NEG, num(0)))));
    }
}

// 64-bit arithmetic, signed and unsigned, and a widening cast.
void wide64(ZOA_file& unit) {
    SUBPROG* m = unit.createSubprog(INT64_S, "mul64", false);
    {
        TEMP* a = m->getArgTemp(INT64_S);
        TEMP* b = m->getArgTemp(INT64_S);
        m->getStartLabel()->addStmt(move(
            m->getReturnTemp(), bin(INT64_S, PLUS, bin(INT64_S, MUL, a, b), new CONST(1099511627776LL))));
    }
    SUBPROG* s = unit.createSubprog(INT64_U, "top64", false);
    {
        TEMP* t = s->getTemp(INT64_U, 0, IN_USE_TEMP);
        s->getStartLabel()->addStmt(move(t, new CONST(~0ULL)));
        s->getStartLabel()->addStmt(move(s->getReturnTemp(), bin(INT64_U, RSHIFT, t, num(60))));
    }
    SUBPROG* w = unit.createSubprog(INT64_S, "square64", false);
    {
        TEMP* x = w->getArgTemp(INT_S);
        UNOP* wide = new UNOP(INT64_S, CONV24, x);
        w->getStartLabel()->addStmt(move(w->getReturnTemp(), bin(INT64_S, MUL, wide, wide)));
    }
}

// Heap and stack memory from malloc and alloca, with their call prototypes.
void heap(ZOA_file& unit) {
    for (const char* fn : {"onheap", "onstack"}) {
        bool useHeap = fn[2] == 'h';
        SUBPROG* sp = unit.createSubprog(INT_S, fn, false);
        TEMP* n = sp->getArgTemp(INT_S);
        TEMP* p = sp->getTemp(POINTER, 0, IN_USE_TEMP);
        CALL* get = new CALL(POINTER, useHeap ? "malloc" : "alloca", {new CONST(16u)});
        unit.addFunctionPrototype(get);
        LABEL* s = sp->getStartLabel();
        s->addStmt(move(p, get));
        s->addStmt(move(mem(INT_S, p), n));
        s->addStmt(move(mem(INT_S, at(p, num(4))), bin(INT_S, MUL, n, num(2))));
        s->addStmt(move(sp->getReturnTemp(), add(mem(INT_S, p), mem(INT_S, at(p, num(4))))));
        if (useHeap) {
            CALL* release = new CALL(VOID, "free", {p});
            unit.addFunctionPrototype(release);
            s->addStmt(new EXP(release));
        }
    }
}

// A static and an extern subprogram called before they are defined.
void linkage(ZOA_file& unit) {
    SUBPROG* user = unit.createSubprog(INT_S, "user", false);
    SUBPROG* helper = unit.createSubprog(INT_S, "helper", true);
    helper->makeStatic();
    SUBPROG* twice = unit.createSubprog(INT_S, "twice", true);
    twice->makeExtern();

    TEMP* x = user->getArgTemp(INT_S);
    CALL* h = new CALL(INT_S, "helper", {x});
    CALL* t = new CALL(INT_S, "twice", {x});
    unit.addFunctionPrototype(h);
    unit.addFunctionPrototype(t);
    user->getStartLabel()->addStmt(move(user->getReturnTemp(), add(h, t)));

    TEMP* hx = helper->getArgTemp(INT_S);
    helper->getStartLabel()->addStmt(move(helper->getReturnTemp(), add(hx, num(1))));
    TEMP* tx = twice->getArgTemp(INT_S);
    twice->getStartLabel()->addStmt(move(twice->getReturnTemp(), bin(INT_S, MUL, tx, num(2))));
}

// A switch through a local table of label addresses, and a jump through a
// label address kept in a temporary.
void computedJump(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "sw", false);
    TEMP* i = sp->getArgTemp(INT_S);
    TEMP* base = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* where = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    LABEL* dispatch = sp->createNewLabel(REGULAR_LABEL);
    LABEL* big = sp->createNewLabel(REGULAR_LABEL);
    LABEL* cases[3];
    for (LABEL*& c : cases) c = sp->createNewLabel(REGULAR_LABEL);
    LABEL* other = sp->createNewLabel(REGULAR_LABEL);
    NAME* table = sp->getName(std::list<ExprBase*>{sp->getName(cases[0]), sp->getName(cases[1]), sp->getName(cases[2])});

    sp->getStartLabel()->addStmt(new CJUMP(GE, i, num(3), big, dispatch));
    dispatch->addStmt(move(base, table));
    dispatch->addStmt(move(base, at(base, bin(INT_S, MUL, i, num(4)))));
    dispatch->addStmt(new JUMP(mem(POINTER, base)));
    for (int k = 0; k < 3; ++k) {
        cases[k]->addStmt(move(sp->getReturnTemp(), num(10 * (k + 1))));
        cases[k]->addStmt(new JUMP(sp->getReturnLabel()));
    }
    big->addStmt(move(where, sp->getName(other)));
    big->addStmt(new JUMP(where));
    other->addStmt(move(sp->getReturnTemp(), num(99)));
    other->addStmt(new JUMP(sp->getReturnLabel()));
}

// File-level and local static data, external data, names without values,
// and floating-point constants.
void data(ZOA_file& unit) {
    NAME* base = unit.getName(new CONST(41));
    NAME* scratch = unit.getName(DATA_ARRAY_REF, "scratch");
    NAME* slot = unit.getName(STATIC_DATA_REF, "zoa_slot");
    NAME* ext = unit.getName(EXTERN_DATA_REF, "zoa_ext");

    SUBPROG* tick = unit.createSubprog(INT_S, "tick", false);
    {
        NAME* counter = tick->getName(new CONST(0));
        LABEL* s = tick->getStartLabel();
        s->addStmt(move(counter, add(counter, num(1))));
        s->addStmt(move(tick->getReturnTemp(), add(base, counter)));
    }
    SUBPROG* bytes = unit.createSubprog(INT_S, "bytes", false);
    {
        TEMP* p = bytes->getTemp(POINTER, 0, IN_USE_TEMP);
        LABEL* s = bytes->getStartLabel();
        s->addStmt(move(p, scratch));
        s->addStmt(move(mem(CHAR_U, p), new CONST(static_cast<unsigned char>(7))));
        s->addStmt(move(slot, p));
        s->addStmt(move(bytes->getReturnTemp(),
                        bin(INT_S, PLUS, mem(CHAR_U, slot), mem(CHAR_S, at(ext, num(1))))));
    }
    SUBPROG* area = unit.createSubprog(DOUBLE, "area", false);
    {
        TEMP* r = area->getArgTemp(DOUBLE);
        area->getStartLabel()->addStmt(
            move(area->getReturnTemp(), bin(DOUBLE, MUL, bin(DOUBLE, MUL, r, r), new CONST(3.14159))));
    }
    SUBPROG* half = unit.createSubprog(FLOAT, "half", false);
    {
        TEMP* x = half->getArgTemp(FLOAT);
        half->getStartLabel()->addStmt(move(half->getReturnTemp(), bin(FLOAT, MUL, x, new CONST(0.5f))));
    }
}

}  // namespace

std::string decompiled(const Program& p, bool isGcc) {
    ZOA_file unit(isGcc, false);
    p.build(unit);
    std::ostringstream os;
    unit.decompile(os);
    return os.str();
}

const std::vector<Program>& programs() {
    static const std::vector<Program> all = {
        {"count", countLoop,
         "void check_count(void (*report)(const char *, long long)) {\n"
         "    report(\"count(10)\", count(10));\n"
         "    report(\"count(0)\", count(0));\n"
         "    report(\"count(-3)\", count(-3));\n"
         "}\n",
         "count(10)=10\ncount(0)=0\ncount(-3)=0\n"},
        {"fact", factorial,
         "void check_fact(void (*report)(const char *, long long)) {\n"
         "    report(\"fact(1)\", fact(1));\n"
         "    report(\"fact(5)\", fact(5));\n"
         "    report(\"fact(10)\", fact(10));\n"
         "}\n",
         "fact(1)=1\nfact(5)=120\nfact(10)=3628800\n"},
        {"fnptr", functionPointers,
         "void check_fnptr(void (*report)(const char *, long long)) {\n"
         "    report(\"apply(7)\", apply(7));\n"
         "    report(\"pick(0,5)\", pick(0, 5));\n"
         "    report(\"pick(1,5)\", pick(1, 5));\n"
         "}\n",
         "apply(7)=21\npick(0,5)=15\npick(1,5)=-5\n"},
        {"tables", tables,
         "void check_tables(void (*report)(const char *, long long)) {\n"
         "    report(\"slen()\", slen());\n"
         "    report(\"sumtab(8)\", sumtab(8));\n"
         "    report(\"sumtab(3)\", sumtab(3));\n"
         "    report(\"pickc(1,2)\", pickc(1, 2));\n"
         "    report(\"pickc(0,1)\", pickc(0, 1));\n"
         "}\n",
         "slen()=12\nsumtab(8)=31\nsumtab(3)=8\npickc(1,2)=101\npickc(0,1)=98\n"},
        {"buffer", buffer,
         "void check_buffer(void (*report)(const char *, long long)) {\n"
         "    report(\"bufsum(2,3,4)\", bufsum(2, 3, 4));\n"
         "}\n",
         "bufsum(2,3,4)=15\n"},
        {"widen", widening,
         "void check_widen(void (*report)(const char *, long long)) {\n"
         "    report(\"widen(200,-3,100)\", widen(200, -3, 100));\n"
         "    report(\"narrow(300)\", narrow(300));\n"
         "    report(\"absdiff(3,10)\", absdiff(3, 10));\n"
         "    report(\"absdiff(10,3)\", absdiff(10, 3));\n"
         "}\n",
         "widen(200,-3,100)=600\nnarrow(300)=44\nabsdiff(3,10)=7\nabsdiff(10,3)=7\n"},
        {"wide64", wide64,
         "void check_wide64(void (*report)(const char *, long long)) {\n"
         "    report(\"mul64(3000000000,7)\", mul64(3000000000LL, 7));\n"
         "    report(\"top64()\", (long long)top64());\n"
         "    report(\"square64(100000)\", square64(100000));\n"
         "}\n",
         "mul64(3000000000,7)=1120511627776\ntop64()=15\nsquare64(100000)=10000000000\n"},
        {"heap", heap,
         "void check_heap(void (*report)(const char *, long long)) {\n"
         "    report(\"onheap(5)\", onheap(5));\n"
         "    report(\"onstack(7)\", onstack(7));\n"
         "}\n",
         "onheap(5)=15\nonstack(7)=21\n"},
        {"linkage", linkage,
         "void check_linkage(void (*report)(const char *, long long)) {\n"
         "    report(\"user(10)\", user(10));\n"
         "}\n",
         "user(10)=31\n"},
        {"computed", computedJump,
         "void check_computed(void (*report)(const char *, long long)) {\n"
         "    report(\"sw(0)\", sw(0));\n"
         "    report(\"sw(1)\", sw(1));\n"
         "    report(\"sw(2)\", sw(2));\n"
         "    report(\"sw(7)\", sw(7));\n"
         "}\n",
         "sw(0)=10\nsw(1)=20\nsw(2)=30\nsw(7)=99\n"},
        {"data", data,
         "void check_data(void (*report)(const char *, long long)) {\n"
         "    report(\"tick()\", tick());\n"
         "    report(\"tick()\", tick());\n"
         "    report(\"bytes()\", bytes());\n"
         "    report(\"area(2)*1000\", (long long)(area(2.0) * 1000));\n"
         "    report(\"half(3)*10\", (long long)(half(3.0f) * 10));\n"
         "}\n",
         "tick()=42\ntick()=43\nbytes()=128\narea(2)*1000=12566\nhalf(3)*10=15\n"},
    };
    return all;
}

const char* const externals =
    "int zoa_triple(int x) { return 3 * x; }\n"
    "int zoa_negate(int x) { return -x; }\n"
    "char *zoa_ext = \"xyz\";\n";

}  // namespace ZOA::corpus
