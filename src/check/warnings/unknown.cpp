/* unknown.cpp: warnings about names that nothing in the source has, or uses. They are reported at the end, and only for
 * a source without errors: all that could have the name must have been understood. */

#include "check/first_lines.h"
#include "check/lacking.h"
#include "check/warnings/watcher.h"

#include <algorithm>
#include <optional>
#include <string>
#include <vector>

namespace check {

namespace {

/* The locator is looked up in the last class. */
class unknown_locator : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_LOCATOR};

    void value(const view &see) override {
        locator = see.value_mention();
    }

    void source_end(const view &see) override {
        const first_lines &attributes = see.known.declared.names[SC_PERSISTENT_RESOURCE_ATTRIBUTE];
        if (see.errors() == 0 && locator && !attributes.has(locator->text))
            report(locator->at, locator->source, "no `PersistentResourceAttribute` has this name",
                   {locator->at, language::suggestion(locator->text, attributes.all())});
    }

private:
    std::optional<mention> locator;
};

/* Reports each name once, where it is given first. */
class unknown_variable_class : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_STRING};

    void value(const view &see) override {
        if (std::string_view(see.attr().ta_name) != "VariableClass")
            return;
        if (see.known.kind == SC_RESOURCE_VARIABLE_CLASS) {
            defined.line_of(see.value()) = see.line.number;
            return;
        }
        int &first = used_lines.line_of(see.value());
        if (first == 0)
            used.push_back(see.value_mention());
        first = see.line.number;
    }

    void stanza_end(const view &see, int next_kind) override {
        language::name_list lacking = lacking_unnoticed(see, next_kind);
        unnamed = unnamed || std::find(lacking.begin(), lacking.end(), "VariableClass") != lacking.end();
    }

    void source_end(const view &see) override {
        constexpr size_t COMPARED_MAX = 1'000'000; /* names in all, for the time not to be quadratic */
        if (see.errors() > 0 || unnamed)
            return;
        language::name_list names = defined.all();
        size_t compared = 0;
        for (const mention &each : used) {
            if (defined.has(each.text))
                continue;
            bool suggests = (compared += names.size()) <= COMPARED_MAX;
            report(each.at, each.source, "no `ResourceVariableClass` has this name",
                   {each.at, suggests ? language::suggestion(each.text, names) : std::string()});
        }
    }

private:
    std::vector<mention> used; /* by attributes, each name once */
    first_lines used_lines;
    first_lines defined;
    bool unnamed = false; /* a variable class lacks its name: it may be any of those that are used */
};

/* Reports each name once, where it is defined first. A name that nothing defines may be a misspelt one of these. */
class unused_variable_class : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_STRING};

    void value(const view &see) override {
        if (std::string_view(see.attr().ta_name) != "VariableClass")
            return;
        bool defines = see.known.kind == SC_RESOURCE_VARIABLE_CLASS;
        int &first = (defines ? defined_lines : used).line_of(see.value());
        if (defines && first == 0)
            defined.push_back(see.value_mention());
        first = see.line.number;
    }

    void source_end(const view &see) override {
        language::name_list names = used.all();
        bool all_known = std::all_of(names.begin(), names.end(), [&](auto name) { return defined_lines.has(name); });
        if (see.errors() > 0 || !all_known)
            return;
        for (const mention &each : defined)
            if (!used.has(each.text))
                report(each.at, each.source, "no dynamic attribute belongs to this variable class");
    }

private:
    std::vector<mention> defined; /* each name once */
    first_lines defined_lines;
    first_lines used;
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
