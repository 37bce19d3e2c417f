/* findings.h: what has been found, on its way to whoever wants it. */
#ifndef CDGEN_CHECK_FINDINGS_H
#define CDGEN_CHECK_FINDINGS_H

#include "check/check.h"
#include "language/messages.h"

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace check {

/* Puts findings in the order of their lines as far as that takes little memory: a finding waits for some others, and is
 * handed over then. */
class findings {
public:
    /* Whether warnings of a line may still be taken back; they wait. */
    using question = std::function<bool(warning_id, int line)>;

    findings(sink handed_to, question is_open) : to(std::move(handed_to)), may_retract(std::move(is_open)) {}

    /* The finding is to be completed before the next one is added. */
    finding &error(const message &known, const place &at, std::string_view source, std::string text);
    /* With a note, if it has a text. */
    finding &warn(const warning &known, const place &at, std::string_view source, std::string text, note more);
    /* Takes back the warnings of a line, which an error now explains. */
    void retract(warning_id id, int line);

    /* An error of a line that is completed later. Null if it has been handed over. */
    finding *waiting_error(message_id id, int line);

    size_t errors() const {
        return count.errors;
    }

    /* Hands over all that still waits, and says how many findings there were. */
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

    sink to;
    question may_retract;
    std::vector<entry> waiting;
    size_t room = WAITING_MAX; /* entries for which make_room() has nothing to do */
    totals count;

    static constexpr size_t WAITING_MAX = 1024; /* findings that need not wait any longer */
};

} // namespace check

#endif
