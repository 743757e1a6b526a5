// The verifier: one test per check, each with a clean counterpart that must pass.
#include <zoa/text.h>
#include <zoa/verify.h>
#include <zoa/zoa.h>

#include <gtest/gtest.h>

namespace ZOA {
// The rewriting friend of the nodes, used here only to make a JUMP whose kind
// contradicts its fields, which no public constructor can build.
class TreeRewriter {
public:
    static void setExpr(JUMP* j, ExprBase* e) { j->replaceExpr(e); }
};
}  // namespace ZOA

using namespace ZOA;

namespace {

struct Found {
    std::vector<verify::Diagnostic> all;
    int count(verify::Severity s, const std::string& part) const {
        int n = 0;
        for (auto& d : all) n += d.severity == s && d.message.find(part) != std::string::npos;
        return n;
    }
};

// Builds the unit from text (the reader itself does not verify) and verifies it.
Found check(const std::string& src) {
    text::Result r = text::parse(src, "v.zoa");
    EXPECT_TRUE(r.ok()) << (r.diagnostics().empty() ? "" : text::format(r.diagnostics()[0]));
    if (!r.ok()) return {};
    return {verify::verify(*r.unit())};
}

std::string fn(const std::string& stmts, bool asmMode = false) {
    return std::string("(unit gcc") + (asmMode ? " asm" : "") +
           " (subprog s0 \"f\" INT_S (arg t1 INT_S) (temp t2 DOUBLE) (buffer t3 8) (label L2)"
           " (block L0 " + stmts + ")) (subprog s1 \"g\" VOID (temp t0 INT_S) (label L2)))";
}

const auto E = verify::Severity::ERROR;
const auto W = verify::Severity::WARNING;

TEST(Verify, CleanProgramHasNoFindings) {
    Found f = check(fn("(MOVE t1 (BINOP INT_S PLUS t1 (CONST INT_S 1))) (MOVE (MEM INT_S t3) t1)"
                       " (CJUMP LT t1 t1 L2 L1) (JUMP L1) (EXP (CALL INT_S t3 t1)) (SEQ nil (JUMP L2))"));
    EXPECT_TRUE(f.all.empty()) << verify::format(f.all.at(0));
}

TEST(Verify, JumpTargetsMustBeLabelsOfTheSameSubprogram) {
    Found f = check(fn("(JUMP s1:L2) (CJUMP EQ t1 t1 L2 s1:L2)"));
    EXPECT_EQ(2, f.count(E, "is not a label of 'f'"));
    // A label freed from the map is no target either.
    f = check("(unit gcc (subprog s0 \"f\" VOID (label L2) (dead L2) (block L0 (JUMP L2))))");
    EXPECT_EQ(1, f.count(E, "target L2 is not a label of 'f'"));
}

TEST(Verify, RelationMustBeOneOfTheSix) {
    Found f = check(fn("(CJUMP PLUS t1 t1 L2 L1) (CJUMP MAX_BINOP t1 t1 L2 L1) (CJUMP GE t1 t1 L2 L1)"));
    EXPECT_EQ(1, f.count(E, "relation PLUS"));
    EXPECT_EQ(1, f.count(E, "relation MAX_BINOP"));
    EXPECT_EQ(2u, f.all.size());
}

TEST(Verify, MoveDestinationIsATempOrMem) {
    Found f = check(fn("(MOVE (CONST INT_S 1) t1) (MOVE (BINOP INT_S PLUS t1 t1) t1) (MOVE t3 t1) (MOVE (MEM INT_S t3) t1)"));
    EXPECT_EQ(1, f.count(E, "MOVE into a CONST"));
    EXPECT_EQ(1, f.count(E, "MOVE into a BINOP"));
    EXPECT_EQ(2u, f.all.size());
}

TEST(Verify, NullChildrenAreReportedButSeqSidesMayBeNull) {
    Found f = check(fn("(MOVE nil t1) (MOVE t1 (BINOP INT_S PLUS nil t1)) (EXP nil) (JUMP label nil)"
                       " (JUMP expr nil) (CJUMP EQ t1 nil nil L1) (EXP (CALL INT_S \"h\" nil)) (SEQ nil nil)"));
    EXPECT_EQ(1, f.count(E, "MOVE has no destination"));
    EXPECT_EQ(1, f.count(E, "BINOP has no left operand"));
    EXPECT_EQ(1, f.count(E, "EXP has no expression"));
    EXPECT_EQ(2, f.count(E, "JUMP has no target"));  // the label and the expression kind
    EXPECT_EQ(1, f.count(E, "JUMP has no target expression"));
    EXPECT_EQ(1, f.count(E, "CJUMP has no right operand"));
    EXPECT_EQ(1, f.count(E, "CJUMP has no true target"));
    EXPECT_EQ(1, f.count(E, "CALL has no argument"));
    EXPECT_EQ(8u, f.all.size());
}

TEST(Verify, TemporaryOfAnotherSubprogram) {
    Found f = check(fn("(MOVE t1 s1:t0)"));
    EXPECT_EQ(1, f.count(E, "temporary t0 of 'g' is used in 'f'"));
    f = check(fn("(MOVE t1 (MEM INT_S (BUF_TEMP 7 4)))"));
    EXPECT_EQ(1, f.count(W, "temporary t7 was not made by 'f'"));
    EXPECT_EQ(0, f.count(E, ""));
}

TEST(Verify, JumpKindMustMatchItsFields) {
    ZOA_file u(true, false);
    SUBPROG* f = u.createSubprog(VOID, "f", false);
    JUMP* j = new JUMP(f->getReturnLabel());
    TreeRewriter::setExpr(j, new CONST(1));
    f->getStartLabel()->addStmt(j);
    auto all = verify::verify(*f, false, &u);
    ASSERT_EQ(1u, all.size());
    EXPECT_EQ(j, all[0].node);
    EXPECT_EQ(f, all[0].subprog);
    EXPECT_EQ("error: JUMP to a label also holds an expression", verify::format(all[0]));
}

TEST(Verify, CallNeedsANameOrAPointer) {
    Found f = check(fn("(EXP (CALL INT_S \"\")) (EXP (CALL INT_S \"h\")) (EXP (CALL INT_S t3))"));
    EXPECT_EQ(1, f.count(E, "neither a function name nor a function pointer"));
    EXPECT_EQ(1u, f.all.size());
}

TEST(Verify, DataNamesNeedTheirElements) {
    Found f = check("(unit gcc (name g0 (values)) (name g1 EXTERN_DATA_REF \"\") (name g2 STRINGLIT_REF \"\")"
                    " (name g3 STATIC_DATA_REF \"\") (name g4 (values (CONST INT_S 1) nil))"
                    " (subprog s0 \"f\" VOID (name n0 SUBPROG_REF \"\")))");
    EXPECT_EQ(1, f.count(E, "name g0 is a constant array without elements"));
    EXPECT_EQ(1, f.count(E, "name g1 of kind EXTERN_DATA_REF has no symbol"));
    EXPECT_EQ(1, f.count(E, "name g3 is static data without its one constant"));
    EXPECT_EQ(1, f.count(E, "NAME has no element"));
    EXPECT_EQ(1, f.count(E, "name n0 of kind SUBPROG_REF has no symbol"));
    EXPECT_EQ(5u, f.all.size());  // an empty string literal is a fine text
}

TEST(Verify, AssemblyModeWarnsAboutWhatItCannotTranslate) {
    std::string stmts = "(MOVE t1 (BINOP INT_S DIV t1 t1)) (MOVE t1 (BINOP INT_S LE t1 t1))"
                        " (MOVE t1 (UNOP INT_S NEG t1)) (MOVE t1 (UNOP INT_S CONV4 t1))"
                        " (MOVE t2 (CONST DOUBLE 1.5)) (MOVE t2 (BINOP DOUBLE PLUS t2 t2))";
    Found f = check(fn(stmts, true));
    EXPECT_EQ(1, f.count(W, "cannot translate BINOP DIV"));
    EXPECT_EQ(1, f.count(W, "cannot translate UNOP NEG"));
    EXPECT_EQ(3, f.count(W, "no DOUBLE values"));  // t2 once, the constant, the sum
    EXPECT_EQ(5u, f.all.size());
    EXPECT_TRUE(check(fn(stmts, false)).all.empty());
}

TEST(Verify, DeepTreesAndSharedNodesAreWalkedOnce) {
    ZOA_file u(true, true);
    SUBPROG* f = u.createSubprog(INT_S, "f", false);
    ExprBase* e = new CONST(FLOAT, 1.0);
    for (int i = 0; i < 200000; ++i) e = new UNOP(INT_S, CONV4, e);
    f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), e));
    f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), e));
    auto all = verify::verify(u);
    ASSERT_EQ(1u, all.size());
    EXPECT_EQ("warning: the assembly output has no FLOAT values", verify::format(all[0]));
}

}  // namespace

// Copy assignment can make a node its own descendant: the walk still ends,
// and each node is checked once.
TEST(Verify, TreesThatContainThemselvesEnd) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    SEQ* s = new SEQ(nullptr, nullptr);
    *s = SEQ(s, new MOVE(t, nullptr));
    sp->getStartLabel()->addStmt(s);
    BINOP* b = new BINOP(INT_S, PLUS, t, nullptr);
    *b = BINOP(INT_S, MUL, b, nullptr);
    sp->getStartLabel()->addStmt(new EXP(b));
    std::vector<verify::Diagnostic> found = verify::verify(unit);
    ASSERT_EQ(2u, found.size());
    EXPECT_EQ("error: MOVE has no source", verify::format(found[0]));
    EXPECT_EQ("error: BINOP has no right operand", verify::format(found[1]));
}
