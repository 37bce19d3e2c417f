/* note_attribute.cpp: notes what an attribute line gives, once the compiler has taken it. */

#include "check/numbers.h"
#include "check/recovery.h"

namespace check {

void recovery::note_mapping_or_variable_class(bool first) {
    std::string_view name = name_of(see.attr());
    if (known.kind == SC_CLASS_TO_MANAGER_MAPPING)
        known.map_values.push_back({see.value_place(), std::string(name), std::string(line.raw)});
    else if (first && name == "VariableClass" && compiler.output() != nullptr)
        known.variable_classes.add(see.value_place(), line.raw);
}

/* In place, since this is done for each attribute and element. */
void recovery::note_data_type() {
    mention &given = known.stanza().data_type;
    given.at = see.value_place();
    given.text = see.value();
    given.source = line.raw;
    bool odd = compiler.data_type() == VX_UNKNOWN || given.text == "SBS";
    if (see.attr().ta_type == AT_SD_DATA_TYPE && odd && compiler.run_makes_value())
        element_run::add(known.run.odd_types, given);
}

void recovery::declare_name() {
    std::string_view attr = name_of(see.attr());
    bool is_variable_class = attr == "VariableClass" && known.kind == SC_RESOURCE_VARIABLE_CLASS;
    bool is_name = attr == "Name" || attr == "ElementName";
    if (!is_variable_class && (!is_name || known.kind == SC_RESOURCE_CLASS))
        return;
    int &first = known.declared.names[index_of(known.kind)].line_of(see.value());
    known.declared.earlier_name = first;
    if (first == 0)
        first = line.number;
}

/* Text that is not a number does not count as an Id; there is another warning for it. */
void recovery::declare_id() {
    known.declared.earlier_id = 0;
    number n(see.value(), 0);
    if (n.read == 0)
        return;
    number_lines &ids = known.declared.ids[index_of(known.kind)];
    known.declared.earlier_id = ids.add(static_cast<vx_uint32_t>(n.value), line.number);
}

void recovery::note_refused(const std::optional<int> &attr_type) {
    compiler.set_broken(known.kind);
    known.stanza().refused.add(attr_type);
}

/* Gives the compiler a text instead of the current line, of which an error has been reported. */
void recovery::take_quietly(std::string_view text, size_t added) {
    try {
        compiler.take_attribute(line.replaced(text, added));
        note_given();
        if (compiler.latest().attr != nullptr && !known.stanza().misplaced)
            note_value();
    } catch (const fatal_exit &) {
        const table_attrs *attr = compiler.latest().attr;
        note_refused(attr == nullptr ? std::nullopt : std::optional(attr->ta_type));
    }
}

} // namespace check
