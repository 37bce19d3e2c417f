/* The image builder: checksum, sizes and sections. */

#include "compiler/cdgen.h"
#include "format/checksum.h"

#include "compiler/staged_image.h"

#include <cstdint>
#include <sys/mman.h>

namespace {

using by_hand::image;
using by_hand::same;
using namespace staged;

/* ---- Checksum -------------------------------------------------------------------------------------------------- */

TEST(ImageChecksum, IsTheStartAndEachWholeWordFromOffset8) {
    const struct {
        vx_uint32_t start, length, expected;
    } rows[] = {
        {0x00000004, 4, 0x00000004},  {0x00000007, 7, 0x00000007},  {0x00000008, 8, 0x1122334C},
        {0x0000000B, 11, 0x1122334F}, {0x0000000C, 12, 0x010203C8}, {0x00000010, 16, 0xFE0203D4},
        {0x10000000, 16, 0xEE0203C4}, {0x00000000, 8, 0x11223344},
    };
    image given(24);
    given.u32(8, 0x11223344).u32(12, 0x10203080).u32(16, 0xFF000000);
    for (const auto &row : rows)
        EXPECT_EQ(cdb_checksum(given.at(0), row.start, row.length), row.expected) << row.length;
}

/* ---- Sizes ----------------------------------------------------------------------------------------------------- */

using ImageSize = Builder;

TEST_F(ImageSize, OfNothingIsHeaderAndAnchors) {
    for (int sections : {0, 1, 7}) {
        cx.image.dsect_count = sections;
        EXPECT_EQ(cdb_size(cx), 80u + 16u * static_cast<unsigned>(sections));
    }
}

/* Strings are rounded up to 8. */
constexpr struct { size_t strings, rounded; } roundings[] = {{0, 0}, {1, 8}, {7, 8}, {8, 8}, {9, 16}, {16, 16}};

TEST_F(ImageSize, OfAMapIs60AndItsStrings) {
    size_t expected = 80;
    for (auto [strings, rounded] : roundings) {
        add_map(strings);
        EXPECT_EQ(cdb_size(cx), expected += 60 + rounded) << strings;
    }
}

TEST_F(ImageSize, OfAManagerIs24AndItsStrings) {
    size_t expected = 80;
    for (auto [strings, rounded] : roundings) {
        add_mgr(strings);
        EXPECT_EQ(cdb_size(cx), expected += 24 + rounded) << strings;
    }
}

TEST_F(ImageSize, OfAVariableClassIs40ItsStringsAndItsRoundedIds) {
    const struct {
        size_t strings;
        vx_uint32_t ids;
        size_t size;
    } rows[] = {{0, 0, 40}, {1, 0, 48}, {8, 1, 56}, {9, 2, 64}, {16, 3, 72}, {0, 4, 56}, {5, 1001, 4056}};
    size_t expected = 80;
    for (const auto &row : rows) {
        add_variable_class(row.strings, row.ids);
        EXPECT_EQ(cdb_size(cx), expected += row.size) << row.strings << ' ' << row.ids;
    }
}

/* Whole records are counted; what the file does not locate is not. */
TEST_F(ImageSize, OfAClassIs224AndItsCountedTables) {
    const struct {
        const char *table;
        size_t number, bytes, size;
    } rows[] = {
        {"persistent class attributes", 0, 144, 144},
        {"dynamic class attributes", 1, 408, 408},
        {"persistent resource attributes", 2, 72, 72},
        {"dynamic resource attributes", 3, 136, 136},
        {"class actions", 4, 168, 168},
        {"resource actions", 5, 56, 56},
        {"errors", 6, 96, 0},
        {"dependencies", 7, 16, 0},
        {"variety lists", 8, 24, 24},
        {"structured byte strings", 9, 40, 0},
        {"structured data", 10, 72, 72},
        {"valid values", 11, 56, 56},
        {"strings", 12, 17, 24},
        {"rounded strings", 12, 16, 16},
        {"half an attribute", 2, 107, 72},
        {"variety lists, not rounded", 8, 13, 13},
    };
    size_t expected = 80;
    for (const auto &row : rows) {
        class_bytes bytes;
        bytes.of[row.number] = row.bytes;
        add_class(bytes);
        EXPECT_EQ(cdb_size(cx), expected += 224 + row.size) << row.table;
    }
}

TEST_F(ImageSize, CountsAndSizesAreStoredInTheStagedClass) {
    add_class({{144, 408, 288, 680, 336, 392, 48, 8, 24, 40, 80, 104, 9}});
    auto before = arbitrary<rsrc_class_t>();
    cdb_size(cx);
    const rsrc_class_t &rc = staged_class();
    EXPECT_EQ(rc.rc_num_pattrsC, 2);
    EXPECT_EQ(rc.rc_num_dattrsC, 3);
    EXPECT_EQ(rc.rc_num_pattrs, 4);
    EXPECT_EQ(rc.rc_num_dattrs, 5);
    EXPECT_EQ(rc.rc_num_actionsC, 6);
    EXPECT_EQ(rc.rc_num_actions, 7);
    EXPECT_EQ(rc.rc_varlist_size, 24u);
    EXPECT_EQ(rc.rc_sd_size, 80u);
    EXPECT_EQ(rc.rc_valval_size, 104u);
    EXPECT_EQ(rc.rc_num_errors, before.rc_num_errors); /* these stay as staged */
    EXPECT_EQ(rc.rc_num_depends, before.rc_num_depends);
    EXPECT_EQ(rc.rc_sbs_size, before.rc_sbs_size);
}

TEST_F(ImageSize, CountsOfEveryClassAreItsOwn) {
    add_class({{0, 0, 72}});
    add_class({{0, 0, 144}});
    EXPECT_EQ(cdb_size(cx), 80u + 224 + 72 + 224 + 144);
    EXPECT_EQ(staged_class(0).rc_num_pattrs, 1);
    EXPECT_EQ(staged_class(1).rc_num_pattrs, 2);
}

TEST_F(ImageSize, MoreThan65535RecordsOfOneKindAreRefused) {
    const struct { size_t number, record; } rows[] = {{0, 72}, {1, 136}, {2, 72}, {3, 136}, {4, 56}, {5, 56}};
    for (const auto &row : rows) {
        SCOPED_TRACE(row.number);
        class_bytes bytes;
        bytes.of[row.number] = 65535 * row.record;
        add_class(bytes);
        EXPECT_EQ(cdb_size(cx), 80 + 224 + 65535 * row.record);
        alloc_tble(cx, staged_tbl(staged_class().*side_tables[row.number]), row.record);
        EXPECT_EQ(fatal_message([this] { cdb_size(cx); }),
                  "Too many records of one kind in a class (65535 at most): Table");
        cx.sections.rsrc_class_tbl.tbl_next = cx.sections.rsrc_class_tbl.tbl_base;
    }
}

#if SIZE_MAX > UINT32_MAX /* a machine of 32 bits has no such tables */
/* Address space for tables that are too large to exist. The test takes it back from the table. */
class vast_table {
public:
    explicit vast_table(tbl *use) : t(use), start(mmap(nullptr, SIZE, PROT_NONE, FLAGS, -1, 0)) {
        EXPECT_NE(start, MAP_FAILED);
        t->tbl_base = static_cast<char *>(start);
    }
    vast_table(const vast_table &) = delete;
    vast_table &operator=(const vast_table &) = delete;
    ~vast_table() {
        t->tbl_base = t->tbl_next = nullptr;
        munmap(start, SIZE);
    }

