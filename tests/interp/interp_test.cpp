// Interpreter: the C meaning of operators and types, memory, control, errors.
#include <zoa/interp.h>
#include <zoa/text.h>

#include <gtest/gtest.h>

#include <sstream>
#include <string>

namespace {

using namespace ZOA;
using interp::Value;

// Runs FUNC of a unit text on integer arguments; "error: <status>" when it stops.
std::string run(const std::string& unitText, const std::string& func, std::vector<long long> args = {},
                bool strict = false) {
    text::Result r = text::parse(unitText, "t.zoa");
    if (!r.ok()) return "parse: " + text::format(r.diagnostics().front());
    std::vector<Value> values;
    for (long long a : args) values.push_back(Value::integer(INT64_S, a));
    interp::Options o;
    o.strictC = strict;
    o.maxSteps = 100000;
    o.maxDepth = 300;
    interp::Result res = interp::run(*r.unit(), func, values, o);
    if (!res.ok()) return std::string("error: ") + interp::toString(res.status);
    return interp::format(res.value);
}

// A unit with one subprogram f returning TYPE, args as given, body moving EXPR to t0.
std::string expr(const std::string& type, const std::string& args, const std::string& e) {
    return "(unit gcc (subprog s0 \"f\" " + type + " " + args + " (block L0 (MOVE t0 " + e + ") (JUMP L1))))";
}

TEST(Interp, ArithmeticFollowsTheCText) {
    // Two chars add in int: the CHAR_S node type does not truncate the sum.
    EXPECT_EQ(run(expr("INT_S", "(arg t1 CHAR_S) (arg t2 CHAR_S)", "(BINOP CHAR_S PLUS t1 t2)"), "f", {100, 100}), "200");
    // ... but the move into a char does.
    EXPECT_EQ(run(expr("CHAR_S", "(arg t1 CHAR_S) (arg t2 CHAR_S)", "(BINOP CHAR_S PLUS t1 t2)"), "f", {100, 100}), "-56");
    // Unsigned wrap-around, signed/unsigned comparison by the usual conversions.
    EXPECT_EQ(run(expr("INT_U", "(arg t1 INT_U)", "(BINOP INT_U MINUS t1 (CONST INT_U 1))"), "f", {0}), "4294967295");
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(BINOP INT_S LT t1 (CONST INT_U 1))"), "f", {-1}), "0");
    // -2147483648 is written as the negation of a long long literal.
    EXPECT_EQ(run(expr("INT64_S", "", "(BINOP INT_S MINUS (CONST INT_S -2147483648) (CONST INT_S 1))"), "f"), "-2147483649");
    // Shifts take the promoted left type; arithmetic right shift of negatives.
    EXPECT_EQ(run(expr("INT_S", "(arg t1 CHAR_S)", "(BINOP INT_S RSHIFT t1 (CONST INT_S 1))"), "f", {-6}), "-3");
    EXPECT_EQ(run(expr("INT64_U", "", "(BINOP INT64_U LSHIFT (CONST INT64_U 1) (CONST INT_S 40))"), "f"), "1099511627776");
    // Logical operators short-circuit: the division by zero is never made.
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(BINOP INT_S AND t1 (BINOP INT_S DIV (CONST 1) t1))"), "f", {0}), "0");
    // Casts by their C text; conversions written bare convert to the UNOP's type.
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(UNOP CHAR_U CONV6 t1)"), "f", {511}), "255");
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(UNOP CHAR_S CONV5 t1)"), "f", {200}), "-56");
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(UNOP INT_S ABS t1)"), "f", {-7}), "7");
    EXPECT_EQ(run(expr("DOUBLE", "", "(BINOP DOUBLE MUL (CONST FLOAT 0.1) (CONST DOUBLE 10.0))"), "f"), "1");
    // Errors, never a crash.
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(BINOP INT_S DIV (CONST 1) t1)"), "f", {0}), "error: division by zero");
    // A long long operation in C: defined, unlike INT_MIN % -1 in int.
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(BINOP INT_S MOD (CONST INT_S -2147483648) t1)"), "f", {-1}), "0");
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S) (arg t2 INT_S)", "(BINOP INT_S DIV t1 t2)"), "f", {-2147483648LL, -1}),
              "error: division by zero");
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(BINOP INT_S PLUS t1 (CONST 1))"), "f", {2147483647}, true),
              "error: undefined in C");
    EXPECT_EQ(run(expr("INT_S", "(arg t1 INT_S)", "(BINOP INT_S PLUS t1 (CONST 1))"), "f", {2147483647}), "-2147483648");
    EXPECT_EQ(run(expr("INT_S", "", "(BINOP INT_S PLUS nil (CONST 1))"), "f"), "error: no meaning");
    EXPECT_EQ(run(expr("INT_S", "(temp t1 INT_S)", "t1"), "f"), "error: no meaning");
}

