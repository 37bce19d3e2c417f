/* format.h: formats a source: bytes in, and out either formatted bytes that compile to the same database, or the reason
 * why the source is left alone. */
#ifndef CDGEN_FORMATTER_FORMAT_H
#define CDGEN_FORMATTER_FORMAT_H

#include "check/check.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace formatter {

/* Lines of a source, counted from 0, each ended by a newline. */
struct line_range {
    std::size_t first = 0;
    std::size_t last = 0; /* the last one that belongs to the range */
};

struct options {
    bool reorder = false;                /* the attributes of a stanza get their usual order */
    std::optional<line_range> only = {}; /* nothing else is changed; nothing: the whole source */
};

/* Bytes of the source that are replaced. */
struct change {
    std::size_t begin = 0; /* offset in bytes */
    std::size_t size = 0;  /* in bytes; 0: an insertion */
    std::string text;
};

struct formatted {
    std::string text;                         /* the source itself if it is left alone */
    std::vector<change> changes;              /* what makes the text of the source: in their order, not overlapping */
    std::optional<check::finding> error = {}; /* the first one: a source with errors is left alone */
    std::string refusal = {};                 /* why the source is left alone, for a message; else empty */

    bool is_left_alone() const {
        return !refusal.empty();
    }
};

/* Formats a source. Its name appears in check::cannot_check only, which is thrown if memory runs out. The result
 * compiles to the same database as the source, with the same warnings; formatting it again changes nothing. */
formatted format(std::string_view source, const std::string &name, const options &how = {});

} // namespace formatter

#endif
