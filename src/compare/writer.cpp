/* writer.cpp: writes names, facts and values for people. */

#include "compare/writer.h"

#include "compare/fields.h"
#include "compare/identity.h"
#include "text/hex.h"
#include "text/shown.h"

#include <algorithm>
#include <limits>

namespace compare {

namespace {

constexpr std::size_t TIMES_SIZE = 16;
constexpr std::size_t AT_LEAST = 1 << 20;
constexpr std::size_t LINE = 256;     /* texts of up to this length are not counted, because a line of a source may have
                                       * them */
constexpr std::size_t PORTION = 4096; /* bytes that are escaped at once */

void append_to(std::string &text, std::string_view piece) {
    text += piece;
}

} // namespace

allowance::allowance(std::size_t size) : left(std::uint64_t{size} * TIMES_SIZE + AT_LEAST) {}

void allowance::spend(std::size_t length) {
    if (length <= LINE)
        return;
    if (length > left)
        throw too_entangled("too many references lead to the same values or texts");
    left -= length;
}

writer::writer(std::size_t size, taker to) : left(size), take(std::move(to)) {}

void writer::write_text(std::string_view text) {
    left.spend(text.size());
    take("'");
    for (; !text.empty(); text.remove_prefix(std::min(PORTION, text.size())))
        take(text::escaped_ascii(text.substr(0, PORTION)));
    take("'");
}

void writer::write_bytes(std::string_view bytes) {
    left.spend(bytes.size());
    take("0x");
    for (; !bytes.empty(); bytes.remove_prefix(std::min(PORTION, bytes.size())))
        take(text::hex_of(std::as_bytes(std::span(bytes.substr(0, PORTION)))));
}

/* The elements of a structure have types of their own. */
void writer::write_elements(const owned_value &value, std::size_t count) {
    bool is_structure = value.value.type() == VX_SD_PTR;
    take(is_structure ? "{" : "[");
    for (std::size_t i = 0; i < count; ++i) {
        owned_value element = element_of(value, i);
        if (i > 0)
            take(", ");
        if (is_structure) {
            take(cdb::name_of(element.value.type()));
            take(" ");
        }
        write_value(element);
    }
    take(is_structure ? "}" : "]");
}

void writer::write_value(const owned_value &value) {
    look seen = look_at(value);
    switch (seen.is) {
    case shape::NOTHING:
        return take("nothing");
    case shape::MISPLACED:
        take("misplaced ");
        return take(seen.number.text());
    case shape::NUMBER:
    case shape::HANDLE:
        return take(seen.number.text());
    case shape::TEXT:
        return write_text(seen.bytes);
    case shape::BINARY:
        return write_bytes(seen.bytes);
    case shape::ARRAY:
    case shape::STRUCTURE:
        return write_elements(value, seen.count);
    }
}

void writer::write_fact(const fact &f) {
    if (const auto *number = std::get_if<std::uint32_t>(&f.is))
        take(text_of_number(*number, f.what->as));
    else if (const auto *value = std::get_if<owned_value>(&f.is))
        write_value(*value);
    else if (std::string_view text = std::get<std::string_view>(f.is); text.empty())
        take("nothing");
    else
        write_text(text);
}

void writer::write_valid_value(const node &n) {
    owned_value low = valid_value_in(n, offsetof(vv_entry_t, vv_low_val));
    owned_value high = valid_value_in(n, offsetof(vv_entry_t, vv_high_val));
    write_value(low);
    if (read_alike(low, high))
        return;
    take(" to ");
    write_value(high);
}

void writer::write_name(const node &n) {
    std::uint64_t number = identity_of(n).number;
    switch (n.kind) {
    case node_kind::valid_value:
        return write_valid_value(n);
    case node_kind::variety:
        return take(std::to_string(number >> 32) + " to " + std::to_string(number & 0xFFFFFFFF));
    case node_kind::class_variable:
        return take(std::to_string(number & ~std::uint64_t{VAR_ID_CLASS_ATTR}));
    case node_kind::variable:
    case node_kind::dependency:
    case node_kind::hash_block:
        return take(std::to_string(number));
    default:
        break;
    }
    if (n.format != nullptr && n.format->name != nullptr)
        write_text(text_in(n, *n.format->name));
}

bool has_name(const node &n) {
    bool is_entry = n.kind >= node_kind::variety || n.kind == node_kind::dependency;
    return is_entry || (n.format != nullptr && n.format->name != nullptr);
}

std::string text_of(const fact &f) {
    std::string text;
    writer(std::numeric_limits<std::size_t>::max() / TIMES_SIZE / 2, [&text](std::string_view piece) {
        append_to(text, piece);
    }).write_fact(f);
    return text;
}

std::string name_of(const node &n) {
    std::string text;
    writer(std::numeric_limits<std::size_t>::max() / TIMES_SIZE / 2, [&text](std::string_view piece) {
        append_to(text, piece);
    }).write_name(n);
    return text;
}

} // namespace compare
