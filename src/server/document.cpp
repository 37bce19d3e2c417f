/* document.cpp: a source that is open in an editor. */

#include "server/document.h"

namespace lsp {

void document::replace(std::string by) {
    content = std::move(by);
    table = line_table(content);
    forget();
}

void document::replace(const range &part, std::string_view by, encoding units) {
    stretch old = stretch_of(part, units);
    content.replace(old.begin, old.end - old.begin, by);
    table.change(content, old, by.size());
    forget();
}

void document::forget() {
    found.reset();
    contents.reset();
    called.reset();
    database.reset();
}

const source_index::index &document::index() {
    if (!contents)
        contents = source_index::index_of(content);
    return *contents;
}

const source_index::names &document::names() {
    if (!called)
        called = source_index::names_of(content, index());
    return *called;
}

const compiled_source *document::compiled() {
    if (!database)
        database = compile(content, address);
    return *database ? &**database : nullptr;
}

const std::vector<check::finding> &document::findings(const check::warning_set &wanted) {
    if (!found)
        found = findings_of(content, wanted);
    return *found;
}

std::vector<check::finding> findings_of(std::string_view text, const check::warning_set &wanted) {
    std::vector<check::finding> all;
    check::check_bytes(text, "source", wanted, [&](check::finding &&each) { all.push_back(std::move(each)); });
    return all;
}

} // namespace lsp
