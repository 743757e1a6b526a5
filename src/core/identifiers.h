// C identifiers: which texts can stand as a name in emitted C and assembly.
#ifndef ZOA_CORE_IDENTIFIERS_H
#define ZOA_CORE_IDENTIFIERS_H

#include <cstddef>
#include <cstring>

namespace ZOA {

// Letters, digits and '_', not starting with a digit, not empty.
inline bool isPlainIdentifier(const char* s, std::size_t n) {
    if (n == 0 || (s[0] >= '0' && s[0] <= '9')) return false;
    for (std::size_t i = 0; i < n; ++i) {
        char c = s[i];
        bool ok = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_';
        if (!ok) return false;
    }
    return true;
}

// The C99 keywords and the GNU and MSVC spellings that act as keywords in
// either flavour.
inline bool isCKeyword(const char* s, std::size_t n) {
    static const char* const words[] = {
        "auto", "break", "case", "char", "const", "continue", "default", "do", "double", "else", "enum",
        "extern", "float", "for", "goto", "if", "inline", "int", "long", "register", "restrict", "return",
        "short", "signed", "sizeof", "static", "struct", "switch", "typedef", "union", "unsigned", "void",
        "volatile", "while", "_Bool", "_Complex", "_Imaginary", "asm", "typeof", "__asm", "__asm__",
        "__attribute__", "__declspec", "__inline", "__int64", "__typeof__", "_Alignas", "_Alignof",
        "_Atomic", "_Generic", "_Noreturn", "_Static_assert", "_Thread_local"};
    for (const char* w : words)
        if (std::strlen(w) == n && std::memcmp(w, s, n) == 0) return true;
    return false;
}

// A text the emitted C can use as it stands for a function or variable.
inline bool isCIdentifier(const char* s, std::size_t n) { return isPlainIdentifier(s, n) && !isCKeyword(s, n); }

}  // namespace ZOA

#endif
