/* fix.cpp: makes the certain corrections of a source. */

#include "check/fix.h"

#include "check/edits.h"

#include <optional>
#include <span>
#include <utility>
#include <vector>

namespace check {

namespace {

constexpr int ROUNDS_MAX = 200; /* the most rounds; few are needed */

/* One round: makes the corrections of a text, except those after which there would be more errors. */
class round {
public:
    round(std::string_view bytes, const std::string &source, const warning_set &wanted)
        : before(bytes), name(source), warned(wanted) {
        std::vector<correction> certain;
        errors = check_bytes(before, name, warned, [&](finding &&each) {
                     if (each.fix.sure == certainty::certain && !each.fix.edits.empty())
                         certain.push_back(std::move(each.fix));
                 }).errors;
        make(compatible(std::move(certain)));
    }

    const std::vector<correction> &made() const {
        return kept;
    }
    size_t dropped() const {
        return refused;
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
};

} // namespace

fixed_source fix_bytes(std::string_view bytes, const std::string &name, const warning_set &wanted) {
    fixed_source fixed = {.text = std::string(bytes)};
    for (int left = ROUNDS_MAX; left > 0; --left) {
        round latest(fixed.text, name, wanted);
        fixed.dropped = latest.dropped();
        if (latest.made().empty())
            break;
        fixed.corrected += latest.made().size();
        std::string text = *corrected(fixed.text, latest.made());
        fixed.text = std::move(text);
    }
    return fixed;
}

} // namespace check
