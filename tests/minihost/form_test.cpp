#include "keltext/minihost/form.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"

namespace kel::mini {
namespace {

// A small control for these tests: an edit field and a button; it reports everything it is
// told as an event to the form, so that one log shows the order of things.
class Probe : public Control {
public:
    explicit Probe(Site& site)
        : site_(site), txt_(site.create_edit_box("txtProbe")), cmd_(site.create_push_button("cmdGo")) {
        WidgetEvents ev;
        ev.change = [this] { say("Change"); };
        ev.got_focus = [this] { say("GotFocus"); };
        ev.lost_focus = [this] { say("LostFocus"); };
        ev.key_down = [this](int16_t& k, int16_t& s) { key("KeyDown", k, s); };
        ev.key_up = [this](int16_t& k, int16_t& s) { key("KeyUp", k, s); };
        ev.key_press = [this](int16_t& k) {
            EventArg args[] = {{"KeyAscii", k}};
            site_.raise_event(5, "KeyPress", args);
            k = *args[0].value.get_if<int16_t>();
        };
        txt_.set_events(ev);
        WidgetEvents bev;
        bev.click = [this] { say("Click"); };
        cmd_.set_events(bev);
    }
    void Initialize() override { say("Initialize"); }
    void InitProperties() override { say("InitProperties"); }
    void ReadProperties(PropertyBag& bag) override {
        say("ReadProperties");
        txt_.Text(text_of(bag.read("Text", "")));
    }
    void WriteProperties(PropertyBag& bag) override {
        bag.write("Text", txt_.Text(), "");
        bag.write("Width", site_.surface().Width(), 1200.0f);
    }
    void Resize() override { say("Resize"); }
    void EnterFocus() override { say("EnterFocus"); }
    void ExitFocus() override { say("ExitFocus"); }

    Site& site() { return site_; }
    EditBox& txt() { return txt_; }

private:
    void say(const char* what) { site_.raise_event(0, what, {}); }
    void key(const char* what, int16_t& k, int16_t& s) {
        EventArg args[] = {{"KeyCode", k}, {"Shift", s}};
        site_.raise_event(4, what, args);
        k = *args[0].value.get_if<int16_t>();
        s = *args[1].value.get_if<int16_t>();
    }

    Site& site_;
    EditBox& txt_;
    PushButton& cmd_;
};

const ClassInfo& probe_class() {
    static const ClassInfo info = ClassBuilder<Probe>("Probe", "test control")
                                      .property("Text", "Variant", [](Probe& p) { return Variant(p.txt().Text()); },
                                                [](Probe& p, const Variant& v) { p.txt().Text(text_of(v)); }, "")
                                      .property("Ping", "Variant", [](Probe&) { return Variant(); },
                                                [](Probe& p, const Variant&) { p.site().raise_event(9, "Ping", {}); }, "")
                                      .build();
    return info;
}

// A page that copies the first selected control's Text into its edit box, and back.
class ProbePage : public PropertyPage {
public:
    explicit ProbePage(Site& site) : site_(site), txt_(site.create_edit_box("txtValue")) {
        WidgetEvents ev;
        ev.change = [this] { site_.page_services()->Changed(true); };
        txt_.set_events(ev);
    }
    void SelectionChanged() override { txt_.Text(text_of(site_.page_services()->selected_control(0).get("Text"))); }
    void ApplyChanges() override { site_.page_services()->selected_control(0).set("Text", txt_.Text()); }

private:
    Site& site_;
    EditBox& txt_;
};

const ClassInfo& page_class() {
    static const ClassInfo info = ClassBuilder<ProbePage>("ProbePage", "test page", true).build();
    return info;
}

struct Recorder : FormObserver {
    std::vector<std::string> log;
    std::function<void(HostedControl&, std::string_view, std::span<EventArg>)> hook;

    void event_raised(HostedControl& c, int, std::string_view event, std::span<EventArg> args) override {
        std::string line = c.name() + "." + std::string(event);
        for (auto& a : args) line += " " + std::string(a.name) + "=" + text_of(a.value);
        log.push_back(line);
        if (hook) hook(c, event, args);
    }
    void keys_sent(HostedControl& c, std::string_view keys) override {
        log.push_back("sendkeys " + c.name() + " " + std::string(keys));
    }
    void handler_error(std::string_view where, int n) override {
        log.push_back(std::string(where) + " -> error " + std::to_string(n));
    }
    void focus_refused(HostedControl& c) override { log.push_back("focus " + c.name() + " refused"); }
    std::vector<std::string> take() { return std::exchange(log, {}); }
};

using Lines = std::vector<std::string>;

Probe& probe(HostedControl& c) { return static_cast<Probe&>(c.control()); }

TEST(Form, CreateAndLoadRunTheLifecycleWithOneResize) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a", 900, 200);
    EXPECT_EQ(r.take(), (Lines{"a.Initialize", "a.InitProperties", "a.Resize"}));
    EXPECT_EQ(a.surface_part().peek("Width"), Variant(900.0f));
    HostedControl& b = f.load(probe_class(), "b", {{"TEXT", "hi"}});
    EXPECT_EQ(r.take(), (Lines{"b.Initialize", "b.ReadProperties", "b.Change", "b.Resize"}));
    EXPECT_EQ(b.part("TXTPROBE")->peek("Text"), Variant("hi"));
    EXPECT_EQ(b.surface_part().peek("Height"), Variant(300.0f));

