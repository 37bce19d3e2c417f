/* captured.h: standard streams that go to memory. */
#ifndef CDGEN_FUZZ_CAPTURED_H
#define CDGEN_FUZZ_CAPTURED_H

#include "fuzz.h"

#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <string>

namespace fuzz {

/* A standard stream that goes to memory while this lives. */
class captured {
public:
    explicit captured(FILE *&standard) : stream(standard), former(standard) {
        stream = open_memstream(&text, &size);
        require(stream != nullptr, "no memory stream");
    }
    captured(const captured &) = delete;
    captured &operator=(const captured &) = delete;
    ~captured() {
        fclose(stream);
        stream = former;
        free(text);
    }

    std::string taken() const {
        require(fflush(stream) == 0, "a memory stream is full");
        return {text, size};
    }

private:
    FILE *&stream;
    FILE *former;
    char *text = nullptr;
    std::size_t size = 0;
};

} // namespace fuzz

#endif
