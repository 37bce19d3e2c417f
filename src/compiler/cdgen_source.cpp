/* cdgen_source.cpp: reads the source line by line and finds each line's text. */

#include "compiler/cdgen_source.h"

#include "compiler/above_stdio.h"
#include "compiler/cdgen_context.h"

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

/* Copies up to `room` bytes of the source; 0 at its end. */
size_t read_some(cdgen &cx, char *to, size_t room) {
    source_file &source = cx.source.cdb_fp;
    if (source.fd < 0) {
        size_t copied = source.memory.copy(to, room);
        source.memory.remove_prefix(copied);
        return copied;
    }
    ssize_t n = 0;
    do
        n = read(source.fd, to, room);
    while (n < 0 && errno == EINTR);
    if (n < 0) {
        int error = errno;
        cdgen_error_exit(MSG_CANNOT_READ, cx.options.cdefsrc, strerror(error), 0, error);
    }
    return static_cast<size_t>(n);
}

/* Moves a line's beginning to the front of the buffer and reads what follows; false at the end of the source. */
bool refill(cdgen &cx) {
    source_file &source = cx.source.cdb_fp;
    size_t begun = source.end - source.pos;
    memmove(source.buffer.data(), source.buffer.data() + source.pos, begun);
    size_t n = read_some(cx, source.buffer.data() + begun, SOURCE_BUFFER - begun);
    source.pos = 0;
    source.end = begun + n;
    memset(source.buffer.data() + source.end, 0, SCAN_BLOCK);
    source.places.scan(source.buffer.data(), source.end);
    source.mark = source.places.marks.first_from(0);
    return n > 0;
}

/* Takes the next line, of this many bytes, from the buffer. */
source_line whole_line(cdgen &cx, size_t length) {
    source_file &source = cx.source.cdb_fp;
    size_t place = source.pos;
    char *begin = source.buffer.data() + place;
    if (source.mark < place)
        source.mark = source.places.marks.first_from(place);
    source.pos += length + 1;
    source.places.take_newline();
    ++cx.source.linenum;
    return {begin,
            begin + length,
            source.buffer.data() + source.end,
            source.buffer.data() + source.mark,
            &source.places.marks,
            place};
}

/* Copies the next bytes, which no newline follows, to inbuf. */
source_line cut_line(cdgen &cx, size_t length) {
    source_file &source = cx.source.cdb_fp;
    size_t place = source.pos;
    char *begin = cx.source.inbuf;
    memcpy(begin, source.buffer.data() + place, length);
    begin[length] = '\0';
    source.pos += length;
    ++cx.source.linenum;
    size_t mark = source.places.marks.first_from(place) - place;
    return {begin, begin + length, begin + length, begin + std::min(mark, length), &source.places.marks, place};
}

/* The line's first mark from p on; its end if there is none. */
char *next_mark(const source_line &line, const char *p) {
    size_t mark = line.marks->first_from(line.place + static_cast<size_t>(p - line.begin)) - line.place;
    return line.begin + std::min(mark, static_cast<size_t>(line.end - line.begin));
}

bool is_blank(char c) {
    return static_cast<unsigned char>(c) <= ' ' && (c == ' ' || c == '\t');
}

/* Where the text of a line that has marks ends: at its newline, its comment, or its NUL. Null for a line without text:
 * blanks, quotes and comments are not text. */
char *end_by_marks(const source_line &line, char *p) {
    bool text_seen = false;
    bool quoted = false;
    for (char *mark = line.mark;; p = mark + 1, mark = next_mark(line, p)) {
        while (!text_seen && is_blank(*p))
            ++p;
        text_seen = text_seen || p < std::min(mark, line.end);
        if (mark >= line.end)
            return text_seen ? line.end : nullptr;
        bool comment = *mark == '#' || (*mark == '/' && (mark[1] == '/' || mark[1] == '*'));
        if (*mark == '\0' || (comment && !quoted) || (*mark == '#' && !text_seen))
            return text_seen ? mark : nullptr;
        quoted = quoted != (*mark == '"');
        text_seen = text_seen || (*mark == '/' && !comment);
    }
}

} // namespace

void source_file::close() {
    if (fd >= 0)
        ::close(fd);
    fd = -1;
}

void open_source(cdgen &cx, const char *filename) {
    take_source(cx, filename, above_stdio(open(filename, O_RDONLY | O_CLOEXEC)));
}

void take_source(cdgen &cx, const char *filename, int fd) {
    source_file &source = cx.source.cdb_fp;
    source.fd = fd;
    struct stat st = {};
    if (source.fd < 0 || fstat(source.fd, &st) != 0)
        cdgen_error_exit(MSG_CANNOT_OPEN, filename, strerror(errno), 0, errno);
    source.device = st.st_dev;
    source.inode = st.st_ino;
    cx.framing.table_id = -1;
}

void take_source(cdgen &cx, std::string_view bytes) {
    cx.source.cdb_fp.close();
    cx.source.cdb_fp.memory = bytes;
    cx.framing.table_id = -1;
}

source_line next_line(cdgen &cx) {
    for (source_file &source = cx.source.cdb_fp;;) {
        size_t length = source.places.newline() - source.pos;
        if (length < LINE_MAX_CHARS)
            return whole_line(cx, length);
        if (source.places.newline() == scanned_places::NO_NEWLINE && source.places.list_more())
            continue;
        if (source.end - source.pos >= LINE_MAX_CHARS)
            return cut_line(cx, LINE_MAX_CHARS);
        if (!refill(cx) && source.end > 0)
            return cut_line(cx, source.end);
        if (source.end == 0)
            return {};
    }
}

attr_text text_of(const source_line &line) {
    char *begin = line.begin;
    while (is_blank(*begin))
        ++begin;
    char *end = line.mark < line.end ? end_by_marks(line, begin) : begin < line.end ? line.end : nullptr;
    if (end == nullptr)
        return {line.begin, begin, nullptr};
    while (is_blank(end[-1]) || end[-1] == '#') /* there is text in front */
        --end;
    *end = '\0';
    return {line.begin, begin, end};
}
