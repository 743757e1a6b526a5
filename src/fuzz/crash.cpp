// Crash campaign: odd trees through every output; only crashes count.
#include "fuzz/campaign.h"

#include <zoa/interp.h>
#include <zoa/text.h>
#include <zoa/verify.h>

#include <iostream>
#include <ostream>
#include <sstream>

namespace ZOA::fuzz {

namespace {

// The DOT dump writes its node statistics to standard output: keep them out of the log.
struct QuietStdout {
    std::ostringstream sink;
    std::streambuf* saved = std::cout.rdbuf(sink.rdbuf());
    ~QuietStdout() { std::cout.rdbuf(saved); }
};

void allOutputs(const std::string& text, const text::Flavour& flavour) {
    text::Result r = text::parse(text, "odd.zoa", flavour);
    if (!r.ok()) return;
    std::ostringstream os;
    r.unit()->decompile(os);
}

}  // namespace

unsigned runCrash(std::uint64_t firstSeed, unsigned seeds, std::ostream* log) {
    unsigned done = 0;
    for (unsigned i = 0; i < seeds; ++i) {
        std::uint64_t seed = firstSeed + i;
        Generated g = generate(seed, Mode::ODD, "o" + std::to_string(seed) + "_");
        ZOA_file& unit = *g.unit;
        std::ostringstream os;
        {
            QuietStdout quiet;
            unit.dumpDot(os);
        }
        unit.dumpAscii(os);
        std::string text = text::write(unit);
        verify::verify(unit);
        interp::Options o;
        o.maxSteps = 100000;
        interp::Machine m(unit, o);
        for (const Entry& e : g.entries) {
            std::vector<interp::Value> args;
            for (DataType p : e.params) args.push_back(interp::Value::integer(p, 3));
            m.call(e.name, args);
        }
        unit.decompile(os);  // forgets the unit: everything else first
        // The same tree written back, in each flavour.
        allOutputs(text, {true, false});
        allOutputs(text, {false, false});
        allOutputs(text, {true, true});
        ++done;
        if (log && (i + 1) % 500 == 0) *log << (i + 1) << " odd units\n" << std::flush;
    }
    return done;
}

}  // namespace ZOA::fuzz
