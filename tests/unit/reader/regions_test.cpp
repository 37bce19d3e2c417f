/* regions(): what each byte of a file is, by the worked example of docs/format.md and by hand; and that every byte of
 * any file, however damaged, is in exactly one region. */

#include "cdb_view.h"

#include "places.h"
#include "reader/image_files.h"
#include "sample.h"

#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

using namespace image_files;

/* "offset size name": a field's name (of a member of a member the last one), or what the region is if it is of no
 * record. */
std::string spelt(const cdb::region &r) {
    std::ostringstream text;
    std::string_view name = r.what != nullptr ? r.what->name : r.record;
    text << r.offset << ' ' << r.size << ' ' << name.substr(name.find('.') + 1);
    return text.str();
}

/* ---- The worked example ---------------------------------------------------------------------------------------- */

/* A row of the document, as document.rows has it: the offset of its bytes, their number, and their meaning. */
struct document_row {
    std::size_t offset = 0;
    std::size_t size = 0;
    std::string content;
};

std::vector<document_row> document_rows() {
    std::vector<document_row> rows;
    std::ifstream file(places::in_images("document.rows"));
    for (document_row row; file >> row.offset >> row.size && std::getline(file >> std::ws, row.content);)
        rows.push_back(row);
    return rows;
}

/* The text between the first two marks. */
std::string between(const std::string &text, char mark) {
    std::size_t start = text.find(mark) + 1;
    return text.substr(start, text.find(mark, start) - start);
}

TEST(CdbRegions, DocumentSaysWhatEachByteIs) {
    std::vector<std::string> expected, found;
    auto expect = [&](std::size_t offset, std::size_t size, const std::string &name) {
        expected.push_back(std::to_string(offset) + ' ' + std::to_string(size) + ' ' + name);
    };
    for (const document_row &row : document_rows()) {
        if (row.content.find("strings: ") == std::string::npos) {
            expect(row.offset, row.size, between(row.content, '`'));
            continue;
        }
        std::size_t text = between(row.content, '"').size() + 1;
        expect(row.offset, text, "text");
        expect(row.offset + text, row.size - text, "filling");
    }
    std::vector<std::byte> image = load("document", std::endian::little);
    for (const cdb::region &r : cdb::regions(cdb::database(image)))
        found.push_back(spelt(r));
    /* Of the header, three anchors, class, manager and map; and three texts with their filling. */
    ASSERT_EQ(expected.size(), 19u + 3 * 4 + 42 + 5 + 18 + 3 * 2);
    EXPECT_EQ(found, expected);
}

/* ---- By hand --------------------------------------------------------------------------------------------------- */

struct expected_region {
    std::size_t offset;
    std::size_t size;
    std::string_view record;
    std::size_t index;
    std::string_view field; /* empty: of no record */
};

/* The regions from expected's first offset on are these, and belong to that section. */
void expect_regions(std::string_view name, std::optional<std::size_t> section,
                    std::span<const expected_region> expected) {
    for (std::endian order : both_orders) {
        std::vector<std::byte> image = load(name, order);
        std::vector<cdb::region> all = cdb::regions(cdb::database(image));
        auto r = std::ranges::find(all, expected.front().offset, &cdb::region::offset);
        for (const expected_region &e : expected) {
            SCOPED_TRACE(testing::Message() << name << ", " << name_of(order) << ", at " << e.offset);
            ASSERT_NE(r, all.end());
            EXPECT_EQ(r->offset, e.offset);
            EXPECT_EQ(r->size, e.size);
            EXPECT_EQ(r->section, section);
            EXPECT_EQ(r->record, e.record);
            EXPECT_EQ(r->index, e.index);
            EXPECT_EQ(r->what == nullptr ? std::string_view() : r->what->name, e.field);
            ++r;
        }
    }
}

TEST(CdbRegions, HeaderAndAnchors) {
    constexpr expected_region header[] = {{0, 4, "orb_cdb_header_t", 0, "cdb_hdr_length"}};
    expect_regions("small", std::nullopt, header);
    constexpr expected_region spares[] = {{50, 30, "orb_cdb_header_t", 0, "cdb_hdr_spares"}};
    expect_regions("small", std::nullopt, spares);
    constexpr expected_region last_anchor[] = {{128, 4, "cdb_dsect_anchor_t", 3, "cda_type"},
                                               {132, 4, "cdb_dsect_anchor_t", 3, "cda_offset"},
                                               {136, 4, "cdb_dsect_anchor_t", 3, "cda_length"},
                                               {140, 4, "cdb_dsect_anchor_t", 3, "cda_revision"}};
    expect_regions("small", 3, last_anchor);
}

TEST(CdbRegions, RecordsHaveTheirPositions) {
    constexpr expected_region second[] = {{576, 4, "rsrc_pattr_t", 1, "ra_cb_ID"},
                                          {580, 4, "rsrc_pattr_t", 1, "ra_props"},
                                          {584, 8, "rsrc_pattr_t", 1, "u_ra_name"}};
    expect_regions("small", 0, second);
}

