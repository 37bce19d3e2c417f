/**
 * @file
 * The data types of a class definition database, its 8-byte value cell, and the layouts of the values that are stored
 * outside of the cell.
 *
 * These are plain declarations for programs that map a database. The header compiles alone, as C11 and as C++20.
 */
#ifndef CDGEN_VX_H
#define CDGEN_VX_H

#include <stddef.h>
#include <stdint.h>

/** One spelling of a compile-time check for both languages. */
#ifdef __cplusplus
#define VX_ASSERT(condition) static_assert(condition, #condition)
#else
#define VX_ASSERT(condition) _Static_assert(condition, #condition)
#endif
/** A compile-time check of a record's size, in bytes. */
#define VX_ASSERT_SIZE(type, size) VX_ASSERT(sizeof(type) == (size))
/** A compile-time check of where a field is, in bytes from the start of its record. */
#define VX_ASSERT_OFFSET(type, field, where) VX_ASSERT(offsetof(type, field) == (where))

/** Makes enumerations 32 bits wide. In a file, a field of such a type may have any value. */
#ifdef __cplusplus
#define VX_ENUM_32 : uint32_t
#else
#define VX_ENUM_32
#endif

typedef int8_t vx_int8_t;                   /**< 8 bits, two's complement */
typedef int16_t vx_int16_t;                 /**< 16 bits, two's complement */
typedef uint16_t vx_uint16_t;               /**< 16 bits, unsigned */
typedef int32_t vx_int32_t;                 /**< 32 bits, two's complement */
typedef uint32_t vx_uint32_t;               /**< 32 bits, unsigned */
typedef int64_t vx_int64_t;                 /**< 64 bits, two's complement */
typedef uint64_t vx_uint64_t;               /**< 64 bits, unsigned */
typedef float vx_float32_t;                 /**< IEEE 754 single */
typedef double vx_float64_t;                /**< IEEE 754 double */
typedef char vx_char_t;                     /**< a byte of text */
typedef vx_uint16_t vx_resource_class_id_t; /**< a class number */

VX_ASSERT_SIZE(vx_float32_t, 4);
VX_ASSERT_SIZE(vx_float64_t, 8);

/** The type of a value. An array type is its element type plus 11 (Int32 to SD: 2..11, their arrays: 13..22); there is
 * no array of structured byte strings. Stored as 32 bits. */
typedef enum vx_data_type VX_ENUM_32 {
    VX_UNKNOWN = 0, /**< no valid type; also the result of looking up an unknown name */
    VX_NONE = 1,    /**< no value */
    VX_INT32 = 2,
    VX_UINT32 = 3,
    VX_INT64 = 4,
    VX_UINT64 = 5,
    VX_FLOAT32 = 6,
    VX_FLOAT64 = 7,
    VX_CHAR_PTR = 8,         /**< NUL-terminated string, out of line */
    VX_BINARY_PTR = 9,       /**< vx_binary_t, out of line */
    VX_RSRC_HANDLE_PTR = 10, /**< vx_resource_handle_t, out of line */
    VX_SD_PTR = 11,          /**< vx_structured_data_t, out of line */
    VX_SBS_PTR = 12,         /**< vx_sbs_t, out of line; the compiler refuses values of it */
    VX_INT32_ARRAY = 13,     /**< this and all that follow: vx_array_t, out of line */
    VX_UINT32_ARRAY = 14,
    VX_INT64_ARRAY = 15,
    VX_UINT64_ARRAY = 16,
    VX_FLOAT32_ARRAY = 17,
    VX_FLOAT64_ARRAY = 18,
    VX_CHAR_PTR_ARRAY = 19,
    VX_BINARY_PTR_ARRAY = 20,
    VX_RSRC_HANDLE_PTR_ARRAY = 21,
    VX_SD_PTR_ARRAY = 22
} vx_data_type_t;
VX_ASSERT_SIZE(vx_data_type_t, 4);

/** How a dynamic attribute varies. Stored as 32 bits. */
typedef enum orb_variable_type VX_ENUM_32 {
    ORB_COUNTER = 0,
    ORB_QUANTITY = 1,
    ORB_STATE = 2,
    ORB_QUANTUM = 3
} orb_variable_type_t;
VX_ASSERT_SIZE(orb_variable_type_t, 4);

/** A binary. The compiler does not put the data directly after the length, but at offset 8, in a piece of their own. A
 * binary without bytes has a zero byte there, or is eight zero bytes altogether. */
typedef struct vx_binary {
    vx_uint32_t length; /**< bytes of data */
    vx_char_t data[1];  /**< see above */
} vx_binary_t;
VX_ASSERT_SIZE(vx_binary_t, 8);
VX_ASSERT_OFFSET(vx_binary_t, data, 4);

/** The four numbers of a resource handle. */
typedef struct vx_resource_id {
    vx_uint32_t id1; /**< first number */
    vx_uint32_t id2; /**< second number */
    vx_uint32_t id3; /**< third number */
    vx_uint32_t id4; /**< fourth number */
} vx_resource_id_t;
VX_ASSERT_SIZE(vx_resource_id_t, 16);

