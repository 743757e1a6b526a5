// A separate program that reads, verifies and writes the text form through an installed libZOA.
#include <zoa/text.h>
#include <zoa/verify.h>

#include <iostream>

int main() {
    ZOA::text::Result r = ZOA::text::parse(
        "(unit gcc (subprog s0 \"seven\" INT_S (block L0 (MOVE t0 (CONST INT_S 7)) (JUMP L1))))", "seven.zoa");
    if (!r.ok()) {
        std::cerr << ZOA::text::format(r.diagnostics().front()) << '\n';
        return 1;
    }
    if (!ZOA::verify::verify(*r.unit()).empty()) {
        std::cerr << "the verifier found something in a sound unit\n";
        return 1;
    }
    if (ZOA::text::write(*r.unit()).find("\"seven\"") == std::string::npos) {
        std::cerr << "the written text lost the subprogram\n";
        return 1;
    }
    return 0;
}
