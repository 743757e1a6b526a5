// Text reader: builds a ZOA_file from the S-expression form, checking ids, kinds and arity.
#include "text/reader.h"

#include "text/names.h"

#include <zoa/zoa.h>

#include <cstring>
#include <limits>
#include <map>
#include <new>

namespace ZOA::text {

namespace {

// Thrown inside the builder only; parse turns it into the one diagnostic.
struct BuildError {
    const SNode* at;
    std::string message;
};

[[noreturn]] void error(const SNode& at, std::string message) { throw BuildError{&at, std::move(message)}; }

struct SubScope {
    SUBPROG* sp = nullptr;
    std::map<unsigned int, TEMP*> temps;
    std::map<unsigned int, LABEL*> labels;  // dead labels stay here so blocks can still name them
    std::map<unsigned int, NAME*> names;
    unsigned int nextTemp = 0;
    unsigned int nextLabel = 2;
    unsigned int nextName = 0;
    std::vector<std::pair<TEMP*, TempState>> states;
};

// A reference token: optional "sK:" then a letter and a number ("t3", "s1:L2").
struct Ref {
    bool valid = false;
    int sub = -1;  // -1: the current scope
    char letter = 0;
    unsigned int id = 0;
};

bool parseNumber(const char*& p, unsigned int& out) {
    if (*p < '0' || *p > '9') return false;
    unsigned long long v = 0;
    while (*p >= '0' && *p <= '9') {
        v = v * 10 + static_cast<unsigned>(*p++ - '0');
        if (v > std::numeric_limits<unsigned int>::max()) return false;
    }
    out = static_cast<unsigned int>(v);
    return true;
}

Ref parseRef(const SNode& n) {
    Ref r;
    if (n.kind != SNode::SYMBOL) return r;
    const char* p = n.text.c_str();
    if (p[0] == 's' && std::strchr(p, ':')) {
        ++p;
        unsigned int s = 0;
        if (!parseNumber(p, s) || *p != ':') return r;
        ++p;
        r.sub = static_cast<int>(s);
    }
    if (*p != 't' && *p != 'L' && *p != 'n' && *p != 'g' && *p != 's') return r;
    r.letter = *p++;
    if (!parseNumber(p, r.id) || *p != '\0') return r;
    r.valid = true;
    return r;
}

class Builder {
public:
    Builder(Result& r, const Flavour* f) : result(r), flavourOverride(f) {}

    void build(const SItems& forms);

private:
    Result& result;
    const Flavour* flavourOverride;
    ZOA_file* unit = nullptr;

    template <class T> T* at(const SNode& n, T* node) {
        if (node) result.positions_.emplace(node, Position{n.line, n.column});
        return node;
    }
    std::vector<SubScope> subs;
    std::vector<NAME*> globals;
    std::vector<std::pair<int, const SNode*>> blocks;
    int scope = -1;  // index of the subprogram whose declarations are being read

    // Shape checks.
    static const SNode& item(const SNode& list, std::size_t i, const char* what) {
        if (i >= list.items.size())
            error(list, "'" + quote(list) + "' lacks " + what);
        return list.items[i];
    }
    static void arity(const SNode& list, std::size_t min, std::size_t max) {
        std::size_t n = list.items.size() - 1;
        if (n < min || n > max) {
            std::string want = min == max ? std::to_string(min) : std::to_string(min) + " to " + std::to_string(max);
            if (max == std::numeric_limits<std::size_t>::max()) want = "at least " + std::to_string(min);
            error(list, "'" + quote(list) + "' takes " + want + " operands, not " + std::to_string(n));
        }
    }
    static const std::string& symbol(const SNode& n, const char* what) {
        if (n.kind != SNode::SYMBOL) error(n, std::string("expected ") + what + ", found '" + quote(n) + "'");
        return n.text;
    }
    static bool isSymbol(const SNode& n, const char* s) { return n.kind == SNode::SYMBOL && n.text == s; }

