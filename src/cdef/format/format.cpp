/* format.cpp: cdef format: sources in their usual form. */

#include "formatter/format.h"

#include "cdef/cdef.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/finding_options.h"
#include "cdef/support/output.h"
#include "cdef/support/replacement.h"
#include "cdef/support/shown_diff.h"
#include "cdef/support/status.h"
#include "cdef/support/text_of_file.h"
#include "report/report.h"
#include "text/shown.h"

#include <algorithm>
#include <cstdio>
#include <memory>
#include <string>
#include <unistd.h>
#include <vector>

namespace cdef {

namespace {

struct format_options {
    std::vector<std::string> sources;
    bool in_place = false;
    bool checks = false; /* only lists the sources that would change */
    bool diffs = false;  /* only shows the changes */
    bool reorder = false;
};

/* The name is masked only on a terminal: programs need it unchanged. */
std::string name_line(const std::string &source) {
    return (isatty(STDOUT_FILENO) == 0 ? source : text::masked(source)) + "\n";
}

/* Writes the source, its name or its changes. Returns false if a check found changes. */
bool write(const std::string &source, const std::string &before, const std::string &after,
           const format_options &options) {
    bool same = before == after;
    if (options.checks)
        print(same ? "" : name_line(source));
    else if (options.diffs)
        show_diff(source, before, after);
    else if (!options.in_place || source == "-")
        print(after);
    else if (!same)
        replace_file(source, after, {.sync = true, .before = before});
    return same || (!options.checks && !options.diffs);
}

/* Throws failure or check::cannot_check if the source is left alone. */
bool format_source(const std::string &source, const format_options &options) {
    require_source(source);
    std::string before = text_of_file(source);
    formatter::formatted result = formatter::format(before, source, {.reorder = options.reorder});
    if (result.error)
        std::fputs(report::as_text(source, *result.error).c_str(), stderr);
    if (result.is_left_alone())
        throw failure(source + ": not formatted, because " + result.refusal);
    return write(source, before, result.text, options);
}

int format_all(const format_options &options) {
    int status = OK;
    for (const std::string &source : options.sources) {
        try {
            status = std::max(status, format_source(source, options) ? OK : FOUND);
        } catch (const failure &reason) {
            print_error(reason.what());
            status = FAILED;
        } catch (const check::cannot_check &unreadable) {
            print_error(unreadable.what());
            status = FAILED;
        }
    }
    return status;
}

} // namespace

void add_format(program &app) {
    auto options = std::make_shared<format_options>();
    command made = app.add("format", "Puts sources into a uniform layout without changing their meaning",
                           [options] { return format_all(*options); });
    made.add("SOURCE", options->sources, "Source to format; - is standard input").required();
    option in_place = made.add_flag("-i,--in-place", options->in_place,
                                    "Replace the sources; without it, formatted sources go to standard output");
    option checks = made.add_flag("--check", options->checks, "Only list the sources that would change");
    option diffs = made.add_flag("--diff", options->diffs, "Only show what would change, as a diff");
    in_place.excludes(checks).excludes(diffs);
    checks.excludes(diffs);
    made.add_flag("--reorder", options->reorder,
                  "Also put attributes into their usual order, where the order has no meaning");
    made.show_examples("  cdef format disk.cdefsrc | less     show the result\n"
                       "  cdef format -i *.cdefsrc            format these sources\n"
                       "  cdef format --check *.cdefsrc       in a build: list sources that are not formatted\n");
}

} // namespace cdef
