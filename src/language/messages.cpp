/* messages.cpp: the table of messages. docs/messages.md is checked against it. */

#include "language/messages.h"

#include "language/limits.h"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <limits>

namespace {

using enum text_place;

constexpr message table[] = {
    /* Lines and stanzas */
    {MSG_UNKNOWN_STANZA, "S101", "Invalid table name: ", FIRST, mark_kind::text, blame::source,
     "A line that starts in column 1 names no stanza kind.",
     "Spell the kind as language.md does; start an attribute line with a blank or a tab. If the cause is "
     "a carriage return at the end of the line or a byte order mark in front of it, the note says so: "
     "remove it."},
    {MSG_NO_STANZA, "S102", "Attribute found but no table defined yet", FIRST, mark_kind::text, blame::source,
     "An attribute line comes before the first header, or the first header starts with a blank.",
     "Put a header in front of it, starting in column 1."},
    {MSG_NO_EQUALS, "S103", "Missing '=' after attribute name", FIRST, mark_kind::text, blame::source,
     "An attribute line has no `=`, or it is a header that starts with a blank, which the note says.",
     "Write `Name=value`; start a header in column 1."},
    {MSG_UNMATCHED_QUOTES, "S104", "Unmatched double quotes for attribute: ", FIRST, mark_kind::value, blame::source,
     "A value starts with a double quote but does not end with one, or ends with `\\\"`.",
     "Close the quote at the end of the value; only a comment may follow it."},
    /* The misspelling is deliberate, as in MSG_INDEX_NOT_CONSECUTIVE. */
    {MSG_VALUE_TOO_LONG, "S105", "Attibute value exceeds maximum length: ", FIRST, mark_kind::value, blame::source,
     "A value has more than 1797 characters. A source line cannot hold that many, so no source "
     "causes this.",
     "Shorten the value."},
    {MSG_UNKNOWN_ATTRIBUTE, "S106", "Attribute name not defined in table (name/table): ", FIRST, mark_kind::name,
     blame::source,
     "The stanza has no attribute of that name; the name and the stanza kind follow each other without a "
     "separator.",
     "Use the suggested name, and put no blank in front of `=`."},
    {MSG_NO_VALUE, "S107", "Missing attribute value: ", FIRST, mark_kind::name, blame::source,
     "Nothing follows the `=`.", "Give a value, or write `\"\"` to leave out an optional attribute."},
    {MSG_OPTIONAL_TOO_EARLY, "S108", "Optional attribute discovered before all required attributes have been defined",
     FIRST, mark_kind::name, blame::source,
     "An optional attribute comes before a required one, or a required one is missing. "
     "`ActionOutSDDefinition` accepts no optional attributes.",
     "Put it after all required attributes, which the note names. In `ActionOutSDDefinition`, remove it."},
    {MSG_REPEATED_ATTRIBUTE, "S109", "Already defined. Duplicated definitions not allowed for ", FIRST, mark_kind::name,
     blame::source, "An attribute that may be given once is given again.", "Remove one of the two."},
    {MSG_NO_SD_ATTRIBUTE, "S110", "Incorrect attribute type preceding this SD definition", FIRST, mark_kind::text,
     blame::source, "Elements of an attribute do not follow an attribute of structured data.",
     "Put them directly after an attribute whose `DataType` is `SD` or `SDArray`."},
    {MSG_INCOMPLETE_STANZA, "S111", "Previous stanza incomplete", FIRST, mark_kind::none, blame::source,
     "A stanza that is completed here, or at the end of the source, lacks required attributes. The note "
     "says which stanza and which attributes.",
     "Add them, in front of the stanza's optional attributes."},
    {MSG_NO_CLASS_FOR_PATTR, "S112", "No class for PersistentAttribute", FIRST, mark_kind::text, blame::source,
     "A `PersistentResourceAttribute` comes before the class.", "Start the source with `ControlDefinition`."},
    {MSG_NO_CLASS_FOR_PATTR_C, "S113", "No class for pattr", FIRST, mark_kind::text, blame::source,
     "A `PersistentClassAttribute` comes before the class.", "Start the source with `ControlDefinition`."},
    {MSG_NO_CLASS_FOR_DATTR, "S114", "No class for DynamicAttribute", FIRST, mark_kind::text, blame::source,
     "A dynamic attribute comes before the class.", "Start the source with `ControlDefinition`."},
    {MSG_NO_CLASS_FOR_ACTION, "S115", "No class for class action", FIRST, mark_kind::text, blame::source,
     "An action comes before the class.", "Start the source with `ControlDefinition`."},
    {MSG_NO_CLASS_FOR_SD, "S116", "No class for SD Definition", FIRST, mark_kind::text, blame::source,
     "Elements come before the class.", "Start the source with `ControlDefinition`."},
    {MSG_NO_STRING_TABLE, "S117", "No tbl for strings table", FIRST, mark_kind::name, blame::source,
     "A name is given before there is a class.", "Put `ControlDefinition` in front of `ResourceClass`."},
    {MSG_SECOND_MAP, "S118", "Only one ClassToManagerMapping stanza allowed", FIRST, mark_kind::text, blame::source,
     "There is a second `ClassToManagerMapping`.", "Remove one of the two."},

    /* Values */
    {MSG_INVALID_PROPERTY, "S201", ": invalid property", AFTER_ITEM, mark_kind::item, blame::source,
     "A name in `Properties`, shown in front of the text, is not a property of this stanza kind, or there "
     "is a blank in the list.",
     "Use the suggested name; write commas without blanks."},
    {MSG_INVALID_DATA_TYPE, "S202", "Invalid data type", FIRST, mark_kind::value, blame::source,
     "The value of `DataType` is not a data type.", "Use one of the names in language.md."},
    {MSG_INVALID_VARIABLE_TYPE, "S203", "Invalid variable type", FIRST, mark_kind::value, blame::source,
     "The value of `VariableType` is not a variable type.", "Write `Counter`, `Quantity`, `State` or `Quantum`."},
    {MSG_INVALID_VARIETY, "S204", "Incorrect variety format", FIRST, mark_kind::value, blame::source,
     "A `VarietyRange` has no comma.", "Write `low,high`."},
    {MSG_TOO_MANY_VARIETIES, "S205", "Too many varieties", FIRST, mark_kind::value, blame::source,
     "A `VarietyRange` has two commas.", "Write one `VarietyRange` line for each range."},
    {MSG_RANGE_NEEDS_TWO, "S206", "Range requires two values", FIRST, mark_kind::value, blame::source,
     "A `Range` has no comma.", "Write `low,high`."},
    {MSG_INVALID_VALUE, "S207", "str_to_vx: Invalid data", FIRST, mark_kind::value, blame::source,
     "The value does not fit the attribute's data type, or it belongs to an element of unknown data type, which the "
     "note shows. Or an earlier number overflowed: after that, a 0 or the limit of a type is refused, and "
     "the note says where.",
     "Write the value as its type requires; shorten the number that overflows."},
    {MSG_NO_VALID_VALUE, "S208", "No ValidValue to attach ValueDisplayName to.", FIRST, mark_kind::name, blame::source,
     "The stanza has no valid value above this line.", "Put `ValueDisplayName` after its valid value."},
    {MSG_SD_DEFAULT, "S209", "Default values not expected; place default values in individual *SDDef stanzas.", FIRST,
     mark_kind::name, blame::source, "An attribute of structured data has a `DefaultValue` or an `InitialValue`.",
     "Remove it: the value is built from the defaults of the elements' types. An element takes no `DefaultValue` "
     "either."},
    {MSG_INDEX_NOT_CONSECUTIVE, "S210", "ElementIndeces must be consecutive", FIRST, mark_kind::value, blame::source,
     "An `ElementIndex` is not the next one of its structure, or an element before it has none. Or an earlier "
     "number overflowed, after which the index 0 is refused: the note says where.",
     "Count from 0 in each structure; shorten the number that overflows."},
    {MSG_SD_IN_SD, "S211", "SD elements cannot be of SD type", FIRST, mark_kind::value, blame::source,
     "An element is of type `SD` or `SDArray`.",
     "Structured data cannot contain structured data: choose another type."},
    {MSG_ELEMENT_DEFAULT, "S212", "Sorry, default SD values are not yet supported", FIRST, mark_kind::name,
     blame::source, "An element has a `DefaultValue`.", "Remove it: an element has the default of its type."},
    {MSG_SECOND_MANAGER, "S213", "Resource manager already defined: ", FIRST, mark_kind::value, blame::source,
     "`ResourceManager` is given a second time; the first name follows. Within one stanza this is reported as S109, "
     "and a second stanza as S118, so no source causes this.",
     "Remove one of the two."},
    {MSG_SBS_TYPE, "S214", "VX_SBS_TYPE not supported", FIRST, mark_kind::none, blame::source,
     "An attribute, or an element of one, is of type `SBS`.", "Choose another type."},
    {MSG_NO_ELEMENT_DEFAULT, "S215", "dump_dflt: copy_this_sd_type default error", FIRST, mark_kind::none,
     blame::source, "An element of a persistent attribute has an unknown type, so there is no default.",
     "Correct the `DataType` that the note shows."},
    {MSG_NO_ELEMENT_INITIAL, "S216", "dump_dflt: copy_this_sd_type init error", FIRST, mark_kind::none, blame::source,
     "An element of a dynamic attribute has an unknown type, so there is no initial value.",
     "Correct the `DataType` that the note shows."},

    /* The end of the source */
    {MSG_NO_CLASSES, "S301", "No classes defined", FIRST, mark_kind::none, blame::source,
     "There is no `ControlDefinition`.", "Start the source with one."},
    {MSG_NO_MAPS, "S302", "No class-to-manager maps defined", FIRST, mark_kind::none, blame::source,
     "There is no `ClassToManagerMapping`.", "Add one."},
    {MSG_NO_MANAGER, "S303", "No resource manager defined", FIRST, mark_kind::none, blame::source,
     "The `ClassToManagerMapping` has no `ResourceManager`. Without such a stanza only S302 is reported.",
     "Add it to `ClassToManagerMapping`."},
    {MSG_KEYS_REVERSED, "S304", "Error: FirstKey is greater than LastKey.", FIRST, mark_kind::none, blame::source,
     "The keys are in the wrong order, or there is no `LastKey`, which is then 0.",
     "Swap them, or add the missing one."},
    {MSG_TOO_MANY_VARIABLE_CLASSES, "S305", "Too many variable classes with dynamic attributes (100 at most)", FIRST,
     mark_kind::none, blame::source, "Dynamic attributes name more than 100 variable classes.", "Use fewer."},
    {MSG_TOO_MANY_RECORDS, "S306", "Too many records of one kind in a class (65535 at most): ", FIRST, mark_kind::none,
     blame::source, "A class has too many attributes or actions of one kind.", "Use fewer."},
    {MSG_TABLE_TOO_LARGE, "S307", "A table or section is too large for the database (4294967295 bytes at most)", FIRST,
     mark_kind::none, blame::source, "An offset would not fit in 32 bits.", "Make the class smaller."},
    {MSG_INVALID_OUTPUT_NAME, "S308", "Invalid cdef out file name (must end in .cdef)", FIRST, mark_kind::none,
     blame::source, "The class has no `Name`, and the output file's name does not contain `.cdef`.",
     "Give the class a `Name`."},

    /* Files, memory, the command line */
    {MSG_USAGE, "S801", "Usage: ", FIRST, mark_kind::none, blame::surroundings, "cdgen was given no file names.",
     "Name the source and the database."},
    {MSG_USAGE_NO_OUTPUT, "S802", "usage: ", FIRST, mark_kind::none, blame::surroundings,
     "cdgen was given only one file name.", "Name the database too."},
    {MSG_CANNOT_OPEN, "S803", ": cannot open because: ", AFTER_ITEM, mark_kind::none, blame::surroundings,
     "The source cannot be opened.", "See the system's reason after the text."},
    {MSG_CANNOT_READ, "S804", ": cannot read because: ", AFTER_ITEM, mark_kind::none, blame::surroundings,
     "The source is a directory or cannot be read to its end.", "See the system's reason after the text."},
    {MSG_CANNOT_CREATE, "S805", "Cannot create CDB file: ", FIRST, mark_kind::none, blame::surroundings,
     "The database cannot be created or filled.", "See the system's reason after the text."},
    {MSG_CANNOT_MAP, "S806", "Cannot map CDB file: ", FIRST, mark_kind::none, blame::surroundings,
     "The database cannot be mapped.", "Write it to a regular file."},
    {MSG_OUT_OF_MEMORY, "S807", "cfg_malloc malloc failure: ", FIRST, mark_kind::none, blame::surroundings,
     "Memory ran out.", "Make the class smaller, or give the process more memory."},
    {MSG_NO_MEMORY_FOR_TABLE, "S808", ": alloc_tble malloc failure: ", AFTER_ITEM, mark_kind::none, blame::surroundings,
     "Memory ran out for a new table.", "As for S807."},
    {MSG_NO_MEMORY_TO_GROW, "S809", ": alloc_tble realloc failure: ", AFTER_ITEM, mark_kind::none, blame::surroundings,
     "Memory ran out for a larger table.", "As for S807."},
    {MSG_NO_MEMORY_FOR_NAME, "S810", "strdup failed: ", FIRST, mark_kind::none, blame::surroundings,
     "Memory ran out for a name.", "As for S807."},

    /* Defects of the compiler, which no source causes */
    {MSG_UNKNOWN_ATTRIBUTE_TYPE, "S901", "Unknown attribute", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_OUTSIDE_TABLE, "S902", ": reference outside the table - internal error", AFTER_ITEM, mark_kind::none,
     blame::program, "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_SD_TABLE, "S903", "No Class SD table for SD Definition", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NOT_AN_SD_TYPE, "S904", "mk_sd_data_tbl: non-SD type - internal error", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NULL_ARRAY, "S905", "Attempt to write NULL array", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_SD_NOT_COPIED, "S906", "copy_this_type: this function does not handle SD type", FIRST, mark_kind::none,
     blame::program, "A defect of the compiler.", "Report it, with the source."},
    {MSG_SD_ARRAY_NOT_COPIED, "S907", "copy_this_type: this function does not handle SD ARRAY type", FIRST,
     mark_kind::none, blame::program, "A defect of the compiler.", "Report it, with the source."},
    {MSG_ONLY_SD_COPIED, "S908", "copy_this_sd_type: only SD types allowed", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_COPY_FAILED, "S909", "copy_this_type error", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_DEFAULT, "S910", "copy_this_type default value error", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_INITIAL_VALUE, "S911", "copy_this_type default value error (dattr)", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_LOWER_BOUND, "S912", "copy_this_type default min range error (dattr)", FIRST, mark_kind::none,
     blame::program, "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_UPPER_BOUND, "S913", "copy_this_type default max range error (dattr)", FIRST, mark_kind::none,
     blame::program, "A defect of the compiler.", "Report it, with the source."},
    {MSG_DEFAULT_NOT_COPIED, "S914", "dump_dflt: copy_this_type error", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_CLASS_TABLES, "S915", "No Rsrc Class Tables found", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_MANAGER_TABLES, "S916", "No Rsrc Manager tables", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_MAP_TABLES, "S917", "No Rsrc CMMAP tables", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_NO_VARIABLE_CLASS_TABLES, "S918", "No Rsrc Variable Class tables", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
    {MSG_IMAGE_TOO_SMALL, "S919", "Image larger than computed - internal error", FIRST, mark_kind::none, blame::program,
     "A defect of the compiler.", "Report it, with the source."},
};
static_assert(std::size(table) == MESSAGE_COUNT, "each message has a row");

/* True if every row is complete and is at the position of its id. */
consteval bool rows_are_sound() {
    for (std::size_t i = 0; i < std::size(table); ++i) {
        const message &row = table[i];
        if (row.id != i)
            return false;
        for (std::string_view part : {row.code, row.text, row.cause, row.cure})
            if (part.empty())
                return false;
        if (i > 0 && std::string_view(table[i - 1].code) >= row.code)
            return false;
    }
    return true;
}
static_assert(rows_are_sound(), "in the order of the ids and of the codes, with code, text, cause and cure");

/* True if a text contains the number. */
consteval bool states(std::string_view text, std::size_t number) {
    char digits[20] = {};
    std::size_t first = std::size(digits);
    for (; number > 0; number /= 10)
        digits[--first] = static_cast<char>('0' + number % 10);
    return text.find(std::string_view(digits + first, std::size(digits) - first)) != std::string_view::npos;
}
static_assert(states(table[MSG_TOO_MANY_VARIABLE_CLASSES].text, VARIABLE_CLASSES_MAX));
static_assert(states(table[MSG_TOO_MANY_VARIABLE_CLASSES].cause, VARIABLE_CLASSES_MAX));
static_assert(states(table[MSG_VALUE_TOO_LONG].cause, VALUE_MAX_CHARS));
static_assert(states(table[MSG_TOO_MANY_RECORDS].text, std::numeric_limits<std::uint16_t>::max()));
static_assert(states(table[MSG_TABLE_TOO_LARGE].text, std::numeric_limits<std::uint32_t>::max()));

} // namespace

constinit const std::span<const message> message_rows = table;

const message &message_of(message_id id) {
    return table[id];
}

const message *find_message(std::string_view code) {
    auto found = std::find_if(std::begin(table), std::end(table), [&](const message &row) { return row.code == code; });
    return found == std::end(table) ? nullptr : found;
}
