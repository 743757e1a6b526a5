// Helpers for the assembly emitter tests: decompiling, a test view of the emitter, assembling.
#ifndef ZOA_TESTS_EMIT_X86_ASM_TEST_UTIL_H
#define ZOA_TESTS_EMIT_X86_ASM_TEST_UTIL_H

#include "emit/x86/decompile_asm.h"
#include "native.h"

#include <zoa/zoa.h>

#include <iostream>
#include <regex>
#include <sstream>
#include <string>

namespace ZOA {

// Only the tests define this friend of the nodes: it builds a DATA_ARRAY_REF
// that carries values, which the public API cannot make.
class TreeRewriter {
public:
    static void addValue(NAME* n, ExprBase* e) { n->exprList.push_back(e); }
};

namespace testing {

// Redirects std::cout into a string while alive.
class CoutCapture {
public:
    CoutCapture() : old(std::cout.rdbuf(buf.rdbuf())) {}
    ~CoutCapture() { std::cout.rdbuf(old); }
    std::string text() const { return buf.str(); }

private:
    std::ostringstream buf;
    std::streambuf* old;
};

// The emitter with its protected state opened up for the tests.
class TestASM : public DecompileASM {
public:
    explicit TestASM(std::ostringstream& os) : DecompileASM(os, true), os(os) {}
    // What was written so far, the gathered lines included.
    std::string text() {
        endEntry();
        return os.str();
    }
    // Forgets what was written so far.
    void clear() {
        endEntry();
        os.str("");
    }
    void setIndent(unsigned int n) { indentLevel = n; }
    void setSubprog(SUBPROG* sp) { curSubprog = sp; }
    ExprBase* holder(unsigned int i) const { return regHolders[i]; }

private:
    std::ostringstream& os;
};

inline std::string decompileAsm(ZOA_file& unit, std::string* console = nullptr) {
    CoutCapture capture;
    std::ostringstream os;
    unit.decompile(os);
    if (console) *console = capture.text();
    return os.str();
}

// The emitter writes size keywords on register operands too (mov DWORD PTR
// eax, ...), which GNU as refuses; drop exactly those before assembling.
inline std::string assemblable(const std::string& text) {
    static const std::regex sized(
        R"((?:BYTE|DWORD) PTR ((?:[abcd][lh]|e(?:ax|bx|cx|dx|si|di|bp|sp))\b))");
    return std::regex_replace(text, sized, "$1");
}

// Assembles one emitted unit with a C driver, runs it and returns its output.
inline std::string runAsm(const std::string& asmText, const std::string& driver) {
    std::string dir = scratchDir();
    std::string s = writeFile(dir, "unit.s", assemblable(asmText));
    std::string c = writeFile(dir, "driver.c", driver);
    CommandResult r = buildAndRun32(dir, {s, c}, "-no-pie -mstackrealign");
    // A 64-bit kernel without 32-bit support refuses to exec (126): emulate.
    if (r.status == 126) r = runCommand("qemu-i386 '" + dir + "/prog'");
    return r.output;
}

}  // namespace testing
}  // namespace ZOA

#endif
