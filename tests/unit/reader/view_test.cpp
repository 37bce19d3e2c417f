/* The views: every field and every accessor over the hand-made image tests/image/whole.image, which has a different
 * number in each field; in both byte orders and from every alignment. Values have a test of their own. */

#include "cdb_view.h"

#include "reader/image_files.h"

#include <iterator>

namespace {

using namespace image_files;
using enum cdb::level;

/* Calls check with the image's database, in both byte orders, 0 to 7 bytes off an aligned place. */
template <class Check> void everywhere(std::string_view image, Check check) {
    for (std::endian order : both_orders)
        for (std::size_t off = 0; off < 8; ++off) {
            exact_copy copy(load(image, order), off);
            SCOPED_TRACE(testing::Message() << image << ", " << name_of(order) << ", " << off << " bytes off");
            check(cdb::database(copy.bytes()));
        }
}

template <class List> auto item(const List &list, std::ptrdiff_t index) {
    return *std::next(list.begin(), index);
}

cdb::resource_class disk(const cdb::database &db) {
    return item(db.classes(), 0);
}

/* ---- The file -------------------------------------------------------------------------------------------------- */

/* database(read_file(...)) would refer to bytes that are gone. */
static_assert(!std::is_constructible_v<cdb::database, std::vector<std::byte>>);
static_assert(!std::is_constructible_v<cdb::database, const std::vector<std::byte>>);
static_assert(std::is_constructible_v<cdb::database, std::vector<std::byte> &>);
static_assert(std::is_constructible_v<cdb::database, const std::vector<std::byte> &>);

TEST(CdbViewDatabase, FormatWordTellsTheByteOrder) {
    for (std::endian order : both_orders) {
        std::vector<std::byte> image = load("whole", order);
        cdb::database db(image);
        EXPECT_TRUE(db.recognised());
        EXPECT_EQ(db.order(), order);
        EXPECT_EQ(db.file().size(), 3168u);
    }
}

TEST(CdbViewDatabase, WithoutFormatWordItIsOfThisMachinesOrder) {
    for (std::endian order : both_orders) {
        std::vector<std::byte> image = load("whole", order);
        image[9] ^= std::byte{1};
        cdb::database db(image);
        EXPECT_FALSE(db.recognised());
        EXPECT_EQ(db.order(), std::endian::native);
    }
}

TEST(CdbViewDatabase, NoBytesAreAnEmptyDatabase) {
    for (const cdb::database &db : {cdb::database(), cdb::database(std::span<const std::byte>())}) {
        EXPECT_FALSE(db.recognised());
        EXPECT_EQ(db.section_count(), 0u);
        EXPECT_TRUE(db.classes().begin() == db.classes().end());
        EXPECT_TRUE(db.variable_classes().begin() == db.variable_classes().end());
        EXPECT_EQ(db.section(0).size(), 0u);
    }
}

TEST(CdbViewDatabase, HeaderHasItsFields) {
    std::vector<std::byte> image = load("whole", std::endian::little);
    for (std::size_t i = 12; i < 24; ++i) /* sequence number and time, which the assembler leaves 0 */
        image[i] = std::byte(i);
    for (std::size_t i = 4; i < 8; ++i)
        image[i] = std::byte(i);
    cdb::database db(image);
    const orb_cdb_header_t &h = db.header();
    EXPECT_EQ(h.cdb_hdr_length, 3164u);
    EXPECT_EQ(h.cdb_hdr_checksum, 0x07060504u);
    EXPECT_EQ(h.cdb_hdr_format, 0x666D7431u);
    EXPECT_EQ(h.cdb_hdr_seqno, 0x0F0E0D0Cu);
    EXPECT_EQ(h.cdb_hdr_timestamp.tv_sec, 0x13121110u);
    EXPECT_EQ(h.cdb_hdr_timestamp.tv_usec, 0x17161514u);
}

TEST(CdbViewDatabase, HeaderCountsAndSizesInBothOrders) {
    everywhere("whole", [](const cdb::database &db) {
        const orb_cdb_header_t &h = db.header();
        EXPECT_EQ(h.cdb_hdr_length, 3164u);
        EXPECT_EQ(h.cdb_hdr_dsect_count, 8u);
        EXPECT_EQ(h.cdb_hdr_max_rm_id, 601);
        EXPECT_EQ(h.cdb_hdr_max_class_id, 0x0102);
        EXPECT_EQ(h.cdb_hdr_rsrc_class_size, 224);
        EXPECT_EQ(h.cdb_hdr_rsrc_cmmap_size, 60);
        EXPECT_EQ(h.cdb_hdr_rsrc_mgr_size, 24);
        EXPECT_EQ(h.cdb_hdr_rsrc_variable_class_size, 40);
        EXPECT_EQ(h.cdb_hdr_rsrc_pattr_size, 72);
        EXPECT_EQ(h.cdb_hdr_rsrc_dattr_size, 136);
        EXPECT_EQ(h.cdb_hdr_rsrc_action_size, 56);
        EXPECT_EQ(h.cdb_hdr_rsrc_error_size, 48);
        EXPECT_EQ(h.cdb_hdr_rsrc_depend_size, 8);
    });
}

/* The checksum word is in the file's order, though a reversal leaves it alone: here it is taken from the document. */
TEST(CdbViewDatabase, ChecksumIsReadInTheFilesOrder) {
    std::vector<std::byte> image = load("document", std::endian::little);
    EXPECT_EQ(cdb::database(image).header().cdb_hdr_checksum, 0xAF6F2186u);
    std::reverse(image.begin() + 4, image.begin() + 8);
    std::reverse(image.begin() + 8, image.begin() + 12);
    EXPECT_EQ(cdb::database(image).header().cdb_hdr_checksum, 0xAF6F2186u);
}

TEST(CdbViewDatabase, AnchorsSayWhereSectionsAre) {
    everywhere("whole", [](const cdb::database &db) {
        constexpr struct {
            std::uint32_t type, offset, length;
        } rows[] = {{5, 208, 2376}, {5, 2584, 232}, {3, 2816, 32}, {3, 2848, 40},
                    {6, 2888, 76},  {6, 2964, 68},  {4, 3032, 72}, {4, 3104, 64}};
        ASSERT_EQ(db.section_count(), std::size(rows));
        for (std::size_t i = 0; i < std::size(rows); ++i) {
            cdb_dsect_anchor_t anchor = db.anchor(i);
            EXPECT_EQ(anchor.cda_type, rows[i].type);
            EXPECT_EQ(anchor.cda_offset, rows[i].offset);
            EXPECT_EQ(anchor.cda_length, rows[i].length);
            EXPECT_EQ(db.section(i).size(), rows[i].length);
            EXPECT_EQ(db.section(i).raw().data(), db.file().raw().data() + rows[i].offset);
        }
    });
}

TEST(CdbViewDatabase, SectionsAreSortedByType) {
    everywhere("whole", [](const cdb::database &db) {
        EXPECT_EQ(std::distance(db.classes().begin(), db.classes().end()), 2);
        EXPECT_EQ(std::distance(db.managers().begin(), db.managers().end()), 2);
        EXPECT_EQ(std::distance(db.maps().begin(), db.maps().end()), 2);
        EXPECT_EQ(std::distance(db.variable_classes().begin(), db.variable_classes().end()), 2);
        EXPECT_EQ(item(db.classes(), 1).name(), "Tape");
        EXPECT_EQ(item(db.managers(), 1).name(), "mgrB");
        EXPECT_EQ(item(db.maps(), 1).message_catalog(), "bb.cat");
        EXPECT_EQ(item(db.variable_classes(), 1).name(), "Slow");
    });
}

TEST(CdbViewDatabase, SectionCountStopsAtTheEndOfTheFile) {
    std::vector<std::byte> image = load("whole", std::endian::little);
    image[26] = std::byte{0xFF};
    EXPECT_EQ(cdb::database(image).section_count(), (3168u - 80) / 16);
    EXPECT_EQ(cdb::database(std::span(image).first(80 + 16 * 3 + 15)).section_count(), 3u);
}

/* ---- Classes --------------------------------------------------------------------------------------------------- */

TEST(CdbViewClass, RecordHasItsFields) {
    everywhere("whole", [](const cdb::database &db) {
        const rsrc_class_t r = disk(db).record();
        EXPECT_EQ(r.rc_cb_ID, 0x43444231u);
        EXPECT_EQ(r.rc_props, 0x12345678u);
        EXPECT_EQ(r.u_rc_alias.offset[0], 8u);
        EXPECT_EQ(r.u_rc_pattrsC.offset[0], 224u);
        EXPECT_EQ(r.u_rc_dattrsC.offset[0], 296u);
        EXPECT_EQ(r.u_rc_pattrs.offset[0], 568u);
        EXPECT_EQ(r.u_rc_dattrs.offset[0], 784u);
        EXPECT_EQ(r.u_rc_undef_input.offset[0], 40u);
        EXPECT_EQ(r.u_rc_online_input.offset[0], 80u);
        EXPECT_EQ(r.u_rc_offline_input.offset[0], 120u);
        EXPECT_EQ(r.u_rc_reset_input.offset[0], 160u);
        EXPECT_EQ(r.u_rc_actionsC.offset[0], 1056u);
        EXPECT_EQ(r.u_rc_actions.offset[0], 1168u);
        EXPECT_EQ(r.u_rc_errors.offset[0], 1224u);
        EXPECT_EQ(r.u_rc_sd_defs.offset[0], 1424u);
        EXPECT_EQ(r.u_rc_valid_vals.offset[0], 1808u);
        EXPECT_EQ(r.u_rc_strings.offset[0], 1960u);
        EXPECT_EQ(r.rc_num_pattrsC, 1);
        EXPECT_EQ(r.rc_num_dattrsC, 2);
        EXPECT_EQ(r.rc_num_pattrs, 3);
        EXPECT_EQ(r.rc_varlist_size, 200u);
        EXPECT_EQ(r.rc_sd_size, 384u);
        EXPECT_EQ(r.rc_valval_size, 152u);
        EXPECT_EQ(r.rc_perm_temp, 0xEEEEEEEEu);
        EXPECT_EQ(r.rc_perm_tempC, 0xDDDDDDDDu);
        EXPECT_EQ(r.rc_class_id, 0x0102);
        EXPECT_EQ(r.rc_dscr_msgid, 103);
        EXPECT_EQ(r.rc_disp_msgid, 104);
        EXPECT_EQ(r.rc_locator, 42);
        EXPECT_EQ(r.rc_version, 0x01020304u);
    });
}

TEST(CdbViewClass, NamesAndInputs) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::resource_class c = disk(db);
        EXPECT_EQ(c.name(), "Disk");
        EXPECT_EQ(c.alias(), "DiskAlias");
        EXPECT_EQ(item(db.classes(), 1).alias(), "");
        constexpr struct {
            cdb_ref_t rsrc_class_t::*input;
            std::string_view name;
            vx_data_type_t type;
        } rows[] = {{&rsrc_class_t::u_rc_def_input, "define0", VX_INT32},
                    {&rsrc_class_t::u_rc_undef_input, "undef0", VX_UINT32},
                    {&rsrc_class_t::u_rc_online_input, "online0", VX_INT32},
                    {&rsrc_class_t::u_rc_offline_input, "offline", VX_UINT64},
                    {&rsrc_class_t::u_rc_reset_input, "reset0", VX_FLOAT32}};
        for (const auto &row : rows) {
            ASSERT_EQ(c.sd_input(row.input).size(), 1u);
            EXPECT_EQ(c.sd_input(row.input)[0].name(), row.name);
            EXPECT_EQ(c.sd_input(row.input)[0].type(), row.type);
            EXPECT_TRUE(item(db.classes(), 1).sd_input(row.input).empty());
        }
    });
}

