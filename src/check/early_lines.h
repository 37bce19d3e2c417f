/* early_lines.h: optional attributes that come before a required one, and how to move them after it. */
#ifndef CDGEN_CHECK_EARLY_LINES_H
#define CDGEN_CHECK_EARLY_LINES_H

#include "check/check.h"
#include "check/current_line.h"

#include <string>

namespace check {

class early_lines {
public:
    /* The optional attribute of a line has been reported as too early. */
    void open(int line) {
        first = line;
        moved = {};
        text.clear();
    }
    void close() {
        first = 0;
    }
    bool is_open() const {
        return first != 0;
    }
    int first_line() const {
        return first;
    }

    /* Notes that the current line is to be moved. */
    void move(const current_line &line);

    /* Moves the lines after the current one. */
    correction after(const current_line &line);

private:
    int first = 0; /* 0: no line is too early */
    correction moved;
    std::string text; /* of the lines */
};

} // namespace check

#endif
