/* Lines and comments, stanza headers, and what a header closes, keeps and opens. */

#include "compiler/source_fixture.h"

#include <cerrno>
#include <limits>

namespace {

using namespace from_source;

/* ---- Lines ----------------------------------------------------------------------------------------------------- */

struct text_row {
    std::string line;
    std::string text;
};

/* What is left of a line is shown by the header that it is not. */
TEST(Reader, LineEndsAtItsCommentAndLosesWhatTrails) {
    const text_row rows[] = {
        {"X", "X"},
        {"X \t ", "X"},
        {"X y", "X y"},
        {"X#y", "X"},
        {"X # y", "X"},
        {"X//y", "X"},
        {"X/*y*/z", "X"},
        {"X/y", "X/y"},
        {"X/", "X/"},
        {"/X", "/X"},
        {"/", "/"}, /* text, even alone */
        {"/ # y", "/"},
        {"\"/\"", "\"/\""},
        {"\"//\"", "\"//\""},
        {"\"/*", "\"/*"},
        {"X/#y", "X/"},
        {"X/ /y", "X/ /y"},
        {"X///y", "X"},
        {"X\"#\"y#z", "X\"#\"y"},
        {"X\"//\"y//z", "X\"//\"y"},
        {"X\"/*\"y/*z", "X\"/*\"y"},
        {"X\"y\"#z", "X\"y\""},
        {"X\"y# \t##", "X\"y"}, /* inside quotes no comment, but at the end */
        {"X\"#", "X\""},
        {"\"X", "\"X"},
        {"\"//X", "\"//X"},
        {"X\r", "X\r"},
        {"X\\\"#y", "X\\\"#y"}, /* a backslash means nothing here: the quote opens */
        {"\xff", "\xff"},
    };
    for (const text_row &row : rows)
        EXPECT_EQ(compilation().reading(row.line + "\n"), (ending{"Invalid table name: " + row.text, 1, 1}))
            << row.line;
}

TEST(Reader, LineWithoutTextIsSkippedAndCounted) {
    const char *rows[] = {"",     " ",       "\t \t",   "#",     "# X",    "  # X",  "//",
                          "// X", " \t// X", "/*",      "/* X",  "/*",     "/**",    "\"\"",
                          "\"",   " \"\"",   "\"# X\"", "\"\"#", "\"\"//", "\" # X", "#\"\" X"};
    for (const char *row : rows)
        EXPECT_EQ(compilation().reading(std::string(row) + "\nX\n"), (ending{"Invalid table name: X", 2, 1})) << row;
}

TEST(Reader, CommentEndsWithItsLine) {
    EXPECT_EQ(compilation().reading("/* from here\nto here */\n"), (ending{"Invalid table name: to here */", 2, 1}));
}

TEST(Reader, LastLineNeedsNoNewline) {
    compilation c;
    c.read("ControlDefinition\n\tFileVersion=1.2.3.4");
    EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_version, 0x01020304U);
    EXPECT_EQ(c.cx.source.linenum, 2);
    EXPECT_EQ(compilation().reading("\n\nX"), (ending{"Invalid table name: X", 3, 1}));
}

TEST(Reader, SourceMayBeEmpty) {
    compilation c;
    EXPECT_EQ(c.reading(""), WELL);
    EXPECT_EQ(c.cx.source.linenum, 0);
    EXPECT_EQ(c.cx.framing.scp, nullptr);
}

/* A read takes 254 characters, the newline among them; each one counts. */
TEST(Reader, LongLineCountsOncePerRead) {
    const std::pair<size_t, int> rows[] = {{1, 1},   {253, 1}, {254, 2}, {255, 2},
                                           {300, 2}, {507, 2}, {508, 3}, {762, 4}};
    for (auto [length, reads] : rows)
        EXPECT_EQ(compilation().reading(std::string(length, '#') + "\nX\n"),
                  (ending{"Invalid table name: X", reads + 1, 1}))
            << length;
}

