/* fix.cpp: makes the certain corrections of a source. */

#include "check/fix.h"

#include "check/edits.h"

#include <algorithm>
#include <cstdint>
#include <optional>
#include <span>
#include <utility>
#include <vector>

namespace check {

namespace {

constexpr int ROUNDS_MAX = 200; /* the most rounds; few are needed */

/* To limit memory, a round makes no more edits than this, or than one for each 256 bytes of a large source. */
constexpr size_t EDITS_MAX = 16384;
constexpr size_t BYTES_FOR_EDIT = 256;

/* To limit time, the search for corrections that bring errors checks no more bytes than this, or than so many times the
 * source if that is more. */
constexpr std::uint64_t SEARCHED_BYTES = std::uint64_t{64} << 20;
constexpr std::uint64_t SEARCHED_TIMES = 64;

/* One round: makes the corrections of a text, except those after which there would be more errors. The first `skipped`
 * corrections are left out. To find those that bring errors, at most `searched` bytes are checked; it is reduced by
 * those that have been. */
class round {
public:
    round(std::string_view bytes, const std::string &source, const warning_set &wanted, size_t skipped,
          std::uint64_t &searched)
        : before(bytes), name(source), warned(wanted), left_to_search(searched) {
        size_t most = std::max(EDITS_MAX, before.size() / BYTES_FOR_EDIT);
        size_t edits = 0;
        errors = check_bytes(before, name, warned, [&](finding &&each) {
                     if (each.fix.sure != certainty::certain || each.fix.edits.empty())
                         return;
                     if (skipped > 0 || edits >= most) {
                         is_last = is_last && skipped > 0;
                         skipped -= skipped > 0 ? 1 : 0;
                         return;
                     }
                     edits += each.fix.edits.size();
                     certain.push_back(std::move(each.fix));
                 }).errors;
        considered = certain.size();
        certain = compatible(std::move(certain));
        fitting = certain.size();
        if (fitting > 0 && !try_next(fitting))
            make_harmless(fitting);
    }

    const std::vector<correction> &made() const {
        return certain;
    }
    size_t dropped() const {
        return fitting - certain.size();
    }
    /* Corrections that have been considered, but not made. */
    size_t left_out() const {
        return considered - certain.size();
    }
    /* No correction is left for another round. */
    bool is_last_of_text() const {
        return is_last;
    }

private:
    /* The next so many corrections cause more errors together: makes those that do not. If too much has been searched,
     * makes none of them. */
    void make_harmless(size_t count) {
        if (count == 1 || left_to_search < before.size()) {
            auto next = certain.begin() + static_cast<std::ptrdiff_t>(kept);
            certain.erase(next, next + static_cast<std::ptrdiff_t>(count));
            return;
        }
        size_t half = count / 2;
        bool made_half = search_next(half);
        if (!made_half)
            make_harmless(half);
        /* With the whole first half, the second one gives the text that has just been refused. */
        if (made_half || !search_next(count - half))
            make_harmless(count - half);
    }

    /* The same as below, unless too much has been searched. */
    bool search_next(size_t count) {
        if (left_to_search < before.size())
            return false;
        left_to_search -= before.size();
        return try_next(count);
    }

    /* Makes the next so many corrections, unless that causes more errors. */
    bool try_next(size_t count) {
        std::optional<std::string> text = corrected(before, std::span(certain).first(kept + count));
        if (!text)
            return false;
        size_t found = check_bytes(*text, name, warned, [](finding &&) {}).errors;
        if (found > errors)
            return false;
        errors = found;
        kept += count;
        return true;
    }

    std::string_view before;
    const std::string &name;
    const warning_set &warned;
    std::uint64_t &left_to_search;   /* in bytes */
    size_t errors = 0;               /* with the corrections that have been made */
    std::vector<correction> certain; /* those that are refused are removed */
    size_t kept = 0;                 /* the first so many are made; the others have not been tried */
    size_t considered = 0;
    size_t fitting = 0; /* of those considered, how many can be made together */
    bool is_last = true;
};

} // namespace

fixed_source fix_bytes(std::string_view bytes, const std::string &name, const warning_set &wanted) {
    fixed_source fixed;
    std::string_view text = bytes;
    size_t skipped = 0; /* corrections that earlier rounds of this pass have not made */
    size_t made_before = 0;
    std::uint64_t left_to_search = std::max(SEARCHED_BYTES, SEARCHED_TIMES * bytes.size());
    for (int left = ROUNDS_MAX; left > 0; --left) {
        round latest(text, name, wanted, skipped, left_to_search);
        fixed.dropped = skipped == 0 ? latest.dropped() : fixed.dropped + latest.dropped();
        fixed.corrected += latest.made().size();
        if (!latest.made().empty())
            text = fixed.text = *corrected(text, latest.made());
        skipped += latest.left_out();
        if (!latest.is_last_of_text())
            continue;
        if (fixed.corrected == made_before)
            break;
        made_before = fixed.corrected;
        skipped = 0;
    }
    if (fixed.corrected == 0)
        fixed.text = bytes;
    return fixed;
}

} // namespace check
