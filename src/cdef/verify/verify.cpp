/* verify.cpp: whether databases are sound, and what is wrong where. */

#include "cdef/cdef.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "cdef/support/trouble.h"
#include "report/json_text.h"
#include "text/append.h"
#include "text/shown.h"

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>

#include <memory>

namespace cdef {

namespace {

using json = nlohmann::ordered_json;

struct verify_options {
    std::vector<std::string> files;
    bool as_json = false;
    bool warnings_count = false; /* as errors do */
    bool quiet = false;          /* no warnings */
};

const char *name_of(cdb::severity level) {
    return level == cdb::severity::error ? "error" : "warning";
}

/* "section 2, rsrc_pattr_t 5, u_ra_name": as much of it as is known. */
std::string place_of(const cdb::finding &f) {
    std::string place = "file";
    if (f.section)
        place = "section " + std::to_string(*f.section);
    if (!f.record.empty())
        place += ", " + std::string(f.record) + " " + std::to_string(f.index);
    if (!f.field.empty())
        place += ", " + std::string(f.field);
    return place;
}

/* One line, as compilers write them. */
std::string line_of(const std::string &file, const cdb::finding &f) {
    std::string line;
    text::appendf(line, "%s: %s: %s at offset %zu: %s: found %s, expected %s [%s]\n", text::escaped(file).c_str(),
                  name_of(f.broken->level), place_of(f).c_str(), f.offset, std::string(f.broken->title).c_str(),
                  f.found.c_str(), f.expected.c_str(), std::string(f.broken->code).c_str());
    return line;
}

json json_of(const cdb::finding &f) {
    json data;
    data["code"] = f.broken->code;
    data["severity"] = name_of(f.broken->level);
    data["title"] = f.broken->title;
    data["section"] = f.section ? json(*f.section) : json();
    data["record"] = f.record;
    data["index"] = f.index;
    data["field"] = f.field;
    data["offset"] = f.offset;
    data["found"] = f.found;
    data["expected"] = f.expected;
    return data;
}

/* What is said of one file, and whether it passes. */
struct verdict {
    std::string text;
    json data;
    bool passes = true;
};

verdict judge(const std::string &path, const verify_options &options) {
    input in(path);
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
            v.data["findings"].push_back(json_of(f));
        else
            v.text += line_of(path, f);
    }
    v.data["sound"] = v.passes;
    return v;
}

int verify(const verify_options &options) {
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
        } catch (const trouble &unreadable) {
            tell(unreadable.what());
            read = false;
        }
    }
    print(options.as_json ? json_text(all) : text);
    return !read ? TROUBLE : pass ? OK : FOUND;
}

} // namespace

void add_verify(CLI::App &app, int &status) {
    auto options = std::make_shared<verify_options>();
    CLI::App *command =
        app.add_subcommand("verify", "Checks whether databases are sound; says nothing of those without findings");
    command->add_option("FILE", options->files, "Databases; - is standard input")->required();
    command->add_flag("--json", options->as_json, "Findings as JSON");
    command->add_flag("--werror", options->warnings_count, "Warnings count as errors");
    command->add_flag("-q,--quiet", options->quiet, "Show errors only");
    command->footer("Exit status: 0 if there are no errors (with --werror: no warnings either), 1 if there are, 2 if a "
                    "file cannot be read.");
    command->callback([options, &status] { status = verify(*options); });
}

} // namespace cdef
