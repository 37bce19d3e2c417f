/* walk.h: the one walk over a database that verification and the map of its regions share. It visits whatever the
 * header leads to once, says which rules are broken, and, if asked to, what each stretch of the file is. */
#ifndef CDGEN_CDB_WALK_H
#define CDGEN_CDB_WALK_H

#include "cdb_view.h"

namespace cdb {

/* The rules, by their position in rules(). */
enum class check : std::size_t {
    FILE_SHORT,
    FILE_LENGTH,
    FORMAT,
    CHECKSUM,
    RECORD_SIZE,
    RESERVED,
    LARGEST_ID,
    ANCHORS_OUTSIDE,
    SECTION_OUTSIDE,
    SECTION_PLACE,
    SECTION_TYPE,
    SECTION_UNUSED,
    SECTION_LENGTH,
    SECTION_ORDER,
    RECORD_ID,
    TABLE_PLACE,
    TABLE_OUTSIDE,
    REFERENCE_NONE,
    REFERENCE_OUTSIDE,
    REFERENCE_UNALIGNED,
    LIST_OUTSIDE,
    LIST_SHARED,
    TEXT_OUTSIDE,
    DATA_TYPE,
    VARIABLE_TYPE,
    VARIABLE_ID,
    UNKNOWN_TYPE,
    TEXT_MISSING,
    CUT_SHORT,
    SD_MISSING,
    LIST_UNREACHED,
    VALUE_OUTSIDE,
    VALUE_UNALIGNED,
    VALUE_SHARED,
    VALUE_NESTING,
    VALUE_TYPE,
    VALUE_MISSING,
    RANGE_ASTRAY,
    SD_DIFFERS,
    COUNT
};

const rule &rule_of(check broken);

/* The field at an offset that is one's. */
constexpr const field *field_at(std::span<const field> fields, std::size_t offset) {
    auto found = std::find_if(fields.begin(), fields.end(), [offset](const field &f) { return f.offset == offset; });
    return found == fields.end() ? nullptr : &*found;
}

/* Those of a record's fields for which a condition holds, picked out while compiling. */
template <class Record, auto Condition> struct picked_fields {
    static constexpr std::size_t count =
        static_cast<std::size_t>(std::count_if(fields_of<Record>.begin(), fields_of<Record>.end(), Condition));
    static constexpr std::array<field, count> fields = [] {
        std::array<field, count> picked = {};
        std::copy_if(fields_of<Record>.begin(), fields_of<Record>.end(), picked.begin(), Condition);
        return picked;
    }();
};

template <class Record>
inline constexpr std::span<const field> reserved_fields_of =
    picked_fields<Record, [](const field &f) { return f.kind == field_kind::reserved; }>::fields;

/* Those that lead to a text, a list or a value. */
template <class Record>
inline constexpr std::span<const field> leading_fields_of = picked_fields<Record, [](const field &f) {
    return f.kind == field_kind::value ||
           (f.kind == field_kind::reference && f.to != target::none && f.to != target::section);
}>::fields;

/* Where the walk is, for findings and regions. */
struct spot {
    std::optional<std::size_t> section;
    std::string_view record = {};
    std::size_t index = 0;
    std::size_t offset = 0; /* of the record, in the file */
};

inline bool all_zero(std::span<const std::byte> stretch) {
    std::uint64_t word = 0;
    for (; stretch.size() >= sizeof word && word == 0; stretch = stretch.subspan(sizeof word))
        std::memcpy(&word, stretch.data(), sizeof word);
    return word == 0 && std::all_of(stretch.begin(), stretch.end(), [](std::byte b) { return b == std::byte{0}; });
}

/* A stretch in which things stand that references lead to: each belongs to one owner. */
class extent {
public:
    static constexpr std::size_t UNIT = 8; /* every thing begins at a multiple of it */

    enum class claim_result { FIRST, AGAIN, OVERLAPS };

    extent(const bytes &covered, std::size_t file_offset);

    /* Claims length bytes, all inside the area, from a multiple of UNIT on. AGAIN: they are claimed from the same place
     * on already. Takes time in proportion to what it newly claims. */
    claim_result claim(std::size_t at, std::size_t length);

    /* What was claimed of a text; whole: its zero byte is part of it. Else it ran into something else, or to its limit.
     */
    struct text_claim {
        std::size_t size;
        bool whole;
    };
    /* Claims a text that ends before the place end. at is a multiple of UNIT. Takes time in proportion to what it
     * claims.
     */
    text_claim claim_text(std::size_t at, std::size_t end);

    /* at < area.size() */
    bool is_taken(std::size_t at) const {
        return (marks[at / UNIT] & TAKEN) != 0;
    }

    /* Texts that are known to begin at a place, a multiple of UNIT, and are not claimed yet. */
    void note_text(std::size_t at) {
        marks[at / UNIT] |= TEXT;
    }
    bool is_text(std::size_t at) const {
        return (marks[at / UNIT] & TEXT) != 0;
    }
    /* Where the first of them begins from at on; the size of the area if there is none. */
    std::size_t next_text(std::size_t at) const;

