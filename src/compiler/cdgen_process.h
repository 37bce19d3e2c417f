/* cdgen_process.h: how the compiler's own process ends. */
#ifndef CDGEN_CDGEN_PROCESS_H
#define CDGEN_CDGEN_PROCESS_H

#include <csignal>
#include <sys/types.h>

/* An output that is being written. Both functions may be called by signal handlers. */
struct unfinished_output {
    const char *name = nullptr;
    dev_t device = 0;
    ino_t inode = 0;

    /* True if the name still refers to this file. Another program may have removed or replaced it. */
    bool has_its_name() const;
    /* Removes the file if the name still refers to it. */
    void remove() const;
};

/* For a process that runs only the compiler (cdgen_process.cpp). A signal that ends it while it is writing first
 * removes the output. If other programs interfere with its files and streams, or if memory runs out, it ends with a
 * message and a status. */
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
