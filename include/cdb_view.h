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

#include "cdb_fields.h"

#include <algorithm>
#include <array>
#include <bit>
#include <compare>
#include <cstddef>
#include <cstdint>
#include <cstring>
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

/* ---- Data types ------------------------------------------------------------------------------------------------ */

/** Values inside values are followed to this depth, and no further. The compiler writes at most 4. */
inline constexpr unsigned NESTING_MAX = 64;

/** True if the number is one of the 23 data types, 0 to 22. A file may hold any number. */
constexpr bool is_data_type(vx_data_type_t type) {
    return type <= VX_SD_PTR_ARRAY;
}

/** True for the ten array types. */
constexpr bool is_array(vx_data_type_t type) {
    return type >= VX_INT32_ARRAY && type <= VX_SD_PTR_ARRAY;
}

/** The type of an array's elements. Any other type is returned as it is. */
constexpr vx_data_type_t element_type(vx_data_type_t type) {
    return is_array(type) ? static_cast<vx_data_type_t>(type - VX_INT32_ARRAY + VX_INT32) : type;
}

/**
 * True if values of the type are stored in the strings of the class, so that the cell holds their offset. False for
 * structured byte strings, which are stored there too but cannot be read.
 */
constexpr bool is_out_of_line(vx_data_type_t type) {
    return (type >= VX_CHAR_PTR && type <= VX_SD_PTR) || is_array(type);
}

/**
 * The name of a data type as a source spells it, such as `UInt32`. Returns an empty text if the number is not a data
 * type. The text is never freed.
 */
std::string_view name_of(vx_data_type_t type);

/* ---- Bytes ----------------------------------------------------------------------------------------------------- */

/**
 * A stretch of a database, and the byte order of its file. It refers to bytes that somebody else keeps. Whatever lies
 * outside of it reads as zero.
 */
class bytes {
public:
    /** No bytes, in the byte order of this machine. */
    bytes() = default;
    /** Refers to `stretch`, which must live as long as this object and everything made from it. */
    bytes(std::span<const std::byte> stretch, std::endian order) : all(stretch), file_order(order) {}

    /** The number of bytes. */
    std::size_t size() const {
        return all.size();
    }
    /** The byte order of the file. */
    std::endian order() const {
        return file_order;
    }
    /** The bytes as they are in the file. */
    std::span<const std::byte> raw() const {
        return all;
    }
    /**
     * True if `length` bytes from `offset` on lie inside. Both are in bytes; neither can overflow. Offsets and lengths
     * have 64 bits on every machine, because sums of two numbers of a file do not fit into 32.
     */
    bool holds(std::uint64_t offset, std::uint64_t length) const {
        return offset <= all.size() && length <= all.size() - offset;
    }

    /**
     * A number or an enumeration of the file at `offset`, in the byte order of this machine. Returns 0 if it is not
     * wholly inside. The offset needs no alignment.
     */
    template <class Number> Number number(std::uint64_t offset) const {
        std::array<std::byte, sizeof(Number)> raw_number = {};
        if (holds(offset, sizeof(Number)))
            std::memcpy(raw_number.data(), at(offset), sizeof(Number));
        if (file_order != std::endian::native)
            std::reverse(raw_number.begin(), raw_number.end());
        return std::bit_cast<Number>(raw_number);
    }

    /**
     * A copy of the record at `offset`, with its numbers and references in the byte order of this machine. Value cells
     * are left as they are in the file; class value reads them. Returns a record of zeros if it is not wholly inside.
     * The offset needs no alignment.
     */
    template <class Record> Record record(std::uint64_t offset) const {
        Record copy = {};
        if (!holds(offset, sizeof copy))
            return copy;
        std::memcpy(&copy, at(offset), sizeof copy);
        if (file_order != std::endian::native)
            turn(reinterpret_cast<std::byte *>(&copy), fields_of<Record>);
        return copy;
    }

    /**
     * The part from `offset` on, at most `length` bytes long. Shorter if fewer bytes follow, and empty if the offset
     * lies outside.
     */
    bytes part(std::uint64_t offset, std::uint64_t length = UINT64_MAX) const {
        if (offset > all.size())
            return {{}, file_order};
        auto room = static_cast<std::size_t>(std::min(length, all.size() - offset));
        return {all.subspan(static_cast<std::size_t>(offset), room), file_order};
    }

