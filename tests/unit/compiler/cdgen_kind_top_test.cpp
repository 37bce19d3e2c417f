/* The records that a database's sections begin with: classes, maps, managers and variable classes. */

#include "compiler/source_fixture.h"

namespace {

using namespace from_source;

template <class Record> std::string bytes_of(const Record &record) {
    return {reinterpret_cast<const char *>(&record), sizeof record};
}

constexpr cdb_ref_t ABSENT = {{0xFFFFFFFF, 0}};

cdb_ref_t reference_to(tbl *t) {
    cdb_ref_t ref;
    stage_tbl(ref, t);
    return ref;
}

/* ---- Opening a class ------------------------------------------------------------------------------------------- */

struct table_row {
    cdb_ref_t rsrc_class_t::*field;
    const char *name;
    size_t unit;
};

/* In the order in which they are made. */
const table_row CLASS_TABLES[] = {
    {&rsrc_class_t::u_rc_pattrsC, "ClassPattrsC", 1152},
    {&rsrc_class_t::u_rc_dattrsC, "ClassDattrsC", 2176},
    {&rsrc_class_t::u_rc_pattrs, "ClassPattrs", 1152},
    {&rsrc_class_t::u_rc_dattrs, "ClassDattrs", 2176},
    {&rsrc_class_t::u_rc_actionsC, "ClassActionsC", 224},
    {&rsrc_class_t::u_rc_actions, "ClassActions", 224},
    {&rsrc_class_t::u_rc_errors, "ClassErrors", 192},
    {&rsrc_class_t::u_rc_depends, "ClassDepends", 32},
    {&rsrc_class_t::u_rc_sbs_defs, "ClassSBSDefs", 320},
    {&rsrc_class_t::u_rc_valid_vals, "ClassValidVals", 256},
    {&rsrc_class_t::u_rc_variety_lists, "ClassVarietyList", 64},
    {&rsrc_class_t::u_rc_strings, "ClassStrings", 8192},
    {&rsrc_class_t::u_rc_sd_defs, "ClassSDDefs", 160},
};

TEST(ResourceClass, OpensWithItsThirteenTables) {
    compilation c;
    init_class_tbl(c.cx);
    ASSERT_EQ(c.cx.store.tables.size(), std::size(CLASS_TABLES));
    for (size_t i = 0; i < std::size(CLASS_TABLES); ++i) {
        const tbl *table = c.table(CLASS_TABLES[i].field);
        ASSERT_EQ(table, &c.cx.store.tables[i]) << CLASS_TABLES[i].name;
        EXPECT_STREQ(table->tbl_name, CLASS_TABLES[i].name);
        EXPECT_EQ(table->tbl_au, CLASS_TABLES[i].unit) << CLASS_TABLES[i].name;
        EXPECT_EQ(table->tbl_base, nullptr) << CLASS_TABLES[i].name;
    }
}

TEST(ResourceClass, OpensAsEmptyRecord) {
    compilation c;
    c.cx.staged.cb_rsrc_class.rc_class_id = 5; /* of an earlier one */
    init_class_tbl(c.cx);
    rsrc_class_t expected = {};
    expected.rc_cb_ID = 0x43444231;
    for (auto field : {&rsrc_class_t::u_rc_name, &rsrc_class_t::u_rc_alias, &rsrc_class_t::u_rc_def_input,
                       &rsrc_class_t::u_rc_undef_input, &rsrc_class_t::u_rc_online_input,
                       &rsrc_class_t::u_rc_offline_input, &rsrc_class_t::u_rc_reset_input})
        expected.*field = ABSENT;
    for (size_t i = 0; i < std::size(CLASS_TABLES); ++i)
        expected.*CLASS_TABLES[i].field = reference_to(&c.cx.store.tables[i]);
    EXPECT_EQ(bytes_of(c.cx.staged.cb_rsrc_class), bytes_of(expected));
}

TEST(ResourceClass, NextOneCompletesTheOpenOne) {
    compilation c;
    c.read(CLASS + class_values({"Name=First"}) + CLASS);
    auto classes = records_of<rsrc_class_t>(&c.cx.sections.rsrc_class_tbl);
    ASSERT_EQ(classes.size(), 1U);
    EXPECT_EQ(c.cx.sections.rsrc_class_count, 1);
    EXPECT_STREQ(staged_content(classes[0].u_rc_strings)->tbl_base + classes[0].u_rc_name.offset[0], "First");
    EXPECT_EQ(staged_content(classes[0].u_rc_pattrsC), nullptr); /* nothing is in it */
    EXPECT_EQ(c.cx.store.tables.size(), 13U);                    /* they serve again, */
    for (const table_row &row : CLASS_TABLES) {
        EXPECT_STREQ(c.table(row.field)->tbl_name, row.name); /* each as any of them, */
        EXPECT_EQ(c.table(row.field)->tbl_au, row.unit) << row.name;
        EXPECT_EQ(c.table(row.field)->tbl_base, nullptr) << row.name; /* and empty */
    }
    EXPECT_TRUE(is_absent(c.cx.staged.cb_rsrc_class.u_rc_name));
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_dscr_msgid, 0U);
}

