// The random-unit generator: well-defined C programs, an assembly subset, and odd trees.
#include "fuzz/gen.h"

#include <algorithm>
#include <list>
#include <random>

namespace ZOA::fuzz {

namespace {

bool isIntType(DataType t) { return t <= INT64_S; }
bool isRealType(DataType t) { return t == FLOAT || t == DOUBLE; }
unsigned sizeOf(DataType t) { return ExprBase::sizeOfDataType(t); }

const DataType cTypes[] = {CHAR_U, INT_U, INT64_U, CHAR_S, INT_S, INT64_S};
const DataType asmTypes[] = {CHAR_U, INT_U, CHAR_S, INT_S};
const DataType asmPlainTypes[] = {CHAR_U, INT_U, INT_S};

// Casts whose C text yields each type; a type without one has none here.
const std::vector<UnopKind>& castsTo(DataType t) {
    static const std::vector<UnopKind> none, s32{CONV4, CONV18, CONV20}, u32{CONV17, CONV21},
        u8{CONV6, CONV15, CONV26}, s8{CONV7, CONV16, CONV25}, s64{CONV24}, f32{CONV13}, f64{CONV14};
    switch (t) {
        case INT_S: return s32;
        case INT_U: return u32;
        case CHAR_U: return u8;
        case CHAR_S: return s8;
        case INT64_S: return s64;
        case FLOAT: return f32;
        case DOUBLE: return f64;
        case INT64_U:
        case POINTER:
        case VOID: break;
    }
    return none;
}
// Conversions the C text writes bare.
const UnopKind bareConvs[] = {CONV5, CONV8, CONV9, CONV10, CONV11, CONV12, CONV19};

struct Fn {
    SUBPROG* sp = nullptr;
    std::string name;
    DataType ret = VOID;
    std::vector<DataType> params;
};

// A byte region the code may load from and store to: a buffer temporary, a
// pointer to an allocated block, or a pointer to a table copied into a temporary.
struct Region {
    ExprBase* base;
    unsigned size;
    bool writable;
};

// A table read through its name: C scales the index by the element size.
struct Table {
    NAME* name;
    DataType elem;
    unsigned count;  // a power of two
};

class Builder {
public:
    Builder(std::uint64_t seed, Mode mode, const std::string& prefix, unsigned asmQuirks, Target target)
        : rng(seed * 0x9E3779B97F4A7C15ull + 12345), mode(mode), prefix(prefix), quirks(asmQuirks), target(target) {}

    Generated build() {
        Generated g;
        g.unit = std::make_unique<ZOA_file>(target.isGcc, target.asmMode);
        unit = g.unit.get();
        makeFileData();
        unsigned n = 1 + below(4);
        for (unsigned i = 0; i < n; ++i) {
            Fn f;
            f.name = prefix + "f" + std::to_string(i);
            f.ret = below(12) == 0 && mode != Mode::ASM ? VOID : anyType(true);
            unsigned np = below(5);
            for (unsigned k = 0; k < np; ++k) f.params.push_back(anyType(true));
            f.sp = unit->createSubprog(f.ret, f.name.c_str(), true);
            for (DataType p : f.params) f.sp->getArgTemp(p);
            fns.push_back(f);
        }
        for (unsigned i = 0; i < n; ++i) body(i);
        for (const Fn& f : fns) {
            Entry e{f.name, f.ret, f.params, {}};
            unsigned sets = 2 + below(3);
            for (unsigned s = 0; s < sets; ++s) {
                std::vector<long long> a;
                for (DataType p : f.params) a.push_back(argValue(p));
                e.argSets.push_back(a);
            }
            g.entries.push_back(e);
        }
        if (mode == Mode::ODD) oddities();
        return g;
    }

private:
    std::mt19937_64 rng;
    Mode mode;
    std::string prefix;
    unsigned quirks;
    Target target;
    ZOA_file* unit = nullptr;
    std::vector<Fn> fns;
    std::vector<Table> tables;
    std::vector<std::pair<NAME*, unsigned>> strings;  // name and length
    // Per subprogram.
    SUBPROG* sp = nullptr;
    unsigned fnIndex = 0;
    LABEL* cur = nullptr;
    LABEL* byteLabel = nullptr;  // where byteHolds counts
    unsigned byteHolds = 0;
    std::vector<TEMP*> vars;      // set at the start, assignable
    std::vector<TEMP*> readable;  // also loop counters while in their loop
    std::vector<Region> regions;
    std::vector<std::pair<TEMP*, int>> counters;  // loop counters and their bound
    std::vector<StmtBase*> made;  // every statement, for the odd mode
    std::vector<ExprBase*> exprs;

