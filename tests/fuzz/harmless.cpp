/* harmless.cpp: which texts may be shown on a terminal. */

#include "harmless.h"

#include "fuzz.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <string_view>

namespace fuzz {

namespace {

/* A second definition of what a terminal must not get, by bytes; the program's own definition is by characters. Line
 * separator, marks and overrides of the writing direction, byte order mark. */
constexpr std::array<std::string_view, 9> acted_upon = {"\xE2\x80\xA8", "\xE2\x80\x8E", "\xE2\x80\x8F",
                                                        "\xE2\x80\xAA", "\xE2\x80\xAE", "\xE2\x81\xA6",
                                                        "\xE2\x81\xA9", "\xEF\xBB\xBF", "\xC2\xAD"};

/* A control character that UTF-8 has two bytes for. */
bool is_long_control(std::string_view text, std::size_t at) {
    return text[at] == '\xC2' && at + 1 < text.size() && static_cast<unsigned char>(text[at + 1]) < 0xA0;
}

/* How many bytes the character takes that begins here; 0: it is not UTF-8, or longer than it has to be. */
std::size_t character_size(std::string_view text) {
    constexpr std::array<unsigned, 5> least = {0, 0, 0x80, 0x800, 0x10000};
    auto byte = [&](std::size_t i) { return static_cast<unsigned char>(text[i]); };
    std::size_t size = byte(0) < 0x80 ? 1 : byte(0) < 0xC0 ? 0 : byte(0) < 0xE0 ? 2 : byte(0) < 0xF0 ? 3 : 4;
    if (size < 2 || size > text.size())
        return size == 1;
    unsigned code = byte(0) & (0x7FU >> size);
    for (std::size_t i = 1; i < size; ++i) {
        if ((byte(i) & 0xC0) != 0x80)
            return 0;
        code = code << 6 | (byte(i) & 0x3F);
    }
    bool is_surrogate = code >= 0xD800 && code < 0xE000;
    return code < least[size] || code > 0x10FFFF || is_surrogate ? 0 : size;
}

bool is_utf8(std::string_view text) {
    while (!text.empty()) {
        std::size_t size = character_size(text);
        if (size == 0)
            return false;
        text.remove_prefix(size);
    }
    return true;
}

bool is_ascii(const std::string &text) {
    return std::all_of(text.begin(), text.end(), [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

/* True if all bytes are printable ASCII, newlines and tabs, as nearly always. Nothing here needs a sanitizer, and with
 * one, this would take longer than some of the functions that made the text. */
__attribute__((no_sanitize("address", "undefined"))) bool is_plain(const char *text, std::size_t size) {
    unsigned strange = 0;
    for (const char *end = text + size; text != end; ++text) {
        auto c = static_cast<unsigned char>(*text);
        unsigned is_printable = static_cast<unsigned char>(c - 0x20) < 0x7F - 0x20;
        strange |= 1U ^ (is_printable | static_cast<unsigned>(c == '\n') | static_cast<unsigned>(c == '\t'));
    }
    return strange == 0;
}

} // namespace

void expect_harmless(const std::string &text) {
    if (is_plain(text.data(), text.size()))
        return;
    for (std::size_t i = 0; i < text.size(); ++i) {
        auto c = static_cast<unsigned char>(text[i]);
        bool control = (c < 0x20 && c != '\n' && c != '\t') || c == 0x7F || is_long_control(text, i);
        require(!control, "a control character is shown");
    }
    if (is_ascii(text))
        return;
    for (std::string_view sequence : acted_upon)
        require(text.find(sequence) == std::string::npos, "a character is shown that a terminal acts upon");
    require(is_utf8(text), "what is shown is no UTF-8");
}

} // namespace fuzz
