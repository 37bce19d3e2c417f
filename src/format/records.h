/* records.h: the records that a file may contain, with their fields, the meanings of the fields, and their sizes. */
#ifndef CDGEN_FORMAT_RECORDS_H
#define CDGEN_FORMAT_RECORDS_H

#include "format/facts.h"

#include <array>

namespace cdb {

struct record_format {
    std::string_view record; /* its type's name */
    std::span<const field> fields;
    std::span<const field_fact> facts; /* one for each field, in the same order */
    std::size_t size;                  /* bytes; of a list and a class hash, without the entries */
    const field *name = nullptr;       /* the field that leads to the record's name; null: the record has no name */
    const field *type = nullptr;       /* the field with its values' data type; null: the record has none */

    /* Of the field that starts at this offset; one must. */
    constexpr const field_fact &fact_at(std::size_t offset) const {
        std::size_t i = 0;
        while (fields[i].offset != offset)
            ++i;
        return facts[i];
    }
    constexpr const field_fact &fact_of(const field &f) const {
        return fact_at(f.offset);
    }
};

/* True if every field has its row, and every reference to a place has the meaning OFFSET or UNUSED, so that it is not
 * taken for a plain number. */
consteval bool rows_match(std::span<const field> fields, std::span<const field_fact> facts) {
    if (fields.size() != facts.size())
        return false;
    for (std::size_t i = 0; i < fields.size(); ++i) {
        bool is_place = fields[i].kind == field_kind::reference &&
                        (fields[i].to == target::section || fields[i].to == target::none);
        bool says_place = facts[i].as == meaning::OFFSET || facts[i].as == meaning::UNUSED;
        if (fields[i].name != facts[i].field || (is_place && !says_place))
            return false;
    }
    return true;
}

/* The fact rows of a record. If a record's rows do not match its fields, this does not compile. */
template <class Record>
consteval record_format describe(std::string_view record, std::span<const field_fact> facts,
                                 std::size_t size = sizeof(Record)) {
    std::span<const field> fields = fields_of<Record>;
    if (!rows_match(fields, facts))
        throw "each field of a record needs one row in format/facts.h, in the same order";
    record_format made = {record, fields, facts, size};
    for (std::size_t i = 0; i < fields.size(); ++i) {
        if (facts[i].is == role::NAME)
            made.name = &fields[i];
        if (facts[i].as == meaning::DATA_TYPE)
            made.type = &fields[i];
    }
    return made;
}

/* The formats by record type. */
template <class Record> inline constexpr record_format format_for = {};
#define CDB_RECORD(type, ...)                                                                                          \
    template <> inline constexpr record_format format_for<type> = describe<type>(#type, __VA_ARGS__)
CDB_RECORD(orb_cdb_header_t, facts::header);
CDB_RECORD(cdb_dsect_anchor_t, facts::anchor);
CDB_RECORD(rsrc_class_t, facts::resource_class);
CDB_RECORD(rsrc_pattr_t, facts::pattr);
CDB_RECORD(rsrc_dattr_t, facts::dattr);
CDB_RECORD(rsrc_action_t, facts::action);
CDB_RECORD(rsrc_error_t, facts::error);
CDB_RECORD(rsrc_depend_t, facts::depend);
CDB_RECORD(variety_list_t, facts::variety_list, offsetof(variety_list_t, vl_values));
CDB_RECORD(vl_entry_t, facts::vl_entry);
CDB_RECORD(valid_values_t, facts::valid_values, offsetof(valid_values_t, vv_values));
CDB_RECORD(vv_entry_t, facts::vv_entry);
CDB_RECORD(sd_def_t, facts::sd_def, offsetof(sd_def_t, sd_fields));
CDB_RECORD(sd_field_t, facts::sd_field);
CDB_RECORD(rsrc_mgr_t, facts::mgr);
CDB_RECORD(rsrc_cmmap_t, facts::cmmap);
CDB_RECORD(rsrc_variable_class_t, facts::variable_class);
CDB_RECORD(rsrc_class_hash_t, facts::class_hash, offsetof(rsrc_class_hash_t, rc_hash_blocks));
CDB_RECORD(rc_hash_block_t, facts::hash_block);
CDB_RECORD(vx_array_t, facts::array, offsetof(vx_array_t, elements));
CDB_RECORD(vx_structured_data_t, facts::structured_data, offsetof(vx_structured_data_t, elements));
CDB_RECORD(vx_structured_data_element_t, facts::structured_data_element);
#undef CDB_RECORD

/* All of them. (Structured byte strings and context templates are declared, but no file contains them.) */
inline constexpr const record_format *record_formats[] = {
    &format_for<orb_cdb_header_t>,
    &format_for<cdb_dsect_anchor_t>,
    &format_for<rsrc_class_t>,
    &format_for<rsrc_pattr_t>,
    &format_for<rsrc_dattr_t>,
    &format_for<rsrc_action_t>,
    &format_for<rsrc_error_t>,
    &format_for<rsrc_depend_t>,
    &format_for<variety_list_t>,
    &format_for<vl_entry_t>,
    &format_for<valid_values_t>,
    &format_for<vv_entry_t>,
    &format_for<sd_def_t>,
    &format_for<sd_field_t>,
    &format_for<rsrc_mgr_t>,
    &format_for<rsrc_cmmap_t>,
    &format_for<rsrc_variable_class_t>,
    &format_for<rsrc_class_hash_t>,
    &format_for<rc_hash_block_t>,
    &format_for<vx_array_t>,
    &format_for<vx_structured_data_t>,
    &format_for<vx_structured_data_element_t>,
};

/* By name; an unknown record has no fields. */
constexpr const record_format &format_of(std::string_view record) {
    constexpr const record_format *unknown = &format_for<void>;
    for (const record_format *format : record_formats)
        if (format->record == record)
            return *format;
    return *unknown;
}

/* The record sizes that the header holds, each in a field of 16 bits. */
struct recorded_size {
    std::size_t at; /* in the header */
    std::size_t size;
};
inline constexpr recorded_size recorded_sizes[] = {
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_class_size), sizeof(rsrc_class_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_cmmap_size), sizeof(rsrc_cmmap_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_mgr_size), sizeof(rsrc_mgr_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_variable_class_size), sizeof(rsrc_variable_class_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_pattr_size), sizeof(rsrc_pattr_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_dattr_size), sizeof(rsrc_dattr_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_action_size), sizeof(rsrc_action_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_error_size), sizeof(rsrc_error_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_depend_size), sizeof(rsrc_depend_t)},
};

} // namespace cdb

#endif
