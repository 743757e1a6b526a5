// Text writer: prints a unit in the form the reader rebuilds it from, ids and order preserved.
#include "text/names.h"
#include "text/write_buffer.h"

#include <zoa/text.h>
#include <zoa/zoa.h>

#include "core/children.h"
#include "core/node_kinds.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <map>
#include <ostream>
#include <type_traits>
#include <unordered_map>

namespace ZOA::text {

namespace {

using detail::head;
using detail::Out;
using detail::writeConstant;
using detail::writeText;

constexpr int GLOBAL = -1;

struct Owner {
    int sub;  // GLOBAL for file-level names
    unsigned int id;
};

class Writer {
public:
    template <class To> Writer(To& to, const ZOA_file& unit) : os(to), unit(unit) {}
    void run();

private:
    Out os;
    const ZOA_file& unit;
    std::vector<SUBPROG*> subs;
    std::unordered_map<const TEMP*, Owner> temps;
    std::unordered_map<const LABEL*, Owner> labels;
    std::unordered_map<const NAME*, Owner> names;
    std::vector<std::map<unsigned int, LABEL*>> dead;  // referenced labels no longer in their map
    // Each subprogram's own temps, labels and local names by id (those the maps
    // give to it), and the file-level names by id: references from a
    // subprogram's own statements are found here without hashing.
    struct Own {
        std::vector<const TEMP*> temps;
        std::vector<const LABEL*> labels;
        std::vector<const NAME*> names;
    };
    std::vector<Own> own;
    std::vector<const NAME*> globalNames;
    // The nodes being written or scanned, outermost first, to stop at a tree
    // that contains itself.
    std::vector<const TreeBase*> path;
    struct Frame {
        TreeBase* node;
        bool entered;
    };
    std::vector<Frame> todo;

    template <class T> static void index(std::vector<const T*>& v, unsigned int id, const T* x) {
        if (id >= v.size()) v.resize(static_cast<std::size_t>(id) + 1, nullptr);
        v[id] = x;
    }
    // The owner of a temp, label or name; false for one the unit does not hold.
    // Looks in subprogram ctx's own ones by id (and, for names, the file-level
    // ones) before the map.
    template <class T>
    static bool find(const T* x, int ctx, const std::vector<const T*>* mine, const std::vector<const T*>* global,
                     const std::unordered_map<const T*, Owner>& map, Owner& o) {
        unsigned int id = x->getId();
        if (global && id < global->size() && (*global)[id] == x) {
            o = {GLOBAL, id};
            return true;
        }
        if (mine && id < mine->size() && (*mine)[id] == x) {
            o = {ctx, id};
            return true;
        }
        auto it = map.find(x);
        if (it != map.end()) o = it->second;
        return it != map.end();
    }
    const Own* mine(int ctx) const { return ctx >= 0 ? &own[static_cast<std::size_t>(ctx)] : nullptr; }
    bool ownerOf(const TEMP* t, int ctx, Owner& o) const {
        return find<TEMP>(t, ctx, ctx >= 0 ? &mine(ctx)->temps : nullptr, nullptr, temps, o);
    }
    bool ownerOf(const LABEL* l, int ctx, Owner& o) const {
        return find<LABEL>(l, ctx, ctx >= 0 ? &mine(ctx)->labels : nullptr, nullptr, labels, o);
    }
    bool ownerOf(const NAME* n, int ctx, Owner& o) const {
        return find<NAME>(n, ctx, ctx >= 0 ? &mine(ctx)->names : nullptr, &globalNames, names, o);
    }

    // True if n is already being written further out: a tree that contains
    // itself through copy assignments. Compares n with one node of the path,
    // the one at the last power of two of the depth, which any repetition meets
    // within twice its length.
    bool repeats(const TreeBase* n) const {
        std::size_t d = path.size();
        if (d == 0) return false;
        std::size_t anchor = std::size_t(1) << (8 * sizeof(std::size_t) - 1 - static_cast<unsigned>(__builtin_clzll(d)));
        return path[anchor - 1] == n;
    }

    void ref(char letter, Owner o, int ctx) {
        if (o.sub != GLOBAL && o.sub != ctx) os << 's' << o.sub << ':';
        os << letter << o.id;
    }
    void label(LABEL* l, int ctx) {
        Owner o;
        if (!l || !ownerOf(l, ctx, o)) {
            os << "nil";
            return;
        }
        ref('L', o, ctx);
    }
    void expr(ExprBase* e, int ctx);
    void exprBody(ExprBase* e, int ctx);
    void stmt(StmtBase* s, int ctx, int depth);
    void stmtBody(StmtBase* s, int ctx, int depth);
    void nameDef(NAME* n, int ctx);
    void privateData(NAME* n, int ctx);
    void subprog(std::size_t i);
    void global(NAME* n);

