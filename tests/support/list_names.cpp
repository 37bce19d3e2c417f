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
 *   meaning STANZA ATTRIBUTE TEXT, and with stanza, value, default or word in the place of the stanza
 *
 * FORM is the form of the value, as the language's document calls it: words, or nothing where every value is refused.
 */

#include "cdb_fields.h"
#include "compiler/cdgen.h"
#include "language/meanings.h"

#include <cstdio>
#include <string>
#include <string_view>

namespace {

/* "KIND NAME text", without line breaks. */
void list_meaning(const char *of, std::string_view name, std::string_view text, std::string_view without = {}) {
    std::string line = std::string("meaning ").append(of).append(" ").append(name).append(" ").append(text);
    if (!without.empty())
        line.append("; without this line ").append(without);
    std::puts(line.c_str());
}

void list_stanzas() {
    for (const srtable_ctrl &stanza : std::span(sc_tables).first(SC_COUNT))
        std::printf("stanza %s\n", stanza.sc_name);
    for (const srtable_ctrl &stanza : std::span(sc_tables).first(SC_COUNT))
        for (const table_attrs &attr : stanza.sc_attrs)
            std::printf("attribute %s %s %s %s %s\n", stanza.sc_name, attr.ta_name,
                        (attr.req_bit & OPTIONAL) != 0 ? "optional" : "required",
                        attr.dup_allowed != 0 ? "repeats" : "once", language::form_of(attr.ta_type).name.data());
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

void list_meanings() {
    for (const srtable_ctrl &stanza : std::span(sc_tables).first(SC_COUNT)) {
        list_meaning("stanza", stanza.sc_name, language::meaning_of(stanza));
        for (const table_attrs &attr : stanza.sc_attrs) {
            const language::attribute_meaning &row = language::meaning_of(stanza, attr);
            list_meaning(stanza.sc_name, attr.ta_name, row.meaning, row.without);
        }
    }
    for (const char *name : vxTypeStr)
        if (const language::type_meaning *type = language::type_called(name)) {
            list_meaning("value", name, type->value);
            list_meaning("default", name, type->without);
        }
    for (const char *variable : vxVarStr)
        list_meaning("word", variable, language::meaning_of_word(variable));
    for (const props_t &property : pa_props)
        list_meaning("word", property.s, language::meaning_of_word(property.s));
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
    list_meanings();
    list_records();
    return std::fflush(stdout) != 0;
}