TEST(CdbRegions, ListsAndTheirEntries) {
    constexpr expected_region lists[] = {
        {992, 4, "sd_def_t", 0, "sd_cb_ID"},           {996, 4, "sd_def_t", 0, "sd_count"},
        {1000, 8, "sd_field_t", 0, "u_sd_field_name"}, {1008, 4, "sd_field_t", 0, "sd_field_type"},
        {1012, 2, "sd_field_t", 0, "sd_disp_msgid"},   {1014, 2, "sd_field_t", 0, "sd_dscr_msgid"},
        {1016, 8, "sd_field_t", 0, "u_sd_valid_vals"}, {1024, 4, "sd_field_t", 0, "sd_action_id"},
        {1028, 2, "sd_field_t", 0, "sd_valid_type"},   {1030, 2, "sd_field_t", 0, "sd_reserved"}};
    expect_regions("small", 0, lists);
    constexpr expected_region values[] = {{1072, 4, "valid_values_t", 0, "vv_cb_ID"},
                                          {1076, 4, "valid_values_t", 0, "vv_count"},
                                          {1080, 8, "vv_entry_t", 0, "vv_low_val"},
                                          {1088, 8, "vv_entry_t", 0, "vv_high_val"},
                                          {1096, 2, "vv_entry_t", 0, "vv_disp_msgid"},
                                          {1098, 6, "vv_entry_t", 0, "vv_reserved"},
                                          {1104, 6, "text", 0, ""}};
    expect_regions("small", 0, values);
    /* 208 + 1224 + 168: the third entry of the last variety list of the class Disk */
    constexpr expected_region entries[] = {{1624, 4, "vl_entry_t", 2, "vl_low_val"},
                                           {1628, 4, "vl_entry_t", 2, "vl_high_val"}};
    expect_regions("whole", 0, entries);
}

/* The second one has no separate piece after its length: a text follows. */
TEST(CdbRegions, EmptyBinaries) {
    constexpr expected_region pieces[] = {
        {504, 4, "length", 0, ""},  {508, 4, "filling", 0, ""}, {512, 8, "filling", 0, ""}, {520, 4, "length", 0, ""},
        {524, 4, "filling", 0, ""}, {528, 2, "text", 0, ""},    {530, 6, "filling", 0, ""}};
    expect_regions("empty_binaries", 0, pieces);
}

/* The room of a list without entries. */
TEST(CdbRegions, EmptyList) {
    constexpr expected_region lists[] = {{408, 4, "variety_list_t", 0, "vl_cb_ID"},
                                         {412, 4, "variety_list_t", 0, "vl_count"},
                                         {416, 8, "filling", 0, ""},
                                         {424, 4, "text", 0, ""}};
    expect_regions("cut_short", 0, lists);
}

TEST(CdbRegions, ValuesInTheStrings) {
    constexpr expected_region values[] = {
        {1168, 3, "text", 0, ""}, /* "in" */
        {1171, 5, "filling", 0, ""},
        {1176, 4, "length", 0, ""}, /* a binary of 3 bytes */
        {1180, 4, "filling", 0, ""},
        {1184, 3, "binary", 0, ""},
        {1187, 5, "filling", 0, ""},
        {1192, 4, "vx_structured_data_t", 0, "element_count"},
        {1196, 4, "vx_structured_data_t", 0, "pad"},
        {1200, 4, "vx_structured_data_element_t", 0, "data_type"},
        {1204, 4, "vx_structured_data_element_t", 0, "pad"},
        {1208, 8, "vx_structured_data_element_t", 0, "value"},
        {1216, 4, "vx_array_t", 0, "element_count"},
        {1220, 4, "vx_array_t", 0, "pad"},
        {1224, 8, "vx_value_t", 0, ""},
        {1232, 4, "length", 0, ""},
    };
    expect_regions("small", 0, values);
    constexpr expected_region two_cells[] = {{1264, 4, "vx_array_t", 0, "element_count"},
                                             {1268, 4, "vx_array_t", 0, "pad"},
                                             {1272, 8, "vx_value_t", 0, ""},
                                             {1280, 8, "vx_value_t", 1, ""},
                                             {1288, 3, "text", 0, ""},
                                             {1291, 5, "filling", 0, ""}};
    expect_regions("small", 0, two_cells);
    constexpr expected_region handle[] = {{1848, 20, "handle", 0, ""}, {1868, 4, "filling", 0, ""}};
    expect_regions("values", 0, handle);
}

TEST(CdbRegions, VariableIds) {
    constexpr expected_region ids[] = {{1468, 3, "text", 0, ""},     {1471, 5, "filling", 0, ""},
                                       {1476, 4, "var_id_t", 0, ""}, {1480, 4, "var_id_t", 1, ""},
                                       {1484, 4, "var_id_t", 2, ""}, {1488, 4, "filling", 3, ""}};
    expect_regions("small", 3, ids);
}

