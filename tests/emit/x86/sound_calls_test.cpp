// Calls in the sound assembly pass and return what the sound C's declarations mean: variadic and C library callees.
#include "sound_util.h"

#include <functional>

using namespace ZOA;
using namespace ZOA::testing;

namespace {

// Builds the unit twice, writes it as sound C and as sound assembly, and runs
// each with the same driver; both programs' output.
std::pair<std::string, std::string> runBoth(const std::function<void(ZOA_file&)>& build, const std::string& driver) {
    ZOA_file c(true, false, Profile::SOUND);
    build(c);
    std::string protos = prototypes(c);
    std::string cText = soundC(c);
    ZOA_file a(true, true, Profile::SOUND);
    build(a);
    std::string asmText = soundAsm(a);
    std::string main = "#include <stdio.h>\n#include <stdarg.h>\n" + protos + driver;
    // libm last, whatever the linker drops as unneeded.
    const char* libm = "-Wl,--no-as-needed -lm";
    return {runWithC({}, {cText, main}, libm), runWithC({asmText}, {main}, libm)};
}

// show's calls disagree on their arguments after the format: it is declared
// variadic, so FLOAT goes as double and chars as int, as vprintf reads them.
// printf is variadic by its header; its FLOAT argument is promoted too.
TEST(SoundAsmCalls, VariadicCalleesGetPromotedArguments) {
    auto build = [](ZOA_file& u) {
        SUBPROG* sp = u.createSubprog(INT_S, "f", false);
        TEMP* x = sp->getArgTemp(FLOAT);
        TEMP* c = sp->getArgTemp(CHAR_S);
        TEMP* d = sp->getArgTemp(DOUBLE);
        TEMP* b = sp->getArgTemp(CHAR_U);
        TEMP* q = sp->getArgTemp(INT64_S);
        TEMP* n = sp->getTemp(INT_S, 0, IN_USE_TEMP);
        LABEL* l = sp->getStartLabel();
        l->addStmt(new MOVE(n, new CALL(INT_S, "show", {u.getName(STRINGLIT_REF, "%.9g %d\\n"), x, c})));
        l->addStmt(new EXP(new CALL(INT_S, "show", {u.getName(STRINGLIT_REF, "%.17g %u %lld %.9g\\n"), d, b, q, x})));
        l->addStmt(new EXP(new CALL(VOID, "printf", {u.getName(STRINGLIT_REF, "%.9g|%c|%d\\n"), x, c, b})));
        // Nodes whose C value is wider than their type: converted to the
        // node's type, then promoted (a char of an unsigned shift, a float of a double sum).
        l->addStmt(new EXP(new CALL(INT_S, "show", {u.getName(STRINGLIT_REF, "%d %.17g\\n"),
                                                    new BINOP(CHAR_S, LSHIFT, new CONST(3107615678u), new CONST(0)),
                                                    new BINOP(FLOAT, PLUS, d, new CONST(0.1))})));
        l->addStmt(new MOVE(sp->getReturnTemp(), new BINOP(INT_S, PLUS, n, new CALL(INT_S, "show", {u.getName(STRINGLIT_REF, "-\\n")}))));
    };
    std::string driver =
        "int show(const char *fmt, ...) { va_list ap; va_start(ap, fmt); int n = vprintf(fmt, ap); va_end(ap); return n; }\n"
        "int main(void) {\n"
        "    printf(\"%d\\n\", f(1.25f, 'A', -2.5, 200, -1234567890123LL));\n"
        "    printf(\"%d\\n\", f(-3.0e-5f, -7, 1e300, 0, 1LL << 40));\n"
        "    return 0;\n}\n";
    auto [fromC, fromAsm] = runBoth(build, driver);
    EXPECT_EQ(fromAsm, fromC);
    EXPECT_NE(fromC.find("1.25 65\n"), std::string::npos) << fromC;
    EXPECT_NE(fromC.find("-66 -2.4000000953674316\n"), std::string::npos) << fromC;
}

// C library functions take their header's parameter types and give their
// real result, which the call's own type converts: sqrt on a FLOAT gets a
// double and its double result becomes the call's int; strlen's unsigned
// result becomes a signed char; a discarded double result leaves the x87
// stack as it found it (nine of them would overflow it).
TEST(SoundAsmCalls, LibraryCalleesTakeAndGiveTheirHeaderTypes) {
    auto build = [](ZOA_file& u) {
        SUBPROG* sp = u.createSubprog(DOUBLE, "lib", false);
        TEMP* x = sp->getArgTemp(FLOAT);
        TEMP* s = sp->getArgTemp(POINTER);
        TEMP* c = sp->getArgTemp(CHAR_S);
        TEMP* i = sp->getTemp(INT_S, 0, IN_USE_TEMP);
        TEMP* k = sp->getTemp(CHAR_S, 0, IN_USE_TEMP);
        TEMP* a = sp->getTemp(INT64_S, 0, IN_USE_TEMP);
        LABEL* l = sp->getStartLabel();
        for (int n = 0; n < 9; ++n) l->addStmt(new EXP(new CALL(VOID, "sqrt", {x})));
        l->addStmt(new MOVE(i, new CALL(INT_S, "sqrt", {x})));
        l->addStmt(new MOVE(k, new CALL(CHAR_S, "strlen", {s})));
        l->addStmt(new MOVE(a, new CALL(INT64_S, "abs", {c})));
        BINOP* sum = new BINOP(DOUBLE, PLUS, new CALL(FLOAT, "sqrt", {x}), new UNOP(DOUBLE, CONV14, i));
        sum = new BINOP(DOUBLE, PLUS, sum, new UNOP(DOUBLE, CONV14, k));
        sum = new BINOP(DOUBLE, PLUS, sum, new UNOP(DOUBLE, CONV14, a));
        l->addStmt(new MOVE(sp->getReturnTemp(), sum));
    };
    std::string driver =
        "int main(void) {\n"
        "    char big[300]; for (int i = 0; i < 299; ++i) big[i] = 'x'; big[299] = 0;\n"
        "    printf(\"%.17g\\n\", lib(2.0f, \"hello\", -5));\n"
        "    printf(\"%.17g\\n\", lib(1e6f, big, -128));\n"
        "    return 0;\n}\n";
    auto [fromC, fromAsm] = runBoth(build, driver);
    EXPECT_EQ(fromAsm, fromC);
    EXPECT_NE(fromC, "");
}

// A subprogram of the unit called with another return type than it has: its
// value converted as the C casts it; a value asked of a void one is 0.
TEST(SoundAsmCalls, UnitCalleesResultsConvertToTheCallsType) {
    auto build = [](ZOA_file& u) {
        SUBPROG* half = u.createSubprog(DOUBLE, "half", false);
        TEMP* h = half->getArgTemp(INT_S);
        half->getStartLabel()->addStmt(
            new MOVE(half->getReturnTemp(), new BINOP(DOUBLE, DIV, new UNOP(DOUBLE, CONV14, h), new CONST(2.0))));
        SUBPROG* none = u.createSubprog(VOID, "none", false);
        none->getArgTemp(INT_S);
        SUBPROG* sp = u.createSubprog(INT64_S, "calls", false);
        TEMP* x = sp->getArgTemp(INT_S);
        BINOP* v = new BINOP(INT64_S, PLUS, new CALL(INT64_S, "half", {x}), new CALL(INT64_S, "half", {x}));
        v = new BINOP(INT64_S, PLUS, v, new CALL(INT64_S, "none", {x}));
        v = new BINOP(INT64_S, PLUS, v, new UNOP(INT64_S, CONV24, new CALL(DOUBLE, "none", {x})));
        sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), v));
    };
    std::string driver = "int main(void) { printf(\"%lld %lld\\n\", calls(9), calls(-7)); return 0; }\n";
    auto [fromC, fromAsm] = runBoth(build, driver);
    EXPECT_EQ(fromAsm, fromC);
    EXPECT_EQ(fromC, "8 -6\n");  // each half truncated before the sum
}

}  // namespace
