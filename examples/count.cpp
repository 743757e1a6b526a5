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
    struct Form {
        const char* name;
        const char* heading;
        bool asmMode;
        bool (ZOA_file::*write)(std::ostream&);
    };
    static const Form forms[] = {
        {"ascii", "== ASCII dump\n", false, &ZOA_file::dumpAscii},
        {"c", "== C (GCC flavour)\n", false, &ZOA_file::decompile},
        {"asm", "== assembly\n", true, &ZOA_file::decompile},
        {"dot", "== DOT graph (node statistics first)\n", false, &ZOA_file::dumpDot},
    };
    const char* what = argc > 1 ? argv[1] : "all";
    bool all = std::strcmp(what, "all") == 0;
    bool known = all;
    for (const Form& form : forms) {
        if (!all && std::strcmp(what, form.name) != 0) continue;
        known = true;
        ZOA_file unit(true, form.asmMode);  // each form gets a fresh unit: decompile empties it
        buildCount(unit);
        if (all) std::cout << form.heading;
        (unit.*form.write)(std::cout);
    }
    if (!known) {
        std::cerr << "usage: count_example [all|ascii|c|asm|dot]\n";
        return 2;
    }
    return 0;
}
