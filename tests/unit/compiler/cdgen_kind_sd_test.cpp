/* Structured data: elements and their sections, the owners of runs, and values made of defaults. */

#include "compiler/source_fixture.h"

#include <tuple>

namespace {

using namespace from_source;

constexpr stanza_id RESET = SC_RESET_SD_DEFINITION;
const std::string P = "PersistentResourceAttribute";
const ending INCOMPLETE = {"Previous stanza incomplete", LINE, 1};
const ending NO_CLASS = {"No class for SD Definition", LINE, 1};

/* ---- Lines of an element --------------------------------------------------------------------------------------- */

TEST(Element, NameIsAString) {
    opened c;
    add_to_tbl(c.cx, c.table(&rsrc_class_t::u_rc_strings), "before", 7);
    c.cx.staged.cb_sd_def.sd_fields[0].u_sd_field_name = {{1, 2}};
    EXPECT_EQ(fed(c, RESET, "ElementName=the name"), WELL);
    EXPECT_EQ(c.cx.staged.cb_sd_def.sd_fields[0].u_sd_field_name.offset[0], 8U);
    EXPECT_EQ(c.cx.staged.cb_sd_def.sd_fields[0].u_sd_field_name.offset[1], 0U);
    EXPECT_EQ(c.string_at(8), "the name");
}

TEST(Element, RemembersWhatItWasGiven) {
    const std::pair<const char *, int sd_element_state::*> rows[] = {
        {"ElementName=x", &sd_element_state::sd_name_found},
        {"Description=1", &sd_element_state::sd_desc_found},
        {"DisplayName=1", &sd_element_state::sd_disp_found},
        {"DataType=Int32", &sd_element_state::sd_dt_found}};
    for (const auto &row : rows) {
        opened c;
        EXPECT_EQ(fed(c, RESET, row.first), WELL);
        for (const auto &[line, found] : rows)
            EXPECT_EQ(c.cx.sd.element.*found, found == row.second ? 1 : 0) << line;
    }
}

TEST(Element, IndexesFollowOneAnother) {
    opened c;
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(fed(c, RESET, "ElementIndex=" + std::to_string(i)), WELL);
        EXPECT_EQ(c.cx.sd.index(), i);
        EXPECT_EQ(c.cx.sd.expected_index(), i + 1);
    }
    EXPECT_EQ(fed(c, RESET, "ElementIndex=4294967299"), WELL); /* the low 32 bits */
    EXPECT_EQ(c.cx.sd.index(), 3);
}

TEST(Element, IndexOutOfOrderIsShownAndRefused) {
    const struct {
        std::vector<const char *> accepted;
        const char *refused;
        const char *shown;
    } rows[] = {
        {{"0", "1"}, "3", "curr_sdel = 3, expected_sdeli = 2\n"},
        {{"0"}, "2", "curr_sdel = 2, expected_sdeli = 1\n"},
        {{"0", "1"}, "1", "curr_sdel = 1, expected_sdeli = 2\n"},
        {{}, "1", "curr_sdel = 1, expected_sdeli = 0\n"},
        {{}, "-1", "curr_sdel = -1, expected_sdeli = 0\n"},
        {{}, "0x0", "curr_sdel = -1, expected_sdeli = 0\n"}, /* no decimal number: the latest index stays */
        {{"0"}, "one", "curr_sdel = 0, expected_sdeli = 1\n"},
    };
    for (const auto &row : rows) {
        opened c;
        for (std::string index : row.accepted)
            EXPECT_EQ(fed(c, RESET, "ElementIndex=" + index), WELL);
        ending end;
        EXPECT_EQ(output_of([&] { end = fed(c, RESET, std::string("ElementIndex=") + row.refused); }), row.shown);
        EXPECT_EQ(end, (ending{"ElementIndeces must be consecutive", LINE, 1})) << row.refused;
    }
}

