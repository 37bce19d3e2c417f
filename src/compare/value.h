/* value.h: values as they are compared. Two values are equal if they would be shown alike. */
#ifndef CDGEN_COMPARE_VALUE_H
#define CDGEN_COMPARE_VALUE_H

#include "cdb_view.h"
#include "reader/ownership.h"

#include <array>
#include <compare>

namespace compare {

/* A value, and what is needed to follow it. */
struct owned_value {
    cdb::value value;
    bool is_own = true;   /* true: the value belongs to its record; false: it is not followed */
    cdb::bytes strings{}; /* of its class */
    const cdb::ownership *owners = nullptr;
};

/* The value in a cell of an area. */
owned_value value_in(const cdb::bytes &area, std::size_t at, vx_data_type_t type, const cdb::bytes &strings,
                     const cdb::ownership &owners);

enum class shape : std::uint8_t { NOTHING, MISPLACED, NUMBER, TEXT, BINARY, HANDLE, ARRAY, STRUCTURE };

/* A number as text. */
class digits {
public:
    void assign(std::string_view text) {
        size = std::min(text.size(), room.size());
        text.copy(room.data(), size);
    }
    std::string_view text() const {
        return {room.data(), size};
    }

private:
    std::array<char, 56> room = {};
    std::size_t size = 0;
};

/* How a value looks when it is shown. Two values with equal looks are shown alike, whatever their types. */
struct look {
    shape is = shape::NOTHING;
    digits number = {};          /* of a number, a handle, and a misplaced value its offset */
    std::string_view bytes = {}; /* of a text or a binary */
    std::size_t count = 0;       /* of elements, which are not part of it */

    /* What distinguishes it from others of its shape, apart from its elements. */
    std::string_view content() const {
        return is == shape::TEXT || is == shape::BINARY ? bytes : number.text();
    }
};

look look_at(const owned_value &v);

/* An element of an array or a structure. */
owned_value element_of(const owned_value &v, std::size_t index);

/* True if two values would be shown alike. Takes time proportional to the smaller one. */
bool read_alike(const owned_value &a, const owned_value &b);

/* An order of values without elements, in which values that are shown alike are equal. */
std::strong_ordering order_of(const look &a, const look &b);

} // namespace compare

#endif
