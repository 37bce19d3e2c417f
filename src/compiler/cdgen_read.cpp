/* cdgen_read.cpp: reads the source line by line, removes comments, and frames stanzas. */

#include "compiler/cdgen_read.h"

#include "compiler/above_stdio.h"
#include "compiler/cdgen.h"
#include "compiler/cdgen_stanzas.h"

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <limits>
#include <sys/stat.h>
#include <unistd.h>

namespace {

/* What may end a line's text before its newline: quotes and comments, and the NUL behind the last byte. They are rare.
 * Where the next one stands is found once, however many lines stand before it. */
char *next_mark(char *from) {
    return from + strcspn(from, "\"#/");
}

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
    source.buffer[source.end] = '\0';
    source.mark = next_mark(source.buffer.data());
    return n > 0;
}

source_line whole_line(source_file &source, char *begin, char *newline) {
    source.pos += static_cast<size_t>(newline - begin) + 1;
    if (source.mark < begin)
        source.mark = next_mark(begin);
    return {begin, newline, source.mark};
}

source_line cut_line(cdgen &cx, const char *begin, size_t length) {
    cx.source.cdb_fp.pos += length;
    memcpy(cx.source.inbuf, begin, length);
    cx.source.inbuf[length] = '\0';
    cx.source.cdb_fp.cut_mark = next_mark(cx.source.inbuf);
    return {cx.source.inbuf, cx.source.inbuf + length, cx.source.cdb_fp.cut_mark};
}

source_line some_line(cdgen &cx) {
    source_file &source = cx.source.cdb_fp;
    for (;;) {
        char *begin = source.buffer.data() + source.pos;
        size_t there = std::min(LINE_MAX_CHARS, source.end - source.pos);
        if (void *newline = memchr(begin, '\n', there))
            return whole_line(source, begin, static_cast<char *>(newline));
        if (there == LINE_MAX_CHARS || (!refill(cx) && there > 0))
            return cut_line(cx, source.buffer.data() + source.pos, there);
        if (source.end == 0)
            return {nullptr, nullptr, source.mark};
    }
}

bool is_blank(char c) {
    return c == ' ' || c == '\t';
}

/* Where the text of a line that has marks ends: at its newline, its comment, or its NUL. Null for a line without text:
 * blanks, quotes and comments are none. */
