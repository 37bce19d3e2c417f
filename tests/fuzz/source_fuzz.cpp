/* source_fuzz: compiles arbitrary bytes, and looks through what comes of them.
 *
 * The first byte holds the options: bit 0 n, bits 1 and 2 the level of d, bit 3 s, bit 4 an output whose name no class
 * can take, bit 5 an output that exists. The rest is the source. Whatever it says, the compilation ends with a database
 * or with one of the program's own statuses; a database is sound, and all of it can be read. */

#include "cdgen.h"
#include "fuzz.h"

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <fstream>
#include <string>
#include <sys/mman.h>
#include <unistd.h>

namespace {

/* Files in memory: the source, and a directory for the output. */
class files {
public:
    files() : source_fd(memfd_create("source", 0)), directory(make_directory()) {
        fuzz::require(source_fd >= 0, "no memory file");
        source = "/proc/self/fd/" + std::to_string(source_fd);
        null = fopen("/dev/null", "w");
        fuzz::require(null != nullptr, "no null device");
        stdout = stderr = null; /* traces and messages; libFuzzer keeps the streams that it has seen before */
    }
    files(const files &) = delete;
    files &operator=(const files &) = delete;
    ~files() {
        unlink(output(true).c_str());
        unlink(output(false).c_str());
        rmdir(directory.c_str());
    }

    void write_source(const std::uint8_t *data, std::size_t size) const {
        bool written = ftruncate(source_fd, 0) == 0 && pwrite(source_fd, data, size, 0) == static_cast<ssize_t>(size);
        fuzz::require(written, "the source cannot be written");
    }

    std::string output(bool names_a_class) const {
        return directory + (names_a_class ? "/out.cdef" : "/out");
    }

    std::string source;

private:
    static std::string make_directory() {
        std::string name = "/dev/shm/cdgen-fuzz-XXXXXX";
        fuzz::require(mkdtemp(name.data()) != nullptr, "no directory");
        return name;
    }

    int source_fd;
    std::string directory;
    FILE *null = nullptr;
};

/* The lowest descriptor that is free. */
int probe() {
    int fd = open("/dev/null", O_RDONLY | O_CLOEXEC);
    close(fd);
    return fd;
}

/* The status, as the driver has it. */
int compile_one(unsigned options, const std::string &source, const std::string &output) {
    cdgen cx;
    cx.interactive = (options & 1) == 0;
    cx.debugLevel = static_cast<int>(options >> 1 & 3);
    cx.swap_endianness = static_cast<int>(options >> 3 & 1);
    cx.cdefsrc = source.c_str();
    cx.cdefname = output.c_str();
    try {
        compile(cx);
    } catch (const fatal_exit &failure) {
        fuzz::require(failure.code == 1 && failure.msg != nullptr && *failure.msg != '\0', "another status than 1");
        return failure.code;
    }
    return 0;
}

/* A mapping takes long to see, so it is looked for now and then only. */
void expect_no_mapping() {
    constexpr unsigned NOW_AND_THEN = 1024;
    static unsigned runs = 0;
    if (++runs % NOW_AND_THEN != 0)
        return;
    std::ifstream maps("/proc/self/maps");
    for (std::string line; std::getline(maps, line);)
        fuzz::require(line.find("/memfd:source") == std::string::npos && line.find("/cdgen-fuzz-") == std::string::npos,
                      "a file stayed mapped");
}

void look_through(const std::string &output) {
    std::error_code error;
    std::vector<std::byte> image = cdb::read_file(output.c_str(), error);
    fuzz::require(!error, "no output");
    cdb::database db(image);
    for (const cdb::finding &f : cdb::verify(db))
        if (f.broken->level == cdb::severity::error)
            fuzz::fail("unsound: " + fuzz::text_of(f));
    fuzz::read_all(db, true);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    static files f;
    if (size == 0)
        return 0;
    unsigned options = data[0];
    std::string output = f.output((options & 0x10) == 0);
    f.write_source(data + 1, size - 1);
    if ((options & 0x20) == 0)
        unlink(output.c_str());
    bool existed = access(output.c_str(), F_OK) == 0;
    int lowest_free = probe();
    int status = compile_one(options, f.source, output);
    fuzz::require(probe() == lowest_free, "a descriptor stayed open");
    expect_no_mapping();
    if (status == 0)
        look_through(output);
    else
        fuzz::require(existed == (access(output.c_str(), F_OK) == 0), "the output was touched");
    return 0;
}
