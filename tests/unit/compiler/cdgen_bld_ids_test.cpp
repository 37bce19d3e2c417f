/* The variable IDs of each variable class, and the table that pairs classes with their lists. */

#include "compiler/cdgen.h"
#include "compiler/given_interface.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

using ids = std::vector<var_id_t>;

/* A staged dynamic attribute: its number, and its variable class unless that is null. */
struct attribute {
    vx_int32_t id;
    const char *variable_class;
};

using attributes = std::vector<attribute>;

class VariableIds : public testing::Test {
protected:
    vx_uint32_t add_text(tbl *strings, const std::string &text) {
        return add_to_tbl(cx, strings, text.c_str(), text.size() + 1);
    }

    template <class Record> void append(tbl *t, const Record &record) {
        memcpy(alloc_tble(cx, t, sizeof record), &record, sizeof record);
    }

    tbl *staged(const attributes &from, tbl *strings) {
        tbl *records = make_tbl(cx, 2176, "ClassDattrs");
        for (const attribute &a : from) {
            rsrc_dattr_t attr = {};
            attr.ra_attr_id = a.id;
            attr.u_ra_vclass = {{a.variable_class == nullptr ? 0xFFFFFFFF : add_text(strings, a.variable_class), 7}};
            attr.u_ra_next_in_vclass = {{5, 6}};
            append(records, attr);
        }
        return records;
    }

    /* The class's strings begin with one that is not the name of anything. */
    void add_class(const attributes &of_class, const attributes &of_resource) {
        tbl *strings = make_tbl(cx, 8192, "ClassStrings");
        add_text(strings, "Class");
        rsrc_class_t record = {};
        stage_tbl(record.u_rc_strings, strings);
        stage_tbl(record.u_rc_dattrsC, staged(of_class, strings));
        stage_tbl(record.u_rc_dattrs, staged(of_resource, strings));
        append(&cx.sections.rsrc_class_tbl, record);
    }

    void add_variable_class(const std::string &name, const std::string &first_string = "") {
        tbl *strings = make_tbl(cx, 8192, "VarClassStrings");
        rsrc_variable_class_t record = {};
        if (!first_string.empty())
            add_text(strings, first_string);
        record.u_rvc_name = {{add_text(strings, name), 0}};
        stage_tbl(record.u_rvc_string_tbl, strings);
        append(&cx.sections.rsrc_var_class_tbl, record);
    }

    rsrc_variable_class_t &variable_class(size_t n) {
        return records_of<rsrc_variable_class_t>(&cx.sections.rsrc_var_class_tbl)[n];
    }

    ids ids_of(size_t n) {
        std::span<var_id_t> found = records_of<var_id_t>(find_tbl_entry(cx, &variable_class(n)));
        EXPECT_EQ(variable_class(n).rvc_var_count, found.size());
        return {found.begin(), found.end()};
    }

    cdgen cx;
};

TEST_F(VariableIds, ClassAttributesComeFirstWithBit15Set) {
    add_variable_class("V");
    add_class({{5, "V"}}, {{5, "V"}});
    bld_var_id_tbls(cx);
    EXPECT_EQ(ids_of(0), (ids{0x8005, 5}));
}

TEST_F(VariableIds, OrderIsClassByClassAndInAClassThatOfItsAttributes) {
    add_variable_class("V");
    add_class({{11, "V"}, {10, "V"}}, {{21, "V"}, {20, "V"}, {22, "V"}});
    add_class({{1, "V"}}, {{2, "V"}});
    bld_var_id_tbls(cx);
    EXPECT_EQ(ids_of(0), (ids{0x800B, 0x800A, 21, 20, 22, 0x8001, 2}));
}

TEST_F(VariableIds, OnlyBit15OfAClassAttributesNumberChanges) {
    const struct {
        vx_int32_t id;
        var_id_t of_class, of_resource;
    } rows[] = {{0, 0x8000, 0},
                {0x7FFF, 0xFFFF, 0x7FFF},
                {0x8001, 0x8001, 0x8001},
                {0x12345, 0x1A345, 0x12345},
                {-1, 0xFFFFFFFF, 0xFFFFFFFF},
                {-0x10000, 0xFFFF8000, 0xFFFF0000}};
    ids expected;
    attributes both;
    for (const auto &row : rows)
        both.push_back({row.id, "V"});
    for (const auto &row : rows)
        expected.push_back(row.of_class);
    for (const auto &row : rows)
        expected.push_back(row.of_resource);
    add_variable_class("V");
    add_class(both, both);
    bld_var_id_tbls(cx);
    EXPECT_EQ(ids_of(0), expected);
}

