/* One attribute line: its syntax, its limits, the order and repetition of attributes, the traces, and names. */

#include "compiler/cdgen_attr.h"
#include "compiler/source_fixture.h"

#include <limits>

namespace {

using namespace from_source;

/* With a class whose name can be looked at. */
std::string class_name(opened &c) {
    return c.string_at(c.cx.staged.cb_rsrc_class.u_rc_name.offset[0]);
}

/* ---- Name and value -------------------------------------------------------------------------------------------- */

TEST(AttributeLine, ValueIsWhatFollowsTheFirstEqualsSign) {
    const std::pair<std::string, std::string> rows[] = {
        {"\tName=abc", "abc"},         {" Name=abc", "abc"},        {" \t Name=abc", "abc"},
        {"\tName=a=b", "a=b"},         {"\tName==", "="},           {"\tName= abc", " abc"},
        {"\tName=a b", "a b"},         {"\tName=a\"b", "a\"b"},     {"\tName=a\"", "a\""},
        {"\tName=a\"\"", "a\"\""},     {"\tName=\"abc\"", "abc"},   {"\tName= \t\"abc\"", "abc"},
        {"\tName=\" abc \"", " abc "}, {"\tName=\"a\"b\"", "a\"b"}, {"\tName=\"a\\b\"", "a\\b"},
        {"\tName=\"a=b\"", "a=b"},     {"\tName=\"\"\"", "\""},     {"\tName=\xff", "\xff"},
        {"\tName=abc\r", "abc\r"},
    };
    for (const auto &[line, value] : rows) {
        opened c;
        c.require_nothing(SC_RESOURCE_CLASS);
        EXPECT_EQ(c.feeding(SC_RESOURCE_CLASS, line), WELL) << line;
        EXPECT_EQ(class_name(c), value) << line;
    }
}

TEST(AttributeLine, LineOfBlanksIsNothing) {
    for (const char *line : {"", " ", "\t", " \t "}) {
        opened c;
        EXPECT_EQ(c.feeding(SC_RESOURCE_CLASS, line), WELL);
        EXPECT_EQ(c.cx.source.linepos(), 1 + static_cast<int>(strlen(line)));
    }
}

TEST(AttributeLine, TwoQuotesAreNoValueAndTheNameIsNotLookedAt) {
    for (const char *line : {"\tName=\"\"", "\tDescription=\"\"", "\tNonsense=\"\"", "\t=\"\""}) {
        opened c;
        vx_uint32_t name = c.cx.staged.cb_rsrc_class.u_rc_name.offset[0];
        EXPECT_EQ(c.feeding(SC_RESOURCE_CLASS, line), WELL) << line;
        EXPECT_EQ(c.state(SC_RESOURCE_CLASS).req_mask, 0U);
        EXPECT_EQ(c.state(SC_RESOURCE_CLASS).opt_mask, 0U);
        EXPECT_EQ(c.cx.staged.cb_rsrc_class.u_rc_name.offset[0], name);
        EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_dscr_msgid, 0U);
    }
}

TEST(AttributeLine, ColumnIsTheValues) {
    const std::pair<std::string, int> rows[] = {
        {"\tDescription=5", 14},  {" \t Description=5", 16}, {"\tDescription=\"5\"", 15}, {"\tDescription=  \"5\"", 17},
        {"\tDescription= 5", 14}, {"Description=5", 13},     {"\tNonsense=\"\"", 2},      {"  \tNonsense=\"\"", 4},
    };
    for (const auto &[line, column] : rows) {
        opened c;
        EXPECT_EQ(c.feeding(SC_RESOURCE_CLASS, line), WELL) << line;
        EXPECT_EQ(c.cx.source.linepos(), column) << line;
    }
}

/* ---- What is refused ------------------------------------------------------------------------------------------- */

struct refusal_row {
    stanza_id kind;
    std::string line;
    std::string message;
};

const std::string UNDEFINED = "Attribute name not defined in table (name/table): ";
const std::string UNMATCHED = "Unmatched double quotes for attribute: ";
const std::string TOO_LONG = "Attibute value exceeds maximum length: ";
const std::string TOO_EARLY = "Optional attribute discovered before all required attributes have been defined";
const std::string TWICE = "Already defined. Duplicated definitions not allowed for ";
const std::string MISSING = "Missing attribute value: ";