TEST(Interp, MemoryHoldsBuffersTablesAndLiterals) {
    const char* unit = R"((unit gcc
      (name g0 STRINGLIT_REF "a\\tb\"c")
      (name g1 (values (CONST INT_S 10) (CONST INT_S 20) (CONST INT_S 30) (CONST INT_S 40)))
      (prototype INT_U "strlen" POINTER)
      (subprog s0 "len" INT_U (block L0 (MOVE t0 (CALL INT_U "strlen" g0)) (JUMP L1)))
      (subprog s1 "byName" INT_S (arg t1 INT_S)
        (block L0 (MOVE t0 (MEM INT_S (BINOP POINTER PLUS g1 t1))) (JUMP L1)))
      (subprog s2 "byTemp" INT_S (arg t1 INT_S) (temp t2 POINTER)
        (block L0 (MOVE t2 g1) (MOVE t0 (MEM INT_S (BINOP POINTER PLUS t2 t1))) (JUMP L1)))
      (subprog s3 "bump" INT_S (block L0
        (MOVE (MEM INT_S g1) (BINOP INT_S PLUS (MEM INT_S g1) (CONST 1))) (MOVE t0 (MEM INT_S g1)) (JUMP L1)))
      (subprog s4 "buf" INT_S (arg t1 INT_S) (buffer t2 8)
        (block L0 (MOVE (MEM INT_S t2) (CONST 7)) (MOVE t0 (MEM INT_S (BINOP POINTER PLUS t2 t1))) (JUMP L1)))
      (subprog s5 "poke" INT_S (block L0 (MOVE (MEM CHAR_S g0) (CONST CHAR_S 0)) (JUMP L1)))
    ))";
    // "\t" is read by C as a tab; the quote gets its backslash from the writer.
    EXPECT_EQ(run(unit, "len"), "5");
    // The array name is an int pointer in C: the index is scaled; through a
    // char * temporary it is a byte offset.
    EXPECT_EQ(run(unit, "byName", {2}), "30");
    EXPECT_EQ(run(unit, "byTemp", {4}), "20");
    EXPECT_EQ(run(unit, "byName", {4}), "error: bad address");
    EXPECT_EQ(run(unit, "buf", {0}), "7");
    EXPECT_EQ(run(unit, "buf", {6}), "error: bad address");
    EXPECT_EQ(run(unit, "buf", {4}, true), "error: undefined in C");  // never written
    EXPECT_EQ(run(unit, "poke"), "error: bad address");               // a literal is read-only

    // Static data keeps its contents from one call to the next.
    text::Result r = text::parse(unit, "t.zoa");
    ASSERT_TRUE(r.ok());
    interp::Machine m(*r.unit());
    EXPECT_EQ(interp::format(m.call("bump", {}).value), "11");
    EXPECT_EQ(interp::format(m.call("bump", {}).value), "12");
}

TEST(Interp, ControlFlowCallsAndLimits) {
    const char* unit = R"((unit gcc
      (subprog s0 "fact" INT_S prototype (arg t1 INT_S) (label L2) (label L3)
        (block L0 (CJUMP LE t1 (CONST 1) L2 L3))
        (block L3 (MOVE t0 (BINOP INT_S MUL t1 (CALL INT_S "fact" (BINOP INT_S MINUS t1 (CONST 1))))) (JUMP L1))
        (block L2 (MOVE t0 (CONST 1)) (JUMP L1)))
      (subprog s1 "ft" INT_S (arg t1 INT_S) (label L2)
        (block L0 (CJUMP LE t1 (CONST 1) L2 L1) (MOVE t0 (CONST 99)))
        (block L2 (MOVE t0 (CONST 1)) (JUMP L1)))
      (subprog s2 "pick" INT_S (arg t1 INT_S) (label L2) (label L3)
        (name n0 (values (NAME L2) (NAME L3)))
        (block L0 (JUMP (MEM POINTER (BINOP POINTER PLUS n0 t1))))
        (block L2 (MOVE t0 (CONST 10)) (JUMP L1))
        (block L3 (MOVE t0 (CONST 20)) (JUMP L1)))
      (subprog s3 "viaPointer" INT_S (temp t1 POINTER)
        (block L0 (MOVE t1 g0) (MOVE t0 (CALL INT_S t1 (CONST 3))) (JUMP L1)))
      (name g0 SUBPROG_REF "fact")
      (subprog s4 "spin" INT_S (block L0 (JUMP L0)))
      (subprog s5 "deep" INT_S (block L0 (MOVE t0 (CALL INT_S "deep")) (JUMP L1)))
      (subprog s6 "ext" INT_S (block L0 (MOVE t0 (CALL INT_S "nowhere")) (JUMP L1)))
    ))";
    EXPECT_EQ(run(unit, "fact", {5}), "120");
    EXPECT_EQ(run(unit, "viaPointer"), "6");
    // The false branch to L1 is written as a fall-through, so in C the move
    // after the conditional jump runs before the return.
    EXPECT_EQ(run(unit, "ft", {5}), "99");
    EXPECT_EQ(run(unit, "ft", {0}), "1");
    EXPECT_EQ(run(unit, "pick", {1}), "20");
    EXPECT_EQ(run(unit, "pick", {2}), "error: bad address");
    EXPECT_EQ(run(unit, "spin"), "error: step limit reached");
    EXPECT_EQ(run(unit, "deep"), "error: depth limit reached");
    EXPECT_EQ(run(unit, "ext"), "error: unknown function");
    EXPECT_EQ(run(unit, "nothere"), "error: unknown function");
}

