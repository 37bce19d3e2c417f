/* baseline.cpp: where the older versions of classes come from. */

#include "cdef/gate/baseline.h"

#include "build/plan.h"
#include "cdb_view.h"
#include "cdef/gate/git.h"
#include "cdef/support/failure.h"

#include <cstring>
#include <filesystem>
#include <string_view>
#include <system_error>

namespace cdef::gate_command {

namespace {

namespace fs = std::filesystem;

constexpr std::string_view GIT = "git:";

std::vector<std::byte> bytes_of(const std::string &text) {
    std::vector<std::byte> bytes(text.size());
    std::memcpy(bytes.data(), text.data(), text.size());
    return bytes;
}

older_version version_in(const std::string &file) {
    std::error_code error;
    std::vector<std::byte> bytes = cdb::read_file(file.c_str(), error);
    if (error)
        throw failure(file + ": " + error.message());
    return {file, std::move(bytes)};
}

std::string without(std::string name, std::string_view end) {
    if (name.ends_with(end))
        name.resize(name.size() - end.size());
    return name;
}

/* The output of git without its newline. */
std::string line_of(std::string output) {
    return without(std::move(output), "\n");
}

} // namespace

std::vector<std::string> names_for(const std::string &path) {
    std::string own = fs::path(path).filename().string();
    std::string stem = without(without(own, "src"), ".cdef");
    return {stem + ".cdef", stem + ".le.cdef", stem + ".be.cdef", stem + ".cdefsrc", own};
}

baseline::baseline(std::string wanted) : kind(kinds::FILE), place(std::move(wanted)) {
    if (place.starts_with(GIT)) {
        std::string rest = place.substr(GIT.size());
        std::size_t colon = rest.find(':');
        kind = colon == std::string::npos ? kinds::REVISION : kinds::REVISION_PATH;
        revision = rest.substr(0, colon);
        place = colon == std::string::npos ? "" : rest.substr(colon + 1);
        if (revision.empty() || revision.starts_with('-'))
            throw failure("--against git:" + rest + ": not a revision");
        return;
    }
    std::error_code error;
    fs::file_status is = fs::status(place, error);
    if (!fs::exists(is))
        throw failure(place + ": " + (error ? error.message() : "No such file or directory"));
    if (fs::is_directory(is))
        kind = kinds::DIRECTORY;
}

std::optional<older_version> baseline::version_of(const std::string &path) const {
    if (kind == kinds::FILE)
        return version_in(place);
    return kind == kinds::DIRECTORY ? in_directory(path) : in_revision(path);
}

std::optional<older_version> baseline::in_directory(const std::string &path) const {
    std::error_code error;
    for (const std::string &name : names_for(path))
        if (fs::path file = fs::path(place) / name; fs::is_regular_file(file, error))
            return version_in(file.string());
    return std::nullopt;
}

std::optional<older_version> baseline::in_revision(const std::string &path) const {
    std::string directory = fs::path(path).parent_path().string();
    if (!git(directory, {"rev-parse", "--verify", "--quiet", revision + "^{tree}"}))
        throw failure(path + ": no git repository has it, or its repository has no revision " + revision);
    std::vector<std::string> candidates;
    if (kind == kinds::REVISION) {
        candidates.push_back("./" + fs::path(path).filename().string());
    } else if (line_of(git(directory, {"cat-file", "-t", revision + ":" + place}).value_or("")) == "tree") {
        for (const std::string &name : names_for(path))
            candidates.push_back(place + (place.empty() || place.ends_with('/') ? "" : "/") + name);
    } else {
        candidates.push_back(place);
    }
    for (const std::string &each : candidates)
        if (std::optional<std::string> text = git(directory, {"cat-file", "blob", revision + ":" + each}))
            return older_version{GIT.data() + revision + ":" + each, bytes_of(*text)};
    if (kind == kinds::REVISION_PATH && candidates.front() == place)
        throw failure("git:" + revision + ":" + place + ": no such file or directory at that revision");
    return std::nullopt;
}

} // namespace cdef::gate_command
