#pragma once
// What drives a form, whichever host shows it: the controls on it as the driver sees them,
// what the form tells its driver, and the driving calls themselves. The script player runs
// the same scripts through any host that implements FormDriver.
#include <cstddef>
#include <cstdint>
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

namespace kel::model {

class HostedControl;

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

class FormDriver {
public:
    virtual ~FormDriver() = default;

    virtual void set_observer(FormObserver* observer) = 0;

    // Ambient UserMode: true while the form runs (the default), false at design time.
    virtual void set_user_mode(bool running) = 0;
    virtual bool user_mode() const = 0;

    // `new`: Initialize, InitProperties, then one Resize. The surface starts at the size
    // given without a Resize. Names must be unique (FormError).
    virtual HostedControl& create(const ClassInfo& cls, std::string name, float width = 1200,
                                  float height = 300) = 0;
    // `load`: Initialize, ReadProperties from a store holding exactly `store`, then Resize.
    virtual HostedControl& load(const ClassInfo& cls, std::string name, const StoredValues& store,
                                float width = 1200, float height = 300) = 0;
    // WriteProperties into an empty store; the values stored, in order.
    virtual StoredValues save(HostedControl& control) = 0;

    virtual HostedControl* find(std::string_view name) = 0;
    // Room for `more` controls beyond those on the form, for a driver that loads many at once.
    virtual void reserve(std::size_t more) = 0;
    // Tab order: order of creation, pages excluded.
    virtual std::vector<HostedControl*> controls() = 0;

    // Opens a property page on the selected controls (item 0 first) and runs SelectionChanged.
    virtual HostedControl& open_page(const ClassInfo& page_class, std::string name,
                                     std::vector<HostedControl*> selected) = 0;
    virtual void apply_page(HostedControl& page) = 0;  // ApplyChanges

    // Focus. focus(nullptr) moves focus off every control.
    virtual HostedControl* focused() = 0;
    enum class FocusResult { moved, unchanged, refused };
    virtual FocusResult focus(HostedControl* target) = 0;
    // The form's Tab and Shift+Tab: next or previous control that can take focus, wrapping.
    virtual void tab(bool forward) = 0;

    // Input to the focused control's edit field (FormError when no control has focus).
    // Each call delivers the synthetic keystrokes queued meanwhile before it returns.
    // Key down, key press where it makes a character, key up.
    virtual void keystroke(const Keystroke& k) = 0;
    // Types a text (Windows-1252) as a person would, one keystroke a character.
    virtual void type(std::string_view text) = 0;
    virtual void key_down(int16_t key_code, int16_t shift) = 0;
    virtual void key_up(int16_t key_code, int16_t shift) = 0;
    virtual void key_press(int16_t char_code) = 0;
    virtual void paste(std::string_view text) = 0;
    // The person sets the caret and selection of the control's edit field.
    virtual void select(HostedControl& control, int32_t start, int32_t length) = 0;

    // Insert key toggle state (key state 1 when on, 0 when off).
    virtual void set_insert(bool on) = 0;
    virtual bool insert_on() const = 0;

    // The host's clipboard as the widgets see it (Windows-1252 text).
    virtual void set_clipboard(std::string_view text) = 0;
    virtual std::string clipboard() const = 0;

    // Clicks and notifications on a part; focus does not move. Not delivered to a disabled
    // surface or widget. FormError for a notification the part does not raise.
    virtual void click(HostedControl& control, Part& part) = 0;
    virtual void dbl_click(HostedControl& control, Part& part) = 0;
    virtual void notify(HostedControl& control, Part& part, std::string_view notification) = 0;
    virtual void mouse(HostedControl& control, Part& part, bool down, int16_t button, int16_t shift, float x,
                       float y) = 0;

    // The form resizes a control's surface (Resize when the size changes).
    virtual void resize(HostedControl& control, float width, float height) = 0;

    // Delivers queued synthetic keystrokes, and those they queue, in order.
    virtual void run_pending() = 0;

    // For a host that shows the models in views of its own. The driver changed members
    // directly (a property, a part's member, a method): the views catch up with the models.
    virtual void members_changed() {}
    // The views of `control` show what its models hold; FormError naming the difference when
    // they do not.
    virtual void check_views(HostedControl& /*control*/) {}
};

}  // namespace kel::model