TEST(ResourceClass, StanzasGoOnWithTheRecordThatIsThere) {
    opened c;
    std::string before = bytes_of(c.cx.staged.cb_rsrc_class);
    init_class_tbl_fake(c.cx);
    EXPECT_EQ(bytes_of(c.cx.staged.cb_rsrc_class), before);
    EXPECT_EQ(c.cx.sections.rsrc_class_count, 0);
}

/* Deliberate: the later value counts, properties add up. */
TEST(ResourceClass, TwoStanzasFillOneRecord) {
    compilation c;
    c.read(CLASS + class_values({"Name=One"}) + stanza("ResourceClass", {"Properties=HasResources", "DisplayName=9"}) +
           "ResourceVariableClass\n");
    EXPECT_EQ(c.cx.sections.rsrc_class_count, 0);
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_props, 0xAU);
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_dscr_msgid, 1U);
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_disp_msgid, 9U);
    EXPECT_EQ(c.string_at(c.cx.staged.cb_rsrc_class.u_rc_name.offset[0]), "One");
}

TEST(ResourceClass, ValuesInFrontOfTheClassAreLost) {
    compilation c;
    c.read(class_values());
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_disp_msgid, 2U);
    c.read(CLASS);
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_disp_msgid, 0U);
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_props, 0U);
    EXPECT_EQ(c.cx.sections.rsrc_class_count, 0);
}

/* ---- Completing a class ---------------------------------------------------------------------------------------- */

TEST(ResourceClass, IsCopiedWholeAndClosed) {
    compilation c;
    c.read(CLASS + class_values({"Name=C"}));
    rsrc_class_t staged = c.cx.staged.cb_rsrc_class;
    cmplt_class_tbl(c.cx);
    EXPECT_EQ(c.cx.sections.rsrc_class_count, 1);
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_cb_ID, 0U);
    EXPECT_EQ(c.cx.sections.rsrc_class_tbl.used(), 224U);
    rsrc_class_t copy = records_of<rsrc_class_t>(&c.cx.sections.rsrc_class_tbl)[0];
    for (const table_row &row : CLASS_TABLES) { /* of these it has what is in them */
        bool filled = row.name == std::string("ClassStrings");
        EXPECT_EQ(staged_content(copy.*row.field) != nullptr, filled) << row.name;
        copy.*row.field = staged.*row.field = {};
    }
    EXPECT_EQ(bytes_of(copy), bytes_of(staged));
}