    /**
     * The text from `offset` to its zero byte, which is not included. If there is none, the text ends with the stretch.
     * Empty if the offset lies outside. It refers to the database's bytes.
     */
    std::string_view text(std::uint64_t offset) const {
        if (offset >= all.size())
            return {};
        const char *start = reinterpret_cast<const char *>(at(offset));
        auto room = static_cast<std::size_t>(all.size() - offset);
        const void *zero = std::memchr(start, 0, room);
        return {start, zero == nullptr ? room : static_cast<std::size_t>(static_cast<const char *>(zero) - start)};
    }

    /** The text that a reference leads to, as for an offset. Empty if the reference is none. */
    std::string_view text(const cdb_ref_t &ref) const {
        return ref.offset[0] == CDB_NONE ? std::string_view() : text(std::uint64_t{ref.offset[0]});
    }

private:
    /* offset: at most size(). */
    const std::byte *at(std::uint64_t offset) const {
        return all.data() + static_cast<std::size_t>(offset);
    }

    static void turn(std::byte *record, std::span<const field> fields) {
        for (const field &f : fields) {
            std::size_t width = f.kind == field_kind::reference ? sizeof(vx_uint32_t) : f.width;
            bool turned = !f.stays && (f.kind == field_kind::reference || f.kind == field_kind::number);
            for (std::size_t i = 0; turned && i < f.count; ++i)
                std::reverse(record + f.offset + i * f.width, record + f.offset + i * f.width + width);
        }
    }

    std::span<const std::byte> all;
    std::endian file_order = std::endian::native;
};

/* ---- Lists ----------------------------------------------------------------------------------------------------- */

/**
 * The iterator of a list that has size() and operator[]. It makes each item when it is asked for: take items by value
 * or by `const auto &`.
 */
template <class List, class Item> class list_iterator {
public:
    /** What it makes. */
    using value_type = Item;
    /** As the standard asks. */
    using difference_type = std::ptrdiff_t;
    /** Items are made, so references to them do not last. */
    using iterator_category = std::input_iterator_tag;
    /** It may be copied, and the list walked several times. */
    using iterator_concept = std::forward_iterator_tag;

    /** An iterator of no list; it may only be assigned to. */
    list_iterator() = default;
    /** At an index of a list, of which it keeps a copy. */
    list_iterator(const List &walked, std::size_t start) : list(walked), index(start) {}
    /** Makes the item. The iterator must not be at the end. */
    Item operator*() const {
        return list[index];
    }
    /** Moves to the next item. */
    list_iterator &operator++() {
        ++index;
        return *this;
    }
    /** Moves to the next item and returns where it was. */
    list_iterator operator++(int) {
        list_iterator before = *this;
        ++index;
        return before;
    }
    /** True at the same index. Only iterators of the same list may be compared. */
    bool operator==(const list_iterator &other) const {
        return index == other.index;
    }

private:
    List list;
    std::size_t index = 0;
};

/**
 * A list of items that follow each other in the file, each `Item::SIZE` bytes long. Items are made when they are asked
 * for; the list itself is small and may be copied.
 */
template <class Item, class Context> class list_of {
public:
    /** An empty list. */
    list_of() = default;
    /** `count` items from the byte `offset` on. What the offset counts from is for the context to say. */
    list_of(const Context &of, std::uint64_t offset, std::size_t count) : context(of), first(offset), items(count) {}

    /** The number of items. */
    std::size_t size() const {
        return items;
    }
    /** True if there are none. */
    bool empty() const {
        return items == 0;
    }
    /**
     * The item at an index, which must be less than size(). The index is not checked: a larger one gives something
     * meaningless, but reads nothing outside of the database.
     */
    Item operator[](std::size_t index) const {
        return Item(context, first + std::uint64_t{index} * Item::SIZE);
    }
    /** The first item. */
    list_iterator<list_of, Item> begin() const {
        return {*this, 0};
    }
    /** After the last item. */
    list_iterator<list_of, Item> end() const {
        return {*this, items};
    }

private:
    Context context = {};
    std::uint64_t first = 0;
    std::size_t items = 0;
};

