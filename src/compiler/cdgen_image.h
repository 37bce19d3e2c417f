/* cdgen_image.h: the image: its sizes and its sections. */
#ifndef CDGEN_CDGEN_IMAGE_H
#define CDGEN_CDGEN_IMAGE_H

#include "cdb.h"

#include <cstddef>
#include <span>
#include <vector>

struct cdgen;

/* A word of an attribute's record that looks like a reference but is not one, or that leads to an array of numbers
 * where the record's type says an array of something else. */
struct stray_reference {
    int rsrc_class; /* the class's position among all */
    cdb_ref_t rsrc_class_t::*records;
    size_t offset;           /* in that table of the class, bytes */
    bool to_numbers = false; /* true: it leads to such an array */
};

/* Facts that the reversal needs but cannot see in the image. */
struct stray_references {
    std::vector<stray_reference> strays; /* by class */
    size_t strays_done = 0;              /* those whose class has been written */
    std::vector<size_t> nowhere;         /* places in the image, in bytes, of those that are not references */
    std::vector<size_t> to_numbers;      /* and of those that lead to numbers; ascending */
};

/* The image is read and written by copying, because sections are not aligned. */
struct image_cursor {
    char *chp = nullptr;         /* the image: its header */
    char *dsect_anchs = nullptr; /* the anchors */
    int dsect_count = 0;
    int dsect_idx = 0;   /* the anchor being filled */
    char *dsp = nullptr; /* where the next bytes go */
};

/* The image. cdb_size also stores counts and sizes in the staged class records. fit_image counts the sections first, so
 * it finds everything that can be wrong with an image before a file exists. */
void bld_cdb(cdgen &cx);
/* The same without a file, and always in the machine's own byte order: in memory that is filled with zeros and has the
 * size that fit_image returned. Returns how many bytes are used. Both give back each table that they have written. */
size_t fill_memory(cdgen &cx, std::span<std::byte> zeros);
size_t fit_image(cdgen &cx);
size_t cdb_size(cdgen &cx);
/* Gives back the class that was completed last, and keeps the size of its section: for a compilation without an image.
 * A class that is needed at the end of the source stays. */
void drop_latest_class(cdgen &cx);
void add_rsrc_class_tbls(cdgen &cx);
void add_rsrc_mgr_tbls(cdgen &cx);
void add_rsrc_cmmap_tbls(cdgen &cx);
void add_rsrc_var_class_tbls(cdgen &cx);

#endif
