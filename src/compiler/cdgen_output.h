/* cdgen_output.h: the output file. */
#ifndef CDGEN_CDGEN_OUTPUT_H
#define CDGEN_CDGEN_OUTPUT_H

#include "compiler/cdgen_process.h"

#include <cstddef>
#include <optional>
#include <sys/types.h>

struct cdgen;

/* The mapped and locked output file. The destructor removes it unless it is finished. */
struct output_file {
    output_file() = default;
    output_file(const output_file &) = delete;
    output_file &operator=(const output_file &) = delete;
    ~output_file() {
        discard();
    }

    /* Cuts the mapped file to size bytes and closes it. The compilation fails if another program has shortened the file
     * meanwhile. It is then left as it is, except that it may have been extended with zeros. */
    void finish(off_t size);
    /* Unmaps, removes and closes the file if it is mapped. */
    void discard();
    /* Closes the file, or a descriptor below 0, and holds no signals any more. If one of them ends the program, an
     * unfinished output is removed first. */
    void close_output(int fd);

    int cdb_mapfile_fd = 0;
    void *cdb_mapfile_ptr = nullptr;
    size_t gross_file_size = 0; /* bytes pre-filled and mapped */
    unfinished_output begun;
    std::optional<held_signals> held; /* as long as the file is open, if it is a regular file */

private:
    bool has_at_least(size_t size) const;
    void unmap();
};

/* Creates the options' cdefname or empties it, fills it with at least size zero bytes and maps it. Only regular files
 * can be mapped; a pipe, which might block, is not even written to. */
char *get_mapfile(cdgen &cx, size_t size);

#endif
