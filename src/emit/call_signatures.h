// CallSignatures: the one declaration of each external function, decided from every call of the unit.
#ifndef ZOA_EMIT_CALL_SIGNATURES_H
#define ZOA_EMIT_CALL_SIGNATURES_H

#include "emit/used_nodes.h"

#include <zoa/enums.h>

#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace ZOA {

class CALL;
class ZOA_file;

// A parameter or return type of a known C library function, as its header
// declares it (the C text differs from the tree's type names: "const char *",
// "void *", "unsigned int" for size_t).
struct LibraryType {
    std::string_view text;  // with its separating blank, like the tree's type names
    DataType type;          // what a value of it is in the tree
};

// A C library function GCC knows as a builtin: declaring it any other way is
// an error under -Werror (-Wbuiltin-declaration-mismatch).
struct LibraryFunction {
    std::string_view name;
    LibraryType result;
    std::vector<LibraryType> params;
    bool variadic;
};

// The declaration of one external function.
//  - A known C library function is declared as its header does (`library`).
//  - Otherwise, when every call has the same argument types, a plain prototype
//    of those types; when calls disagree, a variadic declaration whose fixed
//    part is the longest run of leading argument types all calls share (no
//    fixed part: the old-style "()" declaration, which passes arguments the
//    same way). Arguments past the fixed part get C's default promotions:
//    FLOAT goes as DOUBLE, CHAR_U and CHAR_S as INT_S.
//  - The return type is that of the first call found (the walk goes through
//    the subprograms in order, then the registered prototypes); a call of
//    another type, or one that does not fit the declaration (fits() false),
//    is made through a function pointer of its own type, its arguments passed
//    as they are.
struct CallSignature {
    DataType returnType = VOID;
    std::vector<DataType> params;
    bool variadic = false;
    bool isStatic = false;
    const LibraryFunction* library = nullptr;
};

class CallSignatures {
public:
    // Every named call of the unit's subprograms and registered prototypes
    // whose callee is not a subprogram of the unit, and every external
    // function a SUBPROG_REF name prototype refers to (those get the library
    // declaration when known, else no entry).
    void decide(ZOA_file& unit);
    void clear() { signatures.clear(); }

    const CallSignature* find(std::string_view name) const;
    const std::map<std::string, CallSignature, std::less<>>& all() const { return signatures; }

    // True when c passes its arguments as sig declares them: its argument
    // count fits, each fixed argument converts to its parameter without a
    // diagnostic (pointers to pointers, numbers to numbers), and a non-VOID
    // call does not call a void function.
    static bool fits(const CallSignature& sig, CALL* c);
    // True when c's value must be cast to c's own type: the declared return
    // type writes another C type.
    static bool needsResultCast(const CallSignature& sig, CALL* c);
    static const LibraryFunction* libraryFunction(std::string_view name);

private:
    void add(CALL* c);
    std::map<std::string, CallSignature, std::less<>> signatures;
    UsedMap seen;  // reused across units
};

}  // namespace ZOA

#endif
