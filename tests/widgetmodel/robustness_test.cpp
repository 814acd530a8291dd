// Long random runs of a person's input and program calls on the edit fields: whatever comes,
// nothing crashes, only the host's run-time errors come out, and the caret, selection and
// mask stay consistent with the text.
#include <gtest/gtest.h>

#include <random>

#include "keltext/widgetmodel/edit_box.h"
#include "keltext/widgetmodel/list_widgets.h"
#include "keltext/widgetmodel/masked_edit.h"
#include "tests/widgetmodel/widget_test_support.h"

namespace kel::model {
namespace {

using testing_support::RecordingContext;

template <class Field>
void check_consistent(const Field& f) {
    const auto len = static_cast<int32_t>(f.Text().size());
    ASSERT_GE(f.SelStart(), 0);
    ASSERT_LE(f.SelStart(), len);
    ASSERT_GE(f.SelLength(), 0);
    ASSERT_LE(f.SelStart() + f.SelLength(), len);
}

void random_input(InputPart& w, std::mt19937& rng) {
    static const int16_t keys[] = {kVkDelete, kVkLeft, kVkRight, kVkHome, kVkEnd, kVkUp, kVkDown, 0, 65};
    static const char* const texts[] = {"", "1", "ab", "12/05/2003", "x\xC9y", "________________"};
    int32_t n = std::uniform_int_distribution<int32_t>(-3, 20)(rng);
    try {
        switch (std::uniform_int_distribution<int>(0, 5)(rng)) {
        case 0: w.user_key_down(keys[rng() % std::size(keys)], 0); break;
        case 1: w.user_key_press(static_cast<int16_t>(std::uniform_int_distribution<int>(-2, 300)(rng))); break;
        case 2: w.user_key_press(8); break;
        case 3: w.user_paste(texts[rng() % std::size(texts)]); break;
        case 4: w.user_select(n, std::uniform_int_distribution<int32_t>(-1, 20)(rng)); break;
        case 5: w.poke("Text", texts[rng() % std::size(texts)]); break;
        }
    } catch (const RuntimeError& e) {
        // Only the documented refusals: a negative caret or selection, a text the mask cannot show.
        EXPECT_EQ(e.number(), 380);
    }
}

TEST(Robustness, MaskedEditStaysConsistent) {
    static const char* const masks[] = {"##/##/####", "##/##?", "##/##a", "##/##&", "", "&&", "/#/"};
    for (unsigned seed = 1; seed <= 20; ++seed) {
        std::mt19937 rng(seed);
        RecordingContext ctx;
        MaskedEditModel box(ctx, "msk", 1, 1200, 300);
        for (int step = 0; step < 400; ++step) {
            if (rng() % 25 == 0) box.Mask(masks[rng() % std::size(masks)]);
            random_input(box, rng);
            check_consistent(box);
            if (!box.Mask().empty()) {
                ASSERT_EQ(box.Text().size(), box.Mask().size());
                for (std::size_t i = 0; i < box.Mask().size(); ++i) {
                    char m = box.Mask()[i];
                    char c = box.Text()[i];
                    if (MaskedEditModel::is_input(m))
                        ASSERT_TRUE(c == MaskedEditModel::kPrompt || MaskedEditModel::fits(c, m)) << box.Text();
                    else
                        ASSERT_EQ(c, m);
                }
            }
        }
    }
}

TEST(Robustness, EditBoxAndComboStayConsistent) {
    for (unsigned seed = 1; seed <= 20; ++seed) {
        std::mt19937 rng(seed);
        RecordingContext ctx;
        EditBoxModel box(ctx, "txt", 1, 1200, 300);
        ComboBoxModel combo(ctx, "cbo", 2, 1200, 300);
        box.MaxLength(static_cast<int32_t>(seed % 6));
        for (const char* s : {"one", "two", "three"}) combo.AddItem(s);
        for (int step = 0; step < 400; ++step) {
            random_input(box, rng);
            random_input(combo, rng);
            check_consistent(box);
            check_consistent(combo);
            ASSERT_GE(combo.ListIndex(), -1);
            ASSERT_LT(combo.ListIndex(), combo.ListCount());
        }
    }
}

}  // namespace
}  // namespace kel::model
