// The Qt host through real Qt events on the offscreen platform: typing into each control,
// focus moves Qt makes that are not the person's, a handler that moves focus while the
// control left checks its text, bursts of keys, input methods and characters the controls'
// set lacks. Where the minimal host gives the answer, the Qt host must give the same.
#include <QApplication>
#include <QClipboard>
#include <QComboBox>
#include <QInputMethodEvent>
#include <QLineEdit>
#include <QListWidget>
#include <QMenu>
#include <QMimeData>
#include <QDropEvent>
#include <QTest>
#include <QTimer>
#include <algorithm>
#include <cmath>

#include "keltext/host/charset.h"
#include "keltext/host/conversions.h"
#include "keltext/host/keys.h"
#include "keltext/minihost/form.h"
#include "keltext/qt/form_window.h"
#include "keltext/qt/kel_controls.h"
#include "keltext/qt/qt_keys.h"
#include "keltext/qt/services.h"

using namespace kel;
using namespace kel::qt;

namespace {

// Records what the controls raise, as a form driver would.
struct Recorder : model::FormObserver {
    std::vector<std::string> lines;
    void event_raised(model::HostedControl& c, int, std::string_view event, std::span<EventArg>) override {
        lines.push_back(c.name() + "." + std::string(event));
    }
    long count(const std::string& line) const { return std::count(lines.begin(), lines.end(), line); }
};

std::string peek_text(model::HostedControl& c) { return c.keyboard_part()->peek("Text").str(); }

// What the view shows, in the controls' character set.
std::string shown(QtSite& s) { return s.shown_text(*s.keyboard_part()).value_or("?"); }

// A form with the same controls on both hosts.
struct Both {
    FormWindow qt;
    mini::Form mini;
    QtSite* q = nullptr;
    model::HostedControl* m = nullptr;

    void add(const char* cls_name, const char* name, std::initializer_list<std::pair<const char*, Variant>> sets = {}) {
        const ClassInfo& cls = *qt.services().catalogue().find(cls_name);
        QtSite& qs = qt.create(cls, name);
        model::HostedControl& ms = mini.create(cls, name);
        for (const auto& [prop, value] : sets) {
            qs.dispatch().set(prop, value);
            ms.dispatch().set(prop, value);
        }
        qt.sync();
        if (!q) {
            q = &qs;
            m = &ms;
        }
    }
};

}  // namespace

class QtHostTest : public QObject {
    Q_OBJECT

private slots:
    void keys_from_qt_events_data();
    void keys_from_qt_events();
    void typing_through_key_events_data();
    void typing_through_key_events();
    void popup_and_activation_do_not_leave_the_control();
    void handler_moves_focus_during_exit_data();
    void handler_moves_focus_during_exit();
    void burst_of_keys_keeps_send_keys_in_order();
    void input_method_and_foreign_characters();
    void clipboard_keys_and_shift_insert();
    void combo_list_never_rewrites_the_edit_text();
    void disabled_surface_takes_no_focus_and_is_not_greyed();
    void sizes_are_twips_and_pixels_follow();
    void tab_release_and_lone_modifiers_are_not_delivered();
    void drop_undo_and_middle_click_never_bypass_the_model();
    void combo_list_opens_and_a_pick_is_the_models();
};

