// Indian digit grouping (12,34,567.50) of the numeric box against ICU's formatter for
// Indian English on the same numbers. Each ICU benchmark first checks that ICU groups every
// number exactly as the box does, and fails instead of reporting a figure otherwise.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <random>
#include <string>
#include <vector>

#include "keltext/host/conversions.h"
#include "keltext/numeric/number_format.h"

#if KELTEXT_BENCH_ICU
#include <unicode/locid.h>
#include <unicode/numberformatter.h>
#include <unicode/numfmt.h>
#include <unicode/unistr.h>

#include <memory>
#endif

namespace {

// The same numbers for every benchmark: whole numbers of 1 to 15 digits (every length equally
// often) and the same numbers with two decimals, as digit texts and as doubles.
struct Numbers {
    std::vector<std::string> whole_texts;    // "1234567"
    std::vector<double> whole_values;
    std::vector<std::string> decimal_texts;  // "1234567.50"
    std::vector<double> decimal_values;
};

const Numbers& numbers() {
    static const Numbers n = [] {
        Numbers r;
        std::mt19937_64 random(20031231);
        for (int i = 0; i < 1500; ++i) {
            const int digits = 1 + i % 15;
            std::string t(1, static_cast<char>('1' + random() % 9));
            for (int d = 1; d < digits; ++d) t += static_cast<char>('0' + random() % 10);
            r.whole_texts.push_back(t);
            r.whole_values.push_back(kel::leading_value(t));
            // Two decimals within 15 significant digits, so the double holds them exactly enough.
            if (digits <= 13) {
                std::string dt = t + '.' + static_cast<char>('0' + random() % 10) + static_cast<char>('0' + random() % 10);
                r.decimal_texts.push_back(dt);
                r.decimal_values.push_back(kel::leading_value(dt));
            }
        }
        return r;
    }();
    return n;
}

void BM_GroupIndian_whole(benchmark::State& state) {
    const auto& n = numbers();
    for (auto _ : state)
        for (const std::string& t : n.whole_texts) benchmark::DoNotOptimize(kel::GroupIndian(t));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(n.whole_texts.size()));
}
BENCHMARK(BM_GroupIndian_whole);

void BM_FormatGrouped_decimal(benchmark::State& state) {
    const auto& n = numbers();
    for (auto _ : state)
        for (const std::string& t : n.decimal_texts) benchmark::DoNotOptimize(kel::FormatGrouped(t));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(n.decimal_texts.size()));
}
BENCHMARK(BM_FormatGrouped_decimal);

// From the double, as ICU starts: plain number text, grouping, padding to two places.
std::string box_text_of(double value) {
    return kel::PadDecimals(kel::FormatGrouped(kel::plain_number_text(value)), 2);
}

void BM_FormatGrouped_from_double(benchmark::State& state) {
    const auto& n = numbers();
    for (auto _ : state)
        for (double v : n.decimal_values) benchmark::DoNotOptimize(box_text_of(v));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(n.decimal_values.size()));
}
BENCHMARK(BM_FormatGrouped_from_double);

#if KELTEXT_BENCH_ICU

const icu::Locale& indian_english() {
    static const icu::Locale locale("en", "IN");
    return locale;
}

// Fails the benchmark when ICU's text differs from the box's for any number.
template <class Format>
bool same_grouping(benchmark::State& state, const std::vector<std::string>& texts, const std::vector<double>& values,
                   Format&& format, bool padded) {
    for (size_t i = 0; i < texts.size(); ++i) {
        const std::string ours = padded ? box_text_of(values[i]) : kel::GroupIndian(texts[i]);
        const std::string theirs = format(values[i]);
        if (ours != theirs) {
            state.SkipWithError(("grouping differs: " + ours + " / ICU " + theirs).c_str());
            return false;
        }
    }
    return true;
}

// ICU's classic NumberFormat, the double to a UTF-8 std::string as the box's text would be.
std::unique_ptr<icu::NumberFormat> classic_format(int decimals) {
    UErrorCode status = U_ZERO_ERROR;
    std::unique_ptr<icu::NumberFormat> f(icu::NumberFormat::createInstance(indian_english(), status));
    if (U_FAILURE(status)) return nullptr;
    f->setMinimumFractionDigits(decimals);
    f->setMaximumFractionDigits(decimals);
    return f;
}

void icu_classic(benchmark::State& state, const std::vector<std::string>& texts, const std::vector<double>& values,
                 int decimals) {
    const auto f = classic_format(decimals);
    if (!f) {
        state.SkipWithError("ICU has no formatter for en_IN");
        return;
    }
    auto format = [&](double v) {
        icu::UnicodeString u;
        f->format(v, u);
        std::string s;
        return u.toUTF8String(s);
    };
    if (!same_grouping(state, texts, values, format, decimals > 0)) return;
    for (auto _ : state)
        for (double v : values) benchmark::DoNotOptimize(format(v));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(values.size()));
}

void icu_modern(benchmark::State& state, const std::vector<std::string>& texts, const std::vector<double>& values,
                int decimals) {
    namespace number = icu::number;
    const number::LocalizedNumberFormatter f =
        number::NumberFormatter::withLocale(indian_english())
            .precision(decimals > 0 ? number::Precision::fixedFraction(decimals) : number::Precision::integer());
    auto format = [&](double v) {
        UErrorCode status = U_ZERO_ERROR;
        const icu::UnicodeString u = f.formatDouble(v, status).toString(status);
        std::string s;
        return u.toUTF8String(s);
    };
    if (!same_grouping(state, texts, values, format, decimals > 0)) return;
    for (auto _ : state)
        for (double v : values) benchmark::DoNotOptimize(format(v));
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(values.size()));
}

void BM_ICU_NumberFormat_whole(benchmark::State& state) {
    icu_classic(state, numbers().whole_texts, numbers().whole_values, 0);
}
BENCHMARK(BM_ICU_NumberFormat_whole);

void BM_ICU_NumberFormat_decimal(benchmark::State& state) {
    icu_classic(state, numbers().decimal_texts, numbers().decimal_values, 2);
}
BENCHMARK(BM_ICU_NumberFormat_decimal);

void BM_ICU_NumberFormatter_whole(benchmark::State& state) {
    icu_modern(state, numbers().whole_texts, numbers().whole_values, 0);
}
BENCHMARK(BM_ICU_NumberFormatter_whole);

void BM_ICU_NumberFormatter_decimal(benchmark::State& state) {
    icu_modern(state, numbers().decimal_texts, numbers().decimal_values, 2);
}
BENCHMARK(BM_ICU_NumberFormatter_decimal);

#endif

}  // namespace

BENCHMARK_MAIN();
