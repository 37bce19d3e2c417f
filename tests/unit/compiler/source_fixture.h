/* source_fixture.h: feeds source text to the reader or single lines to the parser, and shows what is staged. */
#ifndef CDGEN_TESTS_SOURCE_FIXTURE_H
#define CDGEN_TESTS_SOURCE_FIXTURE_H

#include "compiler/cdgen.h"
#include "compiler/cdgen_closing.h"
#include "compiler/cdgen_stanzas.h"
#include "compiler/given_interface.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <initializer_list>
#include <ostream>
#include <string>
#include <string_view>
#include <unistd.h>
#include <utility>
#include <vector>

namespace from_source {

/* How a step ended: the message without its line number, that number (0: none) and the exit status. */
struct ending {
    std::string text;
    int line = 0;
    int code = 0;
    bool operator==(const ending &) const = default;
};

inline const ending WELL = {};

inline std::ostream &operator<<(std::ostream &out, const ending &end) {
    return out << end.line << ": " << end.text << " (" << end.code << ")";
}

inline std::string text_of(const fatal_exit &end) {
    auto [first, second, third] = words_of(end);
    return std::string(first) + second + third;
}

template <class Step> ending ending_of(Step step) {
    try {
        step();
    } catch (const fatal_exit &end) {
        return {text_of(end), end.line, end.code};
    }
    return WELL;
}

/* What a step writes to standard output; how it ends is not looked at. */
template <class Step> std::string output_of(Step step) {
    testing::internal::CaptureStdout();
    ending_of(step);
    return testing::internal::GetCapturedStdout();
}

/* ---- Source text ----------------------------------------------------------------------------------------------- */

using lines = std::initializer_list<std::string_view>;

inline std::string stanza(std::string_view kind, lines first = {}, lines more = {}) {
    std::string text(kind);
    text += '\n';
    for (const lines &part : {first, more})
        for (std::string_view line : part)
            text.append("\t").append(line).append("\n");
    return text;
}

/* Two lines. */
inline const std::string CLASS = stanza("ControlDefinition", {"FileVersion=1.0.0.0"});

/* Six lines, and those given. */
inline std::string class_values(lines more = {}) {
    return stanza(
        "ResourceClass",
        {"Description=1", "DisplayName=2", "Properties=CanDefine", "ClassPermTemplate=0", "ResourcePermTemplate=0"},
        more);
}

/* Six lines. */
inline const std::string MAP = stanza("ClassToManagerMapping", {"ResourceManager=Mgr", "FirstKey=5", "LastKey=6",
                                                                "MessageCatalog=m.cat", "DescriptiveMessageSet=7"});

/* Seven lines, and those given. */
inline std::string pattr(std::string_view kind, std::string_view type, lines more = {}) {
    std::string data_type = "DataType=" + std::string(type);
    return stanza(kind, {"Name=P", "Description=11", "DisplayName=12", "Id=13", data_type, "VarietyRange=14,15"}, more);
}

/* Eight lines, and those given. */
inline std::string dattr(std::string_view kind, std::string_view type, lines more = {}) {
    std::string data_type = "DataType=" + std::string(type);
    return stanza(kind,
                  {"Name=D", "Description=21", "DisplayName=22", "Id=23", data_type, "VarietyRange=24,25",
                   "VariableType=Quantity"},
                  more);
}

/* Six lines, and those given. */
inline std::string action(std::string_view kind, lines more = {}) {
    return stanza(kind, {"Name=A", "Description=31", "DisplayName=32", "Id=33", "VarietyRange=34,35"}, more);
}

/* Six lines, and those given. */
inline std::string element(std::string_view kind, int index, std::string_view type, lines more = {}) {
    std::string element_index = "ElementIndex=" + std::to_string(index);
    std::string data_type = "DataType=" + std::string(type);
    return stanza(kind, {"ElementName=E", "Description=41", "DisplayName=42", element_index, data_type}, more);
}

/* ---- A compilation --------------------------------------------------------------------------------------------- */

using ranges = std::vector<std::pair<vx_uint32_t, vx_uint32_t>>;

class compilation {
public:
    compilation() {
        static int made = 0;
        std::string name = "cdgen-unit-" + std::to_string(getpid()) + "-" + std::to_string(++made);
        directory = std::filesystem::temp_directory_path() / name;
        source = directory / "source";
        output = directory / "Out.cdef";
        cx.options.cdefsrc = source.c_str();
        cx.options.cdefname = output.c_str();
    }
    compilation(const compilation &) = delete;
    compilation &operator=(const compilation &) = delete;
    ~compilation() {
        std::filesystem::remove_all(directory);
    }

