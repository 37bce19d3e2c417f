/* compare.cpp: what differs between two trees, and which differences break readers. */

#include "compare/compare.h"

#include <map>
#include <tuple>

namespace compare {

namespace {

/* The kind, the field that leads to an element, and the name. */
using identity = std::tuple<node_kind, const cdb::field_fact *, std::string_view>;

identity identity_of(const node &n) {
    return {n.kind, n.field, n.name};
}

class comparison {
public:
    explicit comparison(std::vector<difference> &to) : found(to) {}

    void compare(const node &before, const node &after) {
        path.push_back(&after);
        compare_facts(before, after);
        compare_parts(before, after);
        path.pop_back();
    }

private:
    /* Both are of one kind, and so have the same facts in the same order. */
    void compare_facts(const node &before, const node &after) {
        for (std::size_t i = 0; i < before.facts.size() && i < after.facts.size(); ++i)
            if (before.facts[i].text != after.facts[i].text)
                found.push_back({change::changed, path, &before.facts[i], &after.facts[i]});
    }

    /* Parts pair by identity, those of one identity in their order. */
    void compare_parts(const node &before, const node &after) {
        std::map<identity, std::vector<const node *>> unpaired;
        for (std::size_t i = after.parts.size(); i > 0; --i)
            unpaired[identity_of(after.parts[i - 1])].push_back(&after.parts[i - 1]);
        for (const node &part : before.parts) {
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

    /* Of parts of one identity the last ones are left, the very last in front. */
    void add_new(const node &after, std::map<identity, std::vector<const node *>> &unpaired) {
        for (const node &part : after.parts) {
            auto &left = unpaired[identity_of(part)];
            if (left.empty() || left.back() != &part)
                continue;
            add(change::added, part);
            left.pop_back();
        }
    }

    void add(change what, const node &part) {
        path.push_back(&part);
        found.push_back({what, path});
        path.pop_back();
    }

    std::vector<difference> &found;
    std::vector<const node *> path;
};

} // namespace

std::vector<difference> differences(const node &before, const node &after) {
    std::vector<difference> found;
    comparison(found).compare(before, after);
    return found;
}

std::string_view breach(const difference &d) {
    node_kind kind = d.path.back()->kind;
    if (d.what != change::changed && kind == node_kind::element)
        return "another layout of the structure";
    if (d.what == change::removed && row_of(kind).is_looked_for)
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

} // namespace compare
