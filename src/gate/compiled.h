/* compiled.h: the database of a source, in memory. */
#ifndef CDGEN_GATE_COMPILED_H
#define CDGEN_GATE_COMPILED_H

#include "check/check.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace gate {

struct compiled {
    std::vector<std::byte> image;         /* empty if there are errors */
    std::vector<check::finding> findings; /* the errors */
};

/* name: of the source, for messages. class_name: of a class without Name. Throws check::cannot_check. */
compiled compile(std::string_view source, const std::string &name, const std::string &class_name);

} // namespace gate

#endif
