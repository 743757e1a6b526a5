// Node base, annotations, expression and statement nodes, and their private replace operations.
#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <vector>

namespace ZOA {

// Reaches the private replace operations, as a tree-rewriting pass would.
class TreeRewriter {
public:
    static void replaceArgs(CALL* c, const std::vector<ExprBase*>& v) { c->replaceArgs(v); }
    static void replaceLeft(BINOP* b, ExprBase* e) { b->replaceLeft(e); }
    static void replaceExpr(MEM* m, ExprBase* e) { m->replaceExpr(e); }
    static void replaceLabelRef(NAME* n, LABEL* l) { n->replaceLabelRef(l); }
};

namespace {

struct Counted : TreeAnnotation {
    explicit Counted(int* d) : destroyed(d) {}
    ~Counted() override { ++*destroyed; }
    int* destroyed;
};

TEST(TreeBase, CloneCommentAnnotationsAndSizes) {
    ZOA_file unit(true, false);
    CONST* k = new CONST(3);
    k->setComment("three");
    EXPECT_TRUE(k->cloneNode() == k && k->getComment() == nullptr);

    int destroyed = 0;
    Counted* a = new Counted(&destroyed);
    k->setAnnotation(a, true);  // nothing attached yet: just attaches
    CONST copy(*k);
    EXPECT_EQ(copy.getAnnotation(), a) << "a copy shares the annotation";
    k->setAnnotation(new Counted(&destroyed), false);  // a is dropped, not destroyed
    EXPECT_EQ(destroyed, 0);
    k->setAnnotation(nullptr, true);
    EXPECT_TRUE(destroyed == 1 && !k->getAnnotation() && copy.getAnnotation() == a);

    EXPECT_EQ(ExprBase::sizeOfDataType(VOID) + ExprBase::sizeOfDataType(static_cast<DataType>(42)), 0u);
    BUF_TEMP buf(9, 64);
    buf.growBufSize(16);
    EXPECT_TRUE(buf.getDataSize() == 4u && buf.getArraySize() == 80u && buf.getNodeType() == BUF_TEMP_NODE);
}

// Which operand of BINOP(t, PLUS, l, r) ends up wrapped in UNOP(t, CONV4, ...).
enum Wrapped { NONE, LEFT, RIGHT };

Wrapped widen(DataType t, ExprBase* l, ExprBase* r) {
    BINOP* b = new BINOP(t, PLUS, l, r);
    auto wraps = [t](ExprBase* e, ExprBase* orig) {
        if (e == orig) return false;
        UNOP* u = e->getNodeType() == UNOP_NODE ? static_cast<UNOP*>(e) : nullptr;
        EXPECT_TRUE(u && u->getOp() == CONV4 && u->getDataType() == t && u->getExpr() == orig);
        return true;
    };
    bool wl = wraps(b->getLeft(), l), wr = wraps(b->getRight(), r);
    EXPECT_FALSE(wl && wr);
    return wl ? LEFT : wr ? RIGHT : NONE;
}

TEST(BINOP, WidensALoneByteOperandOfA32BitIntegerOperation) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    auto tmp = [sp](DataType t) { return sp->getTemp(t, 0, IN_USE_TEMP); };
    struct Case { DataType t, lt, rt; Wrapped w; };
    const Case cases[] = {
        {INT_S, CHAR_U, CHAR_U, NONE},  {INT_S, CHAR_S, POINTER, NONE}, {INT_S, POINTER, CHAR_U, NONE},
        {INT_S, CHAR_S, CHAR_U, NONE},  {INT_S, INT_U, INT_S, NONE},    {INT64_S, CHAR_U, INT_S, NONE},
        {DOUBLE, CHAR_S, DOUBLE, NONE}, {CHAR_S, INT_S, CHAR_S, NONE},  {INT_S, CHAR_U, INT64_S, NONE},
        {INT_U, INT64_U, CHAR_U, NONE}, {INT_U, CHAR_S, INT_U, NONE},   {INT_U, INT_S, CHAR_S, NONE},
        {INT_U, CHAR_U, INT_U, LEFT},   {INT_U, INT_S, CHAR_U, RIGHT},  {INT_U, CHAR_U, FLOAT, LEFT},
        {INT_S, CHAR_U, INT_S, LEFT},   {INT_S, INT_S, CHAR_S, RIGHT},  {INT_S, FLOAT, CHAR_U, RIGHT},
        {INT_S, CHAR_S, INT_U, LEFT},   {INT_U, CHAR_S, INT_S, NONE},
    };
    for (const Case& c : cases)
        EXPECT_EQ(widen(c.t, tmp(c.lt), tmp(c.rt)), c.w)
            << toString(c.t) << " = " << toString(c.lt) << " + " << toString(c.rt);
    // A constant on either side exempts the operation; a missing operand is kept as given.
    EXPECT_EQ(widen(INT_S, tmp(CHAR_U), new CONST(7)), NONE);
    EXPECT_EQ(widen(INT_S, new CONST('x'), tmp(INT_S)), NONE);
    EXPECT_EQ(widen(INT_S, nullptr, tmp(CHAR_U)), NONE);
    // Replacing an operand later does not widen again.
    BINOP* b = new BINOP(INT_S, MUL, tmp(INT_S), tmp(INT_S));
    TEMP* c = tmp(CHAR_U);
    TreeRewriter::replaceLeft(b, c);
    EXPECT_EQ(b->getLeft(), c);
}

TEST(CONST, ConstructorsKeepTypeAndExtendedValue) {
    ZOA_file unit(true, false);
    struct Int { CONST k; DataType t; long long v; };
    const Int ints[] = {
        {CONST(static_cast<unsigned char>(200)), CHAR_U, 200}, {CONST(static_cast<char>(-56)), CHAR_S, -56},
        {CONST(-1), INT_S, -1}, {CONST(4294967295u), INT_U, 4294967295LL}, {CONST(-5LL), INT64_S, -5},
        {CONST(~0ULL), INT64_U, -1}, {CONST(INT_U, 7LL), INT_U, 7},
    };
    for (const Int& c : ints) EXPECT_TRUE(c.k.getDataType() == c.t && c.k.getIValue() == c.v) << toString(c.t);
    EXPECT_TRUE(CONST(1.5f).getDataType() == FLOAT && CONST(1.5f).getFValue() == 1.5);
    EXPECT_EQ(CONST(0.1f).getFValue(), static_cast<double>(0.1f));
    EXPECT_TRUE(CONST(2.5).getDataType() == DOUBLE && CONST(FLOAT, 0.25).getFValue() == 0.25);
    int x = 0;
    CONST p(static_cast<void*>(&x));
    EXPECT_TRUE(p.getDataType() == POINTER && p.getPValue() == &x);
}

TEST(MEM, StateGoesToTheAddressTemporaryOnly) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* t = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    TEMP* buf = sp->getTemp(POINTER, 8, IN_USE_TEMP);
    MEM viaTemp(INT_S, t);
    EXPECT_TRUE(viaTemp.setState(AVAILABLE_TEMP) && t->getState() == AVAILABLE_TEMP);
    EXPECT_EQ(viaTemp.getState(), AVAILABLE_TEMP);
    EXPECT_TRUE(MEM(CHAR_U, buf).setState(PERMANENT_TEMP) && buf->getState() == PERMANENT_TEMP);
    BINOP* addr = new BINOP(POINTER, PLUS, t, new CONST(4));
    MEM* viaExpr = new MEM(INT_S, addr);
    EXPECT_FALSE(viaExpr->setState(IN_USE_TEMP));
    EXPECT_TRUE(viaExpr->getState() == PERMANENT_TEMP && t->getState() == AVAILABLE_TEMP);
    TreeRewriter::replaceExpr(viaExpr, nullptr);
    EXPECT_EQ(viaExpr->getExpr(), addr);
}

