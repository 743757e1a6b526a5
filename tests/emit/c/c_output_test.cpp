// Byte-exact C output: unit layout, the count example, every form in both
// flavours (golden files), the writers' edge cases and broken trees.
#include "emit/c/decompile_c.h"

#include "native.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <list>
#include <sstream>

using namespace ZOA;

namespace {

std::string decompiled(ZOA_file& unit) {
    std::ostringstream os;
    unit.decompile(os);
    return os.str();
}

// Prints one expression the way a statement's first expression prints.
std::string exprText(ExprBase* e, unsigned int level = 0) {
    std::ostringstream os;
    struct Probe : DecompileC {
        using DecompileC::DecompileC;
        void at(unsigned int l) { indentLevel = l; }
    } c(os, true);
    c.at(level);
    e->accept(&c);
    return os.str();
}

void buildCount(ZOA_file& unit) {
    SUBPROG* sp = unit.createSubprog(INT_S, "count", false);
    sp->makeStatic();
    TEMP* n = sp->getArgTemp(INT_S);
    TEMP* i = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* test = sp->createNewLabel(REGULAR_LABEL);
    LABEL* body = sp->createNewLabel(REGULAR_LABEL);
    sp->getStartLabel()->addStmt(new MOVE(i, new CONST(0)));
    sp->getStartLabel()->addStmt(new JUMP(test));
    test->addStmt(new CJUMP(LT, i, n, body, sp->getReturnLabel()));
    body->addStmt(new MOVE(i, new BINOP(INT_S, PLUS, i, new CONST(1))));
    body->addStmt(new JUMP(test));
    sp->getReturnLabel()->addStmt(new MOVE(sp->getReturnTemp(), i));
}

// One unit that uses every definition, prototype, statement and expression form.
void buildForms(ZOA_file& unit) {
    unit.getName(std::list<ExprBase*>{});  // first: it would match any text-made name
    unit.getName(STRINGLIT_REF, "say \"hi\"\\\" tab\t");
    unit.getName(std::list<ExprBase*>{new CONST(1), new CONST(2), new CONST(3)});
    NAME* fortyTwo = unit.getName(new CONST(42));
    unit.getName(new CONST(2.5));
    NAME* state = unit.getName(STATIC_DATA_REF, "state");
    unit.getName(DATA_ARRAY_REF, "area");
    NAME* buf = unit.getName(EXTERN_DATA_REF, "buf");
    NAME* ext = unit.getName(SUBPROG_REF, "ext_fn");
    NAME* lit = unit.getName(STRINGLIT_REF, "x");
    unit.getName(std::list<ExprBase*>{lit, ext});
    unit.getName(std::list<ExprBase*>{new CONST(static_cast<unsigned char>(200)), new CONST(static_cast<unsigned char>(7))});
    unit.getName(std::list<ExprBase*>{new CONST(0.1f), new CONST(3.0f)});

    CALL* foo = new CALL(INT_S, "foo", {new CONST(1), new CONST(static_cast<void*>(nullptr))});
    foo->setStaticCall(true);
    unit.addFunctionPrototype(foo);
    unit.addFunctionPrototype(new CALL(VOID, "bar"));

    SUBPROG* sp = unit.createSubprog(INT_S, "forms", true);
    sp->makeStatic();
    sp->makeExtern();
    TEMP* a = sp->getArgTemp(INT_S);
    TEMP* p = sp->getArgTemp(POINTER);
    TEMP* c = sp->getArgTemp(CHAR_U);
    sp->getArgTemp(DOUBLE);  // unused parameter, still declared
    TEMP* b9 = sp->getTemp(POINTER, 9, IN_USE_TEMP);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    sp->getTemp(INT_S, 0, IN_USE_TEMP);  // never used: not declared
    TEMP* b8 = sp->getTemp(POINTER, 8, IN_USE_TEMP);
    TEMP* q = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* w = sp->getTemp(INT64_U, 0, IN_USE_TEMP);
    TEMP* onlyDst = sp->getTemp(FLOAT, 0, IN_USE_TEMP);
    TEMP* fp = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    NAME* ints = unit.getName(std::list<ExprBase*>{new CONST(1), new CONST(2), new CONST(3)});

    LABEL* l2 = sp->createNewLabel(REGULAR_LABEL);
    LABEL* l3 = sp->createNewLabel(REGULAR_LABEL);
    LABEL* l4 = sp->createNewLabel(REGULAR_LABEL);
    LABEL* empty = sp->createNewLabel(REGULAR_LABEL);
    LABEL* epi = sp->createNewLabel(EPILOGUE_LABEL);
    LABEL* l7 = sp->createNewLabel(REGULAR_LABEL);
    NAME* localTable = sp->getName(std::list<ExprBase*>{sp->getName(l3), sp->getName(l4)});
    NAME* localLit = sp->getName(STRINGLIT_REF, "local");
    NAME* localStatic = sp->getName(new CONST(-7LL));

    LABEL* s = sp->getStartLabel();
    s->addStmt(new EXP(new CALL(INT_S, "foo", {a, new CONST(5)})));
    s->addStmt(new EXP(new BINOP(INT_S, PLUS, a, t)));
    s->addStmt(new MOVE(q, ints));
    s->addStmt(new MOVE(q, new BINOP(POINTER, PLUS, ints, a)));
    s->addStmt(new MOVE(q, localLit));
    s->addStmt(new MOVE(new MEM(INT_S, b9), new BINOP(INT_S, PLUS, a, new CONST(1))));
    s->addStmt(new MOVE(new MEM(CHAR_U, new BINOP(POINTER, PLUS, b8, new CONST(8))), c));
    s->addStmt(new SEQ(new MOVE(t, new UNOP(INT_S, ABS, a)), new SEQ(nullptr, new MOVE(t, new UNOP(INT_S, NEG, t)))));
    s->addStmt(new MOVE(t, new UNOP(INT_S, CONV20, new BINOP(INT_S, MUL, t, t))));
    s->addStmt(new MOVE(t, new UNOP(INT_S, CONV9, t)));
    s->addStmt(new MOVE(q, new UNOP(POINTER, CONV22, t)));
    s->addStmt(new MOVE(w, new CONST(~0ULL)));
    s->addStmt(new MOVE(w, new BINOP(INT64_U, XOR, w, new CONST(-3LL))));
    s->addStmt(new MOVE(onlyDst, new CONST(0.1f)));
    s->addStmt(new MOVE(t, new BINOP(INT_S, MOD, new CONST(static_cast<char>(-5)), new CONST(7u))));
    s->addStmt(new MOVE(q, new CONST(static_cast<void*>(const_cast<char*>("\"raw\"")))));
    s->addStmt(new MOVE(q, new CALL(POINTER, "malloc", {new CONST(16u)})));
    s->addStmt(new MOVE(q, new CALL(POINTER, "Malloc", {new CONST(16u)})));
    s->addStmt(new MOVE(fp, ext));
    s->addStmt(new MOVE(t, new CALL(INT_S, fp, {a, p})));
    s->addStmt(new MOVE(t, new BINOP(INT_S, PLUS, localStatic, fortyTwo)));
    s->addStmt(new MOVE(new MEM(POINTER, p), sp->getName(l2)));
    s->addStmt(new MOVE(q, sp->getName(l3)));
    s->addStmt(new MOVE(q, state));
    s->addStmt(new CJUMP(GE, new MEM(DOUBLE, p), new CONST(1e16), l3, l2));
    l2->addStmt(new CJUMP(EQ, t, new CONST(0), l4, empty));
    l3->addStmt(new MOVE(q, localTable));
    l3->addStmt(new JUMP(new MEM(POINTER, q)));
    l4->addStmt(new MOVE(t, buf));
    l4->addStmt(new JUMP(q));
    epi->addStmt(new MOVE(sp->getReturnTemp(), t));
    l7->addStmt(new CJUMP(LT, a, new CONST(0), l2, l3));
    sp->getReturnLabel()->addStmt(new JUMP(l2));

    SUBPROG* v = unit.createSubprog(VOID, "nothing", false);
    v->getStartLabel()->addStmt(new JUMP(v->getReturnLabel()));
}

}  // namespace

