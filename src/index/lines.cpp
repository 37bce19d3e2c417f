/* lines.cpp: the lines of a source as the compiler reads them. */

#include "index/lines.h"

#include "compiler/stepwise.h"

#include <algorithm>
#include <memory>

namespace source_index {

namespace {

line_kind kind_of(const line &of) {
    if (of.text.is_empty())
        return of.whole.is_empty() ? line_kind::empty : line_kind::comment;
    return of.text.begin == of.whole.begin ? line_kind::header : line_kind::attribute;
}

bool is_blank(std::string_view text) {
    return text.find_first_not_of(" \t\r\"") == std::string_view::npos;
}

} // namespace

std::vector<line> lines_of(std::string_view source) {
    no_observer observer;
    auto compiler = std::make_unique<stepwise_compiler>("source", "class.cdef", observer);
    compiler->open_bytes(source);
    std::vector<line> lines;
    std::size_t at = 0;
    for (source_line read = compiler->next_line(); read.begin != nullptr; read = compiler->next_line()) {
        line one;
        auto length = static_cast<std::size_t>(read.end - read.begin);
        one.whole = {at, at + length};
        attr_text text = text_of(read);
        if (text.end != nullptr && text.name != text.end)
            one.text = {at + static_cast<std::size_t>(text.name - text.line),
                        at + static_cast<std::size_t>(text.end - text.line)};
        one.kind = kind_of(one);
        if (one.kind == line_kind::comment && is_blank(one.whole.of(source)))
            one.kind = line_kind::empty;
        lines.push_back(one);
        at += length + (length < LINE_MAX_CHARS ? 1 : 0); /* a newline, unless the line is read in pieces */
    }
    return lines;
}

attribute_parts parts_of(std::string_view source, const span &text) {
    attribute_parts parts;
    std::size_t equals = source.substr(0, text.end).find('=', text.begin);
    parts.has_equals = equals != std::string_view::npos;
    parts.name = {text.begin, parts.has_equals ? equals : text.end};
    if (!parts.has_equals) {
        parts.written = parts.value = {text.end, text.end};
        return parts;
    }
    parts.written = parts.value = {equals + 1, text.end};
    std::size_t open = equals + 1;
    while (open < text.end && (source[open] == ' ' || source[open] == '\t'))
        ++open;
    parts.quoted = open < text.end && source[open] == '"';
    if (!parts.quoted)
        return parts;
    std::size_t close = text.end - 1;
    parts.closed = close > open && source[close] == '"' && source[close - 1] != '\\';
    parts.value = {open + 1, parts.closed ? close : text.end};
    return parts;
}

bool has_value(std::string_view line, std::string_view value) {
    std::vector<source_index::line> read = lines_of(line);
    return read.size() == 1 && read[0].kind == line_kind::attribute &&
           parts_of(line, read[0].text).value.of(line) == value;
}

std::string written_value(std::string_view value) {
    std::string plain(value);
    std::string quoted = "\"" + plain + "\"";
    return !has_value("\ta=" + plain, value) && has_value("\ta=" + quoted, value) ? quoted : plain;
}

} // namespace source_index
