// Round trips of the text form: write, read, write gives the same bytes and the same outputs.
#include <zoa/text.h>
#include <zoa/verify.h>
#include <zoa/zoa.h>

#include "native.h"

#include <gtest/gtest.h>

#include <dirent.h>

#include <cmath>
#include <fstream>
#include <limits>
#include <map>
#include <regex>
#include <sstream>

using namespace ZOA;

namespace {

// Every output of a unit; decompile last, since it empties the unit.
std::map<std::string, std::string> outputs(ZOA_file& u) {
    std::map<std::string, std::string> out;
    out["text"] = text::write(u);
    std::ostringstream ascii, dot, code;
    u.dumpAscii(ascii);
    out["ascii"] = ZOA::testing::normaliseAddresses(ascii.str());
    u.dumpDot(dot);
    out["dot"] = ZOA::testing::normaliseAddresses(dot.str());
    u.decompile(code);
    out["decompile"] = code.str();
    return out;
}

// Reads text, expecting success, and returns the rebuilt unit's outputs.
std::map<std::string, std::string> reread(const std::string& txt, const std::string& file = "roundtrip.zoa") {
    text::Result r = text::parse(txt, file);
    for (const auto& d : r.diagnostics()) ADD_FAILURE() << text::format(d) << "\nin:\n" << txt;
    if (!r.ok()) return {};
    return outputs(*r.unit());
}

void expectRoundTrip(ZOA_file& u) {
    auto first = outputs(u);
    auto second = reread(first["text"]);
    for (auto& [kind, body] : first) EXPECT_EQ(body, second[kind]) << "output " << kind << " differs";
}

// One unit using every node, constructor variant, flag and kind of declaration.
void buildRich(ZOA_file& u) {
    std::vector<ExprBase*> none;
    u.addFunctionPrototype(new CALL(INT_S, "puts", {new CONST(static_cast<void*>(nullptr))}));
    NAME* greeting = u.getName(STRINGLIT_REF, "hello, \"world\"\n\t\\\x01\x7f\xc3\xa9");
    NAME* later = u.getName(SUBPROG_REF, "helper");  // before helper exists: a prototype
    SUBPROG* main = u.createSubprog(INT_S, "main", true);
    SUBPROG* helper = u.createSubprog(INT64_S, "helper", false);
    helper->makeStatic();
    SUBPROG* ext = u.createSubprog(VOID, "ext", true);
    ext->makeExtern();
    NAME* again = u.getName(SUBPROG_REF, "main");  // main exists: no prototype
    NAME* counter = u.getName(new CONST(INT_S, 42LL));
    NAME* table = u.getName(std::list<ExprBase*>{new CONST(1), new CONST(2u), greeting});
    NAME* outside = u.getName(EXTERN_DATA_REF, "errno");
    NAME* arr = u.getName(DATA_ARRAY_REF, "buffer");
    NAME* flt = u.getName(new CONST(2.5f));
    (void)later;
    (void)arr;

    TEMP* argc = main->getArgTemp(INT_S);
    TEMP* argv = main->getArgTemp(POINTER);
    TEMP* a = main->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* b = main->getTemp(INT_S, 0, IN_USE_TEMP);
    main->freeTemp(a);
    TEMP* c = main->getTemp(CHAR_U, 0, PERMANENT_TEMP);
    TEMP* buf = main->getTemp(POINTER, 16, IN_USE_TEMP);
    TEMP* big = main->getTemp(INT64_U, 0, IN_USE_TEMP);
    TEMP* d = main->getTemp(DOUBLE, 0, AVAILABLE_TEMP);
    TEMP* fp = main->getTemp(POINTER, 0, IN_USE_TEMP);
    LABEL* l2 = main->createNewLabel(REGULAR_LABEL);
    LABEL* l3 = main->createNewLabel(REGULAR_LABEL);
    LABEL* gone = main->createNewLabel(REGULAR_LABEL);
    LABEL* l5 = main->createNewLabel(PROLOGUE_LABEL);
    main->freeDeadLabel(gone);
    NAME* lit = main->getName(STRINGLIT_REF, "local text");
    NAME* jt = main->getName(std::list<ExprBase*>{main->getName(l2), main->getName(l3)});
    NAME* one = main->getName(new CONST(static_cast<unsigned char>(200)));

    LABEL* s = main->getStartLabel();
    s->addStmt(new MOVE(a, new CONST(7)));
    s->addStmt(new MOVE(b, new BINOP(INT_S, PLUS, c, a)));  // widened by BINOP
    for (int op = PLUS; op < MAX_BINOP; ++op)
        s->addStmt(new MOVE(b, new BINOP(INT_S, static_cast<BinopKind>(op), a, new CONST(3))));
    for (int op = ABS; op < UNOP_KIND_COUNT; ++op)
        s->addStmt(new MOVE(b, new UNOP(INT_S, static_cast<UnopKind>(op), a)));
    s->addStmt(new MOVE(new MEM(INT_S, buf), new MEM(INT_S, new BINOP(POINTER, PLUS, buf, new CONST(4)))));
    s->addStmt(new MOVE(c, new CONST('x')));
    s->addStmt(new MOVE(c, new CONST(static_cast<char>(-56))));
    s->addStmt(new MOVE(big, new CONST(std::numeric_limits<unsigned long long>::max())));
    s->addStmt(new MOVE(big, new CONST(std::numeric_limits<long long>::min())));
    s->addStmt(new MOVE(d, new CONST(0.1)));
    s->addStmt(new MOVE(d, new CONST(-0.0)));
    s->addStmt(new MOVE(d, new CONST(std::numeric_limits<double>::quiet_NaN())));
    s->addStmt(new MOVE(d, new CONST(DOUBLE, -std::numeric_limits<double>::infinity())));
    s->addStmt(new MOVE(d, new CONST(FLOAT, 1e300)));
    s->addStmt(new MOVE(d, new CONST(INT_S, 1.5)));  // typed, mismatched: the bits survive
    s->addStmt(new MOVE(argv, new CONST(const_cast<char*>("text \"constant\""))));
    s->addStmt(new MOVE(a, new MEM(INT_S, counter)));
    s->addStmt(new MOVE(a, new MEM(INT_S, new BINOP(POINTER, PLUS, table, new CONST(4)))));
    s->addStmt(new MOVE(argv, greeting));
    s->addStmt(new MOVE(argv, outside));
    s->addStmt(new MOVE(argv, lit));
    s->addStmt(new MOVE(argv, again));
    s->addStmt(new MOVE(d, new MEM(FLOAT, flt)));
    s->addStmt(new MOVE(a, new MEM(CHAR_U, one)));
    CALL* named = new CALL(INT_S, "puts", {greeting});
    named->setStaticCall(true);
    s->addStmt(new EXP(named));
    s->addStmt(new EXP(new CALL(VOID, "ext")));
    s->addStmt(new MOVE(fp, u.getName(SUBPROG_REF, "helper")));
    s->addStmt(new MOVE(big, new CALL(INT64_S, static_cast<TEMP*>(fp), {argc, new CONST(1LL)})));
    s->addStmt(new EXP(new CALL(INT_S, static_cast<TEMP*>(fp))));
    s->addStmt(new SEQ(new MOVE(a, b), nullptr));
    s->addStmt(new SEQ(nullptr, new SEQ(new EXP(a), new MOVE(b, a))));
    s->addStmt(new JUMP(new MEM(POINTER, new BINOP(POINTER, PLUS, jt, new BINOP(INT_S, MUL, a, new CONST(4))))));
    for (int rel = EQ; rel <= GE; ++rel) l2->addStmt(new CJUMP(static_cast<BinopKind>(rel), a, b, l3, l5));
    l3->addStmt(new JUMP(new NAME(*main->getName(l5))));
    l5->addStmt(new MOVE(main->getReturnTemp(), argc));
    l5->addStmt(new JUMP(main->getReturnLabel()));
    u.addFunctionPrototype(named);  // main has a subprogram? no: puts has none

    TEMP* x = helper->getArgTemp(INT64_S);
    helper->getStartLabel()->addStmt(new MOVE(helper->getReturnTemp(), new BINOP(INT64_S, MUL, x, x)));
    helper->getStartLabel()->addStmt(new JUMP(helper->getReturnLabel()));
    ext->getStartLabel()->addStmt(new JUMP(ext->getReturnLabel()));
}

// Odd but legal trees: ids skipped, freed labels still jumped to, foreign and
// free-standing temps, null children, states changed by hand.
void buildOdd(ZOA_file& u) {
    SUBPROG* f = u.createSubprog(INT_S, "f", false);
    SUBPROG* g = u.createSubprog(VOID, "", false);
    f->createTempId();
    TEMP* t = f->getTemp(INT_S, 0, IN_USE_TEMP);  // t2
    TEMP* arg = f->getArgTemp(CHAR_S);
    arg->setState(IN_USE_TEMP);
    f->getReturnTemp()->setState(AVAILABLE_TEMP);
    f->createLabelId();
    LABEL* dead = f->createNewLabel(EPILOGUE_LABEL);  // L3
    f->freeDeadLabel(dead);
    f->freeDeadLabel(f->getReturnLabel());
    f->createNameId();
    NAME* empty = f->getName(std::list<ExprBase*>{});  // n1
    f->getName(EXTERN_DATA_REF, "x");                  // n2
    TEMP* gt = g->getTemp(POINTER, 8, AVAILABLE_TEMP);
    NAME* gl = u.getName(STATIC_DATA_REF, "shared");
    gl->setDeclaredLocal();
    LABEL* s = f->getStartLabel();
    s->addStmt(new MOVE(t, gt));
    s->addStmt(new MOVE(t, new BUF_TEMP(99, 12)));
    s->addStmt(new MOVE(nullptr, new BINOP(INT_S, PLUS, nullptr, arg)));
    s->addStmt(new EXP(new CALL(INT_S, "")));
    s->addStmt(new MOVE(t, empty));
    s->addStmt(new MOVE(t, gl));
    s->addStmt(new CJUMP(PLUS, t, nullptr, nullptr, dead));
    s->addStmt(new JUMP(static_cast<LABEL*>(nullptr)));
    s->addStmt(new JUMP(static_cast<ExprBase*>(nullptr)));
    dead->addStmt(new JUMP(f->getStartLabel()));
    g->getStartLabel()->addStmt(new JUMP(dead));
}

TEST(TextRoundTrip, RichUnitKeepsTextAndOutputs) {
    ZOA_file u(true, false);
    buildRich(u);
    std::string txt = text::write(u);
    EXPECT_GOLDEN("text/golden/rich.zoa", txt);
    expectRoundTrip(u);
}

TEST(TextRoundTrip, AssemblyAndMsvcFlavoursKeepTheirFlags) {
    {
        ZOA_file u(false, true);
        buildRich(u);
        std::string txt = text::write(u);
        EXPECT_EQ(0u, txt.find("(unit msvc asm\n"));
        expectRoundTrip(u);
    }
    text::Result r = text::parse("(unit msvc)", "x.zoa", text::Flavour{true, true});
    ASSERT_TRUE(r.ok());
    EXPECT_TRUE(r.unit()->IsGcc());
    EXPECT_TRUE(r.unit()->IsAsmMode());
}

TEST(TextRoundTrip, OddTreesKeepIdsStatesAndDanglingLabels) {
    ZOA_file u(true, false);
    buildOdd(u);
    std::string txt = text::write(u);
    EXPECT_GOLDEN("text/golden/odd.zoa", txt);
    text::Result r = text::parse(txt, "odd.zoa");
    ASSERT_TRUE(r.ok()) << text::format(r.diagnostics().at(0));
    EXPECT_EQ(txt, text::write(*r.unit()));
    SUBPROG* f = r.unit()->getSubprogs().front();
    EXPECT_EQ(AVAILABLE_TEMP, f->getReturnTemp()->getState());
    EXPECT_EQ(nullptr, f->getReturnLabel());
    EXPECT_EQ(0u, f->getAllLabels().count(3));
    EXPECT_EQ(2u, f->getAllLocalNames().size());
    EXPECT_EQ(2u, f->getAllLocalNames().back()->getId());
    EXPECT_TRUE(r.unit()->getNames().front()->isDeclaredLocal());
}

TEST(TextRoundTrip, PoolStatesAndPrototypesAreRebuilt) {
    text::Result r = text::parse(R"((unit gcc
      (prototype INT_S "late" static POINTER DOUBLE)
      (name g0 SUBPROG_REF "early")  ; no subprogram yet: a prototype
      (subprog s0 "early" VOID prototype
        (temp t0 INT_S AVAILABLE_TEMP)
        (temp t1 INT_S)
        (buffer t2 16 AVAILABLE_TEMP))
      (subprog s1 "late" INT_S)
      (name g1 SUBPROG_REF "late")))", "p.zoa");
    ASSERT_TRUE(r.ok()) << text::format(r.diagnostics().at(0));
    ZOA_file& u = *r.unit();
    SUBPROG* early = u.getSubprogs().front();
    // The pool hands the available temps out again, oldest first.
    EXPECT_EQ(0u, early->getTemp(INT_S, 0, IN_USE_TEMP)->getId());
    EXPECT_EQ(3u, early->getTemp(INT_S, 0, IN_USE_TEMP)->getId());
    EXPECT_EQ(2u, early->getTemp(POINTER, 16, IN_USE_TEMP)->getId());
    EXPECT_EQ(1u, u.getNamePrototypes().count("early"));
    EXPECT_EQ(0u, u.getNamePrototypes().count("late"));
    EXPECT_EQ(1u, u.getSubprogPrototypes().count("early"));
    ASSERT_EQ(1u, u.getCallPrototypes().count("late"));
    CALL* proto = u.getCallPrototypes().at("late");
    EXPECT_TRUE(proto->isCallStatic());
    ASSERT_EQ(2u, proto->getArgs().size());
    EXPECT_EQ(DOUBLE, proto->getArgs()[1]->getDataType());
    // Writing keeps the prototype before the subprogram it names.
    std::string txt = text::write(u);
    EXPECT_LT(txt.find("(name g0"), txt.find("(subprog s0"));
    EXPECT_GT(txt.find("(name g1"), txt.find("(subprog s1"));
}

