// The zoa tool's command line: what the user asked for, and the help text.
#ifndef ZOA_TOOLS_ZOA_CLI_H
#define ZOA_TOOLS_ZOA_CLI_H

#include <zoa/interp.h>

#include <string>
#include <vector>

namespace zoa_tool {

extern const char* const USAGE;
extern const char* const VERSION;

struct Options {
    std::string emit;          // empty: what the unit's own flags give
    std::string input = "-";   // "-": standard input
    std::string output = "-";  // "-": standard output
    bool verify = true;
    bool exact = false;              // the exact texts instead of the sound ones
    bool warningsAreErrors = false;  // -Werror
    bool allowUntranslated = false;  // exact assembly despite what it cannot translate
    bool help = false;
    bool version = false;
    std::string runFunc;  // --run: interpret this subprogram
    std::vector<ZOA::interp::Value> runArgs;
};

// Reads argv. On bad usage returns false with the reason in `why`.
bool parseCommandLine(int argc, char** argv, Options& options, std::string& why);

// One --run argument: a signed integer (decimal or 0x hexadecimal) within
// 64 bits, an unsigned one up to 2^64-1, or a real. False with a reason
// ("is no number", "is out of range") otherwise.
bool parseRunArgument(const std::string& text, ZOA::interp::Value& value, std::string& why);

}  // namespace zoa_tool

#endif