    /* The text through the reader: what the headers close is closed, what is open at the end stays open. */
    void read(std::string_view text) {
        write(text);
        cache_input_data(cx, source.c_str());
    }
    ending reading(std::string_view text) {
        return ending_of([&] { read(text); });
    }

    /* All phases, so that the end of the source closes everything. */
    void compile_all(std::string_view text) {
        write(text);
        compile(cx);
    }
    ending compiling(std::string_view text) {
        return ending_of([&] { compile_all(text); });
    }

    /* All phases before the image, which gives back all records. */
    void stage_all(std::string_view text) {
        read(text);
        for (closing_step step : closing_steps)
            step(cx);
    }

    /* Passes one attribute line to the parser alone. The message of a failure may refer to the line's text. */
    void feed(stanza_id kind, std::string_view text) {
        line = text;
        line.reserve(text.size() + READ_AHEAD);
        save_attr(cx, line.data(), kind);
    }
    ending feeding(stanza_id kind, std::string_view text) {
        return ending_of([&] { feed(kind, text); });
    }

    /* While the class is open. */
    tbl *table(cdb_ref_t rsrc_class_t::*field) const {
        return staged_tbl(cx.staged.cb_rsrc_class.*field);
    }

    /* What is in a table of the class, be it open or closed. */
    tbl_content *content(cdb_ref_t rsrc_class_t::*field) const {
        return staged_content(cx.staged.cb_rsrc_class.*field);
    }

    template <class Record> std::span<Record> filed(cdb_ref_t rsrc_class_t::*field) const {
        return records_of<Record>(content(field));
    }

    std::string string_at(vx_uint32_t offset) {
        return static_cast<const char *>(tbl_at(content(&rsrc_class_t::u_rc_strings), offset, 1));
    }

    template <class Record> Record string_table_at(vx_uint32_t offset) {
        return copy_at<Record>(&rsrc_class_t::u_rc_strings, offset);
    }

    template <class Record> Record copy_at(cdb_ref_t rsrc_class_t::*field, size_t offset) {
        Record record = {};
        memcpy(&record, tbl_at(content(field), offset, sizeof record), sizeof record);
        return record;
    }

    /* The entries of a list of the class. They follow its identifier and its count. */
    template <class Entry> std::vector<Entry> list_at(cdb_ref_t rsrc_class_t::*field, size_t offset) {
        std::vector<Entry> entries(copy_at<vx_uint32_t>(field, offset + 4));
        for (size_t i = 0; i < entries.size(); ++i)
            entries[i] = copy_at<Entry>(field, offset + 8 + i * sizeof(Entry));
        return entries;
    }

    ranges varieties_at(const cdb_ref_t &list) {
        ranges found;
        for (const vl_entry_t &entry : list_at<vl_entry_t>(&rsrc_class_t::u_rc_variety_lists, list.offset[0]))
            found.emplace_back(entry.vl_low_val, entry.vl_high_val);
        return found;
    }

    std::vector<vv_entry_t> valid_values_at(const cdb_ref_t &list) {
        return list_at<vv_entry_t>(&rsrc_class_t::u_rc_valid_vals, list.offset[0]);
    }

    std::vector<sd_field_t> elements_at(const cdb_ref_t &section) {
        return list_at<sd_field_t>(&rsrc_class_t::u_rc_sd_defs, section.offset[0]);
    }

    cdgen cx;
    std::string source;
    std::string output;

private:
    void write(std::string_view text) const {
        std::filesystem::create_directory(directory);
        std::ofstream(source, std::ios::binary) << text;
    }