// Private, zero-filled and aligned data, and aligned buffers: each keeps its
// kind (never merged into a plain name on reading) and its alignment.
void buildPrivate(ZOA_file& u) {
    auto words = [] { return std::list<ExprBase*>{new CONST(INT_U, 1u), new CONST(INT_U, 2u)}; };
    u.createData(words())->setAlignment(16);
    u.createData(new CONST(7));
    u.createZeroData(12)->setAlignment(50);  // rounded up to 64
    u.createData(std::list<ExprBase*>{});
    u.getName(words())->setAlignment(8);  // the same values, but shared data
    NAME* text = u.getName(STRINGLIT_REF, "s");
    SUBPROG* f = u.createSubprog(INT_U, "f", false);
    NAME* table = f->createData(std::list<ExprBase*>{text});
    NAME* zeros = f->createZeroData(4);
    auto* a = static_cast<BUF_TEMP*>(f->getTemp(POINTER, 20, PERMANENT_TEMP));
    a->setAlignment(8);
    static_cast<BUF_TEMP*>(f->getTemp(POINTER, 8, IN_USE_TEMP))->setAlignment(32);
    f->getStartLabel()->addStmt(new MOVE(new MEM(INT_U, zeros), new UNOP(INT_U, CONV17, new MEM(POINTER, table))));
    f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), new UNOP(INT_U, CONV17, a)));
}

