/* same.h: compares what two sources compile to. */
#ifndef CDGEN_FORMATTER_SAME_H
#define CDGEN_FORMATTER_SAME_H

#include "check/check.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace formatter {

struct compiled {
    std::optional<check::finding> error; /* the first one; then there is nothing else */
    std::vector<std::byte> image;        /* without time and checksum */
    std::vector<std::string> warnings;   /* code and text of each, sorted */
};

/* Throws check::cannot_check, which names the source, if memory runs out. */
compiled compile(std::string_view source, const std::string &name);

bool is_same(const compiled &a, const compiled &b);

/* The line of a source without errors, counted from 0, in which a number overflows first: a typed value of 0 is refused
 * after it, and taken before. Nothing if there is none. */
std::optional<std::size_t> first_overflow(std::string_view source);

} // namespace formatter

#endif
