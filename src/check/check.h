/* check.h: what the files of "cdef check" share. It drives the compiler's own modules over a source, line by line,
 * and catches what would end the compilation; no other part of cdef knows the compiler. */
#ifndef CDGEN_CDEF_CHECK_H
#define CDGEN_CDEF_CHECK_H

#include "compiler/stepwise.h"
#include "language/suggestions.h"

#include <array>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace cdef::check {

/* ---- Warnings (messages.cpp) ----------------------------------------------------------------------- */

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
    WARNING_COUNT
};

struct warning {
    warning_id id;
    const char *code; /* for ever, as is */
    const char *name; /* which switches it */
    const char *title;
};

extern const std::array<warning, WARNING_COUNT> warnings;

using warning_set = std::array<bool, WARNING_COUNT>;

/* ---- Findings ------------------------------------------------------------------------------------------------- */

/* Where: a line as the compiler counts it, 0 for none, and bytes of it, column 0 for the whole line. */
struct place {
    int line = 0;
    size_t column = 0; /* from 1 */
    size_t length = 0;
};

struct note {
    place at;
    std::string text;
    std::string source = {}; /* the line, if it is to be shown: the finding itself has no place in it */
};

struct finding {
    bool error = true;
    const char *code = "";
    const char *name = "error"; /* a warning's */
    std::string text;
    place at;
    std::string source; /* the line */
    std::vector<note> notes;
};

struct result {
    std::string file;
    std::vector<finding> findings; /* by line, its errors first, in the order in which they were met */
    size_t errors = 0;
    size_t warnings = 0;
};

/* Checks one source; "-" is standard input. Throws cdef::trouble when it cannot be read, or when memory runs out. */
result check_source(const std::string &path, const warning_set &wanted);

/* ---- Names (names.cpp) ----------------------------------------------------------------------------- */

using language::listed;
using language::name_list;
using language::near_miss;
using language::quoted;
using language::suggestion;

name_list stanza_names();
name_list attribute_names(const srtable_ctrl &kind);

/* The stanza kinds that have an attribute of this name, as bits. */
vx_uint32_t kinds_with(std::string_view name);

name_list property_names(int attr_type);

/* The required attributes of a kind that a mask lacks. */
name_list missing_names(const srtable_ctrl &kind, vx_uint32_t mask);

/* ---- Forms (report/text.cpp, report/json.cpp) -------------------------------------------------------------
 */

/* As compilers write it: a line for each finding and note, and the line of the source with a mark. Nothing of a source,
 * or of its name, can steer a terminal: a '?' stands for each character that might. */
std::string as_text(const result &checked);
std::string as_json(std::span<const result> checked);
std::string as_sarif(std::span<const result> checked);

} // namespace cdef::check

#endif
