// The sound profile on whole files: every example's C compiles alone, its DOT renders with
// Graphviz, and two runs of each dump give the same bytes; DOT labels survive any text.
#include "native.h"

#include <zoa/text.h>
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <dirent.h>

#include <algorithm>
#include <fstream>
#include <functional>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

using namespace ZOA;
using ZOA::testing::runCommand;
using ZOA::testing::scratchDir;
using ZOA::testing::writeFile;

namespace {

std::vector<std::string> examples() {
    std::vector<std::string> files;
    if (DIR* dir = opendir(ZOA_EXAMPLES_DIR)) {
        while (dirent* e = readdir(dir)) {
            std::string name = e->d_name;
            if (name.size() > 4 && name.compare(name.size() - 4, 4, ".zoa") == 0)
                files.push_back(std::string(ZOA_EXAMPLES_DIR) + "/" + name);
        }
        closedir(dir);
    }
    return files;
}

std::string slurp(const std::string& path) {
    std::ifstream in(path);
    std::stringstream ss;
    ss << in.rdbuf();
    return ss.str();
}

enum class Output { C, DOT, ASCII };

// Reads the file into a sound unit and writes one output.
std::string soundOutput(const std::string& source, Output what, std::string* diagnostics = nullptr) {
    text::Flavour flavour;
    text::Result r = text::parse(source, "example", flavour);
    EXPECT_TRUE(r.ok());
    if (!r.ok()) return "";
    ZOA_file* unit = r.unit();
    unit->setProfile(Profile::SOUND);
    std::ostringstream os, diag;
    unit->setDiagnosticStream(&diag);
    bool ok = what == Output::C ? unit->decompile(os) : what == Output::DOT ? unit->dumpDot(os) : unit->dumpAscii(os);
    EXPECT_TRUE(ok);
    if (diagnostics) *diagnostics = diag.str();
    return os.str();
}

// The largest node identity of a digraph: the nodes are numbered from 0, so
// it stays below the node count, where addresses would not.
unsigned long long largestIdentity(const std::string& dot) {
    static const std::regex id(R"((?:^|\n) *([0-9]+)(?=;| ->))");
    unsigned long long most = 0;
    for (auto it = std::sregex_iterator(dot.begin(), dot.end(), id); it != std::sregex_iterator(); ++it)
        most = std::max(most, std::stoull((*it)[1].str()));
    return most;
}

bool renders(const std::string& dir, const std::string& dot) {
    std::string path = writeFile(dir, "graph.dot", dot);
    return runCommand("dot -Tsvg -o /dev/null '" + path + "'").status == 0;
}

}  // namespace

TEST(SoundDumps, ExamplesCompileRenderAndRepeat) {
    std::string dir = scratchDir();
    std::vector<std::string> files = examples();
    ASSERT_FALSE(files.empty());
    for (const std::string& file : files) {
        std::string source = slurp(file);
        std::string c = soundOutput(source, Output::C);
        std::string path = writeFile(dir, "unit.c", c);
        ZOA::testing::CommandResult cc = runCommand(
            "gcc -m32 -c -std=gnu99 -Wall -Werror -Wno-unused-label -Wno-unused-variable "
            "-Wno-unused-but-set-variable -o /dev/null '" + path + "'");
        EXPECT_EQ(cc.status, 0) << file << "\n" << cc.output;

        std::string stats;
        std::string dot = soundOutput(source, Output::DOT, &stats);
        EXPECT_TRUE(renders(dir, dot)) << file;
        EXPECT_EQ(dot.find("Statictics"), std::string::npos);
        EXPECT_NE(stats.find("Total ZOA Nodes"), std::string::npos);
        EXPECT_LT(largestIdentity(dot), 1000u) << file;
        EXPECT_EQ(dot, soundOutput(source, Output::DOT)) << file;
        std::string ascii = soundOutput(source, Output::ASCII);
        EXPECT_EQ(ascii.find("0x"), std::string::npos) << file;
        EXPECT_EQ(ascii, soundOutput(source, Output::ASCII)) << file;
    }
}

TEST(SoundDumps, AsciiIdentitiesAreOrderOfAppearance) {
    ZOA_file unit(true, false, Profile::SOUND);
    SUBPROG* f = unit.createSubprog(INT_S, "f", false);
    f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), new CONST(1)));
    std::ostringstream os;
    unit.dumpAscii(os);
    std::string text = os.str();
    EXPECT_EQ(text.find("0x"), std::string::npos) << text;
    EXPECT_EQ(text.rfind("SUBPROG(@0)", 0), 0u) << text;
    EXPECT_NE(text.find("Annotation: (0)"), std::string::npos);
}

// Labels with every character Graphviz gives a meaning to, a NUL character
// constant and bytes that are not UTF-8: the exact text breaks the file.
TEST(SoundDumps, DotLabelsAreEscaped) {
    std::string dir = scratchDir();
    auto build = [](ZOA_file& u) {
        SUBPROG* f = u.createSubprog(INT_S, "f{|}<a>\"\\", false);
        TEMP* c = f->getTemp(CHAR_U, 0, IN_USE_TEMP);
        f->getStartLabel()->addStmt(new MOVE(c, new CONST(CHAR_U, 0u)));
        f->getStartLabel()->addStmt(new MOVE(c, new CONST(CHAR_U, 0xe9u)));
        std::string odd = "g{x|y}<p>\"q\\\n\x01\xff";
        f->getStartLabel()->addStmt(new EXP(new CALL(INT_S, odd.c_str(), std::vector<ExprBase*>{})));
        f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), new CONST(1)));
    };
    auto dot = [&](Profile p) {
        ZOA_file u(true, false, p);
        std::ostringstream os, diag;
        u.setDiagnosticStream(&diag);
        build(u);
        u.dumpDot(os);
        return os.str();
    };
    EXPECT_FALSE(renders(dir, dot(Profile::EXACT)));
    std::string sound = dot(Profile::SOUND);
    EXPECT_TRUE(renders(dir, sound)) << sound;
    EXPECT_NE(sound.find("(CHAR_U / 0)"), std::string::npos);
    EXPECT_NE(sound.find("g\\{x\\|y\\}\\<p\\>\\\"q\\\\\\\\x0a\\\\x01\\\\xff"), std::string::npos) << sound;
    EXPECT_NE(sound.find("label = \"f{|}<a>\\\"\\\\\""), std::string::npos) << sound;
}
