// Build and output speed on workload W, per statement, for every output.
#include "workload.h"

#include <benchmark/benchmark.h>

#include <iostream>
#include <sstream>
#include <streambuf>
#include <string>

namespace {

using namespace ZOA;
using ZOA::bench::Shape;

// Swallows everything; counts the bytes.
class CountingBuf : public std::streambuf {
public:
    std::size_t bytes = 0;

protected:
    std::streamsize xsputn(const char*, std::streamsize n) override {
        bytes += static_cast<std::size_t>(n);
        return n;
    }
    int overflow(int c) override {
        if (c != traits_type::eof()) ++bytes;
        return c;
    }
};

// Statistics and diagnostics that go to std::cout are sent away while measuring.
class QuietStdout {
public:
    QuietStdout() : saved(std::cout.rdbuf(&sink)) {}
    ~QuietStdout() { std::cout.rdbuf(saved); }

private:
    CountingBuf sink;
    std::streambuf* saved;
};

Shape shapeOf(const benchmark::State& state) {
    return Shape{static_cast<int>(state.range(0)), static_cast<int>(state.range(1)), static_cast<int>(state.range(2))};
}

void report(benchmark::State& state, const Shape& shape, std::size_t bytesPerIteration) {
    // Seconds per statement (printed with an SI suffix: "75n" is 75 ns).
    state.counters["per_stmt"] = benchmark::Counter(static_cast<double>(shape.totalStatements()),
                                                    benchmark::Counter::kIsIterationInvariantRate |
                                                        benchmark::Counter::kInvert);
    state.SetBytesProcessed(static_cast<int64_t>(bytesPerIteration) * state.iterations());
}

void BM_Build(benchmark::State& state) {
    Shape shape = shapeOf(state);
    for (auto _ : state) {
        ZOA_file unit(true, false);
        bench::buildWorkload(unit, shape);
        benchmark::DoNotOptimize(unit.getMemoryUsage());
    }
    report(state, shape, 0);
}

enum Output { C_GCC, ASM, SOUND_ASM, ASCII, DOT };

template <Output K> void write(ZOA_file& unit, std::ostream& os) {
    switch (K) {
    case C_GCC:
    case ASM:
    case SOUND_ASM: unit.decompile(os); break;
    case ASCII: unit.dumpAscii(os); break;
    case DOT: unit.dumpDot(os); break;
    }
}

template <Output K> void BM_Output(benchmark::State& state) {
    Shape shape = shapeOf(state);
    QuietStdout quiet;
    std::size_t bytes = 0;
    bench::StringSink sink;
    std::ostream os(&sink);
    {
        // One untimed run sizes the string: a single iteration of a large W
        // would otherwise measure the kernel faulting in fresh pages.
        ZOA_file unit(true, K == ASM || K == SOUND_ASM, K == SOUND_ASM ? Profile::SOUND : Profile::EXACT);
        bench::buildWorkload(unit, shape);
        write<K>(unit, os);
    }
    for (auto _ : state) {
        state.PauseTiming();
        ZOA_file unit(true, K == ASM || K == SOUND_ASM, K == SOUND_ASM ? Profile::SOUND : Profile::EXACT);
        bench::buildWorkload(unit, shape);
        sink.clear();
        state.ResumeTiming();
        write<K>(unit, os);
        state.PauseTiming();
        bytes = sink.text.size();
        state.ResumeTiming();
        if (bytes == 0) {
            // An output that writes nothing would spin through millions of builds.
            state.SkipWithError("the output wrote nothing");
            break;
        }
    }
    report(state, shape, bytes);
}

void shapes(benchmark::internal::Benchmark* b) {
    b->Args({10, 100, 10})->Args({100, 100, 10})->Args({1000, 100, 10})->Unit(benchmark::kMillisecond);
}

BENCHMARK(BM_Build)->Apply(shapes);
BENCHMARK_TEMPLATE(BM_Output, C_GCC)->Apply(shapes);
BENCHMARK_TEMPLATE(BM_Output, ASM)->Apply(shapes);
BENCHMARK_TEMPLATE(BM_Output, SOUND_ASM)->Apply(shapes);
BENCHMARK_TEMPLATE(BM_Output, ASCII)->Apply(shapes);
BENCHMARK_TEMPLATE(BM_Output, DOT)->Apply(shapes);

}  // namespace

int main(int argc, char** argv) {
    ZOA::bench::keepHeapMapped();
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
