/* early_lines.h: optional attributes that come before a required one, and how to move them after it. */
#ifndef CDGEN_CHECK_EARLY_LINES_H
#define CDGEN_CHECK_EARLY_LINES_H

#include "check/check.h"
#include "check/current_line.h"

#include <string>
#include <vector>

namespace check {

class early_lines {
public:
    /* The optional attribute of a line has been reported as too early. */
    void open(int line) {
        close();
        first = line;
    }
    void close();
    bool is_open() const {
        return first != 0;
    }
    int first_line() const {
        return first;
    }

    /* Notes that the current line is to be moved. More lines than a reader could look at are not moved, because an edit
     * takes more memory than its line. */
    void move(const current_line &line);

    /* Moves the lines after the current one. */
    correction after(const current_line &line);

private:
    static constexpr size_t MOVED_MAX = 4096;

    int first = 0;          /* 0: no line is too early */
    std::string text;       /* of the lines, each with its newline */
    std::vector<int> lines; /* their numbers in the file */
};

} // namespace check

#endif
