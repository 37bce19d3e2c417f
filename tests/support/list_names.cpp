/* list_names: prints every name that the language and the format have, one a line, for tests and generators that hold
 * documents, completions and editor files against them. The first word says what the rest is:
 *
 *   stanza NAME
 *   attribute STANZA NAME required|optional once|repeats FORM
 *   property class|persistent|dynamic|action NAME BIT
 *   permission LETTER MASK
 *   type NAME
 *   variable NAME
 *   field RECORD NAME
 *
 * FORM is the form of the value, as the language's document calls it: words, or nothing where every value is refused.
 */

#include "cdb_fields.h"
#include "compiler/cdgen.h"

#include <cstdio>

namespace {

struct form {
    int type; /* attr_type */
    const char *name;
};

constexpr form forms[] = {
    {AT_UINT16, "number16"},
    {AT_VALUE_DISPLAY, "number16"},
    {AT_SD_DESCRIPTION, "number16"},
    {AT_SD_DISPLAY, "number16"},
    {AT_SD_VALUE_DISPLAY, "number16"},
    {AT_ID, "number32"},
    {AT_STRING, "text"},
    {AT_MANAGER, "text"},
    {AT_LOCATOR, "text"},
    {AT_SD_NAME, "text"},
    {AT_CLASS_PROPS, "names"},
    {AT_PATTR_PROPS, "names"},
    {AT_DATTR_PROPS, "names"},
    {AT_ACTION_PROPS, "names"},
    {AT_VERSION, "version"},
    {AT_VARIETY, "low,high"},
    {AT_RANGE, "two values with ,: low,high"},
    {AT_DATA_TYPE, "type"},
    {AT_SD_DATA_TYPE, "type"},
    {AT_VARIABLE_TYPE, "Counter, Quantity, State or Quantum"},
    {AT_DEFAULT_VALUE, "value"},
    {AT_INITIAL_VALUE, "value"},
    {AT_VALID_VALUE, "value(s)"},
    {AT_SD_VALID_VALUE, "value(s)"},
    {AT_SD_INDEX, "decimal number"},
    {AT_PERMISSION, "a letter"},
    {AT_PERM_TEMPLATE, "anything"},
    {AT_LIST_ACTION_CLASS, "anything"},
    {AT_LIST_ACTION_RSRC, "anything"},
    {AT_SD_DEFAULT_VALUE, ""},
};

const char *form_of(int type) {
    for (const form &f : forms)
        if (f.type == type)
            return f.name;
    return "of no name";
}

void list_stanzas() {
    for (const srtable_ctrl &stanza : std::span(sc_tables).first(SC_COUNT))
        std::printf("stanza %s\n", stanza.sc_name);
    for (const srtable_ctrl &stanza : std::span(sc_tables).first(SC_COUNT))
        for (const table_attrs &attr : stanza.sc_attrs)
            std::printf("attribute %s %s %s %s %s\n", stanza.sc_name, attr.ta_name,
                        (attr.req_bit & OPTIONAL) != 0 ? "optional" : "required",
                        attr.dup_allowed != 0 ? "repeats" : "once", form_of(attr.ta_type));
}

void list_properties(const char *of, std::span<const props_t> props) {
    for (const props_t &prop : props)
        std::printf("property %s %s 0x%x\n", of, prop.s, prop.p);
}

void list_words() {
    list_properties("class", rc_props);
    list_properties("persistent", pa_props);
    list_properties("dynamic", da_props);
    list_properties("action", act_props);
    for (const valid_perms_t &perm : perm_list)
        std::printf("permission %c 0x%x\n", perm.permission, perm.mask);
    for (vx_data_type_t type : vxTypeMap)
        if (type != VX_UNKNOWN) /* which no source may name */
            std::printf("type %s\n", vxTypeStr[type]);
    for (const char *variable : vxVarStr)
        std::printf("variable %s\n", variable);
}

void list_fields(const char *record, std::span<const cdb::field> fields) {
    for (const cdb::field &f : fields)
        std::printf("field %s %.*s\n", record, static_cast<int>(f.name.size()), f.name.data());
}

void list_records() {
    list_fields("orb_cdb_header_t", cdb::cdb_header_fields);
    list_fields("cdb_dsect_anchor_t", cdb::cdb_dsect_anchor_fields);
    list_fields("rsrc_class_t", cdb::class_fields);
    list_fields("rsrc_pattr_t", cdb::pattr_fields);
    list_fields("rsrc_dattr_t", cdb::dattr_fields);
    list_fields("rsrc_action_t", cdb::action_fields);
    list_fields("rsrc_error_t", cdb::error_fields);
    list_fields("rsrc_depend_t", cdb::depend_fields);
    list_fields("variety_list_t", cdb::variety_list_fields);
    list_fields("vl_entry_t", cdb::vl_entry_fields);
    list_fields("valid_values_t", cdb::valid_values_fields);
    list_fields("vv_entry_t", cdb::vv_entry_fields);
    list_fields("sd_def_t", cdb::sd_def_fields);
    list_fields("sd_field_t", cdb::sd_field_fields);
    list_fields("sbs_def_t", cdb::sbs_def_fields);
    list_fields("sbs_field_t", cdb::sbs_field_fields);
    list_fields("rsrc_mgr_t", cdb::mgr_fields);
    list_fields("rsrc_cmmap_t", cdb::cmmap_fields);
    list_fields("ctx_tmplt_t", cdb::ctx_tmplt_fields);
    list_fields("rsrc_variable_class_t", cdb::variable_class_fields);
    list_fields("rsrc_class_hash_t", cdb::class_hash_fields);
    list_fields("rc_hash_block_t", cdb::rc_hash_block_fields);
    list_fields("vx_array_t", cdb::array_fields);
    list_fields("vx_structured_data_t", cdb::structured_data_fields);
    list_fields("vx_structured_data_element_t", cdb::structured_data_element_fields);
}

} // namespace

int main() {
    list_stanzas();
    list_words();
    list_records();
    return std::fflush(stdout) != 0;
}
