/* recovery.h: continues after an error, so that each mistake is reported once. Up to the first error it does exactly
 * what the compiler does. */
#ifndef CDGEN_CHECK_RECOVERY_H
#define CDGEN_CHECK_RECOVERY_H

#include "check/early_lines.h"
#include "check/findings.h"
#include "check/view.h"
#include "check/warnings/registry.h"

#include <optional>
#include <string>
#include <string_view>

namespace check {

class recovery {
public:
    recovery(compilation &driven, current_line &current, knowledge &remembered, findings &results, const view &whole,
             const watchers &warnings_at_work);

    /* Take the current line and report its errors. (recover_header.cpp, recover_attribute.cpp) */
    void take_header(const attr_text &text, bool guessed);
    void take_attribute();

    /* The end of the source. (recover_end.cpp) */
    void close_all();

    /* True if later lines may still withdraw a warning of a line. */
    bool may_retract(warning_id id, int at_line) const;

    /* Carriage returns at the ends of lines are ignored. */
    bool strips_returns() const {
        return strip_returns;
    }

private:
    /* What an error is, and what follows from it (recovery.cpp). */
    finding &report(const fatal_exit &failure, const place &at);
    bool may_follow(const fatal_exit &failure) const;
    bool is_reported_otherwise(const fatal_exit &failure) const;
    bool is_line_of_neighbour(const fatal_exit &failure, int kind);
    int failed_kind(const fatal_exit &failure) const;
    void report_with_notes(const fatal_exit &failure, const place &met, int kind);

    /* Stanzas and records (recovery.cpp). */
    void end_stanza(int next_kind);
    void open_placeholder_class();
    void drop_record(int kind);
    void abandon(int kind, const fatal_exit &failure);
    void settle_broken(int next_kind);
    void skip_stanza();
    void lose_header(const kind_set &kinds);
    void break_if_incomplete(int kind);

    /* Headers (recover_header.cpp). */
    bool loses_index(int next_kind) const;
    void open_stanza(int kind, bool broken);
    bool recover_header(const fatal_exit &failure, int kind);
    bool recover_completion(const fatal_exit &failure);
    bool recover_missing_class(const fatal_exit &failure, int kind);
    void begin_stray_run(int kind, bool misplaced);
    void give_up_map();
    void unknown_header(const attr_text &text, const fatal_exit &failure);
    bool take_joined_header(std::string_view name, finding &error);
    std::string_view bare_header(finding &found, std::string_view name);
    void column_1_attribute(finding &error, std::string_view text);
    void lose_stanza();

    /* Attributes that have been taken (note_attribute.cpp). */
    void note_given();
    void note_mapping_or_variable_class(bool first);
    void note_value();
    void note_data_type();
    void declare_name();
    void declare_id();
    void note_refused(const std::optional<int> &attr_type);
    void take_quietly(std::string_view text, size_t added);

    /* Attribute lines (recover_attribute.cpp). */
    void recover_attribute(const fatal_exit &failure);
    void settle_split();
    language::guess header_meant(const fatal_exit &failure) const;
    void indented_header(const language::guess &meant, const fatal_exit &failure);
    void lose_first_header(const fatal_exit &failure);
    std::string_view name_given() const;
    const table_attrs *attr_meant() const;
    std::optional<int> type_meant() const;
    void settle_order();
    bool follows(const fatal_exit &failure);
    bool is_foreign_value(const fatal_exit &failure) const;
    bool is_foreign_property(const fatal_exit &failure) const;
    bool is_misplaced(const fatal_exit &failure);
    bool is_other_index() const;
    void recover_index(bool follows);
    void recover_value(const fatal_exit &failure, bool follows);
    void report_type_here();

    bool recover_end(const fatal_exit &failure);

    compilation &compiler;
    current_line &line;
    knowledge &known;
    findings &found;
    const view &see;
    const watchers &warned;

    size_t errors_before_header = 0; /* reported when the current header was met */
    bool header_reported = false;    /* as standing in a wrong place */
    int error_line = 0;              /* of the latest error */
    bool strip_returns = false;
    early_lines early;       /* of the current stanza */
    bool index_lost = false; /* the next index of the run is not known */
    int other_index = -1;    /* after a wrong index: another one that may be right as well; -1: none */
    int awaited_index = -1;  /* after a wrong index: the one that was expected instead, which may follow; -1: none */
};

/* note_given() and note_value() are inline because they are called for nearly every line. They leave to other functions
 * what few lines need. */
inline void recovery::note_given() {
    const attr_place &latest = compiler.latest();
    if (latest.attr == nullptr)
        return;
    stanza_record &stanza = known.stanza();
    int &given = stanza.given[static_cast<size_t>(latest.attr - table_of(known.kind).sc_attrs.data())];
    bool first = given == 0;
    if (first) {
        given = line.number;
        stanza.suspect = false;
    }
    if (known.kind == SC_CLASS_TO_MANAGER_MAPPING || known.kind == SC_RESOURCE_VARIABLE_CLASS)
        note_mapping_or_variable_class(first);
    if (latest.attr->ta_type == AT_SD_INDEX)
        index_lost = false;
}

inline void recovery::note_value() {
    switch (see.attr().ta_type) {
    case AT_STRING:
    case AT_SD_NAME:
        if (known.declared.keeps_names)
            declare_name();
        return;
    case AT_ID:
        if (known.declared.keeps_ids)
            declare_id();
        return;
    case AT_DATA_TYPE:
    case AT_SD_DATA_TYPE:
        return note_data_type();
    default:
        return;
    }
}

} // namespace check

#endif
