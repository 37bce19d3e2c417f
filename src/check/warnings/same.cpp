/* same.cpp: warnings about names and Ids that are given twice. */

#include "check/first_lines.h"
#include "check/warnings/watcher.h"

#include <array>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace check {

namespace {

/* The kind whose attributes share a namespace with those of a kind: persistent and dynamic ones of a resource, or of
 * the class. */
std::optional<int> partner_of(int kind) {
    switch (kind) {
    case SC_PERSISTENT_RESOURCE_ATTRIBUTE:
        return SC_DYNAMIC_RESOURCE_ATTRIBUTE;
    case SC_DYNAMIC_RESOURCE_ATTRIBUTE:
        return SC_PERSISTENT_RESOURCE_ATTRIBUTE;
    case SC_PERSISTENT_CLASS_ATTRIBUTE:
        return SC_DYNAMIC_CLASS_ATTRIBUTE;
    case SC_DYNAMIC_CLASS_ATTRIBUTE:
        return SC_PERSISTENT_CLASS_ATTRIBUTE;
    default:
        return std::nullopt;
    }
}

std::string another(int kind, const char *what) {
    return "another " + language::quoted(table_of(kind).sc_name) + " has the same " + what;
}

std::string partner_has(int partner, const char *what) {
    return "a " + language::quoted(table_of(partner).sc_name) + " has the same " + what;
}

note first_given(int line) {
    return {{line, 0, 0}, "first given here"};
}

void to_lower(std::string_view text, std::string &lower) {
    lower = text;
    for (char &c : lower)
        if (c >= 'A' && c <= 'Z')
            c = static_cast<char>(c - 'A' + 'a');
}

class same_name : public watcher {
public:
    explicit same_name(const watcher_setup &setup) : watcher(setup), lower_names(SC_COUNT, first_lines(setup.key)) {}
    static constexpr auto types = std::array{AT_STRING, AT_SD_NAME};

    void value(const view &see) override {
        int kind = see.known.kind;
        std::string_view attr = name_of(see.attr());
        bool is_name = attr == "Name" || attr == "ElementName" || attr == "VariableClass";
        if (!is_name || kind == SC_RESOURCE_CLASS || (attr == "VariableClass" && kind != SC_RESOURCE_VARIABLE_CLASS))
            return;
        int first = see.known.declared.earlier_name;
        int without_case = earlier_without_case(see);
        if (first != 0 || without_case != 0)
            look_at(see, first, without_case);
    }

    /* Elements are named within their run, and all but variable classes within their class. */
    void before_step(const view &see, int next_kind) override {
        if (next_kind < 0)
            return;
        if (is_sd_kind(next_kind) && (!see.compiler.run_is_open() || see.known.kind != next_kind))
            lower_names[index_of(next_kind)].clear();
        if (next_kind != SC_CONTROL_DEFINITION || !see.compiler.class_is_open())
            return;
        for (size_t kind = 0; kind < SC_COUNT; ++kind)
            if (kind != SC_RESOURCE_VARIABLE_CLASS)
                lower_names[kind].clear();
    }

private:
    void look_at(const view &see, int first, int without_case) {
        int kind = see.known.kind;
        std::optional<int> partner = partner_of(kind);
        int of_partner = partner ? see.known.declared.names[index_of(*partner)].find(see.value()) : 0;
        if (first != 0)
            advise(report(see, see.value_place(), another(kind, "name"), first_given(first)), "rename one of them");
        else if (of_partner != 0)
            advise(report(see, see.value_place(), partner_has(*partner, "name"), first_given(of_partner)),
                   "rename one of them");
        else
            advise(report(see, see.value_place(), "this name differs from another one only in case",
                          {{without_case, 0, 0}, "the other one"}),
                   "rename one of them, or spell them alike if they are meant to be one");
    }
    int earlier_without_case(const view &see) {
        std::optional<int> partner = partner_of(see.known.kind);
        to_lower(see.value(), lower);
        int &line = lower_names[index_of(partner ? std::min(*partner, see.known.kind) : see.known.kind)].line_of(lower);
        int first = line;
        if (first == 0)
            line = see.line.number;
        return first;
    }

    std::vector<first_lines> lower_names; /* by kind; partners share the lower kind's */
    std::string lower;
};

class same_id : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_ID};

    void value(const view &see) override {
        if (int first = see.known.declared.earlier_id; first != 0)
            return advise(report(see, see.value_place(), another(see.known.kind, "Id"), first_given(first)),
                          "give one of them another number");
        std::optional<int> partner = partner_of(see.known.kind);
        check::number given(see.value(), 0);
        if (!partner || given.read == 0)
            return;
        if (int first = see.known.declared.ids[index_of(*partner)].find(static_cast<vx_uint32_t>(given.value)))
            advise(report(see, see.value_place(), partner_has(*partner, "Id"), first_given(first)),
                   "give one of them another number");
    }
};

} // namespace

made_watcher make_same_name(const watcher_setup &setup) {
    return make<same_name>(setup);
}

made_watcher make_same_id(const watcher_setup &setup) {
    return make<same_id>(setup);
}

} // namespace check
