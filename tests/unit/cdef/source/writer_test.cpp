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