TEST(ResourceClass, WithoutANameIsCalledAfterTheOutput) {
    const std::pair<const char *, const char *> rows[] = {
        {"Abc.cdef", "Abc"},     {"dir/Abc.cdef", "dir/Abc"}, {"a.cdef.x", "a"},
        {"a.cdef/b.cdef", "a"},  {"Abc.cdefsrc", "Abc"},      {".cdef", ""},
        {"a.cde.cdef", "a.cde"},
    };
    for (auto [output, name] : rows) {
        opened c;
        c.cx.options.cdefname = output;
        add_to_tbl(c.cx, c.table(&rsrc_class_t::u_rc_strings), "before", 7);
        cmplt_class_tbl(c.cx);
        const rsrc_class_t &filed = records_of<rsrc_class_t>(&c.cx.sections.rsrc_class_tbl)[0];
        EXPECT_EQ(filed.u_rc_name.offset[0], 8U) << output;
        EXPECT_EQ(filed.u_rc_name.offset[1], 0U) << output;
        EXPECT_EQ(c.string_at(8), name) << output;
    }
}

TEST(ResourceClass, WithoutANameNeedsASuffixInTheOutputs) {
    for (const char *output : {"", "Abc", "Abc.cde", "Abc.CDEF", "Abc.c.def", "cdef"}) {
        opened unnamed, named;
        unnamed.cx.options.cdefname = named.cx.options.cdefname = output;
        EXPECT_EQ(ending_of([&] { cmplt_class_tbl(unnamed.cx); }),
                  (ending{"Invalid cdef out file name (must end in .cdef)", 0, 1}));
        EXPECT_EQ(unnamed.cx.sections.rsrc_class_count, 0);
        named.cx.staged.cb_rsrc_class.u_rc_name = {};
        EXPECT_EQ(ending_of([&] { cmplt_class_tbl(named.cx); }), WELL);
    }
}

TEST(ResourceClass, WithoutANameNeedsAStringTable) {
    opened c;
    c.cx.staged.cb_rsrc_class.u_rc_strings = {};
    EXPECT_EQ(ending_of([&] { cmplt_class_tbl(c.cx); }), (ending{"No tbl for strings table", LINE, 1}));
}

/* Deliberate: neither checked nor filled up. */
TEST(ResourceClass, TakesOpenAttributesAsTheyAre) {
    opened c;
    c.cx.staged.cb_rsrc_pattrC.ra_attr_id = 1;
    c.cx.staged.cb_rsrc_dattrC.ra_attr_id = 2;
    c.cx.staged.cb_rsrc_pattr.ra_attr_id = 3;
    c.cx.staged.cb_rsrc_dattr.ra_attr_id = 4;
    std::string pattrC = bytes_of(c.cx.staged.cb_rsrc_pattrC), dattrC = bytes_of(c.cx.staged.cb_rsrc_dattrC);
    std::string pattr = bytes_of(c.cx.staged.cb_rsrc_pattr), dattr = bytes_of(c.cx.staged.cb_rsrc_dattr);
    cmplt_class_tbl(c.cx);
    EXPECT_EQ(bytes_of(c.filed<rsrc_pattr_t>(&rsrc_class_t::u_rc_pattrsC)[0]), pattrC);
    EXPECT_EQ(bytes_of(c.filed<rsrc_dattr_t>(&rsrc_class_t::u_rc_dattrsC)[0]), dattrC);
    EXPECT_EQ(bytes_of(c.filed<rsrc_pattr_t>(&rsrc_class_t::u_rc_pattrs)[0]), pattr);
    EXPECT_EQ(bytes_of(c.filed<rsrc_dattr_t>(&rsrc_class_t::u_rc_dattrs)[0]), dattr);
    EXPECT_EQ(c.cx.staged.cb_rsrc_pattrC.ra_cb_ID, 0U);
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattrC.ra_cb_ID, 0U);
    EXPECT_EQ(c.cx.staged.cb_rsrc_pattr.ra_cb_ID, 0U);
    EXPECT_EQ(c.cx.staged.cb_rsrc_dattr.ra_cb_ID, 0U);
    EXPECT_TRUE(c.filed<rsrc_action_t>(&rsrc_class_t::u_rc_actions).empty()); /* an action is not an attribute */
    EXPECT_NE(c.cx.staged.cb_rsrc_action.ac_cb_ID, 0U);
}

