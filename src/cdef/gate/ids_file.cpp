/* ids_file.cpp: the file of all numbers that were ever in use, as a file. */

#include "cdef/gate/ids_file.h"

#include "cdef/support/failure.h"
#include "cdef/support/replacement.h"
#include "cdef/support/text_of_file.h"

#include <filesystem>
#include <utility>

namespace cdef::gate_command {

ids_file::ids_file(std::string name, bool may_be_missing) : path(std::move(name)), is_there(true) {
    std::error_code error;
    if (may_be_missing && !std::filesystem::exists(path, error) && !error) {
        is_there = false;
        return;
    }
    before = text_of_file(path);
    try {
        recorded = gate::id_record(before);
    } catch (const gate::wrong_ids &wrong) {
        throw failure(path + ":" + wrong.what());
    }
}

void ids_file::save() const {
    if (std::string now = recorded.text(); now != before)
        replace_file(path, now, {.before = is_there ? std::optional<std::string_view>(before) : std::nullopt});
}

} // namespace cdef::gate_command