TEST(TextRoundTrip, PrivateZeroAndAlignedDataKeepTheirKind) {
    ZOA_file exact(true, false);
    buildPrivate(exact);
    std::string txt = text::write(exact);
    for (const char* want : {"(name g0 (data (CONST INT_U 1) (CONST INT_U 2)) (align 16))",
                             "(name g1 (static-data (CONST INT_S 7)))", "(name g2 (zero-data 12) (align 64))",
                             "(name g3 (data))", "(name g4 (values (CONST INT_U 1) (CONST INT_U 2)) (align 8))",
                             "(name n0 (data g5))", "(name n1 (zero-data 4))", "(buffer t1 20 PERMANENT_TEMP (align 8))",
                             "(buffer t2 8 (align 32))"})
        EXPECT_NE(txt.find(want), std::string::npos) << want << " in\n" << txt;
    expectRoundTrip(exact);

    // The sound C of the rebuilt unit is the same as the original's.
    ZOA_file sound(true, false, Profile::SOUND);
    buildPrivate(sound);
    std::string soundText = text::write(sound);
    std::ostringstream a, b;
    sound.decompile(a);
    text::Result r = text::parse(soundText, "private.zoa");
    ASSERT_TRUE(r.ok()) << text::format(r.diagnostics().at(0));
    const auto& names = r.unit()->getNames();
    ASSERT_EQ(names.size(), 6u);
    EXPECT_TRUE(names.front()->isPrivateData());
    EXPECT_FALSE(names.back()->isPrivateData());
    r.unit()->setProfile(Profile::SOUND);
    r.unit()->decompile(b);
    EXPECT_EQ(a.str(), b.str());
    EXPECT_NE(a.str().find("static __attribute__((aligned(64))) char ng2[12];"), std::string::npos) << a.str();

    // Malformed forms are diagnosed, never built half.
    for (const char* bad : {"(name g0 (zero-data))", "(name g0 (zero-data -1))", "(name g0 (static-data 5))",
                            "(name g0 (data) (align x))", "(name g0 (data) (align))",
                            "(subprog s0 \"f\" VOID (buffer t1 8 (align 4) IN_USE_TEMP))"}) {
        text::Result e = text::parse(std::string("(unit gcc ") + bad + ")", "bad.zoa");
        EXPECT_FALSE(e.ok()) << bad;
    }
}

