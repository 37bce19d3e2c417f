/* session.h: one check of one source: the compilation that it drives, and what it remembers of it. */
#ifndef CDGEN_CDEF_CHECK_RECOVERY_H
#define CDGEN_CDEF_CHECK_RECOVERY_H

#include "check/check.h"

#include <algorithm>
#include <bitset>
#include <functional>
#include <initializer_list>
#include <optional>

namespace cdef::check {

constexpr size_t ATTRS_MAX = 32;           /* attributes of one kind */
constexpr vx_uint32_t ELEMENT_INDEX = 0x8; /* in an SD kind's req_mask */

/* Attributes of a stanza whose lines were refused. */
struct refused_attributes {
    bool has_any(std::initializer_list<attr_type> wanted) const {
        return std::any_of(wanted.begin(), wanted.end(), [this](attr_type type) { return types.test(type); });
    }

    std::bitset<AT_COUNT> types;
    bool unknown_name = false; /* one of them has a name that the kind does not know */
};

/* A name or a number at a place of the source. */
struct mention {
    place at;
    std::string text;
    std::string source; /* the line */
};

/* The latest stanza of a kind. */
struct stanza_note {
    place header;
    std::array<int, ATTRS_MAX> given = {}; /* line of each attribute, by its position in the kind; 0: none */
    refused_attributes refused;
    mention data_type;      /* the value of its DataType */
    bool broken = false;    /* has been reported: nothing is missed in it any more */
    bool misplaced = false; /* lines of another stanza seem to be in it */
    std::string source;     /* the header's line */
};

/* A Range that has not yet been settled with its attribute. */
struct pending_range {
    place at;
    int kind;
    std::string source; /* the line */
};

/* Texts, with the line that gave each first (lines.cpp). There may be very many. */
class first_lines {
public:
    /* The line for a text, which is 0 if it is a new one. */
    int &of(std::string_view text) {
        return of(text, tag_of(text));
    }
    /* A number, whose tag is itself: they mostly ascend, and so stay close together. */
    int &of(vx_uint32_t number) {
        return of({reinterpret_cast<const char *>(&number), sizeof number}, number);
    }
    bool has(std::string_view text) const;
    /* All texts; they stay as long as none is added. */
    name_list all() const;
    void clear();

private:
    struct entry {
        size_t begin; /* in texts; it ends where the next one begins */
        int line;
    };
    struct slot {
        unsigned tag;      /* tells the slot's place, and that most other texts need no look at their entries */
        unsigned position; /* in entries, from 1; 0 is free */
    };

    static unsigned tag_of(std::string_view text) {
        return static_cast<unsigned>(std::hash<std::string_view>()(text) >> 32);
    }
    int &of(std::string_view text, unsigned tag);
    size_t slot_of(std::string_view text, unsigned tag) const;
    void grow();
    std::string_view text_of(size_t position) const {
        size_t end = position < entries.size() ? entries[position].begin : texts.size();
        return std::string_view(texts).substr(0, end).substr(entries[position - 1].begin);
    }

    std::string texts;
    std::vector<entry> entries;
    std::vector<slot> slots;
};

struct number; /* as the C library reads it (numbers.cpp) */

/* Names and numbers of one kind. */
struct known_values {
    first_lines names;
    first_lines ids;
};

/* What the warnings need to remember. */
struct watch {
    std::array<known_values, SC_COUNT> known; /* of the current class, or run */
    std::vector<pending_range> ranges;
    std::vector<mention> variable_classes; /* named by attributes, */
    first_lines variable_class_names;      /* each once; */
    bool variable_class_unnamed = false;   /* and one that has been told to lack its name may be any of them */
    first_lines defined_variable_classes;
    std::optional<mention> locator;
    std::string sd_source;   /* the line of */
    place sd_attribute;      /* the header of the latest SD-typed attribute whose run may still come, or goes on; */
    bool sd_run = false;     /* and that it goes on */
    int piece = 0;           /* the line that filled a whole piece, if the one before did, */
    bool piece_told = false; /* and that it belongs to a line that has been told of */
    bool carriage_returns = false;
    const char *next_return = nullptr; /* in the reader's buffer, or behind what it holds; null if not known */
};

/* A member of the compilation's context, opened, and the text of the current line. */
struct session final : line_observer {
    session(const std::string &path, const warning_set &wanted_warnings, result &into);

    void run();

    void attribute_read(const attr_place &read) override;
    bool excuses_missing(int of_kind) const override;

