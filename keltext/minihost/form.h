#pragma once
// The minimal host's form: creates controls on their sites, keeps tab order and focus,
// delivers keystrokes, clicks and notifications, queues synthetic keystrokes, loads and saves
// property stores, and opens property pages. kelform (scripts and the terminal UI) and the
// tests drive controls through it.
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "keltext/host/container.h"
#include "keltext/host/members.h"
#include "keltext/host/variant.h"
#include "keltext/widgetmodel/hosted.h"
#include "keltext/widgetmodel/keyboard.h"
#include "keltext/widgetmodel/part.h"

namespace kel::mini {

// The form hands out the models' parts and takes their keystrokes.
using model::Keystroke;
using model::Part;

class FormImpl;

// The driver's view of a form, shared by every host.
using model::FormDriver;
using model::FormError;
using model::FormObserver;
using model::HostedControl;
using model::StoredValues;

class Form final : public FormDriver {
public:
    explicit Form(FormObserver* observer = nullptr);
    ~Form();
    Form(const Form&) = delete;
    Form& operator=(const Form&) = delete;

    void set_observer(FormObserver* observer) override;
    void set_user_mode(bool running) override;
    bool user_mode() const override;
    HostedControl& create(const ClassInfo& cls, std::string name, float width = 1200, float height = 300) override;
    HostedControl& load(const ClassInfo& cls, std::string name, const StoredValues& store, float width = 1200,
                        float height = 300) override;
    StoredValues save(HostedControl& control) override;
    HostedControl* find(std::string_view name) override;
    void reserve(std::size_t more) override;
    std::vector<HostedControl*> controls() override;
    HostedControl& open_page(const ClassInfo& page_class, std::string name,
                             std::vector<HostedControl*> selected) override;
    void apply_page(HostedControl& page) override;
    HostedControl* focused() override;
    FocusResult focus(HostedControl* target) override;
    void tab(bool forward) override;
    void keystroke(const Keystroke& k) override;
    void type(std::string_view text) override;
    void key_down(int16_t key_code, int16_t shift) override;
    void key_up(int16_t key_code, int16_t shift) override;
    void key_press(int16_t char_code) override;
    void paste(std::string_view text) override;
    void select(HostedControl& control, int32_t start, int32_t length) override;
    void set_insert(bool on) override;
    bool insert_on() const override;
    void set_clipboard(std::string_view text) override;
    std::string clipboard() const override;
    void click(HostedControl& control, Part& part) override;
    void dbl_click(HostedControl& control, Part& part) override;
    void notify(HostedControl& control, Part& part, std::string_view notification) override;
    void mouse(HostedControl& control, Part& part, bool down, int16_t button, int16_t shift, float x,
               float y) override;
    void resize(HostedControl& control, float width, float height) override;
    void run_pending() override;

private:
    std::unique_ptr<FormImpl> impl_;
};

}  // namespace kel::mini
