/*
 * cdb_view.h: reads a class definition database without trusting it. C++20, namespace cdb; needs cdb_view.cpp and the
 * standard library.
 *
 * A view refers to bytes that somebody else keeps: read_file's, or a mapping. It copies nothing but single records,
 * allocates nothing, and reads either byte order from any alignment. Whatever the bytes say, no view reads outside of
 * them: what leads nowhere reads as zeros, an empty text or an empty list. Whether a database is sound, verify() says,
 * once; after that what the views show can be relied on.
 *
 * docs/reader.md has a whole program, docs/format.md the file byte by byte.
 */
#ifndef CDGEN_CDB_VIEW_H
#define CDGEN_CDB_VIEW_H

#include "cdb_fields.h"

#include <algorithm>
#include <array>
#include <bit>
#include <compare>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <system_error>
#include <vector>

namespace cdb {

/* ---- Data types ------------------------------------------------------------------------------------------------ */

/* Values inside values are followed at most so deep. (The compiler writes 4.) */
inline constexpr unsigned NESTING_MAX = 64;

/* One of the 23 data types. */
constexpr bool is_data_type(vx_data_type_t type) {
    return type <= VX_SD_PTR_ARRAY;
}

constexpr bool is_array(vx_data_type_t type) {
    return type >= VX_INT32_ARRAY && type <= VX_SD_PTR_ARRAY;
}

/* The type of an array's elements; any other type is its own. */
constexpr vx_data_type_t element_type(vx_data_type_t type) {
    return is_array(type) ? static_cast<vx_data_type_t>(type - VX_INT32_ARRAY + VX_INT32) : type;
}

/* Values of the type stand in the class's strings, and the cell holds their offset. Structured byte strings do too, but
 * nothing can be read of them. */
constexpr bool is_out_of_line(vx_data_type_t type) {
    return (type >= VX_CHAR_PTR && type <= VX_SD_PTR) || is_array(type);
}

/* As a class definition source spells it; "" for what is no data type. */
std::string_view name_of(vx_data_type_t type);

/* ---- Bytes ----------------------------------------------------------------------------------------------------- */

/* A stretch of a database and its byte order. Outside of it everything is zero. */
class bytes {
public:
    bytes() = default;
    bytes(std::span<const std::byte> stretch, std::endian order) : all(stretch), file_order(order) {}

    std::size_t size() const {
        return all.size();
    }
    std::endian order() const {
        return file_order;
    }
    std::span<const std::byte> raw() const {
        return all;
    }
    bool holds(std::size_t offset, std::size_t length) const {
        return offset <= all.size() && length <= all.size() - offset;
    }

    /* A number or an enumeration of the file's, in this machine's order. */
    template <class Number> Number number(std::size_t offset) const {
        std::array<std::byte, sizeof(Number)> raw_number = {};
        if (holds(offset, sizeof(Number)))
            std::memcpy(raw_number.data(), all.data() + offset, sizeof(Number));
        if (file_order != std::endian::native)
            std::reverse(raw_number.begin(), raw_number.end());
        return std::bit_cast<Number>(raw_number);
    }

    /* A copy of a record with its numbers and references in this machine's order. Value cells are left as they stand:
     * class value reads them. */
    template <class Record> Record record(std::size_t offset) const {
        Record copy = {};
        if (!holds(offset, sizeof copy))
            return copy;
        std::memcpy(&copy, all.data() + offset, sizeof copy);
        if (file_order != std::endian::native)
            turn(reinterpret_cast<std::byte *>(&copy), fields_of<Record>);
        return copy;
    }

    /* The part from offset on, at most length bytes; empty if offset lies outside. */
    bytes part(std::size_t offset, std::size_t length = SIZE_MAX) const {
        if (offset > all.size())
            return {{}, file_order};
        return {all.subspan(offset, std::min(length, all.size() - offset)), file_order};
    }

