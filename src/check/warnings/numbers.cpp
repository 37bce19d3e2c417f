/* numbers.cpp: warnings about numbers whose stored value differs from the written one. */

#include "check/numbers.h"
#include "check/first_lines.h"
#include "check/kept_lines.h"

#include "check/warnings/watcher.h"
#include "format/constants.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace check {

namespace {

/* The bits of a form that takes any base; 0 for others. */
int bits_of(number_form form) {
    switch (form) {
    case number_form::BITS16:
        return 16;
    case number_form::BITS32:
    case number_form::ID:
        return 32;
    default:
        return 0;
    }
}

place place_of(const view &see, const number_part &part) {
    return see.part_of_value(part.offset, part.text.size());
}

class number_text : public watcher {
public:
    using watcher::watcher;

    void number(const view &see, const number_part &part) override {
        if (part.form == number_form::VERSION_REST)
            return void(report(see, place_of(see, part), "a version has four parts: the rest is ignored"));
        if (part.form != number_form::VERSION_PART && bits_of(part.form) == 0)
            return;
        check::number n(part.text, part.form == number_form::VERSION_PART ? 10 : 0);
        if (n.read == 0)
            report(see, place_of(see, part), "no number: it is read as 0");
        else if (!n.rest().empty())
            report(see, place_of(see, part),
                   "text after the number is ignored: the value is " + std::to_string(n.value));
    }
};

/* The Ids of attributes that do not fit the class's Locator, which is looked up at the end. There may be very many. */
class wide_ids {
public:
    explicit wide_ids(const text::hash_key &key) : positions(key) {}

    void begin_class() {
        positions.clear();
        ids.clear();
    }
    void take_name(std::string_view text) {
        name = text;
    }
    void take_id(const view &see) {
        constexpr vx_int64_t HIGHEST = 0xFFFE; /* the next one means that there is no locator */
        if (check::number(see.value(), 0).value > HIGHEST)
            id = see.value_mention();
    }
    void end_attribute() {
        if (id.at.line != 0)
            add();
        id = {};
        name.clear();
    }
    /* The first attribute's of this name. */
    std::optional<mention> of(std::string_view wanted) const {
        int position = positions.find(wanted);
        if (position == 0)
            return std::nullopt;
        size_t at = static_cast<size_t>(position) - 1;
        return mention{ids.at(at), std::string(ids.text_of(at)), std::string(ids.line_of(at))};
    }

private:
    void add() {
        int &position = positions.line_of(name);
        if (position != 0)
            return;
        ids.add(id.at, id.source);
        position = static_cast<int>(ids.size());
    }

    std::string name; /* of the current attribute */
    mention id;       /* its Id, if that is wide; line 0: it is not */
    kept_lines ids;
    first_lines positions; /* by names: where in `ids`, from 1 */
};

class narrowed : public watcher {
public:
    explicit narrowed(const watcher_setup &setup) : watcher(setup), ids(setup.key) {}
    static constexpr auto types = std::array{AT_LOCATOR, AT_STRING, AT_ID};

    void value(const view &see) override {
        if (see.attr().ta_type == AT_LOCATOR)
            locator = see.value_mention();
        if (see.known.kind != SC_PERSISTENT_RESOURCE_ATTRIBUTE)
            return;
        if (see.attr().ta_type == AT_ID)
            ids.take_id(see);
        else
            ids.take_name(see.value());
    }
    void before_step(const view &see, int next_kind) override {
        if (next_kind == SC_CONTROL_DEFINITION && see.compiler.class_is_open())
            ids.begin_class();
    }
    void stanza_end(const view &see, int) override {
        if (see.known.kind == SC_PERSISTENT_RESOURCE_ATTRIBUTE)
            ids.end_attribute();
    }
    void source_end(const view &) override {
        constexpr long BITS = 0xFFFF;
        std::optional<mention> wide = locator ? ids.of(locator->text) : std::nullopt;
        if (!wide)
            return;
        vx_int64_t stored = check::number(wide->text, 0).value & BITS;
        advise(report(wide->at, wide->source,
                      "does not fit the 16 bits that the Locator has: it is stored as " +
                          (stored == BITS ? "65535, none" : std::to_string(stored)),
                      {locator->at, "the `Locator`"}),
               "choose an Id of at most 65534");
    }

