// Statement nodes and LABEL, the basic block that holds them.
#ifndef ZOA_STMT_H
#define ZOA_STMT_H

#include <zoa/memmgr.h>
#include <zoa/tree_base.h>

namespace ZOA {

class LABEL;

using StmtList = ArenaList<StmtBase*>;

// Evaluates expr and discards the value (typically a CALL).
class ZOA_API EXP : public StmtBase {
public:
    explicit EXP(ExprBase* e) : expr(e) {}
    EXP(const EXP&) = default;
    EXP& operator=(const EXP&) = default;

    NodeType getNodeType() override { return EXP_NODE; }
    void accept(VisitorBase* v) override;
    ExprBase* getExpr() const { return expr; }

private:
    ExprBase* expr;
};

// Stores src into dst (a TEMP or a MEM; types are not compared).
class ZOA_API MOVE : public StmtBase {
public:
    MOVE(ExprBase* dst, ExprBase* src) : dst(dst), src(src) {}
    MOVE(const MOVE&) = default;
    MOVE& operator=(const MOVE&) = default;

    NodeType getNodeType() override { return MOVE_NODE; }
    void accept(VisitorBase* v) override;
    ExprBase* getDst() const { return dst; }
    ExprBase* getSrc() const { return src; }

private:
    friend class TreeRewriter;
    void replaceDst(ExprBase* e);
    void replaceSrc(ExprBase* e);

    ExprBase* dst;
    ExprBase* src;
};

// left, then right; either side may be null.
class ZOA_API SEQ : public StmtBase {
public:
    SEQ(StmtBase* left, StmtBase* right) : left(left), right(right) {}
    SEQ(const SEQ&) = default;
    SEQ& operator=(const SEQ&) = default;

    NodeType getNodeType() override { return SEQ_NODE; }
    void accept(VisitorBase* v) override;
    StmtBase* getLeft() const { return left; }
    StmtBase* getRight() const { return right; }

private:
    friend class TreeRewriter;
    void replaceLeft(StmtBase* s);
    void replaceRight(StmtBase* s);

    StmtBase* left;
    StmtBase* right;
};

// Goes to a label (DIRECT_LABEL) or to the address an expression yields (DIRECT_EXPR).
class ZOA_API JUMP : public StmtBase {
public:
    explicit JUMP(LABEL* target) : kind(DIRECT_LABEL), expr(nullptr), target(target) {}
    explicit JUMP(ExprBase* e) : kind(DIRECT_EXPR), expr(e), target(nullptr) {}
    JUMP(const JUMP&) = default;

    NodeType getNodeType() override { return JUMP_NODE; }
    void accept(VisitorBase* v) override;
    JumpKind getKind() const { return kind; }
    ExprBase* getExpr() const { return expr; }
    LABEL* getTarget() const { return target; }

private:
    friend class TreeRewriter;
    void replaceExpr(ExprBase* e);   // the kind is not changed
    void replaceTarget(LABEL* l);

    JumpKind kind;
    ExprBase* expr;
    LABEL* target;
};

// If left relOp right holds, goes to ifTrue, else to ifFalse.
class ZOA_API CJUMP : public StmtBase {
public:
    CJUMP(BinopKind rel, ExprBase* left, ExprBase* right, LABEL* ifTrue, LABEL* ifFalse)
        : relOp(rel), left(left), right(right), ifTrue(ifTrue), ifFalse(ifFalse) {}
    CJUMP(const CJUMP&) = default;

    NodeType getNodeType() override { return CJUMP_NODE; }
    void accept(VisitorBase* v) override;
    BinopKind getRelOp() const { return relOp; }
    ExprBase* getLeft() const { return left; }
    ExprBase* getRight() const { return right; }
    LABEL* getIfTrue() const { return ifTrue; }
    LABEL* getIfFalse() const { return ifFalse; }

    // The negated relation (LT gives GE, ...); MAX_BINOP for a non-relation.
    static BinopKind notRel(BinopKind r);

private:
    friend class TreeRewriter;
    void replaceLeft(ExprBase* e);
    void replaceRight(ExprBase* e);
    void replaceIfTrue(LABEL* l);
    void replaceIfFalse(LABEL* l);

    BinopKind relOp;
    ExprBase* left;
    ExprBase* right;
    LABEL* ifTrue;
    LABEL* ifFalse;
};

// A basic block: a numbered jump target and the statements that follow it.
// Labels come from SUBPROG::createNewLabel.
class ZOA_API LABEL : public TreeBase {
public:
    LABEL(const LABEL&) = default;  // own list, same statement pointers

    NodeType getNodeType() override { return LABEL_NODE; }
    void accept(VisitorBase* v) override;
    unsigned int getId() const { return id; }
    LabelKind getKind() const { return kind; }
    const StmtList& getStmts() const { return stmts; }
    bool isLastStmtDone() const { return lastStmtDone; }
    bool containsStmts() const { return hasStmts; }

    // Appends s. A JUMP or CJUMP sets isLastStmtDone() for good; statements after
    // a jump are still accepted. A null statement is ignored.
    void addStmt(StmtBase* s);

protected:
    friend class SUBPROG;
    LABEL(unsigned int id, LabelKind kind) : id(id), kind(kind) {}

private:
    unsigned int id;
    LabelKind kind;
    StmtList stmts;
    bool lastStmtDone = false;
    bool hasStmts = false;
};

}  // namespace ZOA

#endif
