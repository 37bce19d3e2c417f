/* cdgen_swap.cpp: reverses the byte order of a finished image, using the field tables of its records. */

#include "compiler/cdgen_swap.h"

#include "cdb_fields.h"
#include "format/checksum.h"
#include "format/sections.h"

#include <algorithm>
#include <span>
#include <utility>

namespace {

using cdb::field;
using cdb::field_kind;
using cdb::target;

/* Class bits of the data types, by type; only IS_ARRAY is used. */
constexpr vx_uint16_t cu_dtc_table_1[] = {0x0000, 0x0002, 0x0023, 0x0023, 0x0023, 0x0023, 0x0023, 0x0023,
                                          0x000F, 0x000F, 0x000F, 0x0007, 0x000C, 0x001F, 0x001F, 0x001F,
                                          0x001F, 0x001F, 0x001F, 0x0017, 0x0017, 0x0017, 0x0017};
constexpr vx_uint16_t IS_ARRAY = 0x10;

/* Element types of the array types, by type. */
constexpr vx_data_type_t cu_dtc_base_types_1[] = {
    VX_UNKNOWN, VX_UNKNOWN, VX_UNKNOWN, VX_UNKNOWN,  VX_UNKNOWN,    VX_UNKNOWN,         VX_UNKNOWN, VX_UNKNOWN,
    VX_UNKNOWN, VX_UNKNOWN, VX_UNKNOWN, VX_UNKNOWN,  VX_UNKNOWN,    VX_INT32,           VX_UINT32,  VX_INT64,
    VX_UINT64,  VX_FLOAT32, VX_FLOAT64, VX_CHAR_PTR, VX_BINARY_PTR, VX_RSRC_HANDLE_PTR, VX_SD_PTR};
static_assert(std::size(cu_dtc_table_1) == VX_SD_PTR_ARRAY + 1);
static_assert(std::size(cu_dtc_base_types_1) == VX_SD_PTR_ARRAY + 1);

template <class Number> Number load(const char *from) {
    Number number;
    memcpy(&number, from, sizeof number);
    return number;
}

template <class Number> void store(char *to, Number number) {
    memcpy(to, &number, sizeof number);
}

vx_uint32_t load_word(const char *from) {
    return load<vx_uint32_t>(from);
}

void swap_word(char *word) {
    swap_any(word, 4);
}

bool known_type(vx_data_type_t type) {
    return type <= VX_SD_PTR_ARRAY;
}

bool is_array(vx_data_type_t type) {
    return known_type(type) && (cu_dtc_table_1[type] & IS_ARRAY) != 0;
}

/* The tables are known at compile time, so each field is expanded to just the code that it needs. */
template <const auto &fields> constexpr auto rows = std::make_index_sequence<std::size(fields)>();

/* Reverses whole numbers, and the first word of references. Values are reversed elsewhere, because their type must be
 * known. */
template <const auto &fields, size_t row> void swap_field(char *record) {
    constexpr field f = fields[row];
    constexpr bool reference = f.kind == field_kind::reference;
    if constexpr (!f.stays && (reference || f.kind == field_kind::number))
        for (size_t i = 0; i < f.count; ++i)
            swap_any(record + f.offset + i * f.width, reference ? sizeof(vx_uint32_t) : f.width);
}

template <const auto &fields> void swap_fields(char *record) {
    [&]<size_t... row>(std::index_sequence<row...>) {
        (swap_field<fields, row>(record), ...);
    }
    (rows<fields>);
}

template <const auto &fields, size_t row>
void swap_value_of(char *record, vx_data_type_t owner_type, swap_area &sbase_p) {
    constexpr field f = fields[row];
    if constexpr (f.kind == field_kind::value && f.type_at == cdb::TYPE_OF_OWNER)
        swap_value(record + f.offset, owner_type, sbase_p);
    else if constexpr (f.kind == field_kind::value)
        swap_value(record + f.offset, load<vx_data_type_t>(record + f.type_at), sbase_p);
}

template <const auto &fields> void swap_values(char *record, vx_data_type_t owner_type, swap_area &sbase_p) {
    [&]<size_t... row>(std::index_sequence<row...>) {
        (swap_value_of<fields, row>(record, owner_type, sbase_p), ...);
    }
    (rows<fields>);
}

/* ---- Out-of-line values ---------------------------------------------------------------------------------------- */

void swap_binary(vx_uint32_t offset, swap_area &sbase_p) {
    if (char *length = sbase_p.take(offset, sizeof(vx_uint32_t)))
        swap_word(length);
}

void swap_structured_data(vx_uint32_t offset, swap_area &sbase_p) {
    constexpr size_t HEAD = offsetof(vx_structured_data_t, elements);
    constexpr size_t SIZE = sizeof(vx_structured_data_element_t);
    char *sd = sbase_p.take(offset, HEAD, 0, SIZE);
    if (sd == nullptr)
        return;
    char *element = sd + HEAD;
    for (vx_uint32_t n = load_word(sd); n > 0; --n, element += SIZE) {
        swap_values<cdb::structured_data_element_fields>(element, VX_UNKNOWN, sbase_p);
        swap_fields<cdb::structured_data_element_fields>(element);
    }
    swap_fields<cdb::structured_data_fields>(sd);
}

void swap_array(vx_uint32_t offset, vx_data_type_t element_type, swap_area &sbase_p) {
    constexpr size_t HEAD = offsetof(vx_array_t, elements);
    char *array = sbase_p.take(offset, HEAD, 0, sizeof(vx_value_t));
    if (array == nullptr)
        return;
    char *element = array + HEAD;
    for (vx_uint32_t n = load_word(array); n > 0; --n, element += sizeof(vx_value_t))
        swap_value(element, element_type, sbase_p);
    swap_fields<cdb::array_fields>(array);
}

void swap_out_of_line(vx_uint32_t offset, vx_data_type_t type, swap_area &sbase_p) {
    /* The first name of the class is at offset 0, so a cell of 0 was never filled. */
    if (offset == CDB_NONE || offset == 0 || sbase_p.nesting == swap_area::NESTING_MAX)
        return;
    ++sbase_p.nesting;
    if (is_array(type))
        swap_array(offset, cu_dtc_base_types_1[type], sbase_p);
    else if (type == VX_SD_PTR)
        swap_structured_data(offset, sbase_p);
    else if (type == VX_BINARY_PTR)
        swap_binary(offset, sbase_p);
    --sbase_p.nesting;
}

/* The references in its elements are not followed. */
void swap_array_alone(vx_uint32_t offset, vx_data_type_t type, swap_area &sbase_p) {
    unsigned nesting = std::exchange(sbase_p.nesting, swap_area::NESTING_MAX - 1);
    swap_out_of_line(offset, type, sbase_p);
    sbase_p.nesting = nesting;
}

/* ---- Records --------------------------------------------------------------------------------------------------- */

/* The tables of one class. */
struct swap_areas {
    swap_area &sbase_p;
    swap_area &vvbase_p;
    swap_area &vlbase_p;
    swap_area &sdbase_p;
};

void follow_variety_list(vx_uint32_t offset, swap_area &vlbase_p) {
    if (char *list = vlbase_p.take(offset, offsetof(variety_list_t, vl_values), offsetof(variety_list_t, vl_count),
                                   sizeof(vl_entry_t)))
        swap_var_list(list);
}

void follow_valid_vals(vx_uint32_t offset, vx_data_type_t type, swap_area &vvbase_p, swap_area &sbase_p) {
    if (char *list = vvbase_p.take(offset, offsetof(valid_values_t, vv_values), offsetof(valid_values_t, vv_count),
                                   sizeof(vv_entry_t)))
        swap_valid_vals(list, type, sbase_p);
}

void follow_sd_def(vx_uint32_t offset, const swap_areas &areas) {
    if (char *sd = areas.sdbase_p.take(offset, offsetof(sd_def_t, sd_fields), offsetof(sd_def_t, sd_count),
                                       sizeof(sd_field_t)))
        swap_sd_def(sd, areas.vvbase_p, areas.sbase_p);
}

/* Reverses what a record refers to in the class's list tables. type: that of the record's values. */
template <const auto &fields, size_t row>
void follow_reference(const char *record, vx_data_type_t type, const swap_areas &areas) {
    constexpr field f = fields[row];
    vx_uint32_t offset = f.kind == field_kind::reference ? load_word(record + f.offset) : CDB_NONE;
    if (offset == CDB_NONE)
        return;
    if constexpr (f.to == target::variety_lists)
        follow_variety_list(offset, areas.vlbase_p);
    else if constexpr (f.to == target::valid_vals)
        follow_valid_vals(offset, type, areas.vvbase_p, areas.sbase_p);
    else if constexpr (f.to == target::sd_defs)
        follow_sd_def(offset, areas);
}

template <const auto &fields> void follow_references(const char *record, vx_data_type_t type, const swap_areas &areas) {
    [&]<size_t... row>(std::index_sequence<row...>) {
        (follow_reference<fields, row>(record, type, areas), ...);
    }
    (rows<fields>);
}

/* type_at: where the record holds the type of its values, or TYPE_OF_OWNER if it has none. */
template <const auto &fields>
void swap_records(char *first, vx_uint32_t count, size_t size, std::uint16_t type_at, const swap_areas &areas) {
    for (char *record = first; count > 0; --count, record += size) {
        auto type = type_at == cdb::TYPE_OF_OWNER ? VX_UNKNOWN : load<vx_data_type_t>(record + type_at);
        follow_references<fields>(record, type, areas);
        swap_values<fields>(record, type, areas.sbase_p);
        swap_fields<fields>(record);
    }
}

/* ---- Sections -------------------------------------------------------------------------------------------------- */

/* One data section of the image. */
struct swap_section {
    char *start;
    size_t length;
    cell_places to_numbers = {};

