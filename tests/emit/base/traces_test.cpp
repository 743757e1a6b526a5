// Trace ordering of labels and the fall-through test of the emitter base.
#include "emit/decompile_base.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <sstream>
#include <vector>

using namespace ZOA;

namespace {

// Runs buildTraces on a subprogram and exposes the result.
class TraceProbe : public DecompileBase {
public:
    TraceProbe() : DecompileBase(sink, true) {}
    std::vector<unsigned int> order(SUBPROG* sp) {
        curSubprog = sp;
        buildTraces();
        std::vector<unsigned int> ids;
        for (LABEL* l : traceOrder) ids.push_back(l->getId());
        return ids;
    }
    bool omitted(StmtBase* jump, LABEL* printing) {
        curLabel = printing;
        return fallsThrough(jump);
    }

#define ZOA_NODE_KIND(kind, Class) \
    void visit(Class*) override {}
#include "core/node_kinds.def"
    void writeCutNote() override {}
    void defineName(NAME*) override {}
    void declareNamePrototype(NAME*) override {}
    void declareSubprogPrototype(SUBPROG*) override {}
    void declareCallPrototype(CALL*) override {}

private:
    std::ostringstream sink;
};

LABEL* prevOf(StmtBase* s) {
    auto* a = dynamic_cast<DecompileBase::TraceAnnotation*>(s->getAnnotation());
    return a ? a->prevLabel : nullptr;
}

}  // namespace

TEST(Traces, ConditionalFalseBranchAndJumpsFallThrough) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* l0 = sp->getStartLabel();
    LABEL* l1 = sp->getReturnLabel();
    LABEL* l2 = sp->createNewLabel(REGULAR_LABEL);
    LABEL* l3 = sp->createNewLabel(REGULAR_LABEL);
    auto* cj = new CJUMP(LT, t, new CONST(0), l3, l2);
    auto* j2 = new JUMP(l1);
    auto* j3 = new JUMP(l2);
    l0->addStmt(cj);
    l2->addStmt(j2);
    l3->addStmt(j3);

    TraceProbe probe;
    EXPECT_EQ(probe.order(sp), (std::vector<unsigned int>{0, 2, 1, 3}));
    EXPECT_EQ(prevOf(cj), l0);
    EXPECT_EQ(prevOf(j2), l2);
    EXPECT_EQ(j3->getAnnotation(), nullptr);  // backward: always written
    EXPECT_TRUE(probe.omitted(cj, l0));
    EXPECT_TRUE(probe.omitted(j2, l2));
    EXPECT_FALSE(probe.omitted(j2, l0));  // only the label printed just before counts
    EXPECT_FALSE(probe.omitted(j3, l3));
    EXPECT_NE(dynamic_cast<DecompileBase::LABELAnnotation*>(l3->getAnnotation()), nullptr);
}

TEST(Traces, FirstJumpWalkedPlacesASharedTarget) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    LABEL* l2 = sp->createNewLabel(REGULAR_LABEL);
    LABEL* l3 = sp->createNewLabel(REGULAR_LABEL);
    LABEL* l4 = sp->createNewLabel(REGULAR_LABEL);  // reached by nothing
    auto* fromStart = new JUMP(l3);
    auto* from2 = new JUMP(l3);
    auto* back = new JUMP(sp->getStartLabel());
    sp->getStartLabel()->addStmt(fromStart);
    l2->addStmt(from2);
    l3->addStmt(new JUMP(sp->getReturnLabel()));
    l4->addStmt(back);

    TraceProbe probe;
    EXPECT_EQ(probe.order(sp), (std::vector<unsigned int>{0, 3, 1, 2, 4}));
    EXPECT_EQ(prevOf(fromStart), sp->getStartLabel());
    EXPECT_EQ(from2->getAnnotation(), nullptr);
    EXPECT_EQ(back->getAnnotation(), nullptr);
}

// A pulled label's statements are walked before those after the jump, and a
// SEQ's left side before its right side.
TEST(Traces, WalkIsDepthFirstThroughSeq) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* l[8];
    for (int i = 2; i < 8; ++i) l[i] = sp->createNewLabel(REGULAR_LABEL);
    auto* cj = new CJUMP(EQ, t, t, l[5], l[2]);
    auto* toThree = new JUMP(l[3]);
    auto* toSix = new JUMP(l[6]);
    sp->getStartLabel()->addStmt(new SEQ(new SEQ(nullptr, cj), new SEQ(toThree, nullptr)));
    sp->getStartLabel()->addStmt(toSix);
    l[2]->addStmt(new JUMP(l[4]));
    l[7]->addStmt(new SEQ(new JUMP(l[7]), nullptr));

    TraceProbe probe;
    EXPECT_EQ(probe.order(sp), (std::vector<unsigned int>{0, 2, 4, 3, 6, 5, 7, 1}));
    EXPECT_EQ(prevOf(cj), sp->getStartLabel());
    EXPECT_EQ(prevOf(toThree), l[4]);
    EXPECT_EQ(prevOf(toSix), l[3]);
}

TEST(Traces, LongChainsNeedNoDeepRecursion) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    std::vector<LABEL*> chain;
    for (int i = 0; i < 50000; ++i) chain.push_back(sp->createNewLabel(REGULAR_LABEL));
    // Created in ascending id, linked in descending order: each jump pulls the next.
    sp->getStartLabel()->addStmt(new JUMP(chain.back()));
    for (std::size_t i = chain.size() - 1; i > 0; --i) chain[i]->addStmt(new JUMP(chain[i - 1]));
    TraceProbe probe;
    std::vector<unsigned int> order = probe.order(sp);
    ASSERT_EQ(order.size(), chain.size() + 2);
    EXPECT_EQ(order[1], chain.back()->getId());
    EXPECT_EQ(order[chain.size()], chain.front()->getId());
    EXPECT_EQ(order.back(), 1u);
}

TEST(Traces, SeqsThatContainThemselvesEndTheWalk) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    LABEL* a = sp->createNewLabel(REGULAR_LABEL);
    LABEL* b = sp->createNewLabel(REGULAR_LABEL);
    SEQ* alone = new SEQ(nullptr, nullptr);
    *alone = SEQ(alone, nullptr);  // its own left side
    SEQ* twice = new SEQ(nullptr, nullptr);
    *twice = SEQ(twice, twice);  // both sides: would be 2^n without the cut
    sp->getStartLabel()->addStmt(alone);
    sp->getStartLabel()->addStmt(new JUMP(b));
    a->addStmt(twice);
    b->addStmt(new JUMP(a));
    TraceProbe probe;
    // Every label still gets its place: the cut walks end, the work list goes on.
    std::vector<unsigned int> order = probe.order(sp);
    EXPECT_EQ(order.size(), 4u);
    EXPECT_EQ(order.front(), sp->getStartLabel()->getId());
    EXPECT_EQ(order.back(), 1u);
}
