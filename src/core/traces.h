// The trace order: in which order a subprogram's labels are printed, so that jumps can fall through.
#ifndef ZOA_CORE_TRACES_H
#define ZOA_CORE_TRACES_H

#include <zoa/stmt.h>
#include <zoa/subprog.h>

#include <cstddef>
#include <vector>

namespace ZOA {

// What the trace builder asks and tells its user. The C and assembly outputs
// keep their marks as annotations on the nodes; the interpreter keeps them
// aside, so that running a unit leaves it as it was.
class TraceListener {
public:
    // Gives l its place, or answers false when it already has one.
    virtual bool place(LABEL* l) = 0;
    // jump (a JUMP to a label, or a CJUMP through its false label) placed its
    // target right after prev, the label placed before it: when the label
    // being printed is prev, the jump falls through.
    virtual void pulled(StmtBase* jump, LABEL* prev) = 0;

protected:
    ~TraceListener() = default;
};

// How many SEQs the trace walk keeps open at once. The walk is iterative, so
// this only has to stop a SEQ that contains itself (made with the copy
// assignments); far above anything a tree nests, and a few megabytes of stack
// vector at most.
constexpr std::size_t MAX_TRACE_NESTING = std::size_t{1} << 20;

namespace detail {

inline void pushStatements(LABEL* l, std::vector<StmtBase*>& stack) {
    if (!l->containsStmts()) return;
    const StmtList& stmts = l->getStmts();
    for (auto it = stmts.rbegin(); it != stmts.rend(); ++it)
        if (*it) stack.push_back(*it);
}

// One statement: a SEQ queues its sides above a null entry that marks its end;
// a jump may pull its target, whose statements then run before anything
// queued earlier. False when the SEQs nest too deep.
inline bool traceStatement(StmtBase* s, LABEL*& last, std::size_t& open, TraceListener& listener,
                           std::vector<StmtBase*>& stack) {
    NodeType k = s->getNodeType();
    if (k == SEQ_NODE) {
        if (++open > MAX_TRACE_NESTING) return false;
        SEQ* seq = static_cast<SEQ*>(s);
        stack.push_back(nullptr);
        if (seq->getRight()) stack.push_back(seq->getRight());
        if (seq->getLeft()) stack.push_back(seq->getLeft());
        return true;
    }
    LABEL* candidate = nullptr;
    if (k == JUMP_NODE && static_cast<JUMP*>(s)->getKind() == DIRECT_LABEL) candidate = static_cast<JUMP*>(s)->getTarget();
    else if (k == CJUMP_NODE) candidate = static_cast<CJUMP*>(s)->getIfFalse();
    if (!candidate || !listener.place(candidate)) return true;
    listener.pulled(s, last);
    last = candidate;
    // The SEQs this jump ended are closed before the target's statements go
    // on top, so a long chain of pulls leaves nothing open.
    while (!stack.empty() && !stack.back()) {
        stack.pop_back();
        --open;
    }
    pushStatements(candidate, stack);
    return true;
}

}  // namespace detail

// Places every label of sp, calling listener.place in trace order.
//
// Labels come from a FIFO work list: the start label, the others by ascending
// id, the return label last. Placing a label walks its statements depth first
// (a SEQ's left side before its right side): an unconditional jump to a label,
// or a conditional jump's false label, pulls its not yet placed target right
// behind the label placed last, and that target's statements are walked
// before the statements after the jump. A label is placed once; the true label
// of a CJUMP and the target of a computed jump are never pulled.
//
// The walk keeps its own stack (no recursion), so any chain of jumps and any
// SEQ nesting up to MAX_TRACE_NESTING is fine; `stack` is scratch storage a
// caller may reuse. A SEQ that contains itself ends the walk of the work list
// label that reached it; the labels not yet placed keep their turn.
inline void buildTraces(SUBPROG* sp, TraceListener& listener, std::vector<StmtBase*>& stack) {
    if (!sp) return;
    std::vector<LABEL*> work;
    work.reserve(sp->getAllLabels().size() + 1);
    LABEL* start = sp->getStartLabel();
    LABEL* ret = sp->getReturnLabel();
    if (start) work.push_back(start);
    for (const auto& entry : sp->getAllLabels())
        if (entry.second != start && entry.second != ret) work.push_back(entry.second);
    if (ret) work.push_back(ret);

    LABEL* last = nullptr;
    stack.clear();
    for (LABEL* l : work) {
        if (!l || !listener.place(l)) continue;
        last = l;
        detail::pushStatements(l, stack);
        std::size_t open = 0;  // SEQs whose end marker is on the stack
        while (!stack.empty()) {
            StmtBase* s = stack.back();
            stack.pop_back();
            if (!s) {
                --open;
                continue;
            }
            if (!detail::traceStatement(s, last, open, listener, stack)) {
                stack.clear();
                break;
            }
        }
    }
}

}  // namespace ZOA

#endif
