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

    /* Whether the attribute's run ends before the next stanza, or does not come. Once for each attribute. */
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

class sd_without_run : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_DATA_TYPE};

    void value(const view &see) override {
        latest.take_value(see);
    }
    void stanza_end(const view &see, int next_kind) override {
        if (latest.is_settled(next_kind) && !latest.has_run && see.errors() == 0)
            report(latest.header.at, latest.header.source,
                   "attribute of structured data without elements: it has no value");
    }

private:
    sd_attribute latest;
};

class sd_run_at_end : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_DATA_TYPE};

    void value(const view &see) override {
        latest.take_value(see);
    }
    void stanza_end(const view &see, int next_kind) override {
        bool settled = latest.is_settled(next_kind);
        if (settled && latest.has_run && see.line.ended && see.compiler.run_makes_value())
            report(latest.header.at, latest.header.source,
                   "the elements end the file: the attribute is completed before them and has no value");
    }

private:
    sd_attribute latest;
};

class stray_run : public watcher {
public:
    using watcher::watcher;

    void before_step(const view &see, int next_kind) override {
        bool begins = is_action_run(next_kind) && (!see.compiler.run_is_open() || see.known.kind != next_kind);
        if (begins && !see.known.lost.owner && !see.compiler.is_open(SC_RESOURCE_ACTION) &&
            !see.compiler.is_open(SC_CLASS_ACTION))
            report(see, see.line.all(), "no action is open: these elements belong to nothing");
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
