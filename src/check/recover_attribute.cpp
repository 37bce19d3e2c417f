/* recover_attribute.cpp: takes attribute lines, and continues after one that is refused. */

#include "check/meant.h"
#include "check/notes.h"
#include "check/numbers.h"
#include "check/recovery.h"
#include "language/names.h"

#include <algorithm>

namespace check {

namespace {

/* True if the attribute's text is converted to the stanza's data type. */
bool is_typed(int attr_type) {
    switch (attr_type) {
    case AT_VALID_VALUE:
    case AT_SD_VALID_VALUE:
    case AT_DEFAULT_VALUE:
    case AT_INITIAL_VALUE:
    case AT_RANGE:
        return true;
    default:
        return false;
    }
}

/* The attribute that stanzas of most kinds begin with. */
bool is_name(std::string_view attribute) {
    return attribute == "Name" || attribute == "VariableClass";
}

} // namespace

/* ---- Taking lines ---------------------------------------------------------------------------------------------- */

void recovery::take_attribute() {
    if (known.skipping && set_table_id(line.text.name) < 0)
        return;
    int errno_before = compiler.conversion_errno();
    try {
        compiler.take_attribute(line.text);
    } catch (const fatal_exit &failure) {
        recover_attribute(failure);
        if (early.is_open())
            settle_order();
        return;
    }
    if (compiler.conversion_errno() != errno_before)
        known.overflow_line = line.number;
    if (compiler.latest().attr == nullptr)
        return;
    note_given();
    if (known.split.kind != NO_KIND)
        settle_split();
    if (!known.stanza().misplaced)
        note_value();
    warned.attribute(see);
    if (early.is_open())
        settle_order();
}

/* Optional attributes that came too early are moved after the last required one. A line in pieces is not moved. */
void recovery::settle_order() {
    if (compiler.is_complete(known.kind)) {
        found.correct(MSG_OPTIONAL_TOO_EARLY, early.first_line(), [this] { return early.after(line); });
        return early.close();
    }
    const table_attrs *attr = attr_meant();
    if (line.is_piece())
        early.close();
    else if (attr != nullptr && (attr->req_bit & OPTIONAL) != 0)
        early.move(line);
}

/* An attribute that the incomplete stanza before this one already has, or cannot have, is not one of its missing lines.
 */
void recovery::settle_split() {
    if (see.attr().dup_allowed != 0)
        return;
    const srtable_ctrl &table = table_of(known.split.kind);
    const table_attrs *attr = find_attr(table, see.attr().ta_name);
    if (attr != nullptr && known.split.given[static_cast<size_t>(attr - table.sc_attrs.data())] == 0)
        return;
    known.split = {};
    known.stanza().misplaced = false;
}

/* ---- Errors ---------------------------------------------------------------------------------------------------- */

void recovery::recover_attribute(const fatal_exit &failure) {
    if (language::guess meant = header_meant(failure); !meant.name().empty())
        return indented_header(meant, failure);
    if (known.kind < 0)
        return lose_first_header(failure);
    const attr_place latest = compiler.latest();
    bool consequence = follows(failure);
    if (!consequence && may_follow(failure)) {
        report_with_notes(failure, line.marked(message_of(failure.id).mark, latest, failure.detail1), known.kind);
        if (blames_overflow(failure, see))
            found.retract(NARROWED, known.overflow_line);
        if (failure.id == MSG_OPTIONAL_TOO_EARLY)
            early.open(line.number);
    }
    recover_value(failure, consequence);
    compiler.set_broken(known.kind);
    if (failure.id == MSG_OPTIONAL_TOO_EARLY)
        take_quietly(line.raw.substr(0, line.all().column - 1 + line.all().length), 0);
    else
        note_refused(latest.attr == nullptr ? type_meant() : std::optional(latest.attr->ta_type));
    compiler.forget_overflow(); /* its mark would report the same number twice */
}

/* The stanza kind whose name a line resembles, although it begins with a blank. */
language::guess recovery::header_meant(const fatal_exit &failure) const {
    if (failure.id != MSG_NO_EQUALS && failure.id != MSG_NO_STANZA)
        return {};
    language::guess meant = language::meant_by(line.whole(), language::stanza_names());
    return meant.how == language::likeness::word ? language::guess() : meant;
}

void recovery::indented_header(const language::guess &meant, const fatal_exit &failure) {
    bool exact = std::string_view(line.text.name) == meant.name();
    finding &error = report(failure, line.all());
    error.notes.push_back({line.all(), "a stanza begins in column 1"});
    if (!exact)
        error.notes.push_back({line.all(), language::suggestion(line.text.name, language::stanza_names())});
    place from_column_1 = {line.number, 1, line.all().column - 1 + line.all().length};
    error.fix = line.renamed(from_column_1, line.raw, meant);
    take_header(line.replaced(meant.name()), !exact);
}

/* After an attribute line in front of any header. */
void recovery::lose_first_header(const fatal_exit &failure) {
    std::string_view text = line.whole();
    kind_set kinds = language::kinds_with(text.substr(0, text.find('=')));
    report_with_notes(failure, line.all(), NO_KIND);
    lose_header(kinds.none() ? kinds.set() : kinds);
    skip_stanza();
}

std::string_view recovery::name_given() const {
    return line.at(see.name_place());
}

/* The attribute of the current line; null if its name resembles no attribute of the kind. */
const table_attrs *recovery::attr_meant() const {
    const srtable_ctrl &table = table_of(known.kind);
    std::string_view name = name_given();
    const table_attrs *attr = find_attr(table, name);
    return attr != nullptr ? attr : find_attr(table, attribute_meant(known, known.kind, name).name());
}

std::optional<int> recovery::type_meant() const {
    const table_attrs *attr = attr_meant();
    return attr == nullptr ? std::nullopt : std::optional(attr->ta_type);
}

/* Whether an attribute's error is a consequence of one that has been reported. */
bool recovery::follows(const fatal_exit &failure) {
    if (failure.id == MSG_INDEX_NOT_CONSECUTIVE)
        return index_lost || is_other_index();
    if (failure.id == MSG_NO_STRING_TABLE)
        return is_reported_otherwise(failure);
    if (is_line_of_neighbour(failure, known.kind))
        return true;
    const attr_place &latest = compiler.latest();
    bool typed = latest.attr != nullptr && is_typed(latest.attr->ta_type);
    bool untyped =
        compiler.is_broken(known.kind) && table_of(known.kind).dt_offset >= 0 && compiler.data_type() == VX_UNKNOWN;
    if (typed && untyped && failure.id == MSG_INVALID_VALUE)
        return true;
    const refused_attributes &refused = known.stanza().refused;
    bool value_refused = refused.has_any({AT_VALID_VALUE, AT_SD_VALID_VALUE}) || refused.unknown_name;
    if (failure.id == MSG_NO_VALID_VALUE && value_refused)
        return true;
    return is_misplaced(failure);
}

/* True if a value may have been refused only because its line belongs to a stanza of another kind. */
bool recovery::is_foreign_value(const fatal_exit &failure) const {
    return failure.id == MSG_INVALID_VALUE || failure.id == MSG_NO_VALID_VALUE || failure.id == MSG_ELEMENT_DEFAULT ||
           is_foreign_property(failure);
}

bool recovery::is_foreign_property(const fatal_exit &failure) const {
    if (failure.id != MSG_INVALID_PROPERTY)
        return false;
    std::string_view name = line.at(line.marked(mark_kind::item, compiler.latest(), failure.detail1));
    for (int type : {AT_CLASS_PROPS, AT_PATTR_PROPS, AT_DATTR_PROPS, AT_ACTION_PROPS})
        if (language::name_list names = language::property_names(type);
            std::find(names.begin(), names.end(), name) != names.end())
            return true;
    return false;
}

/* True if a line belongs to another stanza, as an earlier line did. The first such line is only noted: a second name,
 * or an attribute that other kinds have and this one has not. An earlier line, which has been reported, may also make
 * the stanza suspect: a repeated required attribute, or a property of another kind. */
bool recovery::is_misplaced(const fatal_exit &failure) {
    stanza_record &stanza = known.stanza();
    bool unknown = failure.id == MSG_UNKNOWN_ATTRIBUTE && !type_meant();
    bool repeated = failure.id == MSG_REPEATED_ATTRIBUTE;
    if (stanza.misplaced)
        return unknown || repeated || is_foreign_value(failure);
    bool first_attribute = compiler.latest().attr == table_of(known.kind).sc_attrs.data();
    bool named = repeated && (first_attribute || is_name(name_given()));
    bool again = stanza.suspect && (repeated || unknown);
    stanza.suspect =
        stanza.suspect || (repeated && (see.attr().req_bit & OPTIONAL) == 0) || is_foreign_property(failure);
    kind_set kinds = unknown || named || again ? language::kinds_with(name_given()) : kind_set();
    stanza.misplaced = kinds.any();
    if (!stanza.misplaced)
        return false;
    lose_header(kinds);
    index_lost = index_lost || is_sd_kind(known.kind); /* this may be another run */
    if (int previous = compiler.previous_kind(); unknown && previous >= 0)
        break_if_incomplete(previous); /* what it lacks may be here */
    return again;
}

/* ---- What an error leaves to be done ---------------------------------------------------------------------------- */

void recovery::recover_value(const fatal_exit &failure, bool consequence) {
    if (failure.id == MSG_INDEX_NOT_CONSECUTIVE) {
        if (!consequence)
            for (const mention &header : known.run.without_index)
                found.retract(INCOMPLETE, header.at.line);
        known.run.without_index.clear();
        recover_index(consequence);
    }
    if (failure.id == MSG_NO_STRING_TABLE)
        open_placeholder_class();
    if (is_sd_kind(known.kind) && failure.id == MSG_INVALID_VALUE && compiler.data_type() == VX_UNKNOWN)
        report_type_here();
}

/* After a wrong index: whether this one skips it, or changed places with it. */
bool recovery::is_other_index() const {
    int index = compiler.element_index();
    return index >= 0 && (index == other_index || index == awaited_index);
}

/* After a wrong index the count either continues from it, or skips it. An index that is not accepted leaves the
 * previous one. */
void recovery::recover_index(bool consequence) {
    int expected = compiler.expected_index();
    number given(see.value(), 10);
    bool read = given.read == see.value().size() && given.value == compiler.element_index();
    bool awaited = consequence && !index_lost && compiler.element_index() == awaited_index;
    if (!awaited)
        compiler.expect_index(index_after(read ? compiler.element_index() : expected));
    other_index = consequence ? -1 : index_after(expected);
    awaited_index = consequence ? -1 : expected;
    index_lost = false;
}

/* A value was refused because its element has no known type. That has been reported, so it is not reported again at the
 * end of the run. */
void recovery::report_type_here() {
    int type_line = known.stanza().data_type.at.line;
    size_t others = std::erase_if(known.run.odd_types, [&](const mention &odd) { return odd.at.line == type_line; });
    known.run.odd_type_reported = known.run.odd_type_reported || others > 0;
    found.retract(ELEMENT_TYPE, type_line);
}

} // namespace check
