/* The work that a file can cause. These tests do not measure time but count findings: an object that is visited twice
 * is reported twice. Each image has one object to which many records refer, and an error in each part of that
 * object. */

#include "reader/extent.h"

#include "reader/image_files.h"

namespace {

constexpr std::uint32_t NONE = 0xFFFFFFFF;

using words = std::vector<std::uint32_t>;

/* ---- Images with many records of one kind, in this machine's order ---------------------------------------------- */

/* The contents of a class. Its records are persistent or dynamic attributes of a resource, all alike. */
struct parts {
    std::size_t attributes = 1;
    words attribute;         /* 18 words: a persistent one; 34: a dynamic one */
    std::size_t step_at = 0; /* the word of it that grows by 8 from record to record; 0: none */
    words varieties;
    words structures;
    words valid_values;
    words strings;
};

void append(words &to, const words &more) {
    to.insert(to.end(), more.begin(), more.end());
}

std::uint32_t bytes_of(const words &of) {
    return static_cast<std::uint32_t>(of.size() * sizeof(std::uint32_t));
}

/* Two 16-bit fields, as they follow each other. */
std::uint32_t pair(std::uint16_t first, std::uint16_t second) {
    return std::bit_cast<std::uint32_t>(std::array<std::uint16_t, 2>{first, second});
}

void append_ref(words &to, std::uint32_t offset) {
    append(to, {offset, 0});
}

words class_of(const parts &p) {
    auto records = static_cast<std::uint32_t>(p.attributes * p.attribute.size() * sizeof(std::uint32_t));
    bool dynamic = p.attribute.size() == 34;
    auto count = static_cast<std::uint16_t>(p.attributes);
    std::uint32_t varieties = 224 + records;
    std::uint32_t structures = varieties + bytes_of(p.varieties);
    std::uint32_t valid_values = structures + bytes_of(p.structures);
    std::uint32_t strings = valid_values + bytes_of(p.valid_values);
    words made = {0x43444231, 0};
    for (std::uint32_t ref : {0u,           NONE,   224u, 224u,      224u, dynamic ? 224u : varieties,
                              NONE,         NONE,   NONE, NONE,      NONE, varieties,
                              varieties,    0u,     0u,   varieties, 0u,   structures,
                              valid_values, strings})
        append_ref(made, ref);
    append(made, {0, dynamic ? pair(0, count) : pair(count, 0), 0, 0});
    append(made, {bytes_of(p.varieties), 0, bytes_of(p.structures), bytes_of(p.valid_values)});
    append(made, {0, 0, 0, pair(0, 0xFFFF), 0, 0});
    for (std::uint32_t i = 0; i < p.attributes; ++i) {
        append(made, p.attribute);
        if (p.step_at != 0)
            made[made.size() - p.attribute.size() + p.step_at] += 8 * i;
    }
    for (const words *table : {&p.varieties, &p.structures, &p.valid_values, &p.strings})
        append(made, *table);
    return made;
}

/* A file of class sections; anchors more of them than there are all lead to the last one. */
std::vector<std::byte> file_of(const std::vector<words> &classes, std::size_t anchors) {
    words body, frame = {0, 0, 0x666D7431, 0, 0, 0, static_cast<std::uint32_t>(anchors), 0};
    append(frame, {pair(224, 60), pair(24, 40), pair(72, 136), pair(56, 48), pair(8, 0), 0, 0, 0, 0, 0, 0, 0});
    std::uint32_t start = static_cast<std::uint32_t>(80 + 16 * anchors), length = 0;
    for (std::size_t i = 0; i < anchors; ++i) {
        if (i < classes.size()) {
            append(body, classes[i]);
            start += length;
            length = bytes_of(classes[i]);
        }
        append(frame, {CDB_DSECT_CLASS, start, length, 0});
    }
    append(frame, body);
    frame[0] = frame[1] = bytes_of(frame) - 4;
    for (std::size_t i = 2; i < frame.size(); ++i)
        frame[1] ^= frame[i];
    auto bytes = std::as_bytes(std::span(frame));
    return {bytes.begin(), bytes.end()};
}

std::vector<std::byte> file_of(const parts &p) {
    return file_of({class_of(p)}, 1);
}

/* A persistent attribute: its type, default, and references. */
words persistent(std::uint32_t type, std::uint32_t value, std::uint32_t variety_list, std::uint32_t valid_values,
                 std::uint32_t structure, std::uint16_t highest_index) {
    return {0x43444239,
            0,
            0,
            0,
            0,
            0,
            value,
            0,
            0,
            type,
            variety_list,
            0,
            valid_values,
            0,
            structure,
            0,
            pair(highest_index, 0),
            0};
}

/* A dynamic attribute of a resource whose lower bound is given. */
words dynamic(std::uint32_t type, std::uint32_t lower_bound) {
    words made = {0x43444261, 0, 0, 0, 0, 0, 0, 0, NONE, 0, lower_bound, 0, NONE, 0, 0, 0, NONE, 0, NONE, 0};
    append(made, {NONE, 0, NONE, 0, 0, 0, type, 0, 0, 0, 0, pair(0xFFFF, 0), 0, 0});
    return made;
}

const words name = {0x41, 0};

std::size_t count_of(std::span<const cdb::finding> findings, std::string_view code) {
    return static_cast<std::size_t>(
        std::ranges::count(findings, code, [](const cdb::finding &f) { return f.broken->code; }));
}

std::vector<cdb::finding> findings_of(const std::vector<std::byte> &file) {
    return cdb::verify(cdb::database(file));
}

/* ---- How often verify() visits an object ------------------------------------------------------------------------ */

/* A section that overlaps another one is not visited: of 1000 anchors, only one leads to the wrong identifier. */
TEST(CdbVerifyWork, ManyAnchorsToOneSection) {
    words section = class_of({.attribute = persistent(VX_INT32, 0, 0, NONE, NONE, 0xFFFF),
                              .varieties = {0x43444267, 1, 1, 1},
                              .structures = {},
                              .valid_values = {},
                              .strings = name});
    section[0] = 1;
    auto findings = findings_of(file_of({section}, 1000));
    EXPECT_EQ(count_of(findings, "CDB301"), 1u);
    EXPECT_EQ(count_of(findings, "CDB203"), 999u);
    EXPECT_EQ(findings.size(), 1000u);
}

/* A list is visited for its first owner only: it has 500 owners and 500 wrong entries, and each entry is found once. */
TEST(CdbVerifyWork, ManyRecordsOfOneList) {
    words list = {0x43444235, 500};
    for (int i = 0; i < 500; ++i)
        append(list, {1, 0, 2, 0, 0, 0xFFFFFFFF});
    words varieties;
    for (int i = 0; i < 500; ++i)
        append(varieties, {0x43444267, 1, 1, 1});
    auto findings = findings_of(file_of({.attributes = 500,
                                         .attribute = persistent(VX_UINT32, 0, 0, 0, NONE, 0xFFFF),
                                         .step_at = 0,
                                         .varieties = varieties,
                                         .structures = {},
                                         .valid_values = list,
                                         .strings = name}));
    EXPECT_EQ(count_of(findings, "CDB106"), 500u);
    EXPECT_EQ(count_of(findings, "CDB308"), 499u + 499u); /* valid values; the one variety list that all refer to */
}

/* At each multiple of 8 begins a list that extends to the end of the table. The first list claims everything; the first
 * byte of each other list shows that it overlaps. */
TEST(CdbVerifyWork, OverlappingLists) {
    words varieties;
    for (std::uint32_t i = 0; i < 500; ++i)
        append(varieties, {0x43444267, 499 - i});
    auto findings = findings_of(file_of({.attributes = 500,
                                         .attribute = persistent(VX_UINT32, 0, 0, NONE, NONE, 0xFFFF),
                                         .step_at = 10,
                                         .varieties = varieties,
                                         .structures = {},
                                         .valid_values = {},
                                         .strings = name}));
    EXPECT_EQ(count_of(findings, "CDB308"), 499u);
    EXPECT_EQ(findings.size(), 499u + 499u); /* and the name that all have */
}

/* The same from the end: each list overlaps the ones after it, and claims 8 bytes before that is noticed. */
TEST(CdbVerifyWork, OverlappingListsFromTheEnd) {
    words varieties;
    for (std::uint32_t i = 0; i < 500; ++i)
        append(varieties, {0x43444267, 499 - i});
    words last = persistent(VX_UINT32, 0, 499 * 8, NONE, NONE, 0xFFFF);
    parts p = {.attributes = 500,
               .attribute = last,
               .step_at = 0,
               .varieties = varieties,
               .structures = {},
               .valid_values = {},
               .strings = name};
    words section = class_of(p);
    for (std::uint32_t i = 0; i < 500; ++i)
        section[56 + 18 * i + 10] = 8 * (499 - i);
    auto findings = findings_of(file_of({section}, 1));
    EXPECT_EQ(count_of(findings, "CDB308"), 499u);
}

/* Each structure contains the next one twice: there are 2 to the 20th paths to the last, and 20 second references. */
words twice_each(std::size_t levels) {
    words strings = name;
    for (std::uint32_t i = 0; i < levels; ++i) {
        std::uint32_t next = i + 1 < levels ? 8 + 40 * (i + 1) : NONE;
        append(strings, {2, 0, VX_SD_PTR, 0, next, 0, VX_SD_PTR, 0, next, 0});
    }
    return strings;
}

const words two_structures = {0x43444266, 2, 0, 0, VX_SD_PTR, 0, NONE, 0, 0, 0, 0, 0, VX_SD_PTR, 0, NONE, 0, 0, 0};

TEST(CdbVerifyWork, StructuresThatShareStructures) {
    auto findings = findings_of(file_of({.attribute = persistent(VX_SD_PTR, 8, 0, NONE, 0, 1),
                                         .varieties = {0x43444267, 1, 1, 1},
                                         .structures = two_structures,
                                         .valid_values = {},
                                         .strings = twice_each(21)}));
    EXPECT_EQ(count_of(findings, "CDB403"), 20u + 2u); /* and the elements' names */
    EXPECT_EQ(findings.size(), 22u);
}

/* An array of 1000 references to one array of 1000 elements: its wrong cells are visited and found only once. */
TEST(CdbVerifyWork, ManyCellsOfOneValue) {
    words strings = name;
    append(strings, {1000, 0});
    for (int i = 0; i < 1000; ++i)
        append(strings, {8016, 0});
    append(strings, {1000, 0});
    for (int i = 0; i < 1000; ++i)
        append(strings, {VX_INT32, 0xFFFFFFFF, 1, 0});
    auto findings = findings_of(file_of({.attribute = persistent(VX_SD_PTR_ARRAY, 8, 0, NONE, 0, 999),
                                         .varieties = {0x43444267, 1, 1, 1},
                                         .structures = two_structures,
                                         .valid_values = {},
                                         .strings = strings}));
    EXPECT_EQ(count_of(findings, "CDB106"), 1000u);
    EXPECT_EQ(count_of(findings, "CDB403"), 999u + 2u); /* and the elements' names */
}

/* Names without a zero byte: the strings are searched for one only once, from their end. */
TEST(CdbVerifyWork, ManyNamesWithoutEnd) {
    words strings(1000, 0x41414141);
    parts p = {.attributes = 500,
               .attribute = persistent(VX_INT32, 0, 0, NONE, NONE, 0xFFFF),
               .step_at = 2,
               .varieties = {0x43444267, 1, 1, 1},
               .structures = {},
               .valid_values = {},
               .strings = strings};
    auto findings = findings_of(file_of(p));
    EXPECT_EQ(count_of(findings, "CDB309"), 501u); /* and the class's */
    EXPECT_FALSE(cdb::is_sound(findings));
}

/* Structured data are compared with their definition only once, here with a finding, even if records share them. */
TEST(CdbVerifyWork, ManyAttributesOfOneStructure) {
    words structures = {0x43444266, 100}, strings = name;
    append(strings, {100, 0});
    for (int i = 0; i < 100; ++i) {
        append(structures, {0, 0, i == 99 ? VX_UINT32 : VX_INT32, 0, NONE, 0, 0, 0});
        append(strings, {VX_INT32, 0, 1, 0});
    }
    auto findings = findings_of(file_of({.attributes = 100,
                                         .attribute = persistent(VX_SD_PTR, 8, 0, NONE, 0, 99),
                                         .step_at = 0,
                                         .varieties = {0x43444267, 1, 1, 1},
                                         .structures = structures,
                                         .valid_values = {},
                                         .strings = strings}));
    EXPECT_EQ(count_of(findings, "CDB453"), 1u);
    EXPECT_EQ(count_of(findings, "CDB403"), 99u + 99u + 100u); /* values; names of attributes and of elements */
    EXPECT_EQ(count_of(findings, "CDB308"), 99u + 99u);        /* definitions, variety lists */
    EXPECT_EQ(findings.size(), 1u + 298 + 198);
}

/* Only the bytes of a text that are new are visited, even if it begins inside another text or runs into another one,
 * however long the other is. */
TEST(CdbVerifyWork, TextsOverOneAnother) {
    std::vector<std::byte> area(8 * 100, std::byte{'x'});
    area[8 * 50 - 1] = std::byte{0};
    cdb::extent strings(cdb::bytes(area, std::endian::native), 0);
    auto long_one = strings.claim_text(8 * 10, area.size());
    EXPECT_EQ(long_one.size, 8u * 40);
    EXPECT_TRUE(long_one.whole);
    auto amid = strings.claim_text(8 * 20, area.size());
    EXPECT_EQ(amid.size, 0u);
    EXPECT_FALSE(amid.whole);
    auto into = strings.claim_text(8 * 8, area.size());
    EXPECT_EQ(into.size, 8u * 2);
    EXPECT_FALSE(into.whole);
    auto to_its_limit = strings.claim_text(8 * 60, 8 * 64 - 3);
    EXPECT_EQ(to_its_limit.size, 8u * 4 - 3);
    EXPECT_FALSE(to_its_limit.whole);
}

/* ---- What is sound can be read to the end ----------------------------------------------------------------------- */

/* Counts values, and the values inside of them, until there are more than a sound file has room for. */
bool ends(const cdb::value &v, std::size_t &budget) {
    if (budget-- == 0)
        return false;
    for (const cdb::value &element : v.elements())
        if (!ends(element, budget)) {
            budget = 0;
            return false;
        }
    return true;
}

testing::AssertionResult unsound_or_read_to_the_end(const std::vector<std::byte> &file) {
    cdb::database db(file);
    std::size_t budget = file.size() / 8;
    bool all = true;
    for (const auto &c : db.classes()) {
        for (const auto &a : c.dynamic_attributes(cdb::level::of_resource))
            all = all && ends(a.min_value(), budget);
        for (const auto &a : c.persistent_attributes(cdb::level::of_resource))
            for (const auto &v : a.valid_values())
                all = all && ends(v.low, budget);
    }
    if (all || !cdb::is_sound(cdb::verify(db)))
        return testing::AssertionSuccess();
    return testing::AssertionFailure() << "sound, but holds more values than it has room for";
}

/* A bound may be a range of another attribute's type, which is not an error; neither is the place that it leads to. */
TEST(CdbVerifyWork, BoundsThatShareStructures) {
    EXPECT_TRUE(unsound_or_read_to_the_end(file_of({.attribute = dynamic(VX_SD_PTR, 8),
                                                    .varieties = {0x43444267, 1, 1, 1},
                                                    .structures = {},
                                                    .valid_values = {},
                                                    .strings = twice_each(60)})));
}

/* The same for valid values of an attribute that was cut short, which may belong to another attribute. */
TEST(CdbVerifyWork, ValidValuesThatShareStructures) {
    words first = class_of({.attribute = persistent(VX_SD_PTR, NONE, 0, 0, NONE, 0xFFFF),
                            .varieties = {0x43444267, 1, 1, 1},
                            .structures = {},
                            .valid_values = {0x43444235, 1, 8, 0, NONE, 0, 0, 0},
                            .strings = twice_each(60)});
    words second = class_of({.attribute = persistent(VX_INT32, 0, 0, NONE, NONE, 0xFFFF),
                             .varieties = {0x43444267, 1, 1, 1},
                             .structures = {},
                             .valid_values = {},
                             .strings = name});
    EXPECT_TRUE(unsound_or_read_to_the_end(file_of({first, second}, 2)));
}

/* A text that runs into the next one is not sound. Otherwise reading all names could take time proportional to their
 * number times their length. */
TEST(CdbVerifyWork, NamesThatRunIntoOneAnother) {
    words strings(1000, 0x41414141);
    strings.back() = 0;
    words varieties;
    for (int i = 0; i < 500; ++i)
        append(varieties, {0x43444267, 1, 1, 1});
    words section = class_of({.attributes = 500,
                              .attribute = persistent(VX_INT32, 0, 0, NONE, NONE, 0xFFFF),
                              .step_at = 2,
                              .varieties = varieties,
                              .structures = {},
                              .valid_values = {},
                              .strings = strings});
    for (std::uint32_t i = 0; i < 500; ++i)
        section[56 + 18 * i + 10] = 16 * i;
    EXPECT_FALSE(cdb::is_sound(findings_of(file_of({section}, 1))));
}

} // namespace
