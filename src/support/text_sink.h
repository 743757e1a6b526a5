// TextSink: an output's text, gathered in a buffer and handed to its stream in large pieces.
#ifndef ZOA_SUPPORT_TEXT_SINK_H
#define ZOA_SUPPORT_TEXT_SINK_H

#include "support/decimal.h"
#include "support/short_copy.h"

#include <zoa/memmgr.h>

#include <cstddef>
#include <cstring>
#include <memory>
#include <ostream>
#include <string_view>

namespace ZOA {

// Outside a Batch every piece goes straight to the stream (ostream::write), so
// a caller writing to the same stream between two pieces keeps its place.
// Inside a Batch the pieces are appended to the buffer and written with one
// ostream::write per buffer-full and at the end of the outermost Batch: the
// same bytes, without a sentry and a formatting round trip per token. Numbers
// are formatted here (plain decimal), never with the stream's flags.
class TextSink {
public:
    explicit TextSink(std::ostream& os) : os(os) {}
    ~TextSink() { flush(); }
    TextSink(const TextSink&) = delete;
    TextSink& operator=(const TextSink&) = delete;

    class Batch {
    public:
        explicit Batch(TextSink& t) : t(t) { ++t.depth; }
        ~Batch() {
            if (--t.depth == 0) t.flush();
        }
        Batch(const Batch&) = delete;
        Batch& operator=(const Batch&) = delete;

    private:
        TextSink& t;
    };

    TextSink& write(const char* p, std::size_t n) {
        if (depth == 0) {
            os.write(p, static_cast<std::streamsize>(n));
        } else if (n <= CAPACITY - used) {
            copyShort(buf.get() + used, p, n);
            used += n;
        } else {
            flush();
            os.write(p, static_cast<std::streamsize>(n));
        }
        return *this;
    }
    TextSink& operator<<(std::string_view s) { return write(s.data(), s.size()); }
    TextSink& operator<<(const char* s) { return write(s, std::strlen(s)); }
    TextSink& operator<<(const String& s) { return write(s.data(), s.size()); }
    TextSink& operator<<(char c) {
        if (depth != 0 && used < CAPACITY) buf[used++] = c;
        else write(&c, 1);
        return *this;
    }
    // n levels of four blanks; the usual shallow levels inline.
    TextSink& indent(unsigned int n) {
        if (n == 0) return *this;
        if (n <= MAX_INLINE_INDENT && depth != 0 && CAPACITY - used >= 4 * n) {
            copyShort(buf.get() + used, BLANKS, 4 * n);
            used += 4 * n;
            return *this;
        }
        return writeBlanks(n);
    }
    // Plain decimal.
    TextSink& writeUnsigned(unsigned long long v) {
        if (depth == 0 || CAPACITY - used < MAX_DECIMAL_CHARS) return writeNumberApart(v);
        char* p = buf.get() + used;
        if (v < 100) {
            // Temporary and label ids are mostly small.
            if (v >= 10) *p++ = static_cast<char>('0' + v / 10);
            *p++ = static_cast<char>('0' + v % 10);
            used = static_cast<std::size_t>(p - buf.get());
            return *this;
        }
        used += writeDecimal(p, v);
        return *this;
    }
    TextSink& writeInt(long long v) {
        if (depth == 0 || CAPACITY - used < MAX_DECIMAL_CHARS) return writeNumberApart(v);
        used += writeDecimal(buf.get() + used, v);
        return *this;
    }

    // Hands what is gathered to the stream.
    void flush() {
        if (used == 0) return;
        os.write(buf.get(), static_cast<std::streamsize>(used));
        used = 0;
    }

private:
    TextSink& writeBlanks(unsigned int n);
    template <class T> TextSink& writeNumberApart(T v) {
        char digits[MAX_DECIMAL_CHARS];
        return write(digits, writeDecimal(digits, v));
    }

    static constexpr std::size_t CAPACITY = 1 << 15;
    static constexpr unsigned int MAX_INLINE_INDENT = 4;
    static constexpr char BLANKS[4 * MAX_INLINE_INDENT + 1] = "                ";
    std::ostream& os;
    std::size_t used = 0;
    unsigned int depth = 0;
    std::unique_ptr<char[]> buf{new char[CAPACITY]};  // one allocation per sink
};

}  // namespace ZOA

#endif