TEST(Reader, SecondPartOfALongLineIsALineOfItsOwn) {
    std::string comment(254, '#');
    EXPECT_EQ(compilation().reading(comment + "X\n"), (ending{"Invalid table name: X", 2, 1}));
    EXPECT_EQ(compilation().reading(comment + "\tX\n"), (ending{"Attribute found but no table defined yet", 2, 1}));
    EXPECT_EQ(compilation().reading(comment + " # X\nY\n"), (ending{"Invalid table name: Y", 3, 1}));
}

TEST(Reader, LongValueIsCutWhereItsReadEnds) {
    compilation c;
    std::string start = "\tMessageCatalog=";
    std::string fits(254 - start.size(), 'm');
    EXPECT_EQ(c.reading("ClassToManagerMapping\n" + start + fits + "X\n"), (ending{"Invalid table name: X", 3, 1}));
    const auto *strings = staged_tbl(c.cx.staged.cb_rsrc_cmmap.u_rcm_strings)->tbl_base;
    EXPECT_EQ(strings + c.cx.staged.cb_rsrc_cmmap.u_rcm_msg_file.offset[0], fits);
}

/* The source comes in pieces that know nothing of lines, nor of comments and quotes. */
TEST(Reader, LineMayStandAcrossPiecesOfTheFile) {
    for (size_t blank = 65536 - 60; blank <= 65536; ++blank) {
        compilation c;
        c.read(std::string(blank, '\n') + "ControlDefinition # X\n\tFileVersion=\"1.2.3.4\" // Y\n");
        ASSERT_EQ(c.cx.staged.cb_rsrc_class.rc_version, 0x01020304U) << blank;
        ASSERT_EQ(c.cx.source.linenum, static_cast<int>(blank) + 2);
    }
}

TEST(Reader, LineNumberStopsAtTheLargest) {
    constexpr int LARGEST = std::numeric_limits<int>::max();
    compilation c;
    c.cx.source.linenum = LARGEST - 1;
    EXPECT_EQ(c.reading("\n\n\nX\n"), (ending{"Invalid table name: X", LARGEST, 1}));
}

/* ---- The file -------------------------------------------------------------------------------------------------- */

TEST(Reader, FileThatCannotBeOpened) {
    compilation c;
    std::string missing = c.source + "/none";
    EXPECT_EQ(ending_of([&] { cache_input_data(c.cx, missing.c_str()); }),
              (ending{missing + ": cannot open because: No such file or directory", 0, ENOENT}));
}

TEST(Reader, FileThatCannotBeRead) {
    compilation c;
    c.read("");
    c.source = std::filesystem::path(c.output).parent_path();
    c.cx.options.cdefsrc = c.source.c_str();
    EXPECT_EQ(ending_of([&] { cache_input_data(c.cx, c.cx.options.cdefsrc); }),
              (ending{c.source + ": cannot read because: Is a directory", 0, EISDIR}));
    EXPECT_EQ(c.cx.source.cdb_fp.fd, -1);
}

TEST(Reader, FileIsClosedAtItsEndAndAfterAFailure) {
    compilation well, ill;
    well.read(CLASS);
    EXPECT_EQ(well.cx.source.cdb_fp.fd, -1);
    EXPECT_NE(ill.reading("X\n"), WELL);
    EXPECT_EQ(ill.cx.source.cdb_fp.fd, -1);
}

/* ---- Headers --------------------------------------------------------------------------------------------------- */

TEST(Reader, HeaderMayBeFollowedByBlanksAndAComment) {
    for (const char *row : {"ControlDefinition", "ControlDefinition \t ", "ControlDefinition  # X",
                            "ControlDefinition#", "ControlDefinition // X", "ControlDefinition/* X"}) {
        compilation c;
        c.read(row);
        EXPECT_EQ(c.cx.framing.table_id, SC_CONTROL_DEFINITION) << row;
        EXPECT_EQ(c.cx.staged.cb_rsrc_class.rc_cb_ID, 0x43444231U) << row;
    }
}

TEST(Reader, HeaderMustBeAKindsName) {
    for (std::string row : {"ControlDefinitions", "ControlDefinitio", "controlDefinition", "ControlDefinition X",
                            "ControlDefinition\r", "\"ControlDefinition\"", "Name=x"})
        EXPECT_EQ(compilation().reading(row + "\n"), (ending{"Invalid table name: " + row, 1, 1})) << row;
}

