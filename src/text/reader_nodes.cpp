// The text reader's expressions and statements.
#include "text/reader.h"

namespace ZOA::text::detail {

CONST* Builder::constant(const SNode& n) {
    arity(n, 1, 2);
    if (n.items.size() == 2) {  // the untyped constructors: int, double, text
        const SNode& v = n.items[1];
        if (v.kind == SNode::STRING) return new CONST(const_cast<char*>(arenaText(text(v))));
        if (v.kind == SNode::REAL) return new CONST(v.real);
        if (v.kind == SNode::INTEGER && v.magnitude <= (v.negative ? 0x80000000ULL : 0x7fffffffULL))
            return new CONST(static_cast<int>(v.negative ? -static_cast<long long>(v.magnitude)
                                                          : static_cast<long long>(v.magnitude)));
        error(v, "'" + quote(v) + "' is no int, double or text constant");
    }
    DataType t = dataType(n.items[1]);
    const SNode& v = n.items[2];
    if (t == FLOAT || t == DOUBLE) {
        if (v.kind == SNode::REAL) return new CONST(t, v.real);
        if (v.kind == SNode::INTEGER)
            return new CONST(t, v.negative ? -static_cast<double>(v.magnitude) : static_cast<double>(v.magnitude));
        if (isSymbol(v, "nan")) return new CONST(t, std::numeric_limits<double>::quiet_NaN());
        if (isSymbol(v, "inf")) return new CONST(t, std::numeric_limits<double>::infinity());
        if (isSymbol(v, "-inf")) return new CONST(t, -std::numeric_limits<double>::infinity());
        error(v, "expected a floating value, found '" + quote(v) + "'");
    }
    if (t == POINTER) {
        if (isSymbol(v, "null")) return new CONST(static_cast<void*>(nullptr));
        if (v.kind == SNode::STRING) return new CONST(const_cast<char*>(arenaText(text(v))));
        error(v, "a POINTER constant is null or a text, not '" + quote(v) + "'");
    }
    if (v.kind != SNode::INTEGER) error(v, "expected an integer, found '" + quote(v) + "'");
    if (v.negative && v.magnitude > 0x8000000000000000ULL) error(v, "number '" + str(v) + "' is out of range");
    unsigned long long bits = v.negative ? 0ULL - v.magnitude : v.magnitude;
    return new CONST(t, static_cast<long long>(bits));
}

ExprBase* Builder::expr(const SNode& n, int ctx) {
    if (n.kind == SNode::SYMBOL) return refExpr(n, ctx);
    return at(n, makeExpr(n, ctx));
}

// A declared temp or name was recorded where it was declared, and that record
// always comes first; only the return temporary is recorded where it is used.
ExprBase* Builder::refExpr(const SNode& n, int ctx) {
    if (isSymbol(n, "nil")) return nullptr;
    Ref r = ref(n);
    if (r.valid && r.letter == 't') {
        SubScope& s = scopeOf(n, r, ctx);
        TEMP* t = find(n, s.temps, r.id, "temporary");
        return t == s.returnTemp ? at(n, t) : t;
    }
    if (r.valid && r.letter == 'n') return find(n, scopeOf(n, r, ctx).names, r.id, "name");
    if (r.valid && r.letter == 'g' && r.sub < 0) {
        if (r.id >= globals.size()) error(n, "name '" + str(n) + "' is not declared");
        return globals[r.id];
    }
    if (r.valid && r.letter == 'L') error(n, "a label is no expression: write (NAME " + str(n) + ") for its address");
    error(n, "expected an expression, found '" + quote(n) + "'");
}

ExprBase* Builder::makeExpr(const SNode& n, int ctx) {
    std::string_view h = head(n);
    NodeType kind = TREE_BASE_NODE;
    if (h.empty()) error(n, "expected an expression, found '" + quote(n) + "'");
    lookupNodeKind(h, kind);
    switch (kind) {
        case CONST_NODE: return constant(n);
        case BINOP_NODE: {
            arity(n, 4, 4);
            DataType t = dataType(n.items[1]);
            BinopKind op = enumerator(n.items[2], lookupBinop, 31, "operator");
            ExprBase* l = expr(n.items[3], ctx);
            return new BINOP(t, op, l, expr(n.items[4], ctx));
        }
        case UNOP_NODE: {
            arity(n, 3, 3);
            DataType t = dataType(n.items[1]);
            UnopKind op = enumerator(n.items[2], lookupUnop, 31, "operator");
            return new UNOP(t, op, expr(n.items[3], ctx));
        }
        case MEM_NODE: {
            arity(n, 2, 2);
            DataType t = dataType(n.items[1]);
            return new MEM(t, expr(n.items[2], ctx));
        }
        case NAME_NODE: {
            arity(n, 1, 2);
            NAME* nm = ctx >= 0 ? subs[static_cast<std::size_t>(ctx)].sp->getName(labelRef(n.items[1], ctx))
                                : unit->getName(labelRef(n.items[1], ctx));
            if (n.items.size() == 3) {
                if (!isSymbol(n.items[2], "local")) error(n.items[2], "unknown flag '" + quote(n.items[2]) + "'");
                nm->setDeclaredLocal();
            }
            return nm;
        }
        case BUF_TEMP_NODE: {
            arity(n, 2, 2);
            unsigned int id = unsignedValue(n.items[1], "an id");
            return new BUF_TEMP(id, unsignedValue(n.items[2], "a size"));
        }
        case CALL_NODE: {
            arity(n, 2, ANY);
            DataType t = dataType(n.items[1]);
            const SNode& target = n.items[2];
            std::size_t i = 3;
            bool isStatic = i < n.items.size() && isSymbol(n.items[i], "static");
            if (isStatic) ++i;
            std::vector<ExprBase*> args;
            for (; i < n.items.size(); ++i) args.push_back(expr(n.items[i], ctx));
            CALL* c;
            if (target.kind == SNode::STRING) {
                c = new CALL(t, str(target).c_str(), args);
            } else {
                Ref r = ref(target);
                if (!r.valid || r.letter != 't')
                    error(target, "a CALL names a function by a text or a temporary, not '" + quote(target) + "'");
                c = new CALL(t, find(target, scopeOf(target, r, ctx).temps, r.id, "temporary"), args);
            }
            c->setStaticCall(isStatic);
            return c;
        }
        default: break;
    }
    error(n.items[0], "unknown expression node '" + std::string(h) + "'");
}

StmtBase* Builder::makeStmt(const SNode& n, int ctx) {
    std::string_view h = head(n);
    NodeType kind = TREE_BASE_NODE;
    if (h.empty()) error(n, "expected a statement, found '" + quote(n) + "'");
    lookupNodeKind(h, kind);
    switch (kind) {
        case MOVE_NODE: {
            arity(n, 2, 2);
            ExprBase* d = expr(n.items[1], ctx);
            return new MOVE(d, expr(n.items[2], ctx));
        }
        case EXP_NODE:
            arity(n, 1, 1);
            return new EXP(expr(n.items[1], ctx));
        case SEQ_NODE: {
            arity(n, 2, 2);
            StmtBase* l = isSymbol(n.items[1], "nil") ? nullptr : stmt(n.items[1], ctx);
            return new SEQ(l, isSymbol(n.items[2], "nil") ? nullptr : stmt(n.items[2], ctx));
        }
        case JUMP_NODE: {
            arity(n, 1, 2);
            if (n.items.size() == 3) {  // explicit kind, needed only for a null target
                if (isSymbol(n.items[1], "label")) return new JUMP(labelOrNil(n.items[2], ctx));
                if (isSymbol(n.items[1], "expr")) return new JUMP(expr(n.items[2], ctx));
                error(n.items[1], "a JUMP's kind is label or expr, not '" + quote(n.items[1]) + "'");
            }
            const SNode& t = n.items[1];
            Ref r = ref(t);
            if (isSymbol(t, "nil") || (r.valid && r.letter == 'L')) return new JUMP(labelOrNil(t, ctx));
            return new JUMP(expr(t, ctx));
        }
        case CJUMP_NODE: {
            arity(n, 5, 5);
            BinopKind rel = enumerator(n.items[1], lookupBinop, 31, "relation");
            ExprBase* l = expr(n.items[2], ctx);
            ExprBase* r = expr(n.items[3], ctx);
            LABEL* t = labelOrNil(n.items[4], ctx);
            return new CJUMP(rel, l, r, t, labelOrNil(n.items[5], ctx));
        }
        default: break;
    }
    error(n.items[0], "unknown statement node '" + std::string(h) + "'");
}

}  // namespace ZOA::text::detail