/* In the order in which mistakes are looked for: if there are two, the first one is reported. */
TEST(AttributeLine, IllFormedLinesAreRefused) {
    const std::string longest(1797, 'x');
    const refusal_row rows[] = {
        {SC_RESOURCE_CLASS, "\tName", "Missing '=' after attribute name"},
        {SC_RESOURCE_CLASS, "\tNonsense", "Missing '=' after attribute name"},
        {SC_RESOURCE_CLASS, "\tName \"x\"", "Missing '=' after attribute name"},
        {SC_RESOURCE_CLASS, "\tName=\"x", UNMATCHED + "Name"},
        {SC_RESOURCE_CLASS, "\tName=\"x\" ", UNMATCHED + "Name"},
        {SC_RESOURCE_CLASS, "\tName=\"x\"y", UNMATCHED + "Name"},
        {SC_RESOURCE_CLASS, "\tName=\"x\\\"", UNMATCHED + "Name"},
        {SC_RESOURCE_CLASS, "\tName=\"x\"\r", UNMATCHED + "Name"},
        {SC_RESOURCE_CLASS, "\tNonsense=\"x", UNMATCHED + "Nonsense"},
        {SC_RESOURCE_CLASS, "\tNonsense=" + longest + "x", TOO_LONG + "Nonsense"},
        {SC_RESOURCE_CLASS, "\tNonsense=" + longest, UNDEFINED + "NonsenseResourceClass"},
        {SC_RESOURCE_CLASS, "\tName =x", UNDEFINED + "Name ResourceClass"},
        {SC_RESOURCE_CLASS, "\tname=x", UNDEFINED + "nameResourceClass"},
        {SC_RESOURCE_CLASS, "\t=x", UNDEFINED + "ResourceClass"},
        {SC_RESOURCE_CLASS, "\tId=1", UNDEFINED + "IdResourceClass"},
        {SC_RESOURCE_CLASS, "\tNonsense=", UNDEFINED + "NonsenseResourceClass"},
        {SC_CLASS_ACTION, "\tDataType=Int32", UNDEFINED + "DataTypeClassAction"},
        {SC_DYNAMIC_CLASS_ATTRIBUTE, "\tValidValue=1", UNDEFINED + "ValidValueDynamicClassAttribute"},
        {SC_RESET_SD_DEFINITION, "\tName=x", UNDEFINED + "NameResetSDDefinition"},
        {SC_RESOURCE_CLASS, "\tLocator=x", TOO_EARLY + "Locator"},
    };
    for (const refusal_row &row : rows) {
        opened c;
        EXPECT_EQ(c.feeding(row.kind, row.line), (ending{row.message, LINE, 1})) << row.line;
    }
}

TEST(AttributeLine, EmptyValueIsMissing) {
    for (const char *line : {"\tName=", "\tName= \"\"", "\tName=\t\"\"", "\tName=\""}) {
        opened c; /* and the order of attributes is not looked at */
        EXPECT_EQ(c.feeding(SC_RESOURCE_CLASS, line), (ending{MISSING + "Name", LINE, 1})) << line;
        EXPECT_EQ(c.state(SC_RESOURCE_CLASS).opt_mask, 0U);
    }
}

TEST(AttributeLine, MissingValueShowsTheSourceOnStandardOutput) {
    opened c;
    c.cx.options.cdefsrc = "some/source.txt";
    EXPECT_EQ(output_of([&] { c.feed(SC_RESOURCE_CLASS, "\tDescription="); }), "In file some/source.txt: ");
    EXPECT_EQ(output_of([&] { c.feed(SC_RESOURCE_CLASS, "\tNonsense="); }), "");
}

