/* Each warning, fed with a few lines. */

#include "check/found_in.h"
#include "messages_document.h"

namespace {

using found_in::CLASS;
using found_in::codes;
using found_in::dynamic;
using found_in::element;
using found_in::found_in;
using found_in::persistent;

constexpr const char *RESOURCE = "DynamicResourceAttribute";
constexpr const char *OF_CLASS = "DynamicClassAttribute";

TEST(Warnings, AreNoneForASoundSource) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "UInt32", "\tDefaultValue=5\n")), codes());
}

TEST(Warnings, AreSilentWhenSwitchedOff) {
    check::warning_set wanted = found_in::all_warnings();
    wanted[check::NARROWED] = false;
    std::string source = CLASS + persistent("A", "0", "UInt32", "\tDefaultValue=-5\n\tGroupID=010\n");
    EXPECT_EQ(found_in(source), (codes{"S508 23:15+2", "S509 24:10+3"}));
    EXPECT_EQ(found_in::findings_in(source, wanted).size(), 1u);
}

/* Names and Ids are remembered for these only. */
TEST(Warnings, RememberNamesAndIdsIfWantedAlone) {
    std::string source = CLASS + persistent("A", "0", "UInt32") + persistent("A", "0", "UInt32");
    source.insert(source.find("ClassTo"), "\tLocator=A\n");
    auto found_with = [&](check::warning_id id) {
        check::warning_set wanted = {};
        wanted[id] = true;
        codes all;
        for (const check::finding &each : found_in::findings_in(source, wanted))
            all.push_back(found_in::shown(each));
        return all;
    };
    EXPECT_EQ(found_with(check::UNKNOWN_LOCATOR), codes());
    EXPECT_EQ(found_with(check::SAME_NAME), codes{"S506 25:7+1"});
    EXPECT_EQ(found_with(check::SAME_ID), codes{"S507 28:5+1"});
}

TEST(Warnings, AreExplainedByTheDocumentAsTheRegistryDoes) {
    std::map<std::string, std::string> document = messages_document::sections();
    for (const check::warning &row : check::warnings) {
        std::string title = "### " + std::string(row.code) + " `" + row.name + "`";
        EXPECT_EQ(document[row.code].substr(0, title.size()), title);
        EXPECT_EQ(messages_document::body_of(document[row.code]), messages_document::words(row.cause, row.cure));
        document.erase(row.code);
    }
    for (const auto &[code, section] : document)
        EXPECT_FALSE(code.starts_with("S5") || code.starts_with("S6")) << section;
}

/* ---- Lines ----------------------------------------------------------------------------------------------------- */

TEST(LongLine, IsReportedOnceAtItsFirstPiece) {
    std::string pieces = "#" + std::string(253, 'x') + "#" + std::string(253, 'x');
    EXPECT_EQ(found_in(CLASS + "#" + std::string(252, 'x') + "\n"), codes());
    EXPECT_EQ(found_in(CLASS + "#" + std::string(253, 'x') + "\n"), codes{"S516 16"});
    EXPECT_EQ(found_in(CLASS + pieces + "#\n"), codes{"S516 16"});
}

TEST(CarriageReturn, IsReportedOnce) {
    EXPECT_EQ(found_in(CLASS + "# one\r\n# two\r\n"), codes{"S517 16:6+1"});
    EXPECT_EQ(found_in(CLASS + "# o\rne\n"), codes{"S517 16:4+1"});
}

/* ---- Values ---------------------------------------------------------------------------------------------------- */

TEST(TextAfterQuote, IsNotReportedOfQuotesInPairs) {
    for (const char *value : {"user == \"root\"", "a == \"\"", "(b=\"x\")", "\"x\" == \"A\""})
        EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", std::string("\tDefaultValue=\"") + value + "\"\n")),
                  codes())
            << value;
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tDefaultValue=\"x\" == \"A\"\n")),
              codes{"S520 23:17+7"});
}

TEST(TextAfterQuote, IsReportedFromTheQuote) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tDefaultValue=\"a\"b\"\n")), codes{"S520 23:17+2"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tDefaultValue=\"a\\\"b\"\n")), codes());
}