TEST(CdbViewClass, SideTablesHaveTheirSizes) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::class_tables tables = disk(db).side_tables();
        EXPECT_EQ(tables.section.size(), 2376u);
        EXPECT_EQ(tables.variety_lists.size(), 200u);
        EXPECT_EQ(tables.sd_defs.size(), 384u);
        EXPECT_EQ(tables.valid_vals.size(), 152u);
        EXPECT_EQ(tables.strings.size(), 416u);
    });
}

/* The names of a list's items, one after the other. */
template <class List> std::string names(const List &list) {
    std::string all;
    for (const auto &i : list)
        all.append(i.name()).append(" ");
    return all;
}

TEST(CdbViewClass, EachTableOfRecordsIsItsOwn) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::resource_class c = disk(db);
        EXPECT_EQ(names(c.persistent_attributes(of_class)), "pc_limit ");
        EXPECT_EQ(names(c.dynamic_attributes(of_class)), "dc_count dc_state ");
        EXPECT_EQ(names(c.persistent_attributes(of_resource)), "p_size p_label p_times ");
        EXPECT_EQ(names(c.dynamic_attributes(of_resource)), "d_load d_marks ");
        EXPECT_EQ(names(c.actions(of_class)), "ac_scan ac_stop ");
        EXPECT_EQ(names(c.actions(of_resource)), "a_check ");
    });
}