void QtHostTest::keys_from_qt_events_data() {
    QTest::addColumn<int>("key");
    QTest::addColumn<int>("modifiers");
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("kind");  // 0 keystroke, 1 modifier, 2 refused
    QTest::addColumn<int>("key_code");
    QTest::addColumn<int>("shift");
    QTest::addColumn<int>("char_code");  // -1: no key press
    QTest::newRow("digit") << int(Qt::Key_5) << 0 << "5" << 0 << 53 << 0 << 53;
    QTest::newRow("letter") << int(Qt::Key_A) << 0 << "a" << 0 << 65 << 0 << 97;
    QTest::newRow("shifted letter") << int(Qt::Key_A) << int(Qt::ShiftModifier) << "A" << 0 << 65 << 1 << 65;
    QTest::newRow("shifted symbol") << int(Qt::Key_Exclam) << int(Qt::ShiftModifier) << "!" << 0 << 49 << 1 << 33;
    QTest::newRow("slash") << int(Qt::Key_Slash) << 0 << "/" << 0 << 191 << 0 << 47;
    QTest::newRow("point") << int(Qt::Key_Period) << 0 << "." << 0 << 190 << 0 << 46;
    QTest::newRow("backspace") << int(Qt::Key_Backspace) << 0 << "\b" << 0 << 8 << 0 << 8;
    QTest::newRow("enter") << int(Qt::Key_Return) << 0 << "\r" << 0 << 13 << 0 << 13;
    QTest::newRow("delete") << int(Qt::Key_Delete) << 0 << "" << 0 << 46 << 0 << -1;
    QTest::newRow("ctrl letter") << int(Qt::Key_C) << int(Qt::ControlModifier) << "c" << 0 << 67 << 2 << 3;
    QTest::newRow("ctrl insert") << int(Qt::Key_Insert) << int(Qt::ControlModifier) << "" << 0 << 45 << 2 << -1;
    QTest::newRow("alt letter") << int(Qt::Key_F) << int(Qt::AltModifier) << "f" << 0 << 70 << 4 << -1;
    QTest::newRow("F4") << int(Qt::Key_F4) << 0 << "" << 0 << 115 << 0 << -1;
    QTest::newRow("keypad digit") << int(Qt::Key_7) << int(Qt::KeypadModifier) << "7" << 0 << 55 << 0 << 55;
    QTest::newRow("accented letter") << int(Qt::Key_Eacute) << 0 << QString::fromUtf8("\u00e9") << 0 << 0 << 0 << 0xE9;
    QTest::newRow("euro sign") << int(Qt::Key_unknown) << 0 << QString::fromUtf8("\u20ac") << 0 << 0 << 0 << 0x80;
    QTest::newRow("outside the set") << int(Qt::Key_unknown) << 0 << QString::fromUtf8("\u0100") << 2 << 0 << 0 << -1;
    QTest::newRow("shift alone") << int(Qt::Key_Shift) << int(Qt::ShiftModifier) << "" << 1 << 0 << 0 << -1;
    QTest::newRow("ctrl alone") << int(Qt::Key_Control) << int(Qt::ControlModifier) << "" << 1 << 0 << 0 << -1;
}

void QtHostTest::keys_from_qt_events() {
    QFETCH(int, key);
    QFETCH(int, modifiers);
    QFETCH(QString, text);
    QFETCH(int, kind);
    QFETCH(int, key_code);
    QFETCH(int, shift);
    QFETCH(int, char_code);
    const QtKeystroke k = keystroke_from_qt(key, Qt::KeyboardModifiers(modifiers), text);
    QCOMPARE(int(k.kind), kind);
    if (kind != 0) return;
    QCOMPARE(int(k.key.key_code), key_code);
    QCOMPARE(int(k.key.shift), shift);
    QCOMPARE(k.key.char_code ? int(*k.key.char_code) : -1, char_code);
}

void QtHostTest::typing_through_key_events_data() {
    QTest::addColumn<QString>("cls");
    QTest::addColumn<QString>("typed");
    QTest::newRow("alphanumeric") << "KelAlphaNumeric" << "ram KUMAR, 12";
    QTest::newRow("numeric") << "KelNumeric" << "1234567.891";
    QTest::newRow("numeric clears with slash") << "KelNumeric" << "12/34.5";
    QTest::newRow("date") << "KelDateMask" << "5/3/03";
    QTest::newRow("combo") << "KelCombo" << "ch";
}

void QtHostTest::typing_through_key_events() {
    QFETCH(QString, cls);
    QFETCH(QString, typed);
    Both f;
    Recorder qt_events, mini_events;
    f.qt.set_observer(&qt_events);
    f.mini.set_observer(&mini_events);
    if (cls == "KelCombo")
        f.add("KelCombo", "c", {{"FillList", Variant(std::string("Cash\xC9" "1\xC8" "Cheque\xC9" "2\xC8"))}});
    else
        f.add(cls.toLatin1().constData(), "c", {});
    f.add("KelNumeric", "next");
    f.qt.focus(f.q);
    f.mini.focus(f.m);
    QTest::keyClicks(f.q->focus_view(), typed);
    f.mini.type(typed.toStdString());
    QCOMPARE(peek_text(*f.q), peek_text(*f.m));
    QCOMPARE(shown(*f.q), peek_text(*f.q));
    QCOMPARE(f.q->keyboard_part()->peek("SelStart"), f.m->keyboard_part()->peek("SelStart"));
    // Leaving through Tab runs the exit formatting on both hosts alike.
    QTest::keyClick(f.q->focus_view(), Qt::Key_Tab);
    f.mini.tab(true);
    QCOMPARE(f.qt.focused()->name(), std::string("next"));
    QCOMPARE(peek_text(*f.q), peek_text(*f.m));
    QCOMPARE(shown(*f.q), peek_text(*f.q));
    QCOMPARE(qt_events.lines, mini_events.lines);
    f.qt.set_observer(nullptr);
}