TEST(LostBytes, AreReportedForEachBoundWithout0x) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Binary", "\tDefaultValue=abcde\n")), codes{"S521 23:15+5"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Binary", "\tValidValue=0x61,b\n")), codes{"S521 23:18+1"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "BinaryArray", "\tDefaultValue=0x61\n")), codes());
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tDefaultValue=abcde\n")), codes());
}

TEST(CommentInValue, IsReportedDirectlyAfterAText) {
    EXPECT_EQ(found_in(CLASS + persistent("A#B", "0", "String")), codes{"S522 17:8+2"});
    EXPECT_EQ(found_in(CLASS + persistent("A // B", "0//1", "String#")), codes());
    EXPECT_EQ(found_in(CLASS + persistent("\"A#B\"#C", "0", "String")), codes());
}

TEST(NumberText, IsReportedForTextAfterANumberAndForNone) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "7 x", "UInt32")), codes{"S510 20:5+3"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "x", "UInt32")), codes{"S510 20:5+1"});
}

TEST(Narrowed, IsReportedForWhatDoesNotFit) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "2147483647", "Int32")), codes());
    for (const char *id : {"2147483648", "4294967295", "4294967296", "9223372036854775808", "-1"})
        EXPECT_EQ(found_in(CLASS + persistent("A", id, "Int32")),
                  codes{"S508 20:5+" + std::to_string(std::string_view(id).size())});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tDefaultValue=2147483648\n")), codes{"S508 23:15+10"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "UInt64", "\tDefaultValue=-1\n")), codes{"S508 23:15+2"});
}

TEST(Octal, IsReportedIfItChangesTheValue) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "010", "UInt32")), codes{"S509 20:5+3"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "007", "UInt32")), codes());
}

TEST(Numbers, AreReportedPartByPart) {
    EXPECT_EQ(found_in("ControlDefinition\n\tFileVersion=x.256\n" + CLASS.substr(CLASS.find("Res"))),
              (codes{"S510 2:14+1", "S508 2:16+3"}));
}

TEST(LowAboveHigh, IsReportedForNumbersOnly) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tValidValue=1,-1\n\tDefaultValue=9\n")),
              codes{"S519 23:13+4"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Float32", "\tValidValue=1.5,1.25\n")), codes{"S519 23:13+8"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tValidValue=-1,1\n")), codes());
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tValidValue=b,a\n")), codes());
}

TEST(UnusedDefault, IsReportedForClassAttributes) {
    std::string stanza = persistent("A", "0", "Int32", "\tDefaultValue=1\n");
    EXPECT_EQ(found_in(CLASS + stanza), codes());
    EXPECT_EQ(found_in(CLASS + stanza.replace(0, 27, "PersistentClassAttribute")), codes{"S511 23:2+12"});
}

TEST(InvalidDefault, IsReportedAtItsLine) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tDefaultValue=3\n\tValidValue=1,2\n")),
              codes{"S533 23:15+1"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tDefaultValue=3\n\tValidValue=1,2\n\tValidValue=3\n")),
              codes());
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "A", "0", "\tInitialValue=3\n\tRange=0,2\n")), codes{"S533 24:15+1"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Float32", "\tDefaultValue=nan\n\tValidValue=0,1\n")), codes());
}

TEST(InvalidDefault, IsThatOfTheTypeIfNoneIsGiven) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "UInt64Array", "\tValidValue=1,2\n")), codes{"S533 16:1+27"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tValidValue=a\n")), codes{"S533 16:1+27"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tValidValue=-1,1\n")), codes());
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tProperties=Public,ReqdForDefine\n\tValidValue=1\n")),
              codes());
    EXPECT_EQ(found_in(CLASS + dynamic(OF_CLASS, "A", "0", "\tRange=1,9\n")), codes{"S533 16:1+21"});
}

TEST(InvalidDefault, IsNotReportedBesideAnotherMistakeOfTheValues) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tValidValue=2,1\n")), codes{"S519 23:13+3"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tValidValue=a#b\n")), codes{"S522 23:14+2"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Binary", "\tValidValue=a\n")), codes{"S521 23:13+1"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tValidValue=1\n\tValidVlaue=0\n")),
              codes{"S106 24:2+10"});
}

TEST(Overlap, IsReportedAtTheLaterLine) {
    std::string given = "\tDefaultValue=1\n\tValidValue=1,5\n";
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", given + "\tValidValue=5\n")), codes{"S535 25:13+1"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", given + "\tValidValue=6\n")), codes());
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tVarietyRange=0x1,2\n")), codes{"S535 23:15+5"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tVarietyRange=2,2\n")), codes());
}

