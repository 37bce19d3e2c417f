/* The certain corrections of a source. */

#include "check/fix.h"

#include "check/edits.h"
#include "check/found_in.h"

namespace {

using check::certainty;
using check::correction;
using found_in::CLASS;
using found_in::persistent;

check::fixed_source fixed(std::string_view source) {
    return check::fix_bytes(source, "source", found_in::all_warnings());
}

std::string replaced(std::string text, std::string_view what, std::string_view by) {
    return text.replace(text.find(what), what.size(), by);
}

TEST(Corrected, ReplacesInAnyOrder) {
    std::vector<correction> all = {{certainty::certain, {{2, 1, 1, "c", "CC"}, {2, 3, 3, "", "!"}}},
                                   {certainty::certain, {{1, 2, 2, "b\n", "\n"}}}};
    EXPECT_EQ(check::corrected("ab\ncd", all), "a\nCCd!");
    EXPECT_EQ(check::corrected("ab\nxd", all), std::nullopt);
    EXPECT_EQ(check::corrected("ab", all), std::nullopt);
}

TEST(Compatible, KeepsTheFirstOfTwoThatOverlap) {
    auto one = [](size_t column, std::string removed) {
        return correction{certainty::certain, {{1, column, column, std::move(removed), "x"}}};
    };
    EXPECT_EQ(check::compatible({one(3, "cd"), one(4, "d"), one(1, "abc"), one(1, "ab"), one(5, "e")}).size(), 3u);
    EXPECT_EQ(check::compatible({one(3, ""), one(3, "")}).size(), 1u);
    EXPECT_EQ(check::compatible({one(2, "b"), one(3, "")}).size(), 2u);
    EXPECT_EQ(check::compatible({one(2, "b\n"), correction{certainty::certain, {{2, 1, 1, "c", ""}}}}).size(), 2u);
}

TEST(Fix, LeavesASoundSourceAlone) {
    EXPECT_EQ(fixed(CLASS).text, CLASS);
    EXPECT_EQ(fixed(CLASS).corrected, 0u);
}

TEST(Fix, CorrectsMisspeltNamesOfEachKind) {
    std::string sound = CLASS + persistent("A", "0", "String", "\tProperties=Public,Select\n");
    for (auto [name, misspelt] : {std::pair("PersistentResourceAttribute", "PersistentResourcAttribute"),
                                  {"DataType", "Datatype"},
                                  {"=String", "=Strnig"},
                                  {"Select", "Selekt"},
                                  {"ClassToManagerMapping", "ClassToManagerMaping"}})
        EXPECT_EQ(fixed(replaced(sound, name, misspelt)).text, sound) << misspelt;
}

TEST(Fix, RemovesBlanksBeforeTheEqualsSign) {
    EXPECT_EQ(fixed(replaced(CLASS, "Name=", "Name \t=")).text, CLASS);
    EXPECT_EQ(fixed(replaced(CLASS, "FirstKey=", "FristKey =")).text, CLASS);
}

TEST(Fix, MovesHeadersToColumn1) {
    EXPECT_EQ(fixed(replaced(CLASS, "ClassTo", " \tClassTo")).text, CLASS);
    EXPECT_EQ(fixed(replaced(CLASS, "ControlDef", " ControlDef")).text, CLASS);
    EXPECT_EQ(fixed(replaced(CLASS, "ClassToMan", "  ClasToMan")).text, CLASS);
}

TEST(Fix, IndentsAttributes) {
    EXPECT_EQ(fixed(replaced(CLASS, "\tDisplay", "Display")).text, CLASS);
    EXPECT_EQ(fixed(replaced(CLASS, "\tDisplay", "Dislay")).text, CLASS);
}

TEST(Fix, MovesOptionalAttributesAfterTheRequiredOnes) {
    std::string required = "\tName=A\n\tDescription=3\n";
    std::string rest = "\tDisplayName=4\n\t# four\n\tId=0\n\tDataType=String\n\tVarietyRange=1,1";
    std::string optional = "\tProperties=Public # yes\n\tGroupID=1\n";
    std::string header = CLASS + "PersistentResourceAttribute\n";
    EXPECT_EQ(fixed(header + required + optional + rest + "\n").text, header + required + rest + "\n" + optional);
    EXPECT_EQ(fixed(header + optional + required + rest).text,
              header + required + rest + "\n" + optional.substr(0, optional.size() - 1));
}

TEST(Fix, MovesNothingIfARequiredAttributeIsMissing) {
    std::string source = CLASS + "PersistentResourceAttribute\n\tName=A\n\tProperties=Public\n\tId=0\n";
    EXPECT_EQ(fixed(source).text, source);
}

TEST(Fix, RemovesCarriageReturnsAtTheEndsOfLines) {
    std::string sound = "# comment\n\n" + CLASS + "#" + std::string(300, 'x') + "\n";
    std::string returns;
    for (char c : sound)
        returns += c == '\n' ? "\r\n" : std::string(1, c);
    EXPECT_EQ(fixed(returns).text, sound);
    EXPECT_EQ(fixed(returns).corrected, 1u);
    EXPECT_EQ(fixed(replaced(CLASS, "Name=Pump", "Name=\"Pump\"\r")).text, replaced(CLASS, "Pump", "\"Pump\""));
    std::string within = replaced(CLASS, "Pump", "Pu\rmp");
    EXPECT_EQ(fixed(within).text, within);
}

TEST(Fix, RemovesAnyNumberOfCarriageReturns) {
    std::string empty_lines(70000, '\n');
    std::string returns;
    for (size_t i = 0; i < empty_lines.size(); ++i)
        returns += "\r\n";
    EXPECT_EQ(fixed(CLASS + returns).text, CLASS + empty_lines);
}

/* A round makes 16384 edits. After them the attribute has been given, so the others may be meant for another one. */
TEST(Fix, LeavesWhatAnEarlierRoundHasMadeUncertain) {
    std::string source = "ControlDefinition\nPersistentResourceAttribute\n";
    for (int i = 0; i < 16385; ++i)
        source += "\tId =1\n";
    EXPECT_EQ(fixed(source).corrected, 16384u);
}

TEST(Fix, RemovesAByteOrderMark) {
    EXPECT_EQ(fixed("\xEF\xBB\xBF" + CLASS).text, CLASS);
    EXPECT_EQ(fixed("\xEF\xBB\xBF# x\r\n" + CLASS).text, "# x\n" + CLASS);
    EXPECT_EQ(fixed("\xEF\xBB\xBF" + replaced(CLASS, "Control", "Contol")).text, CLASS);
}

TEST(Fix, LeavesWhatIsOnlyLikely) {
    std::string source = CLASS + persistent("A", "0", "int");
    EXPECT_EQ(fixed(source).text, source);
}

/* With the corrected header, the map lacks its manager, and its keys are in the wrong order. */
TEST(Fix, DropsACorrectionThatBringsMoreErrors) {
    std::string source = replaced(CLASS, "Mapping\n\tResourceManager=M\n\tFirstKey=1", "Maping\n\tFirstKey=5");
    check::fixed_source made = fixed(source);
    EXPECT_EQ(made.text, source);
    EXPECT_EQ(made.corrected, 0u);
    EXPECT_EQ(made.dropped, 1u);
}

/* With the right type, each of the three lines at the end of a stanza is an error. A good correction does not make up
 * for two more errors. */
std::string source_of_harmful_corrections(int count) {
    std::string source = CLASS;
    for (int i = 0; i < count; ++i) {
        std::string number = std::to_string(i);
        source += persistent("A" + number, number, "Int3", "\tDefaultValue=a\n\tDefaultValue=b\n\tDefaultValue=c\n");
    }
    return source;
}

TEST(Fix, FindsTheGoodCorrectionAmongManyHarmfulOnes) {
    std::string source = source_of_harmful_corrections(30);
    check::fixed_source made = fixed(source + persistent("B", "30", "Strnig"));
    EXPECT_EQ(made.text, source + persistent("B", "30", "String"));
    EXPECT_EQ(made.corrected, 1u);
    EXPECT_EQ(made.dropped, 30u);
}

/* 200 checks would be needed. */
TEST(Fix, ChecksALargeSourceAtMost64TimesToFindGoodCorrections) {
    std::string source = source_of_harmful_corrections(100) + persistent("B", "100", "Strnig");
    while (source.size() <= size_t{2} << 20)
        source += "# " + std::string(100, '-') + "\n";
    check::fixed_source made = fixed(source);
    EXPECT_EQ(made.text, source);
    EXPECT_EQ(made.corrected, 0u);
    EXPECT_EQ(made.dropped, 101u);
}

} // namespace