    static constexpr std::size_t units(std::size_t size) {
        return (size + UNIT - 1) / UNIT;
    }

    bytes area;
    std::size_t offset;                /* of the area in the file */
    bool first_text_asked_for = false; /* by a reference that may as well mean that there is none */
    std::size_t texts_end;             /* behind the last zero byte: a text that begins before it ends */

private:
    static constexpr std::uint8_t TAKEN = 1;  /* something has claimed the unit, */
    static constexpr std::uint8_t BEGINS = 2; /* and begins there */
    static constexpr std::uint8_t TEXT = 4;   /* a text has been noted there */

    std::vector<std::uint8_t> marks; /* by unit */
};

class walker {
public:
    walker(const database &walked, std::vector<finding> &to, std::vector<region> *map)
        : db(walked), findings(to), regions(map) {}

    void walk();

    /* -- saying what was seen -- */

    void report(check broken, const spot &at, std::string_view field, std::size_t offset, std::string found,
                std::string expected);
    /* Numbers, in decimal. */
    void report(check broken, const spot &at, std::string_view field, std::size_t offset, std::uint64_t found,
                std::uint64_t expected);
    void add_region(const spot &at, std::size_t offset, std::size_t size, std::string_view name,
                    const field *what = nullptr) {
        if (regions != nullptr && size > 0)
            regions->push_back({offset, size, at.section, name, at.index, what});
    }

    /* -- records of any kind -- */

    /* The regions of a record's fields, and whether its reserved ones are zero. Lists' entries are not part of it. */
    template <class Record> void visit(const spot &at, const bytes &area, std::size_t offset) {
        for (const field &f : reserved_fields_of<Record>)
            expect_zero(at, f.name, area, offset + f.offset, std::size_t{f.width} * f.count, at.offset + f.offset);
        if (regions != nullptr)
            add_regions(at, area, offset, fields_of<Record>);
    }
    void expect_id(const spot &at, std::string_view field, vx_uint32_t found, vx_uint32_t expected) {
        if (found != expected)
            report_id(at, field, found, expected);
    }
    /* Reports the first of the bytes that is not zero, if there is one. file_offset: of the bytes. */
    void expect_zero(const spot &at, std::string_view field, const bytes &area, std::size_t offset, std::size_t length,
                     std::size_t file_offset) {
        if (auto stretch = area.part(offset, length).raw(); !all_zero(stretch))
            report_reserved(at, field, stretch, file_offset);
    }

    /* The text that a record's reference leads to. */
    void visit_text(const spot &at, const field &ref, std::uint32_t offset, extent &strings);
    /* A text at offset, which is inside of the strings and a multiple of extent::UNIT. */
    void note_text(const spot &at, extent &strings, std::size_t offset);
    /* Regions of texts and their filling, once all texts are known. */
    void finish_texts(const spot &at, extent &strings);

    /* A dynamic attribute that the variable classes behind its class may refer to. */
    void note_dynamic_id(std::int32_t id, bool of_class);

    const database &db;

    /* While set, what would be an error is this warning: the compiler can make it of a careless source. */
    std::optional<check> excuse;

    /* While set, a name that is 0 may mean that there is none, as other fields may: 0 is where the first text stands.
     */
    bool may_be_unset = true;

private:
    void report_id(const spot &at, std::string_view field, vx_uint32_t found, vx_uint32_t expected);
    void report_reserved(const spot &at, std::string_view field, std::span<const std::byte> stretch,
                         std::size_t file_offset);
    void add_regions(const spot &at, const bytes &area, std::size_t offset, std::span<const field> fields);
    bool walk_header();
    void check_length();
    void check_checksum();
    void check_record_sizes();
    void check_largest_ids();
    void walk_anchors();
    void walk_anchor(std::size_t index);
    bool place_section(const spot &at, const cdb_dsect_anchor_t &anchor);
    void walk_section(const spot &anchor_at, const cdb_dsect_anchor_t &anchor);
    void walk_class_section(spot at, const bytes &section);
    void walk_manager(spot at, const bytes &section);
    void walk_map(spot at, const bytes &section);
    void walk_variable_class(spot at, const bytes &section);
    void walk_variable_ids(const spot &at, const bytes &section, std::size_t first, std::size_t count);
    void walk_class_hash(spot at, const bytes &section);
    void walk_text(const spot &in, extent &strings, std::size_t start, std::size_t end);
    void expect_rounded(const spot &at, const bytes &section, std::size_t strings_at);
    void find_last_class();

    struct section_kind;
    static const section_kind section_kinds[];

    std::vector<finding> &findings;
    std::vector<region> *regions;
    std::size_t sections_end = 0;      /* of what has been walked, in the file */
    int section_rank = 0;              /* the highest so far, in the order of types */
    std::size_t last_class = 0;        /* position of the last class among the anchors */
    std::vector<var_id_t> dynamic_ids; /* of the classes before the first variable class */
    bool dynamic_ids_sorted = false;   /* a variable class was met */
};

/* Walks one class section (walk_class.cpp). is_last: no class follows it in the file. */
void walk_class(walker &walk, const spot &at, const bytes &section, bool is_last);

} // namespace cdb

#endif
