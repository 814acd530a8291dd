#include "keltext/datemask/kel_date_mask.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "keltext/datemask/class_info.h"
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/keyboard.h"
#include "tests/support/form_recorder.h"

namespace kel {
namespace {

using Recorder = testing_support::FormRecorder;

class DateMaskTest : public ::testing::Test {
protected:
    DateMaskTest() : form(&rec), cls(kel_date_mask_class()) {}

    mini::HostedControl& add(const std::string& name = "d") { return form.create(cls, name); }
    KelDateMask& box(mini::HostedControl& h) { return static_cast<KelDateMask&>(h.control()); }
    std::string field(mini::HostedControl& h) { return h.part("MskDate")->peek("Text").str(); }
    Variant peek(mini::HostedControl& h, std::string_view part, std::string_view member) {
        return h.part(part)->peek(member);
    }

    Recorder rec;
    mini::Form form;
    ClassInfo cls;
};

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
        {"050303", false, false, false, nullptr, nullptr, "05/03/2003", false, true},
        // A short year is no date until it is widened: in no-correction mode it is reported.
        {"050303", false, true, false, nullptr, nullptr, "05/03/03__", true, false},
        // Day 29-31 in 28-day mode: capped, or reported and kept.
        {"30012003", true, true, false, nullptr, nullptr, "30/01/2003", true, false},
        // Out of range: the bound.
        {"01011999", false, false, false, "01/01/2000", nullptr, "01/01/2000", false, true},
        {"01011999", false, false, false, "01/01/2000", "31/12/1998", "31/12/1998", false, true},
        // The blank date.
        {"", false, false, true, nullptr, nullptr, "__/__/____", false, true},
        {"", false, true, true, nullptr, nullptr, "__/__/____", false, true},
        {"", false, true, false, nullptr, nullptr, "__/__/____", true, false},
        {"", false, false, false, nullptr, nullptr, "__/__/____", false, true},  // a blank year is no date
        // Not a date.
        {"31042003", false, true, false, nullptr, nullptr, "31/04/2003", true, false},
        {"31042003", false, true, true, nullptr, nullptr, "31/04/2003", true, false},
        {"31042003", true, false, false, nullptr, nullptr, "28/04/2003", false, true},
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
        for (char ch : std::string_view(c.typed)) f.keystroke(model::keystroke_for_char(static_cast<uint8_t>(ch)));
        f.focus(nullptr);
        const std::string what = std::string(c.typed) + " Z=" + std::to_string(c.zub) + " T=" +
                                 std::to_string(c.trigger) + " B=" + std::to_string(c.blank);
        EXPECT_EQ(h.part("MskDate")->peek("Text").str(), c.field) << what;
        EXPECT_EQ(r.count("DateError"), c.date_error ? 1 : 0) << what;
        EXPECT_EQ(d.AllowLostFocus(), c.allow_lost_focus) << what;
        if (c.date_error) {
            EXPECT_EQ(alf_in_handler, std::optional<bool>(false)) << what;  // false before the event
        }
        EXPECT_EQ(h.part("MskDate")->peek("Mask"), Variant("##/##/####")) << what;
    }
}

// date_monthyear.kfs walks the month-year style through its exits, with and without
// TriggerError.

TEST_F(DateMaskTest, TabbingThroughChecksOnce) {
    auto& h = add();
    auto& d = box(h);
    d.TriggerError(true);
    form.focus(&h);
    form.focus(nullptr);
    EXPECT_EQ(rec.count("DateError"), 1);  // field lost focus and ExitFocus: one check
    form.focus(&h);
    EXPECT_TRUE(d.AllowLostFocus());
    form.focus(nullptr);
    EXPECT_EQ(rec.count("DateError"), 1);
    EXPECT_TRUE(d.AllowLostFocus());
    (void)d.Text();
    EXPECT_EQ(rec.count("DateError"), 1);
}

// ---- Text -----------------------------------------------------------------------------------

TEST_F(DateMaskTest, FirstReadOfANewBlankBoxChecksIt) {
    auto& h = add();
    box(h).TriggerError(true);
    EXPECT_EQ(box(h).Text(), Variant());
    EXPECT_EQ(rec.count("DateError"), 1);
    EXPECT_FALSE(box(h).AllowLostFocus());
    EXPECT_TRUE(box(h).Validated());

    auto& g = add("g");
    EXPECT_EQ(box(g).Text(), Variant());
    EXPECT_EQ(field(g), "__/__/____");
}

TEST_F(DateMaskTest, TextSetter) {
    auto& h = add();
    auto& d = box(h);
    struct Case {
        Variant value;
        const char* field;
    };
    const Case cases[] = {
        {Variant(" 5/3/2003"), "05/03/2003"},
        {Variant("5/3/03"), "05/03/2003"},  // refused: the field keeps its text
        {Variant("31/01/2003"), "31/01/2003"},
        {Variant(), "__/__/____"},
    };
    for (const auto& c : cases) {
        d.Text(c.value);
        EXPECT_EQ(field(h), c.field);
        EXPECT_EQ(peek(h, "MskDate", "Mask"), Variant("##/##/####"));
    }
    EXPECT_EQ(std::count(rec.changed.begin(), rec.changed.end(), "Text"), 4);
    EXPECT_EQ(rec.count("DateError"), 0);

    d.Text(Variant("31/01/2003"));
    d.Text(Variant("31/04/2003"));
    d.Text(Variant(int16_t{5}));
    EXPECT_EQ(field(h), "31/01/2003");
    EXPECT_EQ(rec.count("DateError"), 0);
    d.TriggerError(true);
    d.Text(Variant("not a date"));
    EXPECT_EQ(field(h), "31/01/2003");
    EXPECT_EQ(rec.count("DateError"), 1);
    EXPECT_EQ(std::count(rec.changed.begin(), rec.changed.end(), "Text"), 8);
}

// ---- Properties ------------------------------------------------------------------------------
// (Layout, colours, selection and persistence are exercised by the form scripts date_*.kfs.)

TEST_F(DateMaskTest, ChangeOnlyWhileEnabledAndNotLocked) {
    auto& h = add();
    auto& d = box(h);
    d.Text(Variant("01/01/2003"));
    EXPECT_GE(rec.count("Change"), 1);
    rec.events.clear();
    d.Locked(true);
    d.Text(Variant("02/01/2003"));
    d.Locked(false);
    d.Enabled(false);
    d.Text(Variant("03/01/2003"));
    EXPECT_EQ(rec.count("Change"), 0);
}

}  // namespace
}  // namespace kel
