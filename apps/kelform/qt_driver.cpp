#include "apps/kelform/qt_driver.h"

#include <QApplication>
#include <QLineEdit>
#include <QTest>
#include <QToolButton>
#include <cmath>

#include "keltext/host/conversions.h"
#include "keltext/qt/qt_keys.h"
#include "keltext/qt/services.h"
#include "keltext/qt/views.h"
#include "keltext/widgetmodel/property_store.h"

namespace kel::kelform {
namespace {

Qt::KeyboardModifiers modifiers_of(int16_t shift) {
    Qt::KeyboardModifiers m;
    if (shift & kShiftMask) m |= Qt::ShiftModifier;
    if (shift & kCtrlMask) m |= Qt::ControlModifier;
    if (shift & kAltMask) m |= Qt::AltModifier;
    return m;
}

// The text of the Qt key event that makes the keystroke's character.
QString text_of(const model::Keystroke& k) {
    if (!k.char_code) return {};
    return qt::qstring_of(std::string(1, static_cast<char>(static_cast<uint8_t>(*k.char_code))));
}

std::string quoted(const std::string& s) { return "\"" + s + "\""; }

}  // namespace

QtFormDriver::QtFormDriver(model::FormObserver* observer) { window_.set_observer(observer); }

QtFormDriver::~QtFormDriver() {
    // No event reaches a player being destroyed; pages let go of the window's controls first.
    window_.set_observer(nullptr);
    pages_.clear();
}

void QtFormDriver::set_observer(model::FormObserver* observer) { window_.set_observer(observer); }

void QtFormDriver::set_user_mode(bool running) { window_.set_user_mode(running); }
bool QtFormDriver::user_mode() const { return window_.user_mode(); }

void QtFormDriver::check_name_free(const std::string& name) {
    if (find(name)) throw model::FormError("a control named " + name + " already exists");
}

model::HostedControl& QtFormDriver::create(const ClassInfo& cls, std::string name, float width, float height) {
    check_name_free(name);
    return window_.create(cls, std::move(name), width, height);
}

model::HostedControl& QtFormDriver::load(const ClassInfo& cls, std::string name, const model::StoredValues& store,
                                         float width, float height) {
    check_name_free(name);
    return window_.load(cls, std::move(name), store, width, height);
}

model::StoredValues QtFormDriver::save(model::HostedControl& control) {
    if (qt::PageWidget* page = page_of(control)) {
        qt::QtSite& s = page->site();
        model::PropertyStore bag;
        s.guarded("surface", "WriteProperties", [&] { s.control().WriteProperties(bag); });
        run_pending();
        return bag.values();
    }
    return window_.save(control);
}

model::HostedControl* QtFormDriver::find(std::string_view name) {
    if (model::HostedControl* c = window_.find(name)) return c;
    for (auto& p : pages_)
        if (same_name(p->site().name(), name)) return &p->site();
    return nullptr;
}

void QtFormDriver::reserve(std::size_t more) { window_.reserve(more); }
std::vector<model::HostedControl*> QtFormDriver::controls() { return window_.controls(); }

qt::PageWidget* QtFormDriver::page_of(model::HostedControl& control) {
    for (auto& p : pages_)
        if (&p->site() == &control) return p.get();
    return nullptr;
}

bool QtFormDriver::is_page(model::HostedControl& control) { return page_of(control) != nullptr; }

qt::QtSite& QtFormDriver::any_site(model::HostedControl& control) {
    if (qt::PageWidget* page = page_of(control)) return page->site();
    return window_.site_of(control);
}

// A page is a window of its own beside the form, shown without taking activation from it
// (Qt delivers focus only inside the active window).
model::HostedControl& QtFormDriver::open_page(const ClassInfo& page_class, std::string name,
                                              std::vector<model::HostedControl*> selected) {
    if (name.empty()) throw model::FormError("a page needs a name");
    for (char c : name)
        if (!((c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') || c == '_'))
            throw model::FormError("bad control name '" + name + "': letters, digits and _ only");
    check_name_free(name);
    auto page = std::make_unique<qt::PageWidget>(page_class, std::move(name), std::move(selected));
    page->setAttribute(Qt::WA_ShowWithoutActivating);
    page->show();
    pages_.push_back(std::move(page));
    window_.sync();
    return pages_.back()->site();
}

void QtFormDriver::apply_page(model::HostedControl& page) {
    qt::PageWidget* p = page_of(page);
    if (!p) throw model::FormError(page.name() + " is not a property page");
    p->apply();
    window_.sync();  // ApplyChanges wrote to the window's controls through their member tables
}

model::HostedControl* QtFormDriver::focused() { return window_.focused(); }
model::FormDriver::FocusResult QtFormDriver::focus(model::HostedControl* target) {
    if (target && is_page(*target)) throw model::FormError(target->name() + " is a property page: it takes no focus");
    return window_.focus(target);
}
void QtFormDriver::tab(bool forward) { window_.tab(forward); }

qt::QtSite& QtFormDriver::focused_site() {
    model::HostedControl* f = window_.focused();
    if (!f) throw model::FormError("no control has focus");
    return window_.site_of(*f);
}

void QtFormDriver::keystroke(const model::Keystroke& k) {
    qt::QtSite& site = focused_site();
    const int qt_key = qt::qt_key_of(k.key_code);
    const Qt::KeyboardModifiers mods = modifiers_of(k.shift);
    const QString text = text_of(k);
    // A keystroke whose Qt event would reach the control as another keystroke (a script's
    // own pairing of key and character) has no faithful Qt event: it goes to the model.
    const qt::QtKeystroke made = qt::keystroke_from_qt(qt_key, mods, text);
    if (made.kind != qt::QtKeystroke::Kind::keystroke || !(made.key == k)) {
        key_down(k.key_code, k.shift);
        if (k.char_code) key_press(*k.char_code);
        key_up(k.key_code, k.shift);
        return;
    }
    QWidget* target = QApplication::focusWidget();
    if (!target) target = site.focus_view();
    QTest::sendKeyEvent(QTest::Press, target, static_cast<Qt::Key>(qt_key), text, mods);
    // The release goes where focus is now: after Tab, to the control Tab moved to.
    QWidget* release_target = QApplication::focusWidget();
    QTest::sendKeyEvent(QTest::Release, release_target ? release_target : target, static_cast<Qt::Key>(qt_key), text,
                        mods);
    run_pending();
}

void QtFormDriver::type(std::string_view text) {
    for (char c : text) keystroke(model::keystroke_for_char(static_cast<uint8_t>(c)));
}

// A lone half of a keystroke has no Qt event of its own (a Qt key press is key down and key
// press together): the model takes it, as the minimal host delivers it.
void QtFormDriver::key_down(int16_t key_code, int16_t shift) {
    window_.services().key_down(focused_site(), key_code, shift);
}
void QtFormDriver::key_press(int16_t char_code) { window_.services().key_press(focused_site(), char_code); }
void QtFormDriver::key_up(int16_t key_code, int16_t shift) {
    window_.services().key_up(focused_site(), key_code, shift);
}

// The script's paste names its text, which no Qt event carries (Ctrl+V takes the clipboard's):
// the model takes it, as the paste path of the view hands it on.
void QtFormDriver::paste(std::string_view text) { window_.services().paste(focused_site(), text); }

// A selection set by the script (a person's drag, in effect) goes to the model: a drag in
// pixels would land on character boundaries the font decides.
void QtFormDriver::select(model::HostedControl& control, int32_t start, int32_t length) {
    window_.select(control, start, length);
}

void QtFormDriver::set_insert(bool on) { window_.set_insert(on); }
bool QtFormDriver::insert_on() const { return window_.insert_on(); }
void QtFormDriver::set_clipboard(std::string_view text) { window_.set_clipboard(text); }
std::string QtFormDriver::clipboard() const { return window_.clipboard(); }

model::InputPart& QtFormDriver::deliverable(qt::QtSite& site, model::Part& part, std::string_view notification) {
    model::InputPart* p = site.input_part(&part);
    if (!p) throw model::FormError(site.name() + " has no such constituent");
    if (!model::find_notification(*p, notification))
        throw model::FormError(site.name() + "." + p->part_name() + " does not raise " + std::string(notification));
    return *p;
}

bool QtFormDriver::takes_input(qt::QtSite& site, model::InputPart& p) {
    return site.surface_model().Enabled() && p.input_enabled();
}

void QtFormDriver::click(model::HostedControl& control, model::Part& part) {
    qt::QtSite& site = any_site(control);
    model::InputPart& p = deliverable(site, part, "Click");
    QWidget* view = site.view_of(part);
    // A click on an edit field also puts the caret where it lands, which the script's click
    // does not say; a hidden view cannot be clicked. Those clicks go to the model.
    if (p.is_edit_field() || !view || !view->isVisible()) return qt::deliver_click(site, p);
    QTest::mouseClick(view, Qt::LeftButton);
    run_pending();
}

void QtFormDriver::dbl_click(model::HostedControl& control, model::Part& part) {
    qt::QtSite& site = any_site(control);
    model::InputPart& p = deliverable(site, part, "DblClick");
    // Qt makes a double click of two presses, each of them a click of its own: the
    // notification alone goes to the model.
    qt::deliver_notification(site, p, "DblClick");
}

void QtFormDriver::notify(model::HostedControl& control, model::Part& part, std::string_view notification) {
    qt::QtSite& site = any_site(control);
    model::InputPart& p = deliverable(site, part, notification);
    const std::string name = *model::find_notification(p, notification);
    for (std::string_view keyed : {"KeyDown", "KeyUp", "KeyPress", "MouseDown", "MouseUp", "MouseMove"})
        if (name == keyed) throw model::FormError(name + " carries arguments: use the key or mouse commands");
    // The spin buttons' clicks are real clicks on their arrows; other notifications have no
    // Qt event that raises them alone, and go to the model.
    if (auto* spin = dynamic_cast<qt::SpinView*>(site.view_of(part)); spin && spin->isVisible()) {
        if (name == "UpClick" || name == "DownClick") {
            QTest::mouseClick(name == "UpClick" ? spin->up() : spin->down(), Qt::LeftButton);
            run_pending();
            return;
        }
    }
    qt::deliver_notification(site, p, name);
}

// Mouse positions are twips; a Qt event at pixels would round them, and a real press on an
// edit field also moves its caret. The model takes the button as the script gives it.
void QtFormDriver::mouse(model::HostedControl& control, model::Part& part, bool down, int16_t button, int16_t shift,
                         float x, float y) {
    qt::QtSite& site = any_site(control);
    model::InputPart& p = deliverable(site, part, down ? "MouseDown" : "MouseUp");
    window_.services().run_pending();
    if (takes_input(site, p)) p.user_mouse(down, button, shift, x, y);
    window_.services().after_input();
}

void QtFormDriver::resize(model::HostedControl& control, float width, float height) {
    if (qt::PageWidget* page = page_of(control)) {
        page->site().surface_model().set_size(width, height);
        return run_pending();
    }
    window_.resize(control, width, height);
}

void QtFormDriver::run_pending() {
    window_.run_pending();
}

void QtFormDriver::members_changed() { window_.sync(); }

void QtFormDriver::check_views(model::HostedControl& control) {
    qt::QtSite& site = any_site(control);
    for (auto& [name, part] : site.parts()) {
        QWidget* view = site.view_of(*part);
        auto* combo = dynamic_cast<qt::ComboView*>(view);
        auto* edit = combo ? &combo->edit() : dynamic_cast<qt::EditFieldView*>(view);
        if (!edit) continue;
        const std::string text = text_of(part->peek("Text"));
        const int32_t start = to_int32(part->peek("SelStart"));
        const int32_t length = to_int32(part->peek("SelLength"));
        const std::string shown = edit->shown_text();
        const int shown_start = edit->hasSelectedText() ? edit->selectionStart() : edit->cursorPosition();
        const int shown_length = edit->hasSelectedText() ? static_cast<int>(edit->selectedText().size()) : 0;
        if (shown != text || shown_start != start || shown_length != length) {
            throw model::FormError("the Qt view of " + control.name() + "." + name + " shows " + quoted(shown) +
                                   " (caret " + std::to_string(shown_start) + ", selection " +
                                   std::to_string(shown_length) + ") but the model holds " + quoted(text) +
                                   " (caret " + std::to_string(start) + ", selection " + std::to_string(length) + ")");
        }
    }
}

}  // namespace kel::kelform
