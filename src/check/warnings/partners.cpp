/* partners.cpp: warnings about attributes of a stanza that need, or bound, another one. */

#include "check/numbers.h"
#include "check/warnings/watcher.h"

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

bool is_broken(const view &see) {
    return see.known.kind < 0 || see.compiler.is_broken(see.known.kind);
}

class no_expression : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_STRING, AT_UINT16};

    void value(const view &see) override {
        std::string_view name = see.attr().ta_name;
        if (name == "Expression")
            has_expression = true;
        else if (name == "ReArmExpression" || name == "ExpressionDescription")
            dependents.push_back({see.name_place(), std::string(name), std::string(see.line.raw)});
    }
    void stanza_end(const view &see, int) override {
        if (!has_expression && !is_broken(see))
            for (const mention &each : dependents)
                report(each.at, each.source, language::quoted(each.text) + " without `Expression`");
        has_expression = false;
        dependents.clear();
    }

private:
    bool has_expression = false;
    std::vector<mention> dependents;
};

class group : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_UINT16};

    void value(const view &see) override {
        constexpr vx_uint16_t NO_GROUP = 255;
        std::string_view name = see.attr().ta_name;
        if (name == "GroupName")
            group_name = mention{see.name_place(), {}, std::string(see.line.raw)};
        if (name != "GroupID")
            return;
        has_id = true;
        if (number_in(see) == NO_GROUP)
            report(see, see.value_place(), "the number 255 means no group");
    }
    void stanza_end(const view &see, int) override {
        if (group_name && !has_id && !is_broken(see))
            report(group_name->at, group_name->source, "`GroupName` without `GroupID`: the attribute is in no group");
        group_name.reset();
        has_id = false;
    }

private:
    std::optional<mention> group_name;
    bool has_id = false;
};

class intervals : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_UINT16};

    void value(const view &see) override {
        std::string_view name = see.attr().ta_name;
        if (name == "ObservationInterval")
            observation = interval(number_in(see), see.value_mention());
        else if (name == "ReportingInterval")
            reporting = interval(number_in(see), see.value_mention());
    }
    void stanza_end(const view &, int) override {
        if (observation && reporting && reporting->first < observation->first)
            report(reporting->second.at, reporting->second.source,
                   "the `ReportingInterval` is below the `ObservationInterval`",
                   {{observation->second.at.line, 0, 0}, "which is given here"});
        observation.reset();
        reporting.reset();
    }

private:
    using interval = std::pair<vx_uint16_t, mention>;

    std::optional<interval> observation;
    std::optional<interval> reporting;
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

} // namespace check
