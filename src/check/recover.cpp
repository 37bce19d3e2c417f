/* recover.cpp: what goes on behind an error, so that one mistake is told once. */

#include "check/session.h"

#include <algorithm>

namespace cdef::check {

namespace {

constexpr std::string_view BYTE_ORDER_MARK = "\xEF\xBB\xBF";
constexpr int HEADER_TRIES = SC_COUNT; /* each one closes a record */

bool is_open(cdgen &cx, int kind) {
    vx_uint32_t identifier = 0;
    memcpy(&identifier, sc_tables[index_of(kind)].sc_cb(cx), sizeof identifier);
    return identifier != 0;
}

void close_record(cdgen &cx, int kind) {
    constexpr vx_uint32_t none = 0;
    memcpy(sc_tables[index_of(kind)].sc_cb(cx), &none, sizeof none);
}

bool is_header(std::string_view name) {
    return set_table_id(std::string(name).c_str()) >= 0;
}

void complete_element(cdgen &cx) {
    cx.sd_name_found = cx.sd_desc_found = cx.sd_disp_found = cx.sd_dt_found = 1;
}

/* A run that is given up. */
void close_run(cdgen &cx) {
    cx.cb_sd_def.sd_cb_ID = 0;
    cx.attr_dflt_val = nullptr;
    cx.curr_sd_tbl = nullptr;
    cx.max_sd_idx = nullptr;
    cx.curr_sdeli = -1;
    cx.expected_sdeli = 0;
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
    bool map_broken = cx.stanzas[SC_CLASS_TO_MANAGER_MAPPING].broken;
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
    if (cx.cb_rsrc_class.rc_cb_ID != 0)
        return;
    init_class_tbl(cx);
    class_forged = true;
}

/* What is not completed has no use for its ranges. */
void session::drop_record(int dropped) {
    close_record(cx, dropped);
    int begun = stanzas[index_of(dropped)].header.line;
    std::erase_if(seen.ranges,
                  [&](const pending_range &range) { return range.kind == dropped && range.at.line >= begun; });
}

/* What has been reported is not completed: its record is dropped before the compiler comes to it. */
void session::settle_broken(int next_kind) {
    if (cx.cb_sd_def.sd_cb_ID != 0 && cx.stanzas[index_of(sd_kind)].broken)
        complete_element(cx);
    if (next_kind >= 0 && is_sd_kind(next_kind))
        return;
    for (int each : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE, SC_DYNAMIC_RESOURCE_ATTRIBUTE,
                     SC_DYNAMIC_CLASS_ATTRIBUTE, SC_RESOURCE_ACTION, SC_CLASS_ACTION})
        if (is_open(cx, each) && cx.stanzas[index_of(each)].broken)
            drop_record(each);
}

/* A record whose completion failed. */
void session::abandon(int failed_kind, const fatal_exit &failure) {
    if (!is_sd_kind(failed_kind))
        drop_record(failed_kind);
    else if (failure.id == MSG_INCOMPLETE_STANZA)
        complete_element(cx);
    else
        close_run(cx);
}

/* The elements are checked all the same; they belong to nothing. */
void session::finish_run_by_hand(int new_kind) {
    forge_class();
    cx.attr_dflt_val = nullptr;
    cx.max_sd_idx = nullptr;
    cx.curr_sd_tbl = &nobody;
    nobody.offset[0] = mk_sd_sec(cx);
    cx.scp = cx.curr_sd_scp = &sc_tables[index_of(new_kind)];
    cx.state = &cx.stanzas[index_of(new_kind)];
    cx.table_id = new_kind;
    cx.scp->sc_init_tbl(cx);
    cx.state->req_mask = cx.state->opt_mask = 0;
    cx.state->dflt = {};
}

/* Whether the run's indexes cannot be told any more: an element that has been reported gave none. */
bool session::lost_index(int new_kind) const {
    if (new_kind != sd_kind || cx.cb_sd_def.sd_cb_ID == 0)
        return false;
    const stanza_state &element = cx.stanzas[index_of(sd_kind)];
    return kind < 0 || (element.broken && (element.req_mask & ELEMENT_INDEX) == 0);
}

void session::open_stanza(int new_kind, bool broken) {
    bool same_run = kind == new_kind && is_sd_kind(new_kind);
    if (!same_run) { /* after a mistake it may be the rest of a run */
        index_lost = kind < 0 || cx.stanzas[index_of(kind)].broken;
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
    cx.stanzas[index_of(kind)].broken = broken;
    stanza_note &stanza = stanzas[index_of(kind)];
    stanza.given.fill(0);
    stanza.refused = {};
    stanza.misplaced = false;
    stanza.data_type.at = {};
    stanza.header = all_of_line();
    stanza.source = raw;
    if (kind == SC_CLASS_TO_MANAGER_MAPPING)
        map_line = cx.linenum;
}

/* Whether the header is to be tried again. */
bool session::recover_header(const fatal_exit &failure, int new_kind) {
    if (cx.completing >= 0) {
        int failed = is_sd_kind(cx.completing) ? sd_kind : cx.completing;
        if (!cx.stanzas[index_of(failed)].broken && !told_otherwise(failure) && may_follow(failure))
            add_notes(error(failure, here(mark_kind::none)), failure, failed);
        splits_stanza = splits_stanza || (failed == kind && out.errors > header_errors);
        abandon(failed, failure);
        return true;
    }
    if (cx.cb_rsrc_class.rc_cb_ID == 0 && wants_class(failure.id)) {
        if (!may_be_lost(SC_CONTROL_DEFINITION))
            add_notes(error(failure, all_of_line()), failure, new_kind);
        header_told = true;
        forge_class();
        return true;
    }
    bool no_attribute = failure.id == MSG_NO_SD_ATTRIBUTE;
    bool told = out.errors > header_errors || kind < 0 || cx.stanzas[index_of(kind)].broken;
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
    stanza_state &map = cx.stanzas[SC_CLASS_TO_MANAGER_MAPPING];
    if (kind == SC_CLASS_TO_MANAGER_MAPPING && !skipping && map.req_mask == 0)
        return;
    map.broken = map.broken || map.req_mask != sc_tables[SC_CLASS_TO_MANAGER_MAPPING].req_mask_cmplt;
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
    if (rest_of_line && error_line + 1 == cx.linenum)
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
    if (kind >= 0 && cx.stanzas[index_of(kind)].req_mask != sc_tables[index_of(kind)].req_mask_cmplt)
        cx.stanzas[index_of(kind)].broken = true; /* the rest of it may be what is skipped */
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
        cx.latest = {};
        take_line(cx, again(text));
        note_given();
    } catch (const fatal_exit &) {
        cx.state->broken = true;
        note_refused(cx.latest.attr == nullptr ? std::nullopt : std::optional(cx.latest.attr->ta_type));
    }
}

void session::take_header(const attr_text &text, bool guessed) {
    int new_kind = set_table_id(text.name);
    if (new_kind >= 0) {
        watch_stanza_end(new_kind);
        watch_header(new_kind);
        settle_broken(new_kind);
    }
    bool resource_open = cx.cb_rsrc_dattr.ra_cb_ID != 0;
    bool class_open = cx.cb_rsrc_dattrC.ra_cb_ID != 0;
    bool no_index = lost_index(new_kind);
    header_errors = out.errors;
    header_told = splits_stanza = false;
    for (int tries = 0; tries < HEADER_TRIES; ++tries) {
        auto before = std::tuple(cx.scp, cx.prev_scp, cx.curr_sd_scp, cx.state, cx.table_id);
        cx.completing = -1;
        try {
            take_line(cx, text);
            ranges_settled(resource_open, class_open, new_kind);
            open_stanza(new_kind, guessed || header_told);
            stanzas[index_of(new_kind)].misplaced = splits_stanza;
            index_lost = index_lost || no_index;
            return;
        } catch (const fatal_exit &failure) {
            std::tie(cx.scp, cx.prev_scp, cx.curr_sd_scp, cx.state, cx.table_id) = before;
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
    const table_attrs *attr = find_attr(*cx.scp, name);
    if (std::string_view meant = near_miss(name, attribute_names(*cx.scp)); attr == nullptr && !meant.empty())
        attr = find_attr(*cx.scp, meant);
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
    bool named = repeated && (cx.latest.attr == cx.scp->sc_attrs.data() || is_name(name_given()));
    vx_uint32_t kinds = unknown || named ? kinds_with(name_given()) : 0;
    before = kinds != 0;
    if (!before)
        return false;
    lose_header(kinds);
    index_lost = index_lost || is_sd_kind(kind); /* this may be another run by now */
    if (unknown && cx.prev_scp != nullptr) {     /* what is missed there is perhaps here */
        stanza_state &previous = cx.stanzas[static_cast<size_t>(cx.prev_scp - sc_tables.data())];
        previous.broken = previous.broken || previous.req_mask != cx.prev_scp->req_mask_cmplt;
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
        return index_lost || (other_index >= 0 && cx.curr_sdeli == other_index);
    if (failure.id == MSG_NO_STRING_TABLE)
        return told_otherwise(failure);
    const stanza_note &stanza = stanzas[index_of(kind)];
    bool typed = cx.latest.attr != nullptr && is_typed(cx.latest.attr->ta_type);
    bool untyped = cx.state->broken && cx.scp->dt_offset >= 0 && data_type(cx) == VX_UNKNOWN;
    if (typed && untyped && failure.id == MSG_INVALID_VALUE)
        return true;
    bool value_refused = stanza.refused.has_any({AT_VALID_VALUE, AT_SD_VALID_VALUE}) || stanza.refused.unknown_name;
    if (failure.id == MSG_NO_VALID_VALUE && value_refused)
        return true;
    return misplaced(failure);
}

/* Behind a wrong index: either the counting goes on from it, or it is passed over. */
void session::recover_index(bool follows) {
    other_index = follows ? -1 : cx.expected_sdeli + 1;
    bool read = cx.curr_sdeli + 1 != cx.expected_sdeli;
    cx.expected_sdeli = read ? cx.curr_sdeli + 1 : cx.expected_sdeli + 1;
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
    if (is_sd_kind(kind) && failure.id == MSG_INVALID_VALUE && data_type(cx) == VX_UNKNOWN)
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
    cx.state->broken = true;
    if (failure.id == MSG_OPTIONAL_TOO_EARLY)
        take_quietly(std::string_view(raw).substr(0, all_of_line().column - 1 + all_of_line().length));
    else
        note_refused(cx.latest.attr == nullptr ? type_meant() : std::optional(cx.latest.attr->ta_type));
    cx.conv_errno = 0; /* its mark would be a second report of the same number */
}

const mention *session::map_value(std::string_view attribute) const {
    auto found =
        std::find_if(map_values.begin(), map_values.end(), [&](const mention &each) { return each.text == attribute; });
    return found == map_values.end() ? nullptr : &*found;
}

/* Whether the step of the end is to be tried again, without the record that it failed for. */
bool session::recover_end(const fatal_exit &failure) {
    int failed = cx.completing < 0 ? -1 : is_sd_kind(cx.completing) ? sd_kind : cx.completing;
    bool told = failed >= 0 && cx.stanzas[index_of(failed)].broken;
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
