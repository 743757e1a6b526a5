// The sound profile's additions to the C mode's grammar.
#include "fuzz/gen_sound.h"

#include <algorithm>
#include <limits>

namespace ZOA::fuzz {

CONST* SoundCBuilder::floatingConstant(DataType t) {
    static const double inexact[] = {0.1, 1.2345678, -2.718281828459045, 1e-7, 3.4028234663852886e38, 123456.789};
    switch (below(10)) {
        case 0: return new CONST(t, pick(inexact));
        case 1: return new CONST(t, chance(50) ? std::numeric_limits<double>::infinity()
                                               : -std::numeric_limits<double>::infinity());
        default: return CBuilder::floatingConstant(t);
    }
}

// Names count bytes here: the index is scaled by the element size.
ExprBase* SoundCBuilder::tableOffset(ExprBase* idx, unsigned elemSize) {
    if (elemSize == 1) return idx;
    DataType t = idx->getDataType() == INT_U ? INT_U : INT_S;
    return new BINOP(t, MUL, idx, intConst(t, elemSize));
}

NAME* SoundCBuilder::makeTable(const std::list<ExprBase*>& values) {
    if (chance(50)) return CBuilder::makeTable(values);
    NAME* n = unit->createData(values);
    static const unsigned alignments[] = {0, 4, 8, 16, 32};
    n->setAlignment(pick(alignments));
    return n;
}

// Half the time through a private table holding the function's address.
ExprBase* SoundCBuilder::functionAddress(const Fn& f) {
    ExprBase* fn = CBuilder::functionAddress(f);
    if (chance(50)) return fn;
    return new MEM(POINTER, unit->createData(std::list<ExprBase*>{fn}));
}

// The variadic host function with 1 to 4 further arguments, the first a call
// of it with none: calls of one name that disagree on their arity. Every unit
// then declares it alike, int zoa_vsum(int, ...), as the driver defines it,
// so units can share one file.
void SoundCBuilder::hostCall() {
    if (chance(50)) return CBuilder::hostCall();
    static const DataType promoted[] = {INT_S, INT_S, CHAR_S, CHAR_U};
    unsigned n = 1 + below(4);
    std::vector<ExprBase*> args{intConst(INT_S, n), new CALL(INT_S, VARIADIC_HOST, std::vector<ExprBase*>{intConst(INT_S, 0)})};
    for (unsigned i = 1; i < n; ++i) {
        DataType t = pick(promoted);
        ExprBase* a = expr(t, 2);
        args.push_back(a->getDataType() == t ? a : constant(t));  // read back as an int
    }
    CALL* c = new CALL(INT_S, VARIADIC_HOST, args);
    unit->addFunctionPrototype(c);
    TEMP* v = varOf(INT_S, true);
    if (v && std::count(vars.begin(), vars.end(), v)) add(new MOVE(v, c));
    else add(new EXP(c));
}

void SoundCBuilder::finish() {
    static const unsigned alignments[] = {0, 8, 16, 64};
    for (SUBPROG* s : unit->getSubprogs())
        for (TEMP* t : s->getAllTemps())
            if (t && t->getNodeType() == BUF_TEMP_NODE && chance(40))
                static_cast<BUF_TEMP*>(t)->setAlignment(pick(alignments));
    CBuilder::finish();
}

}  // namespace ZOA::fuzz
