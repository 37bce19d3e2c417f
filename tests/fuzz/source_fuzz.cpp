/* source_fuzz: compiles arbitrary bytes, and examines the result.
 *
 * The first byte holds the options: bit 0 n, bits 1 and 2 the level of d, bit 3 s, bit 4 an output whose name no class
 * can take, bit 5 an output that exists, bits 6 and 7 a source that extends across the end of the read buffer. The rest
 * is the source. Whatever it says, the compilation ends with a database or with status 1; a database is sound, and all
 * of it can be read; an error leaves the output as it was. */

#include "compiler/cdgen.h"
#include "fuzz.h"

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <fstream>
#include <string>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>
#include <vector>

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

    /* After this many lines of comment. */
    void write_source(const std::uint8_t *data, std::size_t size, std::size_t lines) const {
        std::string text;
        for (std::size_t i = 0; i < lines; ++i)
            text.append("#").append(COMMENT - 2, '-').append("\n");
        text.append(reinterpret_cast<const char *>(data), size);
        bool written = ftruncate(source_fd, 0) == 0 &&
                       pwrite(source_fd, text.data(), text.size(), 0) == static_cast<ssize_t>(text.size());
        fuzz::require(written, "the source cannot be written");
    }

    std::string output(bool names_a_class) const {
        return directory + (names_a_class ? "/out.cdef" : "/out");
    }

    std::string source;

    static constexpr std::size_t COMMENT = 254; /* bytes of a line */

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

/* The status that the program ends with. */
int compile_one(unsigned options, std::string source, std::string output) {
    std::string program = "cdgen", letters = "-d0";
    letters.back() = static_cast<char>('0' + (options >> 1 & 3));
    std::string n = "-n", s = "-s";
    std::vector<char *> arguments = {program.data(), letters.data()};
    if ((options & 1) != 0)
        arguments.push_back(n.data());
    if ((options & 8) != 0)
        arguments.push_back(s.data());
    arguments.insert(arguments.end(), {source.data(), output.data(), nullptr});
    return cdgen_main(static_cast<int>(arguments.size()) - 1, arguments.data());
}

/* A mapping takes long to see, so a fuzzer looks for it now and then only; a replay, always. */
void expect_no_mapping() {
#ifdef CDGEN_FUZZ
    constexpr unsigned NOW_AND_THEN = 1024;
#else
    constexpr unsigned NOW_AND_THEN = 1;
#endif
    static unsigned runs = 0;
    if (++runs % NOW_AND_THEN != 0)
        return;
    std::ifstream maps("/proc/self/maps");
    for (std::string line; std::getline(maps, line);)
        fuzz::require(line.find("/memfd:source") == std::string::npos && line.find("/cdgen-fuzz-") == std::string::npos,
                      "a file stayed mapped");
}

/* What can be seen of a file if it was touched. */
struct file_state {
    explicit file_state(const std::string &path) {
        struct stat st = {};
        exists = stat(path.c_str(), &st) == 0;
        inode = st.st_ino;
        size = st.st_size;
        changed = {st.st_ctim.tv_sec, st.st_ctim.tv_nsec};
    }
    bool operator==(const file_state &) const = default;

    bool exists;
    ino_t inode;
    off_t size;
    std::pair<time_t, long> changed;
};

/* What no compilation writes. */
void write_output(const std::string &path) {
    std::ofstream(path) << "what was there before";
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
    std::size_t text = size - 1;
    bool across = (options & 0xC0) == 0xC0 && text / 2 < SOURCE_BUFFER;
    f.write_source(data + 1, text, across ? (SOURCE_BUFFER - text / 2) / files::COMMENT : 0);
    unlink(output.c_str());
    if ((options & 0x20) != 0)
        write_output(output);
    file_state before(output);
    int lowest_free = fuzz::probe();
    int status = compile_one(options, f.source, output);
    fuzz::require(fuzz::probe() == lowest_free, "a descriptor stayed open");
    expect_no_mapping();
    fuzz::require(status == 0 || status == 1, "another status than 0 and 1");
    if (status == 0)
        look_through(output);
    else
        fuzz::require(file_state(output) == before, "the output was touched");
    return 0;
}