TEST(Element, CannotBeStructuredItself) {
    for (const char *type : {"SD", "SDArray"}) {
        opened c;
        EXPECT_EQ(fed(c, RESET, std::string("DataType=") + type),
                  (ending{"SD elements cannot be of SD type", LINE, 1}));
    }
}

TEST(Element, UnknownTypeIsTakenAsTypeZero) {
    opened c;
    c.cx.staged.cb_sd_def.sd_fields[0].sd_field_type = VX_INT32;
    EXPECT_EQ(fed(c, RESET, "DataType=Nonsense"), WELL);
    EXPECT_EQ(c.cx.staged.cb_sd_def.sd_fields[0].sd_field_type, VX_UNKNOWN);
    EXPECT_EQ(c.cx.sd.element.sd_dt_found, 1);
}

TEST(Element, DefaultValueIsRefused) {
    opened c;
    EXPECT_EQ(fed(c, RESET, "DefaultValue=1"), (ending{"Sorry, default SD values are not yet supported", LINE, 1}));
}

TEST(Element, ValidValuesAreAListOfItsType) {
    opened c;
    mk_vv_sec(c.cx); /* another list before it */
    c.cx.staged.cb_sd_def.sd_fields[0].u_sd_valid_vals = {{1, 2}};
    EXPECT_EQ(fed(c, RESET, "DataType=Int64Array"), WELL);
    EXPECT_EQ(fed(c, RESET, "ValueDisplayName=5"), (ending{"No ValidValue to attach ValueDisplayName to.", LINE, 1}));
    for (const char *line : {"ValidValue=7", "ValueDisplayName=5", "ValidValue=8,9", "ValueDisplayName=6"})
        EXPECT_EQ(fed(c, RESET, line), WELL);
    EXPECT_EQ(fed(c, RESET, "ValidValue=x"), INVALID);
    const cdb_ref_t &list = c.cx.staged.cb_sd_def.sd_fields[0].u_sd_valid_vals;
    EXPECT_EQ(list.offset[0], 32U);
    EXPECT_EQ(list.offset[1], 0U);
    EXPECT_EQ(c.cx.sd.element.sd_vv_found, 1);
    std::vector<vv_entry_t> values = c.valid_values_at(list);
    ASSERT_EQ(values.size(), 2U);
    EXPECT_EQ(values[0].vv_low_val.val_int64, 7);
    EXPECT_EQ(values[0].vv_high_val.val_int64, 7);
    EXPECT_EQ(values[0].vv_disp_msgid, 5U);
    EXPECT_EQ(values[1].vv_low_val.val_int64, 8);
    EXPECT_EQ(values[1].vv_high_val.val_int64, 9);
    EXPECT_EQ(values[1].vv_disp_msgid, 6U);
}

TEST(Element, TypeIsCollectedForAnAttributesValueOnly) {
    compilation of_class, of_attribute;
    of_class.read(CLASS + element("ResetSDDefinition", 0, "Int32"));
    EXPECT_EQ(of_class.cx.sd.elements(), 0U);
    EXPECT_EQ(of_class.cx.framing.stanzas[RESET].dflt.tbl, nullptr);
    of_attribute.read(CLASS + pattr(P, "SD") + element("PAttrSDDefinition", 0, "Int32") +
                      element("PAttrSDDefinition", 1, "StringArray"));
    EXPECT_EQ(of_attribute.cx.sd.elements(), 2U);
    const dflt_tbl &types = of_attribute.cx.framing.stanzas[SC_PATTR_SD_DEFINITION].dflt;
    EXPECT_EQ(types.num_elems, 2U);
    auto cells = records_of<vx_value_t>(&types.tbl->cells);
    ASSERT_EQ(cells.size(), 2U);
    EXPECT_EQ(cells[0].val_uint64, cell32(2));
    EXPECT_EQ(cells[1].val_uint64, cell32(19));
}

/* ---- Filing elements ------------------------------------------------------------------------------------------- */

