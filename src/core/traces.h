// The trace order: in which order a subprogram's labels are printed, so that jumps can fall through.
#ifndef ZOA_CORE_TRACES_H
#define ZOA_CORE_TRACES_H

#include <zoa/stmt.h>
#include <zoa/subprog.h>

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

namespace detail {

inline void pushStatements(LABEL* l, std::vector<StmtBase*>& stack) {
    if (!l->containsStmts()) return;
    const StmtList& stmts = l->getStmts();
    for (auto it = stmts.rbegin(); it != stmts.rend(); ++it) stack.push_back(*it);
}

// One statement: a SEQ queues its sides; a jump may pull its target, whose
// statements then run before anything queued earlier.
inline void traceStatement(StmtBase* s, LABEL*& last, TraceListener& listener, std::vector<StmtBase*>& stack) {
    if (!s) return;
    NodeType k = s->getNodeType();
    if (k == SEQ_NODE) {
        SEQ* seq = static_cast<SEQ*>(s);
        if (seq->getRight()) stack.push_back(seq->getRight());
        if (seq->getLeft()) stack.push_back(seq->getLeft());
        return;
    }
    LABEL* candidate = nullptr;
    if (k == JUMP_NODE && static_cast<JUMP*>(s)->getKind() == DIRECT_LABEL) candidate = static_cast<JUMP*>(s)->getTarget();
    else if (k == CJUMP_NODE) candidate = static_cast<CJUMP*>(s)->getIfFalse();
    if (!candidate || !listener.place(candidate)) return;
    listener.pulled(s, last);
    last = candidate;
    pushStatements(candidate, stack);
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
// The walk keeps its own stack (no recursion), so any depth of SEQ nesting or
// chain of jumps is fine; `stack` is scratch storage a caller may reuse.
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
        while (!stack.empty()) {
            StmtBase* s = stack.back();
            stack.pop_back();
            detail::traceStatement(s, last, listener, stack);
        }
    }
}

}  // namespace ZOA

#endif
