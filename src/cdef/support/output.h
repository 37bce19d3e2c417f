/* output.h: standard output. */
#ifndef CDGEN_CDEF_OUTPUT_H
#define CDGEN_CDEF_OUTPUT_H

#include <cstddef>
#include <string>
#include <string_view>

namespace cdef {

/* Writes to standard output; throws failure if that fails. */
void print(std::string_view text);

/* True if colours are wanted on a descriptor. when: "always", "never", or "auto": it is a terminal, which TERM does not
 * call dumb, and NO_COLOR is not set or empty. */
bool wants_colour(std::string_view when, int descriptor);

/* Writes text to standard output in portions, so that a long listing need not be in memory as a whole. */
class output {
public:
    std::string text;

    void flush_if_full() {
        if (text.size() >= FULL)
            flush();
    }
    void flush() {
        print(text);
        text.clear();
    }

private:
    static constexpr std::size_t FULL = 65536; /* bytes */
};

} // namespace cdef

#endif