/**
 * How many of `count` items, of `size` bytes each, lie wholly inside `area` if the first begins at `offset`. `size`
 * must not be 0.
 */
inline std::size_t count_inside(const bytes &area, std::uint64_t offset, std::uint64_t count, std::size_t size) {
    return offset > area.size() ? 0 : static_cast<std::size_t>(std::min(count, (area.size() - offset) / size));
}

/**
 * The first attribute, action or element of that name, or nothing. Names are compared byte by byte. Takes time in
 * proportion to the list.
 */
template <class List> auto find(const List &list, std::string_view name) {
    using item = typename decltype(list.begin())::value_type;
    for (item i : list)
        if (i.name() == name)
            return std::optional<item>(i);
    return std::optional<item>();
}

/** The first attribute or action with that number, or nothing. Takes time in proportion to the list. */
template <class List> auto find(const List &list, std::int32_t id) {
    using item = typename decltype(list.begin())::value_type;
    for (item i : list)
        if (i.id() == id)
            return std::optional<item>(i);
    return std::optional<item>();
}

/* ---- Values ---------------------------------------------------------------------------------------------------- */

class value;

/** What the elements of an array or of structured data need to be read. */
struct value_context {
    /** The strings of the class. */
    bytes strings;
    /** The type of an array's elements; VX_UNKNOWN for structured data, whose elements name their types themselves. */
    vx_data_type_t array_element = VX_UNKNOWN;
    /** How many arrays and structures the elements are inside of. */
    unsigned nesting = 0;
};

/** The elements of an array or of structured data, in their order. */
class value_list {
public:
    /** An empty list. */
    value_list() = default;
    /** `count` elements from the byte `offset` of the strings on. */
    value_list(const value_context &of, std::uint64_t offset, std::size_t count)
        : context(of), first(offset), items(count) {}

    /** The number of items. */
    std::size_t size() const {
        return items;
    }
    /** True if there are none. */
    bool empty() const {
        return items == 0;
    }
    /**
     * The element at an index, which must be less than size(). The index is not checked: a larger one gives something
     * meaningless, but reads nothing outside of the database.
     */
    value operator[](std::size_t index) const;
    /** The first element. */
    list_iterator<value_list, value> begin() const;
    /** After the last element. */
    list_iterator<value_list, value> end() const;

private:
    value_context context;
    std::uint64_t first = 0;
    std::size_t items = 0;
};

/**
 * A value: its type, its cell of 8 bytes, and the strings that the cell may refer to. type() says which one of the
 * accessors below answers; every other accessor returns 0 or nothing.
 */
class value {
public:
    /** A value that is not present. */
    value() = default;
    /** The value whose cell is at a byte offset of an area. If the cell is not wholly inside, it reads as zeros. */
    value(const bytes &area, std::uint64_t offset, vx_data_type_t data_type, const bytes &class_strings,
          unsigned depth = 0)
        : cell_type(data_type), strings(class_strings), nesting(depth) {
        if (area.holds(offset, cell.size()))
            std::memcpy(cell.data(), area.raw().data() + static_cast<std::size_t>(offset), cell.size());
    }

    /** The type that the record, or the element, names. In an unsound file it may be any number. */
    vx_data_type_t type() const {
        return cell_type;
    }

    /**
     * Where an out-of-line value is: its offset in bytes from the start of the class's strings. Nothing for other
     * types, for none, for a cell that was never filled (0 is where the class's first name is), and for an offset
     * outside of the strings.
     */
    std::optional<std::uint32_t> place() const {
        auto offset = number<std::uint32_t>();
        if (!is_out_of_line(cell_type) || offset == CDB_NONE || offset == 0 || offset >= strings.size())
            return std::nullopt;
        return offset;
    }

    /** True if there is something to read: a number, or an out-of-line value in its place. */
    bool present() const {
        return (cell_type >= VX_INT32 && cell_type <= VX_FLOAT64) || place().has_value();
    }

