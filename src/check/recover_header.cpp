/* recover.cpp: what goes on behind an error, so that one mistake is told once. */

#include "check/recovery.h"

#include <algorithm>

namespace cdef::check {

namespace {

constexpr std::string_view BYTE_ORDER_MARK = "\xEF\xBB\xBF";
constexpr int HEADER_TRIES = SC_COUNT; /* each one closes a record */

bool is_header(std::string_view name) {
    return set_table_id(std::string(name).c_str()) >= 0;
}

constexpr vx_uint32_t bit_of(int kind) {
    return 1u << kind;
}

constexpr vx_uint32_t EVERY_KIND = bit_of(SC_COUNT) - 1;

/* Whether an attribute's text is converted as the stanza's data type says. */
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

constexpr bool wants_class(message_id id) {
    return id == MSG_NO_CLASS_FOR_PATTR || id == MSG_NO_CLASS_FOR_PATTR_C || id == MSG_NO_CLASS_FOR_DATTR ||
           id == MSG_NO_CLASS_FOR_ACTION || id == MSG_NO_CLASS_FOR_SD;
}

/* What a stanza mostly begins with. */
bool is_name(std::string_view attribute) {
    return attribute == "Name" || attribute == "VariableClass";
}

std::string_view name_in(const attr_text &text) {
    std::string_view line(text.name, static_cast<size_t>(text.end - text.name));
    return line.substr(0, line.find('='));
}

} // namespace

/* Whether an error is no consequence of one that has been told. */
bool session::may_follow(const fatal_exit &failure) {
    const message &known = message_of(failure.id);
    return out.errors == 0 || known.whose != blame::program;
}

/* Whether the stanza that an error misses has been told of: it is broken, or its header is lost. */
bool session::told_otherwise(const fatal_exit &failure) const {
    bool map_broken = stanzas[SC_CLASS_TO_MANAGER_MAPPING].broken;
    if (failure.id == MSG_NO_CLASSES || failure.id == MSG_NO_STRING_TABLE)
        return may_be_lost(SC_CONTROL_DEFINITION);
    if (failure.id == MSG_NO_MAPS)
        return may_be_lost(SC_CLASS_TO_MANAGER_MAPPING);
    if (failure.id == MSG_NO_MANAGER) /* without a map, that has been told */
        return map_broken || map_line == 0;
    if (failure.id == MSG_KEYS_REVERSED)
        return map_broken;
    bool element_type =
        failure.id == MSG_SBS_TYPE || failure.id == MSG_NO_ELEMENT_DEFAULT || failure.id == MSG_NO_ELEMENT_INITIAL;
    return element_type && types_told && odd_elements.empty();
}

/* A text to be taken as the current line, in the place of the one that the parser has taken apart. */
attr_text session::again(std::string_view text) {
    size_t length = std::min(text.size(), copy.size() - 1);
    memcpy(copy.data(), text.data(), length);
    copy[length] = '\0';
    size_t blanks = std::min(std::string_view(copy.data(), length).find_first_not_of(" \t"), length);
    return {copy.data(), copy.data() + blanks, copy.data() + length};
}

/* Stanzas before the class, or without any, are checked in a class of their own. */
void session::forge_class() {
    class_forged = compiler.forge_class() || class_forged;
}

/* What is not completed has no use for its ranges. */
void session::drop_record(int dropped) {
    compiler.drop_record(dropped);
    int begun = stanzas[index_of(dropped)].header.line;
    std::erase_if(seen.ranges,
                  [&](const pending_range &range) { return range.kind == dropped && range.at.line >= begun; });
}

/* What has been reported is not completed: its record is dropped before the compiler comes to it. */
void session::settle_broken(int next_kind) {
    if (compiler.run_is_open() && stanzas[index_of(sd_kind)].broken)
        compiler.complete_element();
    if (next_kind >= 0 && is_sd_kind(next_kind))
        return;
    for (int each : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE, SC_DYNAMIC_RESOURCE_ATTRIBUTE,
                     SC_DYNAMIC_CLASS_ATTRIBUTE, SC_RESOURCE_ACTION, SC_CLASS_ACTION})
        if (compiler.is_open(each) && stanzas[index_of(each)].broken)
            drop_record(each);
}