TEST(AttributeLine, LongestValueHas1797Characters) {
    const std::string longest(1797, 'x');
    for (const char *quote : {"", "\""}) {
        std::string fits = quote, too_long = quote;
        fits.append(longest).append(quote);
        too_long.append(longest).append("x").append(quote);
        opened c;
        c.require_nothing(SC_RESOURCE_CLASS);
        EXPECT_EQ(c.feeding(SC_RESOURCE_CLASS, "\tName=" + fits), WELL);
        EXPECT_EQ(class_name(c), longest);
        EXPECT_EQ(c.feeding(SC_RESOURCE_CLASS, "\tLocator=" + fits), WELL);
        EXPECT_EQ(c.cx.later._rc_locator.name, longest);
        for (const char *name : {"Locator", "Name", "Description"})
            EXPECT_EQ(c.feeding(SC_RESOURCE_CLASS, std::string("\t").append(name).append("=").append(too_long)),
                      (ending{TOO_LONG + name, LINE, 1}));
    }
}

/* So that a long source takes no more memory than a short one. */
TEST(AttributeLine, ValuesOfALineGoWithTheNextOne) {
    opened c;
    std::vector<char *> free_room;
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "DataType=String"), WELL);
        EXPECT_EQ(fed(c, SC_PERSISTENT_RESOURCE_ATTRIBUTE, "ValidValue=some,text"), WELL);
        free_room.push_back(c.cx.line_texts.take(8));
    }
    EXPECT_EQ(free_room[1], free_room[0]);
    EXPECT_EQ(free_room[2], free_room[0]);
}

/* ---- Order and repetition -------------------------------------------------------------------------------------- */

struct fed_row {
    const char *line;
    vx_uint32_t required; /* the masks after it */
    vx_uint32_t optional;
};

struct kind_rows {
    stanza_id kind;
    std::vector<fed_row> rows;
};

const std::vector<fed_row> PATTR_ROWS = {
    {"\tName=x", 0x1, 0},
    {"\tDescription=1", 0x3, 0},
    {"\tDisplayName=1", 0x7, 0},
    {"\tId=1", 0xf, 0},
    {"\tDataType=Int32", 0x1f, 0},
    {"\tVarietyRange=1,2", 0x3f, 0},
    {"\tGroupID=1", 0x3f, 0x80000001},
    {"\tGroupName=1", 0x3f, 0x80000003},
    {"\tProperties=Public", 0x3f, 0x80000007},
    {"\tDefaultValue=1", 0x3f, 0x8000000f},
    {"\tValidValue=1", 0x3f, 0x8000001f},
    {"\tValueDisplayName=1", 0x3f, 0x8000003f},
    {"\tListActionRsrc=x", 0x3f, 0x8000007f},
    {"\tListActionClass=x", 0x3f, 0x800000ff},
};

const std::vector<fed_row> DATTR_ROWS = {
    {"\tVariableType=State", 0x40, 0}, /* in any order */
    {"\tVarietyRange=1,2", 0x60, 0},
    {"\tDataType=Int32", 0x70, 0},
    {"\tId=1", 0x78, 0},
    {"\tDisplayName=1", 0x7c, 0},
    {"\tDescription=1", 0x7e, 0},
    {"\tName=x", 0x7f, 0},
    {"\tReArmDescription=1", 0x7f, 0x80002000},
    {"\tReArmExpression=x", 0x7f, 0x80003000},
    {"\tExpressionDescription=1", 0x7f, 0x80003800},
    {"\tExpression=x", 0x7f, 0x80003c00},
    {"\tRange=1,2", 0x7f, 0x80003e00},
    {"\tVariableClass=x", 0x7f, 0x80003f00},
    {"\tListActionClass=x", 0x7f, 0x80003f80},
    {"\tListActionRsrc=x", 0x7f, 0x80003fc0},
    {"\tValidStateValue=1", 0x7f, 0x80003fd0},
    {"\tValueDisplayName=1", 0x7f, 0x80003ff0},
    {"\tInitialValue=1", 0x7f, 0x80003ff8},
    {"\tProperties=Public", 0x7f, 0x80003ffc},
    {"\tGroupName=1", 0x7f, 0x80003ffe},
    {"\tGroupID=1", 0x7f, 0x80003fff},
};