TEST(CUnit, LayoutAndRepeatedDecompile) {
    {
        ZOA_file unit(true, false);
        EXPECT_EQ(decompiled(unit), "\n\n\n");
    }
    ZOA_file unit(false, false);
    SUBPROG* f = unit.createSubprog(INT_S, "f", true);
    f->makeStatic();
    f->getArgTemp(INT_S);
    f->getArgTemp(POINTER);
    unit.getName(SUBPROG_REF, "g");
    unit.addFunctionPrototype(new CALL(INT_S, "h", {new CONST(1)}));
    std::string first = decompiled(unit);
    std::string head = "\nint h(int );\nstatic int f(int , char *);\nvoid g();\n\n\nstatic int f(int t1, char *t2)\n";
    EXPECT_EQ(first.substr(0, head.size()), head);
    // The unit forgot its subprograms, names and call prototypes.
    EXPECT_EQ(decompiled(unit), "\nstatic int f(int , char *);\nvoid g();\n\n\n");
}

TEST(CUnit, CountExample) {
    ZOA_file unit(true, false);
    buildCount(unit);
    const char* expected =
        "\n\n\n"
        "static int count(int t1)\n"
        "{\n"
        "    int t0;\n"
        "    int t2;\n"
        "\n"
        "LAB0:    t2 = 0;\n"
        "\n"
        "LAB2:    if (t2 < t1)\n"
        "        goto LAB3;\n"
        "\n"
        "LAB1:    t0 = t2;\n"
        "    return t0;\n"
        "LAB3:    t2 = (t2 + 1);\n"
        "    goto LAB2;\n"
        "\n"
        "}\n"
        "\n";
    EXPECT_EQ(decompiled(unit), expected);
    // The MSVC flavour differs only in label addresses and computed jumps.
    ZOA_file msvc(false, false);
    buildCount(msvc);
    EXPECT_EQ(decompiled(msvc), expected);
}

