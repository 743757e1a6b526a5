// Speed of the text form: reading back (and writing) the text of workload W.
#include "workload.h"

#include <zoa/text.h>

#include <benchmark/benchmark.h>

#include <string>

using namespace ZOA;

namespace {

std::string workloadText(const bench::Shape& shape) {
    ZOA_file unit(true, false);
    bench::buildWorkload(unit, shape);
    return text::write(unit);
}

void setCounters(benchmark::State& state, const bench::Shape& shape) {
    state.counters["ns/stmt"] = benchmark::Counter(
        static_cast<double>(shape.totalStatements()) * static_cast<double>(state.iterations()),
        benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_ReadText(benchmark::State& state) {
    bench::Shape shape{static_cast<int>(state.range(0)), static_cast<int>(state.range(1)),
                       static_cast<int>(state.range(2))};
    const std::string source = workloadText(shape);
    for (auto _ : state) {
        text::Result r = text::parse(source, "w.zoa");
        if (!r.ok()) state.SkipWithError("the workload's text does not read back");
        benchmark::DoNotOptimize(r.unit());
    }
    setCounters(state, shape);
    state.SetBytesProcessed(static_cast<long long>(source.size()) * static_cast<long long>(state.iterations()));
}

void BM_WriteText(benchmark::State& state) {
    bench::Shape shape{static_cast<int>(state.range(0)), static_cast<int>(state.range(1)),
                       static_cast<int>(state.range(2))};
    ZOA_file unit(true, false);
    bench::buildWorkload(unit, shape);
    for (auto _ : state) benchmark::DoNotOptimize(text::write(unit));
    setCounters(state, shape);
}

}  // namespace

BENCHMARK(BM_ReadText)->Args({10, 100, 10})->Args({100, 100, 10})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_WriteText)->Args({10, 100, 10})->Unit(benchmark::kMillisecond);
BENCHMARK_MAIN();