    unsigned below(unsigned n) { return n ? static_cast<unsigned>(rng() % n) : 0; }
    bool chance(unsigned pct) { return below(100) < pct; }
    template <class T, std::size_t N>
    T pick(const T (&a)[N]) { return a[below(N)]; }
    template <class T>
    T pick(const std::vector<T>& v) { return v[below(static_cast<unsigned>(v.size()))]; }

    DataType anyType(bool allowReal) {
        if (mode == Mode::ASM) return quirks & SIGNED_CHAR ? pick(asmTypes) : pick(asmPlainTypes);
        if (allowReal && chance(6)) return chance(50) ? FLOAT : DOUBLE;
        return pick(cTypes);
    }

    long long interesting() {
        static const long long v[] = {0, 1, -1, 2, 3, 7, 8, 31, 100, 127, 128, 255, 256, -128, -129,
                                      65535, 0x7fffffff, -0x7fffffffLL - 1, 0xffffffffLL,
                                      0x7fffffffffffffffLL, -0x7fffffffffffffffLL - 1};
        switch (below(4)) {
            case 0: return pick(v);
            case 1: return static_cast<long long>(below(21)) - 10;
            case 2: return static_cast<long long>(rng());
            default: return static_cast<long long>(static_cast<std::int32_t>(rng()));
        }
    }
    static long long fitTo(DataType t, long long v) {
        switch (t) {
            case CHAR_U: return v & 0xff;
            case CHAR_S: return static_cast<signed char>(v & 0xff);
            case INT_U: return v & 0xffffffffLL;
            case INT_S: return static_cast<std::int32_t>(v & 0xffffffffLL);
            default: return v;
        }
    }
    long long argValue(DataType t) {
        if (isRealType(t)) return static_cast<long long>(below(41)) - 20;
        return fitTo(t, interesting());
    }

    CONST* constant(DataType t) {
        if (isRealType(t)) return new CONST(t, static_cast<double>(static_cast<int>(below(17)) - 8) * (chance(30) ? 0.5 : 1.0));
        return new CONST(t, fitTo(t, interesting()));
    }
    CONST* intConst(DataType t, long long v) { return new CONST(t, v); }

    // ---- file-level data
    void makeFileData() {
        unsigned nt = below(3);
        for (unsigned i = 0; i < nt; ++i) {
            DataType e = mode == Mode::ASM ? (chance(50) ? CHAR_S : CHAR_U) : anyType(false);
            unsigned count = 1u << (1 + below(3));
            std::list<ExprBase*> values;
            for (unsigned k = 0; k < count; ++k) values.push_back(constant(e));
            NAME* n = unit->getName(values);
            tables.push_back({n, e, count});
        }
        if (mode != Mode::ASM) {
            static const char* const texts[] = {"hello", "", "a longer string, with \\ and \"quotes\"", "x"};
            for (unsigned i = 0, ns = below(3); i < ns; ++i) {
                std::string s = pick(texts);
                strings.push_back({unit->getName(STRINGLIT_REF, s.c_str()), static_cast<unsigned>(s.size())});
            }
        }
    }

