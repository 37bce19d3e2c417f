/* recover_header.cpp: takes headers, and continues after one that is refused. */

#include "check/edits.h"
#include "check/meant.h"
#include "check/recovery.h"
#include "language/limits.h"
#include "language/names.h"

#include <string>

namespace check {

namespace {

constexpr std::string_view BYTE_ORDER_MARK = "\xEF\xBB\xBF";
constexpr int HEADER_TRIES = SC_COUNT; /* each one closes a record */

bool is_header(std::string_view name) {
    return set_table_id(std::string(name).c_str()) >= 0;
}

bool wants_class(message_id id) {
    return id == MSG_NO_CLASS_FOR_PATTR || id == MSG_NO_CLASS_FOR_PATTR_C || id == MSG_NO_CLASS_FOR_DATTR ||
           id == MSG_NO_CLASS_FOR_ACTION || id == MSG_NO_CLASS_FOR_SD;
}

/* Names and Ids must differ within a class, and those of elements within their run. Variable classes are those of the
 * whole source. */
void forget_declarations(declarations &declared, int next_kind, bool begins_run, bool begins_class) {
    if (begins_run)
        declared.names[index_of(next_kind)].clear();
    if (!begins_class)
        return;
    for (size_t kind = 0; kind < SC_COUNT; ++kind)
        if (kind != SC_RESOURCE_VARIABLE_CLASS)
            declared.names[kind].clear();
    for (number_lines &ids : declared.ids)
        ids.clear();
}

} // namespace

/* guessed: the header is what a misspelt one may have meant. */
void recovery::take_header(const attr_text &text, bool guessed) {
    int kind = set_table_id({text.name, static_cast<size_t>(text.end - text.name)});
    if (kind >= 0) {
        end_stanza(kind);
        bool begins_run = is_sd_kind(kind) && (!compiler.run_is_open() || known.kind != kind);
        settle_broken(kind);
        warned.before_step(see, kind);
        forget_declarations(known.declared, kind, begins_run,
                            kind == SC_CONTROL_DEFINITION && compiler.class_is_open());
    }
    bool no_index = loses_index(kind);
    errors_before_header = found.errors();
    header_reported = false;
    if (known.split.kind != NO_KIND) /* rarely; to clear it for every header would take long */
        known.split = {};
    for (int tries = 0; tries < HEADER_TRIES; ++tries) {
        try {
            compiler.take_line(text);
            warned.after_step(see, kind);
            if (kind == SC_CONTROL_DEFINITION && compiler.output() == nullptr)
                compiler.drop_latest_class(); /* there may be millions */
            open_stanza(kind, guessed || header_reported);
            known.stanza().misplaced = known.split.kind != NO_KIND;
            index_lost = index_lost || no_index;
            return;
        } catch (const fatal_exit &failure) {
            if (kind < 0)
                return unknown_header(text, failure);
            if (!recover_header(failure, kind))
                return;
        }
    }
    skip_stanza();
}

/* True if the next index of the run is unknown, because the element before it gave no index, which has been reported.
 */
bool recovery::loses_index(int next_kind) const {
    if (next_kind != known.run.kind || !compiler.run_is_open())
        return false;
    return known.kind < 0 || (compiler.is_broken(next_kind) && !compiler.has_index(next_kind));
}

void recovery::open_stanza(int kind, bool broken) {
    bool same_run = known.kind == kind && is_sd_kind(kind);
    if (!same_run) { /* after a mistake it may be the rest of a run */
        index_lost = known.kind < 0 || compiler.is_broken(known.kind);
        other_index = awaited_index = -1;
        known.run.odd_types.clear();
        known.run.odd_type_reported = false;
        known.run.without_index.clear();
    }
    if (!is_sd_kind(kind))
        known.lost.owner = false;
    known.kind = kind;
    if (is_sd_kind(kind))
        known.run.kind = kind;
    known.skipping = false;
    compiler.set_broken(kind, broken);
    stanza_record &stanza = known.stanza();
    stanza.given.fill(0);
    stanza.ordinal = ++known.stanzas_begun;
    stanza.suspect = false;
    stanza.refused = {};
    stanza.misplaced = false;
    stanza.data_type.at = {};
    stanza.header = line.all();
    stanza.source = line.raw;
    if (kind == SC_CLASS_TO_MANAGER_MAPPING)
        known.map_line = line.number;
    if (kind == SC_RESOURCE_CLASS && compiler.output() != nullptr)
        known.class_lines.push_back(line.number);
}

/* True if the header must be tried again. */
bool recovery::recover_header(const fatal_exit &failure, int kind) {
    if (failure.record >= 0)
        return recover_completion(failure);
    if (!compiler.class_is_open() && wants_class(failure.id))
        return recover_missing_class(failure, kind);
    bool no_attribute = failure.id == MSG_NO_SD_ATTRIBUTE;
    bool reported = found.errors() > errors_before_header || known.kind < 0 || compiler.is_broken(known.kind);
    bool consequence = no_attribute && reported && found.errors() > 0;
    if (!consequence && may_follow(failure))
        report_with_notes(failure, line.all(), kind);
    if (no_attribute)
        begin_stray_run(kind, !consequence || known.kind < 0 || known.stanza().misplaced);
    else if (failure.id == MSG_SECOND_MAP)
        give_up_map();
    else
        skip_stanza();
    return false;
}

/* The header completed a record, which failed. */
bool recovery::recover_completion(const fatal_exit &failure) {
    int failed = failed_kind(failure);
    if (!compiler.is_broken(failed) && !is_reported_otherwise(failure) && !is_line_of_neighbour(failure, failed) &&
        may_follow(failure))
        report_with_notes(failure, line.none(), failed);
    if (failed == known.kind && found.errors() > errors_before_header && !known.stanza().is_empty())
        known.split = {failed, known.stanza().given};
    abandon(failed, failure);
    return true;
}

bool recovery::recover_missing_class(const fatal_exit &failure, int kind) {
    if (!known.lost.may_be(SC_CONTROL_DEFINITION))
        report_with_notes(failure, line.all(), kind);
    header_reported = true;
    open_placeholder_class();
    return true;
}

/* The elements are checked although they belong to nothing. misplaced: the header may be the only line of an element */
void recovery::begin_stray_run(int kind, bool misplaced) {
    open_placeholder_class();
    compiler.begin_ownerless_run(kind);
    open_stanza(kind, true);
    known.stanza().misplaced = misplaced;
    index_lost = true;
}

/* After a second map's header. What the first one lacks may be in the second; a map without any lines continues. */
void recovery::give_up_map() {
    if (known.kind == SC_CLASS_TO_MANAGER_MAPPING && !known.skipping &&
        compiler.required_seen(SC_CLASS_TO_MANAGER_MAPPING) == 0)
        return;
    break_if_incomplete(SC_CLASS_TO_MANAGER_MAPPING);
    skip_stanza();
}

/* A header that names no kind: it is misspelt, or it is an attribute line without its leading blank, or a header is
 * missing. */
void recovery::unknown_header(const attr_text &text, const fatal_exit &failure) {
    std::string_view name(text.name, static_cast<size_t>(text.end - text.name));
    if (line.continues && error_line + 1 == line.number)
        return; /* the line that this one continues has been reported */
    finding &error = report(failure, line.all());
    auto add = [&](std::string note) { error.notes.push_back({line.all(), std::move(note)}); };
    std::string_view bare = bare_header(error, name);
    std::string_view front = bare.substr(0, bare.find('='));
    if (bare.empty())
        return;
    if (bare.size() < name.size() && is_header(bare))
        return take_header(line.replaced(bare), false);
    if (line.continues)
        return add("this is the rest of a line of more than " + std::to_string(LINE_MAX_CHARS - 1) + " characters");
    if (take_joined_header(bare, error))
        return;
    if (front.size() < bare.size() && !is_header(front) && known.kind >= 0)
        return column_1_attribute(error, bare);
    language::name_list names = language::stanza_names();
    language::guess meant = language::meant_by(front, names);
    bool is_name = front.size() == bare.size();
    add(language::suggestion(is_name ? meant : language::meant_by(bare, names), names));
    if (is_name)
        check::add(error.fix, line.renamed(line.part(bare), line.raw, meant));
    if (!meant.name().empty())
        return take_header(line.replaced(meant.name()), true);
    lose_stanza();
}

/* A header and an attribute line in one. */
bool recovery::take_joined_header(std::string_view name, finding &error) {
    size_t blank = name.find_first_of(" \t");
    if (blank == std::string_view::npos || !is_header(name.substr(0, blank)))
        return false;
    error.notes.push_back({line.all(), "a header has a line of its own"});
    std::string attribute(name.substr(blank));
    take_header(line.replaced(std::string(name.substr(0, blank))), true);
    if (known.kind >= 0 && attribute.find('=') != std::string::npos)
        take_quietly(attribute, 0);
    return true;
}

/* A header's name without its invisible characters. */
std::string_view recovery::bare_header(finding &error, std::string_view name) {
    auto add = [&](std::string note, edit removal) {
        error.notes.push_back({line.all(), std::move(note)});
        check::add(error.fix, {certainty::certain, {std::move(removal)}});
    };
    if (line.raw.starts_with(BYTE_ORDER_MARK)) {
        name.remove_prefix(BYTE_ORDER_MARK.size());
        add("the line begins with a byte order mark, which belongs to the name",
            line.replacement({line.number, 1, BYTE_ORDER_MARK.size()}, line.raw, {}));
    }
    if (std::optional<edit> removal = line.without_returns(); removal && name.ends_with('\r')) {
        strip_returns = true;
        name = name.substr(0, name.find_last_not_of('\r') + 1);
        add("the line ends with a carriage return, which belongs to the name; further ones are not reported",
            std::move(*removal));
    }
    return name;
}

/* An attribute line without the blank or tab that it begins with. */
void recovery::column_1_attribute(finding &error, std::string_view text) {
    error.notes.push_back({line.all(), "an attribute line begins with a blank or a tab"});
    std::string_view name = text.substr(0, text.find('='));
    correction indented = line.renamed(line.part(name), line.raw, attribute_meant(known, known.kind, name));
    for (edit &each : indented.edits)
        each.text.insert(0, "\t");
    check::add(error.fix, std::move(indented));
    take_quietly(std::string("\t").append(text), 1);
}

/* A stanza of which nothing is known begins. */
void recovery::lose_stanza() {
    end_stanza(NO_KIND);
    if (known.kind >= 0)
        break_if_incomplete(known.kind);
    lose_header(kind_set().set());
    skip_stanza();
}

} // namespace check
