/* Large tables have reserved address space, and what has been written to the image is given back. */

#include "compiler/util_fixture.h"

#include <sys/resource.h>

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

TEST_F(LargeTables, AreGivenBackPieceByPiece) {
    if (!may_reserve())
        GTEST_SKIP() << "address space is limited";
    tbl t(8192, "Records");
    fill(t, 3 * RESERVE_FROM);
    t.release_front(RESERVE_FROM);
    EXPECT_EQ(t.used(), 2 * RESERVE_FROM);
    size_t number = 0;
    memcpy(&number, t.tbl_base, sizeof number);
    EXPECT_EQ(number, RESERVE_FROM);
    t.release();
    EXPECT_EQ(t.tbl_base, nullptr);
    EXPECT_EQ(t.used(), 0U);
}

TEST_F(LargeTables, PartsOfAPoolStay) {
    cdb_ref_t ref;
    stage_tbl(ref, make_tbl(cx, 32, "Records"));
    memcpy(alloc_tble(cx, staged_tbl(ref), 8), "seven..", 8);
    file_tbl(cx, ref);
    staged_content(ref)->release();
    EXPECT_STREQ(staged_content(ref)->tbl_base, "seven..");
}

} // namespace
