// Builds workload W once and writes one output, for instruction counts under valgrind.
#include "workload.h"

#include <zoa/text.h>
#include <zoa/verify.h>

#include <cstdlib>
#include <cstring>
#include <iostream>
#include <sstream>

// usage: zoa_workload_once build|c|asm|sound-asm|ascii|dot|text|verify [F B S] [--print]
// (--print writes the output on standard output, e.g. to assemble and time it)
int main(int argc, char** argv) {
    using namespace ZOA;
    const char* mode = argc > 1 ? argv[1] : "build";
    bench::Shape shape{argc > 2 ? std::atoi(argv[2]) : 10, argc > 3 ? std::atoi(argv[3]) : 100,
                       argc > 4 ? std::atoi(argv[4]) : 10};
    bool sound = std::strcmp(mode, "sound-asm") == 0;
    bool print = argc > 5 && std::strcmp(argv[5], "--print") == 0;
    ZOA_file unit(true, sound || std::strcmp(mode, "asm") == 0, sound ? Profile::SOUND : Profile::EXACT);
    bench::buildWorkload(unit, shape);
    std::ostringstream os;
    std::streambuf* saved = std::cout.rdbuf(nullptr);  // statistics go nowhere
    if (!std::strcmp(mode, "c") || !std::strcmp(mode, "asm") || sound) unit.decompile(os);
    else if (!std::strcmp(mode, "ascii")) unit.dumpAscii(os);
    else if (!std::strcmp(mode, "dot")) unit.dumpDot(os);
    else if (!std::strcmp(mode, "text")) text::write(os, unit);
    else if (!std::strcmp(mode, "verify")) os << verify::verify(unit).size();
    std::cout.rdbuf(saved);
    if (print) std::cout << os.str();
    std::cerr << mode << ": " << os.tellp() << " bytes, " << shape.totalStatements() << " statements\n";
    return 0;
}
