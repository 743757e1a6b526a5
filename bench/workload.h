// Workload W(F,B,S): F subprograms of B labels of S arithmetic moves each.
#ifndef ZOA_BENCH_WORKLOAD_H
#define ZOA_BENCH_WORKLOAD_H

#include <zoa/zoa.h>

#include <streambuf>
#include <string>

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

// A stream buffer that appends to a string kept across runs: clear() keeps the
// capacity, so repeated runs measure writing the text, not growing the string
// and faulting in its pages again (outputs of W reach hundreds of megabytes).
class StringSink : public std::streambuf {
public:
    std::string text;
    void clear() { text.clear(); }

protected:
    std::streamsize xsputn(const char* s, std::streamsize n) override {
        text.append(s, static_cast<std::size_t>(n));
        return n;
    }
    int overflow(int c) override {
        if (c != traits_type::eof()) text.push_back(static_cast<char>(c));
        return c;
    }
};

// Keeps freed heap memory mapped (mmap only above 32 MB, no trimming), so that
// repeated runs measure the code rather than the kernel's page faults on the
// megabytes of fresh output buffer each run would otherwise touch.
void keepHeapMapped();

}  // namespace ZOA::bench

#endif
