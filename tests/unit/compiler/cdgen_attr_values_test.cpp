/* How each type of attribute converts its text, and where it stores the result. Elements of structured data have their
 * own tests. */

#include "compiler/cdgen_attr.h"
#include "compiler/cdgen_stanzas.h"
#include "compiler/source_fixture.h"

namespace {

using namespace from_source;

/* ---- Plain fields ---------------------------------------------------------------------------------------------- */

struct field_row {
    std::vector<stanza_id> kinds;
    std::string line;
    size_t offset; /* of the field in the record */
    size_t width;
    vx_uint32_t value;
};

const std::vector<stanza_id> P(PERSISTENT.begin(), PERSISTENT.end());
const std::vector<stanza_id> D(DYNAMIC.begin(), DYNAMIC.end());
const std::vector<stanza_id> A(ACTIONS.begin(), ACTIONS.end());
const std::vector<stanza_id> E = {SC_RESET_SD_DEFINITION, SC_ACTION_OUT_SD_DEFINITION};

const std::vector<field_row> FIELD_ROWS = {
    {{SC_CONTROL_DEFINITION}, "FileVersion=1.2.3.4", 216, 4, 0x01020304},
    {{SC_CONTROL_DEFINITION}, "FileVersion=7", 216, 4, 0x07000000},
    {{SC_CLASS_TO_MANAGER_MAPPING}, "FirstKey=101", 26, 2, 101},
    {{SC_CLASS_TO_MANAGER_MAPPING}, "LastKey=102", 28, 2, 102},
    {{SC_CLASS_TO_MANAGER_MAPPING}, "DescriptiveMessageSet=103", 24, 2, 103},
    {{SC_RESOURCE_VARIABLE_CLASS}, "ObservationInterval=104", 4, 2, 104},
    {{SC_RESOURCE_VARIABLE_CLASS}, "ReportingInterval=105", 6, 2, 105},
    {{SC_RESOURCE_CLASS}, "Properties=HasIWAccess,CanControl", 4, 4, 0x5},
    {{SC_RESOURCE_CLASS}, "Properties=QryReqsMonitoring", 4, 4, 0x20000},
    {{SC_RESOURCE_CLASS}, "ClassPermTemplate=0", 204, 4, 0xEEEEEEEE},
    {{SC_RESOURCE_CLASS}, "ResourcePermTemplate=any text", 200, 4, 0xEEEEEEEE},
    {{SC_RESOURCE_CLASS}, "Description=106", 210, 2, 106},
    {{SC_RESOURCE_CLASS}, "DisplayName=107", 212, 2, 107},
    {P, "Description=108", 16, 2, 108},
    {P, "DisplayName=109", 18, 2, 109},
    {P, "GroupName=110", 20, 2, 110},
    {P, "GroupID=111", 22, 2, 111},
    {P, "Id=112", 32, 4, 112},
    {P, "Properties=ReadOnly,Select", 4, 4, 0x11},
    {P, "Properties=Public", 4, 4, 0x20},
    {P, "DataType=StringArray", 36, 4, 19},
    {D, "Description=113", 112, 2, 113},
    {D, "DisplayName=114", 114, 2, 114},
    {D, "GroupName=115", 116, 2, 115},
    {D, "GroupID=116", 118, 2, 116},
    {D, "Id=117", 120, 4, 117},
    {D, "Properties=Public,QryReqsMonitoring", 4, 4, 0x60},
    {D, "DataType=Float64", 104, 4, 7},
    {D, "VariableType=Quantity", 108, 4, 1},
    {D, "VariableType=State", 108, 4, 2},
    {D, "VariableType=Quantum", 108, 4, 3},
    {D, "ExpressionDescription=118", 126, 2, 118},
    {D, "ReArmDescription=119", 128, 2, 119},
    {A, "Id=120", 4, 4, 120},
    {A, "Properties=LongRun,Public", 8, 4, 0x3},
    {A, "Properties=Public", 8, 4, 0x2},
    {A, "Description=121", 12, 2, 121},
    {A, "DisplayName=122", 14, 2, 122},
    {A, "ConfirmationMsg=123", 16, 2, 123},
    {A, "TimeOut=124", 18, 2, 124},
    {A, "Permission=xq", 20, 4, 0x200}, /* the first letter counts */
    {E, "Description=125", 22, 2, 125},
    {E, "DisplayName=126", 20, 2, 126},
    {E, "DataType=UInt64", 16, 4, 5},
};

TEST(PlainValue, LandsInItsFieldAndNowhereElse) {
    for (const field_row &row : FIELD_ROWS)
        for (stanza_id kind : row.kinds) {
            opened c;
            std::string expected = record_of(c, kind);
            expected.replace(row.offset, row.width, number(row.value, row.width));
            EXPECT_EQ(fed(c, kind, row.line), WELL) << row.line;
            EXPECT_EQ(record_of(c, kind), expected) << row.line;
        }
}

struct integer_row {
    std::string text;
    vx_uint16_t as16;
    vx_uint32_t as32;
};

const integer_row INTEGERS[] = {
    {"0", 0, 0},
    {"65535", 65535, 65535},
    {"65536", 0, 65536},
    {"70000", 4464, 70000},
    {"4294967295", 65535, 0xFFFFFFFF},
    {"4294967301", 5, 5},
    {"-1", 65535, 0xFFFFFFFF},
    {"-65535", 1, 0xFFFF0001},
    {"0x1F", 31, 31},
    {"0X1f", 31, 31},
    {"010", 8, 8},
    {"08", 0, 0},
    {"+9", 9, 9},
    {" 9", 9, 9},
    {"12 apples", 12, 12},
    {"12.9", 12, 12},
    {"1e3", 1, 1},
    {"apples", 0, 0},
};

TEST(PlainValue, IntegerMayBeOctalOrHexadecimalAndLosesWhatDoesNotFit) {
    for (const integer_row &row : INTEGERS) {
        opened c;
        EXPECT_EQ(fed(c, SC_PERSISTENT_CLASS_ATTRIBUTE, "Description=" + row.text), WELL);
        EXPECT_EQ(c.cx.staged.cb_rsrc_pattrC.ra_dscr_msgid, row.as16) << row.text;
        EXPECT_EQ(fed(c, SC_PERSISTENT_CLASS_ATTRIBUTE, "Id=" + row.text), WELL);
        EXPECT_EQ(static_cast<vx_uint32_t>(c.cx.staged.cb_rsrc_pattrC.ra_attr_id), row.as32) << row.text;
    }
}

/* No attribute of the language has these two types. */
TEST(PlainValue, UnusedIntegerTypesHaveTheirWidths) {
    struct {
        int type;
        vx_uint32_t expected;
    } rows[] = {{0, 0}, {2, 0x12345678}};
    rows[0].expected = 0xFFFFFFFF;
    *reinterpret_cast<unsigned char *>(&rows[0].expected) = 0x78;
    for (auto [type, expected] : rows) {
        opened c;
        c.cx.staged.cb_rsrc_class.rc_version = 0xFFFFFFFF;
        char value[] = "0x12345678";
        const table_attrs attr = {"Other", type, offsetof(rsrc_class_t, rc_version), 0x1, 0};
        make_current(c.cx, sc_tables[SC_RESOURCE_CLASS]);
        store_value({c.cx, attr, value, strlen(value)});
        EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_version, expected) << type;
    }
}

