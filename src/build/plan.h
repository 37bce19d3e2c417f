/* plan.h: which databases are made of which sources. Pure functions of names. */
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

/* A database in the making. "-" is standard output. */
struct output {
    std::string path;
    std::endian order;
};

/* A source and what is made of it. "-" is standard input. */
struct unit {
    std::string source;
    std::string
        named_after; /* the database, without a byte order in its name, after which a nameless class is called */
    std::vector<output> outputs;
    std::string project_file = {}; /* that had a say in it; empty if there is none */
};

enum class byte_order { native, little, big, both };

struct naming {
    std::optional<std::string> file = {};      /* the one database, */
    std::optional<std::string> directory = {}; /* or where all are; without both, each is beside its source */
    byte_order order = byte_order::native;
};

/* A source, and what is wanted of it. */
struct request {
    std::string source;
    naming how = {};
    std::string project_file = {};
};

/* "NAME.cdef" for a source DIRECTORY/NAME.cdefsrc; what ends otherwise keeps its end. */
std::string database_name_of(std::string_view source);

/* Throws wrong_request if the names make no sense together, or if two databases would have the same one. */
std::vector<unit> plan_of(std::span<const request> requests);

} // namespace build

#endif
