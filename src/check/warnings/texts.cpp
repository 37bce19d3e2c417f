/* texts.cpp: warnings about texts that are stored only in part, or not as they look. */

#include "check/warnings/watcher.h"
#include "format/data_types.h"
#include "text/hex.h"

#include <algorithm>
#include <cstdlib>
#include <span>
#include <string>
#include <string_view>
#include <utility>

namespace check {

namespace {

bool is_binary(const view &see) {
    return scalar_vx(see.compiler.data_type()) == VX_BINARY_PTR;
}

bool is_string(const view &see) {
    return scalar_vx(see.compiler.data_type()) == VX_CHAR_PTR;
}

bool is_valid_value(const view &see) {
    return see.attr().ta_type == AT_VALID_VALUE || see.attr().ta_type == AT_SD_VALID_VALUE;
}

/* The bytes that a text with escapes stands for. The compiler has accepted it. */
std::string unescaped(std::string_view text) {
    std::string bytes;
    for (size_t at = 0; at < text.size(); ++at) {
        bytes += text[at];
        if (text[at] != '\\')
            continue;
        std::string digits(text.substr(at + 1, 3));
        if (digits.starts_with('\\')) {
            ++at;
            continue;
        }
        char *end = nullptr;
        bytes.back() = static_cast<char>(std::strtol(digits.c_str(), &end, 8));
        at += static_cast<size_t>(end - digits.c_str());
    }
    return bytes;
}

std::string hex_text(const std::string &bytes) {
    return "`0x" + text::hex_of(std::as_bytes(std::span(bytes))) + "`";
}

/* Without 0x, the length of a Binary is stored over its first four bytes. */
class lost_bytes : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_VALID_VALUE, AT_SD_VALID_VALUE, AT_DEFAULT_VALUE, AT_INITIAL_VALUE};

    void value(const view &see) override {
        if (!is_binary(see) ||
            (see.known.kind == SC_PERSISTENT_CLASS_ATTRIBUTE && see.attr().ta_type == AT_DEFAULT_VALUE))
            return;
        if (!is_valid_value(see))
            return look_at(see, see.value(), 0);
        bounds both(see.value());
        look_at(see, both.low, 0);
        if (both.two())
            look_at(see, both.high, both.offset);
    }

private:
    void look_at(const view &see, std::string_view part, size_t offset) {
        constexpr size_t LOST = 4, SHOWN_MAX = 16; /* bytes */
        if (part.starts_with('0'))
            return;
        std::string bytes = unescaped(part);
        std::string stored = bytes.substr(std::min(LOST, bytes.size()));
        stored.resize(bytes.size(), '\0');
        place at = see.part_of_value(offset, part.size());
        bool is_short = bytes.size() <= SHOWN_MAX;
        size_t text = std::min(part.find_first_not_of(" \t"), part.size());
        std::string cure = part.substr(text).starts_with("0x") ? "remove the blank in front of `0x`"
                           : is_short                          ? "write " + hex_text(bytes)
                                                               : "write `0x` and two hexadecimal digits for each byte";
        report(see, at,
               "the first four bytes of a Binary without `0x` are lost" +
                   (is_short ? ": stored are " + hex_text(stored) : std::string()),
               {at, std::move(cure)});
    }
};

/* A comment after a blank is meant as one. */
class comment_in_value : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_STRING,      AT_SD_NAME,        AT_MANAGER,       AT_LOCATOR,
                                             AT_VALID_VALUE, AT_SD_VALID_VALUE, AT_DEFAULT_VALUE, AT_INITIAL_VALUE};

    void value(const view &see) override {
        std::string_view rest = see.comment_at_value();
        if (rest.empty() || !is_text(see))
            return;
        place value = see.value_place();
        size_t begin = value.column - 1, end = begin + value.length;
        std::string sign(rest.substr(0, rest.starts_with('#') ? 1 : 2));
        std::string_view whole = see.line.raw.substr(begin, value.length + rest.size());
        std::string cure = whole.find_first_of("\"\\") == std::string_view::npos
                               ? "write `" + std::string(see.attr().ta_name) + "=\"" + std::string(whole) + "\"`"
                               : std::string("quote the value");
        place at = {value.line, end + 1, rest.size()};
        report(see, at, "`" + sign + "` begins a comment here: only this is stored: `" + std::string(see.value()) + "`",
               {at, cure + ", or put a blank in front of a comment"});
    }

