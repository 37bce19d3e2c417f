#include "cdef/diff/typed.h"

#include <gtest/gtest.h>

#include <cstring>

namespace {

constexpr cdb::field_fact ANY = {.field = "a_field"};
constexpr std::size_t SIZE = 0;

/* A cell at 0 of the given word, and strings with the given bytes at 8. */
struct cell {
    explicit cell(std::uint32_t word, std::string_view text = "it's") {
        std::memcpy(stored.data(), &word, sizeof word);
        std::memcpy(strings.data() + 8, text.data(), text.size());
    }
    compare::fact fact_of(vx_data_type_t type, bool is_own = true) {
        cdb::bytes text_area(strings, std::endian::native);
        cdb::value value({stored, std::endian::native}, 0, type, text_area);
        return {&ANY, compare::owned_value{value, is_own, text_area, nullptr}};
    }
    std::string json_of(vx_data_type_t type, bool is_own = true) {
        return cdef::diff::typed_values(SIZE).of_fact(fact_of(type, is_own));
    }

    std::array<std::byte, 8> stored = {};
    std::array<std::byte, 24> strings = {};
};

std::string json_of(std::uint32_t number, cdb::meaning as) {
    cdb::field_fact what = {.field = "a_field", .as = as};
    return cdef::diff::typed_values(SIZE).of_fact({&what, number});
}

} // namespace

TEST(diff_typed, values) {
    EXPECT_EQ(cell(0xFFFFFFFE).json_of(VX_INT32), "-2");
    EXPECT_EQ(cell(0xFFFFFFFE).json_of(VX_UINT32), "4294967294");
    EXPECT_EQ(cell(0x3DCCCCCD).json_of(VX_FLOAT32), "0.1");
    EXPECT_EQ(cell(0x7F800000).json_of(VX_FLOAT32), "\"inf\"");
    EXPECT_EQ(cell(8).json_of(VX_CHAR_PTR), "\"it's\"");
    EXPECT_EQ(cell(8, "\xff").json_of(VX_CHAR_PTR), R"({"bytes":"ff"})");
    EXPECT_EQ(cell(CDB_NONE).json_of(VX_CHAR_PTR), "null");
}

TEST(diff_typed, what_is_not_the_records_own_is_not_followed) {
    EXPECT_EQ(cell(8).json_of(VX_CHAR_PTR, false), R"({"misplaced": 8})");
    EXPECT_EQ(cell(7).json_of(VX_INT32, false), "7");
}

TEST(diff_typed, numbers_as_their_fields_mean_them) {
    EXPECT_EQ(json_of(0xFFFFFFFF, cdb::meaning::SIGNED), "-1");
    EXPECT_EQ(json_of(0x01020304, cdb::meaning::VERSION), "\"1.2.3.4\"");
    EXPECT_EQ(json_of(255, cdb::meaning::NONE_IS_255), "null");
    EXPECT_EQ(json_of(CDB_NONE, cdb::meaning::UNUSED), "0");
}

TEST(diff_typed, only_values_have_a_data_type) {
    EXPECT_EQ(cdef::diff::type_of(cell(7).fact_of(VX_INT32)), "Int32");
    EXPECT_EQ(cdef::diff::type_of({&ANY, 7U}), std::nullopt);
    EXPECT_EQ(cdef::diff::type_of({&ANY, std::string_view("7")}), std::nullopt);
}

TEST(diff_typed, the_same_long_text_may_not_come_too_often) {
    std::string half(1 << 19, 'x');
    cdef::diff::typed_values values(SIZE);
    compare::fact text = {&ANY, std::string_view(half)};
    EXPECT_EQ(values.of_fact(text).size(), half.size() + 2);
    EXPECT_EQ(values.of_fact(text).size(), half.size() + 2);
    EXPECT_THROW(values.of_fact(text), compare::too_entangled);
}
