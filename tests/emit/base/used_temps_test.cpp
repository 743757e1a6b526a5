// UsedTemps against UsedNodes: the same temporaries, including ones that are not the subprogram's own.
#include "emit/used_temps.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <vector>

using namespace ZOA;

namespace {

// Every temporary of the listed subprograms plus extras: UsedTemps must agree with UsedNodes on each.
void expectSameAsUsedNodes(SUBPROG* sp, UsedTemps& fast, const std::vector<TEMP*>& candidates) {
    UsedMap map;
    UsedNodes slow(sp, &map);
    fast.collect(sp);
    for (TEMP* t : candidates) {
        const NodeType* v = map.find(t);
        EXPECT_EQ(fast.isUsed(t), v && *v == TEMP_NODE) << "temporary t" << t->getId();
    }
}

}  // namespace

TEST(UsedTemps, AgreesWithUsedNodesOnOwnForeignAndCopiedTemporaries) {
    ZOA_file unit(true, false);
    SUBPROG* f = unit.createSubprog(INT_S, "f", false);
    SUBPROG* g = unit.createSubprog(VOID, "g", false);
    TEMP* arg = f->getArgTemp(INT_S);  // never mentioned: still used
    TEMP* unused = f->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* copied = f->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* fp = f->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* buf = f->getTemp(POINTER, 16, IN_USE_TEMP);
    TEMP* inList = f->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* foreign = g->getTemp(INT_S, 0, IN_USE_TEMP);  // g's, with the id of one of f's
    TEMP* copy = new TEMP(*copied);                      // same id, another node
    NAME* list = f->getName(std::list<ExprBase*>{inList});
    CALL* call = new CALL(INT_S, fp, {new MEM(INT_S, buf), foreign});
    LABEL* s = f->getStartLabel();
    s->addStmt(new MOVE(copy, call));
    s->addStmt(new EXP(list));
    s->addStmt(new SEQ(new EXP(new UNOP(INT_S, NEG, copy)), nullptr));

    std::vector<TEMP*> all(f->getAllTemps().begin(), f->getAllTemps().end());
    for (TEMP* t : {foreign, copy}) all.push_back(t);
    UsedTemps fast;
    expectSameAsUsedNodes(f, fast, all);
    EXPECT_TRUE(fast.isUsed(arg) && fast.isUsed(foreign) && fast.isUsed(copy) && fast.isUsed(inList));
    EXPECT_FALSE(fast.isUsed(unused) || fast.isUsed(copied));
    ASSERT_EQ(fast.calls().size(), 1u);
    EXPECT_EQ(fast.calls()[0], call);

    // Reused on a subprogram with fewer temporaries: nothing of f's stays marked.
    expectSameAsUsedNodes(g, fast, all);
    EXPECT_FALSE(fast.isUsed(arg) || fast.isUsed(copy));
    EXPECT_TRUE(fast.calls().empty());
    EXPECT_FALSE(fast.isUsed(nullptr));
}