void QtHostTest::popup_and_activation_do_not_leave_the_control() {
    FormWindow form;
    const ClassInfo& cls = *form.services().catalogue().find("KelNumeric");
    QtSite& n = form.create(cls, "n");
    form.create(cls, "next");
    n.dispatch().set("MaxLength", int16_t{12});
    n.dispatch().set("NoOfDecimals", int16_t{2});
    n.dispatch().set("TxtFormat", true);
    form.focus(&n);
    QTest::keyClicks(n.focus_view(), "1234567.5");
    const std::string typed = peek_text(n);

    // A context menu takes Qt's focus with PopupFocusReason and gives it back.
    QMenu menu;
    menu.addAction("nothing");
    menu.popup(QPoint(0, 0));
    QVERIFY(QTest::qWaitForWindowExposed(&menu));
    menu.close();
    QApplication::processEvents();
    QCOMPARE(peek_text(n), typed);
    QCOMPARE(form.focused(), &n);

    // Another window becomes active and then this one again.
    QWidget other;
    other.show();
    QApplication::setActiveWindow(&other);
    QApplication::processEvents();
    QCOMPARE(peek_text(n), typed);
    QApplication::setActiveWindow(&form.window());
    QApplication::processEvents();
    QCOMPARE(peek_text(n), typed);
    QCOMPARE(form.focused(), &n);

    // The person's own move out formats.
    form.focus(nullptr);
    QCOMPARE(peek_text(n), std::string("12,34,567.50"));
}

void QtHostTest::handler_moves_focus_during_exit_data() {
    QTest::addColumn<QString>("moved_to");
    QTest::newRow("another control") << "other";
    QTest::newRow("back into the date box") << "d";
}

void QtHostTest::handler_moves_focus_during_exit() {
    QFETCH(QString, moved_to);
    FormWindow form;
    QWidget& w = form.window();
    const ClassInfo& date = *form.services().catalogue().find("KelDateMask");
    const ClassInfo& num = *form.services().catalogue().find("KelNumeric");
    QtSite& d = form.create(date, "d");
    QtSite& next = form.create(num, "next");
    QtSite& other = form.create(num, "other");
    d.dispatch().set("ZubDate", false);
    d.dispatch().set("TriggerError", true);
    (void)w;
    int date_errors = 0;
    QtSite& target = moved_to == "d" ? d : other;
    auto* box = qobject_cast<KelDateMask*>(&d.container());
    QVERIFY(box);
    connect(box, &KelDateMask::dateError, box, [&] {
        ++date_errors;
        target.container().setFocus(Qt::OtherFocusReason);
    });
    int next_entered = 0;
    auto* next_box = qobject_cast<KelNumeric*>(&next.container());
    connect(next_box, &KelNumeric::change, next_box, [&] { ++next_entered; });
    form.focus(&d);
    QTest::keyClicks(d.focus_view(), "31042003");
    QTest::keyClick(d.focus_view(), Qt::Key_Tab);
    QCOMPARE(date_errors, 1);
    QCOMPARE(form.focused(), &target);
    QCOMPARE(QApplication::focusWidget(), target.focus_view());
    QCOMPARE(next_entered, 0);
    // The control focus went to takes the keys.
    QTest::keyClicks(target.focus_view(), "7");
    QVERIFY(peek_text(target).find('7') != std::string::npos);
}

void QtHostTest::burst_of_keys_keeps_send_keys_in_order() {
    // Key presses arrive before their releases and nothing runs in between: the keys each
    // one queues still go before the next key.
    Both f;
    f.add("KelDateMask", "d");
    f.add("KelNumeric", "next");
    f.qt.focus(f.q);
    f.mini.focus(f.m);
    const QString typed = "5/3/2003";
    QWidget* view = f.q->focus_view();
    for (const QChar c : typed) QTest::sendKeyEvent(QTest::Press, view, Qt::Key(QTest::asciiToKey(char(c.unicode()))), c, Qt::NoModifier);
    for (const QChar c : typed) QTest::sendKeyEvent(QTest::Release, view, Qt::Key(QTest::asciiToKey(char(c.unicode()))), c, Qt::NoModifier);
    f.mini.type(typed.toStdString());
    QCOMPARE(peek_text(*f.q), peek_text(*f.m));
    QCOMPARE(peek_text(*f.q), std::string("05/03/2003"));
    QCOMPARE(shown(*f.q), peek_text(*f.q));
}

