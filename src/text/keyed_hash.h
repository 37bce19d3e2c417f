/* keyed_hash.h: a hash of texts of unknown origin. Whoever does not know its key cannot find texts whose hashes are
 * equal or near each other, so that no input makes the search in a hash table slow. */
#ifndef CDGEN_TEXT_KEYED_HASH_H
#define CDGEN_TEXT_KEYED_HASH_H

#include <cstdint>
#include <string_view>

namespace text {

struct hash_key {
    std::uint64_t first;
    std::uint64_t second;
};

/* A key that cannot be guessed, if the system has random numbers; otherwise one that is hard to guess. Never fails. */
hash_key random_key();

/* SipHash-1-3. All bits are equally good. */
std::uint64_t hash_of(std::string_view bytes, const hash_key &key);

} // namespace text

#endif
