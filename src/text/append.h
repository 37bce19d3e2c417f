/* append.h: formatted text. */
#ifndef CDGEN_TEXT_APPEND_H
#define CDGEN_TEXT_APPEND_H

#include <string>

namespace text {

/* Appends formatted text, as printf formats it. */
[[gnu::format(printf, 2, 3)]] void appendf(std::string &to, const char *format, ...);

} // namespace text

#endif
