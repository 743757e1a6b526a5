// Workload W(F,B,S), built through the public API.
#include "workload.h"

#include <malloc.h>

#include <string>
#include <vector>

namespace ZOA::bench {

void buildWorkload(ZOA_file& unit, const Shape& shape) {
    std::vector<LABEL*> labels(static_cast<std::size_t>(shape.labels));
    for (int f = 0; f < shape.subprogs; ++f) {
        std::string name = "f" + std::to_string(f);
        SUBPROG* sp = unit.createSubprog(INT_S, name.c_str(), false);
        TEMP* a = sp->getArgTemp(INT_S);
        TEMP* b = sp->getArgTemp(INT_S);
        TEMP* pool[8];
        for (TEMP*& t : pool) t = sp->getTemp(INT_S, 0, IN_USE_TEMP);
        for (LABEL*& l : labels) l = sp->createNewLabel(REGULAR_LABEL);
        LABEL* ret = sp->getReturnLabel();
        sp->getStartLabel()->addStmt(new JUMP(labels.empty() ? ret : labels.front()));
        int rotate = 0;
        for (int l = 0; l < shape.labels; ++l) {
            ExprBase* u = a;
            TEMP* v = a;
            for (int s = 0; s < shape.statements; ++s) {
                v = pool[rotate++ & 7];
                labels[l]->addStmt(new MOVE(v, new BINOP(INT_S, MUL, new BINOP(INT_S, PLUS, u, a), new CONST(3))));
                u = v;
            }
            if (l + 1 < shape.labels) labels[l]->addStmt(new CJUMP(LT, v, b, labels[l + 1], ret));
            else labels[l]->addStmt(new JUMP(ret));
        }
        ret->addStmt(new MOVE(sp->getReturnTemp(), a));
    }
}

void keepHeapMapped() {
    mallopt(M_MMAP_THRESHOLD, 32 << 20);  // the largest glibc accepts
    mallopt(M_TRIM_THRESHOLD, 1 << 30);
}

}  // namespace ZOA::bench