const std::vector<fed_row> ACTION_ROWS = {
    {"\tName=x", 0x1, 0},
    {"\tVarietyRange=1,2", 0x11, 0},
    {"\tDisplayName=1", 0x15, 0},
    {"\tId=1", 0x1d, 0},
    {"\tDescription=1", 0x1f, 0},
    {"\tProperties=LongRun", 0x1f, 0x80000001},
    {"\tConfirmationMsg=1", 0x1f, 0x80000009},
    {"\tPermission=x", 0x1f, 0x8000000d},
    {"\tTimeOut=1", 0x1f, 0x8000000f},
};

const std::vector<kind_rows> KIND_ROWS = {
    {SC_CONTROL_DEFINITION, {{"\tFileVersion=1", 0x1, 0}}},
    {SC_CLASS_TO_MANAGER_MAPPING,
     {{"\tFirstKey=1", 0x2, 0},
      {"\tLastKey=1", 0x6, 0},
      {"\tMessageCatalog=x", 0xe, 0},
      {"\tDescriptiveMessageSet=1", 0x1e, 0},
      {"\tResourceManager=x", 0x1f, 0}}},
    {SC_RESOURCE_VARIABLE_CLASS,
     {{"\tObservationInterval=1", 0x2, 0},
      {"\tReportingInterval=1", 0x6, 0},
      {"\tVariableClass=x", 0x7, 0},
      {"\tAlias=x", 0x7, 0x80000001}}},
    {SC_RESOURCE_CLASS,
     {{"\tResourcePermTemplate=x", 0x10, 0},
      {"\tDescription=1", 0x11, 0},
      {"\tProperties=CanDefine", 0x15, 0},
      {"\tClassPermTemplate=x", 0x1d, 0},
      {"\tDisplayName=1", 0x1f, 0},
      {"\tName=x", 0x1f, 0x80000010},
      {"\tLocator=x", 0x1f, 0x80000012}}},
    {SC_PERSISTENT_RESOURCE_ATTRIBUTE, PATTR_ROWS},
    {SC_PERSISTENT_CLASS_ATTRIBUTE, PATTR_ROWS},
    {SC_DYNAMIC_RESOURCE_ATTRIBUTE, DATTR_ROWS},
    {SC_DYNAMIC_CLASS_ATTRIBUTE, DATTR_ROWS},
    {SC_CLASS_ACTION, ACTION_ROWS},
    {SC_RESOURCE_ACTION, ACTION_ROWS},
    {SC_RESET_SD_DEFINITION,
     {{"\tElementIndex=0", 0x8, 0},
      {"\tElementName=x", 0x9, 0},
      {"\tDataType=Int32", 0x19, 0},
      {"\tDisplayName=1", 0x1d, 0},
      {"\tDescription=1", 0x1f, 0},
      {"\tValidValue=1", 0x1f, 0x80000002},
      {"\tValueDisplayName=1", 0x1f, 0x80000006}}},
};

std::string name_in(std::string_view line) {
    return std::string(line.substr(1, line.find('=') - 1));
}

TEST(AttributeOrder, MasksAddUpWhatWasSeen) {
    for (const kind_rows &kind : KIND_ROWS) {
        opened c;
        for (const fed_row &row : kind.rows) {
            SCOPED_TRACE(std::string(sc_tables[kind.kind].sc_name) + row.line);
            ASSERT_EQ(c.feeding(kind.kind, row.line), WELL);
            EXPECT_EQ(c.state(kind.kind).req_mask, row.required);
            EXPECT_EQ(c.state(kind.kind).opt_mask, row.optional);
        }
    }
}

TEST(AttributeOrder, SecondTimeIsRefusedForAllButTheRepeatable) {
    for (const kind_rows &kind : KIND_ROWS) {
        opened c;
        for (const fed_row &row : kind.rows)
            ASSERT_EQ(c.feeding(kind.kind, row.line), WELL);
        for (const fed_row &row : kind.rows) {
            std::string name = name_in(row.line);
            bool repeats = name == "VarietyRange" || name == "ValidValue" || name == "ValidStateValue" ||
                           name == "ValueDisplayName" || name == "DefaultValue";
            EXPECT_EQ(c.feeding(kind.kind, row.line), repeats ? WELL : (ending{TWICE + name, LINE, 1})) << row.line;
        }
    }
}

