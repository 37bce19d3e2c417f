/* cdgen_output.h: the output file. */
#ifndef CDGEN_CDGEN_OUTPUT_H
#define CDGEN_CDGEN_OUTPUT_H

#include "compiler/cdgen_process.h"

#include <cstddef>
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

    /* Unmaps the file, cuts it to size bytes and closes it. If another program has shortened the file meanwhile, it is
     * left as it is and the compilation fails. */
    void finish(off_t size);
    /* Unmaps, removes and closes the file if it is mapped. */
    void discard();

    int cdb_mapfile_fd = 0;
    void *cdb_mapfile_ptr = nullptr;
    size_t gross_file_size = 0; /* bytes pre-filled and mapped */
    unfinished_output begun;

private:
    void unmap();
    void close_mapfile();
};

/* Creates the options' cdefname or empties it, fills it with at least size zero bytes and maps it. Only regular files
 * can be mapped; a pipe, which might block, is not even written to. */
char *get_mapfile(cdgen &cx, size_t size);

#endif
