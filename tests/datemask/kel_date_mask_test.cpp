#include "keltext/datemask/kel_date_mask.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "keltext/datemask/class_info.h"
#include "keltext/host/date.h"
#include "keltext/host/errors.h"
#include "keltext/minihost/form.h"
#include "keltext/minihost/keyboard.h"

namespace kel {
namespace {

// Records what the form hears and runs the test's own form code.
struct Recorder : mini::FormObserver {
    std::vector<std::string> log;
    std::function<void(std::string_view, std::span<EventArg>)> on_event;

    void event_raised(mini::HostedControl&, int, std::string_view event, std::span<EventArg> args) override {
        log.push_back("event " + std::string(event));
        if (on_event) on_event(event, args);
    }
    void keys_sent(mini::HostedControl&, std::string_view keys) override {
        log.push_back("sendkeys " + std::string(keys));
    }
    void property_changed(mini::HostedControl&, std::string_view p) override {
        log.push_back("changed " + std::string(p));
    }
    int count(std::string_view line) const {
        int n = 0;
        for (const auto& l : log) n += l == line;
        return n;
    }
};

class DateMaskTest : public ::testing::Test {
protected:
    DateMaskTest() : form(&rec), cls(kel_date_mask_class()) {}

    mini::HostedControl& add(const std::string& name = "d") { return form.create(cls, name); }
    KelDateMask& box(mini::HostedControl& h) { return static_cast<KelDateMask&>(h.control()); }
    std::string field(mini::HostedControl& h) { return h.part("MskDate")->peek("Text").str(); }
    Variant peek(mini::HostedControl& h, std::string_view part, std::string_view member) {
        return h.part(part)->peek(member);
    }
    void type(std::string_view text) {
        for (char c : text) form.keystroke(mini::keystroke_for_char(static_cast<uint8_t>(c)));
    }
    void key(std::string_view name) { form.keystroke(*mini::parse_key(name)); }