TEST(CUnit, EveryFormInBothFlavours) {
    {
        ZOA_file unit(true, false);
        buildForms(unit);
        EXPECT_GOLDEN("emit/c/golden/forms_gcc.c.golden", decompiled(unit));
    }
    ZOA_file unit(false, false);
    buildForms(unit);
    EXPECT_GOLDEN("emit/c/golden/forms_msvc.c.golden", decompiled(unit));
}

TEST(CWriters, FloatConstantsPrintAsTheStreamDoes) {
    ZOA_file unit(true, false);
    const double values[] = {0.1, 3.0, -2.5, 1e-7, 123456789.0, 1e20, 0.0, -0.0, 1.0 / 3.0, 65504.0,
                             3.4e38, 1e39, -1e300, std::numeric_limits<double>::infinity()};
    for (double v : values) {
        std::ostringstream ref;
        ref << static_cast<float>(std::fabs(v) > 3.5e38 ? std::copysign(HUGE_VALF, v) : v);
        EXPECT_EQ(exprText(new CONST(FLOAT, v)), ref.str()) << v;
    }
    // The stream's own settings do not leak into the output.
    std::ostringstream os;
    os.precision(2);
    os << std::fixed << std::hex;
    DecompileC c(os, true);
    CONST f(0.1f), d(0.1), i(255), u(10u);
    f.accept(&c);
    d.accept(&c);
    i.accept(&c);
    u.accept(&c);
    EXPECT_EQ(os.str(), "0.1" "0.10000000000000001" "255" "10U");
    EXPECT_EQ(exprText(new CONST(1e16)), "10000000000000000.");
    EXPECT_EQ(exprText(new CONST(1.0)), "1.0000000000000000");
}

