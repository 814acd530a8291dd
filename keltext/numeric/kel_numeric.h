#pragma once
// KelNumeric: a box for a decimal number with a fixed number of decimals inside a fixed total
// length. It refuses ill-formed keystrokes, puts the decimal point in by itself, shows the value
// grouped in the Indian style (12,34,567.50) once focus leaves, clamps it to MinValue..MaxValue
// and can show spin buttons that step it. Wraps an edit box (txtNumeric) and a spin button pair
// (UpDownNumeric); the decisions live in numeric_rules.h and number_format.h.
#include <cstdint>
#include <memory>
#include <string>

#include "keltext/host/container.h"
#include "keltext/host/font.h"
#include "keltext/host/variant.h"
#include "keltext/host/widgets.h"
#include "keltext/numeric/numeric_rules.h"

namespace kel {

enum KelNBorderStyle : int32_t {
    KelNPlain = 0,
    KelNFixedSingle = 1,
};

class KelNumeric : public Control {
public:
    explicit KelNumeric(Site& site);

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
        kControlError = 10,
    };

    // Properties and the method, in the order of the interface.
    bool Locked() const;
    void Locked(bool v);
    bool TriggerError() const;
    void TriggerError(bool v);
    std::string Mask() const;
    void Mask(const std::string& v);
    bool TxtFormat() const;
    void TxtFormat(bool v);
    KelNBorderStyle Borderstyle() const;
    void Borderstyle(KelNBorderStyle v);  // outside 16 bits: error 6; not 0 or 1: error 380
    Variant Text() const;
    void Text(const Variant& v);
    Variant MaxValue() const;
    void MaxValue(const Variant& v);
    Variant MinValue() const;
    void MinValue(const Variant& v);
    Colour BackColor() const;
    void BackColor(Colour v);
    Colour ForeColor() const;
    void ForeColor(Colour v);
    std::shared_ptr<kel::Font> Font() const;
    void Font(std::shared_ptr<kel::Font> f);
    int16_t MaxLength() const;
    void MaxLength(int16_t n);
    int16_t NoOfDecimals() const;
    void NoOfDecimals(int16_t n);
    void Refresh();
    bool Enabled() const;
    void Enabled(bool v);
    bool UpDownScroll() const;
    void UpDownScroll(bool v);
    Variant Increment() const;
    void Increment(const Variant& v);
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
    // Notifications of txtNumeric and UpDownNumeric.
    void txtNumeric_KeyDown(int16_t& key_code, int16_t& shift);
    void txtNumeric_KeyPress(int16_t& key_ascii);
    void txtNumeric_KeyUp(int16_t& key_code, int16_t& shift);
    void txtNumeric_Change();
    void txtNumeric_Click();
    void txtNumeric_DblClick();
    void txtNumeric_GotFocus();
    void StepUp();
    void StepDown();

    void LayoutConstituents();
    void FormatOnExit();

    // The edit state the rules decide on: a copy of the box's text and settings.
    NumericEdit edit_state() const;
    // Applies a decision's writes in order, through the widgets.
    void apply(const NumericDecision& d);
    double min_number() const;
    double max_number() const;

    Site& site_;
    EditBox& txtNumeric;
    SpinButton& UpDownNumeric;

    bool mEnabled = true;
    bool mLocked = false;
    bool mTxtFormat = false;
    bool mTriggerError = false;
    int16_t mNoOfDecimals = 0;
    int16_t mMaxLength = 7;
    Variant mMaxValue = Variant(int16_t{0});
    Variant mMinValue = Variant(int16_t{0});
    Variant mIncrement;
    bool mUpDownScroll = false;

    // Run-time state carried from one notification to the next.
    bool CtrlDown = false;
    bool OverwriteMode = false;
};

}  // namespace kel
