/* runs.cpp: what the definition and the value of a structure show about the run of SD stanzas that they came from. */

#include "cdef/source/runs.h"

#include "cdef/source/text.h"

namespace cdef::source {

bool has_default(vx_data_type_t type) {
    return type != VX_UNKNOWN && type != VX_SBS_PTR;
}

element_types types_of(const cdb::value &value) {
    if (!value.present())
        return {};
    if (value.type() == VX_SD_PTR_ARRAY)
        return value.elements().size() == 1 ? types_of(value.elements()[0]) : element_types{true, {}, false};
    element_types found = {.found = true, .types = {}};
    for (const cdb::value &element : value.elements()) {
        found.types.push_back(element.type());
        found.defaults = found.defaults && has_default(element.type()) && is_default(element);
    }
    return found;
}

std::optional<std::size_t> indices_given(std::size_t elements, std::uint16_t highest) {
    std::size_t given = (std::size_t{highest} + 1) & 0xFFFF;
    if (given > elements)
        return std::nullopt;
    return given + (elements - given) / 0x10000 * 0x10000;
}

std::vector<bool> indexed_elements(const std::vector<bool> &has_valid_values, std::size_t given) {
    std::vector<bool> indexed(has_valid_values.size(), true);
    std::size_t without = indexed.size() - given;
    for (std::size_t i = indexed.size(); i > 0 && without > 0; --i) {
        if (!has_valid_values[i - 1]) {
            indexed[i - 1] = false;
            --without;
        }
    }
    return indexed;
}

std::vector<bool> with_valid_values(const cdb::sd_definition &definition) {
    std::vector<bool> found;
    for (const cdb::sd_element &e : definition)
        found.push_back(!e.valid_values().empty());
    return found;
}

bool fits_definition(const cdb::sd_definition &definition, const element_types &value, std::uint16_t highest) {
    if (value.types.size() != definition.size())
        return false;
    std::optional<std::size_t> given = indices_given(definition.size(), highest);
    std::vector<bool> limited = with_valid_values(definition);
    return given && static_cast<std::size_t>(std::count(limited.begin(), limited.end(), true)) <= *given;
}

bool comes_too_late(const cdb::sd_definition &definition, const cdb::value &value, std::uint16_t highest) {
    return !definition.empty() && !fits_definition(definition, types_of(value), highest);
}

} // namespace cdef::source
