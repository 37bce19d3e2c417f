/* text.cpp: findings as compilers write them. */

#include "report/places.h"
#include "report/report.h"
#include "text/shown.h"

#include <utility>

namespace report {

namespace {

constexpr std::size_t PORTION = 65536; /* bytes that are written at once */

class text_writer : public writer {
public:
    explicit text_writer(output written_to) : to(std::move(written_to)) {}

    void begin_source(const std::string &name) override {
        file = name;
    }
    void add(const check::finding &found) override {
        text += as_text(file, found);
        if (text.size() >= PORTION)
            write();
    }
    void end_source(const check::totals & /* count */) override {
        write();
    }
    void fail_source(const std::string &why) override {
        text += "cdef: " + text::escaped(why) + "\n";
        write();
    }
    void close() override {}

private:
    void write() {
        if (!text.empty())
            to(std::exchange(text, {}));
    }

    output to;
    std::string file;
    std::string text; /* not yet written */
};

} // namespace

std::string as_text(const std::string &file, const check::finding &found) {
    std::string text = prefix_of(file, found.at);
    text += found.error ? "error: " : "warning: ";
    text += text::masked(found.text) + " [" + found.code;
    if (!found.error)
        text.append(" ").append(found.name);
    text += "]\n" + excerpt_of(found.at, found.source);
    for (const check::note &more : found.notes) {
        text += prefix_of(file, more.at) + "note: " + text::masked(more.text) + "\n";
        if (!more.source.empty())
            text += excerpt_of(more.at, more.source);
    }
    return text;
}

std::unique_ptr<writer> text_form(output to) {
    return std::make_unique<text_writer>(std::move(to));
}

} // namespace report
