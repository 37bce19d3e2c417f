/* image_mutator.cpp: how libFuzzer changes the inputs of image_fuzz: by sections and fields, or with its own mutations.
 */

#include "mutate.h"

#include <algorithm>
#include <cstdint>

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t *data, std::size_t size, std::size_t max_size);

namespace {

std::span<const std::byte> bytes_of(const std::uint8_t *data, std::size_t size) {
    return std::as_bytes(std::span(data, size));
}

/* An image that became too long is left as it was: cut, it would be nothing new. */
std::size_t put_image(std::uint8_t *data, std::size_t max_size, const fuzz::image_bytes &image, std::size_t size) {
    if (image.size() > max_size)
        return size;
    std::copy_n(reinterpret_cast<const std::uint8_t *>(image.data()), image.size(), data);
    return image.size();
}

} // namespace

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t *data, std::size_t size, std::size_t max_size,
                                               unsigned seed) {
    fuzz::chance random(seed);
    if (size == 0 || fuzz::below(4, random) == 0)
        return LLVMFuzzerMutate(data, size, max_size);
    return put_image(data, max_size, fuzz::changed_image(bytes_of(data, size), random), size);
}

extern "C" std::size_t LLVMFuzzerCustomCrossOver(const std::uint8_t *first, std::size_t first_size,
                                                 const std::uint8_t *second, std::size_t second_size, std::uint8_t *out,
                                                 std::size_t max_size, unsigned seed) {
    fuzz::chance random(seed);
    return put_image(out, max_size,
                     fuzz::crossed_image(bytes_of(first, first_size), bytes_of(second, second_size), random), 0);
}
