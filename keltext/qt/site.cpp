#include "keltext/qt/site.h"

#include <QApplication>
#include <cmath>

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/qt/services.h"
#include "keltext/qt/views.h"

namespace kel::qt {

QtSite::QtSite(Services& services, const ClassInfo& cls, std::string name, QWidget& container, SiteOwner* owner,
               float width, float height, std::optional<std::vector<model::HostedControl*>> selected)
    : services_(services),
      info_(cls),
      name_(std::move(name)),
      container_(container),
      owner_(owner),
      surface_(services.next_handle(), width, height, [this] { raise_resize(); }) {
    if (selected) page_ = std::make_unique<model::PagePart>(std::move(*selected));
    services_.add_site(this);
}

QtSite::~QtSite() {
    services_.forget(*this);
    services_.remove_site(this);
    bound_.reset();
    control_.reset();
    // The views show the models: they go before them.
    for (auto& p : parts_) delete p.view->widget();
    parts_.clear();
}

void QtSite::attach(std::unique_ptr<Control> control) {
    control_ = std::move(control);
    bound_ = std::make_unique<BoundControl>(*control_, info_);
}

bool QtSite::user_mode() const { return services_.user_mode(); }

Control& QtSite::control() {
    if (!control_) throw model::FormError("control " + name_ + " is not built");
    return *control_;
}

Dispatch& QtSite::dispatch() {
    if (!bound_) throw model::FormError("control " + name_ + " is not built");
    return *bound_;
}

void QtSite::raise_resize() {
    if (control_) guarded("surface", "Resize", [&] { control_->Resize(); });
}

void QtSite::property_changed(std::string_view name) {
    if (auto* o = services_.observer()) o->property_changed(*this, name);
    if (owner_) owner_->site_property_changed(name);
}

void QtSite::raise_event(int number, std::string_view name, std::span<EventArg> args) {
    try {
        if (!enter_handler()) throw model::HandlerOverflow{};
        struct Leave {
            QtSite& site;
            ~Leave() { site.leave_handler(); }
        } leave{*this};
        std::vector<Variant> given;
        given.reserve(args.size());
        for (const auto& a : args) given.push_back(a.value);
        // The wrapper's signals first (an application's slots), then the driver's form code.
        if (owner_) owner_->site_event(number, name, args);
        if (auto* o = services_.observer()) o->event_raised(*this, number, name, args);
        for (std::size_t i = 0; i < args.size(); ++i)
            if (!(args[i].value == given[i])) args[i].value = coerce_like(args[i].value, given[i]);
    } catch (model::HandlerOverflow& overflow) {
        if (handlers_running()) throw;
        handler_overflow(overflow.where.empty() ? handler_where("surface", name) : overflow.where);
    }
}

model::Clipboard* QtSite::clipboard() { return &services_.clipboard(); }

void QtSite::handler_error(std::string_view part, std::string_view notification, int number) {
    if (auto* o = services_.observer()) o->handler_error(handler_where(part, notification), number);
}

void QtSite::handler_overflow(std::string_view where) {
    if (auto* o = services_.observer()) o->handler_error(where, model::kOutOfStackSpace);
}

std::string QtSite::handler_where(std::string_view part, std::string_view notification) const {
    return name_ + "." + std::string(part) + "." + std::string(notification);
}

bool QtSite::enter_handler() {
    if (services_.handler_depth() >= kMaxHandlerDepth) return false;
    ++services_.handler_depth();
    return true;
}

void QtSite::leave_handler() { --services_.handler_depth(); }
bool QtSite::handlers_running() const { return services_.handler_depth() > 0; }

void QtSite::send_keys(std::string_view keys) { services_.queue_keys(*this, keys); }
int16_t QtSite::key_state(int16_t virtual_key) { return services_.key_state(virtual_key); }
bool QtSite::delivering_sent_keys() const { return services_.delivering_sent_keys(); }

template <class Model, class View>
Model& QtSite::add_part(std::string_view name) {
    auto m = std::make_unique<Model>(*this, std::string(name), services_.next_handle(), surface_.Width(),
                                     surface_.Height());
    Model& ref = *m;
    View* view = nullptr;
    if constexpr (std::is_same_v<View, EditFieldView>)
        view = new EditFieldView(*this, ref, ref, &container_);
    else
        view = new View(*this, ref, &container_);
    if (!keyboard_part_ && ref.is_edit_field()) {
        keyboard_part_ = &ref;
        focus_view_ = view;
        container_.setFocusProxy(view);
    }
    parts_.push_back({std::string(name), std::move(m), view});
    return ref;
}

EditBox& QtSite::create_edit_box(std::string_view name) { return add_part<model::EditBoxModel, EditFieldView>(name); }
ComboBox& QtSite::create_combo_box(std::string_view name) { return add_part<model::ComboBoxModel, ComboView>(name); }
MaskedEdit& QtSite::create_masked_edit(std::string_view name) {
    return add_part<model::MaskedEditModel, EditFieldView>(name);
}
SpinButton& QtSite::create_spin_button(std::string_view name) { return add_part<model::SpinButtonModel, SpinView>(name); }
Image& QtSite::create_image(std::string_view name) { return add_part<model::ImageModel, ImageView>(name); }
ListBox& QtSite::create_list_box(std::string_view name) { return add_part<model::ListBoxModel, ListView>(name); }
CheckBox& QtSite::create_check_box(std::string_view name) { return add_part<model::CheckBoxModel, CheckView>(name); }
PushButton& QtSite::create_push_button(std::string_view name) {
    return add_part<model::PushButtonModel, ButtonView>(name);
}
Label& QtSite::create_label(std::string_view name) { return add_part<model::LabelModel, LabelView>(name); }
Frame& QtSite::create_frame(std::string_view name) { return add_part<model::FrameModel, FrameView>(name); }

model::Part* QtSite::part(std::string_view name) {
    if (same_name(name, "surface")) return &surface_;
    if (page_ && same_name(name, "page")) return page_.get();
    for (auto& p : parts_)
        if (same_name(p.name, name)) return p.model.get();
    return nullptr;
}

std::vector<std::pair<std::string, model::Part*>> QtSite::parts() {
    std::vector<std::pair<std::string, model::Part*>> out;
    out.reserve(parts_.size());
    for (auto& p : parts_) out.emplace_back(p.name, p.model.get());
    return out;
}

model::InputPart* QtSite::input_part(model::Part* part) {
    for (auto& p : parts_)
        if (p.model.get() == part) return p.model.get();
    return nullptr;
}

model::InputPart* QtSite::part_of_view(const QWidget* w) {
    for (auto& p : parts_)
        if (p.view->widget() == w) return p.model.get();
    return nullptr;
}

QWidget* QtSite::view_of(const model::Part& part) {
    if (&part == &surface_) return &container_;
    for (auto& p : parts_)
        if (p.model.get() == &part) return p.view->widget();
    return nullptr;
}

std::optional<std::string> QtSite::shown_text(const model::Part& part) {
    QWidget* w = view_of(part);
    if (auto* combo = qobject_cast<ComboView*>(w)) return combo->edit().shown_text();
    if (auto* edit = qobject_cast<EditFieldView*>(w)) return edit->shown_text();
    return std::nullopt;
}

model::InputPart* QtSite::input_target() {
    model::InputPart* p = keyboard_part_;
    // A page has several edit fields, each taking its keys while it has Qt's focus.
    if (page_)
        if (model::InputPart* focused = part_of_view(QApplication::focusWidget()); focused && focused->is_edit_field())
            p = focused;
    if (!p || !surface_.Enabled() || !p->input_enabled()) return nullptr;
    return p;
}

void QtSite::sync_views() {
    // A disabled surface takes no focus, but is not greyed: its views stay enabled.
    const bool enabled = surface_.Enabled();
    const Qt::FocusPolicy container_policy = enabled ? Qt::TabFocus : Qt::NoFocus;
    if (container_.focusPolicy() != container_policy) container_.setFocusPolicy(container_policy);
    if (focus_view_) {
        const Qt::FocusPolicy view_policy = enabled ? Qt::ClickFocus : Qt::NoFocus;
        if (focus_view_->focusPolicy() != view_policy) focus_view_->setFocusPolicy(view_policy);
    }
    for (auto& p : parts_) p.view->sync();
    if (owner_) owner_->site_synced();
}

int QtSite::to_pixels(float twips) const {
    return static_cast<int>(std::lround(static_cast<double>(twips) * container_.logicalDpiX() / 1440.0));
}

float QtSite::to_twips(int pixels) const {
    return static_cast<float>(static_cast<double>(pixels) * 1440.0 / container_.logicalDpiX());
}

}  // namespace kel::qt