TEST(ResourceClass, TakesNoClosedAttributes) {
    opened c;
    c.cx.staged.cb_rsrc_pattrC.ra_cb_ID = c.cx.staged.cb_rsrc_pattr.ra_cb_ID = 0;
    c.cx.staged.cb_rsrc_dattrC.ra_cb_ID = c.cx.staged.cb_rsrc_dattr.ra_cb_ID = 0;
    cmplt_class_tbl(c.cx);
    for (const table_row &row : CLASS_TABLES)
        EXPECT_TRUE(row.name == std::string("ClassStrings") || row.name == std::string("ClassVarietyList") ||
                    c.content(row.field) == nullptr)
            << row.name;
}

/* An attribute that was cut short refers to the first list of valid values if it has no list. */
TEST(ResourceClass, RemembersFlushedAttributesWithoutAList) {
    opened c;
    c.cx.sections.rsrc_class_count = 6;
    cmplt_class_tbl(c.cx); /* in the persistent class kind the reference is "none" from the start */
    ASSERT_EQ(c.cx.stray.strays.size(), 3U);
    const std::pair<cdb_ref_t rsrc_class_t::*, size_t> rows[] = {
        {&rsrc_class_t::u_rc_dattrsC, 64}, {&rsrc_class_t::u_rc_pattrs, 48}, {&rsrc_class_t::u_rc_dattrs, 64}};
    for (size_t i = 0; i < 3; ++i) {
        EXPECT_EQ(c.cx.stray.strays[i].rsrc_class, 6);
        EXPECT_EQ(c.cx.stray.strays[i].records, rows[i].first);
        EXPECT_EQ(c.cx.stray.strays[i].offset, rows[i].second);
    }
    opened with_lists;
    with_lists.cx.valid_values.pattr_vv_found = with_lists.cx.valid_values.dattr_vv_found =
        with_lists.cx.valid_values.dattrC_vv_found = 1;
    cmplt_class_tbl(with_lists.cx);
    EXPECT_TRUE(with_lists.cx.stray.strays.empty());
}

/* ---- The locator ----------------------------------------------------------------------------------------------- */

std::string named_attribute(std::string_view kind, std::string_view name, std::string_view id) {
    return stanza(kind, {std::string("Name=").append(name), "Description=1", "DisplayName=1",
                         std::string("Id=").append(id), "DataType=Int32", "VarietyRange=1,2"});
}

TEST(Locator, WaitsForTheEnd) {
    opened c;
    EXPECT_EQ(c.cx.later._rc_locator.ptr, nullptr);
    EXPECT_EQ(fed(c, SC_RESOURCE_CLASS, "Locator=Somewhere else"), WELL);
    EXPECT_EQ(fed(c, SC_RESOURCE_CLASS, "Locator=Here"), WELL);
    EXPECT_EQ(c.cx.later._rc_locator.ptr, &c.cx.staged.cb_rsrc_class.rc_locator);
    EXPECT_STREQ(c.cx.later._rc_locator.name, "Here");
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_locator, 0U);
}

TEST(Locator, IsTheIdOfThePersistentResourceAttributeOfItsName) {
    const std::string BEFORE = MAP + CLASS + class_values({"Locator=Here"}) +
                               named_attribute("PersistentClassAttribute", "Here", "90") +
                               named_attribute("PersistentResourceAttribute", "Other", "91");
    const std::string KIND = "PersistentResourceAttribute";
    const std::pair<std::string, vx_uint16_t> rows[] = {
        {named_attribute(KIND, "Here", "5"), 5},
        {named_attribute(KIND, "Here", "5") + named_attribute(KIND, "Here", "6"), 5}, /* the first one */
        {named_attribute(KIND, "Here", "0x10007"), 7},                                /* its low 16 bits */
        {named_attribute(KIND, "here", "5"), 0xFFFF},
        {named_attribute(KIND, "\"Here \"", "5"), 0xFFFF},
        {named_attribute(KIND, "Her", "5"), 0xFFFF},
        {"", 0xFFFF},
    };
    for (const auto &[text, locator] : rows) {
        compilation c;
        c.stage_all(BEFORE + text);
        EXPECT_EQ(records_of<rsrc_class_t>(&c.cx.sections.rsrc_class_tbl)[0].rc_locator, locator) << text;
    }
}

