// Helpers for the sound assembly tests: writing a unit in the sound profile, building it with C, running it.
#ifndef ZOA_TESTS_EMIT_X86_SOUND_UTIL_H
#define ZOA_TESTS_EMIT_X86_SOUND_UTIL_H

#include "native.h"

#include <zoa/zoa.h>

#include <gtest/gtest.h>

#include <iostream>
#include <sstream>
#include <string>
#include <vector>

namespace ZOA::testing {

// The unit's assembly in the sound profile. Fails the test if anything
// reaches the process's standard output meanwhile.
inline std::string soundAsm(ZOA_file& unit) {
    std::ostringstream console;
    std::streambuf* old = std::cout.rdbuf(console.rdbuf());
    unit.setProfile(Profile::SOUND);
    std::ostringstream os;
    unit.decompile(os);
    std::cout.rdbuf(old);
    EXPECT_EQ(console.str(), "");
    return os.str();
}

// The unit's sound C text, for a program that runs it beside the assembly.
inline std::string soundC(ZOA_file& unit) {
    unit.setProfile(Profile::SOUND);
    std::ostringstream os, diag;
    unit.setDiagnosticStream(&diag);
    EXPECT_TRUE(unit.decompile(os)) << diag.str();
    return os.str();
}

// Static subprograms made reachable from a test driver (the assembler takes a
// .globl anywhere in the file).
inline std::string exportingStatics(const ZOA_file& unit) {
    std::string s;
    for (SUBPROG* sp : unit.getSubprogs())
        if (sp && sp->isStatic()) s += std::string("\t.globl\t") + sp->getName().c_str() + "\n";
    return s;
}

// The C type a declared type is written as.
inline std::string cTypeName(DataType t) {
    static const char* const names[] = {"unsigned char", "unsigned int", "unsigned long long", "signed char", "int",
                                        "long long", "float", "double", "char *", "void"};
    return static_cast<unsigned>(t) < 10 ? names[t] : "void";
}

// Prototypes of the unit's subprograms, for a C driver.
inline std::string prototypes(const ZOA_file& unit) {
    std::string s;
    for (SUBPROG* sp : unit.getSubprogs()) {
        if (!sp) continue;
        s += cTypeName(sp->getReturnType()) + " " + sp->getName().c_str() + "(";
        bool first = true;
        for (TEMP* t : sp->getAllArgTemps()) {
            if (!first) s += ", ";
            first = false;
            s += cTypeName(t->getDataType());
        }
        s += first ? "void);\n" : ");\n";
    }
    return s;
}

// Assembles the texts with the C sources, links (gcc's default PIE unless
// flags say otherwise) and runs; the program's output.
inline std::string runWithC(const std::vector<std::string>& asmTexts, const std::vector<std::string>& cTexts,
                            const std::string& flags = "") {
    std::string dir = scratchDir();
    std::vector<std::string> files;
    for (std::size_t i = 0; i < asmTexts.size(); ++i)
        files.push_back(writeFile(dir, "u" + std::to_string(i) + ".s", asmTexts[i]));
    for (std::size_t i = 0; i < cTexts.size(); ++i)
        files.push_back(writeFile(dir, "c" + std::to_string(i) + ".c", cTexts[i]));
    return buildAndRun32(dir, files, flags).output;
}

}  // namespace ZOA::testing

#endif