    /* The line, and its findings (run.cpp, recover.cpp). */
    void take(const source_line &line);
    void take_header(const attr_text &text, bool guessed);
    void take_quietly(std::string_view text);
    void skip_stanza();
    void note_given();
    bool lost_index(int new_kind) const;
    std::string_view name_given() const;
    std::optional<int> type_meant() const;
    void note_refused(std::optional<int> type);
    bool misplaced(const fatal_exit &failure);
    void take_attribute(const attr_text &text);
    bool recover_header(const fatal_exit &failure, int kind);
    void recover_attribute(const fatal_exit &failure);
    bool attribute_follows(const fatal_exit &failure);
    void recover_index(bool follows);
    void recover_value(const fatal_exit &failure, bool follows);
    void tell_instead(warning_id id, int at_line);
    void open_stanza(int kind, bool broken);
    bool take_stripped(finding &found, std::string_view name);
    void unknown_header(const attr_text &text, const fatal_exit &failure);
    std::string_view header_meant(const attr_text &text, const fatal_exit &failure) const;
    void indented_header(std::string_view meant, const fatal_exit &failure);
    void lose_first_header(const attr_text &text, const fatal_exit &failure);
    void lose_header(vx_uint32_t kinds);
    bool may_be_lost(int each) const {
        return (lost_kinds >> each & 1) != 0;
    }
    void give_up_map();
    void tell_type();
    void finish_run_by_hand(int kind);
    void settle_broken(int next_kind);
    void abandon(int kind, const fatal_exit &failure);
    void drop_record(int dropped);
    void forge_class();
    void close_all();
    const mention *map_value(std::string_view attribute) const;
    bool recover_end(const fatal_exit &failure);
    bool may_follow(const fatal_exit &failure);
    bool told_otherwise(const fatal_exit &failure) const;
    attr_text again(std::string_view text);

    finding &error(const fatal_exit &failure, const place &at);
    /* With a note, if it has a text. */
    bool warn(warning_id id, const place &at, std::string text, note more = {});
    bool warn_at(warning_id id, const place &at, const std::string &source, std::string text, note more = {});

    /* Places of the current line. */
    place here(mark_kind kind, const fatal_exit *failure = nullptr) const;
    place all_of_line() const;
    place value_part(size_t offset, size_t length) const;

    /* Notes (notes.cpp). */
    void add_notes(finding &found, const fatal_exit &failure, int kind);

    /* Warnings (warn.cpp, numbers.cpp). */
    void watch_line(const source_line &line);
    void watch_returns(const source_line &line);
    void watch_header(int kind);
    void watch_stanza_end(int next_kind);
    void watch_complete();
    void watch_attribute();
    void watch_permission(std::string_view text, const place &at);
    void watch_element_type(std::string_view text, const place &at);
    void note_type(std::string_view text);
    void watch_number(std::string_view text, size_t offset, int bits);
    void watch_numbers();
    void watch_rest(const number &n, const place &at);
    void watch_unsigned(std::string_view text, size_t offset, vx_data_type_t type);
    void watch_index(std::string_view text);
    void watch_typed(std::string_view text, size_t offset);
    void watch_bounds();
    void watch_valid(std::string_view text);
    void watch_version();
    void watch_name();
    void watch_variable_class(std::string_view text, const place &at);
    void watch_id(std::string_view text);
    void watch_first(warning_id id, int &first, const place &at, const char *what);
    std::string_view value_text() const;
    void watch_range();
    void watch_quotes();
    void ranges_settled(bool resource_was_open, bool class_was_open, int kind);
    void watch_variable_classes();
    void watch_end();

    const warning_set &wanted;
    result &out;
    stepwise_compiler compiler;
    attr_place latest; /* of the latest attribute line */

    std::string raw;                      /* the line as it was */
    attr_text line = {};                  /* in the reader's buffer, or in copy */
    std::array<char, 512> copy;           /* of a line that is taken again */
    int kind = -1;                        /* of the current stanza; -1 when there is none, or it is skipped */
    int sd_kind = SC_PATTR_SD_DEFINITION; /* of the latest run */
    bool class_forged = false;            /* the class has no stanza */
    int overflow_line = 0;                /* of the latest number that left its mark on later ones */
    bool overflow_told = false;           /* by the note of an error */
    std::vector<mention> odd_elements;    /* DataType lines of the run that its default may fail for; */
    bool types_told = false;              /* and there were others, which have been told of */
    bool skipping = false;                /* nothing of the current stanza can be made sense of */
    vx_uint32_t lost_kinds = 0;           /* bits of what stanzas without a header may have been */
    bool owner_lost = false;              /* one of them may have been the action that a run belongs to */
    bool strip_returns = false;           /* the file has been found to have them everywhere */
    bool index_lost = false;              /* the run's indexes have been found wrong */
    int index_missing = 0;                /* header of the run's latest element that has been told to lack one */
    int other_index = -1;                 /* an index that may be right as well, once one was wrong */
    size_t header_errors = 0;             /* when the current header was met */
    bool header_told = false;             /* it has been told that it stands in a wrong place */
    bool splits_stanza = false;           /* the stanza in front of it is incomplete */
    int error_line = 0;                   /* of the latest error */
    bool rest_of_line = false;            /* the current line goes on with the one before */
    int map_line = 0;
    std::vector<mention> map_values; /* by the names of their attributes */
    std::array<stanza_note, SC_COUNT> stanzas;
    watch seen;
};

constexpr size_t index_of(int kind) {
    return static_cast<size_t>(kind);
}

inline bool is_sd_kind(int kind) {
    return sc_tables[index_of(kind)].sc_sd_owner != nullptr;
}

inline bool is_numeric(vx_data_type_t type) {
    vx_data_type_t scalar = scalar_vx(type);
    return scalar >= VX_INT32 && scalar <= VX_FLOAT64;
}

} // namespace cdef::check

#endif
