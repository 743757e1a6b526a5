// zoa-fuzz: differential campaigns (interpreter against gcc -m32) and crash campaigns.
#include "fuzz/campaign.h"

#include <cstdlib>
#include <iostream>
#include <string>

namespace {

const char* const usage =
    "usage: zoa-fuzz [--mode=c|asm|sound-asm|crash] [--seed=N] [--count=N] [--batch=N] [--levels=-O0,-O2]\n"
    "                [--workdir=DIR] [--shrink=N] [--profile=exact|sound]\n"
    "Generates units from seeds N.. and checks them. c and asm: interprets every\n"
    "subprogram, compiles the unit's output with gcc -m32 and compares; failing\n"
    "seeds are written to DIR as text and shrunk. sound-asm: the c mode's units\n"
    "written by the sound assembly back end, assembled, linked and compared.\n"
    "crash: odd trees through every output.\n"
    "Exit status: 0 no failure, 1 failures, 2 bad usage.\n";

}  // namespace

int main(int argc, char** argv) {
    ZOA::fuzz::CampaignOptions o;
    std::string mode = "c";
    for (int i = 1; i < argc; ++i) {
        std::string a = argv[i];
        auto value = [&](const char* key) { return a.rfind(key, 0) == 0 ? a.substr(std::string(key).size()) : std::string(); };
        if (a == "--help") {
            std::cout << usage;
            return 0;
        } else if (!value("--mode=").empty()) {
            mode = value("--mode=");
        } else if (!value("--seed=").empty()) {
            o.firstSeed = std::strtoull(value("--seed=").c_str(), nullptr, 10);
        } else if (!value("--count=").empty()) {
            o.seeds = static_cast<unsigned>(std::strtoul(value("--count=").c_str(), nullptr, 10));
        } else if (!value("--batch=").empty()) {
            o.batch = static_cast<unsigned>(std::strtoul(value("--batch=").c_str(), nullptr, 10));
        } else if (!value("--workdir=").empty()) {
            o.workDir = value("--workdir=");
        } else if (!value("--shrink=").empty()) {
            o.shrinkLimit = static_cast<unsigned>(std::strtoul(value("--shrink=").c_str(), nullptr, 10));
        } else if (!value("--asm-quirks=").empty()) {
            o.asmQuirks = static_cast<unsigned>(std::strtoul(value("--asm-quirks=").c_str(), nullptr, 0));
        } else if (!value("--profile=").empty()) {
            std::string p = value("--profile=");
            if (p != "exact" && p != "sound") {
                std::cerr << "zoa-fuzz: unknown profile '" << p << "'\n" << usage;
                return 2;
            }
            o.profile = p == "sound" ? ZOA::Profile::SOUND : ZOA::Profile::EXACT;
        } else if (!value("--levels=").empty()) {
            o.optLevels.clear();
            std::string l = value("--levels=");
            for (std::size_t p = 0; p != std::string::npos;) {
                std::size_t q = l.find(',', p);
                o.optLevels.push_back(l.substr(p, q == std::string::npos ? q : q - p));
                p = q == std::string::npos ? q : q + 1;
            }
        } else {
            std::cerr << "zoa-fuzz: unknown argument '" << a << "'\n" << usage;
            return 2;
        }
    }
    if (mode == "crash") {
        unsigned n = ZOA::fuzz::runCrash(o.firstSeed, o.seeds, &std::cerr);
        std::cout << n << " odd units through every output, no crash\n";
        return 0;
    }
    if (mode != "c" && mode != "asm" && mode != "sound-asm") {
        std::cerr << "zoa-fuzz: unknown mode '" << mode << "'\n" << usage;
        return 2;
    }
    o.mode = mode == "asm" ? ZOA::fuzz::Mode::ASM : ZOA::fuzz::Mode::C;
    o.soundAsm = mode == "sound-asm";
    o.log = &std::cerr;
    ZOA::fuzz::CampaignStats s = ZOA::fuzz::runDifferential(o);
    ZOA::fuzz::report(std::cout, o, s);
    return s.failures.empty() ? 0 : 1;
}
