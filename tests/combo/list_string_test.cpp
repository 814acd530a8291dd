#include "keltext/combo/list_string.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <utility>
#include <vector>

#include "fake_list.h"
#include "keltext/host/errors.h"

namespace kel {
namespace {

using test::FakeList;
using Entries = std::vector<std::pair<std::string, int32_t>>;

using test::L;

struct DecodeCase {
    const char* name;
    std::string list_string;
    Entries entries;
    int32_t list_index;
};

class Decode : public testing::TestWithParam<DecodeCase> {};

TEST_P(Decode, GivesTheEntriesAndSelection) {
    const DecodeCase& c = GetParam();
    FakeList list;
    list.entries = {{"old", 1}};
    list.list_index = 0;
    DecodeFillList(list, L(c.list_string));
    EXPECT_EQ(list.entries, c.entries);
    EXPECT_EQ(list.list_index, c.list_index);
    EXPECT_EQ(list.clears, 1);
}

INSTANTIATE_TEST_SUITE_P(
    ListString, Decode,
    testing::Values(
        DecodeCase{"Empty", "", {}, -1},
        DecodeCase{"OnlySpaces", "   ", {}, -1},
        DecodeCase{"TwoEntries", "Cash[201]1[200]Cheque[201]2[200]", {{"Cash", 1}, {"Cheque", 2}}, 0},
        DecodeCase{"OneEntryNoSeparatorLeftUnselected", "A[201]5", {{"A", 5}}, -1},
        DecodeCase{"EmptyEntriesSkipped", "[200][200]A[201]1[200]B[201]2", {{"A", 1}, {"B", 2}}, 0},
        DecodeCase{"EmptyEntryBetween", "A[201]1[200][200]B[201]2[200]", {{"A", 1}, {"B", 2}}, 0},
        DecodeCase{"DataNotANumber", "A[201]x7[200]", {{"A", 0}}, -1},
        DecodeCase{"BlanksInData", "A[201] 1 2[200]", {{"A", 12}}, -1},
        DecodeCase{"HalfUpToEven", "A[201]3.5[200]B[201]2.5[200]", {{"A", 4}, {"B", 2}}, 0},
        DecodeCase{"NegativeHalf", "A[201]-2.5[200]", {{"A", -2}}, -1},
        DecodeCase{"Hexadecimal", "A[201]&H1F[200]", {{"A", 31}}, -1},
        DecodeCase{"SecondDataSeparatorInData", "A[201]1[201]2[200]", {{"A", 1}}, -1},
        DecodeCase{"NoDataSeparatorDropped", "NoData[200]B[201]2[200]", {{"B", 2}}, -1},
        DecodeCase{"SpacesAtTheEnds", "  A B[201]1[200]C [201]2[200]  ", {{"A B", 1}, {"C ", 2}}, 0},
        DecodeCase{"TabsKept", "\tA[201]1[200]", {{"\tA", 1}}, -1},
        DecodeCase{"EmptyText", "[201]9", {{"", 9}}, -1},
        DecodeCase{"EmptyData", "A[201][200]", {{"A", 0}}, -1},
        DecodeCase{"Extremes", "A[201]2147483647[200]B[201]-2147483648[200]",
                   {{"A", 2147483647}, {"B", -2147483648}}, 0},
        // Data beyond 32 bits reads as 0 and the rest of the list still loads.
        DecodeCase{"OutOfRangeDataKeepsTheRest", "A[201]2147483648[200]B[201]2[200]C[201]-1e300[200]",
                   {{"A", 0}, {"B", 2}, {"C", 0}}, 0},
        // A data part never starts with [201][201] in a list this library writes: there it
        // stands for a letter of code 200 or 201 in the text.
        DecodeCase{"EscapedLetters", "[201][201][201]cole[201]1[200]No[201][201][200]l[201]2[200]",
                   {{"\xC9" "cole", 1}, {"No\xC8l", 2}}, 0},
        DecodeCase{"DoubledSeparatorWithoutLetterIsData", "A[201][201]5[200]", {{"A", 0}}, -1},
        DecodeCase{"LeadingEntrySeparatorKeepsSpaces", "[200] A[201]1[200]", {{" A", 1}}, -1}),
    [](const auto& info) { return std::string(info.param.name); });

TEST(ListString, EncodesInListOrder) {
    FakeList list;
    list.entries = {{"Cash", 1}, {"Cheque", -2}, {"", 0}};
    EXPECT_EQ(EncodeFillList(list), L("Cash[201]1[200]Cheque[201]-2[200][201]0[200]"));
    EXPECT_EQ(EncodeFillList(FakeList{}), "");
}

TEST(ListString, AddFillEntry) {
    FakeList list;
    AddFillEntry(list, "");
    AddFillEntry(list, "no separator");
    EXPECT_TRUE(list.entries.empty());
    AddFillEntry(list, L("Cash[201]7"));
    AddFillEntry(list, L("[201]"));
    EXPECT_EQ(list.entries, (Entries{{"Cash", 7}, {"", 0}}));
    EXPECT_EQ(list.list_index, -1);
}

std::string random_text(std::mt19937& rng) {
    // Letters, spaces (also leading), and now and then the two separator letters.
    static constexpr char kChars[] = {'a', 'B', ' ', '1', '\t', '&', '\xC8', '\xC9', '\xE9', '-'};
    std::uniform_int_distribution<int> len(0, 6), pick(0, sizeof kChars - 1);
    std::string s;
    for (int n = len(rng); n > 0; --n) s += kChars[pick(rng)];
    return s;
}

TEST(ListString, DecodingTheEncodingGivesTheListBack) {
    std::mt19937 rng(7);
    std::uniform_int_distribution<int32_t> data(INT32_MIN, INT32_MAX);
    std::uniform_int_distribution<int> size(0, 8);
    for (int round = 0; round < 2000; ++round) {
        FakeList list;
        for (int n = size(rng); n > 0; --n) list.entries.emplace_back(random_text(rng), data(rng));
        const std::string encoded = EncodeFillList(list);
        FakeList back;
        DecodeFillList(back, encoded);
        ASSERT_EQ(back.entries, list.entries) << "round " << round;
        EXPECT_EQ(back.list_index, list.entries.size() > 1 ? 0 : -1);
    }
}

TEST(ListString, ErrorsOfTheListReachTheCaller) {
    // A list that refuses an entry (a widget error) stops the decoding with that error.
    struct Refusing : FakeList {
        void AddItem(const std::string& item, std::optional<int32_t> index) override {
            if (item == "bad") raise_error(kInvalidPropertyIndex);
            FakeList::AddItem(item, index);
        }
    } list;
    try {
        DecodeFillList(list, L("a[201]1[200]bad[201]2[200]"));
        FAIL() << "no error";
    } catch (const RuntimeError& e) {
        EXPECT_EQ(e.number(), kInvalidPropertyIndex);
    }
    EXPECT_EQ(list.entries, (Entries{{"a", 1}}));
}

}  // namespace
}  // namespace kel
