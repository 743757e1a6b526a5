// DecompileBase: what the C and assembly emitters share, including the trace ordering of labels.
#ifndef ZOA_EMIT_DECOMPILE_BASE_H
#define ZOA_EMIT_DECOMPILE_BASE_H

#include "core/traces.h"

#include <zoa/nesting.h>
#include <zoa/subprog.h>
#include <zoa/tree_base.h>
#include <zoa/visitor.h>

#include <ostream>
#include <vector>

namespace ZOA {

class DecompileBase : public VisitorBase, private TraceListener {
public:
    // Marks a label that already has its place in the trace order.
    class LABELAnnotation : public TreeAnnotation {
    public:
        bool placed = true;
    };
    // On a JUMP or CJUMP that placed its target: the label placed right before it.
    class TraceAnnotation : public TreeAnnotation {
    public:
        explicit TraceAnnotation(LABEL* prev) : prevLabel(prev) {}
        LABEL* prevLabel;
    };

    DecompileBase(std::ostream& os, bool isGcc);
    ~DecompileBase() override;

    void reservedHook1(void*) override {}
    void reservedHook2(void*) override {}
    void reservedHook3(void*) override {}

    virtual void defineName(NAME* n) = 0;
    virtual void declareNamePrototype(NAME* n) = 0;
    virtual void declareSubprogPrototype(SUBPROG* sp) = 0;
    virtual void declareCallPrototype(CALL* c) = 0;

    // Prints one subprogram through its visit, then resets the per-subprogram state.
    bool emitSubprogram(SUBPROG* sp);
    // Orders curSubprog's labels into traceOrder so that jumps can fall
    // through (core/traces.h), marking placed labels with a LABELAnnotation
    // and each jump that pulled its target with a TraceAnnotation.
    void buildTraces();
    // True when stmt (a JUMP to a label, or a CJUMP's false branch) targets the
    // label printed right after curLabel, so the jump is left out.
    bool fallsThrough(StmtBase* stmt) const;

    // n->accept(this), one level deeper. Where MAX_WALK_DEPTH cuts the walk (a
    // cycle made with the copy assignments) the output's writeCutNote() comes
    // instead, and the rest of the statement of the label that holds it is left out.
    void acceptNested(TreeBase* n);
    virtual void writeCutNote() = 0;

protected:
    bool isGcc;
    unsigned int indentLevel = 0;
    std::vector<LABEL*> traceOrder;
    SUBPROG* curSubprog = nullptr;
    LABEL* curLabel = nullptr;
    std::ostream& out;
    NestingGuard nesting;  // bounds the recursion of the visits

private:
    bool place(LABEL* l) override;
    void pulled(StmtBase* jump, LABEL* prev) override;
    std::vector<StmtBase*> traceStack;  // reused by buildTraces
};

}  // namespace ZOA

#endif
