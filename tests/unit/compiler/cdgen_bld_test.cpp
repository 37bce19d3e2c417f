/* The image builder: checksum, sizes, sections, and the life of the output file. */

#include "compiler/cdgen.h"
#include "format/checksum.h"

#include "compiler/image_fixture.h"

#include <csignal>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <functional>
#include <sys/file.h>
#include <sys/mman.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

using by_hand::image;
using by_hand::same;

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

/* ---- Staging --------------------------------------------------------------------------------------------------- */

/* A class's side tables, in the order in which they stand in the file. */
constexpr cdb_ref_t rsrc_class_t::*side_tables[] = {
    &rsrc_class_t::u_rc_pattrsC,  &rsrc_class_t::u_rc_dattrsC,  &rsrc_class_t::u_rc_pattrs,
    &rsrc_class_t::u_rc_dattrs,   &rsrc_class_t::u_rc_actionsC, &rsrc_class_t::u_rc_actions,
    &rsrc_class_t::u_rc_errors,   &rsrc_class_t::u_rc_depends,  &rsrc_class_t::u_rc_variety_lists,
    &rsrc_class_t::u_rc_sbs_defs, &rsrc_class_t::u_rc_sd_defs,  &rsrc_class_t::u_rc_valid_vals,
    &rsrc_class_t::u_rc_strings};

/* Bytes of each. */
struct class_bytes {
    size_t of[std::size(side_tables)] = {};
};

class Builder : public testing::Test {
protected:
    /* A staging table of so many equal bytes; never allocated if there are none. */
    tbl *table(size_t size, char byte = 's') {
        tbl *t = make_tbl(cx, 64, "Table");
        if (size > 0)
            memset(alloc_tble(cx, t, size), byte, size);
        return t;
    }

    template <class Record> void append(tbl *t, int &count, const Record &record) {
        memcpy(alloc_tble(cx, t, sizeof record), &record, sizeof record);
        ++count;
    }

    /* A record with arbitrary bytes where nothing else is said. */
    template <class Record> static Record arbitrary() {
        image bytes(sizeof(Record));
        Record record;
        memcpy(&record, bytes.at(0), sizeof record);
        return record;
    }

    /* The tables hold the letters from a on. */
    void add_class(const class_bytes &bytes, vx_uint16_t id = 0) {
        auto record = arbitrary<rsrc_class_t>();
        char letter = 'a';
        const size_t *size = bytes.of;
        for (auto field : side_tables)
            stage_tbl(record.*field, table(*size++, letter++));
        record.rc_class_id = id;
        append(&cx.sections.rsrc_class_tbl, cx.sections.rsrc_class_count, record);
    }

    void add_mgr(size_t strings, vx_uint16_t id = 0) {
        auto record = arbitrary<rsrc_mgr_t>();
        record.rm_id = id;
        stage_tbl(record.u_rm_strings_table, table(strings, 'n'));
        append(&cx.sections.rsrc_mgr_tbl, cx.sections.rsrc_mgr_count, record);
    }

    void add_map(size_t strings) {
        auto record = arbitrary<rsrc_cmmap_t>();
        stage_tbl(record.u_rcm_strings, table(strings, 'o'));
        append(&cx.sections.rsrc_cmmap_tbl, cx.sections.rsrc_cmmap_count, record);
    }

    void add_variable_class(size_t strings, vx_uint32_t ids) {
        auto record = arbitrary<rsrc_variable_class_t>();
        record.rvc_var_count = ids;
        stage_tbl(record.u_rvc_string_tbl, table(strings, 'p'));
        append(&cx.sections.rsrc_var_class_tbl, cx.sections.rsrc_var_class_count, record);
    }

    rsrc_class_t &staged_class(size_t n = 0) {
        return records_of<rsrc_class_t>(&cx.sections.rsrc_class_tbl)[n];
    }

    cdgen cx;
};

std::string message_of(const fatal_exit &failure) {
    auto [first, second, third] = words_of(failure);
    return std::string(first) + second + third;
}

