/*
 * cdgen.h: what the compiler's modules share: staging tables, the stanza catalogue's records, the compilation context
 * and the two fatal exits. One way for the data: source line -> attribute -> staging record -> staging table -> image.
 */
#ifndef CDGEN_CDGEN_H
#define CDGEN_CDGEN_H

#include "cdb.h"
#include "compiler/cdgen_error.h"
#include "compiler/cdgen_observer.h"
#include "format/names.h"
#include "language/catalogue.h"
#include "language/limits.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <memory>
#include <optional>
#include <span>
#include <string_view>
#include <sys/types.h>
#include <vector>

struct cdgen;

/* ---- Staging tables (cdgen_util_tables.cpp) ------------------------------------------------------------------- */

/* What a table holds: all that stays of one to which nothing more is to come. */
struct tbl_content {
    size_t used() const {
        return static_cast<size_t>(tbl_next - tbl_base);
    }

    char *tbl_base = nullptr;       /* null until the first reservation */
    char *tbl_next = nullptr;       /* first unreserved byte */
    const char *tbl_name = nullptr; /* for traces and messages */
};

/* An append-only arena of zero-filled bytes. Grows by whole allocation units, and so does tbl_size, which the traces
 * show; underneath, memory is taken in larger steps. The block moves when it grows: whatever refers into a table does
 * so by its offset from tbl_base. Once there is a block, tbl_next < tbl_end and all bytes between them are 0. */
struct tbl : tbl_content {
    tbl(size_t au, const char *name) : tbl_content{nullptr, nullptr, name}, tbl_au(au) {}
    tbl(const tbl &) = delete;
    tbl &operator=(const tbl &) = delete;
    ~tbl();

    /* Empty, as if it were new; the block waits for the first reservation. */
    void restart(const char *name);

    size_t room() const {
        return static_cast<size_t>(tbl_end - tbl_next);
    }

    char *tbl_prev_base = nullptr; /* the block before its latest move; for diagnosis */
    size_t tbl_size = 0;           /* bytes, a multiple of tbl_au */
    char *tbl_end = nullptr;       /* tbl_base + tbl_size */
    size_t tbl_au;                 /* bytes: the first block and the granule of every growth */
    size_t tbl_capacity = 0;       /* bytes really held, at least tbl_size */
    char *tbl_spare = nullptr;     /* the block before the first reservation, if there is one already */
};

/* Where the container that is being filled stands in a string table; nothing until the first element is added. */
using tbl_anchor = std::optional<vx_uint32_t>;

constexpr size_t round8(size_t n) {
    return (n + 7) & ~size_t{7};
}

/* Zero-filled memory, to be given back with free(). Failing is fatal, with errno as the status. */
void *cfg_malloc(size_t s);

/* A new, empty table that stays until it is filed, or as long as the context. */
tbl *make_tbl(cdgen &cx, size_t au, const char *name);

/* Reserves s bytes, zeroed, at the end of t. The address holds until the next reservation in t. */
void *alloc_tble(cdgen &cx, tbl *t, size_t s);

/* Gives back what a table does not use, down to tbl_next. */
void trim_tbl(tbl *t);

/* Keeps of the table that a staged record refers to only what it holds, once nothing more is to come, and lets the
 * record refer to that; to nothing, if it is empty. With many classes the rest would be most of the memory. The table
 * itself serves again. */
void file_tbl(cdgen &cx, cdb_ref_t &ref);

/* Appends len bytes, zero-filled up to a multiple of 8; returns their offset from tbl_base. add_to_tbl is the name that
 * serves for strings and serialised values. */
vx_uint32_t save_tbl_val_round(cdgen &cx, tbl *tp, const void *val, size_t len);
vx_uint32_t add_to_tbl(cdgen &cx, tbl *tp, const void *data, size_t len);

/* Copies len bytes and zeroes on to the next multiple of 8, for which dst must have room. */
void memcpy_8_rounded(char *dst, const char *src, int len);

/* The record at an offset of a staging table, valid until the next reservation in it. An offset that leads out of the
 * used part is a defect of the program and fatal. Offsets of records are multiples of their alignment. */
void *tbl_at(tbl_content *t, size_t offset, size_t size);

template <class Record> Record *record_at(tbl_content *t, size_t offset) {
    return static_cast<Record *>(tbl_at(t, offset, sizeof(Record)));
}

/* All records of a table that holds nothing else. */
template <class Record> std::span<Record> records_of(tbl_content *t) {
    if (t == nullptr || t->tbl_base == nullptr)
        return {};
    return {reinterpret_cast<Record *>(t->tbl_base), t->used() / sizeof(Record)};
}