    /* True if size bytes from offset on are inside. */
    bool holds(size_t offset, size_t size) const {
        return offset <= length && size <= length - offset;
    }

    /* How many of count records of size bytes from offset on are inside. */
    vx_uint32_t records_inside(size_t offset, vx_uint32_t count, size_t size) const {
        size_t room = offset <= length ? (length - offset) / size : 0;
        return static_cast<vx_uint32_t>(std::min<size_t>(count, room));
    }

    swap_area area(const cdb_ref_t &ref, size_t size) const {
        size_t offset = ref.offset[0];
        return offset <= length ? swap_area(start + offset, std::min(size, length - offset)) : swap_area(start, 0);
    }
};

/* What reverses the records of a class's tables, in the order of the file. */
constexpr decltype(&swap_pattr) record_swaps[] = {swap_pattr,  swap_dattr,  swap_pattr,  swap_dattr,
                                                  swap_action, swap_action, swap_errors, swap_depends};
static_assert(std::size(record_swaps) == cdb::TABLES_OF_RECORDS);

void swap_tables(const swap_section &section, const rsrc_class_t &rc, size_t first, size_t last,
                 const swap_areas &areas) {
    for (size_t i = first; i < last; ++i) {
        const cdb::side_table &table = cdb::side_tables[i];
        vx_uint32_t offset = (rc.*table.ref).offset[0];
        if (offset == CDB_NONE)
            continue;
        vx_uint32_t count = section.records_inside(offset, rc.*table.count, table.record->size);
        if (count > 0)
            record_swaps[i](section.start + offset, count, areas.sbase_p, areas.vvbase_p, areas.vlbase_p,
                            areas.sdbase_p);
    }
}

/* List tables are reversed only where something refers to them, and the string table only where it holds a value. */
void swap_class(const swap_section &section) {
    if (!section.holds(0, sizeof(rsrc_class_t)))
        return;
    auto rc = load<rsrc_class_t>(section.start);
    swap_area strings = section.area(rc.u_rc_strings, section.length);
    strings.to_numbers = section.to_numbers;
    swap_area valid_vals = section.area(rc.u_rc_valid_vals, rc.rc_valval_size);
    swap_area variety_lists = section.area(rc.u_rc_variety_lists, rc.rc_varlist_size);
    swap_area sd_defs = section.area(rc.u_rc_sd_defs, rc.rc_sd_size);
    swap_areas areas = {strings, valid_vals, variety_lists, sd_defs};
    swap_tables(section, rc, 0, cdb::TABLES_OF_ATTRIBUTES, areas);
    follow_references<cdb::class_fields>(section.start, VX_UNKNOWN, areas); /* the five SD inputs */
    swap_tables(section, rc, cdb::TABLES_OF_ATTRIBUTES, cdb::TABLES_OF_RECORDS, areas);
    swap_fields<cdb::class_fields>(section.start);
}

void swap_mgr(const swap_section &section) {
    if (section.holds(0, sizeof(rsrc_mgr_t)))
        swap_fields<cdb::mgr_fields>(section.start);
}

void swap_cmmap(const swap_section &section) {
    if (section.holds(0, sizeof(rsrc_cmmap_t)))
        swap_fields<cdb::cmmap_fields>(section.start);
}

void swap_var_class(const swap_section &section) {
    if (!section.holds(0, sizeof(rsrc_variable_class_t)))
        return;
    auto rvc = load<rsrc_variable_class_t>(section.start);
    if (!section.holds(sizeof rvc, rvc.u_rvc_string_tbl.offset[0]))
        return swap_fields<cdb::variable_class_fields>(section.start);
    size_t ids = sizeof rvc + rvc.u_rvc_string_tbl.offset[0];
    for (vx_uint32_t n = section.records_inside(ids, rvc.rvc_var_count, sizeof(var_id_t)); n > 0; --n)
        swap_word(section.start + ids + (n - 1) * sizeof(var_id_t));
    swap_fields<cdb::variable_class_fields>(section.start);
}

void swap_class_hash(const swap_section &section) {
    constexpr size_t BLOCKS = offsetof(rsrc_class_hash_t, rc_hash_blocks);
    constexpr size_t SIZE = sizeof(rc_hash_block_t);
    if (!section.holds(0, BLOCKS))
        return;
    vx_uint32_t count = load_word(section.start + offsetof(rsrc_class_hash_t, rch_num_hash_blocks));
    for (vx_uint32_t n = section.records_inside(BLOCKS, count, SIZE); n > 0; --n)
        swap_fields<cdb::rc_hash_block_fields>(section.start + BLOCKS + (n - 1) * SIZE);
    swap_fields<cdb::class_hash_fields>(section.start);
}

void swap_section_of(const cdb_dsect_anchor_t &anchor, const swap_section &section) {
    switch (anchor.cda_type) {
    case CDB_DSECT_RSRC_MGR:
        return swap_mgr(section);
    case CDB_DSECT_VAR_CLASS:
        return swap_var_class(section);
    case CDB_DSECT_CLASS:
        return swap_class(section);
    case CDB_DSECT_CMMAP:
        return swap_cmmap(section);
    case CDB_DSECT_CLASS_HASH:
        return swap_class_hash(section);
    default:
        return;
    }
}

/* Sets the words that only look like references to "none" while the image is walked. Returns their previous contents.
 */
std::vector<vx_uint32_t> hide_strays(char *image, std::span<const size_t> places) {
    std::vector<vx_uint32_t> words;
    for (size_t place : places) {
        words.push_back(load_word(image + place));
        store(image + place, vx_uint32_t{CDB_NONE});
    }
    return words;
}

void restore_strays(char *image, std::span<const size_t> places, std::span<const vx_uint32_t> words) {
    for (size_t i = 0; i < places.size(); ++i) {
        store(image + places[i], words[i]);
        swap_word(image + places[i]);
    }
}

} // namespace

