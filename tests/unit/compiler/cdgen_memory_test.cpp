/* Large tables have reserved address space, and what has been written to the image is given back. */

#include "compiler/util_fixture.h"

#include "compiler/cdgen_kinds.h"

#include <sys/mman.h>
#include <sys/resource.h>
#include <unistd.h>

namespace {

class LargeTables : public ::testing::Test {
protected:
    /* Reserves 8-byte cells up to this many bytes; each contains its number. */
    void fill(tbl &t, size_t bytes) {
        for (size_t at = t.used(); at < bytes; at += sizeof at)
            memcpy(alloc_tble(cx, &t, sizeof at), &at, sizeof at);
    }

    static void expect_filled(const tbl_content &t) {
        for (size_t at = 0; at < t.used(); at += sizeof at) {
            size_t number = 0;
            memcpy(&number, t.tbl_base + at, sizeof number);
            ASSERT_EQ(number, at);
        }
    }

    static bool may_reserve() {
        rlimit limit = {};
        return sizeof(size_t) > 4 && getrlimit(RLIMIT_AS, &limit) == 0 && limit.rlim_cur == RLIM_INFINITY;
    }

    /* Whether there is memory at this address. */
    static bool has_pages(const void *address) {
        auto page = static_cast<uintptr_t>(sysconf(_SC_PAGESIZE));
        uintptr_t first = reinterpret_cast<uintptr_t>(address) / page * page;
        unsigned char present = 0;
        return mincore(reinterpret_cast<void *>(first), page, &present) == 0 && (present & 1) != 0;
    }

    /* A record's finished table of this many bytes. */
    cdb_ref_t filed(size_t length) {
        cdb_ref_t ref;
        stage_tbl(ref, make_tbl(cx, 32, "Records"));
        fill(*staged_tbl(ref), length);
        file_tbl(cx, cx.store.of_classes, ref);
        return ref;
    }