TEST(Element, OpensAsEmptyRecord) {
    compilation c;
    init_class_tbl(c.cx);
    c.cx.staged.cb_sd_def.sd_fields[0].sd_dscr_msgid = 3;
    c.cx.valid_values.vvdisp = 0;
    c.cx.sd.element.sd_vv_found = 1;
    init_sd_tbl(c.cx);
    std::string staged(reinterpret_cast<const char *>(&c.cx.staged.cb_sd_def), sizeof(sd_def_t));
    EXPECT_EQ(staged, number(0x43444266, 4) + std::string(36, '\0'));
    EXPECT_FALSE(c.cx.valid_values.vvdisp.has_value());
    EXPECT_EQ(c.cx.sd.element.sd_vv_found, 0);
    EXPECT_EQ(c.table(&rsrc_class_t::u_rc_sd_defs)->used(), 0U); /* nothing was open */
}

TEST(Element, NeedsAClass) {
    opened c;
    c.cx.staged.cb_rsrc_class.rc_cb_ID = 0;
    EXPECT_EQ(ending_of([&] { init_sd_tbl(c.cx); }), NO_CLASS);
    EXPECT_EQ(ending_of([&] { cmplt_sd_tbl(c.cx, &sc_tables[RESET]); }), NO_CLASS);
    EXPECT_EQ(compilation().reading("#\nOnlineSDDefinition\n"), (ending{"No class for SD Definition", 2, 1}));
}

/* An element that was given all it needs, of a run of the class. */
void give_all(opened &c) {
    c.cx.sd.element.sd_name_found = c.cx.sd.element.sd_desc_found = c.cx.sd.element.sd_disp_found =
        c.cx.sd.element.sd_dt_found = 1;
    c.cx.sd.begin_for(c.cx.staged.cb_rsrc_class.u_rc_reset_input, mk_sd_sec(c.cx));
}

TEST(Element, NeedsNameTypeAndBothMessages) {
    for (auto found : {&sd_element_state::sd_name_found, &sd_element_state::sd_desc_found,
                       &sd_element_state::sd_disp_found, &sd_element_state::sd_dt_found}) {
        opened c;
        give_all(c);
        c.cx.sd.element.*found = 0;
        EXPECT_EQ(ending_of([&] { init_sd_tbl(c.cx); }), INCOMPLETE);
        EXPECT_EQ(ending_of([&] { cmplt_sd_tbl(c.cx, &sc_tables[RESET]); }), INCOMPLETE);
        c.cx.sd.element.*found = 1;
        EXPECT_EQ(ending_of([&] { init_sd_tbl(c.cx); }), WELL);
        EXPECT_EQ(c.cx.sd.element.sd_name_found + c.cx.sd.element.sd_desc_found + c.cx.sd.element.sd_disp_found +
                      c.cx.sd.element.sd_dt_found,
                  0);
    }
}

TEST(Element, NeedsTheClassesTable) {
    opened c;
    give_all(c);
    c.cx.staged.cb_rsrc_class.u_rc_sd_defs = {};
    EXPECT_EQ(ending_of([&] { init_sd_tbl(c.cx); }), (ending{"No Class SD table for SD Definition", LINE, 1}));
}

TEST(Element, NeedsNoIndex) {
    compilation c;
    c.read(CLASS + stanza("ResetSDDefinition", {"ElementName=x", "Description=1", "DisplayName=2", "DataType=Int32"}) +
           "ResourceClass\n");
    EXPECT_EQ(c.elements_at(c.cx.staged.cb_rsrc_class.u_rc_reset_input).size(), 1U);
}

