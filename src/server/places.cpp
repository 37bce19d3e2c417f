/* places.cpp: the place in a document that a request is about, and what is there. */

#include "server/places.h"

#include "language/suggestions.h"

#include <algorithm>

namespace lsp {

place_in_source place_at(document &in, std::size_t offset) {
    const source_index::index &index = in.index();
    std::size_t line = index.lines.empty() ? 0 : index.line_at(offset);
    std::size_t stanza = index.stanza_at(line);
    bool in_comment = false;
    if (!index.lines.empty()) {
        const source_index::line &on = index.lines[line];
        std::string_view rest = std::string_view(in.text()).substr(on.text.end, on.whole.end - on.text.end);
        std::size_t blanks = rest.find_first_not_of(" \t\r\"");
        bool has_comment = !on.text.is_empty() && blanks != rest.npos;
        bool after_begin =
            on.kind == source_index::line_kind::comment || (has_comment && offset > on.text.end + blanks);
        in_comment = after_begin && offset <= on.whole.end;
    }
    return {in,
            offset,
            line,
            stanza == source_index::NONE ? nullptr : &index.stanzas[stanza],
            index.attribute_at(line),
            in_comment};
}

place_in_source place_in(session &now, const json &params) {
    document &in = now.document_in(params);
    return place_at(in, in.offset_of(position_from(member(params, "position")), now.client.units));
}

std::string name_documentation(document &in, std::size_t name) {
    std::vector<source_index::mention> all = in.names().of(name);
    auto definition = std::find_if(all.begin(), all.end(), [](const auto &each) { return each.defines; });
    if (definition == all.end())
        return {};
    const source_index::stanza &of = in.index().stanzas[definition->stanza];
    std::string text = language::quoted(in.names().all[name].text) + ": " + language::quoted(of.row().sc_name);
    for (const char *line : {"Id", "ElementIndex", "DataType"})
        if (std::string_view value = of.value(in.text(), line); !value.empty())
            text.append(", ").append(line).append(" ").append(value);
    return text;
}

json location_of(const session &now, document &in, const stretch &part) {
    return {{"uri", in.uri()}, {"range", to_json(in.positions(now.client.units).of(part))}};
}

json workspace_edit(const session &now, const document &of, json edits) {
    if (!now.client.versioned_edits)
        return {{"changes", {{of.uri(), std::move(edits)}}}};
    json document = {{"uri", of.uri()}, {"version", of.version()}};
    return {{"documentChanges", json::array({{{"textDocument", std::move(document)}, {"edits", std::move(edits)}}})}};
}

json byte_edit(const document &in, encoding units, stretch part, std::string by) {
    const std::string &source = in.text();
    auto splits = [&](std::size_t at) {
        return at > 0 && at < source.size() && source[at - 1] == '\r' && source[at] == '\n';
    };
    if (splits(part.end)) {
        ++part.end;
        by += '\n';
    }
    if (splits(part.begin)) {
        --part.begin;
        by.insert(0, "\r");
    }
    position_maker positions = in.positions(units);
    return text_edit(positions, part, by);
}

json text_edit(position_maker &positions, const stretch &part, std::string_view by) {
    return {{"range", to_json(positions.of(part))}, {"newText", by}};
}

} // namespace lsp
