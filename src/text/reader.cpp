// Text reader: builds a ZOA_file from the S-expression form while it is read, checking ids, kinds and arity.
#include "text/reader.h"

#include <algorithm>

namespace ZOA::text {

namespace detail {

bool parseNumber(const char*& p, const char* end, unsigned int& out) {
    if (p == end || *p < '0' || *p > '9') return false;
    unsigned long long v = 0;
    while (p != end && *p >= '0' && *p <= '9') {
        v = v * 10 + static_cast<unsigned>(*p++ - '0');
        if (v > std::numeric_limits<unsigned int>::max()) return false;
    }
    out = static_cast<unsigned int>(v);
    return true;
}

Ref parseRef(std::string_view text) {
    Ref r;
    const char* p = text.data();
    const char* end = p + text.size();
    if (p != end && p[0] == 's' && text.find(':') != std::string_view::npos) {
        ++p;
        unsigned int s = 0;
        if (!parseNumber(p, end, s) || p == end || *p != ':') return r;
        ++p;
        r.sub = static_cast<int>(s);
    }
    if (p == end || (*p != 't' && *p != 'L' && *p != 'n' && *p != 'g' && *p != 's')) return r;
    r.letter = *p++;
    if (!parseNumber(p, end, r.id) || p != end) return r;
    r.valid = true;
    return r;
}

// (name ID KIND "text") | (name ID (CONST ...)) | (name ID (values EXPR...)) |
// (name ID (data EXPR...)) | (name ID (static-data (CONST ...))) | (name ID (zero-data BYTES)),
// then the flags local and (align N).
NAME* Builder::nameDef(const SNode& form, std::size_t at, int ctx, bool local) {
    const SNode& def = item(form, at, "a definition");
    NAME* nm = nullptr;
    std::size_t next = at + 1;
    SUBPROG* sp = ctx >= 0 ? subs[static_cast<std::size_t>(ctx)].sp : nullptr;
    std::string_view h = head(def);
    if (h == "CONST") {
        CONST* c = constant(def);
        nm = local ? sp->getName(c) : unit->getName(c);
    } else if (h == "values") {
        std::list<ExprBase*> values;
        for (std::size_t i = 1; i < def.items.size(); ++i) values.push_back(expr(def.items[i], ctx));
        nm = local ? sp->getName(values) : unit->getName(values);
    } else if (h == "data") {
        std::list<ExprBase*> values;
        for (std::size_t i = 1; i < def.items.size(); ++i) values.push_back(expr(def.items[i], ctx));
        nm = local ? sp->createData(values) : unit->createData(values);
    } else if (h == "static-data") {
        arity(def, 1, 1);
        if (head(def.items[1]) != "CONST") error(def.items[1], "expected a (CONST ...), found '" + quote(def.items[1]) + "'");
        CONST* c = constant(def.items[1]);
        nm = local ? sp->createData(c) : unit->createData(c);
    } else if (h == "zero-data") {
        arity(def, 1, 1);
        unsigned int bytes = unsignedValue(def.items[1], "a size in bytes");
        nm = local ? sp->createZeroData(bytes) : unit->createZeroData(bytes);
    } else {
        NameKind k = enumerator(def, lookupNameKind, 7, "name kind");
        const SNode& t = item(form, next++, "a text");
        if (t.kind != SNode::STRING) error(t, "expected a text, found '" + quote(t) + "'");
        std::string s = str(t);
        nm = local ? sp->getName(k, s.c_str()) : unit->getName(k, s.c_str());
    }
    for (; next < form.items.size(); ++next) {
        const SNode& flag = form.items[next];
        if (head(flag) == "align") {
            arity(flag, 1, 1);
            nm->setAlignment(unsignedValue(flag.items[1], "an alignment in bytes"));
            continue;
        }
        if (!isSymbol(flag, "local")) error(flag, "unknown flag '" + quote(flag) + "'");
        nm->setDeclaredLocal();
    }
    return nm;
}

void Builder::subItem(const SNode& n, SubScope& s) {
    std::string_view h = head(n);
    if (h.empty()) error(n, "expected a declaration or a block, found '" + quote(n) + "'");
    SUBPROG* sp = s.sp;
    auto tempId = [&](const SNode& idNode) {
        Ref r = ref(idNode);
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
        put(s.temps, id, at(n, t));
        s.nextTemp = id + 1;
        if (t->getState() != want) s.states.emplace_back(t, want);
    };
    if (h == "return") {
        arity(n, 1, 2);
        TEMP* rt = sp->getReturnTemp();
        Ref r = ref(n.items[1]);
        if (!rt || !r.valid || r.letter != 't' || r.id != rt->getId())
            error(n.items[1], "'" + quote(n.items[1]) + "' is not this subprogram's return temporary");
        if (n.items.size() == 3) s.states.emplace_back(rt, stateAt(2, PERMANENT_TEMP));
    } else if (h == "arg" || h == "temp") {
        arity(n, 2, 3);
        unsigned int id = tempId(n.items[1]);
        DataType t = dataType(n.items[2]);
        bool arg = h == "arg";
        TempState want = stateAt(3, arg ? PERMANENT_TEMP : IN_USE_TEMP);
        // An available temp is made in use and freed once the declarations are
        // done, so that the pool cannot hand it out to a later declaration.
        TEMP* tmp = arg ? sp->getArgTemp(t) : sp->getTemp(t, 0, want == AVAILABLE_TEMP ? IN_USE_TEMP : want);
        record(id, tmp, want);
    } else if (h == "buffer") {
        // (buffer tN SIZE [STATE] [(align N)])
        const SNode* align = n.items.size() > 3 && head(n.items[n.items.size() - 1]) == "align" ? &n.items[n.items.size() - 1] : nullptr;
        arity(n, align ? 3 : 2, align ? 4 : 3);
        unsigned int id = tempId(n.items[1]);
        unsigned int size = unsignedValue(n.items[2], "a buffer size");
        if (size == 0) error(n.items[2], "a buffer temporary needs a size above 0");
        TempState want = n.items.size() > (align ? 4u : 3u) ? stateAt(3, IN_USE_TEMP) : IN_USE_TEMP;
        TEMP* buf = sp->getTemp(POINTER, size, want == AVAILABLE_TEMP ? IN_USE_TEMP : want);
        if (align) {
            arity(*align, 1, 1);
            static_cast<BUF_TEMP*>(buf)->setAlignment(unsignedValue(align->items[1], "an alignment in bytes"));
        }
        record(id, buf, want);
    } else if (h == "label" || h == "dead") {
        arity(n, 1, 2);
        Ref r = ref(n.items[1]);
        if (!r.valid || r.letter != 'L' || r.sub >= 0) error(n.items[1], "expected a label id like L2, found '" + quote(n.items[1]) + "'");
        LabelKind k = n.items.size() == 3 ? enumerator(n.items[2], lookupLabelKind, 3, "label kind") : REGULAR_LABEL;
        bool existing = h == "dead" && r.id < s.nextLabel && get(s.labels, r.id) != nullptr;
        if (!existing) {
            declareId(n.items[1], r.id, s.nextLabel, "label");
            while (s.nextLabel < r.id) {
                sp->createLabelId();
                ++s.nextLabel;
            }
            put(s.labels, r.id, at(n, sp->createNewLabel(k)));
            s.nextLabel = r.id + 1;
        }
        if (h == "dead") sp->freeDeadLabel(s.labels[r.id]);
    } else if (h == "name") {
        Ref r = ref(item(n, 1, "an id"));
        if (!r.valid || r.letter != 'n' || r.sub >= 0) error(n.items[1], "expected a local name id like n0, found '" + quote(n.items[1]) + "'");
        declareId(n.items[1], r.id, s.nextName, "name");
        while (s.nextName < r.id) {
            sp->createNameId();
            ++s.nextName;
        }
        NAME* nm = nameDef(n, 2, scope, true);
        if (nm->getId() != r.id)
            error(n, "'" + str(n.items[1]) + "' is the same as the earlier n" + std::to_string(nm->getId()));
        put(s.names, r.id, at(n, nm));
        s.nextName = r.id + 1;
    } else if (h == "block") {
        arity(n, 1, ANY);
        subBlocks.push_back(&n);
    } else {
        error(n.items[0], "unknown declaration '" + std::string(h) + "'");
    }
}

void Builder::subprog(const SNode& n) {
    Ref r = ref(item(n, 1, "an id"));
    if (!r.valid || r.letter != 's' || r.sub >= 0) error(n.items[1], "expected a subprogram id like s0, found '" + quote(n.items[1]) + "'");
    if (r.id != subs.size())
        error(n.items[1], "subprogram id '" + str(n.items[1]) + "' should be s" + std::to_string(subs.size()));
    const SNode& name = item(n, 2, "a name");
    if (name.kind != SNode::STRING) error(name, "expected the subprogram's name as a text, found '" + quote(name) + "'");
    DataType t = dataType(item(n, 3, "a return type"));
    std::size_t i = 4;
    bool isStatic = false, isExtern = false, proto = false;
    for (; i < n.items.size() && n.items[i].kind == SNode::SYMBOL; ++i) {
        std::string_view f = text(n.items[i]);
        if (f == "static") isStatic = true;
        else if (f == "extern") isExtern = true;
        else if (f == "prototype") proto = true;
        else error(n.items[i], "unknown flag '" + std::string(f) + "'");
    }
    SubScope s;
    s.sp = at(n, unit->createSubprog(t, str(name).c_str(), proto));
    if (isStatic) s.sp->makeStatic();
    if (isExtern) s.sp->makeExtern();
    put(s.labels, 0, s.sp->getStartLabel());
    put(s.labels, 1, s.sp->getReturnLabel());
    if (TEMP* rt = s.sp->getReturnTemp()) {
        s.returnTemp = rt;
        put(s.temps, rt->getId(), rt);
        s.nextTemp = rt->getId() + 1;
    }
    subs.push_back(std::move(s));
    scope = static_cast<int>(subs.size() - 1);
    subBlocks.clear();
    for (; i < n.items.size(); ++i) subItem(n.items[i], subs.back());
    for (auto& st : subs.back().states) st.first->setState(st.second);
    int ctx = scope;
    scope = -1;
    for (const SNode* b : subBlocks) {
        if (blockError) break;
        if (!deferring && !mentionsLater(*b)) {
            try {
                block(ctx, *b);
            } catch (BuildError& e) {
                // A later declaration's error still comes first.
                blockError = std::move(e);
            }
        } else {
            deferring = true;
            blocks.emplace_back(ctx, b);
        }
    }
}

// True if a block mentions another subprogram's item or a file-level name not
// yet declared: what the subprogram itself declares is all known by now.
bool Builder::mentionsLater(const SNode& b) {
    const std::vector<std::size_t>& at = forms.scopedSymbols;
    for (auto it = std::lower_bound(at.begin(), at.end(), b.offset); it != at.end() && *it < b.offset + b.length; ++it) {
        Ref r = parseRef(src.substr(*it, symbolEnd(src, *it) - *it));
        if (r.valid && (r.sub >= 0 || (r.letter == 'g' && r.id >= globals.size()))) return true;
    }
    return false;
}

void Builder::block(int ctx, const SNode& n) {
    inBlock = true;
    LABEL* l = labelRef(n.items[1], ctx);
    for (std::size_t k = 2; k < n.items.size(); ++k) l->addStmt(stmt(n.items[k], ctx));
    inBlock = false;
}

void Builder::runBlocks(const std::vector<std::pair<int, const SNode*>>& todo) {
    for (auto& b : todo) block(b.first, *b.second);
}

void Builder::buildUnitItem(const SNode& n) {
    std::string_view h = head(n);
    if (h.empty()) error(n, "expected subprog, name or prototype, found '" + quote(n) + "'");
    if (h == "subprog") return subprog(n);
    if (h == "name") {
        Ref r = ref(item(n, 1, "an id"));
        if (!r.valid || r.letter != 'g' || r.sub >= 0) error(n.items[1], "expected a file-level name id like g0, found '" + quote(n.items[1]) + "'");
        if (r.id < globals.size()) error(n.items[1], "name id '" + str(n.items[1]) + "' is used twice or out of order");
        if (r.id > globals.size())
            error(n.items[1], "name id '" + str(n.items[1]) + "' should be g" + std::to_string(globals.size()));
        NAME* nm = nameDef(n, 2, -1, false);
        if (nm->getId() != r.id) error(n, "'" + str(n.items[1]) + "' is the same as the earlier g" + std::to_string(nm->getId()));
        globals.push_back(at(n, nm));
        return;
    }
    if (h == "prototype") {
        // Only the call's type, name, static flag and argument types matter to a prototype.
        arity(n, 2, ANY);
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
        CALL* c = new CALL(t, str(n.items[2]).c_str(), args);
        c->setStaticCall(isStatic);
        unit->addFunctionPrototype(c);
        return;
    }
    error(n.items[0], "unknown unit item '" + std::string(h) + "'");
}

void Builder::ensureUnit() {
    if (unit) return;
    if (flavourOverride)
        result.unit_.reset(new ZOA_file(flavourOverride->isGcc, flavourOverride->asmMode));
    else
        result.unit_.reset(new ZOA_file(isGcc, asmMode));
    unit = result.unit_.get();
}

bool Builder::unitItem(const SNode& unitList, std::size_t index, const SNode& n) {
    if (stopped()) return true;
    try {
        if (index == 0) {
            if (!isSymbol(n, "unit"))
                headError = BuildError{unitList.offset, "expected (unit ...), found '(" +
                                                            (n.kind == SNode::SYMBOL ? str(n) : std::string()) + "'"};
            return true;
        }
        if (index == 1) {
            if (!isSymbol(n, "gcc") && !isSymbol(n, "msvc"))
                error(n, "the unit's flavour is gcc or msvc, not '" + quote(n) + "'");
            isGcc = isSymbol(n, "gcc");
            return true;
        }
        if (index == 2 && isSymbol(n, "asm")) {
            asmMode = true;
            return true;
        }
        ensureUnit();
        buildUnitItem(n);
    } catch (BuildError& e) {
        declError = std::move(e);
        return true;
    }
    // Blocks waiting for the end of the unit still need their nodes.
    return !deferring;
}

void Builder::topForm(std::size_t index, const SNode& form) {
    if (index == 0) {
        if (headError) return;
        if (form.kind != SNode::LIST || form.items.empty()) {
            headError = BuildError{form.offset, "expected (unit ...), found '" + quote(form) + "'"};
            return;
        }
        if (stopped()) return;
        if (form.items.size() < 2) {
            declError = BuildError{form.offset, "'" + quote(form) + "' lacks its flavour (gcc or msvc)"};
            return;
        }
        ensureUnit();
        if (blockError) return;
        try {
            runBlocks(blocks);
        } catch (BuildError& e) {
            blockError = std::move(e);
        }
        return;
    }
    if (index == 1 && !headError) afterError = BuildError{form.offset, "text after the unit: '" + quote(form) + "'"};
}

const BuildError* Builder::failure() const {
    for (const std::optional<BuildError>* e : {&headError, &afterError, &declError, &blockError})
        if (*e) return &**e;
    return nullptr;
}

}  // namespace detail

std::string format(const Diagnostic& d) {
    return d.file + ":" + std::to_string(d.line) + ":" + std::to_string(d.column) + ": error: " + d.message;
}

namespace {

using detail::Builder;
using detail::BuildError;

Result parseWith(std::string_view source, const std::string& fileName, const Flavour* flavour) {
    Result result;
    PositionTable& positions = result.positions_;
    positions.lineStarts.assign(1, 0);
    auto report = [&](std::size_t offset, std::string message) {
        Position p = positions.locate(offset);
        result.diagnostics_.push_back({fileName, p.line, p.column, std::move(message)});
    };
    try {
        Forms forms;
        SyntaxError err;
        Builder b(source, forms, result, flavour);
        if (!readForms(source, forms, positions.lineStarts, b, err))
            report(err.offset, err.message);
        else if (const BuildError* e = b.failure())
            report(e->offset, e->message);
        else if (!result.unit_)
            report(0, "empty input: expected (unit ...)");
    } catch (const std::exception& e) {
        result.diagnostics_.clear();
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