    template <class E> static E enumerator(const SNode& n, bool (*lookup)(const std::string&, E&), int limit,
                                           const char* what) {
        E v{};
        if (n.kind == SNode::INTEGER && !n.negative && n.magnitude <= static_cast<unsigned>(limit))
            return static_cast<E>(n.magnitude);
        if (n.kind == SNode::SYMBOL && lookup(n.text, v)) return v;
        error(n, std::string("unknown ") + what + " '" + quote(n) + "'");
    }
    static DataType dataType(const SNode& n) { return enumerator(n, lookupDataType, 15, "type"); }

    static unsigned int unsignedValue(const SNode& n, const char* what) {
        if (n.kind != SNode::INTEGER || n.negative || n.magnitude > std::numeric_limits<unsigned int>::max())
            error(n, std::string("expected ") + what + ", found '" + quote(n) + "'");
        return static_cast<unsigned int>(n.magnitude);
    }

    const char* arenaText(const std::string& s) {
        char* p = static_cast<char*>(MemMgr::allocate(static_cast<unsigned int>(s.size() + 1)));
        std::memcpy(p, s.c_str(), s.size() + 1);
        return p;
    }

    SubScope& scopeOf(const SNode& n, const Ref& r, int current) {
        int s = r.sub >= 0 ? r.sub : current;
        if (s < 0) error(n, "'" + n.text + "' names a subprogram's own item outside any subprogram");
        if (static_cast<std::size_t>(s) >= subs.size()) error(n, "'" + n.text + "': no such subprogram");
        return subs[static_cast<std::size_t>(s)];
    }

    template <class T> T* find(const SNode& n, std::map<unsigned int, T*>& m, unsigned int id, const char* what) {
        auto it = m.find(id);
        if (it == m.end()) error(n, std::string(what) + " '" + n.text + "' is not declared");
        return it->second;
    }

    LABEL* labelRef(const SNode& n, int ctx) {
        Ref r = parseRef(n);
        if (!r.valid || r.letter != 'L') error(n, "expected a label, found '" + quote(n) + "'");
        return find(n, scopeOf(n, r, ctx).labels, r.id, "label");
    }
    LABEL* labelOrNil(const SNode& n, int ctx) { return isSymbol(n, "nil") ? nullptr : labelRef(n, ctx); }

    // Declaring an id: it must be the next the library hands out, or later
    // (the ids in between are used up, as a client calling create*Id would).
    static void declareId(const SNode& n, unsigned int id, unsigned int& next, const char* what) {
        if (id < next) error(n, std::string(what) + " id '" + n.text + "' is used twice or out of order");
        if (id - next > MAX_ID_SKIP)
            error(n, std::string(what) + " id '" + n.text + "' skips more than " + std::to_string(MAX_ID_SKIP) + " ids");
    }

