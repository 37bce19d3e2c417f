/* A range of a class attribute that was stored in a resource attribute of another type is a number in the place of a
 * reference. The reversal must not follow it, wherever it seems to lead. */

#include "compiler/cdgen.h"

#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>
#include <unistd.h>

namespace {

const std::string HEAD = "ControlDefinition\n\tFileVersion=1.0.0.0\n"
                         "ResourceClass\n\tDescription=1\n\tDisplayName=2\n\tProperties=CanDefine\n"
                         "\tClassPermTemplate=0\n\tResourcePermTemplate=0\n\tName=ABCDEFGHIJKLMNOPQRSTUVWXYZ\n";
const std::string TAIL = "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=2\n"
                         "\tMessageCatalog=m.cat\n\tDescriptiveMessageSet=1\n";

std::string attribute(const std::string &stanza, const std::string &type, const std::string &rest) {
    return stanza + "\n\tName=" + stanza + "\n\tDescription=1\n\tDisplayName=2\n\tId=3\n\tDataType=" + type +
           "\n\tVariableType=State\n\tVarietyRange=1,1\n" + rest;
}

size_t count_of(const std::string &all, const std::string &text) {
    size_t count = 0;
    for (size_t at = all.find(text); at != std::string::npos; at = all.find(text, at + 1))
        ++count;
    return count;
}

class CompilesSources : public testing::Test {
protected:
    void SetUp() override {
        directory = std::filesystem::temp_directory_path() / ("cdgen-stray-" + std::to_string(getpid()));
        std::filesystem::create_directory(directory);
        setenv("VX_CDB_FORCE_EMPTY_TIMESTAMP", "", 1);
    }
    void TearDown() override {
        std::filesystem::remove_all(directory);
    }

    std::string compiled(const std::string &source, std::string options) {
        std::string in = directory / "in.cdefsrc", out = directory / "out.cdef", program = "cdgen";
        std::ofstream(in) << source;
        char *argv[] = {program.data(), options.data(), in.data(), out.data(), nullptr};
        EXPECT_EQ(cdgen_main(4, argv), 0);
        std::ifstream image(out, std::ios::binary);
        return {std::istreambuf_iterator<char>(image), {}};
    }

