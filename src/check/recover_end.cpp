/* recover_end.cpp: the end of the source: completes open stanzas, and reports what the source as a whole lacks. */

#include "check/notes.h"
#include "check/recovery.h"

namespace check {

void recovery::close_all() {
    end_stanza(NO_KIND);
    settle_broken(NO_KIND);
    for (size_t step = 0; step < compiler.closing_steps(); ++step) {
        warned.before_step(see, NO_KIND);
        for (int tries = 0; tries < 2; ++tries) {
            try {
                compiler.take_closing_step(step);
                break;
            } catch (const fatal_exit &failure) {
                if (!recover_end(failure))
                    break;
            }
        }
        warned.after_step(see, NO_KIND);
    }
    try {
        compiler.size_image();
    } catch (const fatal_exit &failure) {
        if (may_follow(failure))
            report(failure, line.none());
    }
    warned.source_end(see);
}

/* True if the step must be tried again, without the record for which it failed. */
bool recovery::recover_end(const fatal_exit &failure) {
    int failed = failed_kind(failure);
    bool reported = failed >= 0 && compiler.is_broken(failed);
    bool elsewhere = failed >= 0 && is_line_of_neighbour(failure, failed);
    if (!reported && !elsewhere && !is_reported_otherwise(failure) && may_follow(failure)) {
        report_with_notes(failure, line.none(), failed);
        if (failure.id == MSG_KEYS_REVERSED && map_value(known, "LastKey") == nullptr)
            found.retract(INCOMPLETE, known.map_line);
    }
    if (failed >= 0)
        abandon(failed, failure);
    return failed >= 0;
}

} // namespace check
