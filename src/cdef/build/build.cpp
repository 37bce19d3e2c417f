/* build.cpp: the subcommand that builds databases from sources. */

#include "cdef/build/build.h"

#include "build/dependencies.h"
#include "cdef/build/separate.h"
#include "cdef/build/workers.h"
#include "cdef/cdef.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/output.h"
#include "cdef/support/replacement.h"
#include "cdef/support/sources.h"
#include "cdef/support/status.h"

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <iterator>
#include <memory>
#include <set>
#include <sys/time.h>
#include <thread>
#include <utility>

namespace cdef {

namespace {

using build_command::build_run;
using build_command::outcome;

struct byte_order_row {
    std::string_view name;
    build::byte_order order;
};

constexpr byte_order_row byte_orders[] = {{"big", build::byte_order::big},
                                          {"both", build::byte_order::both},
                                          {"little", build::byte_order::little},
                                          {"native", build::byte_order::native}};

/* The name is one of them. */
build::byte_order byte_order_named(std::string_view name) {
    return std::find_if(std::begin(byte_orders), std::end(byte_orders),
                        [name](const byte_order_row &each) { return each.name == name; })
        ->order;
}

struct build_options {
    std::vector<std::string> operands;
    std::optional<std::string> file;
    std::optional<std::string> directory;
    std::optional<std::string> order;
    std::optional<std::string> timestamp;
    std::optional<std::string> depfile;
    unsigned jobs = std::max(1U, std::thread::hardware_concurrency());
    bool sync = false;
    bool list = false;
    finding_options findings;
};

std::optional<std::string> environment(const char *name) {
    const char *value = std::getenv(name);
    return value == nullptr ? std::nullopt : std::optional<std::string>(value);
}

orb_timeval32_t wanted_time(const build_options &options) {
    timeval now = {};
    gettimeofday(&now, nullptr);
    return build::time_of({.option = options.timestamp,
                           .environment = environment("SOURCE_DATE_EPOCH"),
                           .forced_empty = environment("VX_CDB_FORCE_EMPTY_TIMESTAMP").has_value()},
                          {static_cast<vx_uint32_t>(now.tv_sec), static_cast<vx_uint32_t>(now.tv_usec)});
}

/* The settings from the options or, where an option is missing, from the project file. */
build::naming naming_of(const build_options &options, const config::settings &settings) {
    std::string order = options.order.value_or(settings.byte_order.empty() ? "native" : settings.byte_order);
    build::naming how = {options.file, options.directory, byte_order_named(order)};
    if (!how.file && !how.directory && !settings.directory.empty())
        how.directory = settings.directory;
    return how;
}

/* The databases to be made, and the settings for them. */
struct assignment {
    std::vector<build::unit> units;
    std::vector<finding_rules> rules;  /* for each of them */
    std::set<std::string> directories; /* where databases go, if not beside their sources */
};

assignment assignment_of(const build_options &options) {
    project_files projects(options.findings.project);
    std::vector<build::request> requests;
    assignment all;
    std::vector<std::string> sources = sources_of(options.operands);
    for (const std::string &source : options.file ? sources : build_command::without_repetitions(sources)) {
        const config::settings &settings = projects.of(source);
        requests.push_back({source, naming_of(options, settings), settings.path});
        all.rules.push_back(options.findings.rules(settings));
        if (const auto &directory = requests.back().how.directory)
            all.directories.insert(*directory);
    }
    all.units = build::plan_of(requests);
    build_command::require_separate_files(all.units, options.depfile);
    return all;
}

void list_outputs(const std::vector<build::unit> &units) {
    std::string names;
    for (const build::unit &each : units)
        for (const build::output &made : each.outputs) {
            if (made.path.find('\n') != std::string::npos)
                throw failure("--list: " + made.path + ": the name has a newline");
            names.append(made.path).append("\n");
        }
    print(names);
}

void require_no_contradiction(const build_options &options) {
    if (options.file != "-")
        return;
    if (options.findings.form != "text")
        throw failure("-o - and --format " + options.findings.form + ": both would be written to standard output");
    if (options.depfile)
        throw failure("-o - and --depfile: standard output has no name for which dependencies could be written");
}

/* sync: waits until all directories that are made are on the disk. */
void make_directory(const std::string &path, bool sync) {
    namespace fs = std::filesystem;
    std::vector<std::string> new_ones;
    std::error_code error;
    for (fs::path at = path; sync && !at.empty() && !fs::exists(at, error); at = at.parent_path())
        new_ones.push_back(at.string());
    fs::create_directories(path, error);
    if (error)
        throw failure(path + ": " + error.message());
    for (const std::string &made : new_ones)
        sync_file(made);
}

int build_all(const build_options &options) {
    require_no_contradiction(options);
    auto [units, rules, directories] = assignment_of(options);
    if (options.list) {
        list_outputs(units);
        return OK;
    }
    std::string dependencies = options.depfile ? build::dependencies_of(units) : "";
    signal(SIGXFSZ, SIG_IGN); /* writing to a closed pipe or beyond a size limit then fails with an error instead of a
                               * signal */
    signal(SIGPIPE, SIG_IGN);
    if (options.depfile)
        remove_remains(target_of(*options.depfile));
    for (const std::string &directory : directories)
        make_directory(directory, options.sync);
    build_run run(
        units, {wanted_time(options), options.findings, std::move(rules), options.sync, options.depfile.has_value()});
    build_command::do_in_order<outcome>(
        units.size(), options.jobs, [&run](std::size_t index) { return run.make(index); },
        [&run](std::size_t index, outcome &&made) { run.show(index, std::move(made)); });
    int status = run.finish();
    if (status == OK && options.depfile)
        replace_file(*options.depfile, dependencies);
    return status;
}

int build_or_refuse(const build_options &options) {
    try {
        return build_all(options);
    } catch (const build::wrong_request &refused) {
        throw failure(refused.what());
    }
}

std::vector<std::string> names_of_orders() {
    std::vector<std::string> names(std::size(byte_orders));
    std::transform(std::begin(byte_orders), std::end(byte_orders), names.begin(),
                   [](const byte_order_row &each) { return std::string(each.name); });
    return names;
}

void add_options(command &to, build_options &options) {
    to.add("SOURCE", options.operands, "Source, or directory of sources (*.cdefsrc); - is standard input").required();
    option file = to.add("-o,--output", options.file, "The database; - is standard output").called("FILE");
    to.add("-d,--directory", options.directory, "Put all databases into DIRECTORY").called("DIRECTORY").excludes(file);
    to.add("--byte-order", options.order,
           "native, little, big or both: NAME.le.cdef and NAME.be.cdef (default: that of cdef.toml, or native)")
        .called("ORDER")
        .one_of(names_of_orders());
    to.add("--timestamp", options.timestamp,
           "Time in the database: none, now or SECONDS since 1970 (default: SOURCE_DATE_EPOCH, or none)")
        .called("TIME");
    to.add("--depfile", options.depfile, "Write the dependencies of the databases to FILE, for Make or Ninja")
        .called("FILE");
    to.add_number("-j,--jobs", options.jobs, build_command::MOST_JOBS,
                  "Compile this many sources at once (default: number of processors)");
    to.add_flag("--sync", options.sync, "Wait until each database is on the disk before it replaces the old one");
    to.add_flag("--list", options.list, "List the databases and build none");
    add_finding_options(to, options.findings);
}

} // namespace

void add_build(program &app) {
    auto options = std::make_shared<build_options>();
    command made =
        app.add("build", "Checks sources and builds their databases", [options] { return build_or_refuse(*options); });
    add_options(made, *options);
}

} // namespace cdef
