/* replacement.cpp: writes a temporary file, and renames it over its target. */

#include "cdef/support/replacement.h"

#include "cdef/support/failure.h"
#include "cdef/support/interruption.h"
#include "cdef/support/text_of_file.h"
#include "text/hex.h"

#include <array>
#include <cerrno>
#include <climits>
#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <optional>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace cdef {

namespace {

constexpr std::string_view MARK = ".cdef-new";
constexpr int MOST_LINKS = 40;   /* as many links as Linux follows */
constexpr int MOST_TRIES = 1000; /* attempts to make a file that other programs make and remove */
constexpr mode_t NEW_MODE = 0644;
constexpr mode_t PRIVATE_MODE = 0600; /* until the contents are whole */

/* Thrown when a step fails; the caller, which knows the path, completes the message. */
struct step_failed {
    int error;
    std::string name = {}; /* of the file, if it is not the target */
};

void require(bool done) {
    if (!done)
        throw step_failed{errno};
}

/* A descriptor that closes itself. */
class descriptor {
public:
    explicit descriptor(int opened) : fd(opened) {}
    descriptor(descriptor &&other) noexcept : fd(std::exchange(other.fd, -1)) {}
    descriptor(const descriptor &) = delete;
    descriptor &operator=(const descriptor &) = delete;
    descriptor &operator=(descriptor &&) = delete;
    ~descriptor() {
        if (fd >= 0)
            ::close(fd);
    }