char *swap_area::take(vx_uint32_t offset, size_t head, size_t count_at, size_t entry) {
    if (offset % ALIGNMENT != 0 || offset > size || head > size - offset)
        return nullptr;
    size_t room = size - offset - head;
    if (entry > 0 && load_word(base + offset + count_at) > room / entry)
        return nullptr;
    if (taken[offset / ALIGNMENT])
        return nullptr;
    taken[offset / ALIGNMENT] = true;
    return base + offset;
}

void swap_any(char *field, size_t width) {
    if (width == 2)
        store(field, __builtin_bswap16(load<vx_uint16_t>(field)));
    else if (width == 4)
        store(field, __builtin_bswap32(load<vx_uint32_t>(field)));
    else if (width == 8)
        store(field, __builtin_bswap64(load<vx_uint64_t>(field)));
}

void swap_value(char *value, vx_data_type_t type, swap_area &sbase_p) {
    switch (type) {
    case VX_INT32:
    case VX_UINT32:
    case VX_FLOAT32:
        return swap_word(value);
    case VX_INT64:
    case VX_UINT64:
    case VX_FLOAT64:
        return swap_any(value, 8);
    case VX_UNKNOWN:
    case VX_NONE:
    case VX_SBS_PTR: /* deliberately neither offset nor data */
        return;
    default:
        if (!known_type(type))
            return;
        if (sbase_p.to_numbers.holds(value))
            swap_array_alone(load_word(value), type, sbase_p);
        else
            swap_out_of_line(load_word(value), type, sbase_p);
        swap_word(value);
    }
}

