/* cdgen_read.cpp: reads the source line by line, removes comments, and frames stanzas. */

#include "cdgen.h"

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <limits>
#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr size_t LINE_MAX_CHARS = 254; /* taken by one read, the newline included */

void open_source(cdgen &cx, const char *filename) {
    source_file &source = cx.cdb_fp;
    source.fd = above_stdio(open(filename, O_RDONLY | O_CLOEXEC));
    struct stat st = {};
    if (source.fd < 0 || fstat(source.fd, &st) != 0)
        cdgen_error_exit(cx, filename, ": cannot open because: ", strerror(errno), 0, errno);
    source.device = st.st_dev;
    source.inode = st.st_ino;
}

/* More bytes into an empty buffer; false at the end of the file. */
bool refill(cdgen &cx) {
    source_file &source = cx.cdb_fp;
    ssize_t n = 0;
    do
        n = read(source.fd, source.buffer.data(), source.buffer.size());
    while (n < 0 && errno == EINTR);
    if (n < 0) {
        int error = errno;
        cdgen_error_exit(cx, cx.cdefsrc, ": cannot read because: ", strerror(error), 0, error);
    }
    source.pos = 0;
    source.end = static_cast<size_t>(n);
    return n > 0;
}

/* The next line, with its newline, or the next 254 characters of a longer one, into cx.inbuf; false at the end. */
bool read_line(cdgen &cx) {
    source_file &source = cx.cdb_fp;
    size_t length = 0;
    while (length < LINE_MAX_CHARS) {
        if (source.pos == source.end && !refill(cx))
            break;
        const char *from = source.buffer.data() + source.pos;
        size_t there = std::min(LINE_MAX_CHARS - length, source.end - source.pos);
        const void *newline = memchr(from, '\n', there);
        size_t taken = newline == nullptr ? there : static_cast<size_t>(static_cast<const char *>(newline) - from) + 1;
        memcpy(cx.inbuf + length, from, taken);
        source.pos += taken;
        length += taken;
        if (newline != nullptr)
            break;
    }
    cx.inbuf[length] = '\0';
    return length > 0;
}

/* What a character means to the search for a line's end; most mean nothing but that there is text. */
enum char_class : char { TEXT, BLANK, QUOTE, HASH, SLASH, END };

constexpr std::array<char_class, 256> char_classes = [] {
    std::array<char_class, 256> classes = {};
    classes['\0'] = classes['\n'] = END;
    classes[' '] = classes['\t'] = BLANK;
    classes['"'] = QUOTE;
    classes['#'] = HASH;
    classes['/'] = SLASH;
    return classes;
}();

char_class class_of(char c) {
    return char_classes[static_cast<unsigned char>(c)];
}

/* Where the text of a line ends: at its newline, its comment, or its NUL. Null for a line without text: blanks, quotes
 * and comments are none. */
char *end_of_text(char *line) {
    bool text_seen = false;
    bool quoted = false;
    for (char *p = line;; ++p) {
        switch (class_of(*p)) {
        case END:
            return text_seen ? p : nullptr;
        case BLANK:
            break;
        case QUOTE:
            quoted = !quoted;
            break;
        case HASH:
            if (!text_seen)
                return nullptr;
            if (!quoted)
                return p;
            break;
        case SLASH:
            if (p[1] != '/' && p[1] != '*')
                text_seen = true;
            else if (!quoted)
                return text_seen ? p : nullptr;
            break;
        case TEXT:
            text_seen = true;
            while (class_of(p[1]) == TEXT)
                ++p;
        }
    }
}

/* Cuts off what is no text; false if nothing is left. Hash signs at the end go even inside quotes. */
bool strip_line(char *line) {
    char *end = end_of_text(line);
    if (end == nullptr)
        return false;
    while (end > line && (end[-1] == ' ' || end[-1] == '\t' || end[-1] == '#'))
        --end;
    *end = '\0';
    return true;
}

bool class_is_open(const cdgen &cx) {
    return cx.cb_rsrc_class.rc_cb_ID != 0;
}

/* What refers to the SD section of a class or action run. An open class action goes before the resource action. */
cdb_ref_t *owner_field(cdgen &cx, const sd_owner &owner) {
    if (owner.of_class != nullptr)
        return &(cx.cb_rsrc_class.*owner.of_class);
    if (owner.of_action == nullptr)
        return nullptr;
    rsrc_action_t &action = cx.cb_rsrc_actionC.ac_cb_ID != 0 ? cx.cb_rsrc_actionC : cx.cb_rsrc_action;
    return &(action.*owner.of_action);
}

