// The builder of the text reader: turns S-expressions into a unit through the public API as they are read.
#ifndef ZOA_TEXT_READER_H
#define ZOA_TEXT_READER_H

#include <zoa/text.h>
#include <zoa/zoa.h>

#include "text/names.h"
#include "text/sexpr.h"

#include <cstring>
#include <limits>
#include <optional>
#include <string>
#include <vector>

namespace ZOA::text::detail {

// Thrown inside the builder only; it becomes the one diagnostic.
struct BuildError {
    std::size_t offset;
    std::string message;
};

[[noreturn]] inline void error(const SNode& at, std::string message) { throw BuildError{at.offset, std::move(message)}; }

// What a subprogram's ids stand for, indexed by id (null: not declared).
struct SubScope {
    SUBPROG* sp = nullptr;
    TEMP* returnTemp = nullptr;
    std::vector<TEMP*> temps;
    std::vector<LABEL*> labels;  // dead labels stay here so blocks can still name them
    std::vector<NAME*> names;
    unsigned int nextTemp = 0;
    unsigned int nextLabel = 2;
    unsigned int nextName = 0;
    std::vector<std::pair<TEMP*, TempState>> states;
};

template <class T> void put(std::vector<T*>& v, unsigned int id, T* x) {
    if (id >= v.size()) v.resize(static_cast<std::size_t>(id) + 1, nullptr);
    v[id] = x;
}
template <class T> T* get(const std::vector<T*>& v, unsigned int id) { return id < v.size() ? v[id] : nullptr; }

// A reference token: optional "sK:" then a letter and a number ("t3", "s1:L2").
struct Ref {
    bool valid = false;
    int sub = -1;  // -1: the current scope
    char letter = 0;
    unsigned int id = 0;
};

Ref parseRef(std::string_view text);

constexpr std::size_t ANY = std::numeric_limits<std::size_t>::max();

class Builder : public FormListener {
public:
    Builder(std::string_view src, const Forms& forms, Result& r, const Flavour* f)
        : src(src), forms(forms), result(r), flavourOverride(f) {}

    bool unitItem(const SNode& unitList, std::size_t index, const SNode& item) override;
    void topForm(std::size_t index, const SNode& form) override;
    // The diagnostic that stops the text, if any, by precedence: a form that is
    // no unit, text after the unit, the first error of the declarations, the
    // first error of the blocks.
    const BuildError* failure() const;

private:
    std::string_view src;
    const Forms& forms;
    Result& result;
    const Flavour* flavourOverride;
    ZOA_file* unit = nullptr;
    std::string scratch;  // decoded texts

    bool isGcc = true;
    bool asmMode = false;
    std::optional<BuildError> headError, afterError, declError, blockError;
    bool stopped() const { return headError || afterError || declError; }

    std::vector<SubScope> subs;
    std::vector<NAME*> globals;
    // Blocks run after every declaration was read, in the order written. A
    // block that mentions only what is declared already runs as soon as its
    // subprogram is read, which gives the same unit; from the first that
    // cannot, the rest wait until the end of the unit.
    std::vector<std::pair<int, const SNode*>> blocks;
    std::vector<const SNode*> subBlocks;
    bool deferring = false;
    bool inBlock = false;  // records of block statements come after those of declarations
    int scope = -1;  // index of the subprogram whose declarations are being read

    template <class T> T* at(const SNode& n, T* node) {
        if (node) result.positions_.record(node, n.offset, inBlock);
        return node;
    }
    std::string_view text(const SNode& n) { return atomText(src, n, scratch); }
    std::string str(const SNode& n) { return std::string(text(n)); }
    std::string quote(const SNode& n) const { return text::quote(src, n); }

    // Shape checks.
    const SNode& item(const SNode& list, std::size_t i, const char* what) {
        if (i >= list.items.size()) error(list, "'" + quote(list) + "' lacks " + what);
        return list.items[i];
    }
    void arity(const SNode& list, std::size_t min, std::size_t max) {
        std::size_t n = list.items.size() - 1;
        if (n < min || n > max) {
            std::string want = min == max ? std::to_string(min) : std::to_string(min) + " to " + std::to_string(max);
            if (max == ANY) want = "at least " + std::to_string(min);
            error(list, "'" + quote(list) + "' takes " + want + " operands, not " + std::to_string(n));
        }
    }
    bool isSymbol(const SNode& n, std::string_view s) const {
        return n.kind == SNode::SYMBOL && src.substr(n.offset, n.length) == s;
    }
    // The head symbol of a list, or empty.
    std::string_view head(const SNode& n) const {
        if (n.kind != SNode::LIST || n.items.empty() || n.items[0].kind != SNode::SYMBOL) return {};
        return src.substr(n.items[0].offset, n.items[0].length);
    }
    Ref ref(const SNode& n) const {
        return n.kind == SNode::SYMBOL ? parseRef(src.substr(n.offset, n.length)) : Ref{};
    }