    Recorder rec;
    mini::Form form;
    ClassInfo cls;
};

TEST_F(DateMaskTest, NewBox) {
    auto& h = add();
    auto& d = box(h);
    EXPECT_EQ(peek(h, "surface", "Width"), Variant(1695.0f));
    EXPECT_EQ(peek(h, "surface", "Height"), Variant(300.0f));
    EXPECT_EQ(peek(h, "MskDate", "ForeColor"), Variant(int32_t{0xC00000}));
    EXPECT_EQ(peek(h, "MskDate", "BackColor"), Variant(int32_t{0xFFEFD0}));
    EXPECT_EQ(peek(h, "surface", "BackColor"), Variant(int32_t{0xFFEFD0}));
    EXPECT_EQ(peek(h, "MskDate", "Mask"), Variant("##/##/####"));
    EXPECT_EQ(field(h), "__/__/____");
    EXPECT_EQ(peek(h, "MskDate", "Width"), Variant(1360.0f));
    EXPECT_EQ(peek(h, "ImgButton", "Left"), Variant(1375.0f));
    EXPECT_EQ(peek(h, "ImgButton", "Visible"), Variant(true));
    EXPECT_TRUE(d.ZubDate());
    EXPECT_FALSE(d.TriggerError());
    EXPECT_FALSE(d.AllowBlankDate());
    EXPECT_TRUE(d.AllowLostFocus());
    EXPECT_EQ(d.CalendarPosition(), 2);
    EXPECT_FALSE(d.Validated());
    EXPECT_EQ(rec.count("changed DateStyle"), 0);  // nothing is announced at start-up
}

// ---- Typing ---------------------------------------------------------------------------------

TEST_F(DateMaskTest, SlashCompletesDayAndMonth) {
    auto& h = add();
    form.focus(&h);
    type("5/");
    EXPECT_EQ(field(h), "05/__/____");
    EXPECT_EQ(peek(h, "MskDate", "SelStart"), Variant(int32_t{3}));
    EXPECT_EQ(rec.count("sendkeys {HOME}{DEL}{DEL}"), 1);
    EXPECT_EQ(rec.count("sendkeys 05"), 1);
    type("3/");
    EXPECT_EQ(field(h), "05/03/____");
    EXPECT_EQ(rec.count("sendkeys {DEL}{DEL}"), 1);
    type("03");
    form.focus(nullptr);
    EXPECT_EQ(field(h), "05/03/2003");
    EXPECT_EQ(box(h).Text(), Variant("05/03/2003"));
}

TEST_F(DateMaskTest, SlashWithADayTooLargeClearsTheDay) {
    auto& h = add();
    form.focus(&h);
    type("45");
    form.select(h, 2, 0);  // the caret just behind the day
    type("/");
    EXPECT_EQ(field(h), "__/__/____");
    EXPECT_EQ(peek(h, "MskDate", "SelStart"), Variant(int32_t{0}));
}

TEST_F(DateMaskTest, SlashInTheYearGoesHomeAndInsertsNothing) {
    auto& h = add();
    form.focus(&h);
    type("120520/");
    EXPECT_EQ(field(h), "12/05/20__");
    EXPECT_EQ(peek(h, "MskDate", "SelStart"), Variant(int32_t{0}));
}

TEST_F(DateMaskTest, TypingOverwrites) {
    auto& h = add();
    form.focus(&h);
    type("12052003");
    form.select(h, 0, 0);
    type("3");
    EXPECT_EQ(field(h), "32/05/2003");
}

TEST_F(DateMaskTest, EnterIsDroppedAfterTheFormSawIt) {
    auto& h = add();
    std::vector<int> seen;
    rec.on_event = [&](std::string_view ev, std::span<EventArg> args) {
        if (ev == "KeyPress") seen.push_back(*args[0].value.get_if<int16_t>());
    };
    form.focus(&h);
    type("1");
    key("Enter");
    EXPECT_EQ(seen, (std::vector<int>{'1', 13}));
    EXPECT_EQ(field(h), "1_/__/____");
}

TEST_F(DateMaskTest, AKeyDroppedByTheFormStillSelectsOneCharacter) {
    auto& h = add();
    rec.on_event = [&](std::string_view ev, std::span<EventArg> args) {
        if (ev == "KeyPress") args[0].value = Variant(int16_t{0});
    };
    form.focus(&h);
    form.select(h, 1, 0);
    type("7");
    EXPECT_EQ(field(h), "__/__/____");
    EXPECT_EQ(peek(h, "MskDate", "SelLength"), Variant(int32_t{1}));
}

TEST_F(DateMaskTest, UpAndDownMoveFocusUnlessCtrlIsHeld) {
    auto& a = add("a");
    auto& b = add("b");
    form.focus(&a);
    key("Down");
    EXPECT_EQ(form.focused(), &b);
    key("Up");
    EXPECT_EQ(form.focused(), &a);
    rec.log.clear();
    key("Ctrl+Down");
    EXPECT_EQ(form.focused(), &a);
    EXPECT_TRUE(box(a).CtrlDown());
    EXPECT_EQ(rec.count("sendkeys {TAB}"), 0);
    // With Ctrl held "/" completes nothing and reaches the mask, which refuses it.
    form.key_press('/');
    EXPECT_EQ(field(a), "__/__/____");
    EXPECT_EQ(rec.count("sendkeys {HOME}{DEL}{DEL}"), 0);
}

TEST_F(DateMaskTest, MonthYearStyleUpperCasesLetters) {
    auto& h = add();
    box(h).DateStyle(mmyyA);
    EXPECT_EQ(peek(h, "MskDate", "Mask"), Variant("##/##?"));
    form.focus(&h);
    type("0503a");
    EXPECT_EQ(field(h), "05/03A");
    form.focus(nullptr);
    EXPECT_EQ(peek(h, "MskDate", "Mask"), Variant("##/##a"));
    EXPECT_EQ(box(h).Text(), Variant("05/03A"));
    EXPECT_TRUE(box(h).AllowLostFocus());
}

// ---- Exit validation ------------------------------------------------------------------------

struct ExitCase {
    const char* typed;  // digits typed into an empty field
    bool zub, trigger, blank;
    const char* min;
    const char* max;
    const char* field;  // afterwards
    bool date_error;
    bool allow_lost_focus;
};

TEST_F(DateMaskTest, ExitOutcomes) {
    const ExitCase cases[] = {
        // A real date: normalized (the short year widened), no report.
        {"05032003", false, false, false, nullptr, nullptr, "05/03/2003", false, true},
        {"120545", true, false, false, nullptr, nullptr, "12/05/1945", false, true},
        {"050303", false, false, false, nullptr, nullptr, "05/03/2003", false, true},
        // A short year is no date until it is widened: in no-correction mode it is reported.
        {"050303", false, true, false, nullptr, nullptr, "05/03/03__", true, false},
        // Day 29-31 in 28-day mode: capped, or reported and kept.
        {"30012003", true, false, false, nullptr, nullptr, "28/01/2003", false, true},
        {"30012003", true, true, false, nullptr, nullptr, "30/01/2003", true, false},
        // Out of range: the bound.
        {"01011999", false, false, false, "01/01/2000", nullptr, "01/01/2000", false, true},
        {"01011999", false, true, false, "01/01/2000", nullptr, "01/01/2000", false, true},
        {"15062005", false, false, false, nullptr, "31/12/2004", "31/12/2004", false, true},
        {"01011999", false, false, false, "01/01/2000", "31/12/1998", "31/12/1998", false, true},
        // The blank date.
        {"", false, false, true, nullptr, nullptr, "__/__/____", false, true},
        {"", false, true, true, nullptr, nullptr, "__/__/____", false, true},
        {"", false, true, false, nullptr, nullptr, "__/__/____", true, false},
        {"", false, false, false, nullptr, nullptr, "__/__/____", false, true},  // a blank year is no date
        // Not a date.
        {"31042003", false, true, false, nullptr, nullptr, "31/04/2003", true, false},
        {"31042003", false, true, true, nullptr, nullptr, "31/04/2003", true, false},
        {"30022003", true, true, false, nullptr, nullptr, "30/02/2003", true, false},
        {"31042003", false, false, false, nullptr, nullptr, "30/04/2003", false, true},
        {"29022003", false, false, false, nullptr, nullptr, "28/02/2003", false, true},
        {"45132003", false, false, false, nullptr, nullptr, "31/12/2003", false, true},
        {"31042003", true, false, false, nullptr, nullptr, "28/04/2003", false, true},
        {"29021900", false, false, false, nullptr, nullptr, "29/02/1900", false, true},
        {"00052003", false, false, false, nullptr, nullptr, "01/01/2003", false, true},
        {"45132003", false, false, false, nullptr, "30/06/2003", "30/06/2003", false, true},
        {"5", false, false, false, nullptr, nullptr, "5_/__/____", false, true},
    };
    for (const auto& c : cases) {
        mini::Form f;
        Recorder r;
        f.set_observer(&r);
        auto& h = f.create(cls, "d");
        auto& d = box(h);
        d.ZubDate(c.zub);
        d.TriggerError(c.trigger);
        d.AllowBlankDate(c.blank);
        if (c.min) d.MinDate(Variant(c.min));
        if (c.max) d.MaxDate(Variant(c.max));
        std::optional<bool> alf_in_handler;
        r.on_event = [&](std::string_view ev, std::span<EventArg>) {
            if (ev == "DateError") alf_in_handler = d.AllowLostFocus();
        };
        f.focus(&h);
        for (char ch : std::string_view(c.typed)) f.keystroke(mini::keystroke_for_char(static_cast<uint8_t>(ch)));
        f.focus(nullptr);
        const std::string what = std::string(c.typed) + " Z=" + std::to_string(c.zub) + " T=" +
                                 std::to_string(c.trigger) + " B=" + std::to_string(c.blank);
        EXPECT_EQ(h.part("MskDate")->peek("Text").str(), c.field) << what;
        EXPECT_EQ(r.count("event DateError"), c.date_error ? 1 : 0) << what;
        EXPECT_EQ(d.AllowLostFocus(), c.allow_lost_focus) << what;
        if (c.date_error) {
            EXPECT_EQ(alf_in_handler, std::optional<bool>(false)) << what;  // false before the event
        }
        EXPECT_EQ(h.part("MskDate")->peek("Mask"), Variant("##/##/####")) << what;
    }
}

TEST_F(DateMaskTest, MonthYearExit) {
    struct Case {
        const char* typed;
        bool trigger;
        bool date_error;
        bool allow_lost_focus;
    };
    const Case cases[] = {
        {"0503", false, false, true}, {"0503", true, false, true}, {"1303", false, false, false},
        {"1303", true, true, false},  {"050", true, true, false},   {"", true, true, false},
    };
    for (const auto& c : cases) {
        mini::Form f;
        Recorder r;
        f.set_observer(&r);
        auto& h = f.create(cls, "d");
        box(h).DateStyle(mmyyA);
        box(h).TriggerError(c.trigger);
        f.focus(&h);
        for (char ch : std::string_view(c.typed)) f.keystroke(mini::keystroke_for_char(static_cast<uint8_t>(ch)));
        const std::string before = h.part("MskDate")->peek("Text").str();
        f.focus(nullptr);
        EXPECT_EQ(h.part("MskDate")->peek("Text").str(), before) << c.typed;  // never corrected
        EXPECT_EQ(r.count("event DateError"), c.date_error ? 1 : 0) << c.typed;
        EXPECT_EQ(box(h).AllowLostFocus(), c.allow_lost_focus) << c.typed;
    }
}

TEST_F(DateMaskTest, MonthYearFailureStaysUntilFocusComesBack) {
    auto& h = add();
    auto& d = box(h);
    d.DateStyle(mmyyA);
    d.TriggerError(true);
    form.focus(&h);
    type("13");
    EXPECT_EQ(d.Text(), Variant("13/   "));
    EXPECT_EQ(rec.count("event DateError"), 1);
    // Corrected within the same visit, the text passes the check, but AllowLostFocus stays
    // false until focus enters again, so the next read reports once more.
    form.select(h, 0, 0);
    type("0503");
    EXPECT_EQ(d.Text(), Variant("05/03 "));
    EXPECT_EQ(rec.count("event DateError"), 2);
    form.focus(nullptr);
    form.focus(&h);
    EXPECT_TRUE(d.AllowLostFocus());
}

TEST_F(DateMaskTest, TabbingThroughChecksOnce) {
    auto& h = add();
    auto& d = box(h);
    d.TriggerError(true);
    form.focus(&h);
    form.focus(nullptr);
    EXPECT_EQ(rec.count("event DateError"), 1);  // field lost focus and ExitFocus: one check
    form.focus(&h);
    EXPECT_TRUE(d.AllowLostFocus());
    form.focus(nullptr);
    EXPECT_EQ(rec.count("event DateError"), 1);
    EXPECT_TRUE(d.AllowLostFocus());
    (void)d.Text();
    EXPECT_EQ(rec.count("event DateError"), 1);
}

// ---- Text -----------------------------------------------------------------------------------

TEST_F(DateMaskTest, FirstReadOfANewBlankBoxChecksIt) {
    auto& h = add();
    box(h).TriggerError(true);
    EXPECT_EQ(box(h).Text(), Variant());
    EXPECT_EQ(rec.count("event DateError"), 1);
    EXPECT_FALSE(box(h).AllowLostFocus());
    EXPECT_TRUE(box(h).Validated());

    auto& g = add("g");
    EXPECT_EQ(box(g).Text(), Variant());
    EXPECT_EQ(field(g), "__/__/____");
}

TEST_F(DateMaskTest, ReadingTextFromChangeChecksTheHalfTypedText) {
    auto& h = add();
    std::vector<Variant> read;
    rec.on_event = [&](std::string_view ev, std::span<EventArg>) {
        if (ev == "Change") read.push_back(box(h).Text());
    };
    form.focus(&h);
    type("5");
    ASSERT_EQ(read.size(), 1u);
    EXPECT_EQ(read[0], Variant());
    EXPECT_EQ(field(h), "5_/__/____");  // 05/01 with a blank year is no date: left as typed
    type("/03");
    EXPECT_EQ(read.back(), Variant());
    EXPECT_EQ(field(h), "05/03/____");
    // The first digit of the year is widened at once, as focus leaving would do.
    type("2");
    EXPECT_EQ(read.back(), Variant("05/03/2002"));
    EXPECT_EQ(field(h), "05/03/2002");
}

TEST_F(DateMaskTest, TextSetter) {
    auto& h = add();
    auto& d = box(h);
    struct Case {
        Variant value;
        const char* field;
    };
    const Case cases[] = {
        {Variant("31/01/2003"), "31/01/2003"},
        {Variant(*make_date(2004, 2, 29)), "29/02/2004"},
        {Variant(" 5/3/2003"), "05/03/2003"},
        {Variant("5/3/03"), "05/03/2003"},  // refused: the field keeps its text
        {Variant("2003-12-24"), "24/12/2003"},
        {Variant(""), "__/__/____"},
        {Variant("31/01/2003"), "31/01/2003"},
        {Variant("11/11/1111"), "__/__/____"},
        {Variant("31/01/2003"), "31/01/2003"},
        {Variant(), "__/__/____"},
    };
    for (const auto& c : cases) {
        d.Text(c.value);
        EXPECT_EQ(field(h), c.field);
        EXPECT_EQ(peek(h, "MskDate", "Mask"), Variant("##/##/####"));
    }
    EXPECT_EQ(rec.count("changed Text"), 10);
    EXPECT_EQ(rec.count("event DateError"), 0);

    d.Text(Variant("31/01/2003"));
    d.Text(Variant("31/04/2003"));
    d.Text(Variant(int16_t{5}));
    EXPECT_EQ(field(h), "31/01/2003");
    EXPECT_EQ(rec.count("event DateError"), 0);
    d.TriggerError(true);
    d.Text(Variant("not a date"));
    EXPECT_EQ(field(h), "31/01/2003");
    EXPECT_EQ(rec.count("event DateError"), 1);
    EXPECT_EQ(rec.count("changed Text"), 14);
}

TEST_F(DateMaskTest, MonthYearTextSetter) {
    auto& h = add();
    auto& d = box(h);
    d.DateStyle(mmyyA);
    d.Text(Variant("05/03A"));
    EXPECT_EQ(field(h), "05/03A");
    EXPECT_EQ(peek(h, "MskDate", "Mask"), Variant("##/##&"));
    d.Text(Variant("05/03"));
    EXPECT_EQ(field(h), "05/03 ");
    d.Text(Variant("12/99 x"));  // six or more characters are kept whole, the mask then keeps what fits
    EXPECT_EQ(field(h), "12/99 ");
    d.TriggerError(true);
    d.Text(Variant("xx"));
    EXPECT_EQ(rec.count("event DateError"), 0);
}

TEST_F(DateMaskTest, OtherStylesLeaveTheFieldAlone) {
    auto& h = add();
    auto& d = box(h);
    d.Text(Variant("31/01/2003"));
    d.DateStyle(7);
    EXPECT_EQ(peek(h, "MskDate", "Mask"), Variant("##/##/####"));
    d.Text(Variant("01/01/2000"));
    EXPECT_EQ(field(h), "31/01/2003");
    EXPECT_EQ(d.Text(), Variant());
}

// ---- Calendar button and layout -------------------------------------------------------------

TEST_F(DateMaskTest, CalendarButton) {
    auto& h = add();
    auto& d = box(h);
    d.ShowCalendar(false);
    EXPECT_EQ(peek(h, "surface", "Width"), Variant(1360.0f));
    EXPECT_EQ(peek(h, "MskDate", "Width"), Variant(1360.0f));
    d.ShowCalendar(true);
    EXPECT_EQ(peek(h, "surface", "Width"), Variant(1695.0f));
    EXPECT_EQ(peek(h, "MskDate", "Width"), Variant(1360.0f));
    EXPECT_EQ(peek(h, "ImgButton", "Left"), Variant(1375.0f));
    form.resize(h, 2000, 900);
    EXPECT_EQ(peek(h, "surface", "Height"), Variant(300.0f));
    EXPECT_EQ(peek(h, "MskDate", "Height"), Variant(300.0f));
    EXPECT_EQ(peek(h, "MskDate", "Width"), Variant(1665.0f));
    form.resize(h, 100, 300);  // narrower than the button: no negative field width
    EXPECT_EQ(peek(h, "MskDate", "Width"), Variant(0.0f));

    form.click(h, *h.part("ImgButton"));
    EXPECT_EQ(rec.count("event ButtonClick"), 1);
    d.Locked(true);
    form.click(h, *h.part("ImgButton"));
    d.Locked(false);
    // Disabled but unlocked last: the surface takes the click, the control raises nothing.
    d.Enabled(false);
    d.Locked(true);
    d.Locked(false);
    form.click(h, *h.part("ImgButton"));
    EXPECT_EQ(rec.count("event ButtonClick"), 1);

    d.CalendarPosition(7);
    EXPECT_EQ(d.CalendarPosition(), 7);
    try {
        d.CalendarPosition(300);
        FAIL() << "no overflow";
    } catch (const RuntimeError& e) {
        EXPECT_EQ(e.number(), kOverflow);
    }
    EXPECT_THROW(d.CalendarPosition(-1), RuntimeError);
    EXPECT_EQ(d.CalendarPosition(), 7);
    EXPECT_EQ(rec.count("changed CalendarPosition"), 1);
}

// ---- Properties -----------------------------------------------------------------------------

TEST_F(DateMaskTest, EnabledGreysAndLockedDecidesTheSurface) {
    auto& h = add();
    auto& d = box(h);
    d.Enabled(false);
    EXPECT_EQ(peek(h, "MskDate", "ForeColor"), Variant(kGreyText));
    EXPECT_EQ(peek(h, "surface", "Enabled"), Variant(false));
    d.Locked(true);
    d.Locked(false);
    EXPECT_EQ(peek(h, "surface", "Enabled"), Variant(true));
    EXPECT_EQ(peek(h, "MskDate", "ForeColor"), Variant(kGreyText));
    d.ForeColor(0x0000FF);
    d.Enabled(true);
    EXPECT_EQ(peek(h, "MskDate", "ForeColor"), Variant(int32_t{0x0000FF}));
}

TEST_F(DateMaskTest, ChangeOnlyWhileEnabledAndNotLocked) {
    auto& h = add();
    auto& d = box(h);
    d.Text(Variant("01/01/2003"));
    EXPECT_GE(rec.count("event Change"), 1);
    rec.log.clear();
    d.Locked(true);
    d.Text(Variant("02/01/2003"));
    d.Locked(false);
    d.Enabled(false);
    d.Text(Variant("03/01/2003"));
    EXPECT_EQ(rec.count("event Change"), 0);
}

TEST_F(DateMaskTest, RangeBoundsAreKeptOnlyWhenTheyAreDates) {
    auto& h = add();
    auto& d = box(h);
    d.MinDate(Variant("31/02/2003"));
    EXPECT_EQ(d.MinDate(), Variant());
    EXPECT_EQ(rec.count("changed MinDate"), 0);
    d.MinDate(Variant("01/01/2003"));
    EXPECT_EQ(d.MinDate(), Variant("01/01/2003"));
    EXPECT_EQ(rec.count("changed MinDate"), 1);
    d.MinDate(Variant());
    EXPECT_EQ(d.MinDate(), Variant("01/01/2003"));
    d.MaxDate(Variant(*make_date(2003, 12, 31)));
    EXPECT_EQ(d.MaxDate(), Variant(*make_date(2003, 12, 31)));
}

TEST_F(DateMaskTest, SelectionSettersIgnoreWhatTheyCannotUse) {
    auto& h = add();
    auto& d = box(h);
    d.Text(Variant("31/01/2003"));
    d.SelStart(Variant("4"));
    d.Sellength(Variant(int16_t{3}));
    EXPECT_EQ(d.SelStart(), Variant(int32_t{4}));
    EXPECT_EQ(d.Sellength(), Variant(int32_t{3}));
    EXPECT_EQ(d.SelText(), Variant("1/2"));
    d.SelStart(Variant("x"));
    d.SelStart(Variant(-2.0));
    d.Sellength(Variant(1e20));
    EXPECT_EQ(d.SelStart(), Variant(int32_t{4}));
    EXPECT_EQ(d.Sellength(), Variant(int32_t{3}));
    EXPECT_TRUE(rec.log.end() == std::find(rec.log.begin(), rec.log.end(), "changed SelStart"));
}

// ---- Persistence ----------------------------------------------------------------------------

TEST_F(DateMaskTest, SaveWritesOnlyWhatDiffersFromTheDefaults) {
    auto& h = add();
    auto saved = form.save(h);
    ASSERT_EQ(saved.size(), 1u);
    EXPECT_EQ(saved[0].first, "Font");

    auto& d = box(h);
    d.DateStyle(mmyyA);
    d.ForeColor(0xFF);
    d.BackColor(0xFFFFFF);
    d.ShowCalendar(false);
    d.Enabled(false);
    d.Locked(true);
    d.TriggerError(true);
    d.ZubDate(false);
    d.AllowBlankDate(true);
    d.CalendarPosition(3);
    saved = form.save(h);
    std::vector<std::string> keys;
    for (const auto& [k, v] : saved) keys.push_back(k);
    EXPECT_EQ(keys, (std::vector<std::string>{"DateStyle", "Forecolor", "Backcolor", "Font", "ShowCalendar", "Enabled",
                                              "Locked", "TriggerError", "ZubDate", "AllowBlankDate",
                                              "CalendarPosition"}));
    EXPECT_EQ(saved[0].second, Variant(int32_t{1}));
    EXPECT_EQ(saved[10].second, Variant(uint8_t{3}));

    // Loaded back under the keys the reader asks for ("Backcolor" as "BackColor", ...).
    auto& l = form.load(cls, "l", saved);
    auto& e = box(l);
    EXPECT_EQ(e.DateStyle(), mmyyA);
    EXPECT_EQ(e.ForeColor(), 0xFF);
    EXPECT_EQ(e.BackColor(), 0xFFFFFF);
    EXPECT_FALSE(e.ShowCalendar());
    EXPECT_FALSE(e.Enabled());
    EXPECT_TRUE(e.Locked());
    EXPECT_TRUE(e.TriggerError());
    EXPECT_FALSE(e.ZubDate());
    EXPECT_TRUE(e.AllowBlankDate());
    EXPECT_EQ(e.CalendarPosition(), 3);
    EXPECT_EQ(peek(l, "surface", "Width"), peek(l, "MskDate", "Width"));
}

TEST_F(DateMaskTest, LoadedDisabledButUnlockedBoxIsGreyYetTakesFocus) {
    auto& l = form.load(cls, "l", {{"Enabled", Variant(false)}, {"CalendarPosition", Variant("x")}});
    EXPECT_EQ(peek(l, "MskDate", "ForeColor"), Variant(kGreyText));
    EXPECT_EQ(peek(l, "surface", "Enabled"), Variant(true));
    EXPECT_EQ(box(l).CalendarPosition(), 2);  // a value that cannot be read keeps the default
    // The loaded width is the field's design width and the button's room.
    EXPECT_EQ(peek(l, "surface", "Width"), Variant(1695.0f));
    EXPECT_EQ(peek(l, "MskDate", "Width"), Variant(1360.0f));
}

TEST_F(DateMaskTest, ClassTable) {
    const auto* text = cls.find_property("text");
    ASSERT_NE(text, nullptr);
    EXPECT_EQ(text->flags & kDefaultMember, kDefaultMember);
    EXPECT_EQ(cls.find_property("ZubDate")->description, "True/False sets No. of days in a month to 28 ");
    EXPECT_TRUE(cls.find_property("AllowLostFocus")->read_only());
    EXPECT_EQ(cls.find_event("DateError")->number, 11);
    EXPECT_EQ(cls.find_event("ButtonClick")->number, 10);
    std::vector<std::string> names;
    for (const auto& p : cls.properties) names.push_back(p.name);
    EXPECT_EQ(names, (std::vector<std::string>{"ZubDate", "MaxDate", "MinDate", "TriggerError", "BackColor",
                                               "ForeColor", "Font", "Locked", "AllowBlankDate", "AllowLostFocus",
                                               "Text", "DateStyle", "Enabled", "ShowCalendar", "CalendarPosition",
                                               "hWnd", "SelStart", "Sellength", "SelText"}));
}

}  // namespace
}  // namespace kel
