/* registry.h: all warnings during a check. */
#ifndef CDGEN_CHECK_WARNINGS_REGISTRY_H
#define CDGEN_CHECK_WARNINGS_REGISTRY_H

#include "check/warnings/watcher.h"

#include <array>
#include <memory>
#include <vector>

namespace check {

/* The wanted warnings, which are notified of each event in turn. */
class watchers {
public:
    watchers(const warning_set &wanted, findings &found, const text::hash_key &key);

    /* All the events of a line that has been read. */
    void line(const view &see) const;
    /* All the events of an attribute line. */
    void attribute(const view &see) const {
        if (!of_event[ON_QUOTED_VALUE].empty() && see.is_quoted())
            quoted(see);
        if (looks_at[index_of(see.attr().ta_type)])
            accepted(see);
    }
    void stanza_end(const view &see, int next_kind) const;
    void before_step(const view &see, int next_kind) const;
    void after_step(const view &see, int next_kind) const;
    void dropped(const view &see, int kind) const;
    void source_end(const view &see) const;

private:
    void quoted(const view &see) const;
    void accepted(const view &see) const;
    void odd_numbers(const view &see) const;

    std::vector<std::unique_ptr<watcher>> all;
    std::array<std::vector<watcher *>, EVENTS> of_event;
    std::array<std::vector<watcher *>, AT_COUNT> of_value; /* the warnings that look at an attribute type's values */
    std::array<bool, AT_COUNT> looks_at = {};              /* true: a warning looks at its values or their numbers */
};

} // namespace check

#endif
