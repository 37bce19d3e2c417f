/* gate.cpp: the subcommand that keeps a class from breaking those who rely on an older version of it. */

#include "cdef/cdef.h"
#include "cdef/gate/baseline.h"
#include "cdef/gate/former.h"
#include "cdef/gate/ids_file.h"
#include "cdef/gate/version.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/finding_options.h"
#include "cdef/support/sources.h"
#include "cdef/support/text_of_file.h"
#include "compare/writer.h"
#include "gate/compiled.h"
#include "gate/judge.h"

#include <algorithm>
#include <filesystem>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <utility>

namespace cdef {

namespace {

namespace fs = std::filesystem;
using gate_command::baseline;
using gate_command::bytes_of;
using gate_command::ids_file;
using gate_command::older_version;
using gate_command::stem_of;
using gate_command::version;

struct gate_options {
    std::vector<std::string> operands;
    std::optional<std::string> against;
    std::optional<std::string> level;
    std::optional<std::string> ids;
    bool update = false;
    finding_options findings;
};

/* The command line refuses names of no level. */
compare::level level_called(std::string_view name) {
    for (compare::level each : compare::levels)
        if (compare::name_of(each) == name)
            return each;
    return compare::level::READERS;
}

/* The name of a class without one. It is called after its database, whose directory is not known here; so it has the
 * older version's name if that is called after its own file. */
std::string class_name_for(const std::string &path, const version *before) {
    std::string own = stem_of(path);
    if (before == nullptr)
        return own;
    std::vector<std::string> names = before->class_names();
    std::string name = names.empty() ? "" : names.back();
    std::string older = stem_of(name);
    return older == own || older == stem_of(before->in.name) ? name : own;
}

/* The rules that findings of this subcommand may break. */
std::vector<report::rule> rules() {
    std::vector<report::rule> all;
    for (const compare::breach_rule &each : compare::breach_rules())
        all.push_back({each.code, {}, each.title, each.reason, std::string(each.reason), true});
    for (const gate::ids_rule &each : gate::ids_rules())
        all.push_back(
            {each.code, each.name, each.title, each.cause, report::help_of(each.cause, each.cure), each.name.empty()});
    return all;
}

/* Numbers are recorded beside the project file; without one, beside the source. */
std::string default_ids(const std::string &source, const config::settings &settings) {
    return (fs::path(settings.path.empty() ? source : settings.path).parent_path() / "ids.lock").string();
}

/* One run of the subcommand. */
class gate_run {
public:
    explicit gate_run(const gate_options &given) : options(given), projects(given.findings.project) {}

    /* Returns the exit status. */
    int run();

private:
    struct operand {
        std::string path;
        const config::settings &settings;
        const baseline *against; /* null: it is not compared */
        ids_file *ids;
    };

    void find_operands();
    void add_operand(const std::string &path, const std::string &directory);
    void refuse_one_file_for_many() const;
    void look_for_former();
    const baseline *baseline_for(const config::settings &settings);
    ids_file *ids_for(const std::string &source, const config::settings &settings);
    void look_at(const operand &what, report::writer &form);
    void report_former(report::writer &form);
    void mention_unused_directories() const;
    const version *last_under_another_name(const operand &what, const version &now);
    check::totals judge(const operand &what, report::writer &form);
    static std::vector<gate::numbered> numbers_of(const operand &what, const std::string &named_after,
                                                  const version &now, std::string_view source);
    std::vector<check::finding> breaches(const operand &what, const std::string &named_after, const version &now,
                                         const version *before, std::string_view source) const;

