// A corpus of small real programs built through the public API, with the C
// that checks what each must compute once compiled.
#ifndef ZOA_TESTS_EMIT_C_CORPUS_H
#define ZOA_TESTS_EMIT_C_CORPUS_H

#include <zoa/zoa_file.h>

#include <string>
#include <vector>

namespace ZOA::corpus {

struct Program {
    const char* name;
    // Builds the program into a fresh unit.
    void (*build)(ZOA_file& unit);
    // C appended to the GCC text: defines void check_<name>(report) calling
    // report(label, value) for each result.
    const char* check;
    // The lines "label=value" the checks must report, in order.
    const char* expected;
};

const std::vector<Program>& programs();

// The program built into a fresh unit of the given flavour, decompiled.
std::string decompiled(const Program& p, bool isGcc);

// C defined outside the units (functions and data the units refer to by name).
extern const char* const externals;

}  // namespace ZOA::corpus

#endif
