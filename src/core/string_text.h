// The bytes a STRINGLIT_REF's text stands for in the sound profile, and their C spelling.
#ifndef ZOA_CORE_STRING_TEXT_H
#define ZOA_CORE_STRING_TEXT_H

#include <cstddef>
#include <string>

namespace ZOA {

// A string name's text is C source between the quotes. In the sound profile
// its escapes mean what C makes of them (\n, \t, ..., up to three octal
// digits, \x and its hex digits, the value kept to a byte), an unknown escape
// or a \x without digits is its letter, a quote is a quote and a backslash at
// the end is a backslash: every text means some bytes.
inline std::string decodeStringText(const char* s, std::size_t n) {
    auto hexValue = [](char c) -> int {
        if (c >= '0' && c <= '9') return c - '0';
        if (c >= 'a' && c <= 'f') return c - 'a' + 10;
        if (c >= 'A' && c <= 'F') return c - 'A' + 10;
        return -1;
    };
    static const char from[] = "ntrabfv", to[] = "\n\t\r\a\b\f\v";
    std::string out;
    out.reserve(n);
    for (std::size_t i = 0; i < n; ++i) {
        char c = s[i];
        if (c != '\\' || i + 1 == n) {
            out += c;
            continue;
        }
        c = s[++i];
        if (c >= '0' && c <= '7') {
            int v = 0;
            for (int k = 0; k < 3 && i < n && s[i] >= '0' && s[i] <= '7'; ++k, ++i) v = v * 8 + (s[i] - '0');
            --i;
            out += static_cast<char>(v & 0xff);
        } else if (c == 'x' && i + 1 < n && hexValue(s[i + 1]) >= 0) {
            int v = 0;
            while (i + 1 < n && hexValue(s[i + 1]) >= 0) v = (v * 16 + hexValue(s[++i])) & 0xff;
            out += static_cast<char>(v);
        } else {
            const char* p = c ? std::char_traits<char>::find(from, 7, c) : nullptr;
            out += p ? to[p - from] : c;
        }
    }
    return out;
}

// A C string literal, quotes included, holding exactly the given bytes:
// printable ASCII as it is, '"', '\' and '?' (trigraphs) escaped, every other
// byte as a three-digit octal escape.
inline std::string quoteCString(const std::string& bytes) {
    std::string out = "\"";
    for (unsigned char c : bytes) {
        if (c == '"' || c == '\\' || c == '?') {
            out += '\\';
            out += static_cast<char>(c);
        } else if (c >= 0x20 && c < 0x7f) {
            out += static_cast<char>(c);
        } else {
            out += '\\';
            out += static_cast<char>('0' + (c >> 6));
            out += static_cast<char>('0' + ((c >> 3) & 7));
            out += static_cast<char>('0' + (c & 7));
        }
    }
    return out + "\"";
}

}  // namespace ZOA

#endif
