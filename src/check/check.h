/* check.h: checks a source: bytes in, findings with positions out. It drives the compiler over the source line by line,
 * catches what would end a compilation, and continues after it. */
#ifndef CDGEN_CHECK_CHECK_H
#define CDGEN_CHECK_CHECK_H

#include <array>
#include <cstddef>
#include <functional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

class stepwise_compiler;

namespace check {

struct view;

/* ---- Warnings (warnings/registry.cpp) --------------------------------------------------------------------------- */

/* In the order of the codes. */
enum warning_id {
    SD_RUN_AT_END,
    SD_WITHOUT_RUN,
    RANGE_ELSEWHERE,
    UNKNOWN_LOCATOR,
    UNKNOWN_VARIABLE_CLASS,
    SAME_NAME,
    SAME_ID,
    NARROWED,
    OCTAL,
    NUMBER_TEXT,
    UNUSED_DEFAULT,
    PERMISSION,
    ELEMENT_TYPE,
    CUT_SHORT,
    INCOMPLETE,
    LONG_LINE,
    CARRIAGE_RETURN,
    STRAY_RUN,
    LOW_ABOVE_HIGH,
    TEXT_AFTER_QUOTE,
    LOST_BYTES,
    COMMENT_IN_VALUE,
    NO_RESOURCE_CLASS,
    SECOND_RESOURCE_CLASS,
    OVERRIDDEN,
    COMMA_LIST,
    IGNORED_RANGE,
    NO_EXPRESSION,
    GROUP,
    UNUSED_VARIABLE_CLASS,
    INTERVALS,
    PROPERTIES,
    INVALID_DEFAULT,
    CLASS_BIT,
    OVERLAP,
    OUTER_BLANK,
    UNBALANCED,
    NO_NAME,
    SHARED_NAME,
    SHARED_KEYS,
    OTHER_MANAGER,
    OTHER_VARIABLE_CLASS,
    RULE_NAME,
    WARNING_COUNT
};

struct warning {
    warning_id id;
    const char *code; /* permanent */
    const char *name; /* the name that turns it on and off; permanent too */
    const char *title;
    const char *cause; /* sentences; `names of the language` are in backquotes */
    const char *cure;
};

/* All of them; warnings[id] is the one with that id. */
extern const std::array<warning, WARNING_COUNT> warnings;

/* By id: true if the warning is wanted. */
using warning_set = std::array<bool, WARNING_COUNT>;

/* ---- Findings --------------------------------------------------------------------------------------------------- */

/* A part of a line. If a line of the file is too long to be read at once, the compiler counts each piece as a line. */
struct place {
    int line = 0;      /* as the compiler counts lines; 0: none */
    size_t column = 0; /* in bytes, from 1; 0: the whole line */
    size_t length = 0; /* in bytes */
    /* The same in the file, where a newline ends each line. Set when a finding is passed on. */
    int file_line = 0;
    size_t file_column = 0;
};

struct note {
    place at;
    std::string text;
    std::string source = {}; /* the line, where it has to be shown because the finding has no place in it */
};

/* A change of the source, at a place of the file. */
struct edit {
    int line = 0;         /* from 1, each ended by a newline */
    size_t column = 0;    /* in bytes, from 1 */
    size_t character = 0; /* the same in characters */
    std::string removed;  /* the bytes there; only the last one may be a newline */
    std::string text;     /* what replaces them */
};

enum class certainty { likely, certain /* only one correction is possible */ };

/* Edits that cure a finding together. They do not overlap. */
struct correction {
    certainty sure = certainty::likely;
    std::vector<edit> edits; /* by place; empty: a program cannot cure the finding */
};

/* A place in another source that a finding is about too. Its text names what is there. */
struct elsewhere {
    std::string file;
    note what;
};

struct finding {
    bool error = true;
    const char *code = "";
    const char *name = "error"; /* that of a warning */
    std::string text;
    place at;
    std::string source; /* the line */
    std::vector<note> notes;
    correction fix = {};
    std::vector<elsewhere> others = {}; /* the text already names these places, too */
};

struct totals {
    size_t errors = 0;
    size_t warnings = 0;
};

/* Receives each finding, when about a thousand later ones have been found. Findings are in the order of their lines,
 * and the errors of a line come before its warnings. A finding about a much earlier line is passed on when it is found.
 */
using sink = std::function<void(finding &&)>;

/* The source cannot be read, or memory ran out. The text names the source. */
struct cannot_check : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* How a source is compiled in the pass that checks it. */
struct compile_job {
    /* A class without a Name is named after this file. Nothing is written to it. */
    std::string output;
    /* Receives the check and the finished compilation of a source without errors. */
    std::function<void(stepwise_compiler &, const view &)> finish;
};

/* Checks a source that is in memory. Its name is only used for cannot_check, which is thrown if memory runs out. With a
 * job, the same pass compiles it. */
totals check_bytes(std::string_view bytes, const std::string &name, const warning_set &wanted, const sink &to,
                   const compile_job *job = nullptr);

/* Checks a file; "-" is standard input. It is read in portions. Throws cannot_check. */
totals check_file(const std::string &path, const warning_set &wanted, const sink &to, const compile_job *job = nullptr);

} // namespace check

#endif
