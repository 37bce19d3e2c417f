/* bounds.cpp: what the bounds of a dynamic attribute say about the Range line that they came from. */

#include "cdef/source/bounds.h"

#include "cdef/source/text.h"

#include <optional>

namespace cdef::source {

namespace {

bool is_number(vx_data_type_t type) {
    return type >= VX_INT32 && type <= VX_FLOAT64;
}

std::size_t width_of(vx_data_type_t type) {
    return type == VX_INT64 || type == VX_UINT64 || type == VX_FLOAT64 ? sizeof(vx_uint64_t) : sizeof(vx_uint32_t);
}

bool is_hundred(const cdb::value &v) {
    switch (v.type()) {
    case VX_INT32:
    case VX_INT64:
        return v.integer() == 100;
    case VX_UINT32:
    case VX_UINT64:
        return v.natural() == 100;
    default:
        return v.real() == 100;
    }
}

/* The element of a bound that is an array of one element; no value for any other bound. */
std::optional<cdb::value> only_element(const cdb::value &bound) {
    cdb::value_list elements = bound.elements();
    return elements.size() == 1 ? std::optional(elements[0]) : std::nullopt;
}

/* The default range of types that have no numbers. */
bool is_default_element(const cdb::value &element) {
    switch (element.type()) {
    case VX_RSRC_HANDLE_PTR:
        return is_default(element);
    case VX_SD_PTR:
        return element.present() && element.elements().empty();
    default:
        return !element.present();
    }
}

bool are_default(const cdb::value &low, const cdb::value &high) {
    if (is_number(low.type()))
        return is_default(low) && is_hundred(high);
    std::optional<cdb::value> first = only_element(low), second = only_element(high);
    if (!first || !second)
        return false;
    if (is_number(first->type()))
        return are_default(*first, *second);
    return is_default_element(*first) && is_default_element(*second);
}

bool are_untouched(const cdb::value &low, const cdb::value &high) {
    return is_number(low.type()) ? is_default(low) && is_default(high) : !low.present() && !high.present();
}

template <class Number> cell cell_of(Number number) {
    cell made = {};
    std::memcpy(made.data(), &number, sizeof number);
    return made;
}

/* A bound, or an element of one that is an array. */
struct bound {
    cdb::value value;
    bool is_own;
};

/* The bytes of a number, or of a reference that leads to no value of its own, which is really a number that was stored
 * in an attribute of another type. No value for a reference to a value of its own. */
std::optional<cell> bytes_of(const bound &b) {
    const cdb::value &v = b.value;
    switch (v.type()) {
    case VX_INT32:
    case VX_INT64:
        return cell_of(v.integer());
    case VX_UINT32:
    case VX_UINT64:
        return cell_of(v.natural());
    case VX_FLOAT32:
        return cell_of(static_cast<float>(v.real()));
    case VX_FLOAT64:
        return cell_of(v.real());
    default:
        break;
    }
    if (!cdb::is_out_of_line(v.type()) || (v.present() && b.is_own))
        return std::nullopt;
    return cell_of(v.place().value_or(0));
}

std::optional<wanted_bytes> wanted_in_cells(const bound &low, const bound &high) {
    std::optional<cell> first = bytes_of(low), second = bytes_of(high);
    if (!first || !second)
        return std::nullopt;
    return wanted_bytes{
        .known = true, .in_arrays = false, .width = width_of(low.value.type()), .low = *first, .high = *second};
}

/* The same for an array, and whether the bound owns what the element leads to. */
std::optional<bound> element_of(const bound &array, const class_plan &plan) {
    std::optional<cdb::value> element = only_element(array.value);
    if (!element || !cdb::is_array(array.value.type()))
        return std::nullopt;
    std::size_t place = *array.value.place() + cdb::value::ELEMENTS;
    return bound{*element, plan.owners.is_own(plan.view.side_tables().strings, place)};
}

/* False if the only element of a bound leads to something that the bound does not own. */
bool owns_element(const bound &array, const class_plan &plan) {
    std::optional<bound> element = element_of(array, plan);
    return !element || element->is_own;
}

wanted_bytes wanted_of(const bound &low, const bound &high, const class_plan &plan) {
    if (std::optional<wanted_bytes> wanted = wanted_in_cells(low, high))
        return *wanted;
    std::optional<bound> first = element_of(low, plan), second = element_of(high, plan);
    if (!first || !second)
        return {};
    wanted_bytes wanted = wanted_in_cells(*first, *second).value_or(wanted_bytes());
    wanted.in_arrays = true;
    return wanted;
}

/* True if the bytes after those of a narrower number are 0. */
bool is_zero_from(const wanted_bytes &wanted, std::size_t offset) {
    auto zero = [](std::byte b) { return b == std::byte{0}; };
    return std::all_of(wanted.low.begin() + static_cast<std::ptrdiff_t>(offset), wanted.low.end(), zero) &&
           std::all_of(wanted.high.begin() + static_cast<std::ptrdiff_t>(offset), wanted.high.end(), zero);
}

} // namespace

range range_of(const class_plan &plan, const step &s) {
    cdb::dynamic_attribute attr = plan.view.dynamic_attributes(level_of(s.from))[s.index];
    cdb::value low = attr.min_value(), high = attr.max_value();
    bound first = {low, plan.owns(s, offsetof(rsrc_dattr_t, ra_min_value))};
    bound second = {high, plan.owns(s, offsetof(rsrc_dattr_t, ra_max_value))};
    bool array = cdb::is_array(attr.type());
    return {.type = attr.type(),
            .takes_line = is_number(cdb::element_type(attr.type())) && is_complete(attr),
            .is_default = are_default(low, high) && owns_element(first, plan) && owns_element(second, plan),
            .is_untouched = are_untouched(low, high),
            .keeps_bounds = is_number(attr.type()) || array,
            .has_none = !is_number(attr.type()) && !array && !low.present() && !high.present(),
            .wanted = wanted_of(first, second, plan)};
}

std::string line_value(const wanted_bytes &wanted, vx_data_type_t type) {
    vx_data_type_t scalar = cdb::element_type(type);
    if (!wanted.known || cdb::is_array(type) != wanted.in_arrays)
        return {};
    std::string text;
    for (const cell &bound : {wanted.low, wanted.high}) {
        std::vector<std::string> texts =
            texts_of(cdb::value(cdb::bytes(bound, std::endian::native), 0, scalar, cdb::bytes()), true);
        if (texts.empty())
            return {};
        text += (text.empty() ? "" : ",") + texts.front();
    }
    return text;
}

bounds after_line(const range &target, bounds before, vx_data_type_t type) {
    std::size_t width = width_of(cdb::element_type(type));
    if (line_value(target.wanted, type).empty())
        return bounds::unwanted;
    if (width >= target.wanted.width)
        return bounds::wanted;
    bool rest = target.wanted.in_arrays || before == bounds::untouched ? is_zero_from(target.wanted, width)
                                                                       : before == bounds::wanted;
    return rest ? bounds::wanted : bounds::unwanted;
}

} // namespace cdef::source
