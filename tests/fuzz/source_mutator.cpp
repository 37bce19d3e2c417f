/* source_mutator.cpp: how libFuzzer changes the inputs of source_fuzz: by stanzas and lines, or with its own mutations.
 */

#include "mutate.h"

#include <algorithm>
#include <cstdint>

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t *data, std::size_t size, std::size_t max_size);

namespace {

/* The first byte holds options; the source follows. */
std::string_view source_in(const std::uint8_t *data, std::size_t size) {
    return {reinterpret_cast<const char *>(data) + 1, size - 1};
}

std::size_t put_source(std::uint8_t *data, std::size_t max_size, const std::string &source) {
    std::size_t size = std::min(source.size(), max_size - 1);
    std::copy_n(source.begin(), size, data + 1);
    return size + 1;
}

} // namespace

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t *data, std::size_t size, std::size_t max_size,
                                               unsigned seed) {
    fuzz::chance random(seed);
    if (size < 2 || fuzz::below(3, random) == 0)
        return LLVMFuzzerMutate(data, size, max_size);
    return put_source(data, max_size, fuzz::changed_source(source_in(data, size), random));
}

extern "C" std::size_t LLVMFuzzerCustomCrossOver(const std::uint8_t *first, std::size_t first_size,
                                                 const std::uint8_t *second, std::size_t second_size, std::uint8_t *out,
                                                 std::size_t max_size, unsigned seed) {
    if (first_size < 2 || second_size < 2)
        return 0;
    fuzz::chance random(seed);
    out[0] = first[0];
    return put_source(out, max_size,
                      fuzz::crossed_source(source_in(first, first_size), source_in(second, second_size), random));
}
