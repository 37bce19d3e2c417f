/* documentation.h: what names of the language mean, as Markdown, from the tables of the language and the format. */
#ifndef CDGEN_SERVER_DOCUMENTATION_H
#define CDGEN_SERVER_DOCUMENTATION_H

#include "language/catalogue.h"

#include <string>
#include <string_view>

namespace lsp {

std::string stanza_documentation(const srtable_ctrl &kind);
/* Includes the record and the fields that the attribute fills. */
std::string attribute_documentation(const srtable_ctrl &kind, const table_attrs &attr);
/* Of a data type, a variable type or a property of the attribute; empty for any other value. */
std::string value_documentation(const table_attrs &attr, std::string_view value);

/* Whether the attribute's value is the number of a message in the class's catalog. */
bool is_message_number(const srtable_ctrl &kind, const table_attrs &attr);

} // namespace lsp

#endif
