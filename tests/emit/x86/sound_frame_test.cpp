// The sound assembly's private data, aligned data and buffers, and trees as deep as the walks go.
#include "sound_util.h"

#include <zoa/nesting.h>

using namespace ZOA;
using namespace ZOA::testing;

namespace {

MEM* at(DataType t, ExprBase* base, long long offset) {
    return new MEM(t, new BINOP(POINTER, PLUS, base, new CONST(INT_S, offset)));
}

// The low bits of an address, as an unsigned int.
ExprBase* lowBits(ExprBase* address, unsigned alignment) {
    return new BINOP(INT_U, BITWISE_AND, new UNOP(INT_U, CONV17, address), new CONST(INT_U, alignment - 1u));
}

// Private data is written and read back, never shared with equal data: each
// createData is its own object, file-level or local, and zero-filled blocks
// have their full size. The driver checks what the C means.
TEST(SoundAsmFrame, PrivateDataIsWritableAndNeverMerged) {
    ZOA_file unit(true, true);
    std::list<ExprBase*> values{new CONST(1), new CONST(2), new CONST(3)};
    NAME* table = unit.createData(values);
    NAME* twin = unit.createData(values);
    NAME* cell = unit.createData(new CONST(2.5));
    NAME* zeros = unit.createZeroData(400);
    // bump(i): ++table[i], the twin's element and the zero block's last word.
    SUBPROG* bump = unit.createSubprog(INT_S, "bump", false);
    TEMP* i = bump->getArgTemp(INT_S);
    TEMP* off = bump->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* l = bump->getStartLabel();
    l->addStmt(new MOVE(off, new BINOP(INT_S, MUL, i, new CONST(4))));
    ExprBase* slot = new BINOP(POINTER, PLUS, table, off);
    l->addStmt(new MOVE(new MEM(INT_S, slot), new BINOP(INT_S, PLUS, new MEM(INT_S, slot), new CONST(1))));
    l->addStmt(new MOVE(at(INT_S, zeros, 396), new BINOP(INT_S, PLUS, at(INT_S, zeros, 396), new CONST(5))));
    l->addStmt(new MOVE(cell, new BINOP(DOUBLE, MUL, cell, new CONST(2.0))));
    ExprBase* sum = new BINOP(INT_S, MUL, new MEM(INT_S, slot), new CONST(1000));
    sum = new BINOP(INT_S, PLUS, sum, new BINOP(INT_S, MUL, new MEM(INT_S, new BINOP(POINTER, PLUS, twin, off)), new CONST(100)));
    sum = new BINOP(INT_S, PLUS, sum, at(INT_S, zeros, 396));
    sum = new BINOP(INT_S, PLUS, sum, new UNOP(INT_S, CONV4, cell));
    l->addStmt(new MOVE(bump->getReturnTemp(), sum));
    // Local private data: two equal arrays in one subprogram and one in another.
    SUBPROG* mine = unit.createSubprog(INT_S, "mine", false);
    NAME* a = mine->createData(std::list<ExprBase*>{new CONST(7)});
    NAME* b = mine->createData(std::list<ExprBase*>{new CONST(7)});
    NAME* z = mine->createZeroData(0);
    mine->getStartLabel()->addStmt(new MOVE(new MEM(INT_S, a), new CONST(99)));
    mine->getStartLabel()->addStmt(new MOVE(new MEM(CHAR_S, z), new CONST(CHAR_S, 3)));
    mine->getStartLabel()->addStmt(new MOVE(mine->getReturnTemp(),
        new BINOP(INT_S, PLUS, new BINOP(INT_S, PLUS, new MEM(INT_S, a), new MEM(INT_S, b)), new MEM(CHAR_S, z))));
    SUBPROG* other = unit.createSubprog(INT_S, "other", false);
    NAME* c = other->createData(std::list<ExprBase*>{new CONST(7)});
    other->getStartLabel()->addStmt(new MOVE(other->getReturnTemp(), new MEM(INT_S, c)));
    // fill: memset over a whole zero block leaves the block after it alone.
    NAME* block = unit.createZeroData(64);
    NAME* guard = unit.createZeroData(4);
    SUBPROG* fill = unit.createSubprog(INT_S, "fill", false);
    fill->getStartLabel()->addStmt(new EXP(new CALL(POINTER, "memset", {block, new CONST(1), new CONST(INT_U, 64u)})));
    fill->getStartLabel()->addStmt(new MOVE(fill->getReturnTemp(),
        new BINOP(INT_S, PLUS, new MEM(INT_S, guard), at(INT_S, block, 60))));
    std::string driver = "#include <stdio.h>\n" + prototypes(unit) +
                         "int main(void) {\n"
                         "    int a = bump(0); int b = bump(0); int c = bump(2);\n"
                         "    printf(\"%d %d %d %d %d %d\\n\", a, b, c, mine(), other(), fill());\n    return 0;\n}\n";
    // 2*1000+100+5+5, 3*1000+100+10+10, 4*1000+300+15+20; 99+7+3; 7; 0x01010101.
    EXPECT_EQ(runWithC({soundAsm(unit)}, {driver}), "2110 3120 4335 109 7 16843009\n");
}

// Data names and buffer temporaries aligned as asked, however deep the
// caller's stack is: below, at and above the frame's own 16 bytes, up to the
// 4096 cap; the buffers are written to their last byte and read back.
TEST(SoundAsmFrame, DataAndBuffersAlignedAsAsked) {
    ZOA_file unit(true, true);
    NAME* d64 = unit.createZeroData(3);
    d64->setAlignment(64);
    NAME* d8 = unit.createData(std::list<ExprBase*>{new CONST(CHAR_S, 1)});
    d8->setAlignment(8);
    NAME* words = unit.createData(std::list<ExprBase*>{new CONST(5), new CONST(6)});
    words->setAlignment(2);  // below the natural 4: stays 4
    SUBPROG* sp = unit.createSubprog(INT_U, "aligned", false);
    TEMP* x = sp->getArgTemp(INT_S);
    NAME* local = sp->createZeroData(10);
    local->setAlignment(256);
    ExprBase* bits = new BINOP(INT_U, BITWISE_OR, lowBits(d64, 64), lowBits(d8, 8));
    bits = new BINOP(INT_U, BITWISE_OR, bits, lowBits(words, 4));
    bits = new BINOP(INT_U, BITWISE_OR, bits, lowBits(local, 256));
    TEMP* check = sp->getTemp(INT_U, 0, IN_USE_TEMP);
    LABEL* l = sp->getStartLabel();
    l->addStmt(new MOVE(check, bits));
    unsigned n = 0;
    for (unsigned align : {4u, 16u, 32u, 64u, 4096u}) {
        auto* buf = static_cast<BUF_TEMP*>(sp->getTemp(POINTER, 40 + n, IN_USE_TEMP));
        buf->setAlignment(align);
        l->addStmt(new MOVE(new MEM(INT_S, buf), x));
        l->addStmt(new MOVE(at(CHAR_S, buf, 39 + n), new CONST(CHAR_S, 9)));
        // Wrong when misaligned, when the last byte overlaps the first word, or when either is lost.
        ExprBase* wrong = new BINOP(INT_U, BITWISE_OR, lowBits(buf, align),
                                    new BINOP(INT_U, NE, new MEM(INT_S, buf), x));
        wrong = new BINOP(INT_U, BITWISE_OR, wrong, new BINOP(INT_U, NE, at(CHAR_S, buf, 39 + n), new CONST(CHAR_S, 9)));
        l->addStmt(new MOVE(check, new BINOP(INT_U, BITWISE_OR, check, wrong)));
        n += 8;
    }
    l->addStmt(new MOVE(sp->getReturnTemp(), check));
    std::string text = soundAsm(unit);
    std::string driver = "#include <stdio.h>\n" + prototypes(unit) +
                         "static unsigned deeper(int k) { volatile char pad[20]; pad[0] = (char)k;\n"
                         "    return k ? deeper(k - 1) | (unsigned)pad[0] * 0 : aligned(k + 12345); }\n"
                         "int main(void) { unsigned r = 0; for (int k = 0; k < 8; ++k) r |= deeper(k);\n"
                         "    printf(\"%u\\n\", r); return 0; }\n";
    EXPECT_EQ(runWithC({text}, {driver}), "0\n") << text;
}

// x plus a chain of `depth` increments, nested on the left and on the right.
ExprBase* chain(TEMP* x, unsigned depth, bool right) {
    ExprBase* e = x;
    for (unsigned i = 0; i < depth; ++i)
        e = right ? new BINOP(INT_S, PLUS, new CONST(1), e) : new BINOP(INT_S, PLUS, e, new CONST(1));
    return e;
}

// Expressions nested to the walks' depth bound are written whole, assemble
// and compute; one level past it is cut with the note, as every output does.
TEST(SoundAsmFrame, TreesAtTheDepthBound) {
    constexpr unsigned deep = MAX_WALK_DEPTH - 4;  // below the label, the MOVE and the statement's own levels
    ZOA_file unit(true, true);
    const char* names[] = {"left", "right", "negs", "calls"};
    for (int k = 0; k < 4; ++k) {
        SUBPROG* sp = unit.createSubprog(INT_S, names[k], false);
        TEMP* x = sp->getArgTemp(INT_S);
        ExprBase* e = x;
        if (k < 2) {
            e = chain(x, deep, k == 1);
        } else {
            for (unsigned i = 0; i < deep; ++i)
                e = k == 2 ? static_cast<ExprBase*>(new UNOP(INT_S, NEG, e)) : new CALL(INT_S, "abs", {e});
        }
        sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), e));
    }
    std::string text = soundAsm(unit);
    EXPECT_EQ(text.find(CUT_NOTE), std::string::npos);
    std::string driver = "#include <stdio.h>\n" + prototypes(unit) +
                         "int main(void) { printf(\"%d %d %d %d\\n\", left(1), right(2), negs(3), calls(-4)); return 0; }\n";
    EXPECT_EQ(runWithC({text}, {driver}), std::to_string(deep + 1) + " " + std::to_string(deep + 2) + " 3 4\n");

    ZOA_file past(true, true);
    SUBPROG* sp = past.createSubprog(INT_S, "past", false);
    TEMP* x = sp->getArgTemp(INT_S);
    sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), chain(x, MAX_WALK_DEPTH + 1, false)));
    text = soundAsm(past);
    EXPECT_NE(text.find(CUT_NOTE), std::string::npos);
    std::string dir = scratchDir();
    CommandResult r = runCommand("as --32 -o '" + dir + "/p.o' '" + writeFile(dir, "p.s", text) + "'");
    EXPECT_EQ(r.status, 0) << r.output;
}

}  // namespace
