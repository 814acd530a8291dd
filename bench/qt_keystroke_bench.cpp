// Keystrokes on the Qt host against a plain Qt line edit, in the same run: the same 20,000 Qt
// key events (press and release, sent as a person's keys arrive) into a KelNumeric on the Qt
// host, where the widget model decides and the QLineEdit only shows it, and into a QLineEdit
// with a QDoubleValidator, where Qt edits and validates itself. The keys type "12.34" and
// rub it out again, 2,000 times. Offscreen platform; the program prints the ratio.
#include <benchmark/benchmark.h>

#include <QApplication>
#include <QDoubleValidator>
#include <QLineEdit>
#include <QTest>
#include <cstdio>
#include <string>
#include <vector>

#include "keltext/qt/kel_controls.h"

namespace {

constexpr int kKeys = 20000;

struct Key {
    Qt::Key key;
    char ascii;
};

std::vector<Key> key_sequence() {
    std::vector<Key> keys;
    const std::string typed = "12.34";
    while (static_cast<int>(keys.size()) < kKeys) {
        for (const char c : typed) keys.push_back({c == '.' ? Qt::Key_Period : Qt::Key(c), c});
        for (std::size_t i = 0; i < typed.size(); ++i) keys.push_back({Qt::Key_Backspace, '\b'});
    }
    keys.resize(kKeys);
    return keys;
}

void type_keys(QWidget* target, const std::vector<Key>& keys) {
    for (const Key& k : keys) QTest::sendKeyEvent(QTest::Click, target, k.key, k.ascii, Qt::NoModifier);
}

struct Results {
    double kel_per_key = 0;
    double qt_per_key = 0;
};

void report(benchmark::State& state, double& per_key, double seconds) {
    per_key = seconds / kKeys;
    state.counters["per_key_us"] = per_key * 1e6;
}

}  // namespace

int main(int argc, char** argv) {
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM")) qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    benchmark::Initialize(&argc, argv);
    const std::vector<Key> keys = key_sequence();
    Results results;

    QWidget window;
    auto* box = new kel::qt::KelNumeric(&window);
    box->setMaxLength(7);
    box->setNoOfDecimals(2);
    auto* edit = new QLineEdit(&window);
    edit->move(0, 40);
    edit->setValidator(new QDoubleValidator(0, 9999.99, 2, edit));
    window.show();
    QApplication::setActiveWindow(&window);

    benchmark::RegisterBenchmark("BM_keystroke_KelNumeric_Qt", [&](benchmark::State& state) {
        box->setFocus();
        QWidget* target = QApplication::focusWidget();
        for (auto _ : state) {
            const auto start = std::chrono::steady_clock::now();
            type_keys(target, keys);
            const std::chrono::duration<double> took = std::chrono::steady_clock::now() - start;
            state.SetIterationTime(took.count());
            report(state, results.kel_per_key, took.count());
        }
        if (!box->site().keyboard_part()->peek("Text").str().empty()) state.SkipWithError("the box is not empty after the keys");
    })->UseManualTime()->Iterations(1)->Repetitions(5)->Unit(benchmark::kMillisecond);

    benchmark::RegisterBenchmark("BM_keystroke_QLineEdit_QDoubleValidator", [&](benchmark::State& state) {
        edit->setFocus();
        for (auto _ : state) {
            const auto start = std::chrono::steady_clock::now();
            type_keys(edit, keys);
            const std::chrono::duration<double> took = std::chrono::steady_clock::now() - start;
            state.SetIterationTime(took.count());
            report(state, results.qt_per_key, took.count());
        }
        if (!edit->text().isEmpty()) state.SkipWithError("the line edit is not empty after the keys");
    })->UseManualTime()->Iterations(1)->Repetitions(5)->Unit(benchmark::kMillisecond);

    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    if (results.kel_per_key > 0 && results.qt_per_key > 0)
        std::printf("KelNumeric on the Qt host / QLineEdit + QDoubleValidator, per key (last run): %.2f\n",
                    results.kel_per_key / results.qt_per_key);
    return 0;
}
