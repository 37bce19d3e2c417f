/* cdgen_memory.h: memory for large tables: address space that is reserved once. Only pages that have been written take
 * memory. The space is filled with zeros and never moves. */
#ifndef CDGEN_CDGEN_MEMORY_H
#define CDGEN_CDGEN_MEMORY_H

#include <cstddef>

/* How a block is freed. */
enum class memory_owner {
    HEAP,     /* free() */
    RESERVED, /* give_back() */
    POOL      /* with the pool that it is a part of */
};

/* A table that grows to this many bytes or more moves to reserved address space. Only little has to be copied then, and
 * a partly used page does not matter. */
constexpr size_t RESERVE_FROM = size_t{1} << 18;

/* Tables are given back, while the image takes them, in pieces of this many bytes, whole pages. */
constexpr size_t PIECE = size_t{1} << 18;

/* A table in reserved address space gets this many bytes of pages at once. That takes less time than getting each page
 * when it is first written. */
constexpr size_t STRETCH = size_t{1} << 17;

/* A pool takes pages for chunks of this many bytes and more. */
constexpr size_t PAGED_CHUNK = size_t{1} << 16;

/* Takes zero-filled pages with at least this many bytes, which give_back() returns to the system at once, unlike
 * free(). Returns null, with errno, if there is no memory. */
char *take_pages(size_t size);
/* Reserves address space of at least this many bytes; *size is how many. Returns null where address space is scarce: on
 * 32-bit machines, and if the process has a memory limit. */
char *reserve(size_t needed, size_t *size);
/* Takes the pages of this part of a reservation from the system. If it cannot, each comes when it is first written. */
void take_reserved_pages(char *begin, size_t size);
/* Gives back all of a reservation but its first bytes, rounded up to whole pages; returns how many remain. */
size_t give_back(char *reserved, size_t size, size_t kept = 0);

#endif
