/* diagnosis.cpp: distinguishes causes from consequences. */

#include "reader/diagnosis.h"

#include "format/records.h"
#include "reader/repair.h"
#include "reader/rules.h"
#include "text/hex.h"

#include <map>
#include <numeric>
#include <set>
#include <tuple>

namespace cdb {

namespace {

constexpr rule contradicting = {
    CODE_CONTRADICTING, severity::error, "contradicts the rest of the file",
    "No rule is about the number itself, but with another one in its place the file would have no error.",
    "Compile the source again, or take another copy of the file: this one is damaged."};

bool breaks(const finding &f, check rule) {
    return f.broken == &rule_of(rule);
}

bool is_error(const finding &f) {
    return f.broken->level == severity::error;
}

/* Orders the findings: each cause in its place, followed by its consequences. causes: for each finding, the position of
 * its cause. */
std::vector<diagnosed> arranged(std::vector<finding> &&found, std::span<const std::size_t> causes) {
    std::vector<std::size_t> order(found.size());
    std::iota(order.begin(), order.end(), std::size_t{0});
    std::stable_sort(order.begin(), order.end(), [&](std::size_t a, std::size_t b) {
        return std::pair(causes[a], a != causes[a]) < std::pair(causes[b], b != causes[b]);
    });
    std::vector<std::size_t> place(found.size());
    for (std::size_t i = 0; i < order.size(); ++i)
        place[order[i]] = i;
    std::vector<diagnosed> all;
    all.reserve(order.size());
    for (std::size_t each : order)
        all.push_back({std::move(found[each]), place[causes[each]]});
    return all;
}

/* ---- One number is the cause of all ----------------------------------------------------------------------------- */

std::string shown(const bytes &file, std::size_t offset, std::size_t size) {
    switch (size) {
    case sizeof(std::uint16_t):
        return std::to_string(file.number<std::uint16_t>(offset));
    case sizeof(std::uint32_t):
        return std::to_string(file.number<std::uint32_t>(offset));
    case sizeof(std::uint64_t):
        return std::to_string(file.number<std::uint64_t>(offset));
    default:
        return text::hex(std::to_integer<unsigned>(file.raw()[offset]));
    }
}

/* The contents of the file where a repair corrected it: a number, or one byte of something longer. */
region corrected_region(const repair &repaired) {
    std::size_t offset = repaired.offset();
    std::vector<region> all = regions(repaired.corrected());
    region at = *std::find_if(all.begin(), all.end(), [&](const region &r) { return offset - r.offset < r.size; });
    if (at.size > sizeof(std::uint64_t)) {
        at.offset = offset;
        at.size = 1;
    }
    return at;
}

finding contradicted(const database &db, const repair &repaired, const region &at) {
    return {.broken = &contradicting,
            .section = at.section,
            .record = at.record,
            .index = at.index,
            .field = at.what == nullptr ? std::string_view() : at.what->name,
            .offset = at.offset,
            .found = shown(db.file(), at.offset, at.size),
            .expected = shown(repaired.corrected().file(), at.offset, at.size)};
}

auto key_of(const finding &f) {
    return std::tuple(f.broken, f.offset, f.section, f.record, f.index);
}

using finding_key = decltype(key_of(std::declval<finding>()));

/* The findings that the corrected database has too. */
std::set<finding_key> remaining(const database &corrected, std::span<const finding> found) {
    std::set<finding_key> before, stay;
    for (const finding &f : found)
        before.insert(key_of(f));
    verify(corrected, [&](finding &&f) {
        if (before.contains(key_of(f)))
            stay.insert(key_of(f));
    });
    return stay;
}

/* Warnings that the corrected database has too are not consequences. */
std::vector<diagnosed> caused_by_one(const database &db, std::vector<finding> &&found, const repair &repaired) {
    region at = corrected_region(repaired);
    auto cause = std::find_if(found.begin(), found.end(),
                              [&](const finding &f) { return is_error(f) && f.offset - at.offset < at.size; });
    if (cause == found.end())
        cause = found.insert(found.begin(), contradicted(db, repaired, at));
    auto first = static_cast<std::size_t>(cause - found.begin());
    std::set<finding_key> stay = remaining(repaired.corrected(), found);
    std::vector<std::size_t> causes(found.size(), first);
    for (std::size_t i = 0; i < found.size(); ++i)
        if (stay.contains(key_of(found[i])))
            causes[i] = i;
    return arranged(std::move(found), causes);
}

/* ---- Causes by rule --------------------------------------------------------------------------------------------- */

/* True if this error is about something that leads to other bytes, which are then wrong as well. */
bool leads_astray(const finding &f) {
    for (check rule :
         {check::SECTION_OUTSIDE, check::SECTION_PLACE, check::SECTION_TYPE, check::SECTION_LENGTH, check::TABLE_PLACE,
          check::TABLE_OUTSIDE, check::REFERENCE_NONE, check::REFERENCE_OUTSIDE, check::REFERENCE_UNALIGNED,
          check::LIST_OUTSIDE, check::LIST_SHARED, check::TEXT_OUTSIDE, check::VALUE_OUTSIDE, check::VALUE_UNALIGNED,
          check::VALUE_SHARED, check::VALUE_NESTING, check::VALUE_TYPE, check::ANCHORS_OUTSIDE})
        if (breaks(f, rule))
            return true;
    return false;
}

/* Finds the cause of one finding after the other. */
class cause_finder {
public:
    std::size_t cause_of(const finding &f, std::size_t at) {
        std::optional<std::size_t> cause = earlier_cause(f);
        if (!cause && leads_astray(f)) {
            if (!first)
                first = at;
            if (f.section)
                of_section[*f.section] = at;
        }
        if (breaks(f, check::SECTION_PLACE) || breaks(f, check::SECTION_OUTSIDE))
            displaced = cause.value_or(at);
        return cause.value_or(at);
    }

private:
    std::optional<std::size_t> earlier_cause(const finding &f) const {
        if (breaks(f, check::SECTION_PLACE) && displaced)
            return displaced;
        if (breaks(f, check::VARIABLE_ID) || breaks(f, check::LARGEST_ID))
            return first;
        if (!f.section)
            return std::nullopt;
        auto at = of_section.find(*f.section);
        return at == of_section.end() ? std::nullopt : std::optional(at->second);
    }

