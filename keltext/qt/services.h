#pragma once
// The Qt host's per-application services: the Insert toggle, the send-keys queue, which
// control has focus as the controls see it, the handler depth shared by all controls, the
// class catalogue, and the routing of Qt's input events into the widget models.
//
// One object per application, a child of the QCoreApplication (of_application finds or makes
// it), so that the application and a Designer plugin share it through the one shared library.
//
// Internal API for a form driver (kelform's Qt player, tests):
//   - set_observer(model::FormObserver*): events raised (with mutable arguments), keys sent,
//     properties changed, handler errors and refused focus reach the driver, as on the
//     minimal host. Without an observer, events go only to the wrappers' signals.
//   - run_pending(): delivers queued send-keys now (the views do it after each user action);
//     after_input(): that, then sync_all().
//   - set_insert / insert_on: the Insert toggle.
//   - focused(): the control that has focus as the controls see it (popup menus and window
//     activation do not change it).
//   - tab(forward): the form's Tab, through Qt focus.
//   - sync_all(): brings every view in line with its model (after a driver poked a part).
//   - key_down / key_press / key_up / paste(site, ...): input with no faithful Qt event, to the
//     model directly as the minimal form delivers it.
//   - clipboard(): the clipboard the edit fields' clipboard keys use (the system's).
// Clicks and notifications on a constituent: deliver_click / deliver_notification (views.h),
// or QTest mouse events on QtSite::view_of(part).
#include <QObject>
#include <QPointer>
#include <cstdint>
#include <deque>
#include <memory>
#include <string_view>
#include <vector>

#include "keltext/library/catalogue.h"
#include "keltext/widgetmodel/hosted.h"
#include "keltext/widgetmodel/keyboard.h"
#include "keltext/widgetmodel/widget_base.h"

class QEvent;
class QWidget;
class QKeyEvent;
class QFocusEvent;
class QInputMethodEvent;

namespace kel::qt {

class QtSite;

class Services final : public QObject {
    Q_OBJECT

public:
    // The application's services (made on first use; the application must exist).
    static Services& of_application();

    const Catalogue& catalogue() const { return catalogue_; }

    void set_observer(model::FormObserver* observer) { observer_ = observer; }
    model::FormObserver* observer() const { return observer_; }

    // Ambient UserMode of every control: false in a designer.
    void set_user_mode(bool running) { user_mode_ = running; }
    bool user_mode() const { return user_mode_; }

    // The clipboard the edit fields copy to and paste from: the system's (QClipboard), in
    // Windows-1252 (characters the set lacks are dropped from a paste).
    model::Clipboard& clipboard() { return clipboard_; }

    void set_insert(bool on) { insert_ = on; }
    bool insert_on() const { return insert_; }
    int16_t key_state(int16_t virtual_key) const;

    int32_t next_handle() {
        next_handle_ += 2;
        return next_handle_;
    }
    int& handler_depth() { return handler_depth_; }
    bool delivering_sent_keys() const { return delivering_; }

    // Send-keys: parsed (error 5 for an unknown token), told to the observer, queued unless
    // nothing has focus; delivered after the user action that queued them.
    void queue_keys(QtSite& from, std::string_view keys);
    void run_pending();

    QtSite* focused() const { return focused_; }
    bool tab(bool forward);
    void sync_all();

    // Sites register themselves for the sync after each delivered event.
    void add_site(QtSite* site);
    void remove_site(QtSite* site);

    // A lone key down, key press or key up, straight to the control's edit field (input with no
    // faithful Qt event: a driver's `keydown`, `keypress`, `keyup`), as the minimal form
    // delivers it; then the keys it queued. Key down flips the Insert toggle as the key does.
    void key_down(QtSite& site, int16_t key_code, int16_t shift);
    void key_press(QtSite& site, int16_t char_code);
    void key_up(QtSite& site, int16_t key_code, int16_t shift);
    // Text put into the control's edit field as a paste (Windows-1252).
    void paste(QtSite& site, std::string_view cp1252);

    // The views hand their input events here. True when the event was the host's (the view
    // does nothing more with it).
    bool route_key_press(QtSite& site, QKeyEvent* e);
    bool route_key_release(QtSite& site, QKeyEvent* e);
    bool route_shortcut_override(QtSite& site, QKeyEvent* e);
    void route_focus_in(QtSite& site, QFocusEvent* e);
    void route_focus_out(QtSite& site, QFocusEvent* e);
    void route_input_method(QtSite& site, QInputMethodEvent* e);
    // Text put in by the person (paste, drop, middle click): Windows-1252 characters only.
    void route_paste(QtSite& site, const QString& text);
    // A click, notification or mouse button on a constituent, then the queued keys.
    void after_input();

    // Focus moves as the controls see it: exit formatting of the control left, entry of the
    // control entered. Called by the focus routing and by FormWindow.
    void set_control_focus(QtSite* target);
    // A site going away must not stay focused.
    void forget(QtSite& site);

    static constexpr std::size_t kMaxSentKeys = 10000;

private:
    explicit Services(QObject* parent);

    void keystroke_to(QtSite& site, const model::Keystroke& k, bool up);
    void deliver_sent(const model::SentKey& k);
    void schedule_flush();

    struct SystemClipboard final : model::Clipboard {
        std::string text() const override;
        void set_text(std::string_view text) override;
    };

    Catalogue catalogue_;
    SystemClipboard clipboard_;
    model::FormObserver* observer_ = nullptr;
    bool user_mode_ = true;
    bool insert_ = false;
    int32_t next_handle_ = 0x100;
    int handler_depth_ = 0;
    std::deque<model::SentKey> queue_;
    bool delivering_ = false;
    bool flush_scheduled_ = false;
    QtSite* focused_ = nullptr;
    QtSite* leaving_ = nullptr;      // the control running its exit handling
    unsigned focus_generation_ = 0;  // counts focus moves, to see one made by a handler
    std::vector<QtSite*> sites_;
};

}  // namespace kel::qt