/* The message of the fatal exit; status and line are always the same. */
std::string fatal_message(const std::function<void()> &run) {
    try {
        run();
    } catch (const fatal_exit &failure) {
        EXPECT_EQ(failure.code, 1);
        EXPECT_EQ(failure.line, 0);
        return message_of(failure);
    }
    return "none";
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

/* Address space for tables that are too large to exist. Whoever uses it takes it back from the table. */
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
    for (size_t number : {8, 10, 11}) {
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
/* ---- Sections -------------------------------------------------------------------------------------------------- */

image blank(size_t size) {
    image made(size);
    std::fill(made.bytes.begin(), made.bytes.end(), '\0');
    return made;
}

template <class Record> void put_arbitrary(image &to, size_t at) {
    to.text(at, {image(sizeof(Record)).at(0), sizeof(Record)});
}

void put_reference(image &to, size_t at, vx_uint32_t offset) {
    to.u32(at, offset).u32(at + 4, 0);
}

void put_anchor(image &to, size_t n, vx_uint32_t type, vx_uint32_t offset, vx_uint32_t length) {
    size_t at = 80 + 16 * n;
    to.u32(at, type).u32(at + 4, offset).u32(at + 8, length).u32(at + 12, 0);
}

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

/* A class as it is staged by add_class(), with the offsets of its tables from pattrsC to strings. */
void put_class(image &to, size_t at, vx_uint16_t id, const std::vector<vx_uint32_t> &offsets) {
    const size_t references[] = {24, 32, 40, 48, 96, 104, 112, 120, 128, 136, 144, 152, 160};
    put_arbitrary<rsrc_class_t>(to, at);
    for (size_t i = 0; i < std::size(references); ++i)
        put_reference(to, at + references[i], offsets[i]);
    to.u16(at + 208, id);
}

TEST_F(ImageSection, ClassIsItsRecordAndItsTablesInOrder) {
    add_class({{72, 136, 144, 272, 56, 112, 48, 8, 16, 40, 80, 32, 13}}, 5);
    image expected = blank(112 + 1256);
    put_anchor(expected, 0, 5, 112, 1256);
    /* errors, dependencies and structured byte strings stand at 1016, 1064 and 1088, which nothing says */
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
    for (size_t at : {112, 344})
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
    for (size_t at : {112, 144}) {
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
    for (size_t at : {112, 188}) {
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
    for (size_t at : {112, 184}) {
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

/* ---- The file -------------------------------------------------------------------------------------------------- */

class ImageFile : public Builder {
protected:
    void SetUp() override {
        directory = std::filesystem::temp_directory_path() / ("cdgen-bld-" + std::to_string(getpid()));
        std::filesystem::create_directory(directory);
        setenv("VX_CDB_FORCE_EMPTY_TIMESTAMP", "", 1);
        name_output(directory / "out.cdef");
    }
    void TearDown() override {
        setenv("VX_CDB_FORCE_EMPTY_TIMESTAMP", "", 1);
        std::filesystem::remove_all(directory);
    }

    void name_output(const std::filesystem::path &path) {
        output = path;
        cx.options.cdefname = output.c_str();
    }

    /* The least that makes a database: LEAST bytes and the class's strings. */
    void add_least(size_t class_strings = 0) {
        class_bytes bytes;
        bytes.of[12] = class_strings;
        add_class(bytes);
        add_mgr(0);
        add_map(0);
    }

    std::string build() {
        return fatal_message([this] { bld_cdb(cx); });
    }

    /* The output as it is now, as one that is being written. */
    unfinished_output begun() const {
        struct stat st = {};
        EXPECT_EQ(stat(output.c_str(), &st), 0);
        return {output.c_str(), st.st_dev, st.st_ino};
    }

    image contents() const {
        std::ifstream in(output, std::ios::binary);
        image read(0);
        read.bytes.assign(std::istreambuf_iterator<char>(in), {});
        return read;
    }

    void write_output(const std::string &text) const {
        std::ofstream(output) << text;
    }

    std::filesystem::path directory;
    std::string output;
};

constexpr size_t LEAST = 80 + 3 * 16 + 224 + 24 + 60;

vx_uint32_t checksum_of(const image &of) {
    vx_uint32_t sum = of.word(0);
    for (size_t at = 8; at + 4 <= of.bytes.size(); at += 4)
        sum ^= of.word(at);
    return sum;
}

void put_header(image &to, vx_uint32_t sections, vx_uint16_t max_mgr, vx_uint16_t max_class) {
    to.u32(0, static_cast<vx_uint32_t>(to.bytes.size() - 4)).u32(8, 0x666D7431).u32(24, sections);
    const vx_uint16_t halves[] = {max_mgr, max_class, 224, 60, 24, 40, 72, 136, 56, 48, 8}; /* with record sizes */
    for (size_t i = 0; i < std::size(halves); ++i)
        to.u16(28 + 2 * i, halves[i]);
}

TEST_F(ImageFile, IsHeaderAnchorsAndSectionsInTheirOrder) {
    add_variable_class(3, 1);
    add_map(0);
    add_mgr(4, 1);
    add_class({{72, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 9}}, 2);
    add_map(1);
    add_tbl_entry(cx, records_of<rsrc_variable_class_t>(&cx.sections.rsrc_var_class_tbl).data(), table(4, 'i'));
    ASSERT_EQ(build(), "none");

    image expected = blank(688);
    put_header(expected, 5, 1, 2);
    put_anchor(expected, 0, 5, 160, 312);
    put_class(expected, 160, 2, {224, 296, 296, 296, 296, 296, 0, 0, 296, 0, 296, 296, 296});
    for (size_t count : {170, 172, 174, 176, 178})
        expected.u16(160 + count, 0);
    expected.u16(160 + 168, 1).u32(160 + 184, 0).u32(160 + 192, 0).u32(160 + 196, 0);
    expected.text(160 + 224, std::string(72, 'a')).text(160 + 296, std::string(9, 'm'));
    put_anchor(expected, 1, 3, 472, 32);
    put_arbitrary<rsrc_mgr_t>(expected, 472);
    put_reference(expected, 472 + 8, 0);
    put_reference(expected, 472 + 16, 0);
    expected.u16(472 + 4, 1).text(472 + 24, "nnnn");
    put_anchor(expected, 2, 6, 504, 60);
    put_anchor(expected, 3, 6, 564, 68);
    for (size_t map : {504, 564}) {
        put_arbitrary<rsrc_cmmap_t>(expected, map);
        put_reference(expected, map + 16, 60);
    }
    expected.text(564 + 60, "o");
    put_anchor(expected, 4, 4, 632, 56);
    put_arbitrary<rsrc_variable_class_t>(expected, 632);
    put_reference(expected, 632 + 28, 8);
    expected.u32(632 + 24, 1).text(632 + 40, "ppp").text(632 + 48, "iiii");
    expected.u32(4, checksum_of(expected));
    EXPECT_TRUE(same(expected, contents()));
}

struct prefill_row {
    size_t class_strings, size, prefill;
};

class ImagePrefill : public ImageFile, public testing::WithParamInterface<prefill_row> {};

TEST_P(ImagePrefill, IsRoundedUpTo1024AndTheFileCutToItsImage) {
    add_least(GetParam().class_strings);
    ASSERT_EQ(build(), "none");
    EXPECT_EQ(cx.output.gross_file_size, GetParam().prefill);
    EXPECT_EQ(contents().bytes.size(), GetParam().size);
    EXPECT_EQ(contents().word(0), GetParam().size - 4);
}

/* The last row takes more than one write. */
INSTANTIATE_TEST_SUITE_P(Sizes, ImagePrefill,
                         testing::Values(prefill_row{0, LEAST, 1024}, prefill_row{584, 1020, 1024},
                                         prefill_row{592, 1028, 2048}, prefill_row{1608, 2044, 2048},
                                         prefill_row{1000000, 1000436, 1000448}));

/* A second map brings the size to a multiple of 8. */
TEST_F(ImageFile, ExactMultipleOf1024IsPrefilledExactly) {
    add_least(496);
    add_map(16);
    ASSERT_EQ(build(), "none");
    EXPECT_EQ(cx.output.gross_file_size, 1024u);
    EXPECT_EQ(contents().bytes.size(), 1024u);
}

/* Structured byte strings are not counted: the prefill has room for them, or has not. */
TEST_F(ImageFile, TablesThatAreNotCountedMayFillThePrefill) {
    add_class({{0, 0, 0, 0, 0, 0, 0, 0, 0, 1024 - LEAST, 0, 0, 0}});
    add_mgr(0);
    add_map(0);
    ASSERT_EQ(build(), "none");
    EXPECT_EQ(contents().bytes.size(), 1024u);
}

TEST_F(ImageFile, IsRemovedIfThePrefillHasNoRoom) {
    add_class({{0, 0, 0, 0, 0, 0, 0, 0, 0, 1025 - LEAST, 0, 0, 0}});
    add_mgr(0);
    add_map(0);
    EXPECT_EQ(build(), "Image larger than computed - internal error");
    EXPECT_FALSE(std::filesystem::exists(output));
    EXPECT_EQ(cx.output.cdb_mapfile_fd, 0);
    EXPECT_EQ(cx.output.cdb_mapfile_ptr, nullptr);
}

/* One message, that of the first section without records. */
TEST_F(ImageFile, IsRemovedIfATableHasNoStorage) {
    auto build_over_another = [this] {
        write_output("yesterday's");
        std::string message = build();
        EXPECT_FALSE(std::filesystem::exists(output)) << message;
        return message;
    };
    EXPECT_EQ(build_over_another(), "No Rsrc Class Tables found");
    add_class({});
    EXPECT_EQ(build_over_another(), "No Rsrc Manager tables");
    add_mgr(0);
    EXPECT_EQ(build_over_another(), "No Rsrc CMMAP tables");
}

TEST_F(ImageFile, VariableClassesAreNoneWithoutStorage) {
    add_least();
    ASSERT_EQ(build(), "none");
    EXPECT_EQ(contents().word(24), 3u);
    EXPECT_EQ(contents().word(80), 5u);
    EXPECT_EQ(contents().word(96), 3u);
    EXPECT_EQ(contents().word(112), 6u);
}

TEST_F(ImageFile, ReplacesALongerOneWhole) {
    add_least();
    write_output(std::string(5000, 'x'));
    ASSERT_EQ(build(), "none");
    image made = contents();
    EXPECT_EQ(made.bytes.size(), LEAST);
    EXPECT_EQ(made.word(4), checksum_of(made));
}

TEST_F(ImageFile, StaysAsItWasIfTheImageCannotBeSized) {
    add_class({{0, 0, 0, 0, 0, 65536UL * 56}});
    write_output("yesterday's");
    EXPECT_EQ(build(), "Too many records of one kind in a class (65535 at most): Table");
    EXPECT_EQ(std::string(contents().at(0), 11), "yesterday's");
}

TEST_F(ImageFile, OutputThatIsTheSourceStaysAsItWas) {
    add_least();
    write_output("the source");
    struct stat st = {};
    ASSERT_EQ(stat(output.c_str(), &st), 0);
    cx.source.cdb_fp.device = st.st_dev;
    cx.source.cdb_fp.inode = st.st_ino;
    EXPECT_EQ(build(), "Cannot create CDB file: it is the source file");
    EXPECT_EQ(std::string(contents().at(0), 10), "the source");
}

TEST_F(ImageFile, ThatCannotBeOpenedIsRefusedWithTheSystemsText) {
    add_least();
    name_output(directory / "missing" / "out.cdef");
    EXPECT_EQ(build(), std::string("Cannot create CDB file: ") + strerror(ENOENT));
    name_output(directory);
    EXPECT_EQ(build(), std::string("Cannot create CDB file: ") + strerror(EISDIR));
}

TEST_F(ImageFile, ThatIsADeviceCannotBeMapped) {
    add_least();
    name_output("/dev/null");
    EXPECT_EQ(build(), std::string("Cannot map CDB file: ") + strerror(EINVAL));
}

/* A pipe that somebody holds open would take what is written. */
TEST_F(ImageFile, ThatIsAPipeCannotBeMappedAndIsNotWrittenTo) {
    add_least();
    ASSERT_EQ(mkfifo(output.c_str(), 0600), 0);
    int reader = open(output.c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC);
    EXPECT_EQ(build(), std::string("Cannot map CDB file: ") + strerror(EINVAL));
    char byte = 0;
    EXPECT_EQ(read(reader, &byte, 1), -1);
    close(reader);
    EXPECT_TRUE(std::filesystem::is_fifo(output)); /* not mapped, so not removed */
}

/* A limit of this process, until the end of the block. */
class limit {
public:
    limit(int resource, rlim_t bytes) : what(resource) {
        EXPECT_EQ(getrlimit(what, &before), 0);
        rlimit lower = {bytes, before.rlim_max};
        EXPECT_EQ(setrlimit(what, &lower), 0);
    }
    limit(const limit &) = delete;
    limit &operator=(const limit &) = delete;
    ~limit() {
        setrlimit(what, &before);
    }

private:
    int what;
    rlimit before = {};
};

TEST_F(ImageFile, WriteThatFailsInThePrefillIsReported) {
    add_least(4000);
    signal(SIGXFSZ, SIG_IGN);
    std::string message;
    {
        limit file_size(RLIMIT_FSIZE, 2048);
        message = build();
    }
    signal(SIGXFSZ, SIG_DFL);
    EXPECT_EQ(message, std::string("Cannot create CDB file: ") + strerror(EFBIG));
}

TEST_F(ImageFile, ThatCannotBeMappedStaysFullOfZeros) {
#ifdef __SANITIZE_ADDRESS__
    GTEST_SKIP() << "the sanitizer itself cannot do without memory";
#endif
    add_least();
    write_output(std::string(3000, 'x'));
    std::string message;
    {
        limit address_space(RLIMIT_AS, 0);
        message = build();
    }
    EXPECT_EQ(message, std::string("Cannot map CDB file: ") + strerror(ENOMEM));
    EXPECT_TRUE(same(blank(1024), contents()));
}

TEST_F(ImageFile, HasMode0644UnderTheMask) {
    add_least();
    mode_t before = umask(022);
    std::string message = build();
    umask(before);
    ASSERT_EQ(message, "none");
    struct stat st = {};
    ASSERT_EQ(stat(output.c_str(), &st), 0);
    EXPECT_EQ(st.st_mode & 0777, 0644u);
}

TEST_F(ImageFile, TimestampIsZeroOnlyIfTheVariableExists) {
    add_least();
    unsetenv("VX_CDB_FORCE_EMPTY_TIMESTAMP");
    ASSERT_EQ(build(), "none");
    EXPECT_NE(contents().word(16), 0u);
    EXPECT_EQ(contents().word(4), checksum_of(contents()));
    for (const char *value : {"", "0", "no"}) {
        setenv("VX_CDB_FORCE_EMPTY_TIMESTAMP", value, 1);
        ASSERT_EQ(build(), "none");
        EXPECT_EQ(contents().word(16), 0u) << value;
        EXPECT_EQ(contents().word(20), 0u) << value;
    }
}

TEST_F(ImageFile, ReversedItIsAsLong) {
    add_least(12);
    cx.options.swap_endianness = 1;
    ASSERT_EQ(build(), "none");
    image made = contents();
    EXPECT_EQ(made.bytes.size(), LEAST + 16);
    EXPECT_EQ(image(made).turn(0, 4).word(0), LEAST + 16 - 4);
    EXPECT_EQ(image(made).turn(8, 4).word(8), 0x666D7431u);
    EXPECT_EQ(made.word(4), checksum_of(made));
}

/* The last record of a table has no valid values though its reference is 0: the reversal must not follow it. */
TEST_F(ImageFile, PlacesOfReferencesThatLeadNowhereAreHandedToTheReversal) {
    class_bytes two_of_each = {{144, 272, 144, 272, 0, 0, 0, 0, 0, 0, 0, 32, 0}};
    for (int n = 0; n < 2; ++n)
        add_class(two_of_each);
    add_mgr(0);
    add_map(0);
    cx.stray.strays = {{0, &rsrc_class_t::u_rc_pattrsC, 72 + 48},
                       {0, &rsrc_class_t::u_rc_dattrs, 136 + 64},
                       {1, &rsrc_class_t::u_rc_dattrsC, 136 + 64},
                       {1, &rsrc_class_t::u_rc_pattrs, 72 + 48}};
    for (size_t n : {size_t{0}, size_t{1}}) {
        char *list = staged_tbl(staged_class(n).u_rc_valid_vals)->tbl_base;
        memcpy(list, image(32).u32(4, 1).at(0), 32);
        staged_class(n).rc_num_errors = staged_class(n).rc_num_depends = 0;
    }
    for (const stray_reference &s : cx.stray.strays)
        memset(staged_tbl(staged_class(static_cast<size_t>(s.rsrc_class)).*s.records)->tbl_base + s.offset, 0, 8);
    cx.options.swap_endianness = 1;
    ASSERT_EQ(build(), "none");
    constexpr size_t FIRST = 144, SECOND = 144 + 224 + 832 + 32;
    EXPECT_EQ(cx.stray.nowhere, (std::vector<size_t>{FIRST + 224 + 120, FIRST + 224 + 832 - 72, SECOND + 224 + 344,
                                                     SECOND + 224 + 416 + 120}));
    for (size_t section : {FIRST, SECOND})
        EXPECT_EQ(std::string(contents().at(section + 224 + 832), 32), std::string(image(32).u32(4, 1).at(0), 32));
}

/* ---- Cleaning up ----------------------------------------------------------------------------------------------- */

TEST_F(ImageFile, ThatIsNotMappedIsLeftAlone) {
    write_output("yesterday's");
    cx.output.discard();
    EXPECT_TRUE(std::filesystem::exists(output));
}

TEST_F(ImageFile, ThatIsMappedGoesWithTheBuildThatFails) {
    EXPECT_EQ(build(), "No Rsrc Class Tables found");
    EXPECT_FALSE(std::filesystem::exists(output));
    EXPECT_EQ(cx.output.cdb_mapfile_fd, 0);
}

TEST_F(ImageFile, ThatIsMappedGoesWithTheContext) {
    write_output(std::string(1024, 'x'));
    {
        cdgen mapped;
        mapped.output.cdb_mapfile_fd = dup(STDERR_FILENO);
        mapped.output.begun = begun();
    }
    EXPECT_FALSE(std::filesystem::exists(output));
}

TEST_F(ImageFile, OfAnotherThatTookTheNameStays) {
    write_output("ours");
    unfinished_output ours = begun();
    EXPECT_TRUE(ours.has_its_name());
    std::filesystem::rename(output, directory / "moved");
    EXPECT_FALSE(ours.has_its_name());
    ours.remove();
    write_output("another's");
    EXPECT_FALSE(ours.has_its_name());
    ours.remove();
    EXPECT_TRUE(std::filesystem::exists(output));
    std::filesystem::rename(directory / "moved", output);
    ours.remove();
    EXPECT_FALSE(std::filesystem::exists(output));
}

/* ---- Locks ----------------------------------------------------------------------------------------------------- */

TEST_F(ImageFile, ThatIsLockedIsRefusedAndStays) {
    add_least();
    write_output("yesterday's");
    int other = open(output.c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_EQ(flock(other, LOCK_SH | LOCK_NB), 0);
    EXPECT_EQ(build(), "Cannot create CDB file: another program has locked it");
    EXPECT_EQ(std::string(contents().at(0), 11), "yesterday's");
    close(other);
    EXPECT_EQ(build(), "none");
}

TEST_F(ImageFile, IsNotLockedOnceItIsFinishedOrRemoved) {
    add_least();
    for (int n = 0; n < 2; ++n)
        ASSERT_EQ(build(), "none");
    cdgen none;
    none.options.cdefname = output.c_str();
    EXPECT_EQ(fatal_message([&] { bld_cdb(none); }), "No Rsrc Class Tables found");
    EXPECT_EQ(build(), "none");
}

} // namespace
