/* The proof that a source gives the database that it was made from. */

#include "cdef/source/proof.h"

#include "cdef/source/error.h"
#include "compare/compiled.h"

#include <gtest/gtest.h>

namespace {

std::string source_with(const std::string &last_key) {
    return "ControlDefinition\n\tFileVersion=1\n"
           "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=" +
           last_key + "\n\tDescriptiveMessageSet=1\n";
}

/* What the proof says of a text as the source of a database with LastKey 9; empty if it is one. */
std::string refusal_of(const std::string &text, const std::string &output = "C.cdef") {
    std::vector<std::byte> image = compiled::image_of(source_with("9"));
    cdb::database db(image);
    cdb::ownership owners(db, {});
    cdef::source::proof compiled(output, db, owners);
    try {
        std::size_t half = text.find("ClassToManagerMapping");
        compiled.take(text.substr(0, half));
        compiled.take(text.substr(half));
        compiled.require_equal();
    } catch (const cdef::source::no_source_error &e) {
        return e.what();
    }
    return "";
}

TEST(SourceProof, SourceOfTheSameDatabaseIsOne) {
    EXPECT_EQ(refusal_of(source_with("9")), "");
}

TEST(SourceProof, FirstDifferenceIsTheReason) {
    EXPECT_EQ(refusal_of(source_with("8")),
              "no source: ClassToManagerMapping: compiled again, its last key would be 8, not 9");
}

TEST(SourceProof, WhatIsGoneIsTheReason) {
    EXPECT_EQ(refusal_of(source_with("9"), "D.cdef"), "no source: ResourceClass 'C': compiled again, it would be gone");
}

TEST(SourceProof, MessageOfTheCompilerIsTheReason) {
    EXPECT_EQ(refusal_of(source_with("9") + "Nonsense\n"),
              "no source: database: its source would not compile: line 8: Invalid table name: Nonsense");
}

} // namespace
