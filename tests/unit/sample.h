/* sample.h: which cases of an exhaustive test are run. By default all are. With CDGEN_SHARE=7, as script/test
 * --sanitize and script/test-32-bit set it, one case in seven is run, and SEED chooses which: seven seeds in a row run
 * each case once. A share that has no divisor in common with the sizes of fields reaches all their bytes. */
#ifndef CDGEN_TESTS_SAMPLE_H
#define CDGEN_TESTS_SAMPLE_H

#include <cstdint>
#include <cstdlib>

namespace sampling {

inline std::uint64_t number_in_environment(const char *name, std::uint64_t otherwise) {
    const char *text = std::getenv(name);
    return text == nullptr ? otherwise : std::strtoull(text, nullptr, 10);
}

class sample {
    std::uint64_t share;
    std::uint64_t next;

public:
    /* Takes one case in `of`, 0 as 1; `seed` is the number of cases to count as passed before the first. */
    constexpr sample(std::uint64_t of, std::uint64_t seed) : share(of == 0 ? 1 : of), next(seed % share) {}

    /* Whether to run the next case. */
    constexpr bool takes() {
        const bool taken = next == 0;
        next = (next + 1) % share;
        return taken;
    }
};

/* The sample of this run. */
inline sample of_this_run() {
    return {number_in_environment("CDGEN_SHARE", 1), number_in_environment("SEED", 1)};
}

} // namespace sampling

#endif
