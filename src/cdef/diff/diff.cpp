/* diff.cpp: the subcommand that shows what differs between two databases, and for whom it matters. */

#include "cdef/cdef.h"
#include "cdef/diff/document.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "compare/describe.h"

#include <algorithm>
#include <memory>

namespace cdef {

namespace {

using compare::change;
using compare::difference;

struct diff_options {
    std::string before;
    std::string after;
    std::string compat; /* show only differences that break rules up to this level; empty: show all differences */
    std::string form;
};

/* ---- Output ---------------------------------------------------------------------------------------------------- */

/* Writes text to standard output. The beginning is held back until it is certain that the comparison succeeds, because
 * half a comparison would mislead. */
class held_output {
public:
    void take(std::string_view piece) {
        if (is_open) {
            out.text += piece;
            return out.flush_if_full();
        }
        if (!is_too_long && out.text.size() + piece.size() <= KEPT)
            out.text += piece;
        else
            is_too_long = true;
    }
    /* True if there was more output than is kept. */
    bool has_lost() const {
        return is_too_long;
    }
    /* Discards the kept output; from now on everything is written. */
    void begin_again() {
        out.text.clear();
        is_open = true;
    }
    void finish() {
        out.flush();
    }

private:
    static constexpr std::size_t KEPT = 1 << 20; /* bytes */

    output out;
    bool is_open = false;
    bool is_too_long = false;
};

/* ---- Forms ----------------------------------------------------------------------------------------------------- */

/* The rules that a difference breaks, if they are to be shown. */
diff::reasons rules_broken(const difference &d, compare::level up_to) {
    diff::reasons rules;
    for (compare::breach b : d.broken)
        if (const compare::breach_rule &rule = compare::rule_of(b); rule.broken_for <= up_to)
            rules.push_back(&rule);
    return rules;
}

/* Differences as lines of text. */
class lines {
public:
    lines(held_output &to, std::size_t size, bool has_one_class)
        : out(to), writer(size, [&to](std::string_view piece) { to.take(piece); }), one_class(has_one_class) {}

    /* Standard error has the mentions. */
    void begin(const std::string & /* before */, const std::string & /* after */) {}
    void mention_version(const difference & /* d */) {}
    void mention_order(std::endian /* before */, std::endian /* after */) {}
    void end() {}

    void add(const difference &d, const diff::reasons &why) {
        compare::describe(d, one_class, writer);
        for (const compare::breach_rule *rule : why)
            out.take(std::string(rule == why.front() ? " (" : "; ").append(rule->reason));
        out.take(why.empty() ? "\n" : ")\n");
    }

private:
    held_output &out;
    compare::writer writer;
    bool one_class;
};

/* ---- The comparison -------------------------------------------------------------------------------------------- */

/* A database that is compared. */
struct compared {
    explicit compared(const std::string &path) : in(path), owners(require_readable_aloud(in).owners) {}

    compare::origin origin() const {
        return {in.db, owners};
    }
    input in;
    cdb::ownership owners;
};

/* Without a level the option is "true". */
std::optional<compare::level> level_of(const std::string &option) {
    auto found = std::find_if(std::begin(compare::levels), std::end(compare::levels),
                              [&option](compare::level l) { return compare::name_of(l) == option; });
    if (found == std::end(compare::levels))
        return option == "true" ? std::optional(compare::level::READERS) : std::nullopt;
    return *found;
}

std::string check_level(const std::string &option) {
    return level_of(option) ? "" : "'" + option + "' is not readers, clients or stored";
}

struct outcome {
    bool found = false;                /* true: there was a difference that is shown */
    std::vector<std::string> mentions; /* worth mentioning, but not counted as a difference */
};

/* Programs that map a database depend on its byte order, and programs that choose between two compare their versions.
 */
std::string mention_of_order(const compared &before, const compared &after) {
    return after.in.name + ": the other byte order than " + before.in.name;
}

std::string mention_of_version(const difference &d, const compared &before, const compared &after) {
    return after.in.name + ": a lower version than " + before.in.name + ": " + text_of(*d.before) + " -> " +
           text_of(*d.after);
}

template <class Form>
outcome write_differences(const compared &before, const compared &after, const diff_options &options, Form &form) {
    outcome came;
    compare::level up_to = level_of(options.compat).value_or(compare::level::STORED);
    form.begin(options.before, options.after);
    compare::compare(before.origin(), after.origin(), [&](const difference &d) {
        if (d.what == change::CHANGED && is_lower_version(*d.before, *d.after)) {
            came.mentions.push_back(mention_of_version(d, before, after));
            form.mention_version(d);
        }
        auto reasons = rules_broken(d, up_to);
        if (!options.compat.empty() && reasons.empty())
            return;
        came.found = true;
        if (options.compat.empty() && options.form != "json")
            reasons.clear();
        form.add(d, reasons);
    });
    if (before.in.db.order() != after.in.db.order()) {
        came.mentions.push_back(mention_of_order(before, after));
        form.mention_order(before.in.db.order(), after.in.db.order());
    }
    form.end();
    return came;
}

outcome write_to(held_output &out, const compared &before, const compared &after, const diff_options &options) {
    std::size_t size = before.in.contents.size() + after.in.contents.size();
    if (options.form == "json") {
        diff::document form([&out](std::string_view piece) { out.take(piece); }, size);
        return write_differences(before, after, options, form);
    }
    bool one_class = compare::has_one_class(before.in.db) && compare::has_one_class(after.in.db);
    lines form(out, size, one_class);
    return write_differences(before, after, options, form);
}

/* The output of a long comparison is not kept. When the comparison is known to succeed, it is done again. */
int run(const diff_options &options) {
    if (options.before == "-" && options.after == "-")
        throw failure("only one of the two can be standard input");
    compared before(options.before), after(options.after);
    held_output out;
    outcome came;
    try {
        came = write_to(out, before, after, options);
    } catch (const compare::too_entangled &e) {
        throw failure(options.before + ", " + options.after + ": " + e.what());
    }
    for (const std::string &mention : came.mentions)
        print_error(mention);
    if (out.has_lost()) {
        out.begin_again();
        write_to(out, before, after, options);
    }
    out.finish();
    return came.found ? FOUND : OK;
}

} // namespace

void add_diff(program &app) {
    auto options = std::make_shared<diff_options>();
    command made = app.add("diff", "Shows how two databases differ in meaning, not in layout",
                           [options] { return run(*options); });
    made.add("A", options->before, "First database; - is standard input").required();
    made.add("B", options->after, "Second database; - is standard input").required();
    made.add_flag("--compat", options->compat,
                  "Show only differences that break programs or data that rely on A, and why; each level includes "
                  "those before it, readers is the default")
        .checked(check_level)
        .shown_as("[=LEVEL:{readers,clients,stored}]");
    add_forms(made, options->form, {"text", "json"}, "Form of the differences: text or json");
}

} // namespace cdef