TEST(CdbViewClass, ItemsAreFoundByNameAndById) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::resource_class c = disk(db);
        EXPECT_EQ(cdb::find(db.classes(), "Tape")->record().rc_version, 0x05060708u);
        EXPECT_EQ(cdb::find(db.managers(), "mgrB")->record().rm_id, 600);
        EXPECT_EQ(cdb::find(db.variable_classes(), "Slow")->record().rvc_var_count, 3u);
        EXPECT_EQ(cdb::find(c.persistent_attributes(of_resource), "p_times")->id(), -43);
        EXPECT_EQ(cdb::find(c.persistent_attributes(of_resource), -43)->name(), "p_times");
        EXPECT_EQ(cdb::find(c.dynamic_attributes(of_class), 34)->name(), "dc_state");
        EXPECT_EQ(cdb::find(c.dynamic_attributes(of_resource), "d_marks")->id(), 50);
        EXPECT_EQ(cdb::find(c.actions(of_class), -71)->name(), "ac_stop");
        EXPECT_EQ(cdb::find(c.actions(of_resource), "a_check")->id(), 81);
        EXPECT_EQ(cdb::find(c.actions(of_class)[0].input(), "in0")->type(), VX_CHAR_PTR_ARRAY);
        EXPECT_FALSE(cdb::find(db.classes(), "disk"));
        EXPECT_FALSE(cdb::find(c.actions(of_class), "a_check"));
        EXPECT_FALSE(cdb::find(c.persistent_attributes(of_class), 42));
    });
}