TEST(Element, IsFiledWithWhatItWasGiven) {
    compilation c;
    c.read(CLASS + element("ResetSDDefinition", 0, "Float32", {"ValidValue=1"}) +
           stanza("ResetSDDefinition", {"ElementName=Second", "Description=51", "DisplayName=52", "ElementIndex=1",
                                        "DataType=StringArray"}) +
           "ResourceClass\n");
    std::vector<sd_field_t> elements = c.elements_at(c.cx.staged.cb_rsrc_class.u_rc_reset_input);
    ASSERT_EQ(elements.size(), 2U);
    EXPECT_EQ(c.string_at(elements[0].u_sd_field_name.offset[0]), "E");
    EXPECT_EQ(elements[0].sd_field_type, VX_FLOAT32);
    EXPECT_EQ(elements[0].sd_dscr_msgid, 41U);
    EXPECT_EQ(elements[0].sd_disp_msgid, 42U);
    EXPECT_EQ(c.valid_values_at(elements[0].u_sd_valid_vals).size(), 1U);
    EXPECT_EQ(c.string_at(elements[1].u_sd_field_name.offset[0]), "Second");
    EXPECT_EQ(elements[1].sd_field_type, VX_CHAR_PTR_ARRAY);
    EXPECT_EQ(elements[1].sd_dscr_msgid, 51U);
    EXPECT_EQ(elements[1].sd_disp_msgid, 52U);
    EXPECT_TRUE(is_absent(elements[1].u_sd_valid_vals));
    for (const sd_field_t &field : elements) {
        EXPECT_EQ(field.sd_action_id, 65535U);
        EXPECT_EQ(field.sd_valid_type, 1U);
        EXPECT_EQ(field.sd_reserved, 0U);
    }
}

/* Each one when the next header comes, the last one at the end of the run. */
TEST(Element, IsFiledByWhatFollows) {
    compilation c;
    c.read(CLASS + element("ResetSDDefinition", 0, "Int32"));
    EXPECT_EQ(c.elements_at(c.cx.staged.cb_rsrc_class.u_rc_reset_input).size(), 0U);
    c.read(element("ResetSDDefinition", 1, "Int32"));
    EXPECT_EQ(c.elements_at(c.cx.staged.cb_rsrc_class.u_rc_reset_input).size(), 1U);
    EXPECT_EQ(c.cx.sd.index(), 1);
    EXPECT_EQ(c.cx.sd.expected_index(), 2);
    cmplt_sd_tbl(c.cx, c.cx.framing.curr_sd_scp);
    EXPECT_EQ(c.elements_at(c.cx.staged.cb_rsrc_class.u_rc_reset_input).size(), 2U);
    EXPECT_EQ(c.cx.staged.cb_sd_def.sd_cb_ID, 0U);
    EXPECT_EQ(c.cx.sd.index(), -1);
    EXPECT_EQ(c.cx.sd.expected_index(), 0);
}

/* The table grows several times meanwhile. */
TEST(Element, StandsBehindTheOnesBefore) {
    compilation c;
    std::string text = CLASS;
    for (int i = 0; i < 100; ++i)
        text += stanza("OnlineSDDefinition", {"ElementName=N", "Description=" + std::to_string(i), "DisplayName=1",
                                              "ElementIndex=" + std::to_string(i), "DataType=Int32"});
    c.read(text + "ResourceClass\n");
    std::vector<sd_field_t> elements = c.elements_at(c.cx.staged.cb_rsrc_class.u_rc_online_input);
    ASSERT_EQ(elements.size(), 100U);
    for (size_t i = 0; i < 100; ++i)
        EXPECT_EQ(elements[i].sd_dscr_msgid, i);
    EXPECT_EQ(c.table(&rsrc_class_t::u_rc_sd_defs)->used(), 8 + 100 * sizeof(sd_field_t));
}

/* ---- Owners ---------------------------------------------------------------------------------------------------- */

const std::pair<const char *, cdb_ref_t rsrc_class_t::*> CLASS_OWNERS[] = {
    {"OnlineSDDefinition", &rsrc_class_t::u_rc_online_input},
    {"OfflineSDDefinition", &rsrc_class_t::u_rc_offline_input},
    {"DefineSDDefinition", &rsrc_class_t::u_rc_def_input},
    {"UndefineSDDefinition", &rsrc_class_t::u_rc_undef_input},
    {"ResetSDDefinition", &rsrc_class_t::u_rc_reset_input},
};

