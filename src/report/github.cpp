/* github.cpp: findings as the workflow commands of GitHub, which shows them beside the lines of a change. */

#include "report/github.h"

#include "report/places.h"
#include "report/report.h"
#include "text/shown.h"

#include <algorithm>
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
        std::string lines = found.text;
        for (const check::note &more : found.notes)
            lines += "\n" + more.text;
        github_command command = {found.error, file, place_of(found), found.code};
        text += command.with(lines);
        write_if_full();
    }
    void end_source(const check::totals & /* count */) override {
        write();
    }
    void fail_source(const std::string &why) override {
        text += github_command{.file = file}.with(why);
        write();
    }
    void fail_output(const std::string &why) override {
        text += github_command{.file = file}.with(why);
    }
    void close() override {}

private:
    static std::string place_of(const check::finding &found) {
        if (found.at.line == 0)
            return {};
        std::string place = ",line=" + std::to_string(line_in_file(found.at));
        if (found.at.column == 0)
            return place;
        character_range in_file = characters_in_file(found.at, found.source);
        place += ",col=" + std::to_string(in_file.column);
        return place + ",endColumn=" + std::to_string(in_file.column + std::max<size_t>(in_file.length, 1) - 1);
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

std::string github_command::with(std::string_view lines) const {
    std::string text = std::string(error ? "::error" : "::warning") + " file=" + escaped(file, true) + place;
    if (!title.empty())
        text += ",title=" + escaped(title, true);
    text += "::";
    for (std::size_t begin = 0; begin <= lines.size();) {
        std::size_t end = std::min(lines.find('\n', begin), lines.size());
        text += (begin == 0 ? "" : "%0A") + escaped(lines.substr(begin, end - begin), false);
        begin = end + 1;
    }
    return text + "\n";
}

std::unique_ptr<writer> github_form(output to) {
    return std::make_unique<github_writer>(std::move(to));
}

} // namespace report
