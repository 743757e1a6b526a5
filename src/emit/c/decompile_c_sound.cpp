// DecompileC, sound profile: constants, external calls, the refusal of unwritable names and the unit layout.
#include "emit/c/decompile_c.h"

#include "core/identifiers.h"
#include "emit/c/c_rules.h"
#include "emit/c/c_texts.h"
#include "emit/c/gcc_builtins.h"
#include "emit/call_signatures.h"

#include <zoa/expr.h>
#include <zoa/zoa_file.h>

#include <climits>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <map>
#include <ostream>
#include <string_view>

namespace ZOA {

namespace {

std::string_view view(const String& s) { return std::string_view(s.data(), s.size()); }

// The C-side prefix of a function named like a GCC built-in.
constexpr std::string_view BUILTIN_SPELLING = "zoa_builtin_";

// Texts the C output itself defines: a name spelled like one would clash.
bool isGeneratedName(std::string_view s) {
    if (s == "int64" || s == "uint64" || s == "ZOA_INT64_TYPES") return true;
    if (s.substr(0, BUILTIN_SPELLING.size()) == BUILTIN_SPELLING) return true;
    for (std::string_view prefix : {"t", "LAB", "ng", "nl"}) {
        if (s.size() <= prefix.size() || s.substr(0, prefix.size()) != prefix) continue;
        bool digits = true;
        for (char c : s.substr(prefix.size())) digits = digits && c >= '0' && c <= '9';
        if (digits) return true;
    }
    return false;
}

// Finds the names of a unit that cannot reach the C text as they stand.
class NameCheck {
public:
    NameCheck(std::ostream& diag) : diag(diag) {}

    void function(std::string_view s, bool defined) {
        if (!valid(s, "function")) return;
        std::string key(s);
        if (defined && !definedFunctions.emplace(key, true).second) refuse(s, "is defined by two subprograms");
        if (dataKinds.count(key)) refuse(s, "names both a function and data");
        functions.emplace(key, true);
    }
    void data(std::string_view s, NameKind k) {
        if (!valid(s, "data name")) return;
        std::string key(s);
        auto it = dataKinds.emplace(key, k).first;
        if (it->second != k) refuse(s, "names data of two kinds");
        if (functions.count(key)) refuse(s, "names both a function and data");
    }
    void names(const NameList& l) {
        for (NAME* n : l) name(n);
    }
    void names(const std::list<NAME*>& l) {
        for (NAME* n : l) name(n);
    }
    bool ok() const { return !failed; }
    void fail(const char* why) {
        diag << "error: sound C: " << why << "\n";
        failed = true;
    }

private:
    void name(NAME* n) {
        if (!n) return;
        switch (n->getKind()) {
        case SUBPROG_REF: function(view(n->getStringValue()), false); return;
        case EXTERN_DATA_REF: data(view(n->getStringValue()), EXTERN_DATA_REF); return;
        case STATIC_DATA_REF:
            if (!n->getStringValue().empty()) data(view(n->getStringValue()), STATIC_DATA_REF);
            return;
        case LABEL_REF:
        case CONST_ARRAY_REF:
        case DATA_ARRAY_REF:
        case STRINGLIT_REF: return;
        }
    }
    bool valid(std::string_view s, const char* what) {
        if (s.empty()) {
            refuse(s, (std::string("is an empty ") + what).c_str());
            return false;
        }
        if (!isPlainIdentifier(s.data(), s.size())) return refuse(s, "is not a C identifier");
        if (isCKeyword(s.data(), s.size())) return refuse(s, "is a C keyword");
        if (isGeneratedName(s)) return refuse(s, "clashes with a name the C output makes");
        return true;
    }
    bool refuse(std::string_view s, const char* why) {
        diag << "error: sound C: '";
        for (char c : s) diag << (c >= 0x20 && c < 0x7f ? c : '?');
        diag << "' " << why << "\n";
        failed = true;
        return false;
    }

