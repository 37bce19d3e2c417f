/* range.cpp: which dynamic attributes get a Range line.
 *
 * Both dynamic kinds share one mark "a Range was given", which the completion of either clears, and a class attribute's
 * Range goes to a resource attribute that is still open. So a line may take effect elsewhere, or an attribute without
 * one go without its default. What a database holds can be had from some choice of lines, if a source made it. That
 * choice is looked for here, stanza by stanza, over the few states that the compiler can be in; if there is none with
 * the stanzas in their order, then over all ways to mix the two kinds. */

#include "cdef/source/source.h"
#include "compare/compare.h"

#include <bit>
#include <limits>

namespace cdef {

namespace {

/* ---- Bounds ---------------------------------------------------------------------------------------------------- */

using cell = std::array<std::byte, sizeof(vx_value_t)>;

/* The bytes that a line has to leave, in cells or in the elements of two arrays of one. */
struct wanted_bytes {
    bool known = false;
    bool in_arrays = false;
    std::size_t width = 0; /* bytes that count */
    cell low = {};
    cell high = {};
};

/* What is known of an attribute's bounds. */
struct range {
    vx_data_type_t type;
    bool takes_line;   /* a Range line is accepted and has an effect */
    bool is_default;   /* what the completion gives without the mark */
    bool is_untouched; /* what an attribute has that nothing was given to */
    bool has_none;     /* bounds are not kept, or cannot be seen */
    wanted_bytes wanted;
};

bool is_number(vx_data_type_t type) {
    return type >= VX_INT32 && type <= VX_FLOAT64;
}

std::size_t width_of(vx_data_type_t type) {
    return type == VX_INT64 || type == VX_UINT64 || type == VX_FLOAT64 ? sizeof(vx_uint64_t) : sizeof(vx_uint32_t);
}

bool is_hundred(const cdb::value &v) {
    switch (v.type()) {
    case VX_INT32:
    case VX_INT64:
        return v.integer() == 100;
    case VX_UINT32:
    case VX_UINT64:
        return v.natural() == 100;
    default:
        return v.real() == 100;
    }
}

/* The one element of a bound that is an array; nothing if it has not exactly one. */
std::optional<cdb::value> only_element(const cdb::value &bound) {
    cdb::value_list elements = bound.elements();
    return elements.size() == 1 ? std::optional(elements[0]) : std::nullopt;
}

/* The default range of types that have no numbers. */
bool is_default_element(const cdb::value &element) {
    switch (element.type()) {
    case VX_RSRC_HANDLE_PTR:
        return is_default(element);
    case VX_SD_PTR:
        return element.present() && element.elements().empty();
    default:
        return !element.present();
    }
}

bool are_default(const cdb::value &low, const cdb::value &high) {
    if (is_number(low.type()))
        return is_default(low) && is_hundred(high);
    std::optional<cdb::value> first = only_element(low), second = only_element(high);
    if (!first || !second)
        return false;
    if (is_number(first->type()))
        return are_default(*first, *second);
    return is_default_element(*first) && is_default_element(*second);
}

bool are_untouched(const cdb::value &low, const cdb::value &high) {
    return is_number(low.type()) ? is_default(low) && is_default(high) : !low.present() && !high.present();
}

template <class Number> cell cell_of(Number number) {
    cell made = {};
    std::memcpy(made.data(), &number, sizeof number);
    return made;
}

/* A bound, or an element of one that is an array. */
struct bound {
    cdb::value value;
    bool is_own;
};

/* A number's bytes, or those of the place that a reference leads to where no value of its own is stored: of a number
 * that landed in the attribute of another type. Nothing for a value of its own. */
std::optional<cell> bytes_of(const bound &b) {
    const cdb::value &v = b.value;
    switch (v.type()) {
    case VX_INT32:
    case VX_INT64:
        return cell_of(v.integer());
    case VX_UINT32:
    case VX_UINT64:
        return cell_of(v.natural());
    case VX_FLOAT32:
        return cell_of(static_cast<float>(v.real()));
    case VX_FLOAT64:
        return cell_of(v.real());
    default:
        break;
    }
    if (!cdb::is_out_of_line(v.type()) || (v.present() && b.is_own))
        return std::nullopt;
    return cell_of(v.place().value_or(0));
}

std::optional<wanted_bytes> wanted_in_cells(const bound &low, const bound &high) {
    std::optional<cell> first = bytes_of(low), second = bytes_of(high);
    if (!first || !second)
        return std::nullopt;
    return wanted_bytes{
        .known = true, .in_arrays = false, .width = width_of(low.value.type()), .low = *first, .high = *second};
}

/* The one element of a bound that is an array; nothing if it has not exactly one. */
std::optional<bound> element_of(const bound &array, const class_plan &plan) {
    std::optional<cdb::value> element = only_element(array.value);
    if (!element || !cdb::is_array(array.value.type()))
        return std::nullopt;
    std::size_t place = *array.value.place() + cdb::value::ELEMENTS;
    return bound{*element, plan.owners->is_own(plan.view.side_tables().strings, place)};
}

wanted_bytes wanted_of(const bound &low, const bound &high, const class_plan &plan) {
    if (std::optional<wanted_bytes> wanted = wanted_in_cells(low, high))
        return *wanted;
    std::optional<bound> first = element_of(low, plan), second = element_of(high, plan);
    if (!first || !second)
        return {};
    wanted_bytes wanted = wanted_in_cells(*first, *second).value_or(wanted_bytes());
    wanted.in_arrays = true;
    return wanted;
}

range range_of(const class_plan &plan, const step &s) {
    cdb::dynamic_attribute attr = plan.view.dynamic_attributes(level_of(s.from))[s.index];
    cdb::value low = attr.min_value(), high = attr.max_value();
    bound first = {low, plan.owns(s, offsetof(rsrc_dattr_t, ra_min_value))};
    bound second = {high, plan.owns(s, offsetof(rsrc_dattr_t, ra_max_value))};
    bool array = cdb::is_array(attr.type());
    return {.type = attr.type(),
            .takes_line = is_number(cdb::element_type(attr.type())) && is_complete(attr),
            .is_default = are_default(low, high),
            .is_untouched = are_untouched(low, high),
            .has_none = !is_number(attr.type()) && !array && !low.present() && !high.present(),
            .wanted = wanted_of(first, second, plan)};
}

/* The value of a Range line of one type that leaves another attribute's bytes; empty if there is none. */
std::string line_value(const wanted_bytes &wanted, vx_data_type_t type) {
    vx_data_type_t scalar = cdb::element_type(type);
    if (!wanted.known || cdb::is_array(type) != wanted.in_arrays)
        return {};
    std::string text;
    for (const cell &bound : {wanted.low, wanted.high}) {
        std::vector<std::string> texts =
            texts_of(cdb::value(cdb::bytes(bound, std::endian::native), 0, scalar, cdb::bytes()), true);
        if (texts.empty())
            return {};
        text += (text.empty() ? "" : ",") + texts.front();
    }
    return text;
}

/* Whether bytes behind those of a narrower number are 0. */
bool is_zero_from(const wanted_bytes &wanted, std::size_t offset) {
    auto zero = [](std::byte b) { return b == std::byte{0}; };
    return std::all_of(wanted.low.begin() + static_cast<std::ptrdiff_t>(offset), wanted.low.end(), zero) &&
           std::all_of(wanted.high.begin() + static_cast<std::ptrdiff_t>(offset), wanted.high.end(), zero);
}

/* ---- States ---------------------------------------------------------------------------------------------------- */

/* What an open attribute's bounds hold so far. */
enum class bounds : std::uint8_t { untouched, wanted, unwanted };
constexpr std::size_t BOUNDS = 3;

struct state {
    bool given = false; /* the mark */
    bounds of_class = bounds::untouched;
    bounds of_resource = bounds::untouched;

