// Speed of the main job on workload W: reading its text, verifying, writing the text and C, the whole pipeline.
#include "workload.h"

#include <zoa/text.h>
#include <zoa/verify.h>
#include <zoa/zoa.h>

#include <benchmark/benchmark.h>

#include <ostream>
#include <string>

using namespace ZOA;

namespace {

bench::Shape shapeOf(const benchmark::State& state) {
    return {static_cast<int>(state.range(0)), static_cast<int>(state.range(1)), static_cast<int>(state.range(2))};
}

std::string workloadText(const bench::Shape& shape) {
    ZOA_file unit(true, false);
    bench::buildWorkload(unit, shape);
    return text::write(unit);
}

void perStatement(benchmark::State& state, const bench::Shape& shape) {
    state.counters["ns/stmt"] = benchmark::Counter(
        static_cast<double>(shape.totalStatements()) * static_cast<double>(state.iterations()),
        benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

// text::parse of W's text.
void BM_Read(benchmark::State& state) {
    bench::Shape shape = shapeOf(state);
    const std::string source = workloadText(shape);
    for (auto _ : state) {
        text::Result r = text::parse(source, "w.zoa");
        if (!r.ok()) state.SkipWithError("the workload's text does not read back");
        benchmark::DoNotOptimize(r.unit());
    }
    perStatement(state, shape);
    state.SetBytesProcessed(static_cast<long long>(source.size()) * static_cast<long long>(state.iterations()));
}

// verify::verify of W as read from its text.
void BM_Verify(benchmark::State& state) {
    bench::Shape shape = shapeOf(state);
    text::Result r = text::parse(workloadText(shape), "w.zoa");
    for (auto _ : state) benchmark::DoNotOptimize(verify::verify(*r.unit()));
    perStatement(state, shape);
}

// text::write of W into a sink kept across runs.
void BM_WriteText(benchmark::State& state) {
    bench::Shape shape = shapeOf(state);
    ZOA_file unit(true, false);
    bench::buildWorkload(unit, shape);
    bench::StringSink sink;
    std::ostream os(&sink);
    text::write(os, unit);  // sizes the sink
    for (auto _ : state) {
        sink.clear();
        text::write(os, unit);
        benchmark::DoNotOptimize(sink.text.data());
    }
    perStatement(state, shape);
    state.SetBytesProcessed(static_cast<long long>(sink.text.size()) * static_cast<long long>(state.iterations()));
}

// decompile (C, GCC flavour) of W, beside the text writer in the same run; a
// unit is output once, so each run builds one, untimed.
void BM_WriteC(benchmark::State& state) {
    bench::Shape shape = shapeOf(state);
    bench::StringSink sink;
    std::ostream os(&sink);
    {  // sizes the sink
        ZOA_file unit(true, false);
        bench::buildWorkload(unit, shape);
        unit.decompile(os);
    }
    for (auto _ : state) {
        state.PauseTiming();
        ZOA_file unit(true, false);
        bench::buildWorkload(unit, shape);
        sink.clear();
        state.ResumeTiming();
        unit.decompile(os);
    }
    perStatement(state, shape);
    state.SetBytesProcessed(static_cast<long long>(sink.text.size()) * static_cast<long long>(state.iterations()));
}

// What `zoa --emit=c` does with W's text in memory: read, verify, write C.
void BM_Pipeline(benchmark::State& state) {
    bench::Shape shape = shapeOf(state);
    const std::string source = workloadText(shape);
    bench::StringSink sink;
    std::ostream os(&sink);
    for (auto _ : state) {
        sink.clear();
        text::Result r = text::parse(source, "w.zoa");
        if (!r.ok() || !verify::verify(*r.unit()).empty()) state.SkipWithError("the workload does not read and verify");
        r.unit()->decompile(os);
        benchmark::DoNotOptimize(sink.text.data());
    }
    perStatement(state, shape);
}

void shapes(benchmark::internal::Benchmark* b) {
    b->Args({10, 100, 10})->Args({100, 100, 10})->Args({300, 100, 10})->Unit(benchmark::kMillisecond);
}

}  // namespace

BENCHMARK(BM_Read)->Apply(shapes);
BENCHMARK(BM_Verify)->Apply(shapes);
BENCHMARK(BM_WriteText)->Apply(shapes);
BENCHMARK(BM_WriteC)->Apply(shapes);
BENCHMARK(BM_Pipeline)->Apply(shapes);

int main(int argc, char** argv) {
    bench::keepHeapMapped();
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