/* A record whose completion failed. */
void session::abandon(int failed_kind, const fatal_exit &failure) {
    if (!is_sd_kind(failed_kind))
        drop_record(failed_kind);
    else if (failure.id == MSG_INCOMPLETE_STANZA)
        compiler.complete_element();
    else
        compiler.give_up_run();
}

/* The elements are checked all the same; they belong to nothing. */
void session::finish_run_by_hand(int new_kind) {
    forge_class();
    compiler.begin_run_of_nobody(new_kind);
}

/* Whether the run's indexes cannot be told any more: an element that has been reported gave none. */
bool session::lost_index(int new_kind) const {
    if (new_kind != sd_kind || !compiler.run_is_open())
        return false;
    return kind < 0 || (stanzas[index_of(sd_kind)].broken && (compiler.required_seen(sd_kind) & ELEMENT_INDEX) == 0);
}

void session::open_stanza(int new_kind, bool broken) {
    bool same_run = kind == new_kind && is_sd_kind(new_kind);
    if (!same_run) { /* after a mistake it may be the rest of a run */
        index_lost = kind < 0 || stanzas[index_of(kind)].broken;
        other_index = -1;
        odd_elements.clear();
        types_told = false;
        index_missing = 0;
    }
    if (!is_sd_kind(new_kind))
        owner_lost = false;
    kind = new_kind;
    if (is_sd_kind(kind))
        sd_kind = kind;
    skipping = false;
    stanzas[index_of(kind)].broken = broken;
    stanza_note &stanza = stanzas[index_of(kind)];
    stanza.given.fill(0);
    stanza.refused = {};
    stanza.misplaced = false;
    stanza.data_type.at = {};
    stanza.header = all_of_line();
    stanza.source = raw;
    if (kind == SC_CLASS_TO_MANAGER_MAPPING)
        map_line = compiler.line_number();
}

/* Whether the header is to be tried again. */
bool session::recover_header(const fatal_exit &failure, int new_kind) {
    if (failure.completing >= 0) {
        int failed = is_sd_kind(failure.completing) ? sd_kind : failure.completing;
        if (!stanzas[index_of(failed)].broken && !told_otherwise(failure) && may_follow(failure))
            add_notes(error(failure, here(mark_kind::none)), failure, failed);
        splits_stanza = splits_stanza || (failed == kind && out.errors > header_errors);
        abandon(failed, failure);
        return true;
    }
    if (!compiler.class_is_open() && wants_class(failure.id)) {
        if (!may_be_lost(SC_CONTROL_DEFINITION))
            add_notes(error(failure, all_of_line()), failure, new_kind);
        header_told = true;
        forge_class();
        return true;
    }
    bool no_attribute = failure.id == MSG_NO_SD_ATTRIBUTE;
    bool told = out.errors > header_errors || kind < 0 || stanzas[index_of(kind)].broken;
    bool consequence = no_attribute && told && out.errors > 0;
    if (!consequence && may_follow(failure))
        add_notes(error(failure, all_of_line()), failure, new_kind);
    if (no_attribute) {
        finish_run_by_hand(new_kind);
        open_stanza(new_kind, true);
        stanzas[index_of(new_kind)].misplaced = true;
        index_lost = true;
    } else if (failure.id == MSG_SECOND_MAP) {
        give_up_map();
    } else {
        skip_stanza();
    }
    return false;
}

/* Behind a second map's header: what the first lacks may be here. One of which there is a header only goes on. */
void session::give_up_map() {
    stanza_note &map = stanzas[SC_CLASS_TO_MANAGER_MAPPING];
    vx_uint32_t seen_of_map = compiler.required_seen(SC_CLASS_TO_MANAGER_MAPPING);
    if (kind == SC_CLASS_TO_MANAGER_MAPPING && !skipping && seen_of_map == 0)
        return;
    map.broken = map.broken || seen_of_map != sc_tables[SC_CLASS_TO_MANAGER_MAPPING].req_mask_cmplt;
    skip_stanza();
}

