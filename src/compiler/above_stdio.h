/* above_stdio.h: descriptors that no stream takes. */
#ifndef CDGEN_ABOVE_STDIO_H
#define CDGEN_ABOVE_STDIO_H

/* A descriptor above the three standard ones, so that a trace on a closed stream cannot end up in it; or -1, with
 * errno. fd, which may be -1, is closed if it is not returned. */
int above_stdio(int fd);

#endif