/** A resource handle. The compiler stores only zeros. */
typedef struct vx_resource_handle {
    vx_uint32_t header;  /**< 0 */
    vx_resource_id_t id; /**< zeros */
} vx_resource_handle_t;
VX_ASSERT_SIZE(vx_resource_handle_t, 20);
VX_ASSERT_OFFSET(vx_resource_handle_t, id, 4);

/** The type of one field of a structured byte string; see sbs_field.sb_field_type. */
typedef enum vx_sbs_field_data_type {
    VX_SF_INT32 = 0,
    VX_SF_FLOAT32 = 1,
    VX_SF_STRING = 2,
    VX_SF_BINARY = 3
} vx_sbs_field_data_type_t;

/** One field of a structured byte string. */
typedef struct vx_sbs_field {
    vx_int16_t field_length; /**< bytes of data */
    vx_int8_t field_dtype;   /**< vx_sbs_field_data_type_t */
    vx_int8_t field_sn;      /**< serial number */
    vx_char_t field_data[1]; /**< the data */
} vx_sbs_field_t;
VX_ASSERT_SIZE(vx_sbs_field_t, 6);
VX_ASSERT_OFFSET(vx_sbs_field_t, field_data, 4);

/** Structured byte string; declared for readers, never produced. */
typedef struct vx_sbs {
    vx_int32_t length;     /**< bytes of the fields */
    vx_sbs_field_t field1; /**< the first field; the others follow */
} vx_sbs_t;
VX_ASSERT_OFFSET(vx_sbs_t, field1, 4);

typedef struct vx_structured_data vx_structured_data_t; /**< structured data */
typedef struct vx_array vx_array_t;                     /**< an array */

typedef vx_char_t *vx_char_ptr_t;                       /**< String, in memory */
typedef vx_binary_t *vx_binary_ptr_t;                   /**< Binary, in memory */
typedef vx_resource_handle_t *vx_resource_handle_ptr_t; /**< RH, in memory */
typedef vx_structured_data_t *vx_sd_ptr_t;              /**< SD, in memory */
typedef vx_sbs_t *vx_sbs_ptr_t;                         /**< SBS, in memory */
typedef vx_array_t *vx_array_ptr_t;                     /**< an array, in memory */

/**
 * The value cell. In a database an out-of-line value is stored as its byte offset from the start of the owning class's
 * string table, in val_uint32; all ones mean that there is no value. Ignore the other four bytes of such a cell.
 * Numbers of 32 bits are in the first four bytes, numbers of 64 bits in all eight. The pointers are for programs that
 * keep values in memory.
 */
typedef union vx_value {
    vx_int32_t val_int32;                     /**< Int32 */
    vx_uint32_t val_uint32;                   /**< UInt32; for an out-of-line value its offset */
    vx_int64_t val_int64;                     /**< Int64 */
    vx_uint64_t val_uint64;                   /**< UInt64 */
    vx_float32_t val_float32;                 /**< Float32 */
    vx_float64_t val_float64;                 /**< Float64 */
    vx_char_ptr_t ptr_char;                   /**< String, in memory */
    vx_binary_ptr_t ptr_binary;               /**< Binary, in memory */
    vx_resource_handle_ptr_t ptr_rsrc_handle; /**< RH, in memory */
    vx_sd_ptr_t ptr_sd;                       /**< SD, in memory */
    vx_sbs_ptr_t ptr_sbs;                     /**< SBS, in memory */
    vx_array_ptr_t ptr_array;                 /**< arrays, in memory */
} vx_value_t;
VX_ASSERT_SIZE(vx_value_t, 8);

/** One element of structured data. */
typedef struct vx_structured_data_element {
    vx_data_type_t data_type; /**< of value */
    vx_uint32_t pad;          /**< 0 */
    vx_value_t value;         /**< of the element */
} vx_structured_data_element_t;
VX_ASSERT_SIZE(vx_structured_data_element_t, 16);
VX_ASSERT_OFFSET(vx_structured_data_element_t, pad, 4);
VX_ASSERT_OFFSET(vx_structured_data_element_t, value, 8);

/** Structured data. n elements take 24 + 16 * (n - 1) bytes; no elements take 24 too. */
struct vx_structured_data {
    vx_uint32_t element_count;                /**< number of elements */
    vx_uint32_t pad;                          /**< 0 */
    vx_structured_data_element_t elements[1]; /**< element_count elements */
};
VX_ASSERT_SIZE(vx_structured_data_t, 24);
VX_ASSERT_OFFSET(vx_structured_data_t, elements, 8);

/** An array. n elements take 8 * (n + 1) bytes. Each is a cell of the element type. */
struct vx_array {
    vx_uint32_t element_count; /**< number of elements */
    vx_uint32_t pad;           /**< 0 */
    vx_value_t elements[1];    /**< element_count elements */
};
VX_ASSERT_SIZE(vx_array_t, 16);
VX_ASSERT_OFFSET(vx_array_t, elements, 8);

#endif
