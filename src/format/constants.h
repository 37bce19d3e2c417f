/* constants.h: the numbers that the compiler stores in fields that no line of a source sets. */
#ifndef CDGEN_FORMAT_CONSTANTS_H
#define CDGEN_FORMAT_CONSTANTS_H

#include "vx.h"

inline constexpr vx_uint16_t NO_GROUP = 255;
inline constexpr vx_uint16_t NO_LOCATOR = 0xFFFF;
inline constexpr vx_uint16_t NO_SD_INDEX = 0xFFFF; /* the highest index of an attribute without elements */

/* The values of these fields in every element of a structure. */
inline constexpr vx_uint32_t NO_ACTION_ID = 0xFFFF;
inline constexpr vx_uint16_t SD_VALID_TYPE = 1;

/* The value of a permission template if its line is given, whatever its text. */
inline constexpr vx_uint32_t PERMISSIONS_GIVEN = 0xEEEEEEEE;

#endif
