// The interpreter: evaluates a unit's trees with the meaning of the C the emitter writes.
#include <zoa/interp.h>
#include <zoa/zoa.h>

#include "core/c_literal.h"
#include "core/traces.h"

#include <cctype>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <functional>
#include <map>
#include <ostream>
#include <sstream>
#include <unordered_map>

namespace ZOA::interp {

namespace {

__extension__ typedef __int128 i128;

struct Stop {
    Status status;
    std::string message;
};

[[noreturn]] void stop(Status s, const std::string& why) { throw Stop{s, why}; }

bool isInt(CType t) { return t <= CType::ULLONG; }
bool isReal(CType t) { return t == CType::FLOAT || t == CType::DOUBLE; }
bool isSigned(CType t) { return t == CType::SCHAR || t == CType::INT || t == CType::LLONG; }
unsigned bitsOf(CType t) {
    static const unsigned w[] = {8, 8, 32, 32, 64, 64, 32, 64, 32, 0};
    return w[static_cast<int>(t)];
}
int rank(CType t) {
    static const int r[] = {0, 0, 1, 1, 2, 2, 0, 0, 0, 0};
    return r[static_cast<int>(t)];
}
unsigned sizeOfC(CType t) { return bitsOf(t) / 8; }

// Cuts v to the width of t and extends it back by t's signedness.
std::uint64_t fit(CType t, std::uint64_t v) {
    unsigned w = bitsOf(t);
    if (w == 64 || w == 0) return v;
    std::uint64_t mask = (std::uint64_t{1} << w) - 1;
    v &= mask;
    if (isSigned(t) && (v >> (w - 1)) & 1) v |= ~mask;
    return v;
}

double roundTo(CType t, long double x) {
    return t == CType::FLOAT ? static_cast<double>(static_cast<float>(x)) : static_cast<double>(x);
}

const char* ctypeName(CType t) {
    static const char* const n[] = {"char", "unsigned char", "int", "unsigned int", "int64",
                                    "uint64", "float", "double", "pointer", "void"};
    return n[static_cast<int>(t)];
}

}  // namespace

CType ctypeOf(DataType t) {
    static const CType m[] = {CType::UCHAR, CType::UINT, CType::ULLONG, CType::SCHAR, CType::INT,
                              CType::LLONG, CType::FLOAT, CType::DOUBLE, CType::POINTER, CType::VOID};
    return static_cast<unsigned>(t) < 10 ? m[t] : CType::VOID;
}

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

namespace {

// Blocks of the simulated 32-bit memory; addresses start well above 0 so that
// null and small integers are never valid, and blocks are kept apart by gaps
// so that running off one never lands in the next.
struct Block {
    std::uint32_t size = 0;
    std::vector<unsigned char> data;
    std::vector<unsigned char> written;
    bool readOnly = false;
    bool heap = false;
};

constexpr std::uint32_t DATA_START = 0x00100000;
constexpr std::uint32_t CODE_START = 0xF0000000;  // label and function addresses
constexpr std::uint64_t MEMORY_LIMIT = 256u << 20;

struct Trace {
    std::vector<LABEL*> order;
    std::unordered_map<const LABEL*, std::size_t> index;
    // For each jump the fall-through test may drop: the label printed before its target.
    std::unordered_map<const StmtBase*, const LABEL*> prev;
};

struct Frame {
    SUBPROG* sp = nullptr;
    const Trace* trace = nullptr;
    std::unordered_map<const TEMP*, Value> temps;
    std::unordered_map<const TEMP*, std::uint32_t> buffers;
    std::vector<std::uint32_t> owned;  // buffers and alloca blocks, freed on return
};

// What an array name stands for in C: its address and the size of its elements.
struct NameInfo {
    bool ready = false;
    bool busy = false;
    Value value;
};

}  // namespace

struct Machine::Impl {
    ZOA_file& unit;
    Options opt;
    std::uint64_t steps = 0;
    unsigned depth = 0;
    std::map<std::uint32_t, Block> mem;
    std::uint32_t nextData = DATA_START;
    std::uint64_t used = 0;
    std::uint32_t nextCode = CODE_START;
    std::unordered_map<const LABEL*, std::uint32_t> labelAddr;
    std::unordered_map<std::uint32_t, const LABEL*> addrLabel;
    std::map<std::string, std::uint32_t> funcAddr;
    std::unordered_map<std::uint32_t, std::string> addrFunc;
    std::unordered_map<const SUBPROG*, Trace> traces;
    std::unordered_map<const NAME*, NameInfo> names;
    Frame* frame = nullptr;

