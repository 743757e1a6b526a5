// The machine: expressions, statements, calls and the public entry points.
#include "interp/machine.h"

#include "core/string_text.h"

#include "core/op_facts.h"
#include "core/traces.h"
#include "core/type_facts.h"
#include "emit/c/c_rules.h"

#include <cmath>
#include <cstdlib>

namespace ZOA::interp {

// ---- code addresses
template <class Key> std::uint32_t Machine::Impl::addressIn(CodeMap<Key>& m, const Key& k) {
    auto it = m.address.find(k);
    if (it != m.address.end()) return it->second;
    if (nextCode >= 0xFFFFFFF0u) stop(Status::BAD_ADDRESS, "too many code addresses");
    std::uint32_t a = nextCode;
    nextCode += 16;
    m.address.emplace(k, a);
    m.key.emplace(a, k);
    return a;
}

// ---- expressions
Value Machine::Impl::constant(CONST* k) {
    long long i = k->getIValue();
    if (sound && k->getDataType() != POINTER) {
        ctypes::Constant c = ctypes::soundConstant(k->getDataType(), i, k->getFValue());
        if (c.type == ctypes::CT::FLOAT || c.type == ctypes::CT::DOUBLE) return Value::floating(k->getDataType(), c.real);
        if (c.type != ctypes::CT::VOID) return Value::of(static_cast<CType>(c.type), c.bits);
    }
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
            if (!std::isfinite(ctext::narrowToFloat(k->getFValue()))) stop(Status::NO_MEANING, "non-finite constant");
            char buf[64];
            std::string text(buf, static_cast<std::size_t>(ctext::formatFloatLiteral(buf, k->getFValue())));
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

std::uint32_t Machine::Impl::stringOf(const NAME* n) {
    const String& text = n->getStringValue();
    if (sound) return bytesBlock(decodeStringText(text.data(), text.size()));
    return stringBlock(text.c_str());
}

SUBPROG* Machine::Impl::findSubprog(const std::string& name) {
    for (SUBPROG* s : unit.getSubprogs())
        if (s && s->getName() == name.c_str()) return s;
    return nullptr;
}

Value Machine::Impl::nameValue(NAME* n) {
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
        v = Value::pointer(stringOf(n));
    } else if (n->getList().empty()) {
        std::uint32_t size = n->getZeroBytes() ? n->getZeroBytes() : 1;
        v = Value::pointer(allocate(size, false, false));
        std::vector<unsigned char> zeros(size, 0);
        store(static_cast<std::uint32_t>(v.bits), zeros.data(), size);
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
                x = Value::pointer(stringOf(static_cast<NAME*>(e)));
            else
                x = eval(e);
            storeValue(at, et, convert(x, et));
            at += size;
        }
        frame = saved;
        v = Value::pointer(base);
        v.scale = sound ? 1 : size;
    }
    info.value = v;
    info.ready = true;
    info.busy = false;
    return v;
}

Value Machine::Impl::temp(TEMP* t) {
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

Value Machine::Impl::unop(UNOP* u) {
    UnopKind op = u->getOp();
    ExprBase* e = u->getExpr();
    // The cast each conversion is written with; 0 where it is written bare.
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
    const ConversionFacts& conv = conversionFacts(op);
    if (!conv.hasCast)  // written bare: the value converted to the UNOP's type
        return convert(eval(e), ctypeOf(u->getDataType()));
    return convert(eval(e), ctypeOf(conv.to), conv.toIntPointer ? sizeOfType(INT_S) : 1);
}

Value Machine::Impl::eval(ExprBase* e) {
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
Value Machine::Impl::call(CALL* c) {
    std::vector<Value> args;
    args.reserve(c->getArgs().size());
    if (TEMP* fp = c->getFunctionPointer()) {
        Value f = eval(fp);
        for (ExprBase* a : c->getArgs()) args.push_back(convert(eval(a), ctypeOf(a ? a->getDataType() : VOID)));
        auto it = functions.key.find(static_cast<std::uint32_t>(f.bits));
        if (it == functions.key.end()) stop(Status::BAD_ADDRESS, "call through an address that is no function");
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
    if (ctext::callCastsToCharPointer(name)) r = convert(r, CType::POINTER);
    return r;
}

// The order the C text prints sp's labels in, and the jumps it leaves out.
const Trace& Machine::Impl::traceOf(SUBPROG* sp) {
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
LABEL* Machine::Impl::exec(StmtBase* s, const LABEL* cur) {
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
            bool charCast = ctext::moveCastsToCharPointer(src);
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
            auto it = labels.key.find(static_cast<std::uint32_t>(a.bits));
            if (a.type == CType::VOID || isReal(a.type) || it == labels.key.end())
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

Value Machine::Impl::invoke(SUBPROG* sp, const std::vector<Value>& args) {
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
