/* compiled.cpp: the database of a source, in memory. */

#include "gate/compiled.h"

#include "compiler/stepwise.h"

#include <utility>

namespace gate {

compiled compile(std::string_view source, const std::string &name, const std::string &class_name) {
    compiled result;
    auto finish = [&](stepwise_compiler &compiler, const check::view & /* see */) { result.image = compiler.image(); };
    check::compile_job job = {class_name + ".cdef", finish};
    check::check_bytes(
        source, name, {}, [&](check::finding &&found) { result.findings.push_back(std::move(found)); }, &job);
    return result;
}

} // namespace gate
