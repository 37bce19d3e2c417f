/* cdgen_error.h: how a compilation ends early. */
#ifndef CDGEN_CDGEN_ERROR_H
#define CDGEN_CDGEN_ERROR_H

#include "language/messages.h"

#include <array>

struct cdgen;

/* The only exception, thrown by the fatal exits and caught by the driver. The details are literals, or are owned by the
 * context or by the caller of the compilation; each may be null. */
struct fatal_exit {
    message_id id; /* NO_MESSAGE: nothing is to be printed */
    const char *detail1;
    const char *detail2;
    int line; /* 0: none */
    int code; /* exit status */

    /* The stanza_id of the stanza whose record could not be completed, -1 if something else failed. All structured data
     * have the same one. */
    int record = -1;
};

/* The texts of the message and its details in the order in which they are printed, without separators; no text is null.
 * There must be a message. */
std::array<const char *, 3> words_of(const fatal_exit &failure);

/* These functions end the compilation and do not return. Parsing and assembly use cdgen_error_exit, the image builder
 * bld_error_exit. Details may be null. */
[[noreturn]] void cdgen_error_exit(message_id id, const char *detail1, const char *detail2, int line, int code);
[[noreturn]] void bld_error_exit(message_id id, const char *detail1, const char *detail2, int code);

/* The usual case: a message about the current line, status 1. */
[[noreturn]] void source_error(cdgen &cx, message_id id, const char *detail1 = nullptr, const char *detail2 = nullptr);

/* Runs the completion of a kind's record. If it fails, the exception names the kind. */
template <class Complete> void completing(int kind, Complete complete) {
    try {
        complete();
    } catch (fatal_exit &failure) {
        failure.record = kind;
        throw;
    }
}

#endif
