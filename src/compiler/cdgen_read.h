/* cdgen_read.h: the steps of reading a source, for who takes them one by one. */
#ifndef CDGEN_CDGEN_READ_H
#define CDGEN_CDGEN_READ_H

#include "compiler/cdgen_attr.h"

/* A line where it stands: the place of its newline is its end. What has none is copied to where it may be cut. */
struct source_line {
    char *begin; /* null: there is no more */
    char *end;
    char *&mark; /* the first mark from begin on; at or behind end if the line has none */
};

/* Fatal if the source cannot be opened or, later, read. */
void open_source(cdgen &cx, const char *filename);

/* The same for a descriptor that is open, or -1 with errno; it is the context's from now on. */
void take_source(cdgen &cx, const char *filename, int fd);

/* The same for a source in memory, which must stay until it has been read. */
void take_source(cdgen &cx, std::string_view bytes);

/* The next line, or the next 254 characters of a longer one, and counts it. It stays until the next call. */
source_line next_line(cdgen &cx);

/* A line's text: what is left without comment, and without blanks and hash signs at the end, even quoted ones. Its end
 * is null for a line without text. */
attr_text text_of(const source_line &line);

/* A header, if it has no blank in front, or an attribute line, which is taken apart. */
void take_line(cdgen &cx, const attr_text &text);

#endif