TEST(Locator, IsNoneUnlessGiven) {
    const std::string AFTER = named_attribute("PersistentResourceAttribute", "Here", "5") + MAP;
    for (const std::string &before : {CLASS + class_values(), CLASS + class_values({"Locator=\"\""})}) {
        compilation c;
        c.stage_all(before + AFTER);
        EXPECT_EQ(records_of<rsrc_class_t>(&c.cx.sections.rsrc_class_tbl)[0].rc_locator, 0xFFFFU);
    }
}

/* Deliberate: at the end, of the class that is open then. */
TEST(Locator, IsLookedUpInTheLastClass) {
    compilation c;
    c.stage_all(CLASS + class_values({"Locator=Here"}) + named_attribute("PersistentResourceAttribute", "Here", "5") +
                CLASS + class_values() + named_attribute("PersistentResourceAttribute", "Here", "6") + MAP);
    auto classes = records_of<rsrc_class_t>(&c.cx.sections.rsrc_class_tbl);
    ASSERT_EQ(classes.size(), 2U);
    EXPECT_EQ(classes[0].rc_locator, 0U);
    EXPECT_EQ(classes[1].rc_locator, 6U);
}

/* ---- The map and its manager ----------------------------------------------------------------------------------- */

TEST(Map, OpensAsEmptyRecordWithItsStrings) {
    compilation c;
    c.cx.staged.cb_rsrc_cmmap.rcm_last_key = 5;
    init_cmmap_tbl(c.cx);
    rsrc_cmmap_t expected = {};
    expected.rcm_cb_ID = 0x43444232;
    expected.u_rcm_strings = reference_to(&c.cx.store.tables.at(0));
    EXPECT_EQ(bytes_of(c.cx.staged.cb_rsrc_cmmap), bytes_of(expected));
    EXPECT_STREQ(c.cx.store.tables[0].tbl_name, "CMMapStrings");
    EXPECT_EQ(c.cx.store.tables[0].tbl_au, 8192U);
}

TEST(Map, StandsOnceInASource) {
    EXPECT_EQ(compilation().reading(MAP + "\n" + MAP), (ending{"Only one ClassToManagerMapping stanza allowed", 0, 1}));
}

/* And nothing else is required of it. */
TEST(Map, KeysMustNotDescend) {
    const ending DESCEND = {"Error: FirstKey is greater than LastKey.", LINE, 1};
    const std::pair<std::pair<vx_uint16_t, vx_uint16_t>, ending> rows[] = {
        {{0, 0}, WELL},          {{1, 100}, WELL}, {{7, 7}, WELL}, {{8, 7}, DESCEND}, {{0x8000, 0x7FFF}, DESCEND},
        {{0x7FFF, 0x8000}, WELL}};
    for (const auto &[keys, end] : rows) {
        opened c;
        c.cx.staged.cb_rsrc_cmmap.rcm_first_key = keys.first;
        c.cx.staged.cb_rsrc_cmmap.rcm_last_key = keys.second;
        std::string staged = bytes_of(c.cx.staged.cb_rsrc_cmmap);
        EXPECT_EQ(ending_of([&] { cmplt_cmmap_tbl(c.cx); }), end) << keys.first;
        ASSERT_EQ(c.cx.sections.rsrc_cmmap_count, end == WELL ? 1 : 0);
        if (end != WELL)
            continue;
        EXPECT_EQ(bytes_of(records_of<rsrc_cmmap_t>(&c.cx.sections.rsrc_cmmap_tbl)[0]), staged);
        EXPECT_EQ(c.cx.staged.cb_rsrc_cmmap.rcm_cb_ID, 0U);
    }
}

TEST(Manager, OpensAsEmptyRecordWithItsStrings) {
    compilation c;
    c.cx.staged.cb_rsrc_mgr.rm_spare = 5;
    init_mgr_tbl(c.cx);
    rsrc_mgr_t expected = {};
    expected.rm_cb_ID = 0x43444233;
    expected.u_rm_strings_table = reference_to(&c.cx.store.tables.at(0));
    EXPECT_EQ(bytes_of(c.cx.staged.cb_rsrc_mgr), bytes_of(expected));
    EXPECT_STREQ(c.cx.store.tables[0].tbl_name, "ManagerStrings");
    EXPECT_EQ(c.cx.store.tables[0].tbl_au, 8192U);
}

