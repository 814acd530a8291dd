#pragma once
// The script player's form on the Qt host: the controls are real Qt widgets in one window,
// and the person's input reaches them as Qt events (QTest) to the widget that has focus, so
// that a script proves the Qt views route input to the models as the minimal host delivers
// it. Reads check that every edit field's view shows what its model holds.
//
// What has no faithful Qt event goes to the models directly, as the minimal host delivers
// it (each such call says why): a lone key down, key press or key up, a paste, a selection
// set by the script, clicks on edit fields, mouse buttons at twip positions. Property pages
// are Qt page widgets of their own beside the window (not focusable, as on the minimal host):
// clicks on their buttons are real clicks.
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/qt/form_window.h"
#include "keltext/qt/page_view.h"
#include "keltext/widgetmodel/hosted.h"

namespace kel::kelform {

class QtFormDriver final : public model::FormDriver {
public:
    explicit QtFormDriver(model::FormObserver* observer);
    ~QtFormDriver() override;

    void set_observer(model::FormObserver* observer) override;
    void set_user_mode(bool running) override;
    bool user_mode() const override;
    model::HostedControl& create(const ClassInfo& cls, std::string name, float width = 1200,
                                 float height = 300) override;
    model::HostedControl& load(const ClassInfo& cls, std::string name, const model::StoredValues& store,
                               float width = 1200, float height = 300) override;
    model::StoredValues save(model::HostedControl& control) override;
    model::HostedControl* find(std::string_view name) override;
    void reserve(std::size_t more) override;
    std::vector<model::HostedControl*> controls() override;
    model::HostedControl& open_page(const ClassInfo& page_class, std::string name,
                                    std::vector<model::HostedControl*> selected) override;
    void apply_page(model::HostedControl& page) override;
    model::HostedControl* focused() override;
    FocusResult focus(model::HostedControl* target) override;
    void tab(bool forward) override;
    void keystroke(const model::Keystroke& k) override;
    void type(std::string_view text) override;
    void key_down(int16_t key_code, int16_t shift) override;
    void key_up(int16_t key_code, int16_t shift) override;
    void key_press(int16_t char_code) override;
    void paste(std::string_view text) override;
    void select(model::HostedControl& control, int32_t start, int32_t length) override;
    void set_insert(bool on) override;
    bool insert_on() const override;
    void set_clipboard(std::string_view text) override;
    std::string clipboard() const override;
    void click(model::HostedControl& control, model::Part& part) override;
    void dbl_click(model::HostedControl& control, model::Part& part) override;
    void notify(model::HostedControl& control, model::Part& part, std::string_view notification) override;
    void mouse(model::HostedControl& control, model::Part& part, bool down, int16_t button, int16_t shift, float x,
               float y) override;
    void resize(model::HostedControl& control, float width, float height) override;
    void run_pending() override;
    void members_changed() override;
    void check_views(model::HostedControl& control) override;

    // The window the controls stand in (a desktop form lays them out and adds its labels).
    qt::FormWindow& form_window() { return window_; }

private:
    bool is_page(model::HostedControl& control);
    qt::PageWidget* page_of(model::HostedControl& control);
    // The site of a control of the window or of an open page.
    qt::QtSite& any_site(model::HostedControl& control);
    qt::QtSite& focused_site();
    void check_name_free(const std::string& name);
    // The input part of `part` that may take `notification`, as the minimal host checks it.
    model::InputPart& deliverable(qt::QtSite& site, model::Part& part, std::string_view notification);
    bool takes_input(qt::QtSite& site, model::InputPart& p);

    qt::FormWindow window_;
    // Property pages, on controls of the window; declared last, they go first.
    std::vector<std::unique_ptr<qt::PageWidget>> pages_;
};

}  // namespace kel::kelform
