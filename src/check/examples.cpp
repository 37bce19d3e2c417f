/* examples.cpp: for each code of a check, a source for which it is reported. A test checks that it is reported for this
 * source and not for the cured one. */

#include "check/examples.h"

#include <algorithm>
#include <iterator>

namespace check {

namespace {

/* ---- Lines that examples have in common ------------------------------------------------------------------------- */

#define CONTROL "ControlDefinition\n\tFileVersion=1.0.0.0\n"
#define CLASS_LINES                                                                                                    \
    "\tDescription=1\n\tDisplayName=2\n\tProperties=HasResources\n\tClassPermTemplate=0\n\tResourcePermTemplate=0\n"
#define CLASS "ResourceClass\n" CLASS_LINES
#define MAP                                                                                                            \
    "ClassToManagerMapping\n\tResourceManager=Mgr1\n\tFirstKey=1\n\tLastKey=100\n\tMessageCatalog=mgr1.cat\n"          \
    "\tDescriptiveMessageSet=1\n"
#define PERSISTENT(name, id, type)                                                                                     \
    "PersistentResourceAttribute\n\tName=" name "\n\tDescription=3\n\tDisplayName=4\n\tId=" id "\n\tDataType=" type    \
    "\n\tVarietyRange=1,1\n"
#define DYNAMIC(name, id, type)                                                                                        \
    "DynamicResourceAttribute\n\tName=" name "\n\tDescription=3\n\tDisplayName=4\n\tId=" id "\n\tDataType=" type       \
    "\n\tVariableType=Quantity\n\tVarietyRange=1,1\n"
#define ACTION "ResourceAction\n\tName=Flush\n\tDescription=5\n\tDisplayName=6\n\tId=0\n\tVarietyRange=1,1\n"
#define ELEMENT(kind, name, index, type)                                                                               \
    kind "SDDefinition\n\tElementName=" name "\n\tDescription=7\n\tDisplayName=8\n\tElementIndex=" index               \
         "\n\tDataType=" type "\n"
#define SLOW "ResourceVariableClass\n\tVariableClass=Slow\n\tObservationInterval=60\n\tReportingInterval="

constexpr frame whole = {"", "", ""};
constexpr frame before_class = {"", "", CONTROL CLASS MAP};
constexpr frame in_class = {CONTROL CLASS MAP, "", ""};
constexpr frame class_alone = {CONTROL, "", MAP};
constexpr frame map_alone = {CONTROL CLASS, "", ""};
constexpr frame begins = {"", "", CLASS MAP};
constexpr frame persistent = {CONTROL CLASS MAP PERSISTENT("Size", "0", "Int32"),
                              "PersistentResourceAttribute\n\t...\n\tDataType=Int32\n", ""};
constexpr frame text = {CONTROL CLASS MAP PERSISTENT("Host", "0", "String"),
                        "PersistentResourceAttribute\n\t...\n\tDataType=String\n", ""};
constexpr frame binary = {CONTROL CLASS MAP PERSISTENT("Key", "0", "Binary"),
                          "PersistentResourceAttribute\n\t...\n\tDataType=Binary\n", ""};
constexpr frame class_attribute = {CONTROL CLASS MAP "PersistentClassAttribute\n\tName=Limit\n\tDescription=3\n"
                                                     "\tDisplayName=4\n\tId=0\n\tDataType=Int32\n\tVarietyRange=1,1\n",
                                   "PersistentClassAttribute\n\t...\n\tDataType=Int32\n", ""};
constexpr frame dynamic = {CONTROL CLASS MAP DYNAMIC("Load", "0", "Int32"),
                           "DynamicResourceAttribute\n\t...\n\tDataType=Int32\n", ""};
constexpr frame dynamic_text = {CONTROL CLASS MAP DYNAMIC("Host", "0", "String"),
                                "DynamicResourceAttribute\n\t...\n\tDataType=String\n", ""};
constexpr frame action = {CONTROL CLASS MAP ACTION, "ResourceAction\n\t...\n", ""};

/* ---- The examples, by code -------------------------------------------------------------------------------------- */

constexpr example examples[] = {
    {"S101", &in_class,
     "PersistentResorceAttribute\n\tName=Size\n\tDescription=3\n\tDisplayName=4\n\tId=0\n\tDataType=Int32\n"
     "\tVarietyRange=1,1\n",
     PERSISTENT("Size", "0", "Int32")},
    {"S102", &begins, " ControlDefinition\n\tFileVersion=1.0.0.0\n", "ControlDefinition\n\tFileVersion=1.0.0.0\n"},
    {"S103", &persistent, "\tProperties Public\n", "\tProperties=Public\n"},
    {"S104", &dynamic, "\tExpression=\"Load > 90\n", "\tExpression=\"Load > 90\"\n"},
    {"S106", &persistent, "\tPropertis=Public\n", "\tProperties=Public\n"},
    {"S107", &persistent, "\tDefaultValue=\n", "\tDefaultValue=\"\"\n"},
    {"S108", &in_class,
     "PersistentResourceAttribute\n\tName=Size\n\tProperties=Public\n\tDescription=3\n\tDisplayName=4\n\tId=0\n"
     "\tDataType=Int32\n\tVarietyRange=1,1\n",
     PERSISTENT("Size", "0", "Int32") "\tProperties=Public\n"},
    {"S109", &persistent, "\tProperties=Public\n\tProperties=Select\n", "\tProperties=Public,Select\n"},
    {"S110", &in_class, PERSISTENT("Size", "0", "Int32") ELEMENT("PAttr", "Width", "0", "Int32"),
     PERSISTENT("Size", "0", "SD") ELEMENT("PAttr", "Width", "0", "Int32") PERSISTENT("Colour", "1", "Int32")},
    {"S111", &in_class,
     "PersistentResourceAttribute\n\tName=Size\n\tDescription=3\n\tDisplayName=4\n\tDataType=Int32\n"
     "\tVarietyRange=1,1\n",
     PERSISTENT("Size", "0", "Int32")},
    {"S112", &before_class, PERSISTENT("Size", "0", "Int32"), nullptr},
    {"S113", &before_class,
     "PersistentClassAttribute\n\tName=Size\n\tDescription=3\n\tDisplayName=4\n\tId=0\n"
     "\tDataType=Int32\n\tVarietyRange=1,1\n",
     nullptr},
    {"S114", &before_class, DYNAMIC("Load", "0", "Int32"), nullptr},
    {"S115", &before_class, ACTION, nullptr},
    {"S116", &before_class, ELEMENT("Online", "Mode", "0", "Int32"), nullptr},
    {"S117", &whole, "ResourceClass\n" CLASS_LINES "\tName=Pump\n" CONTROL CLASS MAP,
     CONTROL "ResourceClass\n" CLASS_LINES "\tName=Pump\n" MAP},
    {"S118", &in_class, MAP, nullptr},

    {"S201", &persistent, "\tProperties=Public, Select\n", "\tProperties=Public,Select\n"},
    {"S202", &in_class, PERSISTENT("Size", "0", "int"), PERSISTENT("Size", "0", "Int32")},
    {"S203", &in_class,
     "DynamicResourceAttribute\n\tName=Load\n\tDescription=3\n\tDisplayName=4\n\tId=0\n\tDataType=Int32\n"
     "\tVariableType=Gauge\n\tVarietyRange=1,1\n",
     DYNAMIC("Load", "0", "Int32")},
    {"S204", &persistent, "\tVarietyRange=5\n", "\tVarietyRange=5,5\n"},
    {"S205", &persistent, "\tVarietyRange=5,6,9\n", "\tVarietyRange=5,6\n\tVarietyRange=9,9\n"},
    {"S206", &dynamic, "\tRange=100\n", "\tRange=0,100\n"},
    {"S207", &persistent, "\tDefaultValue=1,000\n", "\tDefaultValue=1000\n"},
    {"S208", &persistent, "\tValueDisplayName=9\n", "\tValidValue=0\n\tValueDisplayName=9\n"},
    {"S209", &in_class,
     PERSISTENT("Size", "0", "SD") "\tDefaultValue=1\n" ELEMENT("PAttr", "Width", "0", "Int32")
         PERSISTENT("Colour", "1", "Int32"),
     PERSISTENT("Size", "0", "SD") ELEMENT("PAttr", "Width", "0", "Int32") PERSISTENT("Colour", "1", "Int32")},
    {"S210", &in_class, ELEMENT("Online", "Mode", "0", "Int32") ELEMENT("Online", "Time", "2", "Int32"),
     ELEMENT("Online", "Mode", "0", "Int32") ELEMENT("Online", "Time", "1", "Int32")},
    {"S211", &in_class, ELEMENT("Online", "Mode", "0", "SD"), ELEMENT("Online", "Mode", "0", "Int32")},
    {"S212", &in_class, ELEMENT("Online", "Mode", "0", "Int32") "\tDefaultValue=1\n",
     ELEMENT("Online", "Mode", "0", "Int32")},
    {"S214", &in_class, PERSISTENT("Size", "0", "SBS"), PERSISTENT("Size", "0", "Int32")},
    {"S215", &in_class,
     PERSISTENT("Size", "0", "SD") ELEMENT("PAttr", "Width", "0", "int") PERSISTENT("Colour", "1", "Int32"),
     PERSISTENT("Size", "0", "SD") ELEMENT("PAttr", "Width", "0", "Int32") PERSISTENT("Colour", "1", "Int32")},
    {"S216", &in_class,
     DYNAMIC("Load", "0", "SD") ELEMENT("DAttr", "Now", "0", "int") PERSISTENT("Colour", "1", "Int32"),
     DYNAMIC("Load", "0", "SD") ELEMENT("DAttr", "Now", "0", "Int32") PERSISTENT("Colour", "1", "Int32")},

    {"S301", &whole, MAP, CONTROL CLASS MAP},
    {"S302", &whole, CONTROL CLASS, CONTROL CLASS MAP},
    {"S303", &map_alone,
     "ClassToManagerMapping\n\tFirstKey=1\n\tLastKey=100\n\tMessageCatalog=mgr1.cat\n\tDescriptiveMessageSet=1\n", MAP},
    {"S304", &map_alone,
     "ClassToManagerMapping\n\tResourceManager=Mgr1\n\tFirstKey=100\n\tLastKey=1\n\tMessageCatalog=mgr1.cat\n"
     "\tDescriptiveMessageSet=1\n",
     MAP},

    {"S501", &in_class, PERSISTENT("Size", "0", "SD") ELEMENT("PAttr", "Width", "0", "Int32"),
     PERSISTENT("Size", "0", "SD") ELEMENT("PAttr", "Width", "0", "Int32") PERSISTENT("Colour", "1", "Int32")},
    {"S502", &in_class, PERSISTENT("Size", "0", "SD"),
     PERSISTENT("Size", "0", "SD") ELEMENT("PAttr", "Width", "0", "Int32") PERSISTENT("Colour", "1", "Int32")},
    {"S503", &in_class,
     DYNAMIC("Load", "0", "Int32") "DynamicClassAttribute\n\tName=Total\n\tDescription=3\n\tDisplayName=4\n"
                                   "\tId=1\n\tDataType=Int32\n\tVariableType=Quantity\n\tVarietyRange=1,1\n"
                                   "\tRange=0,100\n",
     "DynamicClassAttribute\n\tName=Total\n\tDescription=3\n\tDisplayName=4\n\tId=1\n\tDataType=Int32\n"
     "\tVariableType=Quantity\n\tVarietyRange=1,1\n" DYNAMIC("Load", "0", "Int32") "\tRange=0,100\n"},
    {"S504", &class_alone, CLASS "\tLocator=Serial\n" PERSISTENT("SerialNumber", "0", "String"),
     CLASS "\tLocator=SerialNumber\n" PERSISTENT("SerialNumber", "0", "String")},
    {"S505", &dynamic, "\tVariableClass=Slow\n", "\tVariableClass=Slow\n" SLOW "60\n"},
    {"S506", &in_class, PERSISTENT("Size", "0", "Int32") PERSISTENT("Size", "1", "Int32"),
     PERSISTENT("Size", "0", "Int32") PERSISTENT("Width", "1", "Int32")},
    {"S507", &in_class, PERSISTENT("Size", "0", "Int32") PERSISTENT("Width", "0", "Int32"),
     PERSISTENT("Size", "0", "Int32") PERSISTENT("Width", "1", "Int32")},
    {"S508", &action, "\tTimeOut=70000\n", "\tTimeOut=7000\n"},
    {"S509", &action, "\tTimeOut=010\n", "\tTimeOut=10\n"},
    {"S510", &action, "\tTimeOut=10 seconds\n", "\tTimeOut=10\n"},
    {"S511", &class_attribute, "\tDefaultValue=1\n", ""},
    {"S512", &action, "\tPermission=w\n", "\tPermission=s\n"},
    {"S513", &in_class, ELEMENT("Online", "Mode", "0", "int"), ELEMENT("Online", "Mode", "0", "Int32")},
    {"S514", &in_class, PERSISTENT("Size", "0", "Int32") CONTROL CLASS, nullptr},
    {"S515", &in_class,
     "ResourceVariableClass\n\tVariableClass=Slow\n\tObservationInterval=60\n" DYNAMIC(
         "Load", "0", "Int32") "\tVariableClass=Slow\n",
     SLOW "60\n" DYNAMIC("Load", "0", "Int32") "\tVariableClass=Slow\n"},
    {"S516", &in_class,
     "# A comment of more than 253 characters is read in pieces. This one has 254 of them up to the second"
     " hash sign, so that both pieces are comments. The second one is another line for the compiler, and t"
     "he numbers of all lines below it are one higher.      # This is the second piece.\n",
     "# A comment of fewer characters,\n# and another one.\n"},
    {"S517", &text, "\tDefaultValue=localhost\r\n", "\tDefaultValue=localhost\n"},
    {"S518", &in_class, ELEMENT("ActionIn", "Mode", "0", "Int32"), ACTION ELEMENT("ActionIn", "Mode", "0", "Int32")},
    {"S519", &dynamic, "\tRange=100,0\n", "\tRange=0,100\n"},
    {"S520", &dynamic, "\tExpression=\"Load > 90\" or \"Load < 5\"\n", "\tExpression=\"Load > 90 or Load < 5\"\n"},
    {"S521", &binary, "\tDefaultValue=CAFE0042\n", "\tDefaultValue=0xCAFE0042\n"},
    {"S522", &text, "\tDefaultValue=http://host/path\n", "\tDefaultValue=\"http://host/path\"\n"},
    {"S523", &whole, CONTROL MAP, CONTROL CLASS MAP},
    {"S524", &in_class, CLASS, nullptr},
    {"S525", &persistent, "\tDefaultValue=1\n\tDefaultValue=2\n", "\tDefaultValue=2\n"},
    {"S526", &text, "\tDefaultValue=a\n\tValidValue=a,b,c\n",
     "\tDefaultValue=a\n\tValidValue=a\n\tValidValue=b\n\tValidValue=c\n"},
    {"S527", &dynamic_text, "\tRange=a,z\n", ""},
    {"S528", &dynamic, "\tReArmExpression=\"Load < 50\"\n",
     "\tExpression=\"Load > 90\"\n\tReArmExpression=\"Load < 50\"\n"},
    {"S529", &persistent, "\tGroupName=9\n", "\tGroupID=1\n\tGroupName=9\n"},
    {"S530", &in_class, SLOW "60\n", SLOW "60\n" DYNAMIC("Load", "0", "Int32") "\tVariableClass=Slow\n"},
    {"S531", &in_class, SLOW "10\n" DYNAMIC("Load", "0", "Int32") "\tVariableClass=Slow\n",
     SLOW "120\n" DYNAMIC("Load", "0", "Int32") "\tVariableClass=Slow\n"},
    {"S532", &persistent, "\tProperties=ReqdForDefine,OptForDefine\n", "\tProperties=ReqdForDefine\n"},
    {"S533", &persistent, "\tValidValue=1,5\n\tDefaultValue=7\n", "\tValidValue=1,5\n\tDefaultValue=3\n"},
    {"S534", &in_class, DYNAMIC("Load", "32768", "Int32") "\tVariableClass=Slow\n" SLOW "60\n",
     DYNAMIC("Load", "0", "Int32") "\tVariableClass=Slow\n" SLOW "60\n"},
    {"S535", &persistent, "\tValidValue=0,5\n\tValidValue=3\n", "\tValidValue=0,5\n"},
    {"S536", &text, "\tDefaultValue= localhost\n", "\tDefaultValue=localhost\n"},
    {"S537", &dynamic, "\tExpression=\"(Load > 90\"\n", "\tExpression=\"(Load > 90)\"\n"},
};

#undef CONTROL
#undef CLASS_LINES
#undef CLASS
#undef MAP
#undef PERSISTENT
#undef DYNAMIC
#undef ACTION
#undef ELEMENT
#undef SLOW

} // namespace

const example *example_of(std::string_view code) {
    const example *end = std::end(examples);
    const example *found =
        std::find_if(std::begin(examples), end, [&](const example &each) { return each.code == code; });
    return found == end ? nullptr : found;
}

std::string source_with(const frame &within, std::string_view lines) {
    return std::string(within.before).append(lines).append(within.after);
}

std::string shown_with(const frame &within, std::string_view lines) {
    return std::string(within.shown_before).append(lines);
}

} // namespace check
