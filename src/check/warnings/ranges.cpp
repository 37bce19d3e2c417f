/* ranges.cpp: a warning about ranges that do not reach their attributes. */

#include "check/warnings/watcher.h"

#include <string>
#include <utility>
#include <vector>

namespace check {

namespace {

/* The compiler has one mark for the ranges of both kinds of dynamic attributes, and the completion of either kind
 * clears it. */
class range_elsewhere : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_RANGE};

    void value(const view &see) override {
        if (!is_numeric(see.compiler.data_type()))
            return;
        if (see.known.kind == SC_DYNAMIC_CLASS_ATTRIBUTE && see.compiler.is_open(SC_DYNAMIC_RESOURCE_ATTRIBUTE))
            report(see, see.text_place(), "this Range goes to the `DynamicResourceAttribute` that is still open",
                   begun(see, SC_DYNAMIC_RESOURCE_ATTRIBUTE));
        else
            ranges.push_back({see.text_place(), see.known.kind, std::string(see.line.raw)});
    }

    void before_step(const view &see, int) override {
        resource_was_open = see.compiler.is_open(SC_DYNAMIC_RESOURCE_ATTRIBUTE);
        class_was_open = see.compiler.is_open(SC_DYNAMIC_CLASS_ATTRIBUTE);
    }

    void after_step(const view &see, int next_kind) override {
        if (next_kind == SC_CONTROL_DEFINITION) /* nothing is completed: the ranges stay */
            return ranges.clear();
        if (resource_was_open && is_completed(see, SC_DYNAMIC_RESOURCE_ATTRIBUTE, next_kind))
            complete(see, SC_DYNAMIC_RESOURCE_ATTRIBUTE);
        if (class_was_open && is_completed(see, SC_DYNAMIC_CLASS_ATTRIBUTE, next_kind))
            complete(see, SC_DYNAMIC_CLASS_ATTRIBUTE);
    }

    /* An attribute that is not completed does not use its range. */
    void dropped(const view &see, int kind) override {
        int header = see.known.stanzas[index_of(kind)].header.line;
        std::erase_if(ranges, [&](const pending &each) { return each.kind == kind && each.at.line >= header; });
    }

private:
    /* A Range whose attribute has not been completed. */
    struct pending {
        place at;
        int kind;
        std::string source;    /* the line */
        place cleared_by = {}; /* the header of the attribute whose completion cleared the mark, if one did */
    };

    /* A record of a kind has been completed: with its range, unless the other kind has cleared the mark. */
    void complete(const view &see, int kind) {
        const lost_stanzas &lost = see.known.lost;
        bool uncertain = lost.may_be(SC_DYNAMIC_RESOURCE_ATTRIBUTE) || lost.may_be(SC_DYNAMIC_CLASS_ATTRIBUTE);
        int other = kind == SC_DYNAMIC_CLASS_ATTRIBUTE ? SC_DYNAMIC_RESOURCE_ATTRIBUTE : SC_DYNAMIC_CLASS_ATTRIBUTE;
        for (pending &range : ranges)
            if (range.kind == other && range.cleared_by.line == 0)
                range.cleared_by = see.known.stanzas[index_of(kind)].header;
            else if (range.kind == kind && range.cleared_by.line != 0 && !uncertain)
                report(range.at, range.source,
                       "this Range is lost: a " + language::quoted(table_of(other).sc_name) + " is completed first",
                       {range.cleared_by, "begun here"});
        std::erase_if(ranges, [&](const pending &range) { return range.kind == kind; });
    }

    static note begun(const view &see, int kind) {
        return {see.known.stanzas[index_of(kind)].header, "begun here"};
    }
    static bool is_completed(const view &see, int kind, int next_kind) {
        return next_kind == kind || !see.compiler.is_open(kind);
    }

    std::vector<pending> ranges;
    bool resource_was_open = false;
    bool class_was_open = false;
};

} // namespace

made_watcher make_range_elsewhere(const watcher_setup &setup) {
    return make<range_elsewhere>(setup);
}

} // namespace check
