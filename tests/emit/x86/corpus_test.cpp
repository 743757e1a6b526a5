// Whole units in assembly: golden texts, and each one assembled, linked with a C driver and run.
#include "asm_test_util.h"
#include "corpus.h"

#include <gtest/gtest.h>

using namespace ZOA;
using ZOA::testing::decompileAsm;
using ZOA::testing::runAsm;

TEST(AsmCorpus, GoldenTextsAssembleAndRun) {
    for (const asmcorpus::Unit& u : asmcorpus::units()) {
        SCOPED_TRACE(u.name);
        ZOA_file unit(true, true);
        u.build(unit);
        std::string text = decompileAsm(unit);
        EXPECT_GOLDEN(std::string("emit/x86/golden/") + u.name + ".s", text);
        if (*u.driver) {
            EXPECT_EQ(runAsm(text, u.driver), u.expected) << text;
        }
    }
}

