/* diagnostics.h: findings as the protocol shows them. */
#ifndef CDGEN_SERVER_DIAGNOSTICS_H
#define CDGEN_SERVER_DIAGNOSTICS_H

#include "check/check.h"
#include "server/positions.h"

#include <functional>
#include <span>
#include <string>
#include <string_view>

namespace lsp {

/* The form in which the client wants diagnostics. */
struct diagnostic_form {
    encoding units = encoding::utf16;
    bool relates = true;      /* true: notes become related places; false: they are added to the message */
    bool links = true;        /* true: the client shows links of codes */
    std::string explanations; /* URI of the page that explains the codes; empty: there is none */
};

/* Converts the places of findings to offsets in a text. */
class finding_places {
public:
    explicit finding_places(std::string_view of_text);

    /* A place without a column is the text of its line; one without a line is the beginning of the source. */
    stretch of(const check::place &at) const;
    /* The bytes that an edit removes; empty for an insertion. */
    stretch of(const check::edit &change) const;

private:
    std::size_t offset(std::size_t line, std::size_t column) const;

    std::string_view text;
    std::vector<std::size_t> begins; /* of the lines as findings count them: only newlines end them */
};

/* A place in another document. */
struct location {
    std::string uri;
    range at;
};
using other_places = std::function<location(const check::elsewhere &)>;

/* The list of diagnostics of a document, as JSON. others: where the places in other documents are. */
std::string diagnostics_text(std::string_view text, const line_table &lines, const std::string &uri,
                             std::span<const check::finding> findings, const diagnostic_form &form,
                             const other_places &others);

} // namespace lsp

#endif