    // Calls f on every temp, name and label an expression or statement mentions.
    template <class F> void scan(TreeBase* t, F&& f);
    void collectDead(std::size_t i, TreeBase* t);
};

// The children of forEachChild, less a NAME's values (a name is written by
// reference), plus the expression a label JUMP may also hold: it is not
// written, but a freed label it names has always been declared dead.
template <class F> void Writer::scan(TreeBase* root, F&& f) {
    todo.assign(1, Frame{root, false});
    path.clear();
    while (!todo.empty()) {
        Frame& top = todo.back();
        if (top.entered) {
            todo.pop_back();
            path.pop_back();
            continue;
        }
        TreeBase* t = top.node;
        if (repeats(t)) {
            todo.pop_back();
            continue;
        }
        top.entered = true;
        path.push_back(t);
        // Leaves are met at once: they hold nothing and cannot repeat.
        auto push = [this, &f](TreeBase* c) {
            NodeType k = c->getNodeType();
            if (k == CONST_NODE) return;
            if (k == TEMP_NODE || k == BUF_TEMP_NODE) f(c);
            else todo.push_back(Frame{c, false});
        };
        switch (t->getNodeType()) {
            case NAME_NODE: {
                NAME* n = static_cast<NAME*>(t);
                f(t);
                if (n->getLabelRef()) f(n->getLabelRef());
                continue;
            }
            case TEMP_NODE:
            case BUF_TEMP_NODE: f(t); continue;
            case JUMP_NODE: {
                JUMP* j = static_cast<JUMP*>(t);
                if (LABEL* l = j->getTarget()) f(l);
                if (j->getKind() != DIRECT_EXPR && j->getExpr()) push(j->getExpr());
                break;
            }
            case CJUMP_NODE: {
                CJUMP* c = static_cast<CJUMP*>(t);
                if (c->getIfTrue()) f(c->getIfTrue());
                if (c->getIfFalse()) f(c->getIfFalse());
                break;
            }
            default: break;
        }
        forEachChild(t, push);
    }
}

// A label that was freed but is still jumped to is declared dead in the
// subprogram that mentions it, so the reference can be written by id.
void Writer::collectDead(std::size_t i, TreeBase* t) {
    scan(t, [&](TreeBase* x) {
        if (x->getNodeType() != LABEL_NODE) return;
        LABEL* l = static_cast<LABEL*>(x);
        Owner o;
        if (ownerOf(l, static_cast<int>(i), o) || dead[i].count(l->getId()) || subs[i]->getAllLabels().count(l->getId())) return;
        dead[i][l->getId()] = l;
        labels[l] = {static_cast<int>(i), l->getId()};
    });
}

// A tree that contains itself is written up to the repetition, then
// "(cycle)", which the reader refuses.
void Writer::expr(ExprBase* e, int ctx) {
    if (!e) {
        os << "nil";
        return;
    }
    if (repeats(e)) {
        os << "(cycle)";
        return;
    }
    path.push_back(e);
    exprBody(e, ctx);
    path.pop_back();
}

void Writer::exprBody(ExprBase* e, int ctx) {
    switch (e->getNodeType()) {
        case CONST_NODE: writeConstant(os, static_cast<CONST*>(e)); return;
        case BINOP_NODE: {
            BINOP* b = static_cast<BINOP*>(e);
            os << head(BINOP_NODE) << spell(b->getDataType()) << ' ' << spell(b->getOp()) << ' ';
            expr(b->getLeft(), ctx);
            os << ' ';
            expr(b->getRight(), ctx);
            os << ')';
            return;
        }
        case UNOP_NODE: {
            UNOP* u = static_cast<UNOP*>(e);
            os << head(UNOP_NODE) << spell(u->getDataType()) << ' ' << spell(u->getOp()) << ' ';
            expr(u->getExpr(), ctx);
            os << ')';
            return;
        }
        case MEM_NODE:
            os << head(MEM_NODE) << spell(e->getDataType()) << ' ';
            expr(static_cast<MEM*>(e)->getExpr(), ctx);
            os << ')';
            return;
        case CALL_NODE: {
            CALL* c = static_cast<CALL*>(e);
            os << head(CALL_NODE) << spell(c->getDataType()) << ' ';
            if (c->getFunctionPointer())
                expr(c->getFunctionPointer(), ctx);
            else
                writeText(os, c->getFunctionName().data(), c->getFunctionName().size());
            if (c->isCallStatic()) os << " static";
            for (ExprBase* a : c->getArgs()) {
                os << ' ';
                expr(a, ctx);
            }
            os << ')';
            return;
        }
        case NAME_NODE: {
            NAME* n = static_cast<NAME*>(e);
            Owner o;
            if (ownerOf(n, ctx, o)) {
                ref(o.sub == GLOBAL ? 'g' : 'n', o, ctx);
            } else if (n->getLabelRef()) {
                os << head(NAME_NODE);
                label(n->getLabelRef(), ctx);
                os << (n->isDeclaredLocal() ? " local)" : ")");
            } else {
                os << "(unknown-name " << n->getId() << ')';
            }
            return;
        }
        case TEMP_NODE:
        case BUF_TEMP_NODE: {
            TEMP* t = static_cast<TEMP*>(e);
            Owner o;
            if (ownerOf(t, ctx, o))
                ref('t', o, ctx);
            else if (e->getNodeType() == BUF_TEMP_NODE)
                os << head(BUF_TEMP_NODE) << t->getId() << ' ' << static_cast<BUF_TEMP*>(t)->getArraySize() << ')';
            else
                os << "(unknown-temp " << t->getId() << ')';
            return;
        }
        case TREE_BASE_NODE:
        case EXPR_BASE_NODE:
        case STMT_BASE_NODE:
        case CJUMP_NODE:
        case EXP_NODE:
        case JUMP_NODE:
        case LABEL_NODE:
        case MOVE_NODE:
        case SEQ_NODE:
        case SUBPROG_NODE:
            break;
    }
    os << "(unknown-node)";
}

void Writer::stmt(StmtBase* s, int ctx, int depth) {
    if (!s) {
        os << "nil";
        return;
    }
    if (repeats(s)) {
        os << "(cycle)";
        return;
    }
    path.push_back(s);
    stmtBody(s, ctx, depth);
    path.pop_back();
}

void Writer::stmtBody(StmtBase* s, int ctx, int depth) {
    switch (s->getNodeType()) {
        case MOVE_NODE:
            os << head(MOVE_NODE);
            expr(static_cast<MOVE*>(s)->getDst(), ctx);
            os << ' ';
            expr(static_cast<MOVE*>(s)->getSrc(), ctx);
            os << ')';
            return;
        case EXP_NODE:
            os << head(EXP_NODE);
            expr(static_cast<EXP*>(s)->getExpr(), ctx);
            os << ')';
            return;
        case SEQ_NODE:
            os << head(SEQ_NODE);
            stmt(static_cast<SEQ*>(s)->getLeft(), ctx, depth + 1);
            os << ' ';
            stmt(static_cast<SEQ*>(s)->getRight(), ctx, depth + 1);
            os << ')';
            return;
        case JUMP_NODE: {
            JUMP* j = static_cast<JUMP*>(s);
            os << head(JUMP_NODE);
            if (j->getKind() == DIRECT_LABEL) {
                // An unknown target is written as nil too: keep the kind explicit.
                Owner o;
                if (!j->getTarget() || !ownerOf(j->getTarget(), ctx, o)) os << "label ";
                label(j->getTarget(), ctx);
            } else {
                if (!j->getExpr()) os << "expr ";
                expr(j->getExpr(), ctx);
            }
            os << ')';
            return;
        }
        case CJUMP_NODE: {
            CJUMP* c = static_cast<CJUMP*>(s);
            os << head(CJUMP_NODE) << spell(c->getRelOp()) << ' ';
            expr(c->getLeft(), ctx);
            os << ' ';
            expr(c->getRight(), ctx);
            os << ' ';
            label(c->getIfTrue(), ctx);
            os << ' ';
            label(c->getIfFalse(), ctx);
            os << ')';
            return;
        }
        case TREE_BASE_NODE:
        case EXPR_BASE_NODE:
        case BINOP_NODE:
        case BUF_TEMP_NODE:
        case CALL_NODE:
        case CONST_NODE:
        case MEM_NODE:
        case NAME_NODE:
        case TEMP_NODE:
        case UNOP_NODE:
        case STMT_BASE_NODE:
        case LABEL_NODE:
        case SUBPROG_NODE:
            break;
    }
    os << "(unknown-node)";
}

void Writer::nameDef(NAME* n, int ctx) {
    const ExprList& l = n->getList();
    const String& text = n->getStringValue();
    if (n->isPrivateData()) {
        privateData(n, ctx);
    } else if (n->getKind() == STATIC_DATA_REF && l.size() == 1 && l.front() && text.empty() &&
        l.front()->getNodeType() == CONST_NODE && l.front()->getDataType() == n->getDataType()) {
        writeConstant(os, static_cast<CONST*>(l.front()));
    } else if (n->getKind() == CONST_ARRAY_REF && text.empty()) {
        os << "(values";
        for (ExprBase* e : l) {
            os << ' ';
            expr(e, ctx);
        }
        os << ')';
    } else {
        os << spell(n->getKind()) << ' ';
        writeText(os, text.data(), text.size());
    }
    if (n->getAlignment()) os << " (align " << n->getAlignment() << ')';
}

// Data made by createData or createZeroData.
void Writer::privateData(NAME* n, int ctx) {
    const ExprList& l = n->getList();
    if (n->getKind() == STATIC_DATA_REF && l.size() == 1 && l.front() && l.front()->getNodeType() == CONST_NODE) {
        os << "(static-data ";
        writeConstant(os, static_cast<CONST*>(l.front()));
        os << ')';
    } else if (n->getZeroBytes()) {
        os << "(zero-data " << n->getZeroBytes() << ')';
    } else {
        os << "(data";
        for (ExprBase* e : l) {
            os << ' ';
            expr(e, ctx);
        }
        os << ')';
    }
}

void Writer::global(NAME* n) {
    os << "  (name g" << names[n].id << ' ';
    nameDef(n, GLOBAL);
    os << (n->isDeclaredLocal() ? " local)\n" : ")\n");
}

void Writer::subprog(std::size_t i) {
    SUBPROG* sp = subs[i];
    int ctx = static_cast<int>(i);
    os << "  (subprog s" << i << ' ';
    writeText(os, sp->getName().data(), sp->getName().size());
    os << ' ' << spell(sp->getReturnType());
    if (sp->isStatic()) os << " static";
    if (sp->isExtern()) os << " extern";
    auto proto = unit.getSubprogPrototypes().find(std::string(sp->getName().data(), sp->getName().size()));
    if (proto != unit.getSubprogPrototypes().end() && proto->second == sp) os << " prototype";
    os << '\n';
    const TempList& args = sp->getAllArgTemps();
    for (TEMP* t : sp->getAllTemps()) {
        if (t == sp->getReturnTemp()) {
            if (t->getState() != PERMANENT_TEMP) os << "    (return t" << t->getId() << ' ' << spell(t->getState()) << ")\n";
        } else if (t->getNodeType() == BUF_TEMP_NODE) {
            os << "    (buffer t" << t->getId() << ' ' << static_cast<BUF_TEMP*>(t)->getArraySize();
            if (t->getState() != IN_USE_TEMP) os << ' ' << spell(t->getState());
            if (unsigned int a = static_cast<BUF_TEMP*>(t)->getAlignment()) os << " (align " << a << ')';
            os << ")\n";
        } else {
            bool arg = std::find(args.begin(), args.end(), t) != args.end();
            os << (arg ? "    (arg t" : "    (temp t") << t->getId() << ' ' << spell(t->getDataType());
            if (t->getState() != (arg ? PERMANENT_TEMP : IN_USE_TEMP)) os << ' ' << spell(t->getState());
            os << ")\n";
        }
    }
    // Labels by id, live or dead: the reader recreates them in this order.
    std::map<unsigned int, std::pair<LABEL*, bool>> all;
    for (auto& [id, l] : sp->getAllLabels()) all[id] = {l, true};
    for (auto& [id, l] : dead[i]) all[id] = {l, false};
    // The start and return labels exist from construction; say so if they were freed.
    for (unsigned int id = 0; id < 2; ++id)
        if (!sp->getAllLabels().count(id) && !dead[i].count(id)) os << "    (dead L" << id << ")\n";
    for (auto& [id, e] : all) {
        if (id < 2 && e.second) continue;
        os << (e.second ? "    (label L" : "    (dead L") << id;
        if (e.first->getKind() != REGULAR_LABEL) os << ' ' << spell(e.first->getKind());
        os << ")\n";
    }
    for (NAME* n : sp->getAllLocalNames()) {
        os << "    (name n" << n->getId() << ' ';
        nameDef(n, ctx);
        os << ")\n";
    }
    for (auto& [id, e] : all) {
        if (e.first->getStmts().empty()) continue;
        os << "    (block L" << id;
        for (StmtBase* s : e.first->getStmts()) {
            os << "\n      ";
            stmt(s, ctx, 0);
        }
        os << ")\n";
    }
    os << "  )\n";
}

void Writer::run() {
    subs.assign(unit.getSubprogs().begin(), unit.getSubprogs().end());
    dead.resize(subs.size());
    own.resize(subs.size());
    for (std::size_t i = 0; i < subs.size(); ++i) {
        int s = static_cast<int>(i);
        for (TEMP* t : subs[i]->getAllTemps())
            if (temps.emplace(t, Owner{s, t->getId()}).second) index(own[i].temps, t->getId(), t);
        for (auto& [id, l] : subs[i]->getAllLabels())
            if (labels.emplace(l, Owner{s, id}).second && l->getId() == id) index(own[i].labels, id, l);
        for (NAME* n : subs[i]->getAllLocalNames())
            if (names.emplace(n, Owner{s, n->getId()}).second) index(own[i].names, n->getId(), n);
    }
    for (NAME* n : unit.getNames())
        if (names.emplace(n, Owner{GLOBAL, n->getId()}).second) index(globalNames, n->getId(), n);
    for (std::size_t i = 0; i < subs.size(); ++i) {
        for (auto& [id, l] : subs[i]->getAllLabels())
            for (StmtBase* s : l->getStmts()) collectDead(i, s);
        for (NAME* n : subs[i]->getAllLocalNames())
            for (ExprBase* e : n->getList()) collectDead(i, e);
    }
    for (std::size_t i = 0; i < subs.size(); ++i)
        for (auto& [id, l] : dead[i])
            for (StmtBase* s : l->getStmts()) collectDead(i, s);

    os << "(unit " << (unit.IsGcc() ? "gcc" : "msvc") << (unit.IsAsmMode() ? " asm\n" : "\n");
    // Call prototypes first: no subprogram exists yet, so each one is recorded.
    for (auto& [key, call] : unit.getCallPrototypes()) {
        os << "  (prototype " << spell(call->getDataType()) << ' ';
        writeText(os, key.data(), key.size());
        if (call->isCallStatic()) os << " static";
        for (ExprBase* a : call->getArgs()) os << ' ' << (a ? spell(a->getDataType()) : Spelling{"VOID", 0});
        os << ")\n";
    }

    // File-level names go as early as what they mention allows; a subprogram
    // reference waits for its subprogram unless it was recorded as a prototype.
    std::vector<NAME*> globals(unit.getNames().begin(), unit.getNames().end());
    auto firstSub = [&](const String& name) {
        for (std::size_t i = 0; i < subs.size(); ++i)
            if (subs[i]->getName() == name) return static_cast<int>(i);
        return -1;
    };
    std::vector<int> after(globals.size(), -1);
    for (std::size_t g = 0; g < globals.size(); ++g) {
        NAME* n = globals[g];
        for (ExprBase* e : n->getList())
            scan(e, [&](TreeBase* x) {
                int owner = -1;
                if (x->getNodeType() == LABEL_NODE) {
                    auto it = labels.find(static_cast<LABEL*>(x));
                    if (it != labels.end()) owner = it->second.sub;
                } else if (x->getNodeType() == NAME_NODE) {
                    auto it = names.find(static_cast<NAME*>(x));
                    if (it != names.end()) owner = it->second.sub;
                } else {
                    auto it = temps.find(static_cast<TEMP*>(x));
                    if (it != temps.end()) owner = it->second.sub;
                }
                if (owner > after[g]) after[g] = owner;
            });
        if (n->getKind() == SUBPROG_REF) {
            std::string text(n->getStringValue().data(), n->getStringValue().size());
            auto p = unit.getNamePrototypes().find(text);
            int s = firstSub(n->getStringValue());
            if (s >= 0 && (p == unit.getNamePrototypes().end() || p->second != n) && s > after[g]) after[g] = s;
        }
    }
    std::size_t g = 0, s = 0;
    while (g < globals.size() || s < subs.size()) {
        if (g < globals.size() && (after[g] < static_cast<int>(s) || s == subs.size()))
            global(globals[g++]);
        else
            subprog(s++);
    }
    os << ")\n";
}

}  // namespace

void write(std::ostream& os, const ZOA_file& unit) { Writer(os, unit).run(); }

std::string write(const ZOA_file& unit) {
    std::string text;
    Writer(text, unit).run();
    return text;
}

}  // namespace ZOA::text
