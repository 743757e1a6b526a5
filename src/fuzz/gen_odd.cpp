// The generator's odd mode: constructible but odd trees that every output must cope with.
#include "fuzz/gen_odd.h"

namespace ZOA::fuzz {

// Shared subtrees, empty labels, statements after jumps, null SEQ sides,
// unused temporaries and deep nesting; none of it is compared.
void OddBuilder::finish() {
    for (Fn& f : fns) {
        sp = f.sp;
        sp->createNewLabel(REGULAR_LABEL);    // empty
        sp->getTemp(INT_S, 0, IN_USE_TEMP);   // never used
        sp->getTemp(POINTER, 24, IN_USE_TEMP);
        for (auto& [id, l] : sp->getAllLabels()) {
            if (!l->containsStmts() || chance(50)) continue;
            StmtBase* s = made.empty() ? nullptr : pick(made);
            switch (below(5)) {
                case 0: l->addStmt(new SEQ(nullptr, s)); break;
                case 1: l->addStmt(new SEQ(s, nullptr)); break;
                case 2: l->addStmt(new SEQ(nullptr, nullptr)); break;
                case 3:  // a statement after the jump, sharing a subtree
                    if (!exprs.empty()) l->addStmt(new EXP(pick(exprs)));
                    break;
                default: {  // deep nesting
                    ExprBase* e = new CONST(1);
                    for (unsigned k = 0, n = 50 + below(400); k < n; ++k)
                        e = chance(50) ? static_cast<ExprBase*>(new BINOP(INT_S, PLUS, e, new CONST(2)))
                                       : static_cast<ExprBase*>(new UNOP(INT_S, NEG, e));
                    l->addStmt(new EXP(e));
                }
            }
        }
    }
}

}  // namespace ZOA::fuzz
