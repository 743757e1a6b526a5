// The generator's scaffolding: subprograms, data, statements and control flow shared by every mode.
#ifndef ZOA_FUZZ_BUILDER_H
#define ZOA_FUZZ_BUILDER_H

#include "fuzz/gen.h"

#include "core/op_facts.h"
#include "core/type_facts.h"

#include <cstdint>
#include <list>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace ZOA::fuzz {

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

// Builds one unit. The statement and data scaffolding is shared; each mode
// answers the questions below (which types, which expressions, which
// constructs it may use). The random draws happen in a fixed order, so a seed
// always gives the same unit.
class Builder {
public:
    Builder(std::uint64_t seed, const std::string& prefix, unsigned asmQuirks, Target target)
        : rng(seed * 0x9E3779B97F4A7C15ull + 12345), prefix(prefix), quirks(asmQuirks), target(target) {}
    virtual ~Builder() = default;

    Generated build();

protected:
    // ---- what each mode decides
    virtual DataType anyType(bool allowReal) = 0;
    virtual ExprBase* exprInner(DataType t, unsigned depth) = 0;
    virtual bool voidResults() const { return true; }
    virtual DataType tableElement() { return anyType(false); }
    virtual bool makesStrings() const { return true; }
    // A static data name as a leaf of type t (drawn when asked).
    virtual bool staticDataLeaf(DataType) { return false; }
    // Whether an index is a loop counter or constant rather than an expression.
    virtual bool indexFromCounters() { return chance(25); }
    virtual bool refusesAddress(unsigned) const { return false; }
    virtual bool tableUsable(const Table& tb, DataType t, bool forStore) const {
        return !forStore && tb.elem == t && sizeOfType(t) == 1;
    }
    virtual bool stringAddresses() const { return false; }
    // Scale an index by doubling in statements of its own instead of a MUL.
    virtual bool scalesByDoubling(unsigned) const { return false; }
    virtual StmtBase* wrapped(StmtBase* s) { return s; }
    virtual void added(StmtBase*) {}
    virtual void newLabel() {}
    virtual bool assignsFromMemory() { return false; }
    virtual void storeInto(DataType t, ExprBase* address) { add(new MOVE(new MEM(t, address), expr(t, exprDepth()))); }
    virtual ExprBase* callArgument(DataType p) { return expr(p, 2); }
    virtual bool callsThroughPointer() { return false; }
    virtual DataType relationType(DataType u) { return u; }
    virtual ExprBase* relationOperand(DataType u) { return expr(u, 2); }
    virtual bool computedJumps() const { return false; }
    virtual bool hostCalls() const { return false; }
    virtual bool allocatesRegions() { return false; }
    virtual bool fillsThroughTemp() const { return false; }
    virtual bool tablesThroughPointer() const { return false; }
    virtual bool tablePointersWritable() const { return false; }
    virtual bool localTable() { return false; }
    // After every subprogram has its body.
    virtual void finish() {}
    virtual CONST* floatingConstant(DataType t);
    // The offset of element idx of a table name: in bytes where names step by bytes.
    virtual ExprBase* tableOffset(ExprBase* idx, unsigned elemSize);
    virtual NAME* makeTable(const std::list<ExprBase*>& values) { return unit->getName(values); }
    // What a call through a pointer loads the function's address from.
    virtual ExprBase* functionAddress(const Fn& f) { return unit->getName(SUBPROG_REF, f.name.c_str()); }

    // ---- draws
    unsigned below(unsigned n) { return n ? static_cast<unsigned>(rng() % n) : 0; }
    bool chance(unsigned pct) { return below(100) < pct; }
    template <class T, std::size_t N> T pick(const T (&a)[N]) { return a[below(N)]; }
    template <class T> T pick(const std::vector<T>& v) { return v[below(static_cast<unsigned>(v.size()))]; }
    long long interesting();
    static long long fitTo(DataType t, long long v);
    long long argValue(DataType t);
    CONST* constant(DataType t);
    static CONST* intConst(DataType t, long long v) { return new CONST(t, v); }

    // ---- expressions
    TEMP* varOf(DataType t, bool exact);
    ExprBase* leaf(DataType t);
    ExprBase* index(unsigned count);
    // An index into a name's elements of `size` bytes, as the target steps through names.
    ExprBase* address(DataType t, bool forStore);
    ExprBase* scaled(ExprBase* idx, unsigned size);
    ExprBase* expr(DataType t, unsigned depth);
    unsigned exprDepth() { return 1 + below(3); }

    // ---- statements
    void add(StmtBase* s);
    void afterStore() { newLabel(); }
    void jumpTo(LABEL* l) { add(new JUMP(l)); }
    void assign();
    void store();
    void callOne();
    virtual void hostCall();
    void ifElse(unsigned budget, unsigned nest);
    void loop(unsigned budget, unsigned nest);
    void computedJump(unsigned budget, unsigned nest);
    void statements(unsigned budget, unsigned nest);
    void region(unsigned size);
    void body(unsigned i);
    void makeFileData();

    std::mt19937_64 rng;
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
    std::vector<TEMP*> vars;      // set at the start, assignable
    std::vector<TEMP*> readable;  // also loop counters while in their loop
    std::vector<Region> regions;
    std::vector<std::pair<TEMP*, int>> counters;  // loop counters and their bound
    std::vector<StmtBase*> made;  // every statement, for the odd mode
    std::vector<ExprBase*> exprs;
};

}  // namespace ZOA::fuzz

#endif
