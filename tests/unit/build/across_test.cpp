/* Conflicts between classes that are built together. */

#include "build/across.h"

#include "check/found_in.h"
#include "compiler/stepwise.h"

#include <gtest/gtest.h>

namespace {

using build::class_facts;
using found_in::codes;

std::string variables(const std::string &name, const std::string &interval, const std::string &more = {}) {
    return "ResourceVariableClass\n\tVariableClass=" + name + "\n\tObservationInterval=" + interval +
           "\n\tReportingInterval=60\n" + more;
}

/* CLASS with other keys, catalog, manager or name. */
std::string changed(const std::string &from, const std::string &to, std::string text = found_in::CLASS) {
    return text.replace(text.find(from), from.size(), to);
}

class Across : public testing::Test {
protected:
    /* The warnings about a source: code, line, text. */
    codes add(const std::string &name, const std::string &text) {
        class_facts facts;
        auto finish = [&](stepwise_compiler &compiler, const check::view &see) {
            facts = build::facts_of(see, compiler.image());
        };
        check::compile_job job = {"x.cdef", finish};
        check::check_bytes(
            text, name, {}, [](check::finding &&) {}, &job);
        codes all;
        others.clear();
        for (const check::finding &each : family.add(name, facts, wanted)) {
            all.push_back(found_in::shown(each) + " " + each.text);
            for (const check::elsewhere &other : each.others)
                others.push_back(other.file + ":" + std::to_string(other.what.at.file_line) + ":" +
                                 std::to_string(other.what.at.column) + " " + other.what.text);
        }
        return all;
    }

    check::warning_set wanted = found_in::all_warnings();
    build::class_family family;
    codes others; /* the places in other sources that the latest warnings name */
};

TEST_F(Across, ReportsAClassOfTheSameName) {
    std::string other = changed("MessageCatalog=m", "MessageCatalog=n");
    EXPECT_EQ(add("a", found_in::CLASS), codes());
    EXPECT_EQ(add("b", other), codes{"S611 3 the class `Pump` is also in a:3"});
    EXPECT_EQ(others, codes{"a:3:0 the other class `Pump`"});
    EXPECT_EQ(add("c", changed("Name=Pump", "Name=pump", changed("MessageCatalog=m", "MessageCatalog=o"))), codes());
}

TEST_F(Across, KnowsThePlaceOfEachClassInASource) {
    std::string first = found_in::CLASS.substr(0, found_in::CLASS.find("ClassToManagerMapping")); /* 9 lines */
    EXPECT_EQ(add("a", first + changed("Name=Pump", "Name=Fan")), codes());
    EXPECT_EQ(add("b", changed("MessageCatalog=m", "MessageCatalog=n")),
              codes{"S611 3 the class `Pump` is also in a:3"});
    EXPECT_EQ(add("c", changed("Name=Pump", "Name=Fan", changed("MessageCatalog=m", "MessageCatalog=o"))),
              codes{"S611 3 the class `Fan` is also in a:12"});
}

TEST_F(Across, ReportsKeysThatOverlapInOneCatalog) {
    std::string other = changed("Name=Pump", "Name=Fan");
    EXPECT_EQ(add("a", found_in::CLASS), codes());
    EXPECT_EQ(add("b", changed("FirstKey=1\n\tLastKey=2", "FirstKey=3\n\tLastKey=9", other)), codes());
    std::string third = changed("Name=Pump", "Name=Lamp");
    EXPECT_EQ(add("c", changed("FirstKey=1\n\tLastKey=2", "FirstKey=9\n\tLastKey=12", third)),
              codes{"S612 12:11+1 the keys 9 to 12 overlap 3 to 9 in b:12, which has the message catalog `m` too"});
    EXPECT_EQ(others, codes{"b:12:11 the keys 3 to 9"});
    std::string fourth = changed("Name=Pump", "Name=Door");
    EXPECT_EQ(add("d", changed("MessageCatalog=m", "MessageCatalog=n", fourth)), codes());
}

TEST_F(Across, ReportsAnotherManagerOfOneCatalog) {
    std::string other = changed("FirstKey=1\n\tLastKey=2", "FirstKey=3\n\tLastKey=9", changed("Name=Pump", "Name=Fan"));
    EXPECT_EQ(add("a", found_in::CLASS), codes());
    EXPECT_EQ(add("b", changed("ResourceManager=M", "ResourceManager=N", other)),
              codes{"S613 11:18+1 classes with the message catalog `m` have the manager `N` here and `M` in a:11"});
    EXPECT_EQ(others, codes{"a:11:18 the manager `M`"});
}

TEST_F(Across, ReportsVariableClassesThatDiffer) {
    std::string other = changed("MessageCatalog=m", "MessageCatalog=n", changed("Name=Pump", "Name=Fan"));
    std::string third = changed("MessageCatalog=m", "MessageCatalog=o", changed("Name=Pump", "Name=Lamp"));
    EXPECT_EQ(add("a", found_in::CLASS + variables("V", "5")), codes());
    EXPECT_EQ(add("b", other + variables("V", "5") + variables("W", "6")), codes());
    EXPECT_EQ(add("c", third + variables("V", "6") + variables("W", "6", "\tAlias=U\n")),
              codes{"S614 17:16+1 the variable class `V` has other intervals or another alias than in a:17"});
    EXPECT_EQ(others, codes{"a:17:16 the other variable class `V`"});
}

TEST_F(Across, IsSilentAboutWhatIsNotWanted) {
    wanted[check::SHARED_NAME] = wanted[check::SHARED_KEYS] = false;
    EXPECT_EQ(add("a", found_in::CLASS), codes());
    EXPECT_EQ(add("b", found_in::CLASS), codes());
}

} // namespace