    std::filesystem::path directory; /* made when something is written */
    std::string line;
};

/* ---- Lines that are fed, one by one ---------------------------------------------------------------------------- */

constexpr int LINE = 77; /* of the lines that are fed to an opened compilation */

/* With an open class and an open record of every kind. */
class opened : public compilation {
public:
    opened() {
        init_class_tbl(cx);
        for (auto init : {init_cmmap_tbl, init_var_class_tbl, init_pattr_tbl, init_pattrC_tbl, init_dattr_tbl,
                          init_dattrC_tbl, init_action_tbl, init_actionC_tbl, init_sd_tbl})
            init(cx);
        cx.source.linenum = LINE;
    }

    stanza_state &state(stanza_id kind) {
        return cx.framing.stanzas[kind];
    }

    /* Allows optional attributes at once. */
    void require_nothing(stanza_id kind) {
        state(kind).req_mask = sc_tables[kind].req_mask_cmplt;
    }
};

inline constexpr std::array PERSISTENT = {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE};
inline constexpr std::array DYNAMIC = {SC_DYNAMIC_RESOURCE_ATTRIBUTE, SC_DYNAMIC_CLASS_ATTRIBUTE};
inline constexpr std::array ACTIONS = {SC_RESOURCE_ACTION, SC_CLASS_ACTION};
inline constexpr std::array ATTRIBUTES = {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE,
                                          SC_DYNAMIC_RESOURCE_ATTRIBUTE, SC_DYNAMIC_CLASS_ATTRIBUTE};

inline const ending INVALID = {"str_to_vx: Invalid data", LINE, 1};

inline size_t record_size(stanza_id kind) {
    static const size_t sizes[] = {224, 60, 40, 224, 72, 72, 136, 136, 56, 56};
    return kind < std::size(sizes) ? sizes[kind] : 40;
}

/* The staging record of a kind. */
inline std::string record_of(opened &c, stanza_id kind) {
    return {sc_cb(c.cx, sc_tables[kind]), record_size(kind)};
}

/* A fed attribute: one line of a stanza whose required attributes are all there, unless it is one itself. */
inline ending fed(opened &c, stanza_id kind, const std::string &line) {
    const table_attrs *attr = find_attr(sc_tables[kind], line.substr(0, line.find('=')));
    c.state(kind).req_mask = attr->req_bit & OPTIONAL ? sc_tables[kind].req_mask_cmplt : 0;
    c.state(kind).opt_mask = 0;
    return c.feeding(kind, "\t" + line);
}

/* Numbers as a record contains them. */
inline std::string number(vx_uint32_t value, size_t width) {
    auto narrow = static_cast<vx_uint16_t>(value);
    return width == 2 ? std::string(reinterpret_cast<const char *>(&narrow), 2)
                      : std::string(reinterpret_cast<const char *>(&value), 4);
}

/* A cell whose first four bytes, or all eight, hold something, and the rest nothing. */
inline vx_uint64_t cell32(vx_uint32_t bits) {
    vx_value_t cell = {.val_uint64 = 0};
    cell.val_uint32 = bits;
    return cell.val_uint64;
}
constexpr vx_uint64_t cell64(vx_uint64_t bits) {
    return bits;
}

/* Types whose values are stored in their cells: 7 and 9. */
struct inline_row {
    const char *type;
    vx_uint64_t seven, nine;
};
inline const inline_row INLINE_TYPES[] = {
    {"Int32", cell32(7), cell32(9)},
    {"UInt32", cell32(7), cell32(9)},
    {"Int64", cell64(7), cell64(9)},
    {"UInt64", cell64(7), cell64(9)},
    {"Float32", cell32(0x40E00000), cell32(0x41100000)},
    {"Float64", cell64(0x401C000000000000), cell64(0x4022000000000000)},
};

/* A reference to nothing: the mark in the low word, 0 in the high one. */
inline bool is_absent(const cdb_ref_t &ref) {
    return ref.offset[0] == 0xFFFFFFFF && ref.offset[1] == 0;
}

} // namespace from_source

#endif
