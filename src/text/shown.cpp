/* shown.cpp: makes texts of unknown origin safe to show. */

#include "text/shown.h"
#include "text/append.h"
#include "text/utf8.h"

#include <algorithm>
#include <iterator>

namespace text {

namespace {

struct range {
    char32_t first;
    char32_t last;
};

/* Characters that control a terminal, break a line or are invisible: control characters, separators, characters that
 * change the writing direction, and those that Unicode calls default-ignorable. Combining marks are visible, so they
 * are not in this table. */
constexpr range unprintable[] = {{0x0, 0x1F},        {0x7F, 0x9F},       {0xAD, 0xAD},      {0x34F, 0x34F},
                                 {0x61C, 0x61C},     {0x115F, 0x1160},   {0x17B4, 0x17B5},  {0x180B, 0x180F},
                                 {0x200B, 0x200F},   {0x2028, 0x202E},   {0x2060, 0x206F},  {0x3164, 0x3164},
                                 {0xFE00, 0xFE0F},   {0xFEFF, 0xFEFF},   {0xFFA0, 0xFFA0},  {0xFFF0, 0xFFFB},
                                 {0x1BCA0, 0x1BCA3}, {0x1D173, 0x1D17A}, {0xE0000, 0xE0FFF}};

bool is_printable(char32_t character) {
    return std::none_of(std::begin(unprintable), std::end(unprintable),
                        [character](const range &r) { return character >= r.first && character <= r.last; });
}

void append_byte(std::string &to, char c) {
    appendf(to, "\\x%02x", static_cast<unsigned>(static_cast<unsigned char>(c)));
}

void append_escaped(std::string &to, std::string_view bytes) {
    for (char c : bytes)
        switch (c) {
        case '\t':
            to += "\\t";
            break;
        case '\n':
            to += "\\n";
            break;
        case '\r':
            to += "\\r";
            break;
        default:
            append_byte(to, c);
        }
}

/* How many characters at the start can be shown without a closer look, which is nearly always all of them. */
std::size_t plain_length(std::string_view bytes, std::string_view slashed) {
    auto is_plain = [slashed](char c) { return c >= ' ' && c <= '~' && slashed.find(c) == std::string_view::npos; };
    return static_cast<std::size_t>(std::find_if_not(bytes.begin(), bytes.end(), is_plain) - bytes.begin());
}

/* slashed: characters that get a backslash. */
void append_escaped(std::string &shown, std::string_view bytes, std::string_view slashed) {
    for (;;) {
        std::size_t plain = plain_length(bytes, slashed);
        shown += bytes.substr(0, plain);
        bytes.remove_prefix(plain);
        if (bytes.empty())
            return;
        std::string_view character = bytes.substr(0, length_or_1(bytes));
        if (slashed.find(character) != std::string_view::npos)
            shown += '\\';
        if (printable_length(bytes) != 0)
            shown += character;
        else
            append_escaped(shown, character);
        bytes.remove_prefix(character.size());
    }
}

} // namespace

std::size_t printable_length(std::string_view bytes) {
    std::size_t length = utf8_length(bytes);
    return length != 0 && is_printable(decode(bytes.substr(0, length))) ? length : 0;
}

std::string escaped(std::string_view bytes) {
    std::string shown;
    append_escaped(shown, bytes, {});
    return shown;
}

void append_quoted(std::string &to, std::string_view bytes) {
    to += '"';
    append_escaped(to, bytes, "\"\\");
    to += '"';
}

std::string quoted(std::string_view bytes) {
    std::string shown;
    append_quoted(shown, bytes);
    return shown;
}

std::string escaped_ascii(std::string_view bytes) {
    std::string shown;
    for (char c : bytes) {
        if (c == '\'' || c == '\\')
            shown += {'\\', c};
        else if (c >= ' ' && c <= '~')
            shown += c;
        else
            append_byte(shown, c);
    }
    return shown;
}

std::string quoted_ascii(std::string_view bytes) {
    return "'" + escaped_ascii(bytes) + "'";
}

std::string masked(std::string_view bytes) {
    auto is_plain = [](char c) { return c == '\t' || (c >= ' ' && c <= '~'); };
    if (std::all_of(bytes.begin(), bytes.end(), is_plain)) /* nearly all texts are */
        return std::string(bytes);
    std::string shown;
    while (!bytes.empty()) {
        std::size_t length = length_or_1(bytes);
        bool is_safe = bytes[0] == '\t' || printable_length(bytes) != 0;
        shown += is_safe ? bytes.substr(0, length) : "?";
        bytes.remove_prefix(length);
    }
    return shown;
}

} // namespace text
