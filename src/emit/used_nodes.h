// UsedNodes: collects the temporaries, calls and labels a subprogram really uses.
#ifndef ZOA_EMIT_USED_NODES_H
#define ZOA_EMIT_USED_NODES_H

#include <zoa/all_visitor.h>
#include <zoa/enums.h>

#include <cstddef>
#include <vector>

namespace ZOA {

// A map from node identity to NodeType: open addressing over a vector that
// keeps its capacity across clear(), so an emitter that reuses one map does
// no heap allocation per node. Iteration order is unspecified.
class UsedMap {
public:
    struct Entry {
        TreeBase* node;
        NodeType type;
    };

    void clear();
    // Stores type under node, replacing an earlier value.
    void assign(TreeBase* node, NodeType type);
    // Stores type under node only when node is not yet a key.
    void insertIfAbsent(TreeBase* node, NodeType type);
    // The value stored under node, or nullptr.
    const NodeType* find(const TreeBase* node) const;
    bool contains(const TreeBase* node) const { return find(node) != nullptr; }
    std::size_t size() const { return count; }

    template <class F> void forEach(F f) const {
        for (const Entry& e : slots)
            if (e.node) f(e.node, e.type);
    }

private:
    Entry* slotFor(const TreeBase* node);
    void grow();

    std::vector<Entry> slots;
    std::size_t count = 0;
};

// Built on a subprogram, walks it (labels, statements, the return temporary,
// then every argument temporary) and records into the caller's map: TEMP and
// BUF_TEMP as TEMP_NODE, CALL as CALL_NODE, LABEL as LABEL_NODE.
class UsedNodes : public AllVisitor {
public:
    UsedNodes(SUBPROG* sp, UsedMap* usedMap);

    void visit(UNOP* n) override { AllVisitor::visit(n); }
    void visit(TEMP* n) override;
    void visit(SUBPROG* n) override;
    void visit(SEQ* n) override { AllVisitor::visit(n); }
    void visit(NAME* n) override { AllVisitor::visit(n); }
    void visit(MOVE* n) override { AllVisitor::visit(n); }
    void visit(MEM* n) override { AllVisitor::visit(n); }
    void visit(LABEL* n) override;
    void visit(JUMP* n) override { AllVisitor::visit(n); }
    void visit(EXP* n) override { AllVisitor::visit(n); }
    void visit(CONST* n) override { AllVisitor::visit(n); }
    void visit(CJUMP* n) override { AllVisitor::visit(n); }
    void visit(CALL* n) override;
    void visit(BUF_TEMP* n) override;
    void visit(BINOP* n) override { AllVisitor::visit(n); }

private:
    UsedMap* usedMap;
};

}  // namespace ZOA

#endif
