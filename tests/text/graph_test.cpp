// The writer on pointer graphs a client can build: shared subtrees and trees that contain themselves.
#include <zoa/text.h>
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <string>

using namespace ZOA;

namespace {

// Copy assignment can make a node its own descendant. Writing stops at the
// repetition with "(cycle)", which the reader refuses with a diagnostic.
TEST(WriterGraphs, TreesThatContainThemselvesAreWrittenOnce) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    SEQ* s = new SEQ(nullptr, nullptr);
    *s = SEQ(s, nullptr);
    sp->getStartLabel()->addStmt(s);
    BINOP* b = new BINOP(INT_S, PLUS, t, new CONST(INT_S, 1LL));
    *b = BINOP(INT_S, MUL, t, b);
    sp->getStartLabel()->addStmt(new MOVE(t, b));
    // A longer loop: a SEQ whose right side leads back through two more.
    SEQ* x = new SEQ(nullptr, nullptr);
    SEQ* y = new SEQ(nullptr, x);
    SEQ* z = new SEQ(new EXP(t), y);
    *x = SEQ(nullptr, z);
    sp->getStartLabel()->addStmt(x);

    std::string once = text::write(unit);
    EXPECT_NE(std::string::npos, once.find("(SEQ (cycle) nil)")) << once;
    EXPECT_NE(std::string::npos, once.find("(MOVE t1 (BINOP INT_S MUL t1 (cycle)))")) << once;
    EXPECT_NE(std::string::npos, once.find("(SEQ nil (SEQ (EXP t1) (SEQ nil (cycle))))")) << once;
    text::Result r = text::parse(once, "cycle.zoa");
    ASSERT_FALSE(r.ok());
    EXPECT_NE(std::string::npos, r.diagnostics().front().message.find("'cycle'"));
}

// A subtree shared by two parents is written at each use and read back as two
// equal subtrees: the same text again.
TEST(WriterGraphs, SharedSubtreesAreWrittenAtEachUse) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    ExprBase* shared = new BINOP(INT_S, PLUS, t, new CONST(INT_S, 2LL));
    sp->getStartLabel()->addStmt(new MOVE(t, new BINOP(INT_S, MUL, shared, shared)));
    std::string once = text::write(unit);
    EXPECT_NE(std::string::npos,
              once.find("(BINOP INT_S MUL (BINOP INT_S PLUS t1 (CONST INT_S 2)) (BINOP INT_S PLUS t1 (CONST INT_S 2)))"));
    text::Result r = text::parse(once, "shared.zoa");
    ASSERT_TRUE(r.ok());
    EXPECT_EQ(once, text::write(*r.unit()));
}

}  // namespace