    StoredValues saved = f.save(b);
    ASSERT_EQ(saved.size(), 1u);
    EXPECT_EQ(saved[0].first, "Text");

    // Every surface and widget has its own handle.
    std::vector<int32_t> handles;
    for (HostedControl* c : f.controls()) {
        handles.push_back(*c->surface_part().peek("hWnd").get_if<int32_t>());
        for (auto& [name, part] : c->parts()) handles.push_back(*part->peek("hWnd").get_if<int32_t>());
    }
    std::sort(handles.begin(), handles.end());
    EXPECT_EQ(std::adjacent_find(handles.begin(), handles.end()), handles.end());
    EXPECT_GT(handles.front(), 0);

    EXPECT_THROW(f.create(probe_class(), "A"), FormError);  // names are unique without regard to case
    EXPECT_THROW(f.create(probe_class(), "bad name"), FormError);
    EXPECT_THROW(f.create(probe_class(), "c", -1, 10), FormError);
}

TEST(Form, SurfaceResizesAtOnceAndOnlyOnChange) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    r.take();
    Surface& s = probe(a).site().surface();
    s.Width(1200);
    s.Height(400);
    s.Width(500);
    f.resize(a, 500, 400);
    f.resize(a, 600, 450);
    EXPECT_EQ(r.take(), (Lines{"a.Resize", "a.Resize", "a.Resize"}));
    EXPECT_THROW(s.BorderStyle(2), RuntimeError);
    s.BorderStyle(1);
    EXPECT_EQ(a.surface_part().peek("BorderStyle"), Variant(int16_t{1}));
    s.Refresh();
    s.Refresh();
    EXPECT_EQ(a.surface_part().peek("RefreshCount"), Variant(int32_t{2}));
    EXPECT_EQ(font_of(a.surface_part().peek("Font"))->name, "Fixedsys");
    EXPECT_THROW(f.resize(a, -5, 10), RuntimeError);
}

TEST(Form, ResizeThatKeepsResizingStops) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    int resizes = 0;
    r.hook = [&](HostedControl& c, std::string_view event, std::span<EventArg>) {
        if (event == "Resize") {
            ++resizes;
            Surface& s = probe(c).site().surface();
            s.Width(s.Width() + 1);
        }
    };
    f.resize(a, 100, 100);
    EXPECT_LE(resizes, 20);
    EXPECT_GT(resizes, 1);
    resizes = 0;
    f.resize(a, 50, 50);  // and the next resize runs normally again
    EXPECT_GT(resizes, 1);
}

TEST(Form, FocusOrderAndTabbing) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    HostedControl& b = f.create(probe_class(), "b");
    HostedControl& c = f.create(probe_class(), "c");
    r.take();

    EXPECT_EQ(f.focus(&a), Form::FocusResult::moved);
    EXPECT_EQ(r.take(), (Lines{"a.EnterFocus", "a.GotFocus"}));
    EXPECT_EQ(f.focus(&a), Form::FocusResult::unchanged);
    EXPECT_TRUE(r.take().empty());
    f.focus(&b);
    EXPECT_EQ(r.take(), (Lines{"a.LostFocus", "a.ExitFocus", "b.EnterFocus", "b.GotFocus"}));

    probe(c).site().surface().Enabled(false);
    EXPECT_EQ(f.focus(&c), Form::FocusResult::refused);
    EXPECT_EQ(r.take(), (Lines{"focus c refused"}));
    EXPECT_EQ(f.focused(), &b);

    struct Step {
        bool forward;
        HostedControl* expected;
    };
    const Step steps[] = {{true, &a}, {true, &b}, {false, &a}, {false, &b}};  // c is skipped both ways
    for (const auto& s : steps) {
        f.tab(s.forward);
        EXPECT_EQ(f.focused(), s.expected);
    }
    f.keystroke(*model::parse_key("Shift+Tab"));
    EXPECT_EQ(f.focused(), &a);
    r.take();
    f.focus(nullptr);
    EXPECT_EQ(r.take(), (Lines{"a.LostFocus", "a.ExitFocus"}));
    EXPECT_EQ(f.focused(), nullptr);
    EXPECT_THROW(f.keystroke(*model::parse_key("a")), FormError);
    f.tab(false);  // from nothing, backwards: the last control that can take focus
    EXPECT_EQ(f.focused(), &b);
}

