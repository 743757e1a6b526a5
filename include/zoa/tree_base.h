// Node and annotation base classes.
#ifndef ZOA_TREE_BASE_H
#define ZOA_TREE_BASE_H

#include <zoa/enums.h>
#include <zoa/export.h>
#include <zoa/memmgr.h>

#include <cstddef>
#include <new>
#include <string>

namespace ZOA {

class VisitorBase;
class TreeRewriter;

// Base of every per-node annotation. Annotations live in the arena: delete runs
// the destructor and gives no memory back. Derive your own with a destructor.
// They are aligned as ordinary operator new would align them (any member type,
// long double included), and over-aligned ones as their alignment asks.
class ZOA_API TreeAnnotation {
public:
    virtual ~TreeAnnotation() = 0;

    static void* operator new(std::size_t size);
    static void* operator new(std::size_t size, std::align_val_t align);
    static void operator delete(void*, std::size_t) noexcept {}
    static void operator delete(void*, std::size_t, std::align_val_t) noexcept {}
};

// Base of every node. Nodes live in the arena (operator new bumps it, delete
// releases nothing); no node owns or destroys another.
class ZOA_API TreeBase {
public:
    virtual NodeType getNodeType() { return TREE_BASE_NODE; }
    virtual void freeNode() {}
    virtual TreeBase* cloneNode() { return this; }
    virtual TreeAnnotation* getAnnotation() const { return annotation; }
    // Attaches a (may be null). With deleteOld the annotation held before is
    // destroyed; without it, it is merely dropped.
    virtual void setAnnotation(TreeAnnotation* a, bool deleteOld);
    virtual void accept(VisitorBase* v) = 0;
    virtual ~TreeBase() {}

    // Nodes carry no comments: getComment() is always null.
    const char* getComment() const { return nullptr; }
    void setComment(const std::string&) {}

    // Nodes hold pointers, 64-bit integers and doubles: 8-byte alignment.
    static void* operator new(std::size_t size) {
        return MemMgr::allocateAligned(size, alignof(std::max_align_t) < 8 ? alignof(std::max_align_t) : 8);
    }
    static void operator delete(void*, std::size_t) noexcept {}

protected:
    TreeBase() = default;
    TreeBase(const TreeBase&) = default;  // the copy shares the annotation
    TreeBase& operator=(const TreeBase&) = default;

private:
    TreeAnnotation* annotation = nullptr;
};

// Base of expression nodes: adds the type of the value.
class ZOA_API ExprBase : public TreeBase {
public:
    NodeType getNodeType() override { return EXPR_BASE_NODE; }
    DataType getDataType() const { return dataType; }
    unsigned int getDataSize() const { return sizeOfDataType(dataType); }
    // Bytes of a value on the 32-bit target; 0 for VOID and unknown values.
    static unsigned int sizeOfDataType(DataType t);

protected:
    explicit ExprBase(DataType t) : dataType(t) {}
    ExprBase(const ExprBase&) = default;
    ExprBase& operator=(const ExprBase&) = default;

private:
    DataType dataType;
};

// Base of EXP, MOVE, SEQ, JUMP and CJUMP.
class ZOA_API StmtBase : public TreeBase {
public:
    NodeType getNodeType() override { return STMT_BASE_NODE; }

protected:
    StmtBase() = default;
    StmtBase(const StmtBase&) = default;
    StmtBase& operator=(const StmtBase&) = default;
};

}  // namespace ZOA

#endif