/* The stanza kind that a line names that is no attribute line: nearly, or in a skipped stanza exactly. */
std::string_view session::header_meant(const attr_text &text, const fatal_exit &failure) const {
    bool whole = failure.id == MSG_NO_EQUALS || failure.id == MSG_NO_STANZA;
    if (!whole)
        return {};
    return near_miss({text.name, static_cast<size_t>(text.end - text.name)}, stanza_names());
}

/* A header with blanks in front. */
void session::indented_header(std::string_view meant, const fatal_exit &failure) {
    bool exact = std::string_view(line.name) == meant;
    finding &found = error(failure, all_of_line());
    found.notes.push_back({all_of_line(), "a stanza begins in column 1"});
    if (!exact)
        found.notes.push_back({all_of_line(), suggestion(line.name, stanza_names())});
    take_header(again(meant), !exact);
}

/* Takes a header without what cannot be seen of it. */
bool session::take_stripped(finding &found, std::string_view name) {
    size_t length = name.size();
    if (raw.starts_with(BYTE_ORDER_MARK)) {
        name.remove_prefix(BYTE_ORDER_MARK.size());
        found.notes.push_back({all_of_line(), "a byte order mark is in front, which belongs to the name"});
    }
    if (raw.ends_with('\r')) {
        strip_returns = true;
        name = name.substr(0, name.find_last_not_of('\r') + 1);
        found.notes.push_back({all_of_line(), "the line ends with a carriage return, which belongs to the name; "
                                              "further ones are passed over"});
    }
    if (name.size() == length || !is_header(name))
        return false;
    take_header(again(name), false);
    return true;
}

/* A header that names no kind: of an attribute line without its blank, a near miss, or lost. */
void session::unknown_header(const attr_text &text, const fatal_exit &failure) {
    std::string_view name(text.name, static_cast<size_t>(text.end - text.name));
    if (rest_of_line && error_line + 1 == compiler.line_number())
        return; /* all of the line has been told of */
    finding &found = error(failure, all_of_line());
    if (take_stripped(found, name))
        return;
    if (rest_of_line) {
        found.notes.push_back({all_of_line(), "this is the rest of a line of more than 253 characters"});
        return;
    }
    bool attribute = name.find('=') != std::string_view::npos && !is_header(name.substr(0, name.find('=')));
    if (attribute && kind >= 0) {
        found.notes.push_back({all_of_line(), "an attribute line begins with a blank or a tab"});
        std::string indented = std::string("\t").append(name);
        if (!skipping)
            take_quietly(indented);
        return;
    }
    std::string_view meant = near_miss(name.substr(0, name.find('=')), stanza_names());
    found.notes.push_back({all_of_line(), suggestion(name, stanza_names())});
    if (!meant.empty())
        return take_header(again(meant), true);
    watch_stanza_end(-1);
    if (kind >= 0 && compiler.required_seen(kind) != sc_tables[index_of(kind)].req_mask_cmplt)
        stanzas[index_of(kind)].broken = true; /* the rest of it may be what is skipped */
    lose_header(EVERY_KIND);
    skip_stanza();
}

/* A stanza of one of these kinds, as bits, is there without its header. */
void session::lose_header(vx_uint32_t kinds) {
    constexpr vx_uint32_t actions = bit_of(SC_CLASS_ACTION) | bit_of(SC_RESOURCE_ACTION);
    lost_kinds |= kinds;
    owner_lost = owner_lost || (kinds & actions) != 0;
}

void session::skip_stanza() {
    skipping = true;
    kind = -1;
}

/* The line again, of which an error has been told. */
void session::take_quietly(std::string_view text) {
    try {
        latest = {};
        compiler.take_line(again(text));
        note_given();
    } catch (const fatal_exit &) {
        stanzas[index_of(kind)].broken = true;
        note_refused(latest.attr == nullptr ? std::nullopt : std::optional(latest.attr->ta_type));
    }
}