    template <class E> E enumerator(const SNode& n, bool (*lookup)(std::string_view, E&), int limit,
                                    const char* what) {
        E v{};
        if (n.kind == SNode::INTEGER && !n.negative && n.magnitude <= static_cast<unsigned>(limit))
            return static_cast<E>(n.magnitude);
        if (n.kind == SNode::SYMBOL && lookup(src.substr(n.offset, n.length), v)) return v;
        error(n, std::string("unknown ") + what + " '" + quote(n) + "'");
    }
    DataType dataType(const SNode& n) { return enumerator(n, lookupDataType, 15, "type"); }

    unsigned int unsignedValue(const SNode& n, const char* what) {
        if (n.kind != SNode::INTEGER || n.negative || n.magnitude > std::numeric_limits<unsigned int>::max())
            error(n, std::string("expected ") + what + ", found '" + quote(n) + "'");
        return static_cast<unsigned int>(n.magnitude);
    }

    const char* arenaText(std::string_view s) {
        char* p = static_cast<char*>(MemMgr::allocate(static_cast<unsigned int>(s.size() + 1)));
        std::memcpy(p, s.data(), s.size());
        p[s.size()] = '\0';
        return p;
    }

    SubScope& scopeOf(const SNode& n, const Ref& r, int current) {
        int s = r.sub >= 0 ? r.sub : current;
        if (s < 0) error(n, "'" + str(n) + "' names a subprogram's own item outside any subprogram");
        if (static_cast<std::size_t>(s) >= subs.size()) error(n, "'" + str(n) + "': no such subprogram");
        return subs[static_cast<std::size_t>(s)];
    }

    template <class T> T* find(const SNode& n, const std::vector<T*>& v, unsigned int id, const char* what) {
        T* x = get(v, id);
        if (!x) error(n, std::string(what) + " '" + str(n) + "' is not declared");
        return x;
    }

    LABEL* labelRef(const SNode& n, int ctx) {
        Ref r = ref(n);
        if (!r.valid || r.letter != 'L') error(n, "expected a label, found '" + quote(n) + "'");
        return find(n, scopeOf(n, r, ctx).labels, r.id, "label");
    }
    LABEL* labelOrNil(const SNode& n, int ctx) { return isSymbol(n, "nil") ? nullptr : labelRef(n, ctx); }

    // Declaring an id: it must be the next the library hands out, or later
    // (the ids in between are used up, as a client calling create*Id would).
    void declareId(const SNode& n, unsigned int id, unsigned int next, const char* what) {
        if (id < next) error(n, std::string(what) + " id '" + str(n) + "' is used twice or out of order");
        if (id - next > MAX_ID_SKIP)
            error(n, std::string(what) + " id '" + str(n) + "' skips more than " + std::to_string(MAX_ID_SKIP) + " ids");
    }

    void ensureUnit();
    void runBlocks(const std::vector<std::pair<int, const SNode*>>& todo);
    void block(int ctx, const SNode& n);
    bool mentionsLater(const SNode& block);
    ExprBase* expr(const SNode& n, int ctx);
    ExprBase* refExpr(const SNode& n, int ctx);
    ExprBase* makeExpr(const SNode& n, int ctx);
    StmtBase* stmt(const SNode& n, int ctx) { return at(n, makeStmt(n, ctx)); }
    StmtBase* makeStmt(const SNode& n, int ctx);
    CONST* constant(const SNode& n);
    NAME* nameDef(const SNode& form, std::size_t at, int ctx, bool local);
    void buildUnitItem(const SNode& n);
    void subprog(const SNode& n);
    void subItem(const SNode& n, SubScope& s);
};

}  // namespace ZOA::text::detail

#endif
