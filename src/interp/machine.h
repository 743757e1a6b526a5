// The interpreter's machine: one unit's subprograms run on simulated memory with C's value rules.
#ifndef ZOA_INTERP_MACHINE_H
#define ZOA_INTERP_MACHINE_H

#include "interp/memory.h"
#include "interp/rules.h"

#include <zoa/interp.h>
#include <zoa/zoa.h>

#include <cstdint>
#include <string>
#include <unordered_map>
#include <vector>

namespace ZOA::interp {

struct Trace {
    std::vector<LABEL*> order;
    std::unordered_map<const LABEL*, std::size_t> index;
    // For each jump the fall-through test may drop: the label printed before its target.
    std::unordered_map<const StmtBase*, const LABEL*> prev;
};

struct Frame {
    SUBPROG* sp = nullptr;
    const Trace* trace = nullptr;
    std::unordered_map<const TEMP*, Value> temps;
    std::unordered_map<const TEMP*, std::uint32_t> buffers;
    std::vector<std::uint32_t> owned;  // buffers and alloca blocks, freed on return
};

// What an array name stands for in C: its address and the size of its elements.
struct NameInfo {
    bool ready = false;
    bool busy = false;
    Value value;
};

// The machine is the memory, the value rules and the walk over the tree.
struct Machine::Impl : Memory, Rules {
    ZOA_file& unit;
    Options opt;
    std::uint64_t steps = 0;
    unsigned depth = 0;
    std::uint32_t nextCode = CODE_START;
    // Code addresses both ways, by label and by function name.
    template <class Key> struct CodeMap {
        std::unordered_map<Key, std::uint32_t> address;
        std::unordered_map<std::uint32_t, Key> key;
    };
    CodeMap<const LABEL*> labels;
    CodeMap<std::string> functions;
    std::unordered_map<const SUBPROG*, Trace> traces;
    std::unordered_map<const NAME*, NameInfo> names;
    Frame* frame = nullptr;

    Impl(ZOA_file& u, Options o) : Memory(o.strictC), Rules{o.strictC}, unit(u), opt(o) {}

    // Label and function addresses: distinct values outside the data blocks.
    template <class Key> std::uint32_t addressIn(CodeMap<Key>& m, const Key& k);
    std::uint32_t addressOf(const LABEL* l) { return addressIn(labels, l); }
    std::uint32_t addressOf(const std::string& function) { return addressIn(functions, function); }

    void tick() {
        if (++steps > opt.maxSteps) stop(Status::STEP_LIMIT, "step limit reached");
    }
    struct Nest {
        Impl& m;
        explicit Nest(Impl& i) : m(i) {
            if (++m.depth > m.opt.maxDepth) {
                --m.depth;
                stop(Status::DEPTH_LIMIT, "nesting too deep");
            }
        }
        ~Nest() { --m.depth; }
    };

    // Expressions (machine.cpp).
    Value constant(CONST* k);
    SUBPROG* findSubprog(const std::string& name);
    Value nameValue(NAME* n);
    Value temp(TEMP* t);
    Value unop(UNOP* u);
    Value eval(ExprBase* e);
    Value call(CALL* c);
    // Host functions (host.cpp): malloc, alloca, free, strlen, puts, abs.
    Value host(const std::string& name, const std::vector<Value>& args, DataType type);
    std::string readString(std::uint32_t addr);
    // Statements and control flow (machine.cpp).
    const Trace& traceOf(SUBPROG* sp);
    LABEL* exec(StmtBase* s, const LABEL* cur);
    Value invoke(SUBPROG* sp, const std::vector<Value>& args);
};

}  // namespace ZOA::interp

#endif