TEST(Form, KeystrokeOrderAndHandlersChangingArguments) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    f.focus(&a);
    r.take();
    r.hook = [](HostedControl&, std::string_view event, std::span<EventArg> args) {
        // The form's code: drop x, turn y into the 32-bit Z (the control keeps its 16-bit kind),
        // and give a text that is no number for q (the control keeps its own value).
        if (event != "KeyPress") return;
        int16_t k = *args[0].value.get_if<int16_t>();
        if (k == 'x') args[0].value = int16_t{0};
        if (k == 'y') args[0].value = int32_t{'Z'};
        if (k == 'q') args[0].value = "not a number";
    };
    for (char ch : std::string("xyq")) f.keystroke(model::keystroke_for_char(static_cast<uint8_t>(ch)));
    EXPECT_EQ(probe(a).txt().Text(), "Zq");
    Lines log = r.take();
    EXPECT_EQ(log[0], "a.KeyDown KeyCode=88 Shift=0");
    EXPECT_EQ(log[1], "a.KeyPress KeyAscii=120");
    EXPECT_EQ(log[2], "a.KeyUp KeyCode=88 Shift=0");
    EXPECT_EQ(log[5], "a.Change");
    EXPECT_EQ(log[6], "a.KeyUp KeyCode=89 Shift=0");

    // A disabled surface or widget takes no keystrokes.
    probe(a).txt().Enabled(false);
    f.keystroke(model::keystroke_for_char('k'));
    probe(a).txt().Enabled(true);
    probe(a).site().surface().Enabled(false);
    f.keystroke(model::keystroke_for_char('k'));
    EXPECT_TRUE(r.take().empty());
    EXPECT_EQ(probe(a).txt().Text(), "Zq");
}

TEST(Form, SentKeysComeAfterTheCallInOrder) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    HostedControl& b = f.create(probe_class(), "b");
    f.focus(&a);
    r.take();
    r.hook = [&](HostedControl& c, std::string_view event, std::span<EventArg> args) {
        if (event == "KeyPress" && *args[0].value.get_if<int16_t>() == '/') {
            args[0].value = int16_t{0};
            probe(c).site().keyboard().send_keys("{HOME}1{TAB}2");
        }
    };
    probe(a).txt().Text("ab");
    f.keystroke(model::keystroke_for_char('/'));
    EXPECT_EQ(probe(a).txt().Text(), "1ab");
    EXPECT_EQ(probe(b).txt().Text(), "2");
    EXPECT_EQ(f.focused(), &b);

    // Keys queued while nothing has focus are dropped.
    f.focus(nullptr);
    probe(a).site().keyboard().send_keys("zz");
    f.run_pending();
    EXPECT_EQ(probe(a).txt().Text(), "1ab");

    // An unknown token is the control's error 5.
    try {
        probe(a).site().keyboard().send_keys("{FOO}");
        ADD_FAILURE() << "no error";
    } catch (const RuntimeError& e) {
        EXPECT_EQ(e.number(), 5);
    }
}

TEST(Form, EndlessSentKeysAreStopped) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    f.focus(&a);
    r.hook = [&](HostedControl& c, std::string_view event, std::span<EventArg>) {
        if (event == "KeyUp") probe(c).site().keyboard().send_keys("{END}");
    };
    f.keystroke(*model::parse_key("Home"));
    Lines log = r.take();
    ASSERT_FALSE(log.empty());
    EXPECT_EQ(log.back(), "a.surface.SendKeys -> error 28");
    r.hook = nullptr;
    f.keystroke(model::keystroke_for_char('k'));  // the form still works
    EXPECT_EQ(probe(a).txt().Text(), "k");
}

