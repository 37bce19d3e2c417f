/* watcher.h: a warning during a check: it watches the check and reports findings. It knows no other warning. */
#ifndef CDGEN_CHECK_WARNINGS_WATCHER_H
#define CDGEN_CHECK_WARNINGS_WATCHER_H

#include "check/check.h"
#include "check/findings.h"
#include "check/numbers.h"
#include "check/view.h"
#include "language/suggestions.h"
#include "text/keyed_hash.h"

#include <array>
#include <bitset>
#include <memory>
#include <string>
#include <string_view>
#include <type_traits>

namespace check {

/* What a warning is made from. */
struct watcher_setup {
    const warning &known;
    findings &found;
    const text::hash_key &key; /* for tables of what the source says */
};

class watcher {
public:
    explicit watcher(const watcher_setup &setup) : to(setup) {}
    watcher(const watcher &) = delete;
    watcher &operator=(const watcher &) = delete;
    virtual ~watcher() = default;

    /* ---- Events. A warning overrides those that it has an interest in. */

    /* A line has been read, nothing has been taken from it, and it is the rest of one that is too long; */
    virtual void continued_line(const view &) {}
    /* or it contains carriage returns, the first one at this position. */
    virtual void carriage_return(const view &, size_t /* at */) {}
    /* The compiler has accepted an attribute line whose value is in quotes. */
    virtual void quoted_value(const view &) {}
    /* It has accepted an attribute line, and the attribute certainly belongs to the current stanza. Called first for
     * each number in the value that is not plain, */
    virtual void number(const view &, const number_part &) {}
    /* then for the whole value. Only for the attribute types that the class lists as `types`. */
    virtual void value(const view &) {}
    /* The current stanza, if any, ends. The kind of the next one is NO_KIND at the end of the source or if it is
     * unknown. */
    virtual void stanza_end(const view &, int /* next_kind */) {}
    /* The compiler is about to take a header, or at the end of the source (NO_KIND) another closing step; */
    virtual void before_step(const view &, int /* next_kind */) {}
    /* and it has completed the records that the step completes. */
    virtual void after_step(const view &, int /* next_kind */) {}
    /* The latest record of a kind will not be completed: an error of it has been reported. */
    virtual void dropped(const view &, int /* kind */) {}
    /* All of the source has been read. */
    virtual void source_end(const view &) {}

protected:
    /* With a note, if it has a text. The finding can be given more notes until the next one is reported. */
    finding &report(const place &at, std::string_view source, std::string text, note more = {}, correction fix = {}) {
        finding &found = to.found.warn(to.known, at, source, std::move(text), std::move(more));
        found.fix = std::move(fix);
        return found;
    }
    /* About the current line. */
    finding &report(const view &see, const place &at, std::string text, note more = {}, correction fix = {}) {
        return report(at, see.line.raw, std::move(text), std::move(more), std::move(fix));
    }
    /* Adds a note that says what to do. */
    static void advise(finding &about, std::string cure) {
        about.notes.push_back({about.at, std::move(cure)});
    }

private:
    watcher_setup to;
};

/* ---- Which events a warning overrides --------------------------------------------------------------------------- */

enum event {
    ON_CONTINUED_LINE,
    ON_CARRIAGE_RETURN,
    ON_QUOTED_VALUE,
    ON_NUMBER,
    ON_VALUE,
    ON_STANZA_END,
    ON_BEFORE,
    ON_AFTER,
    ON_DROPPED,
    ON_END,
    EVENTS
};

using event_set = std::array<bool, EVENTS>;

/* A function that a class does not override is a member of watcher. */
template <class Warning> constexpr event_set events_of() {
    using seeing = void (watcher::*)(const view &);
    using seeing_kind = void (watcher::*)(const view &, int);
    using seeing_position = void (watcher::*)(const view &, size_t);
    using seeing_number = void (watcher::*)(const view &, const number_part &);
    return {
        !std::is_same_v<decltype(&Warning::continued_line), seeing>,
        !std::is_same_v<decltype(&Warning::carriage_return), seeing_position>,
        !std::is_same_v<decltype(&Warning::quoted_value), seeing>,
        !std::is_same_v<decltype(&Warning::number), seeing_number>,
        !std::is_same_v<decltype(&Warning::value), seeing>,
        !std::is_same_v<decltype(&Warning::stanza_end), seeing_kind>,
        !std::is_same_v<decltype(&Warning::before_step), seeing_kind>,
        !std::is_same_v<decltype(&Warning::after_step), seeing_kind>,
        !std::is_same_v<decltype(&Warning::dropped), seeing_kind>,
        !std::is_same_v<decltype(&Warning::source_end), seeing>,
    };
}

/* The attribute types whose values a warning looks at. */
template <class Warning> std::bitset<AT_COUNT> types_of() {
    std::bitset<AT_COUNT> all;
    if constexpr (events_of<Warning>()[ON_VALUE])
        for (attr_type type : Warning::types)
            all.set(type);
    return all;
}

struct made_watcher {
    std::unique_ptr<watcher> warning;
    event_set events;
    std::bitset<AT_COUNT> types;
};

template <class Warning> made_watcher make(const watcher_setup &setup) {
    made_watcher made;
    made.warning = std::make_unique<Warning>(setup);
    made.events = events_of<Warning>();
    made.types = types_of<Warning>();
    return made;
}

/* Each warning's file ends with one. */
using maker = made_watcher(const watcher_setup &);

} // namespace check

#endif
