/* memory.cpp: gives freed memory back to the system, with the functions that only glibc has. */

#include "cdef/support/memory.h"

#include <cstdlib> // which says whose C library this is

#if defined(__GLIBC__)
#include <malloc.h>
#endif

namespace cdef {

#if defined(__GLIBC__)

namespace {

constexpr int LARGE = 128 * 1024; /* where the C library begins, too */

} // namespace

void give_back_freed_memory() {
    malloc_trim(0);
}

void give_back_large_blocks() {
    mallopt(M_MMAP_THRESHOLD, LARGE);
}

#else

void give_back_freed_memory() {}

void give_back_large_blocks() {}

#endif

} // namespace cdef
