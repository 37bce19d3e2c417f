/* fix.cpp: cdef check --fix: makes the corrections that are certain. */

#include "cdef/check/fix.h"

#include "cdef/support/failure.h"
#include "cdef/support/memory.h"
#include "cdef/support/output.h"
#include "cdef/support/replacement.h"
#include "cdef/support/shown_diff.h"
#include "cdef/support/text_of_file.h"
#include "check/fix.h"
#include "text/shown.h"

#include <cstddef>
#include <cstdio>

namespace cdef {

namespace {

std::string counted(std::size_t count, const char *what) {
    return std::to_string(count) + " " + what + (count == 1 ? "" : "s");
}

void say(const std::string &source, const std::string &what) {
    std::string line = text::masked(source) + ": " + what + "\n";
    std::fputs(line.c_str(), stderr);
}

void say_what_was_done(const std::string &source, const check::fixed_source &fixed, bool dry_run) {
    if (fixed.corrected > 0)
        say(source, counted(fixed.corrected, "mistake") + (dry_run ? " would be corrected" : " corrected"));
    if (fixed.dropped > 0)
        say(source, counted(fixed.dropped, "correction") + " not made: more errors would be found with " +
                        (fixed.dropped == 1 ? "it" : "them"));
}

} // namespace

std::string fix_source(const std::string &source, const check::warning_set &wanted, bool dry_run) {
    give_back_large_blocks(); /* each round takes and frees many */
    try {
        std::string before = text_of_file(source);
        check::fixed_source fixed = check::fix_bytes(before, source, wanted);
        if (dry_run)
            show_diff(source, before, fixed.text);
        else if (source == "-")
            print(fixed.text);
        else if (fixed.text != before)
            replace_file(source, fixed.text, {.sync = true, .before = before});
        say_what_was_done(source, fixed, dry_run);
        return dry_run ? before : fixed.text;
    } catch (const failure &reason) {
        throw check::cannot_check(reason.what());
    }
}

} // namespace cdef
