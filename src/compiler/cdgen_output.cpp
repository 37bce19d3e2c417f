/* cdgen_output.cpp: creates, locks, fills and maps the output file; finishes or removes it. */

#include "compiler/cdgen_output.h"

#include "compiler/above_stdio.h"
#include "compiler/cdgen_context.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <unistd.h>
#include <utility>

namespace {

constexpr size_t PREFILL_BLOCK = 1024;
constexpr int MOST_TRIES = 16; /* attempts to open a file that other programs remove or replace */

[[noreturn]] void cannot(message_id what, const char *reason) {
    bld_error_exit(what, reason, nullptr, 1);
}

[[noreturn]] void cannot(message_id what, int error) {
    cannot(what, strerror(error));
}

/* A descriptor of the output that is closed unless it is passed on. */
struct output_fd {
    output_fd(output_file &owner, int opened) : file(&owner), fd(opened) {}
    output_fd(const output_fd &) = delete;
    output_fd &operator=(const output_fd &) = delete;
    ~output_fd() {
        if (file != nullptr)
            file->close_output(fd);
    }
    output_fd(output_fd &&other) noexcept : file(std::exchange(other.file, nullptr)), fd(other.fd) {}
    output_fd &operator=(output_fd &&) = delete;
    int release() {
        file = nullptr;
        return fd;
    }

    output_file *file;
    int fd;
};

bool is_stream(const struct stat &file, int stream) {
    struct stat st = {};
    return S_ISREG(file.st_mode) && fstat(stream, &st) == 0 && st.st_dev == file.st_dev && st.st_ino == file.st_ino;
}

/* Called before the output is opened, because the inode number of a source that has been deleted in the meantime may be
 * used for the new file. */
void refuse_own_files(cdgen &cx) {
    struct stat st = {};
    if (stat(cx.options.cdefname, &st) != 0)
        return;
    if (st.st_dev == cx.source.cdb_fp.device && st.st_ino == cx.source.cdb_fp.inode)
        bld_error_exit(MSG_CANNOT_CREATE, "it is the source file", nullptr, 1);
    if (cx.options.debugLevel > 0 && (is_stream(st, STDOUT_FILENO) || is_stream(st, STDERR_FILENO)))
        bld_error_exit(MSG_CANNOT_CREATE, "traces go there", nullptr, 1);
}

/* Locks the file against other compilers until it is closed. On a file system without locks it does nothing. */
void lock_output(int fd) {
    if (flock(fd, LOCK_EX | LOCK_NB) == 0)
        return;
    if (errno == EWOULDBLOCK)
        cannot(MSG_CANNOT_CREATE, "another program has locked it");
    if (errno != EOPNOTSUPP && errno != ENOSYS && errno != ENOLCK && errno != EINVAL)
        cannot(MSG_CANNOT_CREATE, errno);
}

/* Locks the file. Returns false if it has lost its name before, because another compiler failed and removed it. st
 * receives its status while it is locked. */
bool take_output(output_file &file, const char *name, int fd, struct stat &st) {
    lock_output(fd);
    file.begun = {name, st.st_dev, st.st_ino};
    return stat(name, &st) == 0 && st.st_dev == file.begun.device && st.st_ino == file.begun.inode;
}

/* Opens the output without changing it; st receives its status. A regular file is locked. Returns no file if it is to
 * be opened again. Signals are held back from before it is created. */
output_fd open_once(cdgen &cx, struct stat &st) {
    refuse_own_files(cx);
    cx.output.held.emplace();
    output_fd out(cx.output, above_stdio(open(cx.options.cdefname, O_RDWR | O_CREAT | O_CLOEXEC, 0644)));
    if (out.fd < 0)
        cannot(MSG_CANNOT_CREATE, errno);
    if (fstat(out.fd, &st) != 0)
        cannot(MSG_CANNOT_MAP, errno);
    if (!S_ISREG(st.st_mode))
        cx.output.held.reset(); /* it may block, and is not removed */
    else if (!take_output(cx.output, cx.options.cdefname, out.fd, st))
        return {cx.output, -1};
    return out;
}

/* Empties a file that contains something, unless a signal is about to end the program. */
bool emptied(const output_file &file, int fd, const struct stat &st) {
    if (st.st_size > 0 && file.held->will_end_program())
        return false;
    set_unfinished_output(&file.begun);
    if (st.st_size > 0 && ftruncate(fd, 0) != 0)
        cannot(MSG_CANNOT_CREATE, errno);
    return true;
}

/* Emptied only once it is locked and known not to be a file that the program uses. */
output_fd create_output(cdgen &cx, struct stat &st) {
    for (int tries = 0; tries < MOST_TRIES; ++tries) {
        output_fd out = open_once(cx, st);
        if (out.fd >= 0 && (!S_ISREG(st.st_mode) || emptied(cx.output, out.fd, st)))
            return out;
    }
    cannot(MSG_CANNOT_CREATE, "other programs keep replacing it");
}

/* Writes 1024-byte zero blocks until there are at least size bytes, many of them at a time. Gives up if a signal is
 * about to end the program; nothing is printed then. */
size_t prefill(const output_file &file, int fd, size_t size) {
    constexpr size_t BLOCKS_AT_ONCE = 512;
    static const std::array<char, PREFILL_BLOCK> zeros = {};
    std::array<iovec, BLOCKS_AT_ONCE> blocks;
    size_t gross = (size + PREFILL_BLOCK - 1) / PREFILL_BLOCK * PREFILL_BLOCK;
    std::fill_n(blocks.begin(), std::min(blocks.size(), gross / PREFILL_BLOCK),
                iovec{const_cast<char *>(zeros.data()), zeros.size()});
    for (size_t written = 0; written < gross;) {
        size_t left = gross - written;
        blocks[0].iov_len = (left - 1) % PREFILL_BLOCK + 1; /* the rest of a block after a short write */
        size_t count = std::min(blocks.size(), (left - 1) / PREFILL_BLOCK + 1);
        ssize_t n = writev(fd, blocks.data(), static_cast<int>(count));
        if (n < 0 && errno == EINTR)
            continue;
        if (n <= 0)
            cannot(MSG_CANNOT_CREATE, n < 0 ? errno : ENOSPC);
        written += static_cast<size_t>(n);
        if (written < gross && file.held && file.held->will_end_program())
            cannot(MSG_CANNOT_CREATE, EINTR);
    }
    return gross;
}

/* What another program changes when it shortens the image, even if the file is extended with zeros afterwards: the last
 * byte that is not zero. And what changes if it then writes something else: the beginning. */
class cut_mark {
public:
    cut_mark(const char *mapped, size_t size) : image(mapped) {
        memcpy(beginning.data(), image, std::min(beginning.size(), size));
        for (last = size; last > 0 && image[last - 1] == 0;)
            --last;
        last_byte = last > 0 ? image[last - 1] : '\0';
    }
    bool is_there() const {
        return memcmp(image, beginning.data(), std::min(beginning.size(), last)) == 0 &&
               (last == 0 || image[last - 1] == last_byte);
    }

private:
    const char *image;
    std::array<char, sizeof(orb_cdb_header_t)> beginning = {};
    size_t last = 0; /* the number of bytes up to the last one that is not zero */
    char last_byte = 0;
};

} // namespace