/* Each one while one required attribute is missing, the last one that its kind has. */
TEST(AttributeOrder, OptionalAttributesComeAfterAllRequiredOnes) {
    for (const kind_rows &kind : KIND_ROWS) {
        opened c;
        vx_uint32_t complete_mask = sc_tables[kind.kind].req_mask_cmplt;
        for (const fed_row &row : kind.rows) {
            if (row.optional == 0)
                continue;
            for (vx_uint32_t bit = 1; bit <= complete_mask; bit <<= 1) {
                c.state(kind.kind) = {.req_mask = complete_mask & ~bit, .opt_mask = 0, .order = {}, .dflt = {}};
                EXPECT_EQ(c.feeding(kind.kind, row.line), (ending{TOO_EARLY + name_in(row.line), LINE, 1}));
                EXPECT_EQ(c.state(kind.kind).opt_mask, 0U);
            }
        }
    }
}

/* Deliberate: two of the bits that make it complete belong to no attribute. */
TEST(AttributeOrder, ActionResponseElementTakesNoOptionalAttribute) {
    opened c;
    for (const char *line :
         {"\tElementName=x", "\tDescription=1", "\tDisplayName=1", "\tElementIndex=0", "\tDataType=Int32"})
        EXPECT_EQ(c.feeding(SC_ACTION_OUT_SD_DEFINITION, line), WELL);
    EXPECT_EQ(c.state(SC_ACTION_OUT_SD_DEFINITION).req_mask, 0x1fU);
    for (std::string name : {"ValidValue", "ValueDisplayName", "DefaultValue"})
        EXPECT_EQ(c.feeding(SC_ACTION_OUT_SD_DEFINITION, "\t" + name + "=1"), (ending{TOO_EARLY + name, LINE, 1}));
}

TEST(AttributeOrder, RefusedLineStoresNothing) {
    opened c;
    c.feed(SC_RESOURCE_CLASS, "\tDescription=5");
    EXPECT_NE(c.feeding(SC_RESOURCE_CLASS, "\tDescription=6"), WELL);
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_dscr_msgid, 5U);
    EXPECT_NE(c.feeding(SC_RESOURCE_CLASS, "\tName=x"), WELL);
    EXPECT_TRUE(is_absent(c.cx.staged.cb_rsrc_class.u_rc_name));
}

/* ---- Traces ---------------------------------------------------------------------------------------------------- */

TEST(AttributeTrace, LevelTwoShowsTheLineAndTheMask) {
    opened c;
    c.cx.options.debugLevel = 2;
    EXPECT_EQ(output_of([&] { c.feed(SC_RESOURCE_CLASS, "\tDescription=123"); }),
              "ResourceClass: found attr: \"Description\", value: \"123\",length: 3\n"
              "Added 1 to mask, which is now 1\n");
    EXPECT_EQ(output_of([&] { c.feed(SC_RESOURCE_CLASS, "\tResourcePermTemplate=\" q=\""); }),
              "ResourceClass: found attr: \"ResourcePermTemplate\", value: \" q=\",length: 3\n"
              "Added 10 to mask, which is now 11\n");
}

TEST(AttributeTrace, OptionalAttributeShowsNoMask) {
    opened c;
    c.require_nothing(SC_CLASS_ACTION);
    c.cx.options.debugLevel = 2;
    EXPECT_EQ(output_of([&] { c.feed(SC_CLASS_ACTION, "\tTimeOut=5"); }),
              "ClassAction: found attr: \"TimeOut\", value: \"5\",length: 1\n");
}

TEST(AttributeTrace, LineIsShownBeforeItsOrderIsLookedAt) {
    opened c;
    c.cx.options.debugLevel = 3;
    EXPECT_EQ(output_of([&] { c.feed(SC_RESOURCE_CLASS, "\tLocator=y"); }),
              "ResourceClass: found attr: \"Locator\", value: \"y\",length: 1\n");
}

