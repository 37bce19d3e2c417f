/**
 * @file
 * The reader: reads a class definition database without trusting it. C++20, namespace cdb; link with the library
 * cdb_view.
 *
 * A view refers to bytes that the caller keeps, such as those of read_file() or of a mapping. It copies only single
 * records, allocates nothing, and reads either byte order from any alignment. Whatever the bytes are, no view reads
 * outside of them: a reference that leads nowhere reads as zeros, an empty text or an empty list. verify() says, once,
 * whether a database is sound; after that, everything that the views show is reliable.
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
 * A class definition database in memory. It refers to bytes that the caller keeps. They must stay unchanged as long as
 * the database or anything that came from it is used. Views, lists, values and texts refer to the bytes themselves, not
 * to this object, which may be destroyed earlier. All members may be called from several threads at once.
 */
class database {
public:
    /** A database without bytes. It has no sections and is not recognised(). */
    database() = default;
    /**
     * The database in these bytes, which are a whole file and need no alignment. Takes constant time and checks
     * nothing; verify() does.
     */
    explicit database(std::span<const std::byte> file);
    /**
     * Does not compile, because the bytes of `database(read_file(...))` would be freed at once. Keep the result of
     * read_file() in a variable.
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
    /** The number of sections: the number in the header, or the number of anchors in the file if that is smaller. */
    std::size_t section_count() const {
        return count_inside(all, sizeof head, head.cdb_hdr_dsect_count, sizeof(cdb_dsect_anchor_t));
    }
    /** The anchor of a section, in the byte order of this machine. `index` must be less than section_count(). */
    cdb_dsect_anchor_t anchor(std::size_t index) const {
        return all.record<cdb_dsect_anchor_t>(sizeof head + std::uint64_t{index} * sizeof(cdb_dsect_anchor_t));
    }
    /**
     * The bytes of a section. They are fewer than its anchor says, or none, if some are outside of the file. `index`
     * must be less than section_count().
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
    /** The variable class sections. There may be none. */
    sections_of<variable_class> variable_classes() const;

private:
    bytes all;
    bool known = false;
    orb_cdb_header_t head = {};
};

/** The sections of one type, in the order of the file. It has no size(): walk it. */
template <class View> class sections_of {
public:
    /** Walks the sections, and makes the view of each only when it is dereferenced. */
    class iterator {
    public:
        /** The type of the views. */
        using value_type = View;
        /** Required by the standard. */
        using difference_type = std::ptrdiff_t;
        /** Only an input iterator for C++17 algorithms, because views are temporary. */
        using iterator_category = std::input_iterator_tag;
        /** A forward iterator for C++20: the sections may be walked several times. */
        using iterator_concept = std::forward_iterator_tag;

        /** An iterator without a database; it may only be assigned to. */
        iterator() = default;
        /** An iterator at the first section of the type whose anchor's index is at least `start`. */
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

    /** The sections of a database. The object keeps a copy of `of`, but not of the bytes. */
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
 * Reads a whole file. `path` may name anything that can be opened and read to its end. On failure `error` is set and no
 * bytes are returned; otherwise `error` is cleared. May throw std::bad_alloc.
 */
std::vector<std::byte> read_file(const char *path, std::error_code &error);

/* ---- Soundness ------------------------------------------------------------------------------------------------- */

/**
 * How bad a finding is. An error would make reading unsafe, endless or ambiguous. A warning is about something that
 * does not; all but CDB205 are about what the compiler itself can make from a careless source.
 */
enum class severity : std::uint8_t { warning, error };

/** Something that verify() checks. docs/reader.md lists the rules. */
struct rule {
    /** The code, such as `CDB104`, which never changes. */
    std::string_view code;
    /** The severity of all findings of the rule. */
    severity level;
    /** What is wrong, such as `wrong checksum`. */
    std::string_view title;
    /** How it comes about, in whole sentences. */
    std::string_view cause = {};
    /** What to do about it, in whole sentences. */
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
    /** The section's position among the anchors; no value if the finding is about the file as a whole. */
    std::optional<std::size_t> section;
    /** The record's type, as in cdb.h; may be empty. */
    std::string_view record;
    /**
     * Position of the record in its table, or of the entry in its list. For a list itself, its offset in its table, in
     * bytes.
     */
    std::size_t index;
    /** The record's field, as in cdb.h; may be empty. */
    std::string_view field;
    /** The offset in the file, in bytes. */
    std::size_t offset;
    /** What the file contains there, as text for people. */
    std::string found;
    /** What the file should contain there, as text for people. */
    std::string expected;
};

/** The meaning of some consecutive bytes of the file. It does not refer to the bytes of the database. */
struct region {
    /** Where it begins in the file, in bytes. */
    std::size_t offset;
    /** How long it is, in bytes. */
    std::size_t size;
    /** The section's position among the anchors; no value outside of all sections. */
    std::optional<std::size_t> section;
    /**
     * The record's type as in cdb.h, or `text`, `length`, `binary`, `handle`, `vx_value_t`, `var_id_t`, `filling` or
     * `unreached`.
     */
    std::string_view record;
    /** Position of the record in its table, or of the entry in its list. */
    std::size_t index;
    /** The record's field; null if the region is not part of a record. Never freed. */
    const struct field *what;
};

/**
 * Checks the whole file once. Returns the findings, in the order length, format, checksum, record sizes, reserved
 * bytes, anchors, sections; an empty list if nothing is wrong. Takes time proportional to the file's size, and memory
 * of half of that size besides the findings. May throw std::bad_alloc.
 */
std::vector<finding> verify(const database &db);

/**
 * The same, but passes each finding to `take` as soon as it is found. The findings of a damaged file may be too many to
 * keep in memory.
 */
void verify(const database &db, const std::function<void(finding &&)> &take);

/**
 * True if there are no errors among the findings. There may be warnings. What the views show of a sound file is
 * reliable.
 */
bool is_sound(std::span<const finding> findings);

/** All rules, in the order of their codes. Never freed. */
std::span<const rule> rules();

/**
 * Returns the meaning of every byte of the file. The regions cover the file without gap or overlap, in its order. Bytes
 * that no reference reaches are `unreached`. The file may be anything. Takes somewhat longer than verify(). May throw
 * std::bad_alloc.
 */
std::vector<region> regions(const database &db);

/** The same, but passes each region to `take` as soon as those before it are known. */
void regions(const database &db, const std::function<void(const region &)> &take);

} // namespace cdb

#endif
#endif
