#include "reader/diagnosis.h"

#include "compare/compiled.h"
#include "reader/image_files.h"

#include <random>

using namespace image_files;

namespace {

/* "CDB301 1104 <- 0": code, offset, and the position of the cause if it is another one. */
std::vector<std::string> diagnosis_of(std::span<const std::byte> image) {
    std::vector<std::string> lines;
    for (const cdb::diagnosed &each : cdb::diagnose(cdb::database(image))) {
        std::string line = std::string(each.found.broken->code) + " " + std::to_string(each.found.offset);
        if (each.cause != lines.size())
            line += " <- " + std::to_string(each.cause);
        lines.push_back(line);
    }
    return lines;
}

using lines = std::vector<std::string>;

void put(std::vector<std::byte> &image, std::size_t at, std::uint32_t number) {
    std::memcpy(image.data() + at, &number, sizeof number);
}

/* The correct checksum after the change of a word. */
void put_right(std::vector<std::byte> &image, std::size_t at, std::uint32_t number) {
    std::uint32_t before = 0, sum = 0;
    std::memcpy(&before, image.data() + at, sizeof before);
    std::memcpy(&sum, image.data() + 4, sizeof sum);
    put(image, at, number);
    put(image, 4, sum ^ before ^ number);
}

std::vector<std::byte> small() {
    return load("small", std::endian::native);
}

/* In the file small, see small.image. */
constexpr std::size_t LENGTH = 0, CHECKSUM = 4, FORMAT = 8, ANCHOR_OF_CLASS = 80, CLASS = 144;
constexpr std::size_t STRINGS_OF_CLASS = CLASS + offsetof(rsrc_class_t, u_rc_strings);
constexpr std::size_t VARIETY_LIST = 896;
constexpr std::size_t ATTRIBUTE_TYPE = 472, ELEMENT_TYPE = 1048;

} // namespace

TEST(diagnosis, a_flawless_file_has_none) {
    EXPECT_EQ(diagnosis_of(small()), lines());
}

TEST(diagnosis, one_error_is_its_own_cause) {
    std::vector<std::byte> image = small();
    image[CHECKSUM] ^= std::byte{1};
    EXPECT_EQ(diagnosis_of(image), lines{"CDB104 4"});
}

TEST(diagnosis, a_wrong_checksum_follows_from_the_error) {
    std::vector<std::byte> image = small();
    put(image, CLASS, 7);
    EXPECT_EQ(diagnosis_of(image), (lines{"CDB301 144", "CDB104 4 <- 0"}));
}

TEST(diagnosis, a_wrong_length_is_the_cause_of_a_wrong_checksum) {
    std::vector<std::byte> image = small();
    put(image, LENGTH, static_cast<std::uint32_t>(image.size()) - 12);
    EXPECT_EQ(diagnosis_of(image).front(), "CDB102 0");
    put(image, LENGTH, 0);
    EXPECT_EQ(diagnosis_of(image).back(), "CDB104 4 <- 0");
}

/* A count that is too large displaces all tables after it; no rule is about the count itself. */
TEST(diagnosis, a_wrong_count_is_the_cause_of_everything_that_it_displaces) {
    std::vector<std::byte> image = small();
    std::size_t at = CLASS + offsetof(rsrc_class_t, rc_num_pattrs);
    std::uint16_t count = 3;
    std::memcpy(image.data() + at, &count, sizeof count);
    for (bool sum_is_right : {false, true}) {
        if (sum_is_right)
            image[CHECKSUM + (std::endian::native == std::endian::little ? 0 : 1)] ^= std::byte{2} ^ std::byte{3};
        std::vector<cdb::diagnosed> all = cdb::diagnose(cdb::database(image));
        ASSERT_GT(all.size(), 3U);
        EXPECT_EQ(all[0].found.broken->code, cdb::CODE_CONTRADICTING);
        EXPECT_EQ(all[0].found.field, "rc_num_pattrs");
        EXPECT_EQ(all[0].found.offset, at);
        EXPECT_EQ(all[0].found.found, "3");
        EXPECT_EQ(all[0].found.expected, "2");
        for (const cdb::diagnosed &each : all)
            EXPECT_EQ(each.cause, 0U) << each.found.broken->code;
    }
}

/* Without the format word, a file of the other byte order is read in this one's, and hardly anything in it is right. */
TEST(diagnosis, a_wrong_format_word_is_the_cause_of_everything) {
    constexpr std::endian OTHER = std::endian::native == std::endian::little ? std::endian::big : std::endian::little;
    std::vector<std::byte> image = load("small", OTHER);
    image[FORMAT] ^= std::byte{1};
    std::vector<cdb::diagnosed> all = cdb::diagnose(cdb::database(image));
    ASSERT_GT(all.size(), 3U);
    EXPECT_EQ(all[0].found.broken->code, "CDB103");
    EXPECT_EQ(all[0].found.offset, FORMAT);
    for (const cdb::diagnosed &each : all)
        EXPECT_EQ(each.cause, 0U) << each.found.broken->code;
}

TEST(diagnosis, the_count_of_a_list_is_the_cause) {
    std::vector<std::byte> image = small();
    put(image, VARIETY_LIST + 4, 2);
    EXPECT_EQ(diagnosis_of(image).front(), "CDB108 900");
}