/* ---- Attributes ------------------------------------------------------------------------------------------------ */

TEST(CdbViewPersistentAttribute, RecordHasItsFields) {
    everywhere("whole", [](const cdb::database &db) {
        const rsrc_pattr_t r = disk(db).persistent_attributes(of_resource)[2].record();
        EXPECT_EQ(r.ra_cb_ID, 0x43444239u);
        EXPECT_EQ(r.ra_props, 0x28u);
        EXPECT_EQ(r.u_ra_name.offset[0], 88u);
        EXPECT_EQ(r.ra_dscr_msgid, 161);
        EXPECT_EQ(r.ra_disp_msgid, 162);
        EXPECT_EQ(r.ra_group_msgid, 163);
        EXPECT_EQ(r.ra_group_id, 164);
        EXPECT_EQ(r.ra_attr_id, -43);
        EXPECT_EQ(r.ra_data_type, VX_SD_PTR);
        EXPECT_EQ(r.u_ra_variety_list.offset[0], 88u);
        EXPECT_EQ(r.u_ra_valid_vals.offset[0], CDB_NONE);
        EXPECT_EQ(r.u_ra_sd.offset[0], 312u);
        EXPECT_EQ(r.ra_max_sd_idx, 1);
    });
}

TEST(CdbViewPersistentAttribute, LeadsToWhatBelongsToIt) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::persistent_attribute limit = disk(db).persistent_attributes(of_class)[0];
        EXPECT_EQ(limit.record().ra_cb_ID, 0x43444237u);
        EXPECT_EQ(limit.default_value().natural(), 115u);
        EXPECT_TRUE(limit.valid_values().empty());
        EXPECT_TRUE(limit.structure().empty());
        auto attributes = disk(db).persistent_attributes(of_resource);
        EXPECT_EQ(attributes[0].type(), VX_FLOAT64);
        EXPECT_EQ(attributes[0].default_value().real(), -0.125);
        EXPECT_EQ(attributes[1].default_value().text(), "label A");
        ASSERT_EQ(attributes[1].valid_values().size(), 1u);
        EXPECT_EQ(attributes[1].valid_values()[0].low.text(), "valid lo");
        EXPECT_EQ(attributes[1].valid_values()[0].high.text(), "valid hi");
        EXPECT_EQ(attributes[1].valid_values()[0].message, 401);
        EXPECT_EQ(names(attributes[2].structure()), "seconds user ");
        EXPECT_EQ(attributes[2].default_value().elements()[0].natural(), 18446744073709551615u);
        EXPECT_EQ(attributes[2].default_value().elements()[1].text(), "root");
    });
}

