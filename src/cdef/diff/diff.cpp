/* diff.cpp: what differs between two databases, and whether readers of the one can read the other. */

#include "cdef/cdef.h"
#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "compare/compare.h"
#include "compare/text.h"
#include "report/json_writer.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <memory>
#include <span>

namespace cdef {

namespace {

using compare::change;
using compare::difference;
using compare::node;
using compare::node_kind;

struct diff_options {
    std::string before;
    std::string after;
    bool compat = false; /* only what breaks readers */
    std::string form;
};

const char *name_of(change what) {
    return what == change::removed ? "removed" : what == change::added ? "added" : "changed";
}

char sign_of(change what) {
    return what == change::removed ? '-' : what == change::added ? '+' : '~';
}

bool has_one_class(const node &database) {
    return std::count_if(database.parts.begin(), database.parts.end(),
                         [](const node &n) { return n.kind == node_kind::resource_class; }) == 1;
}

/* The part of a path that a line shows: neither the database nor, if there is just one, the class. */
std::vector<const node *> shown_path(const difference &d, bool one_class) {
    std::size_t skipped = d.path.size() == 1                                                               ? 0
                          : d.path.size() > 2 && one_class && d.path[1]->kind == node_kind::resource_class ? 2
                                                                                                           : 1;
    return {d.path.begin() + static_cast<std::ptrdiff_t>(skipped), d.path.end()};
}

std::string line_of(const difference &d, bool one_class, bool with_reason) {
    std::string line = {sign_of(d.what), ' '};
    bool first = true;
    for (const node *n : shown_path(d, one_class)) {
        line += std::exchange(first, false) ? "" : ", ";
        line.append(n->label()).append(n->name.empty() ? "" : " ").append(n->name);
    }
    if (d.what == change::changed)
        line += ": " + std::string(d.before->what->label()) + " " + d.before->text + " -> " + d.after->text;
    if (with_reason)
        line += " (" + std::string(breach(d)) + ")";
    return line + "\n";
}

/* Adds a difference to a list. */
void add_difference(report::json_writer &to, const difference &d) {
    to.open_object();
    to.add_text("change", name_of(d.what));
    to.open_list("path");
    for (const node *n : std::span(d.path).subspan(1)) { /* the first is the database */
        to.open_object();
        to.add_text("kind", n->label());
        to.add_text("name", n->name);
        to.close();
    }
    to.close();
    if (d.what == change::changed) {
        to.add_text("field", d.before->what->field);
        to.add_text("before", d.before->text);
        to.add_text("after", d.after->text);
    }
    if (!breach(d).empty())
        to.add_text("breaks", breach(d));
    to.close();
}

void show_json(const diff_options &options, const std::vector<difference> &found) {
    report::json_writer to(print);
    to.open_object();
    to.add_schema("cdef-diff.schema.json", 1);
    to.add_text("before", options.before);
    to.add_text("after", options.after);
    to.open_list("differences");
    for (const difference &d : found)
        add_difference(to, d);
    to.close();
    to.close();
}

void show_text(const std::vector<difference> &found, bool one_class, bool with_reason) {
    output out;
    for (const difference &d : found) {
        out.text += line_of(d, one_class, with_reason);
        out.flush_if_full();
    }
    out.flush();
}

node read(const std::string &path, std::unique_ptr<input> &in) {
    in = std::make_unique<input>(path);
    cdb::ownership owners = require_readable_aloud(*in).owners;
    try {
        return compare::meaning_of(in->db, owners);
    } catch (const compare::too_entangled &e) {
        throw failure(path + ": " + e.what());
    }
}

int diff(const diff_options &options) {
    if (options.before == "-" && options.after == "-")
        throw failure("only one of the two can be standard input");
    std::unique_ptr<input> in_before, in_after;
    node before = read(options.before, in_before);
    node after = read(options.after, in_after);
    std::vector<difference> found = compare::differences(before, after);
    if (options.compat)
        std::erase_if(found, [](const difference &d) { return breach(d).empty(); });
    if (options.form == "json")
        show_json(options, found);
    else
        show_text(found, has_one_class(before) && has_one_class(after), options.compat);
    return found.empty() ? OK : FOUND;
}

} // namespace

void add_diff(CLI::App &app, int &status) {
    auto options = std::make_shared<diff_options>();
    CLI::App *command = app.add_subcommand("diff", "Shows how two databases differ in meaning, not in layout");
    command->add_option("A", options->before, "First database; - is standard input")->required();
    command->add_option("B", options->after, "Second database; - is standard input")->required();
    command->add_flag("--compat", options->compat,
                      "Show only what keeps programs written for A from reading B, and why");
    add_forms(*command, options->form, {"text", "json"}, "Form of the differences: text or json");
    command->footer("Exit status: 0 if they are the same (with --compat: if programs written for A can read B), 1 if "
                    "not, 2 if a database cannot be read.");
    command->callback([options, &status] { status = diff(*options); });
}

} // namespace cdef
