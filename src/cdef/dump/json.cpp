/* json.cpp: the facts as JSON. docs/dump.md has the schema. */

#include "cdef/dump/dump.h"
#include "cdef/support/output.h"
#include "report/json_writer.h"

#include <utility>

namespace cdef::dump {

namespace {

/* Writes groups as they come. Each fact is on one line, however many members it has. */
class json_form : public sink {
public:
    void open(const label &group) override {
        bool is_document = std::exchange(first, false);
        to.open_object(group.key);
        if (is_document)
            to.add_schema("cdef-dump.schema.json", 1);
    }
    void open_list(const label &list) override {
        to.open_list(list.key);
    }
    void close() override {
        to.close();
    }
    void add(const label &what, const fact &f) override {
        value.clear();
        facts::append_json(value, f);
        to.add_json(what.key, value);
    }

private:
    report::json_writer to{print};
    std::string value; /* of the fact that is being added */
    bool first = true;
};

} // namespace

void show_json(const input &in, const readability &found, bool with_offsets) {
    json_form to;
    walk(in.db, found, to, with_offsets);
}

} // namespace cdef::dump
