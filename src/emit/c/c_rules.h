// Rules of the C text that the interpreter must read the same way the C emitter writes them.
#ifndef ZOA_EMIT_C_C_RULES_H
#define ZOA_EMIT_C_C_RULES_H

#include <zoa/expr.h>

#include <cfloat>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <string>
#include <string_view>

namespace ZOA::ctext {

// Array and string names stand for arrays or const pointers in C.
inline bool isArrayName(const ExprBase* e) {
    if (!e || const_cast<ExprBase*>(e)->getNodeType() != NAME_NODE) return false;
    NameKind k = static_cast<const NAME*>(e)->getKind();
    return k == CONST_ARRAY_REF || k == DATA_ARRAY_REF || k == STRINGLIT_REF;
}

// A move of an array name, or of one level of arithmetic on one, is written
// with a (char *) cast before its source.
inline bool moveCastsToCharPointer(const ExprBase* src) {
    if (isArrayName(src)) return true;
    if (!src || const_cast<ExprBase*>(src)->getNodeType() != BINOP_NODE) return false;
    const BINOP* b = static_cast<const BINOP*>(src);
    return isArrayName(b->getLeft()) || isArrayName(b->getRight());
}

// Calls of these return untyped memory: the call is written with a (char *) cast.
inline bool callCastsToCharPointer(std::string_view functionName) {
    return functionName == "alloca" || functionName == "malloc";
}

// Quoting a text as a C string literal: a double quote is escaped unless the
// character before it is a backslash; every other character stands as it is.
inline bool quoteNeedsEscape(std::string_view text, std::size_t i) {
    return text[i] == '"' && (i == 0 || text[i - 1] != '\\');
}

// The float a FLOAT constant holds, as the stream would see it: values beyond
// the float range round to FLT_MAX or to infinity as the hardware does,
// without the undefined behaviour of a plain conversion.
inline float narrowToFloat(double v) {
    double a = std::fabs(v);
    if (!(a > FLT_MAX)) return static_cast<float>(v);
    const double halfwayToInfinity = 0x1.ffffffp127;
    float r = a < halfwayToInfinity ? FLT_MAX : HUGE_VALF;
    return std::signbit(v) ? -r : r;
}

// The literal written for a FLOAT constant: six significant digits, general
// notation, as an ostream with default flags writes a float. Returns its length.
inline int formatFloatLiteral(char (&buf)[64], double v) {
    return std::snprintf(buf, sizeof buf, "%.*g", 6, static_cast<double>(narrowToFloat(v)));
}

}  // namespace ZOA::ctext

#endif
