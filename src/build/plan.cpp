/* plan.cpp: plans which databases are made from which sources. */

#include "build/plan.h"

#include <filesystem>
#include <map>

namespace build {

namespace {

constexpr std::string_view STANDARD_STREAM = "-";
constexpr std::string_view SOURCE_SUFFIX = ".cdefsrc";
constexpr std::string_view SUFFIX = ".cdef";

/* With the slash. */
std::string_view directory_of(std::string_view path) {
    return path.substr(0, path.rfind('/') + 1);
}

std::string within(const std::string &directory, const std::string &name) {
    return directory + (directory.ends_with('/') ? "" : "/") + name;
}

std::string database_of(const std::string &source, const naming &how) {
    if (how.file)
        return *how.file;
    if (source == STANDARD_STREAM)
        throw wrong_request("standard input has no name: name the database with -o");
    std::string name = database_name_of(source);
    return how.directory ? within(*how.directory, name) : std::string(directory_of(source)) + name;
}

std::string with_order(const std::string &database, std::string_view order) {
    if (!database.ends_with(SUFFIX))
        throw wrong_request(database + ": with --byte-order both, the database's name must end in .cdef");
    return database.substr(0, database.size() - SUFFIX.size()) + std::string(order).append(SUFFIX);
}

std::vector<output> outputs_of(const std::string &database, byte_order order) {
    switch (order) {
    case byte_order::little:
        return {{database, std::endian::little}};
    case byte_order::big:
        return {{database, std::endian::big}};
    case byte_order::both:
        return {{with_order(database, ".le"), std::endian::little}, {with_order(database, ".be"), std::endian::big}};
    default:
        return {{database, std::endian::native}};
    }
}

void require_different(const std::vector<unit> &units) {
    std::map<std::string, const unit *> makers;
    for (const unit &each : units)
        for (const output &made : each.outputs) {
            auto [at, is_new] = makers.emplace(std::filesystem::path(made.path).lexically_normal().string(), &each);
            if (!is_new)
                throw wrong_request(made.path + ": it would be built from " + at->second->source + " and from " +
                                    each.source);
        }
}

} // namespace

std::string database_name_of(std::string_view source) {
    std::string_view name = source.substr(directory_of(source).size());
    if (name.ends_with(SOURCE_SUFFIX) && name.size() > SOURCE_SUFFIX.size())
        name.remove_suffix(SOURCE_SUFFIX.size());
    return std::string(name).append(SUFFIX);
}

std::vector<unit> plan_of(std::span<const request> requests) {
    if (requests.size() > 1 && requests.front().how.file)
        throw wrong_request("-o names one database, and there are " + std::to_string(requests.size()) +
                            " sources: use -d");
    std::vector<unit> units;
    for (const auto &[source, how, project_file] : requests) {
        std::string database = database_of(source, how);
        units.push_back({source, database, outputs_of(database, how.order), project_file});
    }
    require_different(units);
    return units;
}

} // namespace build