/* While a record is staged, the reference to a table of its own holds the address of what is in the table, which may
 * have been filed. */
inline tbl_content *staged_content(const cdb_ref_t &ref) {
    tbl_content *t = nullptr;
    std::memcpy(&t, ref.pointer, sizeof t);
    return t;
}

/* The table itself, while the record is open. */
inline tbl *staged_tbl(const cdb_ref_t &ref) {
    return static_cast<tbl *>(staged_content(ref));
}

inline void stage_tbl(cdb_ref_t &ref, tbl_content *t) {
    ref = {};
    std::memcpy(ref.pointer, &t, sizeof t);
}

/* Values of a class that stand out of line while they wait to be serialised: texts and binaries. */
class text_pool {
public:
    text_pool() = default;
    text_pool(const text_pool &) = delete;
    text_pool &operator=(const text_pool &) = delete;
    ~text_pool();

    /* n zeroed bytes, aligned for any value, that stay until the pool is emptied. Null if there is no memory. */
    char *take(size_t n);
    /* Gives everything back but for the room of the latest chunk. */
    void clear();

private:
    struct chunk;
    chunk *head = nullptr;
    size_t left = 0; /* bytes of head not yet taken */
};

/* ---- Values (cdgen_util_values.cpp, cdgen_util_serial.cpp) ----------------------------------------------------- */

/* What a serialised value stands for. */
enum type_out_mode {
    TYPE_SAME = 1, /* the given value */
    TYPE_16 = 2,   /* the given integer, narrowed to 16 bits */
    TYPE_INIT = 3,
    INIT_DEFAULT = 4, /* a dynamic attribute's initial value */
    DFLT_DEFAULT = 5, /* a persistent attribute's default */
    R_LO_DEFAULT = 6, /* a range's lower bound */
    R_HI_DEFAULT = 7  /* a range's upper bound */
};

/* The code of a type's source name; VX_UNKNOWN for null, unknown names and "UNKNOWN" itself. */
vx_data_type_t strToVxDt(const char *s);
/* 0 and the code of a variable type's name, or 1 with *t left alone. */
int strToVar(const char *s, orb_variable_type_t *t);
/* The element type of an array type; any other type unchanged. */
vx_data_type_t scalar_vx(vx_data_type_t dt);
/* 1 for an array type, else 0. */
int is_vx_array(vx_data_type_t dt);

/* Integers by the rules of the C library, base 0, 8 or 10. An overflow is remembered in cx.conv_errno. */
long int_from_text(cdgen &cx, const char *text, char **end, int base);

/* Converts text into *vx_out, for an array type into one element; 0, or -1 if the text is no value of the type. Texts
 * and binaries stand in the pool. */
int str_to_vx(cdgen &cx, vx_value_t *vx_out, vx_data_type_t vx_type, const char *str_in, text_pool &pool);
/* Decode into a block of a 32-bit length and bytes, for which vx_out must have room: 0, or -1 on malformed text.
 * oct_convert knows two forms of output: 1, text with a NUL at its end; 2, such a block. */
int hex_convert(char *vx_out, const char *str_in);
int oct_convert(cdgen &cx, const char *p, int type, char *out_buf);
/* The text inside a pair of double quotes; s itself when it is not quoted; null when the quotes do not match. Writes a
 * NUL over the closing quote. */
char *strip_quotes(char *s);
/* The same for a text that is known to end, with a NUL, at *end, which becomes the end of what is returned. */
char *strip_quotes(char *s, char **end);
/* ORs the bits of the properties named in a comma-separated list, which it takes apart, into *dest. An unknown name is
 * fatal. */
void set_props(vx_uint32_t *dest, const props_t *props, int len, char *vnoq);
/* Packs up to four dotted numbers into *n; always 0. */
int ver_str_convert(cdgen &cx, const char *ver_str, vx_uint32_t *n);
/* Ends the text at its first comma and returns what follows; null without a comma. */
char *getNextArrVal(char *line);

/* Write a value, or with no in_data the default that the mode asks for, into a record's cell and, out of line, into the
 * string table. Arrays are filled one element a call, with a capacity of array_cnt. 0, or -1 for a type and mode that
 * do not go together. */
int copy_this_type(cdgen &cx, vx_value_t *out_data, const vx_value_t *in_data, vx_data_type_t type_in, int type_out,
                   tbl *str_tbl, tbl_anchor *array_anchor, vx_uint32_t array_cnt);

