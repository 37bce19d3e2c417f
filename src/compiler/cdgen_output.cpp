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

/* A descriptor that is closed unless it is passed on. Closing it releases the lock, so after that no signal may remove
 * the file. */
struct output_fd {
    explicit output_fd(int opened) : fd(opened) {}
    output_fd(const output_fd &) = delete;
    output_fd &operator=(const output_fd &) = delete;
    ~output_fd() {
        if (fd < 0)
            return;
        set_unfinished_output(nullptr);
        close(fd);
    }
    output_fd(output_fd &&other) noexcept : fd(other.release()) {}
    output_fd &operator=(output_fd &&) = delete;
    int release() {
        return std::exchange(fd, -1);
    }

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

/* Opens the output without changing it; st receives its status. A regular file is locked. If another compiler failed
 * and removed the file before it was locked, it is closed again. Signals are held back so that none leaves an empty
 * file that opening may have created. */
output_fd open_once(cdgen &cx, struct stat &st) {
    refuse_own_files(cx);
    held_signals until_begun;
    output_fd out(above_stdio(open(cx.options.cdefname, O_RDWR | O_CREAT | O_CLOEXEC, 0644)));
    if (out.fd < 0)
        cannot(MSG_CANNOT_CREATE, errno);
    if (fstat(out.fd, &st) != 0)
        cannot(MSG_CANNOT_MAP, errno);
    if (!S_ISREG(st.st_mode))
        return out;
    lock_output(out.fd);
    if (fstat(out.fd, &st) != 0) /* its size while it is locked */
        cannot(MSG_CANNOT_MAP, errno);
    cx.output.begun = {cx.options.cdefname, st.st_dev, st.st_ino};
    if (!cx.output.begun.has_its_name())
        return output_fd(-1);
    if (st.st_size == 0)
        set_unfinished_output(&cx.output.begun);
    return out;
}

/* Emptied only once it is locked and known not to be a file that the program uses. */
output_fd create_output(cdgen &cx) {
    for (int tries = 0; tries < MOST_TRIES; ++tries) {
        struct stat st = {};
        output_fd out = open_once(cx, st);
        if (out.fd < 0)
            continue;
        if (S_ISREG(st.st_mode))
            set_unfinished_output(&cx.output.begun);
        if (S_ISREG(st.st_mode) && st.st_size > 0 && ftruncate(out.fd, 0) != 0)
            cannot(MSG_CANNOT_CREATE, errno);
        return out;
    }
    cannot(MSG_CANNOT_CREATE, "other programs keep replacing it");
}

/* Writes 1024-byte zero blocks until there are at least size bytes, many of them at a time. */
size_t prefill(int fd, size_t size) {
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
    }
    return gross;
}

} // namespace

char *get_mapfile(cdgen &cx, size_t size) {
    output_fd out(create_output(cx));
    struct stat st = {};
    if (fstat(out.fd, &st) == 0 && !S_ISFIFO(st.st_mode))
        cx.output.gross_file_size = prefill(out.fd, size);
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
    return static_cast<char *>(mapped);
}

void output_file::finish(off_t size) {
    unmap();
    struct stat st = {};
    bool cut = fstat(cdb_mapfile_fd, &st) == 0 && std::cmp_less(st.st_size, gross_file_size);
    [[maybe_unused]] int truncated = cut ? 0 : ftruncate(cdb_mapfile_fd, size);
    close_mapfile();
    if (cut)
        cannot(MSG_CANNOT_MAP, CUT_OUTPUT);
}

void output_file::discard() {
    if (cdb_mapfile_fd <= 0)
        return;
    unmap();
    begun.remove(); /* while it is locked, because afterwards it may belong to another compiler */
    close_mapfile();
}

void output_file::close_mapfile() {
    set_unfinished_output(nullptr);
    close(std::exchange(cdb_mapfile_fd, 0));
}

void output_file::unmap() {
    if (cdb_mapfile_ptr != nullptr)
        munmap(std::exchange(cdb_mapfile_ptr, nullptr), gross_file_size);
}
