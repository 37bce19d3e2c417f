/* store.cpp: writes a database to its file. */

#include "cdef/build/store.h"

#include "build/image.h"
#include "cdb_view.h"
#include "cdef/support/failure.h"
#include "cdef/support/output.h"
#include "cdef/support/replacement.h"

#include <string_view>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

namespace cdef::build_command {

namespace {

std::string_view text_of(std::span<const std::byte> image) {
    return {reinterpret_cast<const char *>(image.data()), image.size()};
}

/* Compares inodes, because one file may have different names. */
bool is_same_file(const struct stat &target, const std::string &source) {
    struct stat st = {};
    int found = source == "-" ? fstat(STDIN_FILENO, &st) : stat(source.c_str(), &st);
    return found == 0 && st.st_dev == target.st_dev && st.st_ino == target.st_ino;
}

bool is_up_to_date(const std::string &path, const struct stat &target, std::span<const std::byte> image) {
    if (!S_ISREG(target.st_mode) || static_cast<size_t>(target.st_size) != image.size())
        return false;
    std::error_code error;
    std::vector<std::byte> file = cdb::read_file(path.c_str(), error);
    return !error && build::is_same_but_time(image, file);
}

} // namespace

stored store(std::span<const std::byte> image, const std::string &path, const std::string &source, bool sync) {
    if (path == "-") {
        print(std::string(text_of(image)));
        return stored::WRITTEN;
    }
    struct stat target = {};
    bool exists = stat(path.c_str(), &target) == 0;
    if (exists && is_same_file(target, source))
        throw failure(path + ": cannot write: it is the source");
    if (exists && is_up_to_date(path, target, image)) {
        if (sync)
            sync_file(path);
        return stored::UNCHANGED;
    }
    replace_file(path, text_of(image), {.sync = sync});
    return stored::WRITTEN;
}

} // namespace cdef::build_command
