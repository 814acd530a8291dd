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
#include "keltext/widgetmodel/keyboard.h"
#include "keltext/widgetmodel/part.h"

namespace kel::mini {

// The form hands out the models' parts and takes their keystrokes.
using model::Keystroke;
using model::Part;

class HostedControl;
class FormImpl;

// Misuse of the form by its driver (a keystroke with nothing focused, an unknown part,
// a duplicate name): not a run-time error of a control. Script players report it as a
// script error.
class FormError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// What the form tells whoever drives it. All calls come while the form handles a call of
// the driver's, on the same thread.
class FormObserver {
public:
    virtual ~FormObserver() = default;
    // A control raised one of its events. Runs the form's code: it may change `args`.
    virtual void event_raised(HostedControl& /*control*/, int /*number*/, std::string_view /*event*/,
                              std::span<EventArg> /*args*/) {}
    // A control queued synthetic keystrokes.
    virtual void keys_sent(HostedControl& /*control*/, std::string_view /*keys*/) {}
    // A control told its container that a property changed (the name as the control gave it).
    virtual void property_changed(HostedControl& /*control*/, std::string_view /*property*/) {}
    // A run-time error that a handler passed to the host while handling a notification;
    // `where` is "NAME.part.Notification" (part "surface" for focus and resize handling).
    virtual void handler_error(std::string_view /*where*/, int /*number*/) {}
    // `focus NAME` named a control that cannot take focus.
    virtual void focus_refused(HostedControl& /*control*/) {}
};

// A stored property: key as written, value as stored.
using StoredValues = std::vector<std::pair<std::string, Variant>>;

// One control (or property page) on the form, with its site, surface and parts.
class HostedControl {
public:
    virtual ~HostedControl() = default;
    virtual const std::string& name() const = 0;
    virtual const ClassInfo& info() const = 0;
    virtual Control& control() = 0;
    virtual Dispatch& dispatch() = 0;  // late-bound members through the class table
    // Parts by name, without regard to case: the constituents, "surface", and for a page
    // also "page" (member Changed). Null when there is no such part.
    virtual Part* part(std::string_view name) = 0;
    // Constituents in creation order (not the surface), with their names as created.
    virtual std::vector<std::pair<std::string, Part*>> parts() = 0;
    virtual Part& surface_part() = 0;
    // The edit field that takes this control's keystrokes, or null.
    virtual Part* keyboard_part() = 0;
    virtual bool can_take_focus() const = 0;  // surface enabled (and not a page)
};

class Form {
public:
    explicit Form(FormObserver* observer = nullptr);
    ~Form();
    Form(const Form&) = delete;
    Form& operator=(const Form&) = delete;

    void set_observer(FormObserver* observer);

    // Ambient UserMode: true while the form runs (the default), false at design time.
    void set_user_mode(bool running);
    bool user_mode() const;

    // `new`: Initialize, InitProperties, then one Resize. The surface starts at the size
    // given without a Resize. Names must be unique (FormError).
    HostedControl& create(const ClassInfo& cls, std::string name, float width = 1200, float height = 300);
    // `load`: Initialize, ReadProperties from a store holding exactly `store`, then Resize.
    HostedControl& load(const ClassInfo& cls, std::string name, const StoredValues& store, float width = 1200,
                        float height = 300);
    // WriteProperties into an empty store; the values stored, in order.
    StoredValues save(HostedControl& control);

    HostedControl* find(std::string_view name);
    // Room for `more` controls beyond those on the form, for a driver that loads many at once.
    void reserve(std::size_t more);
    std::vector<HostedControl*> controls();  // tab order: order of creation, pages excluded

    // Opens a property page on the selected controls (item 0 first) and runs SelectionChanged.
    HostedControl& open_page(const ClassInfo& page_class, std::string name, std::vector<HostedControl*> selected);
    void apply_page(HostedControl& page);  // ApplyChanges

    // Focus. focus(nullptr) moves focus off every control.
    HostedControl* focused();
    enum class FocusResult { moved, unchanged, refused };
    FocusResult focus(HostedControl* target);
    // The form's Tab and Shift+Tab: next or previous control that can take focus, wrapping.
    void tab(bool forward);

    // Input to the focused control's edit field (FormError when no control has focus).
    // Each call delivers the synthetic keystrokes queued meanwhile before it returns.
    void keystroke(const Keystroke& k);  // key down, key press where it makes a character, key up
    // Types a text (Windows-1252) as a person would, one keystroke a character.
    void type(std::string_view text);
    void key_down(int16_t key_code, int16_t shift);
    void key_up(int16_t key_code, int16_t shift);
    void key_press(int16_t char_code);
    void paste(std::string_view text);
    // The person sets the caret and selection of the control's edit field.
    void select(HostedControl& control, int32_t start, int32_t length);

    // Insert key toggle state (key state 1 when on, 0 when off).
    void set_insert(bool on);
    bool insert_on() const;

    // Clicks and notifications on a part; focus does not move. Not delivered to a disabled
    // surface or widget. FormError for a notification the part does not raise.
    void click(HostedControl& control, Part& part);
    void dbl_click(HostedControl& control, Part& part);
    void notify(HostedControl& control, Part& part, std::string_view notification);
    void mouse(HostedControl& control, Part& part, bool down, int16_t button, int16_t shift, float x, float y);

    // The form resizes a control's surface (Resize when the size changes).
    void resize(HostedControl& control, float width, float height);

    // Delivers queued synthetic keystrokes, and those they queue, in order.
    void run_pending();

private:
    std::unique_ptr<FormImpl> impl_;
};

}  // namespace kel::mini
