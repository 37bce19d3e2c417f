/* cdgen_process.h: how a process that is the compiler alone ends. */
#ifndef CDGEN_CDGEN_PROCESS_H
#define CDGEN_CDGEN_PROCESS_H

/* For a program that is the compiler alone (cdgen_process.cpp): a signal that ends it while it is writing removes
 * the output first; what other programs do to its files and streams, and a lack of memory, end it with a message and a
 * status. */
void take_process();
/* The output that is being written, which must stay where it is; null if there is none. */
void set_unfinished_output(const char *name);

#endif
