/* attributes.cpp: the walk over the attributes of a class. */

#include "reader/attributes.h"

#include "format/records.h"

namespace cdb {

static bool is_bound(const field &f) {
    return f.kind == field_kind::value &&
           (f.offset == offsetof(rsrc_dattr_t, ra_min_value) || f.offset == offsetof(rsrc_dattr_t, ra_max_value));
}

/* An attribute that a following class cut short is the last of its table, in a class that is not the last. Its
 * reference to valid values may be 0 without a meaning; only in a persistent class attribute it is "none" from the
 * start. The bounds of a resource attribute may be the range of a class attribute, with that attribute's type. */
template <class Record>
void attribute_walk::follow(const location &place, std::size_t offset, const Record &record, vx_uint32_t id,
                            bool may_be_cut_short) {
    vx_data_type_t type = record.ra_data_type;
    bool may_have_no_list = may_be_cut_short && id != CDB_ID_PATTR_C;
    bool may_be_astray = id == CDB_ID_DATTR && is_out_of_line(type);
    references.names_may_be_unset = may_be_cut_short;
    for (const field &f : leading_fields_of<Record>) {
        auto word = tables.section.number<std::uint32_t>(offset + f.offset);
        if (may_have_no_list && f.to == target::valid_vals && word == 0)
            doubtful_lists.push_back({place, &f, type, record.u_ra_variety_list, record.u_ra_name.offset[0]});
        else if (may_be_astray && is_bound(f))
            doubtful_bounds.push_back({place, &f, word, type});
        else
            references.follow_field(place, f, word, type);
    }
    std::uint32_t own_list = record.u_ra_valid_vals.offset[0];
    if (own_list != 0 && own_list != CDB_NONE)
        references.evidence.later_list = std::min(references.evidence.later_list, record.u_ra_variety_list.offset[0]);
}

template <class Record>
void attribute_walk::walk_attribute(const location &place, std::size_t offset, vx_uint32_t id, bool is_last_of_table) {
    auto record = tables.section.record<Record>(offset);
    out.visit<Record>(place, tables.section, offset);
    out.expect_id(place, fields_of<Record>.front().name, record.ra_cb_ID, id);
    references.expect_data_type(place, *format_for<Record>.type, record.ra_data_type);
    if constexpr (std::is_same_v<Record, rsrc_dattr_t>) {
        std::uint32_t mark = id == CDB_ID_DATTR_C ? VAR_ID_CLASS_ATTR : 0;
        dynamic_ids.push_back(static_cast<var_id_t>(record.ra_attr_id) | mark);
        if (record.ra_var_type > ORB_QUANTUM)
            out.report(check::VARIABLE_TYPE, place, field_of<rsrc_dattr_t>(offsetof(rsrc_dattr_t, ra_var_type)),
                       std::to_string(record.ra_var_type), "0 to 3");
    }
    references.take_found_shared();
    follow(place, offset, record, id, is_last_of_table && !is_last_class);
    if (!references.take_found_shared() && element_type(record.ra_data_type) == VX_SD_PTR)
        check_structure(place, record);
}

template <class Record>
void attribute_walk::walk(const cdb_ref_t &table, std::size_t count, std::string_view record, vx_uint32_t id) {
    std::size_t offset = table.offset[0];
    count = count_inside(tables.section, offset, count, sizeof(Record));
    location place = {at.section, record, 0, at.offset + offset};
    for (; place.index < count; ++place.index, offset += sizeof(Record), place.offset += sizeof(Record))
        walk_attribute<Record>(place, offset, id, place.index + 1 == count);
}

template void attribute_walk::walk<rsrc_pattr_t>(const cdb_ref_t &, std::size_t, std::string_view, vx_uint32_t);
template void attribute_walk::walk<rsrc_dattr_t>(const cdb_ref_t &, std::size_t, std::string_view, vx_uint32_t);

/* ---- Structures ------------------------------------------------------------------------------------------------ */

/* A run of element stanzas gives an attribute its definition, its largest index and its value. A run that ends the
 * source comes too late for the last two. */
template <class Record> void attribute_walk::check_structure(const location &place, const Record &record) {
    sd_definition definition = sd_definition_at(tables, record.u_ra_sd);
    bool absent = record.u_ra_sd.offset[0] == CDB_NONE;
    std::size_t elements = std::size_t{record.ra_max_sd_idx} + 1;
    if (absent || elements != definition.size())
        out.report(check::SD_MISSING, place,
                   field_of<Record>(absent ? offsetof(Record, u_ra_sd) : offsetof(Record, ra_max_sd_idx)),
                   absent ? "none" : std::to_string(record.ra_max_sd_idx),
                   absent ? "a definition" : std::to_string(definition.size()) + " elements");
    attribute<Record> attr(tables, place.offset - at.offset);
    if constexpr (std::is_same_v<Record, rsrc_pattr_t>)
        check_structure_value(place, field_at(pattr_fields, offsetof(rsrc_pattr_t, ra_dflt_value)), definition,
                              attr.default_value());
    else
        check_structure_value(place, field_at(dattr_fields, offsetof(rsrc_dattr_t, ra_init_value)), definition,
                              attr.initial_value());
}

/* Of an array, its first element. */
void attribute_walk::check_structure_value(const location &place, const field &f, const sd_definition &definition,
                                           const value &cell) {
    if (is_array(cell.type())) {
        value_list values = cell.elements();
        if (!values.empty())
            check_structure_value(place, f, definition, values[0]);
        return;
    }
    if (!cell.present())
        return;
    value_list values = cell.elements();
    bool same = values.size() == definition.size();
    for (std::size_t i = 0; same && i < values.size(); ++i)
        same = values[i].type() == definition[i].type();
    if (!same)
        out.report(check::SD_DIFFERS, place, f.name, place.offset + f.offset,
                   std::to_string(values.size()) + " elements",
                   std::to_string(definition.size()) + " elements of the definition's types");
}

/* ---- Doubts ---------------------------------------------------------------------------------------------------- */

/* Among the attributes in doubt, the position of the one that owns the first list of valid values. */
std::optional<std::size_t> attribute_walk::owner_of_doubtful_lists() const {
    if (tables.valid_vals.number<vx_uint32_t>(0) != CDB_ID_VALID_VALUES)
        return std::nullopt;
    std::vector<suspect> suspects;
    for (const doubtful_list &d : doubtful_lists) {
        valid_value_list list = valid_values_at(tables, {}, d.type);
        bool is_complete = d.type != VX_UNKNOWN && !varieties_at(tables, d.variety_list).empty();
        suspects.push_back(
            {can_have_list(list, tables.strings, is_complete), d.variety_list.offset[0], d.name, first_text(list)});
    }
    return owner_of_first_list(suspects, references.evidence);
}

void attribute_walk::decide_lists() {
    std::optional<std::size_t> owner = owner_of_doubtful_lists();
    bool is_there = tables.valid_vals.holds(0, offsetof(valid_values_t, vv_values));
    for (std::size_t i = 0; i < doubtful_lists.size(); ++i) {
        const doubtful_list &d = doubtful_lists[i];
        if (i == owner)
            references.walk_valid_values(d.attribute_at, *d.what, 0, d.type);
        else
            out.report(check::CUT_SHORT, d.attribute_at, d.what->name, d.attribute_at.offset + d.what->offset, "0",
                       is_there ? "a list of its own" : "in " + std::to_string(tables.valid_vals.size()) + " bytes");
    }
}

/* Only arrays have bounds that are out of line. */
void attribute_walk::decide_bounds() {
    for (const doubtful_bound &d : doubtful_bounds) {
        std::size_t cell = d.attribute_at.offset + d.what->offset;
        if (is_array(d.type) || d.word == 0)
            references.values.walk({d.attribute_at, d.what->name, cell}, d.word, d.type);
        else if (d.word != CDB_NONE)
            out.report(check::RANGE_ASTRAY, d.attribute_at, d.what->name, cell, std::to_string(d.word), "none");
    }
}

void attribute_walk::decide_doubtful() {
    references.names_may_be_unset = true;
    out.excuse = check::CUT_SHORT;
    decide_lists();
    out.excuse = check::RANGE_ASTRAY;
    decide_bounds();
    out.excuse.reset();
}

} // namespace cdb
