// The zoa command line, run as a user runs it: file handling, options, --run arguments, messages.
#include "native.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <utility>

namespace {

using ZOA::testing::CommandResult;
using ZOA::testing::runCommand;

const std::string tool = std::string("'") + ZOA_TOOL + "'";
const std::string count = std::string("'") + ZOA_EXAMPLES_DIR + "/count.zoa'";

std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream s;
    s << in.rdbuf();
    return s.str();
}

// Runs in dir, standard error dropped.
CommandResult stdoutOf(const std::string& dir, const std::string& args) {
    return runCommand("cd '" + dir + "' && " + tool + " " + args + " 2>/dev/null");
}

TEST(ZoaTool, FailedReadsAndWritesSayWhichFileAndWhy) {
    std::string dir = ZOA::testing::scratchDir();
    struct Case {
        std::string args, message;
    } cases[] = {
        {"'" + dir + "'", "zoa: " + dir + ": error: cannot read the file: Is a directory\n"},
        {"'" + dir + "/none.zoa'", "zoa: " + dir + "/none.zoa: error: cannot open the file: No such file or directory\n"},
        {count + " -o /dev/full", "zoa: /dev/full: error: cannot write the file: No space left on device\n"},
        {count + " -o '" + dir + "/no/such/dir.c'",
         "zoa: " + dir + "/no/such/dir.c: error: cannot open the file for writing: No such file or directory\n"},
        {count + " -o '" + dir + "'", "zoa: " + dir + ": error: cannot open the file for writing: Is a directory\n"},
        {"--run=count 3 " + count + " -o /dev/full", "zoa: /dev/full: error: cannot write the file: No space left on device\n"},
    };
    for (const Case& c : cases) {
        CommandResult r = runCommand(tool + " " + c.args);
        EXPECT_EQ(1, r.status) << c.args;
        EXPECT_EQ(c.message, r.output) << c.args;
    }
    CommandResult full = runCommand("(" + tool + " " + count + " >/dev/full)");
    EXPECT_EQ(1, full.status);
    EXPECT_EQ("zoa: <stdout>: error: cannot write the file: No space left on device\n", full.output);
}

TEST(ZoaTool, OptionsAndFilesAreSpelledAsCompilerToolsSpellThem) {
    std::string dir = ZOA::testing::scratchDir();
    CommandResult reference = stdoutOf(dir, "--exact --emit=c " + count);
    ASSERT_EQ(0, reference.status);
    ASSERT_NE(std::string::npos, reference.output.find("count"));
    EXPECT_EQ(reference.output, stdoutOf(dir, "--exact --emit c " + count).output);
    EXPECT_EQ(reference.output, stdoutOf(dir, "--exact --emit=c -o - " + count).output);
    EXPECT_FALSE(std::filesystem::exists(dir + "/-")) << "-o - made a file";
    EXPECT_EQ(reference.output, stdoutOf(dir, "--exact --emit=c < " + count).output) << "standard input";
    EXPECT_EQ(reference.output, stdoutOf(dir, "--exact --emit=c - < " + count).output);
    EXPECT_EQ(0, stdoutOf(dir, "--exact --emit=c -oglued.c " + count).status);
    EXPECT_EQ(reference.output, readFile(dir + "/glued.c"));
    EXPECT_EQ(0, stdoutOf(dir, "--exact --emit=c -o spaced.c " + count).status);
    EXPECT_EQ(reference.output, readFile(dir + "/spaced.c"));
    // After --, a name that starts with '-' is the input.
    std::filesystem::copy_file(std::string(ZOA_EXAMPLES_DIR) + "/count.zoa", dir + "/-odd.zoa");
    EXPECT_EQ(reference.output, stdoutOf(dir, "--exact --emit=c -- -odd.zoa").output);

    CommandResult help = runCommand(tool + " --help");
    EXPECT_EQ(0, help.status);
    for (const char* option : {"--version", "-Werror", "--allow-untranslated", "--exact", "-o FILE", "NO_COLOR"})
        EXPECT_NE(std::string::npos, help.output.find(option)) << option;
    EXPECT_EQ("zoa 0.1.0\n", runCommand(tool + " --version").output);
    for (const char* bad : {"--emit", "--emit pdf", "-o", "--run", "--bogus", "a.zoa b.zoa", "--run=f"}) {
        CommandResult r = runCommand(tool + " " + bad);
        EXPECT_EQ(2, r.status) << bad;
        EXPECT_EQ(0u, r.output.rfind("zoa: ", 0)) << bad << ": " << r.output;
    }
}

