// How the cost of a form grows with its number of controls: opening and saving a form file
// (parse, load every control, WriteProperties of every control, the text written again), and one
// keystroke in the terminal form (the key delivered, then the whole screen drawn). The first
// should grow no faster than the form; the second should not grow at all.
#include <benchmark/benchmark.h>

#include <string>

#include "apps/kelform/form_file.h"
#include "apps/kelform/terminal_canvas.h"
#include "apps/kelform/terminal_session.h"
#include "keltext/host/date.h"
#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/keyboard.h"

namespace {

using namespace kel;
using namespace kel::kelform;

// N controls of the four classes in turn, each with a label and a few stored values: one a row
// down the form (a form has at most 999 rows), then side by side a screen's width (80 columns)
// apart, so that an 80 x 24 screen shows at most 21 of them however many the form holds.
std::string form_text(int n) {
    static const char* const kClasses[] = {"KelAlphaNumeric", "KelNumeric", "KelDateMask", "KelCombo"};
    static const char* const kStores[] = {"    store MaxLength 20\n    store Text \"Ramesh Kumar\"\n",
                                          "    store MaxLength 12\n    store NoOfDecimals 2\n    store Text \"1234.5\"\n",
                                          "    store Text \"30/04/2026\"\n",
                                          "    store FillList \"Cash\\xC91\\xC8Cheque\\xC92\\xC8\"\n"};
    std::string out = "form \"Scale\"\n";
    for (int i = 0; i < n; ++i) {
        const int kind = i % 4;
        out += "\ncontrol " + std::string(kClasses[kind]) + " f" + std::to_string(i) + "\n";
        out += "    label \"Field " + std::to_string(i) + "\"\n";
        out += "    at " + std::to_string(1 + i % 999) + " " + std::to_string(20 + (i / 999) % 13 * 80) + "\n";
        out += "    size 2400 300\n";
        out += kStores[kind];
        out += "end\n";
    }
    return out;
}

void BM_OpenAndSaveFormFile(benchmark::State& state) {
    const int n = static_cast<int>(state.range(0));
    const std::string text = form_text(n);
    Catalogue catalogue;
    const Date today = *make_date(2026, 12, 6);
    for (auto _ : state) {
        const SavedForm saved = parse_form(text, "scale.kform", catalogue.classes());
        mini::Form form;
        open_form(form, saved, catalogue.classes(), "scale.kform", today);
        const std::string again = write_form(capture_form(form, saved));
        benchmark::DoNotOptimize(again.data());
    }
    state.counters["per_control"] =
        benchmark::Counter(static_cast<double>(n), benchmark::Counter::kIsIterationInvariantRate |
                                                       benchmark::Counter::kInvert);
}
BENCHMARK(BM_OpenAndSaveFormFile)->Arg(10000)->Arg(100000)->Unit(benchmark::kMillisecond)->MinTime(2.0);

// A person types into the first field and rubs it out again; each keystroke is followed by a
// redraw of the whole 80 x 24 screen, as the terminal form does.
void BM_TerminalKeystroke(benchmark::State& state) {
    const int n = static_cast<int>(state.range(0));
    Catalogue catalogue;
    const Date today = *make_date(2026, 12, 6);
    const SavedForm saved = parse_form(form_text(n), "scale.kform", catalogue.classes());
    mini::Form form;
    open_form(form, saved, catalogue.classes(), "scale.kform", today);
    TerminalSession session(form, saved, today);
    Canvas canvas(24, 80);
    session.render(canvas);
    bool type = true;
    for (auto _ : state) {
        session.handle(type ? Input::char_of(U'k') : Input::key_of(kVkBackspace));
        session.render(canvas);
        type = !type;
    }
}
BENCHMARK(BM_TerminalKeystroke)->Arg(10)->Arg(21)->Arg(10000)->Unit(benchmark::kMicrosecond);

}  // namespace

BENCHMARK_MAIN();