TEST(PlainValue, PropertiesAreAddedToWhatIsThere) {
    opened c;
    c.cx.staged.cb_rsrc_class.rc_props = 0x80;
    EXPECT_EQ(fed(c, SC_RESOURCE_CLASS, "Properties=CanDefine,CanDefine"), WELL);
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_props, 0x88U);
}

TEST(PlainValue, UnknownPropertyIsRefusedWithoutALineNumber) {
    const std::pair<std::vector<stanza_id>, std::pair<std::string, std::string>> rows[] = {
        {{SC_RESOURCE_CLASS}, {"CanDefine,Public", "Public"}},
        {{SC_RESOURCE_CLASS}, {"CanDefine, CanControl", " CanControl"}},
        {P, {"canDefine", "canDefine"}},
        {P, {"QryReqsMonitoring", "QryReqsMonitoring"}},
        {D, {"Public,ReadOnly", "ReadOnly"}},
        {A, {"QryReqsMonitoring,Public", "QryReqsMonitoring"}},
    };
    for (const auto &[kinds, texts] : rows)
        for (stanza_id kind : kinds) {
            opened c;
            EXPECT_EQ(fed(c, kind, "Properties=" + texts.first), (ending{texts.second + ": invalid property", 0, 1}));
        }
}

TEST(PlainValue, VariableTypeMustBeKnown) {
    for (stanza_id kind : DYNAMIC)
        for (const char *text : {"counter", "Count", "0", "Quantums"}) {
            opened c;
            EXPECT_EQ(fed(c, kind, std::string("VariableType=") + text), (ending{"Invalid variable type", LINE, 1}));
        }
}

