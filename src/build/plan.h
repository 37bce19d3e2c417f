/* plan.h: plans which databases are made from which sources. Pure functions of names. */
#ifndef CDGEN_BUILD_PLAN_H
#define CDGEN_BUILD_PLAN_H

#include "build/time.h"

#include <bit>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace build {

/* A database to be made. "-" is standard output. */
struct output {
    std::string path;
    std::endian order;
};

/* A source and the databases that are made from it. "-" is standard input. */
struct unit {
    std::string source;
    std::string named_after; /* the database without a byte order; names a class without a Name */
    std::vector<output> outputs;
    std::string project_file = {}; /* project file that was used; empty if there is none */
};

enum class byte_order { native, little, big, both };

struct naming {
    std::optional<std::string> file = {};      /* the one database, */
    std::optional<std::string> directory = {}; /* or the directory of all; without both, each database is beside its
                                                * source */
    byte_order order = byte_order::native;
};

/* A source, and the options for it. */
struct request {
    std::string source;
    naming how = {};
    std::string project_file = {};
};

/* "NAME.cdef" for a source DIRECTORY/NAME.cdefsrc. A name with another ending keeps it. */
std::string database_name_of(std::string_view source);

/* Throws wrong_request if the names do not go together, or if two databases would have the same name. */
std::vector<unit> plan_of(std::span<const request> requests);

} // namespace build

#endif
