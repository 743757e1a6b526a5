// The assembly corpus: units the emitter translates, with their C drivers.
#ifndef ZOA_TESTS_EMIT_X86_CORPUS_H
#define ZOA_TESTS_EMIT_X86_CORPUS_H

#include <zoa/zoa_file.h>

#include <vector>

namespace ZOA::asmcorpus {

struct Unit {
    const char* name;
    void (*build)(ZOA_file& unit);
    const char* driver;    // C main; empty: text only
    const char* expected;  // what the driver prints
};

const std::vector<Unit>& units();

}  // namespace ZOA::asmcorpus

#endif
