#include "compare/writer.h"

#include <gtest/gtest.h>

#include <cstring>

namespace {

constexpr cdb::field_fact TEXT = {.field = "a_text"};

/* A cell at 0 of the given word, and strings with a text at 8. */
struct cell {
    explicit cell(std::uint32_t word) {
        std::memcpy(stored.data(), &word, sizeof word);
        std::memcpy(strings.data() + 8, "it's", 4);
    }
    std::string text_of(vx_data_type_t type, bool is_own = true) {
        cdb::bytes text_area(strings, std::endian::native);
        cdb::value value({stored, std::endian::native}, 0, type, text_area);
        return compare::text_of({&TEXT, compare::owned_value{value, is_own, text_area, nullptr}});
    }

    std::array<std::byte, 8> stored = {};
    std::array<std::byte, 16> strings = {};
};

} // namespace

TEST(compare_writer, values_as_a_person_reads_them) {
    EXPECT_EQ(cell(0xFFFFFFFE).text_of(VX_INT32), "-2");
    EXPECT_EQ(cell(0xFFFFFFFE).text_of(VX_UINT32), "4294967294");
    EXPECT_EQ(cell(0x3DCCCCCD).text_of(VX_FLOAT32), "0.1");
    EXPECT_EQ(cell(8).text_of(VX_CHAR_PTR), "'it\\'s'");
    EXPECT_EQ(cell(CDB_NONE).text_of(VX_CHAR_PTR), "nothing");
}

TEST(compare_writer, what_is_not_the_records_own_is_not_followed) {
    EXPECT_EQ(cell(8).text_of(VX_CHAR_PTR, false), "misplaced 8");
    EXPECT_EQ(cell(7).text_of(VX_INT32, false), "7");
}

TEST(compare_writer, a_limit_keeps_long_texts_from_being_written_again_and_again) {
    std::size_t written = 0;
    compare::writer writer(0, [&written](std::string_view piece) { written += piece.size(); });
    std::string half(1 << 19, 'x');
    compare::fact text = {&TEXT, std::string_view(half)};
    writer.write_fact(text);
    writer.write_fact(text);
    EXPECT_EQ(written, 2 * (half.size() + 2));
    EXPECT_THROW(writer.write_fact(text), compare::too_entangled);
    EXPECT_NO_THROW(writer.write_fact({&TEXT, std::string_view("short")}));
}
