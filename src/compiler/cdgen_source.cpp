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
    source.mark = source.places.marks.distance_from(0);
    return n > 0;
}

/* Takes the next line, of this many bytes, from the buffer. */
source_line whole_line(cdgen &cx, size_t length) {
    source_file &source = cx.source.cdb_fp;
    size_t place = source.pos;
    char *begin = source.buffer.data() + place;
    if (source.mark < place)
        source.mark = place + source.places.marks.distance_from(place);
    source.pos += length + 1;
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
    size_t mark = source.places.marks.distance_from(place);
    return {begin, begin + length, begin + length, begin + std::min(mark, length), &source.places.marks, place};
}

static_assert(scanned_places::FAR >= LINE_MAX_CHARS, "the last place would be taken for a newline");

constexpr uint64_t bit_of(char c) {
    return uint64_t{1} << c;
}

/* True for the characters of a set, of which the last one is the highest. */
bool is_one_of(uint64_t characters, char last, char c) {
    auto code = static_cast<unsigned char>(c);
    return code <= last && (characters >> code & 1) != 0;
}

bool is_blank(char c) {
    return is_one_of(bit_of(' ') | bit_of('\t'), ' ', c);
}

/* At the end of a text. */
bool is_left_out(char c) {
    return is_one_of(bit_of(' ') | bit_of('\t') | bit_of('#'), '#', c);
}

/* The line's first mark from p on; its end if there is none. */
char *next_mark(const source_line &line, char *p) {
    size_t distance = line.marks->distance_from(line.place + static_cast<size_t>(p - line.begin));
    return p + std::min(distance, static_cast<size_t>(line.end - p));
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
    cx.framing.leave();
}

void take_source(cdgen &cx, std::string_view bytes) {
    cx.source.cdb_fp.close();
    cx.source.cdb_fp.memory = bytes;
    cx.framing.leave();
}

source_line next_line(cdgen &cx) {
    for (source_file &source = cx.source.cdb_fp;;) {
        size_t length = source.places.newlines.distance_from(source.pos);
        if (length < LINE_MAX_CHARS)
            return whole_line(cx, length);
        if (source.end - source.pos >= LINE_MAX_CHARS)
            return cut_line(cx, LINE_MAX_CHARS);
        if (!refill(cx) && source.end > 0)
            return cut_line(cx, source.end);
        if (source.end == 0)
            return {};
    }
}

attr_text find_text(const source_line &line) {
    char *begin = line.begin;
    while (is_blank(*begin))
        ++begin;
    char *end = line.end;
    if (line.mark < end)
        end = end_by_marks(line, begin);
    else if (begin >= end)
        end = nullptr;
    if (end == nullptr)
        return {line.begin, begin, nullptr};
    while (is_left_out(end[-1])) /* there is text in front */
        --end;
    return {line.begin, begin, end};
}

attr_text text_of(const source_line &line) {
    attr_text text = find_text(line);
    if (text.end != nullptr)
        *text.end = '\0';
    return text;
}
