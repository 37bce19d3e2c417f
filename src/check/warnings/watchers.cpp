/* watchers.cpp: gives each event to the warnings that have an interest in it. */

#include "check/warnings/registry.h"

namespace check {

void watchers::line(const view &see) const {
    for (watcher *each : of_event[ON_LINE])
        each->line(see);
}

void watchers::attribute(const view &see) const {
    for (watcher *each : of_event[ON_ATTRIBUTE])
        each->attribute(see);
    if (see.known.stanza().misplaced)
        return;
    for (const number_part &part : numbers_in(see.attr().ta_type, see.compiler.data_type(), see.value()))
        if (!part.is_plain())
            for (watcher *each : of_event[ON_NUMBER])
                each->number(see, part);
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
