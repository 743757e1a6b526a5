// The ASCII tree dump: whole-unit golden text, block shapes, values, annotations, cycles and broken trees.
#include "dump/ascii/dump_tree.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <map>
#include <sstream>

#include "native.h"

namespace tools {
struct Note : ZOA::TreeAnnotation {};
struct Outer {
    struct Inner : ZOA::TreeAnnotation {};
};
}  // namespace tools

namespace ZOA {
namespace {

// Addresses change from run to run: each distinct one becomes N1, N2, ... in
// order of first appearance; the null identity stays as the stream wrote it.
std::string stable(const std::string& text) {
    std::map<std::string, std::size_t> ids;
    std::string result;
    for (std::size_t i = 0; i < text.size();) {
        if (text.compare(i, 2, "0x") != 0) {
            result += text[i++];
            continue;
        }
        std::size_t end = i + 2;
        while (end < text.size() && std::isxdigit(static_cast<unsigned char>(text[end]))) ++end;
        auto it = ids.emplace(text.substr(i, end - i), ids.size() + 1).first;
        result += "N" + std::to_string(it->second);
        i = end;
    }
    return result;
}

std::string dump(TreeBase* node, bool recursive) {
    std::ostringstream os;
    DumpTree(node, os, recursive);
    return stable(os.str());
}

// Prefixes every non-empty line of block with `blanks` blanks.
std::string indented(const std::string& block, std::size_t blanks) {
    std::string result;
    for (std::size_t i = 0; i < block.size();) {
        std::size_t end = std::min(block.find('\n', i), block.size() - 1) + 1;
        if (end > i + 1) result.append(blanks, ' ');
        result.append(block, i, end - i);
        i = end;
    }
    return result;
}

std::string valueLine(CONST* c) {
    std::string text = dump(c, false);
    std::size_t at = text.find("Value: ");
    return text.substr(at + 7, text.find('\n', at) - at - 7);
}

TEST(AsciiDump, WholeUnitWithEveryNodeKind) {
    ZOA_file unit(true, false);
    std::ostringstream empty;
    EXPECT_TRUE(unit.dumpAscii(empty));
    EXPECT_EQ(empty.str(), "");

    SUBPROG* f = unit.createSubprog(INT_S, "every", false);
    TEMP* a = f->getArgTemp(INT_S);
    TEMP* c = f->getArgTemp(CHAR_U);
    TEMP* buf = f->getTemp(POINTER, 16, IN_USE_TEMP);
    TEMP* fp = f->getTemp(POINTER, 0, IN_USE_TEMP);
    LABEL* loop = f->createNewLabel(REGULAR_LABEL);
    NAME* str = f->getName(STRINGLIT_REF, "hi");
    NAME* table = f->getName(std::list<ExprBase*>{new CONST(1), new CONST(2)});
    NAME* seven = f->getName(new CONST(7u));
    f->getStartLabel()->addStmt(new SEQ(
        new MOVE(new MEM(INT_S, buf), new BINOP(INT_S, PLUS, a, c)),
        new SEQ(new EXP(new CALL(INT_S, "g", {str, table, seven, new CONST(2.5)})), new JUMP(loop))));
    auto* test = new CJUMP(GT, a, new CONST(0), loop, f->getReturnLabel());
    test->setAnnotation(new tools::Note, false);
    loop->addStmt(new SEQ(test, new SEQ(new EXP(new CALL(VOID, fp, {f->getName(loop)})),
                                        new SEQ(new JUMP(f->getStartLabel()), new JUMP(fp)))));
    loop->addStmt(new JUMP(loop));  // not the first statement: not shown
    f->getReturnLabel()->addStmt(new MOVE(f->getReturnTemp(), a));

    SUBPROG* proc = unit.createSubprog(VOID, "proc", false);
    proc->freeDeadLabel(proc->getReturnLabel());

    std::ostringstream os;
    EXPECT_TRUE(unit.dumpAscii(os));
    EXPECT_GOLDEN("dump/ascii/golden/every_kind.txt", stable(os.str()));
}

TEST(AsciiDump, BlockShapes) {
    ZOA_file unit(true, false);
    SUBPROG* f = unit.createSubprog(INT_S, "f", false);
    TEMP* t = f->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* p = f->getTemp(POINTER, 0, IN_USE_TEMP);
    EXPECT_EQ(dump(new BINOP(INT_S, XOR, t, new CONST(3)), false),
              "BINOP(N1)\nDataType: INT_S\nAnnotation: (0)\nOp: XOR\nLeft: (N2)\nRight: (N3)\n\n");
    // The pointer's block is written inside the call's block even when not recursive.
    EXPECT_EQ(dump(new CALL(INT_S, p, {t}), false),
              "CALL(N1)\nDataType: INT_S\nAnnotation: (0)\nFunction Pointer: \n"
              "TEMP(N2)\nDataType: POINTER\nAnnotation: (0)\nId: 2\nTempKind: REGULAR_TEMP\n"
              "TempState: IN_USE_TEMP\n\n\nArgs: (N3)\n\n");
    EXPECT_EQ(dump(new CALL(VOID, static_cast<TEMP*>(nullptr)), true),
              "CALL(N1)\nDataType: VOID\nAnnotation: (0)\nFunction Pointer: \n\nArgs: \n\n");
    EXPECT_EQ(dump(new CALL(VOID, "h"), true), "CALL(N1)\nDataType: VOID\nAnnotation: (0)\nName: h\nArgs: \n\n");
    LABEL* l = f->createNewLabel(REGULAR_LABEL);
    EXPECT_EQ(dump(l, true), "LABEL(N1)\nAnnotation: (0)\nId: 2\nStartStmt: (0)\nKind: REGULAR_LABEL\n\n");
    EXPECT_EQ(dump(f->getTemp(INT_S, 8, IN_USE_TEMP), false),
              "BUF_TEMP(N1)\nDataType: POINTER\nAnnotation: (0)\nId: 3\nTempKind: REGULAR_TEMP\n"
              "TempState: IN_USE_TEMP\nArraySize: 8\n\n");
    EXPECT_EQ(dump(new UNOP(INT_S, CONV4, t), false),
              "UNOP(N1)\nDataType: INT_S\nAnnotation: (0)\nOp: CONV4\nExpr: (N2)\n\n");

    struct Base : TreeBase {
        void accept(VisitorBase*) override {}
    } base;
    EXPECT_EQ(dump(&base, true), "");
}

TEST(AsciiDump, IndentationFlushesAndCallerFlags) {
    ZOA_file unit(true, false);
    SUBPROG* f = unit.createSubprog(INT_S, "f", false);
    for (int i = 0; i < 25; ++i) f->getTemp(INT_S, 0, PERMANENT_TEMP);
    TEMP* t = f->getTemp(INT_S, 0, IN_USE_TEMP);  // id 26
    auto* move = new MOVE(t, new MEM(INT_S, t));
    const std::string temp =
        "TEMP(N2)\nDataType: INT_S\nAnnotation: (0)\nId: 1a\nTempKind: REGULAR_TEMP\nTempState: IN_USE_TEMP\n\n";
    struct CountingBuf : std::stringbuf {
        int syncs = 0;
        int sync() override { return ++syncs, std::stringbuf::sync(); }
    } buf;
    std::ostream os(&buf);
    os << std::hex;
    DumpTree(move, os, true);
    const std::string text = buf.str();
    EXPECT_EQ(stable(text), "MOVE(N1)\nAnnotation: (0)\nDst: (N2)\nSrc: (N3)\n\n" + indented(temp, 4) +
                                "    MEM(N3)\n    DataType: INT_S\n    Annotation: (0)\n    Expr: (N2)\n\n" +
                                indented(temp, 8));
    EXPECT_EQ(buf.syncs, static_cast<int>(std::count(text.begin(), text.end(), '\n')));
    EXPECT_TRUE(os.flags() & std::ios::hex);
}

TEST(AsciiDump, ConstantValues) {
    ZOA_file unit(true, false);
    EXPECT_EQ(valueLine(new CONST(static_cast<unsigned char>(200))), "200");
    EXPECT_EQ(valueLine(new CONST(static_cast<char>(-56))), "-56");
    EXPECT_EQ(valueLine(new CONST(1.5f)), "1.5");
    EXPECT_EQ(valueLine(new CONST(INT64_U, -1LL)), "18446744073709551615");
    EXPECT_EQ(valueLine(new CONST(INT64_S, -1LL)), "-1");
    EXPECT_EQ(valueLine(new CONST(INT_U, -1LL)), "4294967295");
    EXPECT_EQ(valueLine(new CONST(INT_S, 0x1fffffffeLL)), "-2");
    EXPECT_EQ(valueLine(new CONST(VOID, 5LL)), "");
    EXPECT_EQ(valueLine(new CONST(const_cast<char*>("text"))), "text");
    EXPECT_EQ(valueLine(new CONST(static_cast<void*>(nullptr))), "(char *)0");

    // A FLOAT is narrowed before printing; the caller's precision applies.
    std::ostringstream os;
    os.precision(17);
    DumpTree(new CONST(0.1f), os, false);
    DumpTree(new CONST(0.1), os, false);
    EXPECT_NE(os.str().find("Value: 0.10000000149011612\n"), std::string::npos);
    EXPECT_NE(os.str().find("Value: 0.10000000000000001\n"), std::string::npos);
}

TEST(AsciiDump, AnnotationClassNames) {
    ZOA_file unit(true, false);
    auto* note = new tools::Note;
    auto* inner = new tools::Outer::Inner;
    auto* left = new CONST(1);
    auto* right = new CONST(2);
    auto* sum = new BINOP(INT_S, PLUS, left, right);
    left->setAnnotation(note, false);
    right->setAnnotation(inner, false);
    sum->setAnnotation(note, false);
    EXPECT_EQ(dump(sum, true),
              "BINOP(N1)\nDataType: INT_S\nAnnotation: class tools::Note(N2)\nOp: PLUS\nLeft: (N3)\nRight: (N4)\n\n"
              "    CONST(N3)\n    DataType: INT_S\n    Annotation: class tools::Note(N2)\n    Value: 1\n\n"
              "    CONST(N4)\n    DataType: INT_S\n    Annotation: class tools::Outer::Inner(N5)\n    Value: 2\n\n");
}

TEST(AsciiDump, JumpCyclesTerminate) {
    ZOA_file unit(true, false);
    SUBPROG* f = unit.createSubprog(VOID, "spin", false);
    LABEL* self = f->createNewLabel(REGULAR_LABEL);
    self->addStmt(new JUMP(self));
    const std::string block = "LABEL(N1)\nAnnotation: (0)\nId: 2\nStartStmt: (N2)\nKind: REGULAR_LABEL\n\n";
    EXPECT_EQ(dump(self, true), block +
                                    "    JUMP(N2)\n    Annotation: (0)\n    Expr: (0)\n    Target: (N1)\n"
                                    "    Kind: DIRECT_LABEL\n\n" +
                                    indented(block, 8));

    // Start and return label jump to each other through SEQ chains.
    f->getStartLabel()->addStmt(new SEQ(nullptr, new SEQ(new JUMP(f->getReturnLabel()), nullptr)));
    f->getReturnLabel()->addStmt(new SEQ(new JUMP(f->getStartLabel()), nullptr));
    std::ostringstream os;
    unit.dumpAscii(os);
    std::string text = stable(os.str());
    std::size_t labels = 0;
    for (std::size_t i = 0; (i = text.find("LABEL(", i)) != std::string::npos; ++i) ++labels;
    EXPECT_EQ(labels, 8u);  // 3 under the subprogram, 3 under jumps, 2 cut short
}

TEST(AsciiDump, NullChildrenShowNullIdentities) {
    ZOA_file unit(true, false);
    SUBPROG* f = unit.createSubprog(VOID, "f", false);
    NAME* holey = f->getName(std::list<ExprBase*>{nullptr});
    auto* call = new CALL(INT_S, "h",
                          {new UNOP(INT_S, NEG, nullptr), nullptr, holey, new BINOP(INT_S, MUL, nullptr, nullptr)});
    auto* stmt = new SEQ(new MOVE(nullptr, nullptr),
                         new SEQ(new EXP(call), new SEQ(new JUMP(static_cast<LABEL*>(nullptr)),
                                                        new CJUMP(EQ, nullptr, new MEM(INT_S, nullptr),
                                                                  nullptr, nullptr))));
    EXPECT_GOLDEN("dump/ascii/golden/null_children.txt", dump(stmt, true));
}

}  // namespace
}  // namespace ZOA
