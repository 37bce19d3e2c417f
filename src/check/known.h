/* known.h: what a check knows about the source so far. The driver and the recovery write it; notes and warnings read
 * it. */
#ifndef CDGEN_CHECK_KNOWN_H
#define CDGEN_CHECK_KNOWN_H

#include "check/check.h"
#include "check/first_lines.h"
#include "check/kept_lines.h"
#include "check/number_lines.h"
#include "language/names.h"

#include <algorithm>
#include <array>
#include <bitset>
#include <initializer_list>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace check {

constexpr int NO_KIND = -1;      /* no stanza, or one that is skipped */
constexpr size_t ATTRS_MAX = 32; /* attributes of one kind */

using language::kind_set;

constexpr size_t index_of(int kind) {
    return static_cast<size_t>(kind);
}

inline const srtable_ctrl &table_of(int kind) {
    return sc_tables[index_of(kind)];
}

inline std::string_view name_of(const table_attrs &attr) {
    return {attr.ta_name, attr.ta_length};
}

inline bool is_sd_kind(int kind) {
    return table_of(kind).sc_sd_owner != nullptr;
}

/* A name or a number at a place of the source. */
struct mention {
    place at;
    std::string text;
    std::string source; /* the line */
};

/* Attributes of a stanza whose lines were refused. */
struct refused_attributes {
    bool has_any(std::initializer_list<attr_type> wanted) const {
        return std::any_of(wanted.begin(), wanted.end(), [this](attr_type type) { return types.test(type); });
    }
    /* An entry without a value is a name that resembles no attribute of the kind. */
    void add(std::optional<int> type) {
        if (type)
            types.set(index_of(*type));
        else
            unknown_name = true;
    }

    std::bitset<AT_COUNT> types;
    bool unknown_name = false;
};

/* Line of each attribute of a stanza, by its position in the kind; 0: not given. */
using given_lines = std::array<int, ATTRS_MAX>;

/* The latest stanza of a kind. */
struct stanza_record {
    bool is_empty() const {
        return std::all_of(given.begin(), given.end(), [](int line) { return line == 0; });
    }
    /* True if a line that was refused, or that belongs to another stanza, may have been meant as an attribute of these
     * types. */
    bool may_have_lost(std::initializer_list<attr_type> wanted) const {
        return misplaced || refused.unknown_name || refused.has_any(wanted);
    }

    place header;
    std::string source; /* the header's line */
    given_lines given = {};
    int ordinal = 0;      /* among all stanzas, from 1 */
    bool suspect = false; /* true: a line of it may belong to another stanza, and no new attribute has come since */
    refused_attributes refused;
    mention data_type;      /* the value of its DataType */
    bool misplaced = false; /* it seems to contain lines of another stanza */
};

/* An incomplete stanza whose missing lines may be in the stanza after it, because a header came between them. */
struct incomplete_stanza {
    int kind = NO_KIND; /* NO_KIND: there is none, or the missing lines are elsewhere */
    given_lines given = {};
};

/* Attributes of one stanza. */
struct stanza_attributes {
    bool has(std::string_view name) const {
        return std::find(names.begin(), names.end(), name) != names.end();
    }

    int ordinal = 0; /* of the stanza; 0: none */
    language::name_list names;
};

/* Stanzas whose headers could not be understood. */
struct lost_stanzas {
    bool may_be(int kind) const {
        return kinds.test(index_of(kind));
    }

    kind_set kinds;     /* that they may have been of */
    bool owner = false; /* one may have been the action that the next run belongs to */
};

/* The latest run of elements. */
struct element_run {
    /* Adds to one of the lists; so many are enough to see what is wrong. */
    static void add(std::vector<mention> &to, const mention &element) {
        constexpr size_t LISTED_MAX = 1024;
        if (to.size() < LISTED_MAX)
            to.push_back(element);
    }
    /* True if the header of an element without ElementIndex is in this line. */
    bool lists_without_index(int line) const {
        return !without_index.empty() && line >= without_index.front().at.line && line <= without_index.back().at.line;
    }

    int kind = SC_PATTR_SD_DEFINITION;
    std::vector<mention> odd_types;     /* DataTypes of elements for which the run's default may fail */
    bool odd_type_reported = false;     /* there were others, which have been reported */
    std::vector<mention> without_index; /* headers of elements without ElementIndex, since the latest wrong index */
};

/* Names and Ids that the current class gives, or for elements the current run, or for variable classes the source. Kept
 * only for the warnings that look at them. */
struct declarations {
    declarations(const warning_set &wanted, const text::hash_key &key)
        : keeps_names(wanted[SAME_NAME] || wanted[UNKNOWN_LOCATOR] || wanted[UNKNOWN_VARIABLE_CLASS] ||
                      wanted[UNUSED_VARIABLE_CLASS]),
          keeps_ids(wanted[SAME_ID]), names(SC_COUNT, first_lines(key)), ids(SC_COUNT, number_lines(key)) {}

    const first_lines &variable_classes() const {
        return names[SC_RESOURCE_VARIABLE_CLASS];
    }

    bool keeps_names;
    bool keeps_ids;
    std::vector<first_lines> names; /* by kind */
    std::vector<number_lines> ids;  /* by kind */
    int earlier_name = 0;           /* the line that gave the current line's name first; 0: none did */
    int earlier_id = 0;
};

struct knowledge {
    knowledge(const warning_set &wanted, const text::hash_key &key) : declared(wanted, key) {}

    const stanza_record &stanza() const {
        return stanzas[index_of(kind)];
    }
    stanza_record &stanza() {
        return stanzas[index_of(kind)];
    }
    /* The later one of ControlDefinition and ResourceClass, with which a class begins. */
    const stanza_record &class_stanza() const {
        const stanza_record &first = stanzas[SC_CONTROL_DEFINITION];
        const stanza_record &second = stanzas[SC_RESOURCE_CLASS];
        return second.header.line > first.header.line ? second : first;
    }

    int kind = NO_KIND;        /* of the current stanza */
    bool skipping = false;     /* nothing of the current stanza can be understood */
    bool class_forged = false; /* the open class has no stanza */
    std::array<stanza_record, SC_COUNT> stanzas;
    incomplete_stanza split;   /* the stanza before the current one */
    stanza_attributes lacking; /* of the latest stanza reported as lacking some; the next one may have them twice */
    stanza_attributes twice;   /* of the latest stanza reported as having some twice; the next one may lack them */
    int stanzas_begun = 0;
    lost_stanzas lost;
    element_run run;
    declarations declared;
    int overflow_line = 0;           /* of the latest number whose overflow affects later ones; 0: none */
    int map_line = 0;                /* header of the latest ClassToManagerMapping; 0: none */
    std::vector<mention> map_values; /* of all its attributes; the texts are the attributes' names */
    std::vector<int> class_lines;    /* of the headers of all ResourceClasses; only if a database is made */
    kept_lines variable_classes;     /* their names; only if a database is made */
};

} // namespace check

#endif
