/* verify.cpp: the subcommand that checks whether databases are sound. */

#include "cdef/cdef.h"
#include "cdef/support/failure.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "cdef/verify/findings.h"
#include "report/json_text.h"

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>

#include <memory>

namespace cdef {

namespace {

using json = nlohmann::ordered_json;

struct verify_options {
    std::vector<std::string> files;
    bool as_json = false;
    bool warnings_count = false; /* a database with warnings fails as one with errors does */
    bool quiet = false;          /* warnings are not shown */
};

/* The findings in one file, in one of two forms, and whether it passes. */
struct verdict {
    std::string text;
    json data;
    bool passes = true;
};

verdict judge(const std::string &path, const verify_options &options) {
    input in(path);
    if (is_text(in.contents))
        throw failure(path + ": a text, not a database; 'cdef check' checks sources");
    verdict v = {.text = {}, .data = json::object()};
    v.data["file"] = path;
    v.data["sound"] = true;
    v.data["findings"] = json::array();
    for (const cdb::finding &f : cdb::verify(in.db)) {
        bool counts = f.broken->level == cdb::severity::error || options.warnings_count;
        v.passes = v.passes && !counts;
        if (options.quiet && f.broken->level == cdb::severity::warning)
            continue;
        if (options.as_json)
            v.data["findings"].push_back(verify::json_of(f));
        else
            v.text += verify::line_of(path, f);
    }
    v.data["sound"] = v.passes;
    return v;
}

int run(const verify_options &options) {
    json all = json::array();
    std::string text;
    bool pass = true;
    bool read = true;
    for (const std::string &file : options.files) {
        try {
            verdict v = judge(file, options);
            pass = pass && v.passes;
            text += v.text;
            all.push_back(std::move(v.data));
        } catch (const failure &unreadable) {
            print_error(unreadable.what());
            read = false;
        }
    }
    print(options.as_json ? report::json_text(all) : text);
    return !read ? FAILED : pass ? OK : FOUND;
}

} // namespace

void add_verify(CLI::App &app, int &status) {
    auto options = std::make_shared<verify_options>();
    CLI::App *command =
        app.add_subcommand("verify", "Checks whether databases are sound; prints nothing about flawless ones");
    command->add_option("FILE", options->files, "Database to verify; - is standard input")->required();
    command->add_flag("--json", options->as_json, "Write findings as JSON");
    command->add_flag("--werror", options->warnings_count, "Count warnings as errors");
    command->add_flag("-q,--quiet", options->quiet, "Show errors only");
    command->footer("Exit status: 0 without errors, 1 with errors (with --werror: or warnings), 2 if a file cannot be "
                    "read.");
    command->callback([options, &status] { status = run(*options); });
}

} // namespace cdef
