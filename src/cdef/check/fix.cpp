/* fix.cpp: cdef check --fix: makes the corrections that are certain. */

#include "cdef/check/fix.h"

#include "cdef/support/failure.h"
#include "cdef/support/output.h"
#include "cdef/support/replace.h"
#include "check/fix.h"
#include "text/shown.h"
#include "text/unified_diff.h"

#include <cstddef>
#include <cstdio>
#include <unistd.h>

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

/* Of what a terminal would act upon, a terminal gets nothing; a file gets all, so that patch can use it. */
std::string for_output(const std::string &diff) {
    if (isatty(STDOUT_FILENO) == 0)
        return diff;
    std::string shown;
    for (std::size_t begin = 0; begin < diff.size();) {
        std::size_t end = diff.find('\n', begin);
        shown += text::masked(std::string_view(diff).substr(begin, end - begin)) + "\n";
        begin = end + 1;
    }
    return shown;
}

/* The names that git gives the two. */
std::string diff_of(const std::string &source, const std::string &before, const std::string &after) {
    std::string name = source == "-" ? "stdin" : source;
    bool absolute = name.starts_with('/');
    return text::unified_diff((absolute ? "" : "a/") + name, (absolute ? "" : "b/") + name, before, after);
}

} // namespace

std::string fix_source(const std::string &source, const check::warning_set &wanted, bool dry_run) {
    try {
        std::string before = text_of_file(source);
        check::fixed_source fixed = check::fix_bytes(before, source, wanted);
        if (dry_run)
            print(for_output(diff_of(source, before, fixed.text)));
        else if (source == "-")
            print(fixed.text);
        else if (fixed.text != before)
            replace_file(source, before, fixed.text);
        say_what_was_done(source, fixed, dry_run);
        return dry_run ? before : fixed.text;
    } catch (const failure &reason) {
        throw check::cannot_check(reason.what());
    }
}

} // namespace cdef
