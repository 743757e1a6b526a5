// The DOT dump and its node statistics: whole graphs, edge order, labels, broken trees, rendering.
#include "dump/dot/dump_dot.h"

#include <zoa/zoa.h>

#include <native.h>

#include <gtest/gtest.h>

#include <cstdint>
#include <iomanip>
#include <iostream>
#include <list>
#include <map>
#include <regex>
#include <sstream>
#include <string>

namespace ZOA {
namespace {

std::string idOf(const void* node) {
    return std::to_string(static_cast<unsigned long long>(reinterpret_cast<std::uintptr_t>(node)));
}

// Addresses change from run to run: every identity (a number in front of ";",
// " ->" or " [") becomes N1, N2, ... in order of first appearance.
std::string stableIds(const std::string& dot) {
    static const std::regex identity(R"(\b\d+(?=;| ->| \[))");
    std::map<std::string, std::string> names;
    std::string result;
    std::size_t last = 0;
    for (auto it = std::sregex_iterator(dot.begin(), dot.end(), identity); it != std::sregex_iterator(); ++it) {
        auto found = names.emplace(it->str(), "N" + std::to_string(names.size() + 1)).first;
        result.append(dot, last, static_cast<std::size_t>(it->position()) - last);
        result += found->second;
        last = static_cast<std::size_t>(it->position() + it->length());
    }
    result.append(dot, last, std::string::npos);
    return result;
}

std::size_t occurrences(const std::string& text, const std::string& what) {
    std::size_t n = 0;
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + 1)) ++n;
    return n;
}

struct Dumped {
    std::string dot;
    std::string stats;
};

Dumped dump(ZOA_file& unit) {
    std::ostringstream os;
    ::testing::internal::CaptureStdout();
    EXPECT_TRUE(unit.dumpDot(os));
    Dumped d;
    d.stats = ::testing::internal::GetCapturedStdout();
    d.dot = os.str();
    return d;
}

char pointerText[] = "text";

// Nodes of interest in the unit that holds every kind.
struct EveryKind {
    SUBPROG* sp;
    BINOP* shared;
    CALL* call;
    ExprBase* args[3];
    JUMP* jumps[2];
    NAME* labelAddress;
};

EveryKind buildEveryKind(ZOA_file& unit) {
    EveryKind k{};
    SUBPROG* sp = k.sp = unit.createSubprog(INT_S, "every", false);
    TEMP* a = sp->getArgTemp(INT_S);
    sp->getArgTemp(CHAR_U);  // never used: declared all the same
    TEMP* c = sp->getTemp(CHAR_U, 0, IN_USE_TEMP);
    TEMP* buf = sp->getTemp(POINTER, 16, IN_USE_TEMP);
    TEMP* fp = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    LABEL* body = sp->createNewLabel(REGULAR_LABEL);
    LABEL* tail = sp->createNewLabel(REGULAR_LABEL);
    NAME* str = unit.getName(STRINGLIT_REF, "hello");
    NAME* data = unit.getName(new CONST(7));
    NAME* table = unit.getName(std::list<ExprBase*>{new CONST(1.5f), new CONST(1.0 / 3)});
    NAME* labelAddress = k.labelAddress = unit.getName(tail);

    LABEL* start = sp->getStartLabel();
    start->addStmt(new MOVE(c, new CONST(static_cast<unsigned char>(65))));
    k.shared = new BINOP(INT_S, MUL, a, new CONST(3));
    start->addStmt(new MOVE(new MEM(INT_S, buf), k.shared));
    start->addStmt(new MOVE(a, new BINOP(INT_S, PLUS, k.shared, new MEM(INT_S, data))));
    k.args[0] = a;
    k.args[1] = new BINOP(INT_S, MINUS, c, a);  // the CHAR_U operand gets a CONV4
    k.args[2] = new CONST(static_cast<char>(-56));
    k.call = new CALL(INT_S, "f", {k.args[0], k.args[1], k.args[2]});
    start->addStmt(new EXP(k.call));
    start->addStmt(new EXP(new CALL(VOID, fp, {str})));
    start->addStmt(new SEQ(nullptr, new MOVE(fp, table)));
    start->addStmt(new SEQ(new EXP(new UNOP(INT_S, NEG, a)), new EXP(new UNOP(INT_S, CONV7, c))));
    start->addStmt(new MOVE(a, new BINOP(INT_S, BITWISE_AND, a, new CONST(255u))));
    start->addStmt(new EXP(new CALL(VOID, "g",
                                    {new CONST(18446744073709551615ull), new CONST(-5ll), new CONST(0.1f),
                                     new CONST(2.5e-7), new CONST(static_cast<void*>(pointerText)),
                                     new CONST(static_cast<void*>(nullptr)), new CONST(VOID, 0ll)})));
    start->addStmt(new CJUMP(LT, a, new CONST(10), body, nullptr));
    body->addStmt(new CJUMP(GE, new UNOP(INT_S, BITWISE_NOT, a), new CONST(0), tail, sp->getReturnLabel()));
    k.jumps[0] = new JUMP(labelAddress);
    tail->addStmt(k.jumps[0]);
    k.jumps[1] = new JUMP(sp->getReturnLabel());
    sp->getReturnLabel()->addStmt(k.jumps[1]);
    sp->getReturnLabel()->addStmt(new MOVE(sp->getReturnTemp(), a));
    return k;
}

