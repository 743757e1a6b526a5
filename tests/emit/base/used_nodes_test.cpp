// UsedNodes and its identity map.
#include "emit/used_nodes.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <vector>

using namespace ZOA;

namespace {
NodeType valueOf(const UsedMap& m, TreeBase* n) {
    const NodeType* v = m.find(n);
    return v ? *v : TREE_BASE_NODE;
}
}  // namespace

TEST(UsedNodes, RecordsWhatTheSubprogramUses) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    TEMP* unusedArg = sp->getArgTemp(INT_S);
    TEMP* usedArg = sp->getArgTemp(POINTER);
    TEMP* dstOnly = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* unused = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* fp = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* buf = sp->getTemp(POINTER, 16, IN_USE_TEMP);
    TEMP* inJump = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    LABEL* target = sp->createNewLabel(REGULAR_LABEL);
    LABEL* lonely = sp->createNewLabel(REGULAR_LABEL);
    CALL* call = new CALL(INT_S, fp, {new MEM(INT_S, buf)});
    LABEL* s = sp->getStartLabel();
    s->addStmt(new MOVE(dstOnly, call));
    s->addStmt(new CJUMP(EQ, usedArg, new CONST(0), target, lonely));
    target->addStmt(new JUMP(inJump));

    UsedMap map;
    UsedNodes used(sp, &map);
    EXPECT_EQ(valueOf(map, sp->getReturnTemp()), TEMP_NODE);  // mentioned by no statement
    EXPECT_EQ(valueOf(map, unusedArg), TEMP_NODE);
    EXPECT_EQ(valueOf(map, usedArg), TEMP_NODE);
    EXPECT_EQ(valueOf(map, dstOnly), TEMP_NODE);
    EXPECT_FALSE(map.contains(unused));
    EXPECT_EQ(valueOf(map, fp), TEMP_NODE);
    EXPECT_EQ(valueOf(map, buf), TEMP_NODE);  // a buffer counts as a temporary
    EXPECT_EQ(valueOf(map, inJump), TEMP_NODE);
    EXPECT_EQ(valueOf(map, call), CALL_NODE);
    for (LABEL* l : {s, sp->getReturnLabel(), target, lonely}) EXPECT_EQ(valueOf(map, l), LABEL_NODE);
    EXPECT_EQ(map.size(), 12u);
}

TEST(UsedNodes, MapGrowsKeepsLabelsFirstValueAndIsReusable) {
    ZOA_file unit(true, false);
    std::vector<CONST*> keys;
    for (int i = 0; i < 5000; ++i) keys.push_back(new CONST(i));
    UsedMap map;
    for (CONST* k : keys) map.assign(k, CALL_NODE);
    for (CONST* k : keys) map.assign(k, TEMP_NODE);
    map.insertIfAbsent(keys[7], LABEL_NODE);  // present: unchanged
    EXPECT_EQ(map.size(), keys.size());
    for (CONST* k : keys) ASSERT_EQ(valueOf(map, k), TEMP_NODE);

    map.clear();
    EXPECT_EQ(map.size(), 0u);
    EXPECT_FALSE(map.contains(keys[0]));
    map.insertIfAbsent(keys[3], LABEL_NODE);
    map.insertIfAbsent(keys[3], TEMP_NODE);
    EXPECT_EQ(valueOf(map, keys[3]), LABEL_NODE);
    EXPECT_EQ(map.size(), 1u);
}
