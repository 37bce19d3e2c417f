/* baseline.cpp: where the older versions of classes come from. */

#include "cdef/gate/baseline.h"

#include "cdb_view.h"
#include "cdef/gate/revision.h"
#include "cdef/support/failure.h"

#include <algorithm>
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
    if (bytes.empty())
        throw failure(file + ": the file is empty");
    return {file, std::move(bytes)};
}

std::string without(std::string name, std::string_view end) {
    if (name.ends_with(end))
        name.resize(name.size() - end.size());
    return name;
}

std::string without_dots(const fs::path &path) {
    return path.lexically_normal().string();
}

/* True if a file or one of the directories that lead to it is hidden. */
bool is_hidden(const fs::path &below) {
    return std::any_of(below.begin(), below.end(), [](const fs::path &part) { return part.string().starts_with('.'); });
}

bool is_source(std::string_view name) {
    return name.ends_with(".cdefsrc");
}

/* A link that leads nowhere or to itself counts as a file, so that it is reported as one that cannot be read. */
bool may_be_file(const fs::path &path) {
    std::error_code error;
    return fs::is_regular_file(path, error) || (fs::is_symlink(path, error) && !fs::exists(path, error));
}

std::vector<std::string> files_in(const std::string &directory) {
    std::vector<std::string> names;
    try {
        for (const fs::directory_entry &each : fs::directory_iterator(directory))
            if (may_be_file(each.path()))
                names.push_back(each.path().filename().string());
    } catch (const fs::filesystem_error &e) {
        throw failure(directory + ": " + e.code().message());
    }
    std::sort(names.begin(), names.end());
    return names;
}

/* The names, without directory, that an older version of a file may have, the likeliest one first. */
std::vector<std::string> names_of(const std::string &path) {
    std::string own = fs::path(path).filename().string();
    std::string stem = without(without(own, "src"), ".cdef");
    std::vector<std::string> names = {stem + ".cdef", stem + ".le.cdef", stem + ".be.cdef", stem + ".cdefsrc", own};
    for (std::string_view order : {".le", ".be"})
        if (own.ends_with(std::string(order) + ".cdef")) {
            std::string base = without(stem, order);
            for (std::string_view end : {".cdef", ".le.cdef", ".be.cdef", ".cdefsrc"})
                names.push_back(base + std::string(end));
        }
    return names;
}

} // namespace

baseline::baseline(std::string wanted) : kind(kinds::FILE), place(std::move(wanted)) {
    if (place.starts_with(GIT)) {
        std::string rest = place.substr(GIT.size());
        std::size_t colon = rest.find(':');
        kind = colon == std::string::npos ? kinds::REVISION : kinds::REVISION_PATH;
        revision_name = rest.substr(0, colon);
        place = colon == std::string::npos ? "" : rest.substr(colon + 1);
        if (revision_name.empty() || revision_name.starts_with('-'))
            throw failure("--against git:" + rest + ": not a revision");
        if (kind == kinds::REVISION_PATH && place.empty())
            throw failure("--against git:" + rest +
                          ": expected a path after the second colon; ./ is the class's directory");
        return;
    }
    std::error_code error;
    fs::file_status is = fs::status(place, error);
    if (!fs::exists(is))
        throw failure(place + ": " + (error ? error.message() : "No such file or directory"));
    if (fs::is_directory(is))
        kind = kinds::DIRECTORY;
    else if (!fs::is_regular_file(is)) /* a device may have no end, and a pipe no writer */
        throw failure(place + ": not a regular file");
}

bool baseline::is_one_file(const std::string &path) const {
    if (kind != kinds::REVISION_PATH)
        return kind == kinds::FILE;
    revision at(revision_name, fs::path(path).parent_path().string(), path);
    std::optional<revision::entry> named = at.find(place);
    return named && !named->is_directory;
}

std::optional<older_version> baseline::version_of(const std::string &path) const {
    if (kind == kinds::FILE)
        return version_in(place);
    return kind == kinds::DIRECTORY ? in_directory(path) : in_revision(path);
}

std::optional<older_version> baseline::in_directory(const std::string &path) const {
    for (const std::string &name : names_of(path))
        if (fs::path file = fs::path(place) / name; may_be_file(file))
            return version_in(file.string());
    return std::nullopt;
}

std::string baseline::name_in_revision(const std::string &path) const {
    return std::string(GIT) + revision_name + ":" + path;
}

