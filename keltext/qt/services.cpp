#include "keltext/qt/services.h"

#include <QApplication>
#include <QClipboard>
#include <QGuiApplication>
#include <QCoreApplication>
#include <QFocusEvent>
#include <QInputMethodEvent>
#include <QKeyEvent>
#include <QTimer>
#include <QWidget>
#include <algorithm>

#include "keltext/host/charset.h"
#include "keltext/host/errors.h"
#include "keltext/host/keys.h"
#include "keltext/qt/qt_keys.h"
#include "keltext/qt/site.h"

namespace kel::qt {
namespace {

bool is_form_tab(int qt_key, Qt::KeyboardModifiers m) {
    return (qt_key == Qt::Key_Tab || qt_key == Qt::Key_Backtab) && !(m & (Qt::ControlModifier | Qt::AltModifier));
}

// Popup menus and window activation move Qt's focus without moving the person's: the
// control keeps focus as it sees it, and no exit formatting runs.
bool is_passing_focus(Qt::FocusReason r) { return r == Qt::PopupFocusReason || r == Qt::ActiveWindowFocusReason; }

}  // namespace

Services::Services(QObject* parent) : QObject(parent) { setObjectName(QStringLiteral("keltext_services")); }

Services& Services::of_application() {
    QCoreApplication* app = QCoreApplication::instance();
    if (!app) throw model::FormError("KelText controls need a QApplication");
    if (auto* s = app->findChild<Services*>(QString(), Qt::FindDirectChildrenOnly)) return *s;
    return *new Services(app);
}

int16_t Services::key_state(int16_t virtual_key) const { return virtual_key == kVkInsert && insert_ ? 1 : 0; }

void Services::add_site(QtSite* site) { sites_.push_back(site); }

void Services::remove_site(QtSite* site) { std::erase(sites_, site); }

void Services::forget(QtSite& site) {
    if (focused_ == &site) focused_ = nullptr;
    if (leaving_ == &site) leaving_ = nullptr;
}

void Services::sync_all() {
    for (QtSite* s : sites_)
        if (s->has_control()) s->sync_views();
}

void Services::queue_keys(QtSite& from, std::string_view keys) {
    std::vector<model::SentKey> parsed;
    try {
        parsed = model::parse_send_keys(keys);
    } catch (const model::SendKeysError&) {
        raise_error(kInvalidProcedureCall);  // as the platform's send keys does
    }
    if (observer_) observer_->keys_sent(from, keys);
    // Keys queued while focus leaves a control go where focus goes next.
    if (!focused_ && !leaving_) return;
    queue_.insert(queue_.end(), parsed.begin(), parsed.end());
    schedule_flush();
}

void Services::schedule_flush() {
    // The user action that queued the keys delivers them when it ends; this is for keys
    // queued outside one (an application's own call), so that they never wait for input.
    if (flush_scheduled_) return;
    flush_scheduled_ = true;
    QTimer::singleShot(0, this, [this] {
        flush_scheduled_ = false;
        after_input();
    });
}

void Services::keystroke_to(QtSite& site, const model::Keystroke& k, bool up) {
    if (!up) {
        if (model::toggles_insert(k.key_code, k.shift)) insert_ = !insert_;  // flips as the key goes down
        if (auto* p = site.input_target()) p->user_key_down(k.key_code, k.shift);
        if (k.char_code)
            if (auto* p = site.input_target()) p->user_key_press(*k.char_code);
        return;
    }
    if (auto* p = site.input_target()) p->user_key_up(k.key_code, k.shift);
}

void Services::deliver_sent(const model::SentKey& k) {
    switch (k.kind) {
    case model::SentKey::tab: tab(true); break;
    case model::SentKey::back_tab: tab(false); break;
    case model::SentKey::keystroke:
        if (k.key.key_code == kVkTab && (k.key.shift & (kCtrlMask | kAltMask)) == 0) {
            tab((k.key.shift & kShiftMask) == 0);
            break;
        }
        if (QtSite* s = focused_) {
            keystroke_to(*s, k.key, false);
            if (focused_ == s) keystroke_to(*s, k.key, true);
        }
        break;
    }
}

void Services::run_pending() {
    if (delivering_) return;  // the round already running delivers them
    delivering_ = true;
    struct Done {
        bool& flag;
        ~Done() { flag = false; }
    } done{delivering_};
    std::size_t delivered = 0;
    while (!queue_.empty()) {
        const model::SentKey k = queue_.front();
        queue_.pop_front();
        if (!focused_) continue;  // nobody to take it: dropped
        if (++delivered > kMaxSentKeys) {
            queue_.clear();
            if (observer_) observer_->handler_error(focused_->name() + ".surface.SendKeys", model::kOutOfStackSpace);
            break;
        }
        deliver_sent(k);
    }
}

void Services::after_input() {
    run_pending();
    sync_all();
}

bool Services::tab(bool forward) {
    QWidget* start = QApplication::focusWidget();
    if (!start && focused_) start = focused_->focus_view();
    if (!start) return false;
    QWidget* w = start;
    // The focus chain holds every widget of the window once: one lap at most.
    for (;;) {
        w = forward ? w->nextInFocusChain() : w->previousInFocusChain();
        if (!w || w == start) return false;
        if (w->window() != start->window()) continue;
        if ((w->focusPolicy() & Qt::TabFocus) != Qt::TabFocus || !w->isEnabled() || !w->isVisibleTo(w->window()))
            continue;
        QWidget* target = w;
        while (target->focusProxy()) target = target->focusProxy();
        if (target == start) continue;  // the focused control's own container
        w->setFocus(forward ? Qt::TabFocusReason : Qt::BacktabFocusReason);
        return true;
    }
}

void Services::set_control_focus(QtSite* target) {
    if (target == focused_) return;
    if (target && !target->can_take_focus()) return;
    const unsigned generation = ++focus_generation_;
    if (QtSite* from = focused_) {
        // While the control left runs its exit handling, it has focus no longer (a handler
        // that moves focus elsewhere does not make it leave twice), and the keys it queues
        // go to the control entered next.
        focused_ = nullptr;
        leaving_ = from;
        if (auto* p = from->keyboard_input()) p->user_notify("LostFocus");
        if (leaving_ == from) from->guarded("surface", "ExitFocus", [&] { from->control().ExitFocus(); });
        if (leaving_ == from) leaving_ = nullptr;
        // A handler moved focus itself: that move stands.
        if (generation != focus_generation_) return;
    }
    focused_ = target;
    if (target) {
        target->guarded("surface", "EnterFocus", [&] { target->control().EnterFocus(); });
        if (focused_ == target)
            if (auto* p = target->keyboard_input()) p->user_notify("GotFocus");
    }
}

std::string Services::SystemClipboard::text() const {
    return from_utf8(QGuiApplication::clipboard()->text().toStdString());
}

void Services::SystemClipboard::set_text(std::string_view text) {
    QGuiApplication::clipboard()->setText(qstring_of(std::string(text)));
}

void Services::key_down(QtSite& site, int16_t key_code, int16_t shift) {
    run_pending();
    if (model::toggles_insert(key_code, shift)) insert_ = !insert_;
    if (auto* p = site.input_target()) p->user_key_down(key_code, shift);
    after_input();
}

void Services::key_press(QtSite& site, int16_t char_code) {
    run_pending();
    if (auto* p = site.input_target()) p->user_key_press(char_code);
    after_input();
}

void Services::key_up(QtSite& site, int16_t key_code, int16_t shift) {
    run_pending();
    if (auto* p = site.input_target()) p->user_key_up(key_code, shift);
    after_input();
}

void Services::paste(QtSite& site, std::string_view cp1252) {
    run_pending();
    if (auto* p = site.input_target()) p->user_paste(cp1252);
    after_input();
}

bool Services::route_shortcut_override(QtSite&, QKeyEvent* e) {
    // Keys the controls take must not trigger an application's shortcuts (Ctrl+C, Delete);
    // function keys and Alt combinations stay the application's.
    const bool app_key = (e->modifiers() & (Qt::AltModifier | Qt::MetaModifier)) ||
                         (e->key() >= Qt::Key_F1 && e->key() <= Qt::Key_F35) || e->key() == Qt::Key_Escape;
    if (app_key) return false;
    e->accept();
    return true;
}

bool Services::route_key_press(QtSite& site, QKeyEvent* e) {
    run_pending();  // keys queued by earlier input go before this one
    if (is_form_tab(e->key(), e->modifiers())) {
        const bool forward = e->key() == Qt::Key_Tab && !(e->modifiers() & Qt::ShiftModifier);
        tab(forward);
        after_input();
        return true;
    }
    const QtKeystroke q = keystroke_from_qt(e->key(), e->modifiers(), e->text());
    if (q.kind != QtKeystroke::Kind::keystroke) return true;
    keystroke_to(site, q.key, false);
    sync_all();
    // The keys this queued wait for the key's release (or the next input, when keys come in
    // a burst); the timer delivers them should the release never come.
    if (!queue_.empty()) schedule_flush();
    return true;
}

bool Services::route_key_release(QtSite& site, QKeyEvent* e) {
    // A held key repeats key down and key press only; Tab's release lands in the control Tab
    // moved to and is not that control's.
    if (e->isAutoRepeat() || is_form_tab(e->key(), e->modifiers())) return true;
    const QtKeystroke q = keystroke_from_qt(e->key(), e->modifiers(), e->text());
    if (q.kind != QtKeystroke::Kind::keystroke) return true;
    keystroke_to(site, q.key, true);
    after_input();
    return true;
}

void Services::route_focus_in(QtSite& site, QFocusEvent*) {
    // Whatever the reason, focus is in this control now; only a control that had it already
    // (back from a popup or another window) enters nothing.
    if (focused_ == &site) return;
    set_control_focus(&site);
    after_input();
}

void Services::route_focus_out(QtSite& site, QFocusEvent* e) {
    if (is_passing_focus(e->reason()) || focused_ != &site) return;
    set_control_focus(nullptr);
    // The keys the exit queued go to the control focus is moving to, after it entered.
    if (!queue_.empty()) schedule_flush();
    sync_all();
}

void Services::route_input_method(QtSite& site, QInputMethodEvent* e) {
    // Composed text is typed character by character, as the person's keys; characters the
    // controls' set lacks are refused. The preedit string is not shown: a control sees only
    // what is committed.
    run_pending();
    for (const char32_t cp : e->commitString().toUcs4()) {
        const auto b = from_unicode(cp);
        if (!b || *b < 0x20) continue;
        const model::Keystroke k = model::keystroke_for_char(*b);
        keystroke_to(site, k, false);
        keystroke_to(site, k, true);
        run_pending();
    }
    e->accept();
    sync_all();
}

void Services::route_paste(QtSite& site, const QString& text) {
    run_pending();
    if (auto* p = site.input_target()) p->user_paste(from_utf8(text.toStdString()));
    after_input();
}

}  // namespace kel::qt
