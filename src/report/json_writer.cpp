/* json_writer.cpp: writes JSON piece by piece. */

#include "report/json_writer.h"

#include "text/hex.h"
#include "text/utf8.h"

#include <algorithm>

namespace report {

namespace {

constexpr std::size_t PORTION = 65536;      /* bytes that are written at once */
constexpr char32_t REPLACEMENT = U'\uFFFD'; /* for bytes that are not UTF-8 */
constexpr char32_t FIRST_OF_PAIRS = 0x10000;

void append_unit(std::string &to, char32_t unit) {
    to += "\\u";
    for (int shift = 12; shift >= 0; shift -= 4)
        to += text::HEX_DIGITS[unit >> shift & 0xF];
}

/* A character of more than 16 bits takes two UTF-16 units. */
void append_escaped(std::string &to, char32_t character) {
    if (character < FIRST_OF_PAIRS)
        return append_unit(to, character);
    append_unit(to, 0xD800 + ((character - FIRST_OF_PAIRS) >> 10));
    append_unit(to, 0xDC00 + ((character - FIRST_OF_PAIRS) & 0x3FF));
}

/* The letter that, after a backslash, means this character; 0 if there is none. */
char short_escape(char c) {
    constexpr std::string_view characters = "\"\\\b\f\n\r\t";
    constexpr std::string_view letters = "\"\\bfnrt";
    size_t at = characters.find(c);
    return at == std::string_view::npos ? '\0' : letters[at];
}

bool is_plain(char c) {
    return c >= ' ' && c <= '~' && c != '"' && c != '\\';
}

} // namespace

void append_json(std::string &to, std::string_view text) {
    to += '"';
    while (!text.empty()) {
        auto plain = static_cast<std::size_t>(std::find_if_not(text.begin(), text.end(), is_plain) - text.begin());
        to += text.substr(0, plain);
        text.remove_prefix(plain);
        if (text.empty())
            break;
        std::size_t length = text::length_replaced(text);
        if (char letter = short_escape(text.front()); letter != '\0')
            to.append({'\\', letter});
        else
            append_escaped(to, text::utf8_length(text) == 0 ? REPLACEMENT : text::decode(text.substr(0, length)));
        text.remove_prefix(length);
    }
    to += '"';
}

void json_writer::close() {
    level closed = levels.back();
    levels.pop_back();
    if (!closed.is_empty)
        new_line();
    text += closed.end;
    if (levels.empty())
        text += '\n';
    if (levels.empty() || text.size() >= PORTION)
        write_out();
}

void json_writer::write_out() {
    if (is_held)
        return;
    to(text);
    text.clear();
}

void json_writer::add_whole(const std::function<void()> &members) {
    struct {
        std::size_t text, levels;
        bool is_empty;
    } before = {text.size(), levels.size(), levels.back().is_empty};
    is_held = true;
    try {
        members();
    } catch (...) {
        text.resize(before.text);
        levels.resize(before.levels);
        levels.back().is_empty = before.is_empty;
        is_held = false;
        throw;
    }
    is_held = false;
    if (text.size() >= PORTION)
        write_out();
}

void json_writer::add_text(std::string_view key, std::string_view value) {
    next(key);
    append_json(text, value);
}

void json_writer::add_number(std::string_view key, std::uint64_t number) {
    add_json(key, std::to_string(number));
}

void json_writer::add_truth(std::string_view key, bool is) {
    add_json(key, is ? "true" : "false");
}

void json_writer::add_null(std::string_view key) {
    add_json(key, "null");
}

void json_writer::add_json(std::string_view key, std::string_view value) {
    next(key);
    text += value;
}

void json_writer::add_schema(std::string_view file, unsigned version) {
    add_text("schema", file);
    add_number("version", version);
}

void json_writer::open(std::string_view key, char start, char end) {
    next(key);
    text += start;
    levels.push_back({end});
}

void json_writer::next(std::string_view key) {
    if (levels.empty())
        return;
    if (text.size() >= PORTION)
        write_out();
    if (!levels.back().is_empty)
        text += ',';
    levels.back().is_empty = false;
    new_line();
    if (levels.back().end == '}') {
        append_json(text, key);
        text += ": ";
    }
}

void json_writer::new_line() {
    text += '\n';
    text.append(levels.size() * 2, ' ');
}

} // namespace report