    Impl(ZOA_file& u, Options o) : unit(u), opt(o) {}

    // ---- memory
    std::uint32_t allocate(std::uint64_t size, bool readOnly, bool heap) {
        std::uint64_t rounded = (size + 15) & ~std::uint64_t{15};
        if (used + rounded > MEMORY_LIMIT || std::uint64_t{nextData} + rounded + 16 >= CODE_START)
            stop(Status::BAD_ADDRESS, "out of simulated memory");
        std::uint32_t base = nextData;
        nextData = static_cast<std::uint32_t>(nextData + rounded + 16);
        used += rounded;
        Block& b = mem[base];
        b.size = static_cast<std::uint32_t>(size);
        b.data.assign(size, 0);
        b.written.assign(size, 0);
        b.readOnly = readOnly;
        b.heap = heap;
        return base;
    }
    void release(std::uint32_t base) {
        auto it = mem.find(base);
        if (it == mem.end()) return;
        used -= (it->second.size + 15) & ~std::uint64_t{15};
        mem.erase(it);
    }
    Block& blockAt(std::uint32_t addr, std::uint32_t n, std::uint32_t& offset) {
        auto it = mem.upper_bound(addr);
        if (it != mem.begin()) {
            --it;
            std::uint64_t off = addr - it->first;
            if (off + n <= it->second.size) {
                offset = static_cast<std::uint32_t>(off);
                return it->second;
            }
        }
        char buf[80];
        std::snprintf(buf, sizeof buf, "access of %u bytes at 0x%08x outside every block", n, addr);
        stop(Status::BAD_ADDRESS, buf);
    }
    void store(std::uint32_t addr, const unsigned char* bytes, std::uint32_t n) {
        std::uint32_t off;
        Block& b = blockAt(addr, n, off);
        if (b.readOnly) stop(Status::BAD_ADDRESS, "store into a string literal");
        std::memcpy(b.data.data() + off, bytes, n);
        std::memset(b.written.data() + off, 1, n);
    }
    void load(std::uint32_t addr, unsigned char* bytes, std::uint32_t n) {
        std::uint32_t off;
        Block& b = blockAt(addr, n, off);
        for (std::uint32_t i = 0; i < n; ++i)
            if (!b.written[off + i] && opt.strictC) stop(Status::UNDEFINED, "read of memory never written");
        std::memcpy(bytes, b.data.data() + off, n);
    }
    std::uint32_t stringBlock(const std::string& text) {
        std::string s;
        if (!cLiteralValue(text.data(), text.size(), s)) stop(Status::NO_MEANING, "a string literal the C text cannot close");
        std::uint32_t a = allocate(s.size() + 1, false, false);
        store(a, reinterpret_cast<const unsigned char*>(s.c_str()), static_cast<std::uint32_t>(s.size() + 1));
        mem[a].readOnly = true;
        return a;
    }
    std::string readString(std::uint32_t addr) {
        std::string s;
        for (;;) {
            unsigned char c;
            load(addr++, &c, 1);
            if (!c) return s;
            s += static_cast<char>(c);
            tick();
        }
    }
    void storeValue(std::uint32_t addr, CType t, const Value& v) {
        unsigned char b[8];
        unsigned n = sizeOfC(t);
        if (t == CType::FLOAT) {
            float f = static_cast<float>(v.real);
            std::memcpy(b, &f, 4);
        } else if (t == CType::DOUBLE) {
            std::memcpy(b, &v.real, 8);
        } else {
            for (unsigned i = 0; i < n; ++i) b[i] = static_cast<unsigned char>(v.bits >> (8 * i));
        }
        store(addr, b, n);
    }
    Value loadValue(std::uint32_t addr, CType t) {
        unsigned char b[8] = {};
        unsigned n = sizeOfC(t);
        if (n == 0) stop(Status::NO_MEANING, "load of a void value");
        load(addr, b, n);
        Value v;
        v.type = t;
        if (t == CType::FLOAT) {
            float f;
            std::memcpy(&f, b, 4);
            v.real = f;
        } else if (t == CType::DOUBLE) {
            std::memcpy(&v.real, b, 8);
        } else {
            std::uint64_t x = 0;
            for (unsigned i = 0; i < n; ++i) x |= std::uint64_t{b[i]} << (8 * i);
            v = Value::of(t, x);
        }
        return v;
    }