TEST(OuterBlank, IsReportedInNamesAndUnquotedTexts) {
    EXPECT_EQ(found_in(CLASS + persistent(" \tA", "0", "Int32")), codes{"S536 17:7+2"});
    EXPECT_EQ(found_in(CLASS + persistent("\"A \"", "0", "Int32")), codes{"S536 17:9+1"});
    EXPECT_EQ(found_in(CLASS + persistent("\" \"", "0", "Int32")), codes{"S536 17:8+1"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tDefaultValue= x\n")), codes{"S536 23:15+1"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tDefaultValue=\" x \"\n")), codes());
    EXPECT_EQ(found_in(CLASS + persistent("A", " 0", "Int32", "\tDefaultValue= 5\n")), codes());
}

TEST(Unbalanced, IsReportedAtTheLoneCharacter) {
    auto of = [](const std::string &text) {
        return found_in(CLASS + dynamic(RESOURCE, "A", "0", "\tExpression=" + text + "\n"));
    };
    EXPECT_EQ(of("(A > 1"), codes{"S537 24:13+1"});
    EXPECT_EQ(of("((A > 1) || A == 0"), codes{"S537 24:13+1"});
    EXPECT_EQ(of("A > 1)"), codes{"S537 24:18+1"});
    EXPECT_EQ(of("A == \"b"), codes{"S537 24:18+1"});
    EXPECT_EQ(of("A == 'it"), codes{"S537 24:18+1"});
    EXPECT_EQ(of("(A == \"it's (\") && A != ')'"), codes());
    EXPECT_EQ(of("A == 'it\\'s'"), codes{"S537 24:24+1"}); /* a quote after a backslash counts */
    EXPECT_EQ(of("A == 'it\\' && (B)"), codes());
}

TEST(ClassBit, IsReportedInAVariableClassOnly) {
    std::string defined = "ResourceVariableClass\n\tVariableClass=V\n\tObservationInterval=2\n\tReportingInterval=2\n";
    std::string named = "\tVariableClass=V\n";
    EXPECT_EQ(found_in(CLASS + defined + dynamic(RESOURCE, "A", "0x8000", named)), codes{"S534 24:5+6"});
    EXPECT_EQ(found_in(CLASS + defined + dynamic(OF_CLASS, "A", "65535", named)), codes{"S534 24:5+5"});
    EXPECT_EQ(found_in(CLASS + defined + dynamic(RESOURCE, "A", "0x17FFF", named)), codes());
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "A", "0x8000")), codes());
}

TEST(Permission, IsOneKnownLetter) {
    std::string action = CLASS + "ResourceAction\n\tName=A\n\tDescription=3\n\tDisplayName=4\n\tId=0\n"
                                 "\tVarietyRange=1,1\n\tPermission=";
    EXPECT_EQ(found_in(action + "q\n"), codes());
    EXPECT_EQ(found_in(action + "z\n"), codes{"S512 22:13+1"});
    EXPECT_EQ(found_in(action + "qx\n"), codes{"S512 22:13+2"});
}

TEST(CommaList, IsReportedForTexts) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tValidValue=a,b,c\n")), codes{"S526 23:13+5"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "String", "\tValidValue=a,b\n\tDefaultValue=a\n")), codes());
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "StringArray", "\tDefaultValue=a,b\n")), codes{"S526 23:15+3"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "StringArray", "\tDefaultValue=\"a,b\"\n")), codes());
}

TEST(IgnoredRange, IsReportedForTypesWithoutOne) {
    std::string stanza = dynamic(RESOURCE, "A", "0", "\tRange=0,2\n");
    EXPECT_EQ(found_in(CLASS + stanza), codes());
    EXPECT_EQ(found_in(CLASS + stanza.replace(stanza.find("UInt32"), 6, "String")), codes{"S527 24:2+9"});
}

TEST(NoExpression, IsReportedAtWhatNeedsOne) {
    std::string described = "\tExpression=y\n\tReArmDescription=1\n";
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "A", "0", described)), codes{"S528 25:2+16"});
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "A", "0", described + "\tReArmExpression=x\n")), codes());
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "A", "0", "\tReArmExpression=x\n")), codes{"S528 24:2+15"});
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "A", "0", "\tReArmExpression=x\n\tExpression=y\n")), codes());
}

