/* The lines of a stanza, from the catalogue and the facts of fields. */

#include "cdef/source/lines.h"

#include "cdef/source/compose.h"
#include "cdef/source/error.h"
#include "cdef/source/steps.h"
#include "language/fields.h"

#include <gtest/gtest.h>

#include <cstring>
#include <set>

namespace {

using namespace cdef::source;

/* A record that no database has, and the attributes of its stanza. */
constexpr cdb::field fields[] = {
    {"id", 0, 4, 1, cdb::field_kind::number},
    {"text", 4, 8, 1, cdb::field_kind::reference, cdb::target::strings},
    {"name", 12, 8, 1, cdb::field_kind::reference, cdb::target::strings},
    {"group", 20, 2, 1, cdb::field_kind::number},
};
constexpr cdb::field_fact facts[] = {
    cdb::facts::number("id", "Id", "Id"),
    cdb::facts::filled("text", "NewText", "new text"),
    cdb::facts::name("name", "Name"),
    cdb::facts::filled("group", "NewGroup", "new group", cdb::meaning::NONE_IS_255),
};
constexpr cdb::record_format format = {"r", fields, facts, 24};
constexpr table_attrs attributes[] = {
    {"NewText", AT_STRING, 4, OPTIONAL | 0x1, 0},
    {"NewGroup", AT_UINT16, 20, OPTIONAL | 0x2, 0},
    {"Id", AT_ID, 0, 0x2, 0},
    {"Name", AT_STRING, 12, 0x1, 0},
};

/* The stanza's lines; text: offset of the new text. */
std::string written(std::uint32_t text, std::uint16_t group, std::string refusal = {}) {
    constexpr std::string_view strings("the name\0the text", 18);
    std::array<std::byte, 24> record = {};
    std::int32_t id = -7;
    std::memcpy(record.data(), &id, sizeof id);
    std::memcpy(record.data() + 4, &text, sizeof text);
    std::memcpy(record.data() + 20, &group, sizeof group);
    stanza_record from = {.record = {record, std::endian::native},
                          .strings = {std::as_bytes(std::span(strings)), std::endian::native},
                          .place = place_of("r", "x"),
                          .no_optional_lines = std::move(refusal)};
    source_writer out;
    for (const stanza_line &line : lines_of(attributes, format))
        write_plain_line(out, line, from);
    return out.text;
}

TEST(SourceLines, ANewRowIsALine) {
    EXPECT_EQ(written(9, 3), "\tName=the name\n\tId=-7\n\tNewText=the text\n\tNewGroup=3\n");
}

TEST(SourceLines, OptionalLinesThatSayTheDefaultAreLeftOut) {
    EXPECT_EQ(written(CDB_NONE, 255), "\tName=the name\n\tId=-7\n");
    EXPECT_EQ(written(CDB_NONE, 255, "too early"), "\tName=the name\n\tId=-7\n");
}

TEST(SourceLines, OptionalLinesThatCannotFollowAreRefused) {
    try {
        written(CDB_NONE, 3, "too early");
        FAIL();
    } catch (const no_source_error &e) {
        EXPECT_STREQ(e.what(), "no source: r 'x': too early");
    }
}

TEST(SourceLines, PropertiesAreNames) {
    constexpr props_t known[] = {{"Two", 0x2}, {"One", 0x1}};
    EXPECT_EQ(properties_text(0x3, known, {}), "Two,One");
    EXPECT_THROW(properties_text(0x5, known, {}), no_source_error);
}

/* An attribute whose line differs from the text of its field needs a special function. */
TEST(SourceLines, EachAttributeThatFillsAFieldIsWritten) {
    for (std::size_t i = 0; i < SC_COUNT; ++i) {
        auto stanza = static_cast<stanza_id>(i);
        std::vector<std::size_t> own = own_fields(stanza);
        EXPECT_EQ(lines_of(stanza).size(), sc_tables[i].sc_attrs.size());
        for (const stanza_line &line : lines_of(stanza)) {
            bool has_own = std::find(own.begin(), own.end(), line.field->offset) != own.end();
            EXPECT_TRUE(has_own || is_plain(line) || !language::fills(*line.attribute, *line.fact))
                << sc_tables[i].sc_name << " " << line.attribute->ta_name;
        }
    }
}

TEST(SourceLines, EachKindOfRunIsWritten) {
    std::set<std::string_view> written = {"PAttrSDDefinition", "DAttrSDDefinition", "ActionInSDDefinition",
                                          "ActionOutSDDefinition"};
    for (const class_input &input : class_inputs)
        written.insert(input.stanza());
    for (std::size_t i = 0; i < SC_COUNT; ++i)
        EXPECT_EQ(written.contains(sc_tables[i].sc_name), sc_tables[i].sc_sd_owner != nullptr) << sc_tables[i].sc_name;
}

} // namespace
