/* ranges.cpp: a warning about ranges that do not reach their attributes. */

#include "check/warnings/watcher.h"

#include <array>
#include <optional>
#include <string>

namespace check {

namespace {

constexpr auto DYNAMIC = std::array{SC_DYNAMIC_RESOURCE_ATTRIBUTE, SC_DYNAMIC_CLASS_ATTRIBUTE};

bool is_dynamic(int kind) {
    return kind == SC_DYNAMIC_RESOURCE_ATTRIBUTE || kind == SC_DYNAMIC_CLASS_ATTRIBUTE;
}

/* The compiler has one mark for the ranges of both kinds of dynamic attributes. An attribute that is completed while
 * the mark is set keeps the bounds that its record has; otherwise it gets the default ones. Its completion clears the
 * mark. What the next class ends is not completed and keeps its bounds. */
class range_elsewhere : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_RANGE, AT_DATA_TYPE};

    void value(const view &see) override {
        if (!is_dynamic(see.known.kind) || !is_numeric(see.compiler.data_type()))
            return;
        if (see.attr().ta_type == AT_DATA_TYPE)
            of(see.known.kind).numeric = true;
        else
            take_range(see);
    }

    void before_step(const view &see, int next_kind) override {
        for (int kind : DYNAMIC)
            of(kind).was_open = see.compiler.is_open(kind);
        if (next_kind == SC_CONTROL_DEFINITION)
            latest = {};
    }

    void after_step(const view &see, int next_kind) override {
        for (int kind : DYNAMIC)
            if (of(kind).was_open && (next_kind == kind || !see.compiler.is_open(kind)))
                complete(see, kind);
    }

    /* An attribute that is not completed does not use its range. */
    void dropped(const view &, int kind) override {
        if (is_dynamic(kind))
            of(kind) = {};
    }

private:
    struct range {
        place at;
        std::string source; /* the line */
    };
    /* Another attribute, which was completed while the mark was set. */
    struct completed {
        int kind;
        place begin;
        bool without_range;
    };
    /* The latest attribute of a kind. */
    struct attribute {
        bool was_open = false; /* when the current step began */
        bool numeric = false;
        std::optional<range> given;
        std::optional<completed> first; /* cleared the mark of the range */
    };

    attribute &of(int kind) {
        return latest[kind == SC_DYNAMIC_CLASS_ATTRIBUTE];
    }

    void take_range(const view &see) {
        marked = true;
        if (see.known.kind == SC_DYNAMIC_CLASS_ATTRIBUTE && see.compiler.is_open(SC_DYNAMIC_RESOURCE_ATTRIBUTE)) {
            of(SC_DYNAMIC_RESOURCE_ATTRIBUTE).given.reset(); /* replaced, which this warning says */
            advise(report(see, see.text_place(), "this Range goes to the `DynamicResourceAttribute` that is still open",
                          {see.known.stanzas[SC_DYNAMIC_RESOURCE_ATTRIBUTE].header, "begun here"}),
                   "put dynamic class attributes before dynamic resource attributes");
        } else {
            of(see.known.kind).given = range{see.text_place(), std::string(see.line.raw)};
        }
    }

    void complete(const view &see, int kind) {
        attribute &other =
            of(kind == SC_DYNAMIC_CLASS_ATTRIBUTE ? SC_DYNAMIC_RESOURCE_ATTRIBUTE : SC_DYNAMIC_CLASS_ATTRIBUTE);
        attribute &mine = of(kind);
        if (other.given && marked && !other.first)
            other.first = completed{kind, see.known.stanzas[index_of(kind)].header, mine.numeric && !mine.given};
        end(see, kind, marked);
        marked = false;
    }

    /* An attribute keeps the bounds of its record, or gets the default ones. */
    void end(const view &see, int kind, bool keeps) {
        const attribute &mine = of(kind);
        const lost_stanzas &lost = see.known.lost;
        bool certain = !lost.may_be(SC_DYNAMIC_RESOURCE_ATTRIBUTE) && !lost.may_be(SC_DYNAMIC_CLASS_ATTRIBUTE);
        if (mine.given && mine.first && certain && (!keeps || mine.first->without_range)) {
            std::string name = language::quoted(table_of(mine.first->kind).sc_name);
            advise(report(mine.given->at, mine.given->source,
                          keeps ? "because of this Range, a " + name + " that is completed first has the range 0 to 0"
                                : "this Range is lost: a " + name + " is completed first",
                          {mine.first->begin, "begun here"}),
                   "put dynamic class attributes before dynamic resource attributes, and give the last class attribute "
                   "no `Range`");
        }
        of(kind) = {};
    }

    std::array<attribute, DYNAMIC.size()> latest;
    bool marked = false;
};

} // namespace

made_watcher make_range_elsewhere(const watcher_setup &setup) {
    return make<range_elsewhere>(setup);
}

} // namespace check