TEST(PlainValue, CounterIsTypeZero) {
    opened c;
    c.cx.staged.cb_rsrc_dattr.ra_var_type = ORB_QUANTUM;
    EXPECT_EQ(fed(c, SC_DYNAMIC_RESOURCE_ATTRIBUTE, "VariableType=Counter"), WELL);
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattr.ra_var_type, 0U);
}

TEST(PlainValue, ListActionsAreTakenAndIgnored) {
    for (stanza_id kind : ATTRIBUTES)
        for (const char *line : {"ListActionRsrc=a,b", "ListActionClass=7"}) {
            opened c;
            std::string before = record_of(c, kind);
            EXPECT_EQ(fed(c, kind, line), WELL);
            EXPECT_EQ(record_of(c, kind), before);
        }
}

/* ---- Values ---------------------------------------------------------------------------------------------------- */

struct valid_value_kind {
    stanza_id kind;
    const char *attr;
    cdb_ref_t *(*list)(cdgen &);
    vx_uint16_t valid_value_lists::*found;
};
const valid_value_kind VALID_VALUE_KINDS[] = {
    {SC_PERSISTENT_RESOURCE_ATTRIBUTE, "ValidValue", [](cdgen &cx) { return &cx.staged.cb_rsrc_pattr.u_ra_valid_vals; },
     &valid_value_lists::pattr_vv_found},
    {SC_PERSISTENT_CLASS_ATTRIBUTE, "ValidValue", [](cdgen &cx) { return &cx.staged.cb_rsrc_pattrC.u_ra_valid_vals; },
     &valid_value_lists::pattrC_vv_found},
    {SC_DYNAMIC_RESOURCE_ATTRIBUTE, "ValidStateValue",
     [](cdgen &cx) { return &cx.staged.cb_rsrc_dattr.u_ra_valid_vals; }, &valid_value_lists::dattr_vv_found},
    {SC_DYNAMIC_CLASS_ATTRIBUTE, "ValidStateValue", [](cdgen &cx) { return &cx.staged.cb_rsrc_dattrC.u_ra_valid_vals; },
     &valid_value_lists::dattrC_vv_found},
};

/* An array's valid values are of its element type. */
TEST(ValidValue, FirstOneMakesTheListOfItsKind) {
    for (const valid_value_kind &row : VALID_VALUE_KINDS)
        for (const inline_row &type : INLINE_TYPES)
            for (const char *array : {"", "Array"}) {
                opened c;
                std::string attr = std::string(row.attr) + "=";
                mk_vv_sec(c.cx); /* another list before it */
                EXPECT_EQ(fed(c, row.kind, std::string("DataType=") + type.type + array), WELL);
                EXPECT_EQ(fed(c, row.kind, attr + "7"), WELL);
                EXPECT_EQ(row.list(c.cx)->offset[0], 32U);
                EXPECT_EQ(c.cx.valid_values.*row.found, 1U);
                EXPECT_EQ(fed(c, row.kind, attr + "9,7"), WELL);
                std::vector<vv_entry_t> values = c.valid_values_at(*row.list(c.cx));
                ASSERT_EQ(values.size(), 2U);
                EXPECT_EQ(values[0].vv_low_val.val_uint64, type.seven);
                EXPECT_EQ(values[0].vv_high_val.val_uint64, type.seven);
                EXPECT_EQ(values[1].vv_low_val.val_uint64, type.nine);
                EXPECT_EQ(values[1].vv_high_val.val_uint64, type.seven);
                EXPECT_EQ(values[1].vv_disp_msgid, 0U);
            }
}