    /* The text from offset to its zero byte, or to the end if there is none; empty if offset lies outside. */
    std::string_view text(std::size_t offset) const {
        if (offset >= all.size())
            return {};
        const char *start = reinterpret_cast<const char *>(all.data()) + offset;
        const void *zero = std::memchr(start, 0, all.size() - offset);
        return {start, zero == nullptr ? all.size() - offset
                                       : static_cast<std::size_t>(static_cast<const char *>(zero) - start)};
    }

    /* The text that a reference leads to; none is empty. */
    std::string_view text(const cdb_ref_t &ref) const {
        return ref.offset[0] == CDB_NONE ? std::string_view() : text(std::size_t{ref.offset[0]});
    }

private:
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

/* Lets a list that has size() and operator[] be walked. Items are made as they are asked for. */
template <class List, class Item> class list_iterator {
public:
    using value_type = Item;
    using difference_type = std::ptrdiff_t;
    using iterator_category = std::input_iterator_tag;
    using iterator_concept = std::forward_iterator_tag;

    list_iterator() = default;
    list_iterator(const List &walked, std::size_t start) : list(walked), index(start) {}
    Item operator*() const {
        return list[index];
    }
    list_iterator &operator++() {
        ++index;
        return *this;
    }
    list_iterator operator++(int) {
        list_iterator before = *this;
        ++index;
        return before;
    }
    bool operator==(const list_iterator &other) const {
        return index == other.index;
    }

private:
    List list;
    std::size_t index = 0;
};

/* count items of Item::SIZE bytes, from an offset on; each is made of the context and its offset. */
template <class Item, class Context> class list_of {
public:
    list_of() = default;
    list_of(const Context &of, std::size_t offset, std::size_t count) : context(of), first(offset), items(count) {}

    std::size_t size() const {
        return items;
    }
    bool empty() const {
        return items == 0;
    }
    /* index < size() */
    Item operator[](std::size_t index) const {
        return Item(context, first + index * Item::SIZE);
    }
    list_iterator<list_of, Item> begin() const {
        return {*this, 0};
    }
    list_iterator<list_of, Item> end() const {
        return {*this, items};
    }

private:
    Context context = {};
    std::size_t first = 0;
    std::size_t items = 0;
};

/* As many of count items of size bytes from offset on as lie inside. */
inline std::size_t count_inside(const bytes &area, std::size_t offset, std::size_t count, std::size_t size) {
    return offset > area.size() ? 0 : std::min(count, (area.size() - offset) / size);
}

/* The first item of that name, or of that ID (an attribute's, an action's). Takes time in proportion to the list. */
template <class List> auto find(const List &list, std::string_view name) {
    using item = typename decltype(list.begin())::value_type;
    for (item i : list)
        if (i.name() == name)
            return std::optional<item>(i);
    return std::optional<item>();
}

template <class List> auto find(const List &list, std::int32_t id) {
    using item = typename decltype(list.begin())::value_type;
    for (item i : list)
        if (i.id() == id)
            return std::optional<item>(i);
    return std::optional<item>();
}

/* ---- Values ---------------------------------------------------------------------------------------------------- */

class value;

/* What an element of an array or of structured data is made of. */
struct value_context {
    bytes strings;
    vx_data_type_t array_element = VX_UNKNOWN; /* VX_UNKNOWN in structured data, whose elements know their types */
    unsigned nesting = 0;
};

/* The elements of an array or of structured data, in their order. */
class value_list {
public:
    value_list() = default;
    value_list(const value_context &of, std::size_t offset, std::size_t count)
        : context(of), first(offset), items(count) {}

    std::size_t size() const {
        return items;
    }
    bool empty() const {
        return items == 0;
    }
    /* index < size() */
    value operator[](std::size_t index) const;
    list_iterator<value_list, value> begin() const;
    list_iterator<value_list, value> end() const;

private:
    value_context context;
    std::size_t first = 0;
    std::size_t items = 0;
};

/* A value cell, its type, and the strings that it may lead into. What a value is not reads as 0 or empty. */
class value {
public:
    value() = default;
    /* The cell at an offset of an area. */
    value(const bytes &area, std::size_t offset, vx_data_type_t data_type, const bytes &class_strings,
          unsigned depth = 0)
        : cell_type(data_type), strings(class_strings), nesting(depth) {
        if (area.holds(offset, cell.size()))
            std::memcpy(cell.data(), area.raw().data() + offset, cell.size());
    }

