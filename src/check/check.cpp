/* run.cpp: drives a compilation over a source, and goes on behind each error so that one mistake is told
 * once. Up to the first error nothing is done that the compiler would not do. */

#include "check/recovery.h"

#include "cdef/support/trouble.h"

#include <algorithm>
#include <fcntl.h>
#include <memory>
#include <unistd.h>

namespace cdef::check {

namespace {

constexpr const char *CLASS_NAME = "class.cdef"; /* what a compilation would name it after is not known: a good name */

std::string text_of(const fatal_exit &failure) {
    std::string text;
    for (const char *part : words_of(failure))
        text += part;
    return text;
}

} // namespace

session::session(const std::string &path, const warning_set &wanted_warnings, result &into)
    : wanted(wanted_warnings), out(into), compiler(path.c_str(), CLASS_NAME, *this) {}

void session::attribute_read(const attr_place &read) {
    latest = read;
}

bool session::excuses_missing(int of_kind) const {
    return stanzas[index_of(of_kind)].broken;
}

/* ---- Findings ------------------------------------------------------------------------------------------------- */

finding &session::error(const fatal_exit &failure, const place &at) {
    const message &known = message_of(failure.id);
    if (known.whose == blame::surroundings)
        throw trouble(out.file + ": " + text_of(failure));
    out.findings.push_back({.error = true,
                            .code = known.code,
                            .name = "error",
                            .text = text_of(failure),
                            .at = at,
                            .source = raw,
                            .notes = {}});
    ++out.errors;
    error_line = compiler.line_number();
    return out.findings.back();
}

bool session::warn(warning_id id, const place &at, std::string text, note more) {
    return warn_at(id, at, raw, std::move(text), std::move(more));
}

bool session::warn_at(warning_id id, const place &at, const std::string &source, std::string text, note more) {
    const warning &known = warnings[id];
    if (!wanted[id])
        return false;
    out.findings.push_back({.error = false,
                            .code = known.code,
                            .name = known.name,
                            .text = std::move(text),
                            .at = at,
                            .source = source,
                            .notes = {}});
    if (!more.text.empty())
        out.findings.back().notes.push_back(std::move(more));
    ++out.warnings;
    return true;
}

place session::all_of_line() const {
    size_t begin = static_cast<size_t>(line.name - line.line);
    return {compiler.line_number(), begin + 1, static_cast<size_t>(line.end - line.name)};
}

place session::value_part(size_t offset, size_t length) const {
    return {compiler.line_number(), static_cast<size_t>(latest.value - line.line) + offset + 1, length};
}

place session::here(mark_kind what, const fatal_exit *failure) const {
    place all = all_of_line();
    size_t equals = raw.find('=', all.column - 1);
    bool split = equals != std::string::npos && equals < all.column - 1 + all.length;
    if (what == mark_kind::none || line.end == nullptr)
        return {compiler.line_number(), 0, 0};
    if (what == mark_kind::text || !split)
        return all;
    if (what == mark_kind::name)
        return {compiler.line_number(), all.column, equals - (all.column - 1)};
    if (what == mark_kind::item && failure != nullptr && failure->detail1 >= line.line && failure->detail1 < line.end)
        return {compiler.line_number(), static_cast<size_t>(failure->detail1 - line.line) + 1,
                strlen(failure->detail1)};
    if (latest.attr != nullptr && latest.length > 0)
        return value_part(0, latest.length);
    return {compiler.line_number(), equals + 2, all.column - 1 + all.length - (equals + 1)};
}

/* ---- Attribute lines --------------------------------------------------------------------------------------------- */

void session::take_attribute(const attr_text &text) {
    if (skipping && set_table_id(text.name) < 0)
        return;
    latest = {};
    int conversions = compiler.conversion_errno();
    try {
        compiler.take_line(text);
    } catch (const fatal_exit &failure) {
        return recover_attribute(failure);
    }
    if (compiler.conversion_errno() != conversions)
        overflow_line = compiler.line_number();
    if (latest.attr == nullptr)
        return;
    note_given();
    watch_attribute();
}

void session::note_given() {
    if (latest.attr == nullptr)
        return;
    auto at = static_cast<size_t>(latest.attr - sc_tables[index_of(kind)].sc_attrs.data());
    int &given = stanzas[index_of(kind)].given[at];
    if (given == 0)
        given = compiler.line_number();
    if (kind == SC_CLASS_TO_MANAGER_MAPPING)
        map_values.push_back({value_part(0, latest.length), latest.attr->ta_name, raw});
    if (latest.attr->ta_type == AT_SD_INDEX)
        index_lost = false;
}

void session::take(const source_line &source) {
    raw.assign(source.begin, source.end);
    watch_line(source);
    source_line stripped = source;
    if (strip_returns && raw.ends_with('\r'))
        --stripped.end;
    line = text_of(stripped);
    if (line.end == nullptr)
        return;
    if (line.name == line.line)
        take_header(line, false);
    else
        take_attribute(line);
}

/* ---- The end of the source ------------------------------------------------------------------------------------ */

void session::close_all() {
    line = {};
    watch_stanza_end(-1);
    settle_broken(-1);
    for (size_t step = 0; step < stepwise_compiler::closing_steps(); ++step) {
        bool resource_open = compiler.is_open(SC_DYNAMIC_RESOURCE_ATTRIBUTE);
        bool class_open = compiler.is_open(SC_DYNAMIC_CLASS_ATTRIBUTE);
        for (int tries = 0; tries < 2; ++tries) {
            try {
                compiler.take_closing_step(step);
                break;
            } catch (const fatal_exit &failure) {
                if (!recover_end(failure))
                    break;
            }
        }
        ranges_settled(resource_open, class_open, -1);
    }
    try {
        compiler.size_image();
    } catch (const fatal_exit &failure) {
        if (may_follow(failure))
            error(failure, here(mark_kind::none));
    }
    watch_end();
}

void session::run() {
    try {
        if (out.file == "-") /* the descriptor itself: it may be no file, or half read */
            compiler.open(fcntl(STDIN_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1));
        else
            compiler.open();
        for (;;) {
            source_line source = compiler.next_line();
            if (source.begin == nullptr)
                break;
            take(source);
        }
    } catch (const fatal_exit &failure) {
        throw trouble(text_of(failure));
    }
    compiler.close();
    close_all();
}

result check_source(const std::string &path, const warning_set &wanted) {
    result checked = {.file = path, .findings = {}};
    std::make_unique<session>(path, wanted, checked)->run();
    std::stable_sort(checked.findings.begin(), checked.findings.end(), [](const finding &a, const finding &b) {
        return std::pair(a.at.line, !a.error) < std::pair(b.at.line, !b.error);
    });
    return checked;
}

} // namespace cdef::check
