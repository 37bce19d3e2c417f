/* github.h: a workflow command of GitHub, which shows a finding beside a file of a change. */
#ifndef CDGEN_REPORT_GITHUB_H
#define CDGEN_REPORT_GITHUB_H

#include <string>
#include <string_view>

namespace report {

struct github_command {
    bool error = true;
    std::string_view file;
    std::string place = {};      /* ",line=1,col=2,endColumn=3", or the part of it that is known */
    std::string_view title = {}; /* empty: none */

    /* With a newline. lines: any text; a newline in it begins another line of what is shown. */
    std::string with(std::string_view lines) const;
};

} // namespace report

#endif
