// W as an LLVM 14 module, built with IRBuilder (the same functions as bench/workload.cpp builds).
#ifndef ZOA_BENCH_LLVM_W_H
#define ZOA_BENCH_LLVM_W_H

#include "workload.h"

#include <llvm/IR/LLVMContext.h>
#include <llvm/IR/Module.h>

#include <memory>

namespace ZOA::bench {

std::unique_ptr<llvm::Module> buildLlvmW(llvm::LLVMContext& ctx, const Shape& shape);

}  // namespace ZOA::bench

#endif
