/* version.h: a version of a class, as a database in memory. */
#ifndef CDGEN_CDEF_GATE_VERSION_H
#define CDGEN_CDEF_GATE_VERSION_H

#include "cdef/gate/baseline.h"
#include "cdef/support/input.h"
#include "compare/compare.h"

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace cdef::gate_command {

/* A database in memory that can be relied on. */
struct version {
    /* name: of the file, for messages. Throws failure for a database that is not sound. */
    version(const std::string &name, std::vector<std::byte> bytes)
        : in(name, std::move(bytes)), owners(require_readable(in).owners) {}

    compare::origin origin() const {
        return {in.db, owners};
    }
    std::vector<std::string> class_names() const;

    input in;
    cdb::ownership owners;
};

std::vector<std::byte> bytes_of(std::string_view text);
std::string_view text_of(const std::vector<std::byte> &bytes);

/* "Disk" for "old/Disk.le.cdef". */
std::string stem_of(const std::string &path);

/* The older version as a database. A source is compiled; throws failure if it has errors. */
std::unique_ptr<version> readable(older_version &&old);

} // namespace cdef::gate_command

#endif
