/* meanings.cpp: what the names of the language mean. */

#include "language/meanings.h"

#include "language/catalogue_rows.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace language {

namespace {

/* ---- Attributes ------------------------------------------------------------------------------------------------- */

/* Groups of stanzas, which share attributes. */
constexpr unsigned CLASS = 1;
constexpr unsigned MAP = 2;
constexpr unsigned VARIABLES = 4;
constexpr unsigned PERSISTENT = 8;
constexpr unsigned DYNAMIC = 16;
constexpr unsigned ACTION = 32;
constexpr unsigned ELEMENT = 64;
constexpr unsigned NAMED = PERSISTENT | DYNAMIC | ACTION;
constexpr unsigned ATTRIBUTE = PERSISTENT | DYNAMIC;

constexpr unsigned group_of(staged_record record) {
    switch (record) {
    case STAGED_CLASS:
        return CLASS;
    case STAGED_CMMAP:
        return MAP;
    case STAGED_VARIABLE_CLASS:
        return VARIABLES;
    case STAGED_PATTR:
    case STAGED_PATTR_C:
        return PERSISTENT;
    case STAGED_DATTR:
    case STAGED_DATTR_C:
        return DYNAMIC;
    case STAGED_ACTION:
    case STAGED_ACTION_C:
        return ACTION;
    case STAGED_SD_DEF:
    case STAGED_COUNT:
        break;
    }
    return ELEMENT;
}

constexpr std::string_view MESSAGE_RANGE = "0 to 65535";

constexpr attribute_meaning attributes[] = {
    {CLASS, "FileVersion", "version of the class", "four numbers from 0 to 255"},
    {CLASS, "Description", "message number of the description", MESSAGE_RANGE},
    {CLASS, "DisplayName", "message number of the display name", MESSAGE_RANGE},
    {CLASS, "Properties", "class properties"},
    {CLASS, "ClassPermTemplate", "reserved: the text is ignored and 0xEEEEEEEE is stored. Write 0"},
    {CLASS, "ResourcePermTemplate", "reserved: the text is ignored and 0xEEEEEEEE is stored. Write 0"},
    {CLASS, "Name", "name of the class", {}, "the output file's name up to the first `.cdef`, directory included"},
    {CLASS,
     "Locator",
     "name of the `PersistentResourceAttribute` that says where a resource is. The low 16 bits of its `Id` are stored; "
     "0xFFFF if no attribute has the name",
     {},
     "0xFFFF"},

    {MAP, "ResourceManager", "name of the manager that serves the class"},
    {MAP, "FirstKey", "first of the keys under which the manager knows the class", MESSAGE_RANGE},
    {MAP, "LastKey", "last of them, not less than `FirstKey`", MESSAGE_RANGE},
    {MAP, "MessageCatalog", "file name of the message catalog"},
    {MAP, "DescriptiveMessageSet", "number of the set in the catalog that all message numbers of the class refer to",
     MESSAGE_RANGE},

    {VARIABLES, "VariableClass", "name of the group"},
    {VARIABLES, "ObservationInterval", "time between two observations of its attributes", MESSAGE_RANGE},
    {VARIABLES, "ReportingInterval", "time between two reports", MESSAGE_RANGE},
    {VARIABLES, "Alias", "another name of the group", {}, "none"},

    {NAMED, "Name", "name"},
    {NAMED | ELEMENT, "Description", "message number", MESSAGE_RANGE},
    {NAMED | ELEMENT, "DisplayName", "message number", MESSAGE_RANGE},
    {ATTRIBUTE, "Id", "attribute number, see Numbers and who checks them", "0 to 2147483647"},
    {ATTRIBUTE, "DataType", "data type"},
    {ATTRIBUTE, "VarietyRange", "the varieties that have the attribute, first and last", "0 to 4294967295"},
    {ATTRIBUTE, "GroupID", "number of the group", MESSAGE_RANGE, "255, no group"},
    {ATTRIBUTE, "GroupName", "message number of the group's name", MESSAGE_RANGE, "0, none"},
    {PERSISTENT, "Properties", "persistent attribute properties", {}, "`InvalForDefine`"},
    {PERSISTENT, "ValidValue", "a value, or a range of values, that is valid", {}, "any value is valid"},
    {PERSISTENT, "ValueDisplayName", "message number for the last `ValidValue` above it", MESSAGE_RANGE, "0, none"},
    {PERSISTENT,
     "DefaultValue",
     "default; for an array type each line is one element, for any other type the last line counts",
     {},
     "the default of the type"},
    {ATTRIBUTE, "ListActionRsrc", "accepted without effect"},
    {ATTRIBUTE, "ListActionClass", "accepted without effect"},

    {DYNAMIC, "VariableType", "kind of variable, see Names"},
    {DYNAMIC, "VariableClass", "name of a `ResourceVariableClass`; an unknown name is ignored", {}, "none"},
    {DYNAMIC, "Properties", "dynamic attribute properties", {}, "none"},
    {DYNAMIC,
     "InitialValue",
     "value before the first observation; for an array type, its only element",
     {},
     "the default of the type"},
    {DYNAMIC, "ValidStateValue", "a value, or a range of values, that is valid", {}, "any value is valid"},
    {DYNAMIC, "ValueDisplayName", "message number for the last `ValidStateValue` above it", MESSAGE_RANGE, "0, none"},
    {DYNAMIC, "Expression", "the condition under which an event is reported, stored as it is", {}, "none"},
    {DYNAMIC,
     "ReArmExpression",
     "the condition after which the event may be reported again, stored as it is",
     {},
     "none"},
    {DYNAMIC, "ExpressionDescription", "message number", MESSAGE_RANGE, "0, none"},
    {DYNAMIC, "ReArmDescription", "message number", MESSAGE_RANGE, "0, none"},
    {DYNAMIC,
     "Range",
     "lower and upper bound of the variable; for numeric types and arrays of them only",
     {},
     "the default range of the type"},

    {ACTION, "Id", "action number", "0 to 2147483647"},
    {ACTION, "VarietyRange", "the varieties that have the action, first and last", "0 to 4294967295"},
    {ACTION, "Properties", "action properties", {}, "none"},
    {ACTION, "TimeOut", "longest time that the action takes", MESSAGE_RANGE, "0, none given"},
    {ACTION,
     "Permission",
     "permission that a client needs. Only the first character counts; a character that is not a permission letter "
     "stores 0",
     {},
     "`s`"},
    {ACTION, "ConfirmationMsg", "message number of the question to ask before the action", MESSAGE_RANGE, "0, none"},

    {ELEMENT, "ElementName", "name"},
    {ELEMENT, "ElementIndex", "0 for the first element of a run, one more for each that follows", "0, 1, 2 and so on"},
    {ELEMENT, "DataType", "data type; not `SD` or `SDArray`"},
    {ELEMENT, "ValidValue", "a value or a range that is valid", {}, "any value is valid"},
    {ELEMENT, "ValueDisplayName", "message number for the last `ValidValue` above it", MESSAGE_RANGE, "0, none"},
    {ELEMENT, "DefaultValue", "always refused"},
};

constexpr const attribute_meaning *find(staged_record record, std::string_view attribute) {
    for (const attribute_meaning &row : attributes)
        if ((row.groups & group_of(record)) != 0 && row.attribute == attribute)
            return &row;
    return nullptr;
}

consteval bool all_have_rows() {
    for (const srtable_ctrl &kind : std::span(rows::catalogue).first(SC_COUNT))
        for (const table_attrs &attr : kind.sc_attrs)
            if (find(kind.sc_record, attr.ta_name) == nullptr)
                return false;
    return true;
}
static_assert(all_have_rows(), "each attribute of the catalogue needs a row in attributes[]");

/* ---- Forms of values -------------------------------------------------------------------------------------------- */

constexpr value_form NUMBER16 = {"number16", "an integer, of which the low 16 bits are kept"};
constexpr value_form TEXT = {"text", "any text"};
constexpr value_form NAMES = {"names", "property names separated by `,` without blanks"};
constexpr value_form TYPE = {"type", "the name of a data type"};
constexpr value_form VALUES = {"value(s)", "one value, or two separated by `,`: low,high"};
constexpr value_form VALUE = {"value", "text of the attribute's own data type"};
constexpr value_form ANYTHING = {"anything", "any text; it is not interpreted"};

struct form_row {
    attr_type type;
    value_form form;
};

constexpr form_row forms[] = {
    {AT_UINT16, NUMBER16},
    {AT_VALUE_DISPLAY, NUMBER16},
    {AT_SD_DESCRIPTION, NUMBER16},
    {AT_SD_DISPLAY, NUMBER16},
    {AT_SD_VALUE_DISPLAY, NUMBER16},
    {AT_ID, {"number32", "an integer, of which the low 32 bits are kept"}},
    {AT_STRING, TEXT},
    {AT_MANAGER, TEXT},
    {AT_LOCATOR, TEXT},
    {AT_SD_NAME, TEXT},
    {AT_CLASS_PROPS, NAMES},
    {AT_PATTR_PROPS, NAMES},
    {AT_DATTR_PROPS, NAMES},
    {AT_ACTION_PROPS, NAMES},
    {AT_VERSION, {"version", "up to four decimal numbers with `.` between"}},
    {AT_VARIETY, {"low,high", "two integers with one `,`"}},
    {AT_RANGE, {"two values, low,high", "both of the attribute's own data type"}},
    {AT_DATA_TYPE, TYPE},
    {AT_SD_DATA_TYPE, TYPE},
    {AT_VARIABLE_TYPE, {"Counter, Quantity, State or Quantum", "the name of a variable type"}},
    {AT_DEFAULT_VALUE, VALUE},
    {AT_INITIAL_VALUE, VALUE},
    {AT_VALID_VALUE, VALUES},
    {AT_SD_VALID_VALUE, VALUES},
    {AT_SD_INDEX, {"decimal number", "a decimal integer"}},
    {AT_PERMISSION, {"a letter", "a permission letter"}},
    {AT_PERM_TEMPLATE, ANYTHING},
    {AT_LIST_ACTION_CLASS, ANYTHING},
    {AT_LIST_ACTION_RSRC, ANYTHING},
    {AT_SD_DEFAULT_VALUE, {"", "no value is accepted"}},
};

constexpr value_form NO_FORM = {};

/* ---- Stanzas ---------------------------------------------------------------------------------------------------- */

constexpr stanza_meaning stanzas[] = {
    {SC_CONTROL_DEFINITION, "begins the class and gives its version"},
    {SC_CLASS_TO_MANAGER_MAPPING, "the manager that serves the class, and the catalog of its texts"},
    {SC_RESOURCE_VARIABLE_CLASS, "a group of dynamic attributes that are observed and reported together"},
    {SC_RESOURCE_CLASS, "the class itself"},
    {SC_PERSISTENT_RESOURCE_ATTRIBUTE, "what is stored for each resource"},
    {SC_PERSISTENT_CLASS_ATTRIBUTE, "what is stored for the class"},
    {SC_DYNAMIC_RESOURCE_ATTRIBUTE, "what changes by itself in each resource"},
    {SC_DYNAMIC_CLASS_ATTRIBUTE, "what changes by itself in the class"},
    {SC_CLASS_ACTION, "what the class can be told to do"},
    {SC_RESOURCE_ACTION, "what a resource can be told to do"},
    {SC_PATTR_SD_DEFINITION, "value of the persistent attribute before the run"},
    {SC_DATTR_SD_DEFINITION, "value of the dynamic attribute before the run"},
    {SC_DEFINE_SD_DEFINITION, "input for defining a resource"},
    {SC_UNDEFINE_SD_DEFINITION, "input for undefining a resource"},
    {SC_ONLINE_SD_DEFINITION, "input for bringing a resource online"},
    {SC_OFFLINE_SD_DEFINITION, "input for taking a resource offline"},
    {SC_RESET_SD_DEFINITION, "input for resetting a resource"},
    {SC_ACTION_IN_SD_DEFINITION, "input of the action before the run"},
    {SC_ACTION_OUT_SD_DEFINITION, "response of the action before the run"},
};

consteval bool stanzas_in_order() {
    for (std::size_t i = 0; i < std::size(stanzas); ++i)
        if (stanzas[i].kind != static_cast<int>(i))
            return false;
    return std::size(stanzas) == SC_COUNT;
}
static_assert(stanzas_in_order(), "each stanza kind needs a row in stanzas[], in the order of the kinds");

/* ---- Words ------------------------------------------------------------------------------------------------------ */

constexpr type_meaning types[] = {
    {"None", "none: refused", "0"},
    {"Int32", "decimal integer, sign allowed", "0"},
    {"UInt32", "decimal integer", "0"},
    {"Int64", "decimal integer, sign allowed", "0"},
    {"UInt64", "decimal integer", "0"},
    {"Float32", "decimal or hexadecimal floating point, infinity, NaN", "0.0"},
    {"Float64", "the same", "0.0"},
    {"String", "any text, not empty", "empty string"},
    {"Binary", "see below", "no bytes"},
    {"RH", "none: refused", "a handle of zeros"},
    {"SD", "none: refused", "made from its elements; without a run, no value"},
    {"Int32Array", "one element", "an array of one element, 0"},
    {"UInt32Array", "one element", "an array of one element, 0"},
    {"Int64Array", "one element", "an array of one element, 0"},
    {"UInt64Array", "one element", "an array of one element, 0"},
    {"Float32Array", "one element", "an array of one element, 0.0"},
    {"Float64Array", "one element", "an array of one element, 0.0"},
    {"StringArray", "one element", "an array of one empty string"},
    {"BinaryArray", "one element", "an array of one empty binary"},
    {"RHArray", "none: refused", "an array of one handle of zeros"},
    {"SDArray", "none: refused", "an array of one structure, made from its elements; without a run, no value"},
};

struct word_row {
    std::string_view word;
    std::string_view meaning;
};

constexpr std::string_view FOR_DEFINE = "A client that defines a resource must, may or must not give the attribute.";

constexpr word_row words[] = {
    {"Counter", "A number that only increases."},
    {"Quantity", "A number that increases and decreases."},
    {"State", "One of several values, each with a meaning."},
    {"Quantum", "A value for which only changes matter."},
    {"ReqdForDefine", FOR_DEFINE},
    {"OptForDefine", FOR_DEFINE},
    {"InvalForDefine", FOR_DEFINE},
};

} // namespace

const attribute_meaning &meaning_of(const srtable_ctrl &kind, const table_attrs &attr) {
    return *find(kind.sc_record, attr.ta_name);
}

const value_form &form_of(int attr_type) {
    auto row =
        std::find_if(std::begin(forms), std::end(forms), [&](const form_row &each) { return each.type == attr_type; });
    return row == std::end(forms) ? NO_FORM : row->form;
}

std::string_view meaning_of(const srtable_ctrl &kind) {
    return stanzas[&kind - sc_tables.data()].meaning;
}

const type_meaning *type_called(std::string_view name) {
    auto row = std::find_if(std::begin(types), std::end(types), [&](const auto &each) { return each.name == name; });
    return row == std::end(types) ? nullptr : row;
}

std::string_view meaning_of_word(std::string_view word) {
    auto row = std::find_if(std::begin(words), std::end(words), [&](const auto &each) { return each.word == word; });
    return row == std::end(words) ? std::string_view() : row->meaning;
}

} // namespace language
