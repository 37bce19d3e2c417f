/* check.cpp: the subcommand that reports the errors and warnings in sources. */

#include "check/check.h"

#include "cdef/cdef.h"
#include "cdef/check/fix.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/finding_options.h"

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

namespace cdef {

namespace {

struct check_options {
    std::vector<std::string> sources;
    finding_options findings;
    bool fixes = false;
    bool changes_nothing = false; /* only show what would be fixed */
};

check::totals check_source(const std::string &source, const check_options &options, const check::warning_set &wanted,
                           report::writer &to) {
    auto add = [&to](const check::finding &found) { to.add(found); };
    require_source(source);
    if (options.fixes)
        return check::check_bytes(fix_source(source, wanted, options.changes_nothing), source, wanted, add);
    return check::check_file(source, wanted, add);
}

/* In most forms the findings go to standard output, so the fixed source or the diff cannot go there too. */
void require_output(const check_options &options) {
    bool from_input = std::find(options.sources.begin(), options.sources.end(), "-") != options.sources.end();
    if (options.fixes && (options.changes_nothing || from_input) && options.findings.form != "text")
        throw failure("--fix writes to standard output here, and so does --format " + options.findings.form);
}

/* For each source; read before anything is shown, because a project file may have errors. */
std::vector<finding_rules> rules_of(const check_options &options) {
    project_files projects(options.findings.project);
    std::vector<finding_rules> rules;
    for (const std::string &source : options.sources)
        rules.push_back(options.findings.rules(projects.of(source)));
    return rules;
}

/* Checks all sources. */
int check_all(const check_options &options) {
    require_output(options);
    std::vector<finding_rules> rules = rules_of(options);
    std::unique_ptr<report::writer> form = options.findings.writer();
    bool pass = true;
    bool read = true;
    for (std::size_t i = 0; i < rules.size(); ++i) {
        const std::string &source = options.sources[i];
        form->begin_source(source);
        try {
            check::totals count = check_source(source, options, rules[i].wanted, *form);
            form->end_source(count);
            pass = pass && rules[i].pass(count);
        } catch (const check::cannot_check &unreadable) {
            options.findings.fail_source(*form, unreadable.what());
            read = false;
        }
    }
    form->close();
    return !read ? FAILED : pass ? OK : FOUND;
}

} // namespace

void add_check(program &app) {
    auto options = std::make_shared<check_options>();
    command made = app.add("check", "Checks sources and reports every mistake, not just the first",
                           [options] { return check_all(*options); });
    made.add("SOURCE", options->sources, "Source to check; - is standard input").required();
    add_finding_options(made, options->findings);
    option fix = made.add_flag("--fix", options->fixes, "Make the corrections that are certain");
    made.add_flag("--dry-run", options->changes_nothing, "Show as a diff what --fix would change").needs(fix);
}

} // namespace cdef
