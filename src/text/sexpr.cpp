// Lexer and reader of the S-expression layer: comments, strings, numbers, symbols, lists.
#include "text/sexpr.h"

#include <zoa/text.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstdlib>

namespace ZOA::text {

namespace {

bool isSymbolStart(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_';
}
bool isDigit(char c) { return c >= '0' && c <= '9'; }
bool isSymbolChar(char c) {
    return isSymbolStart(c) || isDigit(c) || c == ':' || c == '-' || c == '.' || c == '+';
}
int hexValue(char c) {
    if (isDigit(c)) return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

class Lexer {
public:
    explicit Lexer(std::string_view s) : src(s) {}

    std::string_view src;
    std::size_t pos = 0;
    unsigned int line = 1;
    unsigned int column = 1;

    bool atEnd() const { return pos >= src.size(); }
    char peek() const { return src[pos]; }
    void advance() {
        if (src[pos] == '\n') {
            ++line;
            column = 1;
        } else {
            ++column;
        }
        ++pos;
    }
    void skipBlanks() {
        while (!atEnd()) {
            char c = peek();
            if (c == ';') {
                while (!atEnd() && peek() != '\n') advance();
            } else if (c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f' || c == '\v') {
                advance();
            } else {
                return;
            }
        }
    }
};

bool fail(SyntaxError& err, unsigned int line, unsigned int column, std::string message) {
    err.line = line;
    err.column = column;
    err.message = std::move(message);
    return false;
}

std::string charName(char c) {
    unsigned char u = static_cast<unsigned char>(c);
    char buf[16];
    if (u >= 0x20 && u < 0x7f)
        std::snprintf(buf, sizeof buf, "'%c'", c);
    else
        std::snprintf(buf, sizeof buf, "'\\x%02x'", u);
    return buf;
}

bool lexString(Lexer& lx, SNode& n, SyntaxError& err) {
    lx.advance();  // opening quote
    while (true) {
        if (lx.atEnd()) return fail(err, n.line, n.column, "unterminated string");
        char c = lx.peek();
        if (c == '"') {
            lx.advance();
            return true;
        }
        if (c == '\0') return fail(err, lx.line, lx.column, "NUL byte inside a string");
        if (c != '\\') {
            n.text += c;
            lx.advance();
            continue;
        }
        unsigned int l = lx.line, col = lx.column;
        lx.advance();
        if (lx.atEnd()) return fail(err, n.line, n.column, "unterminated string");
        char e = lx.peek();
        lx.advance();
        switch (e) {
            case 'n': n.text += '\n'; break;
            case 't': n.text += '\t'; break;
            case 'r': n.text += '\r'; break;
            case '\\': n.text += '\\'; break;
            case '"': n.text += '"'; break;
            case 'x': {
                int hi = lx.atEnd() ? -1 : hexValue(lx.peek());
                if (hi >= 0) lx.advance();
                int lo = hi < 0 || lx.atEnd() ? -1 : hexValue(lx.peek());
                if (lo < 0) return fail(err, l, col, "'\\x' needs two hexadecimal digits");
                lx.advance();
                if (hi == 0 && lo == 0) return fail(err, l, col, "'\\x00' cannot be part of a text");
                n.text += static_cast<char>(hi * 16 + lo);
                break;
            }
            default:
                return fail(err, l, col, "unknown escape '\\" + std::string(1, e) + "'");
        }
    }
}

bool lexNumber(Lexer& lx, SNode& n, SyntaxError& err) {
    std::size_t start = lx.pos;
    while (!lx.atEnd() && isSymbolChar(lx.peek())) lx.advance();
    n.text.assign(lx.src.substr(start, lx.pos - start));
    const std::string& t = n.text;
    std::size_t i = 0;
    if (t[i] == '-' || t[i] == '+') {
        n.negative = t[i] == '-';
        ++i;
    }
    bool hex = t.size() > i + 1 && t[i] == '0' && (t[i + 1] == 'x' || t[i + 1] == 'X');
    bool real = !hex && t.find_first_of(".eE", i) != std::string::npos;
    if (real) {
        errno = 0;
        char* end = nullptr;
        n.real = std::strtod(t.c_str(), &end);
        if (end != t.c_str() + t.size()) return fail(err, n.line, n.column, "malformed number '" + t + "'");
        if (errno == ERANGE && (n.real > 1.0 || n.real < -1.0))
            return fail(err, n.line, n.column, "number '" + t + "' is out of range");
        n.kind = SNode::REAL;
        return true;
    }
    if (hex) i += 2;
    if (i >= t.size()) return fail(err, n.line, n.column, "malformed number '" + t + "'");
    unsigned long long v = 0;
    unsigned int base = hex ? 16 : 10;
    for (; i < t.size(); ++i) {
        int d = hex ? hexValue(t[i]) : (isDigit(t[i]) ? t[i] - '0' : -1);
        if (d < 0) return fail(err, n.line, n.column, "malformed number '" + t + "'");
        if (v > (~0ULL - static_cast<unsigned>(d)) / base)
            return fail(err, n.line, n.column, "number '" + t + "' is out of range");
        v = v * base + static_cast<unsigned>(d);
    }
    n.magnitude = v;
    n.kind = SNode::INTEGER;
    return true;
}

}  // namespace

SItems Forms::keep(SNode* first, SNode* last) {
    std::size_t n = static_cast<std::size_t>(last - first);
    if (n == 0) return {};
    if (chunks_.empty() || used_ + n > capacity_) {
        // Chunks double from 64 to 512 nodes; a longer list gets one of its own size.
        capacity_ = capacity_ == 0 ? 64 : capacity_ < 512 ? capacity_ * 2 : 512;
        if (capacity_ < n) capacity_ = n;
        chunks_.emplace_back(new SNode[capacity_]);
        used_ = 0;
    }
    SNode* to = chunks_.back().get() + used_;
    std::move(first, last, to);
    used_ += n;
    return {to, n};
}

bool readForms(std::string_view source, Forms& forms, SyntaxError& err) {
    Lexer lx(source);
    // Open lists, innermost last, each with where its items start in `pending`.
    // Items wait on one stack and move into the forms' storage when their list
    // closes.
    std::vector<std::pair<SNode, std::size_t>> open;
    std::vector<SNode> pending;
    pending.reserve(64);
    auto collect = [&](std::size_t from) {
        SItems kept = forms.keep(pending.data() + from, pending.data() + pending.size());
        pending.resize(from);
        return kept;
    };
    while (true) {
        lx.skipBlanks();
        if (lx.atEnd()) {
            if (!open.empty())
                return fail(err, open.back().first.line, open.back().first.column, "'(' is never closed");
            forms.top = collect(0);
            return true;
        }
        SNode n;
        n.line = lx.line;
        n.column = lx.column;
        char c = lx.peek();
        if (c == '(') {
            if (open.size() >= MAX_NESTING)
                return fail(err, n.line, n.column,
                            "nesting deeper than " + std::to_string(MAX_NESTING) + " levels");
            lx.advance();
            open.emplace_back(std::move(n), pending.size());
            continue;
        }
        if (c == ')') {
            if (open.empty()) return fail(err, n.line, n.column, "unexpected ')'");
            lx.advance();
            SNode done = std::move(open.back().first);
            done.items = collect(open.back().second);
            open.pop_back();
            pending.push_back(std::move(done));
            continue;
        }
        if (c == '"') {
            n.kind = SNode::STRING;
            if (!lexString(lx, n, err)) return false;
        } else if (isDigit(c) || ((c == '-' || c == '+') && lx.pos + 1 < source.size() &&
                                  isDigit(source[lx.pos + 1]))) {
            if (!lexNumber(lx, n, err)) return false;
        } else if (isSymbolStart(c) || c == '-' || c == '+') {
            n.kind = SNode::SYMBOL;
            std::size_t start = lx.pos;
            while (!lx.atEnd() && isSymbolChar(lx.peek())) lx.advance();
            n.text.assign(source.substr(start, lx.pos - start));
        } else {
            return fail(err, n.line, n.column, "unexpected character " + charName(c));
        }
        pending.push_back(std::move(n));
    }
}

std::string quote(const SNode& n) {
    switch (n.kind) {
        case SNode::LIST:
            if (!n.items.empty() && n.items.front().kind == SNode::SYMBOL) return "(" + n.items.front().text;
            return "(";
        case SNode::STRING: {
            std::string s = n.text.size() > 20 ? n.text.substr(0, 20) + "..." : n.text;
            for (char& c : s)
                if (static_cast<unsigned char>(c) < 0x20) c = ' ';
            return "\"" + s + "\"";
        }
        case SNode::SYMBOL:
        case SNode::INTEGER:
        case SNode::REAL:
            return n.text;
    }
    return n.text;
}

}  // namespace ZOA::text
