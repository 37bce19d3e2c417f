/* github.cpp: findings as the workflow commands of GitHub, which shows them beside the lines of a change. */

#include "report/places.h"
#include "report/report.h"
#include "text/shown.h"

#include <utility>

namespace report {

namespace {

/* Text after the last "::"; of a property, what separates properties is escaped too. */
std::string escaped(std::string_view part, bool is_property) {
    std::string text;
    for (char c : text::masked(part))
        if (c == '%')
            text += "%25";
        else if (is_property && (c == ':' || c == ','))
            text += c == ':' ? "%3A" : "%2C";
        else
            text += c;
    return text;
}

class github_writer : public writer {
public:
    explicit github_writer(output written_to) : to(std::move(written_to)) {}

    void begin_source(const std::string &name) override {
        file = name;
    }
    void add(const check::finding &found) override {
        text += std::string(found.error ? "::error" : "::warning") + " file=" + escaped(file, true);
        add_place(found);
        text += ",title=" + escaped(found.code, true) + "::" + escaped(found.text, false);
        for (const check::note &more : found.notes)
            text += "%0A" + escaped(more.text, false);
        text += "\n";
        write_if_full();
    }
    void end_source(const check::totals & /* count */) override {
        write();
    }
    void fail_source(const std::string &why) override {
        text += "::error file=" + escaped(file, true) + "::" + escaped(why, false) + "\n";
        write();
    }
    void close() override {}

private:
    void add_place(const check::finding &found) {
        if (found.at.line == 0)
            return;
        text += ",line=" + std::to_string(line_in_file(found.at));
        if (found.at.column == 0)
            return;
        character_range in_file = characters_in_file(found.at, found.source);
        text += ",col=" + std::to_string(in_file.column);
        text += ",endColumn=" + std::to_string(in_file.column + std::max<size_t>(in_file.length, 1) - 1);
    }
    void write_if_full() {
        constexpr size_t PORTION = 65536;
        if (text.size() >= PORTION)
            write();
    }
    void write() {
        if (!text.empty())
            to(std::exchange(text, {}));
    }

    output to;
    std::string file;
    std::string text; /* not yet written */
};

} // namespace

std::unique_ptr<writer> github_form(output to) {
    return std::make_unique<github_writer>(std::move(to));
}

} // namespace report
