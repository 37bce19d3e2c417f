/* watchers.cpp: notifies warnings of the events that they need. */

#include "check/warnings/registry.h"

namespace check {

void watchers::line(const view &see) const {
    if (see.line.continues)
        for (watcher *each : of_event[ON_CONTINUED_LINE])
            each->continued_line(see);
    if (of_event[ON_CARRIAGE_RETURN].empty())
        return;
    if (size_t at = see.line.carriage_return(); at < see.line.raw.size())
        for (watcher *each : of_event[ON_CARRIAGE_RETURN])
            each->carriage_return(see, at);
}

void watchers::odd_numbers(const view &see) const {
    for (const number_part &part : numbers_in(see.attr().ta_type, see.compiler.data_type(), see.value()))
        if (!part.is_plain())
            for (watcher *each : of_event[ON_NUMBER])
                each->number(see, part);
}

void watchers::quoted(const view &see) const {
    for (watcher *each : of_event[ON_QUOTED_VALUE])
        each->quoted_value(see);
}

void watchers::accepted(const view &see) const {
    if (see.known.stanza().misplaced &&
        see.attr().ta_type != AT_SD_DATA_TYPE) /* whichever attribute or element it belongs to, its type is unknown */
        return;
    if (!of_event[ON_NUMBER].empty())
        odd_numbers(see);
    for (watcher *each : of_value[index_of(see.attr().ta_type)])
        each->value(see);
}

void watchers::stanza_end(const view &see, int next_kind) const {
    for (watcher *each : of_event[ON_STANZA_END])
        each->stanza_end(see, next_kind);
}

void watchers::before_step(const view &see, int next_kind) const {
    for (watcher *each : of_event[ON_BEFORE])
        each->before_step(see, next_kind);
}

void watchers::after_step(const view &see, int next_kind) const {
    for (watcher *each : of_event[ON_AFTER])
        each->after_step(see, next_kind);
}

void watchers::dropped(const view &see, int kind) const {
    for (watcher *each : of_event[ON_DROPPED])
        each->dropped(see, kind);
}

void watchers::source_end(const view &see) const {
    for (watcher *each : of_event[ON_END])
        each->source_end(see);
}

} // namespace check
