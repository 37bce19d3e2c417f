/* groups.cpp: finds the variable class that each dynamic attribute names. */

#include "cdef/source/groups.h"

#include "cdef/source/error.h"
#include "language/limits.h"
#include "language/messages.h"

#include <unordered_map>
#include <unordered_set>

namespace cdef::source {

namespace {

/* The most steps of the search, which are repeated after each wrong choice. Careless sources need few choices. */
constexpr std::size_t LOOKS_MAX = 20'000'000;

/* A dynamic attribute as a member of the lists. */
struct member {
    var_id_t id;
    std::size_t of_class;
    cdb::level level;
    std::size_t index;
};

/* A variable class that lists IDs. */
struct group {
    std::string name;
    std::vector<var_id_t> ids;
};

/* Only an attribute that has all its required lines can name a variable class. */
void add_members(std::vector<member> &to, const class_plan &plan, cdb::level level) {
    var_id_t mark = level == cdb::level::of_class ? VAR_ID_CLASS_ATTR : 0;
    std::size_t index = 0;
    for (const cdb::dynamic_attribute &attr : plan.view.dynamic_attributes(level)) {
        if (is_complete(attr))
            to.push_back({static_cast<var_id_t>(attr.id()) | mark, plan.position, level, index});
        ++index;
    }
}

/* In the order in which the compiler lists them. */
std::vector<member> members_of(class_plans &classes) {
    std::vector<member> members;
    classes.each([&](const class_plan &plan) {
        add_members(members, plan, cdb::level::of_class);
        add_members(members, plan, cdb::level::of_resource);
    });
    return members;
}

/* If several variable classes have the same name, the first gets all IDs. */
std::vector<group> groups_of(const cdb::database &db) {
    std::vector<group> groups;
    std::unordered_set<std::string_view> names;
    for (const cdb::variable_class &v : db.variable_classes()) {
        bool first = names.emplace(v.name()).second;
        group list = {std::string(v.name()), {}};
        for (const cdb::variable_id &id : v.variable_ids())
            list.ids.push_back(id.number);
        if (!list.ids.empty() && (!first || list.name.empty()))
            no_source(place_of("ResourceVariableClass", v.name()), "it lists attributes, but no attribute can name it");
        if (!list.ids.empty())
            groups.push_back(std::move(list));
    }
    return groups;
}

/* Distributes members over lists. A member goes to the list whose next ID is the member's. Only if several lists
 * qualify is there a choice, which may turn out to be wrong later. */
class dealer {
public:
    /* No list is empty. */
    dealer(const std::vector<var_id_t> &to_deal, const std::vector<std::vector<var_id_t>> &to) : members(to_deal) {
        owners.resize(members.size());
        for (const std::vector<var_id_t> &ids : to)
            lists.push_back({ids});
        for (std::size_t i = 0; i < lists.size(); ++i)
            waiting[lists[i].ids[0]].push_back(i);
    }

    /* Returns false if no distribution was found. */
    bool deal() {
        while (looks < LOOKS_MAX) {
            deal_rest();
            if (std::all_of(lists.begin(), lists.end(), [](const id_list &l) { return l.is_done(); }))
                return true;
            if (!choose_otherwise())
                return false;
        }
        return false;
    }

    /* The list of each member. */
    const std::vector<std::optional<std::size_t>> &result() const {
        return owners;
    }

private:
    /* A list, and how many of its IDs have been used. */
    struct id_list {
        const std::vector<var_id_t> &ids;
        std::size_t done = 0;

        bool is_done() const {
            return done == ids.size();
        }
    };

    struct choice {
        std::size_t member;
        std::vector<std::size_t> candidates; /* lists; the last one is chosen */
    };

    void deal_rest() {
        for (; next < members.size(); ++next, ++looks) {
            const std::vector<std::size_t> &candidates = waiting[members[next]];
            if (candidates.empty())
                continue;
            if (candidates.size() > 1)
                choices.push_back({next, {candidates.rbegin(), candidates.rend()}});
            give(next, candidates.front());
        }
    }

    /* Goes back to the latest choice that has another candidate. */
    bool choose_otherwise() {
        while (!choices.empty()) {
            choice &latest = choices.back();
            while (next > latest.member)
                take_back(--next);
            latest.candidates.pop_back();
            if (!latest.candidates.empty()) {
                give(next++, latest.candidates.back());
                return true;
            }
            choices.pop_back();
        }
        return false;
    }

    void give(std::size_t m, std::size_t list) {
        stop_waiting(list);
        ++lists[list].done;
        wait(list);
        owners[m] = list;
    }

    void take_back(std::size_t m) {
        if (!owners[m])
            return;
        std::size_t list = *owners[m];
        stop_waiting(list);
        --lists[list].done;
        wait(list);
        owners[m].reset();
    }

    void wait(std::size_t list) {
        if (!lists[list].is_done())
            waiting[lists[list].ids[lists[list].done]].push_back(list);
    }

    void stop_waiting(std::size_t list) {
        if (!lists[list].is_done())
            std::erase(waiting[lists[list].ids[lists[list].done]], list);
    }

    const std::vector<var_id_t> &members;
    std::vector<id_list> lists;
    std::vector<std::optional<std::size_t>> owners;                 /* lists by member */
    std::unordered_map<var_id_t, std::vector<std::size_t>> waiting; /* lists by their next ID */
    std::vector<choice> choices;
    std::size_t looks = 0;
    std::size_t next = 0; /* member */
};

} // namespace

std::optional<std::vector<std::optional<std::size_t>>> deal_out(const std::vector<var_id_t> &members,
                                                                const std::vector<std::vector<var_id_t>> &lists) {
    dealer dealing(members, lists);
    return dealing.deal() ? std::optional(dealing.result()) : std::nullopt;
}

void plan_variable_classes(class_plans &classes, const cdb::database &db) {
    std::vector<member> members = members_of(classes);
    std::vector<group> groups = groups_of(db);
    if (groups.size() > VARIABLE_CLASSES_MAX)
        no_source("database",
                  std::string("its source would not compile: ") + message_of(MSG_TOO_MANY_VARIABLE_CLASSES).text);
    std::vector<var_id_t> ids(members.size());
    std::vector<std::vector<var_id_t>> lists(groups.size());
    std::transform(members.begin(), members.end(), ids.begin(), [](const member &m) { return m.id; });
    std::transform(groups.begin(), groups.end(), lists.begin(), [](const group &g) { return g.ids; });
    auto dealt = deal_out(ids, lists);
    if (!dealt)
        no_source("variable classes", "their lists of IDs are not those that the dynamic attributes give");
    for (std::size_t i = 0; i < members.size(); ++i)
        if (std::optional<std::size_t> list = (*dealt)[i])
            classes[members[i].of_class].of(members[i].level)[members[i].index].variable_class = groups[*list].name;
}

} // namespace cdef::source
