/* The order of stanzas, from the traces that they have left in a database. */

#include "cdef/source/order.h"

#include <gtest/gtest.h>

namespace {

using namespace cdef::source;

using tables = std::array<std::vector<traces>, RECORD_TABLES>;
constexpr auto PATTRS = static_cast<std::size_t>(table::persistent_attributes);
constexpr auto DATTRS = static_cast<std::size_t>(table::dynamic_attributes);

TEST(SourceOrder, NothingHasNoOrder) {
    EXPECT_TRUE(order_of({}, {}).empty());
}

TEST(SourceOrder, VarietyListsMixTheTables) {
    tables records;
    records[PATTRS] = {{.variety_list = 0, .name = 8}, {.variety_list = 32, .name = 24}};
    records[DATTRS] = {{.variety_list = 16, .name = 16}};
    EXPECT_EQ(order_of(records, {}), (std::vector<step>{{table::persistent_attributes, 0},
                                                        {table::dynamic_attributes, 0},
                                                        {table::persistent_attributes, 1}}));
}

TEST(SourceOrder, RecordsOfATableKeepTheirOrder) {
    tables records;
    records[PATTRS] = {{.variety_list = 32, .name = 8}, {.variety_list = 0, .name = 24}};
    EXPECT_EQ(order_of(records, {}),
              (std::vector<step>{{table::persistent_attributes, 0}, {table::persistent_attributes, 1}}));
}

TEST(SourceOrder, InputsComeBetweenByTheirNames) {
    tables records;
    records[PATTRS] = {{.variety_list = 0, .name = 8}, {.variety_list = 16, .name = 24}};
    const std::vector<traced_step> inputs = {{{table::inputs, 1}, {0, 32}}, {{table::inputs, 4}, {0, 16}}};
    EXPECT_EQ(order_of(records, inputs), (std::vector<step>{{table::persistent_attributes, 0},
                                                            {table::inputs, 4},
                                                            {table::persistent_attributes, 1},
                                                            {table::inputs, 1}}));
}

TEST(SourceOrder, InputsHaveTheirStanzas) {
    EXPECT_EQ(class_inputs[0].stanza(), "DefineSDDefinition");
    EXPECT_EQ(class_inputs[4].stanza(), "ResetSDDefinition");
}

} // namespace