TEST(CWriters, QuotedStringsDeclarationsAndOperands) {
    auto quoted = [](const char* text) {
        std::ostringstream os;
        DecompileC c(os, true);
        c.writeQuotedString(String(text));
        return os.str();
    };
    EXPECT_EQ(quoted(""), "\"\"");
    EXPECT_EQ(quoted("\"a\""), "\"\\\"a\\\"\"");
    EXPECT_EQ(quoted("a\\\"b"), "\"a\\\"b\"");             // already escaped: unchanged
    EXPECT_EQ(quoted("\\\\\""), "\"\\\\\"\"");             // only one character is looked back at
    EXPECT_EQ(quoted("end\\"), "\"end\\\"");               // the trailing backslash escapes the quote
    EXPECT_EQ(quoted("line\nx\\n"), "\"line\nx\\n\"");     // control characters verbatim

    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    std::ostringstream os;
    struct Probe : DecompileC {
        using DecompileC::DecompileC;
        void at(unsigned int l) { indentLevel = l; }
    } c(os, true);
    c.at(1);
    BUF_TEMP zero(7, 0), nine(8, 9), big(9, 0xFFFFFFFFu);
    c.declareTemp(&zero);
    c.declareTemp(&nine);
    c.declareTemp(&big);
    c.declareTemp(sp->getArgTemp(POINTER));
    c.declareTemp(sp->getTemp(POINTER, 0, IN_USE_TEMP));
    EXPECT_EQ(os.str(), "    char t7[0];\n    char t8[16];\n    char t9[4294967296];\n    char *t0    char *t1;\n");

    // Only the statement's first expression is indented, and only if it indents.
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    EXPECT_EQ(exprText(new MEM(INT_S, t), 2), "        *((int *)t2)");
    EXPECT_EQ(exprText(new BINOP(INT_S, PLUS, new BINOP(INT_S, PLUS, t, t), t), 2), "(((t2 + t2)) + t2)");
    EXPECT_EQ(exprText(new UNOP(INT_S, CONV5, t), 2), "((t2))");
    EXPECT_EQ(exprText(new CALL(INT_S, "alloca", {t}), 1), "    (char *)alloca(t2)");
    EXPECT_EQ(exprText(new CALL(INT_S, "mallocx"), 1), "    mallocx()");
    EXPECT_EQ(exprText(new CONST(static_cast<unsigned char>(200))), "(unsigned char)200");
    EXPECT_EQ(exprText(new CONST(CHAR_S, -5LL)), "(char)-5");
    EXPECT_EQ(exprText(new CONST(INT_U, -1LL)), "4294967295U");
    EXPECT_EQ(exprText(new CONST(INT_S, 0x1FFFFFFFFLL)), "-1");
    EXPECT_EQ(exprText(new CONST(static_cast<void*>(nullptr))), "(char *)0");
}

// Missing children and labels never crash either flavour.
TEST(CUnit, BrokenTreesPrintWithoutCrashing) {
    for (bool gcc : {true, false}) {
        ZOA_file unit(gcc, false);
        unit.getName(std::list<ExprBase*>{nullptr, new CONST(1)});
        SUBPROG* sp = unit.createSubprog(INT_S, "broken", false);
        unit.addFunctionPrototype(new CALL(INT_S, "callee", {nullptr}));
        LABEL* s = sp->getStartLabel();
        s->addStmt(new MOVE(nullptr, nullptr));
        s->addStmt(new EXP(nullptr));
        s->addStmt(new SEQ(nullptr, nullptr));
        s->addStmt(new EXP(new BINOP(INT_S, PLUS, nullptr, nullptr)));
        s->addStmt(new EXP(new UNOP(INT_S, ABS, nullptr)));
        s->addStmt(new EXP(new MEM(INT_S, nullptr)));
        s->addStmt(new EXP(new CALL(INT_S, "callee", {nullptr})));
        s->addStmt(new MOVE(nullptr, sp->getName(sp->getReturnLabel())));
        s->addStmt(new MOVE(new MEM(POINTER, nullptr), sp->getName(sp->getReturnLabel())));
        s->addStmt(new JUMP(static_cast<ExprBase*>(nullptr)));
        s->addStmt(new JUMP(new MEM(POINTER, nullptr)));
        s->addStmt(new CJUMP(EQ, nullptr, nullptr, nullptr, nullptr));
        s->addStmt(new JUMP(static_cast<LABEL*>(nullptr)));
        std::string text = decompiled(unit);
        EXPECT_NE(text.find("static ng0[] = {, 1};"), std::string::npos) << text;
        EXPECT_NE(text.find("LAB0: = ;\n;\n"), std::string::npos) << text;
        EXPECT_NE(text.find("    if ( == )\n        ;\n    else\n        ;\n    ;\n"), std::string::npos) << text;
    }
}