    std::size_t index() const {
        return (given ? BOUNDS * BOUNDS : 0) + static_cast<std::size_t>(of_class) * BOUNDS +
               static_cast<std::size_t>(of_resource);
    }
};
constexpr std::size_t STATES = 2 * BOUNDS * BOUNDS;

/* Which lines an attribute gets: a useless one does no good to any bounds, but leaves its mark. */
enum class given_line : std::uint8_t { none, good, useless };
constexpr const char *USELESS_VALUE = "0,0";

/* One stanza more on a way through them. */
struct move {
    std::uint32_t before;     /* in the planner's moves */
    std::uint32_t rsrc_class; /* its position */
    std::uint32_t index;
    std::uint32_t target; /* index of the open resource attribute that a line goes to */
    table from;
    given_line line;
    bool elsewhere; /* the line goes to target, not to its own attribute */
};

struct way {
    std::uint64_t cost = std::numeric_limits<std::uint64_t>::max();
    std::uint32_t last_move = 0;
    state at;

    bool is_open() const {
        return cost != std::numeric_limits<std::uint64_t>::max();
    }
};

/* The cheapest way to each state. */
class ways {
public:
    void keep(const way &w) {
        way &known = all[w.at.index()];
        if (w.cost < known.cost)
            known = w;
    }
    bool is_better(const way &w) const {
        return w.cost < all[w.at.index()].cost;
    }
    const way &best() const {
        return *std::min_element(all.begin(), all.end(), [](const way &a, const way &b) { return a.cost < b.cost; });
    }
    auto begin() const {
        return all.begin();
    }
    auto end() const {
        return all.end();
    }

private:
    std::array<way, STATES> all;
};

/* The dynamic attributes of a class. */
struct dynamic_attributes {
    std::vector<range> of_class;
    std::vector<range> of_resource;
    std::vector<table> order;        /* as planned so far */
    std::optional<table> has_to_end; /* the kind of the last */
};

/* How far ways through a class have come: so many of each kind have begun. */
struct place {
    std::uint32_t of_class;
    std::uint32_t of_resource;
};

class planner {
public:
    planner(std::vector<class_plan> &to, bool any) : classes(to), any_order(any) {}

