/* cdgen_util_tables.cpp: staging tables and memory. */

#include "compiler/cdgen_tables.h"

#include "compiler/cdgen_context.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <new>
#include <utility>

void tbl_content::release() {
    if (tbl_owner == memory_owner::POOL)
        return;
    if (tbl_owner == memory_owner::RESERVED)
        give_back(tbl_base, tbl_capacity);
    else
        free(tbl_base);
    tbl_base = tbl_next = nullptr;
    tbl_owner = memory_owner::HEAP;
    tbl_capacity = 0;
}

void tbl_content::release_before(const char *needed) {
    if (tbl_owner != memory_owner::RESERVED)
        return;
    for (; static_cast<size_t>(needed - tbl_base) >= PIECE; tbl_base += PIECE) {
        give_back(tbl_base, PIECE);
        tbl_capacity -= PIECE;
    }
}

tbl::~tbl() {
    release();
    free(tbl_spare);
}

filed_contents::~filed_contents() {
    for (tbl_content &content : large)
        content.release();
}

void tbl::restart(const char *name) {
    if (tbl_owner == memory_owner::RESERVED)
        release();
    if (tbl_base != nullptr)
        tbl_spare = tbl_base;
    tbl_base = tbl_prev_base = tbl_next = tbl_end = nullptr;
    tbl_size = 0;
    tbl_name = name;
}

void tbl::restart_untraced(const char *name) {
    if (tbl_base == nullptr || tbl_owner == memory_owner::RESERVED)
        return restart(name);
    memset(tbl_base, 0, std::min(used(), tbl_au));
    tbl_next = tbl_prev_base = tbl_base;
    tbl_size = tbl_au;
    tbl_end = tbl_base + tbl_size;
    tbl_name = name;
}

void *cfg_malloc(size_t s) {
    void *block = calloc(1, s);
    if (block == nullptr)
        cdgen_error_exit(MSG_OUT_OF_MEMORY, strerror(errno), nullptr, 0, errno);
    return block;
}

tbl *make_tbl(cdgen &cx, size_t au, const char *name) {
    if (cx.store.spare_tables.empty())
        return &cx.store.tables.emplace_back(au, name);
    tbl *spare = cx.store.spare_tables.back();
    cx.store.spare_tables.pop_back();
    std::destroy_at(spare);
    return std::construct_at(spare, au, name);
}

