#include "keltext/minihost/site.h"

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/widgetmodel/buttons.h"
#include "keltext/widgetmodel/edit_box.h"
#include "keltext/widgetmodel/list_widgets.h"
#include "keltext/widgetmodel/masked_edit.h"

namespace kel::mini {

MiniSite::MiniSite(FormServices& form, const ClassInfo& cls, std::string name, float width, float height,
                   std::optional<std::vector<HostedControl*>> selected)
    : form_(form),
      info_(cls),
      name_(std::move(name)),
      surface_(form.next_handle(), width, height, [this] { raise_resize(); }) {
    if (selected) page_ = std::make_unique<PagePart>(std::move(*selected));
}

MiniSite::~MiniSite() {
    bound_.reset();
    control_.reset();
}

void MiniSite::attach(std::unique_ptr<Control> control) {
    control_ = std::move(control);
    bound_ = std::make_unique<BoundControl>(*control_, info_);
}

Control& MiniSite::control() {
    if (!control_) throw FormError("control " + name_ + " is not built");
    return *control_;
}

Dispatch& MiniSite::dispatch() {
    if (!bound_) throw FormError("control " + name_ + " is not built");
    return *bound_;
}

void MiniSite::raise_resize() {
    if (control_) guarded("surface", "Resize", [&] { control_->Resize(); });
}

void MiniSite::property_changed(std::string_view name) {
    if (auto* o = form_.observer()) o->property_changed(*this, name);
}

void MiniSite::raise_event(int number, std::string_view name, std::span<EventArg> args) {
    FormObserver* o = form_.observer();
    if (!o) return;
    // The form's code may set properties that raise events again: without end, the chain is
    // cut as deep nesting of widget handlers is.
    try {
        if (!enter_handler()) throw model::HandlerOverflow{};
        struct Leave {
            MiniSite& site;
            ~Leave() { site.leave_handler(); }
        } leave{*this};
        std::vector<Variant> given;
        given.reserve(args.size());
        for (const auto& a : args) given.push_back(a.value);
        o->event_raised(*this, number, name, args);
        for (std::size_t i = 0; i < args.size(); ++i)
            if (!(args[i].value == given[i])) args[i].value = coerce_like(args[i].value, given[i]);
    } catch (model::HandlerOverflow& overflow) {
        // Only the outermost handler reports; an event raised by the form's driver itself (not
        // from a widget's notification) is the control's own, on its surface.
        if (handlers_running()) throw;
        handler_overflow(overflow.where.empty() ? handler_where("surface", name) : overflow.where);
    }
}

void MiniSite::handler_error(std::string_view part, std::string_view notification, int number) {
    if (auto* o = form_.observer()) o->handler_error(handler_where(part, notification), number);
}

void MiniSite::handler_overflow(std::string_view where) {
    if (auto* o = form_.observer()) o->handler_error(where, model::kOutOfStackSpace);
}

std::string MiniSite::handler_where(std::string_view part, std::string_view notification) const {
    return name_ + "." + std::string(part) + "." + std::string(notification);
}

bool MiniSite::enter_handler() {
    if (form_.handler_depth() >= kMaxHandlerDepth) return false;
    ++form_.handler_depth();
    return true;
}

template <class W>
W& MiniSite::add_part(std::string_view name) {
    auto w = std::make_unique<W>(*this, std::string(name), form_.next_handle(), surface_.Width(), surface_.Height());
    W& ref = *w;
    if (!keyboard_part_ && ref.is_edit_field()) keyboard_part_ = &ref;
    parts_.emplace_back(std::string(name), std::move(w));
    return ref;
}

EditBox& MiniSite::create_edit_box(std::string_view name) { return add_part<model::EditBoxModel>(name); }
ComboBox& MiniSite::create_combo_box(std::string_view name) { return add_part<model::ComboBoxModel>(name); }
MaskedEdit& MiniSite::create_masked_edit(std::string_view name) { return add_part<model::MaskedEditModel>(name); }
SpinButton& MiniSite::create_spin_button(std::string_view name) { return add_part<model::SpinButtonModel>(name); }
Image& MiniSite::create_image(std::string_view name) { return add_part<model::ImageModel>(name); }
ListBox& MiniSite::create_list_box(std::string_view name) { return add_part<model::ListBoxModel>(name); }
CheckBox& MiniSite::create_check_box(std::string_view name) { return add_part<model::CheckBoxModel>(name); }
PushButton& MiniSite::create_push_button(std::string_view name) { return add_part<model::PushButtonModel>(name); }
Label& MiniSite::create_label(std::string_view name) { return add_part<model::LabelModel>(name); }
Frame& MiniSite::create_frame(std::string_view name) { return add_part<model::FrameModel>(name); }

Part* MiniSite::part(std::string_view name) {
    if (same_name(name, "surface")) return &surface_;
    if (page_ && same_name(name, "page")) return page_.get();
    for (auto& [n, p] : parts_)
        if (same_name(n, name)) return p.get();
    return nullptr;
}

std::vector<std::pair<std::string, Part*>> MiniSite::parts() {
    std::vector<std::pair<std::string, Part*>> out;
    out.reserve(parts_.size());
    for (auto& [n, p] : parts_) out.emplace_back(n, p.get());
    return out;
}

InputPart* MiniSite::input_part(Part* p) {
    for (auto& [n, q] : parts_)
        if (q.get() == p) return q.get();
    return nullptr;
}

}  // namespace kel::mini