    void number(const view &see, const number_part &part) override {
        switch (part.form) {
        case number_form::BITS16:
        case number_form::BITS32:
            return look_at_bits(see, part, bits_of(part.form));
        case number_form::ID:
            return look_at_id(see, part);
        case number_form::INT32:
            return look_at_int32(see, part);
        case number_form::UINT32:
        case number_form::UINT64:
            return look_at_unsigned(see, part);
        case number_form::INDEX:
            return look_at_index(see, part);
        case number_form::VERSION_PART:
            return look_at_version(see, part);
        case number_form::VERSION_REST:
            return;
        }
    }

private:
    void look_at_bits(const view &see, const number_part &part, int bits) {
        check::number n(part.text, 0);
        vx_int64_t limit = (vx_int64_t{1} << bits) - 1;
        if (n.overflow || n.value < 0 || n.value > limit)
            report(see, place_of(see, part),
                   "does not fit " + std::to_string(bits) + " bits: it is stored as " +
                       std::to_string(n.value & limit));
    }

    void look_at_id(const view &see, const number_part &part) {
        check::number n(part.text, 0);
        auto stored = static_cast<vx_int32_t>(n.value);
        if (n.overflow || n.value != stored || stored < 0)
            report(see, place_of(see, part), "an Id is 0 to 2147483647: it is stored as " + std::to_string(stored));
    }

    void look_at_int32(const view &see, const number_part &part) {
        check::number n(part.text, 10);
        auto stored = static_cast<vx_int32_t>(n.value);
        if (n.overflow || n.value != stored)
            report(see, place_of(see, part), "does not fit Int32: it is stored as " + std::to_string(stored));
    }

    /* Only the low bits are stored, and of a negative number its complement. */
    void look_at_unsigned(const view &see, const number_part &part) {
        bool wide = part.form == number_form::UINT64;
        vx_uint64_t value = std::strtoull(std::string(part.text).c_str(), nullptr, 10);
        vx_uint64_t stored = wide ? value : static_cast<vx_uint32_t>(value);
        bool negative = part.text.find('-') != std::string_view::npos && value != 0;
        if (negative || stored != value)
            report(see, place_of(see, part),
                   std::string("does not fit ") + (wide ? "UInt64" : "UInt32") + ": it is stored as " +
                       std::to_string(stored));
    }

    /* The highest index of an attribute has 16 bits; this is reported once, at the first index that is too high. */
    void look_at_index(const view &see, const number_part &part) {
        constexpr int TOO_HIGH = NO_SD_INDEX;
        if (!is_plain(part.text, 32))
            look_at_unsigned(see, part);
        if (see.compiler.element_index() == TOO_HIGH && see.compiler.run_has_highest_index())
            report(see, place_of(see, part),
                   "is too high: the highest index is stored in 16 bits, and 65535 means none");
    }

    void look_at_version(const view &see, const number_part &part) {
        check::number n(part.text, 10);
        if (n.overflow || n.value < 0 || n.value > 255)
            report(see, place_of(see, part), "a part of a version has 8 bits");
    }

    std::optional<mention> locator;
    wide_ids ids;
};

class octal : public watcher {
public:
    using watcher::watcher;

    void number(const view &see, const number_part &part) override {
        if (bits_of(part.form) == 0)
            return;
        check::number n(part.text, 0);
        size_t digits = part.text.find_first_not_of(" \t+-");
        bool leading_zero = digits != std::string_view::npos && digits + 1 < n.read && part.text[digits] == '0' &&
                            part.text[digits + 1] >= '0' && part.text[digits + 1] <= '7';
        if (leading_zero && n.value != check::number(part.text, 10).value)
            report(see, place_of(see, part), "a leading 0 makes it octal: it is read as " + std::to_string(n.value));
    }
};

/* Bounds that do not fit their type are compared as they are written. */
class low_above_high : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_VARIETY, AT_VALID_VALUE, AT_SD_VALID_VALUE, AT_RANGE};

    void value(const view &see) override {
        bool variety = see.attr().ta_type == AT_VARIETY;
        vx_data_type_t data_type = see.compiler.data_type();
        if (!variety && !is_numeric(data_type))
            return;
        if (is_low_above_high(variety, data_type, see.value()))
            report(see, see.value_place(), "the lower bound is above the upper one");
    }
};

} // namespace

made_watcher make_number_text(const watcher_setup &setup) {
    return make<number_text>(setup);
}

made_watcher make_narrowed(const watcher_setup &setup) {
    return make<narrowed>(setup);
}

made_watcher make_octal(const watcher_setup &setup) {
    return make<octal>(setup);
}

made_watcher make_low_above_high(const watcher_setup &setup) {
    return make<low_above_high>(setup);
}

} // namespace check