TEST(diagnosis, a_section_of_the_wrong_length_displaces_the_next) {
    std::vector<std::byte> image = small();
    std::size_t at = ANCHOR_OF_CLASS + offsetof(cdb_dsect_anchor_t, cda_length);
    std::uint32_t length = 0;
    std::memcpy(&length, image.data() + at, sizeof length);
    put_right(image, at, length + 8);
    std::vector<cdb::diagnosed> all = cdb::diagnose(cdb::database(image));
    EXPECT_EQ(all[0].found.field, "cda_length");
    EXPECT_EQ(all[0].found.expected, std::to_string(length));
}

TEST(diagnosis, warnings_of_a_careless_source_are_no_consequences) {
    std::vector<std::byte> image = load("cut_short", std::endian::native);
    EXPECT_EQ(diagnosis_of(image), lines{"CDB353 384"});
    std::uint32_t class_record = 0;
    std::memcpy(&class_record, image.data() + 112, sizeof class_record);
    put(image, 112, class_record + 1);
    EXPECT_EQ(diagnosis_of(image), (lines{"CDB301 112", "CDB104 4 <- 0", "CDB353 384"}));
}

/* Both numbers are types of data, of which verify only warns. The first one is careless: the checksum includes it. The
 * second one is damaged, and the error that it makes is the checksum's. */
TEST(diagnosis, a_damaged_word_need_not_explain_all_warnings) {
    std::vector<std::byte> image = small();
    put_right(image, ATTRIBUTE_TYPE, VX_SBS_PTR);
    EXPECT_EQ(diagnosis_of(image), lines{"CDB351 472"});
    put(image, ELEMENT_TYPE, VX_UNKNOWN);
    EXPECT_EQ(diagnosis_of(image), (lines{"CDB108 1048", "CDB104 4 <- 0", "CDB351 1048 <- 0", "CDB351 472"}));
}

/* The list of A is lost, and B's has two owners. In a megabyte there is no time to try every word, so those that refer
 * to the same list come first. */
TEST(diagnosis, a_second_reference_to_a_list_is_found_in_a_large_file) {
    std::string large;
    for (int i = 0; i < 140'000; ++i)
        large += "DefaultValue=777\n";
    std::vector<std::byte> image =
        compiled::image_of(compiled::source_of(compiled::attribute("A", 1, "String", "ValidValue=x\nDefaultValue=x\n") +
                                               compiled::attribute("B", 2, "Int32", "ValidValue=5\nDefaultValue=5\n") +
                                               compiled::attribute("C", 3, "UInt64Array", large)));
    ASSERT_GT(image.size(), std::size_t{1} << 20);
    std::size_t of_a =
        cdb::database(image).anchor(0).cda_offset + sizeof(rsrc_class_t) + offsetof(rsrc_pattr_t, u_ra_valid_vals);
    std::memcpy(image.data() + of_a, image.data() + of_a + sizeof(rsrc_pattr_t), sizeof(std::uint32_t));
    EXPECT_EQ(diagnosis_of(image).front(), "CDB108 " + std::to_string(of_a));
}

/* Two wrong words: no single one explains everything, so rules tell what follows. */
TEST(diagnosis, errors_after_a_wrong_table_of_a_section_follow_from_it) {
    std::vector<std::byte> image = small();
    put(image, STRINGS_OF_CLASS, 968);
    put(image, VARIETY_LIST + 4, 1000);
    std::vector<cdb::diagnosed> all = cdb::diagnose(cdb::database(image));
    EXPECT_EQ(all[0].found.offset, STRINGS_OF_CLASS);
    for (const cdb::diagnosed &each : all)
        EXPECT_EQ(each.cause, 0U) << each.found.broken->code << " " << each.found.offset;
}

/* A seeded sample of all damages of one byte. */
TEST(diagnosis, one_damaged_byte_is_one_cause) {
    constexpr int SAMPLE = 400;
    std::mt19937 random(1);
    int one_cause = 0, at_the_damage = 0;
    for (int i = 0; i < SAMPLE; ++i) {
        std::vector<std::byte> image = load("whole", both_orders[i % 2]);
        std::size_t at = random() % image.size();
        image[at] ^= static_cast<std::byte>(1 + random() % 255);
        std::vector<cdb::diagnosed> all = cdb::diagnose(cdb::database(image));
        ASSERT_FALSE(all.empty()) << at;
        std::size_t causes = 0;
        for (std::size_t each = 0; each < all.size(); ++each)
            causes += all[each].cause == each;
        one_cause += causes == 1;
        const cdb::finding &first = all[0].found;
        at_the_damage += first.broken->code == cdb::CODE_CHECKSUM || at - first.offset < 8;
    }
    EXPECT_GE(one_cause, SAMPLE * 99 / 100);
    EXPECT_GE(at_the_damage, SAMPLE * 95 / 100);
}

TEST(find_first, counts_what_it_does_not_keep) {
    std::vector<std::byte> image = small();
    image[CHECKSUM] ^= std::byte{1};
    put_right(image, VARIETY_LIST, 0xFFFF);
    std::vector<cdb::finding> all = cdb::verify(cdb::database(image));
    ASSERT_GE(all.size(), 2U);
    cdb::first_findings first = cdb::find_first(cdb::database(image), 1);
    EXPECT_EQ(first.count, all.size());
    ASSERT_EQ(first.kept.size(), 1U);
    EXPECT_EQ(first.kept[0].offset, all[0].offset);
    EXPECT_FALSE(first.sound);
}

TEST(find_first, is_sound_without_errors) {
    std::vector<std::byte> image = small();
    EXPECT_TRUE(cdb::find_first(cdb::database(image), 0).sound);
}
