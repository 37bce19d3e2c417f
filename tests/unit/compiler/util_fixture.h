/* util_fixture.h: helpers for the tests of tables, values and serialisation. */
#ifndef CDGEN_TESTS_UTIL_FIXTURE_H
#define CDGEN_TESTS_UTIL_FIXTURE_H

#include "compiler/cdgen.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <optional>
#include <ostream>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace util_test {

/* Bytes as they are in a table: numbers in the machine's order. */
class bytes {
public:
    bytes &u16(vx_uint16_t n) {
        return number(n);
    }
    template <class... Numbers> bytes &u32(Numbers... n) {
        return (number(static_cast<vx_uint32_t>(n)), ...);
    }
    bytes &u64(vx_uint64_t n) {
        return number(n);
    }
    bytes &f32(float n) {
        return number(n);
    }
    bytes &f64(double n) {
        return number(n);
    }
    bytes &text(std::string_view s) {
        all += s;
        return *this;
    }
    bytes &fill(size_t n, unsigned char with = 0) {
        all.append(n, static_cast<char>(with));
        return *this;
    }

    std::string all;

private:
    template <class Number> bytes &number(Number n) {
        char raw[sizeof n];
        std::memcpy(raw, &n, sizeof n);
        all.append(raw, sizeof n);
        return *this;
    }
};

/* The contents at an address. */
inline std::string bytes_at(const void *p, size_t n) {
    return {static_cast<const char *>(p), n};
}

/* The used part of a table. */
inline std::string contents(const tbl &t) {
    return t.tbl_base == nullptr ? std::string() : bytes_at(t.tbl_base, t.used());
}

/* How a call ended: what the message says altogether, its line and the exit status. */
struct ending {
    std::string text;
    int line;
    int code;

    bool operator==(const ending &) const = default;
};

inline void PrintTo(const ending &e, std::ostream *out) {
    *out << '"' << e.text << "\", line " << e.line << ", status " << e.code;
}

/* No value if the call returns. */
template <class Call> std::optional<ending> ending_of(Call call) {
    try {
        call();
    } catch (const fatal_exit &e) {
        std::string text;
        for (const char *part : words_of(e))
            text += part;
        return ending{text, e.line, e.code};
    }
    return std::nullopt;
}

/* ---- Conversions of texts ------------------------------------------------------------------------------------- */

inline vx_data_type_t type_of_code(vx_uint32_t code) {
    return static_cast<vx_data_type_t>(code);
}

/* A text after which READ_AHEAD bytes may be read. */
inline std::string with_room(std::string_view text) {
    std::string held(text);
    held.reserve(text.size() + READ_AHEAD);
    return held;
}

/* A text and what becomes of it. */
template <class Value> struct row {
    const char *text;
    Value value;
};

/* A context in which an earlier conversion has left its mark. */
struct marked : cdgen {
    explicit marked(int error) {
        conv_errno = error;
    }
};

constexpr int MARKS[] = {ERANGE, EINVAL};
constexpr int NO_MARKS[] = {0, ENOMEM};

/* Each text, as a type and, as one element, as its array type. */
template <class Number>
void expect_taken(std::span<const int> left, vx_data_type_t type, std::span<const row<Number>> rows,
                  Number vx_value_t::*member) {
    for (const row<Number> &r : rows)
        for (int error : left)
            for (vx_uint32_t code : {type + 0U, type + 11U}) {
                marked cx(error);
                vx_value_t value = {};
                EXPECT_EQ(str_to_vx(cx, &value, type_of_code(code), with_room(r.text), cx.line_texts), 0)
                    << r.text << error;
                EXPECT_EQ(value.*member, r.value) << r.text << " as " << code << " after " << error;
            }
}

inline void expect_refused(std::span<const int> left, vx_data_type_t type, const char *text) {
    for (int error : left)
        for (vx_uint32_t code : {type + 0U, type + 11U}) {
            marked cx(error);
            vx_value_t value = {.val_uint64 = 77};
            EXPECT_EQ(str_to_vx(cx, &value, type_of_code(code), with_room(text), cx.line_texts), -1)
                << '"' << text << "\" as " << code << " after " << error;
            EXPECT_EQ(value.val_uint64, 77U) << '"' << text << "\" as " << code;
        }
}

/* Texts that are always taken, those that are refused after an overflow, and those that are always refused. */
template <class Number> struct expectation {
    std::vector<row<Number>> plain, suspicious;
    std::vector<const char *> refused;

    void hold(vx_data_type_t type, Number vx_value_t::*member) const {
        expect_taken<Number>(NO_MARKS, type, plain, member);
        expect_taken<Number>(MARKS, type, plain, member);
        expect_taken<Number>(NO_MARKS, type, suspicious, member);
        for (const row<Number> &r : suspicious)
            expect_refused(MARKS, type, r.text);
        for (const char *text : refused) {
            expect_refused(NO_MARKS, type, text);
            expect_refused(MARKS, type, text);
        }
    }
};

/* ---- Serialised values ----------------------------------------------------------------------------------------- */

constexpr unsigned char OLD = 0xA5; /* what a cell holds before it is written */

/* A cell after something was written to its beginning. */
inline std::string cell(const bytes &written) {
    return written.all + std::string(8 - written.all.size(), static_cast<char>(OLD));
}

/* A string table in which something else comes first, and a cell. */
struct serial {
    serial() {
        memset(&out, OLD, sizeof out);
        add_to_tbl(cx, &strings, "earlier", 8);
    }

    int copy(const vx_value_t *in, vx_data_type_t type, int mode) {
        return copy_this_type(cx, &out, in, type, mode, &strings, nullptr, 0);
    }
    int copy(const vx_value_t *in, vx_data_type_t type, int mode, vx_uint32_t count) {
        return copy_this_type(cx, &out, in, type, mode, &strings, &anchors.array, count);
    }
    int copy_sd(vx_data_type_t type, int mode, vx_uint32_t count, vx_data_type_t sd_type = VX_SD_PTR) {
        return copy_this_sd_type(cx, &out, type, mode, &strings, &anchors, count, sd_type);
    }
    /* The contents of the table after the first eight bytes. */
    std::string added() const {
        EXPECT_EQ(contents(strings).substr(0, 8), std::string("earlier", 8));
        return contents(strings).substr(8);
    }

    /* The cell, and the contents of the table. */
    std::string written() const {
        return bytes_at(&out, sizeof out) + added();
    }

    cdgen cx;
    tbl strings{64, "ClassStrings"};
    sd_anchors anchors;
    vx_value_t out;
};

inline vx_value_t value_of(const bytes &b) {
    vx_value_t value = {};
    memcpy(&value, b.all.data(), sizeof value);
    return value;
}

inline std::string pad8(const bytes &b) {
    return b.all + std::string(8 - b.all.size(), '\0');
}

} // namespace util_test

#endif
