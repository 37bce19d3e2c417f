/* gitlab.h: the code quality report of GitLab. */
#ifndef CDGEN_REPORT_GITLAB_H
#define CDGEN_REPORT_GITLAB_H

#include "report/json_writer.h"

namespace report {

struct gitlab_entry {
    std::string description;
    std::string_view code;
    std::string mark; /* distinguishes it from other entries about the file */
    std::string_view severity;
    std::size_t line = 1; /* from 1; 1 if the file has no lines, because GitLab requires a line */
};

class gitlab_report {
public:
    explicit gitlab_report(output written_to) : to(std::move(written_to)) {
        to.open_list();
    }
    void add(std::string_view file, const gitlab_entry &entry);
    /* Adds a file that cannot be read. why: a message that names the file. */
    void fail(std::string_view file, const std::string &why) {
        add(file, {why, "unreadable", "unreadable", "blocker"});
    }
    void close() {
        to.close();
    }

private:
    json_writer to;
};

} // namespace report

#endif
