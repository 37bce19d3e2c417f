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

/* Writes findings one by one, and keeps a finding only as long as its form requires. */
class writer {
public:
    writer() = default;
    writer(const writer &) = delete;
    writer &operator=(const writer &) = delete;
    virtual ~writer() = default;

    /* Begins a source. The findings that are added before its end belong to it. */
    virtual void begin_source(const std::string &file) = 0;
    virtual void add(const check::finding &found) = 0;
    virtual void end_source(const check::totals &count) = 0;
    /* Ends a source that could not be read to its end. why: a message that names the source. */
    virtual void fail_source(const std::string &why) = 0;
    /* Something that is made from the source could not be written; before end_source(). The text form leaves this to
     * the caller. */
    virtual void fail_output(const std::string &why) = 0;
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
    std::size_t shown_max = 0; /* the most findings shown, warnings being left out first; 0: all */
    bool quiet = false;        /* only errors are shown, without a summary */
    bool coloured = false;
};

/* The form that compilers use: a line for each finding and note, below it the marked line of the source, and at the end
 * a summary. Messages about unreadable sources are included. Each list of known names is shown only once. No text from
 * a source, and no file name, can control a terminal. */
std::unique_ptr<writer> text_form(output to, const text_settings &settings);

/* One finding in that form. */
std::string as_text(const std::string &file, const check::finding &found);

} // namespace report

#endif
