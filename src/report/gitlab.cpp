/* gitlab.cpp: findings as the code quality report of GitLab. */

#include "report/gitlab.h"

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
    explicit gitlab_writer(output written_to) : to(std::move(written_to)) {}

    void begin_source(const std::string &name) override {
        file = name;
    }
    void add(const check::finding &found) override {
        std::string description = found.text;
        for (const check::note &more : found.notes)
            description += "; " + more.text;
        std::string mark = made.of(file, found).text();
        std::size_t line = std::max<std::size_t>(line_in_file(found.at), 1);
        to.add(file, {std::move(description), found.code, std::move(mark), found.error ? "major" : "minor", line});
    }
    void end_source(const check::totals & /* count */) override {}
    void fail_source(const std::string &why) override {
        to.fail(file, why);
    }
    void fail_output(const std::string &why) override {
        to.fail(file, why);
    }
    void close() override {
        to.close();
    }

private:
    gitlab_report to;
    std::string file;
    fingerprints made;
};

} // namespace

void gitlab_report::add(std::string_view file, const gitlab_entry &entry) {
    std::string_view path = path_of(file);
    to.add_whole([&] {
        to.open_object();
        to.add_text("description", entry.description);
        to.add_text("check_name", entry.code);
        to.add_text("fingerprint", hexadecimal(hash_of(entry.mark, hash_of(path))));
        to.add_text("severity", entry.severity);
        to.open_object("location");
        to.add_text("path", path);
        to.open_object("lines");
        to.add_number("begin", entry.line);
        for (int levels = 3; levels > 0; --levels)
            to.close();
    });
}

std::unique_ptr<writer> gitlab_form(output to) {
    return std::make_unique<gitlab_writer>(std::move(to));
}

} // namespace report
