/* run.cpp: one run of the subcommand that builds databases from sources. */

#include "build/compile.h"
#include "build/dependencies.h"
#include "cdef/build/build.h"
#include "cdef/build/store.h"
#include "cdef/support/failure.h"
#include "cdef/support/replacement.h"

#include <cstdio>
#include <utility>

namespace cdef::build_command {

namespace {

size_t count_of_databases(const std::vector<build::unit> &units) {
    size_t count = 0;
    for (const build::unit &each : units)
        count += each.outputs.size();
    return count;
}

/* Done before anything can fail, so that the temporary file of a killed build is removed even if nothing is written. */
void clear_remains(const build::unit &what) {
    for (const build::output &made : what.outputs)
        if (made.path != "-")
            remove_remains(target_of(made.path));
}

} // namespace

build_run::build_run(const std::vector<build::unit> &all, run_options how)
    : units(all), options(std::move(how)), writer(options.findings.writer()), line(all.size()),
      databases(count_of_databases(all)) {}

outcome build_run::make(size_t index) const {
    outcome made;
    try {
        clear_remains(units[index]);
        make_databases(index, made);
    } catch (const check::cannot_check &unreadable) {
        made.unreadable = unreadable.what();
    } catch (const failure &unwritten) {
        made.unwritten.emplace_back(unwritten.what());
    }
    return made;
}

void build_run::make_databases(size_t index, outcome &made) const {
    const build::unit &what = units[index];
    const finding_rules &rules = options.rules[index];
    require_source(what.source);
    build::compiled result = build::compile(what, options.time, rules.wanted, [&made](check::finding &&found) {
        made.findings.push_back(std::move(found));
    });
    made.count = result.count;
    made.facts = std::move(result.facts);
    if (!rules.pass(made.count))
        return;
    for (size_t i = 0; i < what.outputs.size(); ++i) {
        try {
            stored how = store(result.images[i], what.outputs[i].path, what.source, options.sync);
            ++(how == stored::WRITTEN ? made.written : made.unchanged);
        } catch (const failure &unwritten) {
            made.unwritten.emplace_back(unwritten.what());
        }
    }
}

/* Conflicts with other classes are reported after the findings in the source itself. Its database has been written by
 * then. */
void build_run::show(size_t index, outcome &&made) {
    for (check::finding &found : family.add(units[index].source, made.facts, options.rules[index].wanted)) {
        made.findings.push_back(std::move(found));
        ++made.count.warnings;
    }
    if (options.with_depfile && options.rules[index].wanted[check::RULE_NAME])
        if (std::optional<check::finding> misread = build::misread_name_in(units[index])) {
            made.findings.push_back(std::move(*misread));
            ++made.count.warnings;
        }
    line.clear();
    writer->begin_source(units[index].source);
    for (const check::finding &found : made.findings)
        writer->add(found);
    for (const std::string &unwritten : made.unwritten)
        writer->fail_output(unwritten);
    if (made.unreadable.empty())
        writer->end_source(made.count);
    else
        options.findings.fail_source(*writer, made.unreadable);
    for (const std::string &unwritten : made.unwritten)
        print_error(unwritten);
    line.show(index + 1, units[index].source);
    written += made.written;
    unchanged += made.unchanged;
    all_pass = all_pass && options.rules[index].pass(made.count);
    no_fault = no_fault && made.unreadable.empty() && made.unwritten.empty();
}

int build_run::finish() {
    line.clear();
    writer->close();
    if (units.size() > 1 && options.findings.form == "text" && !options.findings.text.quiet)
        std::fprintf(stderr, "cdef: %zu databases: %zu written, %zu unchanged, %zu not made\n", databases, written,
                     unchanged, databases - written - unchanged);
    return !no_fault ? FAILED : all_pass ? OK : FOUND;
}

} // namespace cdef::build_command