TEST(Reader, IndentedLineIsAnAttributeLine) {
    for (std::string indent : {" ", "\t", "\t \t"}) {
        std::string line = indent + "ControlDefinition\n";
        EXPECT_EQ(compilation().reading(line), (ending{"Attribute found but no table defined yet", 1, 1}));
        EXPECT_EQ(compilation().reading(CLASS + line), (ending{"Missing '=' after attribute name", 3, 1}));
    }
}

TEST(Reader, EachSourceBeginsWithoutAStanza) {
    compilation c;
    c.read(CLASS);
    EXPECT_EQ(c.reading("\tFileVersion=2\n"), (ending{"Attribute found but no table defined yet", 3, 1}));
}

TEST(Reader, EveryKindHasAHeader) {
    for (int id = 0; id < SC_COUNT; ++id) {
        compilation c;
        std::string header = sc_tables[static_cast<size_t>(id)].sc_name;
        std::string before = is_attr_SD(id) != nullptr ? pattr("PersistentClassAttribute", "SD") : "";
        c.read(CLASS);
        c.read(before + stanza(header));
        EXPECT_EQ(c.cx.framing.table_id, id);
        EXPECT_EQ(c.cx.framing.scp, &sc_tables[static_cast<size_t>(id)]);
        EXPECT_EQ(c.cx.framing.curr_sd_scp, c.cx.framing.scp);
    }
}

TEST(Reader, HeaderRemembersThePreviousKind) {
    compilation c;
    c.read(CLASS);
    EXPECT_EQ(c.cx.framing.prev_scp, nullptr);
    c.read(class_values());
    EXPECT_EQ(c.cx.framing.prev_scp, &sc_tables[SC_CONTROL_DEFINITION]);
    c.read(MAP);
    EXPECT_EQ(c.cx.framing.prev_scp, &sc_tables[SC_RESOURCE_CLASS]);
    EXPECT_EQ(c.cx.framing.scp, &sc_tables[SC_CLASS_TO_MANAGER_MAPPING]);
}

TEST(Reader, HeaderForgetsWhatTheKindsLastStanzaHad) {
    for (stanza_id kind : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE}) {
        compilation c;
        std::string name = sc_tables[kind].sc_name;
        c.read(CLASS + pattr(name, "Int32", {"GroupID=1", "DefaultValue=3"}));
        stanza_state &state = c.cx.framing.stanzas[kind];
        EXPECT_EQ(state.req_mask, 0x3fU);
        EXPECT_EQ(state.opt_mask, 0x80000009U);
        EXPECT_EQ(state.dflt.num_elems, 1U);
        c.read(name + "\n");
        EXPECT_EQ(state.req_mask, 0U);
        EXPECT_EQ(state.opt_mask, 0U);
        EXPECT_EQ(state.dflt.tbl, nullptr);
        EXPECT_EQ(state.dflt.num_elems, 0U);
    }
}

TEST(Reader, HeaderKeepsWhatOtherKindsHave) {
    compilation c;
    c.read(CLASS + pattr("PersistentResourceAttribute", "Int32", {"GroupID=1", "DefaultValue=3"}) +
           "PersistentClassAttribute\n");
    const stanza_state &state = c.cx.framing.stanzas[SC_PERSISTENT_RESOURCE_ATTRIBUTE];
    EXPECT_EQ(state.req_mask, 0x3fU);
    EXPECT_EQ(state.opt_mask, 0x80000009U);
    EXPECT_EQ(state.dflt.num_elems, 1U);
}

/* ---- What a header closes -------------------------------------------------------------------------------------- */

/* Records of the kinds that a class has, in their tables. */
struct filed_row {
    std::string name; /* of the row */
    std::string text; /* after the class */
    size_t pattrs, pattrsC, dattrs, dattrsC, actions, actionsC;
};