std::optional<older_version> baseline::in_revision(const std::string &path) const {
    revision at(revision_name, fs::path(path).parent_path().string(), path);
    if (!at.has_commit())
        return std::nullopt;
    std::vector<std::string> candidates = {place};
    std::optional<revision::entry> named;
    if (kind == kinds::REVISION) {
        candidates = {"./" + fs::path(path).filename().string()};
    } else if (named = at.find(place); named && named->is_directory) {
        candidates = names_of(path);
        for (std::string &each : candidates)
            each.insert(0, within_place());
    } else if (!named) {
        throw failure(name_in_revision(place) + ": no such file or directory at that revision");
    }
    for (const std::string &each : candidates)
        if (auto file = at.find(each); file && !file->is_directory)
            return older_version{name_in_revision(each), bytes_of(at.contents_of(*file, each))};
    return std::nullopt;
}

/* Below the directory, with a slash; for a path at a revision or another directory, directly in that. */
std::vector<std::string> baseline::names_for(const std::string &directory) const {
    if (kind == kinds::FILE)
        return {};
    if (kind == kinds::DIRECTORY)
        return files_in(place);
    revision at(revision_name, directory, directory);
    if (kind == kinds::REVISION)
        return at.names_below();
    std::optional<revision::entry> named = at.find(place);
    return named && named->is_directory ? at.names_in(*named, place) : std::vector<std::string>();
}

older_file baseline::older_file_of(const std::string &name, const std::string &directory) const {
    std::string now = without_dots(fs::path(directory) / name);
    std::string key = kind == kinds::REVISION || is_relative() ? now : name;
    if (kind == kinds::DIRECTORY) {
        std::string file = (fs::path(place) / name).string();
        return {file, file, key, directory};
    }
    return {name_in_revision((kind == kinds::REVISION ? "./" : within_place()) + name), now, key, directory};
}

std::set<std::string> baseline::keys_of(const std::string &path) const {
    if (kind == kinds::REVISION)
        return {without_dots(path)};
    std::set<std::string> keys;
    for (const std::string &name : names_of(path))
        keys.insert(is_relative() ? without_dots(fs::path(path).parent_path() / name) : name);
    return keys;
}

std::vector<older_file> baseline::files_for(const std::string &directory,
                                            const std::vector<std::string> &sources) const {
    std::set<std::string> directories = {directory};
    if (is_relative())
        for (const std::string &source : sources)
            directories.insert(fs::path(source).parent_path().string());
    std::vector<older_file> files;
    for (const std::string &each : directories)
        for (const std::string &name : names_for(each))
            if (!is_hidden(name) && (is_source(name) || (kind != kinds::REVISION && name.ends_with(".cdef"))))
                files.push_back(older_file_of(name, each));
    return files;
}

/* The keys of the files in the directory of a class that are sources, or databases, as the class is. */
std::set<std::string> baseline::keys_beside(const std::string &path) const {
    fs::path directory = fs::path(path).parent_path();
    std::set<std::string> keys;
    for (const std::string &name : files_in(directory.empty() ? "." : directory.string()))
        if (is_source(name) == is_source(path))
            keys.merge(keys_of((directory / name).string()));
    return keys;
}

std::vector<older_file> baseline::files_gone_from(const std::string &path) const {
    std::string directory = fs::path(path).parent_path().string();
    if (kind == kinds::REVISION)
        directory = revision(revision_name, directory, path).top();
    std::vector<older_file> files = files_for(directory, {path});
    std::set<std::string> present = kind == kinds::REVISION ? std::set<std::string>() : keys_beside(path);
    auto is_present = [&](const older_file &file) {
        std::error_code error;
        return kind == kinds::REVISION ? fs::exists(fs::path(directory) / path_at_revision(file), error)
                                       : present.contains(file.key);
    };
    files.erase(std::remove_if(files.begin(), files.end(), is_present), files.end());
    return files;
}

std::string baseline::path_at_revision(const older_file &file) const {
    return file.name.substr(name_in_revision("").size());
}

older_version baseline::read(const older_file &file) const {
    if (kind == kinds::DIRECTORY)
        return version_in(file.name);
    std::string path = path_at_revision(file);
    revision at(revision_name, file.directory, file.name);
    auto found = at.find(path);
    if (!found || found->is_directory)
        throw failure(file.name + ": not a file");
    return {file.name, bytes_of(at.contents_of(*found, path))};
}

} // namespace cdef::gate_command