    /** The number of an `Int32` or `Int64`; 0 for any other type. */
    std::int64_t integer() const {
        return cell_type == VX_INT32 ? number<std::int32_t>() : cell_type == VX_INT64 ? number<std::int64_t>() : 0;
    }
    /** The number of a `UInt32` or `UInt64`; 0 for any other type. */
    std::uint64_t natural() const {
        return cell_type == VX_UINT32 ? number<std::uint32_t>() : cell_type == VX_UINT64 ? number<std::uint64_t>() : 0;
    }
    /** The number of a `Float32` or `Float64`, which may be infinite or NaN; 0 for any other type. */
    double real() const {
        return cell_type == VX_FLOAT32   ? static_cast<double>(number<float>())
               : cell_type == VX_FLOAT64 ? number<double>()
                                         : 0.0;
    }
    /**
     * The text of a `String`, without its zero byte; empty for any other type, and if it is not present. Its encoding
     * is the source's.
     */
    std::string_view text() const {
        return cell_type == VX_CHAR_PTR && place() ? strings.text(std::uint64_t{*place()}) : std::string_view();
    }
    /**
     * The bytes of a `Binary`; empty for any other type, if it is not present, and if they do not all lie inside the
     * strings. They are a piece of their own, 8 bytes after the length.
     */
    std::span<const std::byte> binary() const {
        if (cell_type != VX_BINARY_PTR || !place())
            return {};
        std::uint64_t at = *place();
        auto length = strings.number<std::uint32_t>(at);
        return strings.holds(at + BINARY_BYTES, length) ? strings.part(at + BINARY_BYTES, length).raw()
                                                        : std::span<const std::byte>();
    }
    /**
     * The resource handle of an `RH`; zeros for any other type, and if it is not present. The compiler writes only
     * zeros.
     */
    vx_resource_handle_t handle() const {
        if (cell_type != VX_RSRC_HANDLE_PTR || !place())
            return {};
        std::uint64_t at = *place();
        auto word = [&](std::size_t i) { return strings.number<std::uint32_t>(at + i * sizeof(std::uint32_t)); };
        return {word(0), {word(1), word(2), word(3), word(4)}};
    }
    /**
     * The elements of an array, or of `SD`. Empty for any other type, if it is not present, and at a depth of more than
     * NESTING_MAX.
     */
    value_list elements() const {
        bool structured = cell_type == VX_SD_PTR;
        if ((!structured && !is_array(cell_type)) || !place() || nesting >= NESTING_MAX)
            return {};
        std::uint64_t at = *place();
        std::size_t size = structured ? sizeof(vx_structured_data_element_t) : sizeof(vx_value_t);
        std::size_t count = count_inside(strings, at + ELEMENTS, strings.number<std::uint32_t>(at), size);
        return {{strings, structured ? VX_UNKNOWN : element_type(cell_type), nesting + 1}, at + ELEMENTS, count};
    }

    /** Offset of a binary's bytes from its start, in bytes. */
    static constexpr std::size_t BINARY_BYTES = 8;
    /** Offset of the first element of an array or of structured data from its start, in bytes. */
    static constexpr std::size_t ELEMENTS = 8;
    static_assert(offsetof(vx_array_t, elements) == ELEMENTS);
    static_assert(offsetof(vx_structured_data_t, elements) == ELEMENTS);

private:
    template <class Number> Number number() const {
        return bytes(cell, strings.order()).number<Number>(0);
    }

    std::array<std::byte, sizeof(vx_value_t)> cell = {};
    vx_data_type_t cell_type = VX_UNKNOWN;
    bytes strings;
    unsigned nesting = 0;
};

inline value value_list::operator[](std::size_t index) const {
    if (context.array_element != VX_UNKNOWN)
        return {context.strings, first + std::uint64_t{index} * sizeof(vx_value_t), context.array_element,
                context.strings, context.nesting};
    std::uint64_t at = first + std::uint64_t{index} * sizeof(vx_structured_data_element_t);
    return {context.strings, at + offsetof(vx_structured_data_element_t, value),
            context.strings.number<vx_data_type_t>(at), context.strings, context.nesting};
}

inline list_iterator<value_list, value> value_list::begin() const {
    return {*this, 0};
}

inline list_iterator<value_list, value> value_list::end() const {
    return {*this, items};
}

/* ---- Inside a class -------------------------------------------------------------------------------------------- */