/* With a comma the upper bound is stored first; without one there are two copies, the lower bound's first. */
TEST(ValidValue, TextStandsInTheClassesStrings) {
    opened c;
    EXPECT_EQ(fed(c, SC_DYNAMIC_CLASS_ATTRIBUTE, "DataType=String"), WELL);
    EXPECT_EQ(fed(c, SC_DYNAMIC_CLASS_ATTRIBUTE, "ValidStateValue=low,the high,one"), WELL);
    EXPECT_EQ(fed(c, SC_DYNAMIC_CLASS_ATTRIBUTE, "ValidStateValue=one"), WELL);
    std::vector<vv_entry_t> values = c.valid_values_at(c.cx.staged.cb_rsrc_dattrC.u_ra_valid_vals);
    ASSERT_EQ(values.size(), 2U);
    EXPECT_EQ(values[0].vv_high_val.val_uint64, cell32(0));
    EXPECT_EQ(values[0].vv_low_val.val_uint64, cell32(16));
    EXPECT_EQ(values[1].vv_low_val.val_uint64, cell32(24));
    EXPECT_EQ(values[1].vv_high_val.val_uint64, cell32(32));
    EXPECT_EQ(c.string_at(0), "the high,one");
    EXPECT_EQ(c.string_at(16), "low");
    EXPECT_EQ(c.string_at(24), "one");
    EXPECT_EQ(c.string_at(32), "one");
}

TEST(ValidValue, BinaryIsItsLengthAndItsBytes) {
    opened c;
    EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "DataType=BinaryArray"), WELL);
    EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "ValidValue=0x616263,0x6465"), WELL);
    vv_entry_t value = c.valid_values_at(c.cx.staged.cb_rsrc_pattr.u_ra_valid_vals).at(0);
    EXPECT_EQ(value.vv_high_val.val_uint64, cell32(0));
    EXPECT_EQ(value.vv_low_val.val_uint64, cell32(16));
    EXPECT_EQ(c.string_table_at<vx_uint32_t>(0), 2U);
    EXPECT_EQ(c.string_at(8), "de");
    EXPECT_EQ(c.string_table_at<vx_uint32_t>(16), 3U);
    EXPECT_EQ(c.string_at(24), "abc");
}

TEST(ValidValue, DisplayNameBelongsToTheLatest) {
    for (const valid_value_kind &row : VALID_VALUE_KINDS) {
        opened c;
        std::string attr = std::string(row.attr) + "=";
        fed(c, row.kind, "DataType=Int32");
        EXPECT_EQ(fed(c, row.kind, "ValueDisplayName=5"),
                  (ending{"No ValidValue to attach ValueDisplayName to.", LINE, 1}));
        for (const std::string &line : {attr + "3", std::string("ValueDisplayName=12"), attr + "4", attr + "5",
                                        std::string("ValueDisplayName=13"), std::string("ValueDisplayName=0x1000E")})
            EXPECT_EQ(fed(c, row.kind, line), WELL);
        std::vector<vv_entry_t> values = c.valid_values_at(*row.list(c.cx));
        ASSERT_EQ(values.size(), 3U);
        EXPECT_EQ(values[0].vv_disp_msgid, 12U);
        EXPECT_EQ(values[1].vv_disp_msgid, 0U);
        EXPECT_EQ(values[2].vv_disp_msgid, 14U); /* the second one in a row, and its low 16 bits */
    }
}

