/* The changes to databases that the fuzzers try: length and checksum stay correct, and each kind of change
 * occurs. */

#include "fuzz/mutate.h"

#include "reader/image_files.h"
#include "sample.h"

#include <gtest/gtest.h>

#include <functional>

namespace {

using namespace image_files;

constexpr unsigned TRIES = 1500;

using seen_by = std::function<bool(const cdb::database &)>;

constexpr sampling::sample EACH_SEED(1, 0);

/* How many of the databases that come of an image show something. */
unsigned count_changed(std::span<const std::byte> image, const seen_by &shows, sampling::sample seeds = EACH_SEED) {
    unsigned count = 0;
    for (unsigned seed = 1; seed <= TRIES; ++seed) {
        if (!seeds.takes())
            continue;
        fuzz::chance random(seed);
        fuzz::image_bytes changed = fuzz::changed_image(image, random);
        count += shows(cdb::database(changed));
    }
    return count;
}

unsigned count_crossed(std::span<const std::byte> image, std::span<const std::byte> other, const seen_by &shows) {
    unsigned count = 0;
    for (unsigned seed = 1; seed <= TRIES; ++seed) {
        fuzz::chance random(seed);
        fuzz::image_bytes crossed = fuzz::crossed_image(image, other, random);
        count += shows(cdb::database(crossed));
    }
    return count;
}

bool breaks(const cdb::database &db, std::string_view code) {
    std::vector<cdb::finding> findings = cdb::verify(db);
    return std::any_of(findings.begin(), findings.end(), [&](const cdb::finding &f) { return f.broken->code == code; });
}

const rsrc_class_t first_class(const cdb::database &db) {
    return cdb::resource_class(db.section(0)).record();
}

class mutate_image : public testing::TestWithParam<std::endian> {
protected:
    std::vector<std::byte> image = load("whole", GetParam());
};

TEST_P(mutate_image, length_and_checksum_are_right) {
    EXPECT_EQ(
        count_changed(
            image,
            [](const cdb::database &db) { return db.recognised() && (breaks(db, "CDB102") || breaks(db, "CDB104")); },
            sampling::of_this_run()),
        0U);
}

TEST_P(mutate_image, nearly_all_remain_databases) {
    EXPECT_GT(count_changed(image, [](const cdb::database &db) { return db.recognised(); }), TRIES * 9 / 10);
}

TEST_P(mutate_image, both_byte_orders_come_about) {
    auto other = GetParam() == std::endian::little ? std::endian::big : std::endian::little;
    EXPECT_GT(count_changed(image, [&](const cdb::database &db) { return db.recognised() && db.order() == other; }),
              0U);
}

TEST_P(mutate_image, sections_are_copied_and_taken_away) {
    cdb::database before(image);
    for (int more : {-1, 1})
        EXPECT_GT(count_changed(image,
                                [&](const cdb::database &db) {
                                    return static_cast<int>(db.section_count()) ==
                                           static_cast<int>(before.section_count()) + more;
                                }),
                  0U);
}

/* The tables after the records are where the class record says. */
TEST_P(mutate_image, records_are_copied_and_the_tables_after_them_moved) {
    unsigned before = first_class(cdb::database(image)).rc_num_dattrs;
    EXPECT_GT(count_changed(image,
                            [&](const cdb::database &db) {
                                return first_class(db).rc_num_dattrs == before + 1 && !breaks(db, "CDB302") &&
                                       !breaks(db, "CDB303") && !breaks(db, "CDB203");
                            }),
              0U);
}

TEST_P(mutate_image, references_lead_to_just_past_the_end_of_their_table) {
    EXPECT_GT(count_changed(image,
                            [](const cdb::database &db) {
                                cdb::class_tables tables = cdb::resource_class(db.section(0)).side_tables();
                                for (const auto &attr :
                                     cdb::resource_class(db.section(0)).dynamic_attributes(cdb::level::of_resource))
                                    if (attr.record().u_ra_variety_list.offset[0] == tables.variety_lists.size())
                                        return true;
                                return false;
                            }),
              0U);
}

/* "whole" has three varieties in the last list. */
TEST_P(mutate_image, counts_are_as_many_as_there_is_room_for_and_one_more) {
    EXPECT_GT(count_changed(image, [](const cdb::database &db) { return breaks(db, "CDB307"); }), 0U);
    EXPECT_GT(count_changed(image, [](const cdb::database &db) { return breaks(db, "CDB401"); }), 0U);
}

TEST_P(mutate_image, types_change) {
    EXPECT_GT(count_changed(image, [](const cdb::database &db) { return breaks(db, "CDB310"); }), 0U);
}

TEST_P(mutate_image, values_are_shared_and_refer_to_themselves) {
    EXPECT_GT(count_changed(image, [](const cdb::database &db) { return breaks(db, "CDB403"); }), 0U);
    EXPECT_GT(count_changed(image, [](const cdb::database &db) { return breaks(db, "CDB308"); }), 0U);
}

TEST_P(mutate_image, some_are_sound_and_not_the_same) {
    EXPECT_GT(count_changed(image,
                            [&](const cdb::database &db) {
                                return cdb::is_sound(cdb::verify(db)) &&
                                       !std::equal(image.begin(), image.end(), db.file().raw().begin(),
                                                   db.file().raw().end());
                            }),
              TRIES / 50);
}

TEST_P(mutate_image, sections_of_another_database_are_taken_in_the_order_of_the_first) {
    for (std::endian order : both_orders) {
        std::vector<std::byte> other = load("small", order);
        unsigned taken = count_crossed(image, other, [&](const cdb::database &db) {
            for (const cdb::resource_class &each : db.classes())
                if (each.name() == cdb::resource_class(cdb::database(other).section(0)).name())
                    return db.order() == GetParam();
            return false;
        });
        EXPECT_GT(taken, 0U);
    }
}

INSTANTIATE_TEST_SUITE_P(fuzz, mutate_image, testing::ValuesIn(both_orders),
                         [](const auto &order) { return order.param == std::endian::little ? "little" : "big"; });

TEST(fuzz_mutate_image, what_is_not_a_database_stays_as_it_is) {
    fuzz::chance random(1);
    std::vector<std::byte> image = load("whole", std::endian::native);
    for (std::size_t size : {0U, 1U, 79U}) {
        std::vector<std::byte> odd(size, std::byte{1});
        EXPECT_EQ(fuzz::changed_image(odd, random), odd);
        EXPECT_EQ(fuzz::crossed_image(odd, image, random), odd);
        EXPECT_EQ(fuzz::crossed_image(image, odd, random), image);
    }
}

/* Changes of changes, so that what is already broken is changed too. */
TEST(fuzz_mutate_image, broken_databases_are_changed_on) {
    fuzz::chance random(5);
    fuzz::image_bytes image = load("small", std::endian::native);
    for (unsigned i = 0; i < TRIES; ++i)
        image = i % 50 == 0 ? load("whole", std::endian::native) : fuzz::changed_image(image, random);
    EXPECT_FALSE(image.empty());
}

} // namespace
