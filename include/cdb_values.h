/**
 * @file
 * The bytes of a database, and the lists and values in them. Include cdb_view.h, which includes this header.
 */
#ifndef CDGEN_CDB_VALUES_H
#define CDGEN_CDB_VALUES_H

#if __cplusplus < 202002L
#error "cdb_values.h needs C++20"
#else

#include "cdb_fields.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <optional>
#include <span>
#include <string_view>

namespace cdb {

/* ---- Data types ------------------------------------------------------------------------------------------------ */

/** The greatest depth to which values inside values are followed. The compiler writes at most 4. */
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
 * structured byte strings, which would be stored there too but cannot be read.
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
 * A part of a database, and the byte order of its file. It refers to bytes that the caller keeps. Reading outside of it
 * gives zeros.
 */
class bytes {
public:
    /** No bytes, in the byte order of this machine. */
    bytes() = default;
    /** Refers to `stretch`, which must remain valid as long as this object and everything made from it. */
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
     * True if the `length` bytes from `offset` on are inside. No arguments cause an overflow. Offsets and lengths have
     * 64 bits on every machine, because the sum of two numbers from a file may not fit into 32.
     */
    bool holds(std::uint64_t offset, std::uint64_t length) const {
        return offset <= all.size() && length <= all.size() - offset;
    }

    /**
     * A number or an enumeration of the file at `offset`, in the byte order of this machine. Returns 0 if some of its
     * bytes are outside. The offset needs no alignment.
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
     * are left as they are in the file; class value reads them. Returns a record of zeros if some of its bytes are
     * outside. The offset needs no alignment.
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
     * The text from `offset` to its zero byte, which is not included. If there is no zero byte, the text ends with
     * these bytes. Empty if the offset lies outside. It refers to the database's bytes.
     */
    std::string_view text(std::uint64_t offset) const {
        if (offset >= all.size())
            return {};
        const char *start = reinterpret_cast<const char *>(at(offset));
        auto room = static_cast<std::size_t>(all.size() - offset);
        const void *zero = std::memchr(start, 0, room);
        return {start, zero == nullptr ? room : static_cast<std::size_t>(static_cast<const char *>(zero) - start)};
    }

    /** The text that a reference leads to, as for an offset. Empty if the reference leads to nothing. */
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
    /** The type of the items. */
    using value_type = Item;
    /** Required by the standard. */
    using difference_type = std::ptrdiff_t;
    /** Only an input iterator for C++17 algorithms, because items are temporary. */
    using iterator_category = std::input_iterator_tag;
    /** A forward iterator for C++20: the list may be walked several times. */
    using iterator_concept = std::forward_iterator_tag;

    /** An iterator without a list; it may only be assigned to. */
    list_iterator() = default;
    /** An iterator at an index of a list, of which it keeps a copy. */
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
    /** `count` items from the byte `offset` on. The context defines what the offset counts from. */
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
 * How many of `count` items of `size` bytes each are completely inside `area` if the first begins at `offset`. `size`
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

/** What is needed to read the elements of an array or of structured data. */
struct value_context {
    /** The strings of the class. */
    bytes strings;
    /** The type of an array's elements; VX_UNKNOWN for structured data, in which each element has its own type. */
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
    /**
     * The value whose cell is at a byte offset of an area. If some of the cell's bytes are outside, it reads as zeros.
     */
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
     * Where an out-of-line value is: its offset in bytes from the start of the class's strings. No value for other
     * types, for a cell that refers to nothing, for a cell that was never filled (which is 0, the offset of the class's
     * first name), and for an offset outside of the strings.
     */
    std::optional<std::uint32_t> place() const {
        auto offset = number<std::uint32_t>();
        if (!is_out_of_line(cell_type) || offset == CDB_NONE || offset == 0 || offset >= strings.size())
            return std::nullopt;
        return offset;
    }

    /** True if there is something to read: a number, or an out-of-line value that the cell leads to. */
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
     * The bytes of a `Binary`; empty for any other type, if it is not present, and if they are not all inside the
     * strings. They are stored separately from the length, 8 bytes after it.
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

} // namespace cdb

#endif
#endif
