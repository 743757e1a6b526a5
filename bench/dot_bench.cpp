// Speed of ZOA_file::dumpDot on subprograms with many distinct temporaries.
#include <zoa/zoa.h>

#include <benchmark/benchmark.h>

#include <iostream>
#include <streambuf>
#include <vector>

using namespace ZOA;

namespace {

// Swallows everything, so that only the dump's own work is measured.
class NullBuf : public std::streambuf {
protected:
    int_type overflow(int_type c) override { return traits_type::not_eof(c); }
    std::streamsize xsputn(const char*, std::streamsize n) override { return n; }
};

// t_0 = 0; t_i = t_{i-1} + i, spread over ten labels that jump from one to the next.
void buildChain(ZOA_file& unit, unsigned n) {
    SUBPROG* sp = unit.createSubprog(INT_S, "chain", false);
    std::vector<TEMP*> temps;
    temps.reserve(n);
    // Argument temps: made in constant time, where the pool's getTemp scans
    // every temp made before and would make the set-up quadratic.
    for (unsigned i = 0; i < n; ++i) temps.push_back(sp->getArgTemp(INT_S));
    const unsigned labelCount = 10;
    std::vector<LABEL*> labels{sp->getStartLabel()};
    for (unsigned j = 1; j < labelCount; ++j) labels.push_back(sp->createNewLabel(REGULAR_LABEL));
    for (unsigned i = 0; i < n; ++i) {
        LABEL* l = labels[static_cast<std::size_t>(i) * labelCount / n];
        ExprBase* value = i == 0 ? static_cast<ExprBase*>(new CONST(0))
                                 : new BINOP(INT_S, PLUS, temps[i - 1], new CONST(static_cast<int>(i)));
        l->addStmt(new MOVE(temps[i], value));
    }
    for (unsigned j = 0; j < labelCount; ++j)
        labels[j]->addStmt(new JUMP(j + 1 < labelCount ? labels[j + 1] : sp->getReturnLabel()));
    sp->getReturnLabel()->addStmt(new MOVE(sp->getReturnTemp(), temps[n - 1]));
}

void BM_DumpDot(benchmark::State& state) {
    const auto n = static_cast<unsigned>(state.range(0));
    ZOA_file unit(true, false);
    buildChain(unit, n);
    NullBuf sink;
    std::ostream out(&sink);
    std::streambuf* saved = std::cout.rdbuf(&sink);  // the statistics, too
    for (auto _ : state) unit.dumpDot(out);
    std::cout.rdbuf(saved);
    state.SetComplexityN(state.range(0));
    // Time per temporary (each brings a MOVE, a BINOP and a CONST along).
    state.counters["per_temp"] =
        benchmark::Counter(static_cast<double>(n), benchmark::Counter::kIsIterationInvariantRate |
                                                       benchmark::Counter::kInvert);
}

}  // namespace

BENCHMARK(BM_DumpDot)->Arg(1000)->Arg(10000)->Arg(100000)->Complexity(benchmark::oN)->Unit(benchmark::kMicrosecond);
