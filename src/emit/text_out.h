// TextOut: an emitter's text, gathered in a buffer and handed to the stream in large pieces.
#ifndef ZOA_EMIT_TEXT_OUT_H
#define ZOA_EMIT_TEXT_OUT_H

#include "core/short_copy.h"

#include <zoa/memmgr.h>

#include <cstddef>
#include <cstring>
#include <memory>
#include <ostream>
#include <string_view>

namespace ZOA {

// Outside a Batch every piece goes straight to the stream (ostream::write), so
// a caller reading the stream between two writes sees them. Inside a Batch the
// pieces are appended to the buffer and written with one ostream::write per
// buffer-full and at the end of the outermost Batch: the same bytes, without a
// sentry and a formatting round trip per token. Numbers are formatted here
// (plain decimal), never with the stream's flags.
class TextOut {
public:
    explicit TextOut(std::ostream& os) : os(os) {}
    ~TextOut() { flush(); }
    TextOut(const TextOut&) = delete;
    TextOut& operator=(const TextOut&) = delete;

    class Batch {
    public:
        explicit Batch(TextOut& t) : t(t) { ++t.depth; }
        ~Batch() {
            if (--t.depth == 0) t.flush();
        }
        Batch(const Batch&) = delete;
        Batch& operator=(const Batch&) = delete;

    private:
        TextOut& t;
    };

    TextOut& write(const char* p, std::size_t n) {
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
    TextOut& operator<<(std::string_view s) { return write(s.data(), s.size()); }
    TextOut& operator<<(const char* s) { return write(s, std::strlen(s)); }
    TextOut& operator<<(const String& s) { return write(s.data(), s.size()); }
    TextOut& operator<<(char c) {
        if (depth != 0 && used < CAPACITY) buf[used++] = c;
        else write(&c, 1);
        return *this;
    }
    // n levels of four blanks; the usual shallow levels inline.
    TextOut& indent(unsigned int n) {
        if (n == 0) return *this;
        if (n <= MAX_INLINE_INDENT && depth != 0 && CAPACITY - used >= 4 * n) {
            copyShort(buf.get() + used, BLANKS, 4 * n);
            used += 4 * n;
            return *this;
        }
        return writeBlanks(n);
    }
    // Plain decimal.
    TextOut& writeUnsigned(unsigned long long v) {
        if (v < 100 && depth != 0 && CAPACITY - used >= 2) {
            // Temporary and label ids are mostly small.
            char* p = buf.get() + used;
            if (v >= 10) *p++ = static_cast<char>('0' + v / 10);
            *p++ = static_cast<char>('0' + v % 10);
            used = static_cast<std::size_t>(p - buf.get());
            return *this;
        }
        return writeDecimal(v);
    }
    TextOut& writeInt(long long v);

    void flush() {
        if (used == 0) return;
        os.write(buf.get(), static_cast<std::streamsize>(used));
        used = 0;
    }

private:
    TextOut& writeBlanks(unsigned int n);
    TextOut& writeDecimal(unsigned long long v);

    static constexpr std::size_t CAPACITY = 1 << 15;
    static constexpr unsigned int MAX_INLINE_INDENT = 4;
    static constexpr char BLANKS[4 * MAX_INLINE_INDENT + 1] = "                ";
    std::ostream& os;
    std::size_t used = 0;
    unsigned int depth = 0;
    std::unique_ptr<char[]> buf{new char[CAPACITY]};  // one allocation per emitter
};

}  // namespace ZOA

#endif