    ExprBase* expr(const SNode& n, int ctx);
    ExprBase* makeExpr(const SNode& n, int ctx);
    StmtBase* stmt(const SNode& n, int ctx);
    StmtBase* makeStmt(const SNode& n, int ctx);
    CONST* constant(const SNode& n);
    NAME* nameDef(const SNode& form, std::size_t at, int ctx, bool local);
    void unitItem(const SNode& n);
    void subprog(const SNode& n);
    void subItem(const SNode& n, SubScope& s);
};

CONST* Builder::constant(const SNode& n) {
    arity(n, 1, 2);
    if (n.items.size() == 2) {  // the untyped constructors: int, double, text
        const SNode& v = n.items[1];
        if (v.kind == SNode::STRING) return new CONST(const_cast<char*>(arenaText(v.text)));
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
        if (v.kind == SNode::STRING) return new CONST(const_cast<char*>(arenaText(v.text)));
        error(v, "a POINTER constant is null or a text, not '" + quote(v) + "'");
    }
    if (v.kind != SNode::INTEGER) error(v, "expected an integer, found '" + quote(v) + "'");
    if (v.negative && v.magnitude > 0x8000000000000000ULL) error(v, "number '" + v.text + "' is out of range");
    unsigned long long bits = v.negative ? 0ULL - v.magnitude : v.magnitude;
    return new CONST(t, static_cast<long long>(bits));
}

ExprBase* Builder::expr(const SNode& n, int ctx) { return at(n, makeExpr(n, ctx)); }

ExprBase* Builder::makeExpr(const SNode& n, int ctx) {
    if (n.kind == SNode::SYMBOL) {
        if (n.text == "nil") return nullptr;
        Ref r = parseRef(n);
        if (r.valid && r.letter == 't') return find(n, scopeOf(n, r, ctx).temps, r.id, "temporary");
        if (r.valid && r.letter == 'n') return find(n, scopeOf(n, r, ctx).names, r.id, "name");
        if (r.valid && r.letter == 'g' && r.sub < 0) {
            if (r.id >= globals.size()) error(n, "name '" + n.text + "' is not declared");
            return globals[r.id];
        }
        if (r.valid && r.letter == 'L') error(n, "a label is no expression: write (NAME " + n.text + ") for its address");
        error(n, "expected an expression, found '" + quote(n) + "'");
    }
    if (n.kind != SNode::LIST || n.items.empty() || n.items[0].kind != SNode::SYMBOL)
        error(n, "expected an expression, found '" + quote(n) + "'");
    const std::string& head = n.items[0].text;
    if (head == "CONST") return constant(n);
    if (head == "BINOP") {
        arity(n, 4, 4);
        DataType t = dataType(n.items[1]);
        BinopKind op = enumerator(n.items[2], lookupBinop, 31, "operator");
        ExprBase* l = expr(n.items[3], ctx);
        return new BINOP(t, op, l, expr(n.items[4], ctx));
    }
    if (head == "UNOP") {
        arity(n, 3, 3);
        DataType t = dataType(n.items[1]);
        UnopKind op = enumerator(n.items[2], lookupUnop, 31, "operator");
        return new UNOP(t, op, expr(n.items[3], ctx));
    }
    if (head == "MEM") {
        arity(n, 2, 2);
        DataType t = dataType(n.items[1]);
        return new MEM(t, expr(n.items[2], ctx));
    }
    if (head == "NAME") {
        arity(n, 1, 2);
        NAME* nm = ctx >= 0 ? subs[static_cast<std::size_t>(ctx)].sp->getName(labelRef(n.items[1], ctx))
                            : unit->getName(labelRef(n.items[1], ctx));
        if (n.items.size() == 3) {
            if (!isSymbol(n.items[2], "local")) error(n.items[2], "unknown flag '" + quote(n.items[2]) + "'");
            nm->setDeclaredLocal();
        }
        return nm;
    }
    if (head == "BUF_TEMP") {
        arity(n, 2, 2);
        unsigned int id = unsignedValue(n.items[1], "an id");
        return new BUF_TEMP(id, unsignedValue(n.items[2], "a size"));
    }
    if (head == "CALL") {
        arity(n, 2, std::numeric_limits<std::size_t>::max());
        DataType t = dataType(n.items[1]);
        const SNode& target = n.items[2];
        std::size_t i = 3;
        bool isStatic = i < n.items.size() && isSymbol(n.items[i], "static");
        if (isStatic) ++i;
        std::vector<ExprBase*> args;
        for (; i < n.items.size(); ++i) args.push_back(expr(n.items[i], ctx));
        CALL* c;
        if (target.kind == SNode::STRING) {
            c = new CALL(t, target.text.c_str(), args);
        } else {
            Ref r = parseRef(target);
            if (!r.valid || r.letter != 't')
                error(target, "a CALL names a function by a text or a temporary, not '" + quote(target) + "'");
            c = new CALL(t, find(target, scopeOf(target, r, ctx).temps, r.id, "temporary"), args);
        }
        c->setStaticCall(isStatic);
        return c;
    }
    error(n.items[0], "unknown expression node '" + head + "'");
}

StmtBase* Builder::stmt(const SNode& n, int ctx) { return at(n, makeStmt(n, ctx)); }

StmtBase* Builder::makeStmt(const SNode& n, int ctx) {
    if (n.kind != SNode::LIST || n.items.empty() || n.items[0].kind != SNode::SYMBOL)
        error(n, "expected a statement, found '" + quote(n) + "'");
    const std::string& head = n.items[0].text;
    if (head == "MOVE") {
        arity(n, 2, 2);
        ExprBase* d = expr(n.items[1], ctx);
        return new MOVE(d, expr(n.items[2], ctx));
    }
    if (head == "EXP") {
        arity(n, 1, 1);
        return new EXP(expr(n.items[1], ctx));
    }
    if (head == "SEQ") {
        arity(n, 2, 2);
        StmtBase* l = isSymbol(n.items[1], "nil") ? nullptr : stmt(n.items[1], ctx);
        return new SEQ(l, isSymbol(n.items[2], "nil") ? nullptr : stmt(n.items[2], ctx));
    }
    if (head == "JUMP") {
        arity(n, 1, 2);
        if (n.items.size() == 3) {  // explicit kind, needed only for a null target
            if (isSymbol(n.items[1], "label")) return new JUMP(labelOrNil(n.items[2], ctx));
            if (isSymbol(n.items[1], "expr")) return new JUMP(expr(n.items[2], ctx));
            error(n.items[1], "a JUMP's kind is label or expr, not '" + quote(n.items[1]) + "'");
        }
        const SNode& t = n.items[1];
        Ref r = parseRef(t);
        if (isSymbol(t, "nil") || (r.valid && r.letter == 'L')) return new JUMP(labelOrNil(t, ctx));
        return new JUMP(expr(t, ctx));
    }
    if (head == "CJUMP") {
        arity(n, 5, 5);
        BinopKind rel = enumerator(n.items[1], lookupBinop, 31, "relation");
        ExprBase* l = expr(n.items[2], ctx);
        ExprBase* r = expr(n.items[3], ctx);
        LABEL* t = labelOrNil(n.items[4], ctx);
        return new CJUMP(rel, l, r, t, labelOrNil(n.items[5], ctx));
    }
    error(n.items[0], "unknown statement node '" + head + "'");
}

// (name ID KIND "text") | (name ID (CONST ...)) | (name ID (values EXPR...)), then flags.
NAME* Builder::nameDef(const SNode& form, std::size_t at, int ctx, bool local) {
    const SNode& def = item(form, at, "a definition");
    NAME* nm = nullptr;
    std::size_t next = at + 1;
    SUBPROG* sp = ctx >= 0 ? subs[static_cast<std::size_t>(ctx)].sp : nullptr;
    if (def.kind == SNode::LIST && !def.items.empty() && isSymbol(def.items[0], "CONST")) {
        CONST* c = constant(def);
        nm = local ? sp->getName(c) : unit->getName(c);
    } else if (def.kind == SNode::LIST && !def.items.empty() && isSymbol(def.items[0], "values")) {
        std::list<ExprBase*> values;
        for (std::size_t i = 1; i < def.items.size(); ++i) values.push_back(expr(def.items[i], ctx));
        nm = local ? sp->getName(values) : unit->getName(values);
    } else {
        NameKind k = enumerator(def, lookupNameKind, 7, "name kind");
        const SNode& text = item(form, next++, "a text");
        if (text.kind != SNode::STRING) error(text, "expected a text, found '" + quote(text) + "'");
        nm = local ? sp->getName(k, text.text.c_str()) : unit->getName(k, text.text.c_str());
    }
    for (; next < form.items.size(); ++next) {
        if (!isSymbol(form.items[next], "local")) error(form.items[next], "unknown flag '" + quote(form.items[next]) + "'");
        nm->setDeclaredLocal();
    }
    return nm;
}

void Builder::subItem(const SNode& n, SubScope& s) {
    if (n.kind != SNode::LIST || n.items.empty() || n.items[0].kind != SNode::SYMBOL)
        error(n, "expected a declaration or a block, found '" + quote(n) + "'");
    const std::string& head = n.items[0].text;
    SUBPROG* sp = s.sp;
    auto tempId = [&](const SNode& idNode) {
        Ref r = parseRef(idNode);
        if (!r.valid || r.letter != 't' || r.sub >= 0) error(idNode, "expected a temporary id like t1, found '" + quote(idNode) + "'");
        declareId(idNode, r.id, s.nextTemp, "temporary");
        while (s.nextTemp < r.id) {
            sp->createTempId();
            ++s.nextTemp;
        }
        return r.id;
    };
    auto stateAt = [&](std::size_t i, TempState dflt) {
        return i < n.items.size() ? enumerator(n.items[i], lookupTempState, 3, "temporary state") : dflt;
    };
    auto record = [&](unsigned int id, TEMP* t, TempState want) {
        s.temps[id] = at(n, t);
        s.nextTemp = id + 1;
        if (t->getState() != want) s.states.emplace_back(t, want);
    };
    if (head == "return") {
        arity(n, 1, 2);
        TEMP* rt = sp->getReturnTemp();
        Ref r = parseRef(n.items[1]);
        if (!rt || !r.valid || r.letter != 't' || r.id != rt->getId())
            error(n.items[1], "'" + quote(n.items[1]) + "' is not this subprogram's return temporary");
        if (n.items.size() == 3) s.states.emplace_back(rt, stateAt(2, PERMANENT_TEMP));
    } else if (head == "arg" || head == "temp") {
        arity(n, 2, 3);
        unsigned int id = tempId(n.items[1]);
        DataType t = dataType(n.items[2]);
        bool arg = head == "arg";
        TempState want = stateAt(3, arg ? PERMANENT_TEMP : IN_USE_TEMP);
        // An available temp is made in use and freed once the declarations are
        // done, so that the pool cannot hand it out to a later declaration.
        TEMP* tmp = arg ? sp->getArgTemp(t) : sp->getTemp(t, 0, want == AVAILABLE_TEMP ? IN_USE_TEMP : want);
        record(id, tmp, want);
    } else if (head == "buffer") {
        arity(n, 2, 3);
        unsigned int id = tempId(n.items[1]);
        unsigned int size = unsignedValue(n.items[2], "a buffer size");
        if (size == 0) error(n.items[2], "a buffer temporary needs a size above 0");
        TempState want = stateAt(3, IN_USE_TEMP);
        record(id, sp->getTemp(POINTER, size, want == AVAILABLE_TEMP ? IN_USE_TEMP : want), want);
    } else if (head == "label" || head == "dead") {
        arity(n, 1, 2);
        Ref r = parseRef(n.items[1]);
        if (!r.valid || r.letter != 'L' || r.sub >= 0) error(n.items[1], "expected a label id like L2, found '" + quote(n.items[1]) + "'");
        LabelKind k = n.items.size() == 3 ? enumerator(n.items[2], lookupLabelKind, 3, "label kind") : REGULAR_LABEL;
        bool existing = head == "dead" && r.id < s.nextLabel && s.labels.count(r.id) != 0;
        if (!existing) {
            declareId(n.items[1], r.id, s.nextLabel, "label");
            while (s.nextLabel < r.id) {
                sp->createLabelId();
                ++s.nextLabel;
            }
            s.labels[r.id] = at(n, sp->createNewLabel(k));
            s.nextLabel = r.id + 1;
        }
        if (head == "dead") sp->freeDeadLabel(s.labels[r.id]);
    } else if (head == "name") {
        Ref r = parseRef(item(n, 1, "an id"));
        if (!r.valid || r.letter != 'n' || r.sub >= 0) error(n.items[1], "expected a local name id like n0, found '" + quote(n.items[1]) + "'");
        declareId(n.items[1], r.id, s.nextName, "name");
        while (s.nextName < r.id) {
            sp->createNameId();
            ++s.nextName;
        }
        NAME* nm = nameDef(n, 2, scope, true);
        if (nm->getId() != r.id)
            error(n, "'" + n.items[1].text + "' is the same as the earlier n" + std::to_string(nm->getId()));
        s.names[r.id] = at(n, nm);
        s.nextName = r.id + 1;
    } else if (head == "block") {
        arity(n, 1, std::numeric_limits<std::size_t>::max());
        blocks.emplace_back(scope, &n);
    } else {
        error(n.items[0], "unknown declaration '" + head + "'");
    }
}

void Builder::subprog(const SNode& n) {
    Ref r = parseRef(item(n, 1, "an id"));
    if (!r.valid || r.letter != 's' || r.sub >= 0) error(n.items[1], "expected a subprogram id like s0, found '" + quote(n.items[1]) + "'");
    if (r.id != subs.size())
        error(n.items[1], "subprogram id '" + n.items[1].text + "' should be s" + std::to_string(subs.size()));
    const SNode& name = item(n, 2, "a name");
    if (name.kind != SNode::STRING) error(name, "expected the subprogram's name as a text, found '" + quote(name) + "'");
    DataType t = dataType(item(n, 3, "a return type"));
    std::size_t i = 4;
    bool isStatic = false, isExtern = false, proto = false;
    for (; i < n.items.size() && n.items[i].kind == SNode::SYMBOL; ++i) {
        const std::string& f = n.items[i].text;
        if (f == "static") isStatic = true;
        else if (f == "extern") isExtern = true;
        else if (f == "prototype") proto = true;
        else error(n.items[i], "unknown flag '" + f + "'");
    }
    SubScope s;
    s.sp = at(n, unit->createSubprog(t, name.text.c_str(), proto));
    if (isStatic) s.sp->makeStatic();
    if (isExtern) s.sp->makeExtern();
    s.labels[0] = s.sp->getStartLabel();
    s.labels[1] = s.sp->getReturnLabel();
    if (TEMP* rt = s.sp->getReturnTemp()) {
        s.temps[rt->getId()] = rt;
        s.nextTemp = rt->getId() + 1;
    }
    subs.push_back(std::move(s));
    scope = static_cast<int>(subs.size() - 1);
    for (; i < n.items.size(); ++i) subItem(n.items[i], subs.back());
    for (auto& st : subs.back().states) st.first->setState(st.second);
    scope = -1;
}

void Builder::unitItem(const SNode& n) {
    if (n.kind != SNode::LIST || n.items.empty() || n.items[0].kind != SNode::SYMBOL)
        error(n, "expected subprog, name or prototype, found '" + quote(n) + "'");
    const std::string& head = n.items[0].text;
    if (head == "subprog") return subprog(n);
    if (head == "name") {
        Ref r = parseRef(item(n, 1, "an id"));
        if (!r.valid || r.letter != 'g' || r.sub >= 0) error(n.items[1], "expected a file-level name id like g0, found '" + quote(n.items[1]) + "'");
        if (r.id < globals.size()) error(n.items[1], "name id '" + n.items[1].text + "' is used twice or out of order");
        if (r.id > globals.size())
            error(n.items[1], "name id '" + n.items[1].text + "' should be g" + std::to_string(globals.size()));
        NAME* nm = nameDef(n, 2, -1, false);
        if (nm->getId() != r.id) error(n, "'" + n.items[1].text + "' is the same as the earlier g" + std::to_string(nm->getId()));
        globals.push_back(at(n, nm));
        return;
    }
    if (head == "prototype") {
        // Only the call's type, name, static flag and argument types matter to a prototype.
        arity(n, 2, std::numeric_limits<std::size_t>::max());
        DataType t = dataType(n.items[1]);
        if (n.items[2].kind != SNode::STRING) error(n.items[2], "expected the function's name as a text, found '" + quote(n.items[2]) + "'");
        std::size_t i = 3;
        bool isStatic = i < n.items.size() && isSymbol(n.items[i], "static");
        if (isStatic) ++i;
        std::vector<ExprBase*> args;
        for (; i < n.items.size(); ++i) {
            DataType at = dataType(n.items[i]);
            args.push_back(at == FLOAT || at == DOUBLE ? new CONST(at, 0.0) : new CONST(at, 0LL));
        }
        CALL* c = new CALL(t, n.items[2].text.c_str(), args);
        c->setStaticCall(isStatic);
        unit->addFunctionPrototype(c);
        return;
    }
    error(n.items[0], "unknown unit item '" + head + "'");
}

void Builder::build(const SItems& forms) {
    static const SNode nowhere{SNode::LIST, 1, 1, {}, 0, false, 0, {}};
    if (forms.empty()) error(nowhere, "empty input: expected (unit ...)");
    const SNode& u = forms[0];
    if (u.kind != SNode::LIST || u.items.empty() || !isSymbol(u.items[0], "unit"))
        error(u, "expected (unit ...), found '" + quote(u) + "'");
    if (forms.size() > 1) error(forms[1], "text after the unit: '" + quote(forms[1]) + "'");
    const SNode& flavour = item(u, 1, "its flavour (gcc or msvc)");
    if (!isSymbol(flavour, "gcc") && !isSymbol(flavour, "msvc"))
        error(flavour, "the unit's flavour is gcc or msvc, not '" + quote(flavour) + "'");
    std::size_t i = 2;
    bool asmMode = i < u.items.size() && isSymbol(u.items[i], "asm");
    if (asmMode) ++i;
    if (flavourOverride)
        result.unit_.reset(new ZOA_file(flavourOverride->isGcc, flavourOverride->asmMode));
    else
        result.unit_.reset(new ZOA_file(flavour.text == "gcc", asmMode));
    unit = result.unit_.get();
    for (; i < u.items.size(); ++i) unitItem(u.items[i]);
    for (auto& b : blocks) {
        const SNode& n = *b.second;
        LABEL* l = labelRef(n.items[1], b.first);
        for (std::size_t k = 2; k < n.items.size(); ++k) l->addStmt(stmt(n.items[k], b.first));
    }
}

}  // namespace

std::string format(const Diagnostic& d) {
    return d.file + ":" + std::to_string(d.line) + ":" + std::to_string(d.column) + ": error: " + d.message;
}

void buildUnit(const SItems& forms, Result& result, const std::string& fileName,
               const Flavour* flavour) {
    Builder b(result, flavour);
    try {
        b.build(forms);
    } catch (const BuildError& e) {
        result.diagnostics_.push_back({fileName, e.at->line, e.at->column, e.message});
    }
}

namespace {

Result parseWith(std::string_view source, const std::string& fileName, const Flavour* flavour) {
    Result result;
    try {
        Forms forms;
        SyntaxError err;
        if (!readForms(source, forms, err))
            result.diagnostics_.push_back({fileName, err.line, err.column, err.message});
        else
            buildUnit(forms.top, result, fileName, flavour);
    } catch (const std::exception& e) {
        result.diagnostics_.push_back({fileName, 1, 1, std::string("cannot read the text: ") + e.what()});
    }
    if (!result.diagnostics_.empty()) {
        result.unit_.reset();
        result.positions_.clear();
    }
    return result;
}

}  // namespace

Result parse(std::string_view source, const std::string& fileName) { return parseWith(source, fileName, nullptr); }

Result parse(std::string_view source, const std::string& fileName, const Flavour& flavour) {
    return parseWith(source, fileName, &flavour);
}

}  // namespace ZOA::text
