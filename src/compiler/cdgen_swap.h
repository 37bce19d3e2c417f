/* cdgen_swap.h: reversing the byte order of single records, in place. Everything is read in native order before it is
 * reversed, and what a reference leads to is reversed before the reference. */
#ifndef CDGEN_CDGEN_SWAP_H
#define CDGEN_CDGEN_SWAP_H

#include "cdb.h"

#include <algorithm>
#include <cstddef>
#include <span>
#include <vector>

/* Reverses the byte order of a finished image in place. nowhere: places in the image of words that look like references
 * and are not; they are reversed, but not followed. to_numbers: places, ascending, of references to arrays of numbers
 * whose record has another array type; their elements are not followed. */
void cdgen_cdef_swap(char *cdb_hdr_p, std::span<const size_t> nowhere = {}, std::span<const size_t> to_numbers = {});

/* Cells of an image, by their places in it, ascending. */
struct cell_places {
    const char *image = nullptr;
    std::span<const size_t> places = {};

    bool holds(const char *cell) const {
        return std::binary_search(places.begin(), places.end(), static_cast<size_t>(cell - image));
    }
};

/* A table that references lead into. Returns each item in it only once, and only if it is inside. */
class swap_area {
public:
    swap_area(char *start, size_t bytes) : base(start), size(bytes), taken(bytes / ALIGNMENT) {}

    /* The address of the item at an offset: a head of head bytes, in which the word at count_at says how many entries
     * of entry bytes follow. Null if some of it is outside, or if it has been returned before. */
    char *take(vx_uint32_t offset, size_t head, size_t count_at = 0, size_t entry = 0);

    /* The greatest depth of values inside values, because recursion must end whatever the file contains. (The compiler
     * writes at most 4.) */
    static constexpr unsigned NESTING_MAX = 64;
    unsigned nesting = 0;   /* values being reversed */
    cell_places to_numbers; /* their arrays are reversed, but the elements are not followed */

private:
    /* Bytes. The compiler starts lists, definitions and values on multiples of 8; multiples of 4 are accepted. */
    static constexpr size_t ALIGNMENT = 4;

    char *base;
    size_t size;
    std::vector<bool> taken;
};

/* The reversal of a field of 2, 4 or 8 bytes; other widths are left alone. */
void swap_any(char *field, size_t width);

/* The cell and, where sbase_p has it, the out-of-line value. */
void swap_value(char *value, vx_data_type_t type, swap_area &sbase_p);

void swap_var_list(char *list);
void swap_valid_vals(char *vv, vx_data_type_t type, swap_area &sbase_p);
void swap_sd_def(char *sd, swap_area &vvbase_p, swap_area &sbase_p);

/* count records from the first on, with what they refer to. */
void swap_pattr(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                swap_area &sdbase_p);
void swap_dattr(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                swap_area &sdbase_p);
void swap_action(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                 swap_area &sdbase_p);
void swap_errors(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                 swap_area &sdbase_p);
void swap_depends(char *first, vx_uint32_t count, swap_area &sbase_p, swap_area &vvbase_p, swap_area &vlbase_p,
                  swap_area &sdbase_p);

#endif
