/* cdgen_attr_values.cpp: the value handler of each attribute type. */

#include "compiler/cdgen_attr.h"

#include "compiler/cdgen_digits.h"
#include "compiler/cdgen_kinds.h"
#include "compiler/cdgen_stanzas.h"
#include "compiler/cdgen_values.h"
#include "compiler/cdgen_words.h"
#include "format/constants.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>

namespace {

/* ---- Fields of staging records -------------------------------------------------------------------------------- */

char *field_of(const attr_line &line) {
    return line.cx.framing.record + line.attr.ta_offset;
}

template <class Value> Value load(const char *from) {
    Value value;
    memcpy(&value, from, sizeof value);
    return value;
}

template <class Value> void store(char *to, Value value) {
    memcpy(to, &value, sizeof value);
}

std::string_view value_of(const attr_line &line) {
    return {line.value, line.length};
}

vx_int64_t integer(const attr_line &line, std::string_view text) {
    return int_from_text(line.cx, text, nullptr, 0);
}

vx_data_type_t data_type(const attr_line &line) {
    return load<vx_data_type_t>(line.cx.framing.record + line.cx.framing.scp->dt_offset);
}

tbl *strings_of(const attr_line &line) {
    tbl *strings = sc_str_tbl(line.cx, *line.cx.framing.scp);
    if (strings == nullptr)
        source_error(line.cx, MSG_NO_STRING_TABLE);
    return strings;
}

/* ---- Plain values ---------------------------------------------------------------------------------------------- */

/* For numbers that only the C library reads, and for texts that are not numbers. */
template <class Width> [[gnu::noinline]] void store_other_integer(cdgen &cx, char *field, char *value, size_t length) {
    value[length] = '\0';
    store(field, static_cast<Width>(int_from_text(cx, {value, length}, nullptr, 0)));
}

/* Deliberately truncated to the field's width, without a range check. */
template <class Width> void store_integer(const attr_line &line) {
    vx_uint64_t plain = 0;
    if (!plain_decimal(value_of(line), &plain))
        return store_other_integer<Width>(line.cx, field_of(line), line.value, line.length);
    store(field_of(line), static_cast<Width>(plain));
}

void store_string(const attr_line &line) {
    store(field_of(line), add_to_tbl(line.cx, strings_of(line), line.value, line.length + 1));
}

void store_props(const attr_line &line, std::span<const props_t> props) {
    auto bits = load<vx_uint32_t>(field_of(line));
    set_props(&bits, props, line.value, line.length);
    store(field_of(line), bits);
}

void store_class_props(const attr_line &line) {
    store_props(line, rc_props);
}

void store_pattr_props(const attr_line &line) {
    store_props(line, pa_props);
}

void store_dattr_props(const attr_line &line) {
    store_props(line, da_props);
}

void store_action_props(const attr_line &line) {
    store_props(line, act_props);
}

void store_version(const attr_line &line) {
    vx_uint32_t version = 0;
    ver_str_convert(line.cx, line.value, &version);
    store(field_of(line), version);
}

/* The text is deliberately not interpreted. */
void store_perm_template(const attr_line &line) {
    store(field_of(line), PERMISSIONS_GIVEN);
}

/* Only the first letter counts; an unknown letter leaves the field as it is. */
void store_permission(const attr_line &line) {
    for (const valid_perms_t *perm = perm_list; perm < perm_list + num_perm_list; ++perm)
        if (perm->permission == line.value[0]) {
            store(field_of(line), perm->mask);
            return;
        }
}

void store_variable_type(const attr_line &line) {
    std::optional<orb_variable_type_t> type = variable_type_named(value_of(line));
    if (!type)
        source_error(line.cx, MSG_INVALID_VARIABLE_TYPE);
    store(field_of(line), *type);
}

/* The name is kept for the manager's record, made at the end; the map refers to manager 0, the only one. */
void store_manager(const attr_line &line) {
    cdgen &cx = line.cx;
    store(field_of(line), vx_uint16_t{0});
    if (cx.later.rm_name != nullptr)
        cdgen_error_exit(MSG_SECOND_MANAGER, cx.later.rm_name.get(), nullptr, 0, 1);
    cx.later.rm_name.reset(strdup(line.value));
    if (cx.later.rm_name == nullptr)
        cdgen_error_exit(MSG_NO_MEMORY_FOR_NAME, strerror(errno), nullptr, 0, errno);
}

void store_locator(const attr_line &line) {
    line.cx.later._rc_locator.ptr = &line.cx.staged.cb_rsrc_class.rc_locator;
    memcpy(line.cx.later._rc_locator.name, line.value, line.length + 1);
}

void ignore(const attr_line &) {}

/* ---- Varieties and valid values -------------------------------------------------------------------------------- */

/* The two values of "low,high". */
struct bounds {
    std::string_view low;
    std::string_view high;
};

/* Splits the value at its first comma, in place. Returns no value if there is no comma. */
std::optional<bounds> split_bounds(const attr_line &line) {
    char *comma = find_character(line.value, line.length, ',');
    if (comma == nullptr)
        return std::nullopt;
    *comma = '\0';
    auto low_length = static_cast<size_t>(comma - line.value);
    return bounds{{line.value, low_length}, {comma + 1, line.length - low_length - 1}};
}

/* The offset of a list's next entry. The list's header has room for the first entry; each other entry is added at the
 * end of the table, which is also the end of the list. */
template <class List>
size_t next_entry(cdgen &cx, tbl *t, size_t list, vx_uint32_t List::*count, size_t first, size_t size) {
    if (record_at<List>(t, list)->*count == 0)
        return list + first;
    auto *entry = static_cast<char *>(alloc_tble(cx, t, size));
    return static_cast<size_t>(entry - t->tbl_base);
}

void store_variety(const attr_line &line) {
    std::optional<bounds> given = split_bounds(line);
    if (!given)
        source_error(line.cx, MSG_INVALID_VARIETY);
    tbl *varieties = sc_vty_tbl(line.cx, *line.cx.framing.scp);
    auto list = load<vx_uint32_t>(field_of(line));
    size_t at = next_entry(line.cx, varieties, list, &variety_list_t::vl_count, offsetof(variety_list_t, vl_values),
                           sizeof(vl_entry_t));
    char *rest = nullptr;
    auto high_val = static_cast<vx_uint32_t>(int_from_text(line.cx, given->high, &rest, 0));
    if (*rest != '\0' && strchr(rest, ',') != nullptr)
        source_error(line.cx, MSG_TOO_MANY_VARIETIES);
    auto low_val = static_cast<vx_uint32_t>(integer(line, given->low));
    *record_at<vl_entry_t>(varieties, at) = {low_val, high_val};
    ++record_at<variety_list_t>(varieties, list)->vl_count;
}

/* Converts a text to a value, which is kept in the pool of the line. */
vx_value_t converted(const attr_line &line, vx_data_type_t type, std::string_view text) {
    vx_value_t value = {};
    if (str_to_vx(line.cx, &value, type, text, line.cx.line_texts) != 0)
        source_error(line.cx, MSG_INVALID_VALUE);
    return value;
}

/* Serialises a value into a cell, with an array of its own if it is one. */
void copied(const attr_line &line, vx_value_t *cell, const vx_value_t &value, vx_data_type_t type, message_id failure) {
    if (copy_number(*cell, value, type)) /* most are */
        return;
    tbl_anchor array;
    if (copy_this_type(line.cx, cell, &value, type, TYPE_SAME, strings_of(line), &array, 1) != 0)
        source_error(line.cx, failure);
}

constexpr message_id COPY_ERROR = MSG_COPY_FAILED;
constexpr message_id DATA_ERROR = MSG_INVALID_VALUE;

/* With a comma, stores high, then low; without one, stores the value twice, as low, then as high. */
void store_bounds(const attr_line &line, vx_data_type_t type, vv_entry_t *entry) {
    if (std::optional<bounds> given = split_bounds(line)) {
        copied(line, &entry->vv_high_val, converted(line, type, given->high), type, COPY_ERROR);
        copied(line, &entry->vv_low_val, converted(line, type, given->low), type, DATA_ERROR);
    } else {
        vx_value_t value = converted(line, type, value_of(line));
        copied(line, &entry->vv_low_val, value, type, COPY_ERROR);
        copied(line, &entry->vv_high_val, value, type, COPY_ERROR);
    }
}

/* Adds an entry to the list at the field's offset. The entries have the owner's type, or its element type. */
void add_valid_value(const attr_line &line) {
    cdgen &cx = line.cx;
    tbl *lists = sc_vv_tbl(cx, *line.cx.framing.scp);
    auto list = load<vx_uint32_t>(field_of(line));
    size_t at =
        next_entry(cx, lists, list, &valid_values_t::vv_count, offsetof(valid_values_t, vv_values), sizeof(vv_entry_t));
    vv_entry_t entry = {};
    cx.line_texts.clear();
    store_bounds(line, scalar_vx(data_type(line)), &entry);
    *record_at<vv_entry_t>(lists, at) = entry;
    cx.valid_values.vvdisp = at + offsetof(vv_entry_t, vv_disp_msgid);
    ++record_at<valid_values_t>(lists, list)->vv_count;
}

void store_valid_value(const attr_line &line) {
    vx_uint16_t &found = vv_found(line.cx, *line.cx.framing.scp);
    if (!found) {
        store(field_of(line), mk_vv_sec(line.cx));
        found = 1;
    }
    add_valid_value(line);
}

void store_value_display(const attr_line &line) {
    cdgen &cx = line.cx;
    if (!cx.valid_values.vvdisp.has_value())
        source_error(cx, MSG_NO_VALID_VALUE);
    *record_at<vx_uint16_t>(sc_vv_tbl(cx, *line.cx.framing.scp), *cx.valid_values.vvdisp) =
        static_cast<vx_uint16_t>(integer(line, value_of(line)));
}

/* ---- Data types, defaults and ranges --------------------------------------------------------------------------- */

bool is_sd(vx_data_type_t type) {
    return scalar_vx(type) == VX_SD_PTR;
}

std::shared_ptr<dflt_values> new_dflt_values(cdgen &cx, const char *name, vx_data_type_t sd_type = VX_UNKNOWN) {
    if (cx.framing.spare_dflt == nullptr)
        return std::make_shared<dflt_values>(name, sd_type);
    cx.framing.spare_dflt->restart(name, sd_type, cx.options.debugLevel > 2);
    return std::move(cx.framing.spare_dflt);
}

/* Collects the value. When the attribute is completed, all collected values become its default. */
void store_default(const attr_line &line) {
    cdgen &cx = line.cx;
    vx_data_type_t type = data_type(line);
    if (is_sd(type))
        source_error(cx, MSG_SD_DEFAULT);
    dflt_tbl &dflt = line.cx.framing.state->dflt;
    if (dflt.tbl == nullptr)
        dflt.tbl = new_dflt_values(cx, "DefaultValues");
    void *slot = alloc_tble(cx, &dflt.tbl->cells, sizeof(vx_value_t));
    vx_value_t value = {};
    if (str_to_vx(cx, &value, type, value_of(line), dflt.tbl->texts) != 0)
        source_error(cx, MSG_INVALID_VALUE);
    memcpy(slot, &value, sizeof value);
    ++dflt.num_elems;
}

/* An SD-typed attribute gets its value from the run of SD stanzas that follows it. */
void expect_sd_run(const attr_line &line, vx_data_type_t type) {
    cdgen &cx = line.cx;
    const attr_kind &kind = *line.cx.framing.scp->sc_attr;
    cx.sd.announce(reinterpret_cast<vx_value_t *>(line.cx.framing.record + kind.value_offset),
                   reinterpret_cast<cdb_ref_t *>(line.cx.framing.record + kind.sd_offset),
                   reinterpret_cast<vx_uint16_t *>(line.cx.framing.record + kind.max_sd_idx_offset), kind.sd_attr_type);
    line.cx.framing.state->dflt.tbl = new_dflt_values(cx, type == VX_SD_PTR ? "VX_SD_PTR" : "VX_SD_PTR_ARRAY", type);
}

void store_data_type(const attr_line &line) {
    vx_data_type_t type = data_type_named(value_of(line));
    store(field_of(line), type);
    if (type == VX_UNKNOWN)
        source_error(line.cx, MSG_INVALID_DATA_TYPE);
    if (is_sd(type))
        expect_sd_run(line, type);
}

/* Strings, binaries, handles, structured data and their arrays have no range. */
bool takes_range(vx_data_type_t type) {
    vx_data_type_t scalar = scalar_vx(type);
    return scalar < VX_CHAR_PTR || scalar > VX_SD_PTR;
}

/* Deliberate: an open resource attribute gets the range even if the line is in the stanza of a class attribute, and the
 * range is converted as that attribute's type. */
void store_range(const attr_line &line) {
    cdgen &cx = line.cx;
    vx_data_type_t type = data_type(line);
    if (!takes_range(type))
        return;
    cx.range.dattr_range_found = 1;
    std::optional<bounds> given = split_bounds(line);
    if (!given)
        source_error(cx, MSG_RANGE_NEEDS_TWO);
    bool of_resource = cx.staged.cb_rsrc_dattr.ra_cb_ID != 0;
    rsrc_dattr_t &target = of_resource ? cx.staged.cb_rsrc_dattr : cx.staged.cb_rsrc_dattrC;
    if (of_resource)
        cx.range.dattr_range_type = type;
    cx.line_texts.clear();
    copied(line, &target.ra_max_value, converted(line, type, given->high), type, COPY_ERROR);
    copied(line, &target.ra_min_value, converted(line, type, given->low), type, DATA_ERROR);
}

/* ---- Elements of structured data ------------------------------------------------------------------------------- */

void store_sd_name(const attr_line &line) {
    cdb_ref_t name = {{add_to_tbl(line.cx, strings_of(line), line.value, line.length + 1), 0}};
    store(field_of(line), name);
    line.cx.sd.element.sd_name_found = 1;
}

void store_sd_description(const attr_line &line) {
    store_integer<vx_uint16_t>(line);
    line.cx.sd.element.sd_desc_found = 1;
}

void store_sd_display(const attr_line &line) {
    store_integer<vx_uint16_t>(line);
    line.cx.sd.element.sd_disp_found = 1;
}

/* Text that is not a number leaves the previous index, which is then not the expected one. */
void check_sd_index(const attr_line &line) {
    cdgen &cx = line.cx;
    vx_value_t index = {};
    if (str_to_vx(cx, &index, VX_UINT32, value_of(line), cx.line_texts) == 0)
        cx.sd.set_index(static_cast<int>(index.val_uint32));
    if (cx.sd.index() != cx.sd.expected_index()) {
        if (cx.options.explanations != nullptr)
            fprintf(cx.options.explanations, "curr_sdel = %d, expected_sdeli = %d\n", cx.sd.index(),
                    cx.sd.expected_index());
        source_error(cx, MSG_INDEX_NOT_CONSECUTIVE);
    }
    cx.sd.expect_index(index_after(cx.sd.index()));
}

/* Deliberate: an unknown type is not an error here. */
void store_sd_data_type(const attr_line &line) {
    cdgen &cx = line.cx;
    vx_data_type_t type = data_type_named(value_of(line));
    if (is_sd(type))
        source_error(cx, MSG_SD_IN_SD);
    store(field_of(line), type);
    cx.sd.element.sd_dt_found = 1;
    if (!cx.sd.makes_value())
        return;
    dflt_tbl &dflt = line.cx.framing.state->dflt;
    *static_cast<vx_value_t *>(alloc_tble(cx, &dflt.tbl->cells, sizeof(vx_value_t))) = {
        .val_uint32 = static_cast<vx_uint32_t>(type)};
    ++dflt.num_elems;
    cx.sd.count_element();
}

void store_sd_valid_value(const attr_line &line) {
    if (!line.cx.sd.element.sd_vv_found) {
        store(field_of(line), cdb_ref_t{{mk_vv_sec(line.cx), 0}});
        line.cx.sd.element.sd_vv_found = 1;
    }
    add_valid_value(line);
}

void refuse_sd_default(const attr_line &line) {
    source_error(line.cx, MSG_ELEMENT_DEFAULT);
}

using handler = void (*)(cdgen &cx, const table_attrs &attr, char *value, size_t length);

/* The function as a handler. A line has four words, which a handler gets in registers. */
template <void (*store)(const attr_line &)>
void stored_by(cdgen &cx, const table_attrs &attr, char *value, size_t length) {
    value[length] = '\0';
    store({cx, attr, value, length});
}

/* The same for a function that needs no NUL at the value's end. It reads words, and a word that contains a byte that
 * has just been written is read slowly. */
template <void (*store)(const attr_line &)>
void stored_by_length(cdgen &cx, const table_attrs &attr, char *value, size_t length) {
    store({cx, attr, value, length});
}

/* By attr_type. */
constexpr std::array<handler, AT_COUNT> handlers = {
    stored_by_length<store_integer<uint8_t>>,     /* AT_UINT8 */
    stored_by_length<store_integer<vx_uint16_t>>, /* AT_UINT16 */
    stored_by_length<store_integer<vx_uint32_t>>, /* AT_UINT32 */
    stored_by<store_string>,                      /* AT_STRING */
    stored_by_length<store_class_props>,          /* AT_CLASS_PROPS */
    stored_by<store_version>,                     /* AT_VERSION */
    stored_by<store_perm_template>,               /* AT_PERM_TEMPLATE */
    stored_by<store_manager>,                     /* AT_MANAGER */
    stored_by<store_locator>,                     /* AT_LOCATOR */
    stored_by_length<store_integer<vx_uint32_t>>, /* AT_ID */
    stored_by<store_variety>,                     /* AT_VARIETY */
    stored_by_length<store_pattr_props>,          /* AT_PATTR_PROPS */
    stored_by_length<store_dattr_props>,          /* AT_DATTR_PROPS */
    stored_by_length<store_action_props>,         /* AT_ACTION_PROPS */
    stored_by<store_valid_value>,                 /* AT_VALID_VALUE */
    stored_by<store_default>,                     /* AT_DEFAULT_VALUE */
    stored_by<store_value_display>,               /* AT_VALUE_DISPLAY */
    stored_by<store_data_type>,                   /* AT_DATA_TYPE */
    stored_by<store_variable_type>,               /* AT_VARIABLE_TYPE */
    stored_by<store_range>,                       /* AT_RANGE */
    stored_by<store_default>,                     /* AT_INITIAL_VALUE */
    stored_by<check_sd_index>,                    /* AT_SD_INDEX */
    stored_by<store_sd_name>,                     /* AT_SD_NAME */
    stored_by<store_sd_description>,              /* AT_SD_DESCRIPTION */
    stored_by<store_sd_display>,                  /* AT_SD_DISPLAY */
    stored_by<store_sd_data_type>,                /* AT_SD_DATA_TYPE */
    stored_by<store_sd_valid_value>,              /* AT_SD_VALID_VALUE */
    stored_by<store_value_display>,               /* AT_SD_VALUE_DISPLAY */
    stored_by<refuse_sd_default>,                 /* AT_SD_DEFAULT_VALUE */
    stored_by_length<ignore>,                     /* AT_LIST_ACTION_CLASS */
    stored_by_length<ignore>,                     /* AT_LIST_ACTION_RSRC */
    stored_by<store_permission>,                  /* AT_PERMISSION */
};

} // namespace

void store_value(const attr_line &line) {
    if (line.attr.ta_type < 0 || line.attr.ta_type >= AT_COUNT)
        source_error(line.cx, MSG_UNKNOWN_ATTRIBUTE_TYPE);
    handlers[static_cast<size_t>(line.attr.ta_type)](line.cx, line.attr, line.value, line.length);
}
