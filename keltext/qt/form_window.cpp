#include "keltext/qt/form_window.h"

#include <QApplication>
#include <cmath>

#include "keltext/host/conversions.h"
#include "keltext/qt/services.h"

namespace kel::qt {
namespace {

bool valid_name(std::string_view name) {
    if (name.empty()) return false;
    for (char c : name)
        if (!((c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') || c == '_')) return false;
    return true;
}

void check_size(float width, float height) {
    if (!std::isfinite(width) || !std::isfinite(height) || width < 0 || height < 0)
        throw model::FormError("a control's size must be zero or more");
}

}  // namespace

FormWindow::FormWindow(QWidget* window) : services_(Services::of_application()) {
    if (!window) {
        own_window_ = std::make_unique<QWidget>();
        own_window_->resize(640, 480);
        window = own_window_.get();
    }
    window_ = window;
    activate();
}

FormWindow::~FormWindow() {
    // Controls go in reverse order of creation, as on the minimal host.
    for (auto it = widgets_.rbegin(); it != widgets_.rend(); ++it) delete it->data();
}

void FormWindow::activate() {
    QWidget* top = window_->window();
    if (!top->isVisible()) top->show();
    if (QApplication::activeWindow() != top) {
        top->activateWindow();
        QApplication::setActiveWindow(top);
    }
}

void FormWindow::set_observer(model::FormObserver* observer) { services_.set_observer(observer); }
void FormWindow::set_user_mode(bool running) { services_.set_user_mode(running); }
bool FormWindow::user_mode() const { return services_.user_mode(); }

void FormWindow::place(ControlWidget& w) {
    w.move(8, next_top_);
    next_top_ += w.sizeHint().height() + 8;
    w.show();
    if (window_->height() < next_top_) window_->resize(window_->width(), next_top_);
}

QtSite& FormWindow::create(const ClassInfo& cls, std::string name, float width, float height) {
    if (cls.is_page) throw model::FormError(cls.name + " is a property page: open it with page");
    if (!valid_name(name)) throw model::FormError("bad control name '" + name + "': letters, digits and _ only");
    if (find(name)) throw model::FormError("a control named " + name + " already exists");
    check_size(width, height);
    std::string key = name_key(name);
    ControlWidget* w = create_control_widget({&cls, std::move(name), width, height, std::nullopt}, window_);
    widgets_.emplace_back(w);
    by_name_.emplace(std::move(key), w);
    place(*w);
    return w->site();
}

QtSite& FormWindow::load(const ClassInfo& cls, std::string name, const model::StoredValues& store, float width,
                         float height) {
    if (cls.is_page) throw model::FormError(cls.name + " is a property page: open it with page");
    if (!valid_name(name)) throw model::FormError("bad control name '" + name + "': letters, digits and _ only");
    if (find(name)) throw model::FormError("a control named " + name + " already exists");
    check_size(width, height);
    std::string key = name_key(name);
    ControlWidget* w = create_control_widget({&cls, std::move(name), width, height, store}, window_);
    widgets_.emplace_back(w);
    by_name_.emplace(std::move(key), w);
    place(*w);
    return w->site();
}

model::StoredValues FormWindow::save(model::HostedControl& control) { return widget_of(control).save(); }

QtSite* FormWindow::find(std::string_view name) {
    const auto it = by_name_.find(name_key(name));
    return it == by_name_.end() ? nullptr : &it->second->site();
}

void FormWindow::reserve(std::size_t more) {
    widgets_.reserve(widgets_.size() + more);
    by_name_.reserve(by_name_.size() + more);
}

std::vector<model::HostedControl*> FormWindow::controls() {
    std::vector<model::HostedControl*> out;
    out.reserve(widgets_.size());
    for (auto& w : widgets_)
        if (w) out.push_back(&w->site());
    return out;
}

ControlWidget& FormWindow::widget_of(model::HostedControl& control) {
    for (auto& w : widgets_)
        if (w && &w->site() == &control) return *w;
    throw model::FormError("control " + control.name() + " is not on this form");
}

QtSite& FormWindow::site_of(model::HostedControl& control) { return widget_of(control).site(); }

model::HostedControl* FormWindow::focused() { return services_.focused(); }

model::FormDriver::FocusResult FormWindow::focus(model::HostedControl* target) {
    QtSite* site = target ? &site_of(*target) : nullptr;
    if (site == services_.focused()) return model::FormDriver::FocusResult::unchanged;
    if (site && !site->can_take_focus()) {
        if (auto* o = services_.observer()) o->focus_refused(*site);
        return model::FormDriver::FocusResult::refused;
    }
    activate();
    if (site) {
        site->container().setFocus(Qt::OtherFocusReason);
    } else if (QWidget* f = QApplication::focusWidget()) {
        f->clearFocus();
    }
    // Qt has nothing to move when its focus already stands there (a control that kept Qt's
    // focus while it lost the controls'): the move is made directly then.
    if (services_.focused() != site && QApplication::focusWidget() == (site ? site->focus_view() : nullptr))
        services_.set_control_focus(site);
    services_.after_input();
    return model::FormDriver::FocusResult::moved;
}

void FormWindow::tab(bool forward) {
    activate();
    if (!services_.focused() || !QApplication::focusWidget()) {
        // Without focus, Tab starts at the first control and Shift+Tab at the last.
        const std::size_t n = widgets_.size();
        for (std::size_t step = 0; step < n; ++step) {
            ControlWidget* w = widgets_[forward ? step : n - 1 - step];
            if (w && w->site().can_take_focus()) {
                w->setFocus(forward ? Qt::TabFocusReason : Qt::BacktabFocusReason);
                break;
            }
        }
    } else {
        services_.tab(forward);
    }
    services_.after_input();
}

void FormWindow::select(model::HostedControl& control, int32_t start, int32_t length) {
    QtSite& s = site_of(control);
    model::InputPart* p = s.keyboard_input();
    if (!p) throw model::FormError(control.name() + " has no edit field");
    services_.run_pending();
    p->user_select(start, length);
    services_.after_input();
}

void FormWindow::set_insert(bool on) { services_.set_insert(on); }
bool FormWindow::insert_on() const { return services_.insert_on(); }
void FormWindow::set_clipboard(std::string_view text) { services_.clipboard().set_text(text); }
std::string FormWindow::clipboard() const { return services_.clipboard().text(); }

void FormWindow::resize(model::HostedControl& control, float width, float height) {
    site_of(control).surface_model().set_size(width, height);
    services_.after_input();
}

void FormWindow::run_pending() { services_.run_pending(); }

void FormWindow::sync() { services_.sync_all(); }

}  // namespace kel::qt