/* The number is the copy's only. */
TEST(Manager, IsNumberedInTheOrderOfCompletion) {
    compilation c;
    for (int i = 0; i < 3; ++i) /* the next one completes the open one */
        init_mgr_tbl(c.cx);
    c.cx.sections.rsrc_mgr_count = 65536 + 7;
    cmplt_mgr_tbl(c.cx);
    auto managers = records_of<rsrc_mgr_t>(&c.cx.sections.rsrc_mgr_tbl);
    ASSERT_EQ(managers.size(), 3U);
    EXPECT_EQ(managers[0].rm_id, 0U);
    EXPECT_EQ(managers[1].rm_id, 1U);
    EXPECT_EQ(managers[2].rm_id, 7U); /* the low 16 bits */
    EXPECT_EQ(managers[2].rm_cb_ID, 0x43444233U);
    EXPECT_EQ(c.cx.sections.rsrc_mgr_count, 65536 + 8);
    EXPECT_EQ(c.cx.staged.cb_rsrc_mgr.rm_id, 0U);
    EXPECT_EQ(c.cx.staged.cb_rsrc_mgr.rm_cb_ID, 0U);
}

TEST(Manager, NameIsKeptAndTheMapRefersToTheFirst) {
    opened c;
    c.cx.staged.cb_rsrc_cmmap.rcm_rm_ID = 9;
    EXPECT_EQ(fed(c, SC_CLASS_TO_MANAGER_MAPPING, "ResourceManager=Some manager"), WELL);
    EXPECT_EQ(c.cx.staged.cb_rsrc_cmmap.rcm_rm_ID, 0U);
    EXPECT_STREQ(c.cx.later.rm_name.get(), "Some manager");
    EXPECT_EQ(fed(c, SC_CLASS_TO_MANAGER_MAPPING, "ResourceManager=Other"),
              (ending{"Resource manager already defined: Some manager", 0, 1}));
    EXPECT_STREQ(c.cx.later.rm_name.get(), "Some manager");
}

TEST(Manager, IsMadeOfItsNameAtTheEnd) {
    compilation c;
    c.stage_all(CLASS + class_values() + MAP);
    auto managers = records_of<rsrc_mgr_t>(&c.cx.sections.rsrc_mgr_tbl);
    ASSERT_EQ(managers.size(), 1U);
    EXPECT_EQ(managers[0].rm_id, 0U);
    EXPECT_EQ(managers[0].u_rm_RMname.offset[0], 0U);
    EXPECT_EQ(managers[0].u_rm_RMname.offset[1], 0U);
    EXPECT_STREQ(staged_content(managers[0].u_rm_strings_table)->tbl_base, "Mgr");
    EXPECT_EQ(records_of<rsrc_cmmap_t>(&c.cx.sections.rsrc_cmmap_tbl)[0].rcm_rm_ID, 0U);
}

/* ---- Variable classes ------------------------------------------------------------------------------------------ */

TEST(VariableClass, OpensAsEmptyRecordWithItsStrings) {
    compilation c;
    c.cx.staged.cb_rsrc_variable_class.rvc_var_count = 5;
    init_var_class_tbl(c.cx);
    rsrc_variable_class_t expected = {};
    expected.rvc_cb_ID = 0x43444234;
    expected.u_rvc_compat_name = ABSENT;
    expected.u_rvc_string_tbl = reference_to(&c.cx.store.tables.at(0));
    EXPECT_EQ(bytes_of(c.cx.staged.cb_rsrc_variable_class), bytes_of(expected));
    EXPECT_STREQ(c.cx.store.tables[0].tbl_name, "VarClassStrings");
    EXPECT_EQ(c.cx.store.tables[0].tbl_au, 8192U);
}

