/* gitlab.cpp: findings as the code quality report of GitLab. */

#include "report/fingerprint.h"
#include "report/places.h"
#include "report/report.h"

#include <algorithm>
#include <utility>

namespace report {

namespace {

/* Paths count from the repository's top, without "./". */
std::string_view path_of(std::string_view file) {
    while (file.starts_with("./"))
        file.remove_prefix(2);
    return file;
}

class gitlab_writer : public writer {
public:
    explicit gitlab_writer(output written_to) : to(std::move(written_to)) {
        to.open_list();
    }
    void begin_source(const std::string &name) override {
        file = name;
    }
    void add(const check::finding &found) override {
        std::string description = found.text;
        for (const check::note &more : found.notes)
            description += "; " + more.text;
        std::string mark = made.of(file, found).text();
        const char *severity = found.error ? "major" : "minor";
        to.add_whole([&] { add_entry(description, found.code, mark, severity, line_in_file(found.at)); });
    }
    void end_source(const check::totals & /* count */) override {}
    void fail_source(const std::string &why) override {
        add_entry(why, "unreadable", "unreadable", "blocker", 1);
    }
    void close() override {
        to.close();
    }

private:
    void add_entry(const std::string &description, const char *code, const std::string &mark, const char *severity,
                   size_t line) {
        to.open_object();
        to.add_text("description", description);
        to.add_text("check_name", code);
        to.add_text("fingerprint", hexadecimal(hash_of(mark, hash_of(path_of(file)))));
        to.add_text("severity", severity);
        to.open_object("location");
        to.add_text("path", path_of(file));
        to.open_object("lines");
        to.add_number("begin", std::max<size_t>(line, 1));
        to.close();
        to.close();
        to.close();
    }

    json_writer to;
    std::string file;
    fingerprints made;
};

} // namespace

std::unique_ptr<writer> gitlab_form(output to) {
    return std::make_unique<gitlab_writer>(std::move(to));
}

} // namespace report
