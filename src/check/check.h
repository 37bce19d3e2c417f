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
    WARNING_COUNT
};

struct warning {
    warning_id id;
    const char *code; /* permanent */
    const char *name; /* switches it on and off; permanent too */
    const char *title;
    const char *cause; /* sentences; `names of the language` are in backquotes */
    const char *cure;
};

/* All of them; warnings[id] is the one with that id. */
extern const std::array<warning, WARNING_COUNT> warnings;

/* By id: whether the warning is wanted. */
using warning_set = std::array<bool, WARNING_COUNT>;

/* ---- Findings --------------------------------------------------------------------------------------------------- */

/* A part of a line. The compiler counts a line of the file several times if it is too long to be read at once. */
struct place {
    int line = 0;      /* as the compiler counts lines; 0: none */
    size_t column = 0; /* in bytes, from 1; 0: the whole line */
    size_t length = 0; /* in bytes */
    /* The same in the file, where a newline ends each line. Set when a finding is handed over. */
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
    std::string removed;  /* the bytes there; a newline is the last one, if there is any */
    std::string text;     /* what replaces them */
};

enum class certainty { likely, certain /* what else could be meant is not in sight */ };

/* Edits that cure a finding together. They do not overlap. */
struct correction {
    certainty sure = certainty::likely;
    std::vector<edit> edits; /* by place; empty: no cure is known that a program could apply */
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
};

struct totals {
    size_t errors = 0;
    size_t warnings = 0;
};

/* Is given each finding, as soon as about a thousand later ones have been found: by line, and the errors of a line
 * before its warnings, but a finding about a line far in front of the others comes when it is found. */
using sink = std::function<void(finding &&)>;

/* The source cannot be read, or memory ran out. The text names the source. */
struct cannot_check : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* What is done with a source that is to be compiled, too. */
struct compile_job {
    /* A class without a Name is called after this file, to which nothing is written. */
    std::string output;
    /* Is given the compilation, all steps of which have been taken, of a source without errors, and the check. */
    std::function<void(stepwise_compiler &, const view &)> finish;
};

/* Checks a source that is in memory. Its name appears in cannot_check only, which is thrown if memory
 * runs out. With a job, the same pass compiles it. */
totals check_bytes(std::string_view bytes, const std::string &name, const warning_set &wanted, const sink &to,
                   const compile_job *job = nullptr);

/* Checks a file; "-" is standard input. It is read in portions. Throws cannot_check. */
totals check_file(const std::string &path, const warning_set &wanted, const sink &to, const compile_job *job = nullptr);

} // namespace check

#endif