// The variadic host function: each further argument read back as the int C's
// promotions make of it, summed with wrap-around; a count that lies stops.
TEST(Interp, VariadicHostFunctionSumsPromotedArguments) {
    auto vsum = [](const std::string& args) {
        return run(expr("INT_S", "(arg t1 CHAR_S) (arg t2 CHAR_U)", "(CALL INT_S \"zoa_vsum\" " + args + ")"), "f", {-3, 200});
    };
    EXPECT_EQ(vsum("(CONST 0)"), "0");
    EXPECT_EQ(vsum("(CONST 2) t1 t2"), "197");
    EXPECT_EQ(vsum("(CONST 2) (CONST 2147483647) (CONST 1)"), "-2147483648");
    EXPECT_EQ(vsum("(CONST 2) (CALL INT_S \"zoa_vsum\" (CONST 1) t2) t2"), "400");
    EXPECT_EQ(vsum("(CONST 2) t1"), "error: no meaning");
    EXPECT_EQ(vsum(""), "error: no meaning");
    EXPECT_EQ(vsum("(CONST 1) (CONST INT64_S 5)"), "error: no meaning");
    EXPECT_EQ(vsum("(CONST 1) (CONST DOUBLE 5.0)"), "error: no meaning");
}

// Trace building keeps its own stack: a long chain of jumps that each pull the
// next label, and deeply nested sequences, neither exhaust the host's stack.
TEST(Interp, LongJumpChainsAndDeepSequencesStopCleanly) {
    ZOA_file unit(true, false);
    SUBPROG* chain = unit.createSubprog(INT_S, "chain", false);
    TEMP* n = chain->getReturnTemp();
    chain->getStartLabel()->addStmt(new MOVE(n, new CONST(0)));
    LABEL* prev = chain->getStartLabel();
    const int length = 100000;
    for (int i = 0; i < length; ++i) {
        LABEL* next = chain->createNewLabel(REGULAR_LABEL);
        prev->addStmt(new JUMP(next));
        next->addStmt(new MOVE(n, new BINOP(INT_S, PLUS, n, new CONST(1))));
        prev = next;
    }
    prev->addStmt(new JUMP(chain->getReturnLabel()));

    SUBPROG* nested = unit.createSubprog(INT_S, "nested", false);
    StmtBase* s = new MOVE(nested->getReturnTemp(), new CONST(7));
    for (int i = 0; i < 100000; ++i) s = new SEQ(s, nullptr);
    nested->getStartLabel()->addStmt(s);

    interp::Options o;
    o.maxSteps = 10 * length;
    interp::Result r = interp::run(unit, "chain", {}, o);
    ASSERT_TRUE(r.ok()) << r.message;
    EXPECT_EQ(interp::format(r.value), std::to_string(length));
    EXPECT_EQ(interp::run(unit, "nested", {}, o).status, interp::Status::DEPTH_LIMIT);
}

}  // namespace