void session::take_header(const attr_text &text, bool guessed) {
    int new_kind = set_table_id(text.name);
    if (new_kind >= 0) {
        watch_stanza_end(new_kind);
        watch_header(new_kind);
        settle_broken(new_kind);
    }
    bool resource_open = compiler.is_open(SC_DYNAMIC_RESOURCE_ATTRIBUTE);
    bool class_open = compiler.is_open(SC_DYNAMIC_CLASS_ATTRIBUTE);
    bool no_index = lost_index(new_kind);
    header_errors = out.errors;
    header_told = splits_stanza = false;
    for (int tries = 0; tries < HEADER_TRIES; ++tries) {
        try {
            compiler.take_line(text);
            ranges_settled(resource_open, class_open, new_kind);
            open_stanza(new_kind, guessed || header_told);
            stanzas[index_of(new_kind)].misplaced = splits_stanza;
            index_lost = index_lost || no_index;
            return;
        } catch (const fatal_exit &failure) {
            if (new_kind < 0)
                return unknown_header(text, failure);
            if (!recover_header(failure, new_kind))
                return;
        }
    }
    skip_stanza();
}

std::string_view session::name_given() const {
    place at = here(mark_kind::name);
    return std::string_view(raw).substr(at.column - 1, at.length);
}

/* The attribute type of a line that could not be read; nothing if its name is like none of the kind's. */
std::optional<int> session::type_meant() const {
    std::string_view name = name_given();
    const table_attrs *attr = find_attr(sc_tables[index_of(kind)], name);
    if (std::string_view meant = near_miss(name, attribute_names(sc_tables[index_of(kind)]));
        attr == nullptr && !meant.empty())
        attr = find_attr(sc_tables[index_of(kind)], meant);
    return attr == nullptr ? std::nullopt : std::optional(attr->ta_type);
}

/* Nothing stands for an attribute whose name is not known. */
void session::note_refused(std::optional<int> type) {
    refused_attributes &refused = stanzas[index_of(kind)].refused;
    if (type)
        refused.types.set(index_of(*type));
    else
        refused.unknown_name = true;
}

/* Whether a line belongs to another stanza, as one before it did. Notes it if it is the first: a second name, or an
 * attribute that other kinds have and this one has not. */
bool session::misplaced(const fatal_exit &failure) {
    bool unknown = failure.id == MSG_UNKNOWN_ATTRIBUTE && !type_meant();
    bool repeated = failure.id == MSG_REPEATED_ATTRIBUTE;
    bool &before = stanzas[index_of(kind)].misplaced;
    if (before)
        return unknown || repeated || failure.id == MSG_INVALID_VALUE || failure.id == MSG_NO_VALID_VALUE;
    bool named = repeated && (latest.attr == sc_tables[index_of(kind)].sc_attrs.data() || is_name(name_given()));
    vx_uint32_t kinds = unknown || named ? kinds_with(name_given()) : 0;
    before = kinds != 0;
    if (!before)
        return false;
    lose_header(kinds);
    index_lost = index_lost || is_sd_kind(kind); /* this may be another run by now */
    if (int before_kind = compiler.previous_kind();
        unknown && before_kind >= 0) { /* what is missed there is perhaps here */
        stanza_note &previous = stanzas[index_of(before_kind)];
        previous.broken =
            previous.broken || compiler.required_seen(before_kind) != sc_tables[index_of(before_kind)].req_mask_cmplt;
    }
    return false;
}

/* A value that is refused because its element has no known type: told of here, and not at the run's end as well. */
void session::tell_type() {
    int type_line = stanzas[index_of(kind)].data_type.at.line;
    types_told =
        std::erase_if(odd_elements, [&](const mention &odd) { return odd.at.line == type_line; }) > 0 || types_told;
    tell_instead(ELEMENT_TYPE, type_line);
}

/* Behind an attribute line in front of any header. */
void session::lose_first_header(const attr_text &text, const fatal_exit &failure) {
    vx_uint32_t kinds = kinds_with(name_in(text));
    add_notes(error(failure, all_of_line()), failure, -1);
    lose_header(kinds == 0 ? EVERY_KIND : kinds);
    skip_stanza();
}