    vx_data_type_t type() const {
        return cell_type;
    }

    /* Where an out-of-line value stands in the strings. Nothing for other types, for none, for a cell that was never
     * filled (0, where the class's first name stands) and for an offset outside. */
    std::optional<std::uint32_t> place() const {
        auto offset = number<std::uint32_t>();
        if (!is_out_of_line(cell_type) || offset == CDB_NONE || offset == 0 || offset >= strings.size())
            return std::nullopt;
        return offset;
    }

    /* There is something to read: a number, or an out-of-line value in its place. */
    bool present() const {
        return (cell_type >= VX_INT32 && cell_type <= VX_FLOAT64) || place().has_value();
    }

    /* Int32, Int64. */
    std::int64_t integer() const {
        return cell_type == VX_INT32 ? number<std::int32_t>() : cell_type == VX_INT64 ? number<std::int64_t>() : 0;
    }
    /* UInt32, UInt64. */
    std::uint64_t natural() const {
        return cell_type == VX_UINT32 ? number<std::uint32_t>() : cell_type == VX_UINT64 ? number<std::uint64_t>() : 0;
    }
    /* Float32, Float64. */
    double real() const {
        return cell_type == VX_FLOAT32   ? static_cast<double>(number<float>())
               : cell_type == VX_FLOAT64 ? number<double>()
                                         : 0.0;
    }
    /* String. */
    std::string_view text() const {
        return cell_type == VX_CHAR_PTR && place() ? strings.text(std::size_t{*place()}) : std::string_view();
    }
    /* Binary. Its bytes stand in a piece of their own, 8 bytes behind the length. */
    std::span<const std::byte> binary() const {
        if (cell_type != VX_BINARY_PTR || !place())
            return {};
        std::size_t at = *place();
        auto length = strings.number<std::uint32_t>(at);
        return strings.holds(at + BINARY_BYTES, length) ? strings.part(at + BINARY_BYTES, length).raw()
                                                        : std::span<const std::byte>();
    }
    /* RH. */
    vx_resource_handle_t handle() const {
        if (cell_type != VX_RSRC_HANDLE_PTR || !place())
            return {};
        std::size_t at = *place();
        auto word = [&](std::size_t i) { return strings.number<std::uint32_t>(at + i * sizeof(std::uint32_t)); };
        return {word(0), {word(1), word(2), word(3), word(4)}};
    }
    /* Arrays and structured data. */
    value_list elements() const {
        bool structured = cell_type == VX_SD_PTR;
        if ((!structured && !is_array(cell_type)) || !place() || nesting >= NESTING_MAX)
            return {};
        std::size_t at = *place();
        std::size_t size = structured ? sizeof(vx_structured_data_element_t) : sizeof(vx_value_t);
        std::size_t count = count_inside(strings, at + ELEMENTS, strings.number<std::uint32_t>(at), size);
        return {{strings, structured ? VX_UNKNOWN : element_type(cell_type), nesting + 1}, at + ELEMENTS, count};
    }

    static constexpr std::size_t BINARY_BYTES = 8; /* of a binary's bytes, from its start */
    static constexpr std::size_t ELEMENTS = 8;     /* of an array's or structured data's first element */
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
        return {context.strings, first + index * sizeof(vx_value_t), context.array_element, context.strings,
                context.nesting};
    std::size_t at = first + index * sizeof(vx_structured_data_element_t);
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

/* A class section and those of its tables that other tables refer into. */
struct class_tables {
    bytes section;
    bytes strings;
    bytes valid_vals;
    bytes variety_lists;
    bytes sd_defs;
};

/* The varieties from low to high. */
struct variety {
    static constexpr std::size_t SIZE = sizeof(vl_entry_t);

