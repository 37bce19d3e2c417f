/* compiled.cpp: what a source in memory compiles to. */

#include "server/compiled.h"

#include "build/plan.h"
#include "compiler/stepwise.h"
#include "server/uris.h"

namespace lsp {

std::optional<compiled_source> compile(std::string_view text, const std::string &uri) {
    std::optional<compiled_source> made;
    auto finish = [&](stepwise_compiler &compiler, const check::view &see) {
        std::vector<std::byte> image = compiler.image();
        build::class_facts facts = build::facts_of(see, image);
        made = {std::move(image), std::move(facts)};
    };
    check::compile_job job = {build::database_name_of(key_of(uri)), finish};
    try {
        check::check_bytes(
            text, "source", {}, [](const check::finding &) {}, &job);
    } catch (const check::cannot_check &) {
        return std::nullopt;
    }
    return made;
}

} // namespace lsp
