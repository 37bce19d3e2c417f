/* cdgen_process.h: how a process that is the compiler alone ends. */
#ifndef CDGEN_CDGEN_PROCESS_H
#define CDGEN_CDGEN_PROCESS_H

#include <csignal>
#include <sys/types.h>

/* An output that is being written. Both functions may be called by signal handlers. */
struct unfinished_output {
    const char *name = nullptr;
    dev_t device = 0;
    ino_t inode = 0;

    /* Whether the name still leads to this file: another program may have removed or replaced it. */
    bool has_its_name() const;
    /* Removes the name if it still leads to this file. */
    void remove() const;
};

/* For a program that is the compiler alone (cdgen_process.cpp): a signal that ends it while it is writing removes
 * the output first; what other programs do to its files and streams, and a lack of memory, end it with a message and a
 * status. */
void take_process();
/* The output that is being written, which must stay where it is; null if there is none. */
void set_unfinished_output(const unfinished_output *output);

/* Holds back the signals that remove the output, until the end of the block. */
class held_signals {
public:
    held_signals();
    held_signals(const held_signals &) = delete;
    held_signals &operator=(const held_signals &) = delete;
    ~held_signals();

private:
    sigset_t before;
};

/* Why the output cannot be mapped, or not be written to its end. */
constexpr char CUT_OUTPUT[] = "it was cut while it was written";

#endif