    variety(const bytes &variety_lists, std::size_t at)
        : low(variety_lists.number<std::uint32_t>(at + offsetof(vl_entry_t, vl_low_val))),
          high(variety_lists.number<std::uint32_t>(at + offsetof(vl_entry_t, vl_high_val))) {}

    std::uint32_t low;
    std::uint32_t high;
};

using variety_list = list_of<variety, bytes>;

/* What the entries of a list of valid values are read as. */
struct valid_value_context {
    class_tables tables;
    vx_data_type_t type = VX_UNKNOWN;
};

/* The values from low to high; for a single value, it twice. They are numbers, texts and binaries: no type that has
 * elements has valid values of its own, so none are followed here. */
struct valid_value {
    static constexpr std::size_t SIZE = sizeof(vv_entry_t);

    valid_value(const valid_value_context &of, std::size_t at)
        : low(of.tables.valid_vals, at + offsetof(vv_entry_t, vv_low_val), of.type, of.tables.strings, NESTING_MAX),
          high(of.tables.valid_vals, at + offsetof(vv_entry_t, vv_high_val), of.type, of.tables.strings, NESTING_MAX),
          message(of.tables.valid_vals.number<std::uint16_t>(at + offsetof(vv_entry_t, vv_disp_msgid))) {}

    value low;
    value high;
    std::uint16_t message; /* number of the message to show; 0: none */
};

using valid_value_list = list_of<valid_value, valid_value_context>;

/* The list that a reference leads to; none is empty. */
inline variety_list varieties_at(const class_tables &tables, const cdb_ref_t &ref) {
    std::size_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::size_t first = at + offsetof(variety_list_t, vl_values);
    auto count = tables.variety_lists.number<std::uint32_t>(at + offsetof(variety_list_t, vl_count));
    return {tables.variety_lists, first, count_inside(tables.variety_lists, first, count, variety::SIZE)};
}

/* owner: the data type of what the values are valid for. */
inline valid_value_list valid_values_at(const class_tables &tables, const cdb_ref_t &ref, vx_data_type_t owner) {
    std::size_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::size_t first = at + offsetof(valid_values_t, vv_values);
    auto count = tables.valid_vals.number<std::uint32_t>(at + offsetof(valid_values_t, vv_count));
    return {{tables, element_type(owner)}, first, count_inside(tables.valid_vals, first, count, valid_value::SIZE)};
}

/* An element of a structured-data definition. */
class sd_element {
public:
    static constexpr std::size_t SIZE = sizeof(sd_field_t);

    sd_element(const class_tables &of, std::size_t at) : tables(of), fields(of.sd_defs.record<sd_field_t>(at)) {}

