// A separate program that interprets a subprogram through an installed libZOA.
#include <zoa/interp.h>
#include <zoa/zoa.h>

#include <iostream>

int main() {
    using namespace ZOA;
    ZOA_file unit(true, false);
    SUBPROG* twice = unit.createSubprog(INT_S, "twice", false);
    TEMP* x = twice->getArgTemp(INT_S);
    twice->getStartLabel()->addStmt(new MOVE(twice->getReturnTemp(), new BINOP(INT_S, PLUS, x, x)));
    twice->getStartLabel()->addStmt(new JUMP(twice->getReturnLabel()));
    interp::Result r = interp::run(unit, "twice", {interp::Value::integer(INT_S, 21)});
    if (!r.ok() || r.value.asSigned() != 42) {
        std::cerr << "twice(21) gave " << (r.ok() ? interp::format(r.value) : r.message) << '\n';
        return 1;
    }
    return 0;
}
