#include "keltext/numeric/kel_numeric.h"

#include <algorithm>
#include <array>

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/keys.h"
#include "keltext/numeric/number_format.h"

namespace kel {
namespace {

constexpr Colour kDefaultForeColor = 0xC00000;
constexpr Colour kDefaultBackColor = 0xFFECC8;
constexpr int16_t kDefaultMaxLength = 7;

// Sizes in twips.
constexpr float kButtonsFromRight = 300;
constexpr float kPlainHeight = 225;
constexpr float kSingleHeight = 300;
constexpr float kButtonInset = 50;
constexpr float kGapButtonsSetter = 320;
constexpr float kGapButtonsResize = 310;
constexpr float kGapNoButtons = 60;
constexpr float kCharWidth = 120;

}  // namespace

KelNumeric::KelNumeric(Site& site)
    : site_(site),
      txtNumeric(site.create_edit_box("txtNumeric")),
      UpDownNumeric(site.create_spin_button("UpDownNumeric")) {
    // Design values of the constituents.
    txtNumeric.MaxLength(kDefaultMaxLength);
    txtNumeric.ForeColor(kDefaultForeColor);
    txtNumeric.BackColor(kDefaultBackColor);
    UpDownNumeric.Visible(false);

    WidgetEvents text_events;
    text_events.key_down = [this](int16_t& k, int16_t& s) { txtNumeric_KeyDown(k, s); };
    text_events.key_press = [this](int16_t& k) { txtNumeric_KeyPress(k); };
    text_events.key_up = [this](int16_t& k, int16_t& s) { txtNumeric_KeyUp(k, s); };
    text_events.change = [this] { txtNumeric_Change(); };
    text_events.click = [this] { txtNumeric_Click(); };
    text_events.dbl_click = [this] { txtNumeric_DblClick(); };
    text_events.got_focus = [this] { txtNumeric_GotFocus(); };
    txtNumeric.set_events(std::move(text_events));

    WidgetEvents spin_events;
    spin_events.up_click = [this] { StepUp(); };
    spin_events.down_click = [this] { StepDown(); };
    UpDownNumeric.set_events(std::move(spin_events));
}

// ---- properties ---------------------------------------------------------------------------------

bool KelNumeric::Locked() const { return mLocked; }

void KelNumeric::Locked(bool v) {
    mLocked = v;
    // The surface decides whether the control takes focus; the text box is left alone.
    site_.surface().Enabled(!v);
    UpDownNumeric.Enabled(!v);
    site_.property_changed("Locked");
}

bool KelNumeric::TriggerError() const { return mTriggerError; }

void KelNumeric::TriggerError(bool v) {
    mTriggerError = v;
    site_.property_changed("TriggerError");
}

// Kept for the forms that set it; the box has no mask.
std::string KelNumeric::Mask() const { return {}; }
void KelNumeric::Mask(const std::string&) {}

bool KelNumeric::TxtFormat() const { return mTxtFormat; }

void KelNumeric::TxtFormat(bool v) {
    mTxtFormat = v;
    site_.property_changed("TxtFormat");
}

KelNBorderStyle KelNumeric::Borderstyle() const {
    return static_cast<KelNBorderStyle>(site_.surface().BorderStyle());
}

void KelNumeric::Borderstyle(KelNBorderStyle v) {
    if (v < -32768 || v > 32767) raise_error(kOverflow);
    site_.surface().BorderStyle(static_cast<int16_t>(v));
    if (v == KelNPlain) UpDownNumeric.Visible(false);
    if (v == KelNFixedSingle && mUpDownScroll) UpDownNumeric.Visible(true);  // room again for kept buttons
    site_.property_changed("BorderStyle");
    LayoutConstituents();
}

Variant KelNumeric::Text() const {
    // Separators are removed whatever TxtFormat says now: the text may still show the grouping
    // of an earlier exit, and a "," in this box is never anything but a separator.
    return Variant(leading_value(StripGrouping(txtNumeric.Text())));
}

void KelNumeric::Text(const Variant& v) {
    NumericLimits limits{mNoOfDecimals, mMaxLength, max_number(), min_number()};
    txtNumeric.Text(ShapeAssignedText(v, limits));
}

Variant KelNumeric::MaxValue() const { return mMaxValue; }

void KelNumeric::MaxValue(const Variant& v) {
    mMaxValue = numeric_test(v) ? Variant(numeric_value_of(v)) : Variant(int16_t{0});
    site_.property_changed("MaxValue");
}

Variant KelNumeric::MinValue() const { return mMinValue; }

void KelNumeric::MinValue(const Variant& v) {
    mMinValue = numeric_test(v) ? v : Variant(int16_t{0});
    site_.property_changed("MinValue");
}

Colour KelNumeric::BackColor() const { return txtNumeric.BackColor(); }

void KelNumeric::BackColor(Colour v) {
    txtNumeric.BackColor(v);
    site_.surface().BackColor(v);
    site_.property_changed("BackColor");
}

Colour KelNumeric::ForeColor() const { return txtNumeric.ForeColor(); }

void KelNumeric::ForeColor(Colour v) {
    txtNumeric.ForeColor(v);
    site_.property_changed("ForeColor");
}

std::shared_ptr<kel::Font> KelNumeric::Font() const { return site_.surface().Font(); }

void KelNumeric::Font(std::shared_ptr<kel::Font> f) {
    if (!f) return;
    site_.surface().Font(f);
    txtNumeric.Font(f);
    site_.property_changed("Font");
}

int16_t KelNumeric::MaxLength() const { return mMaxLength; }

void KelNumeric::MaxLength(int16_t n) {
    // A negative limit is one the text box refuses: it keeps its previous one, and the setter
    // goes on with that.
    if (n >= 0) txtNumeric.MaxLength(n);
    int32_t limit = txtNumeric.MaxLength();
    // The limit always leaves room for the point and the decimals.
    if (limit <= mNoOfDecimals && mNoOfDecimals < 32767) {
        if (mNoOfDecimals + 1 >= 0) txtNumeric.MaxLength(mNoOfDecimals + 1);
        limit = txtNumeric.MaxLength();
    }
    mMaxLength = static_cast<int16_t>(std::clamp<int32_t>(limit, -32768, 32767));
    site_.property_changed("MaxLength");
    if (!site_.user_mode() && txtNumeric.FontSize() < 10) site_.surface().Width(static_cast<float>(limit) * kCharWidth + 80);
}

int16_t KelNumeric::NoOfDecimals() const { return mNoOfDecimals; }

void KelNumeric::NoOfDecimals(int16_t n) {
    if (txtNumeric.MaxLength() <= n && n < 32767) MaxLength(static_cast<int16_t>(n + 1));
    mNoOfDecimals = n;
    site_.property_changed("NoOfDecimals");
    // Bounds set for whole numbers do not carry over to a box with decimals.
    if (n > 0 && (min_number() > 0 || max_number() > 0)) {
        MaxValue(Variant(int16_t{0}));
        MinValue(Variant(int16_t{0}));
    }
}

void KelNumeric::Refresh() { site_.surface().Refresh(); }

bool KelNumeric::Enabled() const { return mEnabled; }

void KelNumeric::Enabled(bool v) {
    mEnabled = v;
    txtNumeric.Enabled(v);
    UpDownNumeric.Enabled(v);
    site_.surface().Enabled(v);
    site_.property_changed("Enabled");
}

bool KelNumeric::UpDownScroll() const { return mUpDownScroll; }

void KelNumeric::UpDownScroll(bool v) {
    // A plain box has no room for the buttons: the value is not even kept.
    if (site_.surface().BorderStyle() == KelNPlain) return;
    Surface& surface = site_.surface();
    mUpDownScroll = v;
    UpDownNumeric.Top(1);
    UpDownNumeric.Height(surface.Height() - kButtonInset);
    const float limit = static_cast<float>(txtNumeric.MaxLength());
    float gap = kGapNoButtons;
    if (v) {
        UpDownNumeric.Visible(true);
        gap = kGapButtonsSetter;
        surface.Width((limit + 2) * kCharWidth + 160);
        UpDownNumeric.Left(surface.Width() - kButtonsFromRight);
    } else {
        surface.Width(limit * kCharWidth + 160);
        UpDownNumeric.Visible(false);
    }
    txtNumeric.Left(1);
    txtNumeric.Top(1);
    txtNumeric.Height(surface.Height());
    txtNumeric.Width(std::max(surface.Width() - gap, 0.0f));
    site_.property_changed("UpDownScroll");
}

Variant KelNumeric::Increment() const { return mIncrement; }

void KelNumeric::Increment(const Variant& v) {
    mIncrement = v;
    site_.property_changed("Increment");
}

Variant KelNumeric::hWnd() const { return Variant(site_.surface().hWnd()); }

double KelNumeric::min_number() const { return numeric_test(mMinValue) ? numeric_value_of(mMinValue) : 0; }
double KelNumeric::max_number() const { return numeric_test(mMaxValue) ? numeric_value_of(mMaxValue) : 0; }

// ---- lifetime and persistence ---------------------------------------------------------------------

void KelNumeric::Initialize() {
    mMaxValue = Variant(int16_t{0});
    mMinValue = Variant(int16_t{0});
}

void KelNumeric::InitProperties() {
    Surface& surface = site_.surface();
    mEnabled = true;
    mLocked = false;
    surface.Enabled(true);

    txtNumeric.ForeColor(kDefaultForeColor);
    surface.BackColor(kDefaultBackColor);
    txtNumeric.BackColor(kDefaultBackColor);
    if (auto f = surface.Font()) txtNumeric.Font(f);
    txtNumeric.MaxLength(kDefaultMaxLength);

    mNoOfDecimals = 0;
    surface.BorderStyle(KelNFixedSingle);
    mTxtFormat = false;
    mTriggerError = false;
    mMaxValue = Variant(int16_t{0});
    mMinValue = Variant(int16_t{0});

    MaxLength(kDefaultMaxLength);

    surface.Width(920);
    surface.Height(300);

    UpDownNumeric.Visible(false);
    LayoutConstituents();
}

namespace {

// Each restored value is applied on its own: one that cannot be used leaves its property as it
// was, and the restore goes on with the next. What a property bag holds is not known in advance
// (another host may have written it), so the step is tried: the errors expected are 13 and 6
// from a stored value that does not convert, and 380 from a value the property refuses.
template <class F>
void restore_step(F&& step) {
    try {
        step();
    } catch (const RuntimeError&) {
        // skipped: the property keeps its value
    }
}

}  // namespace

void KelNumeric::ReadProperties(PropertyBag& bag) {
    Surface& surface = site_.surface();
    restore_step([&] { mIncrement = bag.read("Increment", Variant(int16_t{0})); });
    restore_step([&] { surface.BorderStyle(to_int16(bag.read("BorderStyle", Variant(int16_t{1})))); });
    restore_step([&] {
        const bool buttons = to_bool(bag.read("UpDownScroll", Variant(false)));
        // A plain box has no room for the buttons, but keeps the stored choice (hidden), so that
        // a form opened and saved again stores what it loaded.
        if (surface.BorderStyle() == KelNPlain) mUpDownScroll = buttons;
        else UpDownScroll(buttons);
    });
    restore_step([&] { MaxValue(bag.read("Maxvalue", Variant(int16_t{0}))); });
    restore_step([&] { MinValue(bag.read("MinValue", Variant(int16_t{0}))); });
    restore_step([&] { txtNumeric.ForeColor(to_int32(bag.read("Forecolor", Variant(kDefaultForeColor)))); });
    restore_step([&] { txtNumeric.BackColor(to_int32(bag.read("BackColor", Variant(kDefaultBackColor)))); });
    restore_step([&] {
        if (auto f = font_of(bag.read("Font", Variant()))) Font(f);
    });
    restore_step([&] { MaxLength(to_int16(bag.read("MaxLength", Variant(kDefaultMaxLength)))); });
    restore_step([&] { mNoOfDecimals = to_int16(bag.read("NoOfDecimals", Variant(int16_t{0}))); });
    restore_step([&] { Enabled(to_bool(bag.read("Enabled", Variant(true)))); });
    restore_step([&] { Locked(to_bool(bag.read("Locked", Variant(false)))); });
    // The same stored key as the text box's background, read again for the surface.
    restore_step([&] { surface.BackColor(to_int32(bag.read("Backcolor", Variant(kDefaultBackColor)))); });
    restore_step([&] { mTriggerError = to_bool(bag.read("TriggerError", Variant(false))); });
    restore_step([&] { mTxtFormat = to_bool(bag.read("TxtFormat", Variant(false))); });
    LayoutConstituents();
}

void KelNumeric::WriteProperties(PropertyBag& bag) {
    Surface& surface = site_.surface();
    bag.write("Increment", mIncrement, Variant(int16_t{0}));
    bag.write("UpDownScroll", Variant(mUpDownScroll), Variant(false));
    bag.write("MinValue", mMinValue, Variant(int16_t{0}));
    bag.write("Maxvalue", mMaxValue, Variant(int16_t{0}));
    bag.write("BorderStyle", Variant(surface.BorderStyle()), Variant(int16_t{1}));
    bag.write("Forecolor", Variant(txtNumeric.ForeColor()), Variant(kDefaultForeColor));
    bag.write("Backcolor", Variant(txtNumeric.BackColor()), Variant(kDefaultBackColor));
    bag.write("Font", surface.Font() ? Variant(surface.Font()) : Variant(), Variant());
    bag.write("MaxLength", Variant(mMaxLength), Variant(kDefaultMaxLength));
    bag.write("NoOfDecimals", Variant(mNoOfDecimals), Variant(int16_t{0}));
    bag.write("Locked", Variant(mLocked), Variant(false));
    bag.write("Enabled", Variant(mEnabled), Variant(true));
    bag.write("TriggerError", Variant(mTriggerError), Variant(false));
    bag.write("TxtFormat", Variant(mTxtFormat), Variant(false));
}

// ---- layout and spin buttons ----------------------------------------------------------------------

void KelNumeric::Resize() { LayoutConstituents(); }

void KelNumeric::LayoutConstituents() {
    Surface& surface = site_.surface();
    UpDownNumeric.Top(1);
    UpDownNumeric.Left(surface.Width() - kButtonsFromRight);
    // Forcing the height resizes the surface again; the nested layout finds it settled.
    if (surface.BorderStyle() == KelNPlain) {
        surface.Height(kPlainHeight);
        UpDownNumeric.Height(surface.Height());
    } else {
        surface.Height(kSingleHeight);
        UpDownNumeric.Height(surface.Height() - kButtonInset);
    }
    const float gap = mUpDownScroll ? kGapButtonsResize : kGapNoButtons;
    txtNumeric.Left(1);
    txtNumeric.Top(1);
    // A control narrower than the gap gets an empty text box rather than an error.
    txtNumeric.Width(std::max(surface.Width() - gap, 0.0f));
    txtNumeric.Height(surface.Height());
}

void KelNumeric::StepUp() {
    // An Increment that is not a number cannot step anything: the press changes nothing.
    if (!numeric_test(mIncrement)) return;
    txtNumeric.Text(step_up_text({txtNumeric.Text(), max_number(), min_number(), numeric_value_of(mIncrement)}));
    site_.keyboard().send_keys(kKeysEnd);
}

void KelNumeric::StepDown() {
    if (!numeric_test(mIncrement)) return;
    txtNumeric.Text(step_down_text({txtNumeric.Text(), max_number(), min_number(), numeric_value_of(mIncrement)}));
    site_.keyboard().send_keys(kKeysEnd);
}

// ---- focus ----------------------------------------------------------------------------------------

void KelNumeric::EnterFocus() {
    const std::string text = txtNumeric.Text();
    if (text.empty()) return;
    txtNumeric.SelStart(0);
    txtNumeric.SelLength(static_cast<int32_t>(text.size()));
}

void KelNumeric::txtNumeric_GotFocus() {
    if (!mTxtFormat) return;
    txtNumeric.Text(StripGrouping(txtNumeric.Text()));
    if (mMaxLength >= 0) txtNumeric.MaxLength(mMaxLength);
}

void KelNumeric::ExitFocus() { FormatOnExit(); }

void KelNumeric::FormatOnExit() {
    apply(format_on_exit(edit_state()));
}

// ---- keystroke path -------------------------------------------------------------------------------

NumericEdit KelNumeric::edit_state() const {
    NumericEdit e;
    e.text = txtNumeric.Text();
    e.caret = txtNumeric.SelStart();
    e.sel_length = txtNumeric.SelLength();
    e.limit = txtNumeric.MaxLength();
    e.decimals = mNoOfDecimals;
    e.max_length = mMaxLength;
    e.max_value = max_number();
    e.min_value = min_number();
    e.overwrite = OverwriteMode;
    e.trigger_error = mTriggerError;
    e.txt_format = mTxtFormat;
    return e;
}

void KelNumeric::apply(const NumericDecision& d) {
    if (d.ctrl_down) CtrlDown = *d.ctrl_down;
    if (d.overwrite) OverwriteMode = *d.overwrite;
    for (const EditStep& s : d.steps()) {
        switch (s.kind) {
            case EditStep::Kind::text:
                txtNumeric.Text(s.text);
                break;
            case EditStep::Kind::caret:
                txtNumeric.SelStart(s.value);
                break;
            case EditStep::Kind::sel_length:
                txtNumeric.SelLength(s.value);
                break;
            case EditStep::Kind::max_length:
                if (s.value >= 0) txtNumeric.MaxLength(s.value);  // the box refuses a negative limit
                break;
            case EditStep::Kind::send_keys:
                site_.keyboard().send_keys(s.keys);
                break;
            case EditStep::Kind::control_error:
                site_.raise_event(kControlError, "ControlError", {});
                break;
        }
    }
}

void KelNumeric::txtNumeric_KeyDown(int16_t& key_code, int16_t& shift) {
    raise_key_event(site_, kKeyDown, "KeyDown", key_code, shift);
    NumericDecision d = numeric_key_down(edit_state(), key_code, shift);
    apply(d);
    key_code = d.key;
    if (CtrlDown) return;
    raise_key_event(site_, kKeyDown, "KeyDown", key_code, shift);
}

void KelNumeric::txtNumeric_KeyPress(int16_t& key_ascii) {
    raise_key_press(site_, kKeyPress, key_ascii);
    NumericEdit e = edit_state();
    // The filter reads the Insert key's state afresh for each keystroke; the decision says
    // whether the filter ran and so whether OverwriteMode takes the new state.
    e.overwrite = site_.keyboard().key_state(kVkInsert) == 1;
    NumericDecision d = numeric_key_press(e, key_ascii, CtrlDown);
    apply(d);
    key_ascii = d.key;
}

void KelNumeric::txtNumeric_KeyUp(int16_t& key_code, int16_t& shift) {
    raise_key_event(site_, kKeyUp, "KeyUp", key_code, shift);
}

void KelNumeric::txtNumeric_Change() { site_.raise_event(kChange, "Change", {}); }

void KelNumeric::txtNumeric_Click() {
    if (mEnabled && !mLocked) site_.raise_event(kClick, "Click", {});
}

void KelNumeric::txtNumeric_DblClick() {
    if (mEnabled && !mLocked) site_.raise_event(kDblClick, "DblClick", {});
}

}  // namespace kel
