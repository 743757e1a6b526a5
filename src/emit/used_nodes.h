// UsedNodes: collects the temporaries, calls and labels a subprogram really uses.
#ifndef ZOA_EMIT_USED_NODES_H
#define ZOA_EMIT_USED_NODES_H

#include "support/pointer_table.h"

#include <zoa/all_visitor.h>
#include <zoa/enums.h>

namespace ZOA {

// Node identity to NodeType; keeps its capacity across clear(), so an emitter
// that reuses one map does no heap allocation per node.
using UsedMap = PointerMap<TreeBase*, NodeType>;

// Built on a subprogram, walks it (labels, statements, the return temporary,
// then every argument temporary) and records into the caller's map: TEMP and
// BUF_TEMP as TEMP_NODE, CALL as CALL_NODE, LABEL as LABEL_NODE.
// The other kinds keep AllVisitor's walk.
class UsedNodes : public AllVisitor {
public:
    UsedNodes(SUBPROG* sp, UsedMap* usedMap);
    using AllVisitor::visit;

    void visit(TEMP* n) override;
    void visit(SUBPROG* n) override;
    void visit(LABEL* n) override;
    void visit(CALL* n) override;
    void visit(BUF_TEMP* n) override;

private:
    UsedMap* usedMap;
};

}  // namespace ZOA

#endif
