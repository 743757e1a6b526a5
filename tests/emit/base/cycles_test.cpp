// Walks over any pointer graph a client can build: cycles made with the copy assignments end, deep trees print whole.
#include "emit/used_temps.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <functional>
#include <sstream>
#include <string>
#include <vector>

using namespace ZOA;

namespace {

// Counts how many times each statement's text occurs; a cut output holds one note.
std::size_t count(const std::string& text, const std::string& piece) {
    std::size_t n = 0;
    for (std::size_t at = text.find(piece); at != std::string::npos; at = text.find(piece, at + 1)) ++n;
    return n;
}

// A cyclic statement and two ordinary ones after it, built afresh for each
// output (decompile forgets the unit's subprograms). The ASCII dump shows a
// label's first statement only.
using Cycle = std::function<StmtBase*(SUBPROG*)>;

struct Outputs {
    std::string c, msvc, assembly, dot, ascii;
};

void build(ZOA_file& unit, const Cycle& cycle) {
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    TEMP* after = sp->getTemp(INT_S, 0, IN_USE_TEMP);  // t1
    LABEL* start = sp->getStartLabel();
    start->addStmt(cycle(sp));
    start->addStmt(new MOVE(after, new CONST(2)));
    start->addStmt(new MOVE(sp->getReturnTemp(), after));
}

Outputs writeAll(const Cycle& cycle) {
    Outputs o;
    std::ostringstream notes;
    for (int flavour = 0; flavour < 3; ++flavour) {
        ZOA_file unit(flavour != 1, flavour == 2);
        unit.setDiagnosticStream(&notes);
        build(unit, cycle);
        std::ostringstream os;
        unit.decompile(os);
        (flavour == 0 ? o.c : flavour == 1 ? o.msvc : o.assembly) = os.str();
    }
    ZOA_file unit(true, false);
    unit.setDiagnosticStream(&notes);
    build(unit, cycle);
    std::ostringstream dot, ascii;
    unit.dumpDot(dot);
    unit.dumpAscii(ascii);
    o.dot = dot.str();
    o.ascii = ascii.str();
    return o;
}

TEST(Cycles, EveryOutputEndsWithANoteAndGoesOnAfterTheStatement) {
    std::vector<std::pair<const char*, Cycle>> cycles = {
        {"SEQ, own left side", [](SUBPROG*) -> StmtBase* {
             SEQ* s = new SEQ(nullptr, nullptr);
             *s = SEQ(s, nullptr);
             return s;
         }},
        {"SEQ, own right side", [](SUBPROG*) -> StmtBase* {
             SEQ* s = new SEQ(nullptr, nullptr);
             *s = SEQ(new EXP(new CONST(5)), s);
             return s;
         }},
        {"SEQ, both sides", [](SUBPROG*) -> StmtBase* {
             SEQ* s = new SEQ(nullptr, nullptr);
             *s = SEQ(s, s);
             return s;
         }},
        {"BINOP, own left operand", [](SUBPROG* sp) -> StmtBase* {
             TEMP* x = sp->getTemp(INT_S, 0, IN_USE_TEMP);
             TEMP* y = sp->getTemp(INT_S, 0, IN_USE_TEMP);
             BINOP* b = new BINOP(INT_S, PLUS, x, y);
             *b = BINOP(INT_S, PLUS, b, y);
             return new MOVE(x, b);
         }},
        {"BINOP, both operands", [](SUBPROG* sp) -> StmtBase* {
             TEMP* x = sp->getTemp(INT_S, 0, IN_USE_TEMP);
             BINOP* b = new BINOP(INT_S, MINUS, x, x);
             *b = BINOP(INT_S, MINUS, b, b);
             return new MOVE(x, b);
         }},
        {"MEM through a call argument", [](SUBPROG* sp) -> StmtBase* {
             TEMP* p = sp->getTemp(POINTER, 0, IN_USE_TEMP);
             MEM* m = new MEM(INT_S, p);
             CALL* c = new CALL(POINTER, "g", {m});
             *m = MEM(INT_S, c);
             return new MOVE(new MEM(INT_S, p), m);
         }},
    };
    for (const auto& entry : cycles) {
        SCOPED_TRACE(entry.first);
        Outputs o = writeAll(entry.second);
        for (const std::string* text : {&o.c, &o.msvc, &o.assembly}) EXPECT_EQ(count(*text, CUT_NOTE), 1u);
        // The dump shows the repeated node's block once more, without what is beneath.
        EXPECT_EQ(count(o.ascii, CUT_NOTE), 0u);
        EXPECT_LT(o.ascii.size(), 5000u);
        // The statements after the cyclic one are still written.
        EXPECT_NE(o.c.find("t1 = 2;"), std::string::npos);
        EXPECT_NE(o.msvc.find("t1 = 2;"), std::string::npos);
        EXPECT_NE(o.assembly.find("mov eax, DWORD PTR t0[ebp]"), std::string::npos);
        EXPECT_EQ(o.c.substr(o.c.size() - 4), "\n}\n\n");
        EXPECT_EQ(o.dot.substr(o.dot.size() - 2), "}\n");
        EXPECT_NE(o.dot.find("subgraph conections"), std::string::npos);
    }
}

TEST(Cycles, UsedTempsAndAllVisitorEnd) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* x = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* later = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* unused = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    BINOP* b = new BINOP(INT_S, PLUS, x, x);
    *b = BINOP(INT_S, PLUS, b, b);
    sp->getStartLabel()->addStmt(new EXP(b));
    sp->getStartLabel()->addStmt(new EXP(later));

    UsedTemps used;
    used.collect(sp);
    EXPECT_TRUE(used.isUsed(later));  // the cut ends only the statement that holds the cycle
    EXPECT_FALSE(used.isUsed(unused));

    struct Counter : AllVisitor {
        explicit Counter(TreeBase* root) : AllVisitor(root) { root->accept(this); }
        void visit(BINOP* n) override {
            ++binops;
            AllVisitor::visit(n);
        }
        std::size_t binops = 0;
    } counter(sp);
    EXPECT_EQ(counter.binops, MAX_WALK_DEPTH - 2);  // below the label and the EXP
}

// A chain just within the bound is printed whole (the ASCII dump's
// indentation makes its text grow with the square of the depth: not here).
TEST(Cycles, DeepAcyclicTreesPrintWhole) {
    constexpr unsigned int depth = MAX_WALK_DEPTH - 10;
    for (int flavour = 0; flavour < 3; ++flavour) {
        ZOA_file unit(true, flavour == 1);
        std::ostringstream notes, os;
        unit.setDiagnosticStream(&notes);
        SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
        TEMP* x = sp->getTemp(INT_S, 0, IN_USE_TEMP);
        ExprBase* e = x;
        for (unsigned int i = 0; i < depth; ++i) e = new UNOP(INT_S, NEG, e);
        sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), e));
        StmtBase* s = new EXP(x);
        for (unsigned int i = 0; i < depth; ++i) s = new SEQ(new EXP(x), s);
        sp->getStartLabel()->addStmt(s);
        if (flavour == 2) unit.dumpDot(os);
        else unit.decompile(os);
        EXPECT_EQ(os.str().find(CUT_NOTE), std::string::npos);
        if (flavour == 0) {
            EXPECT_EQ(count(os.str(), "(-("), depth);
        } else if (flavour == 2) {
            EXPECT_EQ(count(os.str(), "{UNOP"), depth);
            EXPECT_EQ(count(os.str(), "{SEQ"), depth);
        }
    }
}

}  // namespace
