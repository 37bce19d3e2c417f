/* version.cpp: a version of a class, as a database in memory. */

#include "cdef/gate/version.h"

#include "cdef/support/failure.h"
#include "gate/compiled.h"

#include <algorithm>
#include <utility>

namespace cdef::gate_command {

std::vector<std::string> version::class_names() const {
    std::vector<std::string> names;
    for (const auto &each : in.db.classes())
        names.emplace_back(each.name());
    return names;
}

std::vector<std::byte> bytes_of(std::string_view text) {
    std::vector<std::byte> bytes(text.size());
    std::copy(text.begin(), text.end(), reinterpret_cast<char *>(bytes.data()));
    return bytes;
}

std::string_view text_of(const std::vector<std::byte> &bytes) {
    return {reinterpret_cast<const char *>(bytes.data()), bytes.size()};
}

std::string stem_of(const std::string &path) {
    std::string name = path.substr(path.rfind('/') + 1);
    return name.substr(0, name.find(".cdef"));
}

std::unique_ptr<version> readable(older_version &&old) {
    if (!is_text(old.bytes))
        return std::make_unique<version>(old.name, std::move(old.bytes));
    gate::compiled made = gate::compile(text_of(old.bytes), old.name, stem_of(old.name));
    if (!made.findings.empty())
        throw failure(old.name + ": not a source that compiles; 'cdef check' says why");
    return std::make_unique<version>(old.name, std::move(made.image));
}

} // namespace cdef::gate_command
