// The C mode's expression grammar.
#include "fuzz/gen_c.h"

namespace ZOA::fuzz {

namespace {

const DataType integerTypes[] = {CHAR_U, INT_U, INT64_U, CHAR_S, INT_S, INT64_S};

// The conversions whose C cast yields t; none for a type without one.
const std::vector<UnopKind>& castsTo(DataType t) {
    static std::vector<UnopKind> byType[DATA_TYPE_COUNT];
    static bool ready = false;
    if (!ready) {
        for (int k = CONV4; k <= CONV26; ++k) {
            const ConversionFacts& c = conversionFacts(static_cast<UnopKind>(k));
            if (c.hasCast && c.to != POINTER) byType[c.to].push_back(static_cast<UnopKind>(k));
        }
        ready = true;
    }
    static const std::vector<UnopKind> none;
    return static_cast<unsigned>(t) < DATA_TYPE_COUNT ? byType[t] : none;
}

// Conversions the C text writes bare.
const std::vector<UnopKind>& bareConversions() {
    static std::vector<UnopKind> bare;
    if (bare.empty())
        for (int k = CONV4; k <= CONV26; ++k)
            if (!conversionFacts(static_cast<UnopKind>(k)).hasCast) bare.push_back(static_cast<UnopKind>(k));
    return bare;
}

}  // namespace

DataType CBuilder::anyType(bool allowReal) {
    if (allowReal && chance(6)) return chance(50) ? FLOAT : DOUBLE;
    return pick(integerTypes);
}

ExprBase* CBuilder::exprInner(DataType t, unsigned depth) {
    if (depth == 0 || chance(25)) {
        if (chance(20))
            if (ExprBase* a = address(t, false)) return new MEM(t, a);
        return leaf(t);
    }
    if (isFloatingType(t)) {
        switch (below(3)) {
            case 0: {
                static const BinopKind ops[] = {PLUS, MINUS, MUL};
                return new BINOP(t, pick(ops), expr(t, depth - 1), expr(t, depth - 1));
            }
            case 1: return new UNOP(t, castsTo(t)[0], new BINOP(INT_S, BITWISE_AND, expr(INT_S, depth - 1), intConst(INT_S, 1023)));
            default: return new UNOP(t, NEG, expr(t, depth - 1));
        }
    }
    DataType other = chance(70) ? t : anyType(false);
    switch (below(11)) {
        case 0:
        case 1:
        case 2: {
            static const BinopKind ops[] = {PLUS, MINUS, MUL, BITWISE_AND, BITWISE_OR, XOR, AND, OR};
            BinopKind op = pick(ops);
            // Signed arithmetic on narrowed operands rarely overflows.
            if ((t == INT_S || t == INT64_S) && op <= MUL && chance(60))
                return new BINOP(t, op, new BINOP(t, BITWISE_AND, expr(t, depth - 1), intConst(t, 0x7fff)),
                                 new BINOP(t, BITWISE_AND, expr(other, depth - 1), intConst(other, 0x7fff)));
            return new BINOP(t, op, expr(t, depth - 1), expr(other, depth - 1));
        }
        case 3: {
            static const BinopKind ops[] = {DIV, MOD};
            ExprBase* d = new BINOP(other, BITWISE_OR, expr(other, depth - 1), intConst(other, 1));
            return new BINOP(t, pick(ops), expr(t, depth - 1), d);
        }
        case 4: {
            static const BinopKind ops[] = {LSHIFT, RSHIFT};
            bool wide = isInt64Type(t);
            BinopKind op = pick(ops);
            DataType left = op == LSHIFT && chance(92) ? (wide ? INT64_U : INT_U) : t;
            ExprBase* count = new BINOP(INT_S, BITWISE_AND, expr(INT_S, depth - 1), intConst(INT_S, wide ? 63 : 31));
            return new BINOP(t, op, expr(left, depth - 1), count);
        }
        case 5: {
            DataType u = anyType(true);
            return new BINOP(t, pick(RELATIONS), expr(u, depth - 1), expr(u, depth - 1));
        }
        case 6: {
            static const UnopKind ops[] = {NEG, NOT, BITWISE_NOT, ABS};
            UnopKind op = pick(ops);
            if ((op == NEG || op == ABS) && (t == INT_S || t == INT64_S))
                return new UNOP(t, op, new BINOP(t, BITWISE_AND, expr(t, depth - 1), intConst(t, 0xffff)));
            return new UNOP(t, op, expr(t, depth - 1));
        }
        case 7:
        case 8: {
            const auto& casts = castsTo(t);
            if (casts.empty() || chance(15)) {
                if (TEMP* v = varOf(t, true)) return new UNOP(t, pick(bareConversions()), v);
                return leaf(t);
            }
            DataType from = anyType(true);
            ExprBase* x = expr(from, depth - 1);
            if (isFloatingType(from))  // keep the value inside every integer type
                x = new UNOP(from, castsTo(from)[0], new BINOP(INT_S, BITWISE_AND, expr(INT_S, depth - 1), intConst(INT_S, 127)));
            return new UNOP(t, pick(casts), x);
        }
        default:
            if (ExprBase* a = address(t, false)) return new MEM(t, a);
            return leaf(t);
    }
}

}  // namespace ZOA::fuzz
