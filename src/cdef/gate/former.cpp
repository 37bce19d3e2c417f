/* former.cpp: classes that an older version of a directory has, in files that the directory no longer has. */

#include "cdef/gate/former.h"

#include "cdef/support/failure.h"

#include <algorithm>
#include <filesystem>
#include <utility>

namespace cdef::gate_command {

namespace {

former_file read(const baseline &in, const older_file &file) {
    former_file gone = {file.path, &in, nullptr, {}};
    try {
        gone.last = readable(in.read(file));
    } catch (const failure &unreadable) {
        gone.problem = unreadable.what();
    }
    return gone;
}

} // namespace

void former_files::look_for(const baseline &in, const std::string &directory, const std::vector<std::string> &sources,
                            const std::vector<std::string> &operands) {
    std::set<std::string> present;
    for (const std::string &operand : operands)
        present.merge(in.keys_of(operand));
    for (const older_file &each : in.files_for(directory, sources))
        if (!present.contains(each.key) && noted.emplace(&in, each.key).second)
            files.push_back(read(in, each));
}

void former_files::look_around(const baseline &in, const std::string &path) {
    if (!looked.emplace(&in, std::filesystem::path(path).parent_path().string()).second)
        return;
    for (const older_file &each : in.files_gone_from(path)) {
        if (!noted.emplace(&in, each.key).second)
            continue;
        older_version old = in.read(each);
        try {
            files.push_back({each.path, &in, readable(std::move(old)), {}});
        } catch (const failure &) { /* its class is not known, so it is not the one that is looked for */
        }
    }
}

const version *former_files::last_of(const baseline &in, const version &now) const {
    std::vector<std::string> names = now.class_names();
    auto found = std::find_if(files.begin(), files.end(), [&](const former_file &each) {
        return each.in == &in && each.last != nullptr && each.last->class_names() == names;
    });
    return found == files.end() ? nullptr : found->last.get();
}

bool former_files::has_files_of(const baseline &in) const {
    return std::any_of(files.begin(), files.end(), [&](const former_file &each) { return each.in == &in; });
}

} // namespace cdef::gate_command