// Builds count(n): i = 0; while (i < n) i = i + 1; return i;
void buildCount(ZOA_file& unit) {
    SUBPROG* count = unit.createSubprog(INT_S, "count", false);
    count->makeStatic();
    TEMP* n = count->getArgTemp(INT_S);
    TEMP* i = count->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* test = count->createNewLabel(REGULAR_LABEL);
    LABEL* body = count->createNewLabel(REGULAR_LABEL);
    count->getStartLabel()->addStmt(new MOVE(i, new CONST(0)));
    count->getStartLabel()->addStmt(new JUMP(test));
    test->addStmt(new CJUMP(LT, i, n, body, count->getReturnLabel()));
    body->addStmt(new MOVE(i, new BINOP(INT_S, PLUS, i, new CONST(1))));
    body->addStmt(new JUMP(test));
    count->getReturnLabel()->addStmt(new MOVE(count->getReturnTemp(), i));
}

TEST(DumpDot, EveryKindMatchesGoldenWithItsOrderingRules) {
    ZOA_file unit(true, false);
    EveryKind k = buildEveryKind(unit);
    Dumped d = dump(unit);
    EXPECT_GOLDEN("dump/dot/golden/every_kind.dot", stableIds(d.dot));

    // Identities are the nodes' addresses in decimal.
    EXPECT_NE(d.dot.find("        " + idOf(k.sp) + ";\n"), std::string::npos);
    // A shared BINOP is declared, and its edges written, once per reference.
    EXPECT_EQ(occurrences(d.dot, "{BINOP | (INT_S / MUL)}"), 2u);
    EXPECT_EQ(occurrences(d.dot, idOf(k.shared) + " -> "), 4u);
    // CALL edges run from the last argument to the first.
    std::string c = idOf(k.call) + " -> ";
    std::size_t a2 = d.dot.find(c + idOf(k.args[2]) + ";\n");
    std::size_t a1 = d.dot.find(c + idOf(k.args[1]) + ";\n");
    std::size_t a0 = d.dot.find(c + idOf(k.args[0]) + ";\n");
    ASSERT_NE(a0, std::string::npos);
    EXPECT_LT(a2, a1);
    EXPECT_LT(a1, a0);
    // JUMP edges leave their line open; the next edge follows on the same line.
    // The return label (id 1) is walked before label 3, so its JUMP comes first.
    EXPECT_NE(d.dot.find(";\n        " + idOf(k.jumps[1]) + " -> " + idOf(k.sp->getReturnLabel()) + ";        " +
                         idOf(k.jumps[0]) + " -> " + idOf(k.labelAddress) + ";        " +
                         idOf(k.sp->getStartLabel()) + " -> "),
              std::string::npos);
    // Constant texts.
    EXPECT_NE(d.dot.find("{CONST | (CHAR_U / A)}"), std::string::npos);
    EXPECT_NE(d.dot.find("{CONST | (CHAR_S / -56)}"), std::string::npos);
    EXPECT_NE(d.dot.find("{CONST | (POINTER / (char *)0)}"), std::string::npos);
    EXPECT_NE(d.dot.find("{CONST | (VOID / )}"), std::string::npos);
    // No blocks for temporaries or jumps; temporaries live in the SUBPROG block.
    EXPECT_EQ(d.dot.find("TEMPType"), std::string::npos);
    EXPECT_EQ(d.dot.find(" JUMPType"), std::string::npos);
    EXPECT_EQ(d.dot.find("{JUMP"), std::string::npos);
    EXPECT_EQ(occurrences(d.dot, "{TEMP | "), 5u);
    EXPECT_EQ(occurrences(d.dot, "{BUF_TEMP | (POINTER / 4 / 16)}"), 1u);
}

