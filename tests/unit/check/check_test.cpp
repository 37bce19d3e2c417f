/* The checking library: bytes in, findings out. */

#include "check/found_in.h"
#include "compiler/stepwise.h"
#include "sample.h"

namespace {

using found_in::CLASS;
using found_in::codes;
using found_in::element;
using found_in::findings_in;
using found_in::found_in;
using found_in::persistent;

TEST(Check, FindsNothingInASoundSource) {
    check::totals count = check::check_bytes(CLASS, "x", found_in::all_warnings(), [](check::finding &&) { FAIL(); });
    EXPECT_EQ(count.errors, 0u);
    EXPECT_EQ(count.warnings, 0u);
}

TEST(Check, CountsWhatItHandsOver) {
    std::string source = CLASS + persistent("A", "x", "Sting", "\tDefaultValue=1\n");
    size_t handed = 0;
    check::totals count =
        check::check_bytes(source, "x", found_in::all_warnings(), [&](check::finding &&) { ++handed; });
    EXPECT_EQ(count.errors, 1u);
    EXPECT_EQ(count.warnings, 1u);
    EXPECT_EQ(handed, 2u);
}

TEST(Check, HandsFindingsOverByLine) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "SDx") + "DynamicResourceAttribute\n\tName=B\n"),
              (codes{"S202 21:11+3", "S111 24"}));
    EXPECT_EQ(found_in(""), (codes{"S301 0", "S302 0"}));
}

TEST(Check, TakesSourcesLargerThanTheReadBuffer) {
    std::string comments(200000, '\n');
    EXPECT_EQ(found_in(CLASS + comments + "Unknwon\n"), codes{"S101 200016:1+7"});
}

/* Lines are saved many at a time, before the compiler takes them apart; those in pieces are saved by themselves. */
TEST(Check, ShowsEachLineAsItWasRead) {
    std::string source = CLASS;
    std::vector<std::string> expected;
    sampling::sample lines = sampling::of_this_run();
    for (int i = 0; i < 20000; ++i) {
        if (!lines.takes())
            continue;
        expected.push_back("Unknown" + std::to_string(i) + "=\"" + std::string(static_cast<size_t>(i) % 100, 'x') +
                           "\"  #");
        source += expected.back() + "\n";
        if (i % 500 == 0)
            source += "#" + std::string(600, '#') + "\n";
    }
    std::vector<check::finding> found = findings_in(source, {});
    ASSERT_EQ(found.size(), expected.size());
    for (size_t i = 0; i < found.size(); ++i)
        EXPECT_EQ(found[i].source, expected[i]);
}

TEST(Check, TakesEveryByte) {
    std::string bytes = CLASS;
    for (int byte = 0; byte < 256; ++byte)
        bytes += static_cast<char>(byte);
    EXPECT_FALSE(found_in(bytes).empty());
}

TEST(Check, SaysWhichFileCannotBeRead) {
    try {
        check::check_file("/nowhere/at all", found_in::all_warnings(), [](check::finding &&) {});
        FAIL();
    } catch (const check::cannot_check &failure) {
        EXPECT_STREQ(failure.what(), "/nowhere/at all: cannot open because: No such file or directory");
    }
}

/* ---- Compiling in the same pass --------------------------------------------------------------------------------- */

std::string text_of(const std::vector<std::byte> &image) {
    return {reinterpret_cast<const char *>(image.data()), image.size()};
}

const std::string NAMELESS = CLASS.substr(0, CLASS.find("\tName=Pump\n")) + CLASS.substr(CLASS.find("ClassToManager"));

TEST(Compile, MakesTheDatabaseInBothByteOrders) {
    std::string native, reversed;
    check::compile_job job = {"Out.cdef", [&](stepwise_compiler &compiler, const check::view &) {
                                  std::vector<std::byte> image = compiler.image();
                                  native = text_of(image);
                                  reversed = text_of(compiler.reversed(std::move(image)));
                              }};
    check::totals count = check::check_bytes(
        CLASS, "x", found_in::all_warnings(), [](check::finding &&) {}, &job);
    EXPECT_EQ(count.errors + count.warnings, 0u);
    EXPECT_EQ(native.size(), reversed.size());
    EXPECT_EQ(native.substr(8, 4), std::string(reversed.rbegin() + static_cast<long>(reversed.size()) - 12,
                                               reversed.rbegin() + static_cast<long>(reversed.size()) - 8));
    EXPECT_NE(native.find("Pump"), std::string::npos);
}

/* What is found if a source is compiled to an output; with the output's bytes, if there are any. */
codes compiled(const std::string &source, const std::string &output, std::string &image) {
    codes found;
    check::compile_job job = {
        output, [&](stepwise_compiler &compiler, const check::view &) { image = text_of(compiler.image()); }};
    check::check_bytes(
        source, "x", found_in::all_warnings(),
        [&](check::finding &&each) { found.push_back(found_in::shown(each) + " " + each.text); }, &job);
    return found;
}

