/* messages.cpp: the warnings: data only. docs/messages.md explains each. */

#include "check/check.h"

namespace cdef::check {

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

} // namespace cdef::check
