/* recovery.cpp: the steps of the recovery that headers, attribute lines and the end of the source share. */

#include "check/recovery.h"

#include "check/lacking.h"
#include "check/notes.h"

#include <algorithm>
#include <utility>

namespace check {

recovery::recovery(compilation &driven, current_line &current, knowledge &remembered, findings &results,
                   const view &whole, const watchers &warnings_at_work)
    : compiler(driven), line(current), known(remembered), found(results), see(whole), warned(warnings_at_work) {}

/* ---- Errors --------------------------------------------------------------------------------------------------- */

finding &recovery::report(const fatal_exit &failure, const place &at) {
    const message &row = message_of(failure.id);
    if (row.whose == blame::surroundings)
        throw cannot_check(std::string(compiler.name()) + ": " + text_of(failure));
    error_line = line.number;
    return found.error(row, at, line.raw, text_of(failure));
}

/* Reports an error at its cause, if that is known, and otherwise where the compiler found it. The first error must be
 * the one that the compiler prints, so an error is not moved to a cause before one that has been reported. */
void recovery::report_with_notes(const fatal_exit &failure, const place &met, int kind) {
    std::optional<mention> cause = cause_of(failure, kind, see);
    bool moves = cause && cause->at.line > error_line;
    finding &error = report(failure, moves ? cause->at : met);
    add_notes(error, failure, kind, see);
    if (!moves)
        return;
    error.source = cause->source;
    error.notes.push_back({met, stops_here(failure, see), met.column == 0 ? "" : std::string(line.raw)});
}

/* True if an error may be a mistake of its own. An error that no source causes is not one if others came before it. */
bool recovery::may_follow(const fatal_exit &failure) const {
    return found.errors() == 0 || message_of(failure.id).whose != blame::program;
}

/* True if the stanza that an error finds missing has been reported, because it is broken or its header is missing. */
bool recovery::is_reported_otherwise(const fatal_exit &failure) const {
    bool map_broken = compiler.is_broken(SC_CLASS_TO_MANAGER_MAPPING);
    switch (failure.id) {
    case MSG_NO_CLASSES:
    case MSG_NO_STRING_TABLE:
        return known.lost.may_be(SC_CONTROL_DEFINITION);
    case MSG_NO_MAPS:
        return known.lost.may_be(SC_CLASS_TO_MANAGER_MAPPING);
    case MSG_NO_MANAGER: /* that there is no map has been reported */
        return map_broken || known.map_line == 0;
    case MSG_KEYS_REVERSED:
        return map_broken;
    case MSG_SBS_TYPE:
    case MSG_NO_ELEMENT_DEFAULT:
    case MSG_NO_ELEMENT_INITIAL:
        return known.run.odd_type_reported && known.run.odd_types.empty();
    default:
        return false;
    }
}

bool recovery::may_retract(warning_id id, int at_line) const {
    switch (id) {
    case NARROWED:
        return at_line == known.overflow_line;
    case INCOMPLETE:
        return at_line == known.map_line || known.run.lists_without_index(at_line);
    case ELEMENT_TYPE:
        return known.kind >= 0 && at_line == known.stanza().data_type.at.line;
    default:
        return false;
    }
}

/* True if a line of one stanza is in the next one, or the other way round, so that one lacks what the other has twice.
 * This has then been reported for the first of the two. */
bool recovery::is_line_of_neighbour(const fatal_exit &failure, int kind) {
    int ordinal = known.stanzas[index_of(kind)].ordinal;
    if (failure.id == MSG_REPEATED_ATTRIBUTE) {
        if (known.lacking.ordinal == ordinal - 1 && known.lacking.has(see.attr().ta_name))
            return true;
        if (known.twice.ordinal != ordinal)
            known.twice = {ordinal, {}};
        known.twice.names.emplace_back(see.attr().ta_name);
        return false;
    }
    if (failure.id != MSG_OPTIONAL_TOO_EARLY && failure.id != MSG_INCOMPLETE_STANZA)
        return false;
    known.lacking = {ordinal, compiler.missing(kind)};
    return known.twice.ordinal == ordinal - 1 &&
           std::all_of(known.lacking.names.begin(), known.lacking.names.end(),
                       [&](std::string_view name) { return known.twice.has(name); });
}

/* The kind whose completion failed. */
int recovery::failed_kind(const fatal_exit &failure) const {
    int kind = failure.record;
    return kind >= 0 && is_sd_kind(kind) ? known.run.kind : kind;
}

/* ---- Stanzas and records -------------------------------------------------------------------------------------- */

void recovery::end_stanza(int next_kind) {
    early.close();
    warned.stanza_end(see, next_kind);
    if (known.kind >= 0 && is_sd_kind(known.kind) && !lacking_unnoticed(see, next_kind).empty())
        element_run::add(known.run.without_index, {known.stanza().header, {}, known.stanza().source});
}

/* Stanzas before the class, or without any, are checked in a class of their own. */
void recovery::open_placeholder_class() {
    if (compiler.open_placeholder_class())
        known.class_forged = true;
}

void recovery::drop_record(int kind) {
    compiler.drop_record(kind);
    warned.dropped(see, kind);
}

/* After the completion of a record failed. */
void recovery::abandon(int kind, const fatal_exit &failure) {
    if (!is_sd_kind(kind))
        drop_record(kind);
    else if (failure.id == MSG_INCOMPLETE_STANZA)
        compiler.complete_element();
    else
        compiler.give_up_run();
}

/* A stanza with a reported error is not completed: its record is dropped before the compiler reaches it. */
void recovery::settle_broken(int next_kind) {
    if (compiler.run_is_open() && compiler.is_broken(known.run.kind))
        compiler.complete_element();
    if (!compiler.any_broken() || (next_kind >= 0 && is_sd_kind(next_kind)))
        return;
    for (int kind : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE, SC_DYNAMIC_RESOURCE_ATTRIBUTE,
                     SC_DYNAMIC_CLASS_ATTRIBUTE, SC_RESOURCE_ACTION, SC_CLASS_ACTION})
        if (compiler.is_open(kind) && compiler.is_broken(kind))
            drop_record(kind);
}

void recovery::skip_stanza() {
    early.close();
    known.skipping = true;
    known.kind = NO_KIND;
}

/* Notes that the header of a stanza of one of these kinds is missing. */
void recovery::lose_header(const kind_set &kinds) {
    known.lost.kinds |= kinds;
    known.lost.owner = known.lost.owner || kinds.test(SC_CLASS_ACTION) || kinds.test(SC_RESOURCE_ACTION);
}

/* True if the missing attributes of the latest stanza of a kind may be in lines that were not understood. */
void recovery::break_if_incomplete(int kind) {
    if (!compiler.is_complete(kind))
        compiler.set_broken(kind);
}

} // namespace check
