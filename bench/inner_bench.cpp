/* inner_bench.cpp: the cost of the compiler's inner functions, one by one. Use it while you change one of them;
 * whether the whole got faster, only script/bench tells. */

#include "compiler/cdgen.h"
#include "compiler/cdgen_swap.h"
#include "format/checksum.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <fstream>
#include <iterator>
#include <optional>
#include <string>
#include <string_view>
#include <unistd.h>

namespace {

constexpr size_t TABLE_AU = 8192;
constexpr size_t TABLE_MAX = size_t{1} << 20; /* bytes after which a measured table is emptied */

/* A staging table that never outgrows the caches for long. */
class bounded_table {
public:
    tbl *get() {
        if (!table || table->used() > TABLE_MAX)
            table.emplace(TABLE_AU, "Bench");
        return &*table;
    }

private:
    std::optional<tbl> table;
};

void int_from_text_of(benchmark::State &state, const std::string &text) {
    cdgen cx;
    for (auto _ : state)
        benchmark::DoNotOptimize(int_from_text(cx, text, nullptr, 0));
}
BENCHMARK_CAPTURE(int_from_text_of, decimal, "42170");
BENCHMARK_CAPTURE(int_from_text_of, hexadecimal, "0xA4BA");

void str_to_vx_of(benchmark::State &state, vx_data_type_t type, const std::string &text) {
    cdgen cx;
    text_pool pool;
    vx_value_t value = {};
    for (auto _ : state) {
        pool.clear();
        if (str_to_vx(cx, &value, type, text, pool) != 0)
            state.SkipWithError("refused");
        benchmark::DoNotOptimize(value);
    }
}
BENCHMARK_CAPTURE(str_to_vx_of, UInt32, VX_UINT32, "123456");
BENCHMARK_CAPTURE(str_to_vx_of, Int64, VX_INT64, "-123456789012");
BENCHMARK_CAPTURE(str_to_vx_of, Float64, VX_FLOAT64, "98.625");
BENCHMARK_CAPTURE(str_to_vx_of, String, VX_CHAR_PTR, "a text of a usual length");
BENCHMARK_CAPTURE(str_to_vx_of, Binary, VX_BINARY_PTR, "0x0011223344556677");

void find_attr_of(benchmark::State &state, std::string_view name) {
    const srtable_ctrl &kind = sc_tables[SC_DYNAMIC_RESOURCE_ATTRIBUTE];
    for (auto _ : state) {
        benchmark::DoNotOptimize(name);
        benchmark::DoNotOptimize(find_attr(kind, name));
    }
}
BENCHMARK_CAPTURE(find_attr_of, known, "VarietyRange");
BENCHMARK_CAPTURE(find_attr_of, unknown, "Variety");

void set_table_id_of(benchmark::State &state, const char *name) {
    for (auto _ : state) {
        benchmark::DoNotOptimize(name);
        benchmark::DoNotOptimize(set_table_id(name));
    }
}
BENCHMARK_CAPTURE(set_table_id_of, known, "PersistentResourceAttribute");
BENCHMARK_CAPTURE(set_table_id_of, unknown, "PersistentAttribute");

void alloc_tble_of(benchmark::State &state) {
    cdgen cx;
    bounded_table table;
    auto bytes = static_cast<size_t>(state.range(0));
    for (auto _ : state)
        benchmark::DoNotOptimize(alloc_tble(cx, table.get(), bytes));
}
BENCHMARK(alloc_tble_of)->Arg(8)->Arg(88);

void add_to_tbl_of(benchmark::State &state) {
    cdgen cx;
    bounded_table table;
    const std::string text(static_cast<size_t>(state.range(0)), 'x');
    for (auto _ : state)
        benchmark::DoNotOptimize(add_to_tbl(cx, table.get(), text.c_str(), text.size() + 1));
}
BENCHMARK(add_to_tbl_of)->Arg(12)->Arg(230);

void copy_this_type_of(benchmark::State &state, vx_data_type_t type, const std::string &text) {
    cdgen cx;
    text_pool pool;
    bounded_table strings;
    vx_value_t value = {}, cell = {};
    if (str_to_vx(cx, &value, type, text, pool) != 0)
        state.SkipWithError("refused");
    for (auto _ : state) {
        tbl_anchor array;
        benchmark::DoNotOptimize(copy_this_type(cx, &cell, &value, type, TYPE_SAME, strings.get(), &array, 1));
    }
}
BENCHMARK_CAPTURE(copy_this_type_of, UInt32, VX_UINT32, "123456");
BENCHMARK_CAPTURE(copy_this_type_of, String, VX_CHAR_PTR, "a text of a usual length");
BENCHMARK_CAPTURE(copy_this_type_of, UInt32Array, VX_UINT32_ARRAY, "123456");

void cdb_checksum_of(benchmark::State &state) {
    const std::string image(static_cast<size_t>(state.range(0)), 'x');
    auto length = static_cast<vx_uint32_t>(image.size() - sizeof(vx_uint32_t));
    for (auto _ : state)
        benchmark::DoNotOptimize(cdb_checksum(image.data(), length, length));
    state.SetBytesProcessed(state.iterations() * state.range(0));
}
BENCHMARK(cdb_checksum_of)->Arg(1 << 12)->Arg(1 << 20);

std::string contents(const std::string &path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

/* The example's database; empty if it does not compile. */
std::string example_image() {
    std::string program = "cdgen", source = CDGEN_EXAMPLE;
    std::string output = "bench-" + std::to_string(getpid()) + ".cdef";
    char *command[] = {program.data(), source.data(), output.data(), nullptr};
    std::string image = cdgen_main(3, command) == 0 ? contents(output) : "";
    std::remove(output.c_str());
    return image;
}

/* Each time a fresh copy, which takes little beside the reversal: an image can be reversed only once. */
void cdgen_cdef_swap_of_example(benchmark::State &state) {
    const std::string image = example_image();
    if (image.empty())
        state.SkipWithError("the example does not compile");
    for (auto _ : state) {
        std::string copy = image;
        cdgen_cdef_swap(copy.data());
        benchmark::DoNotOptimize(copy.data());
    }
    state.SetBytesProcessed(state.iterations() * static_cast<int64_t>(image.size()));
}
BENCHMARK(cdgen_cdef_swap_of_example);

} // namespace

BENCHMARK_MAIN();
