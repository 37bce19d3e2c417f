/* judge.cpp: which rules a difference breaks. */

#include "compare/judge.h"

#include "compare/identity.h"
#include "format/records.h"

#include <utility>

namespace compare {

namespace {

/* Kinds whose values are stored, unlike actions. */
bool is_attribute(node_kind kind) {
    return kind >= node_kind::persistent_class_attribute && kind <= node_kind::dynamic_attribute;
}

bool is_of_class(node_kind kind) {
    return kind == node_kind::persistent_class_attribute || kind == node_kind::dynamic_class_attribute;
}

bool is_persistent(node_kind kind) {
    return kind == node_kind::persistent_class_attribute || kind == node_kind::persistent_attribute;
}

std::uint32_t number_of(const node &n) {
    return number_in(n, *number_field_of(n));
}

std::uint32_t properties_of(const node &n) {
    const auto &fields = n.format->fields;
    for (std::size_t i = 0; i < fields.size(); ++i)
        if (!cdb::properties_of(n.format->facts[i].as).empty())
            return number_in(n, fields[i]);
    return 0;
}

bool is_required(const node &n) {
    return is_persistent(n.kind) && (properties_of(n) & REQD_FOR_DEFINE) != 0;
}

bool may_be_given(std::uint32_t properties) {
    return (properties & (REQD_FOR_DEFINE | OPT_FOR_DEFINE)) != 0;
}

/* ---- Entries of lists ------------------------------------------------------------------------------------------ */

std::optional<range> range_of(const node &entry) {
    if (entry.kind == node_kind::variety) {
        std::uint64_t number = identity_of(entry).number;
        return range{number >> 32, number & 0xFFFFFFFF};
    }
    auto low = ordinal_of(valid_value_in(entry, offsetof(vv_entry_t, vv_low_val)).value);
    auto high = ordinal_of(valid_value_in(entry, offsetof(vv_entry_t, vv_high_val)).value);
    return low && high ? std::optional(range{*low, *high}) : std::nullopt;
}

range_set ranges_of(const family &entries) {
    std::vector<range> ranges;
    for (std::size_t i = 0; i < entries.count; ++i)
        if (std::optional<range> r = range_of(entries.at(i)))
            ranges.push_back(*r);
    bool are_reals = entries.first.kind == node_kind::valid_value &&
                     (entries.first.type == VX_FLOAT32 || entries.first.type == VX_FLOAT64);
    return {std::move(ranges), !are_reals};
}

/* ---- Bounds ---------------------------------------------------------------------------------------------------- */

/* The number of a bound, or of the only element if it is an array. No value if there is no number. */
std::optional<ordinal> ordinal_of_bound(const node &attribute, std::size_t offset) {
    const cdb::bytes &strings = attribute.section->tables.strings;
    owned_value bound =
        value_in(attribute.area, attribute.at + offset, data_type_of(attribute), strings, attribute.from->owners);
    look seen = look_at(bound);
    if (seen.is == shape::ARRAY && seen.count > 0)
        return ordinal_of(element_of(bound, 0).value);
    return seen.is == shape::NUMBER ? ordinal_of(bound.value) : std::nullopt;
}

/* Both bounds of an attribute without a range are 0. */
std::optional<range> bounds_of(const node &attribute) {
    auto low = ordinal_of_bound(attribute, offsetof(rsrc_dattr_t, ra_min_value));
    auto high = ordinal_of_bound(attribute, offsetof(rsrc_dattr_t, ra_max_value));
    cdb::value zero(cdb::bytes(), 0, cdb::element_type(data_type_of(attribute)), cdb::bytes());
    if (!low || !high || (low == ordinal_of(zero) && high == ordinal_of(zero)))
        return std::nullopt;
    return range{*low, *high};
}

bool is_narrower(const node &before, const node &after, const fact &changed) {
    bool is_lower = changed.what == &cdb::format_for<rsrc_dattr_t>.fact_at(offsetof(rsrc_dattr_t, ra_min_value));
    std::optional<range> was = bounds_of(before), is = bounds_of(after);
    if (!is || data_type_of(before) != data_type_of(after))
        return false;
    return !was || (is_lower ? is->low > was->low : is->high < was->high);
}

/* ---- Properties ------------------------------------------------------------------------------------------------ */

/* The properties of a persistent attribute that matter for defining resources are judged together; removing ReadOnly
 * demands less of clients. */
void judge_persistent_properties(std::uint32_t was, std::uint32_t is, breaches &found) {
    constexpr std::uint32_t READ_ONLY_BIT = 0x1;
    constexpr std::uint32_t OF_DEFINING = REQD_FOR_DEFINE | OPT_FOR_DEFINE | INVAL_FOR_DEFINE;
    bool is_newly_required = (was & REQD_FOR_DEFINE) == 0 && (is & REQD_FOR_DEFINE) != 0;
    if (is_newly_required)
        found.add(breach::NOW_REQUIRED);
    if ((was & ~is & ~(OF_DEFINING | READ_ONLY_BIT)) != 0 || (may_be_given(was) && !may_be_given(is)))
        found.add(breach::PROPERTY_GONE);
    if ((is & ~was & READ_ONLY_BIT) != 0)
        found.add(breach::READ_ONLY);
}

void judge_properties(cdb::meaning as, std::uint32_t was, std::uint32_t is, breaches &found) {
    if (as == cdb::meaning::PERSISTENT_PROPERTIES)
        judge_persistent_properties(was, is, found);
    else if (!cdb::properties_of(as).empty() && (was & ~is) != 0)
        found.add(breach::PROPERTY_GONE);
}

bool is_permission(const cdb::field_fact &what) {
    const cdb::record_format &of_class = cdb::format_for<rsrc_class_t>;
    return what.as == cdb::meaning::PERMISSIONS || &what == &of_class.fact_at(offsetof(rsrc_class_t, rc_perm_temp)) ||
           &what == &of_class.fact_at(offsetof(rsrc_class_t, rc_perm_tempC));
}

} // namespace

/* ---- Numbers in use -------------------------------------------------------------------------------------------- */

const cdb::field *number_field_of(const node &n) {
    for (std::size_t i = 0; n.format != nullptr && i < n.format->fields.size(); ++i)
        if (n.format->facts[i].is == cdb::role::NUMBER)
            return &n.format->fields[i];
    return nullptr;
}

void numbered_parts::collect() {
    is_collected = true;
    for (std::uint8_t f = 0; f < parts.count; ++f)
        if (number_field_of(parts.all[f].first) != nullptr)
            for (std::uint32_t i = 0; i < parts.all[f].count; ++i)
                entries.push_back({number_of(parts.all[f].at(i)), f, i});
    std::stable_sort(entries.begin(), entries.end(),
                     [](const entry &a, const entry &b) { return a.number < b.number; });
}

const numbered_parts::entry *numbered_parts::first_with(std::uint32_t number, std::uint8_t family) {
    if (!is_collected)
        collect();
    std::pair wanted(number, family);
    auto found = std::lower_bound(entries.begin(), entries.end(), wanted, [](const entry &e, const auto &other) {
        return std::pair(e.number, e.family) < other;
    });
    bool is_there = found != entries.end() && std::pair(found->number, found->family) == wanted;
    return is_there ? &*found : nullptr;
}

bool numbered_parts::has(node_kind kind, std::uint32_t number) {
    for (std::uint8_t f = 0; f < parts.count; ++f)
        if (parts.all[f].first.kind == kind && first_with(number, f) != nullptr)
            return true;
    return false;
}

/* The first attribute that had the number decides. Class and resources have numbers of their own. */
void numbered_parts::judge_stored(const node &after, breaches &found) {
    if (!is_attribute(after.kind))
        return;
    for (std::uint8_t f = 0; f < parts.count; ++f) {
        node_kind kind = parts.all[f].first.kind;
        if (!is_attribute(kind) || is_of_class(kind) != is_of_class(after.kind))
            continue;
        const entry *first = first_with(number_of(after), f);
        if (first == nullptr)
            continue;
        node before = parts.all[f].at(first->index);
        if (before.kind != after.kind)
            found.add(breach::STORED_KIND);
        if (data_type_of(before) != data_type_of(after))
            found.add(breach::STORED_TYPE);
        if (identity_of(before).name != identity_of(after).name)
            found.add(breach::STORED_NAME);
        return;
    }
}

/* ---- Parts ----------------------------------------------------------------------------------------------------- */

bool family_judge::is_covered(const node &entry) {
    std::optional<range> gone = range_of(entry);
    if (!gone || entry.type != new_parts.first.type)
        return false;
    if (!covered)
        covered = ranges_of(new_parts);
    return covered->has(*gone);
}

breaches family_judge::removed(const node &part) {
    breaches found;
    if (part.kind == node_kind::element)
        found.add(breach::LAYOUT);
    else if (row_of(part.kind).is_looked_for)
        found.add(breach::GONE);
    else if (part.kind == node_kind::valid_value && new_parts.count > 0 && !is_covered(part))
        found.add(breach::VALUE_GONE);
    else if (part.kind == node_kind::variety && !is_covered(part))
        found.add(breach::VARIETY_GONE);
    return found;
}

breaches family_judge::added(const node &part) const {
    breaches found;
    if (part.kind == node_kind::element)
        found.add(breach::LAYOUT);
    else if (part.kind == node_kind::valid_value && old_parts.count == 0)
        found.add(breach::VALUES_LIMITED);
    if (in_use == nullptr || number_field_of(part) == nullptr)
        return found;
    if (in_use->has(part.kind, number_of(part)))
        found.add(breach::NUMBER_TAKEN);
    if (is_required(part))
        found.add(breach::NEW_REQUIRED);
    in_use->judge_stored(part, found);
    return found;
}

/* Programs that look for the old name do not find it. */
breaches family_judge::renamed(const node &after) const {
    breaches found;
    found.add(breach::GONE);
    if (in_use != nullptr)
        in_use->judge_stored(after, found);
    return found;
}

/* ---- Fields ---------------------------------------------------------------------------------------------------- */

breaches judge_change(const node &before, const node &after, const fact &was, const fact &is, numbered_parts *numbers) {
    breaches found;
    const cdb::field_fact &what = *was.what;
    if (what.is == cdb::role::NUMBER) {
        found.add(breach::NUMBER);
        if (numbers != nullptr && numbers->has(after.kind, number_of(after)))
            found.add(breach::NUMBER_TAKEN);
    }
    if (what.as == cdb::meaning::DATA_TYPE)
        found.add(breach::TYPE);
    if (&what == &ELEMENT_INDEX)
        found.add(breach::LAYOUT);
    if (!cdb::properties_of(what.as).empty())
        judge_properties(what.as, std::get<std::uint32_t>(was.is), std::get<std::uint32_t>(is.is), found);
    if (what.as == cdb::meaning::BOUND && is_narrower(before, after, was))
        found.add(breach::RANGE_NARROWER);
    if (is_permission(what))
        found.add(breach::PERMISSION);
    bool is_identifying = what.is == cdb::role::NUMBER || what.as == cdb::meaning::DATA_TYPE;
    if (is_identifying && numbers != nullptr)
        numbers->judge_stored(after, found);
    return found;
}

bool is_lower_version(const fact &was, const fact &is) {
    return was.what->as == cdb::meaning::VERSION && std::get<std::uint32_t>(is.is) < std::get<std::uint32_t>(was.is);
}

} // namespace compare
