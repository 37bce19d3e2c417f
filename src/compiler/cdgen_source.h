/* cdgen_source.h: the source file, its lines and their texts. */
#ifndef CDGEN_CDGEN_SOURCE_H
#define CDGEN_CDGEN_SOURCE_H

#include "compiler/cdgen_scan.h"
#include "language/limits.h"
#include "language/name_pattern.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <string_view>
#include <sys/types.h>

struct cdgen;

constexpr size_t SOURCE_BUFFER = SCAN_BUFFER; /* bytes asked for by one read */

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
    std::string_view memory; /* the rest of such a source, which has not been read */
    dev_t device = 0;
    ino_t inode = 0;
    size_t pos = 0;  /* of the first byte of buffer not yet taken */
    size_t end = 0;  /* of the first byte of buffer not yet filled */
    size_t mark = 0; /* the first of places.marks that is not before the latest line; end before the first line */
    scanned_places places;
    std::array<char, SOURCE_BUFFER + SCAN_BLOCK> buffer;
};

struct source_reader {
    source_file cdb_fp;
    char inbuf[LINE_MAX_CHARS + SCAN_BLOCK] = {}; /* a line that has no newline after it in the buffer */
    int64_t linenum = 0;                          /* reads made; a line of more than LINE_MAX_CHARS takes several */
    const char *latest_line = nullptr;            /* the beginning of the latest attribute line */
    const char *latest_point = nullptr;           /* its value, or its name while the value is not known */

    void point_at(const char *line, const char *point) {
        latest_line = line;
        latest_point = point;
    }
    /* The column that has been reached, from 1. */
    int linepos() const {
        return 1 + static_cast<int>(latest_point - latest_line);
    }
    /* The number as messages show it. */
    int shown_line() const {
        return static_cast<int>(std::min<int64_t>(linenum, std::numeric_limits<int>::max()));
    }
};

/* So many bytes after a line's text may be read, whatever they are: names and values are read by words. */
constexpr size_t READ_AHEAD = language::name_pattern::WIDTH;
static_assert(READ_AHEAD < SCAN_BLOCK, "the read buffer and inbuf have SCAN_BLOCK bytes more than a line");

/* A line's text. The byte at its end may be overwritten, and READ_AHEAD bytes from there on may be read. */
struct attr_text {
    char *line; /* where the line begins */
    char *name; /* the first character that is not a blank */
    char *end;
};

/* A line in the read buffer; its end is the place of its newline. A line without a newline is copied to inbuf. */
struct source_line {
    char *begin; /* null: the end of the source */
    char *end;
    const char *read_end; /* of the bytes that follow in the buffer */
    char *mark;           /* the first mark; at or after end if the line has none */
    const place_set *marks;
    size_t place; /* of begin among them */
};

/* Fatal if the source cannot be opened or, later, read. */
void open_source(cdgen &cx, const char *filename);

/* The same for an open descriptor, or -1 with errno. The context owns it from now on. */
void take_source(cdgen &cx, const char *filename, int fd);

/* The same for a source in memory, which must remain valid until it has been read. */
void take_source(cdgen &cx, std::string_view bytes);

/* Returns the next line, or the next LINE_MAX_CHARS bytes of a longer one, and counts it. It is valid until the next
 * call. */
source_line next_line(cdgen &cx);

/* A line's text: the line without its comment, and without trailing blanks and hash signs, even quoted ones. Its end is
 * null for a line without text. */
attr_text find_text(const source_line &line);

/* The same; writes a NUL at the text's end. */
attr_text text_of(const source_line &line);

#endif
