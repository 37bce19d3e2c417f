/* cdgen_memory.cpp: reserved address space. */

#include "compiler/cdgen_memory.h"

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <sys/mman.h>
#include <sys/resource.h>
#include <unistd.h>

#ifndef MAP_NORESERVE
#define MAP_NORESERVE 0
#endif

namespace {

constexpr bool PLENTIFUL = sizeof(size_t) > sizeof(uint32_t); /* address space */
constexpr uint64_t WHOLE_TABLE = uint64_t{1} << 32;           /* in bytes: the largest size that a table's offsets allow
                                                               */

bool is_limited() {
    struct rlimit limit = {};
    return getrlimit(RLIMIT_AS, &limit) != 0 || limit.rlim_cur != RLIM_INFINITY;
}

} // namespace

char *take_pages(size_t size) {
    void *pages = mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    return pages == MAP_FAILED ? nullptr : static_cast<char *>(pages);
}

char *reserve(size_t needed, size_t *size) {
    if (!PLENTIFUL || needed > SIZE_MAX / 2 || is_limited())
        return nullptr;
    int before = errno;
    *size = std::max(static_cast<size_t>(WHOLE_TABLE), 2 * needed);
    void *space = mmap(nullptr, *size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    errno = before;
    return space == MAP_FAILED ? nullptr : static_cast<char *>(space);
}

void take_reserved_pages([[maybe_unused]] char *begin, [[maybe_unused]] size_t size) {
#ifdef MADV_POPULATE_WRITE
    int before = errno;
    madvise(begin, size, MADV_POPULATE_WRITE);
    errno = before;
#endif
}

size_t give_back(char *reserved, size_t size, size_t kept) {
    static const auto page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    size_t remaining = std::min(size, (kept + page - 1) / page * page);
    if (remaining < size)
        munmap(reserved + remaining, size - remaining);
    return remaining;
}
