// The zoa tool's files: the whole input at once, and an output that remembers why a write failed.
#ifndef ZOA_TOOLS_ZOA_IO_H
#define ZOA_TOOLS_ZOA_IO_H

#include <streambuf>
#include <string>
#include <vector>

namespace zoa_tool {

// Reads the file ("-": standard input) into `text`. On failure returns false
// with the system's reason ("Is a directory") in `why`.
bool readWhole(const std::string& path, std::string& text, std::string& why);

// A buffered stream buffer over a file descriptor that keeps the first
// write error (errno) instead of losing it in a stream's failbit.
class FileOutput : public std::streambuf {
public:
    FileOutput() : buffer(1 << 16) { setp(buffer.data(), buffer.data() + buffer.size()); }
    ~FileOutput() override;
    FileOutput(const FileOutput&) = delete;
    FileOutput& operator=(const FileOutput&) = delete;

    // "-" is standard output. False with the reason on failure.
    bool open(const std::string& path, std::string& why);
    // Writes what is buffered and closes the file; false with the reason of
    // the first failed write (or of the close) otherwise.
    bool finish(std::string& why);

protected:
    int_type overflow(int_type c) override;
    int sync() override;

private:
    bool drain();

    std::vector<char> buffer;
    int fd = -1;
    bool ownsFd = false;
    int error = 0;  // errno of the first failure
};

}  // namespace zoa_tool

#endif
