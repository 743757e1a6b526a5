// The generator's scaffolding: units, subprogram bodies, data and the statement grammar.
#include "fuzz/builder.h"

#include <algorithm>
#include <list>

namespace ZOA::fuzz {

Generated Builder::build() {
    Generated g;
    g.unit = std::make_unique<ZOA_file>(target.isGcc, target.asmMode, target.profile);
    unit = g.unit.get();
    makeFileData();
    unsigned n = 1 + below(4);
    for (unsigned i = 0; i < n; ++i) {
        Fn f;
        f.name = prefix + "f" + std::to_string(i);
        f.ret = below(12) == 0 && voidResults() ? VOID : anyType(true);
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
    finish();
    return g;
}

long long Builder::interesting() {
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

long long Builder::fitTo(DataType t, long long v) {
    switch (t) {
        case CHAR_U: return v & 0xff;
        case CHAR_S: return static_cast<signed char>(v & 0xff);
        case INT_U: return v & 0xffffffffLL;
        case INT_S: return static_cast<std::int32_t>(v & 0xffffffffLL);
        default: return v;
    }
}

long long Builder::argValue(DataType t) {
    if (isFloatingType(t)) return static_cast<long long>(below(41)) - 20;
    return fitTo(t, interesting());
}

CONST* Builder::floatingConstant(DataType t) {
    return new CONST(t, static_cast<double>(static_cast<int>(below(17)) - 8) * (chance(30) ? 0.5 : 1.0));
}

CONST* Builder::constant(DataType t) {
    if (isFloatingType(t)) return floatingConstant(t);
    return new CONST(t, fitTo(t, interesting()));
}

void Builder::makeFileData() {
    unsigned nt = below(3);
    for (unsigned i = 0; i < nt; ++i) {
        DataType e = tableElement();
        unsigned count = 1u << (1 + below(3));
        std::list<ExprBase*> values;
        for (unsigned k = 0; k < count; ++k) values.push_back(constant(e));
        NAME* n = makeTable(values);
        tables.push_back({n, e, count});
    }
    if (makesStrings()) {
        static const char* const texts[] = {"hello", "", "a longer string, with \\ and \"quotes\"", "x"};
        for (unsigned i = 0, ns = below(3); i < ns; ++i) {
            std::string s = pick(texts);
            strings.push_back({unit->getName(STRINGLIT_REF, s.c_str()), static_cast<unsigned>(s.size())});
        }
    }
}

// ---- expressions

TEMP* Builder::varOf(DataType t, bool exact) {
    std::vector<TEMP*> c;
    for (TEMP* v : readable)
        if (v->getDataType() == t || (!exact && isIntegerType(v->getDataType()) && isIntegerType(t))) c.push_back(v);
    return c.empty() ? nullptr : pick(c);
}

ExprBase* Builder::leaf(DataType t) {
    if (chance(65))
        if (TEMP* v = varOf(t, chance(70))) return v;
    if (staticDataLeaf(t)) return unit->getName(constant(t));
    return constant(t);
}

// A non-negative index below `count` (a power of two), of type INT_U when it is an expression.
ExprBase* Builder::index(unsigned count) {
    if (indexFromCounters()) {
        for (auto& [c, bound] : counters)
            if (static_cast<unsigned>(bound) <= count && chance(50)) return c;
        return intConst(INT_S, below(count));
    }
    return new BINOP(INT_U, BITWISE_AND, expr(INT_U, 1), intConst(INT_U, count - 1));
}

ExprBase* Builder::tableOffset(ExprBase* idx, unsigned elemSize) {
    if (!target.namesInBytes || elemSize == 1) return idx;
    if (idx->getNodeType() == CONST_NODE)
        return intConst(INT_S, static_cast<CONST*>(idx)->getIValue() * static_cast<long long>(elemSize));
    DataType t = idx->getDataType() == INT_U ? INT_U : INT_S;
    return new BINOP(t, MUL, idx, intConst(t, elemSize));
}

// The address of a cell of type t, or null when there is none to use.
ExprBase* Builder::address(DataType t, bool forStore) {
    unsigned size = sizeOfType(t);
    if (refusesAddress(size)) return nullptr;
    std::vector<int> options;
    for (std::size_t i = 0; i < regions.size(); ++i)
        if (regions[i].size >= size && (!forStore || regions[i].writable)) options.push_back(static_cast<int>(i));
    for (std::size_t i = 0; i < tables.size(); ++i)
        if (tableUsable(tables[i], t, forStore)) options.push_back(-1 - static_cast<int>(i));
    if (!forStore && (t == CHAR_S) && !strings.empty() && stringAddresses()) options.push_back(-1000);
    if (options.empty()) return nullptr;
    int o = pick(options);
    if (o == -1000) {
        auto [n, len] = pick(strings);
        return new BINOP(POINTER, PLUS, n, intConst(INT_S, below(len + 1)));
    }
    if (o < 0) {
        const Table& tb = tables[-1 - o];
        return new BINOP(POINTER, PLUS, tb.name, tableOffset(index(tb.count), sizeOfType(tb.elem)));
    }
    const Region& r = regions[o];
    unsigned cells = r.size / size;
    unsigned pow = 1;
    while (pow * 2 <= cells) pow *= 2;
    ExprBase* idx = index(pow);
    if (scalesByDoubling(size)) return new BINOP(POINTER, PLUS, r.base, scaled(idx, size));
    ExprBase* off = size == 1 ? idx : new BINOP(idx->getDataType() == INT_U ? INT_U : INT_S, MUL, idx,
                                                intConst(idx->getDataType() == INT_U ? INT_U : INT_S, size));
    return new BINOP(POINTER, PLUS, r.base, off);
}

// idx * size (a power of two) without a MUL: a constant, or a temporary
// doubled in statements of its own before the one that uses it.
ExprBase* Builder::scaled(ExprBase* idx, unsigned size) {
    if (idx->getNodeType() == CONST_NODE)
        return intConst(INT_S, static_cast<CONST*>(idx)->getIValue() * static_cast<long long>(size));
    TEMP* s = sp->getTemp(INT_S, 0, PERMANENT_TEMP);
    add(new MOVE(s, idx));
    for (unsigned k = 1; k < size; k *= 2) add(new MOVE(s, new BINOP(INT_S, PLUS, s, s)));
    return s;
}

ExprBase* Builder::expr(DataType t, unsigned depth) {
    ExprBase* e = exprInner(t, depth);
    exprs.push_back(e);
    return e;
}

// ---- statements

void Builder::add(StmtBase* s) {
    cur->addStmt(wrapped(s));
    made.push_back(s);
    added(s);
}

void Builder::assign() {
    TEMP* v = pick(vars);
    if (assignsFromMemory())
        if (ExprBase* a = address(v->getDataType(), false)) return add(new MOVE(v, new MEM(v->getDataType(), a)));
    add(new MOVE(v, expr(v->getDataType(), exprDepth())));
}

void Builder::store() {
    DataType t = anyType(true);
    ExprBase* a = address(t, true);
    if (!a) return assign();
    storeInto(t, a);
}

void Builder::callOne() {
    if (fnIndex == 0) return assign();
    const Fn& f = fns[below(fnIndex)];
    std::vector<ExprBase*> args;
    for (DataType p : f.params) args.push_back(callArgument(p));
    CALL* c;
    if (callsThroughPointer()) {
        TEMP* fp = sp->getTemp(POINTER, 0, IN_USE_TEMP);
        add(new MOVE(fp, functionAddress(f)));
        // The pointer's type comes from the arguments: they must match the parameters.
        for (std::size_t k = 0; k < args.size(); ++k)
            if (args[k]->getDataType() != f.params[k]) args[k] = constant(f.params[k]);
        c = new CALL(f.ret, fp, args);
    } else {
        c = new CALL(f.ret, f.name.c_str(), args);
    }
    std::vector<TEMP*> fit;
    for (TEMP* v : vars)
        if (isFloatingType(v->getDataType()) == isFloatingType(f.ret)) fit.push_back(v);
    if (f.ret == VOID || fit.empty() || chance(10)) add(new EXP(c));
    else add(new MOVE(pick(fit), c));
}

void Builder::hostCall() {
    if (strings.empty()) return assign();
    CALL* c = new CALL(INT_U, "strlen", std::vector<ExprBase*>{pick(strings).first});
    unit->addFunctionPrototype(c);
    TEMP* v = varOf(INT_U, true);
    if (!v || !std::count(vars.begin(), vars.end(), v)) return assign();
    add(new MOVE(v, c));
}

void Builder::ifElse(unsigned budget, unsigned nest) {
    DataType u = anyType(true);
    LABEL* lt = sp->createNewLabel(REGULAR_LABEL);
    LABEL* lf = sp->createNewLabel(REGULAR_LABEL);
    LABEL* join = sp->createNewLabel(REGULAR_LABEL);
    u = relationType(u);
    add(new CJUMP(pick(RELATIONS), relationOperand(u), relationOperand(u), lt, lf));
    cur = lt;
    statements(budget / 2, nest + 1);
    jumpTo(join);
    cur = lf;
    statements(budget / 2, nest + 1);
    jumpTo(join);
    cur = join;
}

void Builder::loop(unsigned budget, unsigned nest) {
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

void Builder::computedJump(unsigned budget, unsigned nest) {
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
        add(new JUMP(new MEM(POINTER, new BINOP(POINTER, PLUS, table, tableOffset(index(n), sizeOfType(POINTER))))));
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

void Builder::statements(unsigned budget, unsigned nest) {
    while (budget > 0) {
        --budget;
        unsigned c = below(100);
        if (c < 35) assign();
        else if (c < 50) store();
        else if (c < 62) callOne();
        else if (c < 72 && nest < 3) ifElse(budget, nest), budget /= 2;
        else if (c < 80 && nest < 2) loop(budget / 2 + 1, nest), budget /= 2;
        else if (c < 85 && nest < 3 && computedJumps()) computedJump(budget, nest), budget /= 2;
        else if (c < 88 && hostCalls()) hostCall();
        else assign();
    }
}

void Builder::region(unsigned size) {
    ExprBase* base;
    if (allocatesRegions()) {
        const char* fn = chance(50) ? "malloc" : "alloca";
        TEMP* p = sp->getTemp(POINTER, 0, PERMANENT_TEMP);
        CALL* c = new CALL(POINTER, fn, std::vector<ExprBase*>{intConst(INT_U, size)});
        unit->addFunctionPrototype(c);
        add(new MOVE(p, c));
        base = p;
    } else {
        base = sp->getTemp(POINTER, size, IN_USE_TEMP);
    }
    TEMP* fill = fillsThroughTemp() ? sp->getTemp(INT_U, 0, IN_USE_TEMP) : nullptr;
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

void Builder::body(unsigned i) {
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
        if (chance(50) || tablesThroughPointer()) {
            TEMP* p = sp->getTemp(POINTER, 0, PERMANENT_TEMP);
            add(new MOVE(p, tables[k].name));
            regions.push_back({p, tables[k].count * sizeOfType(tables[k].elem), tablePointersWritable()});
        }
    if (localTable()) {
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

}  // namespace ZOA::fuzz
