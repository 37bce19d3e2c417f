/* document.h: a source that is open in an editor, and what has been found out about it. */
#ifndef CDGEN_SERVER_DOCUMENT_H
#define CDGEN_SERVER_DOCUMENT_H

#include "check/check.h"
#include "server/positions.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lsp {

/* A text that changes, and the places in it. */
class document {
public:
    document(std::string called, int number, std::string whole)
        : address(std::move(called)), revision(number), content(std::move(whole)), table(content) {}

    const std::string &uri() const {
        return address;
    }
    int version() const {
        return revision;
    }
    const std::string &text() const {
        return content;
    }
    const line_table &lines() const {
        return table;
    }

    /* All of the text, or a part of it, gives way to another text. What was found out is forgotten. */
    void replace(std::string by);
    void replace(const range &part, std::string_view by, encoding units);
    void set_version(int number) {
        revision = number;
    }

    std::size_t offset_of(const position &at, encoding units) const {
        return lsp::offset_of(content, table, at, units);
    }
    stretch stretch_of(const range &of, encoding units) const {
        return lsp::stretch_of(content, table, of, units);
    }
    position_maker positions(encoding units) const {
        return {content, table, units};
    }

    /* What cdef check reports of the text. The text is checked once. */
    const std::vector<check::finding> &findings(const check::warning_set &wanted);

    /* Whether they have been asked for since the text changed. */
    bool is_checked() const {
        return found.has_value();
    }
    void forget();

private:
    std::string address;
    int revision;
    std::string content;
    line_table table;
    std::optional<std::vector<check::finding>> found;
};

/* All findings of a source in memory. */
std::vector<check::finding> findings_of(std::string_view text, const check::warning_set &wanted);

} // namespace lsp

#endif
