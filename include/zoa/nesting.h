// NestingGuard: the depth bound that keeps every recursive walk finite on any pointer graph.
#ifndef ZOA_NESTING_H
#define ZOA_NESTING_H

namespace ZOA {

// The deepest the library's walks (AllVisitor, the outputs, the dumps) follow
// a chain of children below their root. Above the text form's MAX_NESTING, so
// every tree it can write is walked whole, and small enough for a recursive
// walk's stack, sanitizers included. A cycle built with the copy assignments
// (`*s = SEQ(s, nullptr)`) reaches it at once. A client's own recursive walk
// can use NestingGuard the same way.
constexpr unsigned int MAX_WALK_DEPTH = 10000;

// What entering one level gives.
enum class Nest {
    ENTERED,   // go on, and call leave() afterwards
    CUT_HERE,  // the bound is reached here: the walk is cut (a place for a marker)
    SKIPPED,   // the walk was cut below this root already: skip the node
};

// Counts the levels of one recursive walk. Once the bound is reached the
// whole walk below the current root is cut: every further enter() is
// SKIPPED until the walk is back at its root. So a graph whose cycles branch
// (`*b = BINOP(t, PLUS, b, b)`) costs MAX_WALK_DEPTH steps, not 2^depth.
class NestingGuard {
public:
    Nest enter() {
        if (cut) return Nest::SKIPPED;
        if (depth == MAX_WALK_DEPTH) {
            cut = true;
            return Nest::CUT_HERE;
        }
        ++depth;
        return Nest::ENTERED;
    }
    void leave() {
        if (--depth == 0) cut = false;
    }
    unsigned int level() const { return depth; }

private:
    unsigned int depth = 0;
    bool cut = false;
};

// Enters a level for the lifetime of the object.
class NestingLevel {
public:
    explicit NestingLevel(NestingGuard& g) : guard(g), nest(g.enter()) {}
    ~NestingLevel() {
        if (nest == Nest::ENTERED) guard.leave();
    }
    NestingLevel(const NestingLevel&) = delete;
    NestingLevel& operator=(const NestingLevel&) = delete;
    bool entered() const { return nest == Nest::ENTERED; }
    bool cutHere() const { return nest == Nest::CUT_HERE; }

private:
    NestingGuard& guard;
    Nest nest;
};

// What the outputs write where a walk was cut, inside their comment syntax.
constexpr const char* CUT_NOTE = "nesting deeper than MAX_WALK_DEPTH (a cycle?): not followed";

}  // namespace ZOA

#endif