TEST(CALL, ConstructorsAndPositionalArgumentReplacement) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(VOID, "f", false);
    TEMP* fp = sp->getTemp(POINTER, 0, IN_USE_TEMP);
    CONST *a = new CONST(1), *b = new CONST(2), *c = new CONST(3);
    std::vector<ExprBase*> args{a, b};
    CALL* named = new CALL(INT_S, "g", args);
    args[0] = c;  // the node keeps its own copy
    auto argsOf = [](CALL* k) { return std::vector<ExprBase*>(k->getArgs().begin(), k->getArgs().end()); };
    EXPECT_EQ(argsOf(named), (std::vector<ExprBase*>{a, b}));
    EXPECT_TRUE(named->getFunctionName() == "g" && !named->getFunctionPointer() && !named->isCallStatic());
    CALL* viaPtr = new CALL(VOID, fp, args);
    EXPECT_TRUE(viaPtr->getFunctionName().empty() && viaPtr->getFunctionPointer() == fp);
    EXPECT_TRUE(CALL(VOID, "h").getArgs().empty() && CALL(VOID, fp).getArgs().empty());

    TreeRewriter::replaceArgs(named, {nullptr, c});
    EXPECT_EQ(argsOf(named), (std::vector<ExprBase*>{a, c}));
    TreeRewriter::replaceArgs(named, {b});  // shorter: the rest is kept
    EXPECT_EQ(argsOf(named), (std::vector<ExprBase*>{b, c}));
    TreeRewriter::replaceArgs(named, {a, b, c});  // longer: the count never changes
    EXPECT_EQ(argsOf(named), (std::vector<ExprBase*>{a, b}));
}

