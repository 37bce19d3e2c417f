/* text.cpp: texts and values as a person reads them. */

#include "compare/text.h"

#include "text/append.h"
#include "text/hex.h"
#include "text/number.h"
#include "text/shown.h"

namespace compare {

namespace {

constexpr std::size_t TIMES_FILE = 16;
constexpr std::size_t AT_LEAST = 1 << 20;

/* The offset of an out-of-line value, if no such value is stored there; nothing for a value that is in its place or
 * is none. */
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

std::string text_of_handle(const vx_resource_handle_t &handle) {
    std::string text;
    text::appendf(text, "%x:%x:%x:%x:%x", handle.header, handle.id.id1, handle.id.id2, handle.id.id3, handle.id.id4);
    return text;
}

} // namespace

value_writer::value_writer(std::size_t file_size) : left(file_size * TIMES_FILE + AT_LEAST) {}

void value_writer::spend(std::size_t amount) {
    if (amount > left)
        throw too_entangled("values or texts that lead to the same place too often");
    left -= amount;
}

std::string value_writer::text_of(std::string_view text) {
    spend(text.size());
    return text::quoted_ascii(text);
}

/* The elements of structured data have types of their own. */
std::string value_writer::text_of_elements(const cdb::value &value, const cdb::bytes &strings) {
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

std::string value_writer::text_of(const cdb::value &value, const cdb::bytes &strings) {
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
        return text::shortest(static_cast<float>(value.real()));
    case VX_FLOAT64:
        return text::shortest(value.real());
    case VX_CHAR_PTR:
        return text_of(value.text());
    case VX_BINARY_PTR:
        spend(value.binary().size());
        return "0x" + text::hex_of(value.binary());
    case VX_RSRC_HANDLE_PTR:
        return text_of_handle(value.handle());
    default:
        return text_of_elements(value, strings);
    }
}

/* What is not the attribute's own is a number of another type. */
std::string value_writer::text_of_bound(const cdb::value &bound, bool is_own, const cdb::bytes &strings,
                                        const cdb::ownership &owners) {
    if (!is_own && bound.place())
        return "misplaced " + std::to_string(*bound.place());
    if (!cdb::is_array(bound.type()) || !bound.present())
        return text_of(bound, strings);
    std::string text;
    std::size_t cell = *bound.place() + cdb::value::ELEMENTS;
    for (const cdb::value &element : bound.elements()) {
        text += text.empty() ? "" : ", ";
        text += text_of_bound(element, owners.is_own(strings, cell), strings, owners);
        cell += sizeof(vx_value_t);
    }
    return "[" + text + "]";
}

} // namespace compare
