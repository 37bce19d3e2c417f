/* Staging tables: growth, appending, looking up; memory and its failures. */

#include "compiler/given_interface.h"
#include "compiler/util_fixture.h"

#include <cerrno>
#include <cstdint>
#include <initializer_list>
#include <utility>
#include <vector>

#ifdef __GLIBC__
#include <malloc.h>
#endif

/* A sanitized build ends the process if memory is refused, unless it knows that this is expected here. */
extern "C" const char *__asan_default_options();
extern "C" const char *__asan_default_options() {
    return "allocator_may_return_null=1";
}

using namespace util_test;

namespace {

/* More bytes than a process can get, as a number that single precision holds exactly. */
constexpr auto ABSURD = static_cast<size_t>(sizeof(size_t) > 4 ? uint64_t{1} << 62 : 0xF000'0000);

/* New memory is filled with other bytes than zeros, so that a byte that is not cleared is noticed. */
class Tables : public testing::Test {
protected:
    Tables() {
        dirty_memory(0x5A);
    }
    ~Tables() override {
        dirty_memory(0);
    }

    static void dirty_memory([[maybe_unused]] int with) {
#ifdef __GLIBC__
        mallopt(M_PERTURB, with);
#endif
    }

    /* Reserves n bytes and returns where. */
    size_t reserve(tbl &t, size_t n) {
        return static_cast<size_t>(static_cast<char *>(alloc_tble(cx, &t, n)) - t.tbl_base);
    }

    cdgen cx;
};

bool all_zero(const char *from, const char *to) {
    for (; from < to; ++from)
        if (*from != 0)
            return false;
    return true;
}

/* What holds of every table that has a block. */
void expect_sound(const tbl &t) {
    EXPECT_LE(t.tbl_base, t.tbl_next);
    EXPECT_LT(t.tbl_next, t.tbl_end);
    EXPECT_EQ(t.tbl_base + t.tbl_size, t.tbl_end);
    EXPECT_EQ(t.tbl_size % t.tbl_au, 0U);
    EXPECT_GE(t.tbl_capacity, t.tbl_size);
    EXPECT_TRUE(all_zero(t.tbl_next, t.tbl_end));
}

/* ---- Growth ---------------------------------------------------------------------------------------------------- */

struct growth {
    const char *rule;
    size_t au;
    std::vector<size_t> requests;
    std::vector<size_t> offsets;
    size_t size;
    size_t used;
};

const growth growths[] = {
    {"the first reservation takes one unit", 32, {8}, {0}, 32, 8},
    {"what fits does not grow", 32, {8, 8, 8}, {0, 8, 16}, 32, 24},
    {"reaching the end exactly grows", 32, {8, 8, 8, 8}, {0, 8, 16, 24}, 64, 32},
    {"one byte before the end does not grow", 32, {31}, {0}, 32, 31},
    {"the whole first unit grows", 32, {32}, {0}, 64, 32},
    {"one byte more than the first unit grows by two", 32, {33}, {0}, 96, 33},
    {"two whole units grow by two", 32, {64}, {0}, 96, 64},
    {"the request counts, rounded up to whole units", 32, {24, 100}, {0, 24}, 160, 124},
    {"the request counts, not the shortfall", 32, {24, 40}, {0, 24}, 96, 64},
    {"growth is by the request, not by doubling", 32, {31, 31, 31, 31}, {0, 31, 62, 93}, 128, 124},
    {"no bytes from a new table take the first unit", 32, {0}, {0}, 32, 0},
    {"no bytes do not advance", 32, {8, 0, 8}, {0, 8, 8}, 32, 16},
    {"sizes are taken as they are given", 32, {3, 5, 1}, {0, 3, 8}, 32, 9},
    {"a unit that is no power of 2", 224, {224}, {0}, 448, 224},
    {"several units that are no powers of 2", 72, {71, 145}, {0, 71}, 288, 216},
};

TEST_F(Tables, GrowByWholeUnits) {
    for (const growth &row : growths) {
        SCOPED_TRACE(row.rule);
        tbl t(row.au, "Records");
        std::vector<size_t> offsets;
        for (size_t request : row.requests)
            offsets.push_back(reserve(t, request));
        EXPECT_EQ(offsets, row.offsets);
        EXPECT_EQ(t.tbl_size, row.size);
        EXPECT_EQ(t.used(), row.used);
        expect_sound(t);
    }
}

TEST_F(Tables, NoBytesAtTheVeryEndGrowByOneUnit) {
    tbl t(32, "Records");
    reserve(t, 24);
    t.tbl_next = t.tbl_end;
    EXPECT_EQ(reserve(t, 0), 32U);
    EXPECT_EQ(t.used(), 32U);
    EXPECT_EQ(t.tbl_size, 64U);
    expect_sound(t);
}

/* There the quotient is deliberately one of single precision, but for what would not suffice. */
TEST_F(Tables, GrowthSufficesBeyondSinglePrecision) {
    for (auto [request, size] : {std::pair(16777217U, 16777218U), {16777219U, 16777221U}}) {
        tbl t(1, "Records");
        EXPECT_EQ(reserve(t, request), 0U);
        EXPECT_EQ(t.tbl_size, size);
        expect_sound(t);
    }
}

TEST_F(Tables, ReservedBytesAreZeroAndStayWithTheirOffsets) {
    tbl t(32, "Records");
    for (unsigned char i = 0; i < 200; ++i) {
        auto *reserved = static_cast<char *>(alloc_tble(cx, &t, 9));
        ASSERT_EQ(bytes_at(reserved, 9), std::string(9, '\0'));
        memset(reserved, i + 1, 9);
    }
    for (unsigned char i = 0; i < 200; ++i)
        EXPECT_EQ(bytes_at(t.tbl_base + size_t{i} * 9, 9), bytes().fill(9, static_cast<unsigned char>(i + 1)).all);
    expect_sound(t);
}

TEST_F(Tables, PreviousBlockIsTheOneBeforeTheLatestGrowth) {
    tbl t(32, "Records");
    reserve(t, 8);
    EXPECT_EQ(t.tbl_prev_base, t.tbl_base);
    for (int i = 0; i < 50; ++i) {
        auto before = reinterpret_cast<std::uintptr_t>(t.tbl_base);
        reserve(t, 32);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(t.tbl_prev_base), before);
    }
}

TEST_F(Tables, MemoryIsTakenInEverLargerSteps) {
    tbl t(32, "Records");
    size_t steps = 0;
    for (int i = 0; i < 10000; ++i) {
        size_t before = t.tbl_capacity;
        reserve(t, 32);
        steps += t.tbl_capacity != before;
    }
    EXPECT_EQ(t.tbl_size, 320032U);
    EXPECT_LT(steps, 30U);
}

TEST_F(Tables, RestartAsIfTheyWereNew) {
    tbl t(32, "Before");
    t.restart("Unused"); /* without a block yet */
    memset(alloc_tble(cx, &t, 100), 0xEE, 100);
    size_t held = t.tbl_capacity;
    for (const char *name : {"Again", "Records"}) {
        t.restart(name);
        EXPECT_EQ(t.used() + t.tbl_size, 0U);
    }
    EXPECT_EQ(reserve(t, 8), 0U);
    EXPECT_STREQ(t.tbl_name, "Records");
    EXPECT_EQ(t.tbl_size, 32U);
    EXPECT_EQ(t.tbl_prev_base, t.tbl_base);
    EXPECT_EQ(reserve(t, 90), 8U);
    EXPECT_EQ(t.tbl_size, 128U);
    EXPECT_EQ(t.tbl_capacity, held);
    EXPECT_EQ(contents(t), std::string(98, '\0'));
    expect_sound(t);
}

TEST_F(Tables, TrimmedOnesHoldWhatIsUsedAndGrowAgain) {
    tbl t(32, "Records");
    add_to_tbl(cx, &t, "some text", 10);
    trim_tbl(&t);
    EXPECT_EQ(contents(t), bytes().text("some text").fill(7).all);
    EXPECT_EQ(t.tbl_size, 16U);
    EXPECT_EQ(t.tbl_capacity, 16U);
    EXPECT_EQ(t.tbl_end, t.tbl_next);
    EXPECT_EQ(add_to_tbl(cx, &t, "more", 5), 16U);
    EXPECT_EQ(t.tbl_size, 48U);
    EXPECT_EQ(contents(t), bytes().text("some text").fill(7).text("more").fill(4).all);
    EXPECT_TRUE(all_zero(t.tbl_next, t.tbl_end));
}

TEST_F(Tables, TrimmingLeavesEmptyOnesAlone) {
    trim_tbl(nullptr);
    tbl unused(32, "Records"), empty(32, "Records");
    trim_tbl(&unused);
    EXPECT_EQ(unused.tbl_base, nullptr);
    reserve(empty, 0);
    trim_tbl(&empty);
    EXPECT_EQ(empty.tbl_size, 32U);
    expect_sound(empty);
}

/* What a record refers to once its table is filed. */
const tbl_content *filed(cdgen &cx, size_t length) {
    cdb_ref_t ref;
    stage_tbl(ref, make_tbl(cx, 32, "Records"));
    tbl *t = staged_tbl(ref);
    memset(alloc_tble(cx, t, length), 'x', length);
    file_tbl(cx, cx.store.of_classes, ref);
    return staged_content(ref);
}

TEST_F(Tables, FiledOnesKeepWhatTheyHold) {
    for (size_t length : {size_t{1}, size_t{256}, size_t{100000}, RESERVE_FROM - 1, RESERVE_FROM, RESERVE_FROM + 9}) {
        const tbl_content *content = filed(cx, length);
        const tbl_content *next = filed(cx, length); /* leaves the one before it alone */
        EXPECT_NE(content, next);
        EXPECT_STREQ(content->tbl_name, "Records");
        EXPECT_EQ(std::string(content->tbl_base, content->used()), std::string(length, 'x'));
        EXPECT_EQ(cx.store.of_classes.large.size(), length < RESERVE_FROM ? 0U : length == RESERVE_FROM ? 2U : 4U);
    }
}

TEST_F(Tables, FiledOnesThatHoldNothingAreNone) {
    cdb_ref_t ref;
    stage_tbl(ref, make_tbl(cx, 32, "Records"));
    reserve(*staged_tbl(ref), 0);
    file_tbl(cx, cx.store.of_classes, ref);
    EXPECT_EQ(staged_content(ref), nullptr);
    EXPECT_TRUE(records_of<vx_uint32_t>(staged_content(ref)).empty());
}

TEST_F(Tables, FiledOnesServeAgain) {
    cdb_ref_t ref;
    tbl *first = make_tbl(cx, 8192, "First");
    stage_tbl(ref, first);
    reserve(*first, 9000);
    file_tbl(cx, cx.store.of_classes, ref);
    tbl *second = make_tbl(cx, 32, "Second");
    EXPECT_EQ(second, first);
    EXPECT_EQ(cx.store.tables.size(), 1U);
    EXPECT_STREQ(second->tbl_name, "Second");
    EXPECT_EQ(second->tbl_au, 32U);
    EXPECT_EQ(second->tbl_size + second->tbl_capacity, 0U);
    EXPECT_EQ(reserve(*second, 8), 0U);
    EXPECT_EQ(second->tbl_size, 32U);
    EXPECT_EQ(contents(*second), std::string(8, '\0'));
    expect_sound(*second);
    EXPECT_NE(make_tbl(cx, 32, "Third"), second);
}

/* ---- Traces ---------------------------------------------------------------------------------------------------- */

std::string shown(const char *what, int bytes) {
    return std::string("alloc_tble: Records, ") + what + " size: " + std::to_string(bytes) + "\n";
}

class Traces : public Tables {
protected:
    void expect(int level, std::initializer_list<size_t> requests, const std::string &out, const std::string &err) {
        tbl t(32, "Records");
        cx.options.debugLevel = level;
        testing::internal::CaptureStdout();
        testing::internal::CaptureStderr();
        for (size_t request : requests)
            reserve(t, request);
        EXPECT_EQ(testing::internal::GetCapturedStderr(), err);
        EXPECT_EQ(testing::internal::GetCapturedStdout(), out);
    }
};

TEST_F(Traces, ShowReservationsAndGrowthFromLevel3) {
    expect(3, {8, 16}, shown("structure", 8) + shown("table", 32) + shown("structure", 16), "");
    expect(3, {24, 100},
           shown("structure", 24) + shown("table", 32) + shown("structure", 100) + shown("new table", 160),
           "alloc_tble: overflow by 100 b. Adding 128 b to Records\n");
    expect(9, {32}, shown("structure", 32) + shown("table", 32) + shown("new table", 64),
           "alloc_tble: overflow by 32 b. Adding 32 b to Records\n");
    expect(2, {24, 100}, "", "");
}

TEST_F(Traces, ShowSizesAsInts) {
    tbl t(32, "Records");
    reserve(t, 8);
    cx.options.debugLevel = 3;
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    ending_of([&] { reserve(t, ABSURD); });
    constexpr int AS_INT = static_cast<int>(ABSURD);
    std::string size = std::to_string(AS_INT);
    EXPECT_TRUE(testing::internal::GetCapturedStderr().starts_with("alloc_tble: overflow by " + size + " b. Adding " +
                                                                   size + " b to Records\n"));
    EXPECT_EQ(testing::internal::GetCapturedStdout(), shown("structure", AS_INT));
}

/* ---- Failures -------------------------------------------------------------------------------------------------- */

/* A failure of the system's, in its words: no line, errno as the status. */
ending out_of_memory(const std::string &what) {
    return {what + strerror(ENOMEM), 0, ENOMEM};
}

TEST_F(Tables, MemoryOfAContextComesZeroed) {
    for (size_t size : {1U, 24U, 4096U}) {
        std::unique_ptr<char, free_memory> fresh(static_cast<char *>(cfg_malloc(size)));
        EXPECT_TRUE(all_zero(fresh.get(), fresh.get() + size)) << size;
    }
}

TEST_F(Tables, MemoryThatIsNotToBeHadIsFatal) {
    cx.source.linenum = 7;
    EXPECT_EQ(ending_of([&] { cfg_malloc(ABSURD); }), out_of_memory("cfg_malloc malloc failure: "));
}

TEST_F(Tables, FirstBlockThatIsNotToBeHadIsFatal) {
    cx.source.linenum = 7;
    tbl t(ABSURD, "Records");
    EXPECT_EQ(ending_of([&] { reserve(t, 8); }), out_of_memory("Records: alloc_tble malloc failure: "));
    EXPECT_EQ(t.tbl_base, nullptr);
}

TEST_F(Tables, GrowthThatIsNotToBeHadIsFatalAndLeavesTheBlock) {
    cx.source.linenum = 7;
    tbl t(32, "Records");
    add_to_tbl(cx, &t, "kept", 5);
    const char *block = t.tbl_base;
    EXPECT_EQ(ending_of([&] { reserve(t, ABSURD); }), out_of_memory("Records: alloc_tble realloc failure: "));
    EXPECT_EQ(t.tbl_base, block);
    EXPECT_EQ(t.tbl_size, 32U);
    EXPECT_EQ(contents(t), bytes().text("kept").fill(4).all);
    expect_sound(t);
}

/* ---- Appending ------------------------------------------------------------------------------------------------- */

struct appended {
    const char *data;
    size_t len;
    size_t room; /* len rounded up to 8 */
};

const appended appends[] = {
    {"", 0, 0},
    {"a", 1, 8},
    {"abcd", 5, 8},
    {"abcdefg", 7, 8},
    {"abcdefgh", 8, 8},
    {"abcdefgh", 9, 16},
    {"abcdefghijklmnop", 16, 16},
    {"abcdefghijklmnop", 17, 24},
};

using append_function = vx_uint32_t (*)(cdgen &, tbl *, const void *, size_t);

TEST_F(Tables, AppendedBytesAreFilledUpToEight) {
    for (append_function append : {save_tbl_val_round, add_to_tbl})
        for (const appended &row : appends) {
            SCOPED_TRACE(row.len);
            tbl t(32, "Strings");
            reserve(t, 16);
            EXPECT_EQ(append(cx, &t, row.data, row.len), 16U);
            EXPECT_EQ(contents(t), bytes().fill(16).text({row.data, row.len}).fill(row.room - row.len).all);
            expect_sound(t);
        }
}

TEST_F(Tables, AppendedBytesStandAtTheReturnedOffset) {
    tbl t(32, "Strings");
    EXPECT_EQ(add_to_tbl(cx, &t, "first", 6), 0U);
    EXPECT_EQ(add_to_tbl(cx, &t, "the second one", 15), 8U);
    EXPECT_EQ(add_to_tbl(cx, &t, "3rd", 4), 24U); /* where the block has grown */
    EXPECT_STREQ(t.tbl_base, "first");
    EXPECT_STREQ(t.tbl_base + 8, "the second one");
    EXPECT_STREQ(t.tbl_base + 24, "3rd");
}

TEST_F(Tables, AppendingDoesNotAlignWhatOthersLeftUnaligned) {
    tbl t(32, "Strings");
    reserve(t, 3);
    EXPECT_EQ(add_to_tbl(cx, &t, "text", 5), 3U);
    EXPECT_EQ(add_to_tbl(cx, &t, "more", 5), 11U);
}

TEST_F(Tables, CopyIsFilledUpToEightAndNoFurther) {
    for (const appended &row : appends) {
        SCOPED_TRACE(row.len);
        std::string dst(32, '\xEE');
        memcpy_8_rounded(dst.data(), row.data, static_cast<int>(row.len));
        EXPECT_EQ(dst, bytes().text({row.data, row.len}).fill(row.room - row.len).fill(32 - row.room, 0xEE).all);
    }
}

/* ---- Looking up ------------------------------------------------------------------------------------------------ */

struct lookup {
    const char *rule;
    size_t offset;
    size_t size;
    bool found;
};

const lookup lookups[] = {
    {"the first bytes", 0, 8, true},
    {"all that is used", 0, 24, true},
    {"the last byte", 23, 1, true},
    {"nothing, at the end", 24, 0, true},
    {"nothing, after the end", 25, 0, false},
    {"the first byte that is free", 24, 1, false},
    {"across the end", 20, 5, false},
    {"more than is used", 0, 25, false},
    {"an offset that means none", 0xFFFFFFFF, 1, false},
    {"an offset and a size whose sum overflows", 8, SIZE_MAX, false},
    {"an offset that overflows", SIZE_MAX, 8, false},
};

const ending outside_the_table = {"Strings: reference outside the table - internal error", 0, 1};

TEST_F(Tables, OnlyTheUsedPartCanBeReferredTo) {
    cx.source.linenum = 7;
    tbl t(32, "Strings");
    reserve(t, 24);
    for (const lookup &row : lookups) {
        SCOPED_TRACE(row.rule);
        void *at = nullptr;
        auto end = ending_of([&] { at = tbl_at(&t, row.offset, row.size); });
        EXPECT_EQ(end, row.found ? std::nullopt : std::optional(outside_the_table));
        EXPECT_EQ(at, row.found ? t.tbl_base + row.offset : nullptr);
    }
}

TEST_F(Tables, NothingCanBeReferredToInATableWithoutABlock) {
    tbl t(32, "Strings");
    for (size_t size : {0U, 1U})
        EXPECT_EQ(ending_of([&] { tbl_at(&t, 0, size); }), outside_the_table) << size;
}

TEST_F(Tables, RecordsMustFitWhole) {
    tbl t(32, "Strings");
    vx_uint32_t numbers[] = {11, 22, 33};
    memcpy(alloc_tble(cx, &t, sizeof numbers), numbers, sizeof numbers);
    EXPECT_EQ(*record_at<vx_uint32_t>(&t, 8), 33U);
    EXPECT_EQ(ending_of([&] { record_at<vx_uint64_t>(&t, 8); }), outside_the_table);
}

TEST_F(Tables, RecordsAreThoseOfTheUsedPart) {
    tbl t(32, "Numbers");
    EXPECT_TRUE(records_of<vx_uint32_t>(nullptr).empty());
    EXPECT_TRUE(records_of<vx_uint32_t>(&t).empty());
    for (vx_uint32_t n : {11U, 22U, 33U})
        memcpy(alloc_tble(cx, &t, sizeof n), &n, sizeof n);
    std::span<vx_uint32_t> all = records_of<vx_uint32_t>(&t);
    EXPECT_EQ(std::vector<vx_uint32_t>(all.begin(), all.end()), (std::vector<vx_uint32_t>{11, 22, 33}));
    EXPECT_EQ(records_of<vx_uint64_t>(&t).size(), 1U); /* whole ones only */
}

TEST_F(Tables, ReferenceHoldsTheStagedTable) {
    cdb_ref_t ref;
    ref.offset[0] = ref.offset[1] = CDB_NONE;
    tbl t(32, "Numbers");
    stage_tbl(ref, &t);
    EXPECT_EQ(staged_tbl(ref), &t);
    stage_tbl(ref, nullptr);
    EXPECT_EQ(staged_tbl(ref), nullptr);
    EXPECT_EQ(ref.offset[0], 0U);
    EXPECT_EQ(ref.offset[1], 0U);
}

/* ---- The tables of a compilation ------------------------------------------------------------------------------- */

TEST_F(Tables, TakeNoMemoryBeforeTheFirstReservation) {
    const tbl *t = make_tbl(cx, 480, "Records");
    EXPECT_STREQ(t->tbl_name, "Records");
    EXPECT_EQ(t->tbl_au, 480U);
    EXPECT_EQ(t->used(), 0U);
    EXPECT_EQ(t->tbl_size + t->tbl_capacity, 0U);
    EXPECT_TRUE(!t->tbl_base && !t->tbl_prev_base && !t->tbl_next && !t->tbl_end);
}

using unit = std::pair<std::string, size_t>;

unit unit_of(const tbl &t) {
    return {t.tbl_name, t.tbl_au};
}

TEST_F(Tables, StayWhereTheyAreMade) {
    tbl *first = make_tbl(cx, 64, "First");
    reserve(*first, 8);
    for (int i = 0; i < 1000; ++i)
        make_tbl(cx, 32, "Other");
    EXPECT_EQ(&cx.store.tables.front(), first);
    EXPECT_EQ(unit_of(*first), (unit{"First", 64}));
    EXPECT_EQ(first->used(), 8U);
}

TEST_F(Tables, TablesOfTheContextHaveTheirUnits) {
    EXPECT_EQ(unit_of(cx.sections.rsrc_cmmap_tbl), (unit{"ResourceCMMaps", 480}));
    EXPECT_EQ(unit_of(cx.sections.rsrc_mgr_tbl), (unit{"ResourceManagers", 192}));
    EXPECT_EQ(unit_of(cx.sections.rsrc_var_class_tbl), (unit{"ResourceVariableClasses", 320}));
    EXPECT_EQ(unit_of(cx.sections.rsrc_class_tbl), (unit{"ResourceClasses", 3584}));
    EXPECT_EQ(unit_of(dflt_values("DefaultValues").cells), (unit{"DefaultValues", 32}));
}

TEST_F(Tables, TablesOfTheStanzasHaveTheirUnits) {
    init_class_tbl(cx);
    init_cmmap_tbl(cx);
    init_mgr_tbl(cx);
    init_var_class_tbl(cx);
    std::vector<unit> units;
    for (const tbl &t : cx.store.tables)
        units.push_back(unit_of(t));
    EXPECT_EQ(units, (std::vector<unit>{{"ClassPattrsC", 1152},
                                        {"ClassDattrsC", 2176},
                                        {"ClassPattrs", 1152},
                                        {"ClassDattrs", 2176},
                                        {"ClassActionsC", 224},
                                        {"ClassActions", 224},
                                        {"ClassErrors", 192},
                                        {"ClassDepends", 32},
                                        {"ClassSBSDefs", 320},
                                        {"ClassValidVals", 256},
                                        {"ClassVarietyList", 64},
                                        {"ClassStrings", 8192},
                                        {"ClassSDDefs", 160},
                                        {"CMMapStrings", 8192},
                                        {"ManagerStrings", 8192},
                                        {"VarClassStrings", 8192}}));
}

TEST_F(Tables, VariableIdsHaveTheirUnit) {
    init_class_tbl(cx);
    init_var_class_tbl(cx);
    rsrc_dattr_t attr = {};
    attr.u_ra_vclass.offset[0] = add_to_tbl(cx, staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings), "Volume", 7);
    memcpy(alloc_tble(cx, staged_tbl(cx.staged.cb_rsrc_class.u_rc_dattrs), sizeof attr), &attr, sizeof attr);
    add_to_tbl(cx, staged_tbl(cx.staged.cb_rsrc_variable_class.u_rvc_string_tbl), "Volume", 7);
    memcpy(alloc_tble(cx, &cx.sections.rsrc_class_tbl, sizeof cx.staged.cb_rsrc_class), &cx.staged.cb_rsrc_class,
           sizeof cx.staged.cb_rsrc_class);
    cmplt_var_class_tbl(cx);
    bld_var_id_tbls(cx);
    EXPECT_EQ(unit_of(cx.store.tables.back()), (unit{"VariableIDs", 64}));
}

} // namespace
