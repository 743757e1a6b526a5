// Sound C: each problem of the exact texts shown on the exact text and fixed in the sound one,
// compiled with warnings as errors, run, and checked against the interpreter.
#include "native.h"

#include <zoa/interp.h>
#include <zoa/verify.h>
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <limits>
#include <list>
#include <sstream>

using namespace ZOA;
using ZOA::testing::buildAndRun32;
using ZOA::testing::runCommand;
using ZOA::testing::scratchDir;
using ZOA::testing::writeFile;

namespace {

const char* const STRICT =
    "-std=gnu99 -Wall -Werror -Wno-unused-label -Wno-unused-variable -Wno-unused-but-set-variable";

using Builder = std::function<void(ZOA_file&)>;

struct Emitted {
    bool ok = false;
    std::string text;
    std::string diagnostics;
};

Emitted emit(const Builder& build, Profile profile, bool isGcc = true) {
    ZOA_file unit(isGcc, false, profile);
    std::ostringstream diag;
    unit.setDiagnosticStream(&diag);
    build(unit);
    std::ostringstream os;
    Emitted e;
    e.ok = unit.decompile(os);
    e.text = os.str();
    e.diagnostics = diag.str();
    return e;
}

// The sound interpreter's value of FUNC(), as the C harness prints it.
std::string interpreted(const Builder& build, const char* func) {
    ZOA_file unit(true, false, Profile::SOUND);
    build(unit);
    interp::Result r = interp::run(unit, func, {});
    return r.ok() ? interp::format(r.value) : "stopped: " + r.message;
}

bool compilesStrictly(const std::string& dir, const std::string& text) {
    std::string path = writeFile(dir, "strict.c", text);
    return runCommand(std::string("gcc -m32 -c ") + STRICT + " -o '" + path + ".o' '" + path + "'").status == 0;
}

// Links the text with a harness whose main prints something, and runs it.
std::string run(const std::string& dir, const std::string& text, const std::string& harness) {
    std::string unit = writeFile(dir, "unit.c", text);
    std::string main = writeFile(dir, "main.c", "#include <stdio.h>\n#include <stdarg.h>\n" + harness);
    return buildAndRun32(dir, {unit, main}).output;
}

TEMP* ret(SUBPROG* sp) { return sp->getReturnTemp(); }
LABEL* start(SUBPROG* sp) { return sp->getStartLabel(); }

// ---- one test per problem of the exact texts ----

void tableArithmetic(ZOA_file& u) {
    std::list<ExprBase*> values;
    for (unsigned v : {10u, 20u, 30u, 40u, 50u}) values.push_back(new CONST(INT_U, v));
    NAME* table = u.getName(values);
    SUBPROG* f = u.createSubprog(INT_U, "f", false);
    start(f)->addStmt(new MOVE(ret(f), new MEM(INT_U, new BINOP(POINTER, PLUS, table, new CONST(4)))));
}

TEST(SoundC, TableNameArithmeticCountsBytes) {
    std::string dir = scratchDir();
    const char* harness = "unsigned f(void);\nint main(void) { printf(\"%u\", f()); return 0; }\n";
    std::string exact = "typedef long long int64;\ntypedef unsigned long long uint64;\n" + emit(tableArithmetic, Profile::EXACT).text;
    EXPECT_EQ(run(dir, exact, harness), "50");  // scaled by the element size
    Emitted sound = emit(tableArithmetic, Profile::SOUND);
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    EXPECT_EQ(run(dir, sound.text, harness), "20");
    EXPECT_EQ(interpreted(tableArithmetic, "f"), "20");
}

void twoZeroWords(ZOA_file& u, bool merged) {
    std::list<ExprBase*> zero{new CONST(INT_U, 0u)};
    NAME* a = merged ? u.getName(zero) : u.createData(zero);
    NAME* b = merged ? u.getName(std::list<ExprBase*>{new CONST(INT_U, 0u)}) : u.createData(zero);
    SUBPROG* f = u.createSubprog(INT_U, "f", false);
    start(f)->addStmt(new MOVE(new MEM(INT_U, a), new CONST(INT_U, 5u)));
    start(f)->addStmt(new MOVE(ret(f), new MEM(INT_U, b)));
}

TEST(SoundC, PrivateDataIsNeverMerged) {
    std::string dir = scratchDir();
    const char* harness = "unsigned f(void);\nint main(void) { printf(\"%u\", f()); return 0; }\n";
    auto merged = [](ZOA_file& u) { twoZeroWords(u, true); };
    auto separate = [](ZOA_file& u) { twoZeroWords(u, false); };
    EXPECT_EQ(run(dir, "typedef long long int64;\n" + emit(merged, Profile::EXACT).text, harness), "5");
    Emitted sound = emit(separate, Profile::SOUND);
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    EXPECT_EQ(run(dir, sound.text, harness), "0");
    EXPECT_EQ(interpreted(separate, "f"), "0");

    ZOA_file u(true, false);
    std::list<ExprBase*> values{new CONST(1)};
    NAME* priv = u.createData(values);
    EXPECT_NE(u.getName(values), priv);
    EXPECT_EQ(priv->getKind(), DATA_ARRAY_REF);
    EXPECT_TRUE(priv->isPrivateData());
    NAME* zeros = u.createZeroData(12);
    EXPECT_EQ(zeros->getZeroBytes(), 12u);
    EXPECT_NE(u.getName(std::list<ExprBase*>{}), zeros);
    NAME* single = u.createData(new CONST(7));
    EXPECT_EQ(single->getKind(), STATIC_DATA_REF);
    EXPECT_NE(u.getName(new CONST(7)), single);
    EXPECT_EQ(single->getId(), 4u);  // the unit's name numbering goes on
}

void wideUnsigned(ZOA_file& u) {
    SUBPROG* f = u.createSubprog(INT64_U, "f", false);
    start(f)->addStmt(new MOVE(ret(f), new BINOP(INT64_U, RSHIFT, new CONST(INT64_U, ~0ull), new CONST(63))));
    SUBPROG* g = u.createSubprog(INT_S, "g", false);
    start(g)->addStmt(new MOVE(ret(g), new BINOP(INT_S, DIV, new CONST(std::numeric_limits<int>::min()), new CONST(-2))));
    SUBPROG* h = u.createSubprog(INT64_S, "h", false);
    start(h)->addStmt(new MOVE(ret(h), new CONST(INT64_S, std::numeric_limits<long long>::min())));
}

TEST(SoundC, IntegerConstantsKeepTheirType) {
    std::string dir = scratchDir();
    const char* harness =
        "typedef unsigned long long u64;\nu64 f(void); int g(void); long long h(void);\n"
        "int main(void) { printf(\"%llu %d %lld\", f(), g(), h()); return 0; }\n";
    std::string exact = "typedef long long int64;\ntypedef unsigned long long uint64;\n" + emit(wideUnsigned, Profile::EXACT).text;
    EXPECT_NE(run(dir, exact, harness).substr(0, 2), "1 ");  // the shift is arithmetic
    Emitted sound = emit(wideUnsigned, Profile::SOUND);
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    EXPECT_EQ(run(dir, sound.text, harness), "1 1073741824 -9223372036854775808");
    EXPECT_EQ(interpreted(wideUnsigned, "f"), "1");
    EXPECT_EQ(interpreted(wideUnsigned, "g"), "1073741824");
}

void floatingConstants(ZOA_file& u) {
    SUBPROG* f = u.createSubprog(FLOAT, "f", false);
    start(f)->addStmt(new MOVE(ret(f), new CONST(FLOAT, 1.2345678)));
    SUBPROG* d = u.createSubprog(DOUBLE, "d", false);
    start(d)->addStmt(new MOVE(ret(d), new CONST(DOUBLE, 0.1 + 0.2)));
    SUBPROG* inf = u.createSubprog(DOUBLE, "inf", false);
    start(inf)->addStmt(new MOVE(ret(inf), new CONST(DOUBLE, -std::numeric_limits<double>::infinity())));
    SUBPROG* quiet = u.createSubprog(FLOAT, "quiet", false);
    start(quiet)->addStmt(new MOVE(ret(quiet), new CONST(FLOAT, std::numeric_limits<double>::quiet_NaN())));
}

TEST(SoundC, FloatingConstantsReadBackToTheSameBits) {
    std::string dir = scratchDir();
    Emitted exact = emit(floatingConstants, Profile::EXACT);
    EXPECT_NE(exact.text.find("1.23457"), std::string::npos);
    EXPECT_FALSE(compilesStrictly(dir, "typedef long long int64;\n" + exact.text));  // INF, NAN
    Emitted sound = emit(floatingConstants, Profile::SOUND);
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    const char* harness =
        "float f(void); double d(void); double inf(void); float quiet(void);\n"
        "int main(void) { float x = f(); double y = d(); unsigned a; unsigned long long b;\n"
        "  __builtin_memcpy(&a, &x, 4); __builtin_memcpy(&b, &y, 8);\n"
        "  printf(\"%08x %016llx %g %d\", a, b, inf(), quiet() != quiet()); return 0; }\n";
    float want = 1.2345678f;
    double sum = 0.1 + 0.2;
    unsigned wantBits;
    unsigned long long sumBits;
    std::memcpy(&wantBits, &want, 4);
    std::memcpy(&sumBits, &sum, 8);
    char expected[80];
    std::snprintf(expected, sizeof expected, "%08x %016llx -inf 1", wantBits, sumBits);
    EXPECT_EQ(run(dir, sound.text, harness), expected);
    EXPECT_EQ(interpreted(floatingConstants, "f"), "1.23456776");

    Emitted msvc = emit(floatingConstants, Profile::SOUND, false);
    EXPECT_NE(msvc.text.find("(-(1e+300 * 1e+300))"), std::string::npos);
    EXPECT_EQ(msvc.text.find("__builtin"), std::string::npos);
}

void printfTwice(ZOA_file& u) {
    NAME* fmt = u.getName(STRINGLIT_REF, "%d-%d\\n");
    NAME* line = u.getName(STRINGLIT_REF, "go\\n");
    SUBPROG* f = u.createSubprog(INT_S, "f", false);
    CALL* one = new CALL(INT_S, "printf", std::vector<ExprBase*>{line});
    CALL* three = new CALL(INT_S, "printf", std::vector<ExprBase*>{fmt, new CONST(4), new CONST(2)});
    u.addFunctionPrototype(three);
    u.addFunctionPrototype(one);
    start(f)->addStmt(new EXP(one));
    start(f)->addStmt(new EXP(three));
    start(f)->addStmt(new MOVE(ret(f), new CONST(0)));
}

TEST(SoundC, CallsWithDifferentArgumentCountsCompile) {
    std::string dir = scratchDir();
    EXPECT_FALSE(compilesStrictly(dir, "typedef long long int64;\n" + emit(printfTwice, Profile::EXACT).text));
    Emitted sound = emit(printfTwice, Profile::SOUND);
    EXPECT_NE(sound.text.find("int printf(const char *, ...);"), std::string::npos);
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    EXPECT_EQ(run(dir, sound.text, "int f(void);\nint main(void) { return f(); }\n"), "go\n4-2\n");
}

void functionTable(ZOA_file& u) {
    NAME* table = u.getName(std::list<ExprBase*>{u.getName(SUBPROG_REF, "g")});
    SUBPROG* g = u.createSubprog(INT_S, "g", false);
    start(g)->addStmt(new MOVE(ret(g), new CONST(7)));
    SUBPROG* f = u.createSubprog(INT_S, "f", false);
    TEMP* p = f->getTemp(POINTER, 0, IN_USE_TEMP);
    start(f)->addStmt(new MOVE(p, new MEM(POINTER, table)));
    start(f)->addStmt(new MOVE(ret(f), new CALL(INT_S, p)));
}

TEST(SoundC, FunctionsAreDeclaredBeforeTablesOfTheirAddresses) {
    std::string dir = scratchDir();
    EXPECT_FALSE(compilesStrictly(dir, "typedef long long int64;\n" + emit(functionTable, Profile::EXACT).text));
    Emitted sound = emit(functionTable, Profile::SOUND);
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    EXPECT_LT(sound.text.find("int g();"), sound.text.find("static char *ng1[]"));
    EXPECT_EQ(run(dir, sound.text, "int f(void);\nint main(void) { printf(\"%d\", f()); return 0; }\n"), "7");
}

TEST(SoundC, Int64TypesAreDefinedOnceForConcatenatedFiles) {
    std::string dir = scratchDir();
    auto wide = [](ZOA_file& u) {
        SUBPROG* f = u.createSubprog(INT64_S, "f", false);
        start(f)->addStmt(new MOVE(ret(f), new CONST(INT64_S, 1ll << 40)));
    };
    EXPECT_FALSE(compilesStrictly(dir, emit(wide, Profile::EXACT).text));
    std::string sound = emit(wide, Profile::SOUND).text;
    auto other = [](ZOA_file& u) {
        SUBPROG* g = u.createSubprog(INT64_U, "g", false);
        start(g)->addStmt(new MOVE(ret(g), new CONST(INT64_U, 1ull << 63)));
    };
    EXPECT_TRUE(compilesStrictly(dir, sound + emit(other, Profile::SOUND).text));
}

void aligned(ZOA_file& u) {
    NAME* data = u.createZeroData(40);
    data->setAlignment(32);
    SUBPROG* f = u.createSubprog(INT_U, "f", false);
    auto* buf = static_cast<BUF_TEMP*>(f->getTemp(POINTER, 20, IN_USE_TEMP));
    buf->setAlignment(16);
    TEMP* a = f->getTemp(INT_U, 0, IN_USE_TEMP);
    start(f)->addStmt(new MOVE(a, new BINOP(INT_U, BITWISE_AND, new UNOP(INT_U, CONV17, buf), new CONST(INT_U, 15u))));
    start(f)->addStmt(new MOVE(ret(f), new BINOP(INT_U, BITWISE_OR, a,
        new BINOP(INT_U, BITWISE_AND, new UNOP(INT_U, CONV17, data), new CONST(INT_U, 31u)))));
}

TEST(SoundC, AlignmentRequestsInBothFlavours) {
    std::string dir = scratchDir();
    Emitted gcc = emit(aligned, Profile::SOUND);
    EXPECT_NE(gcc.text.find("static __attribute__((aligned(32))) char ng0[40];"), std::string::npos);
    EXPECT_NE(gcc.text.find("__attribute__((aligned(16))) char t"), std::string::npos);
    ASSERT_TRUE(compilesStrictly(dir, gcc.text)) << gcc.text;
    EXPECT_EQ(run(dir, gcc.text, "unsigned f(void);\nint main(void) { printf(\"%u\", f()); return 0; }\n"), "0");
    Emitted msvc = emit(aligned, Profile::SOUND, false);
    EXPECT_NE(msvc.text.find("static __declspec(align(32)) char ng0[40];"), std::string::npos);

    ZOA_file u(true, false);
    NAME* n = u.createZeroData(0);
    n->setAlignment(12);
    EXPECT_EQ(n->getAlignment(), 16u);
    n->setAlignment(1u << 20);
    EXPECT_EQ(n->getAlignment(), 4096u);
    n->setAlignment(0);
    EXPECT_EQ(n->getAlignment(), 0u);
}

void logicalOperators(ZOA_file& u) {
    SUBPROG* f = u.createSubprog(INT_S, "f", false);
    TEMP* a = f->getArgTemp(INT64_S);
    TEMP* b = f->getArgTemp(INT_S);
    auto product = [&] { return new UNOP(INT_S, CONV20, new BINOP(INT64_S, MUL, a, b)); };
    ExprBase* orOf = new BINOP(INT_S, OR, product(), a);
    ExprBase* andOf = new BINOP(INT_S, AND, new BINOP(INT_S, LSHIFT, b, new CONST(3)), new CONST(DOUBLE, 0.5));
    ExprBase* notOf = new UNOP(INT_S, NOT, product());
    start(f)->addStmt(new MOVE(ret(f), new BINOP(INT_S, PLUS, orOf,
        new BINOP(INT_S, PLUS, new BINOP(INT_S, MUL, andOf, new CONST(2)), new BINOP(INT_S, MUL, notOf, new CONST(4))))));
}

// gcc reports a product or shift under && || ! after folding, with no
// location, so no pragma reaches it: the text must compare with 0 itself.
TEST(SoundC, LogicalOperatorsLeaveNoNumberInBooleanContext) {
    std::string dir = scratchDir();
    Emitted sound = emit(logicalOperators, Profile::SOUND);
    EXPECT_NE(sound.text.find(" != 0) || ("), std::string::npos) << sound.text;
    EXPECT_NE(sound.text.find(" == 0))"), std::string::npos) << sound.text;
    std::string unit = writeFile(dir, "unit.c", sound.text);
    for (const char* level : {"-O0", "-O2"}) {
        auto built = runCommand(std::string("gcc -m32 -c ") + level + " " + STRICT + " -o '" + unit + ".o' '" + unit + "'");
        EXPECT_EQ(built.status, 0) << level << "\n" << built.output;
    }
    EXPECT_EQ(run(dir, sound.text,
                  "int f(long long, int);\nint main(void) { printf(\"%d %d %d %d\", f(0, 5), f(3, 0), f(1LL << 32, 2), f(3, 1)); return 0; }\n"),
              "6 5 7 3");
    ZOA_file u(true, false, Profile::SOUND);
    logicalOperators(u);
    std::string got;
    for (auto [x, y] : {std::pair<long long, int>{0, 5}, {3, 0}, {1LL << 32, 2}, {3, 1}}) {
        interp::Result r = interp::run(u, "f", {interp::Value::integer(INT64_S, x), interp::Value::integer(INT_S, y)});
        got += (got.empty() ? "" : " ") + (r.ok() ? interp::format(r.value) : r.message);
    }
    EXPECT_EQ(got, "6 5 7 3");
    Emitted msvc = emit(logicalOperators, Profile::SOUND, false);
    EXPECT_NE(msvc.text.find(" != 0) || ("), std::string::npos) << msvc.text;
    EXPECT_EQ(emit(logicalOperators, Profile::EXACT).text.find("!= 0"), std::string::npos);
}

// ---- declarations of external functions ----

TEST(SoundC, LibraryFunctionsAreDeclaredAsTheirHeadersDo) {
    std::string dir = scratchDir();
    auto calls = [](ZOA_file& u) {
        SUBPROG* f = u.createSubprog(INT_S, "f", false);
        TEMP* p = f->getArgTemp(POINTER);
        TEMP* i = f->getTemp(INT_S, 0, IN_USE_TEMP);
        TEMP* d = f->getTemp(DOUBLE, 0, IN_USE_TEMP);
        NAME* s = u.getName(STRINGLIT_REF, "x=%d\\n");
        auto call = [&](DataType t, const char* name, std::vector<ExprBase*> args) {
            start(f)->addStmt(new EXP(new CALL(t, name, args)));
        };
        start(f)->addStmt(new MOVE(i, new CONST(3)));
        call(INT_S, "printf", {s, i});
        call(INT_S, "puts", {s});
        call(INT_S, "putchar", {new CONST(65)});
        call(POINTER, "malloc", {new CONST(INT_U, 8u)});
        call(POINTER, "calloc", {new CONST(2), new CONST(4)});
        start(f)->addStmt(new MOVE(i, new CALL(INT_S, "strlen", std::vector<ExprBase*>{p})));
        call(POINTER, "strcpy", {p, s});
        call(INT_S, "strcmp", {p, s});
        call(POINTER, "memcpy", {p, s, new CONST(3)});
        call(POINTER, "memset", {p, new CONST(0), new CONST(3)});
        call(INT_S, "abs", {i});
        start(f)->addStmt(new MOVE(d, new CALL(DOUBLE, "sqrt", std::vector<ExprBase*>{new CONST(FLOAT, 2.0)})));
        call(VOID, "free", {p});
        call(VOID, "exit", {new CONST(0)});
        call(VOID, "abort", {});
        call(INT_S, "exit", {new CONST(1)});  // a value exit has not: 0
        start(f)->addStmt(new MOVE(ret(f), i));
    };
    Emitted sound = emit(calls, Profile::SOUND);
    EXPECT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    EXPECT_NE(sound.text.find("void *malloc(unsigned int );"), std::string::npos);
    EXPECT_NE(sound.text.find("((int)strlen(t1))"), std::string::npos);
    EXPECT_NE(sound.text.find("(exit(1), (int)0)"), std::string::npos);
    EXPECT_NE(sound.text.find("(void)!((char *)malloc(8U));"), std::string::npos);
    EXPECT_FALSE(compilesStrictly(dir, "typedef long long int64;\n" + emit(calls, Profile::EXACT).text));
}

TEST(SoundC, DisagreeingCallsGetAVariadicDeclaration) {
    std::string dir = scratchDir();
    auto calls = [](ZOA_file& u) {
        SUBPROG* f = u.createSubprog(DOUBLE, "f", false);
        TEMP* a = f->getTemp(DOUBLE, 0, IN_USE_TEMP);
        TEMP* b = f->getTemp(DOUBLE, 0, IN_USE_TEMP);
        start(f)->addStmt(new MOVE(a, new CALL(DOUBLE, "total", std::vector<ExprBase*>{new CONST(1), new CONST(DOUBLE, 1.5)})));
        start(f)->addStmt(new MOVE(b, new CALL(DOUBLE, "total",
            std::vector<ExprBase*>{new CONST(2), new CONST(FLOAT, 2.5), new CONST(DOUBLE, 3.0)})));
        start(f)->addStmt(new MOVE(ret(f), new BINOP(DOUBLE, PLUS, a, b)));
        start(f)->addStmt(new EXP(new CALL(VOID, "noargs", std::vector<ExprBase*>{})));
        start(f)->addStmt(new EXP(new CALL(VOID, "noargs", std::vector<ExprBase*>{new CONST(1)})));
    };
    Emitted sound = emit(calls, Profile::SOUND);
    EXPECT_NE(sound.text.find("double total(int , ...);"), std::string::npos) << sound.text;
    EXPECT_NE(sound.text.find("void noargs();"), std::string::npos) << sound.text;
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    const char* harness =
        "double total(int n, ...) { va_list ap; double s = 0; va_start(ap, n);\n"
        "  while (n--) s += va_arg(ap, double); va_end(ap); return s; }\n"
        "void noargs() {}\ndouble f(void);\nint main(void) { printf(\"%g\", f()); return 0; }\n";
    EXPECT_EQ(run(dir, sound.text, harness), "7");

    // A variadic argument has its node's type: a char sum wraps before it is
    // promoted, though its C text alone would have type unsigned int.
    auto charSum = [](ZOA_file& u) {
        SUBPROG* g = u.createSubprog(INT_S, "g", false);
        auto wrapped = new BINOP(CHAR_S, PLUS, new CONST(INT_U, 250u), new CONST(INT_U, 10u));
        start(g)->addStmt(new MOVE(ret(g), new CALL(INT_S, "zoa_vsum", std::vector<ExprBase*>{new CONST(1), wrapped})));
        start(g)->addStmt(new EXP(new CALL(INT_S, "zoa_vsum", std::vector<ExprBase*>{new CONST(0)})));
    };
    Emitted chars = emit(charSum, Profile::SOUND);
    ASSERT_TRUE(compilesStrictly(dir, chars.text)) << chars.text;
    const char* vsum =
        "int zoa_vsum(int n, ...) { va_list ap; int s = 0; va_start(ap, n);\n"
        "  while (n--) s += va_arg(ap, int); va_end(ap); return s; }\n"
        "int g(void);\nint main(void) { printf(\"%d\", g()); return 0; }\n";
    EXPECT_EQ(run(dir, chars.text, vsum), "4");
    EXPECT_EQ(interpreted(charSum, "g"), "4");
}

void builtinNames(ZOA_file& u) {
    auto define = [&](const char* name, DataType arg, auto body) {
        SUBPROG* s = u.createSubprog(INT_S, name, false);
        TEMP* a = s->getArgTemp(arg);
        TEMP* b = std::string(name) == "putchar" ? s->getArgTemp(INT_S) : nullptr;
        start(s)->addStmt(new MOVE(ret(s), body(a, b)));
    };
    define("abs", INT_S, [](TEMP* a, TEMP*) { return new BINOP(INT_S, PLUS, a, new CONST(100)); });
    define("index", CHAR_S, [](TEMP* a, TEMP*) { return new BINOP(INT_S, MUL, a, new CONST(2)); });
    define("nan", INT_S, [](TEMP* a, TEMP*) { return new BINOP(INT_S, MUL, a, a); });
    define("putchar", INT_S, [](TEMP* a, TEMP* b) { return new BINOP(INT_S, MINUS, a, b); });
    NAME* table = u.createData(std::list<ExprBase*>{u.getName(SUBPROG_REF, "abs")});
    SUBPROG* f = u.createSubprog(INT_S, "f", false);
    TEMP* p = f->getTemp(POINTER, 0, IN_USE_TEMP);
    auto call = [](const char* name, std::vector<ExprBase*> args) { return new CALL(INT_S, name, args); };
    ExprBase* sum = new BINOP(INT_S, PLUS, call("abs", {new CONST(-5)}), call("index", {new CONST(CHAR_S, 3)}));
    sum = new BINOP(INT_S, PLUS, sum, call("nan", {new CONST(4)}));
    sum = new BINOP(INT_S, PLUS, sum, call("putchar", {new CONST(10), new CONST(4)}));
    start(f)->addStmt(new MOVE(p, new MEM(POINTER, table)));
    start(f)->addStmt(new MOVE(ret(f), new BINOP(INT_S, PLUS, sum, new CALL(INT_S, p, std::vector<ExprBase*>{new CONST(1)}))));
    // External functions named like built-ins, called with signatures of their own.
    SUBPROG* g = u.createSubprog(INT_S, "g", false);
    start(g)->addStmt(new EXP(new CALL(VOID, "bzero", std::vector<ExprBase*>{})));
    start(g)->addStmt(new MOVE(ret(g), new BINOP(INT_S, PLUS, call("rindex", {new CONST(1)}), call("strlen", {u.getName(STRINGLIT_REF, "abc")}))));
}

// Functions named like GCC built-ins: declared without a clash, and called as
// written at every level (gcc would fold a built-in abs(-5) to 5).
TEST(SoundC, FunctionsNamedLikeBuiltinsKeepTheirOwnMeaning) {
    std::string dir = scratchDir();
    EXPECT_FALSE(compilesStrictly(dir, "typedef long long int64;\n" + emit(builtinNames, Profile::EXACT).text));
    Emitted sound = emit(builtinNames, Profile::SOUND);
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    EXPECT_NE(sound.text.find("int zoa_builtin_abs(int ) __asm__(\"abs\");"), std::string::npos) << sound.text;
    EXPECT_NE(sound.text.find("int zoa_builtin_rindex(int ) __asm__(\"rindex\");"), std::string::npos);
    EXPECT_NE(sound.text.find("unsigned int strlen(const char *);"), std::string::npos);  // the library's own
    // The harness defines the externals under their symbols, as a library would.
    std::string unit = writeFile(dir, "unit.c", sound.text);
    std::string main = writeFile(dir, "main.c",
                                 "#include <stdio.h>\nint f(void); int g(void);\n"
                                 "int lib_rindex(int x) __asm__(\"rindex\");\nint lib_rindex(int x) { return x + 40; }\n"
                                 "void lib_bzero(void) __asm__(\"bzero\");\nvoid lib_bzero(void) {}\n"
                                 "int main(void) { printf(\"%d %d\", f(), g()); return 0; }\n");
    for (const char* level : {"-O0", "-O2"})
        EXPECT_EQ(buildAndRun32(dir, {unit, main}, level).output, "224 44") << level;
    EXPECT_EQ(interpreted(builtinNames, "f"), "224");
    EXPECT_EQ(emit(builtinNames, Profile::SOUND, false).text.find("zoa_builtin_"), std::string::npos);
}

// ---- names the C text cannot carry ----

TEST(SoundC, UnwritableNamesAreRefusedAndReported) {
    struct Case {
        const char* what;
        Builder build;
    } cases[] = {
        {"is not a C identifier", [](ZOA_file& u) { u.createSubprog(VOID, "two words", false); }},
        {"is a C keyword", [](ZOA_file& u) { u.getName(EXTERN_DATA_REF, "int"); }},
        {"clashes with a name the C output makes", [](ZOA_file& u) { u.createSubprog(VOID, "t3", false); }},
        {"'zoa_builtin_abs' clashes with a name the C output makes",
         [](ZOA_file& u) { u.createSubprog(VOID, "zoa_builtin_abs", false); }},
        {"names both a function and data",
         [](ZOA_file& u) {
             u.getName(EXTERN_DATA_REF, "x");
             u.createSubprog(VOID, "x", false);
         }},
        {"'puts' with 2 arguments of type INT_S does not fit",
         [](ZOA_file& u) {
             SUBPROG* f = u.createSubprog(VOID, "f", false);
             start(f)->addStmt(new EXP(new CALL(INT_S, "puts", std::vector<ExprBase*>{new CONST(1), new CONST(2)})));
         }},
        {"'ext' with 0 arguments of type DOUBLE does not fit",
         [](ZOA_file& u) {
             SUBPROG* f = u.createSubprog(VOID, "f", false);
             start(f)->addStmt(new EXP(new CALL(INT_S, "ext", std::vector<ExprBase*>{})));
             start(f)->addStmt(new EXP(new CALL(DOUBLE, "ext", std::vector<ExprBase*>{})));
         }},
        {"is defined by two subprograms",
         [](ZOA_file& u) {
             u.createSubprog(VOID, "twice", false);
             u.createSubprog(VOID, "twice", false);
         }},
    };
    for (const Case& c : cases) {
        Emitted sound = emit(c.build, Profile::SOUND);
        EXPECT_FALSE(sound.ok) << c.what;
        EXPECT_EQ(sound.text, "") << c.what;
        EXPECT_NE(sound.diagnostics.find(c.what), std::string::npos) << sound.diagnostics;
        EXPECT_TRUE(emit(c.build, Profile::EXACT).ok);
    }

    ZOA_file u(true, false);
    u.createSubprog(VOID, "do", false);
    u.getName(STATIC_DATA_REF, "a-b");
    std::string found;
    for (const verify::Diagnostic& d : verify::verify(u)) found += verify::format(d) + "\n";
    EXPECT_NE(found.find("'do'"), std::string::npos) << found;
    EXPECT_NE(found.find("'a-b'"), std::string::npos) << found;
}

TEST(SoundC, StringLiteralsHoldTheBytesTheirTextMeans) {
    std::string dir = scratchDir();
    auto strings = [](ZOA_file& u) {
        NAME* s = u.getName(STRINGLIT_REF, "q\"\\101\\x42\tz\\");
        SUBPROG* f = u.createSubprog(INT_S, "f", false);
        start(f)->addStmt(new EXP(new CALL(INT_S, "puts", std::vector<ExprBase*>{s})));
        start(f)->addStmt(new MOVE(ret(f), new CONST(0)));
    };
    Emitted sound = emit(strings, Profile::SOUND);
    EXPECT_NE(sound.text.find("\"q\\\"AB\\011z\\\\\""), std::string::npos) << sound.text;
    ASSERT_TRUE(compilesStrictly(dir, sound.text)) << sound.text;
    EXPECT_EQ(run(dir, sound.text, "int f(void);\nint main(void) { return f(); }\n"), "q\"AB\tz\\\n");
}

}  // namespace
