// KelCombo's incremental search (d_ComboSearch) over 10,000 to 1,000,000 entries, sorted and
// unsorted, with the typed text matching the first entry, the last entry or none; and the
// memory a combo holds per entry of its list.
#include <benchmark/benchmark.h>
#include <malloc.h>

#include <cstdint>
#include <memory>
#include <string>

#include "keltext/combo/kel_combo.h"
#include "keltext/combo/list_string.h"
#include "keltext/host/widgets.h"
#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"

namespace {

// "Customer 0000042 Ltd": 20 characters, in sorted order by number. The short form
// "Cust 0000042" (12 characters) fits inside a std::string without a heap block, which shows
// what copying each entry's text costs the search.
std::string entry_text(int64_t i, bool short_form = false) {
    std::string number = std::to_string(i);
    std::string digits = std::string(7 - std::min<size_t>(7, number.size()), '0') + number;
    return short_form ? "Cust " + digits : "Customer " + digits + " Ltd";
}

std::string list_string_of(int64_t entries, bool short_form = false) {
    std::string s;
    s.reserve(static_cast<size_t>(entries) * 30);
    for (int64_t i = 0; i < entries; ++i) {
        s += entry_text(i, short_form);
        s += kel::kDataSeparator;
        s += std::to_string(i);
        s += kel::kEntrySeparator;
    }
    return s;
}

// A running form with one KelCombo.
struct ComboForm {
    kel::Catalogue catalogue;
    kel::mini::Form form;
    kel::mini::HostedControl* hosted = nullptr;
    kel::KelCombo* combo = nullptr;
    kel::ComboBox* box = nullptr;

    ComboForm() {
        hosted = &form.create(*catalogue.find("KelCombo"), "c");
        combo = dynamic_cast<kel::KelCombo*>(&hosted->control());
        box = dynamic_cast<kel::ComboBox*>(hosted->part("cboCustom"));
    }
};

enum Where : int64_t { kFirst, kLast, kNowhere };

// Args: entries, sorted (0/1), where the typed text matches.
void BM_d_ComboSearch(benchmark::State& state) {
    const int64_t entries = state.range(0);
    const bool sorted = state.range(1) != 0;
    const auto where = static_cast<Where>(state.range(2));
    ComboForm f;
    if (!f.combo || !f.box) {
        state.SkipWithError("no KelCombo on the form");
        return;
    }
    // A sorted list box takes the entries in order; they arrive sorted already.
    if (sorted) f.hosted->part("cboCustom")->poke("Sorted", kel::Variant(true));
    kel::DecodeFillList(*f.box, list_string_of(entries));
    // Typed in lower case, as a person would; after the first search the text is the entry's
    // own, which matches the same entry from then on.
    std::string typed = where == kFirst ? "customer 0000000" : where == kLast ? entry_text(entries - 1) : "zebra";
    for (char& c : typed) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    f.box->Text(typed);
    const std::string expected = where == kNowhere ? typed : where == kFirst ? entry_text(0) : entry_text(entries - 1);
    for (auto _ : state) {
        int16_t key = 'A';
        f.combo->d_ComboSearch(key);
    }
    if (f.box->Text() != expected) state.SkipWithError(("search left " + f.box->Text()).c_str());
    state.SetLabel(std::string(sorted ? "sorted" : "unsorted") + (where == kFirst  ? ", first entry"
                                                                 : where == kLast ? ", last entry"
                                                                                  : ", no match"));
}
BENCHMARK(BM_d_ComboSearch)
    ->ArgsProduct({{10000, 100000, 1000000}, {0, 1}, {kFirst, kLast, kNowhere}})
    ->Unit(benchmark::kMicrosecond);

// No match in an unsorted list of short entries.
void BM_d_ComboSearch_short_entries(benchmark::State& state) {
    ComboForm f;
    if (!f.combo || !f.box) {
        state.SkipWithError("no KelCombo on the form");
        return;
    }
    kel::DecodeFillList(*f.box, list_string_of(state.range(0), true));
    f.box->Text("zebra");
    for (auto _ : state) {
        int16_t key = 'A';
        f.combo->d_ComboSearch(key);
    }
    if (f.box->Text() != "zebra") state.SkipWithError("the search changed the text");
    state.SetLabel("unsorted, no match, 12-character entries");
}
BENCHMARK(BM_d_ComboSearch_short_entries)->Arg(100000)->Unit(benchmark::kMicrosecond);

// Heap bytes held per entry: the list widget's entries alone, and a combo loaded from its
// saved FillList (which it also keeps as the string to save).
size_t heap_in_use() { return mallinfo2().uordblks; }

void BM_memory_per_entry(benchmark::State& state) {
    const int64_t entries = state.range(0);
    const bool from_saved = state.range(1) != 0;
    const std::string s = list_string_of(entries);
    double per_entry = 0;
    for (auto _ : state) {
        const size_t before = heap_in_use();
        {
            kel::Catalogue catalogue;
            kel::mini::Form form;
            if (from_saved) {
                form.load(*catalogue.find("KelCombo"), "c", {{"FillList", kel::Variant(s)}});
            } else {
                auto& hosted = form.create(*catalogue.find("KelCombo"), "c");
                kel::DecodeFillList(*dynamic_cast<kel::ComboBox*>(hosted.part("cboCustom")), s);
            }
            per_entry = static_cast<double>(heap_in_use() - before) / static_cast<double>(entries);
        }
    }
    state.counters["bytes_per_entry"] = per_entry;
    state.SetLabel(from_saved ? "loaded from FillList (list + saved string)" : "list entries only");
}
BENCHMARK(BM_memory_per_entry)->Args({100000, 0})->Args({100000, 1})->Iterations(1)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
