/* The source language, a second time: every stanza kind, attribute, property and permission letter, written by hand. */

#include "compiler/cdgen.h"
#include "compiler/cdgen_stanzas.h"
#include "compiler/given_interface.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <map>
#include <string>
#include <vector>

namespace {

constexpr int NO_FIELD = -1; /* the value goes elsewhere or nowhere */

/* An attribute; with 0x80000000 in its bit it is optional. */
struct attr_row {
    const char *name;
    int type;
    int field;
    vx_uint32_t bit;
    bool repeats;
};
using attr_rows = std::vector<attr_row>;

const attr_rows CONTROL = {{"FileVersion", 5, offsetof(rsrc_class_t, rc_version), 0x1, false}};

const attr_rows CMMAP = {
    {"ResourceManager", 7, offsetof(rsrc_cmmap_t, rcm_rm_ID), 0x1, false},
    {"FirstKey", 1, offsetof(rsrc_cmmap_t, rcm_first_key), 0x2, false},
    {"LastKey", 1, offsetof(rsrc_cmmap_t, rcm_last_key), 0x4, false},
    {"MessageCatalog", 3, offsetof(rsrc_cmmap_t, u_rcm_msg_file), 0x8, false},
    {"DescriptiveMessageSet", 1, offsetof(rsrc_cmmap_t, rcm_dscr_msg_set), 0x10, false},
};

const attr_rows VARIABLE_CLASS = {
    {"ObservationInterval", 1, offsetof(rsrc_variable_class_t, rvc_obsv_interval), 0x2, false},
    {"ReportingInterval", 1, offsetof(rsrc_variable_class_t, rvc_report_interval), 0x4, false},
    {"VariableClass", 3, offsetof(rsrc_variable_class_t, u_rvc_name), 0x1, false},
    {"Alias", 3, offsetof(rsrc_variable_class_t, u_rvc_compat_name), 0x80000001, false},
};

const attr_rows RSRC_CLASS = {
    {"Properties", 4, offsetof(rsrc_class_t, rc_props), 0x4, false},
    {"ClassPermTemplate", 6, offsetof(rsrc_class_t, rc_perm_tempC), 0x8, false},
    {"ResourcePermTemplate", 6, offsetof(rsrc_class_t, rc_perm_temp), 0x10, false},
    {"Locator", 8, offsetof(rsrc_class_t, rc_locator), 0x80000002, false},
    {"Description", 1, offsetof(rsrc_class_t, rc_dscr_msgid), 0x1, false},
    {"DisplayName", 1, offsetof(rsrc_class_t, rc_disp_msgid), 0x2, false},
    {"Name", 3, offsetof(rsrc_class_t, u_rc_name), 0x80000010, false},
};

const attr_rows PATTR = {
    {"Name", 3, offsetof(rsrc_pattr_t, u_ra_name), 0x1, false},
    {"Description", 1, offsetof(rsrc_pattr_t, ra_dscr_msgid), 0x2, false},
    {"DisplayName", 1, offsetof(rsrc_pattr_t, ra_disp_msgid), 0x4, false},
    {"Id", 9, offsetof(rsrc_pattr_t, ra_attr_id), 0x8, false},
    {"DataType", 17, offsetof(rsrc_pattr_t, ra_data_type), 0x10, false},
    {"VarietyRange", 10, offsetof(rsrc_pattr_t, u_ra_variety_list), 0x20, true},
    {"GroupID", 1, offsetof(rsrc_pattr_t, ra_group_id), 0x80000001, false},
    {"GroupName", 1, offsetof(rsrc_pattr_t, ra_group_msgid), 0x80000002, false},
    {"Properties", 11, offsetof(rsrc_pattr_t, ra_props), 0x80000004, false},
    {"ValidValue", 14, offsetof(rsrc_pattr_t, u_ra_valid_vals), 0x80000010, true},
    {"ValueDisplayName", 16, NO_FIELD, 0x80000020, true},
    {"DefaultValue", 15, offsetof(rsrc_pattr_t, ra_dflt_value), 0x80000008, true},
    {"ListActionRsrc", 30, NO_FIELD, 0x80000040, false},
    {"ListActionClass", 29, NO_FIELD, 0x80000080, false},
};

const attr_rows DATTR = {
    {"Name", 3, offsetof(rsrc_dattr_t, u_ra_name), 0x1, false},
    {"VariableClass", 3, offsetof(rsrc_dattr_t, u_ra_vclass), 0x80000100, false},
    {"Description", 1, offsetof(rsrc_dattr_t, ra_dscr_msgid), 0x2, false},
    {"DisplayName", 1, offsetof(rsrc_dattr_t, ra_disp_msgid), 0x4, false},
    {"Id", 9, offsetof(rsrc_dattr_t, ra_attr_id), 0x8, false},
    {"DataType", 17, offsetof(rsrc_dattr_t, ra_data_type), 0x10, false},
    {"VariableType", 18, offsetof(rsrc_dattr_t, ra_var_type), 0x40, false},
    {"VarietyRange", 10, offsetof(rsrc_dattr_t, u_ra_variety_list), 0x20, true},
    {"GroupID", 1, offsetof(rsrc_dattr_t, ra_group_id), 0x80000001, false},
    {"GroupName", 1, offsetof(rsrc_dattr_t, ra_group_msgid), 0x80000002, false},
    {"Properties", 12, offsetof(rsrc_dattr_t, ra_props), 0x80000004, false},
    {"InitialValue", 20, offsetof(rsrc_dattr_t, ra_init_value), 0x80000008, false},
    {"ValidStateValue", 14, offsetof(rsrc_dattr_t, u_ra_valid_vals), 0x80000010, true},
    {"ValueDisplayName", 16, NO_FIELD, 0x80000020, true},
    {"Expression", 3, offsetof(rsrc_dattr_t, u_ra_express), 0x80000400, false},
    {"ExpressionDescription", 1, offsetof(rsrc_dattr_t, ra_expr_desc), 0x80000800, false},
    {"ReArmExpression", 3, offsetof(rsrc_dattr_t, u_ra_rearm_expr), 0x80001000, false},
    {"ReArmDescription", 1, offsetof(rsrc_dattr_t, ra_rearm_desc), 0x80002000, false},
    {"Range", 19, NO_FIELD, 0x80000200, false},
    {"ListActionRsrc", 30, NO_FIELD, 0x80000040, false},
    {"ListActionClass", 29, NO_FIELD, 0x80000080, false},
};

const attr_rows ACTION = {
    {"Name", 3, offsetof(rsrc_action_t, u_ac_name), 0x1, false},
    {"Description", 1, offsetof(rsrc_action_t, ac_dscr_msgid), 0x2, false},
    {"DisplayName", 1, offsetof(rsrc_action_t, ac_disp_msgid), 0x4, false},
    {"Id", 9, offsetof(rsrc_action_t, ac_action_id), 0x8, false},
    {"VarietyRange", 10, offsetof(rsrc_action_t, u_ac_variety_list), 0x10, true},
    {"Properties", 13, offsetof(rsrc_action_t, ac_props), 0x80000001, false},
    {"Permission", 31, offsetof(rsrc_action_t, ac_perms), 0x80000004, false},
    {"ConfirmationMsg", 1, offsetof(rsrc_action_t, ac_confirm_msgid), 0x80000008, false},
    {"TimeOut", 1, offsetof(rsrc_action_t, ac_timeout), 0x80000002, false},
};

/* An element is staged after 8 bytes of header. */
const attr_rows ELEMENT = {
    {"ElementName", 22, 8 + offsetof(sd_field_t, u_sd_field_name), 0x1, false},
    {"Description", 23, 8 + offsetof(sd_field_t, sd_dscr_msgid), 0x2, false},
    {"DisplayName", 24, 8 + offsetof(sd_field_t, sd_disp_msgid), 0x4, false},
    {"ElementIndex", 21, NO_FIELD, 0x8, false},
    {"DataType", 25, 8 + offsetof(sd_field_t, sd_field_type), 0x10, false},
    {"ValidValue", 26, 8 + offsetof(sd_field_t, u_sd_valid_vals), 0x80000002, true},
    {"ValueDisplayName", 27, NO_FIELD, 0x80000004, true},
    {"DefaultValue", 28, NO_FIELD, 0x80000001, true},
};

enum record_tables { CLASS_TABLES, MAP_TABLES, VARIABLE_CLASS_TABLES };

struct kind_row {
    const char *name;
    char *(*record)(cdgen &);
    void (*init)(cdgen &);
    vx_uint32_t complete;
    const attr_rows *attrs;
    int data_type; /* where its field is; -1: none */
    record_tables tables;
    sd_type_t sd;
};

template <auto Member> char *in(cdgen &cx) {
    return reinterpret_cast<char *>(&(cx.staged.*Member));
}

constexpr auto CLASS = in<&staging_records::cb_rsrc_class>;
constexpr auto SD = in<&staging_records::cb_sd_def>;
constexpr int P_TYPE = 36, D_TYPE = 104, E_TYPE = 16;
constexpr sd_type_t NO_SD = SD_TYPE_UNKNOWN;

const std::vector<kind_row> KINDS = {
    {"ControlDefinition", CLASS, init_class_tbl, 0x1, &CONTROL, -1, CLASS_TABLES, NO_SD},
    {"ClassToManagerMapping", in<&staging_records::cb_rsrc_cmmap>, init_cmmap_tbl, 0x1f, &CMMAP, -1, MAP_TABLES, NO_SD},
    {"ResourceVariableClass", in<&staging_records::cb_rsrc_variable_class>, init_var_class_tbl, 0x7, &VARIABLE_CLASS,
     -1, VARIABLE_CLASS_TABLES, NO_SD},
    {"ResourceClass", CLASS, init_class_tbl_fake, 0x1f, &RSRC_CLASS, -1, CLASS_TABLES, NO_SD},
    {"PersistentResourceAttribute", in<&staging_records::cb_rsrc_pattr>, init_pattr_tbl, 0x3f, &PATTR, P_TYPE,
     CLASS_TABLES, NO_SD},
    {"PersistentClassAttribute", in<&staging_records::cb_rsrc_pattrC>, init_pattrC_tbl, 0x3f, &PATTR, P_TYPE,
     CLASS_TABLES, NO_SD},
    {"DynamicResourceAttribute", in<&staging_records::cb_rsrc_dattr>, init_dattr_tbl, 0x7f, &DATTR, D_TYPE,
     CLASS_TABLES, NO_SD},
    {"DynamicClassAttribute", in<&staging_records::cb_rsrc_dattrC>, init_dattrC_tbl, 0x7f, &DATTR, D_TYPE, CLASS_TABLES,
     NO_SD},
    {"ClassAction", in<&staging_records::cb_rsrc_actionC>, init_actionC_tbl, 0x1f, &ACTION, -1, CLASS_TABLES, NO_SD},
    {"ResourceAction", in<&staging_records::cb_rsrc_action>, init_action_tbl, 0x1f, &ACTION, -1, CLASS_TABLES, NO_SD},
    {"PAttrSDDefinition", SD, init_sd_tbl, 0x1f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_PATTR},
    {"DAttrSDDefinition", SD, init_sd_tbl, 0x1f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_DATTR},
    {"DefineSDDefinition", SD, init_sd_tbl, 0x1f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_DEFINE},
    {"UndefineSDDefinition", SD, init_sd_tbl, 0x1f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_UNDEFINE},
    {"OnlineSDDefinition", SD, init_sd_tbl, 0x1f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_ONLINE},
    {"OfflineSDDefinition", SD, init_sd_tbl, 0x1f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_OFFLINE},
    {"ResetSDDefinition", SD, init_sd_tbl, 0x1f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_RESET},
    {"ActionInSDDefinition", SD, init_sd_tbl, 0x1f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_ACT_IN},
    {"ActionOutSDDefinition", SD, init_sd_tbl, 0x7f, &ELEMENT, E_TYPE, CLASS_TABLES, SD_TYPE_ACT_RESP},
};

const srtable_ctrl &kind_at(size_t i) {
    return sc_tables[i];
}

TEST(Catalogue, KindsStandInTheirOrder) {
    ASSERT_EQ(sc_tables.size(), KINDS.size() + 1);
    cdgen cx;
    for (size_t i = 0; i < KINDS.size(); ++i) {
        SCOPED_TRACE(KINDS[i].name);
        EXPECT_STREQ(kind_at(i).sc_name, KINDS[i].name);
        EXPECT_EQ(sc_cb(cx, kind_at(i)), KINDS[i].record(cx));
        EXPECT_EQ(sc_init_tbl(kind_at(i)), KINDS[i].init);
        EXPECT_EQ(kind_at(i).req_mask_cmplt, KINDS[i].complete);
        EXPECT_EQ(kind_at(i).dt_offset, KINDS[i].data_type);
    }
    EXPECT_EQ(sc_tables.back().sc_name, nullptr);
}

TEST(Catalogue, AttributesStandInTheirOrder) {
    for (size_t i = 0; i < KINDS.size(); ++i) {
        SCOPED_TRACE(KINDS[i].name);
        const attr_rows &rows = *KINDS[i].attrs;
        ASSERT_EQ(kind_at(i).sc_attrs.size(), rows.size());
        for (size_t a = 0; a < rows.size(); ++a) {
            SCOPED_TRACE(rows[a].name);
            const table_attrs &attr = kind_at(i).sc_attrs[a];
            EXPECT_STREQ(attr.ta_name, rows[a].name);
            EXPECT_EQ(attr.ta_type, rows[a].type);
            EXPECT_EQ(attr.req_bit, rows[a].bit);
            EXPECT_EQ(attr.dup_allowed != 0, rows[a].repeats);
            if (rows[a].field != NO_FIELD) {
                EXPECT_EQ(attr.ta_offset, rows[a].field);
            }
        }
    }
}

TEST(Catalogue, NoKindHasABitTwice) {
    for (const kind_row &kind : KINDS) {
        std::map<vx_uint32_t, std::string> owners;
        for (const table_attrs &attr : sc_tables[static_cast<size_t>(set_table_id(kind.name))].sc_attrs)
            EXPECT_TRUE(owners.emplace(attr.req_bit, attr.ta_name).second) << kind.name << " " << attr.ta_name;
    }
}

/* ---- Staging tables of a kind ---------------------------------------------------------------------------------- */

struct tables_of_kind {
    tbl *strings, *varieties, *valid_values, *sd;
};

TEST(Catalogue, KindsReachTheirStagingTables) {
    cdgen cx;
    tbl names(8, ""), varieties(8, ""), values(8, ""), sds(8, ""), map(8, ""), variable_class(8, "");
    stage_tbl(cx.staged.cb_rsrc_class.u_rc_strings, &names);
    stage_tbl(cx.staged.cb_rsrc_class.u_rc_variety_lists, &varieties);
    stage_tbl(cx.staged.cb_rsrc_class.u_rc_valid_vals, &values);
    stage_tbl(cx.staged.cb_rsrc_class.u_rc_sd_defs, &sds);
    stage_tbl(cx.staged.cb_rsrc_cmmap.u_rcm_strings, &map);
    stage_tbl(cx.staged.cb_rsrc_variable_class.u_rvc_string_tbl, &variable_class);
    const tables_of_kind expected[] = {{&names, &varieties, &values, &sds},        /* CLASS_TABLES */
                                       {&map, nullptr, nullptr, nullptr},          /* MAP_TABLES */
                                       {&variable_class, nullptr, nullptr, &sds}}; /* VARIABLE_CLASS_TABLES */
    for (size_t i = 0; i < KINDS.size(); ++i) {
        SCOPED_TRACE(KINDS[i].name);
        const tables_of_kind &tables = expected[KINDS[i].tables];
        EXPECT_EQ(sc_str_tbl(cx, kind_at(i)), tables.strings);
        EXPECT_EQ(sc_vty_tbl(cx, kind_at(i)), tables.varieties);
        EXPECT_EQ(sc_vv_tbl(cx, kind_at(i)), tables.valid_values);
        EXPECT_EQ(sc_sd_tbl(cx, kind_at(i)), tables.sd);
    }
}

TEST(Catalogue, AttributeKindsKnowTheirValueFields) {
    struct expected_row {
        vx_uint16_t valid_value_lists::*found;
        attr_kind fields;
    };
    const std::map<std::string, expected_row> expected = {
        {"PersistentResourceAttribute", {&valid_value_lists::pattr_vv_found, {0, 24, 56, 64}}},
        {"PersistentClassAttribute", {&valid_value_lists::pattrC_vv_found, {0, 24, 56, 64}}},
        {"DynamicResourceAttribute", {&valid_value_lists::dattr_vv_found, {1, 32, 72, 124}}},
        {"DynamicClassAttribute", {&valid_value_lists::dattrC_vv_found, {1, 32, 72, 124}}}};
    cdgen cx;
    for (size_t i = 0; i < KINDS.size(); ++i) {
        SCOPED_TRACE(KINDS[i].name);
        auto row = expected.find(KINDS[i].name);
        ASSERT_EQ(kind_at(i).sc_attr != nullptr, row != expected.end());
        if (row == expected.end())
            continue;
        EXPECT_EQ(&vv_found(cx, kind_at(i)), &(cx.valid_values.*row->second.found));
        EXPECT_EQ(kind_at(i).sc_attr->sd_attr_type, row->second.fields.sd_attr_type);
        EXPECT_EQ(kind_at(i).sc_attr->value_offset, row->second.fields.value_offset);
        EXPECT_EQ(kind_at(i).sc_attr->sd_offset, row->second.fields.sd_offset);
        EXPECT_EQ(kind_at(i).sc_attr->max_sd_idx_offset, row->second.fields.max_sd_idx_offset);
    }
}

/* ---- Kinds of structured data ---------------------------------------------------------------------------------- */

TEST(Catalogue, StructuredDataKindsAreToldByName) {
    for (int i = 0; i < SC_COUNT; ++i) {
        const kind_row &kind = KINDS[static_cast<size_t>(i)];
        bool of_attribute = kind.sd == SD_TYPE_PATTR || kind.sd == SD_TYPE_DATTR;
        EXPECT_EQ(SD_stanza_type(i), kind.sd) << kind.name;
        EXPECT_EQ(is_SD_stanza(i) != nullptr, kind.sd != NO_SD) << kind.name;
        EXPECT_EQ(is_attr_SD(i) != nullptr, of_attribute) << kind.name;
    }
}

TEST(Catalogue, StructuredDataTypesHaveTheirNumbers) {
    const std::pair<const char *, int> rows[] = {
        {"OnlineSDDefinition", 0},    {"OfflineSDDefinition", 1},   {"DefineSDDefinition", 2},
        {"UndefineSDDefinition", 3},  {"ResetSDDefinition", 4},     {"ActionInSDDefinition", 5},
        {"ActionOutSDDefinition", 6}, {"PAttrSDDefinition", 7},     {"DAttrSDDefinition", 8},
        {"ResourceClass", 9},         {"DynamicClassAttribute", 9},
    };
    for (auto [name, number] : rows)
        EXPECT_EQ(SD_stanza_type(set_table_id(name)), number) << name;
}

TEST(Catalogue, RunsKnowTheirOwnersField) {
    using class_field = cdb_ref_t rsrc_class_t::*;
    using action_field = cdb_ref_t rsrc_action_t::*;
    const std::map<std::string, std::pair<class_field, action_field>> expected = {
        {"PAttrSDDefinition", {nullptr, nullptr}},
        {"DAttrSDDefinition", {nullptr, nullptr}},
        {"DefineSDDefinition", {&rsrc_class_t::u_rc_def_input, nullptr}},
        {"UndefineSDDefinition", {&rsrc_class_t::u_rc_undef_input, nullptr}},
        {"OnlineSDDefinition", {&rsrc_class_t::u_rc_online_input, nullptr}},
        {"OfflineSDDefinition", {&rsrc_class_t::u_rc_offline_input, nullptr}},
        {"ResetSDDefinition", {&rsrc_class_t::u_rc_reset_input, nullptr}},
        {"ActionInSDDefinition", {nullptr, &rsrc_action_t::u_ac_sd_input}},
        {"ActionOutSDDefinition", {nullptr, &rsrc_action_t::u_ac_sd_resp}}};
    for (size_t i = 0; i < KINDS.size(); ++i) {
        SCOPED_TRACE(KINDS[i].name);
        auto row = expected.find(KINDS[i].name);
        ASSERT_EQ(kind_at(i).sc_sd_owner != nullptr, row != expected.end());
        if (row == expected.end())
            continue;
        EXPECT_EQ(kind_at(i).sc_sd_owner->of_class, row->second.first);
        EXPECT_EQ(kind_at(i).sc_sd_owner->of_action, row->second.second);
    }
}

/* ---- Looking up ------------------------------------------------------------------------------------------------ */

/* All that differ from a name by one character or in length by one, and some more. */
std::vector<std::string> near_misses(const std::string &name) {
    std::vector<std::string> others = {"",
                                       name + name,
                                       name + " ",
                                       " " + name,
                                       name + "s",
                                       name + "\r",
                                       "\t" + name,
                                       name.substr(1),
                                       name + "=",
                                       name + "\x01\x7f",
                                       name.substr(0, name.size() - 1)};
    for (size_t i = 0; i < name.size(); ++i) {
        std::string other = name;
        auto c = static_cast<unsigned char>(other[i]);
        other[i] = static_cast<char>(std::islower(c) ? std::toupper(c) : std::tolower(c));
        others.push_back(other);
        other[i] = static_cast<char>(c ^ 0x80);
        others.push_back(other);
        other[i] = '.';
        others.push_back(other);
    }
    return others;
}

TEST(Catalogue, KindsAreFoundByTheirExactNameOnly) {
    for (size_t i = 0; i < KINDS.size(); ++i) {
        EXPECT_EQ(set_table_id(KINDS[i].name), static_cast<int>(i)) << KINDS[i].name;
        for (const std::string &other : near_misses(KINDS[i].name))
            if (other != KINDS[i].name) {
                EXPECT_EQ(set_table_id(other.c_str()), -1) << other;
            }
    }
}

TEST(Catalogue, AttributesAreFoundByTheirExactNameOnly) {
    for (size_t i = 0; i < KINDS.size(); ++i) {
        for (const attr_row &row : *KINDS[i].attrs) {
            const table_attrs *attr = find_attr(kind_at(i), row.name);
            ASSERT_NE(attr, nullptr) << row.name;
            EXPECT_STREQ(attr->ta_name, row.name);
            for (const std::string &other : near_misses(row.name))
                if (other != row.name) {
                    EXPECT_EQ(find_attr(kind_at(i), other), nullptr) << other;
                }
        }
    }
}

TEST(Catalogue, NameEndsWhereItsViewEnds) {
    EXPECT_NE(find_attr(sc_tables[SC_RESOURCE_CLASS], std::string_view("Named", 4)), nullptr);
    EXPECT_EQ(find_attr(sc_tables[SC_RESOURCE_CLASS], std::string_view("Name", 3)), nullptr);
    EXPECT_EQ(find_attr(sc_tables[SC_RESOURCE_CLASS], std::string_view("Name\0", 5)), nullptr);
}

/* Every kind is asked for every attribute of every other. */
TEST(Catalogue, AttributesOfOtherKindsAreUnknown) {
    for (size_t i = 0; i < KINDS.size(); ++i)
        for (const kind_row &other : KINDS)
            for (const attr_row &row : *other.attrs) {
                bool own = std::any_of(KINDS[i].attrs->begin(), KINDS[i].attrs->end(),
                                       [&](const attr_row &mine) { return std::string(mine.name) == row.name; });
                EXPECT_EQ(find_attr(kind_at(i), row.name) != nullptr, own) << KINDS[i].name << " " << row.name;
            }
}

TEST(Catalogue, SomeAttributesAreDeliberatelyNotThere) {
    EXPECT_EQ(find_attr(sc_tables[SC_RESOURCE_CLASS], "Id"), nullptr);
    EXPECT_EQ(find_attr(sc_tables[SC_CLASS_ACTION], "DataType"), nullptr);
    EXPECT_EQ(find_attr(sc_tables[SC_DYNAMIC_CLASS_ATTRIBUTE], "ValidValue"), nullptr);
    EXPECT_EQ(find_attr(sc_tables[SC_PERSISTENT_CLASS_ATTRIBUTE], "ValidStateValue"), nullptr);
    EXPECT_EQ(find_attr(sc_tables[SC_RESOURCE_ACTION], "ValueDisplayName"), nullptr);
}

/* ---- Properties and permissions -------------------------------------------------------------------------------- */

using bits = std::vector<std::pair<std::string, vx_uint32_t>>;

bits bits_of(const props_t *props, int count) {
    bits found;
    for (const props_t *prop = props; prop < props + count; ++prop)
        found.emplace_back(prop->s, prop->p);
    return found;
}

TEST(Catalogue, ClassProperties) {
    const bits expected = {{"MtypDivided", 0x2000},     {"MtypCentral", 0x4000},
                           {"MtypGlobal", 0x8000},      {"ORBElectCoord", 0x100},
                           {"HasResources", 0x2},       {"HasConstraints", 0x80},
                           {"CanControl", 0x4},         {"CanDefine", 0x8},
                           {"JoinPhase0", 0x10},        {"JoinPhase1", 0x20},
                           {"SupportsMove", 0x200},     {"CanBatchDefine", 0x400},
                           {"CanBatchUndefine", 0x800}, {"CanBatchSetAttr", 0x1000},
                           {"HasIWAccess", 0x1},        {"QryReqsMonitoring", 0x20000},
                           {"CanLiveUpdate", 0x40000}};
    EXPECT_EQ(rc_props_cnt, 17);
    EXPECT_EQ(bits_of(rc_props, rc_props_cnt), expected);
}

TEST(Catalogue, PersistentAttributeProperties) {
    const bits expected = {{"Public", 0x20},      {"Select", 0x10},        {"ReqdForDefine", 0x2},
                           {"OptForDefine", 0x8}, {"InvalForDefine", 0x4}, {"ReadOnly", 0x1}};
    EXPECT_EQ(pa_props_cnt, 6);
    EXPECT_EQ(bits_of(pa_props, pa_props_cnt), expected);
}

TEST(Catalogue, DynamicAttributeProperties) {
    const bits expected = {{"Public", 0x20}, {"QryReqsMonitoring", 0x40}};
    EXPECT_EQ(da_props_cnt, 2);
    EXPECT_EQ(bits_of(da_props, da_props_cnt), expected);
}

TEST(Catalogue, ActionProperties) {
    const bits expected = {{"Public", 0x2}, {"LongRun", 0x1}};
    EXPECT_EQ(act_props_cnt, 2);
    EXPECT_EQ(bits_of(act_props, act_props_cnt), expected);
}

TEST(Catalogue, PermissionLetters) {
    const bits expected = {{"q", 0x1},  {"l", 0x2},  {"e", 0x4},  {"v", 0x8},   {"d", 0x10},
                           {"c", 0x20}, {"s", 0x40}, {"o", 0x80}, {"a", 0x100}, {"x", 0x200}};
    bits found;
    ASSERT_EQ(num_perm_list, 10);
    for (const valid_perms_t *perm = perm_list; perm < perm_list + num_perm_list; ++perm)
        found.emplace_back(std::string(1, perm->permission), perm->mask);
    EXPECT_EQ(found, expected);
}

} // namespace