/* The anchors of one structured value in the making. */
struct sd_anchors {
    tbl_anchor array;      /* of the element's own array */
    tbl_anchor sd_array;   /* of the array of structured data */
    tbl_anchor sd_element; /* of the structured data */
};

/* Adds one element of type type_in, with its default, to a structured value of array_cnt elements whose kind sd_type is
 * VX_SD_PTR or VX_SD_PTR_ARRAY. */
int copy_this_sd_type(cdgen &cx, vx_value_t *out_data, vx_data_type_t type_in, int type_out, tbl *str_tbl,
                      sd_anchors *anchors, vx_uint32_t array_cnt, vx_data_type_t sd_type);

/* Make the container if the anchor is empty, storing its offset in *out_data, and count one element more. Return the
 * offset of that element: of its value cell for an array, of the whole element for structured data (of the structure if
 * sd_cnt is 0). */
vx_uint32_t init_array(cdgen &cx, tbl *str_tbl, tbl_anchor *anchor, vx_uint32_t array_cnt, vx_value_t *out_data);
vx_uint32_t init_scalar_sd(cdgen &cx, tbl *str_tbl, tbl_anchor *anchor, vx_uint32_t sd_cnt, vx_value_t *out_data);
vx_uint32_t init_array_sd(cdgen &cx, tbl *str_tbl, tbl_anchor *array_anchor, tbl_anchor *sd_anchor,
                          vx_uint32_t array_cnt, vx_uint32_t sd_cnt, vx_value_t *out_data);

/* ---- What stanzas leave ---------------------------------------------------------------------------------------- */

/* Values that wait for their attribute to be completed: one 8-byte cell each, for an SD-typed attribute the types of
 * its elements. */
struct dflt_values {
    dflt_values(const char *name) : cells(32, name) {}

    /* Empty, as if it were new, but for memory that serves again. */
    void restart(const char *name) {
        cells.restart(name);
        texts.clear();
    }

    struct tbl cells;
    text_pool texts; /* what the cells point at */
};

/* The list is shared by an SD-typed attribute's stanza and the SD stanzas that follow it. */
struct dflt_tbl {
    std::shared_ptr<dflt_values> tbl;
    size_t num_elems = 0;
};

/* What is known of a kind's current stanza. */
struct stanza_state {
    vx_uint32_t req_mask = 0; /* required attributes seen */
    vx_uint32_t opt_mask = 0; /* optional attributes seen, with their OPTIONAL bit */
    dflt_tbl dflt;
};

/* ---- The compilation ------------------------------------------------------------------------------------------- */

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

constexpr size_t LOCATOR_SIZE = VALUE_MAX_CHARS + 1; /* the longest value and its NUL */

/* A Locator that waits for the attribute it names. */
struct _rc_locator_t {
    vx_uint16_t *ptr = nullptr; /* the field to fill; null while none was given */
    char name[LOCATOR_SIZE] = {};
};

/* A word of an attribute's record that looks like a reference and is none. */
struct stray_reference {
    int rsrc_class; /* the class's position among all */
    cdb_ref_t rsrc_class_t::*records;
    size_t offset; /* in that table of the class, bytes */
};

/* A variable class and the list of its variable IDs. */
struct tbl_pair {
    const rsrc_variable_class_t *rvcp;
    tbl *tp;
};

struct free_memory {
    void operator()(void *p) const {
        free(p);
    }
};

/* All state of one compilation. A staging record is open while its first word, the cb_ID, is not 0. */
struct cdgen {
    cdgen() = default;
    cdgen(const cdgen &) = delete;
    cdgen &operator=(const cdgen &) = delete;
    ~cdgen();

    /* Command line */
    int interactive = 1; /* messages end with a newline */
    int debugLevel = 0;
    int swap_endianness = 0;
    const char *cdefsrc = nullptr;
    const char *cdefname = nullptr;

    line_observer *observer = nullptr;
    FILE *explanations = stdout; /* where the traces go that explain an error; null: nowhere */

    /* errno as far as number conversions see it: they alone set it, nothing clears it. So an overflow makes a later 0
     * or limit value fail, as it always did, and nothing else does. */
    int conv_errno = 0;

