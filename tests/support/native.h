// Test support: scratch files, building and running 32-bit programs, golden-file comparison.
#ifndef ZOA_TESTS_SUPPORT_NATIVE_H
#define ZOA_TESTS_SUPPORT_NATIVE_H

#include <string>
#include <utility>
#include <vector>

namespace ZOA::testing {

struct CommandResult {
    int status = -1;      // exit status, or -1 when the command could not run
    std::string output;   // standard output and standard error, interleaved
};

// Runs a shell command line, capturing its output.
CommandResult runCommand(const std::string& commandLine);

// A fresh, empty scratch directory named after the current test.
std::string scratchDir();

// Writes text to dir/name and returns the path.
std::string writeFile(const std::string& dir, const std::string& name, const std::string& text);

// Compiles and links the given sources (paths; .c, .s) with `gcc -m32` into
// dir/prog and runs it: directly, or under qemu-i386 when the kernel cannot
// run 32-bit programs (status 126) and qemu-i386 is installed. `flags` go to
// gcc. Fails the current test with the compiler's messages if the build
// fails; returns the build's or the program's result.
CommandResult buildAndRun32(const std::string& dir, const std::vector<std::string>& sources,
                            const std::string& flags = "");

// Node addresses differ from run to run: numbers them (@0, @1, ...) in order of
// appearance, both the ASCII dump's hex form and the DOT dump's decimal node names.
std::string normaliseAddresses(const std::string& text);

// Compares text with tests/<relative path>. With ZOA_UPDATE_GOLDEN=1 in the
// environment the file is rewritten instead and the comparison passes. True
// on a match; otherwise *diff says where the texts part (EXPECT_GOLDEN shows it).
bool matchesGolden(const std::string& relativePath, const std::string& text, std::string* diff);

}  // namespace ZOA::testing

#define EXPECT_GOLDEN(path, text)                                    \
    do {                                                             \
        std::string zoaGoldenDiff;                                   \
        EXPECT_TRUE(::ZOA::testing::matchesGolden(path, text, &zoaGoldenDiff)) << zoaGoldenDiff; \
    } while (0)

#endif