/* Runs of different kinds one after another, each counted from 0. */
TEST(Run, OfTheClassBelongsToItsField) {
    compilation c;
    std::string text = CLASS;
    for (auto [kind, field] : CLASS_OWNERS)
        text += element(kind, 0, "Int32") + element(kind, 1, "Int32") + element(kind, 2, "Int32");
    c.read(text + "ResourceClass\n");
    vx_uint32_t section = 0;
    for (auto [kind, field] : CLASS_OWNERS) {
        EXPECT_EQ((c.cx.staged.cb_rsrc_class.*field).offset[0], section) << kind;
        EXPECT_EQ((c.cx.staged.cb_rsrc_class.*field).offset[1], 0U) << kind;
        EXPECT_EQ(c.elements_at(c.cx.staged.cb_rsrc_class.*field).size(), 3U) << kind;
        section += 8 + 3 * 32;
    }
}

TEST(Run, OfAnActionBelongsToIt) {
    compilation c;
    c.read(CLASS + action("ClassAction") + element("ActionOutSDDefinition", 0, "Int32") +
           element("ActionInSDDefinition", 0, "Int32") + action("ResourceAction") +
           element("ActionInSDDefinition", 0, "Int32") + element("ActionInSDDefinition", 1, "Int32") +
           element("ActionOutSDDefinition", 0, "Int32") + action("ClassAction") + "ResourceClass\n");
    auto of_class = c.filed<rsrc_action_t>(&rsrc_class_t::u_rc_actionsC);
    auto of_resource = c.filed<rsrc_action_t>(&rsrc_class_t::u_rc_actions);
    ASSERT_EQ(of_class.size(), 2U);
    ASSERT_EQ(of_resource.size(), 1U);
    EXPECT_EQ(of_class[0].u_ac_sd_resp.offset[0], 0U);
    EXPECT_EQ(of_class[0].u_ac_sd_input.offset[0], 40U);
    EXPECT_EQ(of_resource[0].u_ac_sd_input.offset[0], 80U);
    EXPECT_EQ(of_resource[0].u_ac_sd_resp.offset[0], 152U);
    EXPECT_EQ(c.elements_at(of_resource[0].u_ac_sd_input).size(), 2U);
    EXPECT_TRUE(is_absent(of_class[1].u_ac_sd_input));
    EXPECT_TRUE(is_absent(of_class[1].u_ac_sd_resp));
}

TEST(Run, OfAnActionGoesToAnOpenClassActionFirst) {
    compilation c;
    init_class_tbl(c.cx);
    init_action_tbl(c.cx);
    init_actionC_tbl(c.cx);
    c.read(element("ActionInSDDefinition", 0, "Int32") + element("ActionOutSDDefinition", 0, "Int32"));
    EXPECT_EQ(c.cx.staged.cb_rsrc_actionC.u_ac_sd_input.offset[0], 0U);
    EXPECT_EQ(c.cx.staged.cb_rsrc_actionC.u_ac_sd_resp.offset[0], 40U);
    EXPECT_TRUE(is_absent(c.cx.staged.cb_rsrc_action.u_ac_sd_input));
    EXPECT_TRUE(is_absent(c.cx.staged.cb_rsrc_action.u_ac_sd_resp));
}

TEST(Run, OfNoActionBelongsToNothing) {
    compilation c;
    c.read(CLASS + element("ActionInSDDefinition", 0, "Int32") + action("ResourceAction") + "ResourceClass\n");
    EXPECT_TRUE(is_absent(c.filed<rsrc_action_t>(&rsrc_class_t::u_rc_actions)[0].u_ac_sd_input));
    EXPECT_EQ(c.table(&rsrc_class_t::u_rc_sd_defs)->used(), 40U);
}