TEST(AttributeTrace, LevelOneAndSkippedLinesShowNothing) {
    opened c;
    c.cx.options.debugLevel = 1;
    EXPECT_EQ(output_of([&] { c.feed(SC_RESOURCE_CLASS, "\tDescription=1"); }), "");
    c.cx.options.debugLevel = 2;
    EXPECT_EQ(output_of([&] { c.feed(SC_RESOURCE_CLASS, "\tDisplayName=\"\""); }), "");
}

/* ---- Names ----------------------------------------------------------------------------------------------------- */

struct name_row {
    stanza_id kind;
    const char *attr;
    size_t offset; /* of the field in the record */
    tbl *(*strings)(const cdgen &);
};

tbl *class_strings(const cdgen &cx) {
    return staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings);
}
tbl *map_strings(const cdgen &cx) {
    return staged_tbl(cx.staged.cb_rsrc_cmmap.u_rcm_strings);
}
tbl *variable_class_strings(const cdgen &cx) {
    return staged_tbl(cx.staged.cb_rsrc_variable_class.u_rvc_string_tbl);
}

TEST(Name, StandsInItsKindsStringTable) {
    const name_row rows[] = {
        {SC_CLASS_TO_MANAGER_MAPPING, "MessageCatalog", 8, map_strings},
        {SC_RESOURCE_VARIABLE_CLASS, "VariableClass", 8, variable_class_strings},
        {SC_RESOURCE_VARIABLE_CLASS, "Alias", 16, variable_class_strings},
        {SC_RESOURCE_CLASS, "Name", 8, class_strings},
        {SC_PERSISTENT_RESOURCE_ATTRIBUTE, "Name", 8, class_strings},
        {SC_PERSISTENT_CLASS_ATTRIBUTE, "Name", 8, class_strings},
        {SC_DYNAMIC_RESOURCE_ATTRIBUTE, "Name", 8, class_strings},
        {SC_DYNAMIC_RESOURCE_ATTRIBUTE, "VariableClass", 16, class_strings},
        {SC_DYNAMIC_RESOURCE_ATTRIBUTE, "Expression", 80, class_strings},
        {SC_DYNAMIC_RESOURCE_ATTRIBUTE, "ReArmExpression", 88, class_strings},
        {SC_DYNAMIC_CLASS_ATTRIBUTE, "Expression", 80, class_strings},
        {SC_RESOURCE_ACTION, "Name", 24, class_strings},
        {SC_CLASS_ACTION, "Name", 24, class_strings},
    };
    for (const name_row &row : rows) {
        opened c;
        tbl *strings = row.strings(c.cx);
        add_to_tbl(c.cx, strings, "nine char", 10); /* 16 bytes go before */
        std::string expected = record_of(c, row.kind).replace(row.offset, 4, number(16, 4));
        EXPECT_EQ(fed(c, row.kind, std::string(row.attr) + "=the text"), WELL) << row.attr;
        EXPECT_EQ(record_of(c, row.kind), expected) << row.attr;
        EXPECT_EQ(std::string(strings->tbl_base + 16, strings->used() - 16),
                  std::string("the text\0\0\0\0\0\0\0\0", 16));
    }
}

TEST(Name, NeedsAStringTable) {
    for (auto [kind, line] : {std::pair{SC_RESOURCE_CLASS, "Name=x"},
                              {SC_RESOURCE_ACTION, "Name=x"},
                              {SC_DYNAMIC_CLASS_ATTRIBUTE, "Expression=x"},
                              {SC_RESET_SD_DEFINITION, "ElementName=x"}}) {
        opened c;
        c.cx.staged.cb_rsrc_class = {};
        EXPECT_EQ(fed(c, kind, line), (ending{"No tbl for strings table", LINE, 1})) << line;
    }
}

/* ---- Handing on ------------------------------------------------------------------------------------------------ */

TEST(AttributeLine, TypeWithoutAHandlerIsUnknown) {
    opened c;
    char value[] = "1";
    for (int type : {-1, 32, 33, std::numeric_limits<int>::max()}) {
        const table_attrs attr = {"Other", type, 0, 0x1, 0};
        EXPECT_EQ(ending_of([&] {
                      store_value({c.cx, attr, value, 1});
                  }),
                  (ending{"Unknown attribute", LINE, 1}))
            << type;
    }
}

} // namespace
