/**
 * @file
 * The reader: reads a class definition database without trusting it. C++20, namespace cdb; link with the library
 * cdb_view.
 *
 * A view refers to bytes that somebody else keeps, such as those of read_file() or of a mapping. It copies only single
 * records, allocates nothing, and reads either byte order from any alignment. Whatever the bytes are, no view reads
 * outside of them: a reference that leads nowhere reads as zeros, an empty text or an empty list. verify() says, once,
 * whether a database is sound; after that, what the views show can be relied on.
 *
 * docs/reader.md has a whole program, docs/format.md describes the file byte by byte.
 */
#ifndef CDGEN_CDB_VIEW_H
#define CDGEN_CDB_VIEW_H

#if __cplusplus < 202002L
#error "cdb_view.h needs C++20"
#else

#include "cdb_sections.h"

#include <bit>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <iterator>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <system_error>
#include <vector>

/** The reader of class definition databases, and the tables of their fields. Begin with database and verify(). */
namespace cdb {

/* ---- The database ---------------------------------------------------------------------------------------------- */

template <class View> class sections_of;

/**
 * A class definition database in memory. It refers to bytes that somebody else keeps: they must stay, unchanged, as
 * long as the database or anything that came from it is used. Views, lists, values and texts refer to the bytes
 * themselves, not to this object, which may go away earlier. All members may be called from several threads at once.
 */
class database {
public:
    /** A database without bytes. It has no sections and is not recognised(). */
    database() = default;
    /**
     * The database in these bytes, a whole file, of any alignment. It takes constant time and checks nothing; verify()
     * does.
     */
    explicit database(std::span<const std::byte> file);
    /**
     * Does not compile, because the bytes of `database(read_file(...))` would be gone at once. Keep what read_file()
     * returns.
     */
    explicit database(const std::vector<std::byte> &&) = delete;

    /**
     * True if the format word is that of a database, in either byte order. If not, the byte order of this machine is
     * assumed.
     */
    bool recognised() const {
        return known;
    }
    /** The byte order of the file. */
    std::endian order() const {
        return all.order();
    }
    /** The whole file. */
    const bytes &file() const {
        return all;
    }
    /**
     * The header as in cdb.h, in the byte order of this machine; zeros if the file is shorter. It is valid as long as
     * this object.
     */
    const orb_cdb_header_t &header() const {
        return head;
    }
    /** The number of sections: as many as the header says, or as there are anchors in the file if these are fewer. */
    std::size_t section_count() const {
        return count_inside(all, sizeof head, head.cdb_hdr_dsect_count, sizeof(cdb_dsect_anchor_t));
    }
    /** The anchor of a section, in the byte order of this machine. `index` must be less than section_count(). */
    cdb_dsect_anchor_t anchor(std::size_t index) const {
        return all.record<cdb_dsect_anchor_t>(sizeof head + std::uint64_t{index} * sizeof(cdb_dsect_anchor_t));
    }
    /**
     * The bytes of a section. Shorter than its anchor says, or empty, if they are not all inside the file. `index` must
     * be less than section_count().
     */
    bytes section(std::size_t index) const {
        cdb_dsect_anchor_t where = anchor(index);
        return all.part(where.cda_offset, where.cda_length);
    }