TEST(Run, OfTheClassLeavesTheAttributeBeforeItAlone) {
    for (const std::string &between : {std::string(), element("PAttrSDDefinition", 0, "Int32")}) {
        compilation c;
        c.read(CLASS + pattr(P, "SD"));
        c.read(between);
        c.read(element("OnlineSDDefinition", 0, "Int32") + stanza("ResourceClass"));
        EXPECT_EQ(c.elements_at(c.cx.staged.cb_rsrc_class.u_rc_online_input).size(), 1U);
        EXPECT_EQ(is_absent(c.cx.staged.cb_rsrc_pattr.u_ra_sd), between.empty());
        EXPECT_EQ(c.cx.staged.cb_rsrc_pattr.ra_max_sd_idx, between.empty() ? 0xFFFFU : 0U);
    }
}

TEST(Run, SecondOneOfAKindTakesTheOwner) {
    compilation c;
    c.read(CLASS + element("ResetSDDefinition", 0, "Int32") + "ResourceClass\n" +
           element("ResetSDDefinition", 0, "Int32") + element("ResetSDDefinition", 1, "Int32") + "ResourceClass\n");
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.u_rc_reset_input.offset[0], 40U);
    EXPECT_EQ(c.elements_at(c.cx.staged.cb_rsrc_class.u_rc_reset_input).size(), 2U);
}

/* ---- Values of attributes -------------------------------------------------------------------------------------- */

TEST(Run, OfAnAttributeMakesItsValue) {
    for (std::string kind : {"PersistentResourceAttribute", "PersistentClassAttribute"}) {
        compilation c;
        c.read(CLASS + pattr(kind, "SD") + element("PAttrSDDefinition", 0, "Int32") +
               element("PAttrSDDefinition", 1, "String"));
        c.read(stanza(kind));
        auto field = kind == P ? &rsrc_class_t::u_rc_pattrs : &rsrc_class_t::u_rc_pattrsC;
        const rsrc_pattr_t &attr = c.filed<rsrc_pattr_t>(field)[0];
        EXPECT_EQ(attr.ra_max_sd_idx, 1U);
        EXPECT_EQ(attr.u_ra_sd.offset[0], 0U);
        EXPECT_EQ(c.elements_at(attr.u_ra_sd).size(), 2U);
        EXPECT_EQ(attr.ra_dflt_value.val_uint64, cell32(24)); /* after its name and those of the elements */
        EXPECT_EQ(c.string_table_at<vx_uint32_t>(24), 2U);
        auto first = c.string_table_at<vx_structured_data_element_t>(32);
        auto second = c.string_table_at<vx_structured_data_element_t>(48);
        EXPECT_EQ(first.data_type, VX_INT32);
        EXPECT_EQ(first.value.val_uint64, 0U);
        EXPECT_EQ(second.data_type, VX_CHAR_PTR);
        EXPECT_EQ(second.value.val_uint64, cell32(64));
        EXPECT_EQ(c.string_at(64), "");
    }
}

TEST(Run, OfADynamicAttributeMakesItsInitialValue) {
    for (std::string kind : {"DynamicResourceAttribute", "DynamicClassAttribute"}) {
        compilation c;
        c.read(CLASS + dattr(kind, "SDArray") + element("DAttrSDDefinition", 0, "Float64"));
        c.read(stanza(kind));
        bool of_class = kind == "DynamicClassAttribute";
        const rsrc_dattr_t &attr =
            c.filed<rsrc_dattr_t>(of_class ? &rsrc_class_t::u_rc_dattrsC : &rsrc_class_t::u_rc_dattrs)[0];
        EXPECT_EQ(attr.ra_max_sd_idx, 0U);
        EXPECT_EQ(c.elements_at(attr.u_ra_sd).size(), 1U);
        EXPECT_EQ(attr.ra_init_value.val_uint64, cell32(16));
        auto array = c.string_table_at<vx_array_t>(16);
        EXPECT_EQ(array.element_count, 1U);
        EXPECT_EQ(array.elements[0].val_uint64, cell32(32));
        auto data = c.string_table_at<vx_structured_data_t>(32);
        EXPECT_EQ(data.element_count, 1U);
        EXPECT_EQ(data.elements[0].data_type, VX_FLOAT64);
    }
}