    // ---- expressions
    TEMP* varOf(DataType t, bool exact) {
        std::vector<TEMP*> c;
        for (TEMP* v : readable)
            if (v->getDataType() == t || (!exact && isIntType(v->getDataType()) && isIntType(t))) c.push_back(v);
        return c.empty() ? nullptr : pick(c);
    }
    ExprBase* leaf(DataType t) {
        if (chance(65))
            if (TEMP* v = varOf(t, chance(70))) return v;
        if (mode == Mode::C && chance(5) && isIntType(t)) return unit->getName(constant(t));  // static data
        return constant(t);
    }
    // A non-negative index below `count` (a power of two), of type INT_U in C mode.
    ExprBase* index(unsigned count) {
        if (mode == Mode::ASM || chance(25)) {
            for (auto& [c, bound] : counters)
                if (static_cast<unsigned>(bound) <= count && chance(50)) return c;
            return intConst(INT_S, below(count));
        }
        return new BINOP(INT_U, BITWISE_AND, expr(INT_U, 1), intConst(INT_U, count - 1));
    }
    // The address of a cell of type t, or null when there is none to use.
    ExprBase* address(DataType t, bool forStore) {
        unsigned size = sizeOf(t);
        if (mode == Mode::ASM && size == 1 && !(quirks & BYTE_MEMORY)) return nullptr;
        std::vector<int> options;
        for (std::size_t i = 0; i < regions.size(); ++i)
            if (regions[i].size >= size && (!forStore || regions[i].writable)) options.push_back(static_cast<int>(i));
        if (mode == Mode::C || !forStore)
            for (std::size_t i = 0; i < tables.size(); ++i)
                if (tables[i].elem == t && (mode == Mode::C || size == 1)) options.push_back(-1 - static_cast<int>(i));
        if (!forStore && (t == CHAR_S) && !strings.empty() && mode == Mode::C) options.push_back(-1000);
        if (options.empty()) return nullptr;
        int o = pick(options);
        if (o == -1000) {
            auto [n, len] = pick(strings);
            return new BINOP(POINTER, PLUS, n, intConst(INT_S, below(len + 1)));
        }
        if (o < 0) {
            const Table& tb = tables[-1 - o];
            return new BINOP(POINTER, PLUS, tb.name, index(tb.count));
        }
        const Region& r = regions[o];
        unsigned cells = r.size / size;
        unsigned pow = 1;
        while (pow * 2 <= cells) pow *= 2;
        ExprBase* idx = index(pow);
        if (mode == Mode::ASM && size > 1 && !(quirks & SCALED_INDEX)) return new BINOP(POINTER, PLUS, r.base, scaled(idx, size));
        ExprBase* off = size == 1 ? idx : new BINOP(idx->getDataType() == INT_U ? INT_U : INT_S, MUL, idx,
                                                    intConst(idx->getDataType() == INT_U ? INT_U : INT_S, size));
        return new BINOP(POINTER, PLUS, r.base, off);
    }
    // idx * size (a power of two) without a MUL, which would take eax from the
    // buffer address beside it: a constant, or a temporary doubled in statements
    // of its own before the one that uses it.
    ExprBase* scaled(ExprBase* idx, unsigned size) {
        if (idx->getNodeType() == CONST_NODE)
            return intConst(INT_S, static_cast<CONST*>(idx)->getIValue() * static_cast<long long>(size));
        TEMP* s = sp->getTemp(INT_S, 0, PERMANENT_TEMP);
        add(new MOVE(s, idx));
        for (unsigned k = 1; k < size; k *= 2) add(new MOVE(s, new BINOP(INT_S, PLUS, s, s)));
        return s;
    }

