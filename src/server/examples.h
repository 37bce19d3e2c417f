/* examples.h: values for lines that the server adds to a source. */
#ifndef CDGEN_SERVER_EXAMPLES_H
#define CDGEN_SERVER_EXAMPLES_H

#include "index/stanzas.h"

#include <string>
#include <string_view>
#include <vector>

namespace lsp {

/* A value that the compiler accepts. Ids and indices are the next free ones. */
std::string example_value(std::string_view source, const source_index::index &of, const source_index::stanza &in,
                          const table_attrs &attr);

/* The required attributes that a stanza lacks, in their usual order. */
std::vector<const table_attrs *> missing_in(const source_index::stanza &in);

} // namespace lsp

#endif