/** A class section, and those of its tables that others refer to. */
struct class_tables {
    /** The whole section, from the class record on. */
    bytes section;
    /** Names, texts and out-of-line values. */
    bytes strings;
    /** Lists of valid values. */
    bytes valid_vals;
    /** Lists of varieties. */
    bytes variety_lists;
    /** Definitions of structured data. */
    bytes sd_defs;
};

/** A range of varieties, both ends included. */
struct variety {
    /** Bytes that one takes in the file. */
    static constexpr std::size_t SIZE = sizeof(vl_entry_t);

    /** The entry at a byte offset of the table. */
    variety(const bytes &variety_lists, std::uint64_t at)
        : low(variety_lists.number<std::uint32_t>(at + offsetof(vl_entry_t, vl_low_val))),
          high(variety_lists.number<std::uint32_t>(at + offsetof(vl_entry_t, vl_high_val))) {}

    /** The first variety. */
    std::uint32_t low;
    /** The last variety. */
    std::uint32_t high;
};

/** The varieties of an attribute or an action. */
using variety_list = list_of<variety, bytes>;

/** What a list of valid values needs to be read. */
struct valid_value_context {
    /** The tables of the class. */
    class_tables tables;
    /** The type of the values; for an attribute of an array type its element type. */
    vx_data_type_t type = VX_UNKNOWN;
};

/**
 * A valid value, or a range of them, both ends included. Only numbers, texts and binaries have valid values, so no
 * elements are followed here.
 */
struct valid_value {
    /** Bytes that one takes in the file. */
    static constexpr std::size_t SIZE = sizeof(vv_entry_t);

    /** The entry at a byte offset of the table. */
    valid_value(const valid_value_context &of, std::uint64_t at)
        : low(of.tables.valid_vals, at + offsetof(vv_entry_t, vv_low_val), of.type, of.tables.strings, NESTING_MAX),
          high(of.tables.valid_vals, at + offsetof(vv_entry_t, vv_high_val), of.type, of.tables.strings, NESTING_MAX),
          message(of.tables.valid_vals.number<std::uint16_t>(at + offsetof(vv_entry_t, vv_disp_msgid))) {}

    /** The lowest value. */
    value low;
    /** The highest value; for a single value the same again. */
    value high;
    /** Number of the message that names the value; 0: none. */
    std::uint16_t message;
};

/** The valid values of an attribute or an element. */
using valid_value_list = list_of<valid_value, valid_value_context>;

/** The list that a reference leads to; empty if the reference is none. */
inline variety_list varieties_at(const class_tables &tables, const cdb_ref_t &ref) {
    std::uint64_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::uint64_t first = at + offsetof(variety_list_t, vl_values);
    auto count = tables.variety_lists.number<std::uint32_t>(at + offsetof(variety_list_t, vl_count));
    return {tables.variety_lists, first, count_inside(tables.variety_lists, first, count, variety::SIZE)};
}

/**
 * The list that a reference leads to; empty if the reference is none. `owner` is the data type of the attribute or
 * element that the values are valid for.
 */
inline valid_value_list valid_values_at(const class_tables &tables, const cdb_ref_t &ref, vx_data_type_t owner) {
    std::uint64_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::uint64_t first = at + offsetof(valid_values_t, vv_values);
    auto count = tables.valid_vals.number<std::uint32_t>(at + offsetof(valid_values_t, vv_count));
    return {{tables, element_type(owner)}, first, count_inside(tables.valid_vals, first, count, valid_value::SIZE)};
}

/** An element of a definition of structured data. */
class sd_element {
public:
    /** Bytes that one takes in the file. */
    static constexpr std::size_t SIZE = sizeof(sd_field_t);

    /** The element at a byte offset of the table. */
    sd_element(const class_tables &of, std::uint64_t at) : tables(of), fields(of.sd_defs.record<sd_field_t>(at)) {}

    /** The element's record as in cdb.h, in the byte order of this machine. It is valid as long as this object. */
    const sd_field_t &record() const {
        return fields;
    }
    /** The element's name. */
    std::string_view name() const {
        return tables.strings.text(fields.u_sd_field_name);
    }
    /** The type of the element. In an unsound file it may be any number. */
    vx_data_type_t type() const {
        return fields.sd_field_type;
    }
    /** The valid values; empty if none are defined. */
    valid_value_list valid_values() const {
        return valid_values_at(tables, fields.u_sd_valid_vals, fields.sd_field_type);
    }

private:
    class_tables tables;
    sd_field_t fields;
};