TEST(Group, IsANumberAndNot255) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tGroupName=1\n")), codes{"S529 23:2+9"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tGroupID=255\n")), codes{"S529 23:10+3"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tGroupName=1\n\tGroupID=254\n")), codes());
}

TEST(Group, HasOneName) {
    std::string first = CLASS + persistent("A", "0", "Int32", "\tGroupID=1\n\tGroupName=5\n");
    EXPECT_EQ(found_in(first + persistent("B", "1", "Int32", "\tGroupName=6\n\tGroupID=1\n")), codes{"S529 32:2+9"});
    EXPECT_EQ(found_in(first + persistent("B", "1", "Int32", "\tGroupName=0x5\n\tGroupID=1\n")), codes());
    EXPECT_EQ(found_in(first + persistent("B", "1", "Int32", "\tGroupName=6\n\tGroupID=2\n")), codes());
}

TEST(Properties, AreReportedIfRepeatedOrContradictory) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tProperties=Public,Public\n")), codes{"S532 23:20+6"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tProperties=ReadOnly,ReqdForDefine\n")),
              codes{"S532 23:22+13"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tProperties=ReadOnly,Public\n")), codes());
}

TEST(VariableClasses, AreNamedUsedAndReportedNoMoreOftenThanObserved) {
    std::string defined = "ResourceVariableClass\n\tVariableClass=V\n\tObservationInterval=2\n\tReportingInterval=2\n";
    std::string used = CLASS + dynamic(RESOURCE, "A", "0", "\tVariableClass=V\n");
    EXPECT_EQ(found_in(CLASS + defined), codes{"S530 17:16+1"});
    EXPECT_EQ(found_in(used + defined + defined), codes{"S506 30:16+1"});
    EXPECT_EQ(found_in(used + defined.replace(defined.rfind('2'), 1, "1")), codes{"S531 28:20+1"});
}

/* ---- Names and Ids --------------------------------------------------------------------------------------------- */

TEST(SameName, IsReportedWithinAKind) {
    std::string source = CLASS + persistent("A", "0", "Int32") + persistent("A", "1", "Int32");
    EXPECT_EQ(found_in(source), codes{"S506 24:7+1"});
    EXPECT_EQ(found_in::findings_in(source).at(0).notes.at(0).at.line, 17);
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32") + dynamic(OF_CLASS, "A", "0")), codes());
}

TEST(SameId, IsReportedForEqualNumbers) {
    std::string source = CLASS + persistent("A", "16", "Int32") + persistent("B", "0x10", "Int32");
    EXPECT_EQ(found_in(source), codes{"S507 27:5+4"});
}

TEST(SameName, IsReportedForPersistentAndDynamicAttributes) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32") + dynamic(RESOURCE, "A", "1")), codes{"S506 24:7+1"});
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "A", "0") + persistent("B", "0", "Int32")), codes{"S507 28:5+1"});
    EXPECT_EQ(found_in(CLASS + dynamic(OF_CLASS, "A", "0") + persistent("A", "0", "Int32")), codes());
}

TEST(SameName, IsReportedForNamesThatDifferInCase) {
    EXPECT_EQ(found_in(CLASS + persistent("Size", "0", "Int32") + persistent("size", "1", "Int32")),
              codes{"S506 24:7+4"});
    EXPECT_EQ(found_in(CLASS + persistent("Size", "0", "Int32") + dynamic(RESOURCE, "SIZE", "1")),
              codes{"S506 24:7+4"});
    EXPECT_EQ(found_in(CLASS + persistent("Size", "0", "Int32") + persistent("Sizes", "1", "Int32")), codes());
}

TEST(SameName, IsNotReportedForElementsOfTwoActions) {
    std::string begin = "ResourceAction\n\tDescription=3\n\tDisplayName=4\n\tVarietyRange=1,1\n\tName=";
    std::string elements = element("ActionOutSDDefinition", "Int32") + element("ActionInSDDefinition", "Int32");
    std::string source = CLASS + begin + "A\n\tId=0\n" + elements + begin + "B\n\tId=1\n" + elements;
    EXPECT_EQ(found_in(source), codes());
}

