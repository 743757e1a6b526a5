// Differential and crash campaigns over generated units.
#ifndef ZOA_FUZZ_CAMPAIGN_H
#define ZOA_FUZZ_CAMPAIGN_H

#include "fuzz/gen.h"

#include <cstdint>
#include <functional>
#include <iosfwd>
#include <map>
#include <string>
#include <vector>

namespace ZOA::fuzz {

struct CampaignOptions {
    Mode mode = Mode::C;
    std::uint64_t firstSeed = 1;
    unsigned seeds = 100;
    unsigned batch = 40;                    // units compiled into one program
    std::vector<std::string> optLevels{"-O0", "-O2"};
    std::string workDir = "/tmp/zoa-fuzz";  // scratch files and reproducers
    unsigned shrinkLimit = 3;               // failures shrunk per campaign
    std::ostream* log = nullptr;            // progress and failures
    unsigned asmQuirks = 0;                 // AsmQuirk bits the assembly mode may generate
    // The C mode's profile: in the sound one the units use its constructs,
    // the interpreter reads them with its meaning, and each unit's C must
    // also compile on its own at -O0 with -Wall -Werror (but for unused
    // labels and variables).
    Profile profile = Profile::EXACT;
    // With Mode::C: the units in assembly mode and the sound profile, their
    // assembly linked with the C driver and compared with the interpreter.
    bool soundAsm = false;
};

struct Failure {
    std::uint64_t seed = 0;
    std::string kind;     // "mismatch", "build", "invalid unit", "crash"
    std::string detail;   // the first differing line, the compiler's message, ...
    std::string text;     // the unit in the text form
    std::string reduced;  // the shrunk unit, when it was shrunk
};

struct CampaignStats {
    unsigned seeds = 0;
    unsigned subprogs = 0;
    unsigned callsCompared = 0;               // per optimisation level
    std::map<std::string, unsigned> dropped;  // calls the interpreter gave no value, by reason
    unsigned programsBuilt = 0;
    std::vector<Failure> failures;
};

// Interprets every entry of every unit, writes the units as GCC-flavour C with
// a driver, compiles at each optimisation level with gcc -m32, runs and
// compares. Failing seeds are isolated, written to workDir as text and shrunk.
CampaignStats runDifferential(const CampaignOptions& options);

// Builds odd units and puts each through every output (C in both flavours,
// assembly, DOT, ASCII, text round trip, verifier, interpreter); only a crash
// (or a sanitizer report) fails. Returns the number of units handled.
unsigned runCrash(std::uint64_t firstSeed, unsigned seeds, std::ostream* log);

// Shrinks a unit text while `stillFails` holds for it; returns the smallest found.
std::string shrink(const std::string& text, const std::function<bool(const std::string&)>& stillFails,
                   unsigned budget);

// Prints the campaign's figures.
void report(std::ostream& os, const CampaignOptions& o, const CampaignStats& s);

}  // namespace ZOA::fuzz

#endif
