#pragma once
// What a control asks of its container, of the keyboard services beside it, and what the
// container calls on a control. The controls are written against these interfaces only.
#include <array>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "keltext/host/conversions.h"
#include "keltext/host/font.h"
#include "keltext/host/variant.h"
#include "keltext/host/widgets.h"

namespace kel {

// Named values handed to a control while a form is loaded or saved. Keys match without
// regard to case.
class PropertyBag {
public:
    virtual ~PropertyBag() = default;
    // The stored value, or `default_value` when the key is absent.
    virtual Variant read(std::string_view key, const Variant& default_value) = 0;
    // Stores the value unless it equals the default (an empty default with a font: always).
    virtual void write(std::string_view key, const Variant& value, const Variant& default_value) = 0;
};

// The control's own surface.
class Surface {
public:
    virtual ~Surface() = default;
    virtual float Width() const = 0;
    virtual void Width(float v) = 0;   // a new value raises the control's Resize at once
    virtual float Height() const = 0;
    virtual void Height(float v) = 0;
    virtual bool Enabled() const = 0;
    virtual void Enabled(bool v) = 0;  // a disabled surface takes no focus and no input
    virtual Colour BackColor() const = 0;
    virtual void BackColor(Colour c) = 0;
    virtual Colour ForeColor() const = 0;
    virtual void ForeColor(Colour c) = 0;
    virtual int16_t BorderStyle() const = 0;
    virtual void BorderStyle(int16_t v) = 0;  // 0 plain, 1 fixed single; anything else error 380
    virtual std::shared_ptr<kel::Font> Font() const = 0;
    virtual void Font(std::shared_ptr<kel::Font> f) = 0;
    virtual int32_t hWnd() const = 0;
    virtual void Refresh() = 0;
};

class Keyboard {
public:
    virtual ~Keyboard() = default;
    // Queues synthetic keystrokes ("{TAB}", "+{TAB}", "{DEL}", "{END}", "{HOME}", runs of them,
    // plain characters) to the focused window; they arrive after the current handler returns.
    virtual void send_keys(std::string_view keys) = 0;
    // GetKeyState: bit 0 set when toggled on, the sign bit while held down.
    virtual int16_t key_state(int16_t virtual_key) = 0;
    // Lets the container handle pending work before the caller goes on.
    virtual void process_pending() = 0;
    // True while the keystroke being delivered is one that send_keys queued, not the person's.
    virtual bool delivering_sent_keys() const = 0;
};

// One argument of a raised event. Arguments are by reference: the form's handlers may change
// `value`, and the control reads it back (the host keeps the kind the control gave).
struct EventArg {
    std::string_view name;
    Variant value;
};

class Dispatch;

// Design-time services of a property page.
class PageServices {
public:
    virtual ~PageServices() = default;
    virtual std::size_t selected_count() const = 0;
    // Late-bound access to the i-th selected control (item 0 is the one edited).
    virtual Dispatch& selected_control(std::size_t i) = 0;
    virtual bool Changed() const = 0;
    virtual void Changed(bool v) = 0;
};

// The container, as one control sees it.
class Site {
public:
    virtual ~Site() = default;
    virtual bool user_mode() const = 0;  // ambient UserMode: false while the form is designed
    virtual void property_changed(std::string_view name) = 0;
    virtual void raise_event(int number, std::string_view name, std::span<EventArg> args) = 0;
    virtual Surface& surface() = 0;
    virtual Keyboard& keyboard() = 0;
    // Property-page services; null for a control.
    virtual PageServices* page_services() = 0;

    // Constituents, placed by name when the control is built. They live as long as the site.
    // The first edit field a control creates is the one that takes its keystrokes.
    virtual EditBox& create_edit_box(std::string_view name) = 0;
    virtual ComboBox& create_combo_box(std::string_view name) = 0;
    virtual MaskedEdit& create_masked_edit(std::string_view name) = 0;
    virtual SpinButton& create_spin_button(std::string_view name) = 0;
    virtual Image& create_image(std::string_view name) = 0;
    virtual ListBox& create_list_box(std::string_view name) = 0;
    virtual CheckBox& create_check_box(std::string_view name) = 0;
    virtual PushButton& create_push_button(std::string_view name) = 0;
    virtual Label& create_label(std::string_view name) = 0;
    virtual Frame& create_frame(std::string_view name) = 0;
};

// The key events every control raises: the arguments go to the form by reference and are read
// back as the form left them (returned_int16: a value that does not convert leaves them).
inline void raise_key_event(Site& site, int number, std::string_view name, int16_t& key_code, int16_t& shift) {
    std::array<EventArg, 2> args{EventArg{"KeyCode", Variant(key_code)}, EventArg{"Shift", Variant(shift)}};
    site.raise_event(number, name, args);
    key_code = returned_int16(args[0].value, key_code);
    shift = returned_int16(args[1].value, shift);
}

inline void raise_key_press(Site& site, int number, int16_t& key_ascii) {
    std::array<EventArg, 1> args{EventArg{"KeyAscii", Variant(key_ascii)}};
    site.raise_event(number, "KeyPress", args);
    key_ascii = returned_int16(args[0].value, key_ascii);
}

// What the container calls on a control. Construction (on its site) builds the constituents;
// then Initialize, exactly one of InitProperties and ReadProperties, then Resize as needed.
class Control : public Object {
public:
    Control() = default;
    // A control's widgets call back into it through `this`: a copy or a moved-to control would
    // hand the original's callbacks a control that is not theirs.
    Control(const Control&) = delete;
    Control& operator=(const Control&) = delete;
    Control(Control&&) = delete;
    Control& operator=(Control&&) = delete;

    virtual void Initialize() {}
    virtual void InitProperties() {}
    virtual void ReadProperties(PropertyBag&) {}
    virtual void WriteProperties(PropertyBag&) {}
    virtual void Resize() {}
    virtual void EnterFocus() {}
    virtual void ExitFocus() {}
    virtual void GotFocus() {}
    virtual void LostFocus() {}
};

// A property page: loads its fields from the selected controls and writes them back.
class PropertyPage : public Control {
public:
    virtual void SelectionChanged() = 0;
    virtual void ApplyChanges() = 0;
};

}  // namespace kel
