// AllVisitor: a visitor that walks every child of every node in a fixed order.
#ifndef ZOA_ALL_VISITOR_H
#define ZOA_ALL_VISITOR_H

#include <zoa/export.h>
#include <zoa/nesting.h>
#include <zoa/tree_base.h>
#include <zoa/visitor.h>

namespace ZOA {

// Constructing an AllVisitor walks the whole tree below root with AllVisitor's
// own visits. A derived visitor that wants its overrides to run calls
// root->accept(this) again from its own constructor, and calls AllVisitor's
// visit for a node to have that node's children walked:
//   SUBPROG: labels in ascending id, then the return temp (not arguments, pool
//            or local names); LABEL: its statements; SEQ: left, right (non-null);
//   MOVE: dst, src; EXP: expr; JUMP: expr for DIRECT_EXPR only; CJUMP: left,
//   right; BINOP: left, right; UNOP, MEM: expr; CALL: function pointer, then
//   args; NAME: its value list; TEMP, BUF_TEMP, CONST: nothing.
// Null children are skipped. The walk follows at most MAX_WALK_DEPTH levels
// below the root: on a graph with a cycle (made with the copy assignments) it
// stops there, and the rest of the walk is skipped, so it always ends.
class ZOA_API AllVisitor : public VisitorBase {
public:
    explicit AllVisitor(TreeBase* root);
    ~AllVisitor() override;

    void visit(UNOP*) override;
    void visit(TEMP*) override;
    void visit(SUBPROG*) override;
    void visit(SEQ*) override;
    void visit(NAME*) override;
    void visit(MOVE*) override;
    void visit(MEM*) override;
    void visit(LABEL*) override;
    void visit(JUMP*) override;
    void visit(EXP*) override;
    void visit(CONST*) override;
    void visit(CJUMP*) override;
    void visit(CALL*) override;
    void visit(BUF_TEMP*) override;
    void visit(BINOP*) override;
    void reservedHook1(void*) override {}
    void reservedHook2(void*) override {}
    void reservedHook3(void*) override {}

private:
    void walkChildren(TreeBase* n);
    void walk(TreeBase* child);
    NestingGuard nesting;
};

}  // namespace ZOA

#endif
