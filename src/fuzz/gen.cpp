// The random-unit generator: one builder per mode.
#include "fuzz/gen.h"

#include "fuzz/gen_asm.h"
#include "fuzz/gen_c.h"
#include "fuzz/gen_odd.h"

namespace ZOA::fuzz {

Generated generate(std::uint64_t seed, Mode mode, const std::string& prefix, unsigned asmQuirks) {
    return generate(seed, mode, prefix, asmQuirks, Target{true, mode == Mode::ASM});
}

Generated generate(std::uint64_t seed, Mode mode, const std::string& prefix, unsigned asmQuirks, Target target) {
    switch (mode) {
        case Mode::ASM: return AsmBuilder(seed, prefix, asmQuirks, target).build();
        case Mode::ODD: return OddBuilder(seed, prefix, asmQuirks, target).build();
        case Mode::C: break;
    }
    return CBuilder(seed, prefix, asmQuirks, target).build();
}

}  // namespace ZOA::fuzz