private:
    static bool is_text(const view &see) {
        switch (see.attr().ta_type) {
        case AT_STRING:
        case AT_SD_NAME:
        case AT_MANAGER:
        case AT_LOCATOR:
            return true;
        default:
            return is_string(see) || is_binary(see);
        }
    }
};

/* Bounds are split at the first comma only, and defaults not at all. */
class comma_list : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_VALID_VALUE, AT_SD_VALID_VALUE, AT_DEFAULT_VALUE, AT_INITIAL_VALUE};

    void value(const view &see) override {
        if (!is_string(see) && !is_binary(see))
            return;
        if (is_valid_value(see))
            look_at_bounds(see);
        else if (is_vx_array(see.compiler.data_type()))
            look_at_element(see);
    }

private:
    void look_at_bounds(const view &see) {
        bounds both(see.value());
        if (!both.two() || both.high.find(',') == std::string_view::npos)
            return;
        report(see, see.value_place(),
               "only the first comma counts: this is a range from " + language::quoted(both.low) + " to " +
                   language::quoted(both.high),
               {see.value_place(), "write one " + name_of(see) + " line for each value"});
    }
    /* A quoted text may well have a comma. */
    void look_at_element(const view &see) {
        place at = see.value_place();
        if (see.value().find(',') == std::string_view::npos || see.line.raw[at.column - 2] == '"')
            return;
        bool one = see.attr().ta_type == AT_INITIAL_VALUE;
        report(see, at, "this whole line is one element, including its commas",
               {at, one ? "an `InitialValue` has one element; quote it if the commas belong to it"
                        : "write one " + name_of(see) + " line for each element, or quote a text with commas"});
    }
    static std::string name_of(const view &see) {
        return language::quoted(see.attr().ta_name);
    }
};

/* Names are compared with their blanks. In other texts a leading blank is reported only without quotes, because in
 * quotes it is intended. */
class outer_blank : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_STRING,      AT_SD_NAME,        AT_MANAGER,       AT_LOCATOR,
                                             AT_VALID_VALUE, AT_SD_VALID_VALUE, AT_DEFAULT_VALUE, AT_INITIAL_VALUE};

    void value(const view &see) override {
        std::string_view text = see.value();
        if (!is_blank(text.front()) && !is_blank(text.back()))
            return;
        size_t begin = std::min(text.find_first_not_of(BLANKS), text.size());
        if (!is_strange(see, begin))
            return;
        if (begin == text.size())
            return advise(report(see, see.value_place(), "the text that is stored consists of blanks"), "give a text");
        size_t end = text.find_last_not_of(BLANKS) + 1;
        bool in_front = begin > 0;
        place at = in_front ? see.part_of_value(0, begin) : see.part_of_value(end, text.size() - end);
        std::string core(text.substr(begin, end - begin));
        if (see.is_quoted())
            core = '"' + core + '"';
        advise(
            report(see, at, std::string("the text that is stored ") + (in_front ? "begins" : "ends") + " with a blank"),
            "write `" + std::string(see.attr().ta_name) + "=" + core + "`" +
                (see.is_quoted() || is_name(see) ? "" : ", or quote the text with its blanks"));
    }

private:
    static constexpr const char *BLANKS = " \t";

    static bool is_blank(char c) {
        return c == ' ' || c == '\t';
    }
    static bool is_name(const view &see) {
        switch (see.attr().ta_type) {
        case AT_STRING:
        case AT_SD_NAME:
        case AT_MANAGER:
        case AT_LOCATOR:
            return true;
        default:
            return false;
        }
    }
    static bool is_strange(const view &see, size_t blanks_in_front) {
        if (is_name(see))
            return !std::string_view(see.attr().ta_name).ends_with("Expression");
        return is_string(see) && blanks_in_front > 0 && !see.is_quoted();
    }
};

} // namespace

made_watcher make_lost_bytes(const watcher_setup &setup) {
    return make<lost_bytes>(setup);
}

made_watcher make_comment_in_value(const watcher_setup &setup) {
    return make<comment_in_value>(setup);
}

made_watcher make_comma_list(const watcher_setup &setup) {
    return make<comma_list>(setup);
}

made_watcher make_outer_blank(const watcher_setup &setup) {
    return make<outer_blank>(setup);
}

} // namespace check
