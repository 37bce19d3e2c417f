/* sarif.h: a log of SARIF 2.1.0, for results about sources or about databases. */
#ifndef CDGEN_REPORT_SARIF_H
#define CDGEN_REPORT_SARIF_H

#include "report/json_writer.h"
#include "report/rules.h"

#include <nlohmann/json_fwd.hpp>

#include <span>

namespace report {

/* Written while results are added. */
class sarif_log {
public:
    /* tool: such as "cdef check". rules: those that results refer to by position. */
    sarif_log(output written_to, std::string_view tool, std::span<const rule> rules);

    void add(const nlohmann::ordered_json &result);
    /* Adds a file that cannot be read. why: a message that names the file. */
    void fail(const std::string &file, const std::string &why);
    void close();

private:
    void add_driver(std::string_view tool, std::span<const rule> rules);
    void add_invocation();

    json_writer to;
    std::vector<std::string> unreadable; /* a notification for each such file */
};

/* {"uri": ...} */
nlohmann::ordered_json artifact_of(const std::string &file);

} // namespace report

#endif
