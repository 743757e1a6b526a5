// Malformed texts: each gives exactly one clear diagnostic, from the reader and from the zoa tool.
#include <zoa/text.h>

#include "native.h"

#include <gtest/gtest.h>

#include <regex>

using namespace ZOA;

namespace {

struct Bad {
    const char* what;
    std::string source;
    const char* message;  // expected part of the message
    unsigned int line;
    unsigned int column;
};

const char* const head = "(unit gcc (subprog s0 \"f\" INT_S (arg t1 INT_S) (label L2)\n";

std::string body(const std::string& stmts) { return head + std::string("(block L0 ") + stmts + ")))"; }

std::vector<Bad> badInputs() {
    std::string deep(100000, '(');
    std::vector<Bad> v = {
        {"unbalanced", "(unit gcc\n  (subprog s0 \"f\" VOID)", "'(' is never closed", 1, 1},
        {"stray close", "(unit gcc))", "unexpected ')'", 1, 11},
        {"unknown statement", body("(FOO t1)"), "unknown statement node 'FOO'", 2, 12},
        {"unknown expression", body("(MOVE t1 (BAR 1))"), "unknown expression node 'BAR'", 2, 21},
        {"wrong arity", body("(MOVE t1)"), "'(MOVE' takes 2 operands, not 1", 2, 11},
        {"unknown type", body("(MOVE t1 (CONST INT_Q 1))"), "unknown type 'INT_Q'", 2, 27},
        {"unknown operator", body("(MOVE t1 (BINOP INT_S PLUSS t1 t1))"), "unknown operator 'PLUSS'", 2, 33},
        {"missing label", body("(JUMP L9)"), "label 'L9' is not declared", 2, 17},
        {"id twice", std::string(head) + "(temp t1 INT_S)))", "temporary id 't1' is used twice", 2, 7},
        {"undeclared temp", body("(MOVE t7 t1)"), "temporary 't7' is not declared", 2, 17},
        {"empty file", "", "empty input", 1, 1},
        {"only a comment", "; nothing here\n", "empty input", 1, 1},
        {"binary garbage", std::string("\x7f\x45\x4c\x46\x02\x01", 6), "unexpected character '\\x7f'", 1, 1},
        {"NUL byte", std::string("(unit gcc\0)", 11), "unexpected character '\\x00'", 1, 10},
        {"huge number", body("(MOVE t1 (CONST INT_S 99999999999999999999999))"), "out of range", 2, 33},
        {"too negative", body("(MOVE t1 (CONST INT64_S -9223372036854775809))"), "out of range", 2, 35},
        {"huge real", body("(MOVE t1 (CONST DOUBLE 1e999))"), "out of range", 2, 34},
        {"deep nesting", deep, "nesting deeper than 4096 levels", 1, 4097},
        {"unterminated string", "(unit gcc (subprog s0 \"f VOID))", "unterminated string", 1, 23},
        {"unknown escape", "(unit gcc (name g0 STRINGLIT_REF \"a\\qb\"))", "unknown escape '\\q'", 1, 36},
        {"second form", "(unit gcc) (unit gcc)", "text after the unit", 1, 12},
        {"no unit", "(subprog s0 \"f\" VOID)", "expected (unit ...)", 1, 1},
        {"bad flavour", "(unit clang)", "gcc or msvc, not 'clang'", 1, 7},
        {"unknown unit item", "(unit gcc (function s0))", "unknown unit item 'function'", 1, 12},
        {"subprog id", "(unit gcc (subprog s1 \"f\" VOID))", "should be s0", 1, 20},
        {"unknown flag", "(unit gcc (subprog s0 \"f\" VOID inline))", "unknown flag 'inline'", 1, 32},
        {"pointer constant", body("(MOVE t1 (CONST POINTER 4))"), "null or a text", 2, 35},
        {"label as value", body("(MOVE t1 L2)"), "write (NAME L2)", 2, 20},
        {"undeclared global", body("(MOVE t1 g5)"), "name 'g5' is not declared", 2, 20},
        {"bad call target", body("(EXP (CALL INT_S L2))"), "not 'L2'", 2, 28},
        {"empty buffer", std::string(head) + "(buffer t2 0)))", "size above 0", 2, 12},
        // Found by the reader fuzzer: counting up to these ids took a minute.
        {"huge name id", "(unit gcc(subprog s0 \"f\" INT_S  (name n0000000000000000003001407164 EXTERN_DATA_REF \"x\")))",
         "name id 'n0000000000000000003001407164' skips more than 1048576 ids", 1, 39},
        {"huge temp id", std::string(head) + "(temp t4000000000 INT_S)))", "skips more than", 2, 7},
        {"huge label id", std::string(head) + "(label L3000000)))", "label id 'L3000000' skips", 2, 8},
        {"duplicate name", "(unit gcc (name g0 EXTERN_DATA_REF \"x\") (name g1 EXTERN_DATA_REF \"x\"))",
         "same as the earlier g0", 1, 41},
        {"foreign scope", body("(MOVE t1 s3:t1)"), "no such subprogram", 2, 20},
        {"unknown state", std::string(head) + "(temp t2 INT_S BUSY)))", "unknown temporary state 'BUSY'", 2, 16},
    };
    return v;
}

TEST(TextMalformed, EachInputGivesOneDiagnosticWithItsPosition) {
    for (const Bad& b : badInputs()) {
        text::Result r = text::parse(b.source, "bad.zoa");
        EXPECT_FALSE(r.ok()) << b.what;
        EXPECT_EQ(nullptr, r.unit()) << b.what;
        ASSERT_EQ(1u, r.diagnostics().size()) << b.what;
        const text::Diagnostic& d = r.diagnostics()[0];
        EXPECT_NE(std::string::npos, d.message.find(b.message)) << b.what << ": " << d.message;
        EXPECT_EQ(b.line, d.line) << b.what << ": " << text::format(d);
        EXPECT_EQ(b.column, d.column) << b.what << ": " << text::format(d);
        EXPECT_EQ("bad.zoa:" + std::to_string(b.line) + ":" + std::to_string(b.column) + ": error: " + d.message,
                  text::format(d));
    }
}

TEST(TextMalformed, ToolExitsWithOneAndOneDiagnostic) {
    std::string dir = ZOA::testing::scratchDir();
    // One diagnostic: its line, then the source line and a caret when the place has text.
    std::regex line("^[^:\n]+\\.zoa:[0-9]+:[0-9]+: error: [^\n]+\n([^\n]*\n[ \t]*\\^\n)?$");
    int n = 0;
    for (const Bad& b : badInputs()) {
        std::string file = ZOA::testing::writeFile(dir, "bad" + std::to_string(n++) + ".zoa", b.source);
        ZOA::testing::CommandResult r = ZOA::testing::runCommand(std::string(ZOA_TOOL) + " " + file);
        EXPECT_EQ(1, r.status) << b.what << ": " << r.output;
        EXPECT_TRUE(std::regex_match(r.output, line)) << b.what << ": " << r.output;
    }
    // Verifier errors stop the tool too, pointing at the statement.
    std::string mismatch = ZOA::testing::writeFile(dir, "verify.zoa", body("(MOVE (CONST INT_S 1) t1)"));
    ZOA::testing::CommandResult r = ZOA::testing::runCommand(std::string(ZOA_TOOL) + " " + mismatch);
    EXPECT_EQ(1, r.status);
    EXPECT_NE(std::string::npos, r.output.find("verify.zoa:2:11: error: MOVE into a CONST")) << r.output;
    r = ZOA::testing::runCommand(std::string(ZOA_TOOL) + " --no-verify --emit=text " + mismatch);
    EXPECT_EQ(0, r.status) << r.output;
}

TEST(TextMalformed, ToolUsageErrorsExitWithTwo) {
    std::string tool = ZOA_TOOL;
    for (const char* args : {"--emit=pdf x.zoa", "--bogus x.zoa", "a.zoa b.zoa", "-o"}) {
        ZOA::testing::CommandResult r = ZOA::testing::runCommand(tool + " " + args);
        EXPECT_EQ(2, r.status) << args << ": " << r.output;
        EXPECT_NE(std::string::npos, r.output.find("usage: zoa")) << args;
    }
    EXPECT_EQ(0, ZOA::testing::runCommand(tool + " --help").status);
    EXPECT_EQ(0, ZOA::testing::runCommand(tool + " --version").status);
    ZOA::testing::CommandResult missing = ZOA::testing::runCommand(tool + " /nonexistent/x.zoa");
    EXPECT_EQ(1, missing.status);
    ZOA::testing::CommandResult piped = ZOA::testing::runCommand("echo '(unit gcc)' | " + tool + " --emit=text -");
    EXPECT_EQ(0, piped.status);
    EXPECT_EQ("(unit gcc\n)\n", piped.output);
}

}  // namespace