TEST(CdbViewDynamicAttribute, RecordHasItsFields) {
    everywhere("whole", [](const cdb::database &db) {
        const rsrc_dattr_t r = disk(db).dynamic_attributes(of_resource)[0].record();
        EXPECT_EQ(r.ra_cb_ID, 0x43444261u);
        EXPECT_EQ(r.ra_props, 0x20u);
        EXPECT_EQ(r.u_ra_next_in_vclass.offset[0], 9u);
        EXPECT_EQ(r.u_ra_variety_list.offset[0], 104u);
        EXPECT_EQ(r.u_ra_express.offset[0], 136u);
        EXPECT_EQ(r.u_ra_rearm_expr.offset[0], 152u);
        EXPECT_EQ(r.ra_var_type, ORB_QUANTUM);
        EXPECT_EQ(r.ra_dscr_msgid, 171);
        EXPECT_EQ(r.ra_disp_msgid, 172);
        EXPECT_EQ(r.ra_group_msgid, 173);
        EXPECT_EQ(r.ra_group_id, 174);
        EXPECT_EQ(r.ra_attr_id, 49);
        EXPECT_EQ(r.ra_max_sd_idx, 0xFFFF);
        EXPECT_EQ(r.ra_expr_desc, 175);
        EXPECT_EQ(r.ra_rearm_desc, 176);
        EXPECT_EQ(r.ra_range_desc, 177);
        const rsrc_dattr_t of_the_class = disk(db).dynamic_attributes(of_class)[0].record();
        EXPECT_EQ(of_the_class.ra_cb_ID, 0x43444238u);
        EXPECT_EQ(of_the_class.u_ra_vclass.offset[0], 248u);
        EXPECT_EQ(of_the_class.u_ra_ZAV_name.offset[0], 256u);
        EXPECT_EQ(of_the_class.ra_report_interval, 0x1111);
    });
}