namespace {

TEST(Interp, LongLongLiteralsReadAsGccReadsThem) {
    // Regressions from the differential campaign (seeds 1198 and 1837): an
    // INT64_U constant above the long long range is written with LL alone and
    // is a negative long long for gcc; so is the most negative INT64_S.
    EXPECT_EQ(run(expr("INT_S", "", "(BINOP INT_S GE (CONST INT64_U 9556173957450139454) (CONST INT64_U 127))"), "f"), "0");
    EXPECT_EQ(run(expr("INT_S", "", "(BINOP INT_S LE (CONST INT64_S -9223372036854775808) (CONST INT64_S 0))"), "f"), "1");
    // Seed 100520: gcc -O2 printed -nan where -O0 printed nan. A NaN, or a
    // double too large for a float, has no value to compare in strict mode.
    const std::string big = "(BINOP DOUBLE MUL (CONST DOUBLE 1e300) (CONST DOUBLE 1e300))";
    EXPECT_EQ(run(expr("FLOAT", "", "(CONST DOUBLE 1e300)"), "f", {}, true), "error: undefined in C");
    EXPECT_EQ(run(expr("DOUBLE", "", "(BINOP DOUBLE MINUS " + big + " " + big + ")"), "f", {}, true),
              "error: undefined in C");
    EXPECT_EQ(run(expr("FLOAT", "", "(CONST DOUBLE 1e300)"), "f"), "inf");
    // Seed 102717: a FLOAT constant with an integral value is written as an
    // int literal, so -(0) is the int 0 and 7 / 2 divides as ints.
    EXPECT_EQ(run(expr("FLOAT", "", "(UNOP FLOAT NEG (CONST FLOAT 0.0))"), "f"), "0");
    EXPECT_EQ(run(expr("FLOAT", "", "(BINOP FLOAT DIV (CONST FLOAT 7.0) (CONST FLOAT 2.0))"), "f"), "3");
    EXPECT_EQ(run(expr("FLOAT", "", "(BINOP FLOAT DIV (CONST FLOAT 7.5) (CONST FLOAT 2.0))"), "f"), "3.75");
}

}  // namespace

#include <fstream>
#include <iterator>

#include "native.h"

namespace {

std::string readExample(const std::string& name) {
    std::ifstream in(std::string(ZOA_EXAMPLES_DIR) + "/" + name, std::ios::binary);
    return std::string((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

TEST(Interp, ExamplesAgreeWithTheCompiledC) {
    struct Case {
        const char* file;
        const char* func;
        const char* cArgs;  // the call's arguments in C
        std::vector<long long> args;
    };
    const Case cases[] = {{"count.zoa", "count", "5", {5}},          {"factorial.zoa", "fact", "6", {6}},
                          {"funcptr.zoa", "apply", "21", {21}},      {"buffer.zoa", "pair", "3, 4", {3, 4}},
                          {"int64.zoa", "mix", "-3LL, 17ULL", {-3, 17}}, {"widen.zoa", "add_byte", "200, -5", {200, -5}},
                          {"jumptable.zoa", "pick", "1", {1}}};
    std::string driver = "#include <stdio.h>\ntypedef long long int64;\ntypedef unsigned long long uint64;\n";
    std::string body, expected;
    for (const Case& c : cases) {
        std::string source = readExample(c.file);
        std::string value = run(source, c.func, c.args);
        text::Result r = text::parse(source, c.file);
        ASSERT_TRUE(r.ok()) << c.file;
        SUBPROG* sp = r.unit()->getSubprogs().back();
        std::string ret = sp->getReturnType() == INT64_S ? "int64" : "int";
        std::string fmt = sp->getReturnType() == INT64_S ? "%lld" : "%d";
        driver += ret + " " + c.func + "();\n";
        body += "    printf(\"" + fmt + "\\n\", " + c.func + "(" + c.cArgs + "));\n";
        expected += value + "\n";
    }
    // Each example is its own translation unit (their file-level names may
    // clash); "static" is dropped so that the driver reaches static subprograms.
    std::string dir = ZOA::testing::scratchDir();
    std::vector<std::string> files;
    std::size_t k = 0;
    for (const Case& c : cases) {
        std::string source = readExample(c.file);
        text::Result r = text::parse(source, c.file);
        std::ostringstream os;
        r.unit()->decompile(os);
        files.push_back(ZOA::testing::writeFile(dir, "u" + std::to_string(k++) + ".c",
                                                "typedef long long int64;\ntypedef unsigned long long uint64;\n" + os.str()));
    }
    files.push_back(ZOA::testing::writeFile(dir, "main.c", driver + "int main(void)\n{\n" + body + "    return 0;\n}\n"));
    ZOA::testing::CommandResult res = ZOA::testing::buildAndRun32(dir, files, "-w -Dstatic=");
    EXPECT_EQ(res.output, expected);
    // The table examples copy the table's address into a char pointer first, so
    // their byte offsets stay byte offsets in C (an array name would scale them).
    EXPECT_EQ(run(readExample("strings.zoa"), "sum"), "26");
}

}  // namespace
