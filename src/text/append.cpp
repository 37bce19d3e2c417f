/* append.cpp: formatted text. */

#include "text/append.h"

#include <cstdarg>
#include <cstdio>

namespace text {

void appendf(std::string &to, const char *format, ...) {
    std::va_list arguments, again;
    va_start(arguments, format);
    va_copy(again, arguments);
    int length = std::vsnprintf(nullptr, 0, format, arguments);
    va_end(arguments);
    std::size_t size = to.size();
    to.resize(size + static_cast<std::size_t>(length) + 1);
    std::vsnprintf(to.data() + size, static_cast<std::size_t>(length) + 1, format, again);
    va_end(again);
    to.pop_back();
}

} // namespace text
