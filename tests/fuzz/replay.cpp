/* replay: gives a fuzz target the files of a directory, one after another, and says which one it is at. So what has
 * once been found stays found, with any compiler. With CDGEN_SHARE=7, it gives it one file in seven. */

#include "sample.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <unistd.h>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size);

namespace {

void give(const std::filesystem::path &file) {
    std::string at = file.string() + "\n"; /* the stream may be the target's */
    [[maybe_unused]] ssize_t written = write(STDERR_FILENO, at.data(), at.size());
    std::ifstream in(file, std::ios::binary);
    std::vector<char> contents{std::istreambuf_iterator<char>(in), {}};
    std::vector<std::uint8_t> exact(contents.begin(), contents.end());
    exact.shrink_to_fit();
    LLVMFuzzerTestOneInput(exact.data(), exact.size());
}

} // namespace

int main(int argc, char **argv) {
    if (argc != 2)
        return 2;
    std::vector<std::filesystem::path> files;
    for (const auto &entry : std::filesystem::recursive_directory_iterator(argv[1]))
        if (entry.is_regular_file())
            files.push_back(entry.path());
    std::sort(files.begin(), files.end());
    sampling::sample chosen = sampling::of_this_run();
    for (const auto &file : files)
        if (chosen.takes())
            give(file);
    return files.empty();
}
