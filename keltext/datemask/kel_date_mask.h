#pragma once
// KelDateMask: a masked date box. The date is typed into a masked edit field, MskDate
// ("##/##/####", or "##/##?" for a month and year); "/" completes the day or the month, and
// when focus leaves (or the form reads Text) the text is completed, corrected and pulled
// into MinDate..MaxDate, or, in no-correction mode (TriggerError), reported through
// DateError. An image beside the field, ImgButton, is the calendar button: it only tells the
// form (ButtonClick); the form shows its own calendar.
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "keltext/datemask/date_rules.h"
#include "keltext/host/container.h"
#include "keltext/host/font.h"
#include "keltext/host/variant.h"
#include "keltext/host/widgets.h"

namespace kel {

// Corner at which the form is to show its calendar (enum KelDtCalpos).
enum KelDtCalpos : int32_t {
    KelDtTopLeft = 0,
    KelDtTopRight = 1,
    KelDtBottomLeft = 2,
    KelDtBottomRight = 3,
};

class KelDateMask : public Control {
public:
    explicit KelDateMask(Site& site);

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
        kButtonClick = 10,
        kDateError = 11,
    };

    // Layout, in twips.
    static constexpr float kButtonRoom = 335;     // the field is this much narrower with the button
    static constexpr float kButtonFromRight = 320;
    static constexpr float kHeight = 300;

    // Properties and the method, in the order of the interface.
    bool ZubDate() const;
    void ZubDate(bool v);
    Variant MaxDate() const;
    void MaxDate(const Variant& v);  // kept only when it is a date
    Variant MinDate() const;
    void MinDate(const Variant& v);  // kept only when it is a date
    bool TriggerError() const;
    void TriggerError(bool v);
    Colour BackColor() const;
    void BackColor(Colour v);
    Colour ForeColor() const;
    void ForeColor(Colour v);
    std::shared_ptr<kel::Font> Font() const;
    void Font(std::shared_ptr<kel::Font> f);  // null: error 13
    bool Locked() const;
    void Locked(bool v);
    bool AllowBlankDate() const;
    void AllowBlankDate(bool v);
    bool AllowLostFocus() const;
    Variant Text();  // checks the date first when it was not checked since the last keystroke
    void Text(const Variant& v);
    int32_t DateStyle() const;
    void DateStyle(int32_t v);
    void Refresh();
    bool Enabled() const;
    void Enabled(bool v);
    bool ShowCalendar() const;
    void ShowCalendar(bool v);
    int32_t CalendarPosition() const;
    void CalendarPosition(int32_t v);  // outside 0..255: error 6, nothing changed
    Variant hWnd() const;
    Variant SelStart() const;
    void SelStart(const Variant& v);
    Variant Sellength() const;
    void Sellength(const Variant& v);
    Variant SelText() const;

    // Run-time state, for whoever hosts or tests the control.
    bool Validated() const { return validated_; }
    bool CtrlDown() const { return ctrl_down_; }

    // What the container calls.
    void Initialize() override;
    void InitProperties() override;
    void ReadProperties(PropertyBag& bag) override;
    void WriteProperties(PropertyBag& bag) override;
    void Resize() override;
    void EnterFocus() override;
    void ExitFocus() override;

private:
    // Notifications of the constituents.
    void MskDate_KeyDown(int16_t& key_code, int16_t& shift);
    void MskDate_KeyPress(int16_t& key_ascii);
    void MskDate_KeyUp(int16_t& key_code, int16_t& shift);
    void MskDate_Change();
    void MskDate_LostFocus();
    void ImgButton_Click();

    // Checks the field's text once between keystrokes: completes and corrects it, or reports
    // it through DateError and AllowLostFocus.
    void ValidateOnExit();
    // "/" typed in style ddMMyyyy: completes the day or month field the caret is in, from
    // what the person typed there when `typed_here`.
    void complete_field(bool typed_here);
    // Typing over a selection of several characters starts the selected part afresh.
    void prepare_overwrite(int16_t key_ascii);
    // After a keystroke of the person's: what they typed, for the next "/".
    void note_typing();
    void forget_typing();
    // Writes a text the mask would not take as typed: empty mask, text, then `mask`.
    void write_unmasked(const std::string& text, const std::string& mask);
    void raise_date_error();
    void fit_width_to_button();

    Site& site_;
    MaskedEdit& MskDate;
    Image& ImgButton;

    bool enabled_ = true;
    bool locked_ = false;
    int32_t date_style_ = ddMMyyyy;
    Variant max_date_;
    Variant min_date_;
    bool trigger_error_ = false;
    bool zub_date_ = true;
    bool allow_lost_focus_ = true;
    bool allow_blank_date_ = false;
    uint8_t calendar_position_ = KelDtBottomLeft;
    Colour fore_color_ = 0xC00000;

    bool validated_ = false;
    bool ctrl_down_ = false;

    // The person's own typing, which tells a "/" typed as a separator from one typed to
    // complete a field. Keystrokes the control queues itself never change it.
    DateField typed_field_ = DateField::none;  // typed into since the caret entered it
    bool confirm_pending_ = false;  // their digit just filled the day or month: "/" only confirms
    int32_t caret_after_key_ = -1;  // where the last keystroke left the caret; elsewhere = moved
    int32_t typed_at_ = -1;         // where this keystroke's character is to land
    char typed_char_ = 0;
};

}  // namespace kel
