/* number_lines.h: numbers, each with the line that gave it first. There may be very many. */
#ifndef CDGEN_CHECK_NUMBER_LINES_H
#define CDGEN_CHECK_NUMBER_LINES_H

#include "text/keyed_hash.h"

#include "vx.h"

#include <cstddef>
#include <vector>

namespace check {

class number_lines {
public:
    explicit number_lines(const text::hash_key &with) : key(with) {}

    /* The line that gave a number first. If none did, returns 0 and notes this line, which is not 0. */
    int add(vx_uint32_t number, int line);
    /* The line of a number; 0 if it is not known. */
    int find(vx_uint32_t number) const;
    void clear();

    /* How many slots a search for the number looks at. There must be some number. */
    size_t probes_for(vx_uint32_t number) const;

private:
    static constexpr size_t FEWEST_SLOTS = 64;

    struct slot {
        vx_uint32_t number;
        int line; /* 0: the slot is free */
    };

    size_t home_of(vx_uint32_t number) const;
    size_t slot_of(vx_uint32_t number) const;
    void grow();

    text::hash_key key;
    size_t count = 0;
    std::vector<slot> slots; /* at most half of them are taken */
};

} // namespace check

#endif
