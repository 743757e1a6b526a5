// Workload W(F,B,S): F subprograms of B labels of S arithmetic moves each.
#ifndef ZOA_BENCH_WORKLOAD_H
#define ZOA_BENCH_WORKLOAD_H

#include <zoa/zoa.h>

namespace ZOA::bench {

struct Shape {
    int subprogs;     // F
    int labels;       // B, regular labels per subprogram
    int statements;   // S, moves per label
    long long totalStatements() const { return static_cast<long long>(subprogs) * labels * statements; }
};

// Builds W into unit: int fN(int a, int b), each label S moves
// v = (u + a) * 3 over a rotating set of eight temporaries, then a
// conditional jump on v < b to the next label or the return label.
void buildWorkload(ZOA_file& unit, const Shape& shape);

// Keeps freed heap memory mapped (no mmap for large blocks, no trimming), so that
// repeated runs measure the code rather than the kernel's page faults on the
// megabytes of fresh output buffer each run would otherwise touch.
void keepHeapMapped();

}  // namespace ZOA::bench

#endif
