/* cdgen_observer.h: what a caller may observe and decide while lines are taken. */
#ifndef CDGEN_CDGEN_OBSERVER_H
#define CDGEN_CDGEN_OBSERVER_H

#include <cstddef>
#include <string_view>

struct table_attrs;

/* The name and value of an attribute line. The value is parsed later. */
struct attr_place {
    const table_attrs *attr = nullptr;
    const char *value = nullptr;
    size_t length = 0;
};

class line_observer {
public:
    /* Called for an attribute line with a known name and a value that is not too long. */
    virtual void attribute_read(const table_attrs &attr, std::string_view value) = 0;
    /* Whether an optional attribute of the kind's current stanza may come before a required one. kind: a stanza_id */
    virtual bool excuses_missing(int kind) const = 0;

protected:
    ~line_observer() = default;
};

#endif
