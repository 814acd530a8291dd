#pragma once
// One control on the minimal host's form: its site (what the control sees of its container),
// its surface and constituents, and the hosted-control view the form's driver uses.
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "keltext/host/container.h"
#include "keltext/host/members.h"
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/surface.h"
#include "keltext/widgetmodel/widget_base.h"

namespace kel::mini {

using model::InputPart;
using model::SurfaceModel;
using model::WidgetContext;

// What a site needs of its form.
class FormServices {
public:
    virtual ~FormServices() = default;
    virtual bool user_mode() const = 0;
    virtual FormObserver* observer() = 0;
    virtual int32_t next_handle() = 0;  // a distinct positive window handle
    virtual void queue_keys(HostedControl& from, std::string_view keys) = 0;
    virtual int16_t key_state(int16_t virtual_key) const = 0;
    // How deep handlers run inside one another, over the whole form.
    virtual int& handler_depth() = 0;
    virtual bool delivering_sent_keys() const = 0;
    virtual model::Clipboard& clipboard() = 0;
};

// The part "page" of a property page: its Changed flag, and the design-time services.
class PagePart final : public Part, public PageServices {
public:
    explicit PagePart(std::vector<HostedControl*> selected) : selected_(std::move(selected)) {}

    std::size_t selected_count() const override { return selected_.size(); }
    Dispatch& selected_control(std::size_t i) override;  // 381 past the end
    bool Changed() const override { return changed_; }
    void Changed(bool v) override { changed_ = v; }

    std::string_view widget_type() const override { return "Page"; }
    std::vector<std::string> members() const override { return {"Changed"}; }
    std::vector<std::string> notifications() const override { return {}; }
    Variant peek(std::string_view member, std::optional<int32_t> index = std::nullopt) const override;
    void poke(std::string_view member, const Variant& value, std::optional<int32_t> index = std::nullopt) override;

private:
    std::vector<HostedControl*> selected_;
    bool changed_ = false;
};

class MiniSite final : public Site, public HostedControl, public WidgetContext, private Keyboard {
public:
    // `selected` is given for a property page (and makes the site a page site).
    MiniSite(FormServices& form, const ClassInfo& cls, std::string name, float width, float height,
             std::optional<std::vector<HostedControl*>> selected = std::nullopt);
    ~MiniSite() override;

    // Takes the control built on this site; its Resize is raised from then on.
    void attach(std::unique_ptr<Control> control);

    // Site
    bool user_mode() const override { return form_.user_mode(); }
    void property_changed(std::string_view name) override;
    void raise_event(int number, std::string_view name, std::span<EventArg> args) override;
    Surface& surface() override { return surface_; }
    Keyboard& keyboard() override { return *this; }
    PageServices* page_services() override { return page_.get(); }
    EditBox& create_edit_box(std::string_view name) override;
    ComboBox& create_combo_box(std::string_view name) override;
    MaskedEdit& create_masked_edit(std::string_view name) override;
    SpinButton& create_spin_button(std::string_view name) override;
    Image& create_image(std::string_view name) override;
    ListBox& create_list_box(std::string_view name) override;
    CheckBox& create_check_box(std::string_view name) override;
    PushButton& create_push_button(std::string_view name) override;
    Label& create_label(std::string_view name) override;
    Frame& create_frame(std::string_view name) override;

    // HostedControl
    const std::string& name() const override { return name_; }
    const ClassInfo& info() const override { return info_; }
    Control& control() override;
    Dispatch& dispatch() override;
    Part* part(std::string_view name) override;
    std::vector<std::pair<std::string, Part*>> parts() override;
    Part& surface_part() override { return surface_; }
    Part* keyboard_part() override { return keyboard_part_; }
    bool can_take_focus() const override { return !page_ && surface_.Enabled(); }

    // WidgetContext
    model::Clipboard* clipboard() override { return &form_.clipboard(); }
    void handler_error(std::string_view part, std::string_view notification, int number) override;
    bool enter_handler() override;
    void leave_handler() override { --form_.handler_depth(); }
    bool handlers_running() const override { return form_.handler_depth() > 0; }
    void handler_overflow(std::string_view where) override;
    std::string handler_where(std::string_view part, std::string_view notification) const override;
    static constexpr int kMaxHandlerDepth = 100;

    // For the form.
    const FormServices& form() const { return form_; }
    std::size_t place() const { return place_; }  // in creation order, from 0
    void set_place(std::size_t place) { place_ = place; }
    bool is_page() const { return page_ != nullptr; }
    SurfaceModel& mini_surface() { return surface_; }
    PagePart* page_part() { return page_.get(); }
    InputPart* keyboard_input() { return keyboard_part_; }
    // The constituent `p` is, or null when it is not one of this control's.
    InputPart* input_part(Part* p);
    // Runs one of the control's own handlers for the form; a run-time error it passes back is
    // reported as "NAME.part.notification" and the form goes on.
    template <class F>
    void guarded(std::string_view part, std::string_view notification, F&& f) {
        run_handler(*this, part, notification, std::forward<F>(f));
    }
    void raise_resize();

private:
    // Keyboard
    void send_keys(std::string_view keys) override { form_.queue_keys(*this, keys); }
    int16_t key_state(int16_t virtual_key) override { return form_.key_state(virtual_key); }
    void process_pending() override {}  // every notification is delivered at once: nothing waits
    bool delivering_sent_keys() const override { return form_.delivering_sent_keys(); }

    template <class W>
    W& add_part(std::string_view name);

    FormServices& form_;
    const ClassInfo& info_;
    std::string name_;
    SurfaceModel surface_;
    std::unique_ptr<PagePart> page_;
    std::vector<std::pair<std::string, std::unique_ptr<InputPart>>> parts_;
    InputPart* keyboard_part_ = nullptr;
    std::size_t place_ = 0;
    // Declared last, destroyed first: the control lets go of its constituents before they go.
    std::unique_ptr<Control> control_;
    std::unique_ptr<BoundControl> bound_;
};

}  // namespace kel::mini
