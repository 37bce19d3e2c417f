/* above_stdio.h: descriptors that no stream takes. */
#ifndef CDGEN_ABOVE_STDIO_H
#define CDGEN_ABOVE_STDIO_H

/* Returns a descriptor above the three standard ones, so that a trace on a closed stream cannot be written to it; or
 * -1, with errno. If fd, which may be -1, is not returned, it is closed. */
int above_stdio(int fd);

#endif
