// TextSink: an output's text, gathered in a buffer and handed to its stream in large pieces.
#ifndef ZOA_SUPPORT_TEXT_SINK_H
#define ZOA_SUPPORT_TEXT_SINK_H

#include "support/short_copy.h"

#include <zoa/memmgr.h>

#include <cstddef>
#include <cstring>
#include <memory>
#include <ostream>
#include <string>
#include <string_view>

namespace ZOA {

// Outside a Batch every piece goes straight to the stream (or string) (ostream::write), so
// a caller writing to the same stream between two pieces keeps its place.
// Inside a Batch the pieces are appended to the buffer and written with one
// ostream::write per buffer-full and at the end of the outermost Batch: the
// same bytes, without a sentry and a formatting round trip per token. Numbers
// are formatted here (plain decimal), never with the stream's flags.
class TextSink {
public:
    explicit TextSink(std::ostream& os) : os(&os) {}
    // Appends to a string instead of a stream.
    explicit TextSink(std::string& into) : str(&into) {}
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
            put(p, n);
        } else if (n <= capacity - used) {
            copyShort(buf.get() + used, p, n);
            used += n;
        } else {
            overflow(p, n);
        }
        return *this;
    }
    TextSink& operator<<(std::string_view s) { return write(s.data(), s.size()); }
    TextSink& operator<<(const char* s) { return write(s, std::strlen(s)); }
    TextSink& operator<<(const String& s) { return write(s.data(), s.size()); }
    TextSink& operator<<(char c) {
        if (depth != 0 && used < capacity) buf[used++] = c;
        else write(&c, 1);
        return *this;
    }
    // n levels of four blanks; the usual shallow levels inline.
    TextSink& indent(unsigned int n) {
        if (n == 0) return *this;
        if (n <= MAX_INLINE_INDENT && depth != 0 && capacity - used >= 4 * n) {
            copyShort(buf.get() + used, BLANKS, 4 * n);
            used += 4 * n;
            return *this;
        }
        return writeBlanks(n);
    }
    // Plain decimal.
    TextSink& writeUnsigned(unsigned long long v) {
        if (v < 100 && depth != 0 && capacity - used >= 2) {
            // Temporary and label ids are mostly small.
            char* p = buf.get() + used;
            if (v >= 10) *p++ = static_cast<char>('0' + v / 10);
            *p++ = static_cast<char>('0' + v % 10);
            used = static_cast<std::size_t>(p - buf.get());
            return *this;
        }
        return writeNumber(v);
    }
    TextSink& writeInt(long long v) { return writeNumber(v); }

    // Hands what is gathered to the stream (not while a Hold keeps it).
    void flush() {
        if (used == 0 || held) return;
        put(buf.get(), used);
        used = 0;
    }

    // Inside a Batch, keeps everything written from here on in memory (the
    // buffer grows as needed) until the Hold ends, so that a piece written
    // later can still go in front of it. Offsets count from the Hold's start.
    class Hold {
    public:
        explicit Hold(TextSink& t) : t(t) {
            t.held = true;
            t.holdStart = t.used;
        }
        ~Hold() { t.held = false; }
        Hold(const Hold&) = delete;
        Hold& operator=(const Hold&) = delete;
        // Bytes held so far.
        std::size_t length() const { return t.used - t.holdStart; }
        // Drops what was held after the first `len` bytes.
        void truncate(std::size_t len) { t.used = t.holdStart + len; }
        // Moves the text from offset `tail` to the end in front of the text
        // from offset `at` (at <= tail).
        void moveToFront(std::size_t at, std::size_t tail) { t.moveToFront(t.holdStart + at, t.holdStart + tail); }

    private:
        TextSink& t;
    };

private:
    void put(const char* p, std::size_t n) {
        if (str) str->append(p, n);
        else os->write(p, static_cast<std::streamsize>(n));
    }
    TextSink& writeBlanks(unsigned int n);
    // For unsigned long long and long long (text_sink.cpp).
    template <class T> TextSink& writeNumber(T v);
    // A piece that does not fit: flushed around, or the buffer grows under a Hold.
    void overflow(const char* p, std::size_t n);
    void moveToFront(std::size_t at, std::size_t tail);

    static constexpr std::size_t CAPACITY = 1 << 15;
    static constexpr unsigned int MAX_INLINE_INDENT = 4;
    static constexpr char BLANKS[4 * MAX_INLINE_INDENT + 1] = "                ";
    std::ostream* os = nullptr;
    std::string* str = nullptr;
    std::size_t used = 0;
    std::size_t capacity = CAPACITY;
    unsigned int depth = 0;
    bool held = false;
    std::size_t holdStart = 0;
    std::unique_ptr<char[]> buf{new char[CAPACITY]};  // one allocation per sink, unless a Hold grows it
    std::unique_ptr<char[]> scratch;                  // moveToFront's copy of the tail
    std::size_t scratchSize = 0;
};

}  // namespace ZOA

#endif