namespace {

/* The request rounded up to whole units. The quotient is deliberately formed in single precision, which the traces
 * show; where that loses integers, beyond 2^24 bytes, the chunk may come out short, and is then computed exactly. */
size_t growth_chunk(const tbl &t, size_t s) {
    if (s == 0)
        return t.tbl_au;
    float units = std::ceil(static_cast<float>(s) / static_cast<float>(t.tbl_au));
    auto chunk = static_cast<size_t>(static_cast<double>(units) * static_cast<double>(t.tbl_au));
    return chunk >= s ? chunk : (s + t.tbl_au - 1) / t.tbl_au * t.tbl_au;
}

/* Takes a block for the table's first or next bytes from the heap. Asks for half as much again, so that the table does
 * not move with every unit; if there is not enough memory for that, asks for just what is needed. */
bool take_from_heap(tbl &t, size_t needed) {
    size_t generous = std::max(needed, t.tbl_capacity + t.tbl_capacity / 2);
    for (size_t capacity : {generous, needed}) {
        if (auto *block = static_cast<char *>(realloc(t.tbl_base, capacity))) {
            t.tbl_capacity = capacity;
            t.tbl_base = block;
            return true;
        }
    }
    return false;
}

/* Moves the table to reserved address space, if there is some. */
bool take_reserved(tbl &t, size_t needed) {
    size_t capacity = 0;
    char *block = reserve(needed, &capacity);
    if (block == nullptr)
        return false;
    if (t.tbl_base != nullptr)
        memcpy(block, t.tbl_base, t.used());
    t.release();
    t.tbl_base = block;
    t.tbl_owner = memory_owner::RESERVED;
    t.tbl_capacity = capacity;
    return true;
}

/* Gives the table a block that is large enough and moves its contents there. Returns false if there is no memory. */
bool take_block(tbl &t, size_t needed) {
    if (needed >= RESERVE_FROM && take_reserved(t, needed))
        return true;
    return t.tbl_owner == memory_owner::HEAP && take_from_heap(t, needed);
}

/* Prepares the pages for the bytes that the table grows by. */
void take_stretches(const tbl &t, size_t size) {
    size_t taken = (t.tbl_size + STRETCH - 1) / STRETCH * STRETCH;
    size_t needed = std::min((size + STRETCH - 1) / STRETCH * STRETCH, t.tbl_capacity);
    if (needed > taken)
        take_reserved_pages(t.tbl_base + taken, needed - taken);
}

[[noreturn]] void table_failure(const tbl &t, message_id what) {
    int error = errno;
    cdgen_error_exit(what, t.tbl_name, strerror(error), 0, error);
}

void first_block(cdgen &cx, tbl &t) {
    t.tbl_base = std::exchange(t.tbl_spare, nullptr);
    if (t.tbl_base == nullptr && !take_block(t, t.tbl_au))
        table_failure(t, MSG_NO_MEMORY_FOR_TABLE);
    if (t.tbl_owner == memory_owner::HEAP)
        memset(t.tbl_base, 0, t.tbl_au);
    t.tbl_prev_base = t.tbl_next = t.tbl_base;
    t.tbl_size = t.tbl_au;
    t.tbl_end = t.tbl_base + t.tbl_size;
    if (cx.options.debugLevel > 2)
        printf("alloc_tble: %s, table size: %d\n", t.tbl_name, static_cast<int>(t.tbl_size));
}

void grow(cdgen &cx, tbl &t, size_t s) {
    size_t used = t.used();
    size_t chunk = growth_chunk(t, s);
    if (cx.options.debugLevel > 2)
        fprintf(stderr, "alloc_tble: overflow by %d b. Adding %d b to %s\n", static_cast<int>(s),
                static_cast<int>(chunk), t.tbl_name);
    t.tbl_prev_base = t.tbl_base;
    size_t size = t.tbl_size + chunk;
    if (size > t.tbl_capacity && !take_block(t, size))
        table_failure(t, MSG_NO_MEMORY_TO_GROW);
    t.tbl_next = t.tbl_base + used;
    if (t.tbl_owner == memory_owner::HEAP)
        memset(t.tbl_base + t.tbl_size, 0, chunk);
    else if (t.tbl_owner == memory_owner::RESERVED)
        take_stretches(t, size);
    t.tbl_size = size;
    t.tbl_end = t.tbl_base + size;
    if (cx.options.debugLevel > 2)
        printf("alloc_tble: %s, new table size: %d\n", t.tbl_name, static_cast<int>(t.tbl_size));
}

} // namespace

[[gnu::noinline]] void make_room(cdgen &cx, tbl &t, size_t s) {
    if (cx.options.debugLevel > 2)
        printf("alloc_tble: %s, structure size: %d\n", t.tbl_name, static_cast<int>(s));
    if (t.tbl_base == nullptr)
        first_block(cx, t);
    if (s >= t.room())
        grow(cx, t, s);
}

void trim_tbl(tbl *t) {
    size_t used = t == nullptr ? 0 : t->used();
    if (used == 0)
        return;
    if (t->tbl_owner == memory_owner::RESERVED) {
        t->tbl_capacity = give_back(t->tbl_base, t->tbl_capacity, used);
    } else if (auto *block = static_cast<char *>(realloc(t->tbl_base, used))) {
        t->tbl_base = block;
        t->tbl_capacity = used;
    } else {
        return;
    }
    t->tbl_next = t->tbl_end = t->tbl_base + used;
    t->tbl_size = used;
}

vx_uint32_t save_tbl_val_round(cdgen &cx, tbl *tp, const void *val, size_t len) {
    auto *copy = static_cast<char *>(alloc_tble(cx, tp, round8(len)));
    memcpy(copy, val, len);
    return static_cast<vx_uint32_t>(copy - tp->tbl_base);
}

vx_uint32_t add_to_tbl(cdgen &cx, tbl *tp, const void *data, size_t len) {
    return save_tbl_val_round(cx, tp, data, len);
}

void *tbl_at(tbl_content *t, size_t offset, size_t size) {
    if (t->tbl_base == nullptr || offset > t->used() || size > t->used() - offset)
        cdgen_error_exit(MSG_OUTSIDE_TABLE, t->tbl_name, nullptr, 0, 1);
    return t->tbl_base + offset;
}

/* A pool grows by chunks for the values of several lines, each twice as large as the one before, up to a size that is
 * worth giving back. What is large gets a chunk of its own. clear() keeps the latest chunk for reuse. */
struct alignas(vx_value_t) text_pool::chunk {
    chunk *before;
    chunk *after;
    size_t size; /* bytes that follow */

    char *bytes() {
        return reinterpret_cast<char *>(this + 1);
    }

