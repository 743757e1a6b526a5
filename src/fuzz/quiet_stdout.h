// Keeps what the outputs write to standard output (DOT statistics, the assembly
// output's per-subprogram note) out of a campaign's log.
#ifndef ZOA_FUZZ_QUIET_STDOUT_H
#define ZOA_FUZZ_QUIET_STDOUT_H

#include <iostream>
#include <streambuf>

namespace ZOA::fuzz {

// Takes every character and keeps none: the outputs are written in full, but
// no growing string buffer is paid for.
class Discard : public std::streambuf {
protected:
    int_type overflow(int_type c) override { return traits_type::not_eof(c); }
    std::streamsize xsputn(const char*, std::streamsize n) override { return n; }
};

// std::cout discards while one of these lives.
struct QuietStdout {
    Discard sink;
    std::streambuf* saved = std::cout.rdbuf(&sink);
    QuietStdout() = default;
    QuietStdout(const QuietStdout&) = delete;
    QuietStdout& operator=(const QuietStdout&) = delete;
    ~QuietStdout() { std::cout.rdbuf(saved); }
};

}  // namespace ZOA::fuzz

#endif
