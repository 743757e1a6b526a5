// libZOA, LLVM 14 and libgccjit 12 on workload W in one run: medians per statement, ratios.
#include "peers.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <iostream>
#include <sstream>
#include <string>
#include <vector>

#include <unistd.h>

namespace ZOA::bench {

namespace {

enum class ZoaOutput { C, ASCII, DOT };

PhaseTimes runZoa(const Shape& shape, ZoaOutput what) {
    PhaseTimes times;
    double t0 = nowNs();
    ZOA_file unit(true, false);
    buildWorkload(unit, shape);
    double t1 = nowNs();
    static StringSink sink;  // reused across runs, as LLVM's output string is
    sink.clear();
    std::ostream os(&sink);
    double t2 = nowNs();
    switch (what) {
    case ZoaOutput::C: unit.decompile(os); break;
    case ZoaOutput::ASCII: unit.dumpAscii(os); break;
    case ZoaOutput::DOT: unit.dumpDot(os); break;
    }
    double t3 = nowNs();
    times.buildNs = t1 - t0;
    times.printNs = t3 - t2;
    times.bytes = sink.text.size();
    return times;
}

double median(std::vector<double> v) {
    std::sort(v.begin(), v.end());
    std::size_t n = v.size();
    return n % 2 ? v[n / 2] : (v[n / 2 - 1] + v[n / 2]) / 2;
}

// Medians over the repetitions of build, print and build + print, per statement.
struct Row {
    std::string name;
    double build, print, total, bytes;
};

Row measure(const std::string& name, int reps, double statements, const std::function<PhaseTimes()>& run) {
    std::vector<double> b, p, t;
    std::size_t bytes = 0;
    run();  // warm-up: caches, page faults, lazy binding
    for (int i = 0; i < reps; ++i) {
        PhaseTimes x = run();
        b.push_back(x.buildNs / statements);
        p.push_back(x.printNs / statements);
        t.push_back((x.buildNs + x.printNs) / statements);
        bytes = x.bytes;
    }
    return Row{name, median(b), median(p), median(t), static_cast<double>(bytes) / statements};
}

}  // namespace
}  // namespace ZOA::bench

// usage: zoa_peers [F B S [repetitions]]
int main(int argc, char** argv) {
    using namespace ZOA::bench;
    Shape shape{argc > 3 ? std::atoi(argv[1]) : 100, argc > 3 ? std::atoi(argv[2]) : 100,
                argc > 3 ? std::atoi(argv[3]) : 10};
    int reps = argc > 4 ? std::atoi(argv[4]) : 11;
    keepHeapMapped();
    double n = static_cast<double>(shape.totalStatements());
    std::string dumpPath = "/tmp/zoa_peers_gccjit_" + std::to_string(getpid()) + ".c";

    // dumpDot writes node statistics to std::cout: send them away while measuring.
    std::ostringstream statistics;
    std::streambuf* saved = std::cout.rdbuf(statistics.rdbuf());
    std::vector<Row> rows;
    rows.push_back(measure("libZOA build + decompile C (GCC)", reps, n, [&] { return runZoa(shape, ZoaOutput::C); }));
    rows.push_back(measure("libZOA build + dumpAscii", reps, n, [&] { return runZoa(shape, ZoaOutput::ASCII); }));
    rows.push_back(measure("libZOA build + dumpDot", reps, n, [&] { return runZoa(shape, ZoaOutput::DOT); }));
    rows.push_back(measure("LLVM 14 IRBuilder + Module::print", reps, n, [&] { return runLlvm(shape); }));
    rows.push_back(measure("libgccjit 12 build + dump_to_file", reps, n, [&] { return runGccJit(shape, dumpPath.c_str()); }));
    std::cout.rdbuf(saved);
    std::remove(dumpPath.c_str());

    const Row& zoa = rows.front();
    std::printf("W(%d,%d,%d) = %lld statements, median of %d runs, ns per statement\n\n", shape.subprogs,
                shape.labels, shape.statements, shape.totalStatements(), reps);
    std::printf("| %-36s | %8s | %8s | %8s | %11s | %17s |\n", "contender", "build", "print", "total", "bytes/stmt",
                "total / libZOA C");
    std::printf("|%s|%s|%s|%s|%s|%s|\n", std::string(38, '-').c_str(), std::string(10, '-').c_str(),
                std::string(10, '-').c_str(), std::string(10, '-').c_str(), std::string(13, '-').c_str(),
                std::string(19, '-').c_str());
    for (const Row& r : rows)
        std::printf("| %-36s | %8.1f | %8.1f | %8.1f | %11.1f | %16.1fx |\n", r.name.c_str(), r.build, r.print,
                    r.total, r.bytes, r.total / zoa.total);
    std::printf("\nLLVM build + print is %.1fx libZOA build + C; libgccjit build + dump is %.1fx.\n",
                rows[3].total / zoa.total, rows[4].total / zoa.total);
    return 0;
}
