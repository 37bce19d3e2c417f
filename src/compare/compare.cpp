/* compare.cpp: what differs between two trees of things, and which differences break readers. */

#include "compare/compare.h"

#include <map>
#include <utility>

namespace cdef {

namespace {

using identity = std::pair<std::string_view, std::string_view>; /* kind and name */

identity identity_of(const thing &t) {
    return {t.kind, t.name};
}

class comparison {
public:
    explicit comparison(std::vector<difference> &to) : found(to) {}

    void compare(const thing &before, const thing &after) {
        path.push_back(&after);
        compare_facts(before, after);
        compare_parts(before, after);
        path.pop_back();
    }

private:
    /* Both are of one kind, and so have the same facts in the same order. */
    void compare_facts(const thing &before, const thing &after) {
        for (std::size_t i = 0; i < before.facts.size() && i < after.facts.size(); ++i)
            if (before.facts[i].text != after.facts[i].text)
                found.push_back({change::changed, path, &before.facts[i], &after.facts[i]});
    }

    /* Parts pair by kind and name, equal ones in their order. */
    void compare_parts(const thing &before, const thing &after) {
        std::map<identity, std::vector<const thing *>> unpaired;
        for (std::size_t i = after.parts.size(); i > 0; --i)
            unpaired[identity_of(after.parts[i - 1])].push_back(&after.parts[i - 1]);
        for (const thing &part : before.parts) {
            auto candidates = unpaired.find(identity_of(part));
            if (candidates == unpaired.end() || candidates->second.empty()) {
                add(change::removed, part);
                continue;
            }
            compare(part, *candidates->second.back());
            candidates->second.pop_back();
        }
        add_new(after, unpaired);
    }

    /* Of equal ones the last are left over, the very last in front. */
    void add_new(const thing &after, std::map<identity, std::vector<const thing *>> &unpaired) {
        for (const thing &part : after.parts) {
            auto &left = unpaired[identity_of(part)];
            if (left.empty() || left.back() != &part)
                continue;
            add(change::added, part);
            left.pop_back();
        }
    }

    void add(change what, const thing &part) {
        path.push_back(&part);
        found.push_back({what, path});
        path.pop_back();
    }

    std::vector<difference> &found;
    std::vector<const thing *> path;
};

bool is_element(const thing &t) {
    return t.kind.ends_with("element");
}

/* What readers look for by name or by number. */
bool is_looked_for(const thing &t) {
    return t.kind == "ResourceClass" || t.kind.ends_with("Attribute") || t.kind.ends_with("Action");
}

} // namespace

std::vector<difference> differences(const thing &before, const thing &after) {
    std::vector<difference> found;
    comparison(found).compare(before, after);
    return found;
}

std::string_view breach(const difference &d) {
    const thing &about = *d.path.back();
    if (d.what != change::changed && is_element(about))
        return "another layout of the structure";
    if (d.what == change::removed && is_looked_for(about))
        return "readers miss it";
    if (d.what != change::changed)
        return {};
    const cdb::field_fact &what = *d.before->what;
    if (what.is == cdb::role::NUMBER)
        return "readers know it by its number";
    if (what.as == cdb::meaning::DATA_TYPE)
        return "values of another type";
    if (&what == &ELEMENT_INDEX)
        return "another layout of the structure";
    return {};
}

} // namespace cdef
