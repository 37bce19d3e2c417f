/* unknown.cpp: warnings about names that the source does not define or does not use. They are reported at the end,
 * unless a line or a stanza that was not understood may have, or use, the name. */

#include "check/first_lines.h"
#include "check/kept_lines.h"
#include "check/warnings/watcher.h"

#include <algorithm>
#include <optional>
#include <string>
#include <utility>

namespace check {

namespace {

/* Whether the stanza that ends has a name in a line that was not understood. */
bool has_lost_name(const view &see) {
    const stanza_record &stanza = see.known.stanza();
    const auto attrs = table_of(see.known.kind).sc_attrs;
    auto name = std::find_if(attrs.begin(), attrs.end(), [](const table_attrs &each) {
        return std::string_view(each.ta_name) == "Name" || std::string_view(each.ta_name) == "VariableClass";
    });
    return stanza.given[static_cast<size_t>(name - attrs.begin())] == 0;
}

/* There may be no name to suggest. */
std::string cure(std::string suggestion) {
    return suggestion.empty() ? "define it, or correct the name" : std::move(suggestion);
}

/* Corrections of names that the source itself defines are never certain. */
correction likely(const view &see, const mention &given, const language::guess &meant) {
    correction fix = see.line.renamed(given.at, given.source, meant);
    fix.sure = certainty::likely;
    return fix;
}

/* The locator is looked up in the last class. */
class unknown_locator : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_LOCATOR};

    void value(const view &see) override {
        locator = see.value_mention();
    }
    void stanza_end(const view &see, int) override {
        if (see.known.kind == SC_PERSISTENT_RESOURCE_ATTRIBUTE)
            name_lost = name_lost || has_lost_name(see);
    }
    void source_end(const view &see) override {
        const first_lines &attributes = see.known.declared.names[SC_PERSISTENT_RESOURCE_ATTRIBUTE];
        if (locator && !attributes.has(locator->text) && !name_lost &&
            !see.known.lost.may_be(SC_PERSISTENT_RESOURCE_ATTRIBUTE))
            report_locator(see, attributes.all());
    }

private:
    void report_locator(const view &see, const language::name_list &names) {
        finding &found = report(locator->at, locator->source, "no `PersistentResourceAttribute` has this name");
        language::guess meant = language::meant_by(locator->text, names);
        advise(found, cure(language::suggestion(meant, names)));
        found.fix = likely(see, *locator, meant);
    }

    std::optional<mention> locator;
    bool name_lost = false;
};

/* Reports each name once, at its first use. */
class unknown_variable_class : public watcher {
public:
    explicit unknown_variable_class(const watcher_setup &setup) : watcher(setup), used_lines(setup.key) {}
    static constexpr auto types = std::array{AT_STRING};

    void value(const view &see) override {
        if (name_of(see.attr()) != "VariableClass" || see.known.kind == SC_RESOURCE_VARIABLE_CLASS)
            return;
        int &first = used_lines.line_of(see.value());
        if (first == 0)
            used.add(see.value_place(), see.line.raw);
        first = see.line.number;
    }

    void stanza_end(const view &see, int) override {
        if (see.known.kind == SC_RESOURCE_VARIABLE_CLASS)
            unnamed = unnamed || has_lost_name(see);
    }

    void source_end(const view &see) override {
        constexpr size_t COMPARED_MAX = 1'000'000; /* names in all, for the time not to be quadratic */
        if (unnamed || see.known.lost.may_be(SC_RESOURCE_VARIABLE_CLASS))
            return;
        const first_lines &defined = see.known.declared.variable_classes();
        language::name_list names; /* the defined ones, if they are needed */
        size_t compared = 0;
        for (size_t i = 0; i < used.size(); ++i) {
            if (defined.has(used.text_of(i)))
                continue;
            const mention each = {used.at(i), std::string(used.text_of(i)), std::string(used.line_of(i))};
            bool suggests = (compared += defined.size()) <= COMPARED_MAX;
            if (suggests && names.empty())
                names = defined.all();
            finding &found = report(each.at, each.source, "no `ResourceVariableClass` has this name");
            language::guess meant = suggests ? language::meant_by(each.text, names) : language::guess();
            advise(found, cure(suggests ? language::suggestion(meant, names) : std::string()));
            if (suggests)
                found.fix = likely(see, each, meant);
        }
    }

private:
    kept_lines used; /* by attributes, each name once */
    first_lines used_lines;
    bool unnamed = false; /* a variable class lacks its name: it may be any of those that are used */
};

bool is_dynamic(int kind) {
    return kind == SC_DYNAMIC_RESOURCE_ATTRIBUTE || kind == SC_DYNAMIC_CLASS_ATTRIBUTE;
}

/* Reports each name once, where it is defined first. A name that nothing defines may be a misspelt one of these. */
class unused_variable_class : public watcher {
public:
    explicit unused_variable_class(const watcher_setup &setup) : watcher(setup), used(setup.key) {}
    static constexpr auto types = std::array{AT_STRING};

    void value(const view &see) override {
        if (name_of(see.attr()) != "VariableClass")
            return;
        if (see.known.kind != SC_RESOURCE_VARIABLE_CLASS)
            used.line_of(see.value()) = see.line.number;
        else if (see.known.declared.earlier_name == 0)
            defined.add(see.value_place(), see.line.raw);
    }

    void stanza_end(const view &see, int) override {
        if (is_dynamic(see.known.kind))
            use_lost = use_lost || see.known.stanza().may_have_lost({AT_STRING});
    }
    void source_end(const view &see) override {
        language::name_list names = used.all();
        const first_lines &known = see.known.declared.variable_classes();
        bool all_known = std::all_of(names.begin(), names.end(), [&](auto name) { return known.has(name); });
        const lost_stanzas &lost = see.known.lost;
        if (!all_known || use_lost || lost.may_be(SC_DYNAMIC_RESOURCE_ATTRIBUTE) ||
            lost.may_be(SC_DYNAMIC_CLASS_ATTRIBUTE))
            return;
        for (size_t i = 0; i < defined.size(); ++i)
            if (!used.has(defined.text_of(i)))
                advise(report(defined.at(i), defined.line_of(i), "no dynamic attribute belongs to this variable class"),
                       "remove it, or give attributes its name");
    }

private:
    kept_lines defined; /* each name once */
    first_lines used;
    bool use_lost = false; /* an attribute may have one of these names in a line that was not understood */
};

} // namespace

made_watcher make_unknown_locator(const watcher_setup &setup) {
    return make<unknown_locator>(setup);
}

made_watcher make_unknown_variable_class(const watcher_setup &setup) {
    return make<unknown_variable_class>(setup);
}

made_watcher make_unused_variable_class(const watcher_setup &setup) {
    return make<unused_variable_class>(setup);
}

} // namespace check
