/* stanzas.cpp: warnings about stanzas that are incomplete, or ended by the next class. */

#include "check/lacking.h"
#include "check/warnings/watcher.h"

namespace check {

namespace {

class incomplete : public watcher {
public:
    using watcher::watcher;

    void stanza_end(const view &see, int next_kind) override {
        language::name_list names = lacking_unnoticed(see, next_kind);
        if (names.empty())
            return;
        const stanza_record &stanza = see.known.stanza();
        report(stanza.header, stanza.source,
               language::quoted(table_of(see.known.kind).sc_name) + " lacks " + language::listed(names));
    }
};

class cut_short : public watcher {
public:
    using watcher::watcher;

    void before_step(const view &see, int next_kind) override {
        if (next_kind != SC_CONTROL_DEFINITION || !see.compiler.class_is_open() || see.known.class_forged)
            return;
        for (int kind : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE, SC_DYNAMIC_RESOURCE_ATTRIBUTE,
                         SC_DYNAMIC_CLASS_ATTRIBUTE})
            if (see.compiler.is_open(kind) && !see.compiler.is_broken(kind))
                report(see, see.line.all(),
                       "a second class ends the latest " + language::quoted(table_of(kind).sc_name) +
                           " unchecked and without its defaults",
                       {see.known.stanzas[index_of(kind)].header, "begun here"});
    }
};

/* If the output is known: a class that is named after it. If the output gives no valid name, the compiler reports it.
 */
class no_name : public watcher {
public:
    using watcher::watcher;

    /* Several steps at the end of the source come before the one that completes the class. */
    void before_step(const view &see, int next_kind) override {
        if (next_kind != SC_CONTROL_DEFINITION && next_kind != NO_KIND)
            return;
        std::string_view output = see.compiler.output() == nullptr ? "" : see.compiler.output();
        size_t suffix = output.find(".cdef");
        const stanza_record &stanza = see.known.class_stanza();
        if (suffix == output.npos || see.errors() > 0 || stanza.header.line == reported ||
            !see.compiler.class_is_open() || see.compiler.class_has_name())
            return;
        reported = stanza.header.line;
        report(stanza.header, stanza.source,
               "the class has no `Name`: it is called " + language::quoted(output.substr(0, suffix)) +
                   ", after the database");
    }

private:
    int reported = 0; /* line of the class that has been reported; 0: none */
};

} // namespace

made_watcher make_incomplete(const watcher_setup &setup) {
    return make<incomplete>(setup);
}

made_watcher make_cut_short(const watcher_setup &setup) {
    return make<cut_short>(setup);
}

made_watcher make_no_name(const watcher_setup &setup) {
    return make<no_name>(setup);
}

} // namespace check
