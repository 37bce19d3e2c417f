/* cdgen_util_values.cpp: data types by name, and from text to values. */

#include "compiler/cdgen_values.h"

#include "compiler/cdgen_context.h"
#include "compiler/cdgen_digits.h"
#include "compiler/cdgen_words.h"
#include "language/name_index.h"
#include "language/same_bytes.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cfloat>
#include <charconv>
#include <cmath>
#include <cstdlib>
#include <limits>
#include <string_view>

namespace {

/* Names with their lengths. */
template <size_t Count> consteval auto with_lengths(const char *const (&names)[Count]) {
    std::array<std::string_view, Count> views;
    std::copy_n(names, Count, views.begin());
    return views;
}

constexpr auto type_names = with_lengths(vxTypeStr);
constexpr auto variable_names = with_lengths(vxVarStr);
constexpr name_index type_index(type_names.size(), [](size_t i) { return type_names[i]; });

/* Calls one of the C library's conversions with the errno of earlier conversions. */
template <class Convert> auto converted(cdgen &cx, Convert convert) {
    int outside = errno;
    errno = cx.conv_errno;
    auto value = convert();
    cx.conv_errno = errno;
    errno = outside;
    return value;
}

bool conversion_failed(const cdgen &cx) {
    return cx.conv_errno == ERANGE || cx.conv_errno == EINVAL;
}

/* Converts plain digits of a number that fits, with the same result as the C library. Returns false for any other text,
 * for which the C library's rules are needed. */
bool plain_unsigned(std::string_view text, vx_uint64_t *value) {
    return all_digits(text, value);
}

/* The same, with or without a minus sign. */
bool plain_signed(std::string_view text, vx_int64_t *value) {
    bool negative = text.starts_with('-');
    vx_uint64_t size = 0;
    bool plain = all_digits(text.substr(negative), &size);
    *value = negative ? -static_cast<vx_int64_t>(size) : static_cast<vx_int64_t>(size);
    return plain;
}

/* Converts digits, with or without a fraction, if the digits as an integer and the power of ten are exact. The single
 * division then rounds as the C library does. */
template <class Float> bool exact_fraction(std::string_view text, Float *value) {
    constexpr vx_uint64_t EXACT = vx_uint64_t{1} << std::numeric_limits<Float>::digits;
    constexpr size_t EXACT_POWER = sizeof(Float) == sizeof(float) ? 10 : 18; /* of ten; and no overflow of n */
    bool negative = text.starts_with('-');
    vx_uint64_t n = 0;
    Float scale = 1;
    Float step = 1;
    for (char c : text.substr(negative)) {
        unsigned digit = static_cast<unsigned char>(c) - unsigned{'0'};
        if (digit <= 9) {
            n = n * 10 + digit;
            scale *= step;
        } else if (c == '.' && step == 1) {
            step = 10;
        } else {
            return false;
        }
    }
    Float size = static_cast<Float>(n) / scale;
    *value = negative ? -size : size;
    bool rounded_once = FLT_EVAL_METHOD == 0 || FLT_EVAL_METHOD == 1;
    return rounded_once && n - 1 < EXACT && text.size() <= EXACT_POWER;
}

/* Converts a decimal number that is normal, and is therefore rounded as the C library rounds it. Returns false where
 * the C library's rules are needed: for white space, plus signs, hexadecimal numbers, and results that it reports in
 * errno. */
template <class Float> bool plain_float(std::string_view text, Float *value) {
    if (exact_fraction(text, value))
        return true;
    const char *end = text.data() + text.size();
    auto [rest, error] = std::from_chars(text.data(), end, *value);
    return rest == end && error == std::errc() && std::isnormal(*value) &&
           std::abs(*value) > std::numeric_limits<Float>::min();
}

[[gnu::noinline]] vx_int64_t library_integer(cdgen &cx, const char *text, char **end, int base) {
    return converted(cx, [&] { return strtoll(text, end, base); });
}

/* Converts the whole text as a decimal integer. Returns false if anything else follows. */
bool whole_signed(cdgen &cx, std::string_view text, vx_int64_t *value) {
    if (plain_signed(text, value))
        return true;
    char *end = nullptr;
    *value = converted(cx, [&] { return strtoll(text.data(), &end, 10); });
    return *end == '\0';
}

bool whole_unsigned(cdgen &cx, std::string_view text, vx_uint64_t *value) {
    if (plain_unsigned(text, value))
        return true;
    char *end = nullptr;
    *value = converted(cx, [&] { return strtoull(text.data(), &end, 10); });
    return *end == '\0';
}

template <class Float>
bool whole_float(cdgen &cx, std::string_view text, Float *value, Float (*convert)(const char *, char **)) {
    if (plain_float(text, value))
        return true;
    char *end = nullptr;
    *value = converted(cx, [&] { return convert(text.data(), &end); });
    return *end == '\0';
}

/* A value that the library also returns for text that it cannot convert is refused while errno is set. An earlier text
 * may have set it; deliberately, nothing clears it. */
template <class Integer> bool suspicious(Integer value) {
    using limits = std::numeric_limits<Integer>;
    return value == 0 || value == limits::max() || (limits::is_signed && value == limits::min());
}

/* Deliberately not symmetric: NaN and negative infinity are accepted. */
template <class Float> bool suspicious_float(Float value) {
    using limits = std::numeric_limits<Float>;
    return value == 0 || value >= limits::max() || value == limits::min();
}

int int32_from_text(cdgen &cx, vx_value_t *out, std::string_view text, text_pool &) {
    vx_int64_t wide = 0;
    if (!whole_signed(cx, text, &wide))
        return -1;
    auto value = static_cast<vx_int32_t>(wide); /* silently narrowed */
    if (suspicious(value) && conversion_failed(cx))
        return -1;
    out->val_int32 = value;
    return 0;
}

int uint32_from_text(cdgen &cx, vx_value_t *out, std::string_view text, text_pool &) {
    vx_uint64_t wide = 0;
    if (!whole_unsigned(cx, text, &wide))
        return -1;
    auto value = static_cast<vx_uint32_t>(wide); /* silently narrowed */
    if (suspicious(value) && conversion_failed(cx))
        return -1;
    out->val_uint32 = value;
    return 0;
}

int int64_from_text(cdgen &cx, vx_value_t *out, std::string_view text, text_pool &) {
    vx_int64_t value = 0;
    if (!whole_signed(cx, text, &value) || (suspicious(value) && conversion_failed(cx)))
        return -1;
    out->val_int64 = value;
    return 0;
}

int uint64_from_text(cdgen &cx, vx_value_t *out, std::string_view text, text_pool &) {
    vx_uint64_t value = 0;
    if (!whole_unsigned(cx, text, &value) || (suspicious(value) && conversion_failed(cx)))
        return -1;
    out->val_uint64 = value;
    return 0;
}

int float32_from_text(cdgen &cx, vx_value_t *out, std::string_view text, text_pool &) {
    float value = 0;
    if (!whole_float(cx, text, &value, strtof) || (suspicious_float(value) && conversion_failed(cx)))
        return -1;
    out->val_float32 = value;
    return 0;
}

int float64_from_text(cdgen &cx, vx_value_t *out, std::string_view text, text_pool &) {
    double value = 0;
    if (!whole_float(cx, text, &value, strtod) || (suspicious_float(value) && conversion_failed(cx)))
        return -1;
    out->val_float64 = value;
    return 0;
}

int string_from_text(cdgen &, vx_value_t *out, std::string_view text, text_pool &pool) {
    char *copy = pool.take(text.size() + 1);
    if (copy == nullptr)
        return -1;
    memcpy(copy, text.data(), text.size() + 1);
    out->ptr_char = copy;
    return 0;
}

/* Text that starts with 0 is hexadecimal, and x must follow; any other text may have escapes. The block is cleared, and
 * large enough for the bytes that are later copied from after the decoded text. */
int binary_from_text(cdgen &cx, vx_value_t *out, std::string_view text, text_pool &pool) {
    char *block = pool.take(sizeof(vx_uint32_t) + text.size() + sizeof(vx_uint32_t));
    if (block == nullptr)
        return -1;
    out->ptr_binary = reinterpret_cast<vx_binary_t *>(block);
    return text[0] == '0' ? hex_convert(block, text.data()) : oct_convert(cx, text.data(), 2, block);
}

using converter = int (*)(cdgen &, vx_value_t *, std::string_view, text_pool &);

/* By type, VX_INT32 to VX_BINARY_PTR. */
constexpr converter converters[] = {int32_from_text,   uint32_from_text,  int64_from_text,  uint64_from_text,
                                    float32_from_text, float64_from_text, string_from_text, binary_from_text};

/* 0 to 15, or -1. */
int hex_digit(char c) {
    if (c >= '0' && c <= '9')
        return c - '0';
    if (c >= 'a' && c <= 'f')
        return c - 'a' + 10;
    if (c >= 'A' && c <= 'F')
        return c - 'A' + 10;
    return -1;
}

/* The number after a backslash, of at most three characters, after which *p is moved; -1 if there is no number. Blanks
 * and a sign count as characters. */
vx_int64_t octal_escape(cdgen &cx, const char **p) {
    char digits[4] = {};
    strncpy(digits, *p, 3);
    char *end = nullptr;
    vx_int64_t value = library_integer(cx, digits, &end, 8);
    *p += end - digits;
    return end == digits ? 256 : value;
}

/* Null if there is no property of that name. */
const props_t *find_property(std::span<const props_t> known, std::string_view name) {
    for (const props_t &property : known)
        if (name.size() < sizeof property.s && property.s[name.size()] == '\0' &&
            language::same_bytes(property.s, name.data(), name.size()))
            return &property;
    return nullptr;
}

void store_length(char *block, size_t length) {
    auto count = static_cast<vx_uint32_t>(length);
    memcpy(block, &count, sizeof count);
}

} // namespace

