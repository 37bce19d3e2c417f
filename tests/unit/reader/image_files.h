/* image_files.h: the images that tests/support/make_images.py makes, in memory. */
#ifndef CDGEN_IMAGE_FILES_H
#define CDGEN_IMAGE_FILES_H

#include "cdb_view.h"
#include "places.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstring>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace image_files {

constexpr std::endian both_orders[] = {std::endian::little, std::endian::big};

inline std::string_view name_of(std::endian order) {
    return order == std::endian::little ? "little" : "big";
}

/* An image, which a test may change. */
inline std::vector<std::byte> load(std::string_view name, std::endian order) {
    std::string path = places::in_images(std::string(name).append(".").append(name_of(order)).append(".cdef"));
    std::error_code error;
    std::vector<std::byte> contents = cdb::read_file(path.c_str(), error);
    EXPECT_FALSE(error) << path << ": " << error.message();
    return contents;
}

/* Bytes at a given distance from an aligned address, in memory of exactly their size, so that a sanitizer notices
 * reading outside of them. */
class exact_copy {
public:
    explicit exact_copy(std::span<const std::byte> of, std::size_t off = 0)
        : memory(std::make_unique<std::byte[]>(of.size() + off)), start(off), size(of.size()) {
        std::copy(of.begin(), of.end(), memory.get() + off);
    }
    std::span<const std::byte> bytes() const {
        return {memory.get() + start, size};
    }
    std::span<std::byte> bytes() {
        return {memory.get() + start, size};
    }

private:
    std::unique_ptr<std::byte[]> memory;
    std::size_t start;
    std::size_t size;
};

} // namespace image_files

#endif
