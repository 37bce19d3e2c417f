/* Compares the field tables with a second list, written by hand, of how each field is reversed. */

#include "cdb_fields.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

namespace {

using cdb::field;
using cdb::field_kind;
using cdb::target;

struct record {
    std::string_view name;
    std::span<const field> fields;
    size_t size;   /* bytes */
    size_t number; /* of fields */
};

constexpr record records[] = {
    {"header", cdb::cdb_header_fields, 80, 19},
    {"anchor", cdb::cdb_dsect_anchor_fields, 16, 4},
    {"class", cdb::class_fields, 224, 42},
    {"pattr", cdb::pattr_fields, 72, 15},
    {"dattr", cdb::dattr_fields, 136, 27},
    {"action", cdb::action_fields, 56, 12},
    {"error", cdb::error_fields, 48, 10},
    {"depend", cdb::depend_fields, 8, 3},
    {"variety", cdb::vl_entry_fields, 8, 2},
    {"varieties", cdb::variety_list_fields, 16, 3},
    {"valid value", cdb::vv_entry_fields, 24, 4},
    {"valid values", cdb::valid_values_fields, 32, 3},
    {"SD element", cdb::sd_field_fields, 32, 8},
    {"SD", cdb::sd_def_fields, 40, 3},
    {"SBS field", cdb::sbs_field_fields, 32, 6},
    {"SBS", cdb::sbs_def_fields, 40, 4},
    {"manager", cdb::mgr_fields, 24, 5},
    {"map", cdb::cmmap_fields, 60, 18},
    {"variable class", cdb::variable_class_fields, 40, 8},
    {"hash block", cdb::rc_hash_block_fields, 24, 4},
    {"hash", cdb::class_hash_fields, 8224, 4},
    {"context", cdb::ctx_tmplt_fields, 16, 5},
    {"array", cdb::array_fields, 16, 3},
    {"structure", cdb::structured_data_fields, 24, 3},
    {"element", cdb::structured_data_element_fields, 16, 3},
};

/* A field that is not a plain number. */
struct special {
    std::string_view record;
    std::string_view name;
    field_kind kind;
    size_t width = 8;
    target to = target::none;
    size_t type_at = 0xFFFF;
    size_t count = 1;
    bool stays = false;
};

constexpr special reference(std::string_view record, std::string_view name, target to) {
    return {record, name, field_kind::reference, 8, to};
}

constexpr special value(std::string_view record, std::string_view name, size_t type_at) {
    return {record, name, field_kind::value, 8, target::strings, type_at};
}

constexpr special reserved(std::string_view record, std::string_view name, size_t width, size_t count) {
    return {record, name, field_kind::reserved, width, target::none, 0xFFFF, count};
}

constexpr special entries(std::string_view record, std::string_view name, size_t width) {
    return {record, name, field_kind::entries, width};
}

constexpr special specials[] = {
    reserved("header", "cdb_hdr_spares", 2, 15),
    {"header", "cdb_hdr_checksum", field_kind::number, 4, target::none, 0xFFFF, 1, true},

    reference("class", "u_rc_name", target::strings),
    reference("class", "u_rc_alias", target::strings),
    reference("class", "u_rc_pattrsC", target::section),
    reference("class", "u_rc_dattrsC", target::section),
    reference("class", "u_rc_pattrs", target::section),
    reference("class", "u_rc_dattrs", target::section),
    reference("class", "u_rc_def_input", target::sd_defs),
    reference("class", "u_rc_undef_input", target::sd_defs),
    reference("class", "u_rc_online_input", target::sd_defs),
    reference("class", "u_rc_offline_input", target::sd_defs),
    reference("class", "u_rc_reset_input", target::sd_defs),
    reference("class", "u_rc_actionsC", target::section),
    reference("class", "u_rc_actions", target::section),
    reference("class", "u_rc_errors", target::section),
    reference("class", "u_rc_depends", target::section),
    reference("class", "u_rc_variety_lists", target::section),
    reference("class", "u_rc_sbs_defs", target::section),
    reference("class", "u_rc_sd_defs", target::section),
    reference("class", "u_rc_valid_vals", target::section),
    reference("class", "u_rc_strings", target::section),
    reserved("class", "rc_spare", 2, 2),

    reference("pattr", "u_ra_name", target::strings),
    value("pattr", "ra_dflt_value", 36),
    reference("pattr", "u_ra_variety_list", target::variety_lists),
    reference("pattr", "u_ra_valid_vals", target::valid_vals),
    reference("pattr", "u_ra_sd", target::sd_defs),
    reserved("pattr", "ra_reserved2", 2, 3),

    reference("dattr", "u_ra_name", target::strings),
    reference("dattr", "u_ra_vclass", target::strings),
    reference("dattr", "u_ra_next_in_vclass", target::none),
    value("dattr", "ra_init_value", 104),
    value("dattr", "ra_min_value", 104),
    value("dattr", "ra_max_value", 104),
    reference("dattr", "u_ra_variety_list", target::variety_lists),
    reference("dattr", "u_ra_valid_vals", target::valid_vals),
    reference("dattr", "u_ra_sd", target::sd_defs),
    reference("dattr", "u_ra_express", target::strings),
    reference("dattr", "u_ra_rearm_expr", target::strings),
    reference("dattr", "u_ra_ZAV_name", target::strings),
    {"dattr", "ra_report_interval", field_kind::number, 2, target::none, 0xFFFF, 1, true},
    reserved("dattr", "ra_reserved", 2, 1),

    reference("action", "u_ac_name", target::strings),
    reference("action", "u_ac_variety_list", target::variety_lists),
    reference("action", "u_ac_sd_input", target::sd_defs),
    reference("action", "u_ac_sd_resp", target::sd_defs),

    reference("error", "u_re_name", target::strings),
    reference("error", "u_re_variety_list", target::variety_lists),
    reference("error", "u_re_sd_input", target::sd_defs),
    reserved("error", "re_reserved", 2, 2),
    reserved("depend", "rd_reserved", 2, 1),

    entries("varieties", "vl_values", 8),
    value("valid value", "vv_low_val", 0xFFFF),
    value("valid value", "vv_high_val", 0xFFFF),
    reserved("valid value", "vv_reserved", 2, 3),
    entries("valid values", "vv_values", 24),

    reference("SD element", "u_sd_field_name", target::strings),
    reference("SD element", "u_sd_valid_vals", target::valid_vals),
    reserved("SD element", "sd_reserved", 2, 1),
    entries("SD", "sd_fields", 32),
    reference("SBS field", "u_sb_field_name", target::strings),
    value("SBS field", "sb_min_value", 0xFFFF),
    value("SBS field", "sb_max_value", 0xFFFF),
    reserved("SBS", "sb_reserved", 2, 1),
    entries("SBS", "sbs_fields", 32),

    reference("manager", "u_rm_RMname", target::strings),
    {"manager", "u_rm_strings_table", field_kind::reference, 8, target::none, 0xFFFF, 1, true},
    reference("map", "u_rcm_msg_file", target::strings),
    reference("map", "u_rcm_strings", target::section),
    reserved("map", "rcm_reserved", 2, 2),
    reference("variable class", "u_rvc_name", target::strings),
    reference("variable class", "u_rvc_compat_name", target::strings),
    reference("variable class", "u_rvc_string_tbl", target::none), /* a length */
    reserved("variable class", "rvc_reserved", 2, 2),

    reference("hash block", "u_rch_next_hash", target::none),
    reference("hash block", "u_rch_rsrc_class", target::none),
    {"hash", "u_rch_table", field_kind::reference, 8, target::none, 0xFFFF, 1024, true},
    entries("hash", "rc_hash_blocks", 24),
    reference("context", "u_ctxt", target::none),

    reserved("array", "pad", 4, 1),
    entries("array", "elements", 8),
    reserved("structure", "pad", 4, 1),
    entries("structure", "elements", 16),
    reserved("element", "pad", 4, 1),
    value("element", "value", 0),
};

/* The row of the second list for a field; null if it is a plain number. */
const special *special_of(std::string_view record_name, std::string_view name) {
    const auto *found = std::ranges::find_if(
        specials, [&](const special &row) { return row.record == record_name && row.name == name; });
    return found == std::end(specials) ? nullptr : found;
}

void expect_special(const special &row, const field &f) {
    EXPECT_EQ(f.kind, row.kind);
    EXPECT_EQ(f.width, row.width);
    EXPECT_EQ(f.count, row.count);
    EXPECT_EQ(f.to, row.to);
    EXPECT_EQ(f.type_at, row.type_at);
    EXPECT_EQ(f.stays, row.stays);
}

void expect_plain_number(const field &f) {
    EXPECT_EQ(f.kind, field_kind::number);
    EXPECT_TRUE(f.width == 2 || f.width == 4) << f.width;
    EXPECT_EQ(f.count, 1);
    EXPECT_FALSE(f.stays);
}

TEST(FieldTables, EveryFieldIsAPlainNumberOrWhatTheListSays) {
    for (const record &r : records)
        for (const field &f : r.fields) {
            SCOPED_TRACE(std::string(r.name) + ' ' + std::string(f.name));
            if (const special *row = special_of(r.name, f.name))
                expect_special(*row, f);
            else
                expect_plain_number(f);
        }
}

TEST(FieldTables, EveryFieldOfTheListIsInItsTableOnce) {
    for (const special &row : specials) {
        const auto *r = std::ranges::find(records, row.record, &record::name);
        ASSERT_NE(r, std::end(records)) << row.record;
        EXPECT_EQ(std::ranges::count(r->fields, row.name, &field::name), 1) << row.record << ' ' << row.name;
    }
}

TEST(FieldTables, CoverTheirRecordsFromFieldToField) {
    for (const record &r : records) {
        SCOPED_TRACE(r.name);
        EXPECT_EQ(r.fields.size(), r.number);
        size_t at = 0;
        for (const field &f : r.fields) {
            EXPECT_EQ(f.offset, at) << f.name;
            at += size_t{f.width} * f.count;
        }
        EXPECT_EQ(at, r.size);
    }
}

/* ---- The check that is made while compiling -------------------------------------------------------------------- */

consteval field row(std::uint16_t offset, std::uint16_t width, std::uint16_t count = 1) {
    return {"", offset, width, count, field_kind::number};
}

constexpr field whole[] = {row(0, 4), row(4, 2), row(6, 2, 3), row(12, 8)};
static_assert(cdb::tiles(whole, 20));
static_assert(cdb::tiles({}, 0));

static_assert(!cdb::tiles(whole, 19), "a field beyond the end");
static_assert(!cdb::tiles(whole, 21), "a gap at the end");
static_assert(!cdb::tiles({}, 1), "nothing but a gap");

constexpr field late[] = {row(2, 2), row(4, 4)};
static_assert(!cdb::tiles(late, 8), "a gap at the start");

constexpr field gap[] = {row(0, 4), row(6, 2)};
static_assert(!cdb::tiles(gap, 8), "a gap between fields");

constexpr field overlap[] = {row(0, 4), row(2, 2), row(4, 4)};
static_assert(!cdb::tiles(overlap, 8), "an overlap");

constexpr field twice[] = {row(0, 4), row(0, 4), row(4, 4)};
static_assert(!cdb::tiles(twice, 8), "a field twice");

constexpr field disordered[] = {row(4, 4), row(0, 4)};
static_assert(!cdb::tiles(disordered, 8), "fields out of order");

constexpr field short_array[] = {row(0, 2, 3), row(8, 4)};
static_assert(!cdb::tiles(short_array, 12), "an array too short");

/* ---- The rows -------------------------------------------------------------------------------------------------- */

struct sample {
    std::uint32_t first;
    std::uint16_t array[3];
    std::uint16_t last;
    cdb_ref_t ref;
    vx_value_t value;
};

constexpr field rows[] = {CDB_FIELD(sample, array, reserved), CDB_REF(sample, ref, valid_vals),
                          CDB_VALUE(sample, value, 4)};

TEST(FieldRows, TakePlaceWidthAndLengthFromTheDeclaration) {
    EXPECT_EQ(rows[0].name, "array");
    EXPECT_EQ(rows[0].offset, 4);
    EXPECT_EQ(rows[0].width, 2);
    EXPECT_EQ(rows[0].count, 3);
    EXPECT_EQ(rows[0].kind, field_kind::reserved);
    EXPECT_EQ(rows[0].to, target::none);
    EXPECT_FALSE(rows[0].stays);
}

TEST(FieldRows, ReferencesHaveATargetAndValuesAType) {
    EXPECT_EQ(rows[1].kind, field_kind::reference);
    EXPECT_EQ(rows[1].to, target::valid_vals);
    EXPECT_EQ(rows[2].kind, field_kind::value);
    EXPECT_EQ(rows[2].to, target::strings);
    EXPECT_EQ(rows[2].type_at, 4);
}

TEST(FieldRows, StaysMarksTheRowAndChangesNothingElse) {
    constexpr field kept = cdb::stays(CDB_REF(sample, ref, sd_defs));
    EXPECT_TRUE(kept.stays);
    EXPECT_EQ(kept.name, "ref");
    EXPECT_EQ(kept.offset, 12);
    EXPECT_EQ(kept.width, 8);
    EXPECT_EQ(kept.count, 1);
    EXPECT_EQ(kept.kind, field_kind::reference);
    EXPECT_EQ(kept.to, target::sd_defs);
}

} // namespace
