/* Lines and values as texts that the compiler reads back. */

#include "cdef/source/text.h"

#include <gtest/gtest.h>

#include <limits>

namespace {

using cdef::source::append_attribute_line;
using cdef::source::is_default;
using cdef::source::texts_of;

using texts = std::vector<std::string>;

/* A value cell with a number in it. */
template <class Number> cdb::value cell(vx_data_type_t type, Number number) {
    std::array<std::byte, 8> bytes = {};
    std::memcpy(bytes.data(), &number, sizeof number);
    return {cdb::bytes(bytes, std::endian::native), 0, type, cdb::bytes()};
}

/* Strings with a value at 8, and a cell that leads to it. */
struct stored {
    explicit stored(std::string_view value) : strings(8, '\0') {
        strings += value;
        strings.resize(strings.size() + 8);
    }
    cdb::value as(vx_data_type_t type) const {
        const cdb::bytes area(std::as_bytes(std::span(strings)), std::endian::native);
        const std::uint32_t word[] = {8, 0};
        return {cdb::bytes(std::as_bytes(std::span(word)), std::endian::native), 0, type, area};
    }

    std::string strings;
};

/* A binary: its length, 4 bytes of filling, its bytes. */
std::string binary(std::string_view bytes) {
    auto length = static_cast<std::uint32_t>(bytes.size());
    std::string made(8, '\0');
    std::memcpy(made.data(), &length, sizeof length);
    return made.append(bytes);
}

/* The line that is appended; nothing if there is none, and then nothing is appended. */
std::optional<std::string> attribute_line(std::string_view name, std::string_view value) {
    const std::string before = "ResourceClass\n";
    std::string text = before;
    bool is_appended = append_attribute_line(text, name, value);
    EXPECT_TRUE(text.starts_with(before));
    EXPECT_EQ(text.size() > before.size(), is_appended);
    return is_appended ? std::optional(text.substr(before.size())) : std::nullopt;
}

TEST(SourceLine, IsIndented) {
    EXPECT_EQ(attribute_line("Name", "Disk"), "\tName=Disk\n");
}

TEST(SourceLine, IsQuotedWhereTheCompilerWouldCutIt) {
    for (std::string value : {"a#b", "a//b", "a/*b", "a ", "a\t"})
        EXPECT_EQ(attribute_line("Name", value), "\tName=\"" + value + "\"\n");
}

TEST(SourceLine, NoLineGivesNothingOrANewline) {
    EXPECT_EQ(attribute_line("Name", ""), std::nullopt);
    EXPECT_EQ(attribute_line("Name", "a\nb"), std::nullopt);
    EXPECT_EQ(attribute_line("Name", "#\\"), std::nullopt); /* the backslash would hide the closing quote */
}

TEST(SourceLine, HasAtMost254Characters) {
    EXPECT_TRUE(attribute_line("Name", std::string(248, 'x')));
    EXPECT_FALSE(attribute_line("Name", std::string(249, 'x')));
}

TEST(SourceTexts, NumbersAreDecimal) {
    EXPECT_EQ(texts_of(cell<std::int32_t>(VX_INT32, -7), false), texts{"-7"});
    EXPECT_EQ(texts_of(cell<std::uint64_t>(VX_UINT64, 18446744073709551615U), false), texts{"18446744073709551615"});
    EXPECT_EQ(texts_of(cell(VX_FLOAT32, 0.1F), false), texts{"0.1"});
}

/* The compiler remembers an underflow and refuses later zeros. */
TEST(SourceTexts, NumbersThatWouldUnderflowAreHexadecimal) {
    EXPECT_EQ(texts_of(cell(VX_FLOAT64, std::numeric_limits<double>::denorm_min()), false),
              texts{"0x0.0000000000001p-1022"});
}

TEST(SourceTexts, ASignallingNanHasNone) {
#ifdef __i386__
    GTEST_SKIP() << "a function that returns a signalling NaN returns a quiet one here";
#endif
    EXPECT_EQ(texts_of(cell<std::uint64_t>(VX_FLOAT64, 0x7FF0000000000001), false), texts());
    EXPECT_EQ(texts_of(cell<std::uint64_t>(VX_FLOAT64, 0x7FF8000000000000), false), texts{"nan"});
}

TEST(SourceTexts, ATextWithACommaIsNoneInAPair) {
    EXPECT_EQ(texts_of(stored("a,b").as(VX_CHAR_PTR), false), texts{"a,b"});
    EXPECT_EQ(texts_of(stored("a,b").as(VX_CHAR_PTR), true), texts());
}

TEST(SourceTexts, BinariesAreHexadecimal) {
    EXPECT_EQ(texts_of(stored(binary("\x01\xff")).as(VX_BINARY_PTR), false), texts{"0x01ff"});
}

/* Four bytes are lost in front of the shorter forms, and four zeros are added. */
TEST(SourceTexts, BinariesThatEndInZerosHaveShorterForms) {
    const std::string bytes("a,b\0\0\0\0", 7);
    EXPECT_EQ(texts_of(stored(binary(bytes)).as(VX_BINARY_PTR), false),
              (texts{"0x612c6200000000", "....a,b", "....a,b"}));
    EXPECT_EQ(texts_of(stored(binary(bytes)).as(VX_BINARY_PTR), true),
              (texts{"0x612c6200000000", "....a\\054b", "....a\\054b"}));
}

TEST(SourceDefault, ZeroIsDefaultButNotItsNegative) {
    EXPECT_TRUE(is_default(cell<std::int32_t>(VX_INT32, 0)));
    EXPECT_FALSE(is_default(cell<std::int32_t>(VX_INT32, 1)));
    EXPECT_TRUE(is_default(cell(VX_FLOAT64, 0.0)));
    EXPECT_FALSE(is_default(cell(VX_FLOAT64, -0.0)));
}

TEST(SourceDefault, AnEmptyTextIsDefault) {
    EXPECT_TRUE(is_default(stored("").as(VX_CHAR_PTR)));
    EXPECT_FALSE(is_default(stored("a").as(VX_CHAR_PTR)));
    EXPECT_FALSE(is_default(cell<std::uint32_t>(VX_CHAR_PTR, CDB_NONE)));
}

} // namespace
