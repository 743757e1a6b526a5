// Expression nodes: constants, temporaries, memory, names, operators and calls.
#ifndef ZOA_EXPR_H
#define ZOA_EXPR_H

#include <zoa/memmgr.h>
#include <zoa/tree_base.h>

#include <list>
#include <vector>

namespace ZOA {

class LABEL;
class SUBPROG;
class ZOA_file;

using ExprList = ArenaList<ExprBase*>;
using ExprVector = ArenaVector<ExprBase*>;

// left op right. A lone 8-bit operand of a 32-bit integer operation is widened
// at construction by wrapping it in UNOP(type, CONV4, operand); constants,
// pointers and 64-bit operands are never widened. With a null operand both
// operands are stored as given.
class ZOA_API BINOP : public ExprBase {
public:
    BINOP(DataType t, BinopKind op, ExprBase* left, ExprBase* right);
    BINOP(const BINOP&) = default;

    NodeType getNodeType() override { return BINOP_NODE; }
    void accept(VisitorBase* v) override;
    BinopKind getOp() const { return op; }
    ExprBase* getLeft() const { return left; }
    ExprBase* getRight() const { return right; }

private:
    friend class TreeRewriter;
    void checkExprs();
    void replaceLeft(ExprBase* e);
    void replaceRight(ExprBase* e);

    BinopKind op;
    ExprBase* left;
    ExprBase* right;
};

// op applied to expr; conversions yield the UNOP's own type.
class ZOA_API UNOP : public ExprBase {
public:
    UNOP(DataType t, UnopKind op, ExprBase* e);
    UNOP(const UNOP&) = default;

    NodeType getNodeType() override { return UNOP_NODE; }
    void accept(VisitorBase* v) override;
    UnopKind getOp() const { return op; }
    ExprBase* getExpr() const { return expr; }

private:
    friend class TreeRewriter;
    void replaceExpr(ExprBase* e);

    UnopKind op;
    ExprBase* expr;
};

// A temporary (virtual register), numbered within its subprogram. Temporaries
// come from SUBPROG::getTemp and getArgTemp.
class ZOA_API TEMP : public ExprBase {
public:
    TEMP(const TEMP&) = default;

    NodeType getNodeType() override { return TEMP_NODE; }
    void accept(VisitorBase* v) override;
    unsigned int getId() const { return id; }
    TempKind getType() const { return tempKind; }
    TempState getState() const { return state; }
    void setState(TempState s) { state = s; }

protected:
    friend class SUBPROG;
    TEMP(unsigned int id, DataType t);              // REGULAR_TEMP, IN_USE_TEMP
    TEMP(unsigned int id, DataType t, TempKind k);  // PERMANENT_TEMP

private:
    unsigned int id;
    TempKind tempKind;
    TempState state;
};

// A temporary standing for a buffer of arraySize bytes; its value, of type
// POINTER, is the buffer's address.
class ZOA_API BUF_TEMP : public TEMP {
public:
    BUF_TEMP(unsigned int id, unsigned int arraySize);
    BUF_TEMP(const BUF_TEMP&) = default;

    NodeType getNodeType() override { return BUF_TEMP_NODE; }
    void accept(VisitorBase* v) override;
    unsigned int getArraySize() const { return arraySize; }
    void growBufSize(unsigned int n) { arraySize += n; }
    // The buffer's alignment in bytes; 0 (the default) leaves it to the
    // output (the C text's char array, the assembly's frame slot). A value
    // that is not a power of two is rounded up to one; above 4096 it is 4096.
    void setAlignment(unsigned int bytes);
    unsigned int getAlignment() const { return alignment; }

private:
    unsigned int arraySize;
    unsigned int alignment = 0;
};

// A literal. Integers are kept extended to 64 bits, FLOAT and DOUBLE as a
// double, POINTER as a pointer (for a non-null POINTER constant: the address of
// a NUL-terminated text, which the outputs write as it stands).
class ZOA_API CONST : public ExprBase {
public:
    CONST(DataType t, long long v);
    CONST(DataType t, double v);
    // So that CONST(INT_S, 5) and CONST(INT_U, 5u) compile as written: the
    // value is kept as an integer, or as a double when t is FLOAT or DOUBLE.
    CONST(DataType t, int v);
    CONST(DataType t, unsigned int v);
    CONST(DataType t, long v);
    CONST(DataType t, unsigned long v);
    CONST(DataType t, unsigned long long v);
    CONST(int v);
    CONST(char v);
    CONST(long long v);
    CONST(unsigned int v);
    CONST(unsigned char v);
    CONST(unsigned long long v);
    CONST(float v);
    CONST(double v);
    CONST(void* p);
    CONST(const CONST&) = default;

