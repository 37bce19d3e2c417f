/* baseline.cpp: where the older versions of classes come from. */

#include "cdef/gate/baseline.h"

#include "cdb_view.h"
#include "cdef/gate/git.h"
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

std::vector<std::string> files_in(const std::string &directory) {
    std::vector<std::string> names;
    try {
        for (const fs::directory_entry &each : fs::directory_iterator(directory))
            if (each.is_regular_file())
                names.push_back(each.path().filename().string());
    } catch (const fs::filesystem_error &e) {
        throw failure(directory + ": " + e.code().message());
    }
    std::sort(names.begin(), names.end());
    return names;
}

/* Texts that git has put a zero byte after. */
std::vector<std::string> texts_in(std::string_view output) {
    std::vector<std::string> texts;
    for (std::size_t end = output.find('\0'); end != output.npos; end = output.find('\0')) {
        texts.emplace_back(output.substr(0, end));
        output.remove_prefix(end + 1);
    }
    return texts;
}

/* The names, without directory, that an older version of a file may have, the likeliest one first. */
std::vector<std::string> names_of(const std::string &path) {
    std::string own = fs::path(path).filename().string();
    std::string stem = without(without(own, "src"), ".cdef");
    return {stem + ".cdef", stem + ".le.cdef", stem + ".be.cdef", stem + ".cdefsrc", own};
}

} // namespace

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
    for (const std::string &name : names_of(path))
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
        for (const std::string &name : names_of(path))
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

/* Below the directory, with a slash; for a path at a revision or another directory, directly in that. */
std::vector<std::string> baseline::names_for(const std::string &directory) const {
    switch (kind) {
    case kinds::FILE:
        return {};
    case kinds::DIRECTORY:
        return files_in(place);
    case kinds::REVISION:
        return texts_in(git(directory, {"ls-tree", "-z", "-r", "--name-only", revision}).value_or(""));
    case kinds::REVISION_PATH: /* git fails if that is a file */
        return texts_in(
            git(directory, {"ls-tree", "-z", "--name-only", "--full-tree", revision + ":" + place}).value_or(""));
    }
    return {};
}

older_file baseline::older_file_of(const std::string &name, const std::string &directory) const {
    std::string now = without_dots(fs::path(directory) / name);
    std::string key = kind == kinds::REVISION || is_relative() ? now : name;
    if (kind == kinds::DIRECTORY) {
        std::string file = (fs::path(place) / name).string();
        return {file, file, key, directory};
    }
    std::string beginning = kind == kinds::REVISION                 ? "./"
                            : place.empty() || place.ends_with('/') ? place
                                                                    : place + "/";
    return {GIT.data() + revision + ":" + beginning + name, now, key, directory};
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

older_version baseline::read(const older_file &file) const {
    if (kind == kinds::DIRECTORY)
        return version_in(file.name);
    std::optional<std::string> text = git(file.directory, {"cat-file", "blob", file.name.substr(GIT.size())});
    if (!text)
        throw failure(file.name + ": not a file");
    return {file.name, bytes_of(*text)};
}

} // namespace cdef::gate_command
