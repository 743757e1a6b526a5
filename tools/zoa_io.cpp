// The zoa tool's files, read and written through the system calls so that every failure has its reason.
#include "zoa_io.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace zoa_tool {

bool readWhole(const std::string& path, std::string& text, std::string& why) {
    int fd = path == "-" ? STDIN_FILENO : ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) {
        why = std::string("cannot open the file: ") + std::strerror(errno);
        return false;
    }
    char chunk[1 << 16];
    int failure = 0;
    for (;;) {
        ssize_t n = ::read(fd, chunk, sizeof chunk);
        if (n > 0) {
            text.append(chunk, static_cast<std::size_t>(n));
        } else if (n == 0) {
            break;
        } else if (errno != EINTR) {
            failure = errno;
            break;
        }
    }
    if (fd != STDIN_FILENO) ::close(fd);
    if (failure) why = std::string("cannot read the file: ") + std::strerror(failure);
    return failure == 0;
}

FileOutput::~FileOutput() {
    if (ownsFd && fd >= 0) ::close(fd);
}

bool FileOutput::open(const std::string& path, std::string& why) {
    if (path == "-") {
        fd = STDOUT_FILENO;
        return true;
    }
    fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (fd < 0) {
        why = std::string("cannot open the file for writing: ") + std::strerror(errno);
        return false;
    }
    ownsFd = true;
    return true;
}

bool FileOutput::drain() {
    const char* p = pbase();
    while (p < pptr() && !error) {
        ssize_t n = ::write(fd, p, static_cast<std::size_t>(pptr() - p));
        if (n >= 0) p += n;
        else if (errno != EINTR) error = errno;
    }
    // After a failure the rest is dropped: the stream reports it, and finish says why.
    setp(buffer.data(), buffer.data() + buffer.size());
    return !error;
}

FileOutput::int_type FileOutput::overflow(int_type c) {
    if (!drain()) return traits_type::eof();
    if (!traits_type::eq_int_type(c, traits_type::eof())) {
        *pptr() = traits_type::to_char_type(c);
        pbump(1);
    }
    return traits_type::not_eof(c);
}

int FileOutput::sync() { return drain() ? 0 : -1; }

bool FileOutput::finish(std::string& why) {
    drain();
    if (ownsFd && ::close(fd) != 0 && !error) error = errno;
    ownsFd = false;
    if (error) why = std::string("cannot write the file: ") + std::strerror(error);
    return !error;
}

}  // namespace zoa_tool
