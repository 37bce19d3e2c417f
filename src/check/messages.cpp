/* messages.cpp: the codes of all messages, and what they mark: data only. docs/messages.md explains each. */

#include "check/check.h"

#include <algorithm>

namespace cdef::check {

namespace {

using enum mark_kind;

constexpr message table[] = {
    /* Lines and stanzas */
    {"S101", "Invalid table name: ", text, blame::source},
    {"S102", "Attribute found but no table defined yet", text, blame::source},
    {"S103", "Missing '=' after attribute name", text, blame::source},
    {"S104", "Unmatched double quotes for attribute: ", value, blame::source},
    {"S105", "Attibute value exceeds maximum length: ", value, blame::source},
    {"S106", "Attribute name not defined in table (name/table): ", name, blame::source},
    {"S107", "Missing attribute value: ", name, blame::source},
    {"S108", "Optional attribute discovered before all required attributes have been defined", name, blame::source},
    {"S109", "Already defined. Duplicated definitions not allowed for ", name, blame::source},
    {"S110", "Incorrect attribute type preceding this SD definition", text, blame::source},
    {"S111", "Previous stanza incomplete", none, blame::source},
    {"S112", "No class for PersistentAttribute", text, blame::source},
    {"S113", "No class for pattr", text, blame::source},
    {"S114", "No class for DynamicAttribute", text, blame::source},
    {"S115", "No class for class action", text, blame::source},
    {"S116", "No class for SD Definition", text, blame::source},
    {"S117", "No tbl for strings table", name, blame::source},
    {"S118", "Only one ClassToManagerMapping stanza allowed", text, blame::source},

    /* Values */
    {"S201", ": invalid property", item, blame::source},
    {"S202", "Invalid data type", value, blame::source},
    {"S203", "Invalid variable type", value, blame::source},
    {"S204", "Incorrect variety format", value, blame::source},
    {"S205", "Too many varieties", value, blame::source},
    {"S206", "Range requires two values", value, blame::source},
    {"S207", "str_to_vx: Invalid data", value, blame::source},
    {"S208", "No ValidValue to attach ValueDisplayName to.", name, blame::source},
    {"S209", "Default values not expected; place default values in individual *SDDef stanzas.", name, blame::source},
    {"S210", "ElementIndeces must be consecutive", value, blame::source},
    {"S211", "SD elements cannot be of SD type", value, blame::source},
    {"S212", "Sorry, default SD values are not yet supported", name, blame::source},
    {"S213", "Resource manager already defined: ", value, blame::source},
    {"S214", "VX_SBS_TYPE not supported", none, blame::source},
    {"S215", "dump_dflt: copy_this_sd_type default error", none, blame::source},
    {"S216", "dump_dflt: copy_this_sd_type init error", none, blame::source},

    /* The end of the source */
    {"S301", "No classes defined", none, blame::source},
    {"S302", "No class-to-manager maps defined", none, blame::source},
    {"S303", "No resource manager defined", none, blame::source},
    {"S304", "Error: FirstKey is greater than LastKey.", none, blame::source},
    {"S305", "Too many variable classes with dynamic attributes (100 at most)", none, blame::source},
    {"S306", "Too many records of one kind in a class (65535 at most): ", none, blame::source},
    {"S307", "A table or section is too large for the database (4294967295 bytes at most)", none, blame::source},
    {"S308", "Invalid cdef out file name (must end in .cdef)", none, blame::source},

    /* Files, memory, the command line */
    {"S801", "Usage: ", none, blame::surroundings},
    {"S802", "usage: ", none, blame::surroundings},
    {"S803", ": cannot open because: ", none, blame::surroundings},
    {"S804", ": cannot read because: ", none, blame::surroundings},
    {"S805", "Cannot create CDB file: ", none, blame::surroundings},
    {"S806", "Cannot map CDB file: ", none, blame::surroundings},
    {"S807", "cfg_malloc malloc failure: ", none, blame::surroundings},
    {"S808", ": alloc_tble malloc failure: ", none, blame::surroundings},
    {"S809", ": alloc_tble realloc failure: ", none, blame::surroundings},
    {"S810", "strdup failed: ", none, blame::surroundings},

    /* What no source causes */
    {"S901", "Unknown attribute", none, blame::program},
    {"S902", ": reference outside the table - internal error", none, blame::program},
    {"S903", "No Class SD table for SD Definition", none, blame::program},
    {"S904", "mk_sd_data_tbl: non-SD type - internal error", none, blame::program},
    {"S905", "Attempt to write NULL array", none, blame::program},
    {"S906", "copy_this_type: this function does not handle SD type", none, blame::program},
    {"S907", "copy_this_type: this function does not handle SD ARRAY type", none, blame::program},
    {"S908", "copy_this_sd_type: only SD types allowed", none, blame::program},
    {"S909", "copy_this_type error", none, blame::program},
    {"S910", "copy_this_type default value error", none, blame::program},
    {"S911", "copy_this_type default value error (dattr)", none, blame::program},
    {"S912", "copy_this_type default min range error (dattr)", none, blame::program},
    {"S913", "copy_this_type default max range error (dattr)", none, blame::program},
    {"S914", "dump_dflt: copy_this_type error", none, blame::program},
    {"S915", "No Rsrc Class Tables found", none, blame::program},
    {"S916", "No Rsrc Manager tables", none, blame::program},
    {"S917", "No Rsrc CMMAP tables", none, blame::program},
    {"S918", "No Rsrc Variable Class tables", none, blame::program},
    {"S919", "Image larger than computed - internal error", none, blame::program},
};

constexpr message unlisted = {"S999", "", none, blame::program};

bool is(const char *text, const char *given) {
    return given != nullptr && std::string_view(text) == given;
}

} // namespace

constinit const std::span<const message> messages = table;

constinit const std::array<warning, WARNING_COUNT> warnings = {{
    {SD_RUN_AT_END, "S501", "sd-run-at-end", "the run of an SD-typed attribute ends the file"},
    {SD_WITHOUT_RUN, "S502", "sd-without-run", "an SD-typed attribute has no elements"},
    {RANGE_ELSEWHERE, "S503", "range-elsewhere", "a Range does not reach its attribute"},
    {UNKNOWN_LOCATOR, "S504", "unknown-locator", "a Locator names no attribute"},
    {UNKNOWN_VARIABLE_CLASS, "S505", "unknown-variable-class", "a VariableClass names no variable class"},
    {SAME_NAME, "S506", "same-name", "two of one kind have the same name"},
    {SAME_ID, "S507", "same-id", "two of one kind have the same Id"},
    {NARROWED, "S508", "narrowed", "a number does not fit and is cut"},
    {OCTAL, "S509", "octal", "a leading 0 makes a number octal"},
    {NUMBER_TEXT, "S510", "number-text", "a number is followed by text, or there is none"},
    {UNUSED_DEFAULT, "S511", "unused-default", "a DefaultValue is never used"},
    {PERMISSION, "S512", "permission", "a Permission is not one known letter"},
    {ELEMENT_TYPE, "S513", "element-type", "an element's data type is unknown"},
    {CUT_SHORT, "S514", "cut-short", "a second class ends an attribute unchecked"},
    {INCOMPLETE, "S515", "incomplete", "a stanza lacks required attributes"},
    {LONG_LINE, "S516", "long-line", "a line is read in pieces"},
    {CARRIAGE_RETURN, "S517", "carriage-return", "a line has a carriage return"},
    {STRAY_RUN, "S518", "stray-run", "an action's elements have no action"},
    {LOW_ABOVE_HIGH, "S519", "low-above-high", "the lower bound is above the upper one"},
    {TEXT_AFTER_QUOTE, "S520", "text-after-quote", "text follows the quote that seems to end a value"},
}};

const message &message_of(const fatal_exit &failure) {
    auto found = std::find_if(messages.begin(), messages.end(), [&](const message &known) {
        return is(known.text, failure.msg) || is(known.text, failure.detail1);
    });
    return found == messages.end() ? unlisted : *found;
}

} // namespace cdef::check