TEST(CdbViewDynamicAttribute, LeadsToWhatBelongsToIt) {
    everywhere("whole", [](const cdb::database &db) {
        auto of_the_class = disk(db).dynamic_attributes(of_class);
        EXPECT_EQ(of_the_class[0].type(), VX_INT64);
        EXPECT_EQ(of_the_class[0].initial_value().integer(), -121);
        EXPECT_EQ(of_the_class[0].min_value().integer(), -5000000000);
        EXPECT_EQ(of_the_class[0].max_value().integer(), 5000000001);
        EXPECT_EQ(of_the_class[0].expression(), "");
        EXPECT_EQ(of_the_class[1].valid_values()[1].low.natural(), 405u);
        EXPECT_EQ(of_the_class[1].valid_values()[1].high.natural(), 406u);
        EXPECT_EQ(of_the_class[1].valid_values()[1].message, 407);
        auto attributes = disk(db).dynamic_attributes(of_resource);
        EXPECT_EQ(attributes[0].initial_value().real(), 1.5);
        EXPECT_EQ(attributes[0].min_value().real(), -2.5);
        EXPECT_EQ(attributes[0].max_value().real(), 3.75);
        EXPECT_EQ(attributes[0].expression(), "load > 9");
        EXPECT_EQ(attributes[0].rearm_expression(), "load < 5");
        EXPECT_EQ(attributes[1].initial_value().elements().size(), 3u);
        EXPECT_EQ(attributes[1].initial_value().elements()[2].natural(), 503u);
        EXPECT_EQ(attributes[1].min_value().elements()[0].natural(), 504u);
        EXPECT_EQ(attributes[1].max_value().elements()[0].natural(), 505u);
        EXPECT_EQ(attributes[1].valid_values()[0].low.type(), VX_UINT32);
        EXPECT_EQ(attributes[1].valid_values()[0].low.natural(), 408u);
    });
}

TEST(CdbViewVarieties, EachRecordHasItsOwn) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::resource_class c = disk(db);
        auto first = [](const auto &record) { return record.varieties()[0].low; };
        EXPECT_EQ(first(c.persistent_attributes(of_class)[0]), 200u);
        EXPECT_EQ(first(c.dynamic_attributes(of_class)[1]), 204u);
        EXPECT_EQ(first(c.persistent_attributes(of_resource)[0]), 206u);
        EXPECT_EQ(first(c.dynamic_attributes(of_resource)[0]), 214u);
        EXPECT_EQ(first(c.actions(of_class)[1]), 220u);
        cdb::variety_list three = c.actions(of_resource)[0].varieties();
        ASSERT_EQ(three.size(), 3u);
        EXPECT_EQ(three[1].high, 225u);
        EXPECT_EQ(three[2].low, 226u);
        EXPECT_EQ(three[2].high, 4294967295u);
    });
}

TEST(CdbViewAction, RecordHasItsFields) {
    everywhere("whole", [](const cdb::database &db) {
        const rsrc_action_t r = disk(db).actions(of_class)[0].record();
        EXPECT_EQ(r.ac_cb_ID, 0x43444263u);
        EXPECT_EQ(r.ac_action_id, 61);
        EXPECT_EQ(r.ac_props, 0x62u);
        EXPECT_EQ(r.ac_dscr_msgid, 163);
        EXPECT_EQ(r.ac_disp_msgid, 164);
        EXPECT_EQ(r.ac_confirm_msgid, 165);
        EXPECT_EQ(r.ac_timeout, 166);
        EXPECT_EQ(r.ac_perms, 0x167u);
        EXPECT_EQ(disk(db).actions(of_resource)[0].record().ac_cb_ID, 0x43444262u);
    });
}

TEST(CdbViewAction, InputAndResponse) {
    everywhere("whole", [](const cdb::database &db) {
        auto of_the_class = disk(db).actions(of_class);
        EXPECT_EQ(names(of_the_class[0].input()), "in0 ");
        EXPECT_TRUE(of_the_class[0].response().empty());
        EXPECT_TRUE(of_the_class[1].input().empty());
        EXPECT_EQ(names(disk(db).actions(of_resource)[0].response()), "resp0 resp1 ");
    });
}

