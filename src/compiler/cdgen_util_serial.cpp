/* cdgen_util_serial.cpp: typed values into cells and string tables. */

#include "compiler/cdgen_values.h"

#include "compiler/cdgen_context.h"

namespace {

/* 100, the default upper bound, as a number of the type. */
vx_value_t hundred(vx_data_type_t type) {
    if (type == VX_FLOAT32)
        return {.val_float32 = 100.0F};
    if (type == VX_FLOAT64)
        return {.val_float64 = 100.0};
    if (number_width(type) == 8)
        return {.val_int64 = 100};
    return {.val_int32 = 100};
}

/* A value that is being written to a cell. */
struct encoding {
    cdgen &cx;
    const vx_value_t *in; /* TYPE_SAME and TYPE_16 only */
    vx_data_type_t type;  /* of the cell, never an array */
    int mode;             /* type_out_mode */
    tbl *strings;
    bool in_array; /* the cell is an array's */
};

void store_offset(vx_value_t &cell, vx_uint32_t offset) {
    memcpy(&cell, &offset, sizeof offset);
}

/* Stores the low 16 bits in the first two bytes. For integers outside arrays only. */
int encode_16(vx_value_t &cell, const encoding &e) {
    size_t width = number_width(e.type);
    if (width == 0 || e.type == VX_FLOAT32 || e.type == VX_FLOAT64 || e.in_array)
        return -1;
    auto narrow = static_cast<vx_uint16_t>(width == 4 ? e.in->val_uint32 : e.in->val_uint64);
    memcpy(&cell, &narrow, sizeof narrow);
    return 0;
}

int encode_number(vx_value_t &cell, const encoding &e) {
    vx_value_t zero = {};
    zero.val_uint64 = 0;
    switch (e.mode) {
    case TYPE_SAME:
        copy_number(cell, *e.in, e.type);
        return 0;
    case TYPE_16:
        return encode_16(cell, e);
    case R_HI_DEFAULT:
        copy_number(cell, hundred(e.type), e.type);
        return 0;
    default:
        copy_number(cell, zero, e.type);
        return 0;
    }
}

void append(vx_value_t &cell, const encoding &e, const void *data, size_t size) {
    store_offset(cell, add_to_tbl(e.cx, e.strings, data, size));
}

/* The length and the data are two pieces of the string table, each rounded up to 8 bytes. */
void append_binary(vx_value_t &cell, const encoding &e, const char *block) {
    vx_uint32_t length = 0;
    memcpy(&length, block, sizeof length);
    append(cell, e, &length, sizeof length);
    if (length == 0)
        add_to_tbl(e.cx, e.strings, "", 1);
    else
        add_to_tbl(e.cx, e.strings, block + sizeof length, length);
}

/* An empty string, or a binary of length 0; deliberately, the binary is one piece in a scalar and two in an array. */
void append_empty(vx_value_t &cell, const encoding &e) {
    constexpr char nothing[sizeof(vx_binary_t)] = {};
    if (e.type == VX_CHAR_PTR)
        append(cell, e, nothing, 1);
    else if (e.in_array)
        append_binary(cell, e, nothing);
    else
        append(cell, e, nothing, sizeof nothing);
}

int encode_text(vx_value_t &cell, const encoding &e) {
    switch (e.mode) {
    case TYPE_SAME:
        if (e.type == VX_CHAR_PTR)
            append(cell, e, e.in->ptr_char, strlen(e.in->ptr_char) + 1);
        else
            append_binary(cell, e, reinterpret_cast<const char *>(e.in->ptr_binary));
        return 0;
    case TYPE_16:
        return -1;
    case INIT_DEFAULT:
    case DFLT_DEFAULT:
        append_empty(cell, e);
        return 0;
    default:
        memset(&cell, 0xFF, sizeof cell);
        return 0;
    }
}

/* All zeros, whatever the value and the mode. */
int encode_handle(vx_value_t &cell, const encoding &e) {
    constexpr vx_resource_handle_t handle = {};
    append(cell, e, &handle, sizeof handle);
    return 0;
}

int encode(vx_value_t &cell, const encoding &e) {
    if (e.type == VX_RSRC_HANDLE_PTR)
        return encode_handle(cell, e);
    if (e.mode < TYPE_SAME || e.mode > R_HI_DEFAULT)
        return -1;
    if (e.type == VX_NONE)
        return 0;
    if (e.in == nullptr && e.mode <= TYPE_16) /* nothing to copy */
        return -1;
    return e.type == VX_CHAR_PTR || e.type == VX_BINARY_PTR ? encode_text(cell, e) : encode_number(cell, e);
}

/* Reserves bytes in the string table and returns their offset. */
vx_uint32_t reserve(cdgen &cx, tbl *str_tbl, size_t size) {
    auto *reserved = static_cast<char *>(alloc_tble(cx, str_tbl, round8(size)));
    return static_cast<vx_uint32_t>(reserved - str_tbl->tbl_base);
}

/* Arrays and structured data begin with their element count. */
vx_uint32_t count_element(tbl *str_tbl, vx_uint32_t container) {
    auto *count = record_at<vx_uint32_t>(str_tbl, container);
    return (*count)++;
}

/* Writes to a cell inside a table that may move while the value is made. */
template <class Write> auto with_cell(tbl *str_tbl, size_t offset, Write write) {
    vx_value_t cell = *record_at<vx_value_t>(str_tbl, offset);
    auto result = write(cell);
    *record_at<vx_value_t>(str_tbl, offset) = cell;
    return result;
}

/* Types that cannot be copied here are fatal. */
void refuse(vx_data_type_t type) {
    message_id message = type == VX_SD_PTR         ? MSG_SD_NOT_COPIED
                         : type == VX_SD_PTR_ARRAY ? MSG_SD_ARRAY_NOT_COPIED
                         : type == VX_SBS_PTR      ? MSG_SBS_TYPE
                                                   : NO_MESSAGE;
    if (message != NO_MESSAGE)
        cdgen_error_exit(message, nullptr, nullptr, 0, 1);
}

} // namespace