    cdgen cx;
};

TEST_F(LargeTables, MoveOnceAndKeepWhatTheyHold) {
    if (!may_reserve())
        GTEST_SKIP() << "address space is limited";
    tbl t(8192, "Records");
    fill(t, RESERVE_FROM - 8192);
    EXPECT_EQ(t.tbl_owner, memory_owner::HEAP);
    fill(t, 2 * RESERVE_FROM);
    EXPECT_EQ(t.tbl_owner, memory_owner::RESERVED);
    const char *base = t.tbl_base;
    fill(t, 20 * RESERVE_FROM);
    EXPECT_EQ(t.tbl_base, base);
    EXPECT_EQ(t.tbl_size % t.tbl_au, 0U);
    expect_filled(t);
    EXPECT_EQ(std::string(t.tbl_next, t.tbl_end), std::string(static_cast<size_t>(t.tbl_end - t.tbl_next), '\0'));
}

TEST_F(LargeTables, GrowOnTheHeapWhereAddressSpaceIsLimited) {
    rlimit before = {};
    ASSERT_EQ(getrlimit(RLIMIT_AS, &before), 0);
    rlimit limited = before;
    limited.rlim_cur = rlim_t{1} << (8 * sizeof(rlim_t) - 3);
    if (setrlimit(RLIMIT_AS, &limited) != 0)
        GTEST_SKIP() << "no limit can be set";
    tbl t(8192, "Records");
    fill(t, 5 * RESERVE_FROM);
    setrlimit(RLIMIT_AS, &before);
    EXPECT_EQ(t.tbl_owner, memory_owner::HEAP);
    expect_filled(t);
}

TEST_F(LargeTables, TrimmedOnesGrowAgain) {
    tbl t(8192, "Records");
    fill(t, 2 * RESERVE_FROM + 8);
    trim_tbl(&t);
    EXPECT_EQ(t.tbl_size, 2 * RESERVE_FROM + 8);
    EXPECT_LT(t.tbl_capacity, 3 * RESERVE_FROM);
    fill(t, 4 * RESERVE_FROM);
    expect_filled(t);
}

TEST_F(LargeTables, RestartEmpty) {
    tbl t(32, "Records");
    for (bool traced : {false, true}) {
        fill(t, 2 * RESERVE_FROM);
        if (traced)
            t.restart("Again");
        else
            t.restart_untraced("Again");
        EXPECT_EQ(t.used(), 0U);
        EXPECT_EQ(std::string(static_cast<char *>(alloc_tble(cx, &t, 24)), 24), std::string(24, '\0'));
        EXPECT_EQ(t.tbl_size, 32U);
        t.restart("Records");
    }
}

TEST_F(LargeTables, UntracedRestartIsAFirstReservationOfNoBytes) {
    tbl t(32, "Before");
    fill(t, 200);
    t.restart_untraced("Records");
    EXPECT_EQ(t.used(), 0U);
    EXPECT_EQ(t.tbl_size, 32U);
    EXPECT_STREQ(t.tbl_name, "Records");
    EXPECT_EQ(std::string(static_cast<char *>(alloc_tble(cx, &t, 150)), 150), std::string(150, '\0'));
}

TEST_F(LargeTables, GetTheirPagesInStretches) {
    size_t size = 0;
    char *space = reserve(STRETCH, &size);
    if (space == nullptr)
        GTEST_SKIP() << "address space is limited";
    take_reserved_pages(space, STRETCH);
    bool can_take = has_pages(space);
    give_back(space, size);
    if (!can_take)
        GTEST_SKIP() << "the system gives pages only when they are written";
    tbl t(8192, "Records");
    for (size_t filled : {4 * RESERVE_FROM + 8192, 4 * RESERVE_FROM + 3 * STRETCH - 8192}) {
        fill(t, filled);
        const char *end = t.tbl_base + (filled + STRETCH - 1) / STRETCH * STRETCH;
        EXPECT_TRUE(has_pages(end - 1));
        EXPECT_FALSE(has_pages(end));
    }
}

TEST_F(LargeTables, AreGivenBackPieceByPiece) {
    if (!may_reserve())
        GTEST_SKIP() << "address space is limited";
    tbl t(8192, "Records");
    fill(t, 3 * RESERVE_FROM);
    const char *base = t.tbl_base;
    t.release_before(base + 2 * PIECE - 1);
    EXPECT_FALSE(has_pages(base));
    t.release_before(base + 2 * PIECE - 1); /* what is left is less than a piece */
    EXPECT_EQ(t.used(), 3 * RESERVE_FROM - PIECE);
    size_t number = 0;
    memcpy(&number, t.tbl_base, sizeof number);
    EXPECT_EQ(number, PIECE);
    t.release();
    EXPECT_FALSE(has_pages(base + PIECE));
    EXPECT_EQ(t.tbl_base, nullptr);
    EXPECT_EQ(t.used(), 0U);
}

TEST_F(LargeTables, PartsOfAPoolStay) {
    cdb_ref_t ref;
    stage_tbl(ref, make_tbl(cx, 32, "Records"));
    memcpy(alloc_tble(cx, staged_tbl(ref), 8), "seven..", 8);
    file_tbl(cx, cx.store.of_classes, ref);
    staged_content(ref)->release();
    EXPECT_STREQ(staged_content(ref)->tbl_base, "seven..");
}

TEST_F(LargeTables, FiledOnesAreGivenBackInTheirOrder) {
    std::vector<cdb_ref_t> refs;
    for (size_t i = 0; i < 100; ++i)
        refs.push_back(filed(PAGED_CHUNK / 8));
    const char *early = staged_content(refs[60])->tbl_base;
    give_back_filed_before(cx.store.of_classes, refs[99]);
    EXPECT_FALSE(has_pages(early));
    expect_filled(*staged_content(refs[99]));
    give_back_filed_before(cx.store.of_classes, filed(0)); /* there is none */
    expect_filled(*staged_content(refs[99]));
}

TEST_F(LargeTables, FiledOnesAreDroppedInTheReverseOrder) {
    cdb_ref_t kept = filed(8);
    const char *latest = staged_content(filed(2 * PAGED_CHUNK))->tbl_base;
    for (size_t length : {size_t{3000}, 2 * PAGED_CHUNK, 2 * RESERVE_FROM}) {
        std::vector<cdb_ref_t> refs;
        for (size_t i = 0; i < 50; ++i)
            refs.push_back(filed(length));
        for (; !refs.empty(); refs.pop_back())
            drop_filed(cx.store.of_classes, refs.back());
        EXPECT_TRUE(cx.store.of_classes.large.empty());
    }
    EXPECT_TRUE(has_pages(latest));
    const char *next = staged_content(filed(8))->tbl_base;
    EXPECT_EQ(staged_content(filed(8))->tbl_base, next + round8(sizeof(tbl_content)) + 8);
    expect_filled(*staged_content(kept));
}

TEST_F(LargeTables, ValuesAreGivenBackWhileTheyAreSerialised) {
    if (!may_reserve())
        GTEST_SKIP() << "address space is limited";
    constexpr size_t COUNT = 100'000;
    tbl strings(8192, "Strings");
    dflt_tbl list{std::make_shared<dflt_values>("DefaultValues"), COUNT};
    for (size_t i = 0; i < COUNT; ++i) {
        vx_value_t value = {.ptr_char = list.tbl->texts.take(8)};
        *value.ptr_char = static_cast<char>('a' + i % 26);
        memcpy(alloc_tble(cx, &list.tbl->cells, sizeof value), &value, sizeof value);
    }
    const auto *first = reinterpret_cast<const vx_value_t *>(list.tbl->cells.tbl_base);
    const char *early = first[30'000].ptr_char; /* after the chunks that are on the heap */
    vx_value_t array = {};
    dump_dflt(cx, &strings, &list, &array, VX_CHAR_PTR_ARRAY);
    EXPECT_FALSE(has_pages(first));
    EXPECT_FALSE(has_pages(early));
    const auto *cells = record_at<vx_array_t>(&strings, array.val_uint32);
    EXPECT_EQ(cells->element_count, COUNT);
    for (size_t i = 0; i < COUNT; ++i)
        EXPECT_EQ(strings.tbl_base[record_at<vx_value_t>(&strings, array.val_uint32 + 8 + 8 * i)->val_uint32],
                  static_cast<char>('a' + i % 26));
}

} // namespace
