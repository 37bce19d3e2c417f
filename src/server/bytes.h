/* bytes.h: where in a database the record of a stanza is, and what it refers to. */
#ifndef CDGEN_SERVER_BYTES_H
#define CDGEN_SERVER_BYTES_H

#include "format/records.h"
#include "index/stanzas.h"

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace lsp {

/* The offset of a stanza's record, in bytes from the start of the file. Nothing if there is no record, or if it cannot
 * be told from others. image: the database that the source compiles to. */
std::optional<std::size_t> record_offset(std::string_view source, const source_index::index &of, std::size_t stanza,
                                         std::span<const std::byte> image);

/* The text with its zero byte, or the value, that a field of a stanza's record refers to, in the image. Empty if the
 * field contains its value itself, or refers to nothing. record: what record_offset returned. */
std::span<const std::byte> referred_bytes(const source_index::index &of, std::size_t stanza,
                                          std::span<const std::byte> image, std::size_t record,
                                          const cdb::field &field);

/* Bytes in hexadecimal with blanks between them; if there are more than 16, "..." stands for the rest. */
std::string hexadecimal(std::span<const std::byte> bytes);

} // namespace lsp

#endif
