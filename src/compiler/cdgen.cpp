/* cdgen.cpp: the driver: command line, the fixed order of the phases, and the one place that prints a fatal message. */

#include "compiler/cdgen.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <new>
#include <unistd.h>

namespace {

constexpr vx_uint16_t NO_LOCATOR = 0xFFFF;

void parse_options(cdgen &cx, int argc, char **argv) {
    optind = 0; /* forget an earlier command line of this process altogether */
    for (int option = 0; (option = getopt(argc, argv, "nd:s")) != -1;) {
        switch (option) {
        case 'n':
            cx.interactive = 0;
            break;
        case 'd':
            cx.debugLevel = atoi(optarg); /* text that is no number is 0; not a conversion of the source's */
            break;
        case 's':
            cx.swap_endianness = 1;
            break;
        default: /* getopt has complained: nothing else is to be printed */
            throw fatal_exit{NO_MESSAGE, nullptr, nullptr, 0, 1};
        }
    }
}

/* The two usage texts are deliberately different. */
void parse_command_line(cdgen &cx, int argc, char **argv) {
    parse_options(cx, argc, argv);
    if (optind >= argc)
        cdgen_error_exit(MSG_USAGE, argv[0],
                         " [-s] cdefsrc_filename cdef_filename\n    -s Reverse endianness of CDB.\n", 0, 1);
    cx.cdefsrc = argv[optind++];
    if (optind >= argc)
        cdgen_error_exit(MSG_USAGE_NO_OUTPUT, argv[0], " cdefsrc_filename cdef_filename", 0, 1);
    cx.cdefname = argv[optind];
}

/* Completes a record if it is open. */
template <auto Record, auto Identifier, void (*Complete)(cdgen &)> void complete_open(cdgen &cx) {
    if ((cx.*Record).*Identifier != 0)
        Complete(cx);
}

void complete_sd_run(cdgen &cx) {
    if (cx.cb_sd_def.sd_cb_ID != 0)
        cmplt_sd_tbl(cx, cx.curr_sd_scp);
}

/* The collected defaults, which have all been serialised; the image needs the memory. */
void drop_values(cdgen &cx) {
    for (stanza_state &state : cx.stanzas)
        state.dflt = {};
    cx.spare_dflt = nullptr;
}

/* The ID of the last class's persistent resource attribute with the locator's name; an unknown name is no error. */
vx_uint16_t locator_id(cdgen &cx) {
    tbl *strings = sc_tables[SC_PERSISTENT_RESOURCE_ATTRIBUTE].sc_str_tbl(cx);
    for (const rsrc_pattr_t &attr : records_of<rsrc_pattr_t>(staged_tbl(cx.cb_rsrc_class.u_rc_pattrs))) {
        const auto *name = static_cast<const char *>(tbl_at(strings, attr.u_ra_name.offset[0], 1));
        if (strcmp(name, cx._rc_locator.name) == 0)
            return static_cast<vx_uint16_t>(attr.ra_attr_id);
    }
    return NO_LOCATOR;
}

void resolve_locator(cdgen &cx) {
    bool given = cx._rc_locator.ptr != nullptr && cx._rc_locator.name[0] != '\0';
    cx.cb_rsrc_class.rc_locator = given ? locator_id(cx) : NO_LOCATOR;
}

/* There is no stanza for the manager: it is made of its name. */
void make_manager(cdgen &cx) {
    if (cx.rm_name == nullptr)
        cdgen_error_exit(MSG_NO_MANAGER, nullptr, nullptr, 0, 1);
    init_mgr_tbl(cx);
    tbl *strings = staged_tbl(cx.cb_rsrc_mgr.u_rm_strings_table);
    const char *name = cx.rm_name.get();
    cx.cb_rsrc_mgr.u_rm_RMname = {{add_to_tbl(cx, strings, name, strlen(name) + 1), 0}};
    cmplt_mgr_tbl(cx);
}

void complete_class(cdgen &cx) {
    if (cx.cb_rsrc_class.rc_cb_ID == 0)
        cdgen_error_exit(MSG_NO_CLASSES, nullptr, nullptr, 0, 1);
    cmplt_class_tbl(cx);
}

void complete_map(cdgen &cx) {
    if (cx.cb_rsrc_cmmap.rcm_cb_ID == 0)
        cdgen_error_exit(MSG_NO_MAPS, nullptr, nullptr, 0, 1);
    cmplt_cmmap_tbl(cx);
}

/* Deliberate: attributes and actions come before the SD run that may belong to them. */
constexpr closing_step steps[] = {
    complete_open<&cdgen::cb_rsrc_pattr, &rsrc_pattr_t::ra_cb_ID, cmplt_pattr_tbl>,
    complete_open<&cdgen::cb_rsrc_dattr, &rsrc_dattr_t::ra_cb_ID, cmplt_dattr_tbl>,
    complete_open<&cdgen::cb_rsrc_pattrC, &rsrc_pattr_t::ra_cb_ID, cmplt_pattrC_tbl>,
    complete_open<&cdgen::cb_rsrc_dattrC, &rsrc_dattr_t::ra_cb_ID, cmplt_dattrC_tbl>,
    complete_open<&cdgen::cb_rsrc_action, &rsrc_action_t::ac_cb_ID, cmplt_action_tbl>,
    complete_open<&cdgen::cb_rsrc_actionC, &rsrc_action_t::ac_cb_ID, cmplt_actionC_tbl>,
    complete_sd_run,
    resolve_locator,
    complete_class,
    complete_open<&cdgen::cb_rsrc_variable_class, &rsrc_variable_class_t::rvc_cb_ID, cmplt_var_class_tbl>,
    complete_map,
    make_manager,
    drop_values,
    bld_var_id_tbls,
};

/* Traces come first: some explain the message. */
int report(const cdgen &cx, const fatal_exit &failure) {
    fflush(stdout);
    if (failure.id == NO_MESSAGE)
        return failure.code;
    const char *end = cx.interactive ? "\n" : "";
    auto [first, second, third] = words_of(failure);
    if (failure.line != 0)
        fprintf(stderr, "%d: %s%s%s%s", failure.line, first, second, third, end);
    else
        fprintf(stderr, "%s%s%s%s", first, second, third, end);
    return failure.code;
}

} // namespace

constinit const std::span<const closing_step> closing_steps = steps;

cdgen::~cdgen() {
    discard_mapfile(*this);
    set_unfinished_output(nullptr);
    for (tbl_content &content : filed)
        free(content.tbl_base);
}

void compile(cdgen &cx) {
    cache_input_data(cx, cx.cdefsrc);
    for (closing_step step : closing_steps)
        step(cx);
    bld_cdb(cx);
}

int cdgen_main(int argc, char **argv) {
    cdgen cx;
    try {
        parse_command_line(cx, argc, argv);
        compile(cx);
        return 0;
    } catch (const fatal_exit &failure) {
        return report(cx, failure);
    } catch (const std::bad_alloc &) { /* of the standard library's containers */
        return report(cx, {MSG_OUT_OF_MEMORY, strerror(ENOMEM), nullptr, 0, ENOMEM});
    }
}
