/* text.cpp: findings as compilers write them. */

#include "cdef/dump/dump.h"
#include "check/check.h"

#include <algorithm>

namespace cdef::check {

/* The bytes of the character that a text begins with: those of well-formed UTF-8, or else 1. */
static std::size_t length_of(std::string_view text) {
    return std::max<std::size_t>(dump::utf8_length(text), 1);
}

std::string visible(std::string_view text) {
    std::string shown;
    while (!text.empty()) {
        std::size_t length = length_of(text);
        bool harmless = text[0] == '\t' || dump::printable_length(text) != 0;
        shown += harmless ? text.substr(0, length) : "?";
        text.remove_prefix(length);
    }
    return shown;
}

namespace {

/* "file:line:column: ", as much of it as there is. */
std::string prefix(const std::string &file, const place &at) {
    std::string text = visible(file) + ":";
    if (at.line != 0)
        text += std::to_string(at.line) + ":";
    if (at.line != 0 && at.column != 0)
        text += std::to_string(at.column) + ":";
    return text + " ";
}

/* Blanks and tabs up to the place, then a caret for each character. */
std::string carets(std::string_view source, const place &at) {
    std::string text;
    size_t begin = std::min(at.column - 1, source.size());
    for (size_t i = 0; i < begin; i += length_of(source.substr(i)))
        text += source[i] == '\t' ? '\t' : ' ';
    size_t end = begin + std::min(at.length, source.size() - begin);
    size_t width = 0;
    for (size_t i = begin; i < end; i += length_of(source.substr(i)))
        ++width;
    return text + "^" + std::string(width > 1 ? width - 1 : 0, '~');
}

std::string excerpt(const place &at, const std::string &source) {
    if (at.line == 0 || at.column == 0)
        return {};
    std::string number = std::to_string(at.line);
    std::string margin(std::max<size_t>(number.size(), 5), ' ');
    return margin.substr(number.size()) + number + " | " + visible(source) + "\n" + margin + " | " +
           carets(source, at) + "\n";
}

} // namespace

std::string as_text(const result &checked) {
    std::string text;
    for (const finding &found : checked.findings) {
        text += prefix(checked.file, found.at) + (found.error ? "error: " : "warning: ") + visible(found.text) + " [" +
                found.code;
        if (!found.error)
            text.append(" ").append(found.name);
        text += "]\n";
        text += excerpt(found.at, found.source);
        for (const note &more : found.notes) {
            text += prefix(checked.file, more.at) + "note: " + visible(more.text) + "\n";
            if (!more.source.empty())
                text += excerpt(more.at, more.source);
        }
    }
    return text;
}

} // namespace cdef::check
