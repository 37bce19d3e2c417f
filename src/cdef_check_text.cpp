/* cdef_check_text.cpp: findings as compilers write them. */

#include "cdef_check.h"

#include <algorithm>

namespace cdef::check {

namespace {

/* The bytes of the character that a text begins with: those of well-formed UTF-8, or else 1. */
size_t length_of(std::string_view text) {
    auto lead = static_cast<unsigned char>(text[0]);
    size_t length = lead < 0xC2 ? 1 : lead < 0xE0 ? 2 : lead < 0xF0 ? 3 : lead < 0xF5 ? 4 : 1;
    if (length > text.size())
        return 1;
    for (size_t i = 1; i < length; ++i)
        if ((static_cast<unsigned char>(text[i]) & 0xC0) != 0x80)
            return 1;
    return length;
}

unsigned code_point(std::string_view character) {
    unsigned code = static_cast<unsigned char>(character[0]);
    if (character.size() > 1)
        code &= 0x7Fu >> character.size();
    for (char c : character.substr(1))
        code = code << 6 | (static_cast<unsigned char>(c) & 0x3Fu);
    return code;
}

/* Control characters, those that are no ASCII too; what turns the direction of writing or is not seen; and bytes that
 * are no UTF-8, which a terminal may take for either. */
bool is_unsafe(std::string_view character) {
    unsigned code = code_point(character);
    if (character.size() == 1)
        return code != '\t' && (code < ' ' || code >= 0x7F);
    bool control = code < 0xA0 || code == 0x2028 || code == 0x2029;
    bool unseen = code == 0x061C || code == 0xFEFF || (code >= 0x200B && code <= 0x200F) ||
                  (code >= 0x202A && code <= 0x202E) || (code >= 0x2066 && code <= 0x2069);
    return control || unseen;
}

} // namespace

std::string visible(std::string_view text) {
    std::string shown;
    for (size_t length = 0; !text.empty(); text.remove_prefix(length)) {
        length = length_of(text);
        if (is_unsafe(text.substr(0, length)))
            shown += '?';
        else
            shown += text.substr(0, length);
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
