// SUBPROG: numbering, the temp pool, argument temps, labels and deduplicated local names.
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <cmath>
#include <list>
#include <string>

namespace ZOA {
namespace {

// "id kind state" of every temp of the pool, in creation order.
std::string pool(const SUBPROG* sp) {
    std::string s;
    for (TEMP* t : sp->getAllTemps())
        s += std::to_string(t->getId()) + (t->getNodeType() == BUF_TEMP_NODE ? "b " : " ") + toString(t->getType()) +
             " " + toString(t->getState()) + "; ";
    return s;
}

TEST(SUBPROG, ConstructionNumbersLabelsAndTheReturnTemp) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    ASSERT_EQ(sp->getAllLabels().size(), 2u);
    EXPECT_TRUE(sp->getAllLabels().at(0) == sp->getStartLabel() && sp->getStartLabel()->getKind() == PROLOGUE_LABEL);
    EXPECT_TRUE(sp->getAllLabels().at(1) == sp->getReturnLabel() && sp->getReturnLabel()->getKind() == EPILOGUE_LABEL);
    EXPECT_EQ(pool(sp), "0 RETURN_TEMP PERMANENT_TEMP; ");
    EXPECT_TRUE(sp->getReturnTemp() == sp->getAllTemps().front() && sp->getReturnTemp()->getDataType() == INT_S);
    EXPECT_EQ(sp->getTemp(INT_S, 0, IN_USE_TEMP)->getId(), 1u);
    EXPECT_EQ(sp->createNewLabel(REGULAR_LABEL)->getId(), 2u);

    SUBPROG* proc = unit.createSubprog(VOID, "p", false);
    EXPECT_TRUE(proc->getReturnTemp() == nullptr && proc->getAllTemps().empty());
    EXPECT_EQ(proc->getTemp(CHAR_S, 0, IN_USE_TEMP)->getId(), 0u) << "numbering is per subprogram";
    NAME* empty = proc->getName(std::list<ExprBase*>{});
    EXPECT_TRUE(empty->getKind() == CONST_ARRAY_REF && empty->getList().empty());
    EXPECT_EQ(proc->getName(std::list<ExprBase*>{}), empty);
}

TEST(SUBPROG, TempPoolReusesTheOldestAvailableTempOfTheSameKind) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* a = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    TEMP* b = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    sp->freeTemp(b);
    sp->freeTemp(a);
    TEMP* c = sp->getTemp(CHAR_S, 0, IN_USE_TEMP);
    EXPECT_TRUE(c != a && c != b);
    EXPECT_EQ(sp->getTemp(INT_S, 0, PERMANENT_TEMP), a) << "oldest first, handed out IN_USE";
    EXPECT_EQ(sp->getTemp(INT_S, 0, IN_USE_TEMP), b);
    TEMP* perm = sp->getTemp(INT_S, 0, PERMANENT_TEMP);
    sp->freeTemp(perm);
    sp->freeAllTemps();
    EXPECT_EQ(pool(sp), "0 REGULAR_TEMP AVAILABLE_TEMP; 1 REGULAR_TEMP AVAILABLE_TEMP; "
                        "2 REGULAR_TEMP AVAILABLE_TEMP; 3 REGULAR_TEMP PERMANENT_TEMP; ");
    EXPECT_EQ(sp->getTemp(INT_S, 0, IN_USE_TEMP), a);
    EXPECT_EQ(sp->getTemp(INT_S, 0, IN_USE_TEMP), b);
    EXPECT_NE(sp->getTemp(INT_S, 0, IN_USE_TEMP), perm);

    // Buffers: reused only by a POINTER request of the very same size.
    TEMP* buf = sp->getTemp(POINTER, 16, IN_USE_TEMP);
    TEMP* ptr = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    sp->freeTemp(buf);
    sp->freeTemp(ptr);
    TEMP* bigger = sp->getTemp(POINTER, 32, IN_USE_TEMP);
    TEMP* intBuf = sp->getTemp(INT_S, 16, IN_USE_TEMP);
    EXPECT_TRUE(bigger != buf && intBuf != buf && intBuf->getDataType() == POINTER);
    EXPECT_EQ(static_cast<BUF_TEMP*>(intBuf)->getArraySize(), 16u);
    EXPECT_EQ(sp->getTemp(POINTER, 0, IN_USE_TEMP), ptr) << "a plain request skips the free buffer";
    EXPECT_EQ(sp->getTemp(POINTER, 16, IN_USE_TEMP), buf);
    // A temp made AVAILABLE from the start is at once in the pool.
    TEMP* spare = sp->getTemp(DOUBLE, 0, AVAILABLE_TEMP);
    EXPECT_EQ(sp->getTemp(DOUBLE, 0, IN_USE_TEMP), spare);
    EXPECT_EQ(pool(sp).substr(pool(sp).find("5b")), "5b REGULAR_TEMP IN_USE_TEMP; 6 REGULAR_TEMP IN_USE_TEMP; "
              "7b REGULAR_TEMP IN_USE_TEMP; 8b REGULAR_TEMP IN_USE_TEMP; 9 REGULAR_TEMP IN_USE_TEMP; ");
}

