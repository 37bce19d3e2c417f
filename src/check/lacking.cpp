/* lacking.cpp: the missing attributes that the compiler does not notice. */

#include "check/lacking.h"

#include <algorithm>
#include <vector>

namespace check {

namespace {

bool is_checked_by_compiler(int kind) {
    return table_of(kind).sc_attr != nullptr || kind == SC_CLASS_ACTION || kind == SC_RESOURCE_ACTION;
}

int type_of(int kind, std::string_view name) {
    const auto &attrs = table_of(kind).sc_attrs;
    return std::find_if(attrs.begin(), attrs.end(), [name](const auto &each) { return name == each.ta_name; })->ta_type;
}

/* An error of the stanza may be about the missing line. If it cannot be, the missing attributes are reported too. An
 * element is left alone: if it lacks its index, that of the next one is refused, and the error is reported here. */
bool may_be_explained(const view &see, int kind) {
    const stanza_record &stanza = see.known.stanza();
    bool has_own_error = stanza.refused.types.any();
    return is_sd_kind(kind) || !has_own_error || stanza.refused.unknown_name || stanza.misplaced || stanza.suspect;
}

void erase_refused(language::name_list &names, const view &see, int kind) {
    std::erase_if(names, [&](std::string_view name) {
        return see.known.stanza().refused.types.test(index_of(type_of(kind, name)));
    });
}

} // namespace

language::name_list lacking_unnoticed(const view &see, int next_kind) {
    int kind = see.known.kind;
    if (kind < 0 || see.known.skipping || is_checked_by_compiler(kind))
        return {};
    bool is_broken = see.compiler.is_broken(kind);
    if (is_broken && may_be_explained(see, kind))
        return {};
    if (kind == SC_CLASS_TO_MANAGER_MAPPING && next_kind == kind) /* a second one is an error */
        return {};
    if (is_sd_kind(kind) && see.compiler.has_index(kind)) /* an element is asked for all else */
        return {};
    language::name_list names = see.compiler.missing(kind);
    if (is_sd_kind(kind) && names.size() > 1)
        return {};
    std::erase(names, "ResourceManager"); /* an error of its own */
    if (is_broken)
        erase_refused(names, see, kind);
    return names;
}

} // namespace check