    ExprBase* expr(DataType t, unsigned depth) {
        ExprBase* e = exprInner(t, depth);
        exprs.push_back(e);
        return e;
    }
    // The assembly output keeps values in registers only within a statement and
    // frees them between the statements of a sequence: its mode writes
    // three-address code, one operator on leaves per statement.
    ExprBase* asmOperand(DataType t) {
        if (TEMP* v = varOf(t, chance(70) || !(quirks & MIXED_WIDTHS))) return v;
        return constant(t);
    }
    ExprBase* asmExpr(DataType t) {
        switch (below(5)) {
            case 0:
            case 1:
            case 2: {
                static const BinopKind ops[] = {PLUS, MINUS, MUL};
                BinopKind op = pick(ops);
                if (op == MUL && !(quirks & MUL_RESULT)) op = PLUS;
                return new BINOP(t, op, asmOperand(t), asmOperand(t));
            }
            case 3: {
                static const BinopKind rels[] = {EQ, NE, LT, LE, GT, GE};
                DataType u = anyType(false);
                if (sizeOf(t) == 1 && !(quirks & CHAR_RELATION)) return asmOperand(t);
                if (u != INT_S && !(quirks & UNSIGNED_RELATION)) u = INT_S;
                return new BINOP(t, pick(rels), asmOperand(u), asmOperand(u));
            }
            default:
                if ((t == INT_S || t == INT_U) && (quirks & WIDENING))
                    return new UNOP(t, CONV4, asmOperand(chance(50) ? CHAR_S : CHAR_U));
                return asmOperand(t);
        }
    }
    ExprBase* exprInner(DataType t, unsigned depth) {
        if (mode == Mode::ASM) return asmExpr(t);
        if (depth == 0 || chance(25)) {
            if (chance(20))
                if (ExprBase* a = address(t, false)) return new MEM(t, a);
            return leaf(t);
        }
        if (isRealType(t)) {
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
        if (mode == Mode::ASM) {
            switch (below(5)) {
                case 0:
                case 1:
                case 2: {
                    static const BinopKind ops[] = {PLUS, MINUS, MUL};
                    return new BINOP(t, pick(ops), expr(t, depth - 1), expr(other, depth - 1));
                }
                case 3: {
                    static const BinopKind rels[] = {EQ, NE, LT, LE, GT, GE};
                    DataType u = anyType(false);
                    return new BINOP(t, pick(rels), expr(u, depth - 1), expr(u, depth - 1));
                }
                default:
                    if (t == INT_S || t == INT_U)
                        return new UNOP(t, CONV4, expr(chance(50) ? CHAR_S : CHAR_U, depth - 1));
                    return expr(t, depth - 1);
            }
        }
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
                bool wide = t == INT64_S || t == INT64_U;
                BinopKind op = pick(ops);
                DataType left = op == LSHIFT && chance(92) ? (wide ? INT64_U : INT_U) : t;
                ExprBase* count = new BINOP(INT_S, BITWISE_AND, expr(INT_S, depth - 1), intConst(INT_S, wide ? 63 : 31));
                return new BINOP(t, op, expr(left, depth - 1), count);
            }
            case 5: {
                static const BinopKind rels[] = {EQ, NE, LT, LE, GT, GE};
                DataType u = anyType(true);
                return new BINOP(t, pick(rels), expr(u, depth - 1), expr(u, depth - 1));
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
                    if (TEMP* v = varOf(t, true)) return new UNOP(t, pick(bareConvs), v);
                    return leaf(t);
                }
                DataType from = anyType(true);
                ExprBase* x = expr(from, depth - 1);
                if (isRealType(from))  // keep the value inside every integer type
                    x = new UNOP(from, castsTo(from)[0], new BINOP(INT_S, BITWISE_AND, expr(INT_S, depth - 1), intConst(INT_S, 127)));
                return new UNOP(t, pick(casts), x);
            }
            default:
                if (ExprBase* a = address(t, false)) return new MEM(t, a);
                return leaf(t);
        }
    }