TEST(DumpDot, StatisticsCountWhatTheWalkReachesAndPrecedeEachGraph) {
    ZOA_file unit(true, false);
    buildEveryKind(unit);
    Dumped d = dump(unit);
    EXPECT_EQ(d.stats,
              "ZOA Statictics for SUBPROG every\n"
              "************************************************************\n"
              "Size of subprogs is 1\n"
              "Total BINOP Nodes: 5\n"
              "Total BUF_TEMP Nodes: 1\n"
              "Total CALL Nodes: 3\n"
              "Total CONST Nodes: 16\n"
              "Total MEM Nodes: 2\n"
              "Total NAME Nodes: 4\n"
              "Total TEMP Nodes: 4\n"
              "Total UNOP Nodes: 4\n"
              "Total CJUMP Nodes: 2\n"
              "Total EXP Nodes: 5\n"
              "Total JUMP Nodes: 2\n"
              "Total LABEL Nodes: 4\n"
              "Total MOVE Nodes: 6\n"
              "Total SEQ Nodes: 2\n"
              "Total SUBPROG Nodes: 1\n"
              "Total ZOA Nodes: 61\n"
              "************************************************************\n");
    EXPECT_EQ(d.dot.find("Statictics"), std::string::npos);

    // Several subprograms: one table and one digraph each; on the same stream
    // every table stands directly before its graph.
    ZOA_file three(true, false);
    three.createSubprog(VOID, "p", false);
    three.createSubprog(INT_S, "q", false);
    three.createSubprog(DOUBLE, "r", false);
    ::testing::internal::CaptureStdout();
    EXPECT_TRUE(three.dumpDot(std::cout));
    std::string all = ::testing::internal::GetCapturedStdout();
    EXPECT_EQ(occurrences(all, "ZOA Statictics for SUBPROG "), 3u);
    EXPECT_EQ(occurrences(all, "digraph ZOA {\n"), 3u);
    std::size_t q = all.find("ZOA Statictics for SUBPROG q\n");
    ASSERT_NE(q, std::string::npos);
    EXPECT_NE(all.find("Total TEMP Nodes: 1\nTotal UNOP Nodes: 0\n", q), std::string::npos);
    EXPECT_NE(all.find("Total ZOA Nodes: 4\n"
                       "************************************************************\n"
                       "digraph ZOA {\n    graph [fontname=\"Helvetica\", fontsize=20, label = \"q\"]\n",
                       q),
              std::string::npos);
    std::size_t p = all.find("ZOA Statictics for SUBPROG p\n");
    std::size_t pTotal = all.find("Total ZOA Nodes: 3\n");
    EXPECT_LT(p, pTotal);
    EXPECT_LT(pTotal, q);
}

