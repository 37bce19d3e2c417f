/* text.cpp: findings as compilers write them. */

#include "language/suggestions.h"
#include "report/fingerprint.h"
#include "report/places.h"
#include "report/report.h"
#include "text/shown.h"

#include <algorithm>
#include <deque>
#include <set>
#include <utility>

namespace report {

namespace {

constexpr std::size_t PORTION = 65536;    /* bytes that are written at once */
constexpr std::size_t WAITING_MAX = 1024; /* findings */

constexpr const char *BOLD = "\033[1m";
constexpr const char *RED = "\033[1;31m";
constexpr const char *MAGENTA = "\033[1;35m";
constexpr const char *CYAN = "\033[1;36m";
constexpr const char *GREEN = "\033[1;32m";

/* "1 error", "2 errors" */
std::string counted(size_t count, const std::string &what) {
    return std::to_string(count) + " " + what + (count == 1 ? "" : "s");
}

/* One finding with its notes. */
class shown_finding {
public:
    shown_finding(const std::string &name, bool with_colours) : file(name), coloured(with_colours) {}

    void head(const check::finding &found) {
        std::string rest = " [" + std::string(found.code);
        if (!found.error)
            rest.append(" ").append(found.name);
        line(found.at, found.error ? RED : MAGENTA, found.error ? "error: " : "warning: ", found.text, rest + "]");
        excerpt(found.at, found.source);
    }
    void note(const check::note &more) {
        line(more.at, CYAN, "note: ", more.text, {});
        if (!more.source.empty())
            excerpt(more.at, more.source);
    }

    std::string text;

private:
    std::string painted(const char *colour, const std::string &part) const {
        return coloured ? std::string(colour).append(part).append(NO_COLOUR) : part;
    }
    void line(const check::place &at, const char *colour, const char *kind, std::string_view message,
              const std::string &rest) {
        text += painted(BOLD, prefix_of(file, at)) + painted(colour, kind) + text::masked(message) + rest + "\n";
    }
    void excerpt(const check::place &at, std::string_view source) {
        text += excerpt_of(at, source, coloured ? GREEN : "");
    }

    const std::string &file;
    bool coloured;
};

/* Warnings are kept until it is certain that they are shown, because a later error may take the place of one. To limit
 * memory, a warning is shown once so many findings after it wait. */
class text_writer : public writer {
public:
    text_writer(output written_to, const text_settings &wanted) : to(std::move(written_to)), settings(wanted) {}

    void begin_source(const std::string &name) override {
        file = name;
        ++sources;
    }
    void add(const check::finding &found) override {
        ++(found.error ? all.errors : all.warnings);
        faulty_sources += std::exchange(latest_faulty, sources) != sources ? 1 : 0;
        if (!found.error && settings.quiet)
            return;
        if (is_full() && found.error && waiting_warnings > 0)
            drop_warning();
        if (is_full())
            return;
        ++shown;
        waiting_warnings += found.error ? 0 : 1;
        waiting.push_back({file, found, {}});
        waiting.back().found.fix = {}; /* which may be large, and is not shown */
        write_certain();
    }
    void end_source(const check::totals & /* count */) override {
        write();
    }
    void fail_source(const std::string &why) override {
        waiting.push_back({file, {}, "cdef: " + text::escaped(why) + "\n"});
        write_certain();
        write();
    }
    void fail_output(const std::string & /* why */) override {}
    void close() override {
        for (; !waiting.empty(); waiting.pop_front())
            append(waiting.front());
        if (!settings.quiet && all.errors + all.warnings > 0)
            text += summary() + "\n";
        write();
    }

private:
    struct item {
        std::string file;
        check::finding found;
        std::string message; /* instead of a finding */
    };

    bool is_full() const {
        return settings.shown_max != 0 && shown >= settings.shown_max;
    }
    static bool is_warning(const item &each) {
        return each.message.empty() && !each.found.error;
    }
    /* The latest one. */
    void drop_warning() {
        auto latest = std::find_if(waiting.rbegin(), waiting.rend(), is_warning);
        waiting.erase(std::next(latest).base());
        --waiting_warnings;
        --shown;
    }
    void write_certain() {
        while (!waiting.empty() &&
               (settings.shown_max == 0 || !is_warning(waiting.front()) || waiting.size() > WAITING_MAX)) {
            append(waiting.front());
            waiting.pop_front();
        }
        if (text.size() >= PORTION)
            write();
    }
    void append(const item &each) {
        waiting_warnings -= is_warning(each) ? 1 : 0;
        if (!each.message.empty()) {
            text += each.message;
            return;
        }
        shown_finding form(each.file, settings.coloured);
        form.head(each.found);
        for (const check::note &more : each.found.notes)
            if (!more.text.starts_with(language::KNOWN_NAMES) || lists.insert(hash_of(more.text)).second)
                form.note(more);
        text += form.text;
    }
    void write() {
        if (!text.empty())
            to(std::exchange(text, {}));
    }
    std::string summary() const {
        std::string line = counted(all.errors, "error") + " and " + counted(all.warnings, "warning");
        if (sources > 1)
            line += " in " + std::to_string(faulty_sources) + " of " + counted(sources, "source");
        if (size_t hidden = all.errors + all.warnings - shown; hidden > 0)
            line += "; " + std::to_string(hidden) + " not shown (--max 0 shows all)";
        return line;
    }

    output to;
    text_settings settings;
    std::string file;
    std::deque<item> waiting;
    size_t waiting_warnings = 0;
    size_t shown = 0;              /* or waiting to be shown */
    std::set<std::uint64_t> lists; /* lists of known names that have been shown, because each is shown only once */
    size_t sources = 0;
    size_t latest_faulty = 0; /* the number of the latest source that has findings */
    size_t faulty_sources = 0;
    check::totals all;
    std::string text; /* not yet written */
};

} // namespace

std::string as_text(const std::string &file, const check::finding &found) {
    shown_finding form(file, false);
    form.head(found);
    for (const check::note &more : found.notes)
        form.note(more);
    return form.text;
}

std::unique_ptr<writer> text_form(output to, const text_settings &settings) {
    return std::make_unique<text_writer>(std::move(to), settings);
}

} // namespace report
