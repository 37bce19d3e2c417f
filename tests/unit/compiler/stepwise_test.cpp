/* The steps of a compilation one by one, and what callers repair after an error. */

#include "compiler/stepwise.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <span>
#include <string>
#include <vector>

namespace {

struct looking_on final : line_observer {
    void attribute_read(const table_attrs &attr, std::string_view value) override {
        names.emplace_back(attr.ta_name);
        values.emplace_back(value);
    }
    bool excuses_missing(int) const override {
        return excuses;
    }

    bool excuses = false;
    std::vector<std::string> names, values;
};

class Stepwise : public testing::Test {
protected:
    void take(std::string text) {
        size_t blanks = text.find_first_not_of('\t');
        text.reserve(text.size() + READ_AHEAD);
        compiler.take_line({text.data(), text.data() + blanks, text.data() + text.size()});
    }
    /* The message of a line that fails, NO_MESSAGE if it does not. */
    message_id failing(const std::string &text) {
        try {
            take(text);
        } catch (const fatal_exit &failure) {
            failed_record = failure.record;
            return failure.id;
        }
        return NO_MESSAGE;
    }

    looking_on observer;
    stepwise_compiler compiler{"source", "Out.cdef", observer};
    int failed_record = -1;
};

TEST_F(Stepwise, ObserverLearnsAttributesAndExcusesMissingOnes) {
    take("ControlDefinition");
    take("PersistentResourceAttribute");
    EXPECT_EQ(failing("\tGroupID=7"), MSG_OPTIONAL_TOO_EARLY);
    observer.excuses = true;
    EXPECT_EQ(failing("\tGroupID=\"8\""), NO_MESSAGE);
    EXPECT_EQ(observer.names, (std::vector<std::string>{"GroupID", "GroupID"}));
    EXPECT_EQ(observer.values, (std::vector<std::string>{"7", "8"}));
}

TEST_F(Stepwise, HeaderThatFailsLeavesTheStanzaBeforeIt) {
    take("ControlDefinition");
    take("PersistentResourceAttribute");
    EXPECT_EQ(failing("Nonsense"), MSG_UNKNOWN_STANZA);
    EXPECT_EQ(failing("\tName=N"), NO_MESSAGE);
    EXPECT_EQ(compiler.required_seen(SC_PERSISTENT_RESOURCE_ATTRIBUTE), 1u);
    EXPECT_EQ(compiler.previous_kind(), SC_CONTROL_DEFINITION);
}

TEST_F(Stepwise, FailureSaysWhichCompletionItEndedAndItsRecordCanBeDropped) {
    take("ControlDefinition");
    take("DynamicClassAttribute");
    testing::internal::CaptureStdout();
    EXPECT_EQ(failing("DynamicClassAttribute"), MSG_INCOMPLETE_STANZA);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    EXPECT_EQ(failed_record, SC_DYNAMIC_CLASS_ATTRIBUTE);
    compiler.drop_record(SC_DYNAMIC_CLASS_ATTRIBUTE);
    EXPECT_FALSE(compiler.is_open(SC_DYNAMIC_CLASS_ATTRIBUTE));
    EXPECT_EQ(failing("DynamicClassAttribute"), NO_MESSAGE);
}

TEST_F(Stepwise, RunCanBeGivenUpOrItsElementCompleted) {
    take("ControlDefinition");
    take("DefineSDDefinition");
    EXPECT_EQ(failing("ResourceClass"), MSG_INCOMPLETE_STANZA);
    compiler.complete_element();
    EXPECT_EQ(failing("DefineSDDefinition"), NO_MESSAGE);
    EXPECT_TRUE(compiler.run_is_open());
    compiler.give_up_run();
    EXPECT_FALSE(compiler.run_is_open());
    EXPECT_EQ(compiler.expected_index(), 0);
    EXPECT_EQ(failing("ResourceClass"), NO_MESSAGE);
}

TEST_F(Stepwise, StanzasWithoutAClassGetOne) {
    EXPECT_EQ(failing("ClassAction"), MSG_NO_CLASS_FOR_ACTION);
    EXPECT_TRUE(compiler.open_placeholder_class());
    EXPECT_FALSE(compiler.open_placeholder_class());
    EXPECT_EQ(failing("ClassAction"), NO_MESSAGE);
}

TEST_F(Stepwise, ElementsOfNobodyAreTakenAllTheSame) {
    take("ControlDefinition");
    EXPECT_EQ(failing("PAttrSDDefinition"), MSG_NO_SD_ATTRIBUTE);
    compiler.begin_ownerless_run(SC_PATTR_SD_DEFINITION);
    EXPECT_FALSE(compiler.run_makes_value());
    EXPECT_EQ(failing("\tElementIndex=1"), MSG_INDEX_NOT_CONSECUTIVE);
    compiler.expect_index(2);
    EXPECT_EQ(failing("\tElementName=E"), NO_MESSAGE);
}

TEST_F(Stepwise, SourceIsTakenFromItsFirstLineToTheLastClosingStep) {
    no_observer nobody;
    auto other = std::make_unique<stepwise_compiler>("source", "Out.cdef", nobody);
    other->take_source("# a comment\nControlDefinition\n\tFileVersion=7\n"
                       "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=9\n"
                       "\tDescriptiveMessageSet=1");
    std::vector<std::byte> image = other->image();
    orb_cdb_header_t header;
    ASSERT_GE(image.size(), sizeof header);
    std::memcpy(&header, image.data(), sizeof header);
    EXPECT_EQ(header.cdb_hdr_length, image.size() - 4);
}

TEST_F(Stepwise, SourceIsTakenInPartsAndItsImageIsMadeInGivenMemory) {
    const std::string head = "ControlDefinition\n\tFileVersion=7\n";
    const std::string map = "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=9\n";
    no_observer nobody;
    auto whole = std::make_unique<stepwise_compiler>("source", "Out.cdef", nobody);
    whole->take_source(head + map + "\tDescriptiveMessageSet=1\n");
    auto parts = std::make_unique<stepwise_compiler>("source", "Out.cdef", nobody);
    parts->take_lines(head);
    parts->take_lines(map);
    parts->take_lines("\tDescriptiveMessageSet=1\n");
    EXPECT_EQ(parts->line_number(), 7);
    parts->take_end();
    std::vector<std::byte> memory(parts->size_image());
    std::span<std::byte> image = parts->image_in(memory);
    std::vector<std::byte> expected = whole->image();
    ASSERT_EQ(image.size(), expected.size());
    EXPECT_EQ(std::memcmp(image.data() + sizeof(orb_cdb_header_t), expected.data() + sizeof(orb_cdb_header_t),
                          expected.size() - sizeof(orb_cdb_header_t)),
              0); /* the headers differ in their times */
}

TEST_F(Stepwise, SourceThatLacksARequiredAttributeFailsInAClosingStep) {
    no_observer nobody;
    auto other = std::make_unique<stepwise_compiler>("source", "Out.cdef", nobody);
    testing::internal::CaptureStdout();
    EXPECT_THROW(other->take_source("ControlDefinition\nDynamicClassAttribute\n"), fatal_exit);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
}

TEST_F(Stepwise, OverflowIsRememberedUntilItIsForgotten) {
    take("ControlDefinition");
    take("PersistentResourceAttribute");
    take("\tDescription=99999999999999999999");
    EXPECT_EQ(compiler.conversion_errno(), ERANGE);
    compiler.forget_overflow();
    EXPECT_EQ(compiler.conversion_errno(), 0);
}

} // namespace
