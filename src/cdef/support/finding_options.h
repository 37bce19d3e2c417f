/* finding_options.h: the options of subcommands that check sources, which are the same in all of them. */
#ifndef CDGEN_CDEF_FINDING_OPTIONS_H
#define CDGEN_CDEF_FINDING_OPTIONS_H

#include "cdef/support/command.h"
#include "cdef/support/project_files.h"
#include "check/check.h"
#include "report/report.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace cdef {

/* The options that decide which findings a source may have. */
struct finding_rules {
    check::warning_set wanted;
    bool warnings_count = false; /* as errors do */

    /* True if a source with this many findings passes. */
    bool pass(const check::totals &count) const {
        return count.errors == 0 && (count.warnings == 0 || !warnings_count);
    }
};

struct finding_options {
    std::string form;
    std::vector<std::string> wanted;
    std::vector<std::string> unwanted;
    std::optional<bool> warnings_count; /* as errors do */
    report::text_settings text = {.shown_max = 100};
    std::string colour = "auto";
    project_options project;

    /* The settings from the options or, where an option is missing, from the project file. All warnings are wanted
     * except the unwanted ones; a name that is in both lists is wanted. */
    finding_rules rules(const config::settings &settings) const;
    /* The object that writes findings in the chosen form: text to standard error, other forms to standard output. more:
     * rules that findings may break besides those of sources. */
    std::unique_ptr<report::writer> writer(const std::vector<report::rule> &more = {}) const;
    /* Reports a source that could not be read. why: a message that names the source. */
    void fail_source(report::writer &to, const std::string &why) const;
};

/* Adds --format, --max, --quiet and --color, which say how findings are shown; */
void add_report_options(command &to, finding_options &options);
/* and --werror, --no-werror, --config and --no-config. */
void add_project_rules(command &to, finding_options &options);

/* Adds all of these, and --warn and --no-warn. The options must outlive the command. */
void add_finding_options(command &to, finding_options &options);

/* Throws check::cannot_check for a database, and names the subcommand that checks it. */
void require_source(const std::string &path);

} // namespace cdef

#endif