TEST(Narrowed, IsReportedForTheIdOfTheLocatorsAttribute) {
    std::string source = CLASS;
    source.insert(source.find("ClassTo"), "\tLocator=A\n");
    EXPECT_EQ(found_in(source + persistent("A", "65535", "Int32")), codes{"S508 21:5+5"});
    EXPECT_EQ(found_in(source + persistent("A", "65534", "Int32") + persistent("B", "65536", "Int32")), codes());
}

TEST(UnknownLocator, IsReportedUnlessAnErrorMayHideTheName) {
    std::string source = CLASS;
    source.insert(source.find("ClassTo"), "\tLocator=Nmae\n");
    EXPECT_EQ(found_in(source + persistent("Name", "0", "String")), codes{"S504 10:10+4"});
    EXPECT_EQ(found_in(source + persistent("Nmae", "0", "String")), codes());
    EXPECT_EQ(found_in(source + persistent("Name", "0", "Sting")), (codes{"S504 10:10+4", "S202 22:11+5"}));
    EXPECT_EQ(found_in(source + persistent("\"Nmae", "0", "String")), codes{"S104 18:7+5"});
}

TEST(UnknownVariableClass, IsReportedOnceForEachName) {
    std::string source =
        CLASS + dynamic(RESOURCE, "A", "0", "\tVariableClass=V\n") + dynamic(RESOURCE, "B", "1", "\tVariableClass=V\n");
    std::string defined = "ResourceVariableClass\n\tVariableClass=V\n\tObservationInterval=1\n\tReportingInterval=1\n";
    EXPECT_EQ(found_in(source), codes{"S505 24:16+1"});
    EXPECT_EQ(found_in(source + defined), codes());
}

/* ---- Given not at all, or twice -------------------------------------------------------------------------------- */

TEST(NoResourceClass, IsReportedForEachClass) {
    std::string without = CLASS;
    without.erase(without.find("ResourceClass"), without.find("ClassTo") - without.find("ResourceClass"));
    EXPECT_EQ(found_in(without), codes{"S523 1:1+17"});
    EXPECT_EQ(found_in(CLASS.substr(0, CLASS.find("ClassTo")) + without), codes{"S523 10:1+17"});
}

TEST(SecondResourceClass, IsReportedWithinAClass) {
    std::string again = CLASS.substr(CLASS.find("ResourceClass"), CLASS.find("ClassTo") - CLASS.find("ResourceClass"));
    EXPECT_EQ(found_in(CLASS + again), codes{"S524 16:1+13"});
    EXPECT_EQ(found_in(CLASS + CLASS.substr(0, CLASS.find("ClassTo"))), codes());
}

TEST(Overridden, IsReportedAtTheLineThatCounts) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32", "\tDefaultValue=1\n\tDefaultValue=1\n")),
              codes{"S525 24:2+14"});
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32Array", "\tDefaultValue=1\n\tDefaultValue=1\n")), codes());
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32",
                                          "\tValidValue=1\n\tValueDisplayName=1\n\tValueDisplayName=2\n"
                                          "\tValidValue=2\n\tValueDisplayName=3\n\tDefaultValue=1\n")),
              codes{"S525 25:2+18"});
}

/* ---- Stanzas and runs ------------------------------------------------------------------------------------------ */

TEST(Incomplete, IsReportedAtTheHeader) {
    std::string source = CLASS;
    source.erase(source.find("\tLastKey=2\n"), 11);
    source.insert(source.find("\tFirstKey=1\n") + 11, " # 0");
    EXPECT_EQ(found_in(source.replace(source.find("Key=1"), 5, "Key=0")), codes{"S515 10:1+21"});
}

TEST(CutShort, IsReportedForAnOpenAttribute) {
    std::string second = CLASS.substr(0, CLASS.find("ClassTo"));
    EXPECT_EQ(found_in(CLASS + second), codes());
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "Int32") + second), codes{"S514 23:1+17"});
}

TEST(SdWithoutRun, IsReportedUnlessElementsFollow) {
    std::string attribute = persistent("A", "0", "SD");
    EXPECT_EQ(found_in(CLASS + attribute + persistent("B", "1", "Int32")), codes{"S502 16:1+27"});
    EXPECT_EQ(found_in(CLASS + attribute + element("PAttrSDDefinition", "Int32") + persistent("B", "1", "Int32")),
              codes());
}

