// UsedNodes and its identity map.
#include "emit/used_nodes.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>

#include <cstdint>

namespace ZOA {

void UsedMap::clear() {
    for (Entry& e : slots) e.node = nullptr;
    count = 0;
}

UsedMap::Entry* UsedMap::slotFor(const TreeBase* node) {
    std::size_t mask = slots.size() - 1;
    std::uintptr_t h = reinterpret_cast<std::uintptr_t>(node);
    std::size_t i = static_cast<std::size_t>((h >> 3) * 0x9E3779B97F4A7C15ull) & mask;
    while (slots[i].node && slots[i].node != node) i = (i + 1) & mask;
    return &slots[i];
}

void UsedMap::grow() {
    std::vector<Entry> old;
    old.swap(slots);
    slots.assign(old.empty() ? 64 : old.size() * 2, Entry{nullptr, TREE_BASE_NODE});
    count = 0;
    for (const Entry& e : old)
        if (e.node) assign(e.node, e.type);
}

void UsedMap::assign(TreeBase* node, NodeType type) {
    if ((count + 1) * 2 > slots.size()) grow();
    Entry* e = slotFor(node);
    if (!e->node) {
        e->node = node;
        ++count;
    }
    e->type = type;
}

void UsedMap::insertIfAbsent(TreeBase* node, NodeType type) {
    if ((count + 1) * 2 > slots.size()) grow();
    Entry* e = slotFor(node);
    if (e->node) return;
    e->node = node;
    e->type = type;
    ++count;
}

const NodeType* UsedMap::find(const TreeBase* node) const {
    if (slots.empty()) return nullptr;
    Entry* e = const_cast<UsedMap*>(this)->slotFor(node);
    return e->node ? &e->type : nullptr;
}

UsedNodes::UsedNodes(SUBPROG* sp, UsedMap* usedMap) : AllVisitor(sp), usedMap(usedMap) { sp->accept(this); }

void UsedNodes::visit(SUBPROG* sp) {
    AllVisitor::visit(sp);
    // Arguments count as used even when no statement mentions them.
    for (TEMP* t : sp->getAllTemps())
        if (t->getType() == ARGUMENT_TEMP) t->accept(this);
}

void UsedNodes::visit(LABEL* l) {
    AllVisitor::visit(l);
    usedMap->insertIfAbsent(l, LABEL_NODE);
}

void UsedNodes::visit(CALL* c) {
    AllVisitor::visit(c);
    usedMap->assign(c, CALL_NODE);
}

void UsedNodes::visit(TEMP* t) { usedMap->assign(t, TEMP_NODE); }

void UsedNodes::visit(BUF_TEMP* t) { usedMap->assign(t, TEMP_NODE); }

}  // namespace ZOA