/* The compiler does not check which of the two kinds of run follows an attribute. */
TEST(Run, MayBeOfTheOtherAttributeKind) {
    compilation c;
    c.read(CLASS + dattr("DynamicResourceAttribute", "SD") + element("PAttrSDDefinition", 0, "Int32") +
           "ResourceClass\n");
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattr.ra_max_sd_idx, 0U);
    EXPECT_EQ(c.elements_at(c.cx.staged.cb_rsrc_dattr.u_ra_sd).size(), 1U);
    EXPECT_EQ(c.string_table_at<vx_uint32_t>(c.cx.staged.cb_rsrc_dattr.ra_init_value.val_uint32), 1U);
}

/* Types are collected since the attribute's line; a run's value takes as many of them as the run has elements. */
TEST(Run, SecondOneOfAnAttributeTakesTheAttribute) {
    compilation c;
    c.read(CLASS + pattr(P, "SD") + element("PAttrSDDefinition", 0, "Int32") +
           element("PAttrSDDefinition", 1, "UInt32") + element("DAttrSDDefinition", 0, "Float32") + "ResourceClass\n");
    const rsrc_pattr_t &attr = c.cx.staged.cb_rsrc_pattr;
    EXPECT_EQ(attr.u_ra_sd.offset[0], 72U);
    EXPECT_EQ(c.elements_at(attr.u_ra_sd).size(), 1U);
    EXPECT_EQ(attr.ra_max_sd_idx, 0U);
    auto value = c.string_table_at<vx_structured_data_t>(attr.ra_dflt_value.val_uint32);
    EXPECT_EQ(value.element_count, 1U);
    EXPECT_EQ(value.elements[0].data_type, VX_INT32);
}

/* Deliberate: at the end of the source attributes are completed before the run that may be theirs. */
TEST(Run, AtTheEndOfTheSourceComesAfterItsAttribute) {
    compilation c;
    c.stage_all(CLASS + MAP + pattr(P, "SD") + element("PAttrSDDefinition", 0, "Int32"));
    const rsrc_class_t &filed = records_of<rsrc_class_t>(&c.cx.sections.rsrc_class_tbl)[0];
    const rsrc_pattr_t &attr = records_of<rsrc_pattr_t>(staged_content(filed.u_rc_pattrs))[0];
    EXPECT_EQ(attr.u_ra_sd.offset[0], 0U);
    EXPECT_EQ(attr.ra_max_sd_idx, 0xFFFFU);
    EXPECT_EQ(attr.ra_dflt_value.val_uint64, 0U);
    EXPECT_EQ(c.elements_at(attr.u_ra_sd).size(), 1U);
}

TEST(Run, OfTypesWithoutADefaultIsRefused) {
    const std::string PATTR = CLASS + pattr(P, "SD") + element("PAttrSDDefinition", 0, "Int32");
    const std::string DATTR = CLASS + dattr("DynamicClassAttribute", "SDArray");
    const std::pair<std::string, ending> rows[] = {
        {PATTR + element("PAttrSDDefinition", 1, "Nonsense"), {"dump_dflt: copy_this_sd_type default error", 22, 1}},
        {DATTR + element("DAttrSDDefinition", 0, "Nonsense"), {"dump_dflt: copy_this_sd_type init error", 17, 1}},
        {PATTR + element("PAttrSDDefinition", 1, "SBS"), {"VX_SBS_TYPE not supported", 0, 1}},
    };
    for (const auto &[text, end] : rows)
        EXPECT_EQ(compilation().reading(text + "ResourceClass\n"), end);
}

/* ---- Collected values ------------------------------------------------------------------------------------------ */

