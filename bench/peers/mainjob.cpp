// The main job beside LLVM: writes W as LLVM IR and as libZOA's text, then times reading each in process.
#include "llvm_w.h"
#include "peers.h"

#include <zoa/text.h>
#include <zoa/verify.h>
#include <zoa/zoa.h>

#include <llvm/AsmParser/Parser.h>
#include <llvm/IR/LLVMContext.h>
#include <llvm/IR/Module.h>
#include <llvm/Support/SourceMgr.h>
#include <llvm/Support/raw_ostream.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <ostream>
#include <string>
#include <vector>

using namespace ZOA;

namespace {

double median(std::vector<double> v) {
    std::sort(v.begin(), v.end());
    return v[v.size() / 2];
}

void save(const std::string& path, const std::string& text) {
    std::ofstream out(path, std::ios::binary);
    out << text;
    if (!out) {
        std::fprintf(stderr, "cannot write %s\n", path.c_str());
        std::exit(1);
    }
}

}  // namespace

// usage: zoa_mainjob F B S repetitions directory
// Writes directory/w.ll and directory/w.zoa and prints, per statement, the
// medians of LLVM's parseAssemblyString and of text::parse, verify::verify and
// decompile (C) on what was read.
int main(int argc, char** argv) {
    if (argc != 6) {
        std::fprintf(stderr, "usage: %s F B S repetitions directory\n", argv[0]);
        return 2;
    }
    bench::Shape shape{std::atoi(argv[1]), std::atoi(argv[2]), std::atoi(argv[3])};
    int reps = std::max(1, std::atoi(argv[4]));
    std::string dir = argv[5];
    bench::keepHeapMapped();

    std::string ll, zoa;
    {
        llvm::LLVMContext ctx;
        llvm::raw_string_ostream os(ll);
        bench::buildLlvmW(ctx, shape)->print(os, nullptr);
    }
    {
        ZOA_file unit(true, false);
        bench::buildWorkload(unit, shape);
        zoa = text::write(unit);
    }
    save(dir + "/w.ll", ll);
    save(dir + "/w.zoa", zoa);

    std::vector<double> llvmParse, zoaParse, zoaVerify, zoaC;
    bench::StringSink sink;
    std::ostream os(&sink);
    for (int r = 0; r < reps; ++r) {
        {
            llvm::LLVMContext ctx;
            llvm::SMDiagnostic err;
            double t0 = bench::nowNs();
            std::unique_ptr<llvm::Module> m = llvm::parseAssemblyString(ll, err, ctx);
            llvmParse.push_back(bench::nowNs() - t0);
            if (!m) {
                err.print("w.ll", llvm::errs());
                return 1;
            }
        }
        sink.clear();
        double t0 = bench::nowNs();
        text::Result result = text::parse(zoa, "w.zoa");
        double t1 = bench::nowNs();
        if (!result.ok()) {
            std::fprintf(stderr, "%s\n", text::format(result.diagnostics().front()).c_str());
            return 1;
        }
        std::size_t findings = verify::verify(*result.unit()).size();
        double t2 = bench::nowNs();
        result.unit()->decompile(os);
        double t3 = bench::nowNs();
        if (findings) return 1;
        zoaParse.push_back(t1 - t0);
        zoaVerify.push_back(t2 - t1);
        zoaC.push_back(t3 - t2);
    }
    double n = static_cast<double>(shape.totalStatements());
    double lp = median(llvmParse) / n, zp = median(zoaParse) / n;
    std::printf("W(%d,%d,%d) = %.0f statements; w.ll %zu bytes, w.zoa %zu bytes; medians of %d runs, ns per statement\n",
                shape.subprogs, shape.labels, shape.statements, n, ll.size(), zoa.size(), reps);
    std::printf("| in process | ns/stmt | / LLVM parseAssemblyString |\n|---|---:|---:|\n");
    std::printf("| LLVM 14 parseAssemblyString | %.1f | 1.00x |\n", lp);
    std::printf("| libZOA text::parse | %.1f | %.2fx |\n", zp, zp / lp);
    std::printf("| libZOA verify::verify | %.1f | %.2fx |\n", median(zoaVerify) / n, median(zoaVerify) / n / lp);
    std::printf("| libZOA decompile (C) | %.1f | %.2fx |\n", median(zoaC) / n, median(zoaC) / n / lp);
    return 0;
}
