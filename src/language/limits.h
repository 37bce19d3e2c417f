/* limits.h: limits for sources. */
#ifndef CDGEN_LANGUAGE_LIMITS_H
#define CDGEN_LANGUAGE_LIMITS_H

#include <cstddef>

/* The most bytes of a line that are read at once, including the newline; a longer line is read in pieces. */
constexpr std::size_t LINE_MAX_CHARS = 254;

/* Bytes of an attribute's value, without quotes. */
constexpr std::size_t VALUE_MAX_CHARS = 1797;

/* Variable classes that dynamic attributes may name. */
constexpr std::size_t VARIABLE_CLASSES_MAX = 100;

#endif
