/* compare.cpp: how two databases differ in meaning. */

#include "compare/compare.h"

#include "compare/fields.h"
#include "compare/pairing.h"

#include <tuple>

namespace compare {

namespace {

/* A section's revision is in its anchor, but belongs to the content of the section. */
const cdb::field_fact &revision_fact() {
    return cdb::format_for<cdb_dsect_anchor_t>.fact_at(offsetof(cdb_dsect_anchor_t, cda_revision));
}

/* The properties that an attribute or action keeps when it is renamed. */
using number_and_type = std::tuple<std::uint32_t, vx_data_type_t>;

number_and_type number_and_type_of(const node &n) {
    return {number_in(n, *number_field_of(n)), data_type_of(n)};
}

/* Unequal numbers may still be shown alike. */
bool numbers_read_alike(std::uint32_t a, std::uint32_t b, cdb::meaning as) {
    return a == b || text_of_number(a, as) == text_of_number(b, as);
}

class comparison {
public:
    comparison(const origin &older, const origin &newer, const taker &taken_by)
        : before(older), after(newer), take(taken_by) {}

    void run() {
        node older = database_node(before), newer = database_node(after);
        path.push_back(&newer);
        compare_facts(older, newer);
        compare_sections();
        path.pop_back();
    }

private:
    void report(const difference &d) {
        take(d);
    }

    /* ---- Facts ---- */

    bool texts_read_alike(std::string_view a, std::string_view b) const {
        bool are_first = a.data() == first_before.data() && b.data() == first_after.data();
        return are_first ? are_firsts_alike : a == b;
    }

    bool facts_read_alike(const fact &was, const fact &is) const {
        if (const auto *number = std::get_if<std::uint32_t>(&was.is))
            return numbers_read_alike(*number, std::get<std::uint32_t>(is.is), was.what->as);
        if (const auto *text = std::get_if<std::string_view>(&was.is))
            return texts_read_alike(*text, std::get<std::string_view>(is.is));
        return read_alike(std::get<owned_value>(was.is), std::get<owned_value>(is.is));
    }

    void compare_fact(const node &older, const node &newer, const fact &was, const fact &is) {
        if (facts_read_alike(was, is))
            return;
        breaches broken = judge_change(older, newer, was, is, in_use ? &*in_use : nullptr);
        report({.what = change::CHANGED, .path = path, .before = &was, .after = &is, .broken = broken});
    }

    /* Most numbers are the same in both; this is seen without making facts of them. */
    static bool is_same_number(const node &older, const node &newer, const cdb::field &f) {
        return f.kind == cdb::field_kind::number && number_in(older, f) == number_in(newer, f);
    }

    /* Both have the same kind, and therefore the same fields. */
    void compare_facts(const node &older, const node &newer) {
        if (older.kind == node_kind::element && older.index != newer.index)
            compare_fact(older, newer, {&ELEMENT_INDEX, static_cast<std::uint32_t>(older.index)},
                         {&ELEMENT_INDEX, static_cast<std::uint32_t>(newer.index)});
        std::size_t count = older.format == nullptr ? 0 : older.format->fields.size();
        for (std::size_t i = 0; i < count; ++i) {
            if (is_same_number(older, newer, older.format->fields[i]))
                continue;
            if (std::optional<fact> was = fact_in(older, i))
                compare_fact(older, newer, *was, *fact_in(newer, i));
        }
    }

    /* ---- Sections ---- */

    void compare_sections() {
        siblings older(before), newer(after);
        pairing pairs(older, newer);
        for (std::size_t i = 0; i < older.size(); ++i) {
            section_tables room, other_room;
            node section = older.at(i, room);
            if (std::uint32_t partner = pairs.partner_of(i); partner != pairing::NONE)
                compare_section(section, newer.at(partner, other_room));
            else
                report_section(change::REMOVED, section);
        }
        for (std::uint32_t i : pairs.left()) {
            section_tables room;
            report_section(change::ADDED, newer.at(i, room));
        }
    }

    void report_section(change what, const node &section) {
        breaches broken;
        if (what == change::REMOVED && row_of(section.kind).is_looked_for)
            broken.add(breach::GONE);
        report_part(what, section, broken);
    }

    void compare_section(const node &older, const node &newer) {
        first_before = older.section->first_text;
        first_after = newer.section->first_text;
        are_firsts_alike = first_before == first_after;
        path.push_back(&newer);
        compare_facts(older, newer);
        compare_fact(older, newer, {&revision_fact(), before.db.anchor(older.index).cda_revision},
                     {&revision_fact(), after.db.anchor(newer.index).cda_revision});
        compare_parts(older, newer);
        path.pop_back();
        in_use.reset();
    }

