/* document.h: a source that is open in an editor, with results that are computed when they are first needed. */
#ifndef CDGEN_SERVER_DOCUMENT_H
#define CDGEN_SERVER_DOCUMENT_H

#include "check/check.h"
#include "index/names.h"
#include "index/stanzas.h"
#include "server/compiled.h"
#include "server/positions.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lsp {

/* A text that changes. Results about it are kept until the next change. */
class document {
public:
    document(std::string its_uri, int number, std::string whole)
        : address(std::move(its_uri)), revision(number), content(std::move(whole)), table(content) {}

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

    /* Replaces all of the text or a part of it, and discards all results. */
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

    /* The findings of cdef check. */
    const std::vector<check::finding> &findings(const check::warning_set &wanted);

    /* The stanzas and names of the text. */
    const source_index::index &index();
    const source_index::names &names();

    /* What the text compiles to; null if it has errors. */
    const compiled_source *compiled();

    /* Discards all results. */
    void forget();

private:
    std::string address;
    int revision;
    std::string content;
    line_table table;
    std::optional<std::vector<check::finding>> found;
    std::optional<source_index::index> contents;
    std::optional<source_index::names> called;
    std::optional<std::optional<compiled_source>> database; /* set but empty: the text has errors */
};

/* All findings of a source in memory. */
std::vector<check::finding> findings_of(std::string_view text, const check::warning_set &wanted);

} // namespace lsp

#endif
