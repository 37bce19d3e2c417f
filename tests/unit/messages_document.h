/* messages_document.h: docs/messages.md, to be compared with the tables that it explains. */
#ifndef CDGEN_TESTS_MESSAGES_DOCUMENT_H
#define CDGEN_TESTS_MESSAGES_DOCUMENT_H

#include "places.h"

#include <algorithm>
#include <fstream>
#include <map>
#include <regex>
#include <sstream>
#include <string>

namespace messages_document {

/* The document's sections by code, each from its title to the next one's, with links reduced to their texts. */
inline std::map<std::string, std::string> sections() {
    std::stringstream whole;
    whole << std::ifstream(places::in_project("docs/messages.md")).rdbuf();
    std::string text = std::regex_replace(whole.str(), std::regex(R"(\[([^\]]*)\]\([^)]*\))"), "$1");
    std::map<std::string, std::string> found;
    for (size_t at = text.find("### S"); at != std::string::npos;) {
        size_t next = std::min(text.find("\n## ", at), text.find("\n### ", at));
        found[text.substr(at + 4, 4)] = text.substr(at, next == std::string::npos ? next : next - at);
        at = text.find("### S", at + 1);
    }
    return found;
}

/* The text of a section below its title. */
inline std::string body_of(const std::string &section) {
    return section.substr(std::min(section.find("\n\n"), section.size()));
}

/* What it must say. */
inline std::string words(const std::string &cause, const std::string &cure) {
    return "\n\n**Cause**: " + cause + " **Cure**: " + cure + "\n";
}

} // namespace messages_document

#endif