vx_uint32_t init_array(cdgen &cx, tbl *str_tbl, tbl_anchor *anchor, vx_uint32_t array_cnt, vx_value_t *out_data) {
    if (array_cnt == 0)
        cdgen_error_exit(MSG_NULL_ARRAY, nullptr, nullptr, 0, 1);
    if (!anchor->has_value()) {
        *anchor = reserve(cx, str_tbl, sizeof(vx_value_t) * (size_t{array_cnt} + 1));
        store_offset(*out_data, **anchor);
    }
    vx_uint32_t index = count_element(str_tbl, **anchor);
    return static_cast<vx_uint32_t>(**anchor + offsetof(vx_array_t, elements) + sizeof(vx_value_t) * index);
}

vx_uint32_t init_scalar_sd(cdgen &cx, tbl *str_tbl, tbl_anchor *anchor, vx_uint32_t sd_cnt, vx_value_t *out_data) {
    if (sd_cnt == 0) { /* always a new one */
        *anchor = reserve(cx, str_tbl, sizeof(vx_structured_data_t));
        store_offset(*out_data, **anchor);
        return **anchor;
    }
    if (!anchor->has_value()) {
        *anchor = reserve(cx, str_tbl,
                          sizeof(vx_structured_data_t) + sizeof(vx_structured_data_element_t) * (size_t{sd_cnt} - 1));
        store_offset(*out_data, **anchor);
    }
    vx_uint32_t index = count_element(str_tbl, **anchor);
    return static_cast<vx_uint32_t>(**anchor + offsetof(vx_structured_data_t, elements) +
                                    sizeof(vx_structured_data_element_t) * index);
}

vx_uint32_t init_array_sd(cdgen &cx, tbl *str_tbl, tbl_anchor *array_anchor, tbl_anchor *sd_anchor,
                          vx_uint32_t array_cnt, vx_uint32_t sd_cnt, vx_value_t *out_data) {
    if (array_cnt == 0)
        cdgen_error_exit(MSG_NULL_ARRAY, nullptr, nullptr, 0, 1);
    if (!array_anchor->has_value()) {
        *array_anchor = reserve(cx, str_tbl, sizeof(vx_value_t) * (size_t{array_cnt} + 1));
        store_offset(*out_data, **array_anchor);
    }
    /* Deliberate: such an array always holds one structured value, whatever its capacity. */
    *record_at<vx_uint32_t>(str_tbl, **array_anchor) = 1;
    return with_cell(str_tbl, **array_anchor + offsetof(vx_array_t, elements),
                     [&](vx_value_t &cell) { return init_scalar_sd(cx, str_tbl, sd_anchor, sd_cnt, &cell); });
}

int copy_this_type(cdgen &cx, vx_value_t *out_data, const vx_value_t *in_data, vx_data_type_t type_in, int type_out,
                   tbl *str_tbl, tbl_anchor *array_anchor, vx_uint32_t array_cnt) {
    if (type_out == TYPE_SAME && in_data != nullptr && copy_number(*out_data, *in_data, type_in))
        return 0;
    refuse(type_in);
    if (type_in <= VX_UNKNOWN || type_in > VX_SD_PTR_ARRAY)
        return -1;
    bool in_array = is_vx_array(type_in);
    encoding e = {cx, in_data, scalar_vx(type_in), type_out, str_tbl, in_array};
    if (!in_array)
        return encode(*out_data, e);
    vx_uint32_t slot = init_array(cx, str_tbl, array_anchor, array_cnt, out_data);
    return with_cell(str_tbl, slot, [&](vx_value_t &cell) { return encode(cell, e); });
}

int copy_this_sd_type(cdgen &cx, vx_value_t *out_data, vx_data_type_t type_in, int type_out, tbl *str_tbl,
                      sd_anchors *anchors, vx_uint32_t array_cnt, vx_data_type_t sd_type) {
    vx_uint32_t element = 0;
    if (sd_type == VX_SD_PTR)
        element = init_scalar_sd(cx, str_tbl, &anchors->sd_element, array_cnt, out_data);
    else if (sd_type == VX_SD_PTR_ARRAY)
        element = init_array_sd(cx, str_tbl, &anchors->sd_array, &anchors->sd_element, 1, array_cnt, out_data);
    else
        cdgen_error_exit(MSG_ONLY_SD_COPIED, nullptr, nullptr, 0, 1);
    if (array_cnt == 0)
        return 0;
    int result = with_cell(str_tbl, element + offsetof(vx_structured_data_element_t, value), [&](vx_value_t &cell) {
        return copy_this_type(cx, &cell, nullptr, type_in, type_out, str_tbl, &anchors->array, 1);
    });
    record_at<vx_structured_data_element_t>(str_tbl, element)->data_type = type_in;
    return result;
}
