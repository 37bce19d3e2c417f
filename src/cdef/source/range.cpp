/* range.cpp: decides which dynamic attributes get a Range line. */

#include "cdef/source/range.h"

#include "cdef/source/error.h"

#include <limits>

namespace cdef::source {

namespace {

/* ---- States ---------------------------------------------------------------------------------------------------- */

constexpr std::size_t BOUNDS = 3;

struct state {
    bool given = false; /* a Range was given, and no completion has cleared the mark */
    bounds of_class = bounds::untouched;
    bounds of_resource = bounds::untouched;

    std::size_t index() const {
        return (given ? BOUNDS * BOUNDS : 0) + static_cast<std::size_t>(of_class) * BOUNDS +
               static_cast<std::size_t>(of_resource);
    }
};
constexpr std::size_t STATES = 2 * BOUNDS * BOUNDS;

/* The line that an attribute gets. A useless line gives no bounds, but sets the mark. */
enum class given_line : std::uint8_t { none, good, useless };
constexpr const char *USELESS_VALUE = "0,0";

/* A step on a path through all stanzas: one more stanza. */
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

/* The cheapest path to each state. */
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

/* How many attributes of each kind have begun. */
struct place {
    std::uint32_t of_class;
    std::uint32_t of_resource;
};

class planner {
public:
    planner(const std::vector<dynamic_attributes> &of, bool any) : classes(of), any_order(any) {}

    std::optional<std::vector<range_lines>> run();

private:
    static constexpr std::size_t MIXTURES_MAX = 40000;

    bool plan_class(std::uint32_t c);
    ways end_in_order(std::uint32_t c);
    ways end_in_any_order(std::uint32_t c);
    void begin(ways &to, const ways &from, std::uint32_t c, table kind, place at);
    void add_lines(ways &to, const way &from, move m, const dynamic_attributes &attrs);
    void add(ways &to, const way &from, const move &m, bounds gives, unsigned cost);
    std::vector<range_lines> lines_on(const way &w) const;