/* Whether an attribute's error is a consequence of one that has been told. */
bool session::attribute_follows(const fatal_exit &failure) {
    if (failure.id == MSG_INDEX_NOT_CONSECUTIVE)
        return index_lost || (other_index >= 0 && compiler.element_index() == other_index);
    if (failure.id == MSG_NO_STRING_TABLE)
        return told_otherwise(failure);
    const stanza_note &stanza = stanzas[index_of(kind)];
    bool typed = latest.attr != nullptr && is_typed(latest.attr->ta_type);
    bool untyped = stanzas[index_of(kind)].broken && sc_tables[index_of(kind)].dt_offset >= 0 &&
                   compiler.data_type() == VX_UNKNOWN;
    if (typed && untyped && failure.id == MSG_INVALID_VALUE)
        return true;
    bool value_refused = stanza.refused.has_any({AT_VALID_VALUE, AT_SD_VALID_VALUE}) || stanza.refused.unknown_name;
    if (failure.id == MSG_NO_VALID_VALUE && value_refused)
        return true;
    return misplaced(failure);
}

/* Behind a wrong index: either the counting goes on from it, or it is passed over. */
void session::recover_index(bool follows) {
    other_index = follows ? -1 : compiler.expected_index() + 1;
    bool read = compiler.element_index() + 1 != compiler.expected_index();
    compiler.expect_index((read ? compiler.element_index() : compiler.expected_index()) + 1);
    index_lost = false;
}

/* What an error has told is not told as a warning as well. */
void session::tell_instead(warning_id id, int at_line) {
    out.warnings -= std::erase_if(out.findings, [&](const finding &found) {
        return found.at.line == at_line && std::string_view(found.code) == warnings[id].code;
    });
}

/* What else the error of an attribute leaves to be done, besides its stanza's being broken. */
void session::recover_value(const fatal_exit &failure, bool follows) {
    if (failure.id == MSG_INDEX_NOT_CONSECUTIVE) {
        if (!follows)
            tell_instead(INCOMPLETE, index_missing);
        recover_index(follows);
    }
    if (failure.id == MSG_NO_STRING_TABLE)
        forge_class();
    if (is_sd_kind(kind) && failure.id == MSG_INVALID_VALUE && compiler.data_type() == VX_UNKNOWN)
        tell_type();
}

void session::recover_attribute(const fatal_exit &failure) {
    const message &known = message_of(failure.id);
    if (std::string_view meant = header_meant(line, failure); !meant.empty())
        return indented_header(meant, failure);
    if (kind < 0)
        return lose_first_header(line, failure);
    bool follows = attribute_follows(failure);
    if (!follows && may_follow(failure))
        add_notes(error(failure, here(known.mark, &failure)), failure, kind);
    if (overflow_told)
        tell_instead(NARROWED, overflow_line);
    overflow_told = false;
    recover_value(failure, follows);
    stanzas[index_of(kind)].broken = true;
    if (failure.id == MSG_OPTIONAL_TOO_EARLY)
        take_quietly(std::string_view(raw).substr(0, all_of_line().column - 1 + all_of_line().length));
    else
        note_refused(latest.attr == nullptr ? type_meant() : std::optional(latest.attr->ta_type));
    compiler.forget_overflow(); /* its mark would be a second report of the same number */
}

const mention *session::map_value(std::string_view attribute) const {
    auto found =
        std::find_if(map_values.begin(), map_values.end(), [&](const mention &each) { return each.text == attribute; });
    return found == map_values.end() ? nullptr : &*found;
}

/* Whether the step of the end is to be tried again, without the record that it failed for. */
bool session::recover_end(const fatal_exit &failure) {
    int failed = failure.completing < 0 ? -1 : is_sd_kind(failure.completing) ? sd_kind : failure.completing;
    bool told = failed >= 0 && stanzas[index_of(failed)].broken;
    if (!told && !told_otherwise(failure) && may_follow(failure)) {
        add_notes(error(failure, here(mark_kind::none)), failure, failed);
        if (failure.id == MSG_KEYS_REVERSED && map_value("LastKey") == nullptr)
            tell_instead(INCOMPLETE, map_line);
    }
    if (failed >= 0)
        abandon(failed, failure);
    return failed >= 0;
}

} // namespace cdef::check
