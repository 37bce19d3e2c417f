/* image_fuzz: reads arbitrary bytes as a database. Whatever they say, verification ends, the regions tile the file, and
 * the views read nothing outside of it; once it is sound, everything in it can be read to the end. */

#include "fuzz.h"

#include <algorithm>
#include <memory>

namespace {

/* Bytes at the end of their memory, so that reading after them is noticed, and at any alignment. */
class copy_of {
public:
    copy_of(const std::uint8_t *data, std::size_t size, std::size_t off)
        : memory(std::make_unique<std::byte[]>(size + off)), bytes(memory.get() + off, size) {
        std::copy_n(reinterpret_cast<const std::byte *>(data), size, bytes.begin());
    }

private:
    std::unique_ptr<std::byte[]> memory;

public:
    std::span<std::byte> bytes;
};

/* A bit of the checksum, which says nothing else, chooses. */
bool stays_as_it_is(const orb_cdb_header_t &header) {
    return (header.cdb_hdr_checksum & 0x100) != 0;
}

void check_regions(const cdb::database &db) {
    std::size_t end = 0;
    for (const cdb::region &r : cdb::regions(db)) {
        fuzz::require(r.offset == end && r.size > 0, "regions do not tile the file");
        end += r.size;
    }
    fuzz::require(end == db.file().size(), "regions do not cover the file");
}

/* Unsound files are read too, which must be safe, if they are small enough that this is quick: their lists may contain
 * each other. */
constexpr std::size_t UNSOUND_SIZE_MAX = 1000;

std::vector<cdb::finding> verified(const cdb::database &db) {
    std::vector<cdb::finding> findings = cdb::verify(db);
    for (const cdb::finding &f : findings)
        fuzz::require(!f.broken->code.empty() && f.offset <= db.file().size(), "a finding outside of the file");
    return findings;
}

void look_through(const cdb::database &db) {
    bool sound = cdb::is_sound(verified(db));
    if (sound || db.file().size() <= UNSOUND_SIZE_MAX)
        fuzz::read_all(db, sound);
    check_regions(db);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    copy_of image(data, size, size % 8);
    cdb::database db(image.bytes);
    if (size < sizeof(orb_cdb_header_t)) {
        look_through(db);
        return 0;
    }
    verified(db);
    if (stays_as_it_is(db.header())) {
        look_through(db);
        return 0;
    }
    fuzz::make_whole(image.bytes, db.order());
    look_through(cdb::database(image.bytes));
    return 0;
}
