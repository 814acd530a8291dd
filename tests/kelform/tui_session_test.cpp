// The terminal form without a terminal: the demo voucher driven as a person would, checked on
// the drawn screen, the form's code (status line, focus rule, calendar, list) and the values.
#include <gtest/gtest.h>

#include <memory>

#include "apps/kelform/demo_form.h"
#include "apps/kelform/form_file.h"
#include "apps/kelform/terminal_session.h"
#include "keltext/library/catalogue.h"
#include "keltext/widgetmodel/keyboard.h"

namespace kel::kelform {
namespace {

constexpr int16_t kF2 = kVkF1 + 1, kF4 = kVkF1 + 3, kF10 = kVkF1 + 9;

// Rows of the demo form's fields.
constexpr int kPayeeRow = 2, kAmountRow = 6, kDateRow = 8, kPayModeRow = 10, kPeriodRow = 14;

class SessionTest : public ::testing::Test {
protected:
    void SetUp() override {
        saved = parse_form(demo_form_text(), "voucher.kform", catalogue.classes());
        open_form(form, saved, catalogue.classes(), "voucher.kform", today);
        session = std::make_unique<TerminalSession>(form, saved, today);
    }

    TerminalSession::Outcome key(int16_t k, int16_t shift = 0) { return session->handle(Input::key_of(k, shift)); }
    void type(std::u32string_view text) {
        for (char32_t c : text) session->handle(Input::char_of(c));
    }
    void tab(int times = 1) {
        for (int i = 0; i < times; ++i) key(kVkTab);
    }
    Canvas screen(int rows = 24, int cols = 80) {
        Canvas c(rows, cols);
        session->render(c);
        return c;
    }
    std::string row(int r) { return screen().row_text(r); }
    Variant text(const char* name) { return form.find(name)->dispatch().get("Text"); }
    std::string focused() { return form.focused() ? form.focused()->name() : std::string(); }
    bool logged(std::string_view line) {
        for (const auto& e : session->events())
            if (e == line) return true;
        return false;
    }
    // Clicks the first cell on the row that shows `ch`.
    void click_on(int r, char32_t ch) {
        Canvas c = screen();
        for (int col = 0; col < c.cols(); ++col)
            if (c.at(r, col).ch == ch) {
                session->handle(Input::click_at(r, col));
                return;
            }
        ADD_FAILURE() << "nothing drawn on row " << r;
    }

