#pragma once
// A form of controls in one Qt window, for whoever drives a form as the minimal host's Form is
// driven (kelform's Qt player, tests): create and load controls by class, save them, focus
// and Tab through Qt, the Insert toggle, resize in twips, and the views to send Qt events to.
//
// Controls stand one under another in creation order, which is also the Qt focus chain and
// so the Tab order. The window is shown and made active at once (offscreen, it is never
// seen): Qt delivers focus only inside the active window.
//
// Internal API: every call below mirrors the Form call of the same name; keystrokes, clicks and
// notifications are the driver's to send as Qt events to focus_view() / view_of(), after which
// run_pending() delivers the keys the controls queued.
#include <QPointer>
#include <QWidget>
#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "keltext/qt/control_widget.h"
#include "keltext/widgetmodel/hosted.h"

namespace kel::qt {

class Services;

class FormWindow {
public:
    // `window`: the widget the controls go on; null makes a top-level window of its own.
    explicit FormWindow(QWidget* window = nullptr);
    ~FormWindow();
    FormWindow(const FormWindow&) = delete;
    FormWindow& operator=(const FormWindow&) = delete;

    QWidget& window() { return *window_; }
    Services& services() { return services_; }

    void set_observer(model::FormObserver* observer);
    void set_user_mode(bool running);
    bool user_mode() const;

    // `new`: Initialize, InitProperties, one Resize. Names are unique (FormError).
    QtSite& create(const ClassInfo& cls, std::string name, float width = 1200, float height = 300);
    // `load`: Initialize, ReadProperties from exactly `store`, Resize.
    QtSite& load(const ClassInfo& cls, std::string name, const model::StoredValues& store, float width = 1200,
                 float height = 300);
    model::StoredValues save(model::HostedControl& control);

    QtSite* find(std::string_view name);
    void reserve(std::size_t more);
    std::vector<model::HostedControl*> controls();  // creation order = Tab order

    // The site and widget of a control of this form (FormError for another's).
    QtSite& site_of(model::HostedControl& control);
    ControlWidget& widget_of(model::HostedControl& control);

    model::HostedControl* focused();
    // Through Qt: setFocus on the control (clearFocus for null). refused (and the observer's
    // focus_refused) when the control cannot take focus.
    model::FormDriver::FocusResult focus(model::HostedControl* target);
    // Tab and Shift+Tab as the form handles them: through the Qt focus chain, wrapping; with
    // nothing focused, the first (or last) control that can take focus.
    void tab(bool forward);

    // The person sets the caret and selection of the control's edit field.
    void select(model::HostedControl& control, int32_t start, int32_t length);

    void set_insert(bool on);
    bool insert_on() const;
    // The system clipboard (Windows-1252 text), as the edit fields see it.
    void set_clipboard(std::string_view text);
    std::string clipboard() const;

    // The surface's new size in twips, with one Resize when it changed; the view follows
    // without a second Resize.
    void resize(model::HostedControl& control, float width, float height);

    void run_pending();
    // Views in line with the models, after a driver poked a part directly.
    void sync();

private:
    void activate();
    void place(ControlWidget& w);

    Services& services_;
    std::unique_ptr<QWidget> own_window_;
    QWidget* window_;
    std::vector<QPointer<ControlWidget>> widgets_;
    std::unordered_map<std::string, ControlWidget*> by_name_;
    int next_top_ = 8;
};

}  // namespace kel::qt
