/* Data types by name, and from text to values. */

#include "compiler/given_interface.h"
#include "compiler/util_fixture.h"

#include <cerrno>
#include <cfloat>
#include <climits>
#include <cmath>
#include <limits>
#include <utility>

using namespace util_test;

namespace {

/* ---- Types ----------------------------------------------------------------------------------------------------- */

const char *const type_names[] = {"UNKNOWN",     "None",        "Int32",        "UInt32",       "Int64",
                                  "UInt64",      "Float32",     "Float64",      "String",       "Binary",
                                  "RH",          "SD",          "SBS",          "Int32Array",   "UInt32Array",
                                  "Int64Array",  "UInt64Array", "Float32Array", "Float64Array", "StringArray",
                                  "BinaryArray", "RHArray",     "SDArray"};

TEST(Types, AreFoundByTheirNames) {
    for (vx_uint32_t code = 0; code < 23; ++code)
        EXPECT_EQ(strToVxDt(type_names[code]), code) << type_names[code];
}

TEST(Types, OtherNamesAreUnknown) {
    for (const char *name : {"int32", "INT32", "Int32 ", " Int32", "Int", "Int32Arra", "Int32Arrays", "Intx2", "R",
                             "SBSArray", "NoneArray", "Unknown", "Uint32", "uint32", "2", ""})
        EXPECT_EQ(strToVxDt(name), VX_UNKNOWN) << name;
    EXPECT_EQ(strToVxDt(nullptr), VX_UNKNOWN);
}

TEST(Types, VariableTypesAreFoundByTheirNames) {
    const char *const names[] = {"Counter", "Quantity", "State", "Quantum"};
    for (vx_uint32_t code = 0; code < 4; ++code) {
        auto type = static_cast<orb_variable_type_t>(99);
        EXPECT_EQ(strToVar(names[code], &type), 0) << names[code];
        EXPECT_EQ(type, code) << names[code];
    }
}

TEST(Types, OtherVariableTypesLeaveTheResultAlone) {
    for (const char *name : {"counter", "Counter ", "Quant", "STATE", "", static_cast<const char *>(nullptr)}) {
        orb_variable_type_t type = ORB_STATE;
        EXPECT_EQ(strToVar(name, &type), 1);
        EXPECT_EQ(type, ORB_STATE);
    }
}

TEST(Types, ArraysAreThirteenToTwentyTwo) {
    for (vx_uint32_t code = 0; code < 50; ++code)
        EXPECT_EQ(is_vx_array(type_of_code(code)), code >= 13 && code <= 22 ? 1 : 0) << code;
    EXPECT_EQ(is_vx_array(type_of_code(0xFFFFFFFF)), 0);
    EXPECT_EQ(is_vx_array(type_of_code(0x80000000)), 0);
}

TEST(Types, ElementOfAnArrayIsElevenLower) {
    for (vx_uint32_t code = 13; code <= 22; ++code)
        EXPECT_EQ(scalar_vx(type_of_code(code)), code - 11);
    for (vx_uint32_t code : {0U, 1U, 2U, 11U, 12U, 23U, 40U, 0xFFFFFFFFU})
        EXPECT_EQ(scalar_vx(type_of_code(code)), code);
}

/* ---- Integers -------------------------------------------------------------------------------------------------- */

constexpr vx_int32_t INT32_LOWEST = std::numeric_limits<vx_int32_t>::min();

/* Always decimal; silently narrowed, also what the library has saturated: twenty nines become -1, which is not
 * suspicious. */
TEST(Integers, Int32) {
    expectation<vx_int32_t> e;
    e.plain = {{"42", 42},
               {"-42", -42},
               {"+42", 42},
               {" 42", 42},
               {" \t\n\v\f\r-42", -42},
               {"010", 10},
               {"0000000000000000000000000042", 42},
               {"2147483646", 2147483646},
               {"-2147483647", -2147483647},
               {"4294967297", 1},
               {"123456789012345678", -1506741426},
               {"1234567890123456789", 2112454933},
               {"99999999999999999999", -1}};
    e.suspicious = {{"0", 0},
                    {"-0", 0},
                    {"4294967296", 0},
                    {"2147483647", 2147483647},
                    {"-2147483648", INT32_LOWEST},
                    {"2147483648", INT32_LOWEST}};
    e.refused = {"-99999999999999999999"};
    e.hold(VX_INT32, &vx_value_t::val_int32);
}

/* A minus negates, as the library has it. */
TEST(Integers, UInt32) {
    expectation<vx_uint32_t> e;
    e.plain = {{"42", 42},
               {"\t+42", 42},
               {"4294967298", 2},
               {"-2", 4294967294},
               {"4294967294", 4294967294},
               {"2147483647", 2147483647},
               {"2147483648", 2147483648}};
    e.suspicious = {{"0", 0}, {"4294967296", 0}, {"4294967295", 4294967295}, {"-1", 4294967295}};
    e.refused = {"99999999999999999999"};
    e.hold(VX_UINT32, &vx_value_t::val_uint32);
}

TEST(Integers, Int64) {
    expectation<vx_int64_t> e;
    e.plain = {{"-42", -42},
               {"999999999999999999", 999999999999999999},
               {"1000000000000000000", 1000000000000000000},
               {"9223372036854775806", 9223372036854775806},
               {"-9223372036854775807", -9223372036854775807},
               {"2147483647", 2147483647},
               {"-2147483648", INT32_LOWEST}};
    e.suspicious = {{"0", 0}, {"9223372036854775807", 9223372036854775807}, {"-9223372036854775808", LLONG_MIN}};
    e.refused = {"9223372036854775808", "-9223372036854775809"};
    e.hold(VX_INT64, &vx_value_t::val_int64);
}

TEST(Integers, UInt64) {
    expectation<vx_uint64_t> e;
    e.plain = {{"42", 42},
               {"-18446744073709551615", 1},
               {"18446744073709551614", 18446744073709551614U},
               {"9223372036854775807", 9223372036854775807},
               {"4294967295", 4294967295}};
    e.suspicious = {{"0", 0}, {"18446744073709551615", 18446744073709551615U}, {"-1", 18446744073709551615U}};
    e.refused = {"18446744073709551616"};
    e.hold(VX_UINT64, &vx_value_t::val_uint64);
}

TEST(Integers, NothingMayFollowTheNumber) {
    for (const char *text : {"", " ", "-", "+", "abc", "42 ", "42x", "4 2", "1.0", "1,2", "0x10", "--1", "+-1", "- 1",
                             " 42 ", "-42 ", "1234567890123456789x", "-1x"})
        for (vx_data_type_t type : {VX_INT32, VX_UINT32, VX_INT64, VX_UINT64})
            expect_refused(NO_MARKS, type, text);
}

/* ---- Floats ---------------------------------------------------------------------------------------------------- */

/* Deliberate: after an overflow positive infinity, the largest and the smallest normal number are refused, the negative
 * ones are not. */
TEST(Floats, Float32) {
    expectation<float> e;
    e.plain = {{"-1.5", -1.5F},
               {" -2.5e2", -250},
               {"0x1.8p3", 12},
               {"-1e39", -HUGE_VALF},
               {"-inf", -HUGE_VALF},
               {"0x1.fffffcp127", 0x1.fffffcp127F},
               {"-0x1.fffffep127", -FLT_MAX},
               {"-0x1p-126", -FLT_MIN},
               {"0x1p-127", FLT_MIN / 2}};
    e.suspicious = {{"0", 0},
                    {"-0", 0},
                    {"3.40282347e+38", FLT_MAX},
                    {"0x1p-126", FLT_MIN},
                    {"inf", HUGE_VALF},
                    {"INFINITY", HUGE_VALF}};
    e.refused = {"1e39", "1e-60", "-1e-60"};
    e.hold(VX_FLOAT32, &vx_value_t::val_float32);
}

TEST(Floats, Float64) {
    expectation<double> e;
    e.plain = {{"0.1", 0.1},
               {"\t-2.5E-2", -0.025},
               {"0X1.8P3", 12},
               {"1e39", 1e39},
               {"-1e309", -HUGE_VAL},
               {"-Infinity", -HUGE_VAL},
               {"-1.7976931348623157e+308", -DBL_MAX},
               {"-0x1p-1022", -DBL_MIN},
               {"0x1.fffffep127", FLT_MAX},
               {"0x1p-126", FLT_MIN}};
    e.suspicious = {{"0", 0}, {"1.7976931348623157e+308", DBL_MAX}, {"0x1p-1022", DBL_MIN}, {"inf", HUGE_VAL}};
    e.refused = {"1e309", "1e-400", "-1e-400"};
    e.hold(VX_FLOAT64, &vx_value_t::val_float64);
}

TEST(Floats, NanIsTakenWhateverHappenedBefore) {
    for (int left : {0, ERANGE, EINVAL}) {
        marked cx(left);
        vx_value_t single = {}, pair = {};
        EXPECT_EQ(str_to_vx(cx, &single, VX_FLOAT32, with_room("nan"), cx.line_texts), 0);
        EXPECT_EQ(str_to_vx(cx, &pair, VX_FLOAT64_ARRAY, with_room("-NAN"), cx.line_texts), 0);
        EXPECT_TRUE(std::isnan(single.val_float32));
        EXPECT_TRUE(std::isnan(pair.val_float64));
    }
}

TEST(Floats, NothingMayFollowTheNumber) {
    for (const char *text : {"", " ", ".", "1.5 ", "1.5f", "1e", "1,5", "1.5.1", "infinit", "nanny", "abc", "0x"})
        for (vx_data_type_t type : {VX_FLOAT32, VX_FLOAT64})
            expect_refused(NO_MARKS, type, text);
}

/* ---- The mark of an overflow ----------------------------------------------------------------------------------- */

int convert(cdgen &cx, vx_data_type_t type, const char *text) {
    vx_value_t value = {};
    return str_to_vx(cx, &value, type, with_room(text), cx.line_texts);
}

TEST(OverflowMark, RefusesZerosFromThenOn) {
    for (auto [first, text] : {std::pair(VX_INT32, "99999999999999999999"),
                               {VX_UINT32, "99999999999999999999"},
                               {VX_INT64, "-9223372036854775809"},
                               {VX_UINT64, "18446744073709551616"},
                               {VX_FLOAT32, "-1e39"},
                               {VX_FLOAT64, "1e309"}}) {
        SCOPED_TRACE(text);
        cdgen cx;
        EXPECT_EQ(convert(cx, VX_INT32, "0"), 0);
        convert(cx, first, text);
        EXPECT_EQ(cx.conv_errno, ERANGE);
        EXPECT_EQ(convert(cx, VX_UINT64, "5"), 0); /* which does not clear it */
        EXPECT_EQ(convert(cx, VX_FLOAT64, "1e5"), 0);
        for (vx_data_type_t type : {VX_INT32, VX_UINT32, VX_INT64, VX_UINT64, VX_FLOAT32, VX_FLOAT64})
            EXPECT_EQ(convert(cx, type, "0"), -1) << type;
    }
}

TEST(OverflowMark, IsAlsoLeftByPlainNumbersAndVersions) {
    cdgen plain, version;
    EXPECT_EQ(int_from_text(plain, "99999999999999999999", nullptr, 0), LLONG_MAX);
    EXPECT_EQ(plain.conv_errno, ERANGE);
    vx_uint32_t n = 0;
    EXPECT_EQ(ver_str_convert(version, "99999999999999999999.1", &n), 0);
    EXPECT_EQ(version.conv_errno, ERANGE);
}

TEST(OverflowMark, IsNotWhatOtherCallsLeaveInErrno) {
    cdgen cx;
    errno = ERANGE;
    EXPECT_EQ(convert(cx, VX_INT32, "-0"), 0);
    EXPECT_EQ(convert(cx, VX_FLOAT32, "0"), 0);
    EXPECT_EQ(errno, ERANGE);
    errno = ENOMEM;
    EXPECT_EQ(convert(cx, VX_FLOAT64, "1e309"), -1);
    EXPECT_EQ(errno, ENOMEM);
}

/* ---- Plain numbers --------------------------------------------------------------------------------------------- */

struct plain_row {
    const char *text;
    int base;
    vx_int64_t value;
    size_t taken;
};

TEST(PlainNumbers, FollowTheBase) {
    for (plain_row row : {plain_row{"42", 0, 42, 2},
                          {"0x1F", 0, 31, 4},
                          {"0XfF", 0, 255, 4},
                          {"017", 0, 15, 3},
                          {"08", 0, 0, 1},
                          {"0", 0, 0, 1},
                          {"0x", 0, 0, 1},
                          {"-0x10", 0, -16, 5},
                          {" \t+7 ", 0, 7, 4},
                          {"12abc", 0, 12, 2},
                          {"abc", 0, 0, 0},
                          {"", 0, 0, 0},
                          {"010", 10, 10, 3},
                          {"0x10", 10, 0, 1},
                          {"179", 8, 15, 2},
                          {"10", 8, 8, 2},
                          {"1234567890123456789", 0, 1234567890123456789, 19},
                          {"-99999999999999999999", 0, INT64_MIN, 21}}) {
        cdgen cx;
        char *end = nullptr;
        std::string text = with_room(row.text);
        EXPECT_EQ(int_from_text(cx, text, &end, row.base), row.value) << row.text;
        EXPECT_EQ(end, text.data() + row.taken) << row.text;
    }
}

/* ---- Texts and binaries ---------------------------------------------------------------------------------------- */

TEST(Texts, AreCopiedAsTheyStand) {
    for (const char *text : {"disk", " two words ", "a\"b\\101", "0", "0x0"})
        for (vx_data_type_t type : {VX_CHAR_PTR, VX_CHAR_PTR_ARRAY}) {
            cdgen cx;
            std::string original = with_room(text);
            vx_value_t value = {};
            ASSERT_EQ(str_to_vx(cx, &value, type, original, cx.line_texts), 0) << text;
            original.assign(original.size(), '#');
            EXPECT_STREQ(value.ptr_char, text);
        }
}

TEST(Texts, OtherTypesHaveNoTextualForm) {
    cdgen cx;
    for (vx_uint32_t code : {0U, 1U, 10U, 11U, 12U, 21U, 22U, 23U, 40U, 0xFFFFFFFFU})
        EXPECT_EQ(convert(cx, type_of_code(code), "1"), -1) << code;
}

TEST(Texts, MustNotBeEmpty) {
    cdgen cx;
    for (vx_uint32_t code = 0; code < 24; ++code)
        EXPECT_EQ(convert(cx, type_of_code(code), ""), -1) << code;
}

/* Escaped text begins at the place of the length, so its first four bytes are overwritten, deliberately. */
TEST(Binaries, AreHexadecimalAfterAZeroElseEscaped) {
    const row<std::string> taken[] = {{"0x0aFF", bytes().u32(2).text("\x0A\xFF").all},
                                      {"0xabcdefABCDEF", bytes().u32(6).text("\xAB\xCD\xEF\xAB\xCD\xEF").all},
                                      {"0x", bytes().u32(0).all},
                                      {"AB\\101", bytes().u32(3).fill(3).all},
                                      {"ABCD\\1012", bytes().u32(6).text("A2").fill(4).all},
                                      {"1230x", bytes().u32(5).text("x").fill(4).all},
                                      {"xyz", bytes().u32(3).fill(3).all}};
    for (const row<std::string> &r : taken)
        for (vx_data_type_t type : {VX_BINARY_PTR, VX_BINARY_PTR_ARRAY}) {
            cdgen cx;
            vx_value_t value = {};
            ASSERT_EQ(str_to_vx(cx, &value, type, with_room(r.text), cx.line_texts), 0) << r.text;
            EXPECT_EQ(bytes_at(value.ptr_binary, r.value.size()), r.value) << r.text;
        }
    cdgen cx;
    for (const char *text : {"0", "012", "00x1", "0ax1", "0X0a", "0x0", "0x0g", "abcd\\400", "abcd\\"})
        EXPECT_EQ(convert(cx, VX_BINARY_PTR, text), -1) << text;
}

TEST(Binaries, HexadecimalDigitsComeInPairsBehindALowerCaseX) {
    const row<std::string> taken[] = {{"0x", bytes().u32(0).fill(4, 0xEE).all},
                                      {"0x09", bytes().u32(1).text("\x09").fill(3, 0xEE).all},
                                      {"0xAfFa", bytes().u32(2).text("\xAF\xFA").fill(2, 0xEE).all}};
    for (const row<std::string> &r : taken) {
        std::string out(8, '\xEE');
        EXPECT_EQ(hex_convert(out.data(), r.text), 0) << r.text;
        EXPECT_EQ(out, r.value) << r.text;
    }
    for (const char *text : {"", "0", "x", "x0", "10x0", "00", "0X00", "0x0", "0x000", "00x0", "0xg0", "0x0G", "0x/0",
                             "0x0:", "0x@0", "0x0`", "0x 0", " 0x0"}) {
        std::string out(8, '\xEE');
        EXPECT_EQ(hex_convert(out.data(), text), -1) << text;
        EXPECT_EQ(out, std::string(8, '\xEE')) << text;
    }
}

TEST(Binaries, WhatStoodBeforeAWrongDigitStaysWritten) {
    std::string out(8, '\xEE');
    EXPECT_EQ(hex_convert(out.data(), "0x12345x"), -1);
    EXPECT_EQ(out, bytes().fill(4, 0xEE).text("\x12\x34").fill(2, 0xEE).all);
}

/* ---- Escapes --------------------------------------------------------------------------------------------------- */

TEST(Escapes, AreABackslashOrUpToThreeCharactersOfAnOctalNumber) {
    using namespace std::string_view_literals;
    const row<std::string_view> taken[] = {
        {"", ""},          {"a b\"", "a b\""}, {"\\\\", "\\"},    {"\\\\101", "\\101"},  {"\\101\\102", "AB"},
        {"\\1018", "A8"},  {"\\0101", "\b1"},  {"\\18", "\0018"}, {"\\1\\\\", "\001\\"}, {"\\0", "\0"sv},
        {"\\377", "\377"}, {"\\ 41", "!"},     {"\\+41", "!"},    {"\\-1", "\377"},      {"\\0x1", "\0x1"sv}};
    for (const row<std::string_view> &r : taken) {
        cdgen cx;
        std::string out(8, '\xEE');
        EXPECT_EQ(oct_convert(cx, r.text, 1, out.data()), 0) << r.text;
        EXPECT_EQ(out, bytes().text(r.value).fill(1).fill(7 - r.value.size(), 0xEE).all) << r.text;
    }
}

TEST(Escapes, MustBeANumberOfOneByte) {
    for (const char *text : {"\\", "a\\", "\\8", "\\x41", "\\n", "\\\"", "\\ ", "\\400", "\\777", "\\-", "\\1\\"}) {
        cdgen cx;
        std::string out(8, '\xEE');
        EXPECT_EQ(oct_convert(cx, text, 1, out.data()), -1) << text;
        EXPECT_EQ(oct_convert(cx, text, 2, out.data()), -1) << text;
    }
}

TEST(Escapes, LengthOfABlockOverwritesItsFirstFourBytes) {
    const row<std::string> blocks[] = {{"", bytes().u32(0).fill(4, 0xEE).all},
                                       {"ab", bytes().u32(2).fill(4, 0xEE).all},
                                       {"abcd", bytes().u32(4).fill(4, 0xEE).all},
                                       {"abcd\\145f", bytes().u32(6).text("ef").fill(2, 0xEE).all}};
    for (const row<std::string> &r : blocks) {
        cdgen cx;
        std::string out(8, '\xEE');
        EXPECT_EQ(oct_convert(cx, r.text, 2, out.data()), 0) << r.text;
        EXPECT_EQ(out, r.value) << r.text;
    }
}

/* ---- Quotes, lists, versions ----------------------------------------------------------------------------------- */

TEST(Quotes, AreTakenOffAtBothEnds) {
    for (auto [text, stripped] : {std::pair("\"abc\"", "abc"),
                                  {"  \"abc\"", "abc"},
                                  {"\t \"a b \"", "a b "},
                                  {"\"\"", ""},
                                  {"\"", ""},
                                  {" \"", ""},
                                  {"\"a\"b\"", "a\"b"},
                                  {"\"a\\b\"", "a\\b"}}) {
        std::string s = text, same = text;
        EXPECT_STREQ(strip_quotes(s.data()), stripped) << text;
        char *end = same.data() + same.size(), *inside = strip_quotes(same.data(), &end);
        EXPECT_EQ(inside, end - strlen(stripped)) << text;
        EXPECT_EQ(same, s) << text;
    }
}

TEST(Quotes, TextWithoutThemIsReturnedItself) {
    for (const char *text : {"abc", "  abc", "", " ", "abc\"", "a\"b\"", "\\\"abc\""}) {
        std::string s = text;
        EXPECT_EQ(strip_quotes(s.data()), s.data()) << text;
        EXPECT_EQ(s, text);
    }
}

TEST(Quotes, MustMatch) {
    for (const char *text : {"\"abc", "\"abc\\\"", "\"abc\" ", "\"abc\"\t", "\"abc\"x", "\"\\\"", "\"a\\\\\"", "\" "}) {
        std::string s = text;
        EXPECT_EQ(strip_quotes(s.data()), nullptr) << text;
    }
    EXPECT_EQ(strip_quotes(nullptr), nullptr);
}

constexpr props_t props[] = {{"Public", 0x1}, {"Required", 0x20}, {"Public", 0x400}, {"Hidden", 0x8000}};

vx_uint32_t props_of(std::string_view text) {
    std::string list = with_room(text);
    vx_uint32_t bits = 0x80000002;
    set_props(&bits, props, 4, list.data());
    return bits;
}

TEST(Properties, AddTheirBits) {
    EXPECT_EQ(props_of(""), 0x80000002);
    EXPECT_EQ(props_of("Public"), 0x80000003); /* the first of that name */
    EXPECT_EQ(props_of("Hidden,Public"), 0x80008003);
    EXPECT_EQ(props_of("Public,Public"), 0x80000003);
    EXPECT_EQ(props_of(",,Required,,Hidden,"), 0x80008022);
}

TEST(Properties, UnknownOnesAreFatal) {
    cdgen cx;
    cx.source.linenum = 7;
    std::string list; /* messages refer to it */
    auto end = [&](std::string_view text) {
        vx_uint32_t bits = 0;
        list = with_room(text);
        return ending_of([&] { set_props(&bits, props, 3, list.data()); });
    };
    EXPECT_EQ(end("public"), (ending{"public: invalid property", 0, 1}));
    EXPECT_EQ(end("Public, Required"), (ending{" Required: invalid property", 0, 1}));
    EXPECT_EQ(end("Required ,Public"), (ending{"Required : invalid property", 0, 1}));
    EXPECT_EQ(end("Requiredly"), (ending{"Requiredly: invalid property", 0, 1}));
    EXPECT_EQ(end("Hidden"), (ending{"Hidden: invalid property", 0, 1})); /* the fourth of three */
}

TEST(Versions, ArePackedIntoBytes) {
    const row<vx_uint32_t> versions[] = {{"1.2.3.4", 0x01020304},
                                         {"7", 0x07000000},
                                         {"7.1", 0x07010000},
                                         {"1.2.3.4.5", 0x01020304},
                                         {"", 0},
                                         {"1..3", 0x01000300},
                                         {"x.2.y.4", 0x00020004},
                                         {"1x.2y.3z.4w", 0x01020304},
                                         {" 1. 2.+3.4", 0x01020304},
                                         {"010.1", 0x0A010000},
                                         {"0x10.1", 0x00010000},
                                         {"1.2.3.1024", 0x01020700},
                                         {"2.257.770.4", 0x02010204},
                                         {"257.0.0.0", 0x01000000},
                                         {"-1.0.0.0", 0xFF000000},
                                         {"1.0.0.-1", 0xFFFFFFFF},
                                         {"4294967298.0.0.0", 0x02000000}};
    for (const row<vx_uint32_t> &r : versions) {
        cdgen cx;
        vx_uint32_t n = 0xEEEEEEEE;
        EXPECT_EQ(ver_str_convert(cx, r.text, &n), 0) << r.text;
        EXPECT_EQ(n, r.value) << r.text;
    }
}

TEST(Lists, AreSplitAtTheirFirstComma) {
    char list[] = "a,bc,", single[] = "abc";
    char *rest = getNextArrVal(list);
    EXPECT_EQ(rest, list + 2);
    EXPECT_STREQ(list, "a");
    EXPECT_STREQ(rest, "bc,");
    EXPECT_STREQ(getNextArrVal(rest), "");
    EXPECT_STREQ(rest, "bc");
    EXPECT_EQ(getNextArrVal(single), nullptr);
    EXPECT_STREQ(single, "abc");
    EXPECT_EQ(getNextArrVal(nullptr), nullptr);
}

} // namespace
