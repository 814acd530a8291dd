// The keystroke benchmark's loop (bench_keystroke) without Google Benchmark, so that the very
// same code runs natively and as WebAssembly under Node: the controls' own cost per keystroke
// on each, with no JavaScript call in between. Prints the median of 9 runs per control.
#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <string>
#include <utility>
#include <vector>

#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/keyboard.h"

namespace {

constexpr int kKeystrokes = 1000;

std::string combo_list() {
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
}

double per_key_ns(const char* class_name, const std::string& typed, bool fill_list, bool decimals) {
    kel::Catalogue catalogue;
    kel::mini::Form form;
    const kel::ClassInfo* cls = catalogue.find(class_name);
    kel::mini::HostedControl& control =
        fill_list ? form.load(*cls, "c", {{"FillList", kel::Variant(combo_list())}, {"AutoSearch", kel::Variant(true)}})
                  : form.create(*cls, "c");
    if (decimals) control.dispatch().set("NoOfDecimals", kel::Variant(int16_t{2}));
    form.focus(&control);
    std::vector<kel::model::Keystroke> keys;
    const kel::model::Keystroke backspace = *kel::model::parse_key("Backspace");
    const size_t cycle = 2 * typed.size() + 1;
    while (keys.size() + cycle <= kKeystrokes) {
        for (char c : typed) keys.push_back(kel::model::keystroke_for_char(static_cast<uint8_t>(c)));
        for (size_t i = 0; i <= typed.size(); ++i) keys.push_back(backspace);
    }
    std::vector<double> runs;
    for (int run = 0; run < 9; ++run) {
        int rounds = 0;
        const auto start = std::chrono::steady_clock::now();
        auto now = start;
        do {
            for (const auto& k : keys) form.keystroke(k);
            ++rounds;
            now = std::chrono::steady_clock::now();
        } while (now - start < std::chrono::milliseconds(100));
        runs.push_back(std::chrono::duration<double, std::nano>(now - start).count() /
                       (static_cast<double>(rounds) * static_cast<double>(keys.size())));
    }
    std::sort(runs.begin(), runs.end());
    return runs[runs.size() / 2];
}

}  // namespace

int main() {
    std::printf("| control | per keystroke |\n|---|---|\n");
    std::printf("| `KelAlphaNumeric` | %.0f ns |\n", per_key_ns("KelAlphaNumeric", "Kel Text 42 road", false, false));
    std::printf("| `KelNumeric` | %.0f ns |\n", per_key_ns("KelNumeric", "1234.56", false, true));
    std::printf("| `KelDateMask` | %.0f ns |\n", per_key_ns("KelDateMask", "31122003", false, false));
    std::printf("| `KelCombo` | %.0f ns |\n", per_key_ns("KelCombo", "chq", true, false));
}
