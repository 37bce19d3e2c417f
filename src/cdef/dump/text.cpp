/* text.cpp: facts as text, and the listing. */

#include "cdef/dump/dump.h"

#include <bit>
#include <charconv>
#include <cmath>
#include <limits>

namespace cdef::dump {

namespace {

struct range {
    char32_t first;
    char32_t last;
};

/* Characters that would steer a terminal, break a line, or hide: controls, separators, what turns the writing
 * direction, and what Unicode calls default-ignorable, of which nothing is seen. Combining marks are seen, and pass. */
constexpr range unprintable[] = {{0x0, 0x1F},        {0x7F, 0x9F},       {0xAD, 0xAD},      {0x34F, 0x34F},
                                 {0x61C, 0x61C},     {0x115F, 0x1160},   {0x17B4, 0x17B5},  {0x180B, 0x180F},
                                 {0x200B, 0x200F},   {0x2028, 0x202E},   {0x2060, 0x206F},  {0x3164, 0x3164},
                                 {0xFE00, 0xFE0F},   {0xFEFF, 0xFEFF},   {0xFFA0, 0xFFA0},  {0xFFF0, 0xFFFB},
                                 {0x1BCA0, 0x1BCA3}, {0x1D173, 0x1D17A}, {0xE0000, 0xE0FFF}};

bool is_printable(char32_t character) {
    return std::none_of(std::begin(unprintable), std::end(unprintable),
                        [character](const range &r) { return character >= r.first && character <= r.last; });
}

/* Of a whole UTF-8 character. */
char32_t decode(std::string_view bytes) {
    auto lead = static_cast<unsigned char>(bytes[0]);
    if (bytes.size() == 1)
        return lead;
    char32_t character = lead & (0x7FU >> bytes.size());
    for (char c : bytes.substr(1))
        character = character << 6 | (static_cast<unsigned char>(c) & 0x3FU);
    return character;
}

void append_escaped(std::string &to, std::string_view bytes) {
    for (char c : bytes)
        switch (c) {
        case '\t':
            to += "\\t";
            break;
        case '\n':
            to += "\\n";
            break;
        case '\r':
            to += "\\r";
            break;
        default:
            appendf(to, "\\x%02x", static_cast<unsigned char>(c));
        }
}

template <class Bits, class Number> std::string shortest_of(Number number) {
    std::array<char, 32> digits;
    auto end = std::to_chars(digits.data(), digits.data() + digits.size(), number).ptr;
    std::string shown(digits.data(), end);
    constexpr int FRACTION = std::numeric_limits<Number>::digits - 1;
    Bits rest = std::bit_cast<Bits>(number) & ((Bits{1} << (FRACTION - 1)) - 1);
    if (std::isnan(number) && rest != 0)
        appendf(shown, "(0x%llx)", static_cast<unsigned long long>(rest));
    return shown;
}

/* A fact's text, by its kind. */
std::string text_of(none) {
    return "none";
}
std::string text_of(std::int64_t number) {
    return std::to_string(number);
}
std::string text_of(std::uint64_t number) {
    return std::to_string(number);
}
std::string text_of(float number) {
    return shortest(number);
}
std::string text_of(double number) {
    return shortest(number);
}
std::string text_of(bits b) {
    std::string shown;
    appendf(shown, "0x%x", b.number);
    return shown;
}
std::string text_of(const word &w) {
    return w.text;
}
std::string text_of(const words &w) {
    std::string joined;
    for (const std::string &item : w.list)
        joined += (joined.empty() ? "" : ", ") + item;
    if (joined.empty())
        return "none";
    return joined;
}
std::string text_of(text t) {
    return quoted(t.bytes);
}
std::string text_of(binary b) {
    return "0x" + hex_of(b.bytes);
}
std::string text_of(const vx_resource_handle_t &h) {
    std::string shown;
    appendf(shown, "0x%x 0x%x 0x%x 0x%x 0x%x", h.header, h.id.id1, h.id.id2, h.id.id3, h.id.id4);
    return shown;
}
std::string text_of(const named &n) {
    std::string shown = std::to_string(n.number) + ", ";
    if (n.kind.empty())
        return shown + "unknown";
    return shown.append(n.kind) + " " + quoted(n.name);
}
std::string text_of(const checksum &c) {
    if (c.found.empty())
        return "correct";
    return "wrong, " + c.found + " in the place of " + c.expected;
}

/* One fact a line, two blanks a level. */
class listing : public sink {
public:
    explicit listing(bool colours) : coloured(colours) {}

