/* ids_file.cpp: the file of all numbers that were ever in use, as a file. */

#include "cdef/gate/ids_file.h"

#include "cdef/support/failure.h"
#include "cdef/support/replacement.h"
#include "cdef/support/text_of_file.h"

#include <algorithm>
#include <filesystem>
#include <utility>

namespace cdef::gate_command {

ids_file::ids_file(std::string name, bool may_be_missing) : path(std::move(name)), is_there(true) {
    namespace fs = std::filesystem;
    std::error_code error;
    /* A link that leads nowhere is there, and is then reported as a file that cannot be read. */
    if (may_be_missing && fs::symlink_status(path, error).type() == fs::file_type::not_found) {
        is_there = false;
        return;
    }
    /* A device may have no end, and a pipe no writer. */
    fs::file_status is = fs::status(path, error);
    if (fs::exists(is) && !fs::is_regular_file(is))
        throw failure(path + ": not a regular file");
    before = text_of_file(path);
    try {
        recorded = gate::id_record(before);
    } catch (const gate::wrong_ids &wrong) {
        throw failure(path + ":" + wrong.what());
    }
}

std::vector<check::finding> ids_file::accept(const std::vector<gate::numbered> &numbers,
                                             const gate::source_places &places) {
    std::vector<check::finding> found = accepted.judge(numbers, places);
    found.erase(std::remove_if(found.begin(), found.end(), [](const check::finding &each) { return !each.error; }),
                found.end());
    if (found.empty()) {
        accepted.accept(numbers);
        recorded.accept(numbers);
    }
    return found;
}

void ids_file::save() const {
    std::string now = recorded.text();
    if (now == before)
        remove_remains(target_of(path));
    else
        replace_file(
            path, now,
            {.before = is_there ? std::optional<std::string_view>(before) : std::nullopt, .must_be_new = !is_there});
}

} // namespace cdef::gate_command
