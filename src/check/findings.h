/* findings.h: keeps findings until they can be passed on in order. */
#ifndef CDGEN_CHECK_FINDINGS_H
#define CDGEN_CHECK_FINDINGS_H

#include "check/check.h"
#include "language/messages.h"

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace check {

/* Puts findings in the order of their lines, as far as that takes little memory: a finding is kept until some later
 * ones have been found, and then passed on. */
class findings {
public:
    /* True if warnings of a line may still be withdrawn; they are kept so long. */
    using question = std::function<bool(warning_id, int line)>;

    findings(sink handed_to, question is_open) : to(std::move(handed_to)), may_retract(std::move(is_open)) {}

    /* Returns the finding, which must be completed before the next one is added. */
    finding &error(const message &known, const place &at, std::string_view source, std::string text);
    /* With a note, if it has a text. */
    finding &warn(const warning &known, const place &at, std::string_view source, std::string text, note more);
    /* Withdraws the warnings of a line, because an error explains it. */
    void retract(warning_id id, int line);

    /* Completes the error of a line, unless it has been passed on already. */
    void correct(message_id id, int line, const std::function<correction()> &fix);

    size_t errors() const {
        return count.errors;
    }

    /* Passes on all remaining findings, and returns how many there were in all. */
    totals close();

private:
    struct entry {
        finding found;
        warning_id id; /* of a warning; WARNING_COUNT: an error */
        bool retracted = false;
    };

    finding &add(entry &&added);
    void sort();
    void hand_over(entry &each);
    void make_room();
    void pass_on_first_half();

    sink to;
    question may_retract;
    std::vector<entry> waiting;
    size_t parts = 0;              /* their notes and edits, but for those of the latest */
    size_t room = WAITING_MAX;     /* entries for which make_room() has nothing to do, */
    size_t parts_room = PARTS_MAX; /* and their parts */
    totals count;

    static constexpr size_t WAITING_MAX = 1024; /* findings that can be passed on */
    static constexpr size_t PARTS_MAX = 16384;
};

} // namespace check

#endif