    const sd_field_t &record() const {
        return fields;
    }
    std::string_view name() const {
        return tables.strings.text(fields.u_sd_field_name);
    }
    vx_data_type_t type() const {
        return fields.sd_field_type;
    }
    valid_value_list valid_values() const {
        return valid_values_at(tables, fields.u_sd_valid_vals, fields.sd_field_type);
    }

private:
    class_tables tables;
    sd_field_t fields;
};

using sd_definition = list_of<sd_element, class_tables>;

/* The definition that a reference leads to; none is empty. */
inline sd_definition sd_definition_at(const class_tables &tables, const cdb_ref_t &ref) {
    std::size_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::size_t first = at + offsetof(sd_def_t, sd_fields);
    auto count = tables.sd_defs.number<std::uint32_t>(at + offsetof(sd_def_t, sd_count));
    return {tables, first, count_inside(tables.sd_defs, first, count, sd_element::SIZE)};
}

/* A persistent attribute (rsrc_pattr_t) or a dynamic one (rsrc_dattr_t). */
template <class Record> class attribute {
public:
    static constexpr std::size_t SIZE = sizeof(Record);

    attribute(const class_tables &of, std::size_t offset)
        : tables(of), at(offset), fields(of.section.record<Record>(offset)) {}

    const Record &record() const {
        return fields;
    }
    std::string_view name() const {
        return tables.strings.text(fields.u_ra_name);
    }
    std::int32_t id() const {
        return fields.ra_attr_id;
    }
    vx_data_type_t type() const {
        return fields.ra_data_type;
    }
    variety_list varieties() const {
        return varieties_at(tables, fields.u_ra_variety_list);
    }
    valid_value_list valid_values() const {
        return valid_values_at(tables, fields.u_ra_valid_vals, fields.ra_data_type);
    }
    /* Of an attribute that holds structured data. */
    sd_definition structure() const {
        return sd_definition_at(tables, fields.u_ra_sd);
    }

    value default_value() const requires std::is_same_v<Record, rsrc_pattr_t> {
        return cell(offsetof(rsrc_pattr_t, ra_dflt_value));
    }

    value initial_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_init_value));
    }
    /* Bounds, if they are not another attribute's (verify says so), are numbers, or arrays of a single element without
     * elements. So nothing deeper is followed. */
    value min_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_min_value), NESTING_MAX - 1);
    }
    value max_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_max_value), NESTING_MAX - 1);
    }
    std::string_view expression() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return tables.strings.text(fields.u_ra_express);
    }
    std::string_view rearm_expression() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return tables.strings.text(fields.u_ra_rearm_expr);
    }

private:
    value cell(std::size_t offset, unsigned nesting = 0) const {
        return {tables.section, at + offset, fields.ra_data_type, tables.strings, nesting};
    }

    class_tables tables;
    std::size_t at; /* in the section */
    Record fields;
};

using persistent_attribute = attribute<rsrc_pattr_t>;
using dynamic_attribute = attribute<rsrc_dattr_t>;

class action {
public:
    static constexpr std::size_t SIZE = sizeof(rsrc_action_t);

    action(const class_tables &of, std::size_t at) : tables(of), fields(of.section.record<rsrc_action_t>(at)) {}

    const rsrc_action_t &record() const {
        return fields;
    }
    std::string_view name() const {
        return tables.strings.text(fields.u_ac_name);
    }
    std::int32_t id() const {
        return fields.ac_action_id;
    }
    variety_list varieties() const {
        return varieties_at(tables, fields.u_ac_variety_list);
    }
    sd_definition input() const {
        return sd_definition_at(tables, fields.u_ac_sd_input);
    }
    sd_definition response() const {
        return sd_definition_at(tables, fields.u_ac_sd_resp);
    }

private:
    class_tables tables;
    rsrc_action_t fields;
};

/* ---- Sections -------------------------------------------------------------------------------------------------- */

/* What attributes and actions belong to: each resource of a class, or the class itself. */
enum class level { of_resource, of_class };

class resource_class {
public:
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_CLASS;

    explicit resource_class(const bytes &section) : fields(section.record<rsrc_class_t>(0)) {
        auto table = [&](const cdb_ref_t &ref, std::size_t size) { return section.part(ref.offset[0], size); };
        tables = {section, table(fields.u_rc_strings, SIZE_MAX), table(fields.u_rc_valid_vals, fields.rc_valval_size),
                  table(fields.u_rc_variety_lists, fields.rc_varlist_size),
                  table(fields.u_rc_sd_defs, fields.rc_sd_size)};
    }

