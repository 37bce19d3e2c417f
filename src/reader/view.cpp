/* view.cpp: the parts of the views that are not in their header. */

#include "cdb_view.h"

#include "format/names.h"

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <new>
#include <sys/mman.h>

namespace cdb {

namespace {

struct close_file {
    void operator()(std::FILE *file) const {
        std::fclose(file);
    }
};

std::error_code system_error() {
    return {errno != 0 ? errno : EIO, std::generic_category()};
}

/* The byte order in which the format word is correct. */
std::optional<std::endian> order_of(std::span<const std::byte> file) {
    for (std::endian order : {std::endian::little, std::endian::big})
        if (bytes(file, order).number<std::uint32_t>(offsetof(orb_cdb_header_t, cdb_hdr_format)) == CDB_FORMAT)
            return order;
    return std::nullopt;
}

constexpr std::size_t STEP = 65536; /* bytes read at a time */

/* Asks for large pages wherever they fit into the memory, because providing small pages takes the system longer than
 * filling them takes the caller. */
void advise_large_pages([[maybe_unused]] std::byte *start, [[maybe_unused]] std::size_t size) {
#ifdef MADV_HUGEPAGE
    constexpr std::size_t LARGE_PAGE = 2097152;
    void *aligned = start;
    if (std::align(LARGE_PAGE, LARGE_PAGE, aligned, size) != nullptr)
        madvise(aligned, size / LARGE_PAGE * LARGE_PAGE, MADV_HUGEPAGE);
#endif
}

/* Reads until the end of the file, even if the expected size was wrong; if it was right, no byte is moved. The steps
 * are small so that the new bytes, which are cleared first, are still in the fastest cache when the file is read into
 * them. */
std::vector<std::byte> read_all(std::FILE *file, std::uintmax_t expected) {
    std::vector<std::byte> contents;
    const std::size_t most = contents.max_size() - STEP;
    contents.reserve(static_cast<std::size_t>(std::min<std::uintmax_t>(expected, most)) + STEP);
    advise_large_pages(contents.data(), contents.capacity());
    for (;;) {
        std::size_t size = contents.size();
        if (size > most) /* of 32 bits: a file of 2 GB and more */
            throw std::bad_alloc();
        contents.resize(size + STEP);
        std::size_t got = std::fread(contents.data() + size, 1, STEP, file);
        if (got < STEP) {
            contents.resize(size + got);
            return contents;
        }
    }
}

} // namespace

std::string_view name_of(vx_data_type_t type) {
    return is_data_type(type) ? vxTypeStr[type] : std::string_view();
}

database::database(std::span<const std::byte> file) {
    std::optional<std::endian> order = order_of(file);
    known = order.has_value();
    all = bytes(file, order.value_or(std::endian::native));
    head = all.record<orb_cdb_header_t>(0);
    head.cdb_hdr_checksum = all.number<std::uint32_t>(offsetof(orb_cdb_header_t, cdb_hdr_checksum));
}

std::vector<std::byte> read_file(const char *path, std::error_code &error) {
    error.clear();
    std::unique_ptr<std::FILE, close_file> file(std::fopen(path, "rb"));
    if (file == nullptr) {
        error = system_error();
        return {};
    }
    std::error_code unknown;
    auto told = std::filesystem::file_size(path, unknown);
    std::vector<std::byte> contents = read_all(file.get(), unknown ? 0 : told);
    if (std::ferror(file.get()) != 0) {
        error = system_error();
        contents.clear();
    }
    return contents;
}

} // namespace cdb
