// ZOA_file: file-level names and the three kinds of prototypes.
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <sstream>

namespace ZOA {
namespace {

TEST(ZOA_file, FileLevelNamesCountFromTheListAndRestartAfterDecompile) {
    ZOA_file unit(true, false);
    NAME* s = unit.getName(STRINGLIT_REF, "hello");
    NAME* k = unit.getName(new CONST(5));
    NAME* t = unit.getName(std::list<ExprBase*>{new CONST(1), new CONST(2)});
    EXPECT_TRUE(s->getId() == 0u && k->getId() == 1u && t->getId() == 2u);
    EXPECT_EQ(unit.getName(new CONST(5)), k);
    EXPECT_EQ(unit.getName(EXTERN_DATA_REF, "errno")->getId(), 3u);
    EXPECT_FALSE(s->isDeclaredLocal() || k->isDeclaredLocal() || t->isDeclaredLocal());
    LABEL* l = unit.createSubprog(VOID, "f", false)->getStartLabel();
    EXPECT_NE(unit.getName(l), unit.getName(l));
    EXPECT_EQ(unit.getNames().size(), 4u);

    std::ostringstream out;
    EXPECT_TRUE(unit.decompile(out));
    EXPECT_TRUE(unit.getNames().empty() && unit.getSubprogs().empty());
    EXPECT_EQ(unit.getName(STRINGLIT_REF, "hello")->getId(), 0u);
}

TEST(ZOA_file, PrototypesAreDecidedWhenAdded) {
    ZOA_file unit(false, true);
    SUBPROG* f = unit.createSubprog(INT_S, "f", false);
    EXPECT_TRUE(unit.getSubprogPrototypes().empty());

    // Names of functions: a prototype only for those without a subprogram here.
    NAME* fRef = unit.getName(SUBPROG_REF, "f");
    EXPECT_EQ(unit.getNames().back(), fRef);
    EXPECT_TRUE(unit.getNamePrototypes().empty());
    NAME* gRef = unit.getName(SUBPROG_REF, "g");
    ASSERT_EQ(unit.getNamePrototypes().size(), 1u);
    EXPECT_EQ(unit.getNamePrototypes().at("g"), gRef);
    unit.getName(SUBPROG_REF, "fx");  // whole names compare, not prefixes
    EXPECT_EQ(unit.getNamePrototypes().count("fx"), 1u);

    // Calls: decided at add time; a later call of the same function replaces the earlier.
    CALL* h1 = new CALL(VOID, "h");
    CALL* h2 = new CALL(VOID, "h");
    unit.addFunctionPrototype(h1);
    unit.addFunctionPrototype(h2);
    unit.createSubprog(VOID, "h", false);
    unit.addFunctionPrototype(new CALL(VOID, "f"));
    unit.addFunctionPrototype(new CALL(VOID, "h"));
    TEMP* fp = f->getTemp(POINTER, 0, IN_USE_TEMP);
    CALL* viaPtr = new CALL(VOID, fp);
    unit.addFunctionPrototype(viaPtr);
    unit.addFunctionPrototype(static_cast<CALL*>(nullptr));  // ignored
    ASSERT_EQ(unit.getCallPrototypes().size(), 2u);
    EXPECT_EQ(unit.getCallPrototypes().at("h"), h2);
    EXPECT_EQ(unit.getCallPrototypes().at(""), viaPtr);

    // Subprograms: one entry per name, the later one.
    SUBPROG* k1 = unit.createSubprog(VOID, "k", true);
    SUBPROG* k2 = unit.createSubprog(VOID, "k", true);
    EXPECT_NE(k1, k2);
    EXPECT_EQ(unit.getSubprogs().size(), 4u);
    ASSERT_EQ(unit.getSubprogPrototypes().size(), 1u);
    EXPECT_EQ(unit.getSubprogPrototypes().at("k"), k2);
    EXPECT_FALSE(k2->isStatic() || k2->isExtern());
}

}  // namespace
}  // namespace ZOA
