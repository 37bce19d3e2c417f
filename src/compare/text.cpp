/* text.cpp: texts and values as a person reads them. */

#include "cdef/cdef.h"
#include "compare/compare.h"

#include <charconv>
#include <cmath>
#include <limits>

namespace cdef {

namespace {

constexpr std::size_t TIMES_FILE = 16;
constexpr std::size_t AT_LEAST = 1 << 20;

/* A NaN's sign and payload are part of the value. */
template <class Float, class Bits> std::string text_of_nan(Float number) {
    constexpr Bits QUIET = Bits{1} << (std::numeric_limits<Float>::digits - 2);
    auto bits = std::bit_cast<Bits>(number);
    std::string text = std::signbit(number) ? "-nan" : "nan";
    if ((bits & (QUIET - 1)) != 0)
        appendf(text, "(0x%llx)", static_cast<unsigned long long>(bits & (QUIET - 1)));
    return text;
}

/* As few digits as tell the number from all others. */
template <class Float, class Bits> std::string text_of_float(Float number) {
    if (std::isnan(number))
        return text_of_nan<Float, Bits>(number);
    std::array<char, 64> text = {};
    auto result = std::to_chars(text.data(), text.data() + text.size(), number);
    return {text.data(), result.ptr};
}

std::string hex_of(std::span<const std::byte> data) {
    std::string text = "0x";
    for (std::byte b : data)
        appendf(text, "%02x", std::to_integer<unsigned>(b));
    return text;
}

std::string text_of_handle(const vx_resource_handle_t &handle) {
    std::string text;
    appendf(text, "%x:%x:%x:%x:%x", handle.header, handle.id.id1, handle.id.id2, handle.id.id3, handle.id.id4);
    return text;
}

} // namespace

std::string in_quotes(std::string_view text) {
    std::string shown = "'";
    for (char c : text) {
        if (c == '\'' || c == '\\')
            shown += {'\\', c};
        else if (c >= ' ' && c <= '~')
            shown += c;
        else
            appendf(shown, "\\x%02x", static_cast<unsigned>(static_cast<unsigned char>(c)));
    }
    return shown + "'";
}

std::string text_of(float number) {
    return text_of_float<float, std::uint32_t>(number);
}

std::string text_of(double number) {
    return text_of_float<double, std::uint64_t>(number);
}

std::optional<std::uint32_t> misplaced(const cdb::value &value, const cdb::bytes &strings) {
    constexpr std::size_t ALIGNMENT = 8;
    std::optional<std::uint32_t> place = value.place();
    if (!place)
        return std::nullopt;
    std::size_t count = strings.number<std::uint32_t>(*place);
    bool right = *place % ALIGNMENT == 0;
    if (value.type() == VX_BINARY_PTR)
        right = right && strings.holds(*place + cdb::value::BINARY_BYTES, count);
    else if (value.type() == VX_RSRC_HANDLE_PTR)
        right = right && strings.holds(*place, sizeof(vx_resource_handle_t));
    else if (value.type() == VX_SD_PTR || cdb::is_array(value.type()))
        right = right && value.elements().size() == count;
    return right ? std::nullopt : place;
}

std::optional<std::uint32_t> misplaced_bound(const cdb::value &value, const cdb::bytes &strings, place_in where) {
    vx_data_type_t type = value.type();
    bool has_bounds = type == VX_RSRC_HANDLE_PTR || type == VX_SD_PTR ? where == place_in::array : cdb::is_array(type);
    return has_bounds ? misplaced(value, strings) : value.place();
}

teller::teller(std::size_t file_size) : left(file_size * TIMES_FILE + AT_LEAST) {}

void teller::spend(std::size_t amount) {
    if (amount > left)
        throw trouble("values or texts that lead to the same place too often");
    left -= amount;
}

std::string teller::text_of(std::string_view text) {
    spend(text.size());
    return in_quotes(text);
}

/* The elements of structured data have types of their own. */
std::string teller::text_of_elements(const cdb::value &value, const cdb::bytes &strings) {
    bool structured = value.type() == VX_SD_PTR;
    std::string text;
    for (const cdb::value &element : value.elements()) {
        text += text.empty() ? "" : ", ";
        if (structured)
            text += std::string(cdb::name_of(element.type())) + " ";
        text += text_of(element, strings);
    }
    return (structured ? "{" : "[") + text + (structured ? "}" : "]");
}

std::string teller::text_of(const cdb::value &value, const cdb::bytes &strings) {
    spend(1);
    if (std::optional<std::uint32_t> offset = misplaced(value, strings))
        return "misplaced " + std::to_string(*offset);
    if (!value.present())
        return "nothing";
    switch (value.type()) {
    case VX_INT32:
    case VX_INT64:
        return std::to_string(value.integer());
    case VX_UINT32:
    case VX_UINT64:
        return std::to_string(value.natural());
    case VX_FLOAT32:
        return cdef::text_of(static_cast<float>(value.real()));
    case VX_FLOAT64:
        return cdef::text_of(value.real());
    case VX_CHAR_PTR:
        return text_of(value.text());
    case VX_BINARY_PTR:
        spend(value.binary().size());
        return hex_of(value.binary());
    case VX_RSRC_HANDLE_PTR:
        return text_of_handle(value.handle());
    default:
        return text_of_elements(value, strings);
    }
}

/* Of the types without bounds only an array has something all the same, to which elements belong. */
std::string teller::text_of_bound(const cdb::value &value, const cdb::bytes &strings, place_in where) {
    if (std::optional<std::uint32_t> offset = misplaced_bound(value, strings, where))
        return "misplaced " + std::to_string(*offset);
    if (!cdb::is_array(value.type()) || !value.present())
        return text_of(value, strings);
    std::string text;
    for (const cdb::value &element : value.elements())
        text += (text.empty() ? "" : ", ") + text_of_bound(element, strings, place_in::array);
    return "[" + text + "]";
}

} // namespace cdef
