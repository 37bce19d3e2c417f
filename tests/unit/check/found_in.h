/* found_in.h: checks a few lines of source in memory, and shows what is found in them. */
#ifndef CDGEN_TESTS_FOUND_IN_H
#define CDGEN_TESTS_FOUND_IN_H

#include "check/check.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <vector>

namespace found_in {

using codes = std::vector<std::string>;

inline check::warning_set all_warnings() {
    check::warning_set all;
    all.fill(true);
    return all;
}

inline std::vector<check::finding> findings_in(std::string_view source,
                                               const check::warning_set &wanted = all_warnings()) {
    std::vector<check::finding> found;
    check::check_bytes(source, "source", wanted, [&](check::finding &&each) { found.push_back(std::move(each)); });
    return found;
}

/* "S508 17:10+5": code, line, column and length; without column and length where the whole line is meant. */
inline std::string shown(const check::finding &found) {
    std::string text = std::string(found.code) + " " + std::to_string(found.at.line);
    if (found.at.column != 0)
        text += ":" + std::to_string(found.at.column) + "+" + std::to_string(found.at.length);
    return text;
}

inline codes found_in(std::string_view source) {
    codes all;
    for (const check::finding &each : findings_in(source))
        all.push_back(shown(each));
    return all;
}

/* A sound class: 15 lines. What a test adds begins in line 16. */
inline const std::string CLASS = "ControlDefinition\n\tFileVersion=1.0.0.0\n"
                                 "ResourceClass\n\tDescription=1\n\tDisplayName=2\n\tProperties=HasResources\n"
                                 "\tClassPermTemplate=0\n\tResourcePermTemplate=0\n\tName=Pump\n"
                                 "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=2\n"
                                 "\tMessageCatalog=m\n\tDescriptiveMessageSet=1\n";

/* A stanza of a class of 7 lines, and those that follow. */
inline std::string persistent(std::string_view name, std::string_view id, std::string_view type,
                              std::string_view more = {}) {
    return std::string("PersistentResourceAttribute\n\tName=")
        .append(name)
        .append("\n\tDescription=3\n\tDisplayName=4\n\tId=")
        .append(id)
        .append("\n\tDataType=")
        .append(type)
        .append("\n\tVarietyRange=1,1\n")
        .append(more);
}

/* A stanza of 8 lines, and those that follow. */
inline std::string dynamic(std::string_view kind, std::string_view name, std::string_view id,
                           std::string_view more = {}) {
    return std::string(kind)
        .append("\n\tName=")
        .append(name)
        .append("\n\tDescription=3\n\tDisplayName=4\n\tId=")
        .append(id)
        .append("\n\tDataType=UInt32\n\tVariableType=Counter\n\tVarietyRange=1,1\n")
        .append(more);
}

/* A stanza of 6 lines. */
inline std::string element(std::string_view kind, std::string_view type, std::string_view index = "0") {
    return std::string(kind)
        .append("\n\tElementName=E\n\tDescription=5\n\tDisplayName=6\n\tElementIndex=")
        .append(index)
        .append("\n\tDataType=")
        .append(type)
        .append("\n");
}

} // namespace found_in

#endif
