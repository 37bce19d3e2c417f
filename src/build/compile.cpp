/* compile.cpp: compiles a source in the pass that checks it. */

#include "build/compile.h"

#include "build/image.h"
#include "compiler/stepwise.h"

namespace build {

compiled compile(const unit &what, orb_timeval32_t time, const check::warning_set &wanted, const check::sink &to) {
    compiled result;
    auto finish = [&](stepwise_compiler &compiler, const check::view &see) {
        std::vector<std::byte> native = compiler.image();
        set_time(native, time);
        result.facts = facts_of(see, native);
        for (const output &made : what.outputs)
            result.images.push_back(made.order == std::endian::native ? native : compiler.reversed(native));
    };
    check::compile_job job = {what.named_after, finish};
    result.count = check::check_file(what.source, wanted, to, &job);
    return result;
}

} // namespace build
