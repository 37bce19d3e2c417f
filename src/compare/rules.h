/* rules.h: the rules of compatibility: which differences break what. */
#ifndef CDGEN_COMPARE_RULES_H
#define CDGEN_COMPARE_RULES_H

#include <cstdint>
#include <span>
#include <string_view>

namespace compare {

/* What relies on a class. Clients also read, and stored values are read by clients, so each level includes the ones
 * before it. */
enum class level : std::uint8_t {
    READERS, /* programs that look things up in the database */
    CLIENTS, /* programs that define resources, give values and start actions */
    STORED   /* values that were stored under the older database, by number */
};

inline constexpr level levels[] = {level::READERS, level::CLIENTS, level::STORED};

std::string_view name_of(level l);

enum class breach : std::uint8_t {
    GONE,
    NUMBER,
    NUMBER_TAKEN,
    TYPE,
    LAYOUT,
    NEW_REQUIRED,
    NOW_REQUIRED,
    VALUE_GONE,
    VALUES_LIMITED,
    VARIETY_GONE,
    PROPERTY_GONE,
    READ_ONLY,
    RANGE_NARROWER,
    PERMISSION,
    STORED_NAME,
    STORED_KIND,
    STORED_TYPE,
    COUNT
};

struct breach_rule {
    breach is;
    std::string_view code; /* permanent */
    level broken_for;
    std::string_view title;  /* the difference */
    std::string_view reason; /* why it breaks something */
};

/* In the order of breach. */
std::span<const breach_rule> breach_rules();

const breach_rule &rule_of(breach b);

} // namespace compare

#endif
