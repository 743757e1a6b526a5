// The sound profile's additions to the C mode's grammar.
#include "fuzz/gen_sound.h"

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

void SoundCBuilder::finish() {
    static const unsigned alignments[] = {0, 8, 16, 64};
    for (SUBPROG* s : unit->getSubprogs())
        for (TEMP* t : s->getAllTemps())
            if (t && t->getNodeType() == BUF_TEMP_NODE && chance(40))
                static_cast<BUF_TEMP*>(t)->setAlignment(pick(alignments));
    CBuilder::finish();
}

}  // namespace ZOA::fuzz
