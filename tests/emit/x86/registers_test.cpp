// The assembly emitter's register model: names, widths, aliasing, release and stealing.
#include "asm_test_util.h"

#include <gtest/gtest.h>

using namespace ZOA;
using ZOA::testing::TestASM;

namespace {

using Ann = DecompileASM::ExprAnnotation;

AsmRegister regOf(ExprBase* e) {
    Ann* a = DecompileASM::annotationOf(e);
    return a ? a->reg : NO_REGISTER;
}

TEST(AsmRegisters, NamesAndWidths) {
    EXPECT_STREQ(DecompileASM::registerName(NO_REGISTER, true), "");
    EXPECT_STREQ(DecompileASM::registerName(static_cast<AsmRegister>(16), false), "unknown register");
    EXPECT_STREQ(DecompileASM::registerName(static_cast<AsmRegister>(70), false), "unknown register");
    EXPECT_STREQ(DecompileASM::registerName(EDX, true), "[edx]");
    EXPECT_STREQ(DecompileASM::registerName(AH, false), "ah");

    EXPECT_EQ(DecompileASM::registerOfClass(CH, DWORD), ECX);
    EXPECT_EQ(DecompileASM::registerOfClass(RCX, DWORD), ECX);
    EXPECT_EQ(DecompileASM::registerOfClass(ESI, LOW_BYTE), NO_REGISTER);
    EXPECT_EQ(DecompileASM::registerOfClass(ESI, QWORD), RSI);
    EXPECT_EQ(DecompileASM::registerOfClass(AH, LOW_BYTE), AH);  // a byte register stays itself
    EXPECT_EQ(DecompileASM::registerOfClass(EDX, HIGH_BYTE), DH);
    EXPECT_EQ(DecompileASM::registerOfClass(DX, DWORD), NO_REGISTER);
    EXPECT_FALSE(DecompileASM::isRegisterOfClass(AH, HIGH_BYTE));
}

TEST(AsmRegisters, ByteRegistersAliasTheirDword) {
    ZOA_file unit(true, true);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* a = sp->getTemp(CHAR_U, 0, IN_USE_TEMP);
    TEMP* b = sp->getTemp(CHAR_U, 0, IN_USE_TEMP);
    std::ostringstream os;
    TestASM e(os);

    e.assignRegister(a, e.claimRegister(AL), false);
    EXPECT_FALSE(e.isReserved(AH));
    EXPECT_TRUE(e.isReserved(EAX));
    EXPECT_TRUE(e.isReserved(RAX));
    AsmRegister next = e.allocateByte();
    EXPECT_EQ(next, AH);
    e.assignRegister(b, next, false);

    e.claimRegister(EAX);  // evicts both byte holders
    EXPECT_EQ(regOf(a), NO_REGISTER);
    EXPECT_EQ(regOf(b), NO_REGISTER);
    EXPECT_TRUE(e.isReserved(AH) && e.isReserved(AL));

    e.markRegister(AL, false);  // releasing a byte register releases the dword too
    EXPECT_FALSE(e.isReserved(EAX));
    EXPECT_TRUE(e.isReserved(AH));
    e.markRegister(EDI, true);
    EXPECT_TRUE(e.isReserved(RDI));
    e.markRegister(EBP, true);  // bp and sp are never tracked
    EXPECT_FALSE(e.isReserved(EBP));
}

TEST(AsmRegisters, ExhaustedDwordsYieldNoRegister) {
    ZOA_file unit(true, true);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* t[5];
    for (TEMP*& x : t) x = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    std::ostringstream os;
    TestASM e(os);
    for (int i = 0; i < 4; ++i) {
        e.visit(t[i]);
        e.loadIntoRegister(t[i], false);
    }
    e.clear();
    e.visit(t[4]);
    EXPECT_EQ(e.loadIntoRegister(t[4], false), NO_REGISTER);
    EXPECT_EQ(e.text(), "mov , DWORD PTR t4[ebp]\n");
    EXPECT_EQ(e.allocateByte(), NO_REGISTER);

    // Already in a register: resized and, when claimed, dropped from the holders.
    e.clear();
    EXPECT_EQ(e.loadIntoRegister(t[1], true), EBX);
    EXPECT_EQ(e.text(), "");
    EXPECT_EQ(regOf(t[1]), NO_REGISTER);
    EXPECT_TRUE(e.isReserved(EBX));
}

TEST(AsmRegisters, StatementBoundaryKeepsOnlyUnloadedLocals) {
    ZOA_file unit(true, true);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* arg = sp->getArgTemp(INT_S);
    TEMP* local = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* loaded = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    std::ostringstream os;
    TestASM e(os);
    e.assignRegister(local, NO_REGISTER, false);  // recorded without a register
    e.assignRegister(arg, e.allocateDword(), false);
    e.assignRegister(loaded, e.allocateDword(), false);
    EXPECT_EQ(e.stealRegister(DWORD), NO_REGISTER);  // every holder is assigned

    SEQ seq(nullptr, nullptr);
    e.releaseStatementRegisters(&seq);  // a SEQ releases nothing itself
    EXPECT_TRUE(e.isReserved(EAX));

    EXP stmt(arg);
    e.releaseStatementRegisters(&stmt);
    EXPECT_EQ(e.holder(0), local);
    EXPECT_FALSE(DecompileASM::annotationOf(local)->isAssigned);
    EXPECT_EQ(e.holder(1), nullptr);
    EXPECT_EQ(e.holder(2), nullptr);
    EXPECT_EQ(regOf(arg), NO_REGISTER);
    EXPECT_FALSE(e.isReserved(EAX) || e.isReserved(EBX));
}

}  // namespace