    // ---- statements
    void add(StmtBase* s) {
        // In a sequence the assembly output frees the registers before each part.
        bool wrap = mode == Mode::ASM && s->getNodeType() != JUMP_NODE && s->getNodeType() != CJUMP_NODE;
        cur->addStmt(wrap ? new SEQ(s, nullptr) : s);
        made.push_back(s);
        if (mode == Mode::ASM && holdsByteRegister(s)) {
            if (cur != byteLabel) byteLabel = cur, byteHolds = 0;
            if (++byteHolds == 2) newLabel();
        }
    }
    // A relation's value (set<cc> into a byte register) and a char move keep
    // their byte register until the next label; four of them leave a later
    // char load without one. The assembly mode starts a label after two.
    static bool holdsByteRegister(StmtBase* s) {
        if (s->getNodeType() != MOVE_NODE) return false;
        MOVE* m = static_cast<MOVE*>(s);
        if (m->getDst() && sizeOf(m->getDst()->getDataType()) == 1) return true;
        ExprBase* src = m->getSrc();
        if (!src || src->getNodeType() != BINOP_NODE) return false;
        BinopKind op = static_cast<BINOP*>(src)->getOp();
        return op == EQ || op == NE || op == LT || op == LE || op == GT || op == GE;
    }
    // A store through an address sum keeps its register reserved until the
    // next label: the assembly mode starts one after each store.
    void afterStore() { newLabel(); }
    void newLabel() {
        if (mode != Mode::ASM) return;
        LABEL* next = sp->createNewLabel(REGULAR_LABEL);
        jumpTo(next);
        cur = next;
    }
    void jumpTo(LABEL* l) { add(new JUMP(l)); }
    unsigned exprDepth() { return 1 + below(3); }

