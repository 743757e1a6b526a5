// The text writer's output: node heads, spellings, numbers, quoted texts and constants on a TextSink.
#ifndef ZOA_TEXT_WRITE_BUFFER_H
#define ZOA_TEXT_WRITE_BUFFER_H

#include "core/node_kinds.h"
#include "support/text_sink.h"
#include "text/names.h"

#include <zoa/enums.h>
#include <zoa/expr.h>

#include <cmath>
#include <cstdio>
#include <cstring>
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

// The text form's pieces on top of the outputs' TextSink (one Batch for the
// writer's lifetime): node heads, spellings and numbers in plain decimal.
class Out {
public:
    explicit Out(std::ostream& os) : sink(os) {}
    explicit Out(std::string& into) : sink(into) {}
    Out(const Out&) = delete;
    Out& operator=(const Out&) = delete;

    Out& operator<<(std::string_view s) {
        sink << s;
        return *this;
    }
    Out& operator<<(const char* s) { return *this << std::string_view(s); }
    Out& operator<<(const std::string& s) { return *this << std::string_view(s); }
    Out& operator<<(Head h) { return *this << '(' << nodeKindName(h.kind) << ' '; }
    Out& operator<<(const Spelling& s) { return s.name.empty() ? *this << s.number : *this << s.name; }
    Out& operator<<(char c) {
        sink << c;
        return *this;
    }
    template <class T, std::enable_if_t<std::is_integral_v<T> && !std::is_same_v<T, char> && !std::is_same_v<T, bool>, int> = 0>
    Out& operator<<(T v) {
        if constexpr (std::is_signed_v<T>) sink.writeInt(v);
        else sink.writeUnsigned(v);
        return *this;
    }

private:
    TextSink sink;
    TextSink::Batch batch{sink};
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

// "(CONST <type> <value>)": floating values to 17 digits (nan, inf, -inf by
// name; a whole number keeps a ".0"), a pointer's text quoted or null.
inline void writeConstant(Out& os, CONST* c) {
    DataType t = c->getDataType();
    os << head(CONST_NODE) << spell(t) << ' ';
    if (t == FLOAT || t == DOUBLE) {
        double v = c->getFValue();
        if (std::isnan(v)) {
            os << "nan";
        } else if (std::isinf(v)) {
            os << (v < 0 ? "-inf" : "inf");
        } else {
            char buf[64];
            std::snprintf(buf, sizeof buf, "%.17g", v);
            os << buf;
            if (!std::strpbrk(buf, ".e")) os << ".0";
        }
    } else if (t == POINTER) {
        const char* p = static_cast<const char*>(c->getPValue());
        if (p)
            writeText(os, p, std::strlen(p));
        else
            os << "null";
    } else if (t == INT64_U) {
        os << static_cast<unsigned long long>(c->getIValue());
    } else {
        os << c->getIValue();
    }
    os << ')';
}

}  // namespace ZOA::text::detail

#endif
