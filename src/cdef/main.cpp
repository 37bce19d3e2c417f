/* main.cpp: the program's entry; everything else is a library that a fuzzer links too. */

#include "cdef/cdef.h"
#include "cdef/support/failure.h"

#include <cstdio>
#include <cstdlib>
#include <new>

namespace {

/* Does not throw, because unwinding would destroy JSON values, which takes memory too. */
[[noreturn]] void end_without_memory() {
    std::fputs("cdef: out of memory\n", stderr);
    std::exit(cdef::FAILED);
}

} // namespace

int main(int argc, char **argv) {
    std::set_new_handler(end_without_memory);
    return cdef::cdef_main(argc, argv);
}