    /* Source reader */
    source_file cdb_fp;
    char inbuf[256] = {}; /* a line that has no newline behind it in the buffer */
    int linenum = 0;      /* reads made; a line of more than 254 characters takes several */
    int linepos = 0;      /* column, from 1 */
    int table_id = -1;
    const srtable_ctrl *scp = nullptr;
    const srtable_ctrl *prev_scp = nullptr;
    const srtable_ctrl *curr_sd_scp = nullptr; /* of the latest header */
    std::array<stanza_state, SC_COUNT> stanzas;
    stanza_state *state = nullptr;           /* that of scp */
    std::shared_ptr<dflt_values> spare_dflt; /* one that no stanza holds any more, for the next */

    /* Staging records */
    rsrc_class_t cb_rsrc_class = {};
    rsrc_cmmap_t cb_rsrc_cmmap = {};
    rsrc_mgr_t cb_rsrc_mgr = {};
    rsrc_variable_class_t cb_rsrc_variable_class = {};
    rsrc_pattr_t cb_rsrc_pattr = {};
    rsrc_pattr_t cb_rsrc_pattrC = {};
    rsrc_dattr_t cb_rsrc_dattr = {};
    rsrc_dattr_t cb_rsrc_dattrC = {};
    rsrc_action_t cb_rsrc_action = {};
    rsrc_action_t cb_rsrc_actionC = {};
    sd_def_t cb_sd_def = {};

    /* Top-level staging tables */
    tbl rsrc_class_tbl{16 * sizeof(rsrc_class_t), "ResourceClasses"};
    tbl rsrc_mgr_tbl{8 * sizeof(rsrc_mgr_t), "ResourceManagers"};
    tbl rsrc_cmmap_tbl{8 * sizeof(rsrc_cmmap_t), "ResourceCMMaps"};
    tbl rsrc_var_class_tbl{8 * sizeof(rsrc_variable_class_t), "ResourceVariableClasses"};
    int rsrc_class_count = 0;
    int rsrc_mgr_count = 0;
    int rsrc_cmmap_count = 0;
    int rsrc_var_class_count = 0;
    std::deque<tbl> tables;          /* all others; the records that own them refer to them */
    std::vector<tbl *> spare_tables; /* those of them that have been filed */
    std::deque<tbl_content> filed;   /* what is left of these: blocks of their own, */
    text_pool filed_small;           /* or a few bytes, and what refers to them */

    /* What attribute lines leave for later */
    std::unique_ptr<char, free_memory> rm_name; /* the resource manager; null until named */
    struct _rc_locator_t _rc_locator;
    std::optional<size_t> vvdisp; /* offset of the latest valid value's vv_disp_msgid in the valid-values table */
    vx_uint16_t pattr_vv_found = 0;
    vx_uint16_t pattrC_vv_found = 0;
    vx_uint16_t dattr_vv_found = 0;
    vx_uint16_t dattrC_vv_found = 0;
    vx_uint16_t dattr_range_found = 0; /* deliberately one flag for both dynamic kinds, cleared at a completion only */
    vx_data_type_t dattr_range_type = VX_UNKNOWN; /* of the range in the open resource attribute, if it has one */
    text_pool line_texts;                         /* out-of-line values of the current line */

    /* Structured data */
    vx_value_t *attr_dflt_val = nullptr; /* while the current attribute is of an SD type: its value */
    cdb_ref_t *curr_sd_tbl = nullptr;    /* what refers to the SD section of the current run */
    vx_uint16_t *max_sd_idx = nullptr;   /* of the current SD-typed attribute */
    int sd_attr_type = 0;                /* 0 persistent, 1 dynamic */
    int curr_sdeli = -1;                 /* latest element index */
    int expected_sdeli = 0;              /* next element index */
    size_t sd_num_elems = 0;             /* elements of the current attribute run */
    int sd_name_found = 0;               /* what the current element has supplied */
    int sd_desc_found = 0;
    int sd_disp_found = 0;
    int sd_dt_found = 0;
    int sd_vv_found = 0;

    /* What the reversal cannot see in the image. */
    std::vector<stray_reference> strays; /* by class */
    size_t strays_done = 0;              /* those whose class has been written */
    std::vector<size_t> nowhere;         /* their places in the image, in bytes */

    /* Variable IDs */
    std::array<tbl_pair, VARIABLE_CLASSES_MAX> tbl_entries = {};
    size_t tbl_entry_used = 0;

    /* Image builder. The image is reached by copying: sections are not aligned. */
    char *chp = nullptr;         /* the image: its header */
    char *dsect_anchs = nullptr; /* the anchors */
    int dsect_count = 0;
    int dsect_idx = 0;      /* the anchor being filled */
    char *dsp = nullptr;    /* where the next bytes go */
    int cdb_mapfile_fd = 0; /* the output file once it is mapped */
    void *cdb_mapfile_ptr = nullptr;
    size_t gross_file_size = 0; /* bytes pre-filled and mapped */
};

