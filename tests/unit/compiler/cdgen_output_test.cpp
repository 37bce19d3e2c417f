/* The output file: its contents, and its life from opening to removal. */

#include "compiler/cdgen.h"

#include "compiler/staged_image.h"

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
using namespace staged;

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
    for (size_t count : {170U, 172U, 174U, 176U, 178U})
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
    for (size_t map : {504U, 564U}) {
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
    add_class({}); /* a build gives back the records */
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
    bool has_effect = false;
    {
        limit address_space(RLIMIT_AS, 0);
        has_effect = mmap(nullptr, 4096, PROT_READ, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0) == MAP_FAILED;
        message = build();
    }
    if (!has_effect)
        GTEST_SKIP() << "an emulator may not pass the limit on";
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
        add_least();
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

TEST_F(ImageFile, IsCutIfItIsShorterThanItWasFilled) {
    write_output("1234");
    unfinished_output filled = begun();
    EXPECT_FALSE(filled.is_cut()) << "it is not mapped yet";
    filled.fd = open(output.c_str(), O_RDWR | O_CLOEXEC);
    filled.size = 4;
    EXPECT_FALSE(filled.is_cut());
    ASSERT_EQ(ftruncate(filled.fd, 3), 0);
    EXPECT_TRUE(filled.is_cut());
    close(filled.fd);
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
    for (int n = 0; n < 2; ++n) {
        add_least();
        ASSERT_EQ(build(), "none");
    }
    cdgen none;
    none.options.cdefname = output.c_str();
    EXPECT_EQ(fatal_message([&] { bld_cdb(none); }), "No Rsrc Class Tables found");
    add_least();
    EXPECT_EQ(build(), "none");
}

} // namespace