    // ---- code addresses
    std::uint32_t codeAddress() {
        if (nextCode >= 0xFFFFFFF0u) stop(Status::BAD_ADDRESS, "too many code addresses");
        std::uint32_t a = nextCode;
        nextCode += 16;
        return a;
    }
    std::uint32_t addressOf(const LABEL* l) {
        auto it = labelAddr.find(l);
        if (it != labelAddr.end()) return it->second;
        std::uint32_t a = codeAddress();
        labelAddr[l] = a;
        addrLabel[a] = l;
        return a;
    }
    std::uint32_t addressOf(const std::string& function) {
        auto it = funcAddr.find(function);
        if (it != funcAddr.end()) return it->second;
        std::uint32_t a = codeAddress();
        funcAddr[function] = a;
        addrFunc[a] = function;
        return a;
    }

    void tick() {
        if (++steps > opt.maxSteps) stop(Status::STEP_LIMIT, "step limit reached");
    }
    struct Nest {
        Impl& m;
        explicit Nest(Impl& i) : m(i) {
            if (++m.depth > m.opt.maxDepth) {
                --m.depth;
                stop(Status::DEPTH_LIMIT, "nesting too deep");
            }
        }
        ~Nest() { --m.depth; }
    };

    // ---- conversions, as C assignment and casts do them
    Value convert(const Value& v, CType to, unsigned scale = 1) {
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
            if (opt.strictC && std::isfinite(static_cast<double>(x)) && !std::isfinite(r.real))
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
    static Value promote(const Value& v) {
        if (v.type == CType::SCHAR || v.type == CType::UCHAR) return Value::of(CType::INT, v.bits);
        return v;
    }
    static CType common(CType a, CType b) {
        if (a == CType::DOUBLE || b == CType::DOUBLE) return CType::DOUBLE;
        if (a == CType::FLOAT || b == CType::FLOAT) return CType::FLOAT;
        if (a == b) return a;
        if (rank(a) == rank(b)) return isSigned(a) ? b : a;  // the unsigned one
        CType hi = rank(a) > rank(b) ? a : b;
        CType lo = rank(a) > rank(b) ? b : a;
        if (!isSigned(hi)) return hi;
        if (bitsOf(hi) > bitsOf(lo)) return hi;  // the wider signed type holds every value
        return hi == CType::LLONG ? CType::ULLONG : CType::UINT;
    }
    bool truth(const Value& v) {
        if (v.type == CType::VOID) stop(Status::NO_MEANING, "use of a void value");
        return isReal(v.type) ? v.real != 0 : v.bits != 0;
    }

    // Integer arithmetic in type t with wrap-around; in strict mode a signed
    // result outside t's range stops the run.
    Value intResult(CType t, i128 exact) {
        if (opt.strictC && isSigned(t)) {
            unsigned w = bitsOf(t);
            i128 lo = -(static_cast<i128>(1) << (w - 1)), hi = (static_cast<i128>(1) << (w - 1)) - 1;
            if (exact < lo || exact > hi) stop(Status::UNDEFINED, std::string("signed overflow in ") + ctypeName(t));
        }
        return Value::of(t, static_cast<std::uint64_t>(exact));
    }
    static i128 wide(const Value& v) {
        return isSigned(v.type) ? static_cast<i128>(static_cast<long long>(v.bits))
                                : static_cast<i128>(v.bits);
    }
    Value realResult(CType t, long double exact) {
        Value r;
        r.type = t;
        r.real = roundTo(t, exact);
        // The sign of a NaN the FPU makes is its own affair.
        if (opt.strictC && (static_cast<long double>(r.real) != exact || std::isnan(r.real)))
            stop(Status::UNDEFINED, "floating result not exact in its type");
        return r;
    }

    Value binop(BinopKind op, Value a, Value b) {
        if (a.type == CType::VOID || b.type == CType::VOID) stop(Status::NO_MEANING, "use of a void value");
        bool pa = a.type == CType::POINTER, pb = b.type == CType::POINTER;
        if (op >= EQ && op <= GE) {
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
                if (opt.strictC) stop(Status::UNDEFINED, "shift count out of range");
                count &= (w - 1);
            }
            unsigned c = static_cast<unsigned>(count);
            if (op == RSHIFT) {
                std::uint64_t v = isSigned(l.type) ? static_cast<std::uint64_t>(static_cast<long long>(l.bits) >> c)
                                                   : (l.bits >> c);
                return Value::of(l.type, v);
            }
            if (opt.strictC && isSigned(l.type)) {
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

    // ---- expressions
    Value constant(CONST* k) {
        long long i = k->getIValue();
        switch (k->getDataType()) {
            case CHAR_U: return Value::of(CType::UCHAR, static_cast<std::uint64_t>(i));
            case INT_U: return Value::of(CType::UINT, static_cast<std::uint64_t>(i));
            case INT64_U:  // written with LL only: gcc reads even a value above the
                           // long long range as a (wrapped) long long
                return Value::of(CType::LLONG, static_cast<std::uint64_t>(i));
            case CHAR_S: return Value::of(CType::SCHAR, static_cast<std::uint64_t>(i));
            case INT_S:  // -2147483648 is the negation of a long long literal
                if (static_cast<std::int32_t>(i) == INT32_MIN) return Value::of(CType::LLONG, static_cast<std::uint64_t>(std::int64_t{INT32_MIN}));
                return Value::of(CType::INT, static_cast<std::uint64_t>(i));
            case INT64_S: return Value::of(CType::LLONG, static_cast<std::uint64_t>(i));
            case FLOAT: {  // written with six significant digits: a double literal
                float f = static_cast<float>(k->getFValue());
                if (!std::isfinite(f)) stop(Status::NO_MEANING, "non-finite constant");
                std::ostringstream s;
                s << f;
                std::string text = s.str();
                // 3.0 is written 3: an int literal, with int arithmetic.
                if (text.find_first_of(".e") == std::string::npos)
                    return Value::of(CType::INT, static_cast<std::uint64_t>(std::strtoll(text.c_str(), nullptr, 10)));
                Value v;
                v.type = CType::DOUBLE;
                v.real = std::strtod(text.c_str(), nullptr);
                return v;
            }
            case DOUBLE:
                if (!std::isfinite(k->getFValue())) stop(Status::NO_MEANING, "non-finite constant");
                return Value::floating(DOUBLE, k->getFValue());
            case POINTER:
                if (k->getPValue() == nullptr) return Value::pointer(0);
                stop(Status::NO_MEANING, "a pointer constant holding C text");
            case VOID: break;
        }
        stop(Status::NO_MEANING, "constant of no type");
    }

    SUBPROG* findSubprog(const std::string& name) {
        for (SUBPROG* s : unit.getSubprogs())
            if (s && s->getName() == name.c_str()) return s;
        return nullptr;
    }
    SUBPROG* ownerOf(const LABEL* l) {
        for (SUBPROG* s : unit.getSubprogs()) {
            if (!s) continue;
            auto it = s->getAllLabels().find(l->getId());
            if (it != s->getAllLabels().end() && it->second == l) return s;
        }
        return nullptr;
    }

    Value nameValue(NAME* n) {
        NameKind k = n->getKind();
        switch (k) {
            case LABEL_REF:
                if (!n->getLabelRef()) stop(Status::NO_MEANING, "label address without a label");
                return Value::pointer(addressOf(n->getLabelRef()));
            case SUBPROG_REF: return Value::pointer(addressOf(std::string(n->getStringValue().c_str())));
            case EXTERN_DATA_REF: stop(Status::NO_MEANING, "external data has no value here");
            case STATIC_DATA_REF: {
                if (n->getList().empty()) return convert(Value::of(CType::INT, 0), ctypeOf(n->getDataType()));
                ExprBase* e = n->getList().front();
                if (!e || e->getNodeType() != CONST_NODE) stop(Status::NO_MEANING, "static data without a constant");
                return convert(constant(static_cast<CONST*>(e)), ctypeOf(n->getDataType()));
            }
            case CONST_ARRAY_REF:
            case DATA_ARRAY_REF:
            case STRINGLIT_REF:
                break;
        }
        NameInfo& info = names[n];
        if (info.ready) return info.value;
        if (info.busy) stop(Status::NO_MEANING, "data that contains its own address");
        info.busy = true;
        Value v;
        if (k == STRINGLIT_REF) {
            v = Value::pointer(stringBlock(n->getStringValue().c_str()));
        } else if (n->getList().empty()) {
            v = Value::pointer(allocate(1, false, false));
            unsigned char zero = 0;
            store(static_cast<std::uint32_t>(v.bits), &zero, 1);
        } else {
            ExprBase* first = n->getList().front();
            if (!first) stop(Status::NO_MEANING, "null array element");
            CType et = ctypeOf(first->getDataType());
            unsigned size = sizeOfC(et);
            if (size == 0) stop(Status::NO_MEANING, "array of void");
            std::uint32_t base = allocate(std::uint64_t{size} * n->getList().size(), false, false);
            std::uint32_t at = base;
            Frame* saved = frame;
            frame = nullptr;  // initialisers are evaluated at file scope
            for (ExprBase* e : n->getList()) {
                Value x;
                if (e && e->getNodeType() == NAME_NODE && static_cast<NAME*>(e)->getKind() == STRINGLIT_REF)
                    x = Value::pointer(stringBlock(static_cast<NAME*>(e)->getStringValue().c_str()));
                else
                    x = eval(e);
                storeValue(at, et, convert(x, et));
                at += size;
            }
            frame = saved;
            v = Value::pointer(base);
            v.scale = size;
        }
        info.value = v;
        info.ready = true;
        info.busy = false;
        return v;
    }

    Value temp(TEMP* t) {
        if (!frame) stop(Status::NO_MEANING, "temporary outside a subprogram");
        if (t->getNodeType() == BUF_TEMP_NODE) {
            auto it = frame->buffers.find(t);
            if (it != frame->buffers.end()) return Value::pointer(it->second);
            unsigned size = (static_cast<BUF_TEMP*>(t)->getArraySize() + 7u) & ~7u;
            std::uint32_t a = allocate(size, false, false);
            frame->buffers[t] = a;
            frame->owned.push_back(a);
            return Value::pointer(a);
        }
        auto it = frame->temps.find(t);
        if (it == frame->temps.end())
            stop(Status::NO_MEANING, "read of temporary t" + std::to_string(t->getId()) + " before it is set");
        return it->second;
    }

    Value unop(UNOP* u) {
        UnopKind op = u->getOp();
        ExprBase* e = u->getExpr();
        // The cast each conversion is written with; 0 where it is written bare.
        static const signed char castOf[27] = {
            -1, -1, -1, -1,
            static_cast<signed char>(CType::INT), 0,
            static_cast<signed char>(CType::UCHAR), static_cast<signed char>(CType::SCHAR),
            0, 0, 0, 0, 0,
            static_cast<signed char>(CType::FLOAT), static_cast<signed char>(CType::DOUBLE),
            static_cast<signed char>(CType::UCHAR), static_cast<signed char>(CType::SCHAR),
            static_cast<signed char>(CType::UINT), static_cast<signed char>(CType::INT), 0,
            static_cast<signed char>(CType::INT), static_cast<signed char>(CType::UINT),
            static_cast<signed char>(CType::POINTER), static_cast<signed char>(CType::POINTER),
            static_cast<signed char>(CType::LLONG), static_cast<signed char>(CType::SCHAR),
            static_cast<signed char>(CType::UCHAR)};
        switch (op) {
            case ABS: {  // (x>=0?x: -x): x is evaluated twice
                Value x = eval(e);
                bool nonNegative = truth(binop(GE, x, Value::of(CType::INT, 0)));
                Value y = eval(e);
                if (y.type == CType::POINTER) stop(Status::NO_MEANING, "absolute value of a pointer");
                Value neg = negate(y);
                CType c = common(promote(y).type, neg.type);
                return convert(nonNegative ? promote(y) : neg, c);
            }
            case NEG: return negate(eval(e));
            case NOT: return Value::of(CType::INT, !truth(eval(e)));
            case BITWISE_NOT: {
                Value x = promote(eval(e));
                if (!isInt(x.type)) stop(Status::NO_MEANING, "complement of a non-integer");
                return Value::of(x.type, ~x.bits);
            }
            default: break;
        }
        if (static_cast<unsigned>(op) > 26 || castOf[op] == 0)  // written bare: the value converted to the UNOP's type
            return convert(eval(e), ctypeOf(u->getDataType()));
        CType to = static_cast<CType>(castOf[op]);
        return convert(eval(e), to, op == CONV23 ? 4 : 1);
    }
    Value negate(const Value& v) {
        Value x = promote(v);
        if (isReal(x.type)) {
            x.real = -x.real;
            return x;
        }
        if (!isInt(x.type)) stop(Status::NO_MEANING, "negation of a non-number");
        return intResult(x.type, -wide(x));
    }

    static bool isArrayName(ExprBase* e) {
        if (!e || e->getNodeType() != NAME_NODE) return false;
        NameKind k = static_cast<NAME*>(e)->getKind();
        return k == CONST_ARRAY_REF || k == DATA_ARRAY_REF || k == STRINGLIT_REF;
    }

    Value eval(ExprBase* e) {
        if (!e) stop(Status::NO_MEANING, "missing expression");
        tick();
        Nest nest(*this);
        switch (e->getNodeType()) {
            case TEMP_NODE:
            case BUF_TEMP_NODE: return temp(static_cast<TEMP*>(e));
            case CONST_NODE: return constant(static_cast<CONST*>(e));
            case NAME_NODE: return nameValue(static_cast<NAME*>(e));
            case MEM_NODE: {
                MEM* m = static_cast<MEM*>(e);
                Value a = eval(m->getExpr());
                if (isReal(a.type) || a.type == CType::VOID) stop(Status::NO_MEANING, "address of no pointer type");
                return loadValue(static_cast<std::uint32_t>(a.bits), ctypeOf(m->getDataType()));
            }
            case UNOP_NODE: return unop(static_cast<UNOP*>(e));
            case BINOP_NODE: {
                BINOP* b = static_cast<BINOP*>(e);
                if (b->getOp() == AND || b->getOp() == OR) {  // short-circuit
                    bool l = truth(eval(b->getLeft()));
                    if (l == (b->getOp() == OR)) return Value::of(CType::INT, l);
                    return Value::of(CType::INT, truth(eval(b->getRight())));
                }
                Value l = eval(b->getLeft());
                Value r = eval(b->getRight());
                return binop(b->getOp(), l, r);
            }
            case CALL_NODE: return call(static_cast<CALL*>(e));
            default: break;
        }
        stop(Status::NO_MEANING, "statement where an expression belongs");
    }

    // ---- calls
    Value call(CALL* c) {
        std::vector<Value> args;
        args.reserve(c->getArgs().size());
        if (TEMP* fp = c->getFunctionPointer()) {
            Value f = eval(fp);
            for (ExprBase* a : c->getArgs()) args.push_back(convert(eval(a), ctypeOf(a ? a->getDataType() : VOID)));
            auto it = addrFunc.find(static_cast<std::uint32_t>(f.bits));
            if (it == addrFunc.end()) stop(Status::BAD_ADDRESS, "call through an address that is no function");
            SUBPROG* s = findSubprog(it->second);
            if (!s) stop(Status::UNKNOWN_FUNCTION, "call of unknown function " + it->second);
            if (s->getReturnType() != c->getDataType()) stop(Status::NO_MEANING, "call through a pointer of another return type");
            auto at = s->getAllArgTemps().begin();
            for (const Value& a : args) {
                if (at == s->getAllArgTemps().end() || ctypeOf((*at)->getDataType()) != a.type)
                    stop(Status::NO_MEANING, "call through a pointer of other parameter types");
                ++at;
            }
            return invoke(s, args);
        }
        std::string name = c->getFunctionName().c_str();
        for (ExprBase* a : c->getArgs()) args.push_back(eval(a));
        if (SUBPROG* s = findSubprog(name)) {
            if (s->getAllArgTemps().size() != args.size()) stop(Status::NO_MEANING, "call of " + name + " with a wrong number of arguments");
            return invoke(s, args);
        }
        // Host functions: arguments take the types the call's own prototype gives them.
        std::size_t i = 0;
        for (ExprBase* a : c->getArgs()) {
            args[i] = convert(args[i], ctypeOf(a ? a->getDataType() : VOID));
            ++i;
        }
        Value r = host(name, args, c->getDataType());
        if (name == "malloc" || name == "alloca") r = convert(r, CType::POINTER);
        return r;
    }

    Value host(const std::string& name, const std::vector<Value>& args, DataType type) {
        auto need = [&](std::size_t n) {
            if (args.size() != n) stop(Status::NO_MEANING, name + " with a wrong number of arguments");
        };
        CType rt = ctypeOf(type);
        if (name == "malloc" || name == "alloca") {
            need(1);
            std::uint64_t n = args[0].type == CType::POINTER || isInt(args[0].type) ? (args[0].bits & 0xffffffffu) : 0;
            if (name == "malloc" && n > (64u << 20)) return convert(Value::pointer(0), rt);
            std::uint32_t a = allocate(n, false, name == "malloc");
            if (name == "alloca") {
                if (!frame) stop(Status::NO_MEANING, "alloca outside a subprogram");
                frame->owned.push_back(a);
            }
            return convert(Value::pointer(a), rt);
        }
        if (name == "free") {
            need(1);
            std::uint32_t a = static_cast<std::uint32_t>(args[0].bits);
            if (a == 0) return Value{};
            auto it = mem.find(a);
            if (it == mem.end() || !it->second.heap) stop(Status::BAD_ADDRESS, "free of an address malloc did not give");
            release(a);
            return rt == CType::VOID ? Value{} : convert(Value::of(CType::INT, 0), rt);
        }
        if (name == "strlen") {
            need(1);
            return convert(Value::of(CType::UINT, readString(static_cast<std::uint32_t>(args[0].bits)).size()), rt);
        }
        if (name == "puts") {
            need(1);
            std::string s = readString(static_cast<std::uint32_t>(args[0].bits));
            if (opt.out) *opt.out << s << '\n';
            return rt == CType::VOID ? Value{} : convert(Value::of(CType::INT, s.size() + 1), rt);
        }
        if (name == "abs") {
            need(1);
            Value x = convert(args[0], CType::INT);
            return convert(intResult(CType::INT, x.bits & 0x80000000u ? -wide(x) : wide(x)), rt);
        }
        stop(Status::UNKNOWN_FUNCTION, "call of unknown function " + name);
    }

    // The order the C text prints sp's labels in, and the jumps it leaves out.
    const Trace& traceOf(SUBPROG* sp) {
        auto it = traces.find(sp);
        if (it != traces.end()) return it->second;
        Trace& t = traces[sp];
        struct Listener : TraceListener {
            Trace& t;
            explicit Listener(Trace& t) : t(t) {}
            bool place(LABEL* l) override {
                if (!t.index.emplace(l, t.order.size()).second) return false;
                t.order.push_back(l);
                return true;
            }
            void pulled(StmtBase* jump, LABEL* prev) override { t.prev[jump] = prev; }
        } listener(t);
        std::vector<StmtBase*> stack;
        buildTraces(sp, listener, stack);
        return t;
    }

    // Runs one statement of label `cur`; gives the label control goes to, or null to go on.
    LABEL* exec(StmtBase* s, const LABEL* cur) {
        if (!s) return nullptr;  // a missing statement prints nothing
        tick();
        Nest nest(*this);
        switch (s->getNodeType()) {
            case SEQ_NODE: {
                SEQ* q = static_cast<SEQ*>(s);
                if (LABEL* l = exec(q->getLeft(), cur)) return l;
                return exec(q->getRight(), cur);
            }
            case EXP_NODE: eval(static_cast<EXP*>(s)->getExpr()); return nullptr;
            case MOVE_NODE: {
                MOVE* m = static_cast<MOVE*>(s);
                ExprBase* d = m->getDst();
                ExprBase* src = m->getSrc();
                bool charCast = isArrayName(src) ||
                                (src && src->getNodeType() == BINOP_NODE &&
                                 (isArrayName(static_cast<BINOP*>(src)->getLeft()) ||
                                  isArrayName(static_cast<BINOP*>(src)->getRight())));
                if (!d) stop(Status::NO_MEANING, "move without a destination");
                if (d->getNodeType() == TEMP_NODE) {
                    Value v = eval(src);
                    if (charCast) v = convert(v, CType::POINTER);
                    TEMP* t = static_cast<TEMP*>(d);
                    if (!frame) stop(Status::NO_MEANING, "temporary outside a subprogram");
                    frame->temps[t] = convert(v, ctypeOf(t->getDataType()));
                    return nullptr;
                }
                if (d->getNodeType() == MEM_NODE) {
                    MEM* mm = static_cast<MEM*>(d);
                    Value a = eval(mm->getExpr());
                    if (isReal(a.type) || a.type == CType::VOID) stop(Status::NO_MEANING, "address of no pointer type");
                    Value v = eval(src);
                    if (charCast) v = convert(v, CType::POINTER);
                    CType t = ctypeOf(mm->getDataType());
                    if (t == CType::VOID) stop(Status::NO_MEANING, "store of a void value");
                    storeValue(static_cast<std::uint32_t>(a.bits), t, convert(v, t));
                    return nullptr;
                }
                stop(Status::NO_MEANING, "move into something that is neither a temporary nor memory");
            }
            case JUMP_NODE: {
                JUMP* j = static_cast<JUMP*>(s);
                if (j->getKind() == DIRECT_LABEL) {
                    auto p = frame->trace->prev.find(s);
                    if (p != frame->trace->prev.end() && p->second == cur) return nullptr;  // written as a fall-through
                    if (!j->getTarget()) stop(Status::NO_MEANING, "jump without a target");
                    return j->getTarget();
                }
                Value a = eval(j->getExpr());
                auto it = addrLabel.find(static_cast<std::uint32_t>(a.bits));
                if (a.type == CType::VOID || isReal(a.type) || it == addrLabel.end())
                    stop(Status::BAD_ADDRESS, "computed jump to an address that is no label");
                if (!frame->trace->index.count(it->second)) stop(Status::NO_MEANING, "computed jump out of the subprogram");
                return const_cast<LABEL*>(it->second);
            }
            case CJUMP_NODE: {
                CJUMP* c = static_cast<CJUMP*>(s);
                if (c->getRelOp() >= MAX_BINOP) stop(Status::NO_MEANING, "conditional jump without a relation");
                bool holds;
                if (c->getRelOp() == AND || c->getRelOp() == OR) {
                    bool l = truth(eval(c->getLeft()));
                    holds = l == (c->getRelOp() == OR) ? l : truth(eval(c->getRight()));
                } else {
                    Value l = eval(c->getLeft());
                    Value r = eval(c->getRight());
                    holds = truth(binop(c->getRelOp(), l, r));
                }
                if (holds) {
                    if (!c->getIfTrue()) stop(Status::NO_MEANING, "conditional jump without a target");
                    return c->getIfTrue();
                }
                auto p = frame->trace->prev.find(s);
                if (p != frame->trace->prev.end() && p->second == cur) return nullptr;
                if (!c->getIfFalse()) stop(Status::NO_MEANING, "conditional jump without a target");
                return c->getIfFalse();
            }
            default: break;
        }
        stop(Status::NO_MEANING, "expression where a statement belongs");
    }

    Value invoke(SUBPROG* sp, const std::vector<Value>& args) {
        Nest nest(*this);
        Frame f;
        f.sp = sp;
        f.trace = &traceOf(sp);
        std::size_t i = 0;
        for (TEMP* t : sp->getAllArgTemps()) {
            if (i >= args.size()) stop(Status::NO_MEANING, "missing argument");
            f.temps[t] = convert(args[i++], ctypeOf(t->getDataType()));
        }
        Frame* saved = frame;
        frame = &f;
        struct Restore {
            Impl& m;
            Frame* saved;
            Frame& f;
            ~Restore() {
                for (std::uint32_t a : f.owned) m.release(a);
                m.frame = saved;
            }
        } restore{*this, saved, f};
        LABEL* cur = sp->getStartLabel();
        if (!cur || f.trace->order.empty()) stop(Status::NO_MEANING, "subprogram without a start label");
        cur = f.trace->order.front();
        for (;;) {
            tick();
            auto idx = f.trace->index.find(cur);
            if (idx == f.trace->index.end()) stop(Status::NO_MEANING, "jump to a label of no trace");
            LABEL* next = nullptr;
            if (cur->containsStmts())
                for (StmtBase* s : cur->getStmts())
                    if ((next = exec(s, cur))) break;
            if (next) {
                cur = next;
                continue;
            }
            if (cur->getKind() == EPILOGUE_LABEL) break;
            if (idx->second + 1 >= f.trace->order.size()) stop(Status::NO_MEANING, "control falls off the end of " + std::string(sp->getName().c_str()));
            cur = f.trace->order[idx->second + 1];
        }
        if (sp->getReturnType() == VOID) return Value{};
        if (!sp->getReturnTemp()) stop(Status::NO_MEANING, "no return temporary");
        return convert(temp(sp->getReturnTemp()), ctypeOf(sp->getReturnType()));
    }
};

Machine::Machine(ZOA_file& unit, Options options) : impl(std::make_unique<Impl>(unit, options)) {}
Machine::~Machine() = default;

Result Machine::call(const std::string& subprog, const std::vector<Value>& args) {
    Result r;
    impl->steps = 0;
    try {
        SUBPROG* s = impl->findSubprog(subprog);
        if (!s) stop(Status::UNKNOWN_FUNCTION, "no subprogram " + subprog);
        if (s->getAllArgTemps().size() != args.size())
            stop(Status::NO_MEANING, subprog + " takes " + std::to_string(s->getAllArgTemps().size()) + " arguments");
        impl->depth = 0;
        r.value = impl->invoke(s, args);
    } catch (const Stop& st) {
        r.status = st.status;
        r.message = st.message;
        impl->frame = nullptr;
        impl->depth = 0;
    } catch (const std::bad_alloc&) {
        r.status = Status::BAD_ADDRESS;
        r.message = "out of host memory";
    }
    r.steps = impl->steps;
    return r;
}

Result run(ZOA_file& unit, const std::string& subprog, const std::vector<Value>& args, const Options& options) {
    Machine m(unit, options);
    return m.call(subprog, args);
}

}  // namespace ZOA::interp