void QtHostTest::input_method_and_foreign_characters() {
    Both f;
    Recorder events;
    f.add("KelAlphaNumeric", "a", {{"TextType", Variant(int32_t{5})}});
    f.qt.focus(f.q);
    f.mini.focus(f.m);
    // Composed text is typed character by character; the preedit shows nothing yet.
    QInputMethodEvent preedit(QString::fromUtf8("caf"), {});
    QApplication::sendEvent(f.q->focus_view(), &preedit);
    QCOMPARE(peek_text(*f.q), std::string());
    QInputMethodEvent commit;
    commit.setCommitString(QString::fromUtf8("Caf\u00e9 \u20ac\u0100!"));
    QApplication::sendEvent(f.q->focus_view(), &commit);
    f.mini.type(from_utf8("Caf\u00e9 \u20ac!"));
    QCOMPARE(peek_text(*f.q), peek_text(*f.m));
    QCOMPARE(peek_text(*f.q), std::string("Caf\xE9 \x80!"));
    QCOMPARE(shown(*f.q), peek_text(*f.q));
    // A key whose character the set lacks is refused whole: no KeyDown, no KeyPress.
    f.qt.set_observer(&events);
    QTest::sendKeyEvent(QTest::Press, f.q->focus_view(), Qt::Key_unknown, QString::fromUtf8("\u0101"), Qt::NoModifier);
    QTest::sendKeyEvent(QTest::Release, f.q->focus_view(), Qt::Key_unknown, QString::fromUtf8("\u0101"), Qt::NoModifier);
    QVERIFY(events.lines.empty());
    QCOMPARE(peek_text(*f.q), std::string("Caf\xE9 \x80!"));
    f.qt.set_observer(nullptr);
}

void QtHostTest::clipboard_keys_and_shift_insert() {
    FormWindow form;
    QtSite& a = form.create(*form.services().catalogue().find("KelAlphaNumeric"), "a");
    a.dispatch().set("TextType", int32_t{5});
    form.focus(&a);
    QTest::keyClicks(a.focus_view(), "abc");
    form.select(a, 0, 2);
    form.set_insert(false);
    QTest::keyClick(a.focus_view(), Qt::Key_C, Qt::ControlModifier);
    QCOMPARE(form.clipboard(), std::string("ab"));
    QCOMPARE(QApplication::clipboard()->text(), QString("ab"));
    QTest::keyClick(a.focus_view(), Qt::Key_End);
    QTest::keyClick(a.focus_view(), Qt::Key_Insert, Qt::ShiftModifier);
    QCOMPARE(peek_text(a), std::string("abcab"));
    QVERIFY(!form.insert_on());  // Shift+Insert pastes and leaves overwrite alone
    QTest::keyClick(a.focus_view(), Qt::Key_Insert);
    QVERIFY(form.insert_on());
    form.set_insert(false);
    QCOMPARE(shown(a), peek_text(a));
}

void QtHostTest::combo_list_never_rewrites_the_edit_text() {
    FormWindow form;
    QtSite& c = form.create(*form.services().catalogue().find("KelCombo"), "c");
    auto* combo = qobject_cast<QComboBox*>(c.focus_view());
    QVERIFY(combo);
    form.focus(&c);
    QTest::keyClicks(c.focus_view(), "xy");
    c.dispatch().call("AddItem", {Variant("Cash")});
    c.dispatch().call("AddItem", {Variant("Card")});
    form.sync();
    // QComboBox holds no items of its own: nothing in it can set the edit text.
    QCOMPARE(combo->count(), 0);
    QCOMPARE(shown(c), peek_text(c));
    c.dispatch().set("ListIndex", int16_t{1});
    form.sync();
    QCOMPARE(peek_text(c), std::string("Card"));
    QCOMPARE(shown(c), std::string("Card"));
}

void QtHostTest::disabled_surface_takes_no_focus_and_is_not_greyed() {
    FormWindow form;
    const ClassInfo& cls = *form.services().catalogue().find("KelNumeric");
    QtSite& first = form.create(cls, "first");
    QtSite& off = form.create(cls, "off");
    QtSite& last = form.create(cls, "last");
    off.surface_model().Enabled(false);
    form.sync();
    QCOMPARE(form.focus(&off), model::FormDriver::FocusResult::refused);
    form.focus(&first);
    QTest::keyClick(first.focus_view(), Qt::Key_Tab);
    QCOMPARE(form.focused(), &last);
    QVERIFY(off.focus_view()->isEnabled());
}

