/* gate.cpp: the subcommand that keeps a class from breaking those who rely on an older version of it. */

#include "cdef/cdef.h"
#include "cdef/gate/baseline.h"
#include "cdef/gate/ids_file.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/finding_options.h"
#include "cdef/support/input.h"
#include "cdef/support/sources.h"
#include "cdef/support/text_of_file.h"
#include "compare/writer.h"
#include "gate/compiled.h"
#include "gate/judge.h"

#include <algorithm>
#include <map>
#include <memory>
#include <optional>

namespace cdef {

namespace {

using gate_command::baseline;
using gate_command::ids_file;
using gate_command::older_version;

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

/* A database in memory that can be relied on. */
struct version {
    version(const std::string &name, std::vector<std::byte> bytes)
        : in(name, std::move(bytes)), owners(require_readable(in).owners) {}

    compare::origin origin() const {
        return {in.db, owners};
    }

    input in;
    cdb::ownership owners;
};

std::vector<std::byte> bytes_of(std::string_view text) {
    std::vector<std::byte> bytes(text.size());
    std::copy(text.begin(), text.end(), reinterpret_cast<char *>(bytes.data()));
    return bytes;
}

std::string_view text_of(const std::vector<std::byte> &bytes) {
    return {reinterpret_cast<const char *>(bytes.data()), bytes.size()};
}

/* "Disk" for "old/Disk.le.cdef". */
std::string stem_of(const std::string &path) {
    std::string name = path.substr(path.rfind('/') + 1);
    return name.substr(0, name.find(".cdef"));
}

/* The name of a class without one. It is called after its database, whose directory is not known here; so it has the
 * older version's name if that is called after its own file. */
std::string class_name_for(const std::string &path, const version *before) {
    std::string own = stem_of(path);
    if (before == nullptr)
        return own;
    std::string name;
    for (const auto &each : before->in.db.classes())
        name = each.name();
    std::string older = stem_of(name);
    return older == own || older == stem_of(before->in.name) ? name : own;
}

/* The older version as a database. A source is compiled; it may not have errors. */
std::unique_ptr<version> readable(older_version &&old) {
    if (!is_text(old.bytes))
        return std::make_unique<version>(old.name, std::move(old.bytes));
    gate::compiled made = gate::compile(text_of(old.bytes), old.name, stem_of(old.name));
    if (!made.findings.empty())
        throw failure(old.name + ": not a source that compiles; 'cdef check' says why");
    return std::make_unique<version>(old.name, std::move(made.image));
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

    std::vector<operand> operands();
    const baseline *baseline_for(const config::settings &settings);
    ids_file *ids_for(const config::settings &settings);
    void look_at(const operand &what, report::writer &form);
    check::totals judge(const operand &what, report::writer &form);
    std::vector<check::finding> breaches(const operand &what, const version &now, const version *before,
                                         std::string_view source) const;

    const gate_options &options;
    project_files projects;
    std::map<std::string, baseline> baselines; /* by what names them */
    std::map<std::string, ids_file> ids;       /* by path */
    bool pass = true;
    bool read = true;
};

const baseline *gate_run::baseline_for(const config::settings &settings) {
    std::string wanted = options.against.value_or(settings.baseline);
    return wanted.empty() ? nullptr : &baselines.try_emplace(wanted, wanted).first->second;
}

/* A file that nobody has named need not exist. */
ids_file *gate_run::ids_for(const config::settings &settings) {
    std::string path = options.ids.value_or(settings.ids);
    bool may_be_missing = options.update || path.empty();
    if (path.empty())
        path = "ids.lock";
    return &ids.try_emplace(path, path, may_be_missing).first->second;
}

std::vector<gate_run::operand> gate_run::operands() {
    std::vector<operand> all;
    for (const std::string &path : sources_of(options.operands)) {
        const config::settings &settings = projects.of(path);
        all.push_back({path, settings, baseline_for(settings), ids_for(settings)});
        const operand &last = all.back();
        if (last.against == nullptr && !last.ids->exists() && !options.update)
            throw failure(path + ": nothing to compare it with: name an older version with --against");
    }
    if (all.size() > 1 && all.front().against != nullptr && all.front().against->is_one_file())
        throw failure("--against names one file, and there are " + std::to_string(all.size()) + " classes");
    return all;
}

/* What breaks, in the order of the lines. */
std::vector<check::finding> gate_run::breaches(const operand &what, const version &now, const version *before,
                                               std::string_view source) const {
    std::string level = options.level.value_or(what.settings.level.empty() ? "readers" : what.settings.level);
    std::vector<check::finding> found;
    if (before != nullptr)
        found = gate::judge({before->origin(), now.origin(), source}, level_called(level));
    std::vector<gate::numbered> numbers = gate::numbers_of(now.in.db);
    if (options.update) {
        what.ids->accept(numbers);
    } else if (what.ids->exists()) {
        std::vector<check::finding> more = what.ids->record().judge(numbers, gate::source_places(source));
        found.insert(found.end(), std::make_move_iterator(more.begin()), std::make_move_iterator(more.end()));
    }
    std::stable_sort(found.begin(), found.end(),
                     [](const check::finding &a, const check::finding &b) { return a.at.line < b.at.line; });
    return found;
}

check::totals gate_run::judge(const operand &what, report::writer &form) {
    std::optional<older_version> old = what.against == nullptr ? std::nullopt : what.against->version_of(what.path);
    std::unique_ptr<version> before = old ? readable(std::move(*old)) : nullptr;
    std::string source = text_of_file(what.path);
    std::vector<std::byte> image = bytes_of(source);
    std::vector<check::finding> found;
    if (is_text(image) || image.empty()) {
        gate::compiled made = gate::compile(source, what.path, class_name_for(what.path, before.get()));
        image = std::move(made.image);
        found = std::move(made.findings);
    } else {
        source.clear();
    }
    if (found.empty())
        found = breaches(what, version(what.path, std::move(image)), before.get(), source);
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

int gate_run::run() {
    std::vector<operand> all = operands();
    std::unique_ptr<report::writer> form = options.findings.writer(rules());
    for (const operand &each : all)
        look_at(each, *form);
    form->close();
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
    made.add("--against", options->against, "The older version: a file, a directory, or git:REVISION[:PATH]");
    made.add("--level", options->level, "What relies on it; each level includes those before")
        .one_of({"readers", "clients", "stored"});
    made.add("--ids", options->ids, "File of all numbers that have been in use; the default is ids.lock");
    made.add_flag("--update", options->update, "Record the numbers in that file, even those that contradict it");
    add_report_options(made, options->findings);
    add_project_rules(made, options->findings);
}

} // namespace cdef
