// Workload W through LLVM 14's IRBuilder, printed with Module::print.
#include "peers.h"
#include "llvm_w.h"

#include <llvm/IR/IRBuilder.h>
#include <llvm/IR/LLVMContext.h>
#include <llvm/IR/Module.h>
#include <llvm/Support/raw_ostream.h>

#include <string>
#include <vector>

namespace ZOA::bench {

// SSA has no reusable temporaries: each statement's value is the next u.
std::unique_ptr<llvm::Module> buildLlvmW(llvm::LLVMContext& ctx, const Shape& shape) {
    auto module = std::make_unique<llvm::Module>("w", ctx);
    llvm::IRBuilder<> ir(ctx);
    llvm::Type* i32 = ir.getInt32Ty();
    llvm::FunctionType* sig = llvm::FunctionType::get(i32, {i32, i32}, false);
    std::vector<llvm::BasicBlock*> labels(static_cast<std::size_t>(shape.labels));
    for (int f = 0; f < shape.subprogs; ++f) {
        auto* fn = llvm::Function::Create(sig, llvm::Function::ExternalLinkage, "f" + std::to_string(f), *module);
        llvm::Value* a = fn->getArg(0);
        llvm::Value* b = fn->getArg(1);
        auto* start = llvm::BasicBlock::Create(ctx, "", fn);
        for (auto*& l : labels) l = llvm::BasicBlock::Create(ctx, "", fn);
        auto* ret = llvm::BasicBlock::Create(ctx, "", fn);
        ir.SetInsertPoint(start);
        ir.CreateBr(labels.empty() ? ret : labels.front());
        for (int l = 0; l < shape.labels; ++l) {
            ir.SetInsertPoint(labels[static_cast<std::size_t>(l)]);
            llvm::Value* u = a;
            for (int s = 0; s < shape.statements; ++s)
                u = ir.CreateNSWMul(ir.CreateNSWAdd(u, a), ir.getInt32(3));
            if (l + 1 < shape.labels)
                ir.CreateCondBr(ir.CreateICmpSLT(u, b), labels[static_cast<std::size_t>(l) + 1], ret);
            else
                ir.CreateBr(ret);
        }
        ir.SetInsertPoint(ret);
        ir.CreateRet(a);
    }
    return module;
}

PhaseTimes runLlvm(const Shape& shape) {
    PhaseTimes times;
    llvm::LLVMContext ctx;
    double t0 = nowNs();
    std::unique_ptr<llvm::Module> module = buildLlvmW(ctx, shape);
    double t1 = nowNs();
    static std::string text;  // reused across runs: its capacity stays
    text.clear();
    llvm::raw_string_ostream os(text);
    module->print(os, nullptr);
    os.flush();
    double t2 = nowNs();
    times.buildNs = t1 - t0;
    times.printNs = t2 - t1;
    times.bytes = text.size();
    return times;
}

}  // namespace ZOA::bench
