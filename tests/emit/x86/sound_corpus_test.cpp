// The sound assembly of every bundled example and of the C and assembly corpora, run beside C.
#include "../c/corpus.h"
#include "corpus.h"
#include "sound_util.h"

#include <zoa/nesting.h>
#include <zoa/text.h>

#include <fstream>
#include <functional>
#include <iterator>

using namespace ZOA;
using namespace ZOA::testing;

namespace {

const char* const prelude = "typedef unsigned long long uint64;\ntypedef long long int64;\n";

std::string readExample(const std::string& name) {
    std::ifstream in(std::string(ZOA_EXAMPLES_DIR) + "/" + name, std::ios::binary);
    return std::string((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

// Each example with a C main that calls it; the sound assembly must print
// what the example's own C output prints with the same main.
TEST(SoundAsm, EveryExampleComputesWhatItsCComputes) {
    struct Case {
        const char* file;
        const char* main;  // the body of main; the driver declares the unit's subprograms
    };
    const Case cases[] = {
        {"alloc.zoa", "char *p = grab(8); printf(\"%d\\n\", p[0]);"},
        {"buffer.zoa", "printf(\"%d %d\\n\", pair(3, 4), pair(-10, 2));"},
        {"count.zoa", "printf(\"%d %d\\n\", count(5), count(-1));"},
        {"factorial.zoa", "printf(\"%d %d\\n\", fact(6), fact(10));"},
        {"funcptr.zoa", "printf(\"%d\\n\", apply(21));"},
        {"int64.zoa", "printf(\"%lld %lld\\n\", mix(-3LL, 17ULL), mix(123456789012LL, 0xffffffffffffffffULL));"},
        {"jumptable.zoa", "printf(\"%d %d %d\\n\", pick(0), pick(1), pick(2));"},
        {"linkage.zoa", "printf(\"%d\\n\", entry(5));"},
        {"strings.zoa", "printf(\"%d\\n\", sum());"},
        {"widen.zoa", "printf(\"%d %d\\n\", add_byte(200, -5), add_byte(255, 1));"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.file);
        std::string source = readExample(c.file);
        std::string cText, asmText, protos;
        {
            text::Result r = text::parse(source, c.file);
            ASSERT_TRUE(r.ok());
            std::ostringstream os;
            r.unit()->decompile(os);
            cText = prelude + os.str();
        }
        {
            text::Result r = text::parse(source, c.file, text::Flavour{true, true});
            ASSERT_TRUE(r.ok());
            protos = prototypes(*r.unit());
            std::string statics = exportingStatics(*r.unit());
            asmText = soundAsm(*r.unit()) + statics;
        }
        std::string hook = source.find("\"hook\"") != std::string::npos ? "void hook(void) { puts(\"hook\"); }\n" : "";
        std::string driver = std::string("#include <stdio.h>\n#include <stdlib.h>\n") + prelude + protos + hook +
                             "int main(void) {\n    " + c.main + "\n    return 0;\n}\n";
        std::string fromC = runWithC({}, {cText, driver}, "-Dstatic=");
        std::string fromAsm = runWithC({asmText}, {driver});
        EXPECT_NE(fromC, "");
        EXPECT_EQ(fromAsm, fromC) << asmText;
    }
}

// The C corpus: the same checks the C output passes, against the assembly,
// in one program (file-level symbols stay private to each text).
TEST(SoundAsm, CCorpusComputesWhatItsCComputes) {
    std::vector<std::string> texts;
    std::string decls, checks, calls, expected;
    for (const corpus::Program& p : corpus::programs()) {
        ZOA_file unit(true, true);
        p.build(unit);
        decls += prototypes(unit);
        std::string statics = exportingStatics(unit);
        texts.push_back(soundAsm(unit) + statics);
        checks += p.check;
        calls += std::string("    check_") + p.name + "(report);\n";
        expected += p.expected;
    }
    std::string driver = std::string("#include <stdio.h>\n#include <stdlib.h>\n") + prelude + corpus::externals +
                         decls + checks +
                         "static void report(const char *what, long long v) { printf(\"%s=%lld\\n\", what, v); }\n"
                         "int main(void) {\n" + calls + "    return 0;\n}\n";
    // report is used before its definition in the checks: declare it first.
    driver.insert(driver.find(corpus::externals), "static void report(const char *, long long);\n");
    EXPECT_EQ(runWithC(texts, {driver}), expected);
    EXPECT_EQ(runWithC(texts, {driver}, "-no-pie"), expected);
}

// "table" is left out: its `tab` is a data name made from a text without
// values, which the sound C and assembly both make a private one-byte array
// (the driver's tab is another object, out of their reach), and it reads the
// words at offsets 4 and 12 of it, past its end: that has no result to
// compare. Only the exact text names the driver's table.
TEST(SoundAsm, AssemblyCorpusRunsItsDrivers) {
    for (const asmcorpus::Unit& u : asmcorpus::units()) {
        if (!*u.driver || std::string(u.name) == "table") continue;
        SCOPED_TRACE(u.name);
        ZOA_file unit(true, true);
        u.build(unit);
        std::string text = soundAsm(unit);
        EXPECT_EQ(runWithC({text}, {u.driver}), u.expected) << text;
    }
}

}  // namespace

namespace {

// A cycle made with the copy assignments ends at the depth bound with the
// note; the statements after it are still written, and the text assembles.
TEST(SoundAsm, CyclesEndWithANoteAndTheTextAssembles) {
    std::vector<std::function<StmtBase*(SUBPROG*)>> cycles = {
        [](SUBPROG*) -> StmtBase* {
            SEQ* s = new SEQ(nullptr, nullptr);
            *s = SEQ(s, s);
            return s;
        },
        [](SUBPROG* sp) -> StmtBase* {
            TEMP* x = sp->getTemp(INT_S, 0, IN_USE_TEMP);
            BINOP* b = new BINOP(INT_S, MINUS, x, x);
            *b = BINOP(INT_S, MINUS, b, b);
            return new MOVE(x, b);
        },
        [](SUBPROG* sp) -> StmtBase* {
            TEMP* p = sp->getTemp(POINTER, 0, IN_USE_TEMP);
            MEM* m = new MEM(INT_S, p);
            CALL* c = new CALL(POINTER, "g", {m});
            *m = MEM(INT_S, c);
            return new MOVE(new MEM(INT_S, p), m);
        },
    };
    for (auto& cycle : cycles) {
        ZOA_file unit(true, true);
        SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
        sp->getStartLabel()->addStmt(cycle(sp));
        sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), new CONST(2)));
        std::string text = soundAsm(unit);
        std::size_t notes = 0;
        for (std::size_t at = text.find(CUT_NOTE); at != std::string::npos; at = text.find(CUT_NOTE, at + 1)) ++notes;
        EXPECT_EQ(notes, 1u);
        EXPECT_NE(text.find("mov\teax, 2\n"), std::string::npos);
        std::string dir = scratchDir();
        CommandResult r = runCommand("as --32 -o '" + dir + "/c.o' '" + writeFile(dir, "c.s", text) + "'");
        EXPECT_EQ(r.status, 0) << r.output;
    }
}

}  // namespace
