/* groups.cpp: finds the variable class that each dynamic attribute names. */

#include "cdef/source/groups.h"

#include "cdef/source/error.h"
#include "language/limits.h"
#include "language/messages.h"

#include <algorithm>
#include <cstdint>
#include <limits>
#include <unordered_map>
#include <unordered_set>

namespace cdef::source {

namespace {

/* How often the search may look at a member, on average: it looks again after a wrong choice. Careless sources need few
 * choices. */
constexpr std::size_t LOOKS_PER_MEMBER = 200;
/* How many looks more it may take, so that few members can have many. */
constexpr std::size_t LOOKS_MORE = 1'000'000;

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
 * qualify is there a choice, which may turn out to be wrong later: when a member can go to no list, but every member
 * with its ID is needed. */
class dealer {
public:
    /* At most VARIABLE_CLASSES_MAX lists, none of which is empty. */
    dealer(const std::vector<var_id_t> &to_deal, const std::vector<std::vector<var_id_t>> &to) : members(to_deal) {
        owners.resize(members.size());
        for (const std::vector<var_id_t> &ids : to) {
            for (var_id_t id : ids)
                --listed[id].spare;
            listed[ids[0]].waiting.push_back(static_cast<list_number>(lists.size()));
            lists.push_back({ids});
        }
        for (var_id_t id : members)
            if (auto found = listed.find(id); found != listed.end())
                ++found->second.spare;
    }

    /* Returns false if no distribution was found. */
    bool deal() {
        if (std::any_of(listed.begin(), listed.end(), [](const auto &each) { return each.second.spare < 0; }))
            return false;
        std::size_t looks_max = LOOKS_PER_MEMBER * members.size() + LOOKS_MORE;
        while (looks < looks_max) {
            if (deal_rest())
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
    /* A small type, because all lists may be candidates for each member. */
    using list_number = std::uint8_t;
    static_assert(VARIABLE_CLASSES_MAX <= std::numeric_limits<list_number>::max());

    /* A list, and how many of its IDs have been used. */
    struct id_list {
        const std::vector<var_id_t> &ids;
        std::size_t done = 0;
    };

    /* An ID that lists contain. */
    struct listed_id {
        std::vector<list_number> waiting; /* the lists whose next ID it is */
        std::ptrdiff_t spare = 0;         /* how many of the next members with it need not go to a list */
    };

    struct choice {
        std::size_t member;
        std::size_t first; /* of its candidates; the last one is chosen */
    };

    /* Returns false at a member that can go to no list, but would have to. */
    bool deal_rest() {
        for (; next < members.size(); ++next, ++looks) {
            auto found = listed.find(members[next]);
            if (found == listed.end())
                continue;
            auto &[waiting, spare] = found->second;
            if (waiting.empty()) {
                if (spare == 0)
                    return false;
                --spare;
                continue;
            }
            if (waiting.size() > 1) {
                choices.push_back({next, candidates.size()});
                candidates.insert(candidates.end(), waiting.rbegin(), waiting.rend());
            }
            give(next, waiting.front());
        }
        return true;
    }

    /* Goes back to the latest choice that has another candidate. */
    bool choose_otherwise() {
        while (!choices.empty()) {
            const choice &latest = choices.back();
            while (next > latest.member)
                take_back(--next);
            candidates.pop_back();
            if (candidates.size() > latest.first) {
                give(next++, candidates.back());
                ++looks;
                return true;
            }
            choices.pop_back();
        }
        return false;
    }

    void give(std::size_t m, list_number list) {
        stop_waiting(list);
        ++lists[list].done;
        wait(list);
        owners[m] = list;
    }

    void take_back(std::size_t m) {
        if (owners[m]) {
            auto list = static_cast<list_number>(*owners[m]);
            stop_waiting(list);
            --lists[list].done;
            wait(list);
            owners[m].reset();
        } else if (auto found = listed.find(members[m]); found != listed.end())
            ++found->second.spare;
    }

    /* The lists that wait for the next ID of a list; null if it is complete. */
    std::vector<list_number> *waiting_with(list_number list) {
        const auto &[ids, done] = lists[list];
        return done == ids.size() ? nullptr : &listed[ids[done]].waiting;
    }

    void wait(list_number list) {
        if (std::vector<list_number> *others = waiting_with(list))
            others->push_back(list);
    }

    void stop_waiting(list_number list) {
        if (std::vector<list_number> *others = waiting_with(list))
            others->erase(std::find(others->begin(), others->end(), list));
    }

    const std::vector<var_id_t> &members;
    std::vector<id_list> lists;
    std::vector<std::optional<std::size_t>> owners; /* lists by member */
    std::unordered_map<var_id_t, listed_id> listed;
    std::vector<choice> choices;
    std::vector<list_number> candidates; /* of all choices */
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
