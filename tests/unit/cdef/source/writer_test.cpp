/* Writing the text of a source. */

#include "cdef/source/writer.h"

#include "cdef/source/error.h"

#include <gtest/gtest.h>

namespace {

using namespace cdef::source;

TEST(SourceWriter, WritesStanzasAndLines) {
    source_writer out;
    out.stanza("ResourceClass", place_of("ResourceClass", "C"));
    out.line("Description", 5);
    out.optional_line("GroupID", 255, 255);
    out.stanza("ControlDefinition", place_of("ResourceClass", "C"));
    out.comment("a\nb");
    EXPECT_EQ(out.text, "\nResourceClass\n\tDescription=5\n\nControlDefinition\n# a\n# b\n");
}

/* Two stanzas, of which the first has 65,536 bytes or more. */
TEST(SourceWriter, PassesOnPartsThatEndWhereAStanzaBegins) {
    std::vector<std::size_t> sizes;
    source_writer out([&](std::string_view part) { sizes.push_back(part.size()); });
    out.stanza("ResourceClass", place_of("ResourceClass", "C"));
    std::size_t before = out.text.size();
    for (int i = 0; i < 10000; ++i)
        out.line("GroupID", 7);
    EXPECT_TRUE(sizes.empty());
    out.stanza("ResourceAction", place_of("ResourceAction", "A"));
    std::size_t after = out.text.size();
    out.flush();
    EXPECT_EQ(sizes, (std::vector<std::size_t>{before + 110000, after}));
}

TEST(SourceWriter, TakesTheFirstTextThatFits) {
    source_writer out;
    out.line_of_any("Name", {"a\nb", "c", "d"});
    EXPECT_EQ(out.text, "\tName=c\n");
}

TEST(SourceWriter, RefusesWhatNoLineSays) {
    source_writer out;
    out.stanza("ResourceClass", place_of("ResourceClass", "C"));
    try {
        out.line("Name", "");
        FAIL();
    } catch (const no_source_error &e) {
        EXPECT_STREQ(e.what(), "no source: ResourceClass 'C': no line can give its Name ('')");
    }
}

TEST(SourceWriter, NamesTheElementOfARecord) {
    EXPECT_EQ(text_of(place_of("ActionInSDDefinition", "A").with_element("E")),
              "ActionInSDDefinition 'A', element 'E'");
    EXPECT_EQ(text_of({"ClassToManagerMapping"}), "ClassToManagerMapping");
}

} // namespace
