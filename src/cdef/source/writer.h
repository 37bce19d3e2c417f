/* writer.h: writes the text of a source. */
#ifndef CDGEN_CDEF_SOURCE_WRITER_H
#define CDGEN_CDEF_SOURCE_WRITER_H

#include "cdef/source/error.h"

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace cdef::source {

/* Takes the next part of a source, which consists of whole lines. */
using part_taker = std::function<void(std::string_view)>;

/* Its functions throw no_source_error for what no line can express. */
class source_writer {
public:
    /* The text is passed on in parts. Without a taker all of it is kept. */
    explicit source_writer(part_taker to = {}) : parts(std::move(to)) {}

    /* Writes each line of the text as a comment. Lines are not wrapped, so they must be short. */
    void comment(std::string_view text);
    /* Begins a stanza, after an empty line as `cdef format` puts it. place: named in messages about its lines. */
    void stanza(std::string_view kind, const record_name &place);
    void line(std::string_view name, std::string_view value);
    void line(std::string_view name, std::int64_t number);
    /* Writes no line for the number that the field has without one. */
    void optional_line(std::string_view name, std::int64_t number, std::int64_t without);
    /* Writes the first of several texts that fits in a line. */
    void line_of_any(std::string_view name, const std::vector<std::string> &values);

    /* Passes on the text if there is much of it. For lists, which may have many lines. */
    void flush_if_full();
    /* Passes on the rest of the text. */
    void flush();

    std::string text; /* which has not been passed on */

private:
    static constexpr std::size_t FULL = 16384; /* bytes of text that are passed on */

    [[noreturn]] void refuse(std::string_view name, std::optional<std::string_view> value) const;

    part_taker parts;
    record_name current; /* of the stanza */
};

} // namespace cdef::source

#endif