TEST(ZoaTool, RunTakesEvery64BitIntegerAndRefusesWhatIsOutOfRange) {
    std::string dir = ZOA::testing::scratchDir();
    std::string unit = "'" + ZOA::testing::writeFile(dir, "id.zoa",
        "(unit gcc\n"
        "  (subprog s0 \"u\" INT64_U (arg t1 INT64_U) (block L0 (MOVE t0 t1) (JUMP L1)))\n"
        "  (subprog s1 \"s\" INT64_S (arg t1 INT64_S) (block L0 (MOVE t0 t1) (JUMP L1)))\n"
        "  (subprog s2 \"d\" DOUBLE (arg t1 DOUBLE) (block L0 (MOVE t0 t1) (JUMP L1))))\n") + "'";
    // Each run's arguments and what it prints, whole (a result) or in part (a refusal).
    using Expected = std::pair<const char*, const char*>;
    for (const Expected& e : {Expected{"--run=u 18446744073709551615", "18446744073709551615\n"},
                              Expected{"--run=u 0xFFFFFFFFFFFFFFFF", "18446744073709551615\n"},
                              Expected{"--run=s -9223372036854775808", "-9223372036854775808\n"},
                              Expected{"--run=s 9223372036854775807", "9223372036854775807\n"},
                              Expected{"--run s -- -0x10", "-16\n"},
                              Expected{"--run=s 010", "10\n"},  // decimal, as the text form reads it
                              Expected{"--run=d 2.5", "2.5\n"}}) {
        CommandResult r = runCommand(tool + " " + e.first + " " + unit);
        EXPECT_EQ(0, r.status) << e.first << ": " << r.output;
        EXPECT_EQ(e.second, r.output) << e.first;
    }
    for (const Expected& e : {Expected{"18446744073709551616", "is out of range"},
                              Expected{"-9223372036854775809", "is out of range"},
                              Expected{"0x10000000000000000", "is out of range"}, Expected{"1e999", "is out of range"},
                              Expected{"12abc", "is no number"}, Expected{"' 5'", "is no number"}}) {
        CommandResult r = runCommand(tool + " --run=s " + e.first + " " + unit);
        EXPECT_EQ(2, r.status) << e.first;
        EXPECT_NE(std::string::npos, r.output.find(e.second)) << e.first << ": " << r.output;
    }
}

TEST(ZoaTool, DiagnosticsShowTheLineAndACaretInColourOnlyOnATerminal) {
    std::string dir = ZOA::testing::scratchDir();
    std::string file = ZOA::testing::writeFile(dir, "bad.zoa",
        "(unit gcc\n  (subprog s0 \"f\" INT_S\n\t(block L0 (MOVE t0 (CONST INT_Q 1)))))\n");
    std::string expected = file + ":3:28: error: unknown type 'INT_Q'\n"
                           "\t(block L0 (MOVE t0 (CONST INT_Q 1)))))\n"
                           "\t                          ^\n";
    CommandResult piped = runCommand(tool + " '" + file + "'");
    EXPECT_EQ(1, piped.status);
    EXPECT_EQ(expected, piped.output);

    // A terminal, by script(1): colour, unless NO_COLOR says otherwise.
    std::string onTerminal = "script -qec \"" + tool + " '" + file + "'\" /dev/null";
    CommandResult coloured = runCommand("env -u NO_COLOR " + onTerminal);
    EXPECT_EQ(1, coloured.status);
    EXPECT_NE(std::string::npos, coloured.output.find("\033[1;31merror:\033[0m")) << coloured.output;
    CommandResult plain = runCommand("NO_COLOR=1 " + onTerminal);
    EXPECT_EQ(std::string::npos, plain.output.find('\033')) << plain.output;
    EXPECT_NE(std::string::npos, plain.output.find("error: unknown type 'INT_Q'"));

    // A long line shows a window around the column; control bytes show as '?'.
    std::string wide = ZOA::testing::writeFile(dir, "wide.zoa", "(unit gcc" + std::string(300, ' ') + "\x01)");
    CommandResult clipped = runCommand(tool + " '" + wide + "'");
    EXPECT_EQ(1, clipped.status);
    std::istringstream lines(clipped.output);
    std::string head, source, caret;
    std::getline(lines, head);
    std::getline(lines, source);
    std::getline(lines, caret);
    EXPECT_EQ(0u, source.rfind("...", 0)) << clipped.output;
    EXPECT_EQ(source.find('?'), caret.size() - 1) << clipped.output;
}

