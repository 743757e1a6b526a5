// zoa: reads a unit in the text form, verifies it and writes one of its outputs.
#include "zoa_cli.h"
#include "zoa_io.h"
#include "zoa_report.h"

#include <zoa/interp.h>
#include <zoa/text.h>
#include <zoa/verify.h>
#include <zoa/zoa.h>

#include <iostream>
#include <ostream>
#include <string>

using namespace zoa_tool;

namespace {

// The verifier's findings about what the exact assembly cannot translate
// (the assembly then leaves operands out) all begin so.
const std::string UNTRANSLATED = "the assembly output ";

// What an output's text is read for: the flags are fixed when the unit is made.
const ZOA::text::Flavour* flavourFor(const std::string& emit) {
    static const ZOA::text::Flavour gccC{true, false}, msvcC{false, false}, assembly{true, true};
    if (emit == "c") return &gccC;
    if (emit == "c-msvc") return &msvcC;
    if (emit == "asm") return &assembly;  // the assembly is the same for both C flavours
    return nullptr;
}

// Prints the verifier's findings; false when they stop the tool.
bool verified(ZOA::ZOA_file& unit, const ZOA::text::Result& parsed, const std::string& fileName,
              const Options& options, bool writesAssembly, Reporter& reporter) {
    bool stop = false, untranslated = false;
    for (const ZOA::verify::Diagnostic& d : ZOA::verify::verify(unit)) {
        const ZOA::text::Position* p = parsed.positionOf(d.node);
        if (!p && d.subprog) p = parsed.positionOf(d.subprog);
        bool blocks = d.severity == ZOA::verify::Severity::ERROR || options.warningsAreErrors;
        if (!blocks && options.exact && writesAssembly && !options.allowUntranslated &&
            d.message.rfind(UNTRANSLATED, 0) == 0) {
            blocks = untranslated = true;
        }
        ZOA::text::Diagnostic where{fileName, p ? p->line : 1, p ? p->column : 1, ""};
        std::string message = d.message;
        if (blocks && d.severity == ZOA::verify::Severity::WARNING && options.warningsAreErrors) message += " [-Werror]";
        reporter.report(where, blocks ? Severity::ERROR : Severity::WARNING, message, p != nullptr);
        stop = stop || blocks;
    }
    if (untranslated)
        reporter.fileError(fileName, "the exact assembly would leave these out; --allow-untranslated writes it anyway");
    return !stop;
}

int run(ZOA::ZOA_file& unit, const Options& options, std::ostream& out) {
    ZOA::interp::Options interpOptions;
    interpOptions.out = &out;
    ZOA::interp::Result r = ZOA::interp::run(unit, options.runFunc, options.runArgs, interpOptions);
    if (!r.ok()) {
        out.flush();
        std::cerr << "zoa: " << options.runFunc << ": " << ZOA::interp::toString(r.status) << ": " << r.message
                  << '\n';
        return 1;
    }
    out << ZOA::interp::format(r.value) << '\n';
    return 0;
}

// False when the library refused to write (it said why on the diagnostic stream).
bool emit(ZOA::ZOA_file& unit, const std::string& kind, std::ostream& out) {
    if (kind == "dot") return unit.dumpDot(out);
    if (kind == "ascii") return unit.dumpAscii(out);
    if (kind == "text") {
        ZOA::text::write(out, unit);
        return true;
    }
    return unit.decompile(out);
}

}  // namespace

int main(int argc, char** argv) {
    Options options;
    std::string why;
    if (!parseCommandLine(argc, argv, options, why)) {
        std::cerr << "zoa: " << why << '\n' << USAGE;
        return 2;
    }
    if (options.help) {
        std::cout << USAGE;
        return 0;
    }
    if (options.version) {
        std::cout << VERSION;
        return 0;
    }

    const bool colour = colourWanted();
    std::string source;
    const std::string fileName = options.input == "-" ? "<stdin>" : options.input;
    if (!readWhole(options.input, source, why)) {
        Reporter(std::cerr, {}, colour).fileError(fileName, why);
        return 1;
    }
    Reporter reporter(std::cerr, source, colour);

    const ZOA::text::Flavour* flavour = options.runFunc.empty() ? flavourFor(options.emit) : nullptr;
    ZOA::text::Result parsed =
        flavour ? ZOA::text::parse(source, fileName, *flavour) : ZOA::text::parse(source, fileName);
    for (const ZOA::text::Diagnostic& d : parsed.diagnostics()) reporter.report(d, Severity::ERROR, d.message);
    if (!parsed.ok()) return 1;
    ZOA::ZOA_file& unit = *parsed.unit();
    unit.setProfile(options.exact ? ZOA::Profile::EXACT : ZOA::Profile::SOUND);

    bool writesAssembly = options.runFunc.empty() && unit.IsAsmMode() && (options.emit.empty() || options.emit == "asm");
    if (options.verify && !verified(unit, parsed, fileName, options, writesAssembly, reporter)) return 1;

    FileOutput file;
    const std::string outName = options.output == "-" ? "<stdout>" : options.output;
    if (!file.open(options.output, why)) {
        reporter.fileError(outName, why);
        return 1;
    }
    std::ostream out(&file);
    // The exact notes and statistics go to standard output; keep them in order with the output there.
    if (options.exact && options.output == "-") unit.setDiagnosticStream(&out);
    int status = 0;
    if (!options.runFunc.empty()) status = run(unit, options, out);
    else if (!emit(unit, options.emit, out)) status = 1;
    if (!file.finish(why)) {
        reporter.fileError(outName, why);
        return 1;
    }
    return status;
}
