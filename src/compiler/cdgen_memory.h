/* cdgen_memory.h: memory of large tables: address space that is reserved once. What is written to takes memory; it is 0
 * before, and never moves. */
#ifndef CDGEN_CDGEN_MEMORY_H
#define CDGEN_CDGEN_MEMORY_H

#include <cstddef>

/* Who gives a block back. */
enum class memory_owner {
    HEAP,     /* free() */
    RESERVED, /* give_back() */
    POOL      /* the pool that it is a part of */
};

/* A table that grows to so many bytes or more moves to reserved address space: that is one copy of little, and a page
 * more or less does not count. */
constexpr size_t RESERVE_FROM = size_t{1} << 18;

/* Address space of at least as many bytes, *size of them; null where there is none to spare: on machines of 32 bits,
 * and where the process has been given a limit. */
char *reserve(size_t needed, size_t *size);
/* Gives back all of a reservation but its first bytes, rounded up to whole pages; returns how many remain. */
size_t give_back(char *reserved, size_t size, size_t kept = 0);

#endif