TEST(CdbViewStructure, ElementHasItsFields) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::sd_element online = disk(db).sd_input(&rsrc_class_t::u_rc_online_input)[0];
        EXPECT_EQ(online.record().sd_disp_msgid, 305);
        EXPECT_EQ(online.record().sd_dscr_msgid, 306);
        EXPECT_EQ(online.record().sd_action_id, 65534u);
        EXPECT_EQ(online.record().sd_valid_type, 2);
        ASSERT_EQ(online.valid_values().size(), 1u);
        EXPECT_EQ(online.valid_values()[0].low.integer(), -411);
        EXPECT_EQ(online.valid_values()[0].high.integer(), 412);
        EXPECT_EQ(online.valid_values()[0].message, 413);
        cdb::sd_element second = disk(db).actions(of_resource)[0].response()[1];
        EXPECT_EQ(second.type(), VX_BINARY_PTR);
        EXPECT_EQ(second.record().sd_disp_msgid, 315);
        EXPECT_TRUE(second.valid_values().empty());
    });
}

/* ---- The other sections ---------------------------------------------------------------------------------------- */

TEST(CdbViewManager, HasItsFields) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::manager m = item(db.managers(), 0);
        EXPECT_EQ(m.record().rm_cb_ID, 0x43444233u);
        EXPECT_EQ(m.record().rm_id, 601);
        EXPECT_EQ(m.record().rm_spare, 602);
        EXPECT_EQ(m.name(), "mgrA");
    });
}

TEST(CdbViewMap, HasItsFields) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::class_map m = item(db.maps(), 0);
        EXPECT_EQ(m.message_catalog(), "a.cat");
        const rsrc_cmmap_t r = m.record();
        EXPECT_EQ(r.rcm_cb_ID, 0x43444232u);
        EXPECT_EQ(r.rcm_class_ID, 701);
        EXPECT_EQ(r.rcm_rm_ID, 702);
        EXPECT_EQ(r.u_rcm_strings.offset[0], 60u);
        EXPECT_EQ(r.rcm_dscr_msg_set, 703);
        EXPECT_EQ(r.rcm_first_key, 704);
        EXPECT_EQ(r.rcm_last_key, 705);
        EXPECT_EQ(r.rcm_asnno_start, 706);
        EXPECT_EQ(r.rcm_num_sctx, 707);
        EXPECT_EQ(r.rcm_num_vctx, 708);
        EXPECT_EQ(r.rcm_num_stats, 709);
        EXPECT_EQ(r.rcm_num_ctx_tmplts, 710);
        EXPECT_EQ(r.rcm_static_contexts, 711u);
        EXPECT_EQ(r.rcm_volatile_contexts, 712u);
        EXPECT_EQ(r.rcm_stats, 713u);
        EXPECT_EQ(r.rcm_ctx_tmplts, 714u);
    });
}

TEST(CdbViewVariableClass, HasItsFields) {
    everywhere("whole", [](const cdb::database &db) {
        cdb::variable_class v = item(db.variable_classes(), 0);
        EXPECT_EQ(v.record().rvc_cb_ID, 0x43444234u);
        EXPECT_EQ(v.record().rvc_obsv_interval, 801);
        EXPECT_EQ(v.record().rvc_report_interval, 802);
        EXPECT_EQ(v.record().u_rvc_string_tbl.offset[0], 24u);
        EXPECT_EQ(v.name(), "Fast");
        EXPECT_EQ(v.alias(), "FastAlias");
        EXPECT_EQ(item(db.variable_classes(), 1).alias(), "");
    });
}

TEST(CdbViewVariableClass, ListsItsIds) {
    everywhere("whole", [](const cdb::database &db) {
        auto fast = item(db.variable_classes(), 0).variable_ids();
        ASSERT_EQ(fast.size(), 2u);
        EXPECT_EQ(fast[0].number, 0x8021u);
        EXPECT_TRUE(fast[0].of_class());
        EXPECT_EQ(fast[1].number, 49u);
        EXPECT_FALSE(fast[1].of_class());
        auto slow = item(db.variable_classes(), 1).variable_ids();
        ASSERT_EQ(slow.size(), 3u);
        EXPECT_EQ(slow[1].number, 0x8022u);
    });
}

} // namespace
