// Crash campaign: odd trees through every output; only crashes count.
#include "fuzz/campaign.h"
#include "fuzz/quiet_stdout.h"

#include <zoa/interp.h>
#include <zoa/text.h>
#include <zoa/verify.h>

#include <ostream>

namespace ZOA::fuzz {

namespace {

void decompileText(const std::string& text, const text::Flavour& flavour) {
    text::Result r = text::parse(text, "odd.zoa", flavour);
    if (!r.ok()) return;
    Discard sink;
    std::ostream os(&sink);
    r.unit()->decompile(os);
}

}  // namespace

unsigned runCrash(std::uint64_t firstSeed, unsigned seeds, std::ostream* log) {
    unsigned done = 0;
    for (unsigned i = 0; i < seeds; ++i) {
        std::uint64_t seed = firstSeed + i;
        std::string prefix = "o" + std::to_string(seed) + "_";
        Generated g = generate(seed, Mode::ODD, prefix);
        ZOA_file& unit = *g.unit;
        Discard sink;
        std::ostream os(&sink);
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
        // The tree read back from its text, as MSVC C; the tree with its shared
        // subtrees made again for the assembly output (parsing is the slow part,
        // so only one flavour goes through the reader).
        decompileText(text, {false, false});
        {
            QuietStdout quiet;  // the assembly output's per-subprogram note
            generate(seed, Mode::ODD, prefix, 0, Target{true, true}).unit->decompile(os);
        }
        {  // and for the sound assembly back end
            Generated s = generate(seed, Mode::ODD, prefix, 0, Target{true, true});
            s.unit->setProfile(Profile::SOUND);
            s.unit->decompile(os);
        }
        ++done;
        if (log && (i + 1) % 500 == 0) *log << (i + 1) << " odd units\n" << std::flush;
    }
    return done;
}

}  // namespace ZOA::fuzz