TEST(ValidValue, MustBeOfTheType) {
    const std::pair<const char *, const char *> rows[] = {
        {"Int32", "x"},      {"Int32", "1,"},   {"Int32", ",1"},   {"Int32", "1,2,3"},  {"Int32", "1,x"},
        {"Int32", "x,1"},    {"Int32", "0x10"}, {"Int32", "1 "},   {"Float32", "1.5f"}, {"Float64", "1e999"},
        {"Float32", "1e39"}, {"String", "a,"},  {"Binary", "012"}, {"Binary", "0x1"},   {"None", "1"},
        {"RH", "1"},         {"RHArray", "1"},  {"SD", "1"},       {"SDArray", "1"},    {"SBS", "1"},
    };
    for (const valid_value_kind &row : VALID_VALUE_KINDS)
        for (auto [type, value] : rows) {
            opened c;
            EXPECT_EQ(fed(c, row.kind, std::string("DataType=") + type), WELL);
            EXPECT_EQ(fed(c, row.kind, std::string(row.attr) + "=" + value), INVALID) << type << " " << value;
        }
}

/* ---- Data types ------------------------------------------------------------------------------------------------ */

TEST(DataType, UnknownNamesAreRefused) {
    for (stanza_id kind : ATTRIBUTES)
        for (const char *name : {"int32", "Int", "SBSArray", "UNKNOWN", "3", "Int32 "}) {
            opened c;
            EXPECT_EQ(fed(c, kind, std::string("DataType=") + name), (ending{"Invalid data type", LINE, 1})) << name;
        }
}

TEST(DataType, StructuredDataAwaitTheirRun) {
    for (stanza_id kind : ATTRIBUTES)
        for (const char *name : {"SD", "SDArray"}) {
            opened c;
            bool dynamic = kind == DYNAMIC[0] || kind == DYNAMIC[1];
            c.cx.sd.announce(nullptr, nullptr, nullptr, 9);
            EXPECT_EQ(fed(c, kind, std::string("DataType=") + name), WELL);
            auto *record = sc_cb(c.cx, sc_tables[kind]);
            EXPECT_EQ(reinterpret_cast<char *>(c.cx.sd.value()), record + (dynamic ? 32 : 24));
            EXPECT_EQ(reinterpret_cast<char *>(c.cx.sd.section()), record + (dynamic ? 72 : 56));
            EXPECT_EQ(reinterpret_cast<char *>(c.cx.sd.highest_index()), record + (dynamic ? 124 : 64));
            EXPECT_EQ(c.cx.sd.attribute_type(), dynamic ? 1 : 0);
            const tbl &types = c.state(kind).dflt.tbl->cells;
            EXPECT_STREQ(types.tbl_name, std::string(name) == "SD" ? "VX_SD_PTR" : "VX_SD_PTR_ARRAY");
            EXPECT_EQ(c.state(kind).dflt.tbl->sd_type, std::string(name) == "SD" ? VX_SD_PTR : VX_SD_PTR_ARRAY);
            EXPECT_EQ(types.tbl_au, 32U);
            EXPECT_EQ(types.used(), 0U);
        }
}

TEST(DataType, OnlyStructuredDataAwaitARun) {
    for (const char *name : {"None", "Int32", "String", "RH", "SBS", "RHArray", "Float64Array"}) {
        opened c;
        EXPECT_EQ(fed(c, SC_DYNAMIC_RESOURCE_ATTRIBUTE, std::string("DataType=") + name), WELL);
        EXPECT_EQ(c.cx.sd.value(), nullptr);
        EXPECT_EQ(c.cx.sd.section(), nullptr);
        EXPECT_EQ(c.state(SC_DYNAMIC_RESOURCE_ATTRIBUTE).dflt.tbl, nullptr);
    }
}
/* ---- Defaults -------------------------------------------------------------------------------------------------- */

TEST(DefaultValue, ValuesAreCollectedInTheirOrder) {
    for (stanza_id kind : ATTRIBUTES)
        for (const inline_row &type : INLINE_TYPES)
            for (const char *array : {"", "Array"}) {
                opened c;
                std::string attr = kind == DYNAMIC[0] || kind == DYNAMIC[1] ? "InitialValue=" : "DefaultValue=";
                std::string before = (fed(c, kind, std::string("DataType=") + type.type + array), record_of(c, kind));
                EXPECT_EQ(fed(c, kind, attr + "9"), WELL);
                EXPECT_EQ(fed(c, kind, attr + "7"), WELL);
                const dflt_tbl &values = c.state(kind).dflt;
                EXPECT_EQ(values.num_elems, 2U);
                EXPECT_STREQ(values.tbl->cells.tbl_name, "DefaultValues");
                EXPECT_EQ(values.tbl->sd_type, VX_UNKNOWN);
                EXPECT_EQ(values.tbl->cells.tbl_au, 32U);
                auto cells = records_of<vx_value_t>(&values.tbl->cells);
                ASSERT_EQ(cells.size(), 2U);
                EXPECT_EQ(cells[0].val_uint64, type.nine);
                EXPECT_EQ(cells[1].val_uint64, type.seven);
                EXPECT_EQ(record_of(c, kind), before);
            }
}