    void assign() {
        TEMP* v = pick(vars);
        if (mode == Mode::ASM && chance(25))
            if (ExprBase* a = address(v->getDataType(), false)) return add(new MOVE(v, new MEM(v->getDataType(), a)));
        add(new MOVE(v, expr(v->getDataType(), exprDepth())));
    }
    void store() {
        DataType t = anyType(true);
        ExprBase* a = address(t, true);
        if (!a) return assign();
        if (mode != Mode::ASM) return add(new MOVE(new MEM(t, a), expr(t, exprDepth())));
        TEMP* v = varOf(t, true);
        if (!v) return assign();
        add(new MOVE(new MEM(t, a), v));
        afterStore();
    }
    void callOne() {
        if (fnIndex == 0) return assign();
        const Fn& f = fns[below(fnIndex)];
        std::vector<ExprBase*> args;
        for (DataType p : f.params) args.push_back(mode == Mode::ASM ? asmOperand(p) : expr(p, 2));
        CALL* c;
        if (mode == Mode::C && chance(25)) {
            TEMP* fp = sp->getTemp(POINTER, 0, IN_USE_TEMP);
            add(new MOVE(fp, unit->getName(SUBPROG_REF, f.name.c_str())));
            // The pointer's type comes from the arguments: they must match the parameters.
            for (std::size_t k = 0; k < args.size(); ++k)
                if (args[k]->getDataType() != f.params[k]) args[k] = constant(f.params[k]);
            c = new CALL(f.ret, fp, args);
        } else {
            c = new CALL(f.ret, f.name.c_str(), args);
        }
        std::vector<TEMP*> fit;
        for (TEMP* v : vars)
            if (isRealType(v->getDataType()) == isRealType(f.ret)) fit.push_back(v);
        if (f.ret == VOID || fit.empty() || chance(10)) add(new EXP(c));
        else add(new MOVE(pick(fit), c));
    }
    void hostCall() {
        if (strings.empty()) return assign();
        CALL* c = new CALL(INT_U, "strlen", std::vector<ExprBase*>{pick(strings).first});
        unit->addFunctionPrototype(c);
        TEMP* v = varOf(INT_U, true);
        if (!v || !std::count(vars.begin(), vars.end(), v)) return assign();
        add(new MOVE(v, c));
    }
    void ifElse(unsigned budget, unsigned nest) {
        static const BinopKind rels[] = {EQ, NE, LT, LE, GT, GE};
        DataType u = anyType(true);
        LABEL* lt = sp->createNewLabel(REGULAR_LABEL);
        LABEL* lf = sp->createNewLabel(REGULAR_LABEL);
        LABEL* join = sp->createNewLabel(REGULAR_LABEL);
        if (mode == Mode::ASM && u != INT_S && !(quirks & UNSIGNED_RELATION)) u = INT_S;
        if (mode == Mode::ASM) add(new CJUMP(pick(rels), asmOperand(u), asmOperand(u), lt, lf));
        else add(new CJUMP(pick(rels), expr(u, 2), expr(u, 2), lt, lf));
        cur = lt;
        statements(budget / 2, nest + 1);
        jumpTo(join);
        cur = lf;
        statements(budget / 2, nest + 1);
        jumpTo(join);
        cur = join;
    }
    void loop(unsigned budget, unsigned nest) {
        TEMP* i = sp->getTemp(INT_S, 0, PERMANENT_TEMP);
        int bound = 1 + static_cast<int>(below(6));
        LABEL* head = sp->createNewLabel(REGULAR_LABEL);
        LABEL* bodyL = sp->createNewLabel(REGULAR_LABEL);
        LABEL* exit = sp->createNewLabel(REGULAR_LABEL);
        add(new MOVE(i, intConst(INT_S, 0)));
        jumpTo(head);
        cur = head;
        add(new CJUMP(LT, i, intConst(INT_S, bound), bodyL, exit));
        cur = bodyL;
        readable.push_back(i);
        counters.push_back({i, bound});
        statements(budget, nest + 1);
        counters.pop_back();
        readable.pop_back();
        add(new MOVE(i, new BINOP(INT_S, PLUS, i, intConst(INT_S, 1))));
        jumpTo(head);
        cur = exit;
    }
    void computedJump(unsigned budget, unsigned nest) {
        unsigned n = 1u << (1 + below(2));
        std::vector<LABEL*> cases;
        std::list<ExprBase*> addrs;
        for (unsigned k = 0; k < n; ++k) {
            cases.push_back(sp->createNewLabel(REGULAR_LABEL));
            addrs.push_back(sp->getName(cases.back()));
        }
        LABEL* join = sp->createNewLabel(REGULAR_LABEL);
        if (chance(50)) {
            NAME* table = sp->getName(addrs);
            add(new JUMP(new MEM(POINTER, new BINOP(POINTER, PLUS, table, index(n)))));
        } else {
            TEMP* target = sp->getTemp(POINTER, 0, IN_USE_TEMP);
            add(new MOVE(target, addrs.front()));
            add(new JUMP(target));
        }
        for (LABEL* c : cases) {
            cur = c;
            statements(budget / n, nest + 1);
            jumpTo(join);
        }
        cur = join;
    }
    void statements(unsigned budget, unsigned nest) {
        while (budget > 0) {
            --budget;
            unsigned c = below(100);
            if (c < 35) assign();
            else if (c < 50) store();
            else if (c < 62) callOne();
            else if (c < 72 && nest < 3) ifElse(budget, nest), budget /= 2;
            else if (c < 80 && nest < 2) loop(budget / 2 + 1, nest), budget /= 2;
            else if (c < 85 && nest < 3 && mode == Mode::C) computedJump(budget, nest), budget /= 2;
            else if (c < 88 && mode == Mode::C) hostCall();
            else assign();
        }
    }

    void region(unsigned size) {
        ExprBase* base;
        if (mode == Mode::C && chance(30)) {
            const char* fn = chance(50) ? "malloc" : "alloca";
            TEMP* p = sp->getTemp(POINTER, 0, PERMANENT_TEMP);
            CALL* c = new CALL(POINTER, fn, std::vector<ExprBase*>{intConst(INT_U, size)});
            unit->addFunctionPrototype(c);
            add(new MOVE(p, c));
            base = p;
        } else {
            base = sp->getTemp(POINTER, size, IN_USE_TEMP);
        }
        TEMP* fill = mode == Mode::ASM ? sp->getTemp(INT_U, 0, IN_USE_TEMP) : nullptr;
        for (unsigned off = 0; off < size; off += 4) {
            ExprBase* value = intConst(INT_U, fitTo(INT_U, interesting()));
            if (fill) {
                add(new MOVE(fill, value));
                value = fill;
            }
            add(new MOVE(new MEM(INT_U, new BINOP(POINTER, PLUS, base, intConst(INT_S, off))), value));
            afterStore();
        }
        regions.push_back({base, size, true});
    }