vx_data_type_t data_type_named(std::string_view name) {
    int at = type_index.candidate(name);
    return at >= 0 && language::same_text(type_names[static_cast<size_t>(at)], name) ? vxTypeMap[at] : VX_UNKNOWN;
}

std::optional<orb_variable_type_t> variable_type_named(std::string_view name) {
    for (size_t i = 0; i < variable_names.size(); ++i)
        if (language::same_text(variable_names[i], name))
            return vxVarMap[i];
    return std::nullopt;
}

vx_int64_t int_from_text(cdgen &cx, std::string_view text, char **end, int base) {
    vx_uint64_t plain = 0;
    if (base == 8 || !(base == 0 ? plain_decimal(text, &plain) : all_digits(text, &plain)))
        return library_integer(cx, text.data(), end, base);
    if (end != nullptr)
        *end = const_cast<char *>(text.data() + text.size());
    return static_cast<vx_int64_t>(plain);
}

int str_to_vx(cdgen &cx, vx_value_t *vx_out, vx_data_type_t vx_type, std::string_view str_in, text_pool &pool) {
    vx_data_type_t scalar = scalar_vx(vx_type);
    if (str_in.empty() || scalar < VX_INT32 || scalar > VX_BINARY_PTR)
        return -1;
    return converters[scalar - VX_INT32](cx, vx_out, str_in, pool);
}

