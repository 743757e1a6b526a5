// zoa: reads a unit in the text form, verifies it and writes one of its outputs.
#include <zoa/interp.h>
#include <zoa/text.h>
#include <zoa/verify.h>
#include <zoa/zoa.h>

#include <cctype>
#include <cstdlib>
#include <cstring>
#include <vector>
#include <fstream>
#include <iostream>
#include <iterator>
#include <sstream>
#include <string>

namespace {

const char* const usage =
    "usage: zoa [--emit=c|c-msvc|asm|dot|ascii|text] [-o FILE] [--no-verify] FILE|-\n"
    "       zoa --run=FUNC [ARG...] FILE|-\n"
    "Reads a unit in the text form (FILE, or standard input for -), verifies it\n"
    "and writes the chosen output (default: what the unit's flavour gives).\n"
    "  --emit=c       C, GCC flavour        --emit=c-msvc  C, MSVC flavour\n"
    "  --emit=asm     32-bit x86 assembly   --emit=dot     Graphviz digraphs\n"
    "  --emit=ascii   indented tree dump    --emit=text    the text form again\n"
    "  -o FILE        write to FILE instead of standard output\n"
    "  --no-verify    skip the verifier\n"
    "  --run=FUNC     interpret subprogram FUNC on the integer or real ARGs and\n"
    "                 print its result (what the compiled C would return)\n"
    "Exit status: 0 success, 1 bad input, 2 bad usage.\n";

const char* const emits[] = {"", "c", "c-msvc", "asm", "dot", "ascii", "text"};

// Runs one subprogram through the interpreter and prints its value.
int runSubprog(ZOA::ZOA_file& unit, const std::string& func, const std::vector<std::string>& args) {
    std::vector<ZOA::interp::Value> values;
    for (const std::string& a : args) {
        char* end = nullptr;
        long long i = std::strtoll(a.c_str(), &end, 0);
        if (end && *end == '\0' && !a.empty()) {
            values.push_back(ZOA::interp::Value::integer(ZOA::INT64_S, i));
            continue;
        }
        double d = std::strtod(a.c_str(), &end);
        if (a.empty() || !end || *end) {
            std::cerr << "zoa: argument '" << a << "' is no number\n";
            return 2;
        }
        values.push_back(ZOA::interp::Value::floating(ZOA::DOUBLE, d));
    }
    ZOA::interp::Options options;
    options.out = &std::cout;
    ZOA::interp::Result r = ZOA::interp::run(unit, func, values, options);
    if (!r.ok()) {
        std::cout.flush();
        std::cerr << "zoa: " << func << ": " << ZOA::interp::toString(r.status) << ": " << r.message << '\n';
        return 1;
    }
    std::cout << ZOA::interp::format(r.value) << '\n';
    return 0;
}

int badUsage(const std::string& why) {
    std::cerr << "zoa: " << why << '\n' << usage;
    return 2;
}

}  // namespace

int main(int argc, char** argv) {
    std::string emit, output, input, runFunc;
    std::vector<std::string> runArgs;
    bool verifyIt = true, haveInput = false;
    for (int i = 1; i < argc; ++i) {
        std::string a = argv[i];
        if (a == "--help" || a == "-h") {
            std::cout << usage;
            return 0;
        }
        if (a == "--version") {
            std::cout << "zoa 0.1.0\n";
            return 0;
        }
        if (a.rfind("--emit=", 0) == 0) {
            emit = a.substr(7);
            bool known = false;
            for (const char* e : emits) known = known || (*e && emit == e);
            if (!known) return badUsage("unknown output '" + emit + "'");
        } else if (a == "-o") {
            if (++i >= argc) return badUsage("-o needs a file name");
            output = argv[i];
        } else if (a == "--no-verify") {
            verifyIt = false;
        } else if (a.rfind("--run=", 0) == 0 && a.size() > 6) {
            runFunc = a.substr(6);
        } else if (a != "-" && a[0] == '-' && (runFunc.empty() || !(std::isdigit(static_cast<unsigned char>(a[1])) || a[1] == '.'))) {
            return badUsage("unknown option '" + a + "'");
        } else {
            if (haveInput && !runFunc.empty()) runArgs.push_back(input);
            else if (haveInput) return badUsage("more than one input");
            input = a;
            haveInput = true;
        }
    }
    if (!haveInput) return badUsage("no input");

    std::string source;
    std::string fileName = input == "-" ? "<stdin>" : input;
    if (input == "-") {
        source.assign(std::istreambuf_iterator<char>(std::cin), std::istreambuf_iterator<char>());
    } else {
        std::ifstream in(input, std::ios::binary);
        if (!in) {
            std::cerr << fileName << ": error: cannot open the file\n";
            return 1;
        }
        source.assign(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
    }

    ZOA::text::Result r = ZOA::text::parse(source, fileName);
    if (r.ok() && (emit == "c" || emit == "c-msvc" || emit == "asm")) {
        // The flags are fixed at construction: read the text again for the chosen output.
        ZOA::text::Flavour f{emit == "asm" ? r.unit()->IsGcc() : emit == "c", emit == "asm"};
        r = ZOA::text::parse(source, fileName, f);
    }
    for (const auto& d : r.diagnostics()) std::cerr << ZOA::text::format(d) << '\n';
    if (!r.ok()) return 1;
    ZOA::ZOA_file& unit = *r.unit();

    if (verifyIt) {
        bool failed = false;
        for (const auto& d : ZOA::verify::verify(unit)) {
            const ZOA::text::Position* p = r.positionOf(d.node);
            if (!p && d.subprog) p = r.positionOf(d.subprog);
            std::cerr << fileName << ':' << (p ? p->line : 1) << ':' << (p ? p->column : 1) << ": "
                      << ZOA::verify::format(d) << '\n';
            failed = failed || d.severity == ZOA::verify::Severity::ERROR;
        }
        if (failed) return 1;
    }

    if (!runFunc.empty()) return runSubprog(unit, runFunc, runArgs);

    std::ofstream file;
    if (!output.empty()) {
        file.open(output, std::ios::binary);
        if (!file) {
            std::cerr << output << ": error: cannot write the file\n";
            return 1;
        }
    }
    std::ostream& os = output.empty() ? std::cout : file;
    if (emit == "dot")
        unit.dumpDot(os);
    else if (emit == "ascii")
        unit.dumpAscii(os);
    else if (emit == "text")
        ZOA::text::write(os, unit);
    else
        unit.decompile(os);
    os.flush();
    return os ? 0 : 1;
}
