/* lines.cpp: warnings about lines as the compiler reads them. */

#include "check/warnings/watcher.h"

#include "language/limits.h"

#include <string>

namespace check {

namespace {

/* Reports each line once, when its second piece is met. */
class long_line : public watcher {
public:
    using watcher::watcher;

    void continued_line(const view &see) override {
        if (latest_piece != see.line.number - 1)
            report(
                {see.line.number - 1, 0, 0}, {},
                "line of more than " + std::to_string(LINE_MAX_CHARS - 1) +
                    " characters: the rest is read as a line of its own, so the numbers of later lines are too high");
        latest_piece = see.line.number;
    }

private:
    int latest_piece = 0; /* the number of the latest line that was not a first piece */
};

/* Reports the first one only: usually all lines have one. */
class first_return : public watcher {
public:
    using watcher::watcher;

    void carriage_return(const view &see, size_t at) override {
        if (reported)
            return;
        reported = true;
        std::string where = at + 1 == see.line.raw.size() ? "at the end of" : "within";
        report(see, {see.line.number, at + 1, 1},
               "carriage return " + where + " a line, which belongs to the line's text");
    }

private:
    bool reported = false;
};

} // namespace

made_watcher make_long_line(const watcher_setup &setup) {
    return make<long_line>(setup);
}

made_watcher make_carriage_return(const watcher_setup &setup) {
    return make<first_return>(setup);
}

} // namespace check
