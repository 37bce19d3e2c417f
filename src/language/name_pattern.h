/* name_pattern.h: finds out whether a line begins with a certain name and an equals sign, without a loop. */
#ifndef CDGEN_LANGUAGE_NAME_PATTERN_H
#define CDGEN_LANGUAGE_NAME_PATTERN_H

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>

namespace language {

class name_pattern {
public:
    /* Bytes of the line that are read, whatever follows the name. */
    static constexpr std::size_t WIDTH = 24;

    /* The name must be shorter than WIDTH. */
    constexpr name_pattern(std::string_view name) {
        std::array<char, WIDTH> wanted = {};
        std::array<char, WIDTH> compared = {};
        for (std::size_t at = 0; at <= name.size(); ++at) {
            wanted.at(at) = at < name.size() ? name[at] : '=';
            compared.at(at) = static_cast<char>(0xFF);
        }
        bytes = std::bit_cast<words>(wanted);
        mask = std::bit_cast<words>(compared);
    }

    bool begins(const char *line) const {
        return (differences(line, 0) | differences(line, 1) | differences(line, 2)) == 0;
    }

private:
    using words = std::array<std::uint64_t, WIDTH / sizeof(std::uint64_t)>;

    std::uint64_t differences(const char *line, std::size_t word) const {
        std::uint64_t read = 0;
        std::memcpy(&read, line + word * sizeof read, sizeof read);
        return (read ^ bytes[word]) & mask[word];
    }

    words bytes = {}; /* the name, the equals sign and zeros */
    words mask = {};  /* all bits of the bytes that are compared */
};

} // namespace language

#endif