TEST(DumpDot, EmptyUnitAndEmptySubprogram) {
    ZOA_file none(true, false);
    Dumped empty = dump(none);
    EXPECT_EQ(empty.dot, "");
    EXPECT_EQ(empty.stats, "");

    ZOA_file unit(true, false);
    unit.createSubprog(VOID, "nothing", false);
    EXPECT_EQ(stableIds(dump(unit).dot),
              "digraph ZOA {\n"
              "    graph [fontname=\"Helvetica\", fontsize=20, label = \"nothing\"]\n"
              "    subgraph LABELType {\n"
              "        node [color=cyan, shape=record];\n"
              "        node [label = \"{LABEL | 0}\"];\n"
              "        N1;\n"
              "        node [label = \"{LABEL | 1}\"];\n"
              "        N2;\n"
              "    }\n"
              "    subgraph SUBPROGType {\n"
              "        node [color=skyblue, shape=record];\n"
              "        node [label = \"{SUBPROG | (VOID / nothing)}\"];\n"
              "        N3;\n"
              "    }\n"
              "    subgraph conections {\n"
              "        N3 -> N1;\n"
              "        N3 -> N2;\n"
              "    }\n"
              "}\n");
}

TEST(DumpDot, NullChildrenGetNoEdges) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "broken", false);
    LABEL* l = sp->getStartLabel();
    l->addStmt(new MOVE(nullptr, nullptr));
    l->addStmt(new EXP(nullptr));
    l->addStmt(new EXP(new BINOP(INT_S, PLUS, nullptr, nullptr)));
    l->addStmt(new EXP(new UNOP(INT_S, NEG, nullptr)));
    l->addStmt(new EXP(new MEM(INT_S, nullptr)));
    l->addStmt(new EXP(new CALL(INT_S, "f", {nullptr, nullptr})));
    l->addStmt(new EXP(unit.getName(std::list<ExprBase*>{nullptr})));
    l->addStmt(new SEQ(nullptr, nullptr));
    l->addStmt(new CJUMP(EQ, nullptr, nullptr, nullptr, nullptr));
    l->addStmt(new JUMP(static_cast<LABEL*>(nullptr)));
    l->addStmt(new JUMP(static_cast<ExprBase*>(nullptr)));
    std::string dot = dump(unit).dot;
    // Edges: the start label to its first statement, the EXPs to their non-null
    // operands, the subprogram to its labels and return temp.
    EXPECT_EQ(occurrences(dot, " -> "), 1u + 5u + 3u);
    std::string file = testing::writeFile(testing::scratchDir(), "broken.dot", dot);
    testing::CommandResult r = testing::runCommand("dot -Tsvg " + file + " -o /dev/null");
    EXPECT_EQ(r.status, 0) << r.output;
}

TEST(DumpDot, NumbersFollowTheStreamsFlags) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "hex", false);
    sp->getStartLabel()->addStmt(new EXP(new CALL(VOID, "h", {new CONST(255u), new CONST(-2ll), new CONST(1.0 / 3)})));
    std::ostringstream os;
    os << std::hex << std::setprecision(3);
    ::testing::internal::CaptureStdout();
    unit.dumpDot(os);
    ::testing::internal::GetCapturedStdout();
    std::ostringstream hexId;
    hexId << std::hex << reinterpret_cast<std::uintptr_t>(sp);
    EXPECT_NE(os.str().find("{CONST | (INT_U / ff)}"), std::string::npos);
    EXPECT_NE(os.str().find("{CONST | (DOUBLE / 0.333)}"), std::string::npos);
    EXPECT_NE(os.str().find("        " + hexId.str() + ";\n"), std::string::npos);
}

TEST(DumpDot, GraphvizRendersTheGraphs) {
    std::string dir = testing::scratchDir();
    ZOA_file count(true, false);
    buildCount(count);
    testing::writeFile(dir, "count.dot", dump(count).dot);
    ZOA_file every(true, false);
    buildEveryKind(every);
    testing::writeFile(dir, "every.dot", dump(every).dot);
    for (const char* name : {"count", "every"}) {
        std::string base = dir + "/" + name;
        testing::CommandResult r = testing::runCommand("dot -Tsvg " + base + ".dot -o " + base + ".svg");
        EXPECT_EQ(r.status, 0) << name << ": " << r.output;
        EXPECT_EQ(r.output, "") << name;
    }
}

}  // namespace
}  // namespace ZOA