void swap_var_list(char *list) {
    char *entry = list + offsetof(variety_list_t, vl_values);
    for (auto n = load_word(list + offsetof(variety_list_t, vl_count)); n > 0; --n, entry += sizeof(vl_entry_t))
        swap_fields<cdb::vl_entry_fields>(entry);
    swap_fields<cdb::variety_list_fields>(list);
}

void swap_valid_vals(char *vv, vx_data_type_t type, swap_area &sbase_p) {
    vx_data_type_t value_type = is_array(type) ? cu_dtc_base_types_1[type] : type;
    char *entry = vv + offsetof(valid_values_t, vv_values);
    for (auto n = load_word(vv + offsetof(valid_values_t, vv_count)); n > 0; --n, entry += sizeof(vv_entry_t)) {
        swap_values<cdb::vv_entry_fields>(entry, value_type, sbase_p);
        swap_fields<cdb::vv_entry_fields>(entry);
    }
    swap_fields<cdb::valid_values_fields>(vv);
}

void swap_sd_def(char *sd, swap_area &vvbase_p, swap_area &sbase_p) {
    char *element = sd + offsetof(sd_def_t, sd_fields);
    for (auto n = load_word(sd + offsetof(sd_def_t, sd_count)); n > 0; --n, element += sizeof(sd_field_t)) {
        auto field = load<sd_field_t>(element);
        if (field.u_sd_valid_vals.offset[0] != CDB_NONE)
            follow_valid_vals(field.u_sd_valid_vals.offset[0], field.sd_field_type, vvbase_p, sbase_p);
        swap_fields<cdb::sd_field_fields>(element);
    }
    swap_fields<cdb::sd_def_fields>(sd);
}