int hex_convert(char *vx_out, const char *str_in) {
    size_t len = strlen(str_in);
    if (str_in[0] != '0' || str_in[1] != 'x' || len % 2 != 0)
        return -1;
    char *data = vx_out + sizeof(vx_uint32_t);
    for (const char *p = str_in + 2; *p != '\0'; p += 2) {
        int high = hex_digit(p[0]);
        int low = hex_digit(p[1]);
        if (high < 0 || low < 0)
            return -1;
        *data++ = static_cast<char>(high * 16 + low);
    }
    store_length(vx_out, (len - 2) / 2);
    return 0;
}

int oct_convert(cdgen &cx, const char *p, int type, char *out_buf) {
    char *out = out_buf;
    while (*p != '\0') {
        if (*p != '\\') {
            *out++ = *p++;
        } else if (p[1] == '\\') {
            *out++ = '\\';
            p += 2;
        } else {
            ++p;
            vx_int64_t value = octal_escape(cx, &p);
            if (value > 255)
                return -1;
            *out++ = static_cast<char>(value);
        }
    }
    if (type == 1)
        *out = '\0';
    else /* deliberately over the first four bytes, so the data begin with the fifth */
        store_length(out_buf, static_cast<size_t>(out - out_buf));
    return 0;
}

char *strip_quotes(char *s, char **end) {
    char *open = s;
    while (*open == ' ' || *open == '\t')
        ++open;
    if (*open != '"')
        return s;
    char *close = *end - 1;
    if (*close != '"' || (close > s && close[-1] == '\\'))
        return nullptr;
    *close = '\0';
    *end = close;
    return open == close ? open : open + 1;
}

void set_props(vx_uint32_t *dest, std::span<const props_t> props, char *list, size_t length) {
    char *end = list + length;
    for (char *name = list, *rest = nullptr; name != nullptr; name = rest) {
        char *name_end = find_character(name, static_cast<size_t>(end - name), ',');
        rest = name_end != nullptr ? name_end + 1 : nullptr;
        if (name_end == nullptr)
            name_end = end;
        *name_end = '\0';
        if (name == name_end) /* an empty field */
            continue;
        const props_t *known = find_property(props, {name, static_cast<size_t>(name_end - name)});
        if (known == nullptr)
            cdgen_error_exit(MSG_INVALID_PROPERTY, name, nullptr, 0, 1);
        *dest |= known->p;
    }
}

int ver_str_convert(cdgen &cx, const char *ver_str, vx_uint32_t *n) {
    vx_uint32_t component[4] = {};
    const char *p = ver_str;
    for (vx_uint32_t &value : component) {
        value = static_cast<vx_uint32_t>(converted(cx, [&] { return strtoull(p, nullptr, 10); }));
        p = strchr(p, '.');
        if (p == nullptr)
            break;
        ++p;
    }
    /* The last one is deliberately not masked. */
    *n = component[0] << 24 | (component[1] & 255) << 16 | (component[2] & 255) << 8 | component[3];
    return 0;
}
