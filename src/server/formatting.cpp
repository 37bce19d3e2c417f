/* formatting.cpp: formats documents, and ranges of them. */

#include "server/formatting.h"

#include "formatter/format.h"
#include "server/places.h"

#include <algorithm>

namespace lsp {

namespace {

json formatted(session &now, document &in, const formatter::options &how) {
    formatter::formatted made = formatter::format(in.text(), "source", how);
    if (made.is_left_alone())
        throw request_error(REQUEST_FAILED, made.refusal);
    json edits = json::array();
    for (const formatter::change &each : made.changes)
        edits.push_back(byte_edit(in, now.client.units, {each.begin, each.begin + each.size}, each.text));
    return edits;
}

/* Lines as the formatter counts them: each ends with a newline. */
std::size_t newlines_before(const std::string &text, std::size_t offset) {
    return static_cast<std::size_t>(std::count(text.begin(), text.begin() + static_cast<std::ptrdiff_t>(offset), '\n'));
}

} // namespace

json format_document(session &now, const json &params) {
    return formatted(now, now.document_in(params), {});
}

/* A range that ends at the beginning of a line does not include that line. */
json format_range(session &now, const json &params) {
    document &in = now.document_in(params);
    stretch part = in.stretch_of(range_from(member(params, "range")), now.client.units);
    if (part.end > part.begin && in.text()[part.end - 1] == '\n')
        --part.end;
    formatter::options how;
    how.only = {newlines_before(in.text(), part.begin), newlines_before(in.text(), part.end)};
    return formatted(now, in, how);
}

} // namespace lsp
