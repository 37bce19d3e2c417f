/* cdef_check_text.cpp: findings as compilers write them. */

#include "cdef_check.h"

#include <algorithm>

namespace cdef::check {

namespace {

/* Nothing of a source may command a terminal. */
std::string visible(std::string_view text) {
    std::string shown(text);
    for (char &c : shown)
        if (c != '\t' && (static_cast<unsigned char>(c) < ' ' || c == '\x7F'))
            c = '?';
    return shown;
}

bool begins_character(char c) {
    return (static_cast<unsigned char>(c) & 0xC0) != 0x80;
}

/* "file:line:column: ", as much of it as there is. */
std::string prefix(const std::string &file, const place &at) {
    std::string text = file + ":";
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
    for (char c : source.substr(0, begin))
        if (begins_character(c))
            text += c == '\t' ? '\t' : ' ';
    std::string_view marked = source.substr(begin, at.length);
    auto width = static_cast<size_t>(std::count_if(marked.begin(), marked.end(), begins_character));
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
                found.code + (found.error ? "" : std::string(" ") + found.name) + "]\n";
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
