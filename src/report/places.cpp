/* places.cpp: places in a source, in the forms that other programs and people read. */

#include "report/places.h"

#include "text/shown.h"
#include "text/utf8.h"

#include <algorithm>
#include <cctype>

namespace report {

using check::place;

namespace {

/* Blanks and tabs up to the place, then a caret for its first character and a tilde for each further one. */
std::string carets(std::string_view source, const place &at) {
    std::string text;
    size_t begin = std::min(at.column - 1, source.size());
    for (size_t i = 0; i < begin; i += text::length_or_1(source.substr(i)))
        text += source[i] == '\t' ? '\t' : ' ';
    size_t end = begin + std::min(at.length, source.size() - begin);
    size_t width = 0;
    for (size_t i = begin; i < end; i += text::length_or_1(source.substr(i)))
        ++width;
    return text + "^" + std::string(width > 1 ? width - 1 : 0, '~');
}

} // namespace

std::string prefix_of(std::string_view file, const place &at) {
    std::string text = text::masked(file) + ":";
    if (at.line != 0)
        text += std::to_string(at.line) + ":";
    if (at.line != 0 && at.column != 0)
        text += std::to_string(at.column) + ":";
    return text + " ";
}

std::string excerpt_of(const place &at, std::string_view source, std::string_view colour) {
    constexpr size_t MARGIN = 5;
    if (at.line == 0 || at.column == 0)
        return {};
    std::string number = std::to_string(at.line);
    std::string margin(std::max(number.size(), MARGIN), ' ');
    std::string text = margin.substr(number.size()) + number + " | " + text::masked(source) + "\n" + margin + " | ";
    text.append(colour).append(carets(source, at));
    return text.append(colour.empty() ? "" : NO_COLOUR) + "\n";
}

std::string uri_of(std::string_view file) {
    constexpr const char *HEXADECIMAL = "0123456789ABCDEF";
    std::string uri = file.starts_with('/') ? "file://" : "";
    for (char c : file) {
        auto byte = static_cast<unsigned char>(c);
        bool plain = std::isalnum(byte) != 0 || std::string_view("-._~/").find(c) != std::string_view::npos;
        if (plain)
            uri += c;
        else
            uri += {'%', HEXADECIMAL[byte >> 4], HEXADECIMAL[byte & 15]};
    }
    return uri;
}

size_t characters_in(std::string_view source, size_t bytes) {
    size_t characters = 0;
    for (size_t at = 0; at < std::min(bytes, source.size()); at += text::length_replaced(source.substr(at)))
        ++characters;
    return characters;
}

character_range characters_of(const place &at, std::string_view source) {
    if (source.empty())
        return {at.column, at.length};
    size_t before = characters_in(source, at.column - 1);
    return {before + 1, characters_in(source, at.column - 1 + at.length) - before};
}

const char *name_of(check::certainty sure) {
    return sure == check::certainty::certain ? "certain" : "likely";
}

size_t line_in_file(const place &at) {
    return static_cast<size_t>(at.file_line != 0 ? at.file_line : at.line);
}

/* The text of the earlier pieces of the line is not known, so their bytes are counted. */
character_range characters_in_file(const place &at, std::string_view source) {
    character_range characters = characters_of(at, source);
    if (at.file_column > at.column)
        characters.column += at.file_column - at.column;
    return characters;
}

std::string_view source_of(const check::note &more, const check::finding &found) {
    if (!more.source.empty())
        return more.source;
    return more.at.line == found.at.line ? std::string_view(found.source) : std::string_view();
}

} // namespace report
