/* region_map.cpp: the meaning of each stretch of a file. */

#include "reader/region_map.h"

#include <queue>
#include <utility>

namespace cdb {

namespace {

constexpr std::string_view other_names[] = {"text", "length", "binary", "handle", "vx_value_t", "var_id_t", "filling"};
static_assert(std::size(other_names) == stretch_kind::COUNT - stretch_kind::TEXT);

constexpr std::uint8_t ANCHOR = kind_of_record(format_for<cdb_dsect_anchor_t>);

bool is_record(std::uint8_t kind) {
    return kind < stretch_kind::TEXT;
}

/* The size of one item, for kinds whose items can follow each other; 0 for other kinds. */
std::size_t unit_of(std::uint8_t kind) {
    if (is_record(kind))
        return record_formats[kind]->size;
    return kind == stretch_kind::VALUE ? sizeof(vx_value_t) : kind == stretch_kind::VARIABLE_ID ? sizeof(var_id_t) : 0;
}

} // namespace

/* ---- Regions of a stretch -------------------------------------------------------------------------------------- */

class region_map::cursor {
public:
    cursor(const stretch &of, const region_map &in)
        : kind(of.kind), order(of.order), left(of.length), unit(unit_of(of.kind) == 0 ? of.length : unit_of(of.kind)),
          at(in.start + of.offset), section(in.section) {
        now.index = of.index;
        settle();
    }

    const region &current() const {
        return now;
    }
    std::uint32_t added() const {
        return order;
    }
    bool is_at_end() const {
        return left == 0;
    }
    void advance() {
        if (!is_record(kind))
            return next_record();
        ++field_index;
        settle();
    }

private:
    void next_record() {
        left -= std::min(left, unit);
        at += unit;
        ++now.index;
        field_index = 0;
        if (!is_at_end())
            settle();
    }

    /* Skips a list's entries, which are regions of their own. */
    void settle() {
        now.section = kind == ANCHOR ? std::optional(now.index) : section;
        if (!is_record(kind)) {
            now.offset = at;
            now.size = unit;
            now.record = other_names[kind - stretch_kind::TEXT];
            return;
        }
        const record_format &format = *record_formats[kind];
        while (field_index < format.fields.size() && format.fields[field_index].kind == field_kind::entries)
            ++field_index;
        if (field_index == format.fields.size())
            return next_record();
        const field &f = format.fields[field_index];
        now.offset = at + f.offset;
        now.size = std::size_t{f.width} * f.count;
        now.record = format.record;
        now.what = &f;
    }

    std::uint8_t kind;
    std::uint32_t order;
    std::size_t left; /* bytes, from the current record on */
    std::size_t unit;
    std::size_t at; /* of the current record, in the file */
    std::optional<std::size_t> section;
    std::size_t field_index = 0;
    region now = {};
};

/* ---- The map --------------------------------------------------------------------------------------------------- */

void region_map::add(std::uint8_t kind, std::size_t offset, std::size_t length, std::size_t index) {
    std::size_t unit = unit_of(kind);
    auto place = static_cast<std::uint32_t>(offset - start);
    if (!stretches.empty() && unit != 0) {
        stretch &last = stretches.back();
        bool follows =
            last.kind == kind && last.offset + last.length == place && last.index + last.length / unit == index;
        if (follows) {
            last.length += static_cast<std::uint32_t>(length);
            return;
        }
    }
    stretches.push_back({place, static_cast<std::uint32_t>(length), static_cast<std::uint32_t>(index),
                         static_cast<std::uint32_t>(stretches.size()), kind});
}

void region_map::hand_over_unreached(std::size_t to) {
    if (to > end)
        take({end, to - end, std::nullopt, "unreached", 0, nullptr});
}

void region_map::hand_over(const region &r) {
    if (r.offset < end)
        return;
    hand_over_unreached(r.offset);
    take(r);
    end = r.offset + r.size;
}

bool region_map::stands_alone(const std::deque<stretch>::const_iterator &one) const {
    auto next = one + 1;
    return next == stretches.end() || next->offset >= std::size_t{one->offset} + one->length;
}

void region_map::hand_over_all(const stretch &of) {
    for (cursor each(of, *this); !each.is_at_end(); each.advance())
        hand_over(each.current());
}

/* In a sound file, one stretch ends before the next one begins. In a damaged one several may be open at a time. */
void region_map::finish_part() {
    std::sort(stretches.begin(), stretches.end(), [](const stretch &a, const stretch &b) {
        return std::pair(a.offset, a.order) < std::pair(b.offset, b.order);
    });
    auto comes_later = [](const cursor &a, const cursor &b) {
        const region &one = a.current(), &other = b.current();
        if (one.offset != other.offset)
            return one.offset > other.offset;
        return one.size != other.size ? one.size < other.size : a.added() > b.added();
    };
    std::priority_queue<cursor, std::vector<cursor>, decltype(comes_later)> open(comes_later);
    auto next = stretches.begin();
    while (!open.empty() || next != stretches.end()) {
        if (open.empty() && stands_alone(next)) {
            hand_over_all(*next++);
            continue;
        }
        while (next != stretches.end() && (open.empty() || start + next->offset <= open.top().current().offset))
            open.emplace(*next++, *this);
        cursor first = open.top();
        open.pop();
        hand_over(first.current());
        first.advance();
        if (!first.is_at_end())
            open.push(first);
    }
    stretches.clear();
}

void region_map::finish() {
    hand_over_unreached(size);
}

} // namespace cdb
