/* cdgen_kinds.h: opening and completing the records of the stanza kinds. */
#ifndef CDGEN_CDGEN_KINDS_H
#define CDGEN_CDGEN_KINDS_H

#include "compiler/cdgen_framing.h"
#include "compiler/cdgen_values.h"

struct cdgen;

void init_class_tbl(cdgen &cx);
void init_class_tbl_fake(cdgen &cx);
void cmplt_class_tbl(cdgen &cx);
void init_cmmap_tbl(cdgen &cx);
void cmplt_cmmap_tbl(cdgen &cx);
void init_mgr_tbl(cdgen &cx);
void cmplt_mgr_tbl(cdgen &cx);
void init_var_class_tbl(cdgen &cx);
void cmplt_var_class_tbl(cdgen &cx);
void init_pattr_tbl(cdgen &cx);
void cmplt_pattr_tbl(cdgen &cx);
void init_pattrC_tbl(cdgen &cx);
void cmplt_pattrC_tbl(cdgen &cx);
void init_dattr_tbl(cdgen &cx);
void cmplt_dattr_tbl(cdgen &cx);
void init_dattrC_tbl(cdgen &cx);
void cmplt_dattrC_tbl(cdgen &cx);
void init_action_tbl(cdgen &cx);
void cmplt_action_tbl(cdgen &cx);
void init_actionC_tbl(cdgen &cx);
void cmplt_actionC_tbl(cdgen &cx);
void init_sd_tbl(cdgen &cx);
void cmplt_sd_tbl(cdgen &cx, const srtable_ctrl *scp);

/* New, empty sections of the open class's tables; return their offsets. */
vx_uint32_t mk_sd_sec(cdgen &cx);
vx_uint32_t mk_vv_sec(cdgen &cx);
vx_uint32_t mk_vty_sec(cdgen &cx);

/* Serialises the collected values (for an SD type: the defaults of the collected element types) as one value. */
void dump_dflt(cdgen &cx, tbl *str_tbl, const dflt_tbl *vtbl, vx_value_t *lval, vx_data_type_t dt);

#endif