    void body(unsigned i) {
        fnIndex = i;
        sp = fns[i].sp;
        cur = sp->getStartLabel();
        vars.assign(sp->getAllArgTemps().begin(), sp->getAllArgTemps().end());
        regions.clear();
        counters.clear();
        std::size_t fileTables = tables.size();
        unsigned nv = 1 + below(4);
        for (unsigned k = 0; k < nv; ++k) {
            TEMP* t = sp->getTemp(anyType(true), 0, IN_USE_TEMP);
            add(new MOVE(t, constant(t->getDataType())));
            vars.push_back(t);
        }
        if (sp->getReturnTemp()) {
            add(new MOVE(sp->getReturnTemp(), constant(fns[i].ret)));
            vars.push_back(sp->getReturnTemp());
        }
        readable = vars;
        for (unsigned k = 0, nb = below(3); k < nb; ++k)
            region(8u << below(3));
        // Tables read through a pointer temporary: byte offsets in every output.
        for (std::size_t k = 0; k < fileTables; ++k)
            if (chance(50) || mode == Mode::ASM) {
                TEMP* p = sp->getTemp(POINTER, 0, PERMANENT_TEMP);
                add(new MOVE(p, tables[k].name));
                regions.push_back({p, tables[k].count * sizeOf(tables[k].elem), mode == Mode::C});
            }
        if (mode == Mode::C && chance(30)) {  // a local table
            DataType e = anyType(false);
            std::list<ExprBase*> values;
            unsigned count = 1u << (1 + below(2));
            for (unsigned k = 0; k < count; ++k) values.push_back(constant(e));
            tables.push_back({sp->getName(values), e, count});
        }
        statements(3 + below(10), 0);
        if (fns[i].ret != VOID) add(new MOVE(sp->getReturnTemp(), expr(fns[i].ret, exprDepth())));
        jumpTo(sp->getReturnLabel());
        tables.resize(fileTables);
    }

    // ---- odd trees: every output must cope with them, none is compared
    void oddities() {
        for (Fn& f : fns) {
            sp = f.sp;
            LABEL* empty = sp->createNewLabel(REGULAR_LABEL);
            (void)empty;
            sp->getTemp(INT_S, 0, IN_USE_TEMP);  // never used
            sp->getTemp(POINTER, 24, IN_USE_TEMP);
            for (auto& [id, l] : sp->getAllLabels()) {
                if (!l->containsStmts() || chance(50)) continue;
                StmtBase* s = made.empty() ? nullptr : pick(made);
                switch (below(5)) {
                    case 0: l->addStmt(new SEQ(nullptr, s)); break;
                    case 1: l->addStmt(new SEQ(s, nullptr)); break;
                    case 2: l->addStmt(new SEQ(nullptr, nullptr)); break;
                    case 3:  // a statement after the jump, sharing a subtree
                        if (!exprs.empty()) l->addStmt(new EXP(pick(exprs)));
                        break;
                    default: {  // deep nesting
                        ExprBase* e = new CONST(1);
                        for (unsigned k = 0, n = 50 + below(400); k < n; ++k)
                            e = chance(50) ? static_cast<ExprBase*>(new BINOP(INT_S, PLUS, e, new CONST(2)))
                                           : static_cast<ExprBase*>(new UNOP(INT_S, NEG, e));
                        l->addStmt(new EXP(e));
                    }
                }
            }
        }
    }
};

}  // namespace

Generated generate(std::uint64_t seed, Mode mode, const std::string& prefix, unsigned asmQuirks) {
    return generate(seed, mode, prefix, asmQuirks, Target{true, mode == Mode::ASM});
}

Generated generate(std::uint64_t seed, Mode mode, const std::string& prefix, unsigned asmQuirks, Target target) {
    return Builder(seed, mode, prefix, asmQuirks, target).build();
}

}  // namespace ZOA::fuzz
