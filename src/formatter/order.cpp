/* order.cpp: puts the attributes of stanzas into their usual order. */

#include "formatter/order.h"

#include "language/names.h"

#include <algorithm>
#include <iterator>

namespace formatter {

namespace {

/* Consecutive rows: an attribute, the comments above it, and those that continue its own comment. */
struct item {
    const table_attrs *attr;
    std::size_t begin;
    std::size_t end;
};

/* Whether the attribute is stored in a table that it shares with others. */
bool stores_in_order(const table_attrs &attr) {
    switch (attr.ta_type) {
    case AT_STRING:
    case AT_SD_NAME:
    case AT_VALID_VALUE:
    case AT_SD_VALID_VALUE:
    case AT_VALUE_DISPLAY:
    case AT_SD_VALUE_DISPLAY:
    case AT_DEFAULT_VALUE:
    case AT_SD_DEFAULT_VALUE:
    case AT_INITIAL_VALUE:
    case AT_RANGE:
        return true;
    default:
        return false;
    }
}

bool is_data_type(const item &each) {
    return each.attr->ta_type == AT_DATA_TYPE || each.attr->ta_type == AT_SD_DATA_TYPE;
}

/* Whether the attribute's value is converted to the data type, which must have been given. */
bool is_typed(const item &each) {
    return stores_in_order(*each.attr) && each.attr->ta_type != AT_STRING && each.attr->ta_type != AT_SD_NAME;
}

bool comes_before(const item &a, const item &b) {
    return language::comes_before(*a.attr, *b.attr);
}

/* The items in their new order. Those that the database stores in order keep it; the others are put between them. */
std::vector<item> ordered(const std::vector<item> &items) {
    std::vector<item> stored;
    std::vector<item> others;
    for (const item &each : items)
        (stores_in_order(*each.attr) ? stored : others).push_back(each);
    std::stable_sort(others.begin(), others.end(), comes_before);
    auto type = std::find_if(others.begin(), others.end(), is_data_type);
    std::vector<item> all;
    auto next = stored.begin();
    for (auto each = others.begin(); each != others.end(); ++each) {
        while (next != stored.end() && comes_before(*next, *each) &&
               (each > type || type == others.end() || !is_typed(*next)))
            all.push_back(*next++);
        all.push_back(*each);
    }
    all.insert(all.end(), next, stored.end());
    return all;
}

class stanza_order {
public:
    stanza_order(std::vector<row> &of, std::span<const line> in) : rows(of), lines(in) {}

    /* The stanza whose attribute lines are these; kind: its stanza_id. */
    void order(std::size_t begin, std::size_t end, int kind) {
        for (std::size_t i = begin; i < end;) {
            std::size_t after = i;
            while (after < end && is_movable(lines[after]))
                ++after;
            order_paragraph(i, after, sc_tables[static_cast<std::size_t>(kind)]);
            i = after + 1;
        }
    }

private:
    static bool is_movable(const line &each) {
        return each.kind == line_kind::attribute || each.kind == line_kind::comment;
    }

    /* The attribute that a line gives; null if it gives none. */
    static const table_attrs *attribute_of(const line &each, const srtable_ctrl &kind) {
        std::size_t equals = each.text.find('=');
        if (equals == std::string_view::npos || each.text.substr(equals + 1) == "\"\"")
            return nullptr;
        return find_attr(kind, each.text.substr(0, equals));
    }

    void order_paragraph(std::size_t begin, std::size_t end, const srtable_ctrl &kind) {
        while (begin < end && rows[begin].belongs_up) /* they continue the header's comment */
            ++begin;
        std::vector<item> items;
        std::size_t first = begin;
        for (std::size_t i = begin; i < end;) {
            const table_attrs *attr = attribute_of(lines[i++], kind);
            while (i < end && rows[i].belongs_up)
                ++i;
            if (attr == nullptr)
                continue;
            items.push_back({attr, first, i});
            first = i;
        }
        std::vector<row> moved;
        for (const item &each : ordered(items))
            std::copy_n(rows.begin() + static_cast<std::ptrdiff_t>(each.begin), each.end - each.begin,
                        std::back_inserter(moved));
        std::move(moved.begin(), moved.end(), rows.begin() + static_cast<std::ptrdiff_t>(begin));
    }

    std::vector<row> &rows;
    std::span<const line> lines;
};

} // namespace

void put_in_order(std::vector<row> &rows, std::span<const line> lines, std::optional<std::size_t> fixed) {
    stanza_order stanzas(rows, lines);
    auto is_header = [](const line &each) { return each.kind == line_kind::header; };
    /* Any verbatim line may be the header of another stanza. */
    auto ends_stanza = [](const line &each) {
        return each.kind == line_kind::header || each.kind == line_kind::verbatim;
    };
    auto header = std::find_if(lines.begin(), lines.end(), is_header);
    while (header != lines.end()) {
        auto last = std::find_if(header + 1, lines.end(), ends_stanza);
        auto begin = static_cast<std::size_t>(header - lines.begin());
        auto end = static_cast<std::size_t>(last - lines.begin());
        int kind = set_table_id(header->text);
        if (kind >= 0 && (!fixed || *fixed < begin || *fixed >= end))
            stanzas.order(begin + 1, end, kind);
        header = std::find_if(last, lines.end(), is_header);
    }
}

} // namespace formatter
