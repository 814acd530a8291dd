#pragma once
// KelAlphaNumeric: a one-line text box that lets one class of characters through (TextType)
// and shapes their case as the user types; a digits box is clamped to MinValue..MaxValue
// when focus leaves it. Wraps one edit box, TxtCustom.
#include <cstdint>
#include <memory>

#include "keltext/alphanumeric/alpha_rules.h"
#include "keltext/host/container.h"
#include "keltext/host/font.h"
#include "keltext/host/variant.h"
#include "keltext/host/widgets.h"

namespace kel {

class KelAlphaNumeric : public Control {
public:
    explicit KelAlphaNumeric(Site& site);

    // Event numbers of the control's event interface.
    enum Event : int {
        kClick = 1,
        kDblClick = 2,
        kChange = 3,
        kKeyDown = 4,
        kKeyPress = 5,
        kKeyUp = 6,
        kMouseDown = 7,
        kMouseMove = 8,
        kMouseUp = 9,
    };

    // Properties and the method, in the order of the interface.
    KelANTxtType TextType() const;
    void TextType(KelANTxtType v);
    bool Locked() const;
    void Locked(bool v);
    KelANBorderStyle Borderstyle() const;
    void Borderstyle(KelANBorderStyle v);  // outside 16 bits: error 6; not 0 or 1: error 380
    Variant Text() const;
    void Text(const Variant& v);
    Colour BackColor() const;
    void BackColor(Colour v);
    Colour ForeColor() const;
    void ForeColor(Colour v);
    std::shared_ptr<kel::Font> Font() const;
    void Font(std::shared_ptr<kel::Font> f);
    Variant MaxLength() const;
    void MaxLength(const Variant& v);
    Variant MaxValue() const;
    void MaxValue(const Variant& v);
    Variant MinValue() const;
    void MinValue(const Variant& v);
    bool Enabled() const;
    void Enabled(bool v);
    void Refresh();
    Variant SelStart() const;
    void SelStart(const Variant& v);
    Variant Sellength() const;
    void Sellength(const Variant& v);
    Variant SelText() const;
    bool TextSelect() const;
    void TextSelect(bool v);
    Variant hWnd() const;

    // What the container calls.
    void Initialize() override;
    void InitProperties() override;
    void ReadProperties(PropertyBag& bag) override;
    void WriteProperties(PropertyBag& bag) override;
    void Resize() override;
    void EnterFocus() override;
    void ExitFocus() override;

private:
    // Notifications of TxtCustom.
    void TxtCustom_KeyDown(int16_t& key_code, int16_t& shift);
    void TxtCustom_KeyPress(int16_t& key_ascii);
    void TxtCustom_Change();
    void TxtCustom_KeyUp(int16_t& key_code, int16_t& shift);
    void TxtCustom_Click();
    void TxtCustom_DblClick();
    void TxtCustom_MouseDown(int16_t& button, int16_t& shift, float& x, float& y);
    void TxtCustom_MouseUp(int16_t& button, int16_t& shift, float& x, float& y);

    // Filters one typed character and returns the code the edit box is to insert.
    int16_t FilterKey(int16_t& key_ascii);

    void raise_mouse_event(Event number, std::string_view name, int16_t& button, int16_t& shift, float& x, float& y);

    Site& site_;
    EditBox& TxtCustom;

    // The properties the control keeps itself; the rest live in TxtCustom and the surface.
    KelANTxtType text_type_ = KelANTitleCase;
    bool locked_ = false;
    bool enabled_ = false;
    bool text_select_ = false;
    Variant max_value_;
    Variant min_value_;

    // Keystroke state carried from one notification to the next. The caret is kept in 32
    // bits so that a text longer than 32,767 characters (pasted or set by code) still gets
    // its caret placed right.
    bool CtrlDown = false;
    int16_t LastKeyCode = 0;
    int32_t SavedSelStart = 0;
    bool OverwriteMode = false;
};

}  // namespace kel
