/* replay: gives a fuzz target the files of the directories that it is called with, one after another, and says which
 * one it is at. So what has once been found stays found, with any compiler. */

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
    std::size_t given = 0;
    for (int i = 1; i < argc; ++i)
        for (const auto &entry : std::filesystem::recursive_directory_iterator(argv[i]))
            if (entry.is_regular_file()) {
                give(entry.path());
                ++given;
            }
    return given == 0;
}
