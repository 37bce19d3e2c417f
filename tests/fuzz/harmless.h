/* harmless.h: what may be shown on a terminal, stated a second time for the fuzzer. */
#ifndef CDGEN_FUZZ_HARMLESS_H
#define CDGEN_FUZZ_HARMLESS_H

#include <string>

namespace fuzz {

/* Fails if the text could control a terminal, or if it is not UTF-8. */
void expect_harmless(const std::string &text);

} // namespace fuzz

#endif
