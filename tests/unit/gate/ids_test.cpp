/* The file of all numbers that were ever in use. */

#include "gate/ids.h"

#include <gtest/gtest.h>

namespace {

gate::numbered called(const std::string &class_name, const std::string &name) {
    return {class_name, compare::node_kind::action, 7, name, "-"};
}

TEST(GateIds, ReadsWhatItWrites) {
    std::vector<gate::numbered> odd = {called("#Disk", "a\tb"), called("", "\\n\n\r#"), called("\\# ", "")};
    gate::id_record record;
    record.accept(odd);
    gate::id_record again(record.text());
    EXPECT_EQ(again.text(), record.text());
    EXPECT_TRUE(again.judge(odd, gate::source_places("")).empty());
}

TEST(GateIds, WritesALineForEachNumber) {
    gate::id_record record;
    record.accept({called("#Disk", "Check")});
    EXPECT_EQ(record.text().substr(record.text().find('\n') + 1), "\\#Disk\tResourceAction\t7\t-\tCheck\n");
}

} // namespace