TEST(ZoaTool, VerifierWarningsAndTheExactAssembly) {
    std::string dir = ZOA::testing::scratchDir();
    std::string file = "'" + ZOA::testing::writeFile(dir, "div.zoa",
        "(unit gcc asm\n"
        "  (subprog s0 \"f\" INT_S (arg t1 INT_S)\n"
        "    (block L0 (MOVE t0 (BINOP INT_S DIV t1 (CONST INT_S 3))) (JUMP L1))))\n") + "'";
    std::string out = dir + "/f.s";
    // The exact assembly would drop the division: an error, and no output written.
    CommandResult exact = runCommand(tool + " --exact -o '" + out + "' " + file);
    EXPECT_EQ(1, exact.status);
    EXPECT_NE(std::string::npos, exact.output.find("div.zoa:3:24: error: the assembly output cannot translate BINOP DIV"))
        << exact.output;
    EXPECT_NE(std::string::npos, exact.output.find("--allow-untranslated"));
    EXPECT_FALSE(std::filesystem::exists(out));
    CommandResult allowed = runCommand(tool + " --exact --allow-untranslated -o '" + out + "' " + file);
    EXPECT_EQ(0, allowed.status) << allowed.output;
    EXPECT_NE(std::string::npos, allowed.output.find("div.zoa:3:24: warning: the assembly output cannot translate"));
    EXPECT_NE(std::string::npos, readFile(out).find("f:"));
    // Other outputs of the same unit are not held back; -Werror holds back everything.
    EXPECT_EQ(0, runCommand(tool + " --exact --emit=text " + file).status);
    CommandResult strict = runCommand(tool + " -Werror --emit=text " + file);
    EXPECT_EQ(1, strict.status);
    EXPECT_NE(std::string::npos, strict.output.find("error: the assembly output cannot translate BINOP DIV [-Werror]"));
}

// The example of the conversion docs: a cast truncates even in a wider UNOP.
TEST(ZoaTool, ACastConversionKeepsItsCastInTheInterpreterAndTheCompiledC) {
    std::string dir = ZOA::testing::scratchDir();
    std::string unit = ZOA::testing::writeFile(dir, "low.zoa",
        "(unit gcc (subprog s0 \"low\" INT_S (arg t1 INT_S)\n"
        "  (block L0 (MOVE t0 (UNOP INT_S CONV6 t1)) (JUMP L1))))\n");
    EXPECT_EQ("164\n", runCommand(tool + " --run=low 178571428 '" + unit + "'").output);
    std::string c = dir + "/low.c";
    ASSERT_EQ(0, runCommand(tool + " --exact --emit=c -o '" + c + "' '" + unit + "'").status);
    std::string driver = ZOA::testing::writeFile(dir, "main.c",
        "#include <stdio.h>\nint low(int);\nint main(void) { printf(\"%d\\n\", low(178571428)); return 0; }\n");
    EXPECT_EQ("164\n", ZOA::testing::buildAndRun32(dir, {c, driver}).output);
}

}  // namespace
