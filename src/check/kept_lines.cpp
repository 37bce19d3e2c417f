/* kept_lines.cpp: places of a source, each with the text of its line. */

#include "check/kept_lines.h"

namespace check {

void kept_lines::add(const place &at, std::string_view source) {
    entries.push_back({at.line, static_cast<small>(at.column), static_cast<small>(at.length)});
    texts.add(source);
}

void kept_lines::clear() {
    texts.clear();
    entries.clear();
}

} // namespace check