    const Date today = make_date(2026, 12, 6).value();
    Catalogue catalogue;
    SavedForm saved;
    mini::Form form;
    std::unique_ptr<TerminalSession> session;
};

// tui_tmux.sh fills in every field of the voucher in a real terminal, opens the combo list and
// the calendar with F4 and checks the JSON printed; these cases take what it leaves out.

TEST_F(SessionTest, TheVoucherDateStaysInTheFinancialYear) {
    tab(3);
    ASSERT_EQ(focused(), "VoucherDate");
    type(U"01012020");
    tab();
    EXPECT_EQ(text("VoucherDate"), Variant("01/04/2026"));
    key(kVkTab, kShiftMask);
    type(U"15062027");
    tab();
    EXPECT_EQ(text("VoucherDate"), Variant("31/03/2027"));
}

TEST_F(SessionTest, TheComboListOpensWithAltDownAndEscapeOnlyClosesIt) {
    tab(4);
    ASSERT_EQ(focused(), "PayMode");
    key(kVkDown, kAltMask);
    ASSERT_TRUE(session->list_open());
    EXPECT_TRUE(logged("event PayMode.DropDown"));
    key(kVkDown);
    key(kVkDown);
    key(kVkEnter);
    EXPECT_FALSE(session->list_open());
    EXPECT_EQ(text("PayMode"), Variant("Card"));
    EXPECT_EQ(form.find("PayMode")->dispatch().get("ListIndex"), Variant(int16_t{2}));

    key(kF4);
    ASSERT_TRUE(session->list_open());
    key(kVkUp);
    key(kVkEscape);  // closes the list only
    EXPECT_FALSE(session->list_open());
    EXPECT_EQ(text("PayMode"), Variant("Card"));
    EXPECT_EQ(focused(), "PayMode");
}

TEST_F(SessionTest, TheCalendarButtonOpensAMonthAndPicksADay) {
    click_on(kDateRow, U'▦');
    ASSERT_TRUE(session->calendar_open());
    EXPECT_TRUE(logged("event VoucherDate.ButtonClick"));
    // CalendarPosition 2, bottom left: the month hangs under the box.
    Canvas c = screen();
    EXPECT_NE(c.row_text(kDateRow + 2).find("December 2026"), std::string::npos) << c.row_text(kDateRow + 2);
    key(kVkRight);
    key(kVkEnter);
    EXPECT_FALSE(session->calendar_open());
    EXPECT_EQ(text("VoucherDate"), Variant("07/12/2026"));
    EXPECT_EQ(focused(), "VoucherDate");

    // Days outside the financial year cannot be picked.
    key(kF4);
    ASSERT_TRUE(session->calendar_open());
    for (int i = 0; i < 4; ++i) key(kVkPageDown);
    key(kVkEnter);
    EXPECT_TRUE(session->calendar_open());
    EXPECT_NE(session->status().find("pick a day 01/04/2026 to 31/03/2027"), std::string::npos) << session->status();
    key(kVkEscape);
    EXPECT_FALSE(session->calendar_open());
    EXPECT_EQ(text("VoucherDate"), Variant("07/12/2026"));
}

TEST_F(SessionTest, AFailedDateCheckKeepsFocusOnceAndExplains) {
    session->handle(Input::click_at(kPeriodRow, 3));  // on the label
    ASSERT_EQ(focused(), "Period");
    type(U"1326");
    tab();
    EXPECT_EQ(focused(), "Period");
    EXPECT_TRUE(logged("event Period.DateError"));
    EXPECT_NE(session->status().find("Period"), std::string::npos) << session->status();
    tab();  // the person insists: the form lets the box go
    EXPECT_EQ(focused(), "Payee");

    // Finishing checks the box the same way.
    session->handle(Input::click_at(kPeriodRow, 3));
    type(U"13");
    EXPECT_EQ(key(kF10), TerminalSession::Outcome::going_on);
    EXPECT_EQ(focused(), "Period");
    EXPECT_NE(session->status().find("F10 again"), std::string::npos) << session->status();
    EXPECT_EQ(key(kF10), TerminalSession::Outcome::finished);
}

TEST_F(SessionTest, StatusLineExplainsRefusedKeys) {
    tab(2);
    ASSERT_EQ(focused(), "Amount");
    type(U"12x");
    EXPECT_TRUE(logged("event Amount.ControlError"));
    EXPECT_NE(session->status().find("Amount: key refused - up to 8 digits, a point and 2 decimals"), std::string::npos) << session->status();
    EXPECT_EQ(text("Amount"), Variant(12.0));

    // A character outside Windows-1252 is refused; one inside it is typed.
    key(kVkTab, kShiftMask);
    key(kVkTab, kShiftMask);
    ASSERT_EQ(focused(), "Payee");
    type(U"\u65e5");
    EXPECT_EQ(session->status(), "'\u65e5' cannot be typed here: the form holds Windows-1252 text");
    EXPECT_NE(row(23).find("'\u65e5' cannot"), std::string::npos) << row(23);
    EXPECT_EQ(text("Payee"), Variant(""));
    type(U"\u00e9\u20ac");
    EXPECT_EQ(text("Payee"), Variant("\xC9\x80"));
    EXPECT_NE(row(kPayeeRow).find("\u00c9\u20ac"), std::string::npos) << row(kPayeeRow);
}

TEST_F(SessionTest, TheFormSaysWhenLeavingChangedTheValueTyped) {
    tab(2);
    type(U"6000000");  // above the largest amount: clamped
    tab();
    EXPECT_EQ(session->status(), "Amount: 6000000 was changed to 5000000.00");
    type(U"31/04/2026");  // no 31 April: corrected
    tab();
    EXPECT_EQ(session->status(), "Voucher date: 31/04/2026 was changed to 30/04/2026");
    key(kVkTab, kShiftMask);
    type(U"5/8/26");  // only completed: no change of value
    key(kVkTab, kShiftMask);
    EXPECT_EQ(session->status(), "");
    type(U"2500");  // only grouped and padded
    tab();
    EXPECT_EQ(session->status(), "");
}

TEST_F(SessionTest, SmallScreensScrollAndSaySoWhenTooSmall) {
    tab(6);
    ASSERT_EQ(focused(), "Period");
    EXPECT_EQ(screen(10, 80).row_text(1).find("Payee"), std::string::npos);  // scrolled away
    EXPECT_NE(screen(30, 80).row_text(kPayeeRow).find("Payee name"), std::string::npos);  // back on growing
    EXPECT_EQ(screen(5, 20).row_text(0), "Terminal too small");
    // On a 40x10 screen the calendar stands clear of its field, its last row on the screen.
    tab(5);  // the blank period keeps focus once
    ASSERT_EQ(focused(), "VoucherDate");
    key(kF4);
    ASSERT_TRUE(session->calendar_open());
    Canvas c = screen(10, 40);
    int field_row = -1, last_week = -1;
    for (int r = 0; r < c.rows(); ++r) {
        if (c.row_text(r).find("Voucher date") != std::string::npos) field_row = r;
        if (c.row_text(r).find("28 29 30 31") != std::string::npos) last_week = r;
    }
    EXPECT_GE(field_row, 1);
    EXPECT_NE(c.row_text(field_row).find("06/12/2026"), std::string::npos) << c.row_text(field_row);
    EXPECT_GT(last_week, field_row);
}

TEST_F(SessionTest, InsertTogglesOverwriteShownOnTheStatusLine) {
    Canvas c = screen();
    EXPECT_NE(c.row_text(23).find("INS"), std::string::npos);
    key(kVkInsert);
    EXPECT_NE(screen().row_text(23).find("OVR"), std::string::npos);
    type(U"abc");
    key(kVkHome);
    type(U"x");
    EXPECT_EQ(text("Payee"), Variant("Xbc"));
}

TEST_F(SessionTest, ClicksFocusFieldsAndPressTheSpinButtons) {
    // A click in a field gives it focus and puts the caret under the mouse.
    session->handle(Input::click_at(kDateRow, 22));
    ASSERT_EQ(focused(), "VoucherDate");
    EXPECT_TRUE(session->status().empty()) << session->status();
    EXPECT_EQ(form.find("VoucherDate")->dispatch().get("SelStart"), Variant(int32_t{3}));
    session->handle(Input::click_at(kPayModeRow, 20));
    ASSERT_EQ(focused(), "PayMode");
    EXPECT_TRUE(session->status().empty()) << session->status();
    session->handle(Input::click_at(kAmountRow, 20));
    ASSERT_EQ(focused(), "Amount");
    EXPECT_TRUE(logged("event Amount.Click"));
    type(U"500");
    click_on(kAmountRow, U'▲');
    EXPECT_EQ(text("Amount"), Variant(600.0));
    click_on(kAmountRow, U'▼');
    click_on(kAmountRow, U'▼');
    EXPECT_EQ(text("Amount"), Variant(400.0));
    key(kVkUp, kAltMask);
    EXPECT_EQ(text("Amount"), Variant(500.0));
    click_on(kPayModeRow, U'▼');
    EXPECT_EQ(focused(), "PayMode");
    EXPECT_TRUE(session->list_open());
    session->handle(Input::click_at(kPayModeRow + 5, 21));  // the fourth entry, under the frame
    EXPECT_EQ(text("PayMode"), Variant("UPI"));
}

TEST_F(SessionTest, EventsPaneAndLeaving) {
    key(kF2);
    type(U"a");
    EXPECT_TRUE(session->events_shown());
    Canvas c = screen();
    bool pane = false, event = false;
    for (int r = 0; r < c.rows(); ++r) {
        pane = pane || c.row_text(r).find("Events (F2 hides)") != std::string::npos;
        event = event || c.row_text(r).find("event Payee.KeyPress KeyAscii=97") != std::string::npos;
    }
    EXPECT_TRUE(pane);
    EXPECT_TRUE(event);
    key(kF2);
    EXPECT_FALSE(session->events_shown());
    // Something typed: leaving asks once, and anything but y keeps the form.
    EXPECT_TRUE(session->changed());
    EXPECT_EQ(key(kVkEscape), TerminalSession::Outcome::going_on);
    EXPECT_EQ(session->status(), "Discard changes? y/n");
    type(U"n");
    EXPECT_EQ(text("Payee"), Variant("A"));
    EXPECT_EQ(key('Q', kCtrlMask), TerminalSession::Outcome::going_on);
    EXPECT_EQ(session->handle(Input::char_of(U'y')), TerminalSession::Outcome::quit);
}

TEST_F(SessionTest, CtrlSAndF10SaveTheRecord) {
    // Without a record file Ctrl+S says how to get one; F10 only finishes.
    type(U"anil");
    EXPECT_EQ(key('S', kCtrlMask), TerminalSession::Outcome::going_on);
    EXPECT_TRUE(session->status().starts_with("No record file"));

    std::vector<std::string> writes;
    bool fail = true;
    session->set_record_file("rec.json", [&](const std::string& path, const std::string& json) {
        if (fail) throw std::runtime_error(path + ": Permission denied");
        writes.push_back(json);
    });
    // A failed save says why and keeps the form open; nothing counts as saved.
    EXPECT_EQ(key(kF10), TerminalSession::Outcome::going_on);
    EXPECT_EQ(session->status(), "Not saved: rec.json: Permission denied");
    fail = false;
    tab(2);
    type(U"2500");
    // Ctrl+S completes the field (grouped and padded), saves, and comes back to it.
    EXPECT_EQ(key('S', kCtrlMask), TerminalSession::Outcome::going_on);
    EXPECT_EQ(session->status(), "Saved to rec.json");
    EXPECT_EQ(focused(), "Amount");
    ASSERT_EQ(writes.size(), 1u);
    EXPECT_NE(writes[0].find("\"Payee\": \"Anil\""), std::string::npos) << writes[0];
    EXPECT_NE(writes[0].find("\"Amount\": 2500,"), std::string::npos) << writes[0];
    EXPECT_NE(writes[0].find("\"Period\": null"), std::string::npos) << writes[0];
    EXPECT_FALSE(session->changed());
    EXPECT_EQ(key(kVkEscape), TerminalSession::Outcome::quit);  // nothing to lose

    // A date whose check fails is not saved; the status line says why.
    tab(1);
    type(U"31/02/2026");
    session->set_record_file("rec.json", [&](const std::string&, const std::string& json) { writes.push_back(json); });
    form.find("VoucherDate")->dispatch().set("TriggerError", Variant(true));
    EXPECT_EQ(key('S', kCtrlMask), TerminalSession::Outcome::going_on);
    EXPECT_TRUE(session->status().ends_with("not saved")) << session->status();
    EXPECT_EQ(writes.size(), 1u);
    EXPECT_EQ(focused(), "VoucherDate");
}

TEST_F(SessionTest, EnterMovesOnAfterTheControlHadIt) {
    type(U"anil");
    key(kVkEnter);
    EXPECT_EQ(focused(), "PAN");
    EXPECT_TRUE(logged("event Payee.KeyPress KeyAscii=13"));
    tab(5);
    ASSERT_EQ(focused(), "Period");
    type(U"0626");
    key(kVkEnter);
    EXPECT_EQ(focused(), "Payee");  // from the last field round to the first
}

TEST_F(SessionTest, TinyAndHugeScreensDrawWithoutHarm) {
    for (auto [rows, cols] : {std::pair{1, 1}, {3, 10}, {24, 20}, {200, 300}}) {
        Canvas c(rows, cols);
        session->render(c);
        session->handle(Input::click_at(rows - 1, cols - 1));
        session->handle(Input::click_at(-5, 1000));
    }
    key(kF4);  // nothing drops down from the payee box
    EXPECT_FALSE(session->calendar_open());
    EXPECT_FALSE(session->list_open());
}

TEST(SessionForms, LockedFieldsAreGreyAndTakeNoFocusOrClicks) {
    Catalogue catalogue;
    const SavedForm saved = parse_form(
        "form \"F\"\n"
        "control KelAlphaNumeric A\n label \"First\"\n at 2 10\n size 1210 300\nend\n"
        "control KelAlphaNumeric B\n label \"Locked\"\n at 4 10\n size 1210 300\n store Locked true\n"
        " store Text \"kept\"\nend\n",
        "f.kform", catalogue.classes());
    mini::Form form;
    open_form(form, saved, catalogue.classes(), "f.kform", make_date(2026, 1, 1).value());
    TerminalSession session(form, saved, make_date(2026, 1, 1).value());
    Canvas c(24, 80);
    session.render(c);
    EXPECT_EQ(c.row_text(4), "  Locked kept");
    EXPECT_TRUE(c.at(4, 9).style.dim);
    EXPECT_EQ(c.at(4, 9).style.fg, kGreyText);
    EXPECT_FALSE(c.at(2, 9).style.dim);
    session.handle(Input::click_at(4, 10));
    session.handle(Input::key_of(kVkTab));
    EXPECT_EQ(form.focused()->name(), "A");
    session.handle(Input::char_of(U'z'));
    EXPECT_EQ(form.find("B")->dispatch().get("Text"), Variant("kept"));
}

TEST(SessionForms, AnEmptyFormStillRunsAndFinishes) {
    Catalogue catalogue;
    const SavedForm saved = parse_form("form \"Nothing\"\n", "e.kform", catalogue.classes());
    mini::Form form;
    TerminalSession session(form, saved, make_date(2026, 1, 1).value());
    for (int16_t k : {int16_t{kVkTab}, int16_t{kVkDown}, kF4, int16_t{kVkInsert}})
        EXPECT_EQ(session.handle(Input::key_of(k)), TerminalSession::Outcome::going_on);
    session.handle(Input::char_of(U'x'));
    session.handle(Input::click_at(3, 3));
    Canvas c(24, 80);
    session.render(c);
    EXPECT_TRUE(c.row_text(0).starts_with(" Nothing "));
    EXPECT_TRUE(c.row_text(0).ends_with(" kelform"));
    EXPECT_EQ(session.handle(Input::key_of(kF10)), TerminalSession::Outcome::finished);
    EXPECT_EQ(session.values_json(), "{}");
}

}  // namespace
}  // namespace kel::kelform
