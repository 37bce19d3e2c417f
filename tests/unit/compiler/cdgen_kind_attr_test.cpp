/* Persistent and dynamic attributes: opening, collecting defaults and ranges, completing. */

#include "compiler/source_fixture.h"

namespace {

using namespace from_source;

template <class Record> struct kind_row {
    stanza_id id;
    Record staging_records::*record;
    cdb_ref_t rsrc_class_t::*records;
    vx_uint32_t cb_id;
    void (*init)(cdgen &);
    void (*complete)(cdgen &);
    vx_uint16_t valid_value_lists::*vv_found;

    std::string name() const {
        return sc_tables[id].sc_name;
    }
};

using pattr_row = kind_row<rsrc_pattr_t>;
using dattr_row = kind_row<rsrc_dattr_t>;

const pattr_row PATTRS[] = {
    {SC_PERSISTENT_RESOURCE_ATTRIBUTE, &staging_records::cb_rsrc_pattr, &rsrc_class_t::u_rc_pattrs, 0x43444239,
     init_pattr_tbl, cmplt_pattr_tbl, &valid_value_lists::pattr_vv_found},
    {SC_PERSISTENT_CLASS_ATTRIBUTE, &staging_records::cb_rsrc_pattrC, &rsrc_class_t::u_rc_pattrsC, 0x43444237,
     init_pattrC_tbl, cmplt_pattrC_tbl, &valid_value_lists::pattrC_vv_found},
};
const dattr_row DATTRS[] = {
    {SC_DYNAMIC_RESOURCE_ATTRIBUTE, &staging_records::cb_rsrc_dattr, &rsrc_class_t::u_rc_dattrs, 0x43444261,
     init_dattr_tbl, cmplt_dattr_tbl, &valid_value_lists::dattr_vv_found},
    {SC_DYNAMIC_CLASS_ATTRIBUTE, &staging_records::cb_rsrc_dattrC, &rsrc_class_t::u_rc_dattrsC, 0x43444238,
     init_dattrC_tbl, cmplt_dattrC_tbl, &valid_value_lists::dattrC_vv_found},
};
const pattr_row &P = PATTRS[0], &PC = PATTRS[1];
const dattr_row &D = DATTRS[0], &DC = DATTRS[1];

/* The source's only attribute of a kind, completed. */
template <class Record> Record completed(compilation &c, const kind_row<Record> &kind, const std::string &text) {
    c.read(CLASS + text);
    kind.complete(c.cx);
    auto records = c.filed<Record>(kind.records);
    EXPECT_EQ(records.size(), 1U);
    EXPECT_EQ((c.cx.staged.*kind.record).ra_cb_ID, 0U);
    return records[0];
}

rsrc_pattr_t completed_pattr(compilation &c, const pattr_row &kind, const char *type, lines more = {}) {
    return completed(c, kind, pattr(kind.name(), type, more));
}
rsrc_dattr_t completed_dattr(compilation &c, const dattr_row &kind, const char *type, lines more = {}) {
    return completed(c, kind, dattr(kind.name(), type, more));
}

template <class Record> std::string bytes_of(const Record &record) {
    return {reinterpret_cast<const char *>(&record), sizeof record};
}

constexpr cdb_ref_t ABSENT = {{0xFFFFFFFF, 0}};

/* ---- Opening --------------------------------------------------------------------------------------------------- */

TEST(PersistentAttribute, OpensAsEmptyRecord) {
    for (const pattr_row &kind : PATTRS) {
        compilation c;
        init_class_tbl(c.cx);
        mk_vty_sec(c.cx);                           /* another list before its own */
        (c.cx.staged.*kind.record).ra_group_id = 3; /* of an earlier one */
        c.cx.valid_values.vvdisp = 0;
        c.cx.valid_values.*kind.vv_found = 1;
        kind.init(c.cx);
        rsrc_pattr_t expected = {};
        expected.ra_cb_ID = kind.cb_id;
        expected.u_ra_variety_list = {{16, 0}};
        expected.u_ra_sd = ABSENT;
        if (&kind == &PC) /* deliberate: the other one at its completion */
            expected.u_ra_valid_vals = ABSENT;
        expected.ra_max_sd_idx = 0xFFFF;
        EXPECT_EQ(bytes_of(c.cx.staged.*kind.record), bytes_of(expected));
        EXPECT_FALSE(c.cx.valid_values.vvdisp.has_value());
        EXPECT_EQ(c.cx.valid_values.*kind.vv_found, 0U);
    }
}

TEST(DynamicAttribute, OpensAsEmptyRecord) {
    for (const dattr_row &kind : DATTRS) {
        compilation c;
        init_class_tbl(c.cx);
        mk_vty_sec(c.cx);
        (c.cx.staged.*kind.record).ra_group_id = 3;
        c.cx.valid_values.vvdisp = 0;
        c.cx.valid_values.*kind.vv_found = 1;
        kind.init(c.cx);
        rsrc_dattr_t expected = {};
        expected.ra_cb_ID = kind.cb_id;
        expected.u_ra_variety_list = {{16, 0}};
        expected.u_ra_express = expected.u_ra_vclass = expected.u_ra_rearm_expr = expected.u_ra_sd = ABSENT;
        expected.ra_max_sd_idx = 0xFFFF;
        EXPECT_EQ(bytes_of(c.cx.staged.*kind.record), bytes_of(expected));
        EXPECT_FALSE(c.cx.valid_values.vvdisp.has_value());
        EXPECT_EQ(c.cx.valid_values.*kind.vv_found, 0U);
    }
}

template <class Record> void expect_class_needed(const kind_row<Record> &kind, const char *message) {
    opened c;
    for (auto step : {kind.init, kind.complete}) {
        c.cx.staged.cb_rsrc_class.rc_cb_ID = 0;
        EXPECT_EQ(ending_of([&] { step(c.cx); }), (ending{message, LINE, 1}));
    }
    compilation nothing_open;
    EXPECT_EQ(nothing_open.reading(kind.name()), (ending{message, 1, 1}));
}

TEST(PersistentAttribute, NeedsAClass) {
    expect_class_needed(P, "No class for PersistentAttribute");
    expect_class_needed(PC, "No class for pattr");
}

TEST(DynamicAttribute, NeedsAClass) {
    expect_class_needed(D, "No class for DynamicAttribute");
    expect_class_needed(DC, "No class for DynamicAttribute");
}

/* ---- Completing ------------------------------------------------------------------------------------------------ */

template <class Record> void expect_all_required_needed(const kind_row<Record> &kind, vx_uint32_t complete) {
    for (vx_uint32_t bit = 1; bit <= complete; bit <<= 1) {
        opened c;
        (c.cx.staged.*kind.record).ra_data_type = VX_INT32;
        c.state(kind.id).req_mask = complete & ~bit;
        for (auto step : {kind.init, kind.complete})
            EXPECT_EQ(ending_of([&] { step(c.cx); }), (ending{"Previous stanza incomplete", LINE, 1}));
        EXPECT_TRUE(c.filed<Record>(kind.records).empty());
        c.state(kind.id).req_mask = complete;
        EXPECT_EQ(ending_of([&] { kind.init(c.cx); }), WELL);
        EXPECT_EQ(c.filed<Record>(kind.records).size(), 1U);
    }
}

TEST(PersistentAttribute, NeedsAllItsRequiredAttributes) {
    expect_all_required_needed(P, 0x3f);
    expect_all_required_needed(PC, 0x3f);
}

/* Deliberate: one of the kinds shows its masks. */
TEST(DynamicAttribute, NeedsAllItsRequiredAttributes) {
    EXPECT_EQ(output_of([] { expect_all_required_needed(D, 0x7f); }), "");
    std::string shown = output_of([] { expect_all_required_needed(DC, 0x7f); });
    EXPECT_TRUE(shown.starts_with("scp->req_mask:         7e\nscp->req_mask_cmplt:   7f\n")) << shown;
    opened c;
    c.state(DC.id).req_mask = 0x3f;
    EXPECT_EQ(output_of([&] { cmplt_dattrC_tbl(c.cx); }), "scp->req_mask:         3f\nscp->req_mask_cmplt:   7f\n");
    c.state(DC.id).req_mask = 0x7f;
    c.cx.staged.cb_rsrc_dattrC.ra_data_type = VX_INT32;
    EXPECT_EQ(output_of([&] { cmplt_dattrC_tbl(c.cx); }), "");
}

TEST(PersistentAttribute, HoldsWhatItsStanzaSays) {
    for (const pattr_row &kind : PATTRS) {
        compilation c;
        rsrc_pattr_t attr = completed_pattr(
            c, kind, "Int32",
            {"GroupID=17", "GroupName=18", "Properties=ReqdForDefine", "ValidValue=19", "VarietyRange=16,20"});
        EXPECT_EQ(attr.ra_cb_ID, kind.cb_id);
        EXPECT_EQ(c.string_at(attr.u_ra_name.offset[0]), "P");
        EXPECT_EQ(attr.ra_dscr_msgid, 11U);
        EXPECT_EQ(attr.ra_disp_msgid, 12U);
        EXPECT_EQ(attr.ra_attr_id, 13);
        EXPECT_EQ(attr.ra_data_type, VX_INT32);
        EXPECT_EQ(c.varieties_at(attr.u_ra_variety_list), (ranges{{14, 15}, {16, 20}}));
        EXPECT_EQ(attr.ra_group_id, 17U);
        EXPECT_EQ(attr.ra_group_msgid, 18U);
        EXPECT_EQ(attr.ra_props, 0x2U);
        EXPECT_EQ(c.valid_values_at(attr.u_ra_valid_vals).size(), 1U);
        EXPECT_TRUE(is_absent(attr.u_ra_sd));
        EXPECT_EQ(attr.ra_max_sd_idx, 0xFFFFU);
        EXPECT_EQ(attr.ra_dflt_value.val_uint64, 0U);
        EXPECT_EQ(c.cx.valid_values.*kind.vv_found, 0U);
    }
}

TEST(DynamicAttribute, HoldsWhatItsStanzaSays) {
    for (const dattr_row &kind : DATTRS) {
        compilation c;
        rsrc_dattr_t attr =
            completed_dattr(c, kind, "Int32",
                            {"GroupID=26", "GroupName=27", "Properties=QryReqsMonitoring", "ValidStateValue=28",
                             "Expression=X", "ExpressionDescription=29", "ReArmExpression=R", "ReArmDescription=30",
                             "VariableClass=V", "Range=31,32", "InitialValue=33"});
        EXPECT_EQ(attr.ra_cb_ID, kind.cb_id);
        EXPECT_EQ(c.string_at(attr.u_ra_name.offset[0]), "D");
        EXPECT_EQ(c.string_at(attr.u_ra_vclass.offset[0]), "V");
        EXPECT_EQ(c.string_at(attr.u_ra_express.offset[0]), "X");
        EXPECT_EQ(c.string_at(attr.u_ra_rearm_expr.offset[0]), "R");
        EXPECT_EQ(attr.ra_dscr_msgid, 21U);
        EXPECT_EQ(attr.ra_disp_msgid, 22U);
        EXPECT_EQ(attr.ra_attr_id, 23);
        EXPECT_EQ(c.varieties_at(attr.u_ra_variety_list), (ranges{{24, 25}}));
        EXPECT_EQ(attr.ra_group_id, 26U);
        EXPECT_EQ(attr.ra_group_msgid, 27U);
        EXPECT_EQ(attr.ra_props, 0x40U);
        EXPECT_EQ(c.valid_values_at(attr.u_ra_valid_vals).size(), 1U);
        EXPECT_EQ(attr.ra_expr_desc, 29U);
        EXPECT_EQ(attr.ra_rearm_desc, 30U);
        EXPECT_EQ(attr.ra_min_value.val_uint64, cell32(31));
        EXPECT_EQ(attr.ra_max_value.val_uint64, cell32(32));
        EXPECT_EQ(attr.ra_init_value.val_uint64, cell32(33));
        EXPECT_EQ(attr.ra_data_type, VX_INT32);
        EXPECT_EQ(attr.ra_var_type, ORB_QUANTITY);
        EXPECT_TRUE(is_absent(attr.u_ra_sd));
        EXPECT_EQ(c.cx.valid_values.*kind.vv_found, 0U);
    }
}

/* Nothing of the first stanza is left in the second. */
template <class Record>
void expect_stanza_order(const kind_row<Record> &kind, const std::string &first, const std::string &second) {
    compilation c;
    c.read(CLASS + first + second);
    kind.complete(c.cx);
    auto records = c.filed<Record>(kind.records);
    ASSERT_EQ(records.size(), 2U);
    EXPECT_EQ(records[0].ra_data_type, VX_INT32);
    EXPECT_EQ(records[0].u_ra_valid_vals.offset[0], 0U);
    EXPECT_EQ(records[0].ra_group_id, 1U);
    EXPECT_EQ(records[1].ra_data_type, VX_UINT32);
    EXPECT_TRUE(is_absent(records[1].u_ra_valid_vals));
    EXPECT_EQ(records[1].ra_group_id, 255U);
    EXPECT_EQ(records[1].ra_group_msgid, 0U);
}

TEST(PersistentAttribute, StandsInStanzaOrder) {
    for (const pattr_row &kind : PATTRS)
        expect_stanza_order(kind, pattr(kind.name(), "Int32", {"ValidValue=1", "GroupID=1", "GroupName=2"}),
                            pattr(kind.name(), "UInt32"));
}

TEST(DynamicAttribute, StandsInStanzaOrder) {
    for (const dattr_row &kind : DATTRS)
        expect_stanza_order(kind, dattr(kind.name(), "Int32", {"ValidStateValue=1", "GroupID=1", "GroupName=2"}),
                            dattr(kind.name(), "UInt32"));
}

TEST(PersistentAttribute, CannotBeDefinedUnlessItSaysSo) {
    const std::pair<const char *, vx_uint32_t> rows[] = {
        {"Properties=\"\"", 0x4},           {"Properties=Public", 0x24},
        {"Properties=ReqdForDefine", 0x2},  {"Properties=OptForDefine", 0x8},
        {"Properties=InvalForDefine", 0x4}, {"Properties=ReqdForDefine,InvalForDefine", 0x6},
    };
    for (const pattr_row &kind : PATTRS)
        for (auto [line, props] : rows) {
            compilation c;
            EXPECT_EQ(completed_pattr(c, kind, "Int32", {line}).ra_props, props) << line;
        }
}

/* Whatever is in the record. A group of 0 is a group. */
template <class Record> void expect_no_group_unless_given(const kind_row<Record> &kind) {
    const std::pair<std::vector<std::string>, std::pair<int, int>> rows[] = {
        {{}, {255, 0}}, {{"Properties=Public"}, {255, 0}}, {{"GroupID=0"}, {0, 0}}, {{"GroupName=9"}, {255, 9}}};
    for (const auto &[given, group] : rows) {
        opened c;
        (c.cx.staged.*kind.record).ra_data_type = VX_INT32;
        (c.cx.staged.*kind.record).ra_group_id = (c.cx.staged.*kind.record).ra_group_msgid = 5;
        c.require_nothing(kind.id);
        for (const std::string &line : given)
            EXPECT_EQ(fed(c, kind.id, line), WELL);
        kind.complete(c.cx);
        EXPECT_EQ(c.filed<Record>(kind.records)[0].ra_group_id, group.first);
        EXPECT_EQ(c.filed<Record>(kind.records)[0].ra_group_msgid, group.second);
    }
}

TEST(PersistentAttribute, GroupIsNoneUnlessGiven) {
    expect_no_group_unless_given(P);
    expect_no_group_unless_given(PC);
}

TEST(DynamicAttribute, GroupIsNoneUnlessGiven) {
    expect_no_group_unless_given(D);
    expect_no_group_unless_given(DC);
}

/* ---- Values that were not given -------------------------------------------------------------------------------- */

/* The name takes the first 8 bytes of the string table. used: the size of the table at the end. */
struct default_row {
    const char *type;
    vx_uint64_t value;
    size_t used;
};

TEST(PersistentAttribute, DefaultIsItsTypes) {
    const default_row rows[] = {
        {"None", 0, 8},
        {"Int32", 0, 8},
        {"UInt32", 0, 8},
        {"Int64", 0, 8},
        {"UInt64", 0, 8},
        {"Float32", 0, 8},
        {"Float64", 0, 8},
        {"String", cell32(8), 16},
        {"Binary", cell32(8), 16},
        {"RH", cell32(8), 32},
        {"SD", 0, 8}, /* to be made by its run */
        {"SDArray", 0, 8},
        {"UInt32Array", cell32(8), 24},
        {"Float64Array", cell32(8), 24},
        {"StringArray", cell32(8), 32},
        {"BinaryArray", cell32(8), 40},
        {"RHArray", cell32(8), 48},
    };
    for (const pattr_row &kind : PATTRS)
        for (const default_row &row : rows) {
            compilation c;
            EXPECT_EQ(completed_pattr(c, kind, row.type).ra_dflt_value.val_uint64, row.value) << row.type;
            EXPECT_EQ(c.table(&rsrc_class_t::u_rc_strings)->used(), row.used) << row.type;
        }
}

struct dynamic_default_row {
    const char *type;
    vx_uint64_t min, max, initial;
    size_t used;
};

const vx_uint64_t NO_BOUND = cell32(0xFFFFFFFF);

const dynamic_default_row DYNAMIC_DEFAULTS[] = {
    {"None", 0, 0, 0, 8},
    {"Int32", 0, cell32(100), 0, 8},
    {"UInt32", 0, cell32(100), 0, 8},
    {"Int64", 0, cell64(100), 0, 8},
    {"UInt64", 0, cell64(100), 0, 8},
    {"Float32", 0, cell32(0x42C80000), 0, 8},
    {"Float64", 0, cell64(0x4059000000000000), 0, 8},
    {"String", NO_BOUND, NO_BOUND, cell32(8), 16},
    {"Binary", NO_BOUND, NO_BOUND, cell32(8), 16},
    {"RH", NO_BOUND, NO_BOUND, cell32(8), 32},
    {"SD", NO_BOUND, NO_BOUND, 0, 8},
    {"Int32Array", cell32(8), cell32(24), cell32(40), 56},
    {"Float64Array", cell32(8), cell32(24), cell32(40), 56},
    {"StringArray", cell32(8), cell32(24), cell32(40), 64},
    {"BinaryArray", cell32(8), cell32(24), cell32(40), 72},
    {"RHArray", cell32(8), cell32(48), cell32(88), 128},
    {"SDArray", cell32(8), cell32(48), 0, 88},
};

TEST(DynamicAttribute, RangeAndInitialValueAreItsTypes) {
    for (const dattr_row &kind : DATTRS)
        for (const dynamic_default_row &row : DYNAMIC_DEFAULTS) {
            compilation c;
            rsrc_dattr_t attr = completed_dattr(c, kind, row.type);
            EXPECT_EQ(attr.ra_min_value.val_uint64, row.min) << row.type;
            EXPECT_EQ(attr.ra_max_value.val_uint64, row.max) << row.type;
            EXPECT_EQ(attr.ra_init_value.val_uint64, row.initial) << row.type;
            EXPECT_EQ(c.table(&rsrc_class_t::u_rc_strings)->used(), row.used) << row.type;
        }
}

/* Two bounds, each a separate array of one element. */
TEST(DynamicAttribute, ArraysBoundsAreArrays) {
    const std::pair<const char *, std::pair<vx_uint64_t, vx_uint64_t>> rows[] = {
        {"Int32Array", {0, cell32(100)}},
        {"Float64Array", {0, cell64(0x4059000000000000)}},
        {"StringArray", {~vx_uint64_t{0}, ~vx_uint64_t{0}}},
    };
    for (auto [type, bounds] : rows) {
        compilation c;
        completed_dattr(c, D, type);
        auto low = c.string_table_at<vx_array_t>(8), high = c.string_table_at<vx_array_t>(24);
        EXPECT_EQ(low.element_count, 1U);
        EXPECT_EQ(low.elements[0].val_uint64, bounds.first) << type;
        EXPECT_EQ(high.element_count, 1U);
        EXPECT_EQ(high.elements[0].val_uint64, bounds.second) << type;
    }
}

TEST(DynamicAttribute, StructuredDataArraysBoundsHaveNoElements) {
    compilation c;
    completed_dattr(c, DC, "SDArray");
    for (vx_uint32_t array : {8U, 48U}) {
        EXPECT_EQ(c.string_table_at<vx_array_t>(array).element_count, 1U);
        EXPECT_EQ(c.string_table_at<vx_array_t>(array).elements[0].val_uint64, cell32(array + 16));
        EXPECT_EQ(c.string_table_at<vx_structured_data_t>(array + 16).element_count, 0U);
    }
}

TEST(DynamicAttribute, TypeWithoutBoundsHasNoneWhateverWasThere) {
    for (vx_data_type_t type : {VX_CHAR_PTR, VX_BINARY_PTR, VX_RSRC_HANDLE_PTR, VX_SD_PTR}) {
        opened c;
        c.require_nothing(D.id);
        rsrc_dattr_t &attr = c.cx.staged.cb_rsrc_dattr;
        attr.ra_data_type = type;
        attr.ra_min_value.val_uint64 = attr.ra_max_value.val_uint64 = 0x123456789ABCDEF0;
        attr.u_ra_valid_vals = {{0, 5}};
        c.cx.range.dattr_range_found = 1;
        cmplt_dattr_tbl(c.cx);
        rsrc_dattr_t filed = c.filed<rsrc_dattr_t>(D.records)[0];
        EXPECT_EQ(filed.ra_min_value.val_uint64, NO_BOUND);
        EXPECT_EQ(filed.ra_max_value.val_uint64, NO_BOUND);
        EXPECT_TRUE(is_absent(filed.u_ra_valid_vals));
        EXPECT_EQ(c.cx.range.dattr_range_found, 0U);
    }
}

/* A record with a type that no source can give it. */
template <class Record> ending completing(const kind_row<Record> &kind, int type, vx_uint16_t range_found) {
    opened c;
    c.require_nothing(kind.id);
    (c.cx.staged.*kind.record).ra_data_type = static_cast<vx_data_type_t>(type);
    c.cx.range.dattr_range_found = range_found;
    return ending_of([&] { kind.complete(c.cx); });
}

TEST(PersistentAttribute, TypeMustHaveADefault) {
    for (const pattr_row &kind : PATTRS) {
        EXPECT_EQ(completing(kind, 0, 0), (ending{"copy_this_type default value error", LINE, 1}));
        EXPECT_EQ(completing(kind, 23, 0), (ending{"copy_this_type default value error", LINE, 1}));
        EXPECT_EQ(completing(kind, VX_SBS_PTR, 0), (ending{"VX_SBS_TYPE not supported", 0, 1}));
    }
}

TEST(DynamicAttribute, TypeMustHaveADefault) {
    for (const dattr_row &kind : DATTRS) {
        EXPECT_EQ(completing(kind, 0, 0), (ending{"copy_this_type default min range error (dattr)", LINE, 1}));
        EXPECT_EQ(completing(kind, 0, 1), (ending{"copy_this_type default value error (dattr)", LINE, 1}));
        EXPECT_EQ(completing(kind, VX_SBS_PTR, 0), (ending{"VX_SBS_TYPE not supported", 0, 1}));
        EXPECT_EQ(completing(kind, VX_SBS_PTR, 1), (ending{"VX_SBS_TYPE not supported", 0, 1}));
    }
}

/* ---- Values that were given ------------------------------------------------------------------------------------ */

TEST(PersistentAttribute, DefaultIsTheResourceKindsLastValue) {
    compilation one, two, text;
    EXPECT_EQ(completed_pattr(one, P, "Int32", {"DefaultValue=5"}).ra_dflt_value.val_uint64, cell32(5));
    EXPECT_EQ(completed_pattr(two, P, "Int64", {"DefaultValue=1", "DefaultValue=-2"}).ra_dflt_value.val_int64, -2);
    EXPECT_EQ(completed_pattr(text, P, "String", {"DefaultValue=some,text"}).ra_dflt_value.val_uint64, cell32(8));
    EXPECT_EQ(text.string_at(8), "some,text");
}

/* Deliberate: they are only read and checked. */
TEST(PersistentAttribute, ClassKindsDefaultValuesAreNotUsed) {
    compilation number, text;
    EXPECT_EQ(completed_pattr(number, PC, "Int32", {"DefaultValue=5"}).ra_dflt_value.val_uint64, 0U);
    EXPECT_EQ(completed_pattr(text, PC, "String", {"DefaultValue=x"}).ra_dflt_value.val_uint64, cell32(8));
    EXPECT_EQ(text.string_at(8), "");
}

TEST(PersistentAttribute, ArraysDefaultHasAllValues) {
    compilation c;
    auto attr = completed_pattr(c, P, "Int32Array", {"DefaultValue=1", "DefaultValue=2", "DefaultValue=0"});
    EXPECT_EQ(attr.ra_dflt_value.val_uint64, cell32(8));
    EXPECT_EQ(c.string_table_at<vx_uint32_t>(8), 3U);
    EXPECT_EQ(c.string_table_at<vx_uint64_t>(16), cell32(1));
    EXPECT_EQ(c.string_table_at<vx_uint64_t>(24), cell32(2));
    EXPECT_EQ(c.string_table_at<vx_uint64_t>(32), 0U);
    EXPECT_EQ(c.table(&rsrc_class_t::u_rc_strings)->used(), 40U);
}

TEST(PersistentAttribute, NextStanzaHasNoneOfTheDefaults) {
    compilation c;
    c.read(CLASS + pattr(P.name(), "Int32", {"DefaultValue=5"}) + pattr(P.name(), "Int32"));
    cmplt_pattr_tbl(c.cx);
    EXPECT_EQ(c.filed<rsrc_pattr_t>(P.records)[1].ra_dflt_value.val_uint64, 0U);
}

TEST(DynamicAttribute, InitialValueServesBothKinds) {
    for (const dattr_row &kind : DATTRS) {
        compilation c;
        EXPECT_EQ(completed_dattr(c, kind, "Int32", {"InitialValue=5"}).ra_init_value.val_uint64, cell32(5));
    }
}

/* A stanza takes one, but two that were collected are two elements. */
TEST(DynamicAttribute, ArraysInitialValueHasAllValues) {
    opened c;
    for (const char *line : {"DataType=Int64Array", "Range=1,2", "InitialValue=7", "InitialValue=9"})
        EXPECT_EQ(fed(c, DC.id, line), WELL);
    c.cx.staged.cb_rsrc_dattr.ra_cb_ID = 0; /* the range is the open resource attribute's */
    cmplt_dattrC_tbl(c.cx);
    vx_uint32_t array = c.filed<rsrc_dattr_t>(DC.records)[0].ra_init_value.val_uint32;
    EXPECT_EQ(c.string_table_at<vx_uint32_t>(array), 2U);
    EXPECT_EQ(c.string_table_at<vx_uint64_t>(array + 8), 7U);
    EXPECT_EQ(c.string_table_at<vx_uint64_t>(array + 16), 9U);
}

} // namespace