    const rsrc_class_t &record() const {
        return fields;
    }
    std::string_view name() const {
        return tables.strings.text(fields.u_rc_name);
    }
    std::string_view alias() const {
        return tables.strings.text(fields.u_rc_alias);
    }
    list_of<persistent_attribute, class_tables> persistent_attributes(level of) const {
        return of == level::of_class ? records<persistent_attribute>(fields.u_rc_pattrsC, fields.rc_num_pattrsC)
                                     : records<persistent_attribute>(fields.u_rc_pattrs, fields.rc_num_pattrs);
    }
    list_of<dynamic_attribute, class_tables> dynamic_attributes(level of) const {
        return of == level::of_class ? records<dynamic_attribute>(fields.u_rc_dattrsC, fields.rc_num_dattrsC)
                                     : records<dynamic_attribute>(fields.u_rc_dattrs, fields.rc_num_dattrs);
    }
    list_of<action, class_tables> actions(level of) const {
        return of == level::of_class ? records<action>(fields.u_rc_actionsC, fields.rc_num_actionsC)
                                     : records<action>(fields.u_rc_actions, fields.rc_num_actions);
    }
    /* One of the class's five inputs, as in sd_input(&rsrc_class_t::u_rc_def_input). */
    sd_definition sd_input(cdb_ref_t rsrc_class_t::*input) const {
        return sd_definition_at(tables, fields.*input);
    }
    const class_tables &side_tables() const {
        return tables;
    }

private:
    template <class Item> list_of<Item, class_tables> records(const cdb_ref_t &ref, std::size_t count) const {
        std::size_t first = ref.offset[0];
        return {tables, first, count_inside(tables.section, first, count, Item::SIZE)};
    }

    rsrc_class_t fields;
    class_tables tables;
};

class manager {
public:
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_RSRC_MGR;

    explicit manager(const bytes &section)
        : fields(section.record<rsrc_mgr_t>(0)), strings(section.part(sizeof(rsrc_mgr_t))) {}

    const rsrc_mgr_t &record() const {
        return fields;
    }
    std::string_view name() const {
        return strings.text(fields.u_rm_RMname);
    }

private:
    rsrc_mgr_t fields;
    bytes strings;
};

/* Which manager serves a class, and where its messages are. */
class class_map {
public:
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_CMMAP;

    explicit class_map(const bytes &section) : fields(section.record<rsrc_cmmap_t>(0)) {
        strings = section.part(fields.u_rcm_strings.offset[0]);
    }

    const rsrc_cmmap_t &record() const {
        return fields;
    }
    std::string_view message_catalog() const {
        return strings.text(fields.u_rcm_msg_file);
    }

private:
    rsrc_cmmap_t fields;
    bytes strings;
};

/* A dynamic attribute of a variable class. */
struct variable_id {
    static constexpr std::size_t SIZE = sizeof(var_id_t);

    variable_id(const bytes &section, std::size_t at) : number(section.number<var_id_t>(at)) {}

    bool of_class() const {
        return (number & VAR_ID_CLASS_ATTR) != 0;
    }

    var_id_t number;
};

class variable_class {
public:
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_VAR_CLASS;

    explicit variable_class(const bytes &whole)
        : fields(whole.record<rsrc_variable_class_t>(0)), section(whole),
          strings(whole.part(sizeof fields, fields.u_rvc_string_tbl.offset[0])) {}

    const rsrc_variable_class_t &record() const {
        return fields;
    }
    std::string_view name() const {
        return strings.text(fields.u_rvc_name);
    }
    std::string_view alias() const {
        return strings.text(fields.u_rvc_compat_name);
    }
    list_of<variable_id, bytes> variable_ids() const {
        std::size_t first = sizeof fields + std::size_t{fields.u_rvc_string_tbl.offset[0]};
        return {section, first, count_inside(section, first, fields.rvc_var_count, variable_id::SIZE)};
    }

private:
    rsrc_variable_class_t fields;
    bytes section;
    bytes strings;
};

/* ---- The database ---------------------------------------------------------------------------------------------- */

template <class View> class sections_of;

class database {
public:
    database() = default;
    /* file has to outlive the database and all views that come from it. */
    explicit database(std::span<const std::byte> file);
    /* read_file's result has to be kept: database(read_file(...)) would read what is gone. */
    explicit database(const std::vector<std::byte> &&) = delete;

