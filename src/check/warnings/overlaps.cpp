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
    static constexpr std::array types = {AT_VARIETY, AT_VALID_VALUE, AT_SD_VALID_VALUE};

    void value(const view &see) override {
        bounds both(see.value());
        if (see.attr().ta_type == AT_VARIETY)
            return take(see, varieties, {variety(both.low), variety(both.high), see.line.number});
        vx_data_type_t type = see.compiler.data_type();
        std::optional<value_key> low = key_of(type, both.low), high = key_of(type, both.high);
        if (low && high)
            take(see, values, {std::move(*low), std::move(*high), see.line.number});
    }

    void stanza_end(const view &, int) override {
        varieties.clear();
        values.clear();
    }

private:
    static value_key variety(std::string_view text) {
        return {static_cast<vx_uint32_t>(check::number(text, 0).value), {}};
    }

    void take(const view &see, key_ranges &ranges, const key_ranges::range &given) {
        key_ranges::range earlier = ranges.add(given);
        if (earlier.line == 0)
            return;
        bool same = earlier.low == given.low && earlier.high == given.high;
        bool single = given.low == given.high;
        std::string what = see.attr().ta_type == AT_VARIETY ? (single ? "variety" : "range of varieties")
                                                            : (single ? "value" : "range of values");
        finding &about =
            report(see, see.value_place(),
                   same ? "this " + what + " is given already" : "this " + what + " overlaps with an earlier one",
                   {{earlier.line, 0, 0}, "the earlier one"});
        advise(about, same ? "remove one of the lines" : "give each value once");
    }

    key_ranges varieties;
    key_ranges values; /* of an attribute or an element */
};

} // namespace

made_watcher make_overlap(const watcher_setup &setup) {
    return make<overlap>(setup);
}

} // namespace check