    void hold(size_t bytes) {
        t->tbl_next = t->tbl_base + bytes;
    }

private:
    static constexpr size_t SIZE = size_t{5} << 30;
    static constexpr int FLAGS = MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE;
    tbl *t;
    void *start;
};

TEST_F(ImageSize, ImageOrTableOfMoreThan32BitsIsRefused) {
    const std::string refused = "A table or section is too large for the database (4294967295 bytes at most)";
    add_class({});
    for (size_t number : {8U, 10U, 11U}) {
        SCOPED_TRACE(number);
        vast_table t(staged_tbl(staged_class().*side_tables[number]));
        t.hold(0xFFFFFFFF - 80 - 224);
        EXPECT_EQ(cdb_size(cx), 0xFFFFFFFFu);
        t.hold(0xFFFFFFFF - 80 - 223);
        EXPECT_EQ(fatal_message([this] { cdb_size(cx); }), refused);
        t.hold(0x100000000);
        EXPECT_EQ(fatal_message([this] { cdb_size(cx); }), refused);
    }
    vast_table strings(staged_tbl(staged_class().u_rc_strings));
    strings.hold(0x100000001);
    EXPECT_EQ(fatal_message([this] { cdb_size(cx); }), refused);
}
#endif

/* ---- Sections -------------------------------------------------------------------------------------------------- */

/* Writers that fill a buffer: sections follow the anchors, with two of them from 112 on. */
class ImageSection : public Builder {
protected:
    image written_by(void (*writer)(cdgen &), size_t size, size_t anchors = 2) {
        image made = blank(size);
        cx.image.chp = made.at(0);
        cx.image.dsect_anchs = cx.image.chp + 80;
        cx.image.dsect_idx = 0;
        cx.image.dsp = cx.image.dsect_anchs + 16 * anchors;
        cx.output.gross_file_size = size;
        writer(cx);
        EXPECT_EQ(cx.image.dsp - cx.image.chp, static_cast<ptrdiff_t>(size));
        return made;
    }
};

TEST_F(ImageSection, ClassIsItsRecordAndItsTablesInOrder) {
    add_class({{72, 136, 144, 272, 56, 112, 48, 8, 16, 40, 80, 32, 13}}, 5);
    image expected = blank(112 + 1256);
    put_anchor(expected, 0, 5, 112, 1256);
    /* errors, dependencies and structured byte strings are at 1016, 1064 and 1088; no offset is recorded */
    put_class(expected, 112, 5, {224, 296, 432, 576, 848, 904, 0, 0, 1072, 0, 1128, 1208, 1240});
    const struct {
        size_t at, size;
        char letter;
    } tables[] = {{224, 72, 'a'},  {296, 136, 'b'}, {432, 144, 'c'}, {576, 272, 'd'}, {848, 56, 'e'},
                  {904, 112, 'f'}, {1016, 48, 'g'}, {1064, 8, 'h'},  {1072, 16, 'i'}, {1088, 40, 'j'},
                  {1128, 80, 'k'}, {1208, 32, 'l'}, {1240, 13, 'm'}};
    for (const auto &t : tables)
        expected.text(112 + t.at, std::string(t.size, t.letter));
    expected.u16(30, 5);
    EXPECT_TRUE(same(expected, written_by(add_rsrc_class_tbls, 112 + 1256)));
}

TEST_F(ImageSection, EmptyTablesOfAClassAllStandBehindItsRecord) {
    add_class({{0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 5}}, 7);
    add_class({}, 6);
    image expected = blank(112 + 232 + 224);
    put_anchor(expected, 0, 5, 112, 232);
    put_anchor(expected, 1, 5, 344, 224);
    for (size_t at : {112U, 344U})
        put_class(expected, at, at == 112 ? 7 : 6, {224, 224, 224, 224, 224, 224, 0, 0, 224, 0, 224, 224, 224});
    expected.text(336, "mmmmm").u16(30, 7);
    EXPECT_TRUE(same(expected, written_by(add_rsrc_class_tbls, 112 + 232 + 224)));
}

TEST_F(ImageSection, ManagersReferencesAreZero) {
    add_mgr(5, 3);
    add_mgr(8, 2);
    image expected = blank(112 + 32 + 32);
    put_anchor(expected, 0, 3, 112, 32);
    put_anchor(expected, 1, 3, 144, 32);
    for (size_t at : {112U, 144U}) {
        put_arbitrary<rsrc_mgr_t>(expected, at);
        put_reference(expected, at + 8, 0);
        put_reference(expected, at + 16, 0);
        expected.u16(at + 4, at == 112 ? 3 : 2).text(at + 24, at == 112 ? "nnnnn" : "nnnnnnnn");
    }
    expected.u16(28, 3);
    EXPECT_TRUE(same(expected, written_by(add_rsrc_mgr_tbls, 112 + 32 + 32)));
}

TEST_F(ImageSection, MapsStringsStandAt60AndShiftWhatFollowsBy4) {
    add_map(9);
    add_map(0);
    image expected = blank(112 + 76 + 60);
    put_anchor(expected, 0, 6, 112, 76);
    put_anchor(expected, 1, 6, 188, 60);
    for (size_t at : {112U, 188U}) {
        put_arbitrary<rsrc_cmmap_t>(expected, at);
        put_reference(expected, at + 16, 60);
    }
    expected.text(172, "ooooooooo");
    EXPECT_TRUE(same(expected, written_by(add_rsrc_cmmap_tbls, 112 + 76 + 60)));
}

TEST_F(ImageSection, VariableIdsFollowTheStringsWhoseLengthIsInTheReference) {
    add_variable_class(9, 3);
    add_variable_class(3, 0);
    tbl *ids = table(12, 'i');
    add_tbl_entry(cx, &records_of<rsrc_variable_class_t>(&cx.sections.rsrc_var_class_tbl)[0], ids);
    image expected = blank(112 + 72 + 48);
    put_anchor(expected, 0, 4, 112, 72);
    put_anchor(expected, 1, 4, 184, 48);
    for (size_t at : {112U, 184U}) {
        put_arbitrary<rsrc_variable_class_t>(expected, at);
        put_reference(expected, at + 28, at == 112 ? 16 : 8);
        expected.u32(at + 24, at == 112 ? 3 : 0);
    }
    expected.text(152, "ppppppppp").text(168, "iiiiiiiiiiii").text(224, "ppp");
    EXPECT_TRUE(same(expected, written_by(add_rsrc_var_class_tbls, 112 + 72 + 48)));
}

TEST_F(ImageSection, LargestNumbersAreUnsignedAndInAnyOrder) {
    for (vx_uint16_t id : std::initializer_list<vx_uint16_t>{3, 0x8001, 0x7FFF}) {
        add_class({}, id);
        add_mgr(0, static_cast<vx_uint16_t>(id + 1));
    }
    EXPECT_EQ(written_by(add_rsrc_class_tbls, 176 + 3 * 224, 6).word(28),
              image(32).u16(28, 0).u16(30, 0x8001).word(28));
    EXPECT_EQ(written_by(add_rsrc_mgr_tbls, 176 + 3 * 24, 6).word(28), image(32).u16(28, 0x8002).u16(30, 0).word(28));
}

TEST_F(ImageSection, TableWithoutStorageIsRefused) {
    const struct {
        void (*writer)(cdgen &);
        const char *message;
    } rows[] = {{add_rsrc_class_tbls, "No Rsrc Class Tables found"},
                {add_rsrc_mgr_tbls, "No Rsrc Manager tables"},
                {add_rsrc_cmmap_tbls, "No Rsrc CMMAP tables"},
                {add_rsrc_var_class_tbls, "No Rsrc Variable Class tables"}};
    for (const auto &row : rows)
        EXPECT_EQ(fatal_message([&] { row.writer(cx); }), row.message);
}

} // namespace
