// DecompileBase: the per-subprogram driver and trace building.
#include "emit/decompile_base.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>

#include <typeinfo>

namespace ZOA {

DecompileBase::DecompileBase(std::ostream& os, bool isGcc) : isGcc(isGcc), out(os) {}

DecompileBase::~DecompileBase() {}

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

void DecompileBase::pulled(StmtBase* jump, LABEL* prev) { jump->setAnnotation(new TraceAnnotation(prev), true); }

void DecompileBase::buildTraces() { ZOA::buildTraces(curSubprog, *this, traceStack); }

void DecompileBase::acceptNested(TreeBase* n) {
    NestingLevel level(nesting);
    if (level.entered()) n->accept(this);
    else if (level.cutHere()) writeCutNote();
}

bool DecompileBase::fallsThrough(StmtBase* stmt) const {
    TreeAnnotation* a = stmt->getAnnotation();
    return a && typeid(*a) == typeid(TraceAnnotation) && static_cast<TraceAnnotation*>(a)->prevLabel == curLabel;
}

}  // namespace ZOA
