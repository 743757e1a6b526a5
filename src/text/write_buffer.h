// The text writer's output: a buffer handed to the stream in large pieces, node heads, quoted texts.
#ifndef ZOA_TEXT_WRITE_BUFFER_H
#define ZOA_TEXT_WRITE_BUFFER_H

#include "core/node_kinds.h"
#include "text/names.h"

#include <zoa/enums.h>

#include <charconv>
#include <cstdio>
#include <ostream>
#include <string>
#include <string_view>
#include <type_traits>

namespace ZOA::text::detail {

// "(KIND ": a node's head, named as the list of node kinds names it.
struct Head {
    NodeType kind;
};
inline Head head(NodeType k) { return {k}; }

// The text gathered in a buffer and handed to the stream a large piece at a
// time, or appended straight to a string; numbers in plain decimal, whatever
// the stream's flags.
class Out {
public:
    explicit Out(std::ostream& os) : os(&os), buf(local) { local.reserve(CAPACITY + 64); }
    explicit Out(std::string& into) : buf(into) {}
    ~Out() { flush(); }
    Out(const Out&) = delete;
    Out& operator=(const Out&) = delete;

    Out& operator<<(std::string_view s) {
        buf.append(s.data(), s.size());
        if (os && buf.size() >= CAPACITY) flush();
        return *this;
    }
    Out& operator<<(const char* s) { return *this << std::string_view(s); }
    Out& operator<<(const std::string& s) { return *this << std::string_view(s); }
    Out& operator<<(Head h) { return *this << '(' << nodeKindName(h.kind) << ' '; }
    Out& operator<<(const Spelling& s) { return s.name.empty() ? *this << s.number : *this << s.name; }
    Out& operator<<(char c) {
        buf.push_back(c);
        return *this;
    }
    template <class T, std::enable_if_t<std::is_integral_v<T> && !std::is_same_v<T, char> && !std::is_same_v<T, bool>, int> = 0>
    Out& operator<<(T v) {
        char tmp[24];
        auto r = std::to_chars(tmp, tmp + sizeof tmp, v);
        return *this << std::string_view(tmp, static_cast<std::size_t>(r.ptr - tmp));
    }
    void flush() {
        if (!os) return;
        os->write(buf.data(), static_cast<std::streamsize>(buf.size()));
        buf.clear();
    }

private:
    static constexpr std::size_t CAPACITY = 32 * 1024;
    std::ostream* os = nullptr;
    std::string local;
    std::string& buf;
};

inline void writeText(Out& os, const char* s, std::size_t n) {
    os << '"';
    for (std::size_t i = 0; i < n; ++i) {
        unsigned char c = static_cast<unsigned char>(s[i]);
        switch (c) {
            case '"': os << "\\\""; break;
            case '\\': os << "\\\\"; break;
            case '\n': os << "\\n"; break;
            case '\t': os << "\\t"; break;
            case '\r': os << "\\r"; break;
            default:
                if (c < 0x20 || c >= 0x7f) {
                    char buf[8];
                    std::snprintf(buf, sizeof buf, "\\x%02x", c);
                    os << buf;
                } else {
                    os << static_cast<char>(c);
                }
        }
    }
    os << '"';
}

}  // namespace ZOA::text::detail

#endif
