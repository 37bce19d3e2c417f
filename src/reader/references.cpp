/* references.cpp: the walk over everything that a class's records refer to. */

#include "reader/references.h"

#include "format/sections.h"

#include <utility>

namespace cdb {

namespace {

std::size_t in_file(const bytes &table, const bytes &section, const location &class_at) {
    return class_at.offset +
           (table.size() == 0 ? 0 : static_cast<std::size_t>(table.raw().data() - section.raw().data()));
}

} // namespace

reference_walk::reference_walk(reporter &to, const location &class_at, const class_tables &of)
    : tables(of), texts(to, class_at, of.strings, in_file(of.strings, of.section, class_at)),
      values(to, texts, class_at), out(to), section(class_at.section),
      valid_vals(of.valid_vals, in_file(of.valid_vals, of.section, class_at)),
      variety_lists(of.variety_lists, in_file(of.variety_lists, of.section, class_at)),
      sd_defs(of.sd_defs, in_file(of.sd_defs, of.section, class_at)) {}

bool reference_walk::take_found_shared() {
    bool shared_value = std::exchange(values.found_shared, false);
    return std::exchange(found_shared_list, false) || shared_value;
}

/* ---- Fields ---------------------------------------------------------------------------------------------------- */

/* An element's type is unknown if the source gives an unknown name, and an attribute's if a following class cut it
 * short. Structured byte strings are types, but have no values. */
void reference_walk::expect_data_type(const location &place, const field &f, vx_data_type_t type) {
    if (!is_data_type(type))
        out.report(check::DATA_TYPE, place, f.name, place.offset + f.offset, std::to_string(type), "0 to 22");
    else if (type == VX_UNKNOWN || type == VX_SBS_PTR)
        out.report(check::UNKNOWN_TYPE, place, f.name, place.offset + f.offset, std::string(name_of(type)),
                   "a type with values");
}

void reference_walk::follow(const location &place, const bytes &area, std::size_t offset, std::span<const field> fields,
                            vx_data_type_t owner_type) {
    for (const field &f : fields)
        follow_field(place, f, area.number<std::uint32_t>(offset + f.offset), owner_type);
}

void reference_walk::follow_field(const location &place, const field &f, std::uint32_t word, vx_data_type_t type) {
    if (f.kind == field_kind::reference)
        follow_reference(place, f, word, type);
    else if (is_out_of_line(type))
        values.walk({place, f.name, place.offset + f.offset}, word, type);
}

void reference_walk::follow_reference(const location &place, const field &f, std::uint32_t word, vx_data_type_t type) {
    switch (f.to) {
    case target::strings:
        return texts.visit(place, f, word, names_may_be_unset);
    case target::variety_lists:
        return walk_varieties(place, f, word);
    case target::valid_vals:
        evidence.has_owner = evidence.has_owner || word == 0;
        return walk_valid_values(place, f, word, type);
    case target::sd_defs:
        return walk_sd_definition(place, f, word);
    case target::section:
    case target::none:
        return;
    }
}

/* ---- Lists ----------------------------------------------------------------------------------------------------- */

/* The start of a list's entries, if there is a list and it has no other owner. */
std::optional<std::size_t> reference_walk::find_list(const location &place, const field &ref, std::uint32_t offset,
                                                     extent &lists, const list_kind &kind) {
    auto refuse = [&](check broken, std::string expected) {
        out.report(broken, place, ref.name, place.offset + ref.offset,
                   offset == CDB_NONE ? "none" : std::to_string(offset), std::move(expected));
        return std::nullopt;
    };
    if (offset == CDB_NONE)
        return ref.optional ? std::nullopt : refuse(check::REFERENCE_NONE, "a list");
    if (!lists.area.holds(offset, LIST_HEAD))
        return refuse(check::REFERENCE_OUTSIDE, "in " + std::to_string(lists.area.size()) + " bytes");
    if (offset % extent::UNIT != 0)
        return refuse(check::REFERENCE_UNALIGNED, "a multiple of 8");
    location list_at = {section, kind.head->record, offset, lists.offset + offset};
    std::size_t count = lists.area.number<std::uint32_t>(offset + LIST_COUNT);
    std::size_t room = (lists.area.size() - offset - LIST_HEAD) / kind.entry->size;
    out.expect_id(list_at, kind.head->fields[0].name, lists.area.number<vx_uint32_t>(offset), kind.id);
    if (count > room) {
        out.report(check::LIST_OUTSIDE, list_at, kind.head->fields[1].name, list_at.offset + LIST_COUNT,
                   std::to_string(count), "at most " + std::to_string(room));
        return std::nullopt;
    }
    if (claim_list(list_at, count, lists, kind))
        return offset + LIST_HEAD;
    found_shared_list = true;
    return refuse(check::LIST_SHARED, "a list of its own");
}

/* Claims a list that is inside its table. Returns false if some of its bytes have an owner. An empty list takes the
 * room of one entry, unless the table ends before. */
bool reference_walk::claim_list(const location &list_at, std::size_t count, extent &lists, const list_kind &kind) {
    std::size_t first = list_at.index + LIST_HEAD;
    std::size_t held = count == 0 && lists.area.size() - first >= kind.entry->size ? 1 : count;
    if (lists.claim(list_at.index, LIST_HEAD + held * kind.entry->size) != extent::claim_result::FIRST)
        return false;
    out.add_region(list_at, list_at.offset, kind.head->size, kind_of_record(*kind.head));
    if (count < held) {
        location room_at = {section, kind.head->record, list_at.index, list_at.offset + LIST_HEAD};
        out.expect_zero(room_at, "filling", lists.area, first, kind.entry->size, room_at.offset);
        out.add_region(room_at, room_at.offset, kind.entry->size, stretch_kind::FILLING);
    }
    return true;
}

void reference_walk::walk_varieties(const location &place, const field &ref, std::uint32_t offset) {
    std::optional<std::size_t> first =
        find_list(place, ref, offset, variety_lists, list_kind_of(target::variety_lists));
    if (!first)
        return;
    auto count = variety_lists.area.number<std::uint32_t>(offset + LIST_COUNT);
    location entry = {section, format_for<vl_entry_t>.record, 0, variety_lists.offset + *first};
    for (; entry.index < count; ++entry.index, entry.offset += sizeof(vl_entry_t))
        out.visit<vl_entry_t>(entry, variety_lists.area, entry.offset - variety_lists.offset);
}

void reference_walk::walk_valid_values(const location &place, const field &ref, std::uint32_t offset,
                                       vx_data_type_t type) {
    std::optional<std::size_t> first = find_list(place, ref, offset, valid_vals, list_kind_of(target::valid_vals));
    if (!first)
        return;
    auto count = valid_vals.area.number<std::uint32_t>(offset + LIST_COUNT);
    location entry = {section, format_for<vv_entry_t>.record, 0, valid_vals.offset + *first};
    for (; entry.index < count; ++entry.index, entry.offset += sizeof(vv_entry_t)) {
        std::size_t in_table = entry.offset - valid_vals.offset;
        out.visit<vv_entry_t>(entry, valid_vals.area, in_table);
        follow(entry, valid_vals.area, in_table, leading_fields_of<vv_entry_t>, element_type(type));
    }
}

/* Every element has a name. */
void reference_walk::walk_sd_definition(const location &place, const field &ref, std::uint32_t offset) {
    std::optional<std::size_t> first = find_list(place, ref, offset, sd_defs, list_kind_of(target::sd_defs));
    if (!first)
        return;
    bool owner_may_be_unset = std::exchange(names_may_be_unset, false);
    auto count = sd_defs.area.number<std::uint32_t>(offset + LIST_COUNT);
    location element = {section, format_for<sd_field_t>.record, 0, sd_defs.offset + *first};
    for (; element.index < count; ++element.index, element.offset += sizeof(sd_field_t)) {
        std::size_t in_table = element.offset - sd_defs.offset;
        auto type = sd_defs.area.number<vx_data_type_t>(in_table + offsetof(sd_field_t, sd_field_type));
        out.visit<sd_field_t>(element, sd_defs.area, in_table);
        expect_data_type(element, *format_for<sd_field_t>.type, type);
        follow(element, sd_defs.area, in_table, leading_fields_of<sd_field_t>, type);
    }
    names_may_be_unset = owner_may_be_unset;
}

void reference_walk::report_unreached(const extent &lists, std::string_view name) {
    location place = {section, name, 0, lists.offset};
    std::size_t size = lists.area.size();
    for (std::size_t from = 0; from < size; from += extent::UNIT) {
        std::size_t to = from;
        while (to < size && !lists.is_taken(to))
            to += extent::UNIT;
        if (to > from)
            out.report(check::LIST_UNREACHED, place, {}, lists.offset + from,
                       std::to_string(std::min(to, size) - from) + " bytes", "an owner");
        from = to;
    }
}

void reference_walk::report_unreached() {
    report_unreached(variety_lists, format_for<variety_list_t>.record);
    report_unreached(sd_defs, format_for<sd_def_t>.record);
    report_unreached(valid_vals, format_for<valid_values_t>.record);
}

} // namespace cdb
