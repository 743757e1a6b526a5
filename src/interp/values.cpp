// Values and C's rules for them: conversions, promotions and arithmetic on the 32-bit target.
#include "interp/rules.h"

#include "core/c_types.h"
#include "core/op_facts.h"
#include "emit/c/c_texts.h"

#include <cmath>
#include <cstdio>
#include <string_view>

namespace ZOA::interp {

static_assert(static_cast<int>(ctypes::CT::POINTER) == static_cast<int>(CType::POINTER) &&
                  static_cast<int>(ctypes::CT::VOID) == static_cast<int>(CType::VOID),
              "the core's C types in the interpreter's order");

void stop(Status s, const std::string& why) { throw Stop{s, why}; }

unsigned bitsOf(CType t) { return ctypes::bitsOf(static_cast<ctypes::CT>(t)); }
int rank(CType t) { return ctypes::rankOf(static_cast<ctypes::CT>(t)); }

std::uint64_t fit(CType t, std::uint64_t v) { return ctypes::fit(static_cast<ctypes::CT>(t), v); }

double roundTo(CType t, long double x) { return ctypes::roundTo(static_cast<ctypes::CT>(t), x); }

std::string ctypeName(CType t) {
    // The C emitter's spelling of the declared type that has this C type.
    for (int d = 0; d < DATA_TYPE_COUNT; ++d) {
        if (ctypeOf(static_cast<DataType>(d)) != t) continue;
        std::string_view name = ctext::typeName(static_cast<DataType>(d));
        while (!name.empty() && name.back() == ' ') name.remove_suffix(1);
        return std::string(name);
    }
    return "?";
}

CType ctypeOf(DataType t) { return static_cast<CType>(ctypes::ctOf(t)); }

Value Value::of(CType t, std::uint64_t b) {
    Value v;
    v.type = t;
    v.bits = t == CType::POINTER ? (b & 0xffffffffu) : fit(t, b);
    return v;
}

Value Value::integer(DataType t, long long x) {
    CType c = ctypeOf(t);
    if (isReal(c)) return floating(t, static_cast<double>(x));
    return of(c, static_cast<std::uint64_t>(x));
}

Value Value::floating(DataType t, double x) {
    Value v;
    v.type = ctypeOf(t) == CType::FLOAT ? CType::FLOAT : CType::DOUBLE;
    v.real = roundTo(v.type, x);
    return v;
}

Value Value::pointer(std::uint32_t address) { return of(CType::POINTER, address); }

std::string format(const Value& v) {
    char buf[64];
    switch (v.type) {
        case CType::SCHAR:
        case CType::UCHAR:
        case CType::INT: std::snprintf(buf, sizeof buf, "%d", static_cast<int>(v.bits)); break;
        case CType::UINT: std::snprintf(buf, sizeof buf, "%u", static_cast<unsigned>(v.bits)); break;
        case CType::LLONG: std::snprintf(buf, sizeof buf, "%lld", static_cast<long long>(v.bits)); break;
        case CType::ULLONG:
            std::snprintf(buf, sizeof buf, "%llu", static_cast<unsigned long long>(v.bits));
            break;
        case CType::FLOAT: std::snprintf(buf, sizeof buf, "%.9g", v.real); break;
        case CType::DOUBLE: std::snprintf(buf, sizeof buf, "%.17g", v.real); break;
        case CType::POINTER: return "ptr";
        case CType::VOID: return "void";
    }
    return buf;
}

const char* toString(Status s) {
    static const char* const n[] = {"ok", "division by zero", "bad address", "unknown function",
                                    "step limit reached", "depth limit reached",
                                    "undefined in C", "no meaning"};
    return n[static_cast<int>(s)];
}

Value Rules::convert(const Value& v, CType to, unsigned scale) const {
    if (v.type == to && to != CType::POINTER) return v;
    if (to == CType::VOID) return Value{};
    if (v.type == CType::VOID) stop(Status::NO_MEANING, "use of a void value");
    if (isReal(to)) {
        if (v.type == CType::POINTER) stop(Status::NO_MEANING, "pointer converted to floating");
        Value r;
        r.type = to;
        long double x = isReal(v.type) ? static_cast<long double>(v.real)
                        : isSigned(v.type) ? static_cast<long double>(static_cast<long long>(v.bits))
                                           : static_cast<long double>(v.bits);
        r.real = roundTo(to, x);
        if (strict && std::isfinite(static_cast<double>(x)) && !std::isfinite(r.real))
            stop(Status::UNDEFINED, "floating value out of the range of its new type");
        return r;
    }
    if (isReal(v.type)) {
        if (to == CType::POINTER) stop(Status::NO_MEANING, "floating value converted to a pointer");
        double x = std::trunc(v.real);
        unsigned w = bitsOf(to);
        long double lo = isSigned(to) ? -std::ldexp(1.0L, static_cast<int>(w) - 1) : -1.0L;
        long double hi = isSigned(to) ? std::ldexp(1.0L, static_cast<int>(w) - 1) : std::ldexp(1.0L, static_cast<int>(w));
        if (std::isnan(v.real) || !(x > lo - (isSigned(to) ? 1 : 0) && x < hi))
            stop(Status::UNDEFINED, "floating value out of the integer's range");
        std::uint64_t b = x < 0 ? static_cast<std::uint64_t>(static_cast<long long>(x))
                                : static_cast<std::uint64_t>(x);
        return Value::of(to, b);
    }
    Value r = Value::of(to, v.bits);
    if (to == CType::POINTER) r.scale = scale;
    return r;
}
Value Rules::promote(const Value& v) {
    if (v.type == CType::SCHAR || v.type == CType::UCHAR) return Value::of(CType::INT, v.bits);
    return v;
}
CType Rules::common(CType a, CType b) {
    return static_cast<CType>(ctypes::common(static_cast<ctypes::CT>(a), static_cast<ctypes::CT>(b)));
}
bool Rules::truth(const Value& v) {
    if (v.type == CType::VOID) stop(Status::NO_MEANING, "use of a void value");
    return isReal(v.type) ? v.real != 0 : v.bits != 0;
}

// Integer arithmetic in type t with wrap-around; in strict mode a signed
// result outside t's range stops the run.
Value Rules::intResult(CType t, i128 exact) const {
    if (strict && isSigned(t)) {
        unsigned w = bitsOf(t);
        i128 lo = -(static_cast<i128>(1) << (w - 1)), hi = (static_cast<i128>(1) << (w - 1)) - 1;
        if (exact < lo || exact > hi) stop(Status::UNDEFINED, "signed overflow in " + ctypeName(t));
    }
    return Value::of(t, static_cast<std::uint64_t>(exact));
}
i128 Rules::wide(const Value& v) {
    return isSigned(v.type) ? static_cast<i128>(static_cast<long long>(v.bits))
                            : static_cast<i128>(v.bits);
}
Value Rules::realResult(CType t, long double exact) const {
    Value r;
    r.type = t;
    r.real = roundTo(t, exact);
    // The sign of a NaN the FPU makes is its own affair.
    if (strict && (static_cast<long double>(r.real) != exact || std::isnan(r.real)))
        stop(Status::UNDEFINED, "floating result not exact in its type");
    return r;
}

Value Rules::binop(BinopKind op, Value a, Value b) const {
    if (a.type == CType::VOID || b.type == CType::VOID) stop(Status::NO_MEANING, "use of a void value");
    bool pa = a.type == CType::POINTER, pb = b.type == CType::POINTER;
    if (isRelation(op)) {
        long double x, y;
        if (pa || pb) {
            if (isReal(a.type) || isReal(b.type)) stop(Status::NO_MEANING, "pointer compared with floating");
            x = static_cast<long double>(a.bits & 0xffffffffu);
            y = static_cast<long double>(b.bits & 0xffffffffu);
        } else {
            CType c = common(promote(a).type, promote(b).type);
            Value ca = convert(promote(a), c), cb = convert(promote(b), c);
            if (isReal(c)) {
                x = ca.real;
                y = cb.real;
            } else {
                bool less = isSigned(c) ? static_cast<long long>(ca.bits) < static_cast<long long>(cb.bits)
                                        : ca.bits < cb.bits;
                x = less ? 0 : (ca.bits == cb.bits ? 1 : 2);
                y = 1;
            }
        }
        bool r = false;
        switch (op) {
            case EQ: r = x == y; break;
            case NE: r = x != y; break;
            case LT: r = x < y; break;
            case LE: r = x <= y; break;
            case GT: r = x > y; break;
            case GE: r = x >= y; break;
            default: break;
        }
        return Value::of(CType::INT, r);
    }
    if (op == PLUS || op == MINUS) {
        if (pa && pb) {
            if (op == PLUS || a.scale != b.scale) stop(Status::NO_MEANING, "invalid pointer arithmetic");
            std::int32_t d = static_cast<std::int32_t>(static_cast<std::uint32_t>(a.bits - b.bits));
            return Value::of(CType::INT, static_cast<std::uint64_t>(static_cast<long long>(d / static_cast<std::int32_t>(a.scale))));
        }
        if (pa || pb) {
            const Value& p = pa ? a : b;
            const Value& n = pa ? b : a;
            if (!isInt(n.type) || (pb && op == MINUS)) stop(Status::NO_MEANING, "invalid pointer arithmetic");
            std::uint64_t off = static_cast<std::uint64_t>(wide(n)) * p.scale;
            Value r = Value::of(CType::POINTER, op == PLUS ? p.bits + off : p.bits - off);
            r.scale = p.scale;
            return r;
        }
    }
    if (pa || pb) stop(Status::NO_MEANING, "pointer operand of an arithmetic operator");
    if (op == AND || op == OR) return Value::of(CType::INT, op == AND ? (truth(a) && truth(b)) : (truth(a) || truth(b)));
    if (op == LSHIFT || op == RSHIFT) {
        Value l = promote(a), r = promote(b);
        if (!isInt(l.type) || !isInt(r.type)) stop(Status::NO_MEANING, "shift of a floating value");
        unsigned w = bitsOf(l.type);
        i128 count = wide(r);
        if (count < 0 || count >= w) {
            if (strict) stop(Status::UNDEFINED, "shift count out of range");
            count &= (w - 1);
        }
        unsigned c = static_cast<unsigned>(count);
        if (op == RSHIFT) {
            std::uint64_t v = isSigned(l.type) ? static_cast<std::uint64_t>(static_cast<long long>(l.bits) >> c)
                                               : (l.bits >> c);
            return Value::of(l.type, v);
        }
        if (strict && isSigned(l.type)) {
            i128 x = wide(l);
            if (x < 0) stop(Status::UNDEFINED, "left shift of a negative value");
            return intResult(l.type, x << c);
        }
        return Value::of(l.type, l.bits << c);
    }
    CType c = common(promote(a).type, promote(b).type);
    Value x = convert(promote(a), c), y = convert(promote(b), c);
    if (isReal(c)) {
        long double p = x.real, q = y.real;
        switch (op) {
            case PLUS: return realResult(c, p + q);
            case MINUS: return realResult(c, p - q);
            case MUL: return realResult(c, p * q);
            case DIV:
                if (q == 0) stop(Status::DIVISION_BY_ZERO, "floating division by zero");
                return realResult(c, p / q);
            default: stop(Status::NO_MEANING, "integer operator on a floating value");
        }
    }
    i128 p = wide(x), q = wide(y);
    switch (op) {
        case PLUS: return intResult(c, p + q);
        case MINUS: return intResult(c, p - q);
        case MUL: return isSigned(c) ? intResult(c, p * q) : Value::of(c, x.bits * y.bits);
        case DIV:
        case MOD: {
            if (q == 0) stop(Status::DIVISION_BY_ZERO, "division by zero");
            if (isSigned(c) && q == -1 && p == -(static_cast<i128>(1) << (bitsOf(c) - 1)))
                stop(Status::DIVISION_BY_ZERO, "division of the most negative value by -1");
            return Value::of(c, static_cast<std::uint64_t>(op == DIV ? p / q : p % q));
        }
        case BITWISE_AND: return Value::of(c, x.bits & y.bits);
        case BITWISE_OR: return Value::of(c, x.bits | y.bits);
        case XOR: return Value::of(c, x.bits ^ y.bits);
        default: stop(Status::NO_MEANING, "operator without a C text");
    }
}

Value Rules::negate(const Value& v) const {
    Value x = promote(v);
    if (isReal(x.type)) {
        x.real = -x.real;
        return x;
    }
    if (!isInt(x.type)) stop(Status::NO_MEANING, "negation of a non-number");
    return intResult(x.type, -wide(x));
}

}  // namespace ZOA::interp
