/* tokens.cpp: semantic tokens. */

#include "server/tokens.h"

#include <cstdint>

namespace lsp {

namespace {

/* In the order of the legend. */
enum token_type : std::uint8_t { CLASS, PROPERTY, TYPE, ENUM_MEMBER, VARIABLE, STRING, NUMBER, COMMENT };
constexpr unsigned DECLARATION = 1;

/* Writes tokens, each relative to the one before it. A token is on one line. */
class token_writer {
public:
    token_writer(document &in, encoding units) : positions(in.positions(units)) {}

    void add(const stretch &part, token_type type, unsigned modifiers = 0) {
        range at = positions.of(part);
        if (part.is_empty() || at.start.line != at.end.line || at.start == at.end)
            return;
        bool same_line = at.start.line == latest.line;
        for (std::size_t each : {at.start.line - latest.line, at.start.character - (same_line ? latest.character : 0),
                                 at.end.character - at.start.character, std::size_t{type}, std::size_t{modifiers}})
            data.push_back(each);
        latest = at.start;
    }

    json data = json::array();

private:
    position_maker positions;
    position latest;
};

token_type type_of_value(int attr_type) {
    switch (attr_type) {
    case AT_DATA_TYPE:
    case AT_SD_DATA_TYPE:
        return TYPE;
    case AT_VARIABLE_TYPE:
    case AT_PERMISSION:
    case AT_CLASS_PROPS:
    case AT_PATTR_PROPS:
    case AT_DATTR_PROPS:
    case AT_ACTION_PROPS:
        return ENUM_MEMBER;
    case AT_STRING:
    case AT_MANAGER:
    case AT_LOCATOR:
    case AT_SD_NAME:
    case AT_VALID_VALUE:
    case AT_SD_VALID_VALUE:
    case AT_DEFAULT_VALUE:
    case AT_INITIAL_VALUE:
        return STRING;
    default:
        return NUMBER;
    }
}

/* The names in a value, or the whole of it. */
void add_value(token_writer &to, document &in, const source_index::attribute &line) {
    const std::vector<source_index::mention> &all = in.names().mentions;
    stretch value = line.parts.value;
    auto named = std::lower_bound(all.begin(), all.end(), value.begin,
                                  [](const auto &each, std::size_t offset) { return each.at.begin < offset; });
    bool has_names = named != all.end() && named->at.end <= value.end;
    for (; named != all.end() && named->at.end <= value.end; ++named)
        to.add(named->at, VARIABLE, named->defines ? DECLARATION : 0);
    if (!has_names)
        to.add(value, line.known == nullptr ? STRING : type_of_value(line.known->ta_type));
}

/* A comment begins after the line's text, or is all of the line. */
void add_comment(token_writer &to, std::string_view source, const source_index::line &line) {
    std::size_t from = line.text.is_empty() ? line.whole.begin : line.text.end;
    std::size_t begin = source.find_first_not_of(" \t\"", from);
    if (begin < line.whole.end && (source[begin] == '#' || source[begin] == '/'))
        to.add({begin, line.whole.end}, COMMENT);
}

void add_line(token_writer &to, document &in, std::size_t number) {
    const source_index::line &line = in.index().lines[number];
    std::size_t at = in.index().stanza_at(number);
    if (line.kind == source_index::line_kind::header && in.index().stanzas[at].is_known())
        to.add(line.text, CLASS);
    if (const source_index::attribute *attribute = in.index().attribute_at(number)) {
        if (attribute->known != nullptr)
            to.add(attribute->parts.name, PROPERTY);
        add_value(to, in, *attribute);
    }
    add_comment(to, in.text(), line);
}

/* The tokens of all lines that overlap a stretch. */
json tokens_in(session &now, document &in, const stretch &part) {
    token_writer written(in, now.client.units);
    const std::vector<source_index::line> &lines = in.index().lines;
    for (std::size_t at = lines.empty() ? 0 : in.index().line_at(part.begin); at < lines.size(); ++at) {
        if (lines[at].whole.begin > part.end)
            break;
        add_line(written, in, at);
    }
    return {{"data", std::move(written.data)}};
}

} // namespace

json token_legend() {
    return {{"tokenTypes", {"class", "property", "type", "enumMember", "variable", "string", "number", "comment"}},
            {"tokenModifiers", {"declaration"}}};
}

json semantic_tokens(session &now, const json &params) {
    document &in = now.document_in(params);
    return tokens_in(now, in, {0, in.text().size()});
}

json semantic_tokens_in_range(session &now, const json &params) {
    document &in = now.document_in(params);
    return tokens_in(now, in, in.stretch_of(range_from(member(params, "range")), now.client.units));
}

} // namespace lsp
