/* Actions of resources and of classes, their varieties and permissions; and the lists that stanzas begin. */

#include "compiler/given_interface.h"
#include "compiler/source_fixture.h"

namespace {

using namespace from_source;

struct action_row {
    stanza_id id;
    rsrc_action_t staging_records::*record;
    cdb_ref_t rsrc_class_t::*records;
    vx_uint32_t cb_id;
    void (*init)(cdgen &);
    void (*complete)(cdgen &);

    std::string name() const {
        return sc_tables[id].sc_name;
    }
};

const action_row KINDS[] = {
    {SC_RESOURCE_ACTION, &staging_records::cb_rsrc_action, &rsrc_class_t::u_rc_actions, 0x43444262, init_action_tbl,
     cmplt_action_tbl},
    {SC_CLASS_ACTION, &staging_records::cb_rsrc_actionC, &rsrc_class_t::u_rc_actionsC, 0x43444263, init_actionC_tbl,
     cmplt_actionC_tbl},
};

std::string bytes_of(const rsrc_action_t &record) {
    return {reinterpret_cast<const char *>(&record), sizeof record};
}

rsrc_action_t completed(compilation &c, const action_row &kind, lines more = {}) {
    c.read(CLASS + action(kind.name(), more));
    kind.complete(c.cx);
    auto records = c.filed<rsrc_action_t>(kind.records);
    EXPECT_EQ(records.size(), 1U);
    EXPECT_EQ((c.cx.staged.*kind.record).ac_cb_ID, 0U);
    return records[0];
}

TEST(Action, OpensAsEmptyRecord) {
    for (const action_row &kind : KINDS) {
        compilation c;
        init_class_tbl(c.cx);
        mk_vty_sec(c.cx); /* another list before its own */
        (c.cx.staged.*kind.record).ac_timeout = 3;
        c.cx.valid_values.vvdisp = 0;
        kind.init(c.cx);
        rsrc_action_t expected = {};
        expected.ac_cb_ID = kind.cb_id;
        expected.u_ac_variety_list = {{16, 0}};
        expected.u_ac_sd_input = expected.u_ac_sd_resp = {{0xFFFFFFFF, 0}};
        EXPECT_EQ(bytes_of(c.cx.staged.*kind.record), bytes_of(expected));
        EXPECT_FALSE(c.cx.valid_values.vvdisp.has_value());
    }
}

/* Deliberate: the resource kind's message names the other kind. */
TEST(Action, NeedsAClass) {
    for (const action_row &kind : KINDS)
        for (auto step : {kind.init, kind.complete}) {
            opened c;
            c.cx.staged.cb_rsrc_class.rc_cb_ID = 0;
            EXPECT_EQ(ending_of([&] { step(c.cx); }), (ending{"No class for class action", LINE, 1}));
            compilation nothing_open;
            EXPECT_EQ(nothing_open.reading(kind.name()), (ending{"No class for class action", 1, 1}));
        }
}

TEST(Action, NeedsAllItsRequiredAttributes) {
    for (const action_row &kind : KINDS)
        for (vx_uint32_t bit = 1; bit <= 0x1f; bit <<= 1) {
            opened c;
            c.state(kind.id).req_mask = 0x1f & ~bit;
            for (auto step : {kind.init, kind.complete})
                EXPECT_EQ(ending_of([&] { step(c.cx); }), (ending{"Previous stanza incomplete", LINE, 1}));
            EXPECT_TRUE(c.filed<rsrc_action_t>(kind.records).empty());
            c.state(kind.id).req_mask = 0x1f;
            kind.init(c.cx);
            EXPECT_EQ(c.filed<rsrc_action_t>(kind.records).size(), 1U);
            EXPECT_EQ((c.cx.staged.*kind.record).ac_cb_ID, kind.cb_id);
        }
}

TEST(Action, HoldsWhatItsStanzaSays) {
    for (const action_row &kind : KINDS) {
        compilation c;
        rsrc_action_t filed =
            completed(c, kind, {"Properties=LongRun", "TimeOut=36", "Permission=x", "ConfirmationMsg=37"});
        EXPECT_EQ(filed.ac_cb_ID, kind.cb_id);
        EXPECT_EQ(c.string_at(filed.u_ac_name.offset[0]), "A");
        EXPECT_EQ(filed.ac_dscr_msgid, 31U);
        EXPECT_EQ(filed.ac_disp_msgid, 32U);
        EXPECT_EQ(filed.ac_action_id, 33);
        EXPECT_EQ(c.varieties_at(filed.u_ac_variety_list), (ranges{{34, 35}}));
        EXPECT_EQ(filed.ac_props, 0x1U);
        EXPECT_EQ(filed.ac_timeout, 36U);
        EXPECT_EQ(filed.ac_perms, 0x200U);
        EXPECT_EQ(filed.ac_confirm_msgid, 37U);
        EXPECT_TRUE(is_absent(filed.u_ac_sd_input));
        EXPECT_TRUE(is_absent(filed.u_ac_sd_resp));
    }
}

TEST(Action, GetsADefaultPermissionOnly) {
    for (const action_row &kind : KINDS) {
        compilation c;
        rsrc_action_t filed = completed(c, kind);
        EXPECT_EQ(filed.ac_perms, 0x40U);
        EXPECT_EQ(filed.ac_props, 0U);
        EXPECT_EQ(filed.ac_timeout, 0U);
        EXPECT_EQ(filed.ac_confirm_msgid, 0U);
    }
}

/* Whatever other optional attributes there are: they share the mark that they are optional. */
TEST(Action, PermissionIsDefaultedUnlessGiven) {
    const std::pair<std::string, vx_uint32_t> rows[] = {
        {"TimeOut=1", 0x40},    {"Properties=Public", 0x40}, {"ConfirmationMsg=1", 0x40},
        {"Permission=s", 0x40}, {"Permission=q", 0x1},       {"Permission=r", 0},
    };
    for (const action_row &kind : KINDS)
        for (const auto &[line, mask] : rows) {
            compilation c;
            EXPECT_EQ(completed(c, kind, {line}).ac_perms, mask) << line;
        }
}

TEST(Action, StandsInStanzaOrder) {
    for (const action_row &kind : KINDS) {
        compilation c;
        c.read(CLASS + action(kind.name(), {"TimeOut=5", "Permission=q"}) + action(kind.name(), {"TimeOut=6"}));
        kind.complete(c.cx);
        auto records = c.filed<rsrc_action_t>(kind.records);
        ASSERT_EQ(records.size(), 2U);
        EXPECT_EQ(records[0].ac_timeout, 5U);
        EXPECT_EQ(records[0].ac_perms, 0x1U);
        EXPECT_EQ(records[1].ac_timeout, 6U);
        EXPECT_EQ(records[1].ac_perms, 0x40U);
        EXPECT_NE(records[0].u_ac_variety_list.offset[0], records[1].u_ac_variety_list.offset[0]);
    }
}

TEST(Permission, IsItsFirstLettersMask) {
    const std::pair<std::string, vx_uint32_t> rows[] = {
        {"q", 0x1},   {"l", 0x2},   {"e", 0x4},    {"v", 0x8},    {"d", 0x10}, {"c", 0x20},
        {"s", 0x40},  {"o", 0x80},  {"a", 0x100},  {"x", 0x200},  {"qx", 0x1}, {"aardvark", 0x100},
        {"r", 0x777}, {"Q", 0x777}, {" q", 0x777}, {"rq", 0x777}, /* no letter of the list: left as it is */
    };
    for (const auto &[text, mask] : rows) {
        opened c;
        c.cx.staged.cb_rsrc_action.ac_perms = 0x777;
        EXPECT_EQ(fed(c, SC_RESOURCE_ACTION, "Permission=" + text), WELL);
        EXPECT_EQ(c.cx.staged.cb_rsrc_action.ac_perms, mask) << text;
    }
}

/* ---- Varieties ------------------------------------------------------------------------------------------------- */

const cdb_ref_t &variety_list(const opened &c, stanza_id kind) {
    switch (kind) {
    case SC_PERSISTENT_RESOURCE_ATTRIBUTE:
        return c.cx.staged.cb_rsrc_pattr.u_ra_variety_list;
    case SC_DYNAMIC_CLASS_ATTRIBUTE:
        return c.cx.staged.cb_rsrc_dattrC.u_ra_variety_list;
    default:
        return c.cx.staged.cb_rsrc_actionC.u_ac_variety_list;
    }
}

TEST(Variety, RangesStandInTheirOrder) {
    for (stanza_id kind : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_DYNAMIC_CLASS_ATTRIBUTE, SC_CLASS_ACTION}) {
        opened c;
        EXPECT_EQ(c.varieties_at(variety_list(c, kind)), ranges{});
        EXPECT_EQ(fed(c, kind, "VarietyRange=1,5"), WELL);
        EXPECT_EQ(c.varieties_at(variety_list(c, kind)), (ranges{{1, 5}}));
    }
    opened c; /* the last list of its table, as it is while its stanza is read */
    for (const char *line : {"VarietyRange=0x10,-1", "VarietyRange= 7 x, 010", "VarietyRange=9,3", "VarietyRange=,"})
        EXPECT_EQ(fed(c, SC_CLASS_ACTION, line), WELL);
    EXPECT_EQ(c.varieties_at(c.cx.staged.cb_rsrc_actionC.u_ac_variety_list),
              (ranges{{16, 0xFFFFFFFF}, {7, 8}, {9, 3}, {0, 0}}));
}

