// The reader builds a unit while it reads: blocks that mention later items, positions, and which error wins.
#include <zoa/text.h>
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <string>

using namespace ZOA;

namespace {

std::string firstDiagnostic(const std::string& src) {
    text::Result r = text::parse(src, "o.zoa");
    EXPECT_FALSE(r.ok());
    return r.diagnostics().empty() ? std::string() : text::format(r.diagnostics().front());
}

std::string where(const text::Result& r, const TreeBase* n) {
    const text::Position* p = r.positionOf(n);
    return p ? std::to_string(p->line) + ":" + std::to_string(p->column) : "none";
}

// A block may mention what is declared after it: another subprogram's items
// and file-level names further down. Such blocks wait for the end of the unit;
// the others are built as soon as their subprogram is read. Both give the unit
// the text describes: written and read again, it writes the same.
TEST(ReaderOrder, BlocksMayMentionWhatComesLater) {
    const std::string src =
        "(unit gcc\n"
        "  (subprog s0 \"f\" INT_S\n"
        "    (arg t1 INT_S)\n"
        "    (block L0\n"
        "      (MOVE t0 (BINOP INT_S PLUS t1 (CALL INT_S s1:t1)))\n"
        "      (MOVE t1 (MEM INT_S g0))\n"
        "      (JUMP L1))\n"
        "  )\n"
        "  (subprog s1 \"g\" INT_S\n"
        "    (temp t1 POINTER)\n"
        "    (block L0\n"
        "      (MOVE t0 (CONST INT_S 2))\n"
        "      (JUMP L1))\n"
        "  )\n"
        "  (name g0 (CONST INT_S 5))\n"
        ")\n";
    text::Result r = text::parse(src, "later.zoa");
    ASSERT_TRUE(r.ok()) << text::format(r.diagnostics().at(0));
    SUBPROG* f = r.unit()->getSubprogs().front();
    SUBPROG* g = r.unit()->getSubprogs().back();
    EXPECT_EQ("5:7", where(r, f->getStartLabel()->getStmts().front()));
    EXPECT_EQ("12:7", where(r, g->getStartLabel()->getStmts().front()));
    EXPECT_EQ("15:3", where(r, r.unit()->getNames().front()));
    std::string once = text::write(*r.unit());
    text::Result again = text::parse(once, "again.zoa");  // gives up r's unit
    ASSERT_TRUE(again.ok());
    EXPECT_EQ(once, text::write(*again.unit()));
}

// A node's position is where it was declared, else where the declarations
// first mention it, else where the blocks first do: the order the reader
// always used, whatever order it builds in.
TEST(ReaderOrder, ReturnTemporaryIsPlacedByTheDeclarationsFirst) {
    const std::string src =
        "(unit gcc\n"
        " (subprog s0 \"f\" INT_S (block L0 (MOVE t0 (CONST INT_S 1)) (JUMP L1)))\n"
        " (subprog s1 \"g\" INT_S (block L0 (MOVE s0:t0 (CONST INT_S 2)) (JUMP L1)))\n"
        " (name g0 (values s0:t0)))\n";
    text::Result r = text::parse(src, "rt.zoa");
    ASSERT_TRUE(r.ok()) << text::format(r.diagnostics().at(0));
    SUBPROG* f = r.unit()->getSubprogs().front();
    EXPECT_EQ("4:19", where(r, f->getReturnTemp()));
    SUBPROG* g = r.unit()->getSubprogs().back();
    EXPECT_EQ("none", where(r, g->getReturnTemp()));  // never written
    EXPECT_EQ("2:2", where(r, f));
}

// One diagnostic, chosen as if the whole text were read before anything was
// built: a syntax error anywhere first, then a first form that is no unit, then
// text after the unit, then the declarations' first error, then the blocks'.
TEST(ReaderOrder, TheSameErrorWinsAsBefore) {
    const std::string badBlock = "(subprog s0 \"f\" VOID (block L0 (MOVE t9 t9)))";
    const std::string badDecl = "(subprog s1 \"g\" VOID (temp t1 INT_Q))";
    EXPECT_EQ("o.zoa:2:31: error: unknown type 'INT_Q'",
              firstDiagnostic("(unit gcc " + badBlock + "\n" + badDecl + ")"));
    EXPECT_EQ("o.zoa:1:48: error: temporary 't9' is not declared", firstDiagnostic("(unit gcc " + badBlock + ")"));
    EXPECT_EQ("o.zoa:2:1: error: text after the unit: '(more'",
              firstDiagnostic("(unit gcc " + badBlock + ")\n(more)"));
    EXPECT_EQ("o.zoa:2:7: error: unexpected character '#'",
              firstDiagnostic("(unit gcc " + badDecl + ")\n(more #)"));
    EXPECT_EQ("o.zoa:1:1: error: expected (unit ...), found '(tinu'", firstDiagnostic("(tinu gcc)\n(more)"));
    EXPECT_EQ("o.zoa:1:1: error: '(unit' lacks its flavour (gcc or msvc)", firstDiagnostic("(unit)"));
    EXPECT_EQ("o.zoa:1:8: error: text after the unit: '(unit'", firstDiagnostic("(unit) (unit gcc)"));
    // A block that waits for the end still loses to a later declaration's error.
    EXPECT_EQ("o.zoa:1:87: error: unknown type 'INT_Q'",
              firstDiagnostic("(unit gcc (subprog s0 \"f\" VOID (block L0 (JUMP s1:L9))) " + badDecl + ")"));
    EXPECT_EQ("o.zoa:1:48: error: label 's1:L9' is not declared",
              firstDiagnostic("(unit gcc (subprog s0 \"f\" VOID (block L0 (JUMP s1:L9))) (subprog s1 \"g\" VOID))"));
}

// Lines count every newline, also those inside texts and comments.
TEST(ReaderOrder, PositionsCountNewlinesEverywhere) {
    const std::string src = "; a comment\n(unit gcc (name g0 STRINGLIT_REF \"two\nlines\")\r\n  ; more\n (subprog s0 \"f\" VOID))";
    text::Result r = text::parse(src, "nl.zoa");
    ASSERT_TRUE(r.ok()) << text::format(r.diagnostics().at(0));
    EXPECT_EQ("2:11", where(r, r.unit()->getNames().front()));
    EXPECT_EQ("5:2", where(r, r.unit()->getSubprogs().front()));
}

}  // namespace