    bool run();

private:
    static constexpr std::size_t MIXTURES_MAX = 40000;

    bool plan_class(std::uint32_t c);
    dynamic_attributes attributes_of(std::uint32_t c) const;
    ways end_in_order(const dynamic_attributes &attrs);
    ways end_in_any_order(const dynamic_attributes &attrs);
    void begin(ways &to, const ways &from, const dynamic_attributes &attrs, table kind, place at);
    void add_lines(ways &to, const way &from, move m, const dynamic_attributes &attrs);
    void add(ways &to, const way &from, const move &m, bounds gives, unsigned cost);
    void use(const way &w);

    std::vector<class_plan> &classes;
    bool any_order;
    ways now;
    std::vector<move> moves = {{}};
    std::vector<dynamic_attributes> attributes;
};

/* Keeps the ways on which an attribute that was open has its bounds. */
ways completed(const ways &all, const range &r, bounds state::*held, bool cut_short) {
    ways right;
    for (way w : all) {
        if (!w.is_open())
            continue;
        bool kept = w.at.*held == bounds::wanted || (w.at.*held == bounds::untouched && r.is_untouched);
        bool has_bounds = cut_short ? kept : r.has_none || (w.at.given ? kept : r.is_default);
        w.at.*held = bounds::untouched;
        w.at.given = w.at.given && cut_short;
        if (has_bounds)
            right.keep(w);
    }
    return right;
}

/* What a line of one type makes of another attribute's bounds. */
bounds after_line(const range &target, bounds before, vx_data_type_t type) {
    std::size_t width = width_of(cdb::element_type(type));
    if (line_value(target.wanted, type).empty())
        return bounds::unwanted;
    if (width >= target.wanted.width)
        return bounds::wanted;
    bool rest = target.wanted.in_arrays || before == bounds::untouched ? is_zero_from(target.wanted, width)
                                                                       : before == bounds::wanted;
    return rest ? bounds::wanted : bounds::unwanted;
}

void planner::add(ways &to, const way &from, const move &m, bounds gives, unsigned cost) {
    way w = from;
    w.cost += cost;
    if (m.line != given_line::none) {
        w.at.given = true;
        bool to_class = m.from == table::dynamic_class_attributes && !m.elsewhere;
        (to_class ? w.at.of_class : w.at.of_resource) = gives;
    }
    if (!to.is_better(w))
        return;
    w.last_move = static_cast<std::uint32_t>(moves.size());
    moves.push_back(m);
    to.keep(w);
}

const range &range_of(const dynamic_attributes &attrs, const move &m) {
    return (m.from == table::dynamic_class_attributes ? attrs.of_class : attrs.of_resource)[m.index];
}

/* Whose bounds a line gives. */
const range &target_of(const dynamic_attributes &attrs, const move &m) {
    return m.elsewhere ? attrs.of_resource[m.target] : range_of(attrs, m);
}

/* A move with a line. One that does no good is tried too: it leaves its mark. */
void planner::add_lines(ways &to, const way &from, move m, const dynamic_attributes &attrs) {
    constexpr unsigned GOOD = 1, MISPLACED = 10, USELESS = 100;
    bounds before = m.elsewhere ? from.at.of_resource : bounds::untouched;
    m.line = given_line::good;
    if (after_line(target_of(attrs, m), before, range_of(attrs, m).type) == bounds::wanted)
        add(to, from, m, bounds::wanted, m.elsewhere ? MISPLACED : GOOD);
    m.line = given_line::useless;
    add(to, from, m, bounds::unwanted, USELESS);
}

/* One attribute more. The one of its kind that was open is completed; a line of a class attribute goes to a resource
 * attribute that is open. */
void planner::begin(ways &to, const ways &from, const dynamic_attributes &attrs, table kind, place at) {
    bool is_class = kind == table::dynamic_class_attributes;
    move m = {.before = 0,
              .rsrc_class = static_cast<std::uint32_t>(attributes.size() - 1),
              .index = is_class ? at.of_class : at.of_resource,
              .target = at.of_resource - 1,
              .from = kind,
              .line = given_line::none,
              .elsewhere = is_class && at.of_resource > 0};
    ways before = from;
    if (m.index > 0)
        before = completed(from, (is_class ? attrs.of_class : attrs.of_resource)[m.index - 1],
                           is_class ? &state::of_class : &state::of_resource, false);
    for (const way &w : before) {
        if (!w.is_open())
            continue;
        m.before = w.last_move;
        add(to, w, m, bounds::untouched, 0);
        if (range_of(attrs, m).takes_line)
            add_lines(to, w, m, attrs);
    }
}

/* The ways through a class with its attributes in their order. */
ways planner::end_in_order(const dynamic_attributes &attrs) {
    ways all = now;
    place at = {0, 0};
    for (table kind : attrs.order) {
        ways next;
        begin(next, all, attrs, kind, at);
        ++(kind == table::dynamic_attributes ? at.of_resource : at.of_class);
        all = next;
    }
    return all;
}

/* Whether an attribute is left of a kind, and may come now. */
bool may_begin(const dynamic_attributes &attrs, table kind, place at) {
    bool is_class = kind == table::dynamic_class_attributes;
    std::size_t of_class = attrs.of_class.size() - at.of_class;
    std::size_t of_resource = attrs.of_resource.size() - at.of_resource;
    std::size_t left = is_class ? of_class : of_resource;
    std::size_t others = is_class ? of_resource : of_class;
    return left > 0 && !(attrs.has_to_end == kind && left == 1 && others > 0);
}

/* All ways through a class, by how many of each kind have begun. */
ways planner::end_in_any_order(const dynamic_attributes &attrs) {
    std::size_t width = attrs.of_resource.size();
    std::vector<ways> row(width + 1);
    row[0] = now;
    for (place at = {0, 0};; ++at.of_class) {
        std::vector<ways> next(width + 1);
        for (at.of_resource = 0; at.of_resource <= width; ++at.of_resource) {
            std::uint32_t j = at.of_resource;
            if (may_begin(attrs, table::dynamic_attributes, at))
                begin(row[j + 1], row[j], attrs, table::dynamic_attributes, at);
            if (may_begin(attrs, table::dynamic_class_attributes, at))
                begin(next[j], row[j], attrs, table::dynamic_class_attributes, at);
        }
        if (at.of_class == attrs.of_class.size())
            return row[width];
        row = std::move(next);
    }
}

dynamic_attributes planner::attributes_of(std::uint32_t c) const {
    dynamic_attributes found;
    for (const step &s : classes[c].order) {
        if (s.from != table::dynamic_attributes && s.from != table::dynamic_class_attributes)
            continue;
        found.order.push_back(s.from);
        (s.from == table::dynamic_attributes ? found.of_resource : found.of_class).push_back(range_of(classes[c], s));
    }
    if (classes[c].ends_in_run && !found.order.empty() && classes[c].order.back().from == found.order.back())
        found.has_to_end = found.order.back();
    return found;
}

/* At the end of the file the resource attribute is completed first. A class that ends earlier completes nothing. */
bool planner::plan_class(std::uint32_t c) {
    attributes.push_back(attributes_of(c));
    const dynamic_attributes &attrs = attributes.back();
    if (any_order && (attrs.of_class.size() + 1) * (attrs.of_resource.size() + 1) > MIXTURES_MAX)
        return false;
    now = any_order ? end_in_any_order(attrs) : end_in_order(attrs);
    bool cut_short = !classes[c].is_last;
    if (!attrs.of_resource.empty())
        now = completed(now, attrs.of_resource.back(), &state::of_resource, cut_short);
    if (!attrs.of_class.empty())
        now = completed(now, attrs.of_class.back(), &state::of_class, cut_short);
    return now.best().is_open();
}

/* Line values, and the order of the moves in the places of the dynamic attributes. */
void planner::use(const way &w) {
    std::vector<std::vector<step>::reverse_iterator> places;
    for (class_plan &plan : classes)
        places.push_back(plan.order.rbegin());
    for (std::uint32_t i = w.last_move; i != 0; i = moves[i].before) {
        const move &m = moves[i];
        const dynamic_attributes &attrs = attributes[m.rsrc_class];
        std::string &value = classes[m.rsrc_class].of(level_of(m.from))[m.index].range;
        if (m.line == given_line::useless)
            value = USELESS_VALUE;
        if (m.line == given_line::good)
            value = line_value(target_of(attrs, m).wanted, range_of(attrs, m).type);
        auto &slot = places[m.rsrc_class];
        while (slot->from != table::dynamic_attributes && slot->from != table::dynamic_class_attributes)
            ++slot;
        *slot++ = {m.from, m.index};
    }
}

bool planner::run() {
    now.keep({.cost = 0, .last_move = 0, .at = {}});
    for (std::uint32_t c = 0; c < classes.size(); ++c)
        if (!plan_class(c))
            return false;
    use(now.best());
    return true;
}

} // namespace

void plan_ranges(std::vector<class_plan> &classes) {
    auto plan = [&](bool any_order) { return planner(classes, any_order).run(); };
    if (!plan(false) && !plan(true))
        no_source("dynamic attributes", "no choice of Range lines gives all of them their bounds");
}

} // namespace cdef