/** A definition of structured data: its elements, in their order. */
using sd_definition = list_of<sd_element, class_tables>;

/** The definition that a reference leads to; empty if the reference is none. */
inline sd_definition sd_definition_at(const class_tables &tables, const cdb_ref_t &ref) {
    std::uint64_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::uint64_t first = at + offsetof(sd_def_t, sd_fields);
    auto count = tables.sd_defs.number<std::uint32_t>(at + offsetof(sd_def_t, sd_count));
    return {tables, first, count_inside(tables.sd_defs, first, count, sd_element::SIZE)};
}

/**
 * An attribute: persistent (`rsrc_pattr_t`) or dynamic (`rsrc_dattr_t`). Use the names persistent_attribute and
 * dynamic_attribute.
 */
template <class Record> class attribute {
public:
    /** Bytes that one takes in the file. */
    static constexpr std::size_t SIZE = sizeof(Record);

    /** The attribute at a byte offset of the class section. */
    attribute(const class_tables &of, std::uint64_t offset)
        : tables(of), at(offset), fields(of.section.record<Record>(offset)) {}

    /**
     * The attribute's record as in cdb.h, in the byte order of this machine: message numbers, properties, groups. Value
     * cells are left as they are in the file. It is valid as long as this object.
     */
    const Record &record() const {
        return fields;
    }
    /** The attribute's name. */
    std::string_view name() const {
        return tables.strings.text(fields.u_ra_name);
    }
    /** The attribute's number, as the source gave it. */
    std::int32_t id() const {
        return fields.ra_attr_id;
    }
    /** The type of its values. In an unsound file it may be any number. */
    vx_data_type_t type() const {
        return fields.ra_data_type;
    }
    /** The varieties that have the attribute. */
    variety_list varieties() const {
        return varieties_at(tables, fields.u_ra_variety_list);
    }
    /**
     * The valid values; empty if none are defined. If verify() warns with CDB353, they belong to another attribute:
     * ignore them.
     */
    valid_value_list valid_values() const {
        return valid_values_at(tables, fields.u_ra_valid_vals, fields.ra_data_type);
    }
    /** The elements of an `SD` or `SDArray` attribute; empty for any other type, and if none are defined. */
    sd_definition structure() const {
        return sd_definition_at(tables, fields.u_ra_sd);
    }

    /** The default value of a persistent attribute. */
    value default_value() const requires std::is_same_v<Record, rsrc_pattr_t> {
        return cell(offsetof(rsrc_pattr_t, ra_dflt_value));
    }

    /** The value of a dynamic attribute before its first observation. */
    value initial_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_init_value));
    }
    /**
     * The lower bound of a dynamic attribute: a number, or an array of one. If verify() warns with CDB452, it belongs
     * to another attribute: ignore it. Nothing deeper than the array is followed.
     */
    value min_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_min_value), NESTING_MAX - 1);
    }
    /** The upper bound, as for min_value(). */
    value max_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_max_value), NESTING_MAX - 1);
    }
    /** The condition that reports an event, as the source gave it; empty if there is none. */
    std::string_view expression() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return tables.strings.text(fields.u_ra_express);
    }
    /** The condition that re-arms the event, as the source gave it; empty if there is none. */
    std::string_view rearm_expression() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return tables.strings.text(fields.u_ra_rearm_expr);
    }

private:
    value cell(std::size_t offset, unsigned nesting = 0) const {
        return {tables.section, at + offset, fields.ra_data_type, tables.strings, nesting};
    }

    class_tables tables;
    std::uint64_t at; /**< in the section */
    Record fields;
};

/** An attribute that is stored. */
using persistent_attribute = attribute<rsrc_pattr_t>;
/** An attribute that changes by itself and is observed. */
using dynamic_attribute = attribute<rsrc_dattr_t>;

/** An action of a class or of its resources. */
class action {
public:
    /** Bytes that one takes in the file. */
    static constexpr std::size_t SIZE = sizeof(rsrc_action_t);