    NodeType getNodeType() override { return CONST_NODE; }
    void accept(VisitorBase* v) override;
    long long getIValue() const { return value.i; }
    double getFValue() const { return value.f; }
    const void* getPValue() const { return value.p; }

private:
    union Value {
        long long i;
        double f;
        const void* p;
    } value;
};

// The memory cell of the node's type at the address expr yields.
class ZOA_API MEM : public ExprBase {
public:
    MEM(DataType t, ExprBase* address);
    MEM(const MEM&) = default;

    NodeType getNodeType() override { return MEM_NODE; }
    void accept(VisitorBase* v) override;
    ExprBase* getExpr() const { return expr; }
    // The state of the address temporary; PERMANENT_TEMP when the address is no TEMP.
    TempState getState() const;
    // Sets the address temporary's state; false (and no change) when it is no TEMP.
    bool setState(TempState s);

private:
    friend class TreeRewriter;
    void replaceExpr(ExprBase* e);  // null leaves the node unchanged

    ExprBase* expr;
};

// A symbolic address or named datum. NAMEs come from the getName operations of
// SUBPROG (local data) and ZOA_file (file-level data), which deduplicate them.
class ZOA_API NAME : public ExprBase {
public:
    NAME(const NAME&) = default;

    NodeType getNodeType() override { return NAME_NODE; }
    void accept(VisitorBase* v) override;
    unsigned int getId() const { return id; }
    NameKind getKind() const { return kind; }
    bool isDeclaredLocal() const { return declaredLocal; }
    void setDeclaredLocal() { declaredLocal = true; }
    bool isLabelRef() const { return labelRef != nullptr; }
    LABEL* getLabelRef() const { return labelRef; }
    const ExprList& getList() const { return exprList; }
    const String& getStringValue() const { return stringValue; }
    // Data made by createData or createZeroData: never returned by getName,
    // never merged with other data, written to as the program likes.
    bool isPrivateData() const { return privateData; }
    // For a createZeroData name: its size in bytes, all zero at start; 0 for
    // every other name.
    unsigned int getZeroBytes() const { return zeroBytes; }
    // The alignment of a data name's storage in bytes; 0 (the default) is its
    // values' natural alignment (one byte for zero-filled data). Rounded and
    // capped as BUF_TEMP::setAlignment. Written for data definitions in both
    // C flavours and in the assembly; other kinds of names ignore it.
    void setAlignment(unsigned int bytes);
    unsigned int getAlignment() const { return alignment; }

protected:
    friend class SUBPROG;
    friend class ZOA_file;
    NAME(unsigned int id, NameKind k, const char* text);
    explicit NAME(LABEL* l);
    NAME(unsigned int id, CONST* c);
    // A CONST_ARRAY_REF; an empty list is accepted and makes a name with no values.
    NAME(unsigned int id, const std::list<ExprBase*>& values);

private:
    friend class TreeRewriter;
    void replaceLabelRef(LABEL* l);

    unsigned int id;
    NameKind kind;
    bool declaredLocal : 1;
    bool privateData : 1;
    unsigned int zeroBytes = 0;
    unsigned int alignment = 0;
    LABEL* labelRef;
    ExprList exprList;
    String stringValue;
};

// A call of a named function, or through the function address a TEMP holds
// (then the name is empty). staticCall is a client flag the library ignores.
class ZOA_API CALL : public ExprBase {
public:
    CALL(DataType t, const char* name, const std::vector<ExprBase*>& args);
    CALL(DataType t, const char* name);
    CALL(DataType t, TEMP* fp, const std::vector<ExprBase*>& args);
    CALL(DataType t, TEMP* fp);
    CALL(const CALL&) = default;

    NodeType getNodeType() override { return CALL_NODE; }
    void accept(VisitorBase* v) override;
    const String& getFunctionName() const { return functionName; }
    TEMP* getFunctionPointer() const { return functionPointer; }
    const ExprVector& getArgs() const { return args; }
    bool isCallStatic() const { return staticCall; }
    void setStaticCall(bool s) { staticCall = s; }

private:
    friend class TreeRewriter;
    // Position by position: a non-null entry replaces the argument, a null one
    // keeps it. The argument count never changes: with a shorter vector the
    // arguments past its end are kept, with a longer one the extra entries
    // are ignored.
    void replaceArgs(const std::vector<ExprBase*>& newArgs);
    void checkArgs() {}

    String functionName;
    TEMP* functionPointer;
    ExprVector args;
    bool staticCall;
};

}  // namespace ZOA

#endif