TEST(Variety, NeedsOneComma) {
    const std::pair<const char *, const char *> rows[] = {
        {"VarietyRange=1", "Incorrect variety format"}, {"VarietyRange=1;2", "Incorrect variety format"},
        {"VarietyRange=1,2,3", "Too many varieties"},   {"VarietyRange=1,2,", "Too many varieties"},
        {"VarietyRange=1,2 x,3", "Too many varieties"}, {"VarietyRange=,,", "Too many varieties"}};
    for (stanza_id kind : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_DYNAMIC_CLASS_ATTRIBUTE, SC_CLASS_ACTION})
        for (auto [line, message] : rows) {
            opened c;
            EXPECT_EQ(fed(c, kind, line), (ending{message, LINE, 1})) << line;
        }
}

/* ---- Lists ----------------------------------------------------------------------------------------------------- */

TEST(Section, IsAnEmptyListWithRoomForItsFirstEntry) {
    const struct {
        vx_uint32_t (*make)(cdgen &);
        cdb_ref_t rsrc_class_t::*table;
        size_t size;
        vx_uint32_t cb_id;
    } rows[] = {{mk_sd_sec, &rsrc_class_t::u_rc_sd_defs, 40, 0x43444266},
                {mk_vv_sec, &rsrc_class_t::u_rc_valid_vals, 32, 0x43444235},
                {mk_vty_sec, &rsrc_class_t::u_rc_variety_lists, 16, 0x43444267}};
    for (const auto &row : rows) {
        compilation c;
        init_class_tbl(c.cx);
        for (size_t i = 0; i < 5; ++i) {
            EXPECT_EQ(row.make(c.cx), i * row.size);
            std::string expected = number(row.cb_id, 4) + std::string(row.size - 4, '\0');
            EXPECT_EQ(std::string(c.table(row.table)->tbl_base + i * row.size, row.size), expected);
        }
        EXPECT_EQ(c.table(row.table)->used(), 5 * row.size);
    }
}

TEST(Section, OfDefaultValuesIsForStructuredDataOnly) {
    compilation c;
    tbl values(32, "values");
    EXPECT_EQ(mk_sd_data_tbl(c.cx, VX_SD_PTR, &values), 0U);
    EXPECT_EQ(mk_sd_data_tbl(c.cx, VX_SD_PTR_ARRAY, &values), 24U);
    EXPECT_EQ(mk_sd_data_tbl(c.cx, VX_SD_PTR, &values), 40U);
    EXPECT_EQ(std::string(values.tbl_base, values.used()), std::string(64, '\0'));
    c.cx.source.linenum = LINE;
    for (int type : {0, 10, 12, 21, 23})
        EXPECT_EQ(ending_of([&] { mk_sd_data_tbl(c.cx, static_cast<vx_data_type_t>(type), &values); }),
                  (ending{"mk_sd_data_tbl: non-SD type - internal error", LINE, 1}));
}

} // namespace