/* ---- Phases, in their order ------------------------------------------------------------------------------------ */

/* Runs the whole program on a command line, in a context of its own; returns the exit status. */
int cdgen_main(int argc, char **argv);

/* Compiles cx.cdefsrc into cx.cdefname; throws fatal_exit. */
void compile(cdgen &cx);

void cache_input_data(cdgen &cx, const char *filename);
/* il: an attribute line without comment and newline, taken apart in place. */
void save_attr(cdgen &cx, char *il, int table_id);

/* Opening and completing the stanza kinds (cdgen_kind*.cpp). */
void init_class_tbl(cdgen &cx);
void init_class_tbl_fake(cdgen &cx);
void cmplt_class_tbl(cdgen &cx);
void init_cmmap_tbl(cdgen &cx);
void cmplt_cmmap_tbl(cdgen &cx);
void init_mgr_tbl(cdgen &cx);
void cmplt_mgr_tbl(cdgen &cx);
void init_var_class_tbl(cdgen &cx);
void cmplt_var_class_tbl(cdgen &cx);
void init_pattr_tbl(cdgen &cx);
void cmplt_pattr_tbl(cdgen &cx);
void init_pattrC_tbl(cdgen &cx);
void cmplt_pattrC_tbl(cdgen &cx);
void init_dattr_tbl(cdgen &cx);
void cmplt_dattr_tbl(cdgen &cx);
void init_dattrC_tbl(cdgen &cx);
void cmplt_dattrC_tbl(cdgen &cx);
void init_action_tbl(cdgen &cx);
void cmplt_action_tbl(cdgen &cx);
void init_actionC_tbl(cdgen &cx);
void cmplt_actionC_tbl(cdgen &cx);
void init_sd_tbl(cdgen &cx);
void cmplt_sd_tbl(cdgen &cx, const srtable_ctrl *scp);

/* New, empty sections of the open class's tables; return their offsets. */
vx_uint32_t mk_sd_sec(cdgen &cx);
vx_uint32_t mk_vv_sec(cdgen &cx);
vx_uint32_t mk_vty_sec(cdgen &cx);
/* An empty structured value in a table of default values, for an SD type; nothing calls it. */
vx_uint32_t mk_sd_data_tbl(cdgen &cx, vx_data_type_t sd_type, tbl *dflt_tp);

/* Serialises the collected values (for an SD type: the defaults of the collected element types) as one value. */
void dump_dflt(cdgen &cx, tbl *str_tbl, const dflt_tbl *vtbl, vx_value_t *lval, vx_data_type_t dt);

/* Variable IDs: gives each variable class the list of its dynamic attributes. */
void bld_var_id_tbls(cdgen &cx);
tbl *find_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp);
void add_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp, tbl *entry_ptr);
void del_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp);

/* The image. cdb_size also stores counts and sizes into the staged class records; fit_image counts the sections first,
 * and so finds all that can be wrong with an image before there is a file. */
void bld_cdb(cdgen &cx);
size_t fit_image(cdgen &cx);
size_t cdb_size(cdgen &cx);
/* The checksum of an image: a start value, XORed with the (length - 4) / 4 words from the format word on. */
vx_uint32_t cdb_checksum(const char *image, vx_uint32_t start, vx_uint32_t length);
void add_rsrc_class_tbls(cdgen &cx);
void add_rsrc_mgr_tbls(cdgen &cx);
void add_rsrc_cmmap_tbls(cdgen &cx);
void add_rsrc_var_class_tbls(cdgen &cx);
/* Unmaps, closes and removes the output file if it is mapped. */
void discard_mapfile(cdgen &cx);

/* For a program that is the compiler alone (cdgen_process.cpp): what would end it by a signal in the midst of writing
 * removes the output first; what other programs do to its files and streams, and a lack of memory, end it with a
 * message and a status. */
void take_process();
/* The output that is being written, which must stay where it is; null if there is none. */
void set_unfinished_output(const char *name);

/* Reverses the byte order of a finished image in place. nowhere: places in the image of words that look like references
 * and are none; they are reversed, but not followed. */
void cdgen_cdef_swap(char *cdb_hdr_p, std::span<const size_t> nowhere = {});

/* A descriptor above the three standard ones, so that a trace on a closed stream cannot end up in it; or -1. */
int above_stdio(int fd);

#endif
