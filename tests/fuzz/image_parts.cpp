/* image_parts.cpp: takes a database apart and joins it again. */

#include "image_parts.h"

#include "fuzz.h"

#include <algorithm>
#include <array>
#include <cstring>

namespace fuzz {

void put_number(std::span<std::byte> field, std::uint32_t number, std::endian order) {
    std::size_t width = std::min(field.size(), sizeof number);
    for (std::size_t i = 0; i < width; ++i) {
        std::size_t at = order == std::endian::little ? i : width - 1 - i;
        field[at] = static_cast<std::byte>(number >> 8 * i & 0xFF);
    }
}

image_parts parts_of(const cdb::database &db) {
    auto copy = [](std::span<const std::byte> raw) { return image_bytes(raw.begin(), raw.end()); };
    image_parts parts = {db.order(), copy(db.file().part(0, sizeof(orb_cdb_header_t)).raw()), {}};
    parts.header.resize(sizeof(orb_cdb_header_t));
    for (std::size_t i = 0; i < db.section_count(); ++i)
        parts.sections.push_back({db.anchor(i), copy(db.section(i).raw())});
    return parts;
}

image_bytes joined(const image_parts &parts) {
    image_bytes image = parts.header;
    put(image, offsetof(orb_cdb_header_t, cdb_hdr_dsect_count), static_cast<std::uint32_t>(parts.sections.size()),
        parts.order);
    std::size_t at = image.size();
    image.resize(at + parts.sections.size() * sizeof(cdb_dsect_anchor_t));
    for (const section_part &each : parts.sections) {
        put(image, at + offsetof(cdb_dsect_anchor_t, cda_type), each.anchor.cda_type, parts.order);
        put(image, at + offsetof(cdb_dsect_anchor_t, cda_offset), static_cast<std::uint32_t>(image.size()),
            parts.order);
        put(image, at + offsetof(cdb_dsect_anchor_t, cda_length), static_cast<std::uint32_t>(each.contents.size()),
            parts.order);
        put(image, at + offsetof(cdb_dsect_anchor_t, cda_revision), each.anchor.cda_revision, parts.order);
        at += sizeof(cdb_dsect_anchor_t);
        image.insert(image.end(), each.contents.begin(), each.contents.end());
    }
    make_whole(image, parts.order);
    return image;
}

void turn_fields(std::span<std::byte> image) {
    std::vector<cdb::region> regions = cdb::regions(cdb::database(image));
    for (const cdb::region &r : regions) {
        bool is_word =
            r.what == nullptr && (r.record == "length" || r.record == "var_id_t" || r.record == "vx_value_t");
        bool is_turned = is_word || (r.what != nullptr && !r.what->stays && r.what->kind != cdb::field_kind::reserved);
        std::size_t step = r.what != nullptr ? std::size_t{r.what->width} : r.size;
        for (std::size_t at = 0; is_turned && at + step <= r.size; at += step) {
            auto field = image.subspan(r.offset + at, std::min(step, sizeof(std::uint32_t)));
            std::reverse(field.begin(), field.end());
        }
    }
}

} // namespace fuzz