TEST(TextRoundTrip, ShorthandConstantsAndSharedSubtrees) {
    text::Result r = text::parse(R"((unit gcc (subprog s0 "f" INT_S
      (block L0 (MOVE t0 (CONST 5)) (MOVE t0 (CONST -2.5)) (EXP (CONST "hi"))))))", "c.zoa");
    ASSERT_TRUE(r.ok()) << text::format(r.diagnostics().at(0));
    std::string txt = text::write(*r.unit());
    EXPECT_NE(std::string::npos, txt.find("(CONST INT_S 5)"));
    EXPECT_NE(std::string::npos, txt.find("(CONST DOUBLE -2.5)"));
    EXPECT_NE(std::string::npos, txt.find("(CONST POINTER \"hi\")"));

    // A subtree used twice is written twice and read back as two equal trees.
    ZOA_file u(true, false);
    SUBPROG* f = u.createSubprog(INT_S, "f", false);
    ExprBase* sum = new BINOP(INT_S, PLUS, f->getReturnTemp(), new CONST(1));
    f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), sum));
    f->getStartLabel()->addStmt(new EXP(sum));
    std::string once = text::write(u);
    text::Result again = text::parse(once, "shared.zoa");
    ASSERT_TRUE(again.ok());
    EXPECT_EQ(once, text::write(*again.unit()));
    auto& stmts = again.unit()->getSubprogs().front()->getStartLabel()->getStmts();
    EXPECT_NE(static_cast<MOVE*>(stmts.front())->getSrc(), static_cast<EXP*>(stmts.back())->getExpr());
}

TEST(TextRoundTrip, ExamplesReadVerifyAndRoundTrip) {
    DIR* dir = opendir(ZOA_EXAMPLES_DIR);
    ASSERT_NE(nullptr, dir);
    int count = 0;
    while (dirent* e = readdir(dir)) {
        std::string file = e->d_name;
        if (file.size() < 4 || file.compare(file.size() - 4, 4, ".zoa") != 0) continue;
        ++count;
        std::ifstream in(std::string(ZOA_EXAMPLES_DIR) + "/" + file);
        std::string src((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
        text::Result r = text::parse(src, file);
        ASSERT_TRUE(r.ok()) << text::format(r.diagnostics().at(0));
        for (auto& d : verify::verify(*r.unit()))
            EXPECT_NE(verify::Severity::ERROR, d.severity) << file << ": " << verify::format(d);
        auto first = outputs(*r.unit());
        auto second = reread(first["text"], file);
        for (auto& [kind, body] : first) EXPECT_EQ(body, second[kind]) << file << ": output " << kind << " differs";
    }
    closedir(dir);
    EXPECT_GE(count, 8);
}

}  // namespace
