/* text_of_file.cpp: reads a text file. */

#include "cdef/support/text_of_file.h"

#include "cdef/support/failure.h"

#include <array>
#include <cerrno>
#include <cstddef>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

namespace cdef {

namespace {

[[noreturn]] void fail(const std::string &path) {
    throw failure(path + ": " + std::strerror(errno));
}

/* An open file, which closes itself. */
class open_file {
public:
    explicit open_file(int descriptor) : fd(descriptor) {}
    open_file(const open_file &) = delete;
    open_file &operator=(const open_file &) = delete;
    ~open_file() {
        close(fd);
    }

    const int fd;
};

std::string all_of(int fd, const std::string &name) {
    constexpr std::size_t STEP = 65536;
    std::string text;
    std::array<char, STEP> portion;
    for (;;) {
        ssize_t got = read(fd, portion.data(), portion.size());
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0)
            fail(name);
        if (got == 0)
            return text;
        text.append(portion.data(), static_cast<std::size_t>(got));
    }
}

} // namespace

std::string text_of_file(const std::string &path) {
    if (path == "-")
        return all_of(STDIN_FILENO, path);
    int fd = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0)
        fail(path);
    return all_of(open_file(fd).fd, path);
}

} // namespace cdef
