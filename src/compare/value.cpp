/* value.cpp: values as they are compared. */

#include "compare/value.h"

#include "text/append.h"
#include "text/number.h"

#include <bit>

namespace compare {

namespace {

/* True if an out-of-line value of the type is stored at the offset. */
bool is_stored(const cdb::value &value, std::size_t place, const cdb::bytes &strings) {
    constexpr std::size_t ALIGNMENT = 8;
    std::size_t count = strings.number<std::uint32_t>(place);
    if (place % ALIGNMENT != 0)
        return false;
    if (value.type() == VX_BINARY_PTR)
        return strings.holds(place + cdb::value::BINARY_BYTES, count);
    if (value.type() == VX_RSRC_HANDLE_PTR)
        return strings.holds(place, sizeof(vx_resource_handle_t));
    bool has_elements = value.type() == VX_SD_PTR || cdb::is_array(value.type());
    return !has_elements || value.elements().size() == count;
}

std::string text_of_handle(const vx_resource_handle_t &handle) {
    std::string text;
    text::appendf(text, "%x:%x:%x:%x:%x", handle.header, handle.id.id1, handle.id.id2, handle.id.id3, handle.id.id4);
    return text;
}

std::string_view characters_of(std::span<const std::byte> raw) {
    return {reinterpret_cast<const char *>(raw.data()), raw.size()};
}

look with_number(shape is, std::string_view text) {
    look seen = {.is = is};
    seen.number.assign(text);
    return seen;
}

look look_at_number(const cdb::value &value) {
    switch (value.type()) {
    case VX_INT32:
    case VX_INT64:
        return with_number(shape::NUMBER, std::to_string(value.integer()));
    case VX_UINT32:
    case VX_UINT64:
        return with_number(shape::NUMBER, std::to_string(value.natural()));
    case VX_FLOAT32:
        return with_number(shape::NUMBER, text::shortest(static_cast<float>(value.real())));
    default:
        return with_number(shape::NUMBER, text::shortest(value.real()));
    }
}

bool is_number(vx_data_type_t type) {
    return type >= VX_INT32 && type <= VX_FLOAT64;
}

/* True if two numbers of one type have the same bits. Others may still be shown alike, because not every bit of a NaN
 * is shown. */
bool have_same_bits(const cdb::value &a, const cdb::value &b) {
    return a.integer() == b.integer() && a.natural() == b.natural() &&
           std::bit_cast<std::uint64_t>(a.real()) == std::bit_cast<std::uint64_t>(b.real());
}

bool elements_read_alike(const owned_value &a, const owned_value &b, std::size_t count, bool have_types) {
    for (std::size_t i = 0; i < count; ++i) {
        owned_value one = element_of(a, i), other = element_of(b, i);
        if (have_types && one.value.type() != other.value.type())
            return false;
        if (!read_alike(one, other))
            return false;
    }
    return true;
}

} // namespace

owned_value value_in(const cdb::bytes &area, std::size_t at, vx_data_type_t type, const cdb::bytes &strings,
                     const cdb::ownership &owners) {
    return {{area, at, type, strings}, owners.is_own(area, at), strings, &owners};
}

look look_at(const owned_value &v) {
    std::optional<std::uint32_t> place = v.value.place();
    if (place && (!v.is_own || !is_stored(v.value, *place, v.strings)))
        return with_number(shape::MISPLACED, std::to_string(*place));
    if (!v.value.present())
        return {};
    vx_data_type_t type = v.value.type();
    if (is_number(type))
        return look_at_number(v.value);
    if (type == VX_CHAR_PTR)
        return {.is = shape::TEXT, .bytes = v.value.text()};
    if (type == VX_BINARY_PTR)
        return {.is = shape::BINARY, .bytes = characters_of(v.value.binary())};
    if (type == VX_RSRC_HANDLE_PTR)
        return with_number(shape::HANDLE, text_of_handle(v.value.handle()));
    return {.is = type == VX_SD_PTR ? shape::STRUCTURE : shape::ARRAY, .count = v.value.elements().size()};
}

owned_value element_of(const owned_value &v, std::size_t index) {
    bool is_structure = v.value.type() == VX_SD_PTR;
    std::size_t cell = *v.value.place() + cdb::value::ELEMENTS;
    if (is_structure)
        cell += index * sizeof(vx_structured_data_element_t) + offsetof(vx_structured_data_element_t, value);
    else
        cell += index * sizeof(vx_value_t);
    return {v.value.elements()[index], v.owners->is_own(v.strings, cell), v.strings, v.owners};
}

bool read_alike(const owned_value &a, const owned_value &b) {
    if (a.value.type() == b.value.type() && is_number(a.value.type()) && have_same_bits(a.value, b.value))
        return true;
    look one = look_at(a), other = look_at(b);
    if (one.is != other.is || one.count != other.count || one.content() != other.content())
        return false;
    return elements_read_alike(a, b, one.count, one.is == shape::STRUCTURE);
}

std::strong_ordering order_of(const look &a, const look &b) {
    if (auto by_shape = a.is <=> b.is; std::is_neq(by_shape))
        return by_shape;
    return a.content() <=> b.content();
}

} // namespace compare
