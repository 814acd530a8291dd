// The host conversions every keystroke and property set goes through.
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "keltext/host/conversions.h"
#include "keltext/host/variant.h"

namespace {

const std::vector<std::string>& sample_texts() {
    static const std::vector<std::string> texts = {
        "0", "7", "12.5", "1234567.50", "  -98765.4321 ", "1,234", "3.5E+2", "&H1F", "x7", "99999999999999",
    };
    return texts;
}

void BM_leading_value(benchmark::State& state) {
    const auto& texts = sample_texts();
    for (auto _ : state)
        for (const std::string& t : texts) benchmark::DoNotOptimize(kel::leading_value(t));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(texts.size()));
}
BENCHMARK(BM_leading_value);

void BM_numeric_text(benchmark::State& state) {
    const auto& texts = sample_texts();
    for (auto _ : state)
        for (const std::string& t : texts) benchmark::DoNotOptimize(kel::numeric_text(t));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(texts.size()));
}
BENCHMARK(BM_numeric_text);

void BM_plain_number_text(benchmark::State& state) {
    const double values[] = {0, 7, 12.5, 1234567.5, -98765.4321, 0.1, 1.0 / 3.0, 99999999999999.0, 1e20, 2.5e-7};
    for (auto _ : state)
        for (double v : values) benchmark::DoNotOptimize(kel::plain_number_text(v));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(std::size(values)));
}
BENCHMARK(BM_plain_number_text);

void BM_to_int32_of_text(benchmark::State& state) {
    const kel::Variant values[] = {kel::Variant("12"), kel::Variant("-2.5"), kel::Variant("1,234,567"),
                                   kel::Variant(" 2147483647 "), kel::Variant("3.5")};
    for (auto _ : state)
        for (const auto& v : values) benchmark::DoNotOptimize(kel::to_int32(v));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(std::size(values)));
}
BENCHMARK(BM_to_int32_of_text);

}  // namespace

BENCHMARK_MAIN();
