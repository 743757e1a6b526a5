// Broken rules of use: a unit whose arena was rewound under it, a node kept from an earlier unit.
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <sstream>
#include <unistd.h>

namespace ZOA {
namespace {

SUBPROG* returning(ZOA_file& unit, const char* name, long long value) {
    SUBPROG* f = unit.createSubprog(INT_S, name, false);
    f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), new CONST(value)));
    return f;
}

TEST(UnitMisuse, AUnitRewoundUnderItRefusesEveryOutputAndSaysSo) {
    for (bool asmMode : {false, true}) {
        SCOPED_TRACE(asmMode ? "assembly" : "C");
        std::ostringstream notesOfA, notesOfB;
        ZOA_file a(true, asmMode);
        a.setDiagnosticStream(&notesOfA);
        returning(a, "fromA", 1);
        EXPECT_TRUE(a.isCurrent());

        ZOA_file b(true, asmMode, Profile::SOUND);  // rewinds the arena under a
        b.setDiagnosticStream(&notesOfB);
        returning(b, "fromB", 2);
        EXPECT_FALSE(a.isCurrent());
        EXPECT_TRUE(b.isCurrent());

        std::ostringstream out;
        EXPECT_FALSE(a.decompile(out));
        EXPECT_FALSE(a.dumpDot(out));
        EXPECT_FALSE(a.dumpAscii(out));
        EXPECT_EQ("", out.str());
        const std::string line =
            "ZOA_file: a later ZOA_file rewound the arena under this unit; its nodes are gone, nothing written\n";
        EXPECT_EQ(line + line + line, notesOfA.str());
        // The refused decompile forgot nothing, and the current unit is untouched.
        EXPECT_EQ(1u, a.getSubprogs().size());
        EXPECT_TRUE(b.dumpAscii(out));
        EXPECT_TRUE(b.decompile(out));
        EXPECT_NE(std::string::npos, out.str().find("fromB"));
        EXPECT_EQ(std::string::npos, out.str().find("fromA"));
        EXPECT_EQ(std::string::npos, notesOfB.str().find("rewound"));
    }
}

TEST(UnitMisuse, ADirectRewindMakesTheUnitStaleToo) {
    std::ostringstream notes, out;
    ZOA_file unit(false, false);
    unit.setDiagnosticStream(&notes);
    MemMgr::rewind();
    EXPECT_FALSE(unit.isCurrent());
    EXPECT_FALSE(unit.decompile(out));
    EXPECT_EQ("", out.str());
    EXPECT_NE(std::string::npos, notes.str().find("rewound"));
}

// A node of an earlier unit lands on the same arena bytes as the node that
// now refers to it: here a BINOP whose left operand is itself. The outputs
// must still finish; the alarm turns a hang into a failure.
TEST(UnitMisuse, ANodeKeptFromAnEarlierUnitDoesNotHangTheOutputs) {
    BINOP* kept = nullptr;
    {
        ZOA_file earlier(true, false);
        earlier.createSubprog(INT_S, "f", false);
        CONST* one = new CONST(1);
        kept = new BINOP(INT_S, PLUS, one, one);
    }
    for (bool asmMode : {false, true}) {
        ZOA_file unit(true, asmMode);
        std::ostringstream notes, out;
        unit.setDiagnosticStream(&notes);
        SUBPROG* f = unit.createSubprog(INT_S, "f", false);
        CONST* one = new CONST(1);
        BINOP* sum = new BINOP(INT_S, PLUS, kept, one);
        ASSERT_EQ(static_cast<ExprBase*>(sum), sum->getLeft()) << "the arena handed out other bytes";
        f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), sum));
        alarm(20);
        EXPECT_TRUE(unit.dumpAscii(out));
        EXPECT_TRUE(unit.dumpDot(out));
        EXPECT_TRUE(unit.decompile(out));
        alarm(0);
    }
}

}  // namespace
}  // namespace ZOA
