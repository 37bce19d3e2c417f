/* values.cpp: the walk over the values that a class stores among its strings. */

#include "reader/values.h"

namespace cdb {

void value_walk::walk(const cell_location &cell, std::uint32_t offset, vx_data_type_t type) {
    auto refuse = [&](check broken, std::string expected) {
        out.report(broken, cell.record, cell.field, cell.offset, std::to_string(offset), std::move(expected));
    };
    if (offset == CDB_NONE)
        return;
    if (offset == 0)
        return refuse(check::VALUE_MISSING, "a value's place, or none");
    if (offset >= strings.area.size() || (type == VX_CHAR_PTR && offset >= strings.texts_end))
        return refuse(check::VALUE_OUTSIDE, "in " + std::to_string(strings.area.size()) + " bytes");
    if (offset % extent::UNIT != 0)
        return refuse(check::VALUE_UNALIGNED, "a multiple of 8");
    if (type == VX_CHAR_PTR)
        return walk_text(cell, offset);
    if (type == VX_BINARY_PTR)
        return walk_binary(cell, offset);
    if (type == VX_RSRC_HANDLE_PTR)
        return walk_handle(cell, offset);
    if (nesting >= NESTING_MAX)
        return out.report(check::VALUE_NESTING, cell.record, cell.field, cell.offset, nesting + 1, NESTING_MAX);
    ++nesting;
    if (type == VX_SD_PTR)
        walk_structured_data(cell, offset);
    else
        walk_array(cell, offset, type);
    --nesting;
}

/* Claims length bytes from offset on. Returns false, and reports it, if they are outside or belong to another value. */
bool value_walk::claim(const cell_location &cell, std::size_t offset, std::uint64_t length) {
    if (!strings.area.holds(offset, length)) {
        out.report(check::VALUE_OUTSIDE, cell.record, cell.field, cell.offset,
                   std::to_string(offset) + " + " + std::to_string(length),
                   "at most " + std::to_string(strings.area.size()));
        return false;
    }
    if (strings.claim(offset, static_cast<std::size_t>(length)) == extent::claim_result::FIRST)
        return true;
    out.report(check::VALUE_SHARED, cell.record, cell.field, cell.offset, std::to_string(offset), "a value of its own");
    found_shared = true;
    return false;
}

void value_walk::walk_text(const cell_location &cell, std::size_t offset) {
    if (!out.excuse && strings.is_text(offset))
        out.report(check::VALUE_SHARED, cell.record, cell.field, cell.offset, std::to_string(offset),
                   "a value of its own");
    else
        texts.note(offset);
}

/* From end to the next multiple of 8, in the strings. */
void value_walk::walk_filling(const location &place, std::size_t end) {
    std::size_t rounded = std::min(extent::rounded(end), strings.area.size());
    out.expect_zero(place, "filling", strings.area, end, rounded - end, strings.offset + end);
    out.add_region(place, strings.offset + end, rounded - end, stretch_kind::FILLING);
}

/* The length and the bytes are stored as two separate pieces. */
void value_walk::walk_binary(const cell_location &cell, std::size_t offset) {
    auto length = strings.area.number<std::uint32_t>(offset);
    if (!claim(cell, offset, value::BINARY_BYTES + std::uint64_t{length}))
        return;
    location binary = {section, "binary", 0, strings.offset + offset};
    out.add_region(binary, binary.offset, sizeof(vx_uint32_t), stretch_kind::LENGTH);
    walk_filling(binary, offset + sizeof(vx_uint32_t));
    out.add_region(binary, binary.offset + value::BINARY_BYTES, length, stretch_kind::BINARY);
    walk_filling(binary, offset + value::BINARY_BYTES + length);
    if (length == 0)
        empty_binaries.push_back(offset + value::BINARY_BYTES);
}

void value_walk::finish_empty_binaries() {
    constexpr auto UNIT = extent::UNIT;
    for (std::size_t piece : empty_binaries) {
        auto raw = strings.area.part(piece, UNIT).raw();
        if (raw.size() == UNIT && all_zero(raw) && strings.claim(piece, UNIT) == extent::claim_result::FIRST)
            out.add_region({section, "binary", 0, strings.offset + piece}, strings.offset + piece, UNIT,
                           stretch_kind::FILLING);
    }
}

void value_walk::walk_handle(const cell_location &cell, std::size_t offset) {
    constexpr std::size_t SIZE = sizeof(vx_resource_handle_t);
    if (!claim(cell, offset, SIZE))
        return;
    location handle = {section, "handle", 0, strings.offset + offset};
    out.add_region(handle, handle.offset, SIZE, stretch_kind::HANDLE);
    walk_filling(handle, offset + SIZE);
}

void value_walk::walk_array(const cell_location &cell, std::size_t offset, vx_data_type_t type) {
    auto count = strings.area.number<std::uint32_t>(offset);
    if (!claim(cell, offset, value::ELEMENTS + std::uint64_t{count} * sizeof(vx_value_t)))
        return;
    location array = {section, "vx_array_t", 0, strings.offset + offset};
    out.visit<vx_array_t>(array, strings.area, offset);
    location element = {section, "vx_value_t", 0, array.offset + value::ELEMENTS};
    for (; element.index < count; ++element.index, element.offset += sizeof(vx_value_t)) {
        out.add_region(element, element.offset, sizeof(vx_value_t), stretch_kind::VALUE);
        if (is_out_of_line(element_type(type)))
            walk_element(element, strings.area.number<std::uint32_t>(element.offset - strings.offset),
                         element_type(type));
    }
}

/* Texts and binaries have no bounds. In the array of such a bound the compiler writes "none", or does not fill the
 * cell. */
void value_walk::walk_element(const location &element, std::uint32_t offset, vx_data_type_t type) {
    bool is_bound = out.excuse == check::RANGE_ASTRAY;
    if (!is_bound || (type != VX_CHAR_PTR && type != VX_BINARY_PTR))
        walk({element, "elements", element.offset}, offset, type);
    else if (offset != CDB_NONE && offset != 0)
        out.report(check::RANGE_ASTRAY, element, "elements", element.offset, std::to_string(offset), "none");
}

/* There is room for one element even if there is none. */
void value_walk::walk_structured_data(const cell_location &cell, std::size_t offset) {
    constexpr std::size_t SIZE = sizeof(vx_structured_data_element_t);
    constexpr std::size_t VALUE = offsetof(vx_structured_data_element_t, value);
    auto count = strings.area.number<std::uint32_t>(offset);
    if (!claim(cell, offset, value::ELEMENTS + std::max<std::uint64_t>(count, 1) * SIZE))
        return;
    location sd = {section, "vx_structured_data_t", 0, strings.offset + offset};
    out.visit<vx_structured_data_t>(sd, strings.area, offset);
    location element = {section, "vx_structured_data_element_t", 0, sd.offset + value::ELEMENTS};
    if (count == 0) {
        out.expect_zero(element, "filling", strings.area, offset + value::ELEMENTS, SIZE, element.offset);
        out.add_region(element, element.offset, SIZE, stretch_kind::FILLING);
    }
    for (; element.index < count; ++element.index, element.offset += SIZE) {
        std::size_t in_strings = element.offset - strings.offset;
        auto type = strings.area.number<vx_data_type_t>(in_strings);
        out.visit<vx_structured_data_element_t>(element, strings.area, in_strings);
        if (!is_data_type(type))
            out.report(check::VALUE_TYPE, element, "data_type", element.offset, std::to_string(type), "0 to 22");
        if (is_out_of_line(type))
            walk({element, "value", element.offset + VALUE}, strings.area.number<std::uint32_t>(in_strings + VALUE),
                 type);
    }
}

} // namespace cdb
