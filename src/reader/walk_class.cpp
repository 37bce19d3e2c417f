/* walk_class.cpp: the walk over a class section: its records, and the lists that they lead to. */

#include "reader/walk_class.h"

#include <utility>

namespace cdb {

namespace {

constexpr std::size_t LIST_HEAD = 8; /* identifier and count, of all three */
constexpr std::size_t LIST_COUNT = 4;
static_assert(offsetof(variety_list_t, vl_values) == LIST_HEAD && offsetof(variety_list_t, vl_count) == LIST_COUNT);
static_assert(offsetof(valid_values_t, vv_values) == LIST_HEAD && offsetof(valid_values_t, vv_count) == LIST_COUNT);
static_assert(offsetof(sd_def_t, sd_fields) == LIST_HEAD && offsetof(sd_def_t, sd_count) == LIST_COUNT);

constexpr list_format variety_format = {"variety_list_t",    "vl_cb_ID",         "vl_count",
                                        CDB_ID_VARIETY_LIST, sizeof(vl_entry_t), variety_list_fields};
constexpr list_format valid_values_format = {"valid_values_t",    "vv_cb_ID",         "vv_count",
                                             CDB_ID_VALID_VALUES, sizeof(vv_entry_t), valid_values_fields};
constexpr list_format sd_format = {"sd_def_t",    "sd_cb_ID",         "sd_count",
                                   CDB_ID_SD_DEF, sizeof(sd_field_t), sd_def_fields};

/* A table of a class's records, in the order in which they follow each other. */
struct class_table {
    cdb_ref_t rsrc_class_t::*ref;
    std::string_view field;
    bool located; /* its offset is recorded; deliberately not for all */
    std::size_t (*size)(const rsrc_class_t &);
};

template <auto Count, class Record> std::size_t size_of_records(const rsrc_class_t &rc) {
    return std::size_t{rc.*Count} * sizeof(Record);
}
template <auto Size> std::size_t size_in_bytes(const rsrc_class_t &rc) {
    return rc.*Size;
}

constexpr class_table class_tables_in_order[] = {
    {&rsrc_class_t::u_rc_pattrsC, "u_rc_pattrsC", true, size_of_records<&rsrc_class_t::rc_num_pattrsC, rsrc_pattr_t>},
    {&rsrc_class_t::u_rc_dattrsC, "u_rc_dattrsC", true, size_of_records<&rsrc_class_t::rc_num_dattrsC, rsrc_dattr_t>},
    {&rsrc_class_t::u_rc_pattrs, "u_rc_pattrs", true, size_of_records<&rsrc_class_t::rc_num_pattrs, rsrc_pattr_t>},
    {&rsrc_class_t::u_rc_dattrs, "u_rc_dattrs", true, size_of_records<&rsrc_class_t::rc_num_dattrs, rsrc_dattr_t>},
    {&rsrc_class_t::u_rc_actionsC, "u_rc_actionsC", true,
     size_of_records<&rsrc_class_t::rc_num_actionsC, rsrc_action_t>},
    {&rsrc_class_t::u_rc_actions, "u_rc_actions", true, size_of_records<&rsrc_class_t::rc_num_actions, rsrc_action_t>},
    {&rsrc_class_t::u_rc_errors, "u_rc_errors", false, size_of_records<&rsrc_class_t::rc_num_errors, rsrc_error_t>},
    {&rsrc_class_t::u_rc_depends, "u_rc_depends", false, size_of_records<&rsrc_class_t::rc_num_depends, rsrc_depend_t>},
    {&rsrc_class_t::u_rc_variety_lists, "u_rc_variety_lists", true, size_in_bytes<&rsrc_class_t::rc_varlist_size>},
    {&rsrc_class_t::u_rc_sbs_defs, "u_rc_sbs_defs", false, size_in_bytes<&rsrc_class_t::rc_sbs_size>},
    {&rsrc_class_t::u_rc_sd_defs, "u_rc_sd_defs", true, size_in_bytes<&rsrc_class_t::rc_sd_size>},
    {&rsrc_class_t::u_rc_valid_vals, "u_rc_valid_vals", true, size_in_bytes<&rsrc_class_t::rc_valval_size>},
    {&rsrc_class_t::u_rc_strings, "u_rc_strings", true, [](const rsrc_class_t &) { return std::size_t{0}; }},
};

} // namespace

/* ---- Tables ---------------------------------------------------------------------------------------------------- */

void class_walk::check_tables() {
    std::size_t end = sizeof rc;
    for (const class_table &t : class_tables_in_order) {
        std::size_t offset = (rc.*t.ref).offset[0];
        bool unlocated = !t.located && offset == 0;
        std::size_t place = at.offset;
        for (const field &f : class_fields)
            if (f.name == t.field)
                place += f.offset;
        if (!unlocated && offset != end)
            walk.report(check::TABLE_PLACE, at, t.field, place, offset, end);
        end += t.size(rc);
        if (end > section.size()) {
            walk.report(check::TABLE_OUTSIDE, at, t.field, place, "ends at " + std::to_string(end),
                        "at most " + std::to_string(section.size()));
            return;
        }
    }
    if ((section.size() - end) % extent::UNIT != 0)
        walk.report(check::SECTION_LENGTH, at, "u_rc_strings", at.offset + offsetof(rsrc_class_t, u_rc_strings),
                    std::to_string(section.size() - end) + " bytes of strings", "a multiple of 8");
}

/* ---- Records --------------------------------------------------------------------------------------------------- */

/* A source can leave an element's type unknown, and a new class an attribute's. Structured byte strings are types, but
 * have no values. */
void class_walk::expect_data_type(const spot &place, std::string_view field, std::size_t offset, vx_data_type_t type) {
    if (!is_data_type(type))
        walk.report(check::DATA_TYPE, place, field, place.offset + offset, std::to_string(type), "0 to 22");
    else if (type == VX_UNKNOWN || type == VX_SBS_PTR)
        walk.report(check::UNKNOWN_TYPE, place, field, place.offset + offset, std::string(name_of(type)),
                    "a type with values");
}

void class_walk::follow_reference(const spot &place, const field &f, std::uint32_t word, vx_data_type_t type) {
    switch (f.to) {
    case target::strings:
        return walk.visit_text(place, f, word, strings);
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

void class_walk::follow_field(const spot &place, const field &f, std::uint32_t word, vx_data_type_t type) {
    if (f.kind == field_kind::reference)
        follow_reference(place, f, word, type);
    else if (is_out_of_line(type))
        walk_container(place, f.name, place.offset + f.offset, word, type);
}

/* Everything that a record's leading fields lead to. owner_type: of its values, where the record itself does not know
 * it. */
void class_walk::follow(const spot &place, const bytes &area, std::size_t offset, std::span<const field> fields,
                        vx_data_type_t owner_type) {
    for (const field &f : fields) {
        auto type = f.type_at == TYPE_OF_OWNER ? owner_type : area.number<vx_data_type_t>(offset + f.type_at);
        follow_field(place, f, area.number<std::uint32_t>(offset + f.offset), type);
    }
}

static bool is_bound(const field &f) {
    return f.kind == field_kind::value &&
           (f.offset == offsetof(rsrc_dattr_t, ra_min_value) || f.offset == offsetof(rsrc_dattr_t, ra_max_value));
}

/* An attribute that a following class cut short is the last of its table, in a class that is not the last. Its
 * reference to valid values may be 0 and mean nothing; only a persistent class attribute says "none" from the start.
 * The bounds of a resource attribute may be the range of a class attribute, and of its type. */
template <class Record>
void class_walk::follow_attribute(const spot &place, std::size_t offset, vx_uint32_t id, bool last) {
    auto record = section.record<Record>(offset);
    vx_data_type_t type = record.ra_data_type;
    bool may_be_cut_short = last && !is_last;
    walk.may_be_unset = may_be_cut_short;
    bool may_have_no_list = may_be_cut_short && id != CDB_ID_PATTR_C;
    bool may_be_astray = id == CDB_ID_DATTR && is_out_of_line(type);
    for (const field &f : leading_fields_of<Record>) {
        auto word = section.number<std::uint32_t>(offset + f.offset);
        if (may_have_no_list && f.to == target::valid_vals && word == 0)
            doubtful_lists.push_back({place, &f, type, record.u_ra_variety_list, record.u_ra_name.offset[0]});
        else if (may_be_astray && is_bound(f))
            doubtful_bounds.push_back({place, &f, word, type});
        else
            follow_field(place, f, word, type);
        if (f.to == target::valid_vals && word != 0 && word != CDB_NONE)
            evidence.later_list = std::min(evidence.later_list, record.u_ra_variety_list.offset[0]);
    }
}

/* The attribute, among those in doubt, that has the first list of valid values. */
std::optional<std::size_t> class_walk::owner_of_doubtful_lists() const {
    if (valid_vals.area.number<vx_uint32_t>(0) != CDB_ID_VALID_VALUES)
        return std::nullopt;
    std::vector<suspect> suspects;
    for (const doubtful_list &d : doubtful_lists) {
        valid_value_list list = valid_values_at(tables(), {}, d.type);
        bool is_complete = d.type != VX_UNKNOWN && !varieties_at(tables(), d.variety_list).empty();
        suspects.push_back(
            {can_have_list(list, strings.area, is_complete), d.variety_list.offset[0], d.name, first_text(list)});
    }
    return owner_of_first_list(suspects, evidence);
}

void class_walk::walk_doubtful_lists() {
    std::optional<std::size_t> owner = owner_of_doubtful_lists();
    bool is_there = valid_vals.area.holds(0, LIST_HEAD);
    walk.excuse = check::CUT_SHORT;
    for (std::size_t i = 0; i < doubtful_lists.size(); ++i) {
        const doubtful_list &d = doubtful_lists[i];
        if (i == owner)
            walk_valid_values(d.record_at, *d.what, 0, d.type);
        else
            walk.report(check::CUT_SHORT, d.record_at, d.what->name, d.record_at.offset + d.what->offset, "0",
                        is_there ? "a list of its own" : "in " + std::to_string(valid_vals.area.size()) + " bytes");
    }
    walk.excuse.reset();
}

/* Only arrays have bounds that are out of line. */
void class_walk::walk_doubtful_bounds() {
    walk.excuse = check::RANGE_ASTRAY;
    for (const doubtful_bound &d : doubtful_bounds) {
        std::size_t file_offset = d.record_at.offset + d.what->offset;
        if (is_array(d.type) || d.word == 0)
            walk_container(d.record_at, d.what->name, file_offset, d.word, d.type);
        else if (d.word != CDB_NONE)
            walk.report(check::RANGE_ASTRAY, d.record_at, d.what->name, file_offset, std::to_string(d.word), "none");
    }
    walk.excuse.reset();
}

template <class Record>
void class_walk::walk_attribute(const spot &place, std::size_t offset, vx_uint32_t id, bool last) {
    auto record = section.record<Record>(offset);
    walk.visit<Record>(place, section, offset);
    walk.expect_id(place, "ra_cb_ID", record.ra_cb_ID, id);
    expect_data_type(place, "ra_data_type", offsetof(Record, ra_data_type), record.ra_data_type);
    if constexpr (std::is_same_v<Record, rsrc_dattr_t>) {
        walk.note_dynamic_id(record.ra_attr_id, id == CDB_ID_DATTR_C);
        if (record.ra_var_type > ORB_QUANTUM)
            walk.report(check::VARIABLE_TYPE, place, "ra_var_type", place.offset + offsetof(rsrc_dattr_t, ra_var_type),
                        std::to_string(record.ra_var_type), "0 to 3");
    }
    met_shared = false;
    follow_attribute<Record>(place, offset, id, last);
    if (element_type(record.ra_data_type) == VX_SD_PTR && !met_shared)
        check_structure(place, record);
}

template <class Record>
void class_walk::walk_attributes(const cdb_ref_t &ref, std::size_t count, std::string_view record, vx_uint32_t id) {
    std::size_t offset = ref.offset[0];
    count = count_inside(section, offset, count, sizeof(Record));
    spot place = {at.section, record, 0, at.offset + offset};
    for (; place.index < count; ++place.index, offset += sizeof(Record), place.offset += sizeof(Record))
        walk_attribute<Record>(place, offset, id, place.index + 1 == count);
}

/* A run of element stanzas gives an attribute its definition, its largest index and its value; one that ends the source
 * comes too late for the last two. */
template <class Record> void class_walk::check_structure(const spot &place, const Record &record) {
    sd_definition definition = sd_definition_at(tables(), record.u_ra_sd);
    bool absent = record.u_ra_sd.offset[0] == CDB_NONE;
    std::size_t elements = std::size_t{record.ra_max_sd_idx} + 1;
    if (absent || elements != definition.size())
        walk.report(check::SD_MISSING, place, absent ? "u_ra_sd" : "ra_max_sd_idx",
                    place.offset + (absent ? offsetof(Record, u_ra_sd) : offsetof(Record, ra_max_sd_idx)),
                    absent ? "none" : std::to_string(record.ra_max_sd_idx),
                    absent ? "a definition" : std::to_string(definition.size()) + " elements");
    attribute<Record> attr(tables(), place.offset - at.offset);
    if constexpr (std::is_same_v<Record, rsrc_pattr_t>)
        check_structure_value(place, *field_at(pattr_fields, offsetof(rsrc_pattr_t, ra_dflt_value)), definition,
                              attr.default_value());
    else
        check_structure_value(place, *field_at(dattr_fields, offsetof(rsrc_dattr_t, ra_init_value)), definition,
                              attr.initial_value());
}

void class_walk::check_structure_value(const spot &place, const field &f, const sd_definition &definition,
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
        walk.report(check::SD_DIFFERS, place, f.name, place.offset + f.offset,
                    std::to_string(values.size()) + " elements",
                    std::to_string(definition.size()) + " elements of the definition's types");
}

void class_walk::walk_actions(const cdb_ref_t &ref, std::size_t count, vx_uint32_t id) {
    std::size_t offset = ref.offset[0];
    count = count_inside(section, offset, count, sizeof(rsrc_action_t));
    spot place = {at.section, "rsrc_action_t", 0, at.offset + offset};
    for (; place.index < count; ++place.index, offset += sizeof(rsrc_action_t), place.offset += sizeof(rsrc_action_t)) {
        walk.visit<rsrc_action_t>(place, section, offset);
        walk.expect_id(place, "ac_cb_ID", section.number<vx_uint32_t>(offset), id);
        follow(place, section, offset, leading_fields_of<rsrc_action_t>, VX_UNKNOWN);
    }
}

void class_walk::walk_errors() {
    std::size_t offset = rc.u_rc_errors.offset[0];
    std::size_t count = offset == 0 ? 0 : count_inside(section, offset, rc.rc_num_errors, sizeof(rsrc_error_t));
    spot place = {at.section, "rsrc_error_t", 0, at.offset + offset};
    for (; place.index < count; ++place.index, offset += sizeof(rsrc_error_t), place.offset += sizeof(rsrc_error_t)) {
        walk.visit<rsrc_error_t>(place, section, offset);
        follow(place, section, offset, leading_fields_of<rsrc_error_t>, VX_UNKNOWN);
    }
}

void class_walk::walk_depends() {
    std::size_t offset = rc.u_rc_depends.offset[0];
    std::size_t count = offset == 0 ? 0 : count_inside(section, offset, rc.rc_num_depends, sizeof(rsrc_depend_t));
    spot place = {at.section, "rsrc_depend_t", 0, at.offset + offset};
    for (; place.index < count; ++place.index, offset += sizeof(rsrc_depend_t), place.offset += sizeof(rsrc_depend_t))
        walk.visit<rsrc_depend_t>(place, section, offset);
}

/* ---- Lists ----------------------------------------------------------------------------------------------------- */

/* Where the entries of a list begin, if it is one and has no other owner. An empty list has room for one entry. */
std::optional<std::size_t> class_walk::claim_list(const spot &place, const field &ref, std::uint32_t offset,
                                                  extent &lists, const list_format &format) {
    std::size_t field_at = place.offset + ref.offset;
    auto refuse = [&](check broken, std::string expected) {
        walk.report(broken, place, ref.name, field_at, offset == CDB_NONE ? "none" : std::to_string(offset),
                    std::move(expected));
        return std::nullopt;
    };
    if (offset == CDB_NONE)
        return ref.optional ? std::nullopt : refuse(check::REFERENCE_NONE, "a list");
    if (!lists.area.holds(offset, LIST_HEAD))
        return refuse(check::REFERENCE_OUTSIDE, "in " + std::to_string(lists.area.size()) + " bytes");
    if (offset % extent::UNIT != 0)
        return refuse(check::REFERENCE_UNALIGNED, "a multiple of 8");
    spot list_at = {at.section, format.record, offset, lists.offset + offset};
    std::size_t count = lists.area.number<std::uint32_t>(offset + LIST_COUNT);
    std::size_t room = (lists.area.size() - offset - LIST_HEAD) / format.entry;
    walk.expect_id(list_at, format.id_field, lists.area.number<vx_uint32_t>(offset), format.id);
    if (count > room) {
        walk.report(check::LIST_OUTSIDE, list_at, format.count_field, list_at.offset + LIST_COUNT,
                    std::to_string(count), "at most " + std::to_string(room));
        return std::nullopt;
    }
    std::size_t held = std::max(count, std::min<std::size_t>(room, 1));
    if (lists.claim(offset, LIST_HEAD + held * format.entry) != extent::claim_result::FIRST) {
        met_shared = true;
        return refuse(check::LIST_SHARED, "a list of its own");
    }
    for (const field &f : format.fields.first(format.fields.size() - 1))
        walk.add_region(list_at, list_at.offset + f.offset, f.width, format.record, &f);
    if (count < held) {
        spot room_at = {at.section, format.record, offset, list_at.offset + LIST_HEAD};
        walk.expect_zero(room_at, "filling", lists.area, offset + LIST_HEAD, format.entry, room_at.offset);
        walk.add_region(room_at, room_at.offset, format.entry, "filling");
    }
    return offset + LIST_HEAD;
}

void class_walk::walk_varieties(const spot &place, const field &ref, std::uint32_t offset) {
    std::optional<std::size_t> first = claim_list(place, ref, offset, variety_lists, variety_format);
    if (!first)
        return;
    auto count = variety_lists.area.number<std::uint32_t>(offset + LIST_COUNT);
    spot entry = {at.section, "vl_entry_t", 0, variety_lists.offset + *first};
    for (; entry.index < count; ++entry.index, entry.offset += sizeof(vl_entry_t))
        walk.visit<vl_entry_t>(entry, variety_lists.area, entry.offset - variety_lists.offset);
}

void class_walk::walk_valid_values(const spot &place, const field &ref, std::uint32_t offset, vx_data_type_t type) {
    std::optional<std::size_t> first = claim_list(place, ref, offset, valid_vals, valid_values_format);
    if (!first)
        return;
    auto count = valid_vals.area.number<std::uint32_t>(offset + LIST_COUNT);
    spot entry = {at.section, "vv_entry_t", 0, valid_vals.offset + *first};
    for (; entry.index < count; ++entry.index, entry.offset += sizeof(vv_entry_t)) {
        std::size_t in_table = entry.offset - valid_vals.offset;
        walk.visit<vv_entry_t>(entry, valid_vals.area, in_table);
        follow(entry, valid_vals.area, in_table, leading_fields_of<vv_entry_t>, element_type(type));
    }
}

void class_walk::walk_sd_definition(const spot &place, const field &ref, std::uint32_t offset) {
    std::optional<std::size_t> first = claim_list(place, ref, offset, sd_defs, sd_format);
    if (!first)
        return;
    bool owner_may_be_unset = std::exchange(walk.may_be_unset, false);
    auto count = sd_defs.area.number<std::uint32_t>(offset + LIST_COUNT);
    spot element = {at.section, "sd_field_t", 0, sd_defs.offset + *first};
    for (; element.index < count; ++element.index, element.offset += sizeof(sd_field_t)) {
        std::size_t in_table = element.offset - sd_defs.offset;
        auto type = sd_defs.area.number<vx_data_type_t>(in_table + offsetof(sd_field_t, sd_field_type));
        walk.visit<sd_field_t>(element, sd_defs.area, in_table);
        expect_data_type(element, "sd_field_type", offsetof(sd_field_t, sd_field_type), type);
        follow(element, sd_defs.area, in_table, leading_fields_of<sd_field_t>, type);
    }
    walk.may_be_unset = owner_may_be_unset;
}

/* A source can leave lists that nothing refers to. */
void class_walk::report_unreached(extent &lists, std::string_view name) {
    spot place = {at.section, name, 0, lists.offset};
    std::size_t size = lists.area.size();
    for (std::size_t from = 0; from < size; from += extent::UNIT) {
        std::size_t to = from;
        while (to < size && !lists.is_taken(to))
            to += extent::UNIT;
        if (to > from)
            walk.report(check::LIST_UNREACHED, place, {}, lists.offset + from,
                        std::to_string(std::min(to, size) - from) + " bytes", "an owner");
        from = to;
    }
}

/* ---- The class ------------------------------------------------------------------------------------------------- */

void class_walk::run() {
    walk.visit<rsrc_class_t>(at, section, 0);
    walk.expect_id(at, "rc_cb_ID", rc.rc_cb_ID, CDB_ID_CLASS);
    check_tables();
    walk_attributes<rsrc_pattr_t>(rc.u_rc_pattrsC, rc.rc_num_pattrsC, "rsrc_pattr_t", CDB_ID_PATTR_C);
    walk_attributes<rsrc_dattr_t>(rc.u_rc_dattrsC, rc.rc_num_dattrsC, "rsrc_dattr_t", CDB_ID_DATTR_C);
    walk_attributes<rsrc_pattr_t>(rc.u_rc_pattrs, rc.rc_num_pattrs, "rsrc_pattr_t", CDB_ID_PATTR);
    walk_attributes<rsrc_dattr_t>(rc.u_rc_dattrs, rc.rc_num_dattrs, "rsrc_dattr_t", CDB_ID_DATTR);
    walk.may_be_unset = true;
    follow(at, section, 0, leading_fields_of<rsrc_class_t>, VX_UNKNOWN);
    walk.may_be_unset = false;
    walk_actions(rc.u_rc_actionsC, rc.rc_num_actionsC, CDB_ID_ACTION_C);
    walk_actions(rc.u_rc_actions, rc.rc_num_actions, CDB_ID_ACTION);
    walk_errors();
    walk_depends();
    walk.finish_texts(at, strings); /* now all that has an owner without doubt is known */
    walk.may_be_unset = true;
    walk_doubtful_lists();
    walk_doubtful_bounds();
    walk_empty_binaries();
    report_unreached(variety_lists, "variety_list_t");
    report_unreached(sd_defs, "sd_def_t");
    report_unreached(valid_vals, "valid_values_t");
}

void walk_class(walker &walk, const spot &at, const bytes &section, bool is_last) {
    class_walk(walk, at, section, is_last).run();
}

} // namespace cdb
