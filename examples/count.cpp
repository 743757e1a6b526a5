// Builds the subprogram
//     static int count(int n) { int i = 0; while (i < n) i = i + 1; return i; }
// through the public API and prints it in every form libZOA writes.
#include <zoa/zoa.h>

#include <cstring>
#include <iostream>

using namespace ZOA;

// Labels: 0 start, 1 return, 2 loop test, 3 loop body.
static void buildCount(ZOA_file& unit) {
    SUBPROG* count = unit.createSubprog(INT_S, "count", false);
    count->makeStatic();
    TEMP* n = count->getArgTemp(INT_S);
    TEMP* i = count->getTemp(INT_S, 0, IN_USE_TEMP);
    LABEL* test = count->createNewLabel(REGULAR_LABEL);
    LABEL* body = count->createNewLabel(REGULAR_LABEL);

    count->getStartLabel()->addStmt(new MOVE(i, new CONST(0)));
    count->getStartLabel()->addStmt(new JUMP(test));
    test->addStmt(new CJUMP(LT, i, n, body, count->getReturnLabel()));
    body->addStmt(new MOVE(i, new BINOP(INT_S, PLUS, i, new CONST(1))));
    body->addStmt(new JUMP(test));
    count->getReturnLabel()->addStmt(new MOVE(count->getReturnTemp(), i));
}

int main(int argc, char** argv) {
    const char* what = argc > 1 ? argv[1] : "all";
    bool all = std::strcmp(what, "all") == 0;
    if (all || std::strcmp(what, "ascii") == 0) {
        ZOA_file unit(true, false);
        buildCount(unit);
        if (all) std::cout << "== ASCII dump\n";
        unit.dumpAscii(std::cout);
    }
    if (all || std::strcmp(what, "asm") == 0) {
        ZOA_file unit(true, true);
        buildCount(unit);
        if (all) std::cout << "== assembly\n";
        unit.decompile(std::cout);
    }
    return 0;
}