char *end_by_marks(const source_line &line, char *p) {
    bool text_seen = false;
    bool quoted = false;
    for (;; p = line.mark + 1, line.mark = next_mark(p)) {
        char *mark = line.mark;
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

bool class_is_open(const cdgen &cx) {
    return cx.staged.cb_rsrc_class.rc_cb_ID != 0;
}

/* What refers to the SD section of a class or action run. An open class action goes before the resource action. */
cdb_ref_t *owner_field(cdgen &cx, const sd_owner &owner) {
    if (owner.of_class != nullptr)
        return &(cx.staged.cb_rsrc_class.*owner.of_class);
    if (owner.of_action == nullptr)
        return nullptr;
    rsrc_action_t &action =
        cx.staged.cb_rsrc_actionC.ac_cb_ID != 0 ? cx.staged.cb_rsrc_actionC : cx.staged.cb_rsrc_action;
    return &(action.*owner.of_action);
}

/* The first stanza of a run makes the SD section and lets its owner refer to it. */
void begin_sd_run(cdgen &cx, bool of_attribute) {
    if (!of_attribute && !class_is_open(cx))
        source_error(cx, MSG_NO_CLASS_FOR_SD);
    if (cx.sd.curr_sd_tbl == nullptr)
        cx.sd.curr_sd_tbl = owner_field(cx, *cx.framing.scp->sc_sd_owner);
    if (cx.sd.curr_sd_tbl != nullptr)
        cx.sd.begin(mk_sd_sec(cx));
    if (of_attribute && cx.sd.attr_dflt_val == nullptr)
        source_error(cx, MSG_NO_SD_ATTRIBUTE);
}

stanza_state &state_of(cdgen &cx, const srtable_ctrl *scp) {
    return cx.framing.stanzas[static_cast<size_t>(scp - sc_tables.data())];
}

/* The values of the stanza before have been used. */
void forget_values(cdgen &cx, dflt_tbl &dflt) {
    if (dflt.tbl.use_count() == 1)
        cx.framing.spare_dflt = std::move(dflt.tbl);
    dflt = {};
}

void begin_sd_stanza(cdgen &cx) {
    bool of_attribute = is_attr_SD(cx.framing.table_id) != nullptr;
    stanza_state &state = state_of(cx, cx.framing.scp);
    if (cx.staged.cb_sd_def.sd_cb_ID != 0 && cx.framing.prev_scp != cx.framing.scp) {
        cmplt_sd_tbl(cx, cx.framing.prev_scp);
        if (!of_attribute)
            cx.sd.curr_sd_tbl = nullptr;
    }
    if (of_attribute && cx.sd.attr_dflt_val != nullptr)
        state.dflt = state_of(cx, cx.framing.prev_scp).dflt;
    if (!of_attribute) {
        cx.sd.leave_attribute();
        if (cx.staged.cb_sd_def.sd_cb_ID == 0)
            cx.sd.curr_sd_tbl = nullptr;
    }
    if (cx.staged.cb_sd_def.sd_cb_ID == 0) {
        begin_sd_run(cx, of_attribute);
        if (!of_attribute)
            forget_values(cx, state.dflt);
    }
    sc_init_tbl (*cx.framing.scp)(cx);
    state.req_mask = state.opt_mask = 0;
}

/* Attribute records stay open: their own kind's next stanza, or the end of input, completes them. */
void begin_plain_stanza(cdgen &cx) {
    if (cx.staged.cb_sd_def.sd_cb_ID != 0)
        cmplt_sd_tbl(cx, cx.framing.prev_scp);
    if (cx.staged.cb_rsrc_action.ac_cb_ID != 0)
        cmplt_action_tbl(cx);
    if (cx.staged.cb_rsrc_actionC.ac_cb_ID != 0)
        cmplt_actionC_tbl(cx);
    sc_init_tbl (*cx.framing.scp)(cx);
    forget_values(cx, cx.framing.state->dflt);
    cx.framing.state->req_mask = cx.framing.state->opt_mask = 0;
    cx.sd.forget_owner();
}

void begin_stanza(cdgen &cx, const char *name) {
    cx.framing.table_id = set_table_id(name);
    if (cx.framing.table_id < 0)
        source_error(cx, MSG_UNKNOWN_STANZA, name);
    cx.framing.prev_scp = cx.framing.scp;
    cx.framing.scp = cx.framing.curr_sd_scp = &sc_tables[static_cast<size_t>(cx.framing.table_id)];
    cx.framing.state = &state_of(cx, cx.framing.scp);
    if (cx.framing.scp->sc_sd_owner != nullptr)
        begin_sd_stanza(cx);
    else
        begin_plain_stanza(cx);
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
    source_line line = some_line(cx);
    if (line.begin != nullptr && cx.source.linenum < std::numeric_limits<int>::max())
        ++cx.source.linenum;
    return line;
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

void take_line(cdgen &cx, const attr_text &text) {
    if (text.name == text.line)
        begin_stanza(cx, text.name);
    else if (cx.framing.table_id < 0)
        source_error(cx, MSG_NO_STANZA);
    else
        save_attr_line(cx, text, static_cast<stanza_id>(cx.framing.table_id));
}

namespace {

/* Closes the source however its reading ends. */
struct closing {
    explicit closing(source_file &file) : source(file) {}
    closing(const closing &) = delete;
    closing &operator=(const closing &) = delete;
    ~closing() {
        source.close();
    }

    source_file &source;
};

} // namespace

void cache_input_data(cdgen &cx, const char *filename) {
    closing at_end(cx.source.cdb_fp);
    open_source(cx, filename);
    for (;;) {
        source_line line = next_line(cx);
        if (line.begin == nullptr)
            break;
        attr_text text = text_of(line);
        if (text.end != nullptr)
            take_line(cx, text);
    }
}
