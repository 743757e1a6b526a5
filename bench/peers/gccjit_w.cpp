// Workload W through libgccjit 12's C API, dumped with gcc_jit_context_dump_to_file.
#include "peers.h"

#include <libgccjit.h>

#include <sys/stat.h>

#include <string>
#include <vector>

namespace ZOA::bench {

PhaseTimes runGccJit(const Shape& shape, const char* dumpPath) {
    PhaseTimes times;
    double t0 = nowNs();
    gcc_jit_context* ctx = gcc_jit_context_acquire();
    gcc_jit_type* i32 = gcc_jit_context_get_type(ctx, GCC_JIT_TYPE_INT);
    gcc_jit_rvalue* three = gcc_jit_context_new_rvalue_from_int(ctx, i32, 3);
    std::vector<gcc_jit_block*> labels(static_cast<std::size_t>(shape.labels));
    for (int f = 0; f < shape.subprogs; ++f) {
        gcc_jit_param* params[2] = {gcc_jit_context_new_param(ctx, nullptr, i32, "a"),
                                    gcc_jit_context_new_param(ctx, nullptr, i32, "b")};
        std::string name = "f" + std::to_string(f);
        gcc_jit_function* fn = gcc_jit_context_new_function(ctx, nullptr, GCC_JIT_FUNCTION_EXPORTED, i32,
                                                            name.c_str(), 2, params, 0);
        gcc_jit_rvalue* a = gcc_jit_param_as_rvalue(params[0]);
        gcc_jit_rvalue* b = gcc_jit_param_as_rvalue(params[1]);
        gcc_jit_lvalue* pool[8];
        for (int i = 0; i < 8; ++i) pool[i] = gcc_jit_function_new_local(fn, nullptr, i32, ("t" + std::to_string(i)).c_str());
        gcc_jit_block* start = gcc_jit_function_new_block(fn, nullptr);
        for (auto*& l : labels) l = gcc_jit_function_new_block(fn, nullptr);
        gcc_jit_block* ret = gcc_jit_function_new_block(fn, nullptr);
        gcc_jit_block_end_with_jump(start, nullptr, labels.empty() ? ret : labels.front());
        int rotate = 0;
        for (int l = 0; l < shape.labels; ++l) {
            gcc_jit_block* blk = labels[static_cast<std::size_t>(l)];
            gcc_jit_rvalue* u = a;
            for (int s = 0; s < shape.statements; ++s) {
                gcc_jit_lvalue* v = pool[rotate++ & 7];
                gcc_jit_rvalue* sum = gcc_jit_context_new_binary_op(ctx, nullptr, GCC_JIT_BINARY_OP_PLUS, i32, u, a);
                gcc_jit_block_add_assignment(
                    blk, nullptr, v, gcc_jit_context_new_binary_op(ctx, nullptr, GCC_JIT_BINARY_OP_MULT, i32, sum, three));
                u = gcc_jit_lvalue_as_rvalue(v);
            }
            if (l + 1 < shape.labels)
                gcc_jit_block_end_with_conditional(blk, nullptr,
                                                   gcc_jit_context_new_comparison(ctx, nullptr, GCC_JIT_COMPARISON_LT, u, b),
                                                   labels[static_cast<std::size_t>(l) + 1], ret);
            else
                gcc_jit_block_end_with_jump(blk, nullptr, ret);
        }
        gcc_jit_block_end_with_return(ret, nullptr, a);
    }
    double t1 = nowNs();
    gcc_jit_context_dump_to_file(ctx, dumpPath, 0);
    double t2 = nowNs();
    gcc_jit_context_release(ctx);
    struct stat st {};
    if (stat(dumpPath, &st) == 0) times.bytes = static_cast<std::size_t>(st.st_size);
    times.buildNs = t1 - t0;
    times.printNs = t2 - t1;
    return times;
}

}  // namespace ZOA::bench
