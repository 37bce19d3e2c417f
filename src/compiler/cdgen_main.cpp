/* cdgen_main.cpp: the program's entry; everything else is a library that tests link too. */

#include "compiler/cdgen.h"

#include "compiler/cdgen_process.h"

int main(int argc, char **argv) {
    take_process();
    return cdgen_main(argc, argv);
}