TEST(Statements, LabelFlagsJumpKindsAndNegatedRelations) {
    ZOA_file unit(true, false);
    SUBPROG* sp = unit.createSubprog(INT_S, "f", false);
    LABEL* l = sp->createNewLabel(REGULAR_LABEL);
    LABEL* other = sp->createNewLabel(REGULAR_LABEL);
    TEMP* t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
    MOVE* mv = new MOVE(t, new CONST(1));
    EXP* ex = new EXP(new CALL(VOID, "g"));
    JUMP* toLabel = new JUMP(other);
    EXPECT_TRUE(toLabel->getKind() == DIRECT_LABEL && JUMP(static_cast<ExprBase*>(t)).getKind() == DIRECT_EXPR);
    l->addStmt(nullptr);  // ignored
    EXPECT_TRUE(!l->containsStmts() && l->getStmts().empty());
    for (StmtBase* s : {static_cast<StmtBase*>(mv), static_cast<StmtBase*>(ex)}) l->addStmt(s);
    EXPECT_TRUE(l->containsStmts() && !l->isLastStmtDone());
    for (StmtBase* s : {static_cast<StmtBase*>(toLabel), static_cast<StmtBase*>(ex)}) l->addStmt(s);
    EXPECT_TRUE(l->isLastStmtDone()) << "stays set after later statements";
    EXPECT_EQ(std::vector<StmtBase*>(l->getStmts().begin(), l->getStmts().end()),
              (std::vector<StmtBase*>{mv, ex, toLabel, ex}));
    other->addStmt(new CJUMP(LT, t, t, l, other));
    EXPECT_TRUE(other->isLastStmtDone());

    const BinopKind rel[] = {EQ, NE, LT, LE, GT, GE}, neg[] = {NE, EQ, GE, GT, LE, LT};
    for (int i = 0; i < 6; ++i)
        EXPECT_TRUE(CJUMP::notRel(rel[i]) == neg[i] && CJUMP::notRel(neg[i]) == rel[i]) << toString(rel[i]);
    EXPECT_TRUE(CJUMP::notRel(PLUS) == MAX_BINOP && CJUMP::notRel(MAX_BINOP) == MAX_BINOP);

    NAME* ref = sp->getName(l);
    TreeRewriter::replaceLabelRef(ref, other);
    EXPECT_TRUE(ref->getLabelRef() == other && ref->getId() == other->getId());
}

}  // namespace
}  // namespace ZOA