/* The first stanza of a run makes the SD section and lets its owner refer to it. */
void begin_sd_run(cdgen &cx, bool of_attribute) {
    if (!of_attribute && !class_is_open(cx))
        source_error(cx, "No class for SD Definition");
    if (cx.curr_sd_tbl == nullptr)
        cx.curr_sd_tbl = owner_field(cx, *cx.scp->sc_sd_owner);
    if (cx.curr_sd_tbl != nullptr) {
        cx.curr_sd_tbl->offset[0] = mk_sd_sec(cx);
        cx.sd_num_elems = 0;
    }
    if (of_attribute && cx.attr_dflt_val == nullptr)
        source_error(cx, "Incorrect attribute type preceding this SD definition");
}

stanza_state &state_of(cdgen &cx, const srtable_ctrl *scp) {
    return cx.stanzas[static_cast<size_t>(scp - sc_tables.data())];
}

void begin_sd_stanza(cdgen &cx) {
    bool of_attribute = is_attr_SD(cx.table_id) != nullptr;
    stanza_state &state = state_of(cx, cx.scp);
    if (cx.cb_sd_def.sd_cb_ID != 0 && cx.prev_scp != cx.scp) {
        cmplt_sd_tbl(cx, cx.prev_scp);
        if (!of_attribute)
            cx.curr_sd_tbl = nullptr;
    }
    if (of_attribute && cx.attr_dflt_val != nullptr)
        state.dflt = state_of(cx, cx.prev_scp).dflt;
    if (!of_attribute) { /* an attribute that came before keeps what its own run gave it */
        cx.attr_dflt_val = nullptr;
        cx.max_sd_idx = nullptr;
        if (cx.cb_sd_def.sd_cb_ID == 0)
            cx.curr_sd_tbl = nullptr;
    }
    if (cx.cb_sd_def.sd_cb_ID == 0) {
        begin_sd_run(cx, of_attribute);
        if (!of_attribute)
            state.dflt = {};
    }
    cx.scp->sc_init_tbl(cx);
    state.req_mask = state.opt_mask = 0;
}

/* Attribute records stay open: their own kind's next stanza, or the end of input, completes them. */
void begin_plain_stanza(cdgen &cx) {
    if (cx.cb_sd_def.sd_cb_ID != 0)
        cmplt_sd_tbl(cx, cx.prev_scp);
    if (cx.cb_rsrc_action.ac_cb_ID != 0)
        cmplt_action_tbl(cx);
    if (cx.cb_rsrc_actionC.ac_cb_ID != 0)
        cmplt_actionC_tbl(cx);
    cx.scp->sc_init_tbl(cx);
    state_of(cx, cx.scp) = {};
    cx.attr_dflt_val = nullptr;
    cx.curr_sd_tbl = nullptr;
    cx.max_sd_idx = nullptr;
}

void begin_stanza(cdgen &cx, const char *name) {
    cx.table_id = set_table_id(name);
    if (cx.table_id < 0)
        source_error(cx, "Invalid table name: ", name);
    cx.prev_scp = cx.scp;
    cx.scp = cx.curr_sd_scp = &sc_tables[static_cast<size_t>(cx.table_id)];
    if (is_SD_stanza(cx.table_id))
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

int above_stdio(int fd) {
    if (fd < 0 || fd > STDERR_FILENO)
        return fd;
    int higher = fcntl(fd, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    int error = errno;
    close(fd);
    errno = error;
    return higher;
}

void cache_input_data(cdgen &cx, const char *filename) {
    open_source(cx, filename);
    cx.table_id = -1;
    while (read_line(cx)) {
        if (cx.linenum < std::numeric_limits<int>::max())
            ++cx.linenum;
        if (!strip_line(cx.inbuf))
            continue;
        if (cx.inbuf[0] != ' ' && cx.inbuf[0] != '\t')
            begin_stanza(cx, cx.inbuf);
        else if (cx.table_id < 0)
            source_error(cx, "Attribute found but no table defined yet");
        else
            save_attr(cx, cx.inbuf, cx.table_id);
    }
    cx.cdb_fp.close();
}

const char *is_SD_stanza(int table_id) {
    return strstr(sc_tables[static_cast<size_t>(table_id)].sc_name, "SDDefinition");
}

const char *is_attr_SD(int table_id) {
    return strstr(sc_tables[static_cast<size_t>(table_id)].sc_name, "AttrSDDefinition");
}

sd_type_t SD_stanza_type(int table_id) {
    const sd_owner *owner = sc_tables[static_cast<size_t>(table_id)].sc_sd_owner;
    return owner == nullptr ? SD_TYPE_UNKNOWN : owner->type;
}
