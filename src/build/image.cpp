/* image.cpp: the time in a finished database. */

#include "build/image.h"

#include "format/checksum.h"

#include <cstring>

namespace build {

namespace {

constexpr size_t CHECKSUM = offsetof(orb_cdb_header_t, cdb_hdr_checksum);
constexpr size_t AFTER_CHECKSUM = CHECKSUM + sizeof(vx_uint32_t);
constexpr size_t TIME = offsetof(orb_cdb_header_t, cdb_hdr_timestamp);
constexpr size_t AFTER_TIME = TIME + sizeof(orb_timeval32_t);

bool is_same(std::span<const std::byte> a, std::span<const std::byte> b, size_t begin, size_t end) {
    return std::memcmp(a.data() + begin, b.data() + begin, end - begin) == 0;
}

vx_uint32_t word_at(std::span<const std::byte> image, size_t place) {
    return cdb_checksum_word<vx_uint32_t>(reinterpret_cast<const char *>(image.data()) + place);
}

/* The checksum without the two words of the time. */
vx_uint32_t timeless_checksum(std::span<const std::byte> image) {
    return word_at(image, CHECKSUM) ^ word_at(image, TIME) ^ word_at(image, TIME + sizeof(vx_uint32_t));
}

} // namespace

void set_time(std::span<std::byte> image, orb_timeval32_t time) {
    orb_cdb_header_t header;
    std::memcpy(&header, image.data(), sizeof header);
    header.cdb_hdr_timestamp = time;
    std::memcpy(image.data(), &header, sizeof header);
    header.cdb_hdr_checksum =
        cdb_checksum(reinterpret_cast<const char *>(image.data()), header.cdb_hdr_length, header.cdb_hdr_length);
    std::memcpy(image.data(), &header, sizeof header);
}

bool is_same_but_time(std::span<const std::byte> image, std::span<const std::byte> file) {
    return image.size() == file.size() && image.size() >= sizeof(orb_cdb_header_t) &&
           is_same(image, file, 0, CHECKSUM) && is_same(image, file, AFTER_CHECKSUM, TIME) &&
           is_same(image, file, AFTER_TIME, image.size()) && timeless_checksum(image) == timeless_checksum(file);
}

} // namespace build