    /** The action at a byte offset of the class section. */
    action(const class_tables &of, std::uint64_t at) : tables(of), fields(of.section.record<rsrc_action_t>(at)) {}

    /**
     * The action's record as in cdb.h, in the byte order of this machine: message numbers, properties, permissions,
     * time-out. It is valid as long as this object.
     */
    const rsrc_action_t &record() const {
        return fields;
    }
    /** The action's name. */
    std::string_view name() const {
        return tables.strings.text(fields.u_ac_name);
    }
    /** The action's number, as the source gave it. */
    std::int32_t id() const {
        return fields.ac_action_id;
    }
    /** The varieties that have the action. */
    variety_list varieties() const {
        return varieties_at(tables, fields.u_ac_variety_list);
    }
    /** The elements of what the action takes; empty if it takes nothing. */
    sd_definition input() const {
        return sd_definition_at(tables, fields.u_ac_sd_input);
    }
    /** The elements of what the action answers; empty if it answers nothing. */
    sd_definition response() const {
        return sd_definition_at(tables, fields.u_ac_sd_resp);
    }

private:
    class_tables tables;
    rsrc_action_t fields;
};

/* ---- Sections -------------------------------------------------------------------------------------------------- */

/** Whose attributes or actions are meant: those of each resource of a class, or those of the class itself. */
enum class level { of_resource, of_class };

/** A class section. */
class resource_class {
public:
    /** The type of class sections in their anchors. */
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_CLASS;

    /** The class whose section these bytes are. database::classes() makes them. */
    explicit resource_class(const bytes &section) : fields(section.record<rsrc_class_t>(0)) {
        auto table = [&](const cdb_ref_t &ref, std::uint64_t size) { return section.part(ref.offset[0], size); };
        tables = {section, table(fields.u_rc_strings, UINT64_MAX), table(fields.u_rc_valid_vals, fields.rc_valval_size),
                  table(fields.u_rc_variety_lists, fields.rc_varlist_size),
                  table(fields.u_rc_sd_defs, fields.rc_sd_size)};
    }

    /** The class record as in cdb.h, in the byte order of this machine. It is valid as long as this object. */
    const rsrc_class_t &record() const {
        return fields;
    }
    /** The class's name. */
    std::string_view name() const {
        return tables.strings.text(fields.u_rc_name);
    }
    /** Another name of the class; empty if there is none. The compiler writes none. */
    std::string_view alias() const {
        return tables.strings.text(fields.u_rc_alias);
    }
    /** The persistent attributes of each resource, or of the class itself, in the order of the source. */
    list_of<persistent_attribute, class_tables> persistent_attributes(level of) const {
        return of == level::of_class ? records<persistent_attribute>(fields.u_rc_pattrsC, fields.rc_num_pattrsC)
                                     : records<persistent_attribute>(fields.u_rc_pattrs, fields.rc_num_pattrs);
    }
    /** The dynamic attributes of each resource, or of the class itself, in the order of the source. */
    list_of<dynamic_attribute, class_tables> dynamic_attributes(level of) const {
        return of == level::of_class ? records<dynamic_attribute>(fields.u_rc_dattrsC, fields.rc_num_dattrsC)
                                     : records<dynamic_attribute>(fields.u_rc_dattrs, fields.rc_num_dattrs);
    }
    /** The actions of each resource, or of the class itself, in the order of the source. */
    list_of<action, class_tables> actions(level of) const {
        return of == level::of_class ? records<action>(fields.u_rc_actionsC, fields.rc_num_actionsC)
                                     : records<action>(fields.u_rc_actions, fields.rc_num_actions);
    }
    /**
     * The elements of one of the class's five inputs, named by its field in the class record, as in
     * `sd_input(&rsrc_class_t::u_rc_def_input)`. Empty if the class does not define it.
     */
    sd_definition sd_input(cdb_ref_t rsrc_class_t::*input) const {
        return sd_definition_at(tables, fields.*input);
    }
    /** The section and its tables, for readers that follow references of record() themselves. */
    const class_tables &side_tables() const {
        return tables;
    }

private:
    template <class Item> list_of<Item, class_tables> records(const cdb_ref_t &ref, std::size_t count) const {
        std::uint64_t first = ref.offset[0];
        return {tables, first, count_inside(tables.section, first, count, Item::SIZE)};
    }

