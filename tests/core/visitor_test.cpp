// Double dispatch and the order of the whole-tree walk.
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <string>

namespace ZOA {
namespace {

// Writes one token per node met, then lets AllVisitor walk the children.
class Recorder : public AllVisitor {
public:
    explicit Recorder(TreeBase* root) : AllVisitor(root) { root->accept(this); }
    std::string trace;

#define ZOA_RECORD(Node, text) \
    void visit(Node* n) override { put(text); AllVisitor::visit(n); }
    ZOA_RECORD(UNOP, "UNOP") ZOA_RECORD(SUBPROG, "SUBPROG") ZOA_RECORD(SEQ, "SEQ") ZOA_RECORD(NAME, "NAME")
    ZOA_RECORD(MOVE, "MOVE") ZOA_RECORD(MEM, "MEM") ZOA_RECORD(JUMP, "JUMP") ZOA_RECORD(EXP, "EXP")
    ZOA_RECORD(CJUMP, "CJUMP") ZOA_RECORD(CALL, "CALL") ZOA_RECORD(BINOP, "BINOP")
    ZOA_RECORD(LABEL, "L" + std::to_string(n->getId())) ZOA_RECORD(TEMP, "t" + std::to_string(n->getId()))
    ZOA_RECORD(BUF_TEMP, "buf" + std::to_string(n->getId())) ZOA_RECORD(CONST, std::to_string(n->getIValue()))
#undef ZOA_RECORD

private:
    void put(const std::string& s) { trace += trace.empty() ? s : " " + s; }
};

// Overrides only visit(TEMP*): buffers go to AllVisitor's visit(BUF_TEMP*).
class TempCounter : public AllVisitor {
public:
    explicit TempCounter(TreeBase* root) : AllVisitor(root) { root->accept(this); }
    std::string seen;
    void visit(TEMP* t) override { seen += "t" + std::to_string(t->getId()) + " "; }
};

TEST(AllVisitor, WalksLabelsByIdAndChildrenInFixedOrder) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    LABEL* labels[6] = {sp->getStartLabel(), sp->getReturnLabel()};
    for (int i = 2; i < 6; ++i) labels[i] = sp->createNewLabel(REGULAR_LABEL);
    sp->freeDeadLabel(labels[2]);
    sp->freeDeadLabel(labels[4]);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* fp = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* buf = sp->getTemp(POINTER, 8, IN_USE_TEMP);
    sp->getArgTemp(INT_S);  // arguments are not walked unless used
    NAME* table = sp->getName(std::list<ExprBase*>{new CONST(8), new CONST(9)});

    labels[5]->addStmt(new SEQ(nullptr, new MOVE(new MEM(INT_S, buf), new UNOP(INT_S, NEG, t))));
    labels[5]->addStmt(new JUMP(labels[3]));
    labels[3]->addStmt(new EXP(new CALL(VOID, fp, {sp->getName(labels[5]), table})));
    labels[3]->addStmt(new CJUMP(LT, t, new CONST(1), labels[5], labels[1]));
    labels[0]->addStmt(new SEQ(new MOVE(t, new BINOP(INT_S, PLUS, t, new CONST(2))), nullptr));
    labels[0]->addStmt(new JUMP(new MEM(POINTER, fp)));

    EXPECT_EQ(Recorder(sp).trace,
              "SUBPROG L0 SEQ MOVE t1 BINOP t1 2 JUMP MEM t2 L1 "
              "L3 EXP CALL t2 NAME NAME 8 9 CJUMP t1 1 "
              "L5 SEQ MOVE MEM buf3 UNOP t1 JUMP t0");
    EXPECT_EQ(TempCounter(sp).seen, "t1 t1 t2 t2 t1 t1 t0 ");

    SUBPROG* proc = unit.createSubprog(VOID, "p", false);
    EXPECT_EQ(Recorder(proc).trace, "SUBPROG L0 L1");
    EXPECT_EQ(Recorder(sp->getName(labels[3])).trace, "NAME");

    // The walk goes over the labels present when it starts.
    struct Grower : AllVisitor {
        SUBPROG* sp;
        int seen = 0;
        explicit Grower(SUBPROG* s) : AllVisitor(nullptr), sp(s) { s->accept(this); }
        void visit(LABEL*) override { ++seen, sp->createNewLabel(REGULAR_LABEL); }
    };
    EXPECT_EQ(Grower(proc).seen, 2);
    EXPECT_EQ(proc->getAllLabels().size(), 4u);
}

TEST(VisitorBase, BufTempReachesItsOwnVisit) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* buf = sp->getTemp(POINTER, 4, IN_USE_TEMP);
    Recorder r(buf);
    EXPECT_EQ(r.trace, "buf0");
    r.trace.clear();
    TEMP* asTemp = buf;
    asTemp->accept(&r);
    EXPECT_EQ(r.trace, "buf0");
    EXPECT_EQ(TempCounter(buf).seen, "");
}

}  // namespace
}  // namespace ZOA
