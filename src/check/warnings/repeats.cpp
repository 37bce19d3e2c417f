/* repeats.cpp: warnings about lines that a class or a stanza lacks or has twice. */

#include "check/warnings/watcher.h"
#include "format/data_types.h"

#include <optional>
#include <string>
#include <utility>

namespace check {

namespace {

/* Where the latest class begins, and where it has been given its ResourceClass. */
class class_parts {
public:
    void take_header(const view &see, int kind) {
        if (kind == SC_CONTROL_DEFINITION) {
            place before = std::exchange(resource_class, {});
            early = control ? place{} : before;
            control = mention{see.line.all(), {}, std::string(see.line.raw)};
        } else if (kind == SC_RESOURCE_CLASS) {
            resource_class = see.line.all();
        }
    }

    std::optional<mention> control;
    place resource_class; /* of this class; line 0: none so far */
    place early;          /* in front of the first ControlDefinition, which clears it; line 0: none */
};

class no_resource_class : public watcher {
public:
    using watcher::watcher;

    void before_step(const view &see, int next_kind) override {
        if (next_kind == SC_CONTROL_DEFINITION)
            look_at_class(see);
        parts.take_header(see, next_kind);
    }
    void source_end(const view &see) override {
        look_at_class(see);
    }

private:
    void look_at_class(const view &see) {
        if (!parts.control || parts.resource_class.line != 0 || see.known.lost.may_be(SC_RESOURCE_CLASS))
            return;
        finding &about = report(parts.control->at, parts.control->source,
                                "the class has no `ResourceClass`: its properties and message numbers are 0");
        if (parts.early.line != 0)
            about.notes.push_back({parts.early, "this stanza is lost: put it after the `ControlDefinition`"});
        else
            advise(about, "add a `ResourceClass` after it");
    }

    class_parts parts;
};

class second_resource_class : public watcher {
public:
    using watcher::watcher;

    void before_step(const view &see, int next_kind) override {
        if (next_kind == SC_RESOURCE_CLASS && parts.control && parts.resource_class.line != 0)
            advise(
                report(
                    see, see.line.all(),
                    "the class already has a `ResourceClass`: values of this one replace those of the first, and its "
                    "properties are added",
                    {parts.resource_class, "the other one"}),
                "combine the two");
        parts.take_header(see, next_kind);
    }

private:
    class_parts parts;
};

/* Attributes that may be repeated, of which the last one counts. */
class overridden : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types =
        std::array{AT_DEFAULT_VALUE, AT_VALID_VALUE, AT_SD_VALID_VALUE, AT_VALUE_DISPLAY, AT_SD_VALUE_DISPLAY};

    void value(const view &see) override {
        switch (see.attr().ta_type) {
        case AT_DEFAULT_VALUE:
            return take_default(see);
        case AT_VALID_VALUE:
        case AT_SD_VALID_VALUE:
            earlier_display = {};
            return;
        default:
            return take(see, earlier_display, "the valid value has a `ValueDisplayName` already");
        }
    }
    void stanza_end(const view &, int) override {
        earlier_default = earlier_display = {};
    }

private:
    /* Those of a class attribute are not used at all, which is a warning of its own. */
    void take_default(const view &see) {
        vx_data_type_t type = see.compiler.data_type();
        if (scalar_vx(type) == type && see.known.kind != SC_PERSISTENT_CLASS_ATTRIBUTE)
            take(see, earlier_default, "an attribute that is not an array has one default");
    }
    void take(const view &see, place &earlier, const char *text) {
        if (earlier.line != 0)
            advise(report(see, see.text_place(), std::string(text) + ": this line replaces the earlier one",
                          {earlier, "the earlier one"}),
                   see.attr().ta_type == AT_DEFAULT_VALUE ? "remove one of them, or choose an array type"
                                                          : "remove one of them");
        earlier = {see.line.number, 0, 0};
    }

    place earlier_default; /* line 0: none */
    place earlier_display; /* of the latest valid value; line 0: none */
};

} // namespace

made_watcher make_no_resource_class(const watcher_setup &setup) {
    return make<no_resource_class>(setup);
}

made_watcher make_second_resource_class(const watcher_setup &setup) {
    return make<second_resource_class>(setup);
}

made_watcher make_overridden(const watcher_setup &setup) {
    return make<overridden>(setup);
}

} // namespace check