    rsrc_class_t fields;
    class_tables tables;
};

/** A manager section. */
class manager {
public:
    /** The type of manager sections in their anchors. */
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_RSRC_MGR;

    /** The manager whose section these bytes are. database::managers() makes them. */
    explicit manager(const bytes &section)
        : fields(section.record<rsrc_mgr_t>(0)), texts(section.part(sizeof(rsrc_mgr_t))) {}

    /** The manager's record as in cdb.h, in the byte order of this machine. It is valid as long as this object. */
    const rsrc_mgr_t &record() const {
        return fields;
    }
    /** The manager's name. */
    std::string_view name() const {
        return texts.text(fields.u_rm_RMname);
    }
    /** The strings of the section, which references in the record lead into. */
    const bytes &strings() const {
        return texts;
    }

private:
    rsrc_mgr_t fields;
    bytes texts;
};

/** A class-to-manager map section: which manager serves a class, and where the class's messages are. */
class class_map {
public:
    /** The type of map sections in their anchors. */
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_CMMAP;

    /** The map whose section these bytes are. database::maps() makes them. */
    explicit class_map(const bytes &section) : fields(section.record<rsrc_cmmap_t>(0)) {
        texts = section.part(fields.u_rcm_strings.offset[0]);
    }

    /**
     * The map's record as in cdb.h, in the byte order of this machine: the manager's number, keys, the message set. It
     * is valid as long as this object.
     */
    const rsrc_cmmap_t &record() const {
        return fields;
    }
    /** The file name of the message catalog; empty if none was given. */
    std::string_view message_catalog() const {
        return texts.text(fields.u_rcm_msg_file);
    }
    /** The strings of the section, which references in the record lead into. */
    const bytes &strings() const {
        return texts;
    }

private:
    rsrc_cmmap_t fields;
    bytes texts;
};

/** A dynamic attribute of a variable class. */
struct variable_id {
    /** Bytes that one takes in the file. */
    static constexpr std::size_t SIZE = sizeof(var_id_t);

    /** The entry at a byte offset of the section. */
    variable_id(const bytes &section, std::uint64_t at) : number(section.number<var_id_t>(at)) {}

    /** True for an attribute of the class itself, false for one of its resources. */
    bool of_class() const {
        return (number & VAR_ID_CLASS_ATTR) != 0;
    }

    /** The attribute's number; for an attribute of the class itself with bit 0x8000 (VAR_ID_CLASS_ATTR) set. */
    var_id_t number;
};

/** A variable class section: attributes that are observed and reported together. */
class variable_class {
public:
    /** The type of variable class sections in their anchors. */
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_VAR_CLASS;

    /** The variable class whose section these bytes are. database::variable_classes() makes them. */
    explicit variable_class(const bytes &whole)
        : fields(whole.record<rsrc_variable_class_t>(0)), section(whole),
          texts(whole.part(sizeof fields, fields.u_rvc_string_tbl.offset[0])) {}

    /**
     * The record as in cdb.h, in the byte order of this machine: the two intervals. It is valid as long as this object.
     */
    const rsrc_variable_class_t &record() const {
        return fields;
    }
    /** The variable class's name. */
    std::string_view name() const {
        return texts.text(fields.u_rvc_name);
    }
    /** Its other name; empty if there is none. */
    std::string_view alias() const {
        return texts.text(fields.u_rvc_compat_name);
    }
    /** The strings of the section, which references in the record lead into. */
    const bytes &strings() const {
        return texts;
    }
    /** The dynamic attributes that belong to it: those of the class first, then those of its resources. */
    list_of<variable_id, bytes> variable_ids() const {
        std::uint64_t first = sizeof fields + std::uint64_t{fields.u_rvc_string_tbl.offset[0]};
        return {section, first, count_inside(section, first, fields.rvc_var_count, variable_id::SIZE)};
    }

private:
    rsrc_variable_class_t fields;
    bytes section;
    bytes texts;
};

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

} // namespace cdb

#endif
#endif