TEST(DefaultValue, TextIsKeptUntilTheAttributeIsComplete) {
    opened c;
    EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "DataType=StringArray"), WELL);
    EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "DefaultValue=one, two"), WELL);
    EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "DefaultValue=three"), WELL);
    auto cells = records_of<vx_value_t>(&c.state(SC_PERSISTENT_RESOURCE_ATTRIBUTE).dflt.tbl->cells);
    ASSERT_EQ(cells.size(), 2U);
    EXPECT_STREQ(cells[0].ptr_char, "one, two"); /* nothing is split */
    EXPECT_STREQ(cells[1].ptr_char, "three");
}

TEST(DefaultValue, MustBeOfTheType) {
    const std::string NOT_HERE = "Default values not expected; place default values in individual *SDDef stanzas.";
    const std::pair<const char *, ending> rows[] = {{"Int32", INVALID},
                                                    {"Float64Array", INVALID},
                                                    {"None", INVALID},
                                                    {"RH", INVALID},
                                                    {"SBS", INVALID},
                                                    {"SD", {NOT_HERE, LINE, 1}},
                                                    {"SDArray", {NOT_HERE, LINE, 1}}};
    for (stanza_id kind : ATTRIBUTES)
        for (const auto &[type, end] : rows) {
            opened c;
            std::string attr = kind == DYNAMIC[0] || kind == DYNAMIC[1] ? "InitialValue" : "DefaultValue";
            EXPECT_EQ(fed(c, kind, std::string("DataType=") + type), WELL);
            EXPECT_EQ(fed(c, kind, attr + "=1,2"), end) << type;
        }
}

/* Deliberate: a number too large for its conversion makes a later 0, or limit value, fail. */
TEST(DefaultValue, ZeroFailsAfterAnOverflow) {
    opened c;
    fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "DataType=Int32");
    EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "DefaultValue=0"), WELL);
    EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "Id=99999999999999999999"), WELL);
    EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "DefaultValue=1"), WELL);
    for (const char *text : {"0", "2147483647", "-2147483648"})
        EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, std::string("DefaultValue=") + text), INVALID) << text;
}
/* ---- Ranges ---------------------------------------------------------------------------------------------------- */

/* No resource attribute is open, so that the class attribute's own record gets the range. */
void close_resource_attribute(opened &c) {
    c.cx.staged.cb_rsrc_dattr.ra_cb_ID = 0;
}

TEST(Range, BoundsAreOfTheType) {
    for (stanza_id kind : DYNAMIC)
        for (const inline_row &type : INLINE_TYPES) {
            opened c;
            if (kind == SC_DYNAMIC_CLASS_ATTRIBUTE)
                close_resource_attribute(c);
            const auto &attr = *reinterpret_cast<rsrc_dattr_t *>(sc_cb(c.cx, sc_tables[kind]));
            EXPECT_EQ(fed(c, kind, std::string("DataType=") + type.type), WELL);
            EXPECT_EQ(fed(c, kind, "Range=7,9"), WELL);
            EXPECT_EQ(attr.ra_min_value.val_uint64, type.seven);
            EXPECT_EQ(attr.ra_max_value.val_uint64, type.nine);
            EXPECT_EQ(c.cx.range.dattr_range_found, 1U);
        }
}

