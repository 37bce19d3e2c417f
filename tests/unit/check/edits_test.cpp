/* The edits that cure findings. */

#include "check/current_line.h"
#include "check/found_in.h"

#include <cstdlib>
#include <sys/resource.h>

namespace {

using found_in::CLASS;
using found_in::findings_in;
using found_in::persistent;

/* "16:1(1) Actoin -> Action certain" for each edit: line, column, character. */
std::string fixes_in(std::string_view source) {
    std::string all;
    for (const check::finding &found : findings_in(source))
        for (const check::edit &each : found.fix.edits)
            all += std::to_string(each.line) + ":" + std::to_string(each.column) + "(" +
                   std::to_string(each.character) + ") " + each.removed + " -> " + each.text +
                   (found.fix.sure == check::certainty::certain ? " certain" : " likely") + "\n";
    return all;
}

/* Also those behind so many errors that other warnings no longer wait. */
TEST(Edits, RemoveTheCarriageReturnsOfAllLines) {
    std::string errors;
    for (int i = 0; i < 5000; ++i)
        errors += "Nothing\n";
    std::string all = fixes_in("# one\r\n" + CLASS + errors + "# two\r\n");
    EXPECT_EQ(all, "1:6(6) \r ->  certain\n5017:6(6) \r ->  certain\n");
}

TEST(Edits, CorrectEachKindOfName) {
    EXPECT_EQ(fixes_in(CLASS + "PersistentResorceAttribute\n\tName=A\n\tDescripton=3\n\tDisplayName=4\n\tId=0\n"
                               "\tDataType=string\n\tVarietyRange=1,1\n\tProperties=Public,Slect\n"),
              "16:1(1) PersistentResorceAttribute -> PersistentResourceAttribute certain\n"
              "18:2(2) Descripton -> Description certain\n"
              "21:11(11) string -> String certain\n"
              "23:20(20) Slect -> Select certain\n");
    EXPECT_EQ(fixes_in(CLASS + found_in::element("OnlineSDDefinition", "In32")), "21:11(11) In32 -> Int32 certain\n");
}

TEST(Edits, AreLikelyFromTheSecondLetterOn) {
    EXPECT_EQ(fixes_in(CLASS + persistent("A", "0", "Strnigg")), "21:11(11) Strnigg -> String likely\n");
}

TEST(Edits, AreLikelyForNamesOfTheSourceItself) {
    std::string source = CLASS + persistent("Serial", "0", "String");
    source.insert(source.find("\tName=Pump"), "\tLocator=Seral\n");
    EXPECT_EQ(fixes_in(source), "9:10(10) Seral -> Serial likely\n");
    EXPECT_EQ(fixes_in(CLASS + found_in::dynamic("DynamicResourceAttribute", "L", "0", "\tVariableClass=Slw\n") +
                       "ResourceVariableClass\n\tVariableClass=Slow\n\tObservationInterval=9\n"
                       "\tReportingInterval=9\n"),
              "24:16(16) Slw -> Slow likely\n");
}

TEST(Edits, DoNotNameATypeThatIsRefused) {
    EXPECT_EQ(fixes_in(CLASS + persistent("A", "0", "SBSS")), "");
}

TEST(Edits, CountLinesAsTheFileDoes) {
    std::string long_comment = "# " + std::string(600, 'x') + "\n";
    EXPECT_EQ(fixes_in(long_comment + CLASS + persistent("A", "0", "Sting")), "22:11(11) Sting -> String certain\n");
    EXPECT_EQ(fixes_in(CLASS + "#" + std::string(253, 'x') + "ResourceActoin\n"), "");
}

TEST(Edits, CountCharactersToo) {
    std::string text = "\tName=\xC3\xA4.b\n";
    char *mark = text.data() + text.size();
    check::current_line line;
    line.read({text.data(), text.data() + text.size() - 1, mark, mark, nullptr, 0}, 1);
    check::edit made = line.replacement({1, 10, 1}, line.raw, "c");
    EXPECT_EQ(made.column, 10u);
    EXPECT_EQ(made.character, 9u);
    EXPECT_EQ(made.removed, "b");
}

TEST(Places, AreThoseOfTheFileToo) {
    check::place latest;
    for (const check::finding &found : findings_in(CLASS + "#" + std::string(600, 'x') + "\nUnknwon\n")) {
        latest = found.at;
        if (latest.line == 17) { /* the second piece of the comment */
            EXPECT_EQ(latest.file_line, 16);
            EXPECT_EQ(latest.file_column, 255u);
        }
    }
    EXPECT_EQ(latest.line, 19);
    EXPECT_EQ(latest.file_line, 17);
    EXPECT_EQ(latest.file_column, 1u);
}

/* Reads a line of so many pieces, and finds a place in each. Exits with 0 if that takes no more than a minute, and if
 * all places are right. */
void find_in_pieces(int count) {
    constexpr rlimit MINUTE = {60, 60};
    setrlimit(RLIMIT_CPU, &MINUTE);
    std::string piece(LINE_MAX_CHARS, 'x');
    char *end = piece.data() + piece.size();
    check::current_line line;
    bool right = true;
    for (int number = 1; number <= count; ++number) {
        line.read({piece.data(), end, end, end, nullptr, 0}, number);
        check::place at = {number, 2, 1};
        line.find_in_file(at);
        right = right && at.file_line == 1 && at.file_column == static_cast<size_t>(number - 1) * LINE_MAX_CHARS + 2;
    }
    std::_Exit(right ? EXIT_SUCCESS : EXIT_FAILURE);
}

/* The time does not grow with the square of the pieces. */
TEST(Places, AreFoundSoonInALongLine) {
    constexpr int PIECES = 1'000'000;
    EXPECT_EXIT(find_in_pieces(PIECES), testing::ExitedWithCode(EXIT_SUCCESS), "");
}

TEST(Places, AreFoundInLongLinesAfterEachOther) {
    check::place latest;
    std::string two = "#" + std::string(600, 'x') + "\n#" + std::string(300, 'x') + "\n";
    for (const check::finding &found : findings_in(CLASS + two + "#" + std::string(252, 'x') + "\nUnknwon\n"))
        latest = found.at;
    EXPECT_EQ(latest.line, 22);
    EXPECT_EQ(latest.file_line, 19);
    EXPECT_EQ(latest.file_column, 1u);
}

} // namespace
