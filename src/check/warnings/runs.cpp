/* runs.cpp: warnings about runs of elements and what they belong to. */

#include "check/warnings/watcher.h"
#include "format/data_types.h"

#include <utility>

namespace check {

namespace {

bool is_attribute_run(int kind) {
    return kind == SC_PATTR_SD_DEFINITION || kind == SC_DATTR_SD_DEFINITION;
}

bool is_action_run(int kind) {
    return kind == SC_ACTION_IN_SD_DEFINITION || kind == SC_ACTION_OUT_SD_DEFINITION;
}

/* The latest SD-typed attribute whose run may still begin, or continue. */
class sd_attribute {
public:
    void take_value(const view &see) {
        if (scalar_vx(see.compiler.data_type()) != VX_SD_PTR)
            return;
        header = {see.known.stanza().header, {}, see.known.stanza().source};
        open = true;
        has_run = false;
    }

    /* True if the attribute's run ends before the next stanza, or is missing. True only once for each attribute. */
    bool is_settled(int next_kind) {
        bool run = is_attribute_run(next_kind);
        has_run = has_run || run;
        return std::exchange(open, open && run) && !run;
    }

    mention header;
    bool has_run = false;

private:
    bool open = false;
};

/* A header that is not understood may be the run's. */
class sd_without_run : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_DATA_TYPE};

    void value(const view &see) override {
        latest.take_value(see);
    }
    void stanza_end(const view &see, int next_kind) override {
        bool understood = next_kind != NO_KIND || see.line.ended;
        bool contains_run = see.known.kind != NO_KIND && see.known.stanza().misplaced;
        if (latest.is_settled(next_kind) && !latest.has_run && understood && !contains_run)
            advise(report(latest.header.at, latest.header.source,
                          "attribute of structured data without elements: it has no value"),
                   "put its elements directly after it");
    }

private:
    sd_attribute latest;
};

class sd_run_at_end : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_DATA_TYPE};

    void value(const view &see) override {
        latest.take_value(see);
    }
    void stanza_end(const view &see, int next_kind) override {
        bool settled = latest.is_settled(next_kind);
        if (settled && latest.has_run && see.line.ended && see.compiler.run_makes_value())
            advise(report(latest.header.at, latest.header.source,
                          "the elements of this attribute are the last stanzas of the file, so it has no value"),
                   "put another stanza after the elements");
    }

private:
    sd_attribute latest;
};

/* Warns of a run that does not belong to the stanza before it. */
class stray_run : public watcher {
public:
    using watcher::watcher;

    void before_step(const view &see, int next_kind) override {
        if (next_kind == NO_KIND || !is_sd_kind(next_kind) ||
            (see.compiler.run_is_open() && see.known.kind == next_kind))
            return;
        if (is_action_run(next_kind))
            look_for_action(see);
        else if (see.known.kind != NO_KIND && is_attribute_run(see.known.kind) && see.compiler.run_makes_value())
            advise(report(see, see.line.all(),
                          "these elements directly follow those of an attribute: what they belong to is not defined"),
                   "put a stanza of another kind between them");
        else if (is_attribute_run(next_kind))
            look_at_attribute(see, next_kind);
    }

private:
    void look_for_action(const view &see) {
        if (!see.known.lost.owner && !see.compiler.is_open(SC_RESOURCE_ACTION) &&
            !see.compiler.is_open(SC_CLASS_ACTION))
            advise(report(see, see.line.all(), "no action is open: these elements belong to nothing"),
                   "put them directly after their action");
    }
    void look_at_attribute(const view &see, int next_kind) {
        if (see.known.kind == NO_KIND || table_of(see.known.kind).sc_attr == nullptr || !see.compiler.run_makes_value())
            return;
        bool persistent = table_of(see.known.kind).sc_attr->sd_attr_type == 0;
        int right = persistent ? SC_PATTR_SD_DEFINITION : SC_DATTR_SD_DEFINITION;
        if (next_kind != right)
            advise(report(see, see.line.all(),
                          "these elements follow a " + language::quoted(table_of(see.known.kind).sc_name)),
                   "write " + language::quoted(table_of(right).sc_name));
    }
};

} // namespace

made_watcher make_sd_without_run(const watcher_setup &setup) {
    return make<sd_without_run>(setup);
}

made_watcher make_sd_run_at_end(const watcher_setup &setup) {
    return make<sd_run_at_end>(setup);
}

made_watcher make_stray_run(const watcher_setup &setup) {
    return make<stray_run>(setup);
}

} // namespace check
