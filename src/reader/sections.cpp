/* sections.cpp: the walks over all sections but classes. */

#include "reader/sections.h"

#include "reader/texts.h"

namespace cdb {

/* A section's own strings end it, filled up to a multiple of 8. */
static void expect_filled_up(reporter &out, const location &at, const bytes &section, std::size_t strings_at) {
    std::size_t size = section.size() - std::min(strings_at, section.size());
    if (size % extent::UNIT != 0)
        out.report(check::SECTION_LENGTH, at, {}, at.offset, std::to_string(size) + " bytes of strings",
                   "a multiple of 8");
}

void walk_manager(reporter &out, const location &at, const bytes &section) {
    auto record = section.record<rsrc_mgr_t>(0);
    out.visit<rsrc_mgr_t>(at, section, 0);
    out.expect_id(at, fields_of<rsrc_mgr_t>.front().name, record.rm_cb_ID, CDB_ID_MGR);
    text_walk texts(out, at, section.part(sizeof record), at.offset + sizeof record);
    texts.visit(at, field_at(mgr_fields, offsetof(rsrc_mgr_t, u_rm_RMname)), record.u_rm_RMname.offset[0], true);
    texts.finish();
    expect_filled_up(out, at, section, sizeof record);
}

void walk_map(reporter &out, const location &at, const bytes &section) {
    auto record = section.record<rsrc_cmmap_t>(0);
    out.visit<rsrc_cmmap_t>(at, section, 0);
    out.expect_id(at, fields_of<rsrc_cmmap_t>.front().name, record.rcm_cb_ID, CDB_ID_CMMAP);
    std::size_t strings_at = record.u_rcm_strings.offset[0];
    if (strings_at != sizeof record)
        out.report(check::TABLE_PLACE, at, field_of<rsrc_cmmap_t>(offsetof(rsrc_cmmap_t, u_rcm_strings)), strings_at,
                   sizeof record);
    text_walk texts(out, at, section.part(strings_at), at.offset + strings_at);
    texts.visit(at, field_at(cmmap_fields, offsetof(rsrc_cmmap_t, u_rcm_msg_file)), record.u_rcm_msg_file.offset[0],
                true);
    texts.finish();
    expect_filled_up(out, at, section, sizeof record);
}

/* The IDs, filled up to a multiple of 8, end the section. first: where they start. */
static void walk_variable_ids(reporter &out, const location &record_at, const bytes &section, std::uint64_t first,
                              std::uint64_t told, std::span<const var_id_t> dynamic_ids) {
    std::uint64_t filled = (told * sizeof(var_id_t) + extent::UNIT - 1) / extent::UNIT * extent::UNIT;
    if (first + filled != section.size())
        out.report(check::SECTION_LENGTH, record_at,
                   field_of<rsrc_variable_class_t>(offsetof(rsrc_variable_class_t, rvc_var_count)), section.size(),
                   first + filled);
    if (first > section.size())
        return;
    std::size_t start = static_cast<std::size_t>(first);
    std::size_t count = count_inside(section, first, told, sizeof(var_id_t));
    location at = {record_at.section, "var_id_t", 0, record_at.offset + start};
    for (; at.index < count; ++at.index, at.offset += sizeof(var_id_t)) {
        out.add_region(at, at.offset, sizeof(var_id_t), stretch_kind::VARIABLE_ID);
        auto id = section.number<var_id_t>(at.offset - record_at.offset);
        if (!std::binary_search(dynamic_ids.begin(), dynamic_ids.end(), id))
            out.report(check::VARIABLE_ID, at, {}, at.offset, std::to_string(id), "the ID of a dynamic attribute");
    }
    std::size_t end = at.offset - record_at.offset;
    std::size_t filling = static_cast<std::size_t>(std::min<std::uint64_t>(section.size(), first + filled)) - end;
    out.expect_zero(at, "filling", section, end, filling, at.offset);
    out.add_region(at, at.offset, filling, stretch_kind::FILLING);
}

void walk_variable_class(reporter &out, const location &at, const bytes &section,
                         std::span<const var_id_t> dynamic_ids) {
    auto record = section.record<rsrc_variable_class_t>(0);
    out.visit<rsrc_variable_class_t>(at, section, 0);
    out.expect_id(at, fields_of<rsrc_variable_class_t>.front().name, record.rvc_cb_ID, CDB_ID_VARIABLE_CLASS);
    std::size_t strings_size = record.u_rvc_string_tbl.offset[0];
    text_walk texts(out, at, section.part(sizeof record, strings_size), at.offset + sizeof record);
    texts.visit(at, field_at(variable_class_fields, offsetof(rsrc_variable_class_t, u_rvc_name)),
                record.u_rvc_name.offset[0], true);
    texts.visit(at, field_at(variable_class_fields, offsetof(rsrc_variable_class_t, u_rvc_compat_name)),
                record.u_rvc_compat_name.offset[0], true);
    texts.finish();
    if (strings_size % extent::UNIT != 0)
        out.report(check::REFERENCE_UNALIGNED, at,
                   field_of<rsrc_variable_class_t>(offsetof(rsrc_variable_class_t, u_rvc_string_tbl)),
                   std::to_string(strings_size), "a multiple of 8");
    walk_variable_ids(out, at, section, sizeof record + std::uint64_t{strings_size}, record.rvc_var_count, dynamic_ids);
}

void walk_class_hash(reporter &out, const location &at, const bytes &section) {
    constexpr std::size_t BLOCKS = offsetof(rsrc_class_hash_t, rc_hash_blocks);
    out.visit<rsrc_class_hash_t>(at, section, 0);
    std::uint64_t told = section.number<std::uint32_t>(offsetof(rsrc_class_hash_t, rch_num_hash_blocks));
    std::uint64_t size = BLOCKS + told * sizeof(rc_hash_block_t);
    if (size != section.size())
        out.report(check::SECTION_LENGTH, at,
                   field_of<rsrc_class_hash_t>(offsetof(rsrc_class_hash_t, rch_num_hash_blocks)), section.size(), size);
    location block = {at.section, "rc_hash_block_t", 0, at.offset + BLOCKS};
    for (std::size_t count = count_inside(section, BLOCKS, told, sizeof(rc_hash_block_t)); block.index < count;
         ++block.index) {
        out.visit<rc_hash_block_t>(block, section, block.offset - at.offset);
        block.offset += sizeof(rc_hash_block_t);
    }
}

} // namespace cdb