TEST(Compile, MakesNothingOfASourceWithErrors) {
    std::string image;
    EXPECT_EQ(compiled(CLASS + "Unknwon\n", "Out.cdef", image), codes{"S101 16:1+7 Invalid table name: Unknwon"});
    EXPECT_EQ(image, "");
}

TEST(Compile, WarnsOfAClassThatIsCalledAfterTheOutput) {
    std::string image;
    EXPECT_EQ(compiled(NAMELESS, "d.cdef/Out.cdef", image),
              codes{"S601 3:1+13 the class has no `Name`: it is called `d`, after the database"});
    EXPECT_NE(image.find(std::string("d\0", 2)), std::string::npos);
    EXPECT_EQ(found_in(NAMELESS), codes());
}

TEST(Compile, WarnsOfEachNamelessClassOnce) {
    std::string image;
    EXPECT_EQ(compiled("ControlDefinition\n\tFileVersion=1\n" + NAMELESS, "O.cdef", image),
              (codes{"S523 1:1+17 the class has no `ResourceClass`: its properties and message numbers are 0",
                     "S601 1:1+17 the class has no `Name`: it is called `O`, after the database",
                     "S601 5:1+13 the class has no `Name`: it is called `O`, after the database"}));
}

TEST(Compile, RefusesANamelessClassIfTheOutputGivesNone) {
    std::string image;
    EXPECT_EQ(compiled(NAMELESS, "-", image), codes{"S308 14 Invalid cdef out file name (must end in .cdef)"});
    EXPECT_EQ(compiled(CLASS, "-", image), codes());
    EXPECT_NE(image, "");
}

TEST(Recovery, ReportsAMisspeltPermissionAfterASecondName) {
    EXPECT_EQ(found_in(CLASS + "ResourceAction\n\tName=A\n\tDescription=3\n\tDisplayName=4\n\tId=0\n"
                               "\tVarietyRange=1,1\n\tName=B\n\tPermision=x\n"),
              (codes{"S109 22:2+4", "S106 23:2+9"}));
}

TEST(Recovery, ReportsAWarningNotBesideTheErrorThatExplainsIt) {
    std::string element = "DefineSDDefinition\n\tElementName=F\n\tDescription=5\n\tDisplayName=6\n\tDataType=Int32\n";
    EXPECT_EQ(found_in(CLASS + element), codes{"S515 16:1+18"});
    EXPECT_EQ(found_in(CLASS + element + found_in::element("DefineSDDefinition", "Int32", "1")), codes{"S210 16:1+18"});
}

TEST(Recovery, ReportsAWrongIndexAtTheElementsThatHaveNone) {
    std::string none = "DefineSDDefinition\n\tElementName=F\n\tDescription=5\n\tDisplayName=6\n\tDataType=Int32\n";
    std::string first = found_in::element("DefineSDDefinition", "Int32");
    std::vector<check::finding> found =
        findings_in(CLASS + first + none + none + found_in::element("DefineSDDefinition", "Int32", "3"));
    ASSERT_EQ(found.size(), 3u);
    EXPECT_EQ(found_in::shown(found[0]), "S210 22:1+18");
    EXPECT_EQ(found_in::shown(found[1]), "S506 28:14+1"); /* the two are named F */
    EXPECT_EQ(found_in::shown(found[2]), "S506 33:14+1"); /* and the others E */
    EXPECT_EQ(found[0].source, "DefineSDDefinition");
    ASSERT_EQ(found[0].notes.size(), 3u);
    EXPECT_EQ(found[0].notes[0].at.line, 22);
    EXPECT_EQ(found[0].notes[1].at.line, 27);
    EXPECT_EQ(found[0].notes[2].at.line, 36);
    EXPECT_EQ(found[0].notes[2].text, "the compiler stops here: expected is 1");
}

TEST(Recovery, ReportsAWrongIndexInItsLineIfElementsWithoutOneDoNotExplainIt) {
    std::string none = "DefineSDDefinition\n\tElementName=F\n\tDescription=5\n\tDisplayName=6\n\tDataType=Int32\n";
    EXPECT_EQ(found_in(CLASS + none + found_in::element("DefineSDDefinition", "Int32", "2")), codes{"S210 25:15+1"});
    EXPECT_EQ(found_in(CLASS + none + "DefineSDDefinition\n\tElementNam=E\n\tElementIndex=1\n"),
              (codes{"S106 22:2+10", "S210 23:15+1"}));
}

TEST(Recovery, RemembersTheNamesOfAStanzaAfterAnIncompleteOne) {
    std::string incomplete = "PAttrSDDefinition\n\tElementName=E\n\tDescription=5\n\tDisplayName=6\n\tElementIndex=0\n";
    std::string same = persistent("Q", "7", "Int32");
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "SD") + incomplete + same + same),
              (codes{"S111 28", "S506 36:7+1", "S507 39:5+1"}));
    std::string short_one = "PersistentResourceAttribute\n\tName=A\n\tDescription=3\n";
    EXPECT_EQ(found_in(CLASS + short_one + same + same), (codes{"S111 19", "S506 27:7+1", "S507 30:5+1"}));
}

