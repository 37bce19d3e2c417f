/* data_types.h: questions about data types. */
#ifndef CDGEN_FORMAT_DATA_TYPES_H
#define CDGEN_FORMAT_DATA_TYPES_H

#include "vx.h"

/* 1 for an array type, else 0. */
constexpr int is_vx_array(vx_data_type_t dt) {
    return static_cast<unsigned>(dt) - VX_INT32_ARRAY < 10;
}

/* The element type of an array type; any other type unchanged. */
constexpr vx_data_type_t scalar_vx(vx_data_type_t dt) {
    return is_vx_array(dt) ? static_cast<vx_data_type_t>(dt - VX_INT32_ARRAY + VX_INT32) : dt;
}

#endif
