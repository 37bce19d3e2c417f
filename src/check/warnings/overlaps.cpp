/* overlaps.cpp: a warning about varieties and valid values that a stanza gives twice. */

#include "check/value_keys.h"
#include "check/warnings/watcher.h"

#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace check {

namespace {

class overlap : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_VARIETY, AT_VALID_VALUE, AT_SD_VALID_VALUE};

    void value(const view &see) override {
        take(see, see.attr().ta_type == AT_VARIETY ? varieties : values);
    }

    void stanza_end(const view &, int) override {
        varieties.clear();
        values.clear();
    }

private:
    /* What a stanza gives of one kind. Most give one range only, which is not looked at before there is another. */
    struct given_ranges {
        void clear() {
            first_line = 0;
            ranges.clear();
        }

        int first_line = 0; /* 0: there is none */
        std::string first;
        key_ranges ranges;
    };

    static std::optional<value_key> key(const view &see, std::string_view text) {
        if (see.attr().ta_type == AT_VARIETY)
            return value_key{static_cast<vx_uint32_t>(check::number(text, 0).value), {}};
        return key_of(see.compiler.data_type(), text);
    }
    static std::optional<key_ranges::range> range_of(const view &see, std::string_view text, int line) {
        bounds both(text);
        std::optional<value_key> low = key(see, both.low), high = key(see, both.high);
        if (!low || !high)
            return std::nullopt;
        return key_ranges::range{std::move(*low), std::move(*high), line};
    }

    void take(const view &see, given_ranges &earlier) {
        if (earlier.first_line == 0) {
            earlier.first_line = see.line.number;
            earlier.first = see.value();
            return;
        }
        if (earlier.ranges.empty())
            if (std::optional<key_ranges::range> first = range_of(see, earlier.first, earlier.first_line))
                earlier.ranges.add(std::move(*first));
        if (std::optional<key_ranges::range> given = range_of(see, see.value(), see.line.number))
            look_at(see, *given, earlier.ranges.add(*given));
    }

    void look_at(const view &see, const key_ranges::range &given, const key_ranges::range &earlier) {
        if (earlier.line == 0)
            return;
        bool same = earlier.low == given.low && earlier.high == given.high;
        bool single = given.low == given.high;
        std::string what = see.attr().ta_type == AT_VARIETY ? (single ? "variety" : "range of varieties")
                                                            : (single ? "value" : "range of values");
        finding &about =
            report(see, see.value_place(),
                   same ? "this " + what + " has already been given" : "this " + what + " overlaps with an earlier one",
                   {{earlier.line, 0, 0}, "the earlier one"});
        advise(about, same ? "remove one of the lines" : "give each value once");
    }

    given_ranges varieties;
    given_ranges values; /* of an attribute or an element */
};

} // namespace

made_watcher make_overlap(const watcher_setup &setup) {
    return make<overlap>(setup);
}

} // namespace check
