// A corpus of small real programs built through the public API, with the C
// that checks what each must compute once compiled.
#ifndef ZOA_TESTS_EMIT_C_CORPUS_H
#define ZOA_TESTS_EMIT_C_CORPUS_H

#include <string>
#include <vector>

namespace ZOA::corpus {

struct Program {
    const char* name;
    // Builds the unit in a fresh ZOA_file and returns its decompiled C.
    std::string (*build)(bool isGcc);
    // C appended to the GCC text: defines void check_<name>(report) calling
    // report(label, value) for each result.
    const char* check;
    // The lines "label=value" the checks must report, in order.
    const char* expected;
};

const std::vector<Program>& programs();

// C defined outside the units (functions and data the units refer to by name).
extern const char* const externals;

}  // namespace ZOA::corpus

#endif
