/* read.cpp: reads all of a database through its views; of the database that comes with the benchmark it is known that
 * it is sound. */

#include "reader/read_everything.h"

#include <cstdio>

int main(int argc, char **argv) {
    std::error_code error;
    std::vector<std::byte> image = cdb::read_file(argc > 1 ? argv[1] : "", error);
    if (error) {
        std::fprintf(stderr, "bench_read: %s\n", error.message().c_str());
        return 1;
    }
    reading::everything all(true);
    all.read(cdb::database(image));
    std::printf("%llu\n", static_cast<unsigned long long>(all.sum));
    return 0;
}
