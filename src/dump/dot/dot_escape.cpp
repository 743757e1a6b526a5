// Escaping of user texts inside DOT labels.
#include "dump/dot/dot_escape.h"

namespace ZOA {

void appendDotEscaped(TextSink& text, const char* s, std::size_t n, bool record) {
    static const char hex[] = "0123456789abcdef";
    for (std::size_t i = 0; i < n; ++i) {
        unsigned char c = static_cast<unsigned char>(s[i]);
        if (c < 0x20 || c >= 0x7f) {
            const char e[] = {'\\', '\\', 'x', hex[c >> 4], hex[c & 15]};
            text.write(e, sizeof e);
            continue;
        }
        bool special = c == '"' || c == '\\' ||
                       (record && (c == '{' || c == '}' || c == '|' || c == '<' || c == '>'));
        if (special) text << '\\';
        text << static_cast<char>(c);
    }
}

}  // namespace ZOA
