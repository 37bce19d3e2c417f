/* numbers.cpp: numbers that the compiler takes otherwise than they were meant. */

#include "check/recovery.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>

namespace cdef::check {

/* A number as the C library reads it. Plain ones are read without it. */
struct number {
    explicit number(std::string_view given, int base) : text(given) {
        constexpr size_t SAFE_DIGITS = 18;
        bool plain = !text.empty() && text.size() <= SAFE_DIGITS && (text[0] != '0' || text.size() == 1 || base == 10);
        for (; plain && read < text.size() && text[read] >= '0' && text[read] <= '9'; ++read)
            value = value * 10 + (text[read] - '0');
        if (read == 0 || read < text.size())
            convert(base);
    }

    void convert(int base) {
        std::string copy(text);
        errno = 0;
        char *stop = nullptr;
        value = std::strtol(copy.c_str(), &stop, base);
        overflow = errno == ERANGE;
        read = static_cast<size_t>(stop - copy.c_str());
    }

    std::string_view rest() const {
        std::string_view left = text.substr(read);
        return left.substr(std::min(left.find_first_not_of(" \t"), left.size()));
    }

    std::string_view text;
    long value = 0;
    size_t read = 0;
    bool overflow = false;
};

namespace {

/* Nothing but digits, no octal ones, and too few of them to be too large: as nearly all numbers are. */
bool is_plain(std::string_view text, int bits) {
    size_t safe_digits = bits == 16 ? 4 : 9;
    return !text.empty() && text.size() <= safe_digits && (text[0] != '0' || text.size() == 1) &&
           std::all_of(text.begin(), text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

/* Low and high of "low,high", with the offset of the second; both are the whole text if there is no comma. */
struct pair_of_texts {
    explicit pair_of_texts(std::string_view text) : low(text), high(text) {
        size_t comma = text.find(',');
        if (comma == std::string_view::npos)
            return;
        low = text.substr(0, comma);
        high = text.substr(comma + 1);
        offset = comma + 1;
    }

    bool two() const {
        return offset > 0;
    }

    std::string_view low, high;
    size_t offset = 0;
};

} // namespace

/* Of a text that is a number in front, or nowhere. */
void session::watch_rest(const number &n, const place &at) {
    if (n.read == 0)
        warn(NUMBER_TEXT, at, "no number: it is read as 0");
    else if (!n.rest().empty())
        warn(NUMBER_TEXT, at, "only the number in front counts: it is read as " + std::to_string(n.value));
}

/* A number16 or number32, or one part of it. */
void session::watch_number(std::string_view text, size_t offset, int bits) {
    if (is_plain(text, bits))
        return;
    number n(text, 0);
    place at = value_part(offset, text.size());
    long limit = (1L << bits) - 1;
    watch_rest(n, at);
    if (n.overflow || n.value < 0 || n.value > limit)
        warn(NARROWED, at,
             "does not fit " + std::to_string(bits) + " bits: it is stored as " + std::to_string(n.value & limit));
    size_t digits = text.find_first_not_of(" \t+-");
    bool octal = digits != std::string_view::npos && digits + 1 < n.read && text[digits] == '0' &&
                 text[digits + 1] >= '0' && text[digits + 1] <= '7';
    if (octal && n.value != number(text, 10).value)
        warn(OCTAL, at, "a leading 0 makes it octal: it is read as " + std::to_string(n.value));
}

/* A number of an unsigned type, of which only the low bits are stored, and what is below 0 as its complement. */
void session::watch_unsigned(std::string_view text, size_t offset, vx_data_type_t type) {
    if (is_plain(text, 32))
        return;
    vx_uint64_t value = std::strtoull(std::string(text).c_str(), nullptr, 10);
    vx_uint64_t stored = type == VX_UINT32 ? static_cast<vx_uint32_t>(value) : value;
    bool negative = text.find('-') != std::string_view::npos && value != 0;
    if (negative || stored != value)
        warn(NARROWED, value_part(offset, text.size()),
             std::string("does not fit ") + (type == VX_UINT32 ? "UInt32" : "UInt64") + ": it is stored as " +
                 std::to_string(stored));
}

/* A value of the attribute's own type, or one part of it. */
void session::watch_typed(std::string_view text, size_t offset) {
    vx_data_type_t type = scalar_vx(compiler.data_type());
    if (type == VX_UINT32 || type == VX_UINT64)
        return watch_unsigned(text, offset, type);
    if (type != VX_INT32)
        return;
    number n(text, 10);
    auto stored = static_cast<vx_int32_t>(n.value);
    if (n.overflow || n.value != stored)
        warn(NARROWED, value_part(offset, text.size()),
             "does not fit Int32: it is stored as " + std::to_string(stored));
}

/* The highest index of an attribute has 16 bits; told where they are passed. */
void session::watch_index(std::string_view text) {
    constexpr int TOO_HIGH = 1 << 16;
    watch_unsigned(text, 0, VX_UINT32);
    if (compiler.element_index() == TOO_HIGH && compiler.run_has_highest_index())
        warn(NARROWED, value_part(0, text.size()), "does not fit 16 bits, which the attribute's highest index has");
}

void session::watch_version() {
    std::string_view text = value_text();
    size_t offset = 0;
    for (int part = 0; part < 4 && offset <= text.size(); ++part) {
        size_t dot = std::min(text.find('.', offset), text.size());
        std::string_view piece = text.substr(offset, dot - offset);
        number n(piece, 10);
        watch_rest(n, value_part(offset, piece.size()));
        if (n.overflow || n.value < 0 || n.value > 255)
            warn(NARROWED, value_part(offset, piece.size()), "a part of a version has 8 bits");
        offset = dot + 1;
    }
    if (offset <= text.size())
        warn(NUMBER_TEXT, value_part(offset, text.size() - offset), "a version has four parts: these are cut off");
}

/* What is no number has been told of. */
void session::watch_id(std::string_view text) {
    number n(text, 0);
    if (n.read > 0)
        watch_first(SAME_ID, seen.known[index_of(kind)].ids.of(static_cast<vx_uint32_t>(n.value)),
                    value_part(0, text.size()), "Id");
}

void session::watch_numbers() {
    std::string_view text = value_text();
    switch (latest.attr->ta_type) {
    case AT_UINT16:
    case AT_SD_DESCRIPTION:
    case AT_SD_DISPLAY:
    case AT_VALUE_DISPLAY:
    case AT_SD_VALUE_DISPLAY:
        return watch_number(text, 0, 16);
    case AT_ID:
        watch_number(text, 0, 32);
        return watch_id(text);
    case AT_SD_INDEX:
        return watch_index(text);
    case AT_VARIETY: {
        pair_of_texts both(text);
        watch_number(both.low, 0, 32);
        watch_number(both.high, both.offset, 32);
        return watch_bounds();
    }
    case AT_VERSION:
        return watch_version();
    case AT_DEFAULT_VALUE:
    case AT_INITIAL_VALUE:
        return watch_typed(text, 0);
    case AT_VALID_VALUE:
    case AT_SD_VALID_VALUE:
    case AT_RANGE:
        return watch_valid(text);
    default:
        return;
    }
}

void session::watch_valid(std::string_view text) {
    if (!is_numeric(compiler.data_type()))
        return;
    pair_of_texts both(text);
    watch_typed(both.low, 0);
    if (!both.two())
        return;
    watch_typed(both.high, both.offset);
    watch_bounds();
}

/* Two values that fit their type; others have been warned of. */
void session::watch_bounds() {
    std::string_view text = value_text();
    pair_of_texts both(text);
    bool variety = latest.attr->ta_type == AT_VARIETY;
    vx_data_type_t type = variety ? VX_UINT32 : scalar_vx(compiler.data_type());
    bool above = false;
    if (type == VX_FLOAT32 || type == VX_FLOAT64) {
        above =
            std::strtod(std::string(both.low).c_str(), nullptr) > std::strtod(std::string(both.high).c_str(), nullptr);
    } else if (type == VX_UINT64) {
        above = std::strtoull(std::string(both.low).c_str(), nullptr, 10) >
                std::strtoull(std::string(both.high).c_str(), nullptr, 10);
    } else {
        int base = variety ? 0 : 10;
        above = number(both.low, base).value > number(both.high, base).value;
    }
    if (above)
        warn(LOW_ABOVE_HIGH, value_part(0, latest.length), "the lower bound is above the upper one");
}

} // namespace cdef::check