    const gate_options &options;
    project_files projects;
    std::map<std::string, baseline> baselines; /* by what names them */
    std::set<const baseline *> used;           /* that have an older version of a class */
    std::map<std::string, ids_file> ids;       /* by path */
    std::vector<operand> operands;
    std::set<std::string> compared; /* absolute paths of the operands */
    /* The sources in each directory that was given, and what they are compared with. */
    std::map<std::pair<std::string, const baseline *>, std::vector<std::string>> directories;
    gate_command::former_files former;  /* in the directories that were given */
    gate_command::former_files renamed; /* elsewhere; only for classes that are new */
    std::set<std::string> classes;      /* names of those that are there */
    bool pass = true;
    bool read = true;
};

const baseline *gate_run::baseline_for(const config::settings &settings) {
    std::string wanted = options.against.value_or(settings.baseline);
    if (options.against && wanted.empty())
        throw failure("--against: expected a file, a directory, or git:REVISION");
    return wanted.empty() ? nullptr : &baselines.try_emplace(wanted, wanted).first->second;
}

/* The default file need not exist, but one that is named must. */
ids_file *gate_run::ids_for(const std::string &source, const config::settings &settings) {
    std::string path = options.ids.value_or(settings.ids);
    if (options.ids && path.empty())
        throw failure("--ids: expected a file");
    bool may_be_missing = options.update || path.empty();
    if (path.empty())
        path = default_ids(source, settings);
    std::error_code error;
    return &ids.try_emplace(fs::weakly_canonical(path, error).string(), path, may_be_missing).first->second;
}

/* directory: that was given, and in which the source is; empty: the source was given itself. */
void gate_run::add_operand(const std::string &path, const std::string &directory) {
    const config::settings &settings = projects.of(path);
    const baseline *against = baseline_for(settings);
    if (path == "-" && against != nullptr && against->goes_by_file_names())
        throw failure("standard input has no file name by which to find its older version: compare it with a file");
    if (!directory.empty() && against != nullptr)
        directories[{directory, against}].push_back(path);
    std::error_code error;
    if (!compared.insert(path == "-" ? path : fs::absolute(path, error).lexically_normal().string()).second)
        return;
    operands.push_back({path, settings, against, ids_for(path, settings)});
    if (against == nullptr && !operands.back().ids->exists() && !options.update)
        throw failure(path + ": nothing to compare it with: name an older version with --against");
}

void gate_run::refuse_one_file_for_many() const {
    std::map<const baseline *, std::size_t> counts;
    for (const operand &each : operands)
        ++counts[each.against];
    for (const operand &each : operands)
        if (std::size_t count = std::exchange(counts[each.against], 0); /* each baseline once */
            count > 1 && each.against != nullptr && each.against->is_one_file(each.path))
            throw failure("--against names one file, and there are " + std::to_string(count) + " classes");
}

void gate_run::find_operands() {
    for (const std::string &each : options.operands) {
        std::error_code error;
        std::string directory = each != "-" && fs::is_directory(each, error) ? each : "";
        for (const std::string &path : sources_of({each}))
            add_operand(path, directory);
    }
    refuse_one_file_for_many();
}

/* Only a directory says that what is not in it is gone. */
void gate_run::look_for_former() {
    std::vector<std::string> paths;
    for (const operand &each : operands)
        paths.push_back(each.path);
    for (const auto &[where, there] : directories)
        former.look_for(*where.second, where.first, there, paths);
}

/* A class without a name is recorded under that of its file, not under the name that an older version has given it. */
std::vector<gate::numbered> gate_run::numbers_of(const operand &what, const std::string &named_after,
                                                 const version &now, std::string_view source) {
    std::string own = stem_of(what.path);
    if (source.empty() || named_after == own)
        return gate::numbers_of(now.in.db);
    version again(what.path, gate::compile(source, what.path, own).image);
    return gate::numbers_of(again.in.db);
}

/* What breaks, in the order of the lines. */
std::vector<check::finding> gate_run::breaches(const operand &what, const std::string &named_after, const version &now,
                                               const version *before, std::string_view source) const {
    std::string level = options.level.value_or(what.settings.level.empty() ? "readers" : what.settings.level);
    std::vector<check::finding> found;
    if (before != nullptr)
        found = gate::judge({before->origin(), now.origin(), source}, level_called(level));
    std::vector<check::finding> more;
    if (options.update && found.empty())
        more = what.ids->accept(numbers_of(what, named_after, now, source), gate::source_places(source));
    else if (!options.update && what.ids->exists())
        more = what.ids->record().judge(numbers_of(what, named_after, now, source), gate::source_places(source));
    found.insert(found.end(), std::make_move_iterator(more.begin()), std::make_move_iterator(more.end()));
    std::stable_sort(found.begin(), found.end(),
                     [](const check::finding &a, const check::finding &b) { return a.at.line < b.at.line; });
    return found;
}

/* The older version of a class that has a new file; null if there is none. */
const version *gate_run::last_under_another_name(const operand &what, const version &now) {
    const version *last = former.last_of(*what.against, now);
    if (last == nullptr) {
        renamed.look_around(*what.against, what.path);
        last = renamed.last_of(*what.against, now);
    }
    if (last != nullptr)
        used.insert(what.against);
    return last;
}

check::totals gate_run::judge(const operand &what, report::writer &form) {
    std::optional<older_version> old = what.against == nullptr ? std::nullopt : what.against->version_of(what.path);
    if (old)
        used.insert(what.against);
    std::unique_ptr<version> before = old ? readable(std::move(*old)) : nullptr;
    std::string source = text_of_file(what.path);
    std::string named_after = class_name_for(what.path, before.get());
    std::vector<std::byte> image = bytes_of(source);
    std::vector<check::finding> found;
    if (is_text(image) || image.empty()) {
        gate::compiled made = gate::compile(source, what.path, named_after);
        image = std::move(made.image);
        found = std::move(made.findings);
    } else {
        source.clear();
    }
    if (found.empty()) {
        version now(what.path, std::move(image));
        for (std::string &name : now.class_names())
            classes.insert(std::move(name));
        bool is_new = what.against != nullptr && before == nullptr;
        const version *last = is_new ? last_under_another_name(what, now) : before.get();
        found = breaches(what, named_after, now, last, source);
    }
    check::totals count;
    for (const check::finding &each : found) {
        form.add(each);
        ++(each.error ? count.errors : count.warnings);
    }
    return count;
}

void gate_run::look_at(const operand &what, report::writer &form) {
    form.begin_source(what.path);
    try {
        check::totals count = judge(what, form);
        form.end_source(count);
        pass = pass && options.findings.rules(what.settings).pass(count);
        return;
    } catch (const failure &unreadable) {
        options.findings.fail_source(form, unreadable.what());
    } catch (const check::cannot_check &unreadable) {
        options.findings.fail_source(form, unreadable.what());
    } catch (const compare::too_entangled &refused) {
        options.findings.fail_source(form, what.path + ": " + refused.what());
    }
    read = false;
}

/* Reports the classes that are gone, and the files that cannot be read. */
void gate_run::report_former(report::writer &form) {
    for (const gate_command::former_file &each : former.all()) {
        check::totals count;
        if (each.last == nullptr) {
            form.begin_source(each.path);
            options.findings.fail_source(form, each.problem);
            read = false;
            continue;
        }
        for (const std::string &name : each.last->class_names()) {
            if (classes.contains(name))
                continue;
            if (count.errors++ == 0)
                form.begin_source(each.path);
            form.add(gate::without_class(name));
        }
        if (count.errors > 0)
            form.end_source(count);
        pass = pass && count.errors == 0;
    }
}

/* Such a directory may be the wrong one, or be empty because a download has failed. */
void gate_run::mention_unused_directories() const {
    if (!read || options.findings.text.quiet)
        return;
    for (const auto &[name, each] : baselines)
        if (each.is_one_directory() && !used.contains(&each) && !former.has_files_of(each))
            print_error(name + ": has no older version of any of the classes, which all count as new");
}

int gate_run::run() {
    find_operands();
    look_for_former();
    std::unique_ptr<report::writer> form = options.findings.writer(rules());
    for (const operand &each : operands)
        look_at(each, *form);
    report_former(*form);
    form->close();
    mention_unused_directories();
    if (options.update)
        for (const auto &[path, file] : ids)
            file.save();
    return !read ? FAILED : pass ? OK : FOUND;
}

} // namespace

void add_gate(program &app) {
    auto options = std::make_shared<gate_options>();
    command made = app.add("gate", "Reports what breaks programs or data that rely on an older version of a class",
                           [options] { return gate_run(*options).run(); });
    made.add("SOURCE", options->operands,
             "Source or database, or directory of sources (*.cdefsrc); - is standard input")
        .required();
    made.add("--against", options->against, "The older version: a file, a directory, or git:REVISION[:PATH]")
        .called("VERSION");
    made.add("--level", options->level,
             "What relies on the older version; each level includes those before it (default: that of cdef.toml, or "
             "readers)")
        .called("LEVEL")
        .one_of({"readers", "clients", "stored"});
    made.add("--ids", options->ids,
             "File of all numbers that have been in use (default: that of cdef.toml, or ids.lock beside cdef.toml or "
             "the source)")
        .called("FILE");
    made.add_flag("--update", options->update, "Record the numbers in that file, even those that contradict it");
    add_report_options(made, options->findings);
    add_project_rules(made, options->findings);
}

} // namespace cdef