TEST_F(VariableIds, EachVariableClassHasItsOwn) {
    add_variable_class("A");
    add_variable_class("Nobody's");
    add_variable_class("B", "a string in front of the name");
    add_class({{1, "B"}, {2, "A"}}, {{3, "A"}, {4, "B"}});
    bld_var_id_tbls(cx);
    EXPECT_EQ(ids_of(0), (ids{0x8002, 3}));
    EXPECT_EQ(ids_of(1), (ids{}));
    EXPECT_EQ(ids_of(2), (ids{0x8001, 4}));
    EXPECT_EQ(find_tbl_entry(cx, &variable_class(1)), nullptr);
    EXPECT_EQ(cx.variable_ids.tbl_entry_used, 2u);
}

TEST_F(VariableIds, OfTwoVariableClassesWithOneNameTheFirstHasAll) {
    add_variable_class("Other");
    add_variable_class("V");
    add_variable_class("V");
    add_class({{1, "V"}}, {{2, "V"}});
    bld_var_id_tbls(cx);
    EXPECT_EQ(ids_of(1), (ids{0x8001, 2}));
    EXPECT_EQ(ids_of(2), (ids{}));
}

TEST_F(VariableIds, NamesMustBeEqualByteForByte) {
    add_variable_class("Load");
    for (const char *name : {"load", "Loa", "Loads", "Load ", " Load", ""})
        add_class({}, {{1, name}});
    add_class({}, {{2, "Load"}});
    bld_var_id_tbls(cx);
    EXPECT_EQ(ids_of(0), (ids{2}));
}

TEST_F(VariableIds, VariableClassWithoutStringsIsNeverFound) {
    rsrc_variable_class_t unnamed = {};
    stage_tbl(unnamed.u_rvc_string_tbl, make_tbl(cx, 8192, "VarClassStrings"));
    append(&cx.sections.rsrc_var_class_tbl, unnamed);
    add_variable_class("V");
    add_class({{1, ""}}, {{2, "V"}});
    bld_var_id_tbls(cx);
    EXPECT_EQ(ids_of(0), (ids{}));
    EXPECT_EQ(ids_of(1), (ids{2}));
}

TEST_F(VariableIds, AttributesReferenceIsClearedWhetherItNamedAClassOrNot) {
    add_variable_class("V");
    attributes all = {{1, "V"}, {2, "unknown"}, {3, nullptr}};
    add_class(all, all);
    bld_var_id_tbls(cx);
    const rsrc_class_t &record = records_of<rsrc_class_t>(&cx.sections.rsrc_class_tbl)[0];
    for (const cdb_ref_t &table : {record.u_rc_dattrsC, record.u_rc_dattrs}) {
        std::span<rsrc_dattr_t> attrs = records_of<rsrc_dattr_t>(staged_tbl(table));
        ASSERT_EQ(attrs.size(), 3u);
        for (const rsrc_dattr_t &attr : attrs) {
            EXPECT_EQ(attr.u_ra_vclass.offset[0], 0u);
            EXPECT_EQ(attr.u_ra_vclass.offset[1], 0u);
            EXPECT_EQ(attr.u_ra_next_in_vclass.offset[0], 5u);
            EXPECT_EQ(attr.u_ra_next_in_vclass.offset[1], 6u);
        }
    }
}

TEST_F(VariableIds, UnknownNameIsDroppedInSilence) {
    add_class({{1, "V"}}, {{2, "V"}}); /* no variable class at all */
    bld_var_id_tbls(cx);
    EXPECT_EQ(cx.variable_ids.tbl_entry_used, 0u);
}

TEST_F(VariableIds, NothingStagedIsNoError) {
    bld_var_id_tbls(cx);
    append(&cx.sections.rsrc_class_tbl, rsrc_class_t{}); /* a class with empty tables */
    bld_var_id_tbls(cx);
    EXPECT_EQ(cx.variable_ids.tbl_entry_used, 0u);
}

TEST_F(VariableIds, ListGrowsByUnitsOf64Bytes) {
    add_variable_class("V");
    add_class({}, {{1, "V"}});
    bld_var_id_tbls(cx);
    const tbl *list = find_tbl_entry(cx, &variable_class(0));
    ASSERT_NE(list, nullptr);
    EXPECT_STREQ(list->tbl_name, "VariableIDs");
    EXPECT_EQ(list->tbl_au, 64u);
    EXPECT_EQ(list->used(), 4u);
}

TEST_F(VariableIds, ManyIdsKeepTheirOrder) {
    attributes many;
    ids expected;
    for (vx_int32_t id = 1000; id > 0; --id) {
        many.push_back({id, "V"});
        expected.push_back(static_cast<var_id_t>(id));
    }
    add_variable_class("V");
    add_class({}, many);
    bld_var_id_tbls(cx);
    EXPECT_EQ(ids_of(0), expected);
}

std::vector<std::string> many_names(size_t count) {
    std::vector<std::string> names;
    for (size_t i = 0; i < count; ++i)
        names.push_back("V" + std::to_string(i));
    return names;
}

/* One for each variable class. The names must outlive them. */
attributes attributes_naming(const std::vector<std::string> &names) {
    attributes named;
    for (const std::string &name : names)
        named.push_back({9, name.c_str()});
    return named;
}