TEST(SUBPROG, ArgumentTempsKeepCallOrderAndStayPermanent) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    TEMP* x = sp->getArgTemp(INT_S);
    TEMP* y = sp->getArgTemp(CHAR_U);
    EXPECT_EQ((std::list<TEMP*>(sp->getAllArgTemps().begin(), sp->getAllArgTemps().end())), (std::list<TEMP*>{x, y}));
    sp->freeAllTemps();
    EXPECT_EQ(pool(sp), "0 RETURN_TEMP PERMANENT_TEMP; 1 ARGUMENT_TEMP PERMANENT_TEMP; 2 ARGUMENT_TEMP PERMANENT_TEMP; ");
    EXPECT_EQ(sp->getTemp(INT_S, 0, IN_USE_TEMP)->getId(), 3u);
}

TEST(SUBPROG, FreeDeadLabelRemovesByIdAndIgnoresUnknownLabels) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    SUBPROG* other = unit.createSubprog(VOID, "g", false);
    for (int i = 0; i < 6; ++i) other->createNewLabel(REGULAR_LABEL);
    LABEL* l2 = sp->createNewLabel(REGULAR_LABEL);
    LABEL* start = sp->getStartLabel();
    sp->freeDeadLabel(sp->getReturnLabel());
    EXPECT_TRUE(sp->getReturnLabel() == nullptr && sp->getAllLabels().count(1) == 0);
    sp->freeDeadLabel(other->getAllLabels().at(7));  // not in this subprogram: ignored
    sp->freeDeadLabel(nullptr);
    EXPECT_EQ(sp->getAllLabels().size(), 2u);
    sp->freeDeadLabel(start);
    EXPECT_EQ(sp->getStartLabel(), start) << "the start label pointer is never changed";
    EXPECT_TRUE(sp->getAllLabels().size() == 1u && sp->getAllLabels().begin()->second == l2);
    EXPECT_EQ(sp->createNewLabel(REGULAR_LABEL)->getId(), 3u) << "ids are not reused";
}

TEST(SUBPROG, LocalNamesAreDeduplicatedByKindTextAndValue) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    NAME* abc = sp->getName(STRINGLIT_REF, "abc");
    EXPECT_EQ(sp->getName(STRINGLIT_REF, "abc"), abc);
    NAME* ext = sp->getName(EXTERN_DATA_REF, "abc");
    EXPECT_TRUE(ext != abc && abc->getId() == 0u && ext->getId() == 1u) << "a match consumes no id";
    EXPECT_TRUE(abc->isDeclaredLocal() && abc->getDataType() == POINTER);
    EXPECT_NE(sp->getName(STRINGLIT_REF, "ab"), abc);

    NAME* seven = sp->getName(new CONST(7));
    EXPECT_EQ(sp->getName(new CONST(7)), seven);
    EXPECT_TRUE(seven->getKind() == STATIC_DATA_REF && seven->getDataType() == INT_S);
    EXPECT_NE(sp->getName(new CONST(7u)), seven);
    EXPECT_NE(sp->getName(new CONST(7LL)), seven);
    NAME* half = sp->getName(new CONST(0.5));
    EXPECT_EQ(sp->getName(new CONST(0.5)), half);
    EXPECT_NE(sp->getName(new CONST(0.5f)), half);
    EXPECT_NE(sp->getName(new CONST(std::nan(""))), sp->getName(new CONST(std::nan(""))));
    EXPECT_EQ(SUBPROG::getMatchingName(new CONST(static_cast<void*>(nullptr)), sp->getAllLocalNames()), nullptr);

    // Value lists pair up element by element; POINTER elements by identity.
    NAME* ptrName = sp->getName(EXTERN_DATA_REF, "p");
    NAME* table = sp->getName(std::list<ExprBase*>{new CONST(1), new CONST(2.0), ptrName});
    EXPECT_EQ(table->getKind(), CONST_ARRAY_REF);
    EXPECT_EQ(sp->getName(std::list<ExprBase*>{new CONST(1), new CONST(2.0), ptrName}), table);
    EXPECT_NE(sp->getName(std::list<ExprBase*>{new CONST(2.0), new CONST(1), ptrName}), table);
    EXPECT_NE(sp->getName(std::list<ExprBase*>{new CONST(1), new CONST(2.0), abc}), table);
    EXPECT_EQ(sp->getName(std::list<ExprBase*>{new CONST(7)}), seven) << "one value matches a one-constant name";
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);  // elements that are not constants never match
    EXPECT_NE(sp->getName(std::list<ExprBase*>{t}), sp->getName(std::list<ExprBase*>{t}));
    EXPECT_EQ(sp->getName(std::list<ExprBase*>{}), abc) << "an empty list matches the first name made from text";
    NAME* arr = sp->getName(DATA_ARRAY_REF, "arr");
    EXPECT_EQ(SUBPROG::getMatchingName("abc", sp->getAllLocalNames()), abc);
    EXPECT_EQ(SUBPROG::getMatchingName("arr", sp->getAllLocalNames()), nullptr);
    EXPECT_EQ(SUBPROG::getMatchingName(DATA_ARRAY_REF, "arr", sp->getAllLocalNames()), arr);

    // Label references are made anew each time and never recorded.
    std::size_t recorded = sp->getAllLocalNames().size();
    LABEL* l = sp->createNewLabel(REGULAR_LABEL);
    NAME* r1 = sp->getName(l);
    EXPECT_NE(sp->getName(l), r1);
    EXPECT_TRUE(r1->getKind() == LABEL_REF && r1->getId() == 2u && r1->getLabelRef() == l && !r1->isDeclaredLocal());
    EXPECT_EQ(sp->getAllLocalNames().size(), recorded);
    EXPECT_EQ(sp->getName(STRINGLIT_REF, "new")->getId(), recorded) << "label references take no name id";
}

}  // namespace
}  // namespace ZOA