TEST(CdbRegions, ClassHash) {
    constexpr expected_region hash[] = {
        {96, 4, "rsrc_class_hash_t", 0, "rch_cb_ID"},
        {100, 8192, "rsrc_class_hash_t", 0, "u_rch_table"},
        {8292, 4, "rsrc_class_hash_t", 0, "rch_num_hash_blocks"},
        {8296, 8, "rc_hash_block_t", 0, "u_rch_next_hash"},
        {8304, 4, "rc_hash_block_t", 0, "rch_prim_hash_value"},
        {8308, 4, "rc_hash_block_t", 0, "rch_class_id"},
        {8312, 8, "rc_hash_block_t", 0, "u_rch_rsrc_class"},
    };
    expect_regions("hash", 0, hash);
}

TEST(CdbRegions, ErrorsAndDependencies) {
    constexpr expected_region records[] = {
        {364, 4, "rsrc_error_t", 0, "re_reserved"},  {368, 4, "rsrc_depend_t", 0, "rd_cb_ID"},
        {372, 2, "rsrc_depend_t", 0, "rd_class_ID"}, {374, 2, "rsrc_depend_t", 0, "rd_reserved"},
        {376, 4, "variety_list_t", 0, "vl_cb_ID"},   {380, 4, "variety_list_t", 0, "vl_count"},
        {384, 4, "vl_entry_t", 0, "vl_low_val"},     {388, 4, "vl_entry_t", 0, "vl_high_val"}};
    expect_regions("errors", 0, records);
}

TEST(CdbRegions, Dependencies) {
    constexpr expected_region records[] = {
        {320, 4, "rsrc_depend_t", 0, "rd_cb_ID"},    {324, 2, "rsrc_depend_t", 0, "rd_class_ID"},
        {326, 2, "rsrc_depend_t", 0, "rd_reserved"}, {328, 4, "rsrc_depend_t", 1, "rd_cb_ID"},
        {332, 2, "rsrc_depend_t", 1, "rd_class_ID"}, {334, 2, "rsrc_depend_t", 1, "rd_reserved"}};
    expect_regions("dependencies", 0, records);
}

/* ---- Bytes that no reference reaches --------------------------------------------------------------------------- */

TEST(CdbRegions, UnreachedValuesAndSections) {
    constexpr expected_region value[] = {{1992, 24, "unreached", 0, ""}};
    expect_regions("nested", std::nullopt, value);
    constexpr expected_region sections[] = {{176, 48, "unreached", 0, ""}};
    expect_regions("sections", std::nullopt, sections);
}

TEST(CdbRegions, TooShortForAHeader) {
    std::vector<std::byte> image(79);
    std::vector<cdb::region> all = cdb::regions(cdb::database(image));
    ASSERT_EQ(all.size(), 1u);
    EXPECT_EQ(spelt(all[0]), "0 79 unreached");
    EXPECT_TRUE(cdb::regions(cdb::database()).empty());
}

/* ---- Every byte once ------------------------------------------------------------------------------------------- */

testing::AssertionResult tiles(std::span<const std::byte> image) {
    std::size_t end = 0;
    for (const cdb::region &r : cdb::regions(cdb::database(image))) {
        if (r.offset != end || r.size == 0)
            return testing::AssertionFailure() << spelt(r) << " where " << end << " was expected";
        end += r.size;
    }
    return end == image.size() ? testing::AssertionSuccess() : testing::AssertionFailure() << "ends at " << end;
}

TEST(CdbRegions, TileEveryImage) {
    for (const auto &file : std::filesystem::recursive_directory_iterator(places::in_images("")))
        if (file.path().extension() == ".cdef") {
            std::error_code error;
            EXPECT_TRUE(tiles(cdb::read_file(file.path().c_str(), error))) << file.path();
        }
}

TEST(CdbRegions, TileWhatIsCut) {
    for (std::endian order : both_orders) {
        std::vector<std::byte> image = load("whole", order);
        for (std::size_t size = 0; size < image.size(); ++size)
            EXPECT_TRUE(tiles(exact_copy(std::span<const std::byte>(image).first(size)).bytes())) << size;
    }
}

TEST(CdbRegions, TileWhatIsDamaged) {
    sampling::sample changes = sampling::of_this_run();
    for (std::endian order : both_orders) {
        exact_copy copy(load("small", order));
        for (std::byte &changed : copy.bytes()) {
            const std::byte was = changed;
            const unsigned n = std::to_integer<unsigned>(was);
            for (unsigned now : {0x00u, 0xFFu, n ^ 1, n ^ 0x80, (n + 1) & 0xFF, (n + 8) & 0xFF}) {
                if (!changes.takes())
                    continue;
                changed = std::byte(now);
                EXPECT_TRUE(tiles(copy.bytes())) << "byte " << &changed - copy.bytes().data() << " is " << now;
            }
            changed = was;
        }
    }
}

} // namespace
