#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <stdexcept>
#include <string>
#include <vector>

#include "keltext/numeric/numeric_rules.h"

namespace kel {
namespace {

// An edit box as the minimal host keeps it, so that a decision can be followed to the text the
// person sees: the rule's writes, then the edit box's own part with the key left to it, then
// the queued keystrokes ({END}; {DEL} goes through the key-down rule again).
struct Box {
    std::string text;
    int caret = 0;
    int sel = 0;
    int limit = 7;
    std::string keys;  // every synthetic keystroke queued, in order
    int errors = 0;    // ControlError events

    void set_text(const std::string& t) {
        if (t == text) return;
        text = t;
        caret = 0;
        sel = 0;
    }
    void apply(const NumericDecision& d) {
        for (const EditStep& s : d.steps()) {
            switch (s.kind) {
                case EditStep::Kind::text: set_text(s.text); break;
                case EditStep::Kind::caret:
                    caret = std::min<int>(s.value, static_cast<int>(text.size()));
                    sel = 0;
                    break;
                case EditStep::Kind::sel_length:
                    sel = std::min<int>(s.value, static_cast<int>(text.size()) - caret);
                    break;
                case EditStep::Kind::max_length: limit = s.value; break;
                case EditStep::Kind::send_keys: keys.append(s.keys); break;
                case EditStep::Kind::control_error: ++errors; break;
            }
        }
    }
    void erase_selection() {
        text.erase(static_cast<std::size_t>(caret), static_cast<std::size_t>(sel));
        sel = 0;
    }
    void type(int16_t key) {
        if (key >= 32) {
            if (limit > 0 && static_cast<int>(text.size()) - sel + 1 > limit) return;
            erase_selection();
            text.insert(static_cast<std::size_t>(caret), 1, static_cast<char>(key));
            ++caret;
        } else if (key == 8) {
            if (sel > 0) erase_selection();
            else if (caret > 0) text.erase(static_cast<std::size_t>(--caret), 1);
        }
    }
    void del() {
        if (sel > 0) erase_selection();
        else if (caret < static_cast<int>(text.size())) text.erase(static_cast<std::size_t>(caret), 1);
    }
};

struct Settings {
    int decimals = 2;
    int limit = 7;
    double max_value = 0;
    double min_value = 0;
    bool overwrite = false;
    bool trigger_error = true;
};

NumericEdit edit_of(const Box& b, const Settings& s) {
    NumericEdit e;
    e.text = b.text;
    e.caret = b.caret;
    e.sel_length = b.sel;
    e.limit = b.limit;
    e.decimals = s.decimals;
    e.max_length = s.limit;
    e.max_value = s.max_value;
    e.min_value = s.min_value;
    e.overwrite = s.overwrite;
    e.trigger_error = s.trigger_error;
    return e;
}

void key_down(Box& b, const Settings& s, int16_t key) {
    std::string before = b.text;  // the edit state must not see its own writes
    Box view = b;
    view.text = before;
    NumericDecision d = numeric_key_down(edit_of(view, s), key, 0);
    b.apply(d);
    if (d.key == 46) b.del();
}

// One keystroke's key press, the edit box's insertion and the queued keystrokes.
int16_t press(Box& b, const Settings& s, int16_t key, bool ctrl = false) {
    Box view = b;
    NumericDecision d = numeric_key_press(edit_of(view, s), key, ctrl);
    std::size_t queued = b.keys.size();
    b.apply(d);
    b.type(d.key);
    std::string pending = b.keys.substr(queued);
    for (std::size_t p = 0; p < pending.size();) {
        if (pending.compare(p, 5, "{END}") == 0) {
            b.caret = static_cast<int>(b.text.size());
            b.sel = 0;
            p += 5;
        } else if (pending.compare(p, 5, "{DEL}") == 0) {
            key_down(b, s, 46);
            p += 5;
        } else {
            ++p;
        }
    }
    return d.key;
}

struct PressCase {
    const char* name;
    std::string text;
    int caret;
    int sel;
    char key;
    Settings settings;
    std::string text_after;
    int caret_after;
    int16_t key_after;
    std::string keys;
    int errors = 0;
};

void run(const std::vector<PressCase>& cases) {
    for (const auto& c : cases) {
        Box b{c.text, c.caret, c.sel, c.settings.limit, {}, 0};
        int16_t k = press(b, c.settings, static_cast<int16_t>(static_cast<unsigned char>(c.key)));
        EXPECT_EQ(b.text, c.text_after) << c.name;
        EXPECT_EQ(b.caret, c.caret_after) << c.name;
        EXPECT_EQ(k, c.key_after) << c.name;
        EXPECT_EQ(b.keys, c.keys) << c.name;
        EXPECT_EQ(b.errors, c.errors) << c.name;
    }
}

const Settings kDec2{};  // two decimals in seven places: integer room 4

Settings with(Settings s, auto change) {
    change(s);
    return s;
}

TEST(FilterNumericKey, NothingSelected) {
    const Settings ow = with(kDec2, [](Settings& s) { s.overwrite = true; });
    const Settings max100 = with(kDec2, [](Settings& s) { s.decimals = 0; s.max_value = 100; });
    const Settings tight = with(kDec2, [](Settings& s) { s.decimals = 1; s.limit = 4; s.max_value = 45.5; });
    const Settings no_room = with(kDec2, [](Settings& s) { s.limit = 3; });
    const Settings min01 = with(kDec2, [](Settings& s) { s.min_value = 0.1; });
    const Settings min10 = with(kDec2, [](Settings& s) { s.min_value = 10; });
    const std::vector<PressCase> cases = {
        {"first digit", "", 0, 0, '1', kDec2, "1", 1, '1', ""},
        {"fifth digit brings the point", "1234", 4, 0, '5', kDec2, "1234.5", 6, 0, "{END}"},
        {"point into empty box", "", 0, 0, '.', kDec2, "0.", 2, 0, "{END}"},
        {"point elsewhere moves behind the point", "12.5", 0, 0, '.', kDec2, "12.5", 3, 0, ""},
        {"digit just before the point", "12.50", 2, 0, '7', kDec2, "127.50", 3, 0, ""},
        {"integer part full before the point", "1234.5", 2, 0, '9', kDec2, "1234.5", 2, 0, ""},
        {"decimals full", "12.50", 5, 0, '3', kDec2, "12.50", 5, 0, ""},
        {"decimal with room", "12.5", 4, 0, '6', kDec2, "12.56", 5, '6', ""},
        {"letter refused", "12", 2, 0, 'a', kDec2, "12", 2, 0, "", 1},
        {"letter refused silently", "12", 2, 0, 'a', with(kDec2, [](Settings& s) { s.trigger_error = false; }),
         "12", 2, 0, ""},
        {"digit into lone zero", "0", 1, 0, '5', kDec2, "5", 1, '5', ""},
        {"point appended when the tail is long", "1234", 1, 0, '.', kDec2, "1234.", 5, 0, ""},
        {"point inserted at the caret", "1234", 2, 0, '.', kDec2, "12.34", 3, '.', ""},
        {"backspace joins digits that fit", "12.5", 3, 0, '\b', kDec2, "125", 2, 8, ""},
        {"backspace keeps the point", "1234.5", 5, 0, '\b', kDec2, "1234.5", 5, 0, ""},
        {"range is checked before insertion", "99", 2, 0, '9', max100, "999", 3, '9', ""},
        {"automatic point out of range", "45", 2, 0, '7', tight, "45", 2, 0, "{END}"},
        {"automatic point exactly on the bound", "45", 2, 0, '5', tight, "45.5", 4, 0, "{END}"},
        {"0. below MinValue is typed on", "0", 1, 0, '.', min01, "0.", 2, 0, "{END}"},
        {"a digit into 0. below MinValue", "0.", 2, 0, '5', min01, "0.5", 3, 0, ""},
        {"a point into empty with a high MinValue", "", 0, 0, '.', min10, "0.", 2, 0, "{END}"},
        {"a text already above MaxValue is not the filter's", "999", 3, 0, '9', max100, "9999", 4, '9', ""},
        {"no decimals: point refused", "12", 2, 0, '.', with(kDec2, [](Settings& s) { s.decimals = 0; }), "12", 2,
         0, "", 1},
        {"no integer room: point alone", "", 0, 0, '.', no_room, ".", 1, 0, "{END}"},
        {"digit after a lone point", ".", 1, 0, '5', no_room, ".5", 2, 0, ""},
        {"digit at the start of 0.", "0.", 0, 0, '5', kDec2, "5.", 1, '5', ""},
        {"overwrite a decimal", "12.34", 3, 0, '9', ow, "12.94", 4, '9', ""},
        {"overwrite at the end", "12.34", 5, 0, '9', ow, "12.34", 5, 0, ""},
        {"overwrite steps over the point", "1234.56", 4, 0, '9', ow, "1234.96", 6, '9', ""},
        {"overwrite without decimals", "123", 0, 0, '9', with(kDec2, [](Settings& s) {
             s.decimals = 0;
             s.overwrite = true;
         }),
         "923", 1, '9', ""},
    };
    run(cases);
}

TEST(FilterNumericKey, KeyPressStepsBeforeTheFilter) {
    const std::vector<PressCase> cases = {
        {"enter dropped", "12", 2, 0, '\r', kDec2, "12", 2, 0, ""},
        {"tab passes", "12", 2, 0, '\t', kDec2, "12", 2, 9, ""},
        {"line feed passes", "12", 2, 0, '\n', kDec2, "12", 2, 10, ""},
    };
    run(cases);
    Box b{"12", 2, 0, 7, {}, 0};
    EXPECT_EQ(press(b, kDec2, 'a', /*ctrl=*/true), 'a');  // Ctrl held: not filtered at all
    EXPECT_EQ(b.text, "12a");
}

TEST(FilterNumericKey, CodeZeroFromTheFormStillCountsAsRefused) {
    NumericEdit e;
    e.text = "12";
    e.caret = 2;
    e.limit = 7;
    e.decimals = 2;
    e.trigger_error = true;
    NumericDecision d = FilterNumericKey(e, 0);
    EXPECT_EQ(d.key, 0);
    int errors = 0;
    for (const auto& s : d.steps()) errors += s.kind == EditStep::Kind::control_error;
    EXPECT_EQ(errors, 1);
    ASSERT_TRUE(d.overwrite.has_value());
}

TEST(FilterNumericKey, RestoredTextIsTheTextBeforeTheKey) {
    // The automatic point makes 45.7, above the bound: the box goes back to 45 and says so
    // with a second change, in order.
    NumericEdit e;
    e.text = "45";
    e.caret = 2;
    e.limit = 4;
    e.decimals = 1;
    e.max_length = 4;
    e.max_value = 45.5;
    NumericDecision d = FilterNumericKey(e, '7');
    std::vector<std::string> texts;
    for (const auto& s : d.steps())
        if (s.kind == EditStep::Kind::text) texts.push_back(s.text);
    EXPECT_EQ(texts, (std::vector<std::string>{"45.7", "45"}));
}

TEST(ReplaceSelection, EverySelectionCase) {
    const Settings dec0 = with(kDec2, [](Settings& s) { s.decimals = 0; });
    const std::vector<PressCase> cases = {
        {"point with a point outside", "12.50", 0, 2, '.', kDec2, ".50", 1, 0, ""},
        {"all selected", "1234", 0, 4, '5', kDec2, "5", 1, 0, ""},
        {"point before a short tail", "1234", 0, 2, '.', kDec2, ".34", 1, 0, ""},
        {"point before a long tail", "1234", 0, 1, '.', kDec2, "1234", 1, 0, ""},
        {"digit at the start", "1234", 0, 1, '9', kDec2, "9234", 1, 0, ""},
        {"digit in the middle", "1234", 1, 2, '9', kDec2, "194", 2, 0, ""},
        {"digit over the point, room left", "12.34", 1, 3, '9', kDec2, "19.4", 2, 0, ""},
        {"point over the point", "12.34", 2, 1, '.', kDec2, "12.34", 3, 0, ""},
        {"digit over the point, integer full", "1234.5", 4, 1, '9', kDec2, "1234.95", 5, 0, ""},
        {"point over the point and the tail", "12.34", 2, 3, '.', kDec2, "12.", 3, 0, ""},
        {"backspace where the digits fit", "1234.56", 2, 3, '\b', kDec2, "1256", 2, 0, "{DEL}"},
        {"backspace where they do not", "1234.56", 3, 2, '\b', kDec2, "1234.56", 3, 0, ""},
        {"integer part too long", "12345.6", 5, 2, '9', kDec2, "12345.6", 6, 0, ""},
        {"letter, no error", "12", 0, 1, 'a', kDec2, "12", 0, 0, "", 0},
        {"no decimals: point refused", "123", 0, 1, '.', dec0, "123", 0, 0, "", 1},
        {"no decimals: digit replaces", "123", 0, 1, '9', dec0, "923", 1, '9', ""},
        {"no decimals: backspace", "123", 1, 2, '\b', dec0, "1", 1, 0, "{DEL}"},
    };
    run(cases);
}

TEST(NumericKeyDown, Rules) {
    struct Case {
        const char* name;
        std::string text;
        int caret;
        int16_t key;
        int16_t shift;
        std::string text_after;
        int16_t key_after;
        std::string keys;
        bool ctrl;
    };
    const std::vector<Case> cases = {
        {"slash key clears, key goes on", "12.5", 4, 191, 0, "", 191, "", false},
        {"up moves to the previous control", "12", 2, 38, 0, "12", 0, "+{TAB}", false},
        {"down moves to the next control", "12", 2, 40, 0, "12", 0, "{TAB}", false},
        {"ctrl up is left alone", "12", 2, 38, 2, "12", 38, "", true},
        {"delete on a trailing point", "12.", 2, 46, 0, "12.", 46, "", false},
        {"delete on a lone point", ".", 0, 46, 0, "", 46, "", false},
        {"delete elsewhere", "12.5", 0, 46, 0, "12.5", 46, "", false},
        {"delete on the point of a long integer", "12345.6", 5, 46, 0, "12345.6", 46, "", false},
    };
    for (const auto& c : cases) {
        Box b{c.text, c.caret, 0, 7, {}, 0};
        NumericDecision d = numeric_key_down(edit_of(b, kDec2), c.key, c.shift);
        Box after = b;
        after.apply(d);
        EXPECT_EQ(after.text, c.text_after) << c.name;
        EXPECT_EQ(d.key, c.key_after) << c.name;
        EXPECT_EQ(after.keys, c.keys) << c.name;
        ASSERT_TRUE(d.ctrl_down.has_value()) << c.name;
        EXPECT_EQ(*d.ctrl_down, c.ctrl) << c.name;
    }
}

TEST(NumericKeys, TypingAsAPerson) {
    // Whole keystroke sequences, each key through the key-down and key-press rules.
    struct Case {
        std::string typed;
        Settings settings;
        std::string text;
    };
    const std::vector<Case> cases = {
        {"12345", kDec2, "1234.5"},
        {"123456", kDec2, "1234.56"},
        {"1.2.3", kDec2, "1.32"},  // the second point puts the caret just behind the first
        {"12a3", kDec2, "123"},
        {"1/2", kDec2, "2"},
        {"1234567", with(kDec2, [](Settings& s) { s.decimals = 0; }), "1234567"},
        {"12.5", with(kDec2, [](Settings& s) { s.decimals = 0; }), "125"},
        // A double keeps 15 significant digits: integer digits and decimals together stop there.
        {std::string(20, '9'), with(kDec2, [](Settings& s) { s.decimals = 0; s.limit = 400; }), std::string(15, '9')},
        {"0001234567890123456", with(kDec2, [](Settings& s) { s.decimals = 0; s.limit = 400; }), "123456789012345"},
        {"12345678901234.56", with(kDec2, [](Settings& s) { s.limit = 40; }), "1234567890123.56"},
        {"1234567890123.45", with(kDec2, [](Settings& s) { s.limit = 40; }), "1234567890123.45"},
    };
    for (const auto& c : cases) {
        Box b{"", 0, 0, c.settings.limit, {}, 0};
        for (char ch : c.typed) {
            key_down(b, c.settings, 0);
            press(b, c.settings, static_cast<int16_t>(ch));
        }
        EXPECT_EQ(b.text, c.text) << c.typed;
    }
}

TEST(NumericKeys, RandomTypingKeepsOneNumber) {
    // Whatever a person types, clicks and selects, the box holds digits and at most one point.
    std::mt19937 rng(20240605);
    const std::string keys = "0123456789.0123456789.\ba/\r";
    for (int decimals : {0, 1, 2, 4}) {
        Settings s = with(kDec2, [&](Settings& t) {
            t.decimals = decimals;
            t.limit = decimals + 5;
        });
        Box b{"", 0, 0, s.limit, {}, 0};
        for (int i = 0; i < 4000; ++i) {
            int len = static_cast<int>(b.text.size());
            if (rng() % 5 == 0) {
                b.caret = static_cast<int>(rng() % static_cast<unsigned>(len + 1));
                b.sel = static_cast<int>(rng() % static_cast<unsigned>(len - b.caret + 1));
            }
            s.overwrite = rng() % 4 == 0;
            key_down(b, s, 0);
            press(b, s, static_cast<int16_t>(keys[rng() % keys.size()]));
            ASSERT_EQ(b.text.find_first_not_of("0123456789."), std::string::npos) << b.text;
            ASSERT_LE(std::count(b.text.begin(), b.text.end(), '.'), decimals == 0 ? 0 : 1) << b.text;
            ASSERT_LE(b.caret, static_cast<int>(b.text.size()));
        }
    }
}

TEST(NumericDecision, EveryDecisionFitsItsStepsAndOneMoreFailsLoudly) {
    // Every key, pressed and put down, over boxes that make the rules write the most: none
    // may need more steps than a decision holds (a push beyond them throws).
    std::size_t most = 0;
    const char* const texts[] = {"", "0", ".", "0.", "12", "1234", "1234.5", "12.50", "45", "12,34,567.50"};
    for (const char* text : texts)
        for (int caret : {0, 2, 99})
            for (int sel : {0, 1})
                for (int decimals : {0, 1, 2})
                    for (bool overwrite : {false, true})
                        for (double max_value : {0.0, 45.5}) {
                            Box b{text, std::min<int>(caret, static_cast<int>(std::string(text).size())), 0, 7, {}, 0};
                            b.sel = std::min<int>(sel, static_cast<int>(b.text.size()) - b.caret);
                            NumericEdit e = edit_of(b, with(kDec2, [&](Settings& s) {
                                                        s.decimals = decimals;
                                                        s.limit = decimals == 1 ? 4 : 7;
                                                        s.overwrite = overwrite;
                                                        s.max_value = max_value;
                                                    }));
                            e.limit = decimals == 1 ? 4 : 7;
                            e.txt_format = true;
                            most = std::max(most, format_on_exit(e).steps().size());
                            for (int key = 0; key <= 255; ++key) {
                                const auto k = static_cast<int16_t>(key);
                                most = std::max(most, numeric_key_press(e, k, false).steps().size());
                                most = std::max(most, numeric_key_down(e, k, 0).steps().size());
                            }
                        }
    EXPECT_LE(most, EditSteps::kCapacity);
    NumericDecision d;
    for (std::size_t i = 0; i < EditSteps::kCapacity; ++i) d.push(EditStep{});
    EXPECT_THROW(d.push(EditStep{}), std::logic_error);
}

TEST(FormatOnExit, NormalizesGroupsClampsPads) {
    struct Case {
        std::string text;
        int decimals;
        bool grouped;
        double max_value;
        double min_value;
        std::string out;
        int limit;  // the edit box's limit afterwards
    };
    const std::vector<Case> cases = {
        {"7", 2, false, 0, 0, "7.00", 7},
        {".5", 2, false, 0, 0, "0.50", 7},
        {"12.", 2, false, 0, 0, "12.00", 7},
        {"123", 2, true, 0, 0, "123.00", 3},
        {"123456", 2, true, 5000, 0, "5000.00", 8},  // clamped after grouping: ungrouped
        // Exactly on a bound is inside the range: the grouping stays.
        {"5000", 2, true, 5000, 0, "5,000.00", 5},
        {"1000", 0, true, 0, 1000, "1,000", 5},
        {"999", 0, true, 0, 1000, "1000", 3},
        {"", 2, false, 0, 10, "0.00", 7},  // empty is never clamped
        {".", 2, false, 0, 0, ".00", 7},
        {"99", 0, false, 0, 0, "99", 7},
        {"-1234567", 2, true, 0, -1e9, "-12,34,567.00", 10},
        {"1234567", 0, true, 0, 0, "12,34,567", 9},
        {"12,34,567.50", 2, false, 0, 0, "1234567.50", 7},  // still grouped from an earlier exit
        {"1,234", 0, false, 0, 0, "1234", 7},
    };
    for (const auto& c : cases) {
        Box b{c.text, 0, 0, 7, {}, 0};
        NumericEdit e = edit_of(b, with(kDec2, [&](Settings& s) {
                                    s.decimals = c.decimals;
                                    s.max_value = c.max_value;
                                    s.min_value = c.min_value;
                                }));
        e.txt_format = c.grouped;
        b.apply(format_on_exit(e));
        EXPECT_EQ(b.text, c.out) << c.text;
        EXPECT_EQ(b.limit, c.limit) << c.text;
        EXPECT_EQ(b.errors, 0);
    }
}

TEST(SpinButtons, StepAndClamp) {
    struct Case {
        std::string text;
        double max_value;
        double min_value;
        double increment;
        std::string up;
        std::string down;
    };
    const std::vector<Case> cases = {
        {"5", 0, 0, 0, "5", "5"},
        {"12", 12, 0, 5, "12", "7"},
        {"3", 10, 3, 1, "4", "3"},  // on MinValue: down stays
        {"abc", 10, 3, 1, "3", "3"},
        {"12,34,567", 0, 0, 1, "1234568", "1234566"},
        {"1", 0, 2, 1, "2", "2"},
        {"2.5", 0, 0, 0.25, "2.75", "2.25"},
    };
    for (const auto& c : cases) {
        SpinInput in{c.text, c.max_value, c.min_value, c.increment};
        EXPECT_EQ(step_up_text(in), c.up) << c.text;
        EXPECT_EQ(step_down_text(in), c.down) << c.text;
    }
}

}  // namespace
}  // namespace kel
