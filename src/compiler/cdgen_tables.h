/* cdgen_tables.h: staging tables and the memory of a compilation. */
#ifndef CDGEN_CDGEN_TABLES_H
#define CDGEN_CDGEN_TABLES_H

#include "compiler/cdgen_memory.h"

#include "cdb.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <optional>
#include <span>
#include <vector>

struct cdgen;

/* The bytes of a table, which is all that is kept when the table is finished. */
struct tbl_content {
    size_t used() const {
        return static_cast<size_t>(tbl_next - tbl_base);
    }

    /* Frees the block, unless it belongs to a pool. */
    void release();
    /* Gives back what is before this address in the block, in whole PIECEs, if the block is reserved. */
    void release_before(const char *needed);

    char *tbl_base = nullptr;       /* null until the first reservation */
    char *tbl_next = nullptr;       /* first unreserved byte */
    const char *tbl_name = nullptr; /* for traces and messages */
    memory_owner tbl_owner = memory_owner::HEAP;
    size_t tbl_capacity = 0; /* bytes allocated */
};

/* An append-only arena of zero-filled bytes. It grows by whole allocation units, and so does tbl_size, which the traces
 * show. Memory is allocated in larger steps, and a large table gets address space for its largest possible size. The
 * block moves when it grows beyond what it has, so references into a table are offsets from tbl_base. Once there is a
 * block, tbl_next < tbl_end and all bytes between them are 0. */
struct tbl : tbl_content {
    tbl(size_t au, const char *name) : tbl_content{.tbl_name = name}, tbl_au(au) {}
    tbl(const tbl &) = delete;
    tbl &operator=(const tbl &) = delete;
    ~tbl();

    /* Empties the table. It keeps its block for the next reservation. */
    void restart(const char *name);
    /* Empties the table as if no bytes had been reserved in it for the first time, but without the trace of such a
     * reservation. */
    void restart_untraced(const char *name);

    size_t room() const {
        return static_cast<size_t>(tbl_end - tbl_next);
    }

    char *tbl_prev_base = nullptr; /* the block before its latest move; for diagnosis */
    size_t tbl_size = 0;           /* bytes, a multiple of tbl_au */
    char *tbl_end = nullptr;       /* tbl_base + tbl_size */
    size_t tbl_au;                 /* bytes: the first block and the granule of every growth */
    char *tbl_spare = nullptr;     /* the block before the first reservation, if there is one already */
};

/* The offset in a string table of the container that is being filled; no value until the first element is added. */
using tbl_anchor = std::optional<vx_uint32_t>;

constexpr size_t round8(size_t n) {
    return (n + 7) & ~size_t{7};
}

/* Returns zero-filled memory, to be freed with free(). Failure is fatal, with errno as the status. */
void *cfg_malloc(size_t s);

/* A new, empty table that exists until it is filed, or as long as the context. */
tbl *make_tbl(cdgen &cx, size_t au, const char *name);

/* Reserves s bytes, zeroed, at the end of t. The address is valid until the next reservation in t. */
inline void *alloc_tble(cdgen &cx, tbl *t, size_t s); /* cdgen_context.h has its body */

/* The rare part of reserve(): traces the reservation, and makes room for s more bytes in t. */
void make_room(cdgen &cx, tbl &t, size_t s);

/* Frees the unused memory of a table after tbl_next. */
void trim_tbl(tbl *t);

struct filed_contents;

/* Moves a finished table's bytes to compact storage and points the record at them, or at nothing if there are no bytes.
 * With many classes, most of the memory would otherwise be unused. The table itself is reused. */
void file_tbl(cdgen &cx, filed_contents &to, cdb_ref_t &ref);
/* Frees a filed table's bytes. Several tables must be freed in the reverse order of their filing. */
void drop_filed(filed_contents &from, const cdb_ref_t &ref);
/* Gives back everything that was filed before this table. */
void give_back_filed_before(filed_contents &from, const cdb_ref_t &ref);

/* Appends len bytes, zero-filled up to a multiple of 8; returns their offset from tbl_base. add_to_tbl is the name that
 * serves for strings and serialised values. */
vx_uint32_t save_tbl_val_round(cdgen &cx, tbl *tp, const void *val, size_t len);
vx_uint32_t add_to_tbl(cdgen &cx, tbl *tp, const void *data, size_t len);

/* The record at an offset of a staging table, valid until the next reservation in it. An offset outside the used part
 * is a defect of the program and fatal. Offsets of records are multiples of their alignment. */
void *tbl_at(tbl_content *t, size_t offset, size_t size);

template <class Record> Record *record_at(tbl_content *t, size_t offset) {
    return static_cast<Record *>(tbl_at(t, offset, sizeof(Record)));
}

/* All records of a table that contains nothing else. */
template <class Record> std::span<Record> records_of(tbl_content *t) {
    if (t == nullptr || t->tbl_base == nullptr)
        return {};
    return {reinterpret_cast<Record *>(t->tbl_base), t->used() / sizeof(Record)};
}

/* While a record is staged, the reference to one of its side tables holds the address of the table's content, which may
 * have been filed. */
inline tbl_content *staged_content(const cdb_ref_t &ref) {
    tbl_content *t = nullptr;
    std::memcpy(&t, ref.pointer, sizeof t);
    return t;
}

/* The table itself, while the record is open. */
inline tbl *staged_tbl(const cdb_ref_t &ref) {
    return static_cast<tbl *>(staged_content(ref));
}

inline void stage_tbl(cdb_ref_t &ref, tbl_content *t) {
    ref = {};
    std::memcpy(ref.pointer, &t, sizeof t);
}

/* Memory for out-of-line values, texts and binaries, until they are serialised, and for small filed contents. It is
 * used up in the order in which it was taken. */
class text_pool {
public:
    text_pool() = default;
    text_pool(const text_pool &) = delete;
    text_pool &operator=(const text_pool &) = delete;
    ~text_pool();

    /* n zeroed bytes, aligned for any value, that stay until the pool is emptied. Null if there is no memory. */
    char *take(size_t n);
    /* Frees the memory at this address, which must have been taken, and after it. */
    void give_back_from(const char *taken);
    /* Frees the chunks before the one that has this address, which must have been taken. */
    void give_back_before(const char *taken);
    /* Frees everything except the latest chunk, which is reused. */
    void clear();

private:
    struct chunk;
    bool add_chunk(size_t n);
    void free_earliest();
    void free_latest();

    chunk *earliest = nullptr;
    chunk *latest = nullptr;
    size_t left = 0; /* bytes of the latest chunk not yet taken */
};

struct free_memory {
    void operator()(void *p) const {
        free(p);
    }
};

/* The contents of finished side tables, in the order of their records, in which the image takes them and they are given
 * back. */
struct filed_contents {
    filed_contents() = default;
    filed_contents(const filed_contents &) = delete;
    filed_contents &operator=(const filed_contents &) = delete;
    ~filed_contents();

    text_pool pool;                /* contents of less than RESERVE_FROM bytes, each after its tbl_content */
    std::deque<tbl_content> large; /* contents that have a block of their own */
};

/* The side tables of a compilation's records, and the contents of finished ones. */
struct table_store {
    std::deque<tbl> tables;          /* the records that own them refer to them */
    std::vector<tbl *> spare_tables; /* tables that have been filed, for reuse */
    filed_contents of_classes;
    filed_contents of_variable_classes;
};

#endif
