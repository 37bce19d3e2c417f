/* cdgen_process.h: how the compiler's own process ends. */
#ifndef CDGEN_CDGEN_PROCESS_H
#define CDGEN_CDGEN_PROCESS_H

#include <csignal>
#include <sys/types.h>

/* An output that is being written. Its functions may be called by signal handlers. */
struct unfinished_output {
    const char *name = nullptr;
    dev_t device = 0;
    ino_t inode = 0;
    int fd = -1;    /* once it is mapped */
    off_t size = 0; /* which the mapped file has unless another program shortens it */

    /* True if the name still refers to this file. Another program may have removed or replaced it. */
    bool has_its_name() const;
    /* Removes the file if the name still refers to it. */
    void remove() const;
    /* True if the mapped file has become shorter. */
    bool is_cut() const;
};

/* For a process that runs only the compiler. If other programs interfere with its files and streams, or if memory runs
 * out, it ends with a message and a status. A bus error, a call of abort or the lack of memory first removes an output
 * that is being written; for other signals, held_signals does that. */
void take_process();
/* The output that is being written, which must stay where it is; null if there is none. */
void set_unfinished_output(const unfinished_output *output);
void remove_unfinished_output();

/* The signals that end a program, except those that report a defect of it (SIGSEGV and the like) and SIGPIPE and
 * SIGXFSZ, for which a system call returns an error. */
sigset_t ending_signals();

/* Holds back the ending signals while an output is written, except SIGBUS, which the kernel sends if the output is cut.
 * Handlers would need a system call for each signal. */
class held_signals {
public:
    held_signals();
    held_signals(const held_signals &) = delete;
    held_signals &operator=(const held_signals &) = delete;
    ~held_signals();

    /* True if a signal is pending that ends the program as soon as it is let through. The output has to be removed
     * before that. */
    bool will_end_program() const;

private:
    sigset_t held;
    sigset_t before;
};

/* Why the output cannot be mapped, or not be written to its end. */
constexpr char CUT_OUTPUT[] = "it was cut while it was written";
constexpr char UNSTORED_OUTPUT[] = "the system could not store it";

#endif
