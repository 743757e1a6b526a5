// The corpus compiled with gcc -m32 and run: the C must mean what the trees
// say. The MSVC flavour of the same units is pinned as golden text.
#include "corpus.h"

#include "native.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <functional>
#include <sstream>
#include <string>
#include <vector>

using namespace ZOA;

namespace {

const char* const prelude = "typedef unsigned long long uint64;\ntypedef long long int64;\n";

// Writes every program's C (textOf) with its check into dir, links them with
// a driver that calls each check, runs it and expects every check's output.
void expectCorpusComputes(const std::string& dir, const std::function<std::string(const corpus::Program&)>& textOf) {
    std::vector<std::string> sources;
    std::string decls, calls, expected;
    for (const corpus::Program& p : corpus::programs()) {
        sources.push_back(ZOA::testing::writeFile(dir, std::string(p.name) + ".c", textOf(p) + p.check));
        decls += std::string("void check_") + p.name + "(void (*)(const char *, long long));\n";
        calls += std::string("    check_") + p.name + "(report);\n";
        expected += p.expected;
    }
    std::string driver = std::string("#include <stdio.h>\n") + corpus::externals + decls +
                         "static void report(const char *what, long long v) { printf(\"%s=%lld\\n\", what, v); }\n"
                         "int main(void) {\n" + calls + "    return 0;\n}\n";
    sources.push_back(ZOA::testing::writeFile(dir, "driver.c", driver));
    ZOA::testing::CommandResult run = ZOA::testing::buildAndRun32(dir, sources);
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.output, expected);
}

}  // namespace

TEST(CCorpus, GccFlavourCompilesAndComputes) {
    expectCorpusComputes(ZOA::testing::scratchDir(), [](const corpus::Program& p) {
        std::string text = corpus::decompiled(p, true);
        EXPECT_GOLDEN(std::string("emit/c/golden/corpus/") + p.name + "_gcc.c.golden", text);
        return prelude + text;
    });
}

TEST(CCorpus, MsvcFlavourText) {
    for (const corpus::Program& p : corpus::programs())
        EXPECT_GOLDEN(std::string("emit/c/golden/corpus/") + p.name + "_msvc.c.golden", corpus::decompiled(p, false));
}

// The same programs in the sound profile: each file compiles on its own with
// warnings as errors, and all compute what the checks expect.
TEST(CCorpus, SoundProfileCompilesAloneAndComputes) {
    std::string dir = ZOA::testing::scratchDir();
    const std::string strict =
        " -std=gnu99 -Wall -Werror -Wno-unused-label -Wno-unused-variable -Wno-unused-but-set-variable";
    expectCorpusComputes(dir, [&](const corpus::Program& p) {
        ZOA_file unit(true, false, Profile::SOUND);
        p.build(unit);
        std::ostringstream os;
        EXPECT_TRUE(unit.decompile(os)) << p.name;
        std::string alone = ZOA::testing::writeFile(dir, std::string(p.name) + "_alone.c", os.str());
        ZOA::testing::CommandResult cc = ZOA::testing::runCommand("gcc -m32 -c" + strict + " -o /dev/null '" + alone + "'");
        EXPECT_EQ(cc.status, 0) << p.name << "\n" << cc.output;
        return os.str();
    });
}
