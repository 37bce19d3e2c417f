/* registry.cpp: the table of warnings: the texts about each, and the function that makes it. docs/messages.md is
 * checked against it. The order of the rows is the order in which warnings are notified of an event, and so the order
 * of findings in one line. */

#include "check/warnings/registry.h"

#include "language/limits.h"

#include <algorithm>
#include <iterator>
#include <string_view>
#include <utility>

namespace check {

/* To add a warning: a class in a file of this folder, its maker, a row, its id, and an example (examples.cpp). */
// NOLINTBEGIN(readability-redundant-declaration): the files that define them may be read in one unit with this one
maker make_carriage_return, make_class_bit, make_comma_list, make_comment_in_value, make_cut_short, make_element_type,
    make_group, make_ignored_range, make_incomplete, make_intervals, make_invalid_default, make_long_line,
    make_lost_bytes, make_low_above_high, make_narrowed, make_no_expression, make_no_name, make_no_resource_class,
    make_number_text, make_octal, make_outer_blank, make_overlap, make_overridden, make_permission, make_properties,
    make_range_elsewhere, make_same_id, make_same_name, make_sd_run_at_end, make_sd_without_run,
    make_second_resource_class, make_stray_run, make_text_after_quote, make_unbalanced, make_unknown_locator,
    make_unknown_variable_class, make_unused_default, make_unused_variable_class;
// NOLINTEND(readability-redundant-declaration)

namespace {

/* Warnings about several classes or about names of files, which no check of one source can report. */
made_watcher make_nothing(const watcher_setup &setup) {
    return make<watcher>(setup);
}

struct row {
    warning known;
    maker *make;
};

static_assert(LINE_MAX_CHARS == 254, "the cause of a long line says so");

constexpr row rows[] = {
    {{LONG_LINE, "S516", "long-line", "a line is read in pieces",
      "A line has more than 253 characters. What follows the 254th, even if it is only the newline, is read "
      "as a line of its own, and later lines get higher numbers. Reported once for each line.",
      "Shorten the line or its comment."},
     make_long_line},
    {{CARRIAGE_RETURN, "S517", "carriage-return", "a line has a carriage return",
      "A line ends with a carriage return, or contains one. It is part of the line's text. Reported once.",
      "Save the source with newlines only."},
     make_carriage_return},
    {{TEXT_AFTER_QUOTE, "S520", "text-after-quote", "text follows the quote that seems to end a value",
      "A value in quotes contains another quote that has no partner, with text after it.",
      "Remove the quote if it is not part of the value. If the value itself begins and ends with a quote, put another "
      "pair of quotes around it: `\"\"a\" == \"b\"\"`. Put no quotes around any other value that contains quotes. A "
      "backslash in front of a quote is stored too."},
     make_text_after_quote},
    {{NUMBER_TEXT, "S510", "number-text", "a number is followed by text, or there is none",
      "There is text after a number, which is ignored. Or there is no number, as in the middle of `1..2`, and 0 is "
      "stored.",
      "Write only the number."},
     make_number_text},
    {{NARROWED, "S508", "narrowed", "a number does not fit and is cut",
      "A number does not fit its field, so only its low bits are stored. Or a run has more than 65535 elements, but "
      "its highest index is stored in 16 bits, and 65535 means none. Or the `Id` of the attribute that a `Locator` "
      "names is above 65534, the highest that a class can store for it.",
      "Use a smaller number, or a wider type."},
     make_narrowed},
    {{OCTAL, "S509", "octal", "a leading 0 makes a number octal",
      "A leading 0 makes a number octal, and its value differs from the decimal one.",
      "Remove the 0, or write the number in decimal."},
     make_octal},
    {{LOW_ABOVE_HIGH, "S519", "low-above-high", "the lower bound is above the upper one",
      "A lower bound is greater than the upper one.", "Exchange them."},
     make_low_above_high},
    {{OVERLAP, "S535", "overlap", "values or varieties are given twice",
      "A `ValidValue`, `ValidStateValue` or `VarietyRange` repeats an earlier one of its stanza, or overlaps with it. "
      "Texts are compared byte by byte.",
      "Give each value once."},
     make_overlap},
    {{SAME_ID, "S507", "same-id", "two attributes or actions have the same Id",
      "Two attributes or actions of one kind have the same `Id`. The same is reported of a persistent and a dynamic "
      "attribute, if both are attributes of a resource or both of the class. An `Id` that is not a number (S510) is "
      "not compared.",
      "Give one of them another number."},
     make_same_id},
    {{SAME_NAME, "S506", "same-name", "two names are equal or differ only in case",
      "Two attributes, actions or elements of one kind, or two variable classes, have the same name, or names that "
      "differ only in case. The same is reported of a persistent and a dynamic attribute, if both are attributes of a "
      "resource or both of the class.",
      "Rename one."},
     make_same_name},
    {{RANGE_ELSEWHERE, "S503", "range-elsewhere", "a Range does not take effect in its own attribute",
      "A `Range` of a `DynamicClassAttribute` is stored in a `DynamicResourceAttribute` that has not "
      "been completed yet. Or another dynamic attribute is completed after the `Range` line, but before the attribute "
      "to which the "
      "line belongs. Then the `Range` may be lost, and the other attribute, if it has none, gets the range 0 to 0 "
      "instead of 0 to 100.",
      "Put dynamic class attributes before dynamic resource attributes, and give the last dynamic class attribute no "
      "`Range`. "
      "After an attribute with a `Range`, put another of its kind."},
     make_range_elsewhere},
    {{UNUSED_DEFAULT, "S511", "unused-default", "a DefaultValue is never used",
      "A `PersistentClassAttribute` has a `DefaultValue`, which is never used.", "Remove the line."},
     make_unused_default},
    {{PERMISSION, "S512", "permission", "a Permission is not one known letter",
      "A `Permission` has more than one letter, of which only the first counts. Or the letter is unknown, "
      "so no permission is needed.",
      "Write one of q, l, e, v, d, c, s, o, a and x."},
     make_permission},
    {{ELEMENT_TYPE, "S513", "element-type", "an element's data type is unknown",
      "The `DataType` of an element is unknown, so type 0 is stored.", "Use one of the names in language.md."},
     make_element_type},
    {{LOST_BYTES, "S521", "lost-bytes", "the first four bytes of a Binary are lost",
      "A `Binary` value does not begin with `0x`. Its length is stored over its first four bytes, and the "
      "rest is followed by zeros.",
      "Write `0x` and two hexadecimal digits for each byte; the note shows them for short values."},
     make_lost_bytes},
    {{COMMENT_IN_VALUE, "S522", "comment-in-value", "a comment cuts a text short",
      "A `#`, `//` or `/*` outside quotes directly follows a text, as in `http://host` or `Paper#Size`. "
      "It begins a comment, so only what comes before it is stored.",
      "Put the whole value in quotes. If it is a comment, put a blank in front of it."},
     make_comment_in_value},
    {{NO_RESOURCE_CLASS, "S523", "no-resource-class", "a class has no ResourceClass",
      "No `ResourceClass` follows a `ControlDefinition`, so the class has no properties, no message "
      "numbers and no name of its own. A `ResourceClass` before the first `ControlDefinition` has no effect.",
      "Add a `ResourceClass` after the `ControlDefinition`."},
     make_no_resource_class},
    {{SECOND_RESOURCE_CLASS, "S524", "second-resource-class", "a class has two ResourceClass stanzas",
      "A class has a second `ResourceClass`. It fills the same record: values that both give are replaced, and "
      "properties are added.",
      "Combine the two stanzas."},
     make_second_resource_class},
    {{OVERRIDDEN, "S525", "overridden", "a line replaces an earlier one",
      "An attribute whose type is not an array has a second `DefaultValue`, or a valid value a second "
      "`ValueDisplayName`. Only the last one counts.",
      "Remove one of the lines. For a list of values, choose an array type."},
     make_overridden},
    {{COMMA_LIST, "S526", "comma-list", "commas do not separate values",
      "A `ValidValue` or `ValidStateValue` of texts has more than one comma. It is a range: the text before the first "
      "comma is its lower end, and all the text after that comma is its upper end. Or an element of a `StringArray` or "
      "`BinaryArray` has commas and no quotes: the whole line is one element.",
      "Write one line for each value or element. Put an element with commas in quotes."},
     make_comma_list},
    {{IGNORED_RANGE, "S527", "ignored-range", "a Range has no effect on this type",
      "A `Range` of a `String`, a `Binary`, an `RH`, an `SD` or an array of these is ignored.",
      "Remove the line. For strings, use `ValidStateValue`."},
     make_ignored_range},
    {{NO_EXPRESSION, "S528", "no-expression", "a line has no effect without an Expression",
      "A dynamic attribute has a `ReArmExpression` or an `ExpressionDescription`, but no `Expression`. Or it has a "
      "`ReArmDescription`, but no `ReArmExpression`.",
      "Add the expression, or remove the line."},
     make_no_expression},
    {{GROUP, "S529", "group", "a group has no number, or two names",
      "An attribute has a `GroupName` but no `GroupID`, or its `GroupID` is 255, which means no group. Or two "
      "attributes of a class have the same `GroupID` and different `GroupName`s.",
      "Give the attribute a `GroupID` other than 255, and all attributes of a group the same `GroupName`."},
     make_group},
    {{UNUSED_VARIABLE_CLASS, "S530", "unused-variable-class", "a variable class is never used",
      "A `ResourceVariableClass` is not the `VariableClass` of any dynamic attribute. Not reported if a "
      "`VariableClass` has an unknown name (S505), or if a line of a dynamic attribute was not understood.",
      "Remove it, or give attributes its name."},
     make_unused_variable_class},
    {{INTERVALS, "S531", "intervals", "a variable class is reported more often than observed",
      "The `ReportingInterval` of a variable class is below its `ObservationInterval`.", "Exchange them."},
     make_intervals},
    {{PROPERTIES, "S532", "properties", "properties are repeated or contradictory",
      "A property is given twice. Or two contradict each other: two of `ReqdForDefine`, `OptForDefine` "
      "and `InvalForDefine`, or `ReqdForDefine` and `ReadOnly`.",
      "Remove one of them."},
     make_properties},
    {{INVALID_DEFAULT, "S533", "invalid-default", "a default is not a valid value",
      "A `DefaultValue` or `InitialValue` is not among the valid values of its attribute, or is outside its `Range`. "
      "Without such a line, the default of the type is checked: 0, an empty text, or an array of one of these. "
      "An attribute with `ReqdForDefine` is not checked, because it needs no default. Elements of structured "
      "data have no defaults of their own.",
      "Choose a default that is allowed, or allow it."},
     make_invalid_default},
    {{CLASS_BIT, "S534", "class-bit", "an Id has the bit that marks class attributes",
      "The `Id` of a dynamic attribute in a variable class has bit 0x8000 set. In variable classes, this bit "
      "distinguishes the Ids of class attributes from those of resource attributes.",
      "Choose an `Id` below 32768."},
     make_class_bit},
    {{OUTER_BLANK, "S536", "outer-blank", "a text begins or ends with a blank",
      "A name begins or ends with a blank. Or a value of type `String` begins with one and is not quoted, as in "
      "`DefaultValue= x`. The blank is stored.",
      "Remove it. Quote a value that has to begin with a blank."},
     make_outer_blank},
    {{UNBALANCED, "S537", "unbalanced", "an expression lacks a parenthesis or a quote",
      "An `Expression` or `ReArmExpression` has a parenthesis or a quote without its partner. A quote after a "
      "backslash counts; a parenthesis after one does not.",
      "Add the missing character, or remove this one."},
     make_unbalanced},
    {{INCOMPLETE, "S515", "incomplete", "a stanza lacks required attributes",
      "A stanza lacks required attributes, which the compiler does not notice: their fields are 0. If an error in the "
      "stanza may be about the missing line, only the error is reported.",
      "Add them."},
     make_incomplete},
    {{SD_WITHOUT_RUN, "S502", "sd-without-run", "an SD-typed attribute has no elements",
      "An attribute of type `SD` or `SDArray` is not directly followed by its elements.",
      "Put them directly after it."},
     make_sd_without_run},
    {{SD_RUN_AT_END, "S501", "sd-run-at-end", "the elements of an SD-typed attribute end the file",
      "The elements of an attribute of structured data are the last stanzas of the file. The attribute is completed "
      "before them, so it has no value and no highest index.",
      "Put another stanza after them, for example by moving the elements up."},
     make_sd_run_at_end},
    {{STRAY_RUN, "S518", "stray-run", "elements do not belong to what they follow",
      "`ActionInSDDefinition` or `ActionOutSDDefinition` comes where no action is open. `PAttrSDDefinition` follows a "
      "dynamic attribute, or `DAttrSDDefinition` a persistent one. Or elements of another kind directly follow "
      "those of an attribute, so that it is not defined what they belong to. Not reported if an error shows that a "
      "header is missing.",
      "Put elements after what they belong to, and another stanza between two structures."},
     make_stray_run},
    {{CUT_SHORT, "S514", "cut-short", "a second class ends an attribute before it is checked",
      "A second `ControlDefinition` ends an attribute that has not been completed, as it is, without checks and "
      "defaults.",
      "Put each class in a file of its own."},
     make_cut_short},
    {{UNKNOWN_LOCATOR, "S504", "unknown-locator", "a Locator names no attribute",
      "A `Locator` names no `PersistentResourceAttribute` of the last class. Not reported if a line or a stanza that "
      "was not understood may define such an attribute.",
      "Correct the name."},
     make_unknown_locator},
    {{UNKNOWN_VARIABLE_CLASS, "S505", "unknown-variable-class", "a VariableClass names no variable class",
      "A `VariableClass` names no `ResourceVariableClass`, so the attribute belongs to none. Reported "
      "once for each name, where it is first given. Not reported if the name of a `ResourceVariableClass` is missing "
      "or was not understood.",
      "Correct the name, or define the variable class."},
     make_unknown_variable_class},
    {{NO_NAME, "S601", "no-name", "a class is called after its database",
      "A class has no `Name`, so it is named after its database: the path up to `.cdef`, with the directory. "
      "Only `cdef build` reports this, because `cdef check` does not know the name of the database.",
      "Give the `ResourceClass` a `Name`."},
     make_no_name},
    {{SHARED_NAME, "S611", "shared-name", "two classes have the same name",
      "Two classes that are built together have the same name.", "Give one of them another name."},
     make_nothing},
    {{SHARED_KEYS, "S612", "shared-keys", "the keys of two classes overlap",
      "Two classes that are built together have the same `MessageCatalog`, and their ranges of keys, from `FirstKey` "
      "to `LastKey`, overlap.",
      "Give each class keys of its own."},
     make_nothing},
    {{OTHER_MANAGER, "S613", "other-manager", "a message catalog has two managers",
      "Two classes that are built together have the same `MessageCatalog`, and different `ResourceManager`s.",
      "Correct the name of one of them."},
     make_nothing},
    {{OTHER_VARIABLE_CLASS, "S614", "other-variable-class", "two variable classes with the same name differ",
      "Two classes that are built together have a `ResourceVariableClass` of the same name, with different intervals "
      "or aliases.",
      "Make them alike, or give one of them another name."},
     make_nothing},
    {{RULE_NAME, "S615", "rule-name", "a build system misreads the name of a file",
      "The file of `--depfile` contains a name that Make or Ninja misreads. Ninja then builds the database "
      "every time, and Make does not notice a change of the source. Only `cdef build` reports this.",
      "Rename the file or its directory. If only a program that reads the name correctly uses the file, turn the "
      "warning off."},
     make_nothing},
};

constexpr std::array<warning, WARNING_COUNT> by_id() {
    std::array<warning, WARNING_COUNT> all = {};
    for (const row &each : rows)
        all[each.known.id] = each.known;
    return all;
}

/* Codes ascend with the ids, and no id lacks its row. */
constexpr bool is_whole(const std::array<warning, WARNING_COUNT> &all) {
    auto no_ascent = [](const warning &a, const warning &b) {
        return std::string_view(a.code) >= std::string_view(b.code);
    };
    return std::size(rows) == WARNING_COUNT && std::adjacent_find(all.begin(), all.end(), no_ascent) == all.end();
}

static_assert(is_whole(by_id()));

} // namespace

constinit const std::array<warning, WARNING_COUNT> warnings = by_id();

watchers::watchers(const warning_set &wanted, findings &found, const text::hash_key &key) {
    for (const row &each : rows) {
        if (!wanted[each.known.id])
            continue;
        made_watcher made = each.make({warnings[each.known.id], found, key});
        for (size_t event = 0; event < EVENTS; ++event)
            if (made.events[event])
                of_event[event].push_back(made.warning.get());
        for (size_t type = 0; type < AT_COUNT; ++type)
            if (made.types[type])
                of_value[type].push_back(made.warning.get());
        all.push_back(std::move(made.warning));
    }
    for (size_t type = 0; type < AT_COUNT; ++type)
        looks_at[type] = !of_value[type].empty() || !of_event[ON_NUMBER].empty();
}

} // namespace check
