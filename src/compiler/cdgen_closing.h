/* cdgen_closing.h: the steps at the end of the source. */
#ifndef CDGEN_CDGEN_CLOSING_H
#define CDGEN_CDGEN_CLOSING_H

#include "compiler/cdgen_context.h"

#include <span>

using closing_step = void (*)(cdgen &);

/* The steps up to the sizing of the image, in this order. */
extern const std::span<const closing_step> closing_steps;

#endif
