/* same.cpp: compares what two sources compile to. */

#include "formatter/same.h"

#include "cdb.h"
#include "compiler/stepwise.h"
#include "language/limits.h"

#include <algorithm>
#include <cstring>
#include <memory>

namespace formatter {

namespace {

/* A class without a Name gets its name from the output; any will do. */
constexpr const char *OUTPUT = "class.cdef";

constexpr check::warning_set all_warnings() {
    check::warning_set all = {};
    all.fill(true);
    return all;
}

void remove_time(std::vector<std::byte> &image) {
    orb_cdb_header_t header;
    std::memcpy(&header, image.data(), sizeof header);
    header.cdb_hdr_timestamp = {};
    header.cdb_hdr_checksum = 0;
    std::memcpy(image.data(), &header, sizeof header);
}

} // namespace

compiled compile(std::string_view source, const std::string &name) {
    compiled result;
    auto finish = [&result](stepwise_compiler &compiler, const check::view &) {
        result.image = compiler.image();
        remove_time(result.image);
    };
    auto take = [&result](check::finding &&each) {
        if (!each.error)
            result.warnings.push_back(each.code + (" " + each.text));
        else if (!result.error)
            result.error = std::move(each);
    };
    check::compile_job job = {OUTPUT, finish};
    check::check_bytes(source, name, all_warnings(), take, &job);
    std::sort(result.warnings.begin(), result.warnings.end());
    return result;
}

bool is_same(const compiled &a, const compiled &b) {
    return !a.error && !b.error && a.image == b.image && a.warnings == b.warnings;
}

std::optional<std::size_t> first_overflow(std::string_view source) {
    no_observer observer;
    auto compiler = std::make_unique<stepwise_compiler>("", OUTPUT, observer); /* large */
    compiler->open_bytes(source);
    std::size_t at = 0;
    std::size_t line_number = 0;
    try {
        for (source_line line = compiler->next_line(); line.begin != nullptr; line = compiler->next_line()) {
            at += static_cast<std::size_t>(line.end - line.begin);
            if (attr_text text = text_of(line); text.end != nullptr)
                compiler->take_line(text);
            if (compiler->conversion_errno() != 0)
                return line_number;
            bool ended = static_cast<std::size_t>(line.end - line.begin) < LINE_MAX_CHARS && at < source.size();
            at += ended;
            line_number += ended;
        }
    } catch (const fatal_exit &) {
        return std::nullopt;
    }
    return std::nullopt;
}

} // namespace formatter
