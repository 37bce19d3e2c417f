/* memory.h: memory that has been freed goes back to the system sooner than the C library gives it back. */
#ifndef CDEF_SUPPORT_MEMORY_H
#define CDEF_SUPPORT_MEMORY_H

namespace cdef {

/* Gives back what has been freed so far between blocks that are still used. */
void give_back_freed_memory();

/* From now on, gives back each large block when it is freed. By default, the C library keeps blocks as large as those
 * that have been freed before. */
void give_back_large_blocks();

} // namespace cdef

#endif