/* Types or numbers as they are collected. */
dflt_tbl collected(cdgen &cx, std::initializer_list<vx_uint32_t> numbers) {
    dflt_tbl values = {std::make_shared<dflt_values>("collected"), numbers.size()};
    for (vx_uint32_t value : numbers)
        static_cast<vx_value_t *>(alloc_tble(cx, &values.tbl->cells, 8))->val_uint32 = value;
    return values;
}

TEST(CollectedValues, AreOneArrayOrTheLast) {
    compilation c;
    tbl strings(64, "strings");
    vx_value_t scalar = {.val_uint64 = 0}, array = {.val_uint64 = 0};
    dflt_tbl values = collected(c.cx, {7, 9});
    dump_dflt(c.cx, &strings, &values, &scalar, VX_UINT32);
    EXPECT_EQ(scalar.val_uint64, cell32(9));
    EXPECT_EQ(strings.used(), 0U);
    add_to_tbl(c.cx, &strings, "before", 7);
    dump_dflt(c.cx, &strings, &values, &array, VX_UINT32_ARRAY);
    EXPECT_EQ(array.val_uint64, cell32(8));
    const vx_uint64_t expected[] = {cell32(2), cell32(7), cell32(9)};
    EXPECT_EQ(strings.used(), 8 + sizeof expected);
    EXPECT_EQ(memcmp(strings.tbl_base + 8, expected, sizeof expected), 0);
}

TEST(CollectedValues, MayBeNone) {
    compilation c;
    tbl strings(64, "strings");
    for (vx_data_type_t type : {VX_INT32, VX_CHAR_PTR_ARRAY, VX_SD_PTR, VX_UNKNOWN}) {
        vx_value_t value = {.val_uint64 = 0x123456789ABCDEF0};
        dflt_tbl none;
        dump_dflt(c.cx, &strings, &none, &value, type);
        EXPECT_EQ(value.val_uint64, 0x123456789ABCDEF0U);
    }
    EXPECT_EQ(strings.used(), 0U);
}

/* Each element of an array type has a separate array. */
TEST(CollectedValues, ElementsOfArrayTypesHaveArraysOfTheirOwn) {
    compilation c;
    tbl strings(64, "strings");
    vx_value_t value = {.val_uint64 = 0};
    dflt_tbl types = collected(c.cx, {VX_INT32_ARRAY, VX_INT32_ARRAY});
    dump_dflt(c.cx, &strings, &types, &value, VX_SD_PTR);
    const vx_uint64_t two_elements[] = {cell32(2), cell32(13), cell32(40), cell32(13), cell32(56)};
    const vx_uint64_t arrays[] = {cell32(1), 0, cell32(1), 0};
    EXPECT_EQ(value.val_uint64, 0U);
    ASSERT_EQ(strings.used(), 72U);
    EXPECT_EQ(memcmp(strings.tbl_base, two_elements, sizeof two_elements), 0);
    EXPECT_EQ(memcmp(strings.tbl_base + 40, arrays, sizeof arrays), 0);
}

TEST(CollectedValues, MustBeOfATypeThatCanBeCopied) {
    const std::tuple<vx_data_type_t, int, const char *> rows[] = {
        {VX_UNKNOWN, 0, "dump_dflt: copy_this_type error"},
        {VX_SD_PTR, 0, "dump_dflt: copy_this_sd_type default error"},
        {VX_SD_PTR_ARRAY, 0, "dump_dflt: copy_this_sd_type default error"},
        {VX_SD_PTR, 1, "dump_dflt: copy_this_sd_type init error"}};
    for (auto [type, sd_attr_type, message] : rows) {
        opened c;
        tbl strings(64, "strings");
        vx_value_t value = {.val_uint64 = 0};
        dflt_tbl unknown = collected(c.cx, {0});
        c.cx.sd.announce(nullptr, nullptr, nullptr, sd_attr_type);
        EXPECT_EQ(ending_of([&, type = type] { dump_dflt(c.cx, &strings, &unknown, &value, type); }),
                  (ending{message, LINE, 1}));
    }
}

} // namespace
