/* report.h: findings in sources, in the forms that people and other programs read. */
#ifndef CDGEN_REPORT_REPORT_H
#define CDGEN_REPORT_REPORT_H

#include "check/check.h"
#include "report/json_writer.h"
#include "report/rules.h"

#include <cstddef>
#include <memory>
#include <string>
#include <vector>

namespace report {

/* Writes findings as it is given them, and keeps none of them longer than their form demands. */
class writer {
public:
    writer() = default;
    writer(const writer &) = delete;
    writer &operator=(const writer &) = delete;
    virtual ~writer() = default;

    /* A source; what is added up to its end was found in it. */
    virtual void begin_source(const std::string &file) = 0;
    virtual void add(const check::finding &found) = 0;
    virtual void end_source(const check::totals &count) = 0;
    /* The same if the source could not be read, or not to its end. why: a message that names the source. */
    virtual void fail_source(const std::string &why) = 0;
    /* There are no more sources. */
    virtual void close() = 0;
};

/* Each writes a document for all sources. */
std::unique_ptr<writer> json_form(output to);
std::unique_ptr<writer> sarif_form(output to);
/* more: the rules that findings may break besides those of all_rules(). */
std::unique_ptr<writer> sarif_form(output to, const std::vector<rule> &more);
/* The code quality report of GitLab. */
std::unique_ptr<writer> gitlab_form(output to);

/* Workflow commands of GitHub, one line for each finding. */
std::unique_ptr<writer> github_form(output to);

struct text_settings {
    std::size_t shown_max = 0; /* findings; 0: all. Errors are shown before warnings are */
    bool quiet = false;        /* only errors are shown, without a summary */
    bool coloured = false;
};

/* As compilers write it: a line for the finding and each note, and the line of the source with a mark; at the end a
 * summary. Messages of sources that cannot be read are among them. A list of known names is shown once. Nothing of a
 * source, or of its name, can steer a terminal. */
std::unique_ptr<writer> text_form(output to, const text_settings &settings);

/* One finding in that form. */
std::string as_text(const std::string &file, const check::finding &found);

} // namespace report

#endif
