#include "reader/tables.h"

#include "reader/image_files.h"

using namespace image_files;

TEST(reader_tables, the_strings_of_a_section_are_where_its_record_says) {
    for (std::endian order : both_orders) {
        exact_copy copy(load("whole", order));
        cdb::database db(copy.bytes());
        std::vector<std::string> first_texts;
        for (std::size_t i = 0; i < db.section_count(); ++i)
            if (db.anchor(i).cda_type != CDB_DSECT_CLASS)
                first_texts.emplace_back(cdb::tables_of(db, i).strings.text(0));
        EXPECT_EQ(first_texts, (std::vector<std::string>{"mgrA", "first", "-", "bb.cat", "Fast", "Slow"}));
    }
}

TEST(reader_tables, a_class_has_all_its_tables) {
    exact_copy copy(load("whole", std::endian::native));
    cdb::database db(copy.bytes());
    ASSERT_EQ(db.anchor(0).cda_type, CDB_DSECT_CLASS);
    cdb::class_tables tables = cdb::tables_of(db, 0);
    EXPECT_NE(tables.valid_vals.size(), 0U);
    EXPECT_NE(tables.variety_lists.size(), 0U);
    EXPECT_NE(tables.sd_defs.size(), 0U);
}

TEST(reader_tables, records_are_counted_as_far_as_the_section_has_them) {
    std::array<std::byte, 40> section = {};
    EXPECT_EQ(cdb::count_placed(cdb::bytes(section, std::endian::native), {{8, 0}}, 3, 8), 3U);
    EXPECT_EQ(cdb::count_placed(cdb::bytes(section, std::endian::native), {{24, 0}}, 3, 8), 2U);
    EXPECT_EQ(cdb::count_placed(cdb::bytes(section, std::endian::native), {{0, 0}}, 3, 8), 0U);
}
