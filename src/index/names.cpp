/* names.cpp: the names that a source defines, and the places where it uses them. */

#include "index/names.h"

#include "index/expressions.h"

#include <algorithm>
#include <array>
#include <map>
#include <optional>
#include <tuple>

namespace source_index {

namespace {

struct definition_row {
    int stanza;
    name_kind kind;
};

constexpr auto definitions = std::array{
    definition_row{SC_RESOURCE_CLASS, name_kind::resource_class},
    definition_row{SC_PERSISTENT_RESOURCE_ATTRIBUTE, name_kind::persistent_resource},
    definition_row{SC_PERSISTENT_CLASS_ATTRIBUTE, name_kind::persistent_class},
    definition_row{SC_DYNAMIC_RESOURCE_ATTRIBUTE, name_kind::dynamic_resource},
    definition_row{SC_DYNAMIC_CLASS_ATTRIBUTE, name_kind::dynamic_class},
    definition_row{SC_RESOURCE_ACTION, name_kind::resource_action},
    definition_row{SC_CLASS_ACTION, name_kind::class_action},
    definition_row{SC_RESOURCE_VARIABLE_CLASS, name_kind::variable_class},
};

constexpr name_kind ELEMENT = name_kind::element;

bool is_dynamic(int kind) {
    return kind == SC_DYNAMIC_RESOURCE_ATTRIBUTE || kind == SC_DYNAMIC_CLASS_ATTRIBUTE;
}

/* The kinds of attributes that an expression in a stanza may mean, the likeliest first. */
std::array<name_kind, 4> meant_in_expression(int kind) {
    if (kind == SC_DYNAMIC_CLASS_ATTRIBUTE)
        return {name_kind::dynamic_class, name_kind::persistent_class, name_kind::dynamic_resource,
                name_kind::persistent_resource};
    return {name_kind::dynamic_resource, name_kind::persistent_resource, name_kind::dynamic_class,
            name_kind::persistent_class};
}

class collector {
public:
    collector(std::string_view text, const index &whole) : source(text), from(whole) {}

    names collect() {
        for (std::size_t at = 0; at < from.stanzas.size(); ++at)
            define(at);
        for (std::size_t at = 0; at < from.stanzas.size(); ++at)
            refer(at);
        std::sort(made.mentions.begin(), made.mentions.end(),
                  [](const mention &a, const mention &b) { return a.at.begin < b.at.begin; });
        return std::move(made);
    }

private:
    using key = std::tuple<name_kind, std::size_t, std::string_view>;

    /* The number of a name, which is added if it is new. */
    std::size_t number_of(name_kind kind, std::size_t scope, std::string_view text) {
        auto [at, is_new] = known.try_emplace({kind, scope, text}, made.all.size());
        if (is_new)
            made.all.push_back({kind, scope, std::string(text)});
        return at->second;
    }

    std::optional<std::size_t> find(name_kind kind, std::size_t scope, std::string_view text) const {
        auto found = known.find({kind, scope, text});
        return found == known.end() ? std::nullopt : std::optional(found->second);
    }

    void define(std::size_t at) {
        const stanza &of = from.stanzas[at];
        if (!of.is_known())
            return;
        const name_kind *kind = of.is_element() ? &ELEMENT : defined_by(of.kind);
        std::string_view line = of.is_element()                         ? "ElementName"
                                : of.kind == SC_RESOURCE_VARIABLE_CLASS ? "VariableClass"
                                                                        : "Name";
        const attribute *name = kind == nullptr ? nullptr : of.find(line);
        if (name == nullptr || name->parts.value.is_empty())
            return;
        std::size_t scope = of.is_element()                      ? of.run
                            : *kind == name_kind::variable_class ? 0
                                                                 : static_cast<std::size_t>(of.class_number);
        span place = name->parts.value;
        made.mentions.push_back({place, number_of(*kind, scope, place.of(source)), at, true});
        if (*kind == name_kind::element && of.owner != NONE)
            runs.try_emplace(of.owner, of.run);
        if (*kind != name_kind::element)
            owners.try_emplace(made.mentions.back().name, at);
    }

    void refer(std::size_t at) {
        const stanza &of = from.stanzas[at];
        for (const attribute &each : of.attributes) {
            std::string_view name = each.known == nullptr ? std::string_view() : each.known->ta_name;
            if (name == "Locator")
                refer(each, at, name_kind::persistent_resource,
                      static_cast<std::size_t>(from.stanzas.back().class_number));
            else if (name == "VariableClass" && is_dynamic(of.kind))
                refer(each, at, name_kind::variable_class, 0);
            else if (name == "Expression" || name == "ReArmExpression")
                refer_in_expression(each, at);
        }
    }

    /* The value is a name, whether or not something defines it. */
    void refer(const attribute &line, std::size_t at, name_kind kind, std::size_t scope) {
        span place = line.parts.value;
        if (!place.is_empty())
            made.mentions.push_back({place, number_of(kind, scope, place.of(source)), at, false});
    }

    /* Words that are not names of attributes belong to the expression's own language. */
    void refer_in_expression(const attribute &line, std::size_t at) {
        span value = line.parts.value;
        std::optional<std::size_t> latest;
        for (const expression_name &each : names_in(value.of(source))) {
            span place = {value.begin + each.at.begin, value.begin + each.at.end};
            latest = each.member ? element_of(latest, place.of(source)) : attribute_called(place.of(source), at);
            if (!latest)
                continue;
            made.mentions.push_back({place, *latest, at, false});
            made.all[*latest].in_expressions = true;
        }
    }

    std::optional<std::size_t> attribute_called(std::string_view text, std::size_t at) const {
        const stanza &of = from.stanzas[at];
        for (name_kind kind : meant_in_expression(of.kind))
            if (auto found = find(kind, static_cast<std::size_t>(of.class_number), text))
                return found;
        return std::nullopt;
    }

    std::optional<std::size_t> element_of(std::optional<std::size_t> name, std::string_view text) const {
        auto owner = name ? owners.find(*name) : owners.end();
        auto run = owner == owners.end() ? runs.end() : runs.find(owner->second);
        return run == runs.end() ? std::nullopt : find(ELEMENT, run->second, text);
    }

    std::string_view source;
    const index &from;
    names made;
    std::map<key, std::size_t> known;
    std::map<std::size_t, std::size_t> owners; /* by name: the stanza that defines it first */
    std::map<std::size_t, std::size_t> runs;   /* by owner: the first run of its elements */
};

} // namespace

const name_kind *defined_by(int stanza_kind) {
    auto row = std::find_if(definitions.begin(), definitions.end(),
                            [&](const definition_row &each) { return each.stanza == stanza_kind; });
    return row == definitions.end() ? nullptr : &row->kind;
}

const mention *names::at(std::size_t offset) const {
    auto after = std::upper_bound(mentions.begin(), mentions.end(), offset,
                                  [](std::size_t place, const mention &each) { return place < each.at.begin; });
    if (after == mentions.begin() || !after[-1].at.touches(offset))
        return nullptr;
    return &after[-1];
}

std::vector<mention> names::of(std::size_t name) const {
    std::vector<mention> found;
    std::copy_if(mentions.begin(), mentions.end(), std::back_inserter(found),
                 [&](const mention &each) { return each.name == name; });
    return found;
}

names names_of(std::string_view source, const index &of) {
    return collector(source, of).collect();
}

} // namespace source_index
