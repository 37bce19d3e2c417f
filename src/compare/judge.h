/* judge.h: which rules a difference breaks. */
#ifndef CDGEN_COMPARE_JUDGE_H
#define CDGEN_COMPARE_JUDGE_H

#include "compare/ranges.h"
#include "compare/rules.h"

namespace compare {

/* The rules that one difference breaks, those of the first level first. */
class breaches {
public:
    void add(breach b) {
        if (std::find(begin(), end(), b) == end())
            all.at(count++) = b;
    }
    const breach *begin() const {
        return all.data();
    }
    const breach *end() const {
        return all.data() + count;
    }

private:
    std::array<breach, 8> all = {};
    std::size_t count = 0;
};

/* The attributes and actions of a class, by number. */
class numbered_parts {
public:
    /* of: the families of the class. They are searched when a number is looked up. */
    explicit numbered_parts(const families &of) : parts(of) {}

    /* True if a part of this kind has the number. */
    bool has(node_kind kind, std::uint32_t number);

    /* Adds the rules that are broken because the values stored under an attribute's number belong to another attribute.
     * after: the attribute in the newer database, which is new or had another number, name or type. */
    void judge_stored(const node &after, breaches &found);

private:
    struct entry {
        std::uint32_t number;
        std::uint8_t family;
        std::uint32_t index;
    };

    void collect();
    /* The first part of a family that has the number; null if there is none. */
    const entry *first_with(std::uint32_t number, std::uint8_t family);

    const families &parts;
    bool is_collected = false;
    std::vector<entry> entries; /* by number; those of one number by family and index */
};

/* The field that holds the number of an attribute or an action; null for any other record. */
const cdb::field *number_field_of(const node &n);

/* Judges the parts of one family of a record. The families must live as long. */
class family_judge {
public:
    /* numbers: of the older class; null for parts of anything else. */
    family_judge(const family &before, const family &after, numbered_parts *numbers)
        : old_parts(before), new_parts(after), in_use(numbers) {}

    breaches removed(const node &part);
    breaches added(const node &part) const;
    breaches renamed(const node &after) const;

private:
    bool is_covered(const node &entry);

    const family &old_parts;
    const family &new_parts;
    numbered_parts *in_use;
    std::optional<range_set> covered; /* by the entries after; made when it is needed */
};

/* Judges a field whose text differs. numbers: as above. */
breaches judge_change(const node &before, const node &after, const fact &was, const fact &is, numbered_parts *numbers);

/* True if the difference is that the class has a lower version. */
bool is_lower_version(const fact &was, const fact &is);

} // namespace compare

#endif
