/* meant.cpp: the names that the unknown names of a source were meant to be. */

#include "check/meant.h"

namespace check {

namespace {

bool is_given(const knowledge &known, int kind, std::string_view attribute) {
    const srtable_ctrl &table = table_of(kind);
    const table_attrs *attr = find_attr(table, attribute);
    auto at = static_cast<size_t>(attr - table.sc_attrs.data());
    return known.stanzas[index_of(kind)].given[at] != 0 && attr->dup_allowed == 0;
}

} // namespace

language::guess attribute_meant(const knowledge &known, int kind, std::string_view name) {
    using language::likeness;
    name = name.substr(0, name.find_last_not_of(" \t") + 1);
    language::guess meant = language::attribute_meant_by(name, table_of(kind));
    auto given = [&](std::string_view each) { return is_given(known, kind, each); };
    if (meant.how == likeness::word)
        std::erase_if(meant.names, given);
    else if (given(meant.name()))
        meant.how = likeness::few_edits;
    return meant;
}

} // namespace check