    void open(const label &group) override {
        levels.push_back(!group.title.empty());
        if (group.title.empty())
            return;
        line((coloured ? "\x1b[1m" : "") + group.title + (coloured ? "\x1b[0m" : ""));
        ++depth;
    }
    void open_list(const label &list) override {
        open(list);
    }
    void close() override {
        depth -= levels.back() ? 1 : 0;
        levels.pop_back();
    }
    void add(const label &what, const fact &f) override {
        if (!what.title.empty())
            line(what.title + ": " + as_text(f));
    }

    output out;

private:
    void line(const std::string &shown) {
        out.text.append(depth * 2, ' ');
        out.text += shown;
        out.text += '\n';
        out.flush_if_full();
    }

    bool coloured;
    std::size_t depth = 0;
    std::vector<bool> levels; /* whether each is seen */
};

} // namespace

std::size_t utf8_length(std::string_view bytes) {
    auto at = [bytes](std::size_t i) { return i < bytes.size() ? static_cast<unsigned char>(bytes[i]) : 0U; };
    unsigned lead = at(0);
    std::size_t length = lead < 0x80                   ? 1
                         : lead >= 0xC2 && lead < 0xE0 ? 2
                         : lead >= 0xE0 && lead < 0xF0 ? 3
                         : lead >= 0xF0 && lead < 0xF5 ? 4
                                                       : 0;
    if (bytes.size() < length || length == 0)
        return 0;
    for (std::size_t i = 1; i < length; ++i)
        if ((at(i) & 0xC0) != 0x80)
            return 0;
    bool overlong = (lead == 0xE0 && at(1) < 0xA0) || (lead == 0xF0 && at(1) < 0x90);
    bool outside = (lead == 0xED && at(1) >= 0xA0) || (lead == 0xF4 && at(1) >= 0x90);
    return overlong || outside ? 0 : length;
}

std::size_t printable_length(std::string_view bytes) {
    std::size_t length = utf8_length(bytes);
    return length != 0 && is_printable(decode(bytes.substr(0, length))) ? length : 0;
}

/* slashed: characters that get a backslash. */
static std::string escaped(std::string_view bytes, std::string_view slashed) {
    std::string shown;
    while (!bytes.empty()) {
        std::string_view character = bytes.substr(0, std::max<std::size_t>(utf8_length(bytes), 1));
        if (slashed.find(character) != std::string_view::npos)
            shown += '\\';
        if (printable_length(bytes) != 0)
            shown += character;
        else
            append_escaped(shown, character);
        bytes.remove_prefix(character.size());
    }
    return shown;
}

std::string quoted(std::string_view bytes) {
    return '"' + escaped(bytes, "\"\\") + '"';
}

std::string harmless(std::string_view bytes) {
    return escaped(bytes, {});
}

std::string hex_of(std::span<const std::byte> bytes) {
    constexpr std::string_view digits = "0123456789abcdef";
    std::string shown;
    for (std::byte b : bytes) {
        shown += digits[std::to_integer<unsigned>(b) >> 4];
        shown += digits[std::to_integer<unsigned>(b) & 0xF];
    }
    return shown;
}

std::string shortest(float number) {
    return shortest_of<std::uint32_t>(number);
}

std::string shortest(double number) {
    return shortest_of<std::uint64_t>(number);
}

std::string as_text(const fact &f) {
    return std::visit([](const auto &some) { return text_of(some); }, f);
}

void show_listing(const input &in, bool with_offsets) {
    listing to(wants_colour());
    walk(in.db, to, with_offsets);
    to.out.flush();
}

} // namespace cdef::dump