    const std::vector<dynamic_attributes> &classes;
    bool any_order;
    ways now;
    std::vector<move> moves = {{}};
};

/* How an open attribute can get its bounds. */
ways completed(const ways &all, const range &r, bounds state::*held, bool cut_short) {
    ways right;
    for (way w : all) {
        if (!w.is_open())
            continue;
        bool kept = w.at.*held == bounds::wanted || (w.at.*held == bounds::untouched && r.is_untouched);
        bool as_given = r.keeps_bounds && (w.at.given ? kept : r.is_default);
        bool has_bounds = cut_short ? kept : r.has_none || as_given;
        w.at.*held = bounds::untouched;
        w.at.given = w.at.given && cut_short;
        if (has_bounds)
            right.keep(w);
    }
    return right;
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

/* The attribute whose bounds a line gives. */
const range &target_of(const dynamic_attributes &attrs, const move &m) {
    return m.elsewhere ? attrs.of_resource[m.target] : range_of(attrs, m);
}

/* Adds moves with a line. A useless line is tried too, because it sets the mark. */
void planner::add_lines(ways &to, const way &from, move m, const dynamic_attributes &attrs) {
    constexpr unsigned GOOD = 1, MISPLACED = 10, USELESS = 100;
    bounds before = m.elsewhere ? from.at.of_resource : bounds::untouched;
    m.line = given_line::good;
    if (after_line(target_of(attrs, m), before, range_of(attrs, m).type) == bounds::wanted)
        add(to, from, m, bounds::wanted, m.elsewhere ? MISPLACED : GOOD);
    m.line = given_line::useless;
    add(to, from, m, bounds::unwanted, USELESS);
}

/* Adds an attribute. The open one of its kind is completed; a line of a class attribute goes to an open resource
 * attribute. */
void planner::begin(ways &to, const ways &from, std::uint32_t c, table kind, place at) {
    const dynamic_attributes &attrs = classes[c];
    bool is_class = kind == table::dynamic_class_attributes;
    move m = {.before = 0,
              .rsrc_class = c,
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

/* The paths through a class with its attributes in their order. */
ways planner::end_in_order(std::uint32_t c) {
    ways all = now;
    place at = {0, 0};
    for (table kind : classes[c].order) {
        ways next;
        begin(next, all, c, kind, at);
        ++(kind == table::dynamic_attributes ? at.of_resource : at.of_class);
        all = next;
    }
    return all;
}

/* True if a kind has an attribute left that may come now. */
bool may_begin(const dynamic_attributes &attrs, table kind, place at) {
    bool is_class = kind == table::dynamic_class_attributes;
    std::size_t of_class = attrs.of_class.size() - at.of_class;
    std::size_t of_resource = attrs.of_resource.size() - at.of_resource;
    std::size_t left = is_class ? of_class : of_resource;
    std::size_t others = is_class ? of_resource : of_class;
    return left > 0 && !(attrs.has_to_end == kind && left == 1 && others > 0);
}

/* All paths through a class, by how many attributes of each kind have begun. */
ways planner::end_in_any_order(std::uint32_t c) {
    const dynamic_attributes &attrs = classes[c];
    std::size_t width = attrs.of_resource.size();
    std::vector<ways> row(width + 1);
    row[0] = now;
    for (place at = {0, 0};; ++at.of_class) {
        std::vector<ways> next(width + 1);
        for (at.of_resource = 0; at.of_resource <= width; ++at.of_resource) {
            std::uint32_t j = at.of_resource;
            if (may_begin(attrs, table::dynamic_attributes, at))
                begin(row[j + 1], row[j], c, table::dynamic_attributes, at);
            if (may_begin(attrs, table::dynamic_class_attributes, at))
                begin(next[j], row[j], c, table::dynamic_class_attributes, at);
        }
        if (at.of_class == attrs.of_class.size())
            return row[width];
        row = std::move(next);
    }
}

/* At the end of the file the resource attribute is completed first. A class that ends earlier completes nothing. */
bool planner::plan_class(std::uint32_t c) {
    const dynamic_attributes &attrs = classes[c];
    if (any_order && (attrs.of_class.size() + 1) * (attrs.of_resource.size() + 1) > MIXTURES_MAX)
        return false;
    now = any_order ? end_in_any_order(c) : end_in_order(c);
    if (!attrs.of_resource.empty())
        now = completed(now, attrs.of_resource.back(), &state::of_resource, attrs.cut_short);
    if (!attrs.of_class.empty())
        now = completed(now, attrs.of_class.back(), &state::of_class, attrs.cut_short);
    return now.best().is_open();
}

/* The lines of the moves on a path, and the order of the moves. */
std::vector<range_lines> planner::lines_on(const way &w) const {
    std::vector<range_lines> lines;
    for (const dynamic_attributes &attrs : classes)
        lines.push_back(
            {std::vector<std::string>(attrs.of_class.size()), std::vector<std::string>(attrs.of_resource.size()), {}});
    for (std::uint32_t i = w.last_move; i != 0; i = moves[i].before) {
        const move &m = moves[i];
        const dynamic_attributes &attrs = classes[m.rsrc_class];
        range_lines &of = lines[m.rsrc_class];
        std::string &value = (m.from == table::dynamic_class_attributes ? of.of_class : of.of_resource)[m.index];
        if (m.line == given_line::useless)
            value = USELESS_VALUE;
        if (m.line == given_line::good)
            value = line_value(target_of(attrs, m).wanted, range_of(attrs, m).type);
        of.order.push_back(m.from);
    }
    for (range_lines &of : lines)
        std::reverse(of.order.begin(), of.order.end());
    return lines;
}

std::optional<std::vector<range_lines>> planner::run() {
    now.keep({.cost = 0, .last_move = 0, .at = {}});
    for (std::uint32_t c = 0; c < classes.size(); ++c)
        if (!plan_class(c))
            return std::nullopt;
    return lines_on(now.best());
}

/* ---- Plans ----------------------------------------------------------------------------------------------------- */

dynamic_attributes attributes_of(const class_plan &plan) {
    dynamic_attributes found;
    found.cut_short = !plan.is_last;
    found.of_class.reserve(plan.view.dynamic_attributes(cdb::level::of_class).size());
    found.of_resource.reserve(plan.view.dynamic_attributes(cdb::level::of_resource).size());
    for (const step &s : plan.order) {
        if (!is_dynamic(s.from))
            continue;
        found.order.push_back(s.from);
        (s.from == table::dynamic_attributes ? found.of_resource : found.of_class).push_back(range_of(plan, s));
    }
    if (plan.ends_in_run() && !found.order.empty() && plan.order.back().from == found.order.back())
        found.has_to_end = found.order.back();
    return found;
}

std::optional<std::vector<range_lines>> lines_for(class_plans &classes) {
    std::vector<dynamic_attributes> attributes(classes.size());
    classes.each([&](const class_plan &plan) { attributes[plan.position] = attributes_of(plan); });
    return find_range_lines(attributes);
}

/* The dynamic attributes keep the places of such attributes among the other stanzas. */
void use(range_lines &lines, const class_plan &plan) {
    std::size_t of_class = 0, of_resource = 0;
    auto kind = lines.order.begin();
    for (step &s : plan.order)
        if (is_dynamic(s.from)) {
            s = {*kind, *kind == table::dynamic_class_attributes ? of_class++ : of_resource++};
            ++kind;
        }
    plan.of(cdb::level::of_class).resize(lines.of_class.size());
    plan.of(cdb::level::of_resource).resize(lines.of_resource.size());
    for (std::size_t i = 0; i < lines.of_class.size(); ++i)
        plan.of(cdb::level::of_class)[i].range = std::move(lines.of_class[i]);
    for (std::size_t i = 0; i < lines.of_resource.size(); ++i)
        plan.of(cdb::level::of_resource)[i].range = std::move(lines.of_resource[i]);
}

} // namespace

std::optional<std::vector<range_lines>> find_range_lines(const std::vector<dynamic_attributes> &classes) {
    auto in_order = planner(classes, false).run();
    return in_order ? in_order : planner(classes, true).run();
}

void plan_ranges(class_plans &classes) {
    auto lines = lines_for(classes);
    if (!lines)
        no_source("dynamic attributes", "no combination of Range lines gives all of them their bounds");
    classes.each([&](const class_plan &plan) { use((*lines)[plan.position], plan); });
}

} // namespace cdef::source
