/* error.h: why a database has no source. */
#ifndef CDGEN_CDEF_SOURCE_ERROR_H
#define CDGEN_CDEF_SOURCE_ERROR_H

#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

namespace cdef::source {

/* "no source: DynamicClassAttribute 'X': no varieties" */
struct no_source_error : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* Throws no_source_error: what cannot be written, and why. */
[[noreturn]] void no_source(const std::string &what, const std::string &why);

/* What a message is about; its text is made only for a message. The views must stay as long as it. */
struct record_name {
    std::string_view kind;
    std::optional<std::string_view> name = {};
    std::optional<std::string_view> element = {};

    record_name with_element(std::string_view of_record) const {
        return {kind, name, of_record};
    }
};

inline record_name place_of(std::string_view kind, std::string_view name) {
    return {kind, name};
}

/* "DynamicClassAttribute 'X', element 'Y'" */
std::string text_of(const record_name &what);

[[noreturn]] void no_source(const record_name &what, const std::string &why);

} // namespace cdef::source

#endif