    /* ---- Parts ---- */

    void compare(const node &older, const node &newer) {
        path.push_back(&newer);
        compare_facts(older, newer);
        if (may_have_parts(newer.kind))
            compare_parts(older, newer);
        path.pop_back();
    }

    void compare_parts(const node &older, const node &newer) {
        auto &[were, are, added] = workspaces.at(path.size());
        were.clear();
        are.clear();
        add_families(older, were);
        add_families(newer, are);
        if (older.kind == node_kind::resource_class)
            in_use.emplace(were);
        for (std::size_t i = 0; i < were.count; ++i)
            added[i] = compare_family(were.all[i], are.all[i]);
        for (std::size_t i = 0; i < are.count; ++i) {
            family_judge judge(were.all[i], are.all[i], in_use ? &*in_use : nullptr);
            for (std::uint32_t one : added[i]) {
                node part = are.all[i].at(one);
                report_part(change::ADDED, part, judge.added(part));
            }
        }
    }

    /* Returns the parts that are new. */
    std::vector<std::uint32_t> compare_family(const family &were, const family &are) {
        pairing pairs{siblings(were), siblings(are)};
        std::vector<std::uint32_t> renamed = find_renamed(were, are, pairs);
        family_judge judge(were, are, in_use ? &*in_use : nullptr);
        for (std::uint32_t i = 0; i < were.count; ++i) {
            node older = were.at(i);
            std::uint32_t partner = pairs.partner_of(i);
            if (partner == pairing::NONE) {
                report_part(change::REMOVED, older, judge.removed(older));
                continue;
            }
            node newer = are.at(partner);
            if (std::binary_search(renamed.begin(), renamed.end(), i))
                report_renamed(older, newer, judge.renamed(newer));
            compare(older, newer);
        }
        return pairs.left();
    }

    /* Pairs the parts without a partner that have the same number and type; returns the positions of the older ones, in
     * their order. */
    static std::vector<std::uint32_t> find_renamed(const family &were, const family &are, pairing &pairs) {
        std::vector<std::uint32_t> renamed;
        if (number_field_of(were.first) == nullptr || pairs.left().empty())
            return renamed;
        std::vector<std::tuple<number_and_type, std::uint32_t>> new_ones;
        for (std::uint32_t i : pairs.left())
            new_ones.emplace_back(number_and_type_of(are.at(i)), i);
        std::sort(new_ones.begin(), new_ones.end());
        std::vector<pairing::pair> joined;
        std::vector<bool> is_taken(new_ones.size());
        for (std::uint32_t i = 0; i < were.count; ++i) {
            if (pairs.partner_of(i) != pairing::NONE)
                continue;
            number_and_type wanted = number_and_type_of(were.at(i));
            auto found = std::lower_bound(new_ones.begin(), new_ones.end(), std::tuple(wanted, std::uint32_t{0}));
            auto at = static_cast<std::size_t>(found - new_ones.begin());
            if (found == new_ones.end() || std::get<0>(*found) != wanted || is_taken[at])
                continue;
            is_taken[at] = true;
            joined.push_back({i, std::get<1>(*found)});
            renamed.push_back(i);
        }
        pairs.join(joined);
        return renamed;
    }

    void report_part(change what, const node &part, const breaches &broken) {
        path.push_back(&part);
        report({.what = what, .path = path, .broken = broken});
        path.pop_back();
    }

    void report_renamed(const node &older, const node &newer, const breaches &broken) {
        path.push_back(&older);
        report({.what = change::RENAMED, .path = path, .renamed_to = &newer, .broken = broken});
        path.pop_back();
    }

    /* The parts of the two nodes that are being compared, of one depth. */
    struct workspace {
        families were;
        families are;
        std::array<std::vector<std::uint32_t>, FAMILIES_MAX> added;
    };
    static constexpr std::size_t DEPTH = 8; /* more than nodes are nested */

    const origin &before;
    const origin &after;
    const taker &take;
    std::array<workspace, DEPTH> workspaces;
    std::vector<const node *> path;
    std::optional<numbered_parts> in_use; /* of the older class that is being compared */
    /* The first texts of the sections that are being compared, and whether they read alike: any number of references
     * may lead to them. */
    std::string_view first_before;
    std::string_view first_after;
    bool are_firsts_alike = false;
};

} // namespace

void compare(const origin &before, const origin &after, const taker &take) {
    comparison(before, after, take).run();
}

} // namespace compare