TEST(VariableClass, StandsInStanzaOrder) {
    compilation c;
    c.read(stanza("ResourceVariableClass",
                  {"VariableClass=V", "ObservationInterval=1", "ReportingInterval=2", "Alias=W"}) +
           stanza("ResourceVariableClass", {"ReportingInterval=3"})); /* nothing is required of it */
    EXPECT_EQ(c.cx.sections.rsrc_var_class_count, 1);
    cmplt_var_class_tbl(c.cx);
    EXPECT_EQ(c.cx.sections.rsrc_var_class_count, 2);
    EXPECT_EQ(c.cx.staged.cb_rsrc_variable_class.rvc_cb_ID, 0U);
    auto records = records_of<rsrc_variable_class_t>(&c.cx.sections.rsrc_var_class_tbl);
    ASSERT_EQ(records.size(), 2U);
    EXPECT_EQ(records[0].rvc_obsv_interval, 1U);
    EXPECT_EQ(records[0].rvc_report_interval, 2U);
    EXPECT_STREQ(staged_content(records[0].u_rvc_string_tbl)->tbl_base + records[0].u_rvc_name.offset[0], "V");
    EXPECT_STREQ(staged_content(records[0].u_rvc_string_tbl)->tbl_base + records[0].u_rvc_compat_name.offset[0], "W");
    EXPECT_EQ(records[0].u_rvc_compat_name.offset[1], 0U);
    EXPECT_EQ(records[1].rvc_report_interval, 3U);
    EXPECT_EQ(records[1].rvc_obsv_interval, 0U);
    EXPECT_TRUE(is_absent(records[1].u_rvc_compat_name));
    EXPECT_EQ(records[1].rvc_var_count, 0U);
    EXPECT_EQ(staged_content(records[1].u_rvc_string_tbl), nullptr); /* no strings */
}

/* ---- All of them ----------------------------------------------------------------------------------------------- */

TEST(TopLevel, TablesHaveTheirUnitsAndNames) {
    cdgen cx;
    const std::pair<const tbl *, std::pair<size_t, const char *>> rows[] = {
        {&cx.sections.rsrc_class_tbl, {3584, "ResourceClasses"}},
        {&cx.sections.rsrc_mgr_tbl, {192, "ResourceManagers"}},
        {&cx.sections.rsrc_cmmap_tbl, {480, "ResourceCMMaps"}},
        {&cx.sections.rsrc_var_class_tbl, {320, "ResourceVariableClasses"}},
    };
    for (const auto &[table, expected] : rows) {
        EXPECT_EQ(table->tbl_au, expected.first);
        EXPECT_STREQ(table->tbl_name, expected.second);
        EXPECT_EQ(table->tbl_base, nullptr);
    }
}

TEST(TopLevel, EndOfTheSourceNeedsOneOfEach) {
    const std::string NO_MANAGER = stanza("ClassToManagerMapping", {"FirstKey=5", "LastKey=5"});
    const std::pair<std::string, ending> rows[] = {
        {"", {"No classes defined", 0, 1}},
        {class_values() + MAP, {"No classes defined", 0, 1}},
        {CLASS + class_values(), {"No class-to-manager maps defined", 0, 1}},
        {CLASS + NO_MANAGER, {"No resource manager defined", 0, 1}},
        {CLASS + stanza("ClassToManagerMapping", {"FirstKey=1"}) + "#\n#\n",
         {"Error: FirstKey is greater than LastKey.", 6, 1}},
        {CLASS + MAP, WELL},
        {MAP + CLASS, WELL},
    };
    for (const auto &[text, end] : rows)
        EXPECT_EQ(compilation().compiling(text), end) << text;
}

TEST(TopLevel, NameOfTheOutputIsLookedAtBeforeTheMap) {
    compilation c;
    c.cx.options.cdefname = "none";
    EXPECT_EQ(c.compiling(CLASS), (ending{"Invalid cdef out file name (must end in .cdef)", 0, 1}));
    EXPECT_EQ(c.cx.sections.rsrc_class_count, 0);
}

} // namespace
