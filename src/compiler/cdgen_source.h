/* cdgen_source.h: the source while it is read. */
#ifndef CDGEN_CDGEN_SOURCE_H
#define CDGEN_CDGEN_SOURCE_H

#include "language/limits.h"

#include <array>
#include <cstddef>
#include <string_view>
#include <sys/types.h>

constexpr size_t SOURCE_BUFFER = 65536; /* bytes asked for by one read */

/* The source while it is read; closes itself. */
struct source_file {
    source_file() = default;
    source_file(const source_file &) = delete;
    source_file &operator=(const source_file &) = delete;
    ~source_file() {
        close();
    }

    void close();

    int fd = -1;             /* -1: the source is in memory */
    std::string_view memory; /* of such a source, what has not been read */
    dev_t device = 0;
    ino_t inode = 0;
    size_t pos = 0;           /* of the first byte of buffer not yet taken */
    size_t end = 0;           /* of the first byte of buffer not yet filled, which is a NUL */
    char *mark = nullptr;     /* in buffer, and */
    char *cut_mark = nullptr; /* in a cut line: what may end a text and has not been looked at */
    std::array<char, SOURCE_BUFFER + 1> buffer;
};

struct source_reader {
    source_file cdb_fp;
    char inbuf[LINE_MAX_CHARS + 2] = {}; /* a line that has no newline after it in the buffer */
    int linenum = 0;                     /* reads made; a line of more than LINE_MAX_CHARS takes several */
    int linepos = 0;                     /* column, from 1 */
};

#endif