TEST(Reader, HeaderClosesActionsAndItsOwnKindOnly) {
    const std::string P = pattr("PersistentResourceAttribute", "Int32"),
                      PC = pattr("PersistentClassAttribute", "Int32"), D = dattr("DynamicResourceAttribute", "Int32"),
                      DC = dattr("DynamicClassAttribute", "Int32"), A = action("ResourceAction"),
                      AC = action("ClassAction");
    const filed_row rows[] = {
        {"nothing is closed by the end", P + PC + D + DC, 0, 0, 0, 0, 0, 0},
        {"attributes wait for their own kind", P + PC + D + DC + "ResourceVariableClass\n", 0, 0, 0, 0, 0, 0},
        {"attributes wait for their own kind, others' stanzas", P + PC + D + DC + A + "ResourceClass\n", 0, 0, 0, 0, 1,
         0},
        {"persistent resource attribute", P + P, 1, 0, 0, 0, 0, 0},
        {"persistent class attribute", PC + PC, 0, 1, 0, 0, 0, 0},
        {"dynamic resource attribute", D + D, 0, 0, 1, 0, 0, 0},
        {"dynamic class attribute", DC + DC, 0, 0, 0, 1, 0, 0},
        {"resource action, by an attribute", A + P, 0, 0, 0, 0, 1, 0},
        {"class action, by an attribute", AC + P, 0, 0, 0, 0, 0, 1},
        {"resource action, by a class action", A + AC, 0, 0, 0, 0, 1, 0},
        {"class action, by a resource action", AC + A, 0, 0, 0, 0, 0, 1},
        {"actions, by their own kind", A + A + AC + AC, 0, 0, 0, 0, 2, 1},
        {"action, by the map", A + MAP, 0, 0, 0, 0, 1, 0},
        {"action, by no structured data", A + element("ActionInSDDefinition", 0, "Int32"), 0, 0, 0, 0, 0, 0},
        {"action, by no structured data of the class", AC + element("OnlineSDDefinition", 0, "Int32"), 0, 0, 0, 0, 0,
         0},
    };
    for (const filed_row &row : rows) {
        compilation c;
        c.read(CLASS + row.text);
        EXPECT_EQ(c.filed<rsrc_pattr_t>(&rsrc_class_t::u_rc_pattrs).size(), row.pattrs) << row.name;
        EXPECT_EQ(c.filed<rsrc_pattr_t>(&rsrc_class_t::u_rc_pattrsC).size(), row.pattrsC) << row.name;
        EXPECT_EQ(c.filed<rsrc_dattr_t>(&rsrc_class_t::u_rc_dattrs).size(), row.dattrs) << row.name;
        EXPECT_EQ(c.filed<rsrc_dattr_t>(&rsrc_class_t::u_rc_dattrsC).size(), row.dattrsC) << row.name;
        EXPECT_EQ(c.filed<rsrc_action_t>(&rsrc_class_t::u_rc_actions).size(), row.actions) << row.name;
        EXPECT_EQ(c.filed<rsrc_action_t>(&rsrc_class_t::u_rc_actionsC).size(), row.actionsC) << row.name;
    }
}

TEST(Reader, IncompleteStanzaIsReportedAtTheHeaderThatClosesIt) {
    const text_row rows[] = {
        {"PersistentResourceAttribute\n\tName=x\n#\nPersistentResourceAttribute\n", "6"},
        {"PersistentClassAttribute\n\tName=x\nPersistentClassAttribute\n", "5"},
        {"DynamicResourceAttribute\nDynamicResourceAttribute\n", "4"},
        {"ResourceAction\n\tName=x\nMisspelt\n", ""}, /* the name is looked up first */
        {"ResourceAction\n\tName=x\nPersistentClassAttribute\n", "5"},
        {"ClassAction\n\tName=x\nClassToManagerMapping\n", "5"},
        {"ResetSDDefinition\n\tElementName=x\nResetSDDefinition\n", "5"},
        {"ResetSDDefinition\n\tElementName=x\nDefineSDDefinition\n", "5"},
        {"ResetSDDefinition\n\tElementName=x\nResourceClass\n", "5"},
    };
    for (const text_row &row : rows) {
        ending expected = row.text.empty() ? ending{"Invalid table name: Misspelt", 5, 1}
                                           : ending{"Previous stanza incomplete", std::stoi(row.text), 1};
        EXPECT_EQ(compilation().reading(CLASS + row.line), expected) << row.line;
    }
}