void swap_pattr(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                swap_area &sdbase_p) {
    swap_records<cdb::pattr_fields>(first, count, sizeof(rsrc_pattr_t), offsetof(rsrc_pattr_t, ra_data_type),
                                    {sbase_p, vvbase_p, vlbase_p, sdbase_p});
}

void swap_dattr(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                swap_area &sdbase_p) {
    swap_records<cdb::dattr_fields>(first, count, sizeof(rsrc_dattr_t), offsetof(rsrc_dattr_t, ra_data_type),
                                    {sbase_p, vvbase_p, vlbase_p, sdbase_p});
}

void swap_action(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                 swap_area &sdbase_p) {
    swap_records<cdb::action_fields>(first, count, sizeof(rsrc_action_t), cdb::TYPE_OF_OWNER,
                                     {sbase_p, vvbase_p, vlbase_p, sdbase_p});
}

void swap_errors(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                 swap_area &sdbase_p) {
    swap_records<cdb::error_fields>(first, count, sizeof(rsrc_error_t), cdb::TYPE_OF_OWNER,
                                    {sbase_p, vvbase_p, vlbase_p, sdbase_p});
}

void swap_depends(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                  swap_area &sdbase_p) {
    swap_records<cdb::depend_fields>(first, count, sizeof(rsrc_depend_t), cdb::TYPE_OF_OWNER,
                                     {sbase_p, vvbase_p, vlbase_p, sdbase_p});
}

void cdgen_cdef_swap(char *cdb_hdr_p, std::span<const size_t> nowhere, std::span<const size_t> to_numbers) {
    auto header = load<orb_cdb_header_t>(cdb_hdr_p);
    size_t file_size = size_t{header.cdb_hdr_length} + sizeof header.cdb_hdr_length;
    std::vector<vx_uint32_t> strays = hide_strays(cdb_hdr_p, nowhere);
    swap_section file = {cdb_hdr_p, file_size};
    char *anchor_p = cdb_hdr_p + sizeof header;
    vx_uint32_t n = file.records_inside(sizeof header, header.cdb_hdr_dsect_count, sizeof(cdb_dsect_anchor_t));
    for (; n > 0; --n, anchor_p += sizeof(cdb_dsect_anchor_t)) {
        auto anchor = load<cdb_dsect_anchor_t>(anchor_p);
        if (file.holds(anchor.cda_offset, anchor.cda_length))
            swap_section_of(anchor, {cdb_hdr_p + anchor.cda_offset, anchor.cda_length, {cdb_hdr_p, to_numbers}});
        swap_fields<cdb::cdb_dsect_anchor_fields>(anchor_p);
    }
    restore_strays(cdb_hdr_p, nowhere, strays);
    swap_fields<cdb::cdb_header_fields>(cdb_hdr_p);
    vx_uint32_t checksum = cdb_checksum(cdb_hdr_p, load_word(cdb_hdr_p), header.cdb_hdr_length);
    memcpy(cdb_hdr_p + offsetof(orb_cdb_header_t, cdb_hdr_checksum), &checksum, sizeof checksum);
}
