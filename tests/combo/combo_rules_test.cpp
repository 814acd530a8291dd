#include "keltext/combo/combo_rules.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace kel {
namespace {

// --- Search ------------------------------------------------------------------------------

struct SearchCase {
    const char* name;
    std::vector<std::string> list;
    bool sorted;
    std::string typed;
    int32_t found;
    int32_t visited;  // entries read before the search ended
};

class Search : public testing::TestWithParam<SearchCase> {};

TEST_P(Search, FindsTheFirstEntryStartingWithTheText) {
    const SearchCase& c = GetParam();
    int32_t visited = 0;
    const int32_t found =
        find_completion(c.typed, static_cast<int32_t>(c.list.size()), c.sorted, [&](int32_t i) {
            ++visited;
            return std::string_view(c.list[static_cast<std::size_t>(i)]);
        });
    EXPECT_EQ(found, c.found);
    EXPECT_EQ(visited, c.visited);
}

const std::vector<std::string> kFruit = {"Apple", "Banana", "Cherry"};

INSTANTIATE_TEST_SUITE_P(
    ComboSearch, Search,
    testing::Values(SearchCase{"OneLetter", kFruit, false, "b", 1, 2},
                    SearchCase{"CaseIgnored", kFruit, false, "bA", 1, 2},
                    SearchCase{"UnsortedHasNoEarlyStop", {"Cherry", "Apple"}, false, "a", 1, 2},
                    SearchCase{"SortedFindsLast", kFruit, true, "c", 2, 3},
                    SearchCase{"SortedRunsToTheEnd", kFruit, true, "z", -1, 3},
                    SearchCase{"SortedTwoLetters", kFruit, true, "ap", 0, 1},
                    // An entry shorter than the text sorts before it: the search goes on.
                    SearchCase{"SortedShortEntryBeforeTheText", {"Ca", "Cash", "Cheque"}, true, "cas", 1, 2},
                    SearchCase{"SortedStopsEarly", {"Apple", "Banana", "Cherry", "Date"}, true, "bz", -1, 3},
                    SearchCase{"UnsortedNoMatch", kFruit, false, "x", -1, 3},
                    SearchCase{"LowerIndexWins", {"Bean", "Banana", "Bar"}, false, "ba", 1, 2},
                    SearchCase{"EmptyTextTakesFirst", kFruit, false, "", 0, 1},
                    SearchCase{"EmptyList", {}, false, "a", -1, 0},
                    SearchCase{"EntryShorterThanText", {"Ba", "Banana"}, true, "ban", 1, 2},
                    SearchCase{"AccentedUpperCase", {"\xC9" "cole"}, false, "\xE9" "c", 0, 1},
                    SearchCase{"WholeEntry", kFruit, false, "cherry", 2, 3},
                    SearchCase{"LongerThanEveryEntry", kFruit, false, "cherry pie", -1, 3}),
    [](const auto& info) { return std::string(info.param.name); });

// --- Filter --------------------------------------------------------------------------------

struct FilterCase {
    const char* name;
    int32_t type;
    std::string text;
    int32_t caret;
    int32_t sel_length;
    bool overwrite;
    char typed;
    int16_t key;                      // the code the widget is to insert
    bool select_one;
    std::optional<std::string> new_text;
    std::optional<int32_t> new_caret;
};

class Filter : public testing::TestWithParam<FilterCase> {};

TEST_P(Filter, Decides) {
    const FilterCase& c = GetParam();
    ComboEdit e;
    e.text = c.text;
    e.sel_start = c.caret;
    e.saved_sel_start = c.caret;
    e.sel_length = c.sel_length;
    e.overwrite = c.overwrite;
    const ComboDecision d = filter_combo_key(c.type, e, static_cast<int16_t>(static_cast<uint8_t>(c.typed)));
    EXPECT_EQ(d.key, c.key);
    EXPECT_EQ(d.select_one, c.select_one);
    EXPECT_EQ(d.text, c.new_text);
    EXPECT_EQ(d.sel_start, c.new_caret);
}

constexpr int16_t k(char c) { return static_cast<int16_t>(static_cast<uint8_t>(c)); }
const std::nullopt_t none = std::nullopt;

INSTANTIATE_TEST_SUITE_P(
    ComboFilter, Filter,
    testing::Values(
        FilterCase{"DigitsPassDigit", KelCboDigits, "", 0, 0, false, '7', k('7'), false, none, none},
        FilterCase{"DigitsPassSpace", KelCboDigits, "", 0, 0, false, ' ', k(' '), false, none, none},
        FilterCase{"DigitsPassFullStop", KelCboDigits, "", 0, 0, false, '.', k('.'), false, none, none},
        FilterCase{"DigitsDropLetter", KelCboDigits, "", 0, 0, true, 'a', 0, false, none, none},
        FilterCase{"DigitsDropMinus", KelCboDigits, "", 0, 0, false, '-', 0, false, none, none},
        FilterCase{"DigitsOverwrite", KelCboDigits, "12", 0, 0, true, '3', k('3'), true, none, none},
        FilterCase{"AlnumUpper", KelCboUAlphaNumeric, "", 0, 0, false, 'a', k('A'), false, none, none},
        FilterCase{"AlnumSpace", KelCboUAlphaNumeric, "", 0, 0, false, ' ', k(' '), false, none, none},
        FilterCase{"AlnumDropFullStop", KelCboUAlphaNumeric, "", 0, 0, false, '.', 0, false, none, none},
        FilterCase{"AlnumDropMinus", KelCboUAlphaNumeric, "", 0, 0, false, '-', 0, false, none, none},
        FilterCase{"AlnumDropAccented", KelCboUAlphaNumeric, "", 0, 0, false, '\xE9', 0, false, none, none},
        FilterCase{"UpperLetter", KelCboUpperCase, "x", 1, 0, false, 'q', k('Q'), false, none, none},
        FilterCase{"UpperAccented", KelCboUpperCase, "x", 1, 0, false, '\xE9', k('\xC9'), false, none, none},
        FilterCase{"UpperSymbol", KelCboUpperCase, "x", 1, 0, false, '%', k('%'), false, none, none},
        FilterCase{"UpperOverwrite", KelCboUpperCase, "xy", 1, 0, true, 'q', k('Q'), true, none, none},
        // A selection the person made is replaced whole, also in overwrite mode.
        FilterCase{"UpperOverwriteSelection", KelCboUpperCase, "xyz", 0, 3, true, 'q', k('Q'), false, none, none},
        FilterCase{"SentenceAtStart", KelCboSentence, "", 0, 0, false, 'a', k('A'), false, none, none},
        FilterCase{"SentenceElsewhere", KelCboSentence, "b", 1, 0, false, 'a', k('a'), false, none, none},
        FilterCase{"UserKeys", KelCboUserKeys, "", 0, 0, true, 'a', k('a'), false, none, none},
        FilterCase{"UnknownType", 9, "", 0, 0, true, 'a', k('a'), false, none, none},
        // The title-case rule itself is the host's (tests/alphanumeric): these rows check what
        // the combo hands it (the saved caret) and what it takes back.
        FilterCase{"TitleEmpty", KelCboTitleCase, "", 0, 0, false, 'j', 0, false, "J", 1},
        FilterCase{"TitleSpaceAtEnd", KelCboTitleCase, "John", 4, 0, false, ' ', 0, false, "John ", 5},
        FilterCase{"TitleAfterSpace", KelCboTitleCase, "John ", 5, 0, false, 's', 0, false, "John S", 6},
        FilterCase{"TitleOverwrite", KelCboTitleCase, "abc", 1, 0, true, 'x', 0, false, "Axc", 2},
        FilterCase{"TitleEscapeIsText", KelCboTitleCase, "ab", 2, 0, false, '\x1B', 0, false, "Ab\x1B", 3},
        FilterCase{"TitleAccentedWordStart", KelCboTitleCase, "le ", 3, 0, false, '\xE9', 0, false, "Le \xC9", 4}),
    [](const auto& info) { return std::string(info.param.name); });

TEST(ComboFilter, CodeZeroIsLeftAlone) {
    ComboEdit e;
    e.text = "abc";
    e.overwrite = true;
    for (int32_t type = 0; type <= 5; ++type) {
        const ComboDecision d = filter_combo_key(type, e, 0);
        EXPECT_EQ(d.key, 0);
        EXPECT_FALSE(d.select_one);
        EXPECT_FALSE(d.text);
    }
}

}  // namespace
}  // namespace kel