/* Each bound is a separate array, the upper one first. */
TEST(Range, ArraysBoundsAreArrays) {
    opened c;
    EXPECT_EQ(fed(c, SC_DYNAMIC_RESOURCE_ATTRIBUTE, "DataType=Float64Array"), WELL);
    EXPECT_EQ(fed(c, SC_DYNAMIC_RESOURCE_ATTRIBUTE, "Range=7,9"), WELL);
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattr.ra_max_value.val_uint64, cell32(0));
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattr.ra_min_value.val_uint64, cell32(16));
    EXPECT_EQ(c.string_table_at<vx_array_t>(0).element_count, 1U);
    EXPECT_EQ(c.string_table_at<vx_array_t>(0).elements[0].val_float64, 9.0);
    EXPECT_EQ(c.string_table_at<vx_array_t>(16).element_count, 1U);
    EXPECT_EQ(c.string_table_at<vx_array_t>(16).elements[0].val_float64, 7.0);
}

TEST(Range, TypesWithoutBoundsIgnoreTheLine) {
    for (stanza_id kind : DYNAMIC)
        for (const char *type : {"String", "Binary", "RH", "SD", "StringArray", "BinaryArray", "RHArray", "SDArray"}) {
            opened c;
            fed(c, kind, std::string("DataType=") + type);
            std::string before = record_of(c, kind);
            EXPECT_EQ(fed(c, kind, "Range=anything"), WELL) << type;
            EXPECT_EQ(record_of(c, kind), before) << type;
            EXPECT_EQ(c.cx.range.dattr_range_found, 0U) << type;
            EXPECT_NE(c.state(kind).opt_mask & 0x200, 0U) << type; /* a second one is one too many */
        }
}

TEST(Range, NeedsTwoValuesOfTheType) {
    const std::pair<std::pair<const char *, const char *>, ending> rows[] = {
        {{"Int32", "7"}, {"Range requires two values", LINE, 1}},
        {{"None", "7"}, {"Range requires two values", LINE, 1}},
        {{"Int32", "7,"}, INVALID},
        {{"Int32", ",7"}, INVALID},
        {{"Int32", "7,8,9"}, INVALID},
        {{"Int32", "x,8"}, INVALID},
        {{"Float32Array", "7,x"}, INVALID},
        {{"None", "7,9"}, INVALID},
        {{"SBS", "7,9"}, INVALID}};
    for (stanza_id kind : DYNAMIC)
        for (const auto &[texts, end] : rows) {
            opened c;
            fed(c, kind, std::string("DataType=") + texts.first);
            EXPECT_EQ(fed(c, kind, std::string("Range=") + texts.second), end) << texts.first << " " << texts.second;
        }
}

/* Deliberate: converted as what its stanza says, stored where another one is open. */
TEST(Range, OpenResourceAttributeGetsTheClassAttributes) {
    opened c;
    fed(c, SC_DYNAMIC_RESOURCE_ATTRIBUTE, "DataType=Int32");
    fed(c, SC_DYNAMIC_CLASS_ATTRIBUTE, "DataType=Float64");
    EXPECT_EQ(fed(c, SC_DYNAMIC_CLASS_ATTRIBUTE, "Range=7,9"), WELL);
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattr.ra_min_value.val_float64, 7.0);
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattr.ra_max_value.val_float64, 9.0);
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattrC.ra_max_value.val_uint64, 0U);
}

/* Deliberate: the mark is shared, and the first attribute to be completed takes it. */
TEST(Range, MarkIsTakenByTheNextCompletion) {
    compilation c;
    c.read(CLASS + dattr("DynamicClassAttribute", "Int32") + dattr("DynamicResourceAttribute", "Int32", {"Range=7,9"}) +
           "DynamicClassAttribute\n");
    const rsrc_dattr_t &other = c.filed<rsrc_dattr_t>(&rsrc_class_t::u_rc_dattrsC)[0];
    EXPECT_EQ(other.ra_min_value.val_uint64, 0U);
    EXPECT_EQ(other.ra_max_value.val_uint64, 0U);
    EXPECT_EQ(c.cx.range.dattr_range_found, 0U);
    c.read("DynamicResourceAttribute\n");
    const rsrc_dattr_t &owner = c.filed<rsrc_dattr_t>(&rsrc_class_t::u_rc_dattrs)[0];
    EXPECT_EQ(owner.ra_min_value.val_uint64, cell32(0));
    EXPECT_EQ(owner.ra_max_value.val_uint64, cell32(100));
}

} // namespace
