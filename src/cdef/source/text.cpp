/* text.cpp: lines and values, written so that the compiler reads back what they were written for. */

#include "cdef/source/text.h"

#include "language/limits.h"
#include "text/append.h"
#include "text/hex.h"
#include "text/number.h"

#include <algorithm>
#include <array>
#include <cmath>

namespace cdef::source {

namespace {

constexpr std::string_view BLANKS = " \t";

/* True of a character that is text wherever it is in a line, except that blanks at the end are removed. Letters and
 * digits, which most characters are, come after the special ones. */
bool is_never_special(char c) {
    return c > '/' || (c != '\n' && c != '\0' && c != '"' && c != '#' && c != '/');
}

/* True if the compiler reads a whole line as text that ends with this and has no special characters before it: there is
 * no newline, no comment, and nothing at the end that the compiler removes. */
bool is_all_text(std::string_view line) {
    if (std::all_of(line.begin(), line.end(), is_never_special))
        return !line.ends_with(' ') && !line.ends_with('\t');
    bool quoted = false;
    for (std::size_t i = 0; i < line.size(); ++i) {
        char next = i + 1 < line.size() ? line[i + 1] : '\0';
        if (line[i] == '\n' || line[i] == '\0')
            return false;
        if (line[i] == '"')
            quoted = !quoted;
        else if (!quoted && (line[i] == '#' || (line[i] == '/' && (next == '/' || next == '*'))))
            return false;
    }
    return !line.ends_with(' ') && !line.ends_with('\t') && !line.ends_with('#');
}

bool is_blank(char c) {
    return c == ' ' || c == '\t';
}

/* text: not empty */
bool begins_with_quote(std::string_view text) {
    std::size_t first = is_blank(text.front()) ? text.find_first_not_of(BLANKS) : 0;
    return first != std::string_view::npos && text[first] == '"';
}

/* ---- Values ---------------------------------------------------------------------------------------------------- */

/* Decimal, except where that would underflow, because the compiler remembers it and refuses later zeros. */
template <class Float> std::string text_of_real(Float number) {
    if (std::fpclassify(number) != FP_SUBNORMAL)
        return text::shortest(number);
    std::string text;
    text::appendf(text, "%a", static_cast<double>(number));
    return text;
}

/* A list of one text. */
std::vector<std::string> only(std::string text) {
    std::vector<std::string> texts;
    texts.push_back(std::move(text));
    return texts;
}

/* True for characters that are written as they are in a binary's text. */
enum class plain : std::uint8_t { printable, all };

std::string escaped(std::byte b, plain which, bool in_pair) {
    auto c = static_cast<char>(b);
    bool safe = c > ' ' && c <= '~' && std::string_view("\"#/").find(c) == std::string_view::npos;
    bool usable = c != '\0' && c != '\n' && c != '\\' && (c != ',' || !in_pair);
    if (usable && (safe || which == plain::all))
        return {c};
    std::string text;
    text::appendf(text, "\\%03o", std::to_integer<unsigned>(b));
    return text;
}

/* The form with escapes is shorter, but the compiler drops its first four bytes and adds as many zeros at the end. */
std::string text_with_escapes(std::span<const std::byte> data, plain which, bool in_pair) {
    constexpr std::size_t LOST = 4;
    std::string text(LOST, '.');
    for (std::byte b : data.first(data.size() - LOST))
        text += escaped(b, which, in_pair);
    return text;
}

bool ends_in_zeros(std::span<const std::byte> data) {
    return data.size() >= 4 && std::all_of(data.end() - 4, data.end(), [](std::byte b) { return b == std::byte{0}; });
}

std::vector<std::string> texts_of_binary(std::span<const std::byte> data, bool in_pair) {
    if (data.size() >= LINE_MAX_CHARS)
        return {};
    std::vector<std::string> texts = only("0x" + text::hex_of(data));
    if (ends_in_zeros(data))
        for (plain which : {plain::printable, plain::all})
            texts.push_back(text_with_escapes(data, which, in_pair));
    return texts;
}

/* A double that is a signalling NaN has no text. */
std::vector<std::string> texts_of_double(double number) {
    constexpr std::uint64_t QUIET = std::uint64_t{1} << 51;
    if (std::isnan(number) && (std::bit_cast<std::uint64_t>(number) & QUIET) == 0)
        return {};
    return only(text_of_real(number));
}

bool has_no_bytes(const cdb::value &v) {
    return v.type() == VX_CHAR_PTR ? v.text().empty() : v.binary().empty();
}

bool is_empty_handle(const cdb::value &v) {
    vx_resource_handle_t h = v.handle();
    return (h.header | h.id.id1 | h.id.id2 | h.id.id3 | h.id.id4) == 0;
}

} // namespace

bool append_attribute_line(std::string &to, std::string_view name, std::string_view value) {
    if (value.empty())
        return false;
    bool is_plain = !begins_with_quote(value) && is_all_text(value);
    bool is_quoted = !is_plain && !value.ends_with('\\') && is_all_text("\"" + std::string(value) + "\"");
    std::size_t size = 1 + name.size() + 1 + value.size() + (is_plain ? 0 : 2);
    if ((!is_plain && !is_quoted) || size > LINE_MAX_CHARS)
        return false;
    std::array<char, LINE_MAX_CHARS + 1> line;
    char *end = line.data();
    auto add = [&end](std::string_view text) { end = std::copy(text.begin(), text.end(), end); };
    *end++ = '\t';
    add(name);
    *end++ = '=';
    add(is_plain ? "" : "\"");
    add(value);
    add(is_plain ? "" : "\"");
    *end++ = '\n';
    to.append(line.data(), end);
    return true;
}

std::vector<std::string> texts_of(const cdb::value &value, bool in_pair) {
    if (!value.present())
        return {};
    switch (value.type()) {
    case VX_INT32:
    case VX_INT64:
        return only(std::to_string(value.integer()));
    case VX_UINT32:
    case VX_UINT64:
        return only(std::to_string(value.natural()));
    case VX_FLOAT32:
        return only(text_of_real(static_cast<float>(value.real())));
    case VX_FLOAT64:
        return texts_of_double(value.real());
    case VX_CHAR_PTR:
        if (in_pair && value.text().find(',') != std::string_view::npos)
            return {};
        return only(std::string(value.text().substr(0, LINE_MAX_CHARS)));
    case VX_BINARY_PTR:
        return texts_of_binary(value.binary(), in_pair);
    default:
        return {};
    }
}

bool is_default(const cdb::value &value) {
    switch (value.type()) {
    case VX_UNKNOWN:
    case VX_NONE:
    case VX_SBS_PTR:
        return true;
    case VX_INT32:
    case VX_INT64:
        return value.integer() == 0;
    case VX_UINT32:
    case VX_UINT64:
        return value.natural() == 0;
    case VX_FLOAT32:
    case VX_FLOAT64:
        return value.real() == 0 && !std::signbit(value.real());
    case VX_CHAR_PTR:
    case VX_BINARY_PTR:
        return value.present() && has_no_bytes(value);
    case VX_RSRC_HANDLE_PTR:
        return value.present() && is_empty_handle(value);
    case VX_SD_PTR:
        return false;
    default: /* arrays */
        return value.elements().size() == 1 && is_default(value.elements()[0]);
    }
}

} // namespace cdef::source
