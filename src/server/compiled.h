/* compiled.h: what a source in memory compiles to. */
#ifndef CDGEN_SERVER_COMPILED_H
#define CDGEN_SERVER_COMPILED_H

#include "build/across.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lsp {

struct compiled_source {
    std::vector<std::byte> image; /* in the machine's own byte order */
    build::class_facts facts;
};

/* Compiles a source; nothing if it has errors. uri: the source's. A class without a Name gets its name from it. */
std::optional<compiled_source> compile(std::string_view text, const std::string &uri);

} // namespace lsp

#endif
