/* findings.cpp: findings as text and as JSON. */

#include "cdef/verify/findings.h"

#include "text/append.h"
#include "text/shown.h"

#include <nlohmann/json.hpp>

namespace cdef::verify {

static const char *name_of(cdb::severity level) {
    return level == cdb::severity::error ? "error" : "warning";
}

std::string place_of(const cdb::finding &f) {
    std::string place = "file";
    if (f.section)
        place = "section " + std::to_string(*f.section);
    if (!f.record.empty())
        place += ", " + std::string(f.record) + " " + std::to_string(f.index);
    if (!f.field.empty())
        place += ", " + std::string(f.field);
    return place;
}

std::string line_of(const std::string &file, const cdb::finding &f) {
    std::string line;
    text::appendf(line, "%s: %s: %s at offset %zu: %s: found %s, expected %s [%s]\n", text::escaped(file).c_str(),
                  name_of(f.broken->level), place_of(f).c_str(), f.offset, std::string(f.broken->title).c_str(),
                  f.found.c_str(), f.expected.c_str(), std::string(f.broken->code).c_str());
    return line;
}

nlohmann::ordered_json json_of(const cdb::finding &f) {
    nlohmann::ordered_json data;
    data["code"] = f.broken->code;
    data["severity"] = name_of(f.broken->level);
    data["title"] = f.broken->title;
    data["section"] = f.section ? nlohmann::ordered_json(*f.section) : nlohmann::ordered_json();
    data["record"] = f.record;
    data["index"] = f.index;
    data["field"] = f.field;
    data["offset"] = f.offset;
    data["found"] = f.found;
    data["expected"] = f.expected;
    return data;
}

} // namespace cdef::verify
