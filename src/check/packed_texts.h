/* packed_texts.h: texts in the order in which they came, in little memory. There may be very many. */
#ifndef CDGEN_CHECK_PACKED_TEXTS_H
#define CDGEN_CHECK_PACKED_TEXTS_H

#include "language/limits.h"

#include <cstddef>
#include <cstdint>
#include <limits>
#include <string>
#include <string_view>
#include <vector>

namespace check {

class packed_texts {
public:
    /* A line or a part of one. */
    void add(std::string_view text);
    void clear();

    size_t size() const {
        return ends.size();
    }
    /* Valid until the next text is added. */
    std::string_view operator[](size_t position) const {
        size_t begin = position % BLOCK == 0 ? 0 : ends[position - 1];
        return {blocks[position / BLOCK].data() + begin, ends[position] - begin};
    }

private:
    using offset = std::uint16_t;

    static constexpr size_t BLOCK = 256; /* so many texts are in one block */
    static_assert(BLOCK * LINE_MAX_CHARS <= std::numeric_limits<offset>::max());

    std::vector<std::string> blocks; /* all but the last one have no room left */
    std::vector<offset> ends;        /* of each text in its block */
};

} // namespace check

#endif
