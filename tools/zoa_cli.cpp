// The zoa tool's command line, read as compiler tools read theirs.
#include "zoa_cli.h"

#include <cctype>
#include <cerrno>
#include <charconv>
#include <climits>
#include <cmath>
#include <cstdlib>
#include <cstring>

namespace zoa_tool {

const char* const VERSION = "zoa 0.1.0\n";

const char* const USAGE =
    "usage: zoa [OPTION...] [FILE]\n"
    "       zoa --run=FUNC [OPTION...] [ARG...] FILE\n"
    "Reads a unit in the text form from FILE (standard input when FILE is - or\n"
    "missing), verifies it and writes the chosen output.\n"
    "  --emit=KIND, --emit KIND   what to write (default: what the unit's flags give)\n"
    "      c      C, GCC flavour          c-msvc  C, MSVC flavour\n"
    "      asm    32-bit x86 assembly     dot     Graphviz digraphs\n"
    "      ascii  indented tree dump      text    the text form again\n"
    "  -o FILE, -oFILE   write to FILE (- is standard output, the default)\n"
    "  --exact           the library's fixed texts, byte for byte; without it the\n"
    "                    outputs are sound: they mean what the tree means, and\n"
    "                    node statistics and notes go to standard error\n"
    "  --no-verify       skip the verifier\n"
    "  -Werror           make verifier warnings errors\n"
    "  --allow-untranslated\n"
    "                    with --exact assembly, write it even where the verifier\n"
    "                    warns that it cannot translate a construct (which is an\n"
    "                    error otherwise: the exact assembly leaves such operands out)\n"
    "  --run=FUNC, --run FUNC\n"
    "                    interpret subprogram FUNC on the ARGs and print its result\n"
    "                    (what the compiled C would return); the last operand is\n"
    "                    the FILE. ARGs are integers (decimal or 0x hexadecimal,\n"
    "                    signed 64-bit, or unsigned up to 18446744073709551615) or reals\n"
    "  --                the options end here\n"
    "  -h, --help        this text\n"
    "  --version         the tool's version\n"
    "Messages go to standard error as FILE:LINE:COL: error: message, with the\n"
    "source line and a caret under the column, in colour on a terminal unless\n"
    "NO_COLOR is set.\n"
    "Exit status: 0 success, 1 bad input or a failed read or write, 2 bad usage.\n";

namespace {

const char* const EMITS[] = {"c", "c-msvc", "asm", "dot", "ascii", "text"};

bool knownEmit(const std::string& e) {
    for (const char* k : EMITS)
        if (e == k) return true;
    return false;
}

// Digits only, in the base: what std::from_chars reads here, and no more.
bool allDigits(const char* p, const char* end, int base) {
    if (p == end) return false;
    for (; p != end; ++p)
        if (base == 16 ? !std::isxdigit(static_cast<unsigned char>(*p)) : !std::isdigit(static_cast<unsigned char>(*p)))
            return false;
    return true;
}

}  // namespace

bool parseRunArgument(const std::string& text, ZOA::interp::Value& value, std::string& why) {
    const char* p = text.c_str();
    const char* end = p + text.size();
    bool negative = p != end && *p == '-';
    if (p != end && (*p == '-' || *p == '+')) ++p;
    int base = 10;
    if (end - p > 2 && p[0] == '0' && (p[1] == 'x' || p[1] == 'X')) {
        base = 16;
        p += 2;
    }
    if (allDigits(p, end, base)) {
        unsigned long long magnitude = 0;
        std::from_chars_result r = std::from_chars(p, end, magnitude, base);
        const unsigned long long mostNegative = static_cast<unsigned long long>(LLONG_MAX) + 1;
        if (r.ec == std::errc::result_out_of_range || (negative && magnitude > mostNegative)) {
            why = "is out of range";
            return false;
        }
        if (negative)  // -2^63 has no positive counterpart: negate in unsigned arithmetic
            value = ZOA::interp::Value::integer(ZOA::INT64_S, static_cast<long long>(0 - magnitude));
        else if (magnitude <= static_cast<unsigned long long>(LLONG_MAX))
            value = ZOA::interp::Value::integer(ZOA::INT64_S, static_cast<long long>(magnitude));
        else
            value = ZOA::interp::Value::integer(ZOA::INT64_U, static_cast<long long>(magnitude));
        return true;
    }
    // A real, as strtod reads it, filling the whole argument.
    char* stop = nullptr;
    errno = 0;
    double d = text.empty() || std::isspace(static_cast<unsigned char>(text[0])) ? 0 : std::strtod(text.c_str(), &stop);
    if (!stop || *stop != '\0') {
        why = "is no number";
        return false;
    }
    if (errno == ERANGE && std::isinf(d)) {  // underflow to a tiny value is fine
        why = "is out of range";
        return false;
    }
    value = ZOA::interp::Value::floating(ZOA::DOUBLE, d);
    return true;
}

bool parseCommandLine(int argc, char** argv, Options& options, std::string& why) {
    // With --run, operands that look like negative numbers are arguments, not options.
    bool runMode = false;
    for (int i = 1; i < argc && std::strcmp(argv[i], "--") != 0; ++i)
        runMode = runMode || std::strncmp(argv[i], "--run", 5) == 0;

    std::vector<std::string> operands;
    bool optionsEnded = false;
    for (int i = 1; i < argc; ++i) {
        std::string a = argv[i];
        ZOA::interp::Value ignored;
        std::string notNumber;
        bool numeric = a.size() > 1 && (std::isdigit(static_cast<unsigned char>(a[1])) || a[1] == '.');
        if (optionsEnded || a == "-" || a.empty() || a[0] != '-' ||
            (runMode && (numeric || parseRunArgument(a, ignored, notNumber)))) {
            operands.push_back(a);
            continue;
        }
        // An option's value: after '=' or in the next argument.
        auto valueOf = [&](const std::string& name, std::string& into) {
            if (a.size() > name.size() && a[name.size()] == '=') {
                into = a.substr(name.size() + 1);
                return true;
            }
            if (a != name) return false;
            if (++i >= argc) {
                why = name + " needs a value";
                return false;
            }
            into = argv[i];
            return true;
        };
        if (a == "--") {
            optionsEnded = true;
        } else if (a == "-h" || a == "--help") {
            options.help = true;
        } else if (a == "--version") {
            options.version = true;
        } else if (a == "--no-verify") {
            options.verify = false;
        } else if (a == "--exact") {
            options.exact = true;
        } else if (a == "-Werror") {
            options.warningsAreErrors = true;
        } else if (a == "--allow-untranslated") {
            options.allowUntranslated = true;
        } else if (a.rfind("-o", 0) == 0) {
            if (a.size() > 2) {
                options.output = a.substr(2);
            } else if (++i < argc) {
                options.output = argv[i];
            } else {
                why = "-o needs a file name";
                return false;
            }
            if (options.output.empty()) {
                why = "-o needs a file name";
                return false;
            }
        } else if (a.rfind("--emit", 0) == 0 && valueOf("--emit", options.emit)) {
            if (!knownEmit(options.emit)) {
                why = "unknown output '" + options.emit + "'";
                return false;
            }
        } else if (a.rfind("--run", 0) == 0 && valueOf("--run", options.runFunc)) {
            if (options.runFunc.empty()) {
                why = "--run needs a subprogram name";
                return false;
            }
        } else {
            if (why.empty()) why = "unknown option '" + a + "'";
            return false;
        }
    }

    if (options.runFunc.empty()) {
        if (operands.size() > 1) {
            why = "more than one input";
            return false;
        }
        if (!operands.empty()) options.input = operands.front();
        return true;
    }
    if (operands.empty()) {
        why = "--run needs the file after its arguments (- for standard input)";
        return false;
    }
    options.input = operands.back();
    operands.pop_back();
    for (const std::string& a : operands) {
        ZOA::interp::Value v;
        std::string reason;
        if (!parseRunArgument(a, v, reason)) {
            why = "argument '" + a + "' " + reason;
            return false;
        }
        options.runArgs.push_back(v);
    }
    return true;
}

}  // namespace zoa_tool
