#pragma once
// One control in a Qt application: its site (what the control sees of its container), the
// widget models of its surface and constituents, and a Qt view over each model. The models
// hold every rule; the views show them and hand Qt's input to the services. Twips are the
// truth: pixels are computed at the container's logical DPI for display only, and never fed
// back into the models except when Qt itself resizes the control (a layout).
//
// Internal API for a form driver: QtSite is a model::HostedControl (name, info, control,
// dispatch, part, parts, surface_part, keyboard_part, can_take_focus), and
//   - view_of(part): the Qt widget showing a part (the container for the surface);
//   - focus_view(): the widget that takes the control's keystrokes (send Qt key events here);
//   - container(): the control's own QWidget (a ControlWidget);
//   - sync_views(): brings the views in line with the models.
#include <QPointer>
#include <QWidget>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "keltext/host/container.h"
#include "keltext/host/members.h"
#include "keltext/widgetmodel/hosted.h"
#include "keltext/widgetmodel/surface.h"
#include "keltext/widgetmodel/widget_base.h"

namespace kel::qt {

class Services;

// A Qt view over one part's model.
class PartView {
public:
    virtual ~PartView() = default;
    virtual QWidget* widget() = 0;
    // Shows what the model holds now (text, caret, list, caption, geometry).
    virtual void sync() = 0;
};

// What the control's own QWidget hears from its site: the wrappers turn events into signals.
class SiteOwner {
public:
    virtual ~SiteOwner() = default;
    // An event with its by-reference arguments, before the driver's form code sees it.
    virtual void site_event(int number, std::string_view name, std::span<EventArg> args) = 0;
    virtual void site_property_changed(std::string_view name) = 0;
    // The views were brought in line with the models: the surface shows its size and colours.
    virtual void site_synced() = 0;
};

class QtSite final : public Site, public model::HostedControl, public model::WidgetContext, private Keyboard {
public:
    QtSite(Services& services, const ClassInfo& cls, std::string name, QWidget& container, SiteOwner* owner,
           float width, float height);
    ~QtSite() override;
    QtSite(const QtSite&) = delete;
    QtSite& operator=(const QtSite&) = delete;

    // Takes the control built on this site; its Resize is raised from then on.
    void attach(std::unique_ptr<Control> control);

    // Site
    bool user_mode() const override;
    void property_changed(std::string_view name) override;
    void raise_event(int number, std::string_view name, std::span<EventArg> args) override;
    Surface& surface() override { return surface_; }
    Keyboard& keyboard() override { return *this; }
    PageServices* page_services() override { return nullptr; }
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
    model::Part* part(std::string_view name) override;
    std::vector<std::pair<std::string, model::Part*>> parts() override;
    model::Part& surface_part() override { return surface_; }
    model::Part* keyboard_part() override { return keyboard_part_; }
    bool can_take_focus() const override { return surface_.Enabled(); }

    // WidgetContext
    model::Clipboard* clipboard() override;
    void handler_error(std::string_view part, std::string_view notification, int number) override;
    bool enter_handler() override;
    void leave_handler() override;
    bool handlers_running() const override;
    void handler_overflow(std::string_view where) override;
    std::string handler_where(std::string_view part, std::string_view notification) const override;
    static constexpr int kMaxHandlerDepth = 100;

    // For the host.
    Services& services() { return services_; }
    QWidget& container() { return container_; }
    QWidget* view_of(const model::Part& part);
    QWidget* focus_view() { return focus_view_; }
    // The text the Qt view of an edit-field part shows (Windows-1252), to check against its
    // model; nothing for a part without a text view.
    std::optional<std::string> shown_text(const model::Part& part);
    model::SurfaceModel& surface_model() { return surface_; }
    const model::SurfaceModel& surface_model() const { return surface_; }
    model::InputPart* keyboard_input() { return keyboard_part_; }
    model::InputPart* input_part(model::Part* p);
    // The part whose view is `w`, or null.
    model::InputPart* part_of_view(const QWidget* w);
    // Whether input reaches the keyboard part now: the surface and the widget enabled.
    model::InputPart* input_target();
    bool has_control() const { return control_ != nullptr; }

    void sync_views();
    int to_pixels(float twips) const;
    float to_twips(int pixels) const;

    template <class F>
    void guarded(std::string_view part, std::string_view notification, F&& f) {
        model::run_handler(*this, part, notification, std::forward<F>(f));
    }
    void raise_resize();

private:
    // Keyboard
    void send_keys(std::string_view keys) override;
    int16_t key_state(int16_t virtual_key) override;
    // Every notification is delivered at once, as on the minimal host: nothing waits, and Qt's
    // event loop is never pumped from inside a control (it would re-enter layout).
    void process_pending() override {}
    bool delivering_sent_keys() const override;

    template <class Model, class View>
    Model& add_part(std::string_view name);

    struct PartEntry {
        std::string name;
        std::unique_ptr<model::InputPart> model;
        PartView* view = nullptr;  // owned by the container (a Qt child)
    };

    Services& services_;
    const ClassInfo& info_;
    std::string name_;
    QWidget& container_;
    SiteOwner* owner_;
    model::SurfaceModel surface_;
    std::vector<PartEntry> parts_;
    model::InputPart* keyboard_part_ = nullptr;
    QWidget* focus_view_ = nullptr;
    // Declared last, destroyed first: the control lets go of its constituents before they go.
    std::unique_ptr<Control> control_;
    std::unique_ptr<BoundControl> bound_;
};

}  // namespace kel::qt
