// What a string literal the C output writes for a text holds once C reads its escapes.
#ifndef ZOA_CORE_C_LITERAL_H
#define ZOA_CORE_C_LITERAL_H

#include <cctype>
#include <cstring>
#include <string>

namespace ZOA {

// The characters of the literal the C text writes for `text`: a double quote is
// escaped unless a backslash precedes it, every other character is written as
// it stands, and C then reads the escapes (an unknown one as its letter).
// False when the literal would end early or its closing quote is escaped.
inline bool cLiteralValue(const char* text, std::size_t n, std::string& value) {
    std::string w;
    w.reserve(n + 8);
    for (std::size_t i = 0; i < n; ++i) {
        if (text[i] == '"' && (i == 0 || text[i - 1] != '\\')) w += '\\';
        w += text[i];
    }
    value.clear();
    for (std::size_t i = 0; i < w.size(); ++i) {
        char c = w[i];
        if (c == '"') return false;  // the literal ends early
        if (c != '\\') {
            value += c;
            continue;
        }
        if (++i >= w.size()) return false;  // the closing quote is escaped
        c = w[i];
        static const char from[] = "ntrabfv\\'\"?", to[] = "\n\t\r\a\b\f\v\\'\"?";
        if (const char* p = std::strchr(from, c); p && c) {
            value += to[p - from];
        } else if (c >= '0' && c <= '7') {
            int v = 0;
            for (int k = 0; k < 3 && i < w.size() && w[i] >= '0' && w[i] <= '7'; ++k, ++i) v = v * 8 + (w[i] - '0');
            --i;
            value += static_cast<char>(v);
        } else if (c == 'x') {
            int v = 0, k = 0;
            while (i + 1 < w.size() && std::isxdigit(static_cast<unsigned char>(w[i + 1])))
                v = v * 16 + (std::isdigit(static_cast<unsigned char>(w[++i])) ? w[i] - '0' : (w[i] | 0x20) - 'a' + 10), ++k;
            if (!k) return false;
            value += static_cast<char>(v);
        } else {
            value += c;
        }
    }
    return true;
}

}  // namespace ZOA

#endif