TEST_F(VariableIds, HundredVariableClassesMayHaveThem) {
    std::vector<std::string> names = many_names(100);
    add_variable_class("Nobody's");
    for (const std::string &name : names)
        add_variable_class(name);
    add_class({}, attributes_naming(names));
    bld_var_id_tbls(cx);
    EXPECT_EQ(cx.variable_ids.tbl_entry_used, 100u);
    EXPECT_EQ(ids_of(0), (ids{}));
    EXPECT_EQ(ids_of(100), (ids{9}));
}

std::string message_of(const fatal_exit &failure) {
    auto [first, second, third] = words_of(failure);
    return std::string(first) + second + third;
}

TEST_F(VariableIds, HundredAndFirstIsFatal) {
    std::vector<std::string> names = many_names(101);
    for (const std::string &name : names)
        add_variable_class(name);
    add_class({}, attributes_naming(names));
    try {
        bld_var_id_tbls(cx);
        FAIL() << "not refused";
    } catch (const fatal_exit &failure) {
        EXPECT_EQ(message_of(failure), "Too many variable classes with dynamic attributes (100 at most)");
        EXPECT_EQ(failure.line, 0);
        EXPECT_EQ(failure.code, 1);
    }
}

/* ---- The pairs ------------------------------------------------------------------------------------------------- */

class VariableIdPairs : public testing::Test {
protected:
    cdgen cx;
    rsrc_variable_class_t classes[101] = {};
    tbl lists[2] = {{64, "first"}, {64, "second"}};
};

TEST_F(VariableIdPairs, ClassWithoutAListHasNone) {
    EXPECT_EQ(find_tbl_entry(cx, &classes[0]), nullptr);
    add_tbl_entry(cx, &classes[0], &lists[0]);
    EXPECT_EQ(find_tbl_entry(cx, &classes[1]), nullptr);
}

TEST_F(VariableIdPairs, EachClassFindsItsList) {
    add_tbl_entry(cx, &classes[0], &lists[0]);
    add_tbl_entry(cx, &classes[1], &lists[1]);
    EXPECT_EQ(find_tbl_entry(cx, &classes[0]), &lists[0]);
    EXPECT_EQ(find_tbl_entry(cx, &classes[1]), &lists[1]);
}

TEST_F(VariableIdPairs, FirstOfSeveralIsFound) {
    add_tbl_entry(cx, &classes[0], &lists[1]);
    add_tbl_entry(cx, &classes[0], &lists[0]);
    EXPECT_EQ(find_tbl_entry(cx, &classes[0]), &lists[1]);
}

TEST_F(VariableIdPairs, DeletingClearsEveryPairOfTheClassAndFreesNoPlace) {
    add_tbl_entry(cx, &classes[0], &lists[0]);
    add_tbl_entry(cx, &classes[1], &lists[1]);
    add_tbl_entry(cx, &classes[0], &lists[1]);
    del_tbl_entry(cx, &classes[0]);
    EXPECT_EQ(find_tbl_entry(cx, &classes[0]), nullptr);
    EXPECT_EQ(find_tbl_entry(cx, &classes[1]), &lists[1]);
    for (size_t cleared : {size_t{0}, size_t{2}}) {
        EXPECT_EQ(cx.variable_ids.tbl_entries[cleared].rvcp, nullptr);
        EXPECT_EQ(cx.variable_ids.tbl_entries[cleared].tp, nullptr);
    }
    EXPECT_EQ(cx.variable_ids.tbl_entry_used, 3u);
    add_tbl_entry(cx, &classes[2], &lists[0]);
    EXPECT_EQ(cx.variable_ids.tbl_entries[3].rvcp, &classes[2]);
}

TEST_F(VariableIdPairs, DeletingAnUnknownClassChangesNothing) {
    add_tbl_entry(cx, &classes[0], &lists[0]);
    del_tbl_entry(cx, &classes[1]);
    EXPECT_EQ(find_tbl_entry(cx, &classes[0]), &lists[0]);
}

TEST_F(VariableIdPairs, HundredFitAndTheNextIsFatal) {
    for (size_t i = 0; i < 100; ++i)
        add_tbl_entry(cx, &classes[i], &lists[i % 2]);
    EXPECT_EQ(find_tbl_entry(cx, &classes[99]), &lists[1]);
    EXPECT_THROW(add_tbl_entry(cx, &classes[100], &lists[0]), fatal_exit);
    EXPECT_EQ(cx.variable_ids.tbl_entry_used, 100u);
}

TEST_F(VariableIdPairs, DeletedPlacesDoNotMakeRoom) {
    for (size_t i = 0; i < 100; ++i)
        add_tbl_entry(cx, &classes[i], &lists[0]);
    del_tbl_entry(cx, &classes[5]);
    EXPECT_THROW(add_tbl_entry(cx, &classes[100], &lists[0]), fatal_exit);
}

} // namespace
