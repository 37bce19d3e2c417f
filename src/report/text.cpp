/* text.cpp: findings as compilers write them. */

#include "check/check.h"
#include "text/shown.h"
#include "text/utf8.h"

#include <algorithm>

namespace cdef::check {

namespace {

/* "file:line:column: ", as much of it as there is. */
std::string prefix(const std::string &file, const place &at) {
    std::string text = text::masked(file) + ":";
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
    for (size_t i = 0; i < begin; i += text::length_or_1(source.substr(i)))
        text += source[i] == '\t' ? '\t' : ' ';
    size_t end = begin + std::min(at.length, source.size() - begin);
    size_t width = 0;
    for (size_t i = begin; i < end; i += text::length_or_1(source.substr(i)))
        ++width;
    return text + "^" + std::string(width > 1 ? width - 1 : 0, '~');
}

std::string excerpt(const place &at, const std::string &source) {
    if (at.line == 0 || at.column == 0)
        return {};
    std::string number = std::to_string(at.line);
    std::string margin(std::max<size_t>(number.size(), 5), ' ');
    return margin.substr(number.size()) + number + " | " + text::masked(source) + "\n" + margin + " | " +
           carets(source, at) + "\n";
}

} // namespace

std::string as_text(const result &checked) {
    std::string text;
    for (const finding &found : checked.findings) {
        text += prefix(checked.file, found.at) + (found.error ? "error: " : "warning: ") + text::masked(found.text) +
                " [" + found.code;
        if (!found.error)
            text.append(" ").append(found.name);
        text += "]\n";
        text += excerpt(found.at, found.source);
        for (const note &more : found.notes) {
            text += prefix(checked.file, more.at) + "note: " + text::masked(more.text) + "\n";
            if (!more.source.empty())
                text += excerpt(more.at, more.source);
        }
    }
    return text;
}

} // namespace cdef::check