TEST(Recovery, RemembersNoNamesOfTheRestOfAStanza) {
    std::string header = "PersistentResourceAttribute\n";
    std::string rest = "\tName=Q\n\tDescription=3\n\tDisplayName=4\n\tId=7\n";
    EXPECT_EQ(found_in(CLASS + persistent("Q", "7", "Int32") + header + "\tDataType=Int32\n\tVarietyRange=1,1\n" +
                       header + rest),
              (codes{"S111 26", "S111 30"}));
}

TEST(Recovery, ReportsALostHeaderOnce) {
    std::string lost = "\tId=7\n\tDataType=Int32\n\tVarietyRange=1,1\n\tDescription=3\n\tDisplayName=4\n\tName=Q\n";
    EXPECT_EQ(found_in(CLASS + persistent("P", "0", "Int32") + lost), codes{"S109 23:2+2"});
}

/* The property is known, but to dynamic attributes: the lines that follow are theirs, too. */
TEST(Recovery, ReportsALostHeaderAtAPropertyOfAnotherKindOnly) {
    std::string lost = "\tProperties=QryReqsMonitoring\n\tName=Q\n\tDescription=3\n\tDisplayName=4\n\tId=7\n"
                       "\tDataType=Int32\n\tVarietyRange=1,1\n\tVariableType=State\n";
    EXPECT_EQ(found_in(CLASS + persistent("P", "0", "Int32") + lost), codes{"S201 23:13+17"});
}

TEST(Recovery, ReportsTwoRepeatedAttributesThatAreApart) {
    EXPECT_EQ(found_in(CLASS + "PersistentResourceAttribute\n\tName=P\n\tDescription=3\n\tDescription=3\n"
                               "\tDisplayName=4\n\tId=0\n\tDataType=Int32\n\tDataType=Int32\n\tVarietyRange=1,1\n"),
              (codes{"S109 19:2+11", "S109 23:2+8"}));
}

TEST(Recovery, ShowsAValueOfALineThatWasTakenAgain) {
    std::string source = CLASS;
    source.replace(source.find("\tFirstKey=1"), 11, "FirstKey=9");
    std::vector<check::finding> found = findings_in(source);
    ASSERT_EQ(found.size(), 2u);
    EXPECT_EQ(found_in::shown(found[1]), "S304 15"); /* not where FirstKey is: an error in its line comes first */
    EXPECT_EQ(found[1].notes.at(0).at.column, 10u);
}

TEST(Recovery, ReportsAnErrorWhereItsCauseIs) {
    std::string source = CLASS;
    source.replace(source.find("\tFirstKey=1"), 11, "\tFirstKey=9");
    EXPECT_EQ(found_in(source), codes{"S304 12:11+1"});
    std::vector<check::finding> found = findings_in(source);
    EXPECT_EQ(found.at(0).source, "\tFirstKey=9");
    EXPECT_EQ(found.at(0).notes.back().text, "the compiler stops here");
    EXPECT_EQ(found.at(0).notes.back().at.line, 15);
    source = CLASS;
    source.replace(source.find("\tResourceManager=M\n"), 19, "");
    EXPECT_EQ(found_in(source), codes{"S303 10:1+21"});
    std::string structure = CLASS + persistent("A", "0", "SD") + element("PAttrSDDefinition", "Int23");
    EXPECT_EQ(found_in(structure + persistent("B", "1", "Int32")), codes{"S215 28:11+5"});
    EXPECT_EQ(found_in(CLASS + element("DefineSDDefinition", "Int23") + "\tValidValue=1\n"), codes{"S207 21:11+5"});
}

TEST(Recovery, TakesElementsInAnyOrderForOneMistake) {
    std::string elements;
    for (const char *index : {"0", "2", "1", "3"})
        elements += element("DefineSDDefinition", "Int32", index);
    std::vector<check::finding> found = findings_in(CLASS + elements);
    std::erase_if(found, [](const check::finding &each) { return !each.error; });
    ASSERT_EQ(found.size(), 1u);
    EXPECT_EQ(found_in::shown(found[0]), "S210 26:15+1");
}

TEST(Recovery, ReportsALineInTheWrongStanzaOnce) {
    std::string without = persistent("A", "0", "Int32");
    without.erase(without.find("\tDescription"), 15);
    EXPECT_EQ(found_in(CLASS + without + "\tGroupID=1\n" + persistent("B", "1", "Int32", "\tDescription=3\n")),
              codes{"S108 22:2+7"});
    EXPECT_EQ(found_in(CLASS + persistent("B", "1", "Int32", "\tDescription=3\n") + without), codes{"S109 23:2+11"});
    EXPECT_EQ(found_in(CLASS + persistent("B", "1", "Int32", "\tId=3\n") + without), (codes{"S109 23:2+2", "S111 29"}));
}

TEST(Recovery, TakesAHeaderWithAnAttributeInItsLine) {
    std::string joined = persistent("A", "0", "Int32");
    joined.replace(joined.find("\n\t"), 2, " ");
    EXPECT_EQ(found_in(CLASS + joined), codes{"S101 16:1+34"});
}

} // namespace
