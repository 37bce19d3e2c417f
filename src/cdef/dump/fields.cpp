/* fields.cpp: what the fields of records mean. */

#include "cdef/dump/dump.h"

#include "format/names.h"
#include "text/append.h"
#include "text/hex.h"

#include <chrono>

namespace cdef::dump {

namespace {

template <class Record>
constexpr record_format describe(std::string_view record, std::string_view name_field = {},
                                 std::size_t size = sizeof(Record)) {
    return {record, cdb::fields_of<Record>, size, name_field};
}

constexpr record_format formats[] = {
    describe<orb_cdb_header_t>("orb_cdb_header_t"),
    describe<cdb_dsect_anchor_t>("cdb_dsect_anchor_t"),
    describe<rsrc_class_t>("rsrc_class_t", "u_rc_name"),
    describe<rsrc_pattr_t>("rsrc_pattr_t", "u_ra_name"),
    describe<rsrc_dattr_t>("rsrc_dattr_t", "u_ra_name"),
    describe<rsrc_action_t>("rsrc_action_t", "u_ac_name"),
    describe<rsrc_error_t>("rsrc_error_t", "u_re_name"),
    describe<rsrc_depend_t>("rsrc_depend_t"),
    describe<variety_list_t>("variety_list_t", {}, offsetof(variety_list_t, vl_values)),
    describe<vl_entry_t>("vl_entry_t"),
    describe<valid_values_t>("valid_values_t", {}, offsetof(valid_values_t, vv_values)),
    describe<vv_entry_t>("vv_entry_t"),
    describe<sd_def_t>("sd_def_t", {}, offsetof(sd_def_t, sd_fields)),
    describe<sd_field_t>("sd_field_t", "u_sd_field_name"),
    describe<rsrc_mgr_t>("rsrc_mgr_t", "u_rm_RMname"),
    describe<rsrc_cmmap_t>("rsrc_cmmap_t"),
    describe<rsrc_variable_class_t>("rsrc_variable_class_t", "u_rvc_name"),
    describe<rsrc_class_hash_t>("rsrc_class_hash_t", {}, offsetof(rsrc_class_hash_t, rc_hash_blocks)),
    describe<rc_hash_block_t>("rc_hash_block_t"),
    describe<vx_array_t>("vx_array_t", {}, offsetof(vx_array_t, elements)),
    describe<vx_structured_data_t>("vx_structured_data_t", {}, offsetof(vx_structured_data_t, elements)),
    describe<vx_structured_data_element_t>("vx_structured_data_element_t"),
};

struct special {
    std::string_view record;
    std::string_view field;
    meaning as;
};

using enum meaning;

/* Every field that is not a plain number or a reference to what its row in cdb_fields.h says. */
constexpr special specials[] = {
    {"orb_cdb_header_t", "cdb_hdr_checksum", CHECKSUM},
    {"orb_cdb_header_t", "cdb_hdr_format", MARK},
    {"orb_cdb_header_t", "cdb_hdr_timestamp.tv_sec", TIME},
    {"cdb_dsect_anchor_t", "cda_type", SECTION_TYPE},
    {"cdb_dsect_anchor_t", "cda_offset", OFFSET},
    {"rsrc_class_t", "rc_cb_ID", MARK},
    {"rsrc_class_t", "rc_props", CLASS_PROPERTIES},
    {"rsrc_class_t", "u_rc_errors", UNUSED},
    {"rsrc_class_t", "u_rc_depends", UNUSED},
    {"rsrc_class_t", "u_rc_sbs_defs", UNUSED},
    {"rsrc_class_t", "rc_perm_temp", BITS},
    {"rsrc_class_t", "rc_perm_tempC", BITS},
    {"rsrc_class_t", "rc_locator", LOCATOR},
    {"rsrc_class_t", "rc_version", VERSION},
    {"rsrc_pattr_t", "ra_cb_ID", MARK},
    {"rsrc_pattr_t", "ra_props", PERSISTENT_PROPERTIES},
    {"rsrc_pattr_t", "ra_group_msgid", NONE_IS_0},
    {"rsrc_pattr_t", "ra_group_id", NONE_IS_255},
    {"rsrc_pattr_t", "ra_attr_id", SIGNED},
    {"rsrc_pattr_t", "ra_data_type", DATA_TYPE},
    {"rsrc_pattr_t", "ra_max_sd_idx", NONE_IS_65535},
    {"rsrc_dattr_t", "ra_cb_ID", MARK},
    {"rsrc_dattr_t", "ra_props", DYNAMIC_PROPERTIES},
    {"rsrc_dattr_t", "u_ra_vclass", UNUSED},
    {"rsrc_dattr_t", "u_ra_next_in_vclass", UNUSED},
    {"rsrc_dattr_t", "u_ra_ZAV_name", UNUSED},
    {"rsrc_dattr_t", "ra_data_type", DATA_TYPE},
    {"rsrc_dattr_t", "ra_var_type", VARIABLE_TYPE},
    {"rsrc_dattr_t", "ra_group_msgid", NONE_IS_0},
    {"rsrc_dattr_t", "ra_group_id", NONE_IS_255},
    {"rsrc_dattr_t", "ra_attr_id", SIGNED},
    {"rsrc_dattr_t", "ra_max_sd_idx", NONE_IS_65535},
    {"rsrc_dattr_t", "ra_expr_desc", NONE_IS_0},
    {"rsrc_dattr_t", "ra_rearm_desc", NONE_IS_0},
    {"rsrc_action_t", "ac_cb_ID", MARK},
    {"rsrc_action_t", "ac_action_id", SIGNED},
    {"rsrc_action_t", "ac_props", ACTION_PROPERTIES},
    {"rsrc_action_t", "ac_confirm_msgid", NONE_IS_0},
    {"rsrc_action_t", "ac_timeout", NONE_IS_0},
    {"rsrc_action_t", "ac_perms", PERMISSIONS},
    {"rsrc_error_t", "re_cb_ID", MARK},
    {"rsrc_error_t", "re_error_id", SIGNED},
    {"rsrc_error_t", "re_props", BITS},
    {"rsrc_error_t", "re_perms", PERMISSIONS},
    {"rsrc_depend_t", "rd_cb_ID", MARK},
    {"variety_list_t", "vl_cb_ID", MARK},
    {"valid_values_t", "vv_cb_ID", MARK},
    {"vv_entry_t", "vv_disp_msgid", NONE_IS_0},
    {"sd_def_t", "sd_cb_ID", MARK},
    {"sd_field_t", "sd_field_type", DATA_TYPE},
    {"rsrc_mgr_t", "rm_cb_ID", MARK},
    {"rsrc_mgr_t", "u_rm_strings_table", UNUSED},
    {"rsrc_cmmap_t", "rcm_cb_ID", MARK},
    {"rsrc_cmmap_t", "rcm_rm_ID", MANAGER},
    {"rsrc_variable_class_t", "rvc_cb_ID", MARK},
    {"rsrc_class_hash_t", "rch_cb_ID", MARK},
    {"vx_structured_data_element_t", "data_type", DATA_TYPE},
};

consteval bool has_field(std::string_view record, std::string_view name) {
    for (const record_format &format : formats)
        for (const cdb::field &f : format.fields)
            if (format.record == record && f.name == name)
                return true;
    return false;
}

consteval bool all_fields_exist() {
    for (const special &s : specials)
        if (!has_field(s.record, s.field))
            return false;
    for (const record_format &format : formats)
        if (!format.name_field.empty() && !has_field(format.record, format.name_field))
            return false;
    return true;
}
static_assert(all_fields_exist());

constexpr std::string_view section_types[] = {"CDB_DSECT_UNUSED",   "CDB_DSECT_EMPTY",     "CDB_DSECT_TBL_CNTRS",
                                              "CDB_DSECT_RSRC_MGR", "CDB_DSECT_VAR_CLASS", "CDB_DSECT_CLASS",
                                              "CDB_DSECT_CMMAP",    "CDB_DSECT_CLASS_HASH"};
static_assert(section_types[CDB_DSECT_CLASS_HASH] == "CDB_DSECT_CLASS_HASH");

/* The bits' names, the lowest first; what has no name follows as one number. */
template <class NameOf> words names_of(std::uint32_t set, NameOf name_of) {
    words names;
    std::uint32_t unknown = 0;
    for (std::uint32_t bit = 1; bit != 0; bit <<= 1) {
        std::string name = (set & bit) != 0 ? name_of(bit) : std::string();
        if (!name.empty())
            names.list.push_back(std::move(name));
        else
            unknown |= set & bit;
    }
    if (unknown != 0)
        names.list.push_back(text::hex(unknown));
    return names;
}

words properties(std::span<const props_t> table, std::uint32_t set) {
    return names_of(set, [table](std::uint32_t bit) {
        auto found = std::find_if(table.begin(), table.end(), [bit](const props_t &p) { return p.p == bit; });
        return std::string(found == table.end() ? "" : found->s);
    });
}

words permissions(std::uint32_t set) {
    return names_of(set, [](std::uint32_t bit) {
        const auto *found = std::find_if(std::begin(perm_list), std::end(perm_list),
                                         [bit](const valid_perms_t &p) { return p.mask == bit; });
        std::string letter;
        if (found != std::end(perm_list))
            letter = found->permission;
        return letter;
    });
}

/* The characters of a mark, the first one in the highest byte. */
fact mark(std::uint32_t number) {
    std::string characters;
    for (int shift = 24; shift >= 0; shift -= 8)
        characters += static_cast<char>(number >> shift & 0xFF);
    bool readable = std::all_of(characters.begin(), characters.end(), [](char c) { return c > ' ' && c <= '~'; });
    if (readable)
        return word{characters};
    return bits{number};
}

fact time(std::uint32_t seconds) {
    using namespace std::chrono;
    if (seconds == 0)
        return none{};
    sys_seconds moment{std::chrono::seconds(seconds)};
    auto day = floor<days>(moment);
    year_month_day date(day);
    hh_mm_ss clock(moment - day);
    word w;
    text::appendf(w.text, "%04d-%02u-%02uT%02d:%02d:%02dZ", int{date.year()}, unsigned{date.month()},
                  unsigned{date.day()}, static_cast<int>(clock.hours().count()),
                  static_cast<int>(clock.minutes().count()), static_cast<int>(clock.seconds().count()));
    return w;
}

fact version(std::uint32_t number) {
    word w;
    text::appendf(w.text, "%u.%u.%u.%u", number >> 24, number >> 16 & 0xFF, number >> 8 & 0xFF, number & 0xFF);
    return w;
}

template <class Name> fact name_in(std::span<const Name> names, std::uint32_t number) {
    if (number < names.size())
        return word{std::string(names[number])};
    return bits{number};
}

fact number_or_none(std::uint32_t number, std::uint32_t no_number) {
    return number == no_number ? fact(none{}) : fact(std::uint64_t{number});
}

} // namespace

const std::span<const record_format> record_formats = formats;

const record_format &format_of(std::string_view record) {
    static constexpr record_format unknown = {};
    const auto *found = std::find_if(std::begin(formats), std::end(formats),
                                     [record](const record_format &f) { return f.record == record; });
    return found == std::end(formats) ? unknown : *found;
}

const cdb::field *find_field(const record_format &format, std::string_view name) {
    auto found = std::find_if(format.fields.begin(), format.fields.end(),
                              [name](const cdb::field &f) { return f.name == name; });
    return found == format.fields.end() ? nullptr : &*found;
}

meaning meaning_of(std::string_view record, const cdb::field &f) {
    for (const special &s : specials)
        if (s.field == f.name && s.record == record)
            return s.as;
    bool leads_to_facts = f.to != cdb::target::section && f.to != cdb::target::none;
    return f.kind == cdb::field_kind::reference && !leads_to_facts ? OFFSET : PLAIN;
}

std::uint32_t number_in(const cdb::bytes &area, std::size_t at, const cdb::field &f) {
    bool is_short = f.width == sizeof(std::uint16_t);
    return is_short ? area.number<std::uint16_t>(at + f.offset) : area.number<std::uint32_t>(at + f.offset);
}

fact fact_of(meaning as, std::uint32_t number) {
    switch (as) {
    case SIGNED:
        return std::int64_t{static_cast<std::int32_t>(number)};
    case BITS:
    case CHECKSUM:
        return bits{number};
    case MARK:
        return mark(number);
    case TIME:
        return time(number);
    case SECTION_TYPE:
        return name_in(std::span<const std::string_view>(section_types), number);
    case CLASS_PROPERTIES:
        return properties(rc_props, number);
    case PERSISTENT_PROPERTIES:
        return properties(pa_props, number);
    case DYNAMIC_PROPERTIES:
        return properties(da_props, number);
    case ACTION_PROPERTIES:
        return properties(act_props, number);
    case PERMISSIONS:
        return permissions(number);
    case DATA_TYPE:
        return name_in(std::span<const char *const>(vxTypeStr), number);
    case VARIABLE_TYPE:
        return name_in(std::span<const char *const>(vxVarStr), number);
    case VERSION:
        return version(number);
    case NONE_IS_0:
        return number_or_none(number, 0);
    case NONE_IS_255:
        return number_or_none(number, 255);
    case NONE_IS_65535:
    case LOCATOR:
        return number_or_none(number, 0xFFFF);
    case PLAIN:
    case MANAGER:
    case OFFSET:
    case UNUSED:
        break;
    }
    return std::uint64_t{number};
}

fact fact_of(const cdb::value &value) {
    if (!value.present())
        return none{};
    switch (value.type()) {
    case VX_INT32:
    case VX_INT64:
        return value.integer();
    case VX_UINT32:
    case VX_UINT64:
        return value.natural();
    case VX_FLOAT32:
        return static_cast<float>(value.real());
    case VX_FLOAT64:
        return value.real();
    case VX_CHAR_PTR:
        return any_text{value.text()};
    case VX_BINARY_PTR:
        return binary{value.binary()};
    default: /* of those with elements these are facts of their own */
        return value.handle();
    }
}

vx_data_type_t data_type_in(const record_format &format, const cdb::bytes &area, std::size_t at) {
    for (const cdb::field &f : format.fields)
        if (meaning_of(format.record, f) == DATA_TYPE)
            return static_cast<vx_data_type_t>(number_in(area, at, f));
    return VX_UNKNOWN;
}

cdb::class_tables tables_of(const cdb::database &db, std::size_t section) {
    cdb::bytes whole = db.section(section);
    auto strings_at = [&](std::size_t at, std::size_t size = SIZE_MAX) {
        return cdb::class_tables{
            .section = whole, .strings = whole.part(at, size), .valid_vals = {}, .variety_lists = {}, .sd_defs = {}};
    };
    switch (db.anchor(section).cda_type) {
    case CDB_DSECT_CLASS:
        return cdb::resource_class(whole).side_tables();
    case CDB_DSECT_RSRC_MGR:
        return strings_at(sizeof(rsrc_mgr_t));
    case CDB_DSECT_CMMAP:
        return strings_at(whole.record<rsrc_cmmap_t>(0).u_rcm_strings.offset[0]);
    case CDB_DSECT_VAR_CLASS:
        return strings_at(sizeof(rsrc_variable_class_t),
                          whole.record<rsrc_variable_class_t>(0).u_rvc_string_tbl.offset[0]);
    default:
        return strings_at(whole.size());
    }
}

const cdb::bytes &lists_of(const cdb::class_tables &tables, cdb::target to) {
    return to == cdb::target::variety_lists ? tables.variety_lists
           : to == cdb::target::valid_vals  ? tables.valid_vals
                                            : tables.sd_defs;
}

} // namespace cdef::dump
