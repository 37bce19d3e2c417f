/* replace.cpp: a text file that is read and then replaced. */

#include "cdef/support/replace.h"

#include "cdef/support/failure.h"

#include <array>
#include <cerrno>
#include <cstddef>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <memory>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace cdef {

namespace {

[[noreturn]] void fail(const std::string &path) {
    throw failure(path + ": " + std::strerror(errno));
}

/* Closes itself. */
class descriptor {
public:
    explicit descriptor(int opened) : fd(opened) {}
    descriptor(const descriptor &) = delete;
    descriptor &operator=(const descriptor &) = delete;
    ~descriptor() {
        close();
    }

    int get() const {
        return fd;
    }
    /* False if closing fails. */
    bool close() {
        int closed = std::exchange(fd, -1);
        return closed < 0 || ::close(closed) == 0;
    }

private:
    int fd;
};

/* A new file beside another one. It is removed unless it replaces the other. */
class file_beside {
public:
    explicit file_beside(const std::string &target) : path(target + ".XXXXXX"), out(mkostemp(path.data(), O_CLOEXEC)) {
        if (out.get() < 0)
            fail(target);
    }
    file_beside(const file_beside &) = delete;
    file_beside &operator=(const file_beside &) = delete;
    ~file_beside() {
        if (!path.empty())
            unlink(path.c_str());
    }

    /* Sets the owner first, because that may change the mode. */
    void belong_as(const struct stat &other) {
        constexpr mode_t MODE_BITS = 07777;
        bool owned = fchown(out.get(), other.st_uid, other.st_gid) == 0;
        mode_t mode = other.st_mode & (owned ? MODE_BITS : MODE_BITS & ~static_cast<mode_t>(S_ISUID | S_ISGID));
        if (fchmod(out.get(), mode) != 0)
            fail(path);
    }
    void write(std::string_view text) {
        while (!text.empty()) {
            ssize_t written = ::write(out.get(), text.data(), text.size());
            if (written < 0 && errno != EINTR)
                fail(path);
            text.remove_prefix(written < 0 ? 0 : static_cast<std::size_t>(written));
        }
        if (fsync(out.get()) != 0 || !out.close())
            fail(path);
    }
    void take_place_of(const std::string &target) {
        if (rename(path.c_str(), target.c_str()) != 0)
            fail(target);
        path.clear();
    }

private:
    std::string path; /* empty: it has replaced the other */
    descriptor out;
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

/* The file that a path leads to. */
std::string target_of(const std::string &path) {
    std::unique_ptr<char, decltype(&std::free)> resolved(realpath(path.c_str(), nullptr), &std::free);
    if (resolved == nullptr)
        fail(path);
    return resolved.get();
}

} // namespace

std::string text_of_file(const std::string &path) {
    if (path == "-")
        return all_of(STDIN_FILENO, path);
    descriptor in(open(path.c_str(), O_RDONLY | O_CLOEXEC));
    if (in.get() < 0)
        fail(path);
    return all_of(in.get(), path);
}

void replace_file(const std::string &path, std::string_view before, std::string_view after) {
    std::string target = target_of(path);
    struct stat old = {};
    if (stat(target.c_str(), &old) != 0)
        fail(path);
    if (!S_ISREG(old.st_mode))
        throw failure(path + ": not a regular file, which could be replaced");
    if (access(target.c_str(), W_OK) != 0)
        fail(path);
    file_beside made(target);
    made.belong_as(old);
    made.write(after);
    if (text_of_file(target) != before)
        throw failure(path + ": it has been changed meanwhile, and is left as it is");
    made.take_place_of(target);
}

} // namespace cdef