    std::filesystem::path directory;
};

class StrayRange : public CompilesSources, public testing::WithParamInterface<const char *> {};

std::uint32_t word_at(const std::string &image, size_t at) {
    std::uint32_t word = 0;
    memcpy(&word, image.data() + at, sizeof word);
    return word;
}

/* A word of an image, and of its reversal. */
std::string turned_word(const std::string &image, size_t at) {
    std::string word = image.substr(at, 4);
    return {word.rbegin(), word.rend()};
}

/* The class's name is the first string; 8 and 16 lead into it, and as a binary's length would turn "IJKL" to "LKJI". */
TEST_P(StrayRange, DoesNotTurnText) {
    std::string source = HEAD + attribute("DynamicResourceAttribute", GetParam(), "") +
                         attribute("DynamicClassAttribute", "Int32", "\tRange=8,16\n");
    bool is_binary = GetParam() == std::string("Binary");
    for (size_t classes : {1U, 2U}) {  /* completed, and cut short by another class */
        if (is_binary && classes == 1) /* which gets no bounds when it is completed */
            continue;
        std::string whole = source + (classes == 2 ? HEAD : "") + TAIL;
        std::string native = compiled(whole, "-n"), turned = compiled(whole, "-s");
        EXPECT_EQ(count_of(native, "ABCDEFGHIJKLMNOPQRSTUVWXYZ"), classes);
        EXPECT_EQ(count_of(turned, "ABCDEFGHIJKLMNOPQRSTUVWXYZ"), classes);
        size_t ra_min_value = 80 + 16 * (classes + 2) + sizeof(rsrc_class_t) + sizeof(rsrc_dattr_t) + 40;
        std::string word = native.substr(ra_min_value, 4);
        EXPECT_EQ(word[0] + word[3], 8); /* in either order */
        EXPECT_EQ(turned.substr(ra_min_value, 4), std::string(word.rbegin(), word.rend()));
    }
}

/* It stays in the resource attribute while a later class attribute, which the last one completes, gets a default range
 * of its own. */
TEST_P(StrayRange, DoesNotTurnTextAfterAnotherClassAttribute) {
    std::string source = HEAD + attribute("DynamicResourceAttribute", GetParam(), "") +
                         attribute("DynamicClassAttribute", "Int32", "\tRange=8,16\n") +
                         attribute("DynamicClassAttribute", "Int32", "") +
                         attribute("DynamicClassAttribute", "Int32", "") + HEAD + TAIL;
    std::string native = compiled(source, "-n"), turned = compiled(source, "-s");
    EXPECT_EQ(count_of(turned, "ABCDEFGHIJKLMNOPQRSTUVWXYZ"), 2U);
    size_t ra_min_value = 80 + 16 * 4 + sizeof(rsrc_class_t) + 3 * sizeof(rsrc_dattr_t) + 40;
    EXPECT_EQ(word_at(native, ra_min_value), 8U);
    EXPECT_EQ(turned.substr(ra_min_value, 4), turned_word(native, ra_min_value));
}

INSTANTIATE_TEST_SUITE_P(Types, StrayRange,
                         testing::Values("Binary", "StringArray", "BinaryArray", "SDArray", "RHArray"));

class StrayArrayRange : public StrayRange {};

/* The count, and of the element what the record's type has there: a word. 8 and 16, the first words of the elements,
 * lead into the class's name, which must stay. */
TEST_P(StrayArrayRange, IsReversedAsTheRecordSays) {
    constexpr size_t CLASS = 80 + 16 * 3;
    constexpr size_t BOUNDS =
        CLASS + sizeof(rsrc_class_t) + sizeof(rsrc_dattr_t) + offsetof(rsrc_dattr_t, ra_min_value);
    std::string source = HEAD + attribute("DynamicResourceAttribute", GetParam(), "") +
                         attribute("DynamicClassAttribute", "Int64Array", "\tRange=73014444040,16\n") + TAIL;
    std::string native = compiled(source, "-n"), turned = compiled(source, "-s");
    EXPECT_EQ(count_of(turned, "ABCDEFGHIJKLMNOPQRSTUVWXYZ"), 1U);
    size_t strings = CLASS + word_at(native, CLASS + offsetof(rsrc_class_t, u_rc_strings));
    for (size_t bound : {BOUNDS, BOUNDS + sizeof(vx_value_t)}) {
        size_t array = strings + word_at(native, bound);
        EXPECT_EQ(word_at(native, array), 1U);
        EXPECT_EQ(turned.substr(bound, 4), turned_word(native, bound));
        EXPECT_EQ(turned.substr(array, 4), turned_word(native, array));
        EXPECT_EQ(turned.substr(array + 8, 4), turned_word(native, array + 8));
        EXPECT_EQ(turned.substr(array + 12, 4), native.substr(array + 12, 4));
    }
}

INSTANTIATE_TEST_SUITE_P(Types, StrayArrayRange, testing::Values("StringArray", "BinaryArray", "SDArray", "RHArray"));

class StrayWideRange : public CompilesSources {};

/* A number of 32 bits fills half a cell; a record of 64-bit numbers has the whole cell reversed. */
TEST_F(StrayWideRange, IsReversedInTheWidthOfTheRecord) {
    constexpr size_t CLASS = 80 + 16 * 3;
    constexpr size_t BOUND = CLASS + sizeof(rsrc_class_t) + sizeof(rsrc_dattr_t) + offsetof(rsrc_dattr_t, ra_min_value);
    for (const char *type : {"Int64Array", "Float64Array"}) {
        std::string source = HEAD + attribute("DynamicResourceAttribute", type, "") +
                             attribute("DynamicClassAttribute", "Int32Array", "\tRange=16909060,16\n") + TAIL;
        std::string native = compiled(source, "-n"), turned = compiled(source, "-s");
        size_t array = CLASS + word_at(native, CLASS + offsetof(rsrc_class_t, u_rc_strings)) + word_at(native, BOUND);
        std::string cell = native.substr(array + 8, 8);
        EXPECT_EQ(word_at(cell, 0), 16909060U);
        EXPECT_EQ(turned.substr(array, 4), turned_word(native, array));
        EXPECT_EQ(turned.substr(array + 8, 8), std::string(cell.rbegin(), cell.rend()));
    }
}

} // namespace
