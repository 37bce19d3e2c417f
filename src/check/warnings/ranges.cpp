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
        bool of_resource = resource_was_open && is_completed(see, SC_DYNAMIC_RESOURCE_ATTRIBUTE, next_kind);
        bool of_class = class_was_open && is_completed(see, SC_DYNAMIC_CLASS_ATTRIBUTE, next_kind);
        if ((!of_resource && !of_class) || next_kind == SC_CONTROL_DEFINITION)
            return;
        int completed = of_resource ? SC_DYNAMIC_RESOURCE_ATTRIBUTE : SC_DYNAMIC_CLASS_ATTRIBUTE;
        const lost_stanzas &lost = see.known.lost;
        bool uncertain = lost.may_be(SC_DYNAMIC_RESOURCE_ATTRIBUTE) || lost.may_be(SC_DYNAMIC_CLASS_ATTRIBUTE);
        std::string name = language::quoted(table_of(completed).sc_name);
        for (const pending &range : ranges)
            if (range.kind != completed && !uncertain)
                report(range.at, range.source, "this Range is lost: a " + name + " is completed first",
                       begun(see, completed));
        ranges.clear();
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
        std::string source; /* the line */
    };

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
