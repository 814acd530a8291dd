// Keystrokes through the whole host path: the minimal form delivers key down, key press and
// key up to the focused control's edit field, the control's handlers run (events raised to the
// form, filters, synthetic keystrokes queued and delivered), and the widget edits its text.
// Each iteration types close to 1,000 keystrokes (whole cycles) into one control: a value typed, then Backspace over
// it, again and again, so that the text stays the size a person would type.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>
#include <vector>

#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/keyboard.h"

namespace {

constexpr int kKeystrokes = 1000;

struct Setup {
    const char* class_name;
    const char* typed;  // one cycle: these characters, then Backspace once more than their count
    std::vector<std::pair<const char*, kel::Variant>> properties;
    bool fill_list = false;
};

const std::string& combo_list() {
    static const std::string list = [] {
        const char* names[] = {"Apple", "Apricot", "Banana", "Bank Transfer", "Cash", "Cheque", "Cherry",
                               "Credit Card", "Debit Card", "Demand Draft", "Grapes", "Kiwi", "Lemon",
                               "Mango", "Melon", "Orange", "Papaya", "Peach", "Pear", "Plum"};
        std::string s;
        int i = 0;
        for (const char* n : names) {
            s += n;
            s += '\xC9';
            s += std::to_string(++i);
            s += '\xC8';
        }
        return s;
    }();
    return list;
}

void type_into(benchmark::State& state, const Setup& setup) {
    kel::Catalogue catalogue;
    kel::mini::Form form;
    const kel::ClassInfo* cls = catalogue.find(setup.class_name);
    if (!cls) {
        state.SkipWithError("no such class");
        return;
    }
    kel::mini::HostedControl& control =
        setup.fill_list ? form.load(*cls, "c", {{"FillList", kel::Variant(combo_list())}, {"AutoSearch", kel::Variant(true)}})
                        : form.create(*cls, "c");
    for (const auto& [name, value] : setup.properties) control.dispatch().set(name, value);
    form.focus(&control);
    kel::model::Part* field = control.keyboard_part();
    const kel::Variant empty_text = field->peek("Text");

    // The keystrokes of one iteration, worked out beforehand.
    std::vector<kel::model::Keystroke> keys;
    const kel::model::Keystroke backspace = *kel::model::parse_key("Backspace");
    const std::string typed = setup.typed;
    // Whole cycles only, so that every iteration starts from the empty field again.
    const size_t cycle = 2 * typed.size() + 1;
    while (keys.size() + cycle <= kKeystrokes) {
        for (char c : typed) keys.push_back(kel::model::keystroke_for_char(static_cast<uint8_t>(c)));
        for (size_t i = 0; i <= typed.size(); ++i) keys.push_back(backspace);
    }

    for (auto _ : state)
        for (const auto& k : keys) form.keystroke(k);

    if (const kel::Variant left = field->peek("Text"); !(left == empty_text))
        state.SkipWithError(("the typed text was not erased again: \"" + left.str() + "\" is left").c_str());
    const auto n = static_cast<double>(keys.size());
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(keys.size()));
    state.counters["per_key"] =
        benchmark::Counter(n * static_cast<double>(state.iterations()), benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_keystroke_KelAlphaNumeric(benchmark::State& state) {
    type_into(state, {"KelAlphaNumeric", "Kel Text 42 road", {}});
}
void BM_keystroke_KelNumeric(benchmark::State& state) {
    type_into(state, {"KelNumeric", "1234.56", {{"NoOfDecimals", kel::Variant(int16_t{2})}}});
}
void BM_keystroke_KelDateMask(benchmark::State& state) { type_into(state, {"KelDateMask", "31122003", {}}); }
void BM_keystroke_KelCombo(benchmark::State& state) { type_into(state, {"KelCombo", "chq", {}, true}); }

BENCHMARK(BM_keystroke_KelAlphaNumeric)->Repetitions(9)->ReportAggregatesOnly(true)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_keystroke_KelNumeric)->Repetitions(9)->ReportAggregatesOnly(true)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_keystroke_KelDateMask)->Repetitions(9)->ReportAggregatesOnly(true)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_keystroke_KelCombo)->Repetitions(9)->ReportAggregatesOnly(true)->Unit(benchmark::kMicrosecond);

}  // namespace

BENCHMARK_MAIN();
