/* cdgen.cpp: the driver: the command line, the fixed order of the phases, and the only place that prints a fatal
 * message. */

#include "compiler/cdgen.h"

#include "compiler/cdgen_closing.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <new>
#include <unistd.h>

namespace {

void parse_options(cdgen &cx, int argc, char **argv) {
    optind = 0; /* forget any earlier command line of this process */
    for (int option = 0; (option = getopt(argc, argv, "nd:s")) != -1;) {
        switch (option) {
        case 'n':
            cx.options.interactive = 0;
            break;
        case 'd':
            cx.options.debugLevel =
                atoi(optarg); /* 0 for text that is not a number; does not affect the errno of conversions in the source
                               */
            break;
        case 's':
            cx.options.swap_endianness = 1;
            break;
        default: /* getopt has printed a message, so nothing else is printed */
            throw fatal_exit{NO_MESSAGE, nullptr, nullptr, 0, 1};
        }
    }
}

/* The two usage texts are deliberately different. */
void parse_command_line(cdgen &cx, int argc, char **argv) {
    parse_options(cx, argc, argv);
    if (optind >= argc)
        cdgen_error_exit(MSG_USAGE, argv[0],
                         " [-s] cdefsrc_filename cdef_filename\n    -s Reverse endianness of CDB.\n", 0, 1);
    cx.options.cdefsrc = argv[optind++];
    if (optind >= argc)
        cdgen_error_exit(MSG_USAGE_NO_OUTPUT, argv[0], " cdefsrc_filename cdef_filename", 0, 1);
    cx.options.cdefname = argv[optind];
}

/* Traces come first: some explain the message. */
int report(const cdgen &cx, const fatal_exit &failure) {
    fflush(stdout);
    if (failure.id == NO_MESSAGE)
        return failure.code;
    const char *end = cx.options.interactive ? "\n" : "";
    auto [first, second, third] = words_of(failure);
    if (failure.line != 0)
        fprintf(stderr, "%d: %s%s%s%s", failure.line, first, second, third, end);
    else
        fprintf(stderr, "%s%s%s%s", first, second, third, end);
    return failure.code;
}

} // namespace

void compile(cdgen &cx) {
    cache_input_data(cx, cx.options.cdefsrc);
    for (closing_step step : closing_steps)
        step(cx);
    bld_cdb(cx);
}

int cdgen_main(int argc, char **argv) {
    cdgen cx;
    try {
        parse_command_line(cx, argc, argv);
        compile(cx);
        return 0;
    } catch (const fatal_exit &failure) {
        return report(cx, failure);
    } catch (const std::bad_alloc &) { /* thrown by the standard library's containers */
        return report(cx, {MSG_OUT_OF_MEMORY, strerror(ENOMEM), nullptr, 0, ENOMEM});
    }
}