TEST(SdRunAtEnd, IsReportedIfNothingFollows) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "SD") + element("PAttrSDDefinition", "Int32")),
              codes{"S501 16:1+27"});
}

TEST(StrayRun, IsReportedWithoutAnAction) {
    EXPECT_EQ(found_in(CLASS + element("ActionInSDDefinition", "Int32")), codes{"S518 16:1+20"});
    EXPECT_EQ(found_in(CLASS +
                       "ResourceAction\n\tName=A\n\tDescription=3\n\tDisplayName=4\n\tId=0\n"
                       "\tVarietyRange=1,1\n" +
                       element("ActionInSDDefinition", "Int32")),
              codes());
}

TEST(StrayRun, IsReportedAfterTheOtherKindOfAttribute) {
    EXPECT_EQ(found_in(CLASS + persistent("A", "0", "SD") + element("DAttrSDDefinition", "Int32") +
                       persistent("B", "1", "Int32")),
              codes{"S518 23:1+17"});
}

TEST(StrayRun, IsReportedDirectlyAfterTheElementsOfAnAttribute) {
    std::string attribute = CLASS + persistent("A", "0", "SD") + element("PAttrSDDefinition", "Int32");
    std::string run = element("ResetSDDefinition", "Int32");
    EXPECT_EQ(found_in(attribute + run), codes{"S518 29:1+17"});
    EXPECT_EQ(found_in(attribute + persistent("B", "1", "Int32") + run), codes());
    EXPECT_EQ(found_in(CLASS + run + element("OnlineSDDefinition", "Int32")), codes());
}

TEST(ElementType, IsReportedWhereTheCompilerAcceptsIt) {
    EXPECT_EQ(found_in(CLASS + element("DefineSDDefinition", "Sting")), codes{"S513 21:11+5"});
}

TEST(ElementType, IsReportedAlthoughTheAttributeOfTheElementHasAnError) {
    std::string broken = persistent("A", "0", "SD");
    broken.replace(broken.find("DataType"), 8, "DataTyp ");
    EXPECT_EQ(found_in(CLASS + broken + element("PAttrSDDefinition", "Sting")), (codes{"S106 21:2+8", "S513 28:11+5"}));
}

TEST(RangeElsewhere, IsReportedIfTheOtherKindIsOpen) {
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "A", "0") + dynamic(OF_CLASS, "B", "1", "\tRange=0,2\n")),
              codes{"S503 32:2+9"});
}

TEST(RangeElsewhere, IsReportedIfTheOtherKindIsCompletedFirst) {
    EXPECT_EQ(found_in(CLASS + dynamic(OF_CLASS, "A", "0") + dynamic(RESOURCE, "B", "1", "\tRange=0,2\n") +
                       dynamic(OF_CLASS, "C", "2")),
              codes{"S503 32:2+9"});
    EXPECT_EQ(found_in(CLASS + dynamic(RESOURCE, "B", "1", "\tRange=0,2\n")), codes());
}

/* The mark at the second class attribute comes from the range before it. */
TEST(RangeElsewhere, FollowsTheMark) {
    std::vector<check::finding> found =
        found_in::findings_in(CLASS + dynamic(OF_CLASS, "A", "0", "\tRange=0,2\n") + dynamic(RESOURCE, "B", "1") +
                              dynamic(RESOURCE, "C", "2", "\tRange=0,4\n") + dynamic(OF_CLASS, "D", "3"));
    ASSERT_EQ(found.size(), 2u);
    EXPECT_EQ(found_in::shown(found[0]), "S503 24:2+9");
    EXPECT_EQ(found[0].text.substr(0, 21), "because of this Range");
    EXPECT_EQ(found_in::shown(found[1]), "S503 41:2+9");
    EXPECT_EQ(found[1].text.substr(0, 18), "this Range is lost");
}

TEST(RangeElsewhere, IsNotReportedIfTheNextClassEndsTheAttribute) {
    EXPECT_EQ(found_in(CLASS + dynamic(OF_CLASS, "A", "0") + dynamic(RESOURCE, "B", "1", "\tRange=0,2\n") +
                       dynamic(OF_CLASS, "C", "2") + "ControlDefinition\n\tFileVersion=1\n"),
              (codes{"S514 41:1+17", "S514 41:1+17", "S523 41:1+17"})); /* the next class has no ResourceClass */
}

} // namespace