char *get_mapfile(cdgen &cx, size_t size) {
    struct stat st = {};
    output_fd out(create_output(cx, st));
    if (!S_ISFIFO(st.st_mode))
        cx.output.gross_file_size = prefill(cx.output, out.fd, size);
    if (fstat(out.fd, &st) != 0)
        cannot(MSG_CANNOT_MAP, errno);
    if (S_ISREG(st.st_mode) && std::cmp_less(st.st_size, cx.output.gross_file_size))
        cannot(MSG_CANNOT_MAP, CUT_OUTPUT);
    size_t length = S_ISREG(st.st_mode) ? cx.output.gross_file_size : 0;
    void *mapped = mmap(nullptr, length, PROT_READ | PROT_WRITE, MAP_SHARED, out.fd, 0);
    if (mapped == MAP_FAILED)
        cannot(MSG_CANNOT_MAP, errno);
    cx.output.cdb_mapfile_fd = out.release();
    cx.output.cdb_mapfile_ptr = mapped;
    cx.output.begun.fd = cx.output.cdb_mapfile_fd;
    cx.output.begun.size = static_cast<off_t>(length);
    return static_cast<char *>(mapped);
}

void output_file::finish(off_t size) {
    auto final_size = static_cast<size_t>(size);
    cut_mark mark(static_cast<char *>(cdb_mapfile_ptr), final_size);
    bool whole = has_at_least(gross_file_size);
    if (whole) {
        begun.size = size;
        [[maybe_unused]] int truncated = ftruncate(cdb_mapfile_fd, size);
        whole = mark.is_there() && has_at_least(final_size);
    }
    unmap();
    if (!whole)
        set_unfinished_output(nullptr); /* the file now belongs to another program */
    close_output(std::exchange(cdb_mapfile_fd, 0));
    if (!whole)
        cannot(MSG_CANNOT_MAP, CUT_OUTPUT);
}

void output_file::discard() {
    if (cdb_mapfile_fd <= 0)
        return;
    unmap();
    begun.remove(); /* while it is locked, because afterwards it may belong to another compiler */
    close_output(std::exchange(cdb_mapfile_fd, 0));
}

void output_file::close_output(int fd) {
    if (held && held->will_end_program())
        remove_unfinished_output(); /* while it is locked */
    set_unfinished_output(nullptr);
    if (fd >= 0)
        close(fd);
    held.reset();
}

/* True if the size is not known, too. */
bool output_file::has_at_least(size_t size) const {
    struct stat st = {};
    return fstat(cdb_mapfile_fd, &st) != 0 || !std::cmp_less(st.st_size, size);
}

void output_file::unmap() {
    if (cdb_mapfile_ptr != nullptr)
        munmap(std::exchange(cdb_mapfile_ptr, nullptr), gross_file_size);
}
