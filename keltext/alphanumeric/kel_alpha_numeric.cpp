#include "keltext/alphanumeric/kel_alpha_numeric.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>
#include <optional>
#include <string>

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/keys.h"

namespace kel {
namespace {

constexpr Colour kDefaultForeColor = 0xC00000;  // dark blue
constexpr Colour kDefaultBackColor = 0xFFEFD0;  // pale blue
constexpr int16_t kDefaultBorderStyle = KelANFixedSingle;
constexpr float kControlHeight = 300;

// A limit as a number: MaxValue and MinValue hold numbers or numeric text, compared by value.
double limit_value(const Variant& v) {
    if (v.is_object() || !numeric_test(v)) return 0;
    return to_double(v);
}

int32_t text_length(const std::string& s) {
    return static_cast<int32_t>(std::min<std::size_t>(s.size(), std::numeric_limits<int32_t>::max()));
}

}  // namespace

KelAlphaNumeric::KelAlphaNumeric(Site& site) : site_(site), TxtCustom(site.create_edit_box("TxtCustom")) {
    // Designed with the surface's font, shared by reference, until the Font property is set.
    if (auto f = site_.surface().Font()) TxtCustom.Font(f);
    WidgetEvents events;
    events.key_down = [this](int16_t& k, int16_t& s) { TxtCustom_KeyDown(k, s); };
    events.key_press = [this](int16_t& k) { TxtCustom_KeyPress(k); };
    events.change = [this] { TxtCustom_Change(); };
    events.key_up = [this](int16_t& k, int16_t& s) { TxtCustom_KeyUp(k, s); };
    events.click = [this] { TxtCustom_Click(); };
    events.dbl_click = [this] { TxtCustom_DblClick(); };
    events.mouse_down = [this](int16_t& b, int16_t& s, float& x, float& y) { TxtCustom_MouseDown(b, s, x, y); };
    events.mouse_up = [this](int16_t& b, int16_t& s, float& x, float& y) { TxtCustom_MouseUp(b, s, x, y); };
    TxtCustom.set_events(std::move(events));
}

// ---- properties ------------------------------------------------------------------------------

KelANTxtType KelAlphaNumeric::TextType() const { return text_type_; }

void KelAlphaNumeric::TextType(KelANTxtType v) {
    text_type_ = v;  // any value: unknown ones filter nothing
    site_.property_changed("TextType");
}

bool KelAlphaNumeric::Locked() const { return locked_; }

void KelAlphaNumeric::Locked(bool v) {
    // Only the surface: the one of Locked and Enabled set last decides whether the control
    // takes focus, while the edit box itself keeps its own enabled state.
    locked_ = v;
    site_.surface().Enabled(!v);
    site_.property_changed("Locked");
}

KelANBorderStyle KelAlphaNumeric::Borderstyle() const {
    return static_cast<KelANBorderStyle>(site_.surface().BorderStyle());
}

void KelAlphaNumeric::Borderstyle(KelANBorderStyle v) {
    site_.surface().BorderStyle(to_int16(static_cast<double>(v)));
    site_.property_changed("BorderStyle");
}

Variant KelAlphaNumeric::Text() const { return Variant(TxtCustom.Text()); }

void KelAlphaNumeric::Text(const Variant& v) {
    // Set unfiltered: code may put anything into the box. An object has no text form.
    if (!v.is_object()) TxtCustom.Text(text_of(v));
    TxtCustom.SelStart(0);
    site_.property_changed("Text");
}

Colour KelAlphaNumeric::BackColor() const { return TxtCustom.BackColor(); }

void KelAlphaNumeric::BackColor(Colour v) {
    TxtCustom.BackColor(v);
    site_.surface().BackColor(v);
    site_.property_changed("BackColor");
}

Colour KelAlphaNumeric::ForeColor() const { return TxtCustom.ForeColor(); }

void KelAlphaNumeric::ForeColor(Colour v) {
    TxtCustom.ForeColor(v);
    site_.property_changed("ForeColor");
}

std::shared_ptr<kel::Font> KelAlphaNumeric::Font() const { return site_.surface().Font(); }

void KelAlphaNumeric::Font(std::shared_ptr<kel::Font> f) {
    if (f) {
        site_.surface().Font(f);
        TxtCustom.Font(f);
    }
    site_.property_changed("Font");
}

Variant KelAlphaNumeric::MaxLength() const { return Variant(TxtCustom.MaxLength()); }

void KelAlphaNumeric::MaxLength(const Variant& v) {
    if (v.is_object() || !numeric_test(v)) return;
    // The number read from the value's text form, whole with halves to even ("2.5" gives 2).
    // A negative or oversized limit is one the edit box refuses: it keeps the old one.
    const double n = round_half_even(v.is_number() ? v.number() : leading_value(text_of(v)));
    if (n >= 0 && n <= std::numeric_limits<int32_t>::max()) TxtCustom.MaxLength(static_cast<int32_t>(n));
    // At design time a short box is sized to hold its limit in a small font.
    if (!site_.user_mode() && TxtCustom.FontSize() < 10 && TxtCustom.MaxLength() < 61)
        site_.surface().Width(static_cast<float>(TxtCustom.MaxLength() * 120 + 80));
    site_.property_changed("MaxLength");
}

Variant KelAlphaNumeric::MaxValue() const { return max_value_; }

void KelAlphaNumeric::MaxValue(const Variant& v) {
    // Kept as given, kind included (the text "250" stays text); anything not numeric is 0.
    max_value_ = (!v.is_object() && numeric_test(v)) ? v : Variant(int16_t{0});
}

Variant KelAlphaNumeric::MinValue() const { return min_value_; }

void KelAlphaNumeric::MinValue(const Variant& v) {
    min_value_ = (!v.is_object() && numeric_test(v)) ? v : Variant(int16_t{0});
}

bool KelAlphaNumeric::Enabled() const { return enabled_; }

void KelAlphaNumeric::Enabled(bool v) {
    enabled_ = v;
    TxtCustom.Enabled(v);
    site_.surface().Enabled(v);
    site_.property_changed("Enabled");
}

void KelAlphaNumeric::Refresh() { site_.surface().Refresh(); }

Variant KelAlphaNumeric::SelStart() const { return Variant(TxtCustom.SelStart()); }

void KelAlphaNumeric::SelStart(const Variant& v) {
    // Text that is not a number is ignored; a number the edit box refuses is the caller's error.
    if (v.is_object() || !numeric_test(v)) return;
    TxtCustom.SelStart(to_int32(v));
}

Variant KelAlphaNumeric::Sellength() const { return Variant(TxtCustom.SelLength()); }

void KelAlphaNumeric::Sellength(const Variant& v) {
    if (v.is_object() || !numeric_test(v)) return;
    TxtCustom.SelLength(to_int32(v));
}

Variant KelAlphaNumeric::SelText() const { return Variant(TxtCustom.SelText()); }

bool KelAlphaNumeric::TextSelect() const { return text_select_; }

void KelAlphaNumeric::TextSelect(bool v) {
    text_select_ = v;
    site_.property_changed("TextSelect");
}

Variant KelAlphaNumeric::hWnd() const { return Variant(site_.surface().hWnd()); }

// ---- lifetime and persistence ------------------------------------------------------------------

void KelAlphaNumeric::Initialize() {
    min_value_ = Variant(int16_t{0});
    max_value_ = Variant(int16_t{0});
}

void KelAlphaNumeric::InitProperties() {
    Surface& surface = site_.surface();
    TxtCustom.ForeColor(kDefaultForeColor);
    surface.BackColor(kDefaultBackColor);
    TxtCustom.BackColor(kDefaultBackColor);
    surface.Enabled(true);
    text_type_ = KelANTitleCase;
    text_select_ = true;
    TxtCustom.MaxLength(0);
    surface.BorderStyle(kDefaultBorderStyle);
    surface.Width(1200);
    surface.Height(250);  // Resize forces 300 at once
    enabled_ = true;
    locked_ = false;
}

void KelAlphaNumeric::ReadProperties(PropertyBag& bag) {
    Surface& surface = site_.surface();
    // Keys are matched without regard to case: forms saved as "Backcolor" load as "BackColor".
    if (auto c = stored_int32(bag.read("Forecolor", Variant(kDefaultForeColor)))) TxtCustom.ForeColor(*c);
    if (auto c = stored_int32(bag.read("BackColor", Variant(kDefaultBackColor)))) surface.BackColor(*c);
    if (auto c = stored_int32(bag.read("BackColor", Variant(kDefaultBackColor)))) TxtCustom.BackColor(*c);
    if (auto f = font_of(bag.read("Font", Variant()))) Font(f);
    if (auto b = stored_int16(bag.read("BorderStyle", Variant(kDefaultBorderStyle))); b && (*b == KelANPlain || *b == KelANFixedSingle))
        surface.BorderStyle(*b);
    if (auto t = stored_int32(bag.read("TextType", Variant(int32_t{KelANTitleCase})))) text_type_ = static_cast<KelANTxtType>(*t);
    if (auto m = stored_int32(bag.read("MaxLength", Variant(int32_t{0}))); m && *m >= 0) TxtCustom.MaxLength(*m);
    if (const Variant t = bag.read("Text", Variant("")); !t.is_object()) TxtCustom.Text(text_of(t));
    if (auto e = stored_bool(bag.read("Enabled", Variant(true)))) Enabled(*e);
    if (auto l = stored_bool(bag.read("Locked", Variant(false)))) Locked(*l);
    if (auto s = stored_bool(bag.read("TextSelect", Variant(true)))) TextSelect(*s);
}

void KelAlphaNumeric::WriteProperties(PropertyBag& bag) {
    const Surface& surface = site_.surface();
    bag.write("BorderStyle", Variant(surface.BorderStyle()), Variant(kDefaultBorderStyle));
    bag.write("TextType", Variant(int32_t{text_type_}), Variant(int32_t{KelANTitleCase}));
    bag.write("Forecolor", Variant(TxtCustom.ForeColor()), Variant(kDefaultForeColor));
    bag.write("Backcolor", Variant(TxtCustom.BackColor()), Variant(kDefaultBackColor));
    if (auto f = Font()) bag.write("Font", Variant(f), Variant());
    bag.write("MaxLength", Variant(TxtCustom.MaxLength()), Variant(int32_t{0}));
    bag.write("Text", Variant(TxtCustom.Text()), Variant(""));
    bag.write("Locked", Variant(locked_), Variant(false));
    bag.write("Enabled", Variant(enabled_), Variant(true));
    bag.write("TextSelect", Variant(text_select_), Variant(true));
}

void KelAlphaNumeric::Resize() {
    Surface& surface = site_.surface();
    TxtCustom.Left(1);
    TxtCustom.Top(1);
    surface.Height(kControlHeight);
    TxtCustom.Height(kControlHeight);
    // A surface narrower than the margin gets an edit box of no width, not a failing layout.
    TxtCustom.Width(std::max(0.0f, surface.Width() - 10));
}

void KelAlphaNumeric::EnterFocus() {
    if (!text_select_) return;
    const std::string text = TxtCustom.Text();
    if (text.empty()) return;
    TxtCustom.SelStart(0);
    TxtCustom.SelLength(text_length(text));
}

void KelAlphaNumeric::ExitFocus() {
    // Only a digits box has a range, checked when focus leaves: never while typing, never
    // when code sets the text. An upper bound of 0 or less means no upper bound.
    if (text_type_ != KelANDigits) return;
    std::string text = TxtCustom.Text();
    const double max = limit_value(max_value_);
    if (!text.empty() && leading_value(text) > max && max > 0) TxtCustom.Text(text_of(max_value_));
    text = TxtCustom.Text();
    if (!text.empty() && leading_value(text) < limit_value(min_value_)) TxtCustom.Text(text_of(min_value_));
}

// ---- keystroke path ------------------------------------------------------------------------------

void KelAlphaNumeric::TxtCustom_KeyDown(int16_t& key_code, int16_t& shift) {
    raise_key_event(site_, kKeyDown, "KeyDown", key_code, shift);
    const KeyDownDecision d = key_down_decision(key_code, shift);
    CtrlDown = d.ctrl_down;
    // Up and Down move to the previous and next control; the key itself is left alone.
    if (!d.send_keys.empty()) site_.keyboard().send_keys(d.send_keys);
    if (d.record) {
        LastKeyCode = key_code;
        SavedSelStart = TxtCustom.SelStart();
    }
}

void KelAlphaNumeric::TxtCustom_KeyPress(int16_t& key_ascii) {
    // With Ctrl held the character goes to the edit box as it is, unseen by the form.
    if (CtrlDown) return;
    raise_key_press(site_, kKeyPress, key_ascii);
    switch (key_press_action(key_ascii)) {
        case KeyPressAction::pass:
            break;
        case KeyPressAction::drop:
            key_ascii = 0;
            break;
        case KeyPressAction::filter:
            SavedSelStart = TxtCustom.SelStart();
            key_ascii = FilterKey(key_ascii);
            break;
    }
}

int16_t KelAlphaNumeric::FilterKey(int16_t& key_ascii) {
    OverwriteMode = site_.keyboard().key_state(kVkInsert) == 1;
    // Only the title-case rebuild needs the text; the other types decide on the key alone.
    const std::string text = text_type_ == KelANTitleCase ? TxtCustom.Text() : std::string();
    const AlphaEdit edit{text, TxtCustom.SelStart(), TxtCustom.SelLength(), TxtCustom.MaxLength(), OverwriteMode};
    AlphaDecision d = filter_alpha_key(edit, text_type_, key_ascii);
    if (d.select_next) TxtCustom.SelLength(1);
    if (d.caret) TxtCustom.SelStart(*d.caret);
    // Setting the text raises the change handler at once, which places the caret after the
    // typed character and tells the form.
    if (d.text) TxtCustom.Text(*d.text);
    key_ascii = d.key;
    return key_ascii;
}

void KelAlphaNumeric::TxtCustom_Change() {
    if (auto caret = caret_after_change(LastKeyCode, SavedSelStart)) TxtCustom.SelStart(*caret);
    site_.raise_event(kChange, "Change", {});
}

void KelAlphaNumeric::TxtCustom_KeyUp(int16_t& key_code, int16_t& shift) {
    raise_key_event(site_, kKeyUp, "KeyUp", key_code, shift);
}

void KelAlphaNumeric::TxtCustom_Click() {
    if (enabled_ && !locked_) site_.raise_event(kClick, "Click", {});
}

void KelAlphaNumeric::TxtCustom_DblClick() {
    if (enabled_ && !locked_) site_.raise_event(kDblClick, "DblClick", {});
}

void KelAlphaNumeric::TxtCustom_MouseDown(int16_t& button, int16_t& shift, float& x, float& y) {
    raise_mouse_event(kMouseDown, "MouseDown", button, shift, x, y);
}

void KelAlphaNumeric::TxtCustom_MouseUp(int16_t& button, int16_t& shift, float& x, float& y) {
    raise_mouse_event(kMouseUp, "MouseUp", button, shift, x, y);
}

void KelAlphaNumeric::raise_mouse_event(Event number, std::string_view name, int16_t& button, int16_t& shift, float& x,
                                        float& y) {
    std::array<EventArg, 4> args{
        {{"Button", Variant(button)}, {"Shift", Variant(shift)}, {"X", Variant(x)}, {"Y", Variant(y)}}};
    site_.raise_event(number, name, args);
    button = returned_int16(args[0].value, button);
    shift = returned_int16(args[1].value, shift);
    x = returned_single(args[2].value, x);
    y = returned_single(args[3].value, y);
}

}  // namespace kel
