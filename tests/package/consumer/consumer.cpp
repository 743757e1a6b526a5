// A separate program built against an installed libZOA.
#include <zoa/zoa.h>

#include <iostream>
#include <sstream>

int main() {
    using namespace ZOA;
    ZOA_file unit(true, false);
    SUBPROG* f = unit.createSubprog(INT_S, "answer", false);
    f->getStartLabel()->addStmt(new MOVE(f->getReturnTemp(), new CONST(42)));
    if (f->getReturnTemp()->getId() != 0 || f->getAllLabels().size() != 2) {
        std::cerr << "unexpected subprogram shape\n";
        return 1;
    }
    std::ostringstream os;
    if (!unit.dumpAscii(os) || os.str().rfind("SUBPROG(", 0) != 0) {
        std::cerr << "dumpAscii wrote no subprogram block\n";
        return 1;
    }
    return 0;
}
