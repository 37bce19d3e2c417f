#include "compare/text.h"

#include <gtest/gtest.h>

#include <cstring>

namespace {

/* A cell at 0 of the given word, and strings with a text at 8. */
struct cell {
    explicit cell(std::uint32_t word) {
        std::memcpy(stored.data(), &word, sizeof word);
        std::memcpy(strings.data() + 8, "it's", 4);
    }
    std::string text_of(vx_data_type_t type) {
        cdb::bytes text_area(strings, std::endian::native);
        cdb::value value({stored, std::endian::native}, 0, type, text_area);
        return compare::value_writer(100).text_of(value, text_area);
    }

    std::array<std::byte, 8> stored = {};
    std::array<std::byte, 16> strings = {};
};

} // namespace

TEST(compare_text, values_as_a_person_reads_them) {
    EXPECT_EQ(cell(0xFFFFFFFE).text_of(VX_INT32), "-2");
    EXPECT_EQ(cell(0xFFFFFFFE).text_of(VX_UINT32), "4294967294");
    EXPECT_EQ(cell(0x3DCCCCCD).text_of(VX_FLOAT32), "0.1");
    EXPECT_EQ(cell(8).text_of(VX_CHAR_PTR), "'it\\'s'");
    EXPECT_EQ(cell(CDB_NONE).text_of(VX_CHAR_PTR), "nothing");
}

TEST(compare_text, a_limit_keeps_texts_from_filling_the_memory) {
    compare::value_writer writer(0);
    std::string half(1 << 19, 'x');
    EXPECT_EQ(writer.text_of(half).size(), half.size() + 2);
    EXPECT_EQ(writer.text_of(half).size(), half.size() + 2);
    EXPECT_THROW(writer.text_of("x"), compare::too_entangled);
}