void QtHostTest::sizes_are_twips_and_pixels_follow() {
    FormWindow form;
    QtSite& c = form.create(*form.services().catalogue().find("KelCombo"), "c");
    QWidget& w = c.container();
    const double dpi = w.logicalDpiX();
    // The driver's size in twips stands as given; the widget shows it at the logical DPI.
    form.resize(c, 3001, 315);
    QCOMPARE(c.surface_model().Width(), 3001.0f);
    QCOMPARE(w.width(), int(std::lround(3001 * dpi / 1440)));
    const float height = c.surface_model().Height();
    // A size Qt gives (a layout) reaches the control in twips; the control keeps its height.
    w.resize(300, w.height() + 20);
    QCOMPARE(c.surface_model().Width(), float(300 * 1440 / dpi));
    QCOMPARE(c.surface_model().Height(), height);
    QCOMPARE(w.height(), int(std::lround(height * dpi / 1440)));
}

void QtHostTest::combo_list_opens_and_a_pick_is_the_models() {
    FormWindow form;
    Recorder events;
    form.set_observer(&events);
    QtSite& c = form.create(*form.services().catalogue().find("KelCombo"), "c");
    c.dispatch().call("AddItem", {Variant("Cash")});
    c.dispatch().call("AddItem", {Variant("Card")});
    form.focus(&c);
    QTest::keyClick(c.focus_view(), Qt::Key_F4);
    QCOMPARE(events.count("c.DropDown"), 1);
    auto* popup = c.focus_view()->findChild<QListWidget*>();
    QVERIFY(popup && popup->isVisible());
    QCOMPARE(popup->count(), 2);
    emit popup->itemClicked(popup->item(1));
    QCOMPARE(peek_text(c), std::string("Card"));
    QCOMPARE(c.dispatch().get("ListIndex"), Variant(int16_t{1}));
    QCOMPARE(events.count("c.Click"), 1);
    QCOMPARE(shown(c), std::string("Card"));
    form.set_observer(nullptr);
}

void QtHostTest::tab_release_and_lone_modifiers_are_not_delivered() {
    FormWindow form;
    Recorder events;
    const ClassInfo& cls = *form.services().catalogue().find("KelAlphaNumeric");
    QtSite& a = form.create(cls, "a");
    QtSite& b = form.create(cls, "b");
    form.focus(&a);
    form.set_observer(&events);
    QTest::keyPress(a.focus_view(), Qt::Key_Shift, Qt::ShiftModifier);
    QTest::keyRelease(a.focus_view(), Qt::Key_Shift);
    QTest::keyPress(a.focus_view(), Qt::Key_Tab);
    QCOMPARE(form.focused(), &b);
    QTest::keyRelease(b.focus_view(), Qt::Key_Tab);  // Tab's release lands in the control it moved to
    QVERIFY2(events.lines.empty(), events.lines.empty() ? "" : events.lines.front().c_str());
    QTest::keyClick(b.focus_view(), Qt::Key_Backtab, Qt::ShiftModifier);
    QCOMPARE(form.focused(), &a);
    form.set_observer(nullptr);
}

void QtHostTest::drop_undo_and_middle_click_never_bypass_the_model() {
    FormWindow form;
    QtSite& n = form.create(*form.services().catalogue().find("KelNumeric"), "n");
    form.focus(&n);
    QTest::keyClicks(n.focus_view(), "12");
    auto* view = qobject_cast<QLineEdit*>(n.focus_view());
    // Text dropped on the view would go around the box's filter: refused.
    QMimeData mime;
    mime.setText("abc");
    QDropEvent drop(QPointF(2, 2), Qt::CopyAction, &mime, Qt::LeftButton, Qt::NoModifier);
    QApplication::sendEvent(view, &drop);
    QCOMPARE(peek_text(n), std::string("12"));
    // QLineEdit's own undo never runs: Ctrl+Z is a key for the box (which types nothing).
    QTest::keyClick(view, Qt::Key_Z, Qt::ControlModifier);
    view->undo();
    form.sync();
    QCOMPARE(peek_text(n), std::string("12"));
    QCOMPARE(view->text(), QString("12"));
    // A middle click pastes the selection clipboard through the model's paste, where there is one.
    if (QApplication::clipboard()->supportsSelection()) {
        QApplication::clipboard()->setText("x5", QClipboard::Selection);
        QTest::mouseClick(view, Qt::MiddleButton, {}, QPoint(1, 1));
        QCOMPARE(view->text(), QString::fromStdString(peek_text(n)));
    }
}

QTEST_MAIN(QtHostTest)
#include "qt_host_test.moc"