    bool contains(const char *address) {
        return reinterpret_cast<uintptr_t>(address) - reinterpret_cast<uintptr_t>(bytes()) < size;
    }

    static chunk *make(size_t size) {
        size_t whole = sizeof(chunk) + size;
        return reinterpret_cast<chunk *>(has_pages(size) ? take_pages(whole) : static_cast<char *>(malloc(whole)));
    }

    void destroy() {
        if (has_pages(size))
            give_back(reinterpret_cast<char *>(this), sizeof(chunk) + size);
        else
            free(this);
    }

private:
    static bool has_pages(size_t size) {
        return sizeof(chunk) + size >= PAGED_CHUNK;
    }
};

namespace {
constexpr size_t POOL_CHUNK = 1024;
} // namespace

text_pool::~text_pool() {
    while (earliest != nullptr)
        free_earliest();
}

bool text_pool::add_chunk(size_t n) {
    constexpr size_t LARGEST = 2 * PAGED_CHUNK - sizeof(chunk);
    size_t usual = latest == nullptr ? POOL_CHUNK : std::min(2 * latest->size, LARGEST);
    size_t size = n > PAGED_CHUNK ? n : std::max(n, usual);
    chunk *fresh = chunk::make(size);
    if (fresh == nullptr)
        return false;
    *fresh = {latest, nullptr, size};
    (latest == nullptr ? earliest : latest->after) = fresh;
    latest = fresh;
    left = size;
    return true;
}

char *text_pool::take(size_t n) {
    n = round8(n);
    if ((latest == nullptr || n > left) && !add_chunk(n))
        return nullptr;
    char *taken = latest->bytes() + (latest->size - left);
    left -= n;
    memset(taken, 0, n);
    return taken;
}

void text_pool::free_earliest() {
    chunk *unused = std::exchange(earliest, earliest->after);
    (earliest == nullptr ? latest : earliest->before) = nullptr;
    unused->destroy();
}

void text_pool::free_latest() {
    chunk *unused = std::exchange(latest, latest->before);
    (latest == nullptr ? earliest : latest->after) = nullptr;
    unused->destroy();
}

void text_pool::give_back_from(const char *taken) {
    while (latest != nullptr && !latest->contains(taken))
        free_latest();
    if (latest != nullptr)
        left = latest->size - static_cast<size_t>(taken - latest->bytes());
}

void text_pool::give_back_before(const char *taken) {
    while (earliest != latest && !earliest->contains(taken))
        free_earliest();
}

void text_pool::clear() {
    if (latest == nullptr)
        return;
    left = latest->size;
    while (earliest != latest)
        free_earliest();
}

namespace {

tbl_content *keep_copy(filed_contents &to, const tbl &t) {
    constexpr size_t BEFORE_BYTES = round8(sizeof(tbl_content));
    char *content = to.pool.take(BEFORE_BYTES + t.used());
    if (content == nullptr)
        table_failure(t, MSG_NO_MEMORY_FOR_TABLE);
    char *bytes = content + BEFORE_BYTES;
    memcpy(bytes, t.tbl_base, t.used());
    return new (content) tbl_content{bytes, bytes + t.used(), t.tbl_name, memory_owner::POOL};
}

tbl_content *keep_block(filed_contents &to, tbl &t) {
    trim_tbl(&t);
    tbl_content *kept = &to.large.emplace_back(t);
    static_cast<tbl_content &>(t) = {.tbl_name = t.tbl_name};
    return kept;
}

} // namespace

void file_tbl(cdgen &cx, filed_contents &to, cdb_ref_t &ref) {
    tbl *open = staged_tbl(ref);
    if (open->used() == 0)
        stage_tbl(ref, nullptr);
    else
        stage_tbl(ref, open->used() < RESERVE_FROM ? keep_copy(to, *open) : keep_block(to, *open));
    open->release();
    cx.store.spare_tables.push_back(open);
}

void drop_filed(filed_contents &from, const cdb_ref_t &ref) {
    tbl_content *kept = staged_content(ref);
    if (kept == nullptr)
        return;
    if (kept->tbl_owner == memory_owner::POOL)
        return from.pool.give_back_from(reinterpret_cast<const char *>(kept));
    kept->release();
    if (kept == &from.large.back())
        from.large.pop_back();
}

void give_back_filed_before(filed_contents &from, const cdb_ref_t &ref) {
    const tbl_content *kept = staged_content(ref);
    if (kept != nullptr && kept->tbl_owner == memory_owner::POOL)
        from.pool.give_back_before(reinterpret_cast<const char *>(kept));
}
