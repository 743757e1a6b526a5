// Lexer and reader of the S-expression layer: comments, strings, numbers, symbols, lists.
#include "text/sexpr.h"

#include <zoa/text.h>

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cstdio>
#include <cstdlib>
#include <utility>

namespace ZOA::text {

namespace {

// Character classes, one table lookup each.
enum : unsigned char { SYM_START = 1, DIGIT = 2, SYM_CHAR = 4, BLANK = 8 };

struct CharClasses {
    unsigned char of[256] = {};
    constexpr CharClasses() {
        for (int c = 'a'; c <= 'z'; ++c) of[c] = SYM_START | SYM_CHAR;
        for (int c = 'A'; c <= 'Z'; ++c) of[c] = SYM_START | SYM_CHAR;
        of[static_cast<unsigned char>('_')] = SYM_START | SYM_CHAR;
        for (int c = '0'; c <= '9'; ++c) of[c] = DIGIT | SYM_CHAR;
        for (char c : {':', '-', '.', '+'}) of[static_cast<unsigned char>(c)] = SYM_CHAR;
        for (char c : {' ', '\t', '\n', '\r', '\f', '\v'}) of[static_cast<unsigned char>(c)] = BLANK;
    }
};
constexpr CharClasses CLASSES;

inline bool is(char c, unsigned char cls) { return (CLASSES.of[static_cast<unsigned char>(c)] & cls) != 0; }

int hexValue(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

bool fail(SyntaxError& err, std::size_t offset, std::string message) {
    err.offset = offset;
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

// Checks the string starting at the quote at pos; leaves pos after the closing quote.
bool lexString(std::string_view src, std::size_t& pos, SNode& n, std::vector<std::size_t>& lines, SyntaxError& err) {
    std::size_t start = pos++;
    while (true) {
        if (pos >= src.size()) return fail(err, start, "unterminated string");
        char c = src[pos];
        if (c == '"') {
            n.offset = start;
            n.length = pos - start - 1;
            ++pos;
            return true;
        }
        if (c == '\0') return fail(err, pos, "NUL byte inside a string");
        if (c != '\\') {
            if (c == '\n') lines.push_back(pos + 1);
            ++pos;
            continue;
        }
        n.escaped = true;
        std::size_t at = pos++;
        if (pos >= src.size()) return fail(err, start, "unterminated string");
        char e = src[pos++];
        if (e == '\n') lines.push_back(pos);
        switch (e) {
            case 'n':
            case 't':
            case 'r':
            case '\\':
            case '"': break;
            case 'x': {
                int hi = pos >= src.size() ? -1 : hexValue(src[pos]);
                if (hi >= 0) ++pos;
                int lo = hi < 0 || pos >= src.size() ? -1 : hexValue(src[pos]);
                if (lo < 0) return fail(err, at, "'\\x' needs two hexadecimal digits");
                ++pos;
                if (hi == 0 && lo == 0) return fail(err, at, "'\\x00' cannot be part of a text");
                break;
            }
            default:
                return fail(err, at, "unknown escape '\\" + std::string(1, e) + "'");
        }
    }
}

// A number is the run of symbol characters starting at a digit or a signed digit.
bool lexNumber(std::string_view t, SNode& n, SyntaxError& err) {
    std::size_t i = 0;
    if (t[i] == '-' || t[i] == '+') {
        n.negative = t[i] == '-';
        ++i;
    }
    bool hex = t.size() > i + 1 && t[i] == '0' && (t[i + 1] == 'x' || t[i + 1] == 'X');
    if (!hex && t.find_first_of(".eE", i) != std::string_view::npos) {
        // strtod, not from_chars: it also takes a '+' and gives underflows their value.
        std::string s(t);
        errno = 0;
        char* end = nullptr;
        n.real = std::strtod(s.c_str(), &end);
        if (end != s.c_str() + s.size()) return fail(err, n.offset, "malformed number '" + s + "'");
        if (errno == ERANGE && (n.real > 1.0 || n.real < -1.0))
            return fail(err, n.offset, "number '" + s + "' is out of range");
        n.kind = SNode::REAL;
        return true;
    }
    if (hex) i += 2;
    unsigned long long v = 0;
    auto [end, ec] = std::from_chars(t.data() + i, t.data() + t.size(), v, hex ? 16 : 10);
    // Overflow is reported before a stray character further on, as a digit-by-digit reading would.
    if (ec == std::errc::result_out_of_range)
        return fail(err, n.offset, "number '" + std::string(t) + "' is out of range");
    if (ec != std::errc() || end != t.data() + t.size())
        return fail(err, n.offset, "malformed number '" + std::string(t) + "'");
    n.magnitude = v;
    n.kind = SNode::INTEGER;
    return true;
}

}  // namespace

SItems Forms::keep(SNode* first, SNode* last) {
    std::size_t n = static_cast<std::size_t>(last - first);
    if (n == 0) return {};
    if (chunks_.empty() || used_ + n > chunks_.back().capacity) {
        // Chunks of 512 nodes, kept for reuse; a longer list gets one of its own size.
        constexpr std::size_t CHUNK = 512;
        if (n <= CHUNK && !spare_.empty()) {
            chunks_.push_back(std::move(spare_.back()));
            spare_.pop_back();
        } else {
            std::size_t cap = std::max(n, CHUNK);
            chunks_.push_back(Chunk{std::unique_ptr<SNode[]>(new SNode[cap]), cap});
        }
        used_ = 0;
    }
    SNode* to = chunks_.back().nodes.get() + used_;
    std::move(first, last, to);
    used_ += n;
    return {to, n};
}

void Forms::release(const Mark& m) {
    while (chunks_.size() > m.chunk) {
        if (chunks_.back().capacity == 512) spare_.push_back(std::move(chunks_.back()));
        chunks_.pop_back();
    }
    used_ = m.used;
}

bool readForms(std::string_view src, Forms& forms, std::vector<std::size_t>& lines,
               FormListener& listener, SyntaxError& err) {
    // Open lists, innermost last: the list, where its items start in `pending`
    // and the storage mark taken when it opened. Items wait on one stack and
    // move into the storage when their list closes.
    struct Open {
        SNode list;
        std::size_t from;
        Forms::Mark mark;
    };
    std::vector<Open> open;
    std::vector<SNode> pending;
    pending.reserve(64);
    std::size_t topCount = 0;
    std::size_t pos = 0;
    const std::size_t size = src.size();

    // A complete item: the first form's items and every top-level form go to the listener.
    auto complete = [&](SNode&& n, const Forms::Mark* mark) {
        if (open.size() == 1 && topCount == 0) {
            const Open& unit = open.front();
            bool done = listener.unitItem(unit.list, pending.size() - unit.from, n);
            if (done && mark) forms.release(*mark);
        } else if (open.empty()) {
            listener.topForm(topCount++, n);
        }
        pending.push_back(std::move(n));
    };

    while (true) {
        // Blanks and comments.
        while (pos < size) {
            char c = src[pos];
            if (is(c, BLANK)) {
                if (c == '\n') lines.push_back(pos + 1);
                ++pos;
            } else if (c == ';') {
                while (pos < size && src[pos] != '\n') ++pos;
            } else {
                break;
            }
        }
        if (pos >= size) {
            if (!open.empty()) return fail(err, open.back().list.offset, "'(' is never closed");
            return true;
        }
        SNode n;
        n.offset = pos;
        char c = src[pos];
        if (c == '(') {
            if (open.size() >= MAX_NESTING)
                return fail(err, pos, "nesting deeper than " + std::to_string(MAX_NESTING) + " levels");
            ++pos;
            open.push_back(Open{n, pending.size(), forms.mark()});
            continue;
        }
        if (c == ')') {
            if (open.empty()) return fail(err, pos, "unexpected ')'");
            ++pos;
            Open done = std::move(open.back());
            open.pop_back();
            done.list.length = pos - done.list.offset;
            done.list.items = forms.keep(pending.data() + done.from, pending.data() + pending.size());
            pending.resize(done.from);
            complete(std::move(done.list), &done.mark);
            continue;
        }
        if (c == '"') {
            n.kind = SNode::STRING;
            if (!lexString(src, pos, n, lines, err)) return false;
        } else if (is(c, SYM_CHAR) && (is(c, SYM_START | DIGIT) || c == '-' || c == '+')) {
            std::size_t start = pos++;
            while (pos < size && is(src[pos], SYM_CHAR)) ++pos;
            n.length = pos - start;
            bool number = is(c, DIGIT) || (!is(c, SYM_START) && n.length > 1 && is(src[start + 1], DIGIT));
            if (number) {
                if (!lexNumber(src.substr(start, n.length), n, err)) return false;
            } else {
                n.kind = SNode::SYMBOL;
                if ((c == 's' || c == 'g') && n.length > 1 && is(src[start + 1], DIGIT))
                    forms.scopedSymbols.push_back(start);
            }
        } else {
            return fail(err, pos, "unexpected character " + charName(c));
        }
        complete(std::move(n), nullptr);
    }
}

std::size_t symbolEnd(std::string_view source, std::size_t at) {
    while (at < source.size() && is(source[at], SYM_CHAR)) ++at;
    return at;
}

std::string_view atomText(std::string_view source, const SNode& n, std::string& scratch) {
    if (n.kind != SNode::STRING) return source.substr(n.offset, n.length);
    std::string_view raw = source.substr(n.offset + 1, n.length);
    if (!n.escaped) return raw;
    // The lexer checked every escape already.
    scratch.clear();
    for (std::size_t i = 0; i < raw.size(); ++i) {
        char c = raw[i];
        if (c != '\\') {
            scratch += c;
            continue;
        }
        char e = raw[++i];
        switch (e) {
            case 'n': scratch += '\n'; break;
            case 't': scratch += '\t'; break;
            case 'r': scratch += '\r'; break;
            case 'x':
                scratch += static_cast<char>(hexValue(raw[i + 1]) * 16 + hexValue(raw[i + 2]));
                i += 2;
                break;
            default: scratch += e; break;
        }
    }
    return scratch;
}

std::string quote(std::string_view source, const SNode& n) {
    std::string scratch;
    switch (n.kind) {
        case SNode::LIST:
            if (!n.items.empty() && n.items.front().kind == SNode::SYMBOL)
                return "(" + std::string(atomText(source, n.items.front(), scratch));
            return "(";
        case SNode::STRING: {
            std::string_view text = atomText(source, n, scratch);
            std::string s = text.size() > 20 ? std::string(text.substr(0, 20)) + "..." : std::string(text);
            for (char& c : s)
                if (static_cast<unsigned char>(c) < 0x20) c = ' ';
            return "\"" + s + "\"";
        }
        case SNode::SYMBOL:
        case SNode::INTEGER:
        case SNode::REAL:
            break;
    }
    return std::string(atomText(source, n, scratch));
}

}  // namespace ZOA::text
