/* walk_values.cpp: the walk over a class's values, which stand among its strings. */

#include "reader/walk_class.h"

namespace cdb {

/* file_offset: of the cell. offset: the first word in it. */
void class_walk::walk_container(const spot &place, std::string_view field, std::size_t file_offset,
                                std::uint32_t offset, vx_data_type_t type) {
    if (offset == CDB_NONE)
        return;
    if (offset == 0)
        return walk.report(check::VALUE_MISSING, place, field, file_offset, "0", "a value's place, or none");
    if (offset >= strings.area.size() || (type == VX_CHAR_PTR && offset >= strings.texts_end))
        return walk.report(check::VALUE_OUTSIDE, place, field, file_offset, std::to_string(offset),
                           "in " + std::to_string(strings.area.size()) + " bytes");
    if (offset % extent::UNIT != 0)
        return walk.report(check::VALUE_UNALIGNED, place, field, file_offset, std::to_string(offset),
                           "a multiple of 8");
    if (type == VX_CHAR_PTR) {
        if (!walk.excuse && strings.is_text(offset))
            return walk.report(check::VALUE_SHARED, place, field, file_offset, std::to_string(offset),
                               "a value of its own");
        walk.note_text(at, strings, offset);
    } else if (type == VX_BINARY_PTR)
        walk_binary(place, field, file_offset, offset);
    else if (type == VX_RSRC_HANDLE_PTR)
        walk_handle(place, field, file_offset, offset);
    else if (nesting >= NESTING_MAX)
        walk.report(check::VALUE_NESTING, place, field, file_offset, nesting + 1, NESTING_MAX);
    else {
        ++nesting;
        if (type == VX_SD_PTR)
            walk_structured_data(place, field, file_offset, offset);
        else
            walk_array(place, field, file_offset, offset, type);
        --nesting;
    }
}

/* False, and said so, unless length bytes from offset on are there and belong to nobody else. */
bool class_walk::claim_value(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset,
                             std::size_t length) {
    if (!strings.area.holds(offset, length)) {
        walk.report(check::VALUE_OUTSIDE, place, field, file_offset,
                    std::to_string(offset) + " + " + std::to_string(length),
                    "at most " + std::to_string(strings.area.size()));
        return false;
    }
    if (strings.claim(offset, length) == extent::claim_result::FIRST)
        return true;
    walk.report(check::VALUE_SHARED, place, field, file_offset, std::to_string(offset), "a value of its own");
    met_shared = true;
    return false;
}

/* From a place to the next multiple of 8, in the strings. */
void class_walk::walk_filling(const spot &place, std::size_t end) {
    std::size_t rounded = std::min(extent::units(end) * extent::UNIT, strings.area.size());
    walk.expect_zero(place, "filling", strings.area, end, rounded - end, strings.offset + end);
    walk.add_region(place, strings.offset + end, rounded - end, "filling");
}

/* The length and the bytes are two pieces. */
void class_walk::walk_binary(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset) {
    std::size_t length = strings.area.number<std::uint32_t>(offset);
    if (!claim_value(place, field, file_offset, offset, value::BINARY_BYTES + length))
        return;
    spot binary = {at.section, "binary", 0, strings.offset + offset};
    walk.add_region(binary, binary.offset, sizeof(vx_uint32_t), "length");
    walk_filling(binary, offset + sizeof(vx_uint32_t));
    walk.add_region(binary, binary.offset + value::BINARY_BYTES, length, "binary");
    walk_filling(binary, offset + value::BINARY_BYTES + length);
    if (length == 0)
        empty_binaries.push_back(offset + value::BINARY_BYTES);
}

/* Some binaries without bytes have a second piece all the same, of zeros. It is one if nothing else stands there. */
void class_walk::walk_empty_binaries() {
    constexpr auto UNIT = extent::UNIT;
    for (std::size_t piece : empty_binaries) {
        auto raw = strings.area.part(piece, UNIT).raw();
        bool zero = std::all_of(raw.begin(), raw.end(), [](std::byte b) { return b == std::byte{0}; });
        if (raw.size() == UNIT && zero && strings.claim(piece, UNIT) == extent::claim_result::FIRST)
            walk.add_region({at.section, "binary", 0, strings.offset + piece}, strings.offset + piece, UNIT, "filling");
    }
}

void class_walk::walk_handle(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset) {
    constexpr std::size_t SIZE = sizeof(vx_resource_handle_t);
    if (!claim_value(place, field, file_offset, offset, SIZE))
        return;
    spot handle = {at.section, "handle", 0, strings.offset + offset};
    walk.add_region(handle, handle.offset, SIZE, "handle");
    walk_filling(handle, offset + SIZE);
}

/* Texts and binaries have no bounds, in an array either; the compiler writes none or never fills the cell. */
void class_walk::expect_no_bound(const spot &cell) {
    auto word = strings.area.number<std::uint32_t>(cell.offset - strings.offset);
    if (word != CDB_NONE && word != 0)
        walk.report(check::RANGE_ASTRAY, cell, "elements", cell.offset, std::to_string(word), "none");
}

void class_walk::walk_array(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset,
                            vx_data_type_t type) {
    std::size_t count = strings.area.number<std::uint32_t>(offset);
    if (!claim_value(place, field, file_offset, offset, value::ELEMENTS + count * sizeof(vx_value_t)))
        return;
    spot array = {at.section, "vx_array_t", 0, strings.offset + offset};
    walk.visit<vx_array_t>(array, strings.area, offset);
    vx_data_type_t element = element_type(type);
    spot cell = {at.section, "vx_value_t", 0, array.offset + value::ELEMENTS};
    for (; cell.index < count; ++cell.index, cell.offset += sizeof(vx_value_t)) {
        walk.add_region(cell, cell.offset, sizeof(vx_value_t), cell.record);
        if (walk.excuse == check::RANGE_ASTRAY && (element == VX_CHAR_PTR || element == VX_BINARY_PTR))
            expect_no_bound(cell);
        else if (is_out_of_line(element))
            walk_container(cell, "elements", cell.offset,
                           strings.area.number<std::uint32_t>(cell.offset - strings.offset), element);
    }
}

/* There is room for one element even if there is none. */
void class_walk::walk_structured_data(const spot &place, std::string_view field, std::size_t file_offset,
                                      std::size_t offset) {
    constexpr std::size_t SIZE = sizeof(vx_structured_data_element_t);
    std::size_t count = strings.area.number<std::uint32_t>(offset);
    if (!claim_value(place, field, file_offset, offset, value::ELEMENTS + std::max<std::size_t>(count, 1) * SIZE))
        return;
    spot sd = {at.section, "vx_structured_data_t", 0, strings.offset + offset};
    walk.visit<vx_structured_data_t>(sd, strings.area, offset);
    spot element = {at.section, "vx_structured_data_element_t", 0, sd.offset + value::ELEMENTS};
    if (count == 0) {
        walk.expect_zero(element, "filling", strings.area, offset + value::ELEMENTS, SIZE, element.offset);
        walk.add_region(element, element.offset, SIZE, "filling");
    }
    for (; element.index < count; ++element.index, element.offset += SIZE) {
        std::size_t in_strings = element.offset - strings.offset;
        auto type = strings.area.number<vx_data_type_t>(in_strings);
        walk.visit<vx_structured_data_element_t>(element, strings.area, in_strings);
        if (!is_data_type(type))
            walk.report(check::VALUE_TYPE, element, "data_type", element.offset, std::to_string(type), "0 to 22");
        follow(element, strings.area, in_strings, leading_fields_of<vx_structured_data_element_t>, VX_UNKNOWN);
    }
}

} // namespace cdb
