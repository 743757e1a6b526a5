// The peers' versions of workload W: build it, then print it, each phase timed apart.
#ifndef ZOA_BENCH_PEERS_H
#define ZOA_BENCH_PEERS_H

#include "workload.h"

#include <chrono>
#include <cstddef>

namespace ZOA::bench {

// Nanoseconds of one build and of one print of W, and the bytes printed.
struct PhaseTimes {
    double buildNs = 0;
    double printNs = 0;
    std::size_t bytes = 0;
};

// LLVM 14: IRBuilder, then Module::print into a std::string.
PhaseTimes runLlvm(const Shape& shape);
// libgccjit 12: the C API, then gcc_jit_context_dump_to_file.
PhaseTimes runGccJit(const Shape& shape, const char* dumpPath);

inline double nowNs() {
    return static_cast<double>(
        std::chrono::duration_cast<std::chrono::nanoseconds>(std::chrono::steady_clock::now().time_since_epoch())
            .count());
}

}  // namespace ZOA::bench

#endif
