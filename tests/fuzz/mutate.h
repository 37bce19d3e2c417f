/* mutate.h: changes to sources and databases that know how these are built, for the fuzzers to try. The same numbers by
 * chance give the same change. */
#ifndef CDGEN_FUZZ_MUTATE_H
#define CDGEN_FUZZ_MUTATE_H

#include <cstddef>
#include <random>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fuzz {

using chance = std::minstd_rand;
using image_bytes = std::vector<std::byte>;

/* A number below count, which is not 0. */
inline std::size_t below(std::size_t count, chance &random) {
    return random() % count;
}

/* One of a list that is not empty. */
template <class List> auto &one_of(List &list, chance &random) {
    return list[below(list.size(), random)];
}

/* The source with stanzas or attribute lines moved, copied or taken away, values exchanged with others of their form or
 * set to the limits, or with a quote or the mark of a comment set anywhere. */
std::string changed_source(std::string_view source, chance &random);

/* The source with a stanza, an attribute line, a value or all after a stanza taken from another one. */
std::string crossed_source(std::string_view source, std::string_view other, chance &random);

/* The database with a reference, a count, a type or any other field changed, records copied or taken away, sections
 * moved, copied or taken away, or turned into the other byte order. Its length and its checksum are right. Bytes that
 * are not a database are returned as they are. */
image_bytes changed_image(std::span<const std::byte> image, chance &random);

/* The database with a field, a record or sections taken from another one, in either byte order. Its length and its
 * checksum are right. */
image_bytes crossed_image(std::span<const std::byte> image, std::span<const std::byte> other, chance &random);

} // namespace fuzz

#endif