/* ---- Structured data ------------------------------------------------------------------------------------------- */

TEST(Reader, PlainHeaderForgetsTheStructuredAttribute) {
    compilation c;
    c.read(CLASS + pattr("PersistentResourceAttribute", "SD"));
    EXPECT_EQ(c.cx.sd.value(), &c.cx.staged.cb_rsrc_pattr.ra_dflt_value);
    EXPECT_EQ(c.cx.sd.section(), &c.cx.staged.cb_rsrc_pattr.u_ra_sd);
    EXPECT_EQ(c.cx.sd.highest_index(), &c.cx.staged.cb_rsrc_pattr.ra_max_sd_idx);
    c.read("ResourceVariableClass\n");
    EXPECT_EQ(c.cx.sd.value(), nullptr);
    EXPECT_EQ(c.cx.sd.section(), nullptr);
    EXPECT_EQ(c.cx.sd.highest_index(), nullptr);
}

TEST(Reader, AttributeRunMustFollowAnAttributeOfAnSdType) {
    const std::pair<std::string, int> rows[] = {
        {"", 1},
        {CLASS, 3},
        {CLASS + pattr("PersistentResourceAttribute", "Int32"), 10},
        {CLASS + dattr("DynamicClassAttribute", "StringArray"), 11},
        {CLASS + pattr("PersistentResourceAttribute", "SD") + "ResourceVariableClass\n", 11},
        {CLASS + pattr("PersistentResourceAttribute", "SD") + element("OnlineSDDefinition", 0, "Int32"), 16},
        {CLASS + pattr("PersistentResourceAttribute", "SD") + action("ResourceAction"), 16},
    };
    for (const auto &[before, line] : rows)
        for (const char *kind : {"PAttrSDDefinition", "DAttrSDDefinition"})
            EXPECT_EQ(compilation().reading(before + kind),
                      (ending{"Incorrect attribute type preceding this SD definition", line, 1}))
                << before;
}

TEST(Reader, AttributeRunTakesOverTheAttributesCollection) {
    compilation c;
    c.read(CLASS + dattr("DynamicClassAttribute", "SDArray") + element("DAttrSDDefinition", 0, "Int32"));
    const stanza_state &run = c.cx.framing.stanzas[SC_DATTR_SD_DEFINITION];
    EXPECT_NE(run.dflt.tbl, nullptr);
    EXPECT_EQ(run.dflt.tbl, c.cx.framing.stanzas[SC_DYNAMIC_CLASS_ATTRIBUTE].dflt.tbl);
    c.read(element("DAttrSDDefinition", 1, "Int32"));
    EXPECT_EQ(run.dflt.num_elems, 2U);
    EXPECT_EQ(run.dflt.tbl, c.cx.framing.stanzas[SC_DYNAMIC_CLASS_ATTRIBUTE].dflt.tbl);
}

TEST(Reader, PlainRunStartsWithoutACollection) {
    compilation c;
    c.cx.framing.stanzas[SC_RESET_SD_DEFINITION].dflt = {std::make_shared<dflt_values>("VX_SD_PTR", VX_SD_PTR), 7};
    c.read(CLASS + "ResetSDDefinition\n");
    EXPECT_EQ(c.cx.framing.stanzas[SC_RESET_SD_DEFINITION].dflt.tbl, nullptr);
    EXPECT_EQ(c.cx.framing.stanzas[SC_RESET_SD_DEFINITION].dflt.num_elems, 0U);
}

TEST(Reader, EveryStructuredDataHeaderStartsTheMasksAnew) {
    compilation c;
    c.read(CLASS + element("ResetSDDefinition", 0, "Int32", {"ValidValue=1"}));
    stanza_state &state = c.cx.framing.stanzas[SC_RESET_SD_DEFINITION];
    EXPECT_EQ(state.req_mask, 0x1fU);
    EXPECT_EQ(state.opt_mask, 0x80000002U);
    c.read("ResetSDDefinition\n");
    EXPECT_EQ(state.req_mask, 0U);
    EXPECT_EQ(state.opt_mask, 0U);
}

} // namespace
