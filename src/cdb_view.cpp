/* cdb_view.cpp: what of the reader does not stand in its header. */

#include "cdb_view.h"

#include "cdb_names.h"

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <memory>

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

/* The order in which the format word is the format word. */
std::optional<std::endian> order_of(std::span<const std::byte> file) {
    for (std::endian order : {std::endian::little, std::endian::big})
        if (bytes(file, order).number<std::uint32_t>(offsetof(orb_cdb_header_t, cdb_hdr_format)) == CDB_FORMAT)
            return order;
    return std::nullopt;
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

/* In one piece if the file tells its size, which keeps the system from moving it about; but its end decides. */
static std::vector<std::byte> read_all(std::FILE *file, std::size_t expected) {
    std::vector<std::byte> contents(expected + 1);
    for (std::size_t size = 0;;) {
        size += std::fread(contents.data() + size, 1, contents.size() - size, file);
        bool ended = size < contents.size();
        contents.resize(ended ? size : 2 * size);
        if (ended)
            return contents;
    }
}

std::vector<std::byte> read_file(const char *path, std::error_code &error) {
    constexpr std::size_t STEP = 65536;
    error.clear();
    std::unique_ptr<std::FILE, close_file> file(std::fopen(path, "rb"));
    if (file == nullptr) {
        error = system_error();
        return {};
    }
    std::error_code unknown;
    auto told = std::filesystem::file_size(path, unknown);
    std::vector<std::byte> contents = read_all(file.get(), unknown ? STEP : static_cast<std::size_t>(told));
    if (std::ferror(file.get()) != 0) {
        error = system_error();
        contents.clear();
    }
    return contents;
}

} // namespace cdb
