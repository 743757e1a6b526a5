// CallSignatures: the one declaration of each external function, decided from every call of the unit.
#ifndef ZOA_EMIT_CALL_SIGNATURES_H
#define ZOA_EMIT_CALL_SIGNATURES_H

#include "support/pointer_table.h"

#include <zoa/expr.h>
#include <zoa/nesting.h>

#include <zoa/enums.h>

#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace ZOA {

class CALL;
class TreeBase;
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

// How the calls of one named function are made.
//  - A subprogram of the unit (`defined`): its return and argument temporary
//    types.
//  - A known C library function is declared as its header does (`library`).
//  - Otherwise, when every call has the same argument types, a plain prototype
//    of those types; when calls disagree, a variadic declaration whose fixed
//    part is the longest run of leading argument types all calls share (no
//    fixed part: the old-style "()" declaration, which passes arguments the
//    same way). The return type is that of the first call found (the walk
//    goes through the subprograms in order, then the registered prototypes).
// A call that fits (fits()) passes each fixed argument converted to its
// parameter's type and the rest with C's default promotions (FLOAT as DOUBLE,
// CHAR_U and CHAR_S as INT_S); its value is converted to the call's type
// (needsResultCast()); a call that wants a value of a VOID function gets 0 of
// its type. Calls that do not fit (another argument count than a defined or
// library function takes, or, for an external function, another return type
// than the first call's) are listed in misfits(): C cannot make them (GCC
// refuses calls through a cast of a known function), so outputs refuse them.
struct CallSignature {
    DataType returnType = VOID;
    std::vector<DataType> params;
    bool variadic = false;
    bool defined = false;
    const LibraryFunction* library = nullptr;
};

class CallSignatures {
public:
    // Every subprogram of the unit, the callee of every named call of its
    // subprograms and registered prototypes, and every C library function a
    // SUBPROG_REF name prototype refers to.
    void decide(ZOA_file& unit);
    void clear() { signatures.clear(); }

    const CallSignature* find(std::string_view name) const;
    const std::map<std::string, CallSignature, std::less<>>& all() const { return signatures; }

    // True when c can be made as sig declares the function.
    static bool fits(const CallSignature& sig, CALL* c);
    // True when c's value must be converted to c's own type: the real return
    // type is known and writes another C type.
    static bool needsResultCast(const CallSignature& sig, CALL* c);
    // The calls that do not fit their function's signature, in walk order.
    const std::vector<CALL*>& misfits() const { return misfitCalls; }
    static const LibraryFunction* libraryFunction(std::string_view name);
    // The POINTER constants holding C text met by decide(), once each, in walk order.
    const std::vector<CONST*>& textConstants() const { return textPointers; }

private:
    void add(CALL* c);
    void walk(TreeBase* n);
    std::map<std::string, CallSignature, std::less<>> signatures;
    std::vector<CALL*> misfitCalls;
    std::vector<CONST*> textPointers;
    PointerSet<const TreeBase*> met;  // calls and text constants met; reused across units
    NestingGuard nesting;
};

}  // namespace ZOA

#endif