    std::ostream& diag;
    bool failed = false;
    std::map<std::string, bool> functions, definedFunctions;
    std::map<std::string, NameKind> dataKinds;
};

// Finite values in decimal with enough digits to read back to the same bits
// (9 for float, 17 for double), always looking like a floating constant.
int formatFinite(char* buf, std::size_t size, double v, bool isFloat) {
    int n = std::snprintf(buf, size, isFloat ? "%.9g" : "%.17g", v);
    if (!std::strpbrk(buf, ".e")) n += std::snprintf(buf + n, size - static_cast<std::size_t>(n), ".0");
    if (isFloat) n += std::snprintf(buf + n, size - static_cast<std::size_t>(n), "f");
    return n;
}

}  // namespace

void DecompileC::writeSoundFloating(double v, bool isFloat) {
    if (std::isfinite(v)) {
        char buf[48];
        int n = formatFinite(buf, sizeof buf, v, isFloat);
        sink.write(buf, static_cast<std::size_t>(n));
        return;
    }
    bool negative = std::signbit(v);
    if (negative) sink << "(-";
    if (isGcc) {
        if (std::isinf(v)) sink << (isFloat ? "__builtin_inff()" : "__builtin_inf()");
        else sink << (isFloat ? "__builtin_nanf(\"\")" : "__builtin_nan(\"\")");
    } else {
        // cl has no builtins: constant expressions that overflow, as its own
        // math.h spells INFINITY and NAN.
        if (isFloat) sink << "((float)";
        sink << (std::isinf(v) ? "(1e+300 * 1e+300)" : "((1e+300 * 1e+300) * 0.0)");
        if (isFloat) sink << ')';
    }
    if (negative) sink << ')';
}

void DecompileC::writeCast(DataType to) {
    std::string_view name = ctext::typeName(to);
    if (!name.empty() && name.back() == ' ') name.remove_suffix(1);
    sink << '(' << name << ')';
}

void DecompileC::writeSoundCast(DataType to, ExprBase* e) {
    if (!e || to == VOID) return;
    NodeType k = e->getNodeType();
    // These have exactly their DataType as their C type.
    if ((k == TEMP_NODE || k == CONST_NODE || k == MEM_NODE) && e->getDataType() == to) return;
    if (to == POINTER && ctext::isArrayName(e)) return;  // written as a char pointer
    // For scalars a cast converts as assignment does, and also between
    // pointers and integers, which assignment refuses.
    writeCast(to);
}

bool DecompileC::writeSoundConst(CONST* c) {
    long long v = c->getIValue();
    std::uint32_t low = static_cast<std::uint32_t>(v);
    switch (c->getDataType()) {
    case INT64_U:
        writeUnsigned(static_cast<unsigned long long>(v));
        sink << "ULL";
        return true;
    case INT_S:
        // -2147483648 would be a negated long long constant.
        if (low == 0x80000000u) sink << "(-2147483647 - 1)";
        else writeInt(static_cast<std::int32_t>(low));
        return true;
    case INT64_S:
        if (v == LLONG_MIN) {
            sink << "(-9223372036854775807LL - 1)";
            return true;
        }
        writeInt(v);
        sink << "LL";
        return true;
    case FLOAT: writeSoundFloating(static_cast<double>(ctext::narrowToFloat(c->getFValue())), true); return true;
    case DOUBLE: writeSoundFloating(c->getFValue(), false); return true;
    case CHAR_U:
    case INT_U:
    case CHAR_S:
    case POINTER:
    case VOID: break;
    }
    return false;  // the exact text means the value
}

bool DecompileC::discardNeedsNot(ExprBase* x) const {
    if (!signatures || x->getNodeType() != CALL_NODE) return false;
    CALL* c = static_cast<CALL*>(x);
    if (c->getFunctionPointer()) return false;
    const CallSignature* sig = signatures->find(view(c->getFunctionName()));
    return sig && sig->library && sig->returnType != VOID;
}

// Sound, GCC flavour: a function named like a GCC built-in, other than the C
// library's own, is spelled zoa_builtin_<name> in C and keeps its symbol
// through an asm label, so GCC neither refuses its declaration nor replaces
// its calls with the built-in's meaning.
bool DecompileC::spelledApart(const String& name) const {
    if (!sound || !isGcc || !ctext::isGccBuiltinName(view(name))) return false;
    const CallSignature* sig = signatures ? signatures->find(view(name)) : nullptr;
    return !(sig && sig->library);
}

void DecompileC::writeFunctionName(const String& name) {
    if (spelledApart(name)) sink << BUILTIN_SPELLING;
    sink << name;
}

void DecompileC::writeAsmLabel(const String& name) {
    if (spelledApart(name)) sink << " __asm__(\"" << name << "\")";
}

void DecompileC::writeSoundCall(CALL* c) {
    const String& name = c->getFunctionName();
    const CallSignature* sig = signatures ? signatures->find(view(name)) : nullptr;
    // A value wanted of a void function: 0 of the call's type.
    bool voidValue = sig && sig->returnType == VOID && c->getDataType() != VOID;
    bool cast = sig && CallSignatures::needsResultCast(*sig, c);
    if (voidValue || cast) sink << '(';
    if (cast) writeCast(c->getDataType());
    writeFunctionName(name);
    writeArgList(c, sig ? &sig->params : nullptr);
    if (voidValue) {
        sink << ", ";
        writeCast(c->getDataType());
        sink << '0';
    }
    if (voidValue || cast) sink << ')';
}

void DecompileC::declareSignature(const std::string& name, const CallSignature& sig) {
    if (const LibraryFunction* f = sig.library) {
        sink << f->result.text << name << '(';
        bool first = true;
        for (const LibraryType& p : f->params) {
            if (!first) sink << ", ";
            first = false;
            sink << p.text;
        }
        if (f->variadic) sink << ", ...";
        if (f->params.empty()) sink << "void";
        sink << ");\n";
        return;
    }
    // No "static", whatever the calls say: the function is not defined here.
    writeTypeName(sig.returnType);
    String spelled(name);
    writeFunctionName(spelled);
    sink << '(';
    bool first = true;
    for (DataType t : sig.params) {
        if (!first) sink << ", ";
        first = false;
        writeTypeName(t);
    }
    if (sig.variadic && !sig.params.empty()) sink << ", ...";
    if (!sig.variadic && sig.params.empty()) sink << "void";
    sink << ')';
    writeAsmLabel(spelled);
    sink << ";\n";
}

bool DecompileC::writeSoundUnit(ZOA_file& unit, std::ostream& diag) {
    NameCheck check(diag);
    CallSignatures sigs;
    sigs.decide(unit);
    for (std::size_t i = 0; i < sigs.textConstants().size(); ++i)
        check.fail("a POINTER constant holds C text, which means nothing here");
    for (SUBPROG* sp : unit.getSubprogs())
        if (sp) check.function(view(sp->getName()), true);
    for (auto& entry : sigs.all())
        if (!entry.second.defined) check.function(entry.first, false);
    for (auto& entry : unit.getNamePrototypes()) check.function(entry.first, false);
    check.names(unit.getNames());
    for (SUBPROG* sp : unit.getSubprogs())
        if (sp) check.names(sp->getAllLocalNames());
    for (CALL* c : sigs.misfits()) {
        std::string why = "a call of '" + std::string(view(c->getFunctionName())) + "' with " +
                          std::to_string(c->getArgs().size()) + " arguments of type " + toString(c->getDataType()) +
                          " does not fit its declaration";
        check.fail(why.c_str());
    }
    if (!check.ok()) return false;

    TextSink::Batch batch(sink);
    signatures = &sigs;
    sink << "#ifndef ZOA_INT64_TYPES\n#define ZOA_INT64_TYPES\n"
            "typedef long long int64;\ntypedef unsigned long long uint64;\n#endif\n\n";
    // GCC's style warnings on valid machine-made expressions (x == x, a
    // relation used as a number, constant shifts in code that never runs, a
    // main with the tree's parameters) are no faults of the text.
    if (isGcc) {
        for (const char* w : {"tautological-compare", "bool-compare", "int-in-bool-context", "bool-operation",
                              "shift-count-overflow", "shift-count-negative", "shift-overflow", "div-by-zero", "overflow", "main"})
            sink << "#pragma GCC diagnostic ignored \"-W" << w << "\"\n";
        sink << '\n';
    }
    // Every function is declared before any data, so tables can hold their addresses.
    for (auto& entry : sigs.all())
        if (!entry.second.defined) declareSignature(entry.first, entry.second);
    for (SUBPROG* sp : unit.getSubprogs()) declareSubprogPrototype(sp);
    for (auto& entry : unit.getNamePrototypes())
        if (!sigs.find(entry.first)) declareNamePrototype(entry.second);
    sink << '\n';
    for (NAME* n : unit.getNames()) defineName(n);
    sink << '\n';
    for (SUBPROG* sp : unit.getSubprogs()) emitSubprogram(sp);
    signatures = nullptr;
    return true;
}

}  // namespace ZOA
