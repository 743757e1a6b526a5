// Expression nodes: construction, widening of lone 8-bit operands, replace operations.
#include <zoa/expr.h>
#include <zoa/stmt.h>
#include <zoa/visitor.h>

#include "core/type_facts.h"

namespace ZOA {

BINOP::BINOP(DataType t, BinopKind op, ExprBase* left, ExprBase* right)
    : ExprBase(t), op(op), left(left), right(right) {
    checkExprs();
}

void BINOP::checkExprs() {
    if (!left || !right) return;
    if (left->getNodeType() == CONST_NODE || right->getNodeType() == CONST_NODE) return;
    DataType lt = left->getDataType(), rt = right->getDataType(), t = getDataType();
    if (lt == rt || lt == POINTER || rt == POINTER) return;
    if ((isByteType(lt) && isByteType(rt)) || (isInt32Type(lt) && isInt32Type(rt))) return;
    if (!isInt32Type(t)) return;
    if (isInt64Type(lt) || isInt64Type(rt)) return;
    if (t == INT_U) {
        if (lt == CHAR_S || rt == CHAR_S) return;
        if (lt == CHAR_U) left = new UNOP(t, CONV4, left);
        else if (rt == CHAR_U) right = new UNOP(t, CONV4, right);
        return;
    }
    if (isByteType(lt)) left = new UNOP(t, CONV4, left);
    else if (isByteType(rt)) right = new UNOP(t, CONV4, right);
}

void BINOP::accept(VisitorBase* v) { v->visit(this); }

void BINOP::replaceLeft(ExprBase* e) {
    if (left) left->freeNode();
    left = e;
}

void BINOP::replaceRight(ExprBase* e) {
    if (right) right->freeNode();
    right = e;
}

UNOP::UNOP(DataType t, UnopKind op, ExprBase* e) : ExprBase(t), op(op), expr(e) {}

void UNOP::accept(VisitorBase* v) { v->visit(this); }

void UNOP::replaceExpr(ExprBase* e) {
    if (expr) expr->freeNode();
    expr = e;
}

TEMP::TEMP(unsigned int id, DataType t) : ExprBase(t), id(id), tempKind(REGULAR_TEMP), state(IN_USE_TEMP) {}

TEMP::TEMP(unsigned int id, DataType t, TempKind k) : ExprBase(t), id(id), tempKind(k), state(PERMANENT_TEMP) {}

void TEMP::accept(VisitorBase* v) { v->visit(this); }

BUF_TEMP::BUF_TEMP(unsigned int id, unsigned int arraySize) : TEMP(id, POINTER), arraySize(arraySize) {}

void BUF_TEMP::accept(VisitorBase* v) { v->visit(this); }

CONST::CONST(DataType t, long long v) : ExprBase(t) { value.i = v; }
CONST::CONST(DataType t, double v) : ExprBase(t) { value.f = v; }
namespace {
// A typed integer literal: FLOAT and DOUBLE keep it as a double.
template <class Int> void setTyped(DataType t, Int v, long long& i, double& f) {
    if (isFloatingType(t)) f = static_cast<double>(v);
    else i = static_cast<long long>(v);
}
}  // namespace

CONST::CONST(DataType t, int v) : ExprBase(t) { setTyped(t, v, value.i, value.f); }
CONST::CONST(DataType t, unsigned int v) : ExprBase(t) { setTyped(t, v, value.i, value.f); }
CONST::CONST(DataType t, long v) : ExprBase(t) { setTyped(t, v, value.i, value.f); }
CONST::CONST(DataType t, unsigned long v) : ExprBase(t) { setTyped(t, v, value.i, value.f); }
CONST::CONST(DataType t, unsigned long long v) : ExprBase(t) { setTyped(t, v, value.i, value.f); }
CONST::CONST(int v) : ExprBase(INT_S) { value.i = v; }
CONST::CONST(char v) : ExprBase(CHAR_S) { value.i = static_cast<signed char>(v); }
CONST::CONST(long long v) : ExprBase(INT64_S) { value.i = v; }
CONST::CONST(unsigned int v) : ExprBase(INT_U) { value.i = static_cast<long long>(v); }
CONST::CONST(unsigned char v) : ExprBase(CHAR_U) { value.i = v; }
CONST::CONST(unsigned long long v) : ExprBase(INT64_U) { value.i = static_cast<long long>(v); }
CONST::CONST(float v) : ExprBase(FLOAT) { value.f = v; }
CONST::CONST(double v) : ExprBase(DOUBLE) { value.f = v; }
CONST::CONST(void* p) : ExprBase(POINTER) { value.p = p; }

void CONST::accept(VisitorBase* v) { v->visit(this); }

MEM::MEM(DataType t, ExprBase* address) : ExprBase(t), expr(address) {}

void MEM::accept(VisitorBase* v) { v->visit(this); }

namespace {
TEMP* asTemp(ExprBase* e) {
    if (!e) return nullptr;
    NodeType k = e->getNodeType();
    return (k == TEMP_NODE || k == BUF_TEMP_NODE) ? static_cast<TEMP*>(e) : nullptr;
}
}  // namespace

TempState MEM::getState() const {
    TEMP* t = asTemp(expr);
    return t ? t->getState() : PERMANENT_TEMP;
}

bool MEM::setState(TempState s) {
    TEMP* t = asTemp(expr);
    if (!t) return false;
    t->setState(s);
    return true;
}

void MEM::replaceExpr(ExprBase* e) {
    if (!e) return;
    if (expr) expr->freeNode();
    expr = e;
}

NAME::NAME(unsigned int id, NameKind k, const char* text)
    : ExprBase(POINTER), id(id), kind(k), declaredLocal(false), labelRef(nullptr), stringValue(text ? text : "") {}

NAME::NAME(LABEL* l)
    : ExprBase(POINTER), id(l ? l->getId() : 0), kind(LABEL_REF), declaredLocal(false), labelRef(l) {}

NAME::NAME(unsigned int id, CONST* c)
    : ExprBase(c ? c->getDataType() : VOID), id(id), kind(STATIC_DATA_REF), declaredLocal(false), labelRef(nullptr) {
    exprList.push_back(c);
}

NAME::NAME(unsigned int id, const std::list<ExprBase*>& values)
    : ExprBase(POINTER), id(id), kind(CONST_ARRAY_REF), declaredLocal(false), labelRef(nullptr),
      exprList(values.begin(), values.end()) {}

void NAME::accept(VisitorBase* v) { v->visit(this); }

void NAME::replaceLabelRef(LABEL* l) {
    if (labelRef) labelRef->freeNode();
    labelRef = l;
    if (l) id = l->getId();
}

CALL::CALL(DataType t, const char* name, const std::vector<ExprBase*>& args)
    : ExprBase(t), functionName(name ? name : ""), functionPointer(nullptr), args(args.begin(), args.end()),
      staticCall(false) {}

CALL::CALL(DataType t, const char* name)
    : ExprBase(t), functionName(name ? name : ""), functionPointer(nullptr), staticCall(false) {}

CALL::CALL(DataType t, TEMP* fp, const std::vector<ExprBase*>& args)
    : ExprBase(t), functionPointer(fp), args(args.begin(), args.end()), staticCall(false) {}

CALL::CALL(DataType t, TEMP* fp) : ExprBase(t), functionPointer(fp), staticCall(false) {}

void CALL::accept(VisitorBase* v) { v->visit(this); }

void CALL::replaceArgs(const std::vector<ExprBase*>& newArgs) {
    std::size_t n = args.size() < newArgs.size() ? args.size() : newArgs.size();
    for (std::size_t i = 0; i < n; ++i) {
        if (!newArgs[i]) continue;
        if (args[i]) args[i]->freeNode();
        args[i] = newArgs[i];
    }
}

}  // namespace ZOA
