/* fix.cpp: makes the certain corrections of a source. */

#include "check/fix.h"

#include "check/edits.h"

#include <algorithm>
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

/* One round: makes the corrections of a text, except those after which there would be more errors. The first `skipped`
 * corrections are left out. */
class round {
public:
    round(std::string_view bytes, const std::string &source, const warning_set &wanted, size_t skipped)
        : before(bytes), name(source), warned(wanted) {
        std::vector<correction> certain;
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
        make(compatible(std::move(certain)));
    }

    const std::vector<correction> &made() const {
        return kept;
    }
    size_t dropped() const {
        return refused;
    }
    /* Corrections that have been considered, but not made. */
    size_t left_out() const {
        return considered - kept.size();
    }
    /* No correction is left for another round. */
    bool is_last_of_text() const {
        return is_last;
    }

private:
    /* Makes the corrections together; if that causes more errors, tries each half of them. */
    void make(std::span<const correction> some) {
        if (some.empty() || try_with(some))
            return;
        if (some.size() == 1) {
            ++refused;
            return;
        }
        make(some.first(some.size() / 2));
        make(some.subspan(some.size() / 2));
    }

    bool try_with(std::span<const correction> more) {
        std::vector<correction> all = kept;
        all.insert(all.end(), more.begin(), more.end());
        std::optional<std::string> text = corrected(before, all);
        if (!text)
            return false;
        size_t found = check_bytes(*text, name, warned, [](finding &&) {}).errors;
        if (found > errors)
            return false;
        errors = found;
        kept = std::move(all);
        return true;
    }

    std::string_view before;
    const std::string &name;
    const warning_set &warned;
    size_t errors = 0; /* with the corrections that have been made */
    std::vector<correction> kept;
    size_t refused = 0;
    size_t considered = 0;
    bool is_last = true;
};

} // namespace

fixed_source fix_bytes(std::string_view bytes, const std::string &name, const warning_set &wanted) {
    fixed_source fixed = {.text = std::string(bytes)};
    size_t skipped = 0; /* corrections that earlier rounds of this pass have not made */
    size_t made_before = 0;
    for (int left = ROUNDS_MAX; left > 0; --left) {
        round latest(fixed.text, name, wanted, skipped);
        fixed.dropped = skipped == 0 ? latest.dropped() : fixed.dropped + latest.dropped();
        fixed.corrected += latest.made().size();
        if (!latest.made().empty())
            fixed.text = *corrected(fixed.text, latest.made());
        skipped += latest.left_out();
        if (!latest.is_last_of_text())
            continue;
        if (fixed.corrected == made_before)
            break;
        made_before = fixed.corrected;
        skipped = 0;
    }
    return fixed;
}

} // namespace check