    /** The class sections. The compiler writes one for each class. */
    sections_of<resource_class> classes() const;
    /** The manager sections. The compiler writes one. */
    sections_of<manager> managers() const;
    /** The class-to-manager map sections. The compiler writes one. */
    sections_of<class_map> maps() const;
    /** The variable class sections, perhaps none. */
    sections_of<variable_class> variable_classes() const;

private:
    bytes all;
    bool known = false;
    orb_cdb_header_t head = {};
};

/** The sections of one type, in the order of the file. It has no size(): walk it. */
template <class View> class sections_of {
public:
    /** Walks the sections, and makes a view of each when it is asked for. */
    class iterator {
    public:
        /** What it makes. */
        using value_type = View;
        /** As the standard asks. */
        using difference_type = std::ptrdiff_t;
        /** Views are made, so references to them do not last. */
        using iterator_category = std::input_iterator_tag;
        /** It may be copied, and the sections walked several times. */
        using iterator_concept = std::forward_iterator_tag;

        /** An iterator of no database; it may only be assigned to. */
        iterator() = default;
        /** At the first section of the type from an index of the anchors on. */
        iterator(const database &walked, std::size_t start) : db(walked), index(start) {
            skip();
        }
        /** Makes the view. The iterator must not be at the end. */
        View operator*() const {
            return View(db.section(index));
        }
        /** Moves to the next section of the type. */
        iterator &operator++() {
            ++index;
            skip();
            return *this;
        }
        /** Moves to the next section of the type and returns where it was. */
        iterator operator++(int) {
            iterator before = *this;
            ++*this;
            return before;
        }
        /** True at the same section. Only iterators of the same database may be compared. */
        bool operator==(const iterator &other) const {
            return index == other.index;
        }

    private:
        void skip() {
            while (index < db.section_count() && db.anchor(index).cda_type != View::TYPE)
                ++index;
        }

        database db;
        std::size_t index = 0;
    };

    /** The sections of a database, of which it keeps a copy; the bytes are not copied. */
    explicit sections_of(const database &of) : db(of) {}

    /** The first section of the type. */
    iterator begin() const {
        return {db, 0};
    }
    /** After the last section. */
    iterator end() const {
        return {db, db.section_count()};
    }

private:
    database db;
};

inline sections_of<resource_class> database::classes() const {
    return sections_of<resource_class>(*this);
}
inline sections_of<manager> database::managers() const {
    return sections_of<manager>(*this);
}
inline sections_of<class_map> database::maps() const {
    return sections_of<class_map>(*this);
}
inline sections_of<variable_class> database::variable_classes() const {
    return sections_of<variable_class>(*this);
}

/**
 * Reads a whole file. `path` is a file name, or anything that can be opened and read to its end. On failure `error` is
 * set and nothing is returned; otherwise `error` is cleared. May throw std::bad_alloc.
 */
std::vector<std::byte> read_file(const char *path, std::error_code &error);

/* ---- Soundness ------------------------------------------------------------------------------------------------- */

/**
 * How bad a finding is. An error would make reading unsafe, endless or ambiguous. A warning is about something that the
 * compiler itself can make of a careless source.
 */
enum class severity : std::uint8_t { warning, error };

/** Something that verify() checks. docs/reader.md lists the rules. */
struct rule {
    /** Permanent, such as `CDB104`. */
    std::string_view code;
    /** Of all findings of the rule. */
    severity level;
    /** What is wrong, such as `wrong checksum`. */
    std::string_view title;
    /** How it comes about: sentences. */
    std::string_view cause = {};
    /** What to do about it: sentences. */
    std::string_view cure = {};
};

/** Code of the rule about the checksum. A file that breaks only this rule and CODE_RESERVED can still be read. */
inline constexpr std::string_view CODE_CHECKSUM = "CDB104";
/** Code of the rule about reserved bytes and padding. See CODE_CHECKSUM. */
inline constexpr std::string_view CODE_RESERVED = "CDB106";

/** Code of the rule about valid values that belong to another attribute. */
inline constexpr std::string_view CODE_CUT_SHORT = "CDB353";
/** Code of the rule about bounds that belong to another attribute. */
inline constexpr std::string_view CODE_RANGE_ASTRAY = "CDB452";

/** A place where a rule is broken. It does not refer to the bytes of the database. */
struct finding {
    /** The rule; never null, never freed. */
    const rule *broken;
    /** The section's position among the anchors; nothing if the finding is about the file as a whole. */
    std::optional<std::size_t> section;
    /** The record's type, as in cdb.h; may be empty. */
    std::string_view record;
    /**
     * Position of the record in its table, or of the entry in its list. Of a list itself, its offset in bytes in its
     * table.
     */
    std::size_t index;
    /** The record's field, as in cdb.h; may be empty. */
    std::string_view field;
    /** Where in the file, in bytes. */
    std::size_t offset;
    /** What is there, for people to read. */
    std::string found;
    /** What should be there, for people to read. */
    std::string expected;
};

/** What a stretch of the file is. It does not refer to the bytes of the database. */
struct region {
    /** Where it begins in the file, in bytes. */
    std::size_t offset;
    /** How long it is, in bytes. */
    std::size_t size;
    /** The section's position among the anchors; nothing outside of all sections. */
    std::optional<std::size_t> section;
    /**
     * The record's type as in cdb.h, or `text`, `length`, `binary`, `handle`, `vx_value_t`, `var_id_t`, `filling` or
     * `unreached`.
     */
    std::string_view record;
    /** Position of the record in its table, or of the entry in its list. */
    std::size_t index;
    /** The record's field; null for what is not part of a record. Never freed. */
    const struct field *what;
};

/**
 * Checks the whole file once. Returns what it finds, in the order length, format, checksum, record sizes, reserved
 * bytes, anchors, sections; an empty list for a flawless file. Takes time in proportion to the file, and memory of half
 * of its size besides the findings. May throw std::bad_alloc.
 */
std::vector<finding> verify(const database &db);

/**
 * The same, but hands over each finding as soon as it is made, so that they need not be in memory together: a damaged
 * file may have many.
 */
void verify(const database &db, const std::function<void(finding &&)> &take);

/**
 * True if there are no errors among the findings. There may be warnings. What the views show of a sound file can be
 * relied on.
 */
bool is_sound(std::span<const finding> findings);

/** All rules, in the order of their codes. Never freed. */
std::span<const rule> rules();

/**
 * Says of every byte of the file what it is: the regions cover the file without gap or overlap, in its order. What no
 * reference reaches is `unreached`. Nothing is required of the file. Takes somewhat longer than verify(). May throw
 * std::bad_alloc.
 */
std::vector<region> regions(const database &db);

/** The same, but hands over each region as soon as those before it are known. */
void regions(const database &db, const std::function<void(const region &)> &take);

} // namespace cdb

#endif
#endif
