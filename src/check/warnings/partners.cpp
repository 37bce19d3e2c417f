/* partners.cpp: warnings about attributes of a stanza that need, limit or exclude another one. */

#include "check/numbers.h"
#include "check/warnings/watcher.h"

#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace check {

namespace {

/* As it is stored. */
vx_uint16_t number_in(const view &see) {
    return static_cast<vx_uint16_t>(number(see.value(), 0).value);
}

/* A line that needs an Expression, or a ReArmDescription, which needs a ReArmExpression. A refused line may be the
 * missing one. */
class no_expression : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_STRING, AT_UINT16};

    void value(const view &see) override {
        std::string_view name = name_of(see.attr());
        if (name == EXPRESSION)
            has_expression = true;
        if (name == REARM)
            has_rearm = true;
        if (name == REARM || name == "ExpressionDescription" || name == "ReArmDescription")
            dependents.push_back({see.name_place(), std::string(name), std::string(see.line.raw)});
    }
    void stanza_end(const view &see, int) override {
        if (!dependents.empty() && !see.known.stanza().may_have_lost({AT_STRING}))
            for (const mention &each : dependents)
                look_at(each);
        has_expression = has_rearm = false;
        dependents.clear();
    }

private:
    static constexpr std::string_view EXPRESSION = "Expression", REARM = "ReArmExpression";

    void look_at(const mention &dependent) {
        bool needs_rearm = dependent.text == "ReArmDescription";
        if (needs_rearm ? has_rearm : has_expression)
            return;
        std::string partner = language::quoted(needs_rearm ? REARM : EXPRESSION);
        advise(report(dependent.at, dependent.source, language::quoted(dependent.text) + " without " + partner),
               "add the " + partner + ", or remove this line");
    }

    bool has_expression = false;
    bool has_rearm = false;
    std::vector<mention> dependents;
};

/* Groups are those of a class. */
class group : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_UINT16};

    void value(const view &see) override {
        constexpr vx_uint16_t NO_GROUP = 255;
        std::string_view name = name_of(see.attr());
        if (name == "GroupName") {
            group_name = number_in(see);
            name_line.at = see.name_place();
            name_line.source = see.line.raw;
        }
        if (name != "GroupID")
            return;
        group_id = number_in(see);
        if (group_id == NO_GROUP)
            advise(report(see, see.value_place(), "the number 255 means no group"), "give the group another number");
    }
    void stanza_end(const view &see, int) override {
        if (group_name && group_id)
            look_at_name();
        else if (group_name && !see.known.stanza().may_have_lost({AT_UINT16}))
            advise(
                report(name_line.at, name_line.source, "`GroupName` without `GroupID`: the attribute is in no group"),
                "add a `GroupID`, or remove this line");
        group_id.reset();
        group_name.reset();
    }
    void before_step(const view &, int next_kind) override {
        if (next_kind == SC_CONTROL_DEFINITION)
            groups.clear();
    }

private:
    struct naming {
        vx_uint16_t name;
        int line;
    };

    /* An attribute without a GroupName uses the name that another attribute gives the group. */
    void look_at_name() {
        if (*group_name == 0)
            return;
        naming first = groups.try_emplace(*group_id, naming{*group_name, name_line.at.line}).first->second;
        if (first.name == *group_name)
            return;
        finding &about = report(name_line.at, name_line.source,
                                "group " + std::to_string(*group_id) + " has the `GroupName` " +
                                    std::to_string(first.name) + " already",
                                {{first.line, 0, 0}, "given here"});
        advise(about, "give all attributes of a group the same name");
    }

    std::optional<vx_uint16_t> group_id, group_name; /* of the stanza */
    mention name_line;                               /* that of group_name */
    std::map<vx_uint16_t, naming> groups;            /* of the class */
};

class intervals : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_UINT16};

    void value(const view &see) override {
        std::string_view name = name_of(see.attr());
        if (name == "ObservationInterval")
            observation = interval(number_in(see), see.value_mention());
        else if (name == "ReportingInterval")
            reporting = interval(number_in(see), see.value_mention());
    }
    void stanza_end(const view &, int) override {
        if (observation && reporting && reporting->first < observation->first)
            advise(report(reporting->second.at, reporting->second.source,
                          "the `ReportingInterval` is below the `ObservationInterval`",
                          {{observation->second.at.line, 0, 0}, "which is given here"}),
                   "exchange the two numbers");
        observation.reset();
        reporting.reset();
    }

private:
    using interval = std::pair<vx_uint16_t, mention>;

    std::optional<interval> observation;
    std::optional<interval> reporting;
};

/* In a variable class the compiler sets a bit in the Ids of class attributes. */
class class_bit : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_ID, AT_STRING};

    void value(const view &see) override {
        constexpr long CLASS_BIT = 0x8000;
        const attr_kind *kind = table_of(see.known.kind).sc_attr;
        if (kind == nullptr || kind->sd_attr_type == 0)
            return;
        if (see.attr().ta_type == AT_ID && (check::number(see.value(), 0).value & CLASS_BIT) != 0)
            id = see.value_mention();
        else if (name_of(see.attr()) == "VariableClass")
            in_variable_class = true;
    }
    void stanza_end(const view &see, int) override {
        if (id && in_variable_class)
            advise(report(id->at, id->source,
                          see.known.kind == SC_DYNAMIC_CLASS_ATTRIBUTE
                              ? "bit 0x8000 is set in the variable class anyway: this is the Id without it"
                              : "with bit 0x8000 this is the Id of a class attribute in the variable class"),
                   "choose an Id below 32768");
        id.reset();
        in_variable_class = false;
    }

private:
    std::optional<mention> id; /* one with the bit */
    bool in_variable_class = false;
};

} // namespace

made_watcher make_no_expression(const watcher_setup &setup) {
    return make<no_expression>(setup);
}

made_watcher make_group(const watcher_setup &setup) {
    return make<group>(setup);
}

made_watcher make_intervals(const watcher_setup &setup) {
    return make<intervals>(setup);
}

made_watcher make_class_bit(const watcher_setup &setup) {
    return make<class_bit>(setup);
}

} // namespace check
