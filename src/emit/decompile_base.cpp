// DecompileBase: indentation, the per-subprogram driver and trace building.
#include "emit/decompile_base.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>

#include <typeinfo>

namespace ZOA {

DecompileBase::DecompileBase(std::ostream& os, bool isGcc) : isGcc(isGcc), out(os) {}

DecompileBase::~DecompileBase() {}

std::ostream& DecompileBase::indent(unsigned int n) {
    static const char blanks[] = "                                                                ";
    constexpr unsigned int perChunk = (sizeof(blanks) - 1) / 4;
    while (n > perChunk) {
        out.write(blanks, perChunk * 4);
        n -= perChunk;
    }
    if (n) out.write(blanks, n * 4);
    return out;
}

bool DecompileBase::emitSubprogram(SUBPROG* sp) {
    curSubprog = sp;
    if (sp) sp->accept(this);
    indentLevel = 0;
    traceOrder.clear();
    curSubprog = nullptr;
    curLabel = nullptr;
    return true;
}

// Attaches the placed mark and appends l to the trace order; false if already placed.
bool DecompileBase::place(LABEL* l) {
    TreeAnnotation* a = l->getAnnotation();
    if (a && typeid(*a) == typeid(LABELAnnotation)) return false;
    l->setAnnotation(new LABELAnnotation, true);
    traceOrder.push_back(l);
    return true;
}

// Labels are placed from a FIFO work list (start label, the others by id, the
// return label last). Placing a label walks its statements: an unconditional
// jump to a label, or a conditional jump's false label, pulls its not yet
// placed target right behind the label placed last, and the jump records that
// predecessor in a TraceAnnotation so the emitter can leave it out. The walk is
// depth first: a pulled label's statements come before those after the jump.
void DecompileBase::buildTraces() {
    SUBPROG* sp = curSubprog;
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
    for (LABEL* l : work) {
        if (!l || !place(l)) continue;
        last = l;
        if (!l->containsStmts()) continue;
        const StmtList& stmts = l->getStmts();
        for (auto it = stmts.rbegin(); it != stmts.rend(); ++it) pending.push_back(*it);
        while (!pending.empty()) {
            StmtBase* s = pending.back();
            pending.pop_back();
            traceStatement(s, last);
        }
    }
}

// One step: a SEQ queues its sides; a jump may pull its target, whose
// statements are queued to run before anything queued earlier.
void DecompileBase::traceStatement(StmtBase* s, LABEL*& last) {
    if (!s) return;
    NodeType k = s->getNodeType();
    if (k == SEQ_NODE) {
        SEQ* seq = static_cast<SEQ*>(s);
        if (seq->getRight()) pending.push_back(seq->getRight());
        if (seq->getLeft()) pending.push_back(seq->getLeft());
        return;
    }
    LABEL* candidate = nullptr;
    if (k == JUMP_NODE && static_cast<JUMP*>(s)->getKind() == DIRECT_LABEL) candidate = static_cast<JUMP*>(s)->getTarget();
    else if (k == CJUMP_NODE) candidate = static_cast<CJUMP*>(s)->getIfFalse();
    if (!candidate || !place(candidate)) return;
    s->setAnnotation(new TraceAnnotation(last), true);
    last = candidate;
    if (!candidate->containsStmts()) return;
    const StmtList& stmts = candidate->getStmts();
    for (auto it = stmts.rbegin(); it != stmts.rend(); ++it) pending.push_back(*it);
}

bool DecompileBase::fallsThrough(StmtBase* stmt) const {
    TreeAnnotation* a = stmt->getAnnotation();
    return a && typeid(*a) == typeid(TraceAnnotation) && static_cast<TraceAnnotation*>(a)->prevLabel == curLabel;
}

}  // namespace ZOA
