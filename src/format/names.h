/* names.h: how a class definition source spells data types, variable types, properties and permissions. The
 * compiler reads them, the inspector writes them. */
#ifndef CDGEN_CDB_NAMES_H
#define CDGEN_CDB_NAMES_H

#include "cdb.h"

#include <iterator>
#include <span>

/* Data types: names, and the types they stand for. */
inline constexpr const char *vxTypeStr[] = {
    "UNKNOWN",      "None",        "Int32",       "UInt32",     "Int64",       "UInt64",
    "Float32",      "Float64",     "String",      "Binary",     "RH",          "SD",
    "SBS",          "Int32Array",  "UInt32Array", "Int64Array", "UInt64Array", "Float32Array",
    "Float64Array", "StringArray", "BinaryArray", "RHArray",    "SDArray",
};
inline constexpr vx_data_type_t vxTypeMap[] = {
    VX_UNKNOWN,
    VX_NONE,
    VX_INT32,
    VX_UINT32,
    VX_INT64,
    VX_UINT64,
    VX_FLOAT32,
    VX_FLOAT64,
    VX_CHAR_PTR,
    VX_BINARY_PTR,
    VX_RSRC_HANDLE_PTR,
    VX_SD_PTR,
    VX_SBS_PTR,
    VX_INT32_ARRAY,
    VX_UINT32_ARRAY,
    VX_INT64_ARRAY,
    VX_UINT64_ARRAY,
    VX_FLOAT32_ARRAY,
    VX_FLOAT64_ARRAY,
    VX_CHAR_PTR_ARRAY,
    VX_BINARY_PTR_ARRAY,
    VX_RSRC_HANDLE_PTR_ARRAY,
    VX_SD_PTR_ARRAY,
};
static_assert(std::size(vxTypeStr) == std::size(vxTypeMap));

/* Variable types, likewise. */
inline constexpr const char *vxVarStr[] = {"Counter", "Quantity", "State", "Quantum"};
inline constexpr orb_variable_type_t vxVarMap[] = {ORB_COUNTER, ORB_QUANTITY, ORB_STATE, ORB_QUANTUM};
static_assert(std::size(vxVarStr) == std::size(vxVarMap));

/* A property name and its bit. */
struct props_t {
    char s[20];
    vx_uint32_t p;
};

/* A permission letter and its mask. */
struct valid_perms_t {
    char permission;
    vx_uint32_t mask;
};

/* The properties of classes, persistent attributes, dynamic attributes and actions. */
inline constexpr props_t rc_props[] = {
    {"MtypDivided", 0x2000},     {"MtypCentral", 0x4000},     {"MtypGlobal", 0x8000},  {"ORBElectCoord", 0x100},
    {"HasResources", 0x2},       {"HasConstraints", 0x80},    {"CanControl", 0x4},     {"CanDefine", 0x8},
    {"JoinPhase0", 0x10},        {"JoinPhase1", 0x20},        {"SupportsMove", 0x200}, {"CanBatchDefine", 0x400},
    {"CanBatchUndefine", 0x800}, {"CanBatchSetAttr", 0x1000}, {"HasIWAccess", 0x1},    {"QryReqsMonitoring", 0x20000},
    {"CanLiveUpdate", 0x40000},
};
inline constexpr int rc_props_cnt = std::size(rc_props);

inline constexpr vx_uint32_t REQD_FOR_DEFINE = 0x2;
inline constexpr vx_uint32_t INVAL_FOR_DEFINE = 0x4; /* what the compiler sets if none of the three is given */
inline constexpr vx_uint32_t OPT_FOR_DEFINE = 0x8;
inline constexpr props_t pa_props[] = {
    {"Public", 0x20},
    {"Select", 0x10},
    {"ReqdForDefine", REQD_FOR_DEFINE},
    {"OptForDefine", OPT_FOR_DEFINE},
    {"InvalForDefine", INVAL_FOR_DEFINE},
    {"ReadOnly", 0x1},
};
inline constexpr int pa_props_cnt = std::size(pa_props);

inline constexpr props_t da_props[] = {{"Public", 0x20}, {"QryReqsMonitoring", 0x40}};
inline constexpr int da_props_cnt = std::size(da_props);

inline constexpr props_t act_props[] = {{"Public", 0x2}, {"LongRun", 0x1}};
inline constexpr int act_props_cnt = std::size(act_props);

inline constexpr valid_perms_t perm_list[] = {
    {'q', 0x1},  {'l', 0x2},  {'e', 0x4},  {'v', 0x8},   {'d', 0x10},
    {'c', 0x20}, {'s', 0x40}, {'o', 0x80}, {'a', 0x100}, {'x', 0x200},
};
inline constexpr int num_perm_list = std::size(perm_list);
inline constexpr vx_uint32_t DEFAULT_PERMISSION = 0x40; /* s: of an action without a Permission line */

/* ---- Bits as spellings ------------------------------------------------------------------------------------------ */

/* The letter of a permission; '\0' if no single letter has this mask. */
constexpr char permission_letter(vx_uint32_t mask) {
    for (const valid_perms_t &known : perm_list)
        if (known.mask == mask)
            return known.permission;
    return '\0';
}

/* Passes the name of each property in the set to take(const char *), in the order of the table. Returns the bits that
 * have no name. */
template <class Take>
constexpr vx_uint32_t take_properties(vx_uint32_t set, std::span<const props_t> known, Take take) {
    for (const props_t &property : known)
        if ((set & property.p) != 0) {
            take(property.s);
            set &= ~property.p;
        }
    return set;
}

#endif
