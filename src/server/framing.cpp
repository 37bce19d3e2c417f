/* framing.cpp: finds messages in a stream of bytes. */

#include "server/framing.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <utility>

namespace lsp {

namespace {

constexpr std::string_view LINE_END = "\r\n";
constexpr std::string_view HEADER_END = "\r\n\r\n";

bool is_same_name(std::string_view a, std::string_view b) {
    auto lower = [](char c) { return std::tolower(static_cast<unsigned char>(c)); };
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), [&](char x, char y) { return lower(x) == lower(y); });
}

std::string_view trimmed(std::string_view text) {
    std::size_t begin = std::min(text.find_first_not_of(" \t"), text.size());
    return text.substr(begin, text.find_last_not_of(" \t") + 1 - begin);
}

struct header_fields {
    std::optional<std::size_t> length;
    bool utf8 = true;
};

std::optional<std::size_t> number_of(std::string_view digits) {
    std::size_t number = 0;
    auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number);
    if (error != std::errc() || end != digits.data() + digits.size())
        return std::nullopt;
    return number;
}

/* The value may be in quotation marks. */
bool names_utf8(std::string_view type) {
    constexpr std::string_view NAME = "charset=";
    auto found = std::search(type.begin(), type.end(), NAME.begin(), NAME.end(),
                             [](char x, char y) { return std::tolower(static_cast<unsigned char>(x)) == y; });
    if (found == type.end())
        return true;
    std::string_view charset = type.substr(static_cast<std::size_t>(found - type.begin()) + NAME.size());
    charset = trimmed(charset.substr(0, charset.find(';')));
    if (charset.size() > 1 && charset.starts_with('"') && charset.ends_with('"'))
        charset = charset.substr(1, charset.size() - 2);
    return is_same_name(charset, "utf-8") || is_same_name(charset, "utf8");
}

/* Returns false if the line is not a field, or is a length that is not a number, or a second length. */
bool take_field(header_fields &to, std::string_view line) {
    std::size_t colon = line.find(':');
    if (colon == std::string_view::npos || colon == 0)
        return false;
    std::string_view name = line.substr(0, colon);
    std::string_view value = trimmed(line.substr(colon + 1));
    if (is_same_name(name, "Content-Length")) {
        if (to.length)
            return false;
        to.length = number_of(value);
        return to.length.has_value();
    }
    if (is_same_name(name, "Content-Type"))
        to.utf8 = names_utf8(value);
    return true;
}

/* The fields of a header, which is given without its empty line. Nothing if it is malformed or has no length. */
std::optional<header_fields> fields_of(std::string_view header) {
    header_fields fields;
    while (!header.empty()) {
        std::size_t end = header.find(LINE_END);
        if (end == std::string_view::npos || !take_field(fields, header.substr(0, end)))
            return std::nullopt;
        header.remove_prefix(end + LINE_END.size());
    }
    return fields.length ? std::optional(fields) : std::nullopt;
}

} // namespace

/* Returns true once the header is complete, or too long. */
bool frame_reader::take_header(std::string_view &bytes) {
    while (!bytes.empty() && header.size() < HEADER_MAX && !header.ends_with(HEADER_END)) {
        header += bytes.front();
        bytes.remove_prefix(1);
    }
    return header.size() == HEADER_MAX || header.ends_with(HEADER_END);
}

void frame_reader::begin_body() {
    std::optional<header_fields> fields;
    if (header.ends_with(HEADER_END))
        fields = fields_of(std::string_view(header).substr(0, header.size() - LINE_END.size()));
    header.clear();
    in_body = true;
    awaited = fields ? *fields->length : 0;
    current = {};
    if (!fields || awaited > SKIPPED_MAX)
        current.state = frame_state::bad_header;
    else if (awaited > BODY_MAX)
        current.state = frame_state::too_large;
    else if (!fields->utf8)
        current.state = frame_state::other_charset;
}

bool frame_reader::take_body(std::string_view &bytes) {
    std::size_t taken = std::min(awaited, bytes.size());
    if (current.state == frame_state::whole)
        current.body.append(bytes.substr(0, taken));
    bytes.remove_prefix(taken);
    awaited -= taken;
    return awaited == 0;
}

std::optional<frame> frame_reader::take(std::string_view &bytes) {
    for (;;) {
        if (lost)
            bytes = {};
        if (lost || (!in_body && !take_header(bytes)))
            return std::nullopt;
        if (!in_body) {
            begin_body();
            lost = current.state == frame_state::bad_header;
            if (current.state != frame_state::whole)
                return frame{current.state}; /* reported before its body has come, which is skipped */
        }
        if (!take_body(bytes))
            return std::nullopt;
        in_body = false;
        frame taken = std::exchange(current, {});
        if (taken.state == frame_state::whole)
            return taken;
    }
}

std::string framed(std::string_view body) {
    return "Content-Length: " + std::to_string(body.size()) + "\r\n\r\n" + std::string(body);
}

} // namespace lsp