    std::map<std::size_t, std::size_t> of_section; /* the first error that makes later findings its consequences */
    std::optional<std::size_t> first;              /* of all sections */
    std::optional<std::size_t> displaced;          /* the latest section that is not where the one before it ends */
};

/* A wrong checksum follows from any other error. */
std::vector<diagnosed> caused_by_rule(std::vector<finding> &&found) {
    cause_finder finder;
    std::vector<std::size_t> causes;
    for (std::size_t i = 0; i < found.size(); ++i)
        causes.push_back(finder.cause_of(found[i], i));
    auto other = std::find_if(found.begin(), found.end(),
                              [](const finding &f) { return is_error(f) && !breaks(f, check::CHECKSUM); });
    for (std::size_t i = 0; i < found.size() && other != found.end(); ++i)
        if (breaks(found[i], check::CHECKSUM))
            causes[i] = causes[static_cast<std::size_t>(other - found.begin())];
    return arranged(std::move(found), causes);
}

} // namespace

std::vector<diagnosed> diagnose(const database &db) {
    return diagnose(db, verify(db));
}

std::vector<diagnosed> diagnose(const database &db, std::vector<finding> &&found) {
    if (found.size() < 2 || is_sound(found))
        return caused_by_rule(std::move(found));
    repair repaired(db, found);
    if (repaired.succeeds())
        return caused_by_one(db, std::move(found), repaired);
    return caused_by_rule(std::move(found));
}

first_findings find_first(const database &db, std::size_t most_kept) {
    first_findings all;
    verify(db, [&](finding &&f) {
        ++all.count;
        all.sound = all.sound && !is_error(f);
        if (all.kept.size() < most_kept)
            all.kept.push_back(std::move(f));
    });
    return all;
}

const rule &contradicting_rule() {
    return contradicting;
}

} // namespace cdb
