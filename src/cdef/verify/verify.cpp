/* verify.cpp: the subcommand that checks whether databases are sound. */

#include "cdef/cdef.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "cdef/verify/findings.h"
#include "cdef/verify/forms.h"

#include <algorithm>
#include <memory>
#include <utility>

namespace cdef {

namespace {

struct verify_options {
    std::vector<std::string> files;
    std::string form;
    bool warnings_count = false; /* warnings count as errors */
    bool quiet = false;          /* warnings are not shown */
    bool shows_all = false;      /* consequences are shown too */
};

std::unique_ptr<verify::form> form_of(const verify_options &options) {
    if (options.form == "json")
        return verify::json_form();
    if (options.form == "sarif")
        return verify::sarif_form();
    if (options.form == "github")
        return verify::github_form(options.shows_all);
    if (options.form == "gitlab")
        return verify::gitlab_form(options.shows_all);
    return verify::text_form(options.shows_all);
}

constexpr std::size_t MOST_DIAGNOSED = 10000; /* the most findings for which causes are looked for */

bool is_shown(const cdb::finding &found, const verify_options &options) {
    return !options.quiet || found.broken->level == cdb::severity::error;
}

void show_diagnosis(const cdb::database &db, std::vector<cdb::finding> &&found, const verify_options &options,
                    verify::form &form) {
    std::vector<cdb::diagnosed> findings = cdb::diagnose(db, std::move(found));
    form.add(options.quiet ? verify::errors_of(std::move(findings)) : findings);
}

/* Verifies again, so that the findings are never in memory together. */
void show_many(const cdb::database &db, std::size_t count, const verify_options &options, verify::form &form) {
    form.begin_many(count);
    cdb::verify(db, [&](cdb::finding &&found) {
        if (is_shown(found, options))
            form.add_one(found);
    });
}

/* Shows the findings in one file; whether it passes. */
bool judge(const std::string &path, const verify_options &options, verify::form &form) {
    input in(path);
    require_database(in);
    cdb::first_findings first = cdb::find_first(in.db, MOST_DIAGNOSED);
    bool pass = options.warnings_count ? first.count == 0 : first.sound;
    form.begin_file(path, pass);
    if (first.count > first.kept.size())
        show_many(in.db, first.count, options, form);
    else
        show_diagnosis(in.db, std::move(first.kept), options, form);
    form.end_file();
    return pass;
}

int run(const verify_options &options) {
    std::unique_ptr<verify::form> form = form_of(options);
    bool pass = true;
    bool read = true;
    for (const std::string &file : options.files) {
        try {
            pass = judge(file, options, *form) && pass;
        } catch (const failure &unreadable) {
            print_error(unreadable.what());
            form->add_unreadable(file, unreadable.what());
            read = false;
        }
    }
    form->close();
    return !read ? FAILED : pass ? OK : FOUND;
}

} // namespace

void add_verify(program &app) {
    auto options = std::make_shared<verify_options>();
    command made = app.add("verify", "Checks whether databases are sound; prints nothing if there is nothing to report",
                           [options] { return run(*options); });
    made.add("FILE", options->files, "Database to verify; - is standard input").required();
    add_forms(made, options->form, {"text", "json", "sarif", "github", "gitlab"}, "Form of the findings");
    made.add_flag("--all", options->shows_all, "Show the findings that follow from others too");
    made.add_flag("--werror", options->warnings_count, "Count warnings as errors");
    made.add_flag("-q,--quiet", options->quiet, "Show errors only");
}

} // namespace cdef
