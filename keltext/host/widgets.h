#pragma once
// The standard widgets a control wraps (its constituents), with exactly the members and
// notifications the controls use. A widget reports its notifications to the handlers its
// owner installs; by-reference arguments come back as the handler left them.
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "keltext/host/font.h"

namespace kel {

using Notify = std::function<void()>;
using KeyNotify = std::function<void(int16_t& key_code, int16_t& shift)>;
using KeyPressNotify = std::function<void(int16_t& key_ascii)>;
using MouseNotify = std::function<void(int16_t& button, int16_t& shift, float& x, float& y)>;

// Every notification any widget raises; each widget raises the ones its interface lists.
// An empty handler means the owner does not listen.
struct WidgetEvents {
    Notify change, click, dbl_click, drop_down, scroll, got_focus, lost_focus;
    Notify up_click, down_click;  // spin buttons
    KeyNotify key_down, key_up;
    KeyPressNotify key_press;
    MouseNotify mouse_down, mouse_up, mouse_move;
};

class Widget {
public:
    virtual ~Widget() = default;
    virtual void set_events(WidgetEvents events) = 0;
    virtual int32_t hWnd() const = 0;
    virtual bool Enabled() const = 0;
    virtual void Enabled(bool v) = 0;
    virtual bool Visible() const = 0;
    virtual void Visible(bool v) = 0;
    virtual float Left() const = 0;
    virtual void Left(float v) = 0;
    virtual float Top() const = 0;
    virtual void Top(float v) = 0;
    virtual float Width() const = 0;
    virtual void Width(float v) = 0;
    virtual float Height() const = 0;
    virtual void Height(float v) = 0;
};

// A widget that shows text in a font and colours.
class TextWidget : public Widget {
public:
    virtual Colour ForeColor() const = 0;
    virtual void ForeColor(Colour c) = 0;
    virtual Colour BackColor() const = 0;
    virtual void BackColor(Colour c) = 0;
    virtual std::shared_ptr<kel::Font> Font() const = 0;
    virtual void Font(std::shared_ptr<kel::Font> f) = 0;  // by reference: the object is shared
    virtual double FontSize() const = 0;                 // points
};

// Text with a caret and a selection: the edit box, the combo's edit field, the masked box.
// Positions count characters (bytes); SelStart and SelLength below 0 are error 380.
class EditField : public TextWidget {
public:
    virtual std::string Text() const = 0;
    virtual void Text(const std::string& t) = 0;  // raises change at once (when different)
    virtual int32_t SelStart() const = 0;
    virtual void SelStart(int32_t v) = 0;
    virtual int32_t SelLength() const = 0;
    virtual void SelLength(int32_t v) = 0;
    virtual std::string SelText() const = 0;
};

// Single-line edit box. Notifications: change, key_down, key_press, key_up, click, dbl_click,
// got_focus, lost_focus, mouse_down, mouse_up.
class EditBox : public EditField {
public:
    virtual int32_t MaxLength() const = 0;  // 0 = no limit
    virtual void MaxLength(int32_t v) = 0;  // negative: error 380, limit kept
};

// The list part shared by the combo box and the list box. Index errors are 381.
class ListWidget {
public:
    virtual ~ListWidget() = default;
    virtual void AddItem(const std::string& item, std::optional<int32_t> index = std::nullopt) = 0;
    virtual void RemoveItem(int32_t index) = 0;
    virtual void Clear() = 0;
    virtual std::string List(int32_t index) const = 0;
    virtual void List(int32_t index, const std::string& text) = 0;
    virtual int32_t ItemData(int32_t index) const = 0;
    virtual void ItemData(int32_t index, int32_t value) = 0;
    virtual int32_t ListIndex() const = 0;
    virtual void ListIndex(int32_t index) = 0;  // -1 selects nothing; raises click
    virtual int32_t ListCount() const = 0;
    virtual int32_t NewIndex() const = 0;
    // The text of entry `index` as a view, valid until the list or `scratch` changes: lets a
    // search read the whole list without a copy per entry. A list that keeps its texts
    // returns a view of its own; this default copies into `scratch`. Index errors are 381.
    virtual std::string_view list_text(int32_t index, std::string& scratch) const {
        scratch = List(index);
        return scratch;
    }
};

// Drop-down combo box. Notifications: change, click, dbl_click, drop_down, got_focus,
// key_down, key_press, key_up, scroll.
class ComboBox : public EditField, public ListWidget {
public:
    virtual int16_t Style() const = 0;  // 0 drop-down combo, 2 drop-down list
    virtual bool Sorted() const = 0;
};

// Masked edit box. Notifications: key_down, key_press, key_up, change, got_focus, lost_focus.
// Text can be set only while the mask is empty.
class MaskedEdit : public EditField {
public:
    virtual std::string Mask() const = 0;
    virtual void Mask(const std::string& mask) = 0;
};

// Spin button pair, used as two buttons. Notifications: up_click, down_click.
class SpinButton : public Widget {};

// Image. Notification: click.
class Image : public Widget {};

// List box, unsorted. Notifications: click, got_focus, scroll.
class ListBox : public Widget, public ListWidget {};

// Check box. Notification: click.
class CheckBox : public Widget {
public:
    virtual int16_t Value() const = 0;  // 0 unchecked, 1 checked
    virtual void Value(int16_t v) = 0;
    virtual std::string Caption() const = 0;
    virtual void Caption(const std::string& c) = 0;
};

// Push button, label and frame: a caption. Notification: click (labels also change).
class CaptionWidget : public Widget {
public:
    virtual std::string Caption() const = 0;
    virtual void Caption(const std::string& c) = 0;
};
class PushButton : public CaptionWidget {};
class Label : public CaptionWidget {};
class Frame : public CaptionWidget {};

}  // namespace kel
