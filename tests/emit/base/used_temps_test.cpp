// UsedTemps: the temporaries a subprogram mentions, including ones that are not its own; the C output's declarations.
#include "emit/used_temps.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

using namespace ZOA;

TEST(UsedTemps, MarksWhatTheSubprogramMentionsWhoeverOwnsIt) {
    ZOA_file unit(true, false);
    SUBPROG* f = unit.createSubprog(INT_S, "f", false);
    SUBPROG* g = unit.createSubprog(VOID, "g", false);
    TEMP* arg = f->getArgTemp(INT_S);  // never mentioned: still used
    TEMP* unused = f->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* copied = f->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* fp = f->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* buf = f->getTemp(POINTER, 16, IN_USE_TEMP);
    TEMP* inList = f->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* inJump = f->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* foreign = g->getTemp(INT_S, 0, IN_USE_TEMP);  // g's, with the id of one of f's
    TEMP* copy = new TEMP(*copied);                      // same id, another node
    NAME* list = f->getName(std::list<ExprBase*>{inList});
    CALL* call = new CALL(INT_S, fp, {new MEM(INT_S, buf), foreign});
    LABEL* s = f->getStartLabel();
    LABEL* target = f->createNewLabel(REGULAR_LABEL);
    s->addStmt(new MOVE(copy, call));
    s->addStmt(new EXP(list));
    s->addStmt(new SEQ(new EXP(new UNOP(INT_S, NEG, copy)), nullptr));
    s->addStmt(new CJUMP(EQ, arg, new CONST(0), target, f->getReturnLabel()));
    target->addStmt(new JUMP(inJump));

    UsedTemps used;
    used.collect(f);
    for (TEMP* t : {f->getReturnTemp(), arg, fp, buf, inList, inJump, foreign, copy}) EXPECT_TRUE(used.isUsed(t)) << t->getId();
    EXPECT_FALSE(used.isUsed(unused) || used.isUsed(copied));
    ASSERT_EQ(used.calls().size(), 1u);
    EXPECT_EQ(used.calls()[0], call);

    // Reused on a subprogram with fewer temporaries: nothing of f's stays marked.
    used.collect(g);
    EXPECT_FALSE(used.isUsed(arg) || used.isUsed(copy) || used.isUsed(foreign));
    EXPECT_TRUE(used.calls().empty());
    EXPECT_FALSE(used.isUsed(nullptr));
}

// The C output marks the temporaries it prints while it prints a body once;
// where that can differ from the whole walk (values of names, a cut, labels
// placed by another subprogram) the declarations are still the whole walk's.
TEST(UsedTemps, CDeclaresExactlyWhatTheWholeWalkFinds) {
    for (int flavour = 0; flavour < 3; ++flavour) {
        ZOA_file unit(flavour != 1, false, flavour == 2 ? Profile::SOUND : Profile::EXACT);
        std::ostringstream diag;
        unit.setDiagnosticStream(&diag);
        SUBPROG* g = unit.createSubprog(INT_S, "g", false);
        SUBPROG* f = unit.createSubprog(INT_S, "f", false);
        TEMP* t[8];
        for (TEMP*& x : t) x = f->getTemp(INT_S, 0, IN_USE_TEMP);
        // t1 only in a name's values; t2 below values nested past the bound,
        // and t3 after them in the same statement, both cut from the walk.
        NAME* shallow = f->getName(std::list<ExprBase*>{new CONST(1), t[1]});
        ExprBase* deep = t[2];
        for (unsigned int i = 0; i < MAX_WALK_DEPTH; ++i) deep = new UNOP(INT_S, NEG, deep);
        NAME* tooDeep = f->getName(std::list<ExprBase*>{deep});
        LABEL* pulled = f->createNewLabel(REGULAR_LABEL);
        f->getStartLabel()->addStmt(new MOVE(t[0], new MEM(INT_S, shallow)));
        f->getStartLabel()->addStmt(new MOVE(t[0], new BINOP(INT_S, PLUS, new MEM(INT_S, tooDeep), t[3])));
        // t4 only in f's label, placed and printed while g is printed.
        pulled->addStmt(new MOVE(t[4], t[0]));
        pulled->addStmt(new JUMP(f->getReturnLabel()));
        g->getStartLabel()->addStmt(new JUMP(pulled));
        // t5 after a cycle in its statement; t6 in the next one.
        BINOP* cycle = new BINOP(INT_S, PLUS, t[0], t[0]);
        *cycle = BINOP(INT_S, PLUS, cycle, t[5]);
        f->getStartLabel()->addStmt(new EXP(cycle));
        f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), t[6]));

        UsedTemps whole;
        whole.collect(f);
        std::vector<bool> expected;
        for (TEMP* x : t) expected.push_back(whole.isUsed(x));
        EXPECT_EQ(expected, (std::vector<bool>{true, true, false, true, true, true, true, false}));

        std::ostringstream os;
        ASSERT_TRUE(unit.decompile(os)) << diag.str();
        std::string text = os.str();
        std::size_t body = text.find("int f()\n{");
        ASSERT_NE(body, std::string::npos);
        std::string decls = text.substr(body, text.find("LAB", body) - body);
        for (std::size_t i = 0; i < 8; ++i) {
            std::string line = "    int t" + std::to_string(t[i]->getId()) + ";\n";
            EXPECT_EQ(decls.find(line) != std::string::npos, expected[i]) << flavour << ": t" << t[i]->getId();
        }
    }
}
