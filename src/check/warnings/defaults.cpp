/* defaults.cpp: a warning about default and initial values that are not valid themselves. */

#include "check/kept_lines.h"
#include "check/value_keys.h"
#include "check/warnings/watcher.h"
#include "format/data_types.h"

#include <algorithm>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace check {

namespace {

/* A text that is cut short has a warning of its own. */
bool is_whole(const view &see, vx_data_type_t type) {
    return is_numeric(type) || see.comment_at_value().empty();
}

/* The values that a stanza allows: its valid values, or its Range. */
class allowed_values {
public:
    void add(const view &see, vx_data_type_t type) {
        if (line == 0)
            line = see.line.number;
        bounds both(see.value());
        std::optional<value_key> low = key_of(type, both.low), high = key_of(type, both.high);
        bool list = !is_numeric(type) && both.high.find(',') != std::string_view::npos && both.two();
        if (is_whole(see, type) && !list && low && high && *low <= *high)
            ranges.add({std::move(*low), std::move(*high), see.line.number});
        else
            comparable = false;
    }
    void clear() {
        ranges.clear();
        line = 0;
        comparable = true;
    }
    /* True if other values are allowed, but not this one. */
    bool excludes(const std::optional<value_key> &key) const {
        return line != 0 && comparable && key && !ranges.has(*key);
    }

    int line = 0; /* of the first one; 0: everything is allowed */

private:
    key_ranges ranges;
    bool comparable = true; /* none is NaN, or has warnings of its own */
};

bool has_name(std::string_view list, std::string_view name) {
    size_t at = list.find(name);
    size_t end = at + name.size();
    return at != std::string_view::npos && (at == 0 || list[at - 1] == ',') && (end == list.size() || list[end] == ',');
}

/* The valid values may follow the defaults, so all is compared at the stanza's end. Elements of structured data are
 * left alone: they always have the default of their type. */
class invalid_default : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types =
        std::array{AT_VALID_VALUE, AT_DEFAULT_VALUE, AT_INITIAL_VALUE, AT_RANGE, AT_PATTR_PROPS};

    void value(const view &see) override {
        touched = true;
        vx_data_type_t type = see.compiler.data_type();
        switch (see.attr().ta_type) {
        case AT_VALID_VALUE:
            return valid.add(see, type);
        case AT_RANGE:
            if (is_numeric(type))
                range.add(see, type);
            return;
        case AT_PATTR_PROPS:
            is_required = has_name(see.value(), "ReqdForDefine");
            return;
        default:
            return take_default(see, type);
        }
    }

    void stanza_end(const view &see, int) override {
        if (!touched)
            return;
        if ((valid.line != 0 || range.line != 0) && !see.known.stanza().may_have_lost({AT_VALID_VALUE, AT_RANGE})) {
            look_at_given(see.compiler.data_type());
            look_at_implied(see);
        }
        valid.clear();
        range.clear();
        defaults.clear();
        touched = has_default = is_required = false;
    }

private:
    /* Of a type that is not an array the last one counts. That of a class attribute is not used. */
    void take_default(const view &see, vx_data_type_t type) {
        if (see.known.kind == SC_PERSISTENT_CLASS_ATTRIBUTE)
            return;
        has_default = true;
        if (!is_vx_array(type))
            defaults.clear();
        if (is_whole(see, type))
            defaults.add(see.value_place(), see.line.raw);
    }

    void look_at_given(vx_data_type_t type) {
        for (size_t i = 0; i < defaults.size(); ++i)
            if (std::optional<value_key> key = key_of(type, defaults.text_of(i)); is_excluded(key))
                explain(report(defaults.at(i), defaults.line_of(i), "this value " + reason(key)), key,
                        "choose another value, or allow this one");
    }

    /* An attribute that must be given whenever a resource is defined needs no default. */
    void look_at_implied(const view &see) {
        const stanza_record &stanza = see.known.stanza();
        vx_data_type_t type = see.compiler.data_type();
        std::optional<value_key> key = default_key(type);
        if (has_default || is_required || !is_excluded(key) ||
            stanza.may_have_lost({AT_DEFAULT_VALUE, AT_INITIAL_VALUE, AT_PATTR_PROPS}))
            return;
        std::string implied = is_numeric(type) ? "0" : "empty";
        bool of_class = see.known.kind == SC_PERSISTENT_CLASS_ATTRIBUTE;
        std::string name = table_of(see.known.kind).sc_attr->sd_attr_type == 0 ? "`DefaultValue`" : "`InitialValue`";
        explain(report(stanza.header, stanza.source,
                       (of_class ? "the default of a class attribute is " : "without " + name + " the attribute is ") +
                           implied + ", which " + reason(key)),
                key, of_class ? "allow this value, too" : "add " + name + ", or allow this value");
    }

    bool is_excluded(const std::optional<value_key> &key) const {
        return valid.excludes(key) || range.excludes(key);
    }
    std::string reason(const std::optional<value_key> &key) const {
        return valid.excludes(key) ? "is not one of the valid values" : "is outside the `Range`";
    }
    void explain(finding &about, const std::optional<value_key> &key, std::string cure) const {
        bool by_values = valid.excludes(key);
        about.notes.push_back(
            {{by_values ? valid.line : range.line, 0, 0}, by_values ? "the valid values" : "the `Range`"});
        advise(about, std::move(cure));
    }

    allowed_values valid, range;
    kept_lines defaults;  /* of the stanza, until its end */
    bool touched = false; /* the stanza has any of these attributes */
    bool has_default = false;
    bool is_required = false; /* clients that define a resource must give it */
};

} // namespace

made_watcher make_invalid_default(const watcher_setup &setup) {
    return make<invalid_default>(setup);
}

} // namespace check
