/* image_parts.h: a database taken apart into its sections. References count from the start of a section or of one of
 * its tables, so whole sections may be moved. */
#ifndef CDGEN_FUZZ_IMAGE_PARTS_H
#define CDGEN_FUZZ_IMAGE_PARTS_H

#include "cdb_view.h"
#include "mutate.h"

#include <bit>
#include <vector>

namespace fuzz {

struct section_part {
    cdb_dsect_anchor_t anchor; /* offset and length are set when the parts are joined */
    image_bytes contents;
};

struct image_parts {
    std::endian order;
    image_bytes header;
    std::vector<section_part> sections;
};

/* The database must be recognised. */
image_parts parts_of(const cdb::database &db);

/* A database of these parts: the sections follow each other without gaps; length, count and checksum are right. */
image_bytes joined(const image_parts &parts);

/* Writes a number of 2 or 4 bytes; a wider field gets it in its first 4. */
void put_number(std::span<std::byte> field, std::uint32_t number, std::endian order);

/* Reverses what the field tables know of: numbers, and the first words of references and values. Nearly what the
 * compiler does, which also knows the types of values. */
void turn_fields(std::span<std::byte> image);

} // namespace fuzz

#endif