    /* The format word says that it is one. If not, this machine's byte order is assumed. */
    bool recognised() const {
        return known;
    }
    std::endian order() const {
        return all.order();
    }
    const bytes &file() const {
        return all;
    }
    const orb_cdb_header_t &header() const {
        return head;
    }
    /* As many as the header says, or as fit into the file. */
    std::size_t section_count() const {
        return count_inside(all, sizeof head, head.cdb_hdr_dsect_count, sizeof(cdb_dsect_anchor_t));
    }
    cdb_dsect_anchor_t anchor(std::size_t index) const {
        return all.record<cdb_dsect_anchor_t>(sizeof head + index * sizeof(cdb_dsect_anchor_t));
    }
    bytes section(std::size_t index) const {
        cdb_dsect_anchor_t where = anchor(index);
        return all.part(where.cda_offset, where.cda_length);
    }

    sections_of<resource_class> classes() const;
    sections_of<manager> managers() const;
    sections_of<class_map> maps() const;
    sections_of<variable_class> variable_classes() const;

private:
    bytes all;
    bool known = false;
    orb_cdb_header_t head = {};
};

/* The sections of one type, in the file's order. */
template <class View> class sections_of {
public:
    class iterator {
    public:
        using value_type = View;
        using difference_type = std::ptrdiff_t;
        using iterator_category = std::input_iterator_tag;
        using iterator_concept = std::forward_iterator_tag;

        iterator() = default;
        iterator(const database &walked, std::size_t start) : db(walked), index(start) {
            skip();
        }
        View operator*() const {
            return View(db.section(index));
        }
        iterator &operator++() {
            ++index;
            skip();
            return *this;
        }
        iterator operator++(int) {
            iterator before = *this;
            ++*this;
            return before;
        }
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

    explicit sections_of(const database &of) : db(of) {}

    iterator begin() const {
        return {db, 0};
    }
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

/* The whole of a file. On failure error says why, and nothing is returned. */
std::vector<std::byte> read_file(const char *path, std::error_code &error);

/* ---- Soundness ------------------------------------------------------------------------------------------------- */

/* A warning is for what the compiler itself can make of a careless source; what it cannot is an error. */
enum class severity : std::uint8_t { warning, error };

/* What verify checks. Codes are permanent; docs/reader.md lists them. */
struct rule {
    std::string_view code; /* "CDB104" */
    severity level;
    std::string_view title; /* "wrong checksum" */
};

/* The two rules that, broken, leave the rest of a database readable. */
inline constexpr std::string_view CODE_CHECKSUM = "CDB104";
inline constexpr std::string_view CODE_RESERVED = "CDB106";

/* The two rules that, broken, leave a record something that is not its own: valid values, or a bound. */
inline constexpr std::string_view CODE_CUT_SHORT = "CDB353";
inline constexpr std::string_view CODE_RANGE_ASTRAY = "CDB452";

/* Where a rule is broken. */
struct finding {
    const rule *broken;
    std::optional<std::size_t> section; /* position among the anchors; none: the file as a whole */
    std::string_view record;            /* the record's type, as in cdb.h; may be empty */
    std::size_t index;                  /* of the record in its table, or of the entry in its list */
    std::string_view field;             /* may be empty */
    std::size_t offset;                 /* in the file, bytes */
    std::string found;
    std::string expected;
};

/* What a stretch of the file is. */
struct region {
    std::size_t offset; /* in the file, bytes */
    std::size_t size;   /* bytes */
    std::optional<std::size_t> section;
    std::string_view record;  /* the record's type, or "text", "binary", "handle", "filling", "unreached" */
    std::size_t index;        /* of the record in its table, or of the entry in its list */
    const struct field *what; /* of the record; null for what is no record */
};

/* Looks through the whole file once, in time in proportion to its size (each variable ID is looked up in a sorted
 * list); findings in the order length, format, checksum, record sizes, reserved bytes, anchors, sections. Nothing
 * found: the file is sound. */
std::vector<finding> verify(const database &db);

/* Sound: no errors; there may be warnings. */
bool is_sound(std::span<const finding> findings);

/* All rules, in the order of their codes. */
std::span<const rule> rules();

/* Every byte of the file in exactly one region, in the order of the file. What no reference reaches is "unreached". */
std::vector<region> regions(const database &db);

} // namespace cdb

#endif
