// The list string (FillList) decoded into and encoded from the minimal host's list box, at
// 1,000 to 1,000,000 entries: the time per entry should stay flat as the list grows.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>
#include <string_view>

#include "keltext/combo/list_string.h"
#include "keltext/widgetmodel/list_widgets.h"

namespace {

class NoHandlers final : public kel::model::WidgetContext {
public:
    void handler_error(std::string_view, std::string_view, int) override {}
};

// Entries as a form would hold them: "Customer 0000042 Ltd" with item data 42 * 7 - 1000.
std::string list_string_of(int64_t entries) {
    std::string s;
    s.reserve(static_cast<size_t>(entries) * 30);
    std::string number;
    for (int64_t i = 0; i < entries; ++i) {
        number = std::to_string(i);
        s += "Customer ";
        s.append(7 - std::min<size_t>(7, number.size()), '0');
        s += number;
        s += " Ltd";
        s += kel::kDataSeparator;
        s += std::to_string(i * 7 - 1000);
        s += kel::kEntrySeparator;
    }
    return s;
}

void BM_DecodeFillList(benchmark::State& state) {
    const std::string s = list_string_of(state.range(0));
    NoHandlers context;
    kel::model::ListBoxModel list(context, "lstList", 1, 1200, 2000);
    for (auto _ : state) {
        kel::DecodeFillList(list, s);
        benchmark::DoNotOptimize(list.ListCount());
    }
    if (list.ListCount() != state.range(0)) state.SkipWithError("wrong number of entries decoded");
    state.SetItemsProcessed(state.iterations() * state.range(0));
    state.SetBytesProcessed(state.iterations() * static_cast<int64_t>(s.size()));
}
BENCHMARK(BM_DecodeFillList)->RangeMultiplier(10)->Range(1000, 1000000)->Unit(benchmark::kMillisecond);

void BM_EncodeFillList(benchmark::State& state) {
    const std::string s = list_string_of(state.range(0));
    NoHandlers context;
    kel::model::ListBoxModel list(context, "lstList", 1, 1200, 2000);
    kel::DecodeFillList(list, s);
    for (auto _ : state) {
        std::string encoded = kel::EncodeFillList(list);
        benchmark::DoNotOptimize(encoded);
        if (encoded.size() != s.size()) state.SkipWithError("encoding differs from the decoded string");
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
    state.SetBytesProcessed(state.iterations() * static_cast<int64_t>(s.size()));
}
BENCHMARK(BM_EncodeFillList)->RangeMultiplier(10)->Range(1000, 1000000)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
