/* utf8.cpp: where UTF-8 characters end. */

#include "text/utf8.h"

#include <algorithm>
#include <string>

namespace text {

std::size_t utf8_length(std::string_view bytes) {
    auto at = [bytes](std::size_t i) { return i < bytes.size() ? static_cast<unsigned char>(bytes[i]) : 0U; };
    unsigned lead = at(0);
    std::size_t length = lead < 0x80                   ? 1
                         : lead >= 0xC2 && lead < 0xE0 ? 2
                         : lead >= 0xE0 && lead < 0xF0 ? 3
                         : lead >= 0xF0 && lead < 0xF5 ? 4
                                                       : 0;
    if (bytes.size() < length || length == 0)
        return 0;
    for (std::size_t i = 1; i < length; ++i)
        if ((at(i) & 0xC0) != 0x80)
            return 0;
    bool overlong = (lead == 0xE0 && at(1) < 0xA0) || (lead == 0xF0 && at(1) < 0x90);
    bool outside = (lead == 0xED && at(1) >= 0xA0) || (lead == 0xF4 && at(1) >= 0x90);
    return overlong || outside ? 0 : length;
}

std::size_t length_or_1(std::string_view bytes) {
    return bytes.empty() ? 0 : std::max<std::size_t>(utf8_length(bytes), 1);
}

std::size_t length_replaced(std::string_view bytes) {
    if (std::size_t length = utf8_length(bytes); length != 0 || bytes.empty())
        return length;
    for (std::size_t whole = 4; whole > 2; --whole)
        for (std::size_t length = std::min(whole - 1, bytes.size()); length > 1; --length) {
            std::string completed(bytes.substr(0, length));
            completed.append(whole - length, '\x80');
            if (utf8_length(completed) == whole)
                return length;
        }
    return 1;
}

bool is_utf8(std::string_view bytes) {
    while (!bytes.empty()) {
        std::size_t length = utf8_length(bytes);
        if (length == 0)
            return false;
        bytes.remove_prefix(length);
    }
    return true;
}

std::size_t characters_in(std::string_view bytes) {
    auto begins = [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; };
    return static_cast<std::size_t>(std::count_if(bytes.begin(), bytes.end(), begins));
}

char32_t decode(std::string_view character) {
    auto lead = static_cast<unsigned char>(character[0]);
    if (character.size() == 1)
        return lead;
    char32_t point = lead & (0x7FU >> character.size());
    for (char c : character.substr(1))
        point = point << 6 | (static_cast<unsigned char>(c) & 0x3FU);
    return point;
}

} // namespace text