// Handlers that notify each other without end: the chain is cut and unwinds whole, reported
// once where it was cut, however many handlers each level runs (two a level used to double the
// work with every level), and the form goes on.
TEST(Form, HandlersThatNotifyEachOtherWithoutEndUnwindOnce) {
    struct Case {
        const char* event;  // what the hook answers, and what it sets off again
        int handlers;       // how many times a level sets it off
        const char* where;
    };
    for (const Case& k : {Case{"Change", 1, "a.txtProbe.Change"}, Case{"Change", 2, "a.txtProbe.Change"},
                          Case{"Ping", 1, "a.surface.Ping"}, Case{"Ping", 3, "a.surface.Ping"}}) {
        SCOPED_TRACE(std::string(k.event) + " x" + std::to_string(k.handlers));
        Recorder r;
        Form f(&r);
        HostedControl& a = f.create(probe_class(), "a");
        r.hook = [&](HostedControl& c, std::string_view event, std::span<EventArg>) {
            if (event != k.event) return;
            for (int i = 0; i < k.handlers; ++i) {
                if (event == "Change")
                    probe(c).txt().Text(probe(c).txt().Text() + "x");
                else
                    c.dispatch().set("Ping", Variant());
            }
        };
        r.take();
        if (std::string_view(k.event) == "Change")
            a.part("txtProbe")->poke("Text", "go");
        else
            a.dispatch().set("Ping", Variant());
        Lines log = r.take();
        ASSERT_FALSE(log.empty());
        EXPECT_EQ(log.back(), std::string(k.where) + " -> error 28");
        EXPECT_EQ(std::count_if(log.begin(), log.end(), [](const std::string& l) { return l.ends_with("error 28"); }), 1);
        EXPECT_LT(log.size(), 200u);  // one event a level, not one per path through the levels
        r.hook = nullptr;
        f.focus(&a);
        std::size_t length = probe(a).txt().Text().size();
        f.keystroke(model::keystroke_for_char('k'));  // the form still works
        EXPECT_EQ(probe(a).txt().Text().size(), length + 1);
    }
}

TEST(Form, HandlerErrorsAreReportedWhereTheyHappen) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    HostedControl& b = f.create(probe_class(), "b");
    f.focus(&a);
    r.hook = [](HostedControl&, std::string_view event, std::span<EventArg>) {
        if (event == "Click" || event == "ExitFocus" || event == "KeyPress") raise_error(kTypeMismatch);
    };
    r.take();
    f.click(a, *a.part("cmdGo"));
    f.focus(&b);
    f.keystroke(model::keystroke_for_char('k'));
    Lines log = r.take();
    auto has = [&](const std::string& s) { return std::find(log.begin(), log.end(), s) != log.end(); };
    EXPECT_TRUE(has("a.cmdGo.Click -> error 13"));
    EXPECT_TRUE(has("a.surface.ExitFocus -> error 13"));
    EXPECT_TRUE(has("b.txtProbe.KeyPress -> error 13"));
    EXPECT_EQ(f.focused(), &b);
    EXPECT_EQ(probe(b).txt().Text(), "k");  // the widget goes on with the key as it stood

    EXPECT_THROW(f.notify(a, *a.part("cmdGo"), "DropDown"), FormError);
    EXPECT_THROW(f.notify(a, *a.part("txtProbe"), "KeyDown"), FormError);
    EXPECT_THROW(f.click(a, a.surface_part()), FormError);
    EXPECT_THROW(f.click(b, *a.part("cmdGo")), FormError);  // a part of another control
}

TEST(Form, ClicksAreNotDeliveredToADisabledSurfaceOrWidget) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    Part& cmd = *a.part("cmdGo");
    r.take();
    cmd.poke("Enabled", false);
    f.click(a, cmd);
    cmd.poke("Enabled", true);
    probe(a).site().surface().Enabled(false);
    f.click(a, cmd);
    EXPECT_TRUE(r.take().empty());
    probe(a).site().surface().Enabled(true);
    f.click(a, cmd);
    f.dbl_click(a, *a.part("txtProbe"));  // the probe does not listen: nothing is raised
    EXPECT_EQ(r.take(), (Lines{"a.Click"}));
}

TEST(Form, PagesEditTheSelectedControl) {
    Recorder r;
    Form f(&r);
    HostedControl& a = f.create(probe_class(), "a");
    probe(a).txt().Text("one");
    HostedControl& pg = f.open_page(page_class(), "pg", {&a});
    EXPECT_EQ(pg.part("txtValue")->peek("Text"), Variant("one"));
    EXPECT_EQ(pg.part("page")->peek("Changed"), Variant(true));
    EXPECT_FALSE(pg.can_take_focus());
    EXPECT_EQ(f.controls().size(), 1u);
    pg.part("txtValue")->poke("Text", "two");
    f.apply_page(pg);
    EXPECT_EQ(probe(a).txt().Text(), "two");
    EXPECT_EQ(pg.part("page")->peek("Changed"), Variant(false));
    EXPECT_EQ(f.focus(&pg), Form::FocusResult::refused);

    // A page with nothing selected reports its handler's error and stays usable.
    r.take();
    f.open_page(page_class(), "empty", {});
    EXPECT_EQ(r.take().back(), "empty.page.SelectionChanged -> error 381");
    EXPECT_THROW(f.create(page_class(), "p2"), FormError);
}

}  // namespace
}  // namespace kel::mini
