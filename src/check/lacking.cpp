/* lacking.cpp: what a stanza lacks without the compiler's noticing. */

#include "check/lacking.h"

#include <vector>

namespace check {

namespace {

bool is_checked_by_compiler(int kind) {
    return table_of(kind).sc_attr != nullptr || kind == SC_CLASS_ACTION || kind == SC_RESOURCE_ACTION;
}

} // namespace

language::name_list lacking_unnoticed(const view &see, int next_kind) {
    int kind = see.known.kind;
    if (kind < 0 || see.known.skipping || see.compiler.is_broken(kind) || is_checked_by_compiler(kind))
        return {};
    if (kind == SC_CLASS_TO_MANAGER_MAPPING && next_kind == kind) /* a second one is an error */
        return {};
    if (is_sd_kind(kind) && see.compiler.has_index(kind)) /* an element is asked for all else */
        return {};
    language::name_list names = see.compiler.missing(kind);
    if (is_sd_kind(kind) && names.size() > 1)
        return {};
    std::erase(names, "ResourceManager"); /* an error of its own */
    return names;
}

} // namespace check