    bool is_open() const {
        return fd >= 0;
    }
    int get() const {
        return fd;
    }
    /* Closing is the last chance of a file system to report that it could not write. */
    void close() {
        require(::close(std::exchange(fd, -1)) == 0);
    }

private:
    int fd;
};

bool is_same_file(const struct stat &a, const struct stat &b) {
    return a.st_dev == b.st_dev && a.st_ino == b.st_ino;
}

/* True if a name leads to an open file. */
bool has_name(int fd, const std::string &name) {
    struct stat file = {}, named = {};
    return fstat(fd, &file) == 0 && lstat(name.c_str(), &named) == 0 && is_same_file(file, named);
}

/* Locks the file. Without waiting, returns false if another program has locked it. On a file system without locks,
 * every file counts as locked. */
bool lock(int fd, bool wait) {
    int how = LOCK_EX | (wait ? 0 : LOCK_NB);
    int done = 0;
    do
        done = flock(fd, how);
    while (done != 0 && errno == EINTR);
    return done == 0 || errno != EWOULDBLOCK;
}

/* Removes a temporary file that no program has locked. If a program has locked it, waits for that. Does nothing if the
 * file is gone. */
void clear_away(const std::string &name, bool wait) {
    descriptor old(open(name.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
    if (!old.is_open()) {
        if (errno != ENOENT)
            throw step_failed{errno, name};
        return;
    }
    struct stat file = {};
    require(fstat(old.get(), &file) == 0);
    if (!S_ISREG(file.st_mode))
        throw step_failed{EEXIST, name};
    if (lock(old.get(), wait) && has_name(old.get(), name))
        require(unlink(name.c_str()) == 0 || errno == ENOENT);
}

void write_all(int fd, std::string_view contents) {
    while (!contents.empty()) {
        ssize_t written = write(fd, contents.data(), contents.size());
        if (written < 0 && errno == EINTR)
            continue;
        if (written == 0)
            errno = ENOSPC;
        require(written > 0);
        contents.remove_prefix(static_cast<size_t>(written));
    }
}

std::string directory_of(const std::string &path) {
    size_t slash = path.rfind('/');
    return slash == path.npos ? "" : path.substr(0, slash + 1);
}

/* The temporary file while it exists; removes itself unless it is renamed. */
class temporary_file {
public:
    /* Does not make the file if it exists already. */
    temporary_file(std::string called, mode_t mode)
        : name(std::move(called)), file(open(name.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode)) {
        require(file.is_open() || errno == EEXIST);
    }
    temporary_file(const temporary_file &) = delete;
    temporary_file &operator=(const temporary_file &) = delete;
    ~temporary_file() {
        if (is_locked && is_mine())
            unlink(name.c_str());
    }

    /* False if the file existed, or if another program mistakes it for that of a killed program and removes it. */
    bool is_made() {
        is_locked = file.is_open() && lock(file.get(), false);
        return is_locked && is_mine();
    }
    void fill(std::string_view contents, const std::optional<struct stat> &old, bool sync) const {
        write_all(file.get(), contents);
        if (old)
            adopt(*old);
        require(!sync || fsync(file.get()) == 0);
        descriptor copy(dup(file.get())); /* some file systems report a failed write when a descriptor is closed; */
        require(copy.is_open());          /* the file itself stays open, and so locked */
        copy.close();
    }
    void rename_to(const std::string &target) const {
        if (!is_mine())
            throw step_failed{EEXIST};
        require(rename(name.c_str(), target.c_str()) == 0);
    }

private:
    bool is_mine() const {
        return has_name(file.get(), name);
    }
    /* Sets the owner first, because changing it may clear bits of the mode. Not every user may change it; then nobody
     * gets the rights of the new owner. */
    void adopt(const struct stat &old) const {
        constexpr mode_t MODE = 07777, OWNERS_RIGHTS = S_ISUID | S_ISGID;
        struct stat mine = {};
        require(fstat(file.get(), &mine) == 0);
        bool other = mine.st_uid != old.st_uid || mine.st_gid != old.st_gid;
        bool differs = other && fchown(file.get(), old.st_uid, old.st_gid) != 0;
        if (differs) [[maybe_unused]]
            int group_at_least = fchown(file.get(), static_cast<uid_t>(-1), old.st_gid);
        require(fchmod(file.get(), old.st_mode & (differs ? MODE & ~OWNERS_RIGHTS : MODE)) == 0);
    }

    std::string name;
    descriptor file;
    bool is_locked = false; /* only then may the name be removed, or given to another file */
};

/* The file that will be replaced, if it exists. */
std::optional<struct stat> existing(const std::string &target) {
    struct stat old = {};
    if (stat(target.c_str(), &old) != 0) {
        require(errno == ENOENT);
        return std::nullopt;
    }
    if (S_ISDIR(old.st_mode))
        throw step_failed{EISDIR};
    if (!S_ISREG(old.st_mode))
        throw failure("not a regular file");
    return old;
}

void sync_directory(const std::string &target) {
    std::string place = directory_of(target);
    descriptor directory(open(place.empty() ? "." : place.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    require(directory.is_open() && fsync(directory.get()) == 0);
}

/* Refuses a file that this user may not write to, even if the directory would allow to replace it, and one with other
 * contents. */
void require_contents(const std::string &target, std::string_view contents) {
    require(access(target.c_str(), W_OK) == 0);
    if (text_of_file(target) != contents)
        throw failure("it has been changed in the meantime");
}

/* False if there is a temporary file already. */
bool replaced_at_once(const std::string &target, std::string_view contents, const replacement_options &options) {
    uninterrupted work;
    std::optional<struct stat> old = existing(target);
    temporary_file temporary(temporary_of(target), old ? PRIVATE_MODE : NEW_MODE);
    if (!temporary.is_made())
        return false;
    temporary.fill(contents, old, options.sync);
    if (options.before)
        require_contents(target, *options.before);
    if (options.must_be_new && existing(target))
        throw failure("it has been made in the meantime");
    temporary.rename_to(target);
    return true;
}

void replace_target(const std::string &target, std::string_view contents, const replacement_options &options) {
    for (int tries = 0; !replaced_at_once(target, contents, options); ++tries) {
        if (tries == MOST_TRIES)
            throw step_failed{EEXIST};
        clear_away(temporary_of(target), true);
    }
    if (options.sync)
        sync_directory(target);
}

/* Writing beyond a limit for the size of files then fails with an error. The signal would end the program with the
 * temporary file in place. */
void ignore_size_limit_signal() {
    signal(SIGXFSZ, SIG_IGN);
}

/* Enough to distinguish names with the same beginning. */
std::uint64_t hash_of(std::string_view text) {
    std::uint64_t hash = 14695981039346656037U; /* FNV-1a */
    for (char c : text)
        hash = (hash ^ static_cast<unsigned char>(c)) * 1099511628211U;
    return hash;
}

} // namespace

std::string target_of(const std::string &path) {
    std::string target = path;
    for (int links = 0; links < MOST_LINKS; ++links) {
        std::array<char, PATH_MAX> text;
        ssize_t length = readlink(target.c_str(), text.data(), text.size());
        if (length < 0 || static_cast<size_t>(length) == text.size()) /* not a link; other errors are reported when it
                                                                       * is opened */
            return target;
        std::string_view leads_to(text.data(), static_cast<size_t>(length));
        target = (leads_to.starts_with('/') ? "" : directory_of(target)).append(leads_to);
    }
    throw failure(path + ": " + std::strerror(ELOOP));
}

std::string temporary_of(const std::string &target) {
    std::string place = directory_of(target);
    std::string name = target.substr(place.size());
    if (name.size() + 1 + MARK.size() > NAME_MAX) {
        std::string end = "-" + text::hex(hash_of(name));
        name = name.substr(0, NAME_MAX - 1 - MARK.size() - end.size()) + end;
    }
    return place.append(".").append(name).append(MARK);
}

void remove_remains(const std::string &target) {
    try {
        clear_away(temporary_of(target), false);
    } catch (const step_failed &) { /* an error is reported when the name is needed */
    }
}

void sync_file(const std::string &path) {
    try {
        descriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
        require(file.is_open() && fsync(file.get()) == 0);
        sync_directory(target_of(path));
    } catch (const step_failed &step) {
        throw failure(path + ": cannot write: " + std::strerror(step.error));
    }
}

void replace_file(const std::string &path, std::string_view contents, const replacement_options &options) {
    std::string target = target_of(path);
    ignore_size_limit_signal();
    try {
        replace_target(target, contents, options);
    } catch (const step_failed &step) {
        throw failure(path + ": cannot write: " + (step.name.empty() ? "" : step.name + ": ") +
                      std::strerror(step.error));
    } catch (const failure &e) {
        throw failure(path + ": cannot write: " + e.what());
    }
}

} // namespace cdef
