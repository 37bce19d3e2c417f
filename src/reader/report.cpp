/* report.cpp: collects what the walk over a database reports. */

#include "reader/report.h"

#include "text/hex.h"

#include <utility>

namespace cdb {

void reporter::report(check broken, const location &at, std::string_view field, std::size_t offset, std::string found,
                      std::string expected) {
    const rule *rule = &rule_of(broken);
    if (excuse && rule->level == severity::error)
        rule = &rule_of(*excuse);
    take({rule, at.section, at.record, at.index, field, offset, std::move(found), std::move(expected)});
}

void reporter::report(check broken, const location &at, std::string_view field, std::size_t offset, std::uint64_t found,
                      std::uint64_t expected) {
    report(broken, at, field, offset, std::to_string(found), std::to_string(expected));
}

void reporter::report_id(const location &at, std::string_view field, vx_uint32_t found, vx_uint32_t expected) {
    report(check::RECORD_ID, at, field, at.offset, text::hex(found), text::hex(expected));
}

void reporter::report_reserved(const location &at, std::string_view field, std::span<const std::byte> stretch,
                               std::size_t file_offset) {
    auto wrong = std::find_if(stretch.begin(), stretch.end(), [](std::byte b) { return b != std::byte{0}; });
    auto distance = static_cast<std::size_t>(wrong - stretch.begin());
    report(check::RESERVED, at, field, file_offset + distance, text::hex(std::to_integer<unsigned>(*wrong)), "0x0");
}

} // namespace cdb
