/* image.h: the time in a finished database, which both byte orders have at the same place. */
#ifndef CDGEN_BUILD_IMAGE_H
#define CDGEN_BUILD_IMAGE_H

#include "cdb.h"

#include <cstddef>
#include <span>

namespace build {

/* Writes a time to an image in the machine's own byte order, and corrects the checksum. */
void set_time(std::span<std::byte> image, orb_timeval32_t time);

/* True if a file contains the same database as an image, apart from the time and its effect on the checksum. */
bool is_same_but_time(std::span<const std::byte> image, std::span<const std::byte> file);

} // namespace build

#endif
