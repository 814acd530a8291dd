#include "keltext/datemask/kel_date_mask.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <optional>

#include "keltext/host/conversions.h"
#include "keltext/host/date.h"
#include "keltext/host/date_recognizer.h"
#include "keltext/host/errors.h"
#include "keltext/host/keys.h"
#include "keltext/host/mask.h"

namespace kel {
namespace {

constexpr std::string_view kDateMask = "##/##/####";
constexpr std::string_view kMonthYearTypingMask = "##/##?";  // set by DateStyle: a letter to type
constexpr std::string_view kMonthYearTextMask = "##/##&";    // set by Text: whatever was given
constexpr std::string_view kMonthYearCheckedMask = "##/##a"; // after the check: letter or nothing

constexpr Colour kDefaultForeColor = 0xC00000;
constexpr Colour kDefaultBackColor = 0xFFEFD0;
constexpr float kDefaultWidth = 1695;


// Values read from a property store or given to the selection setters are used only when the
// host's conversions would take them; anything else skips the step.
std::optional<double> number_value(const Variant& v) {
    switch (v.kind()) {
        case VarKind::Object:
            return std::nullopt;
        case VarKind::String: {
            if (!numeric_text(v.str())) return std::nullopt;
            std::string plain = v.str();
            std::erase(plain, ',');  // grouping commas of a numeric text
            const double d = leading_value(plain);
            return std::isfinite(d) ? std::optional<double>(d) : std::nullopt;
        }
        default:
            return v.number();
    }
}

std::optional<int32_t> int32_value(const Variant& v) {
    const auto d = number_value(v);
    if (!d) return std::nullopt;
    const double r = round_half_even(*d);
    if (!(r >= -2147483648.0 && r <= 2147483647.0)) return std::nullopt;
    return static_cast<int32_t>(r);
}

std::optional<bool> bool_value(const Variant& v) {
    if (v.is_string()) {
        if (same_name(v.str(), "True")) return true;
        if (same_name(v.str(), "False")) return false;
    }
    const auto d = number_value(v);
    if (!d) return std::nullopt;
    return *d != 0;
}

}  // namespace

KelDateMask::KelDateMask(Site& site)
    : site_(site), MskDate(site.create_masked_edit("MskDate")), ImgButton(site.create_image("ImgButton")) {
    // The constituents' design values: laid out for a box of the default width. A loaded box
    // takes its width from the field's (see ReadProperties), so that width is the design one.
    MskDate.Mask(std::string(kDateMask));
    MskDate.Font(default_font());
    MskDate.Left(1);
    MskDate.Top(1);
    MskDate.Width(kDefaultWidth - kButtonRoom);
    MskDate.Height(kHeight);
    ImgButton.Visible(true);
    ImgButton.Left(kDefaultWidth - kButtonFromRight);
    ImgButton.Top(1);

    WidgetEvents msk;
    msk.key_down = [this](int16_t& k, int16_t& s) { MskDate_KeyDown(k, s); };
    msk.key_press = [this](int16_t& k) { MskDate_KeyPress(k); };
    msk.key_up = [this](int16_t& k, int16_t& s) { MskDate_KeyUp(k, s); };
    msk.change = [this] { MskDate_Change(); };
    msk.got_focus = [] {};
    msk.lost_focus = [this] { MskDate_LostFocus(); };
    MskDate.set_events(std::move(msk));

    WidgetEvents img;
    img.click = [this] { ImgButton_Click(); };
    ImgButton.set_events(std::move(img));
}

// ---- Properties ---------------------------------------------------------------------------

bool KelDateMask::ZubDate() const { return zub_date_; }
void KelDateMask::ZubDate(bool v) {
    zub_date_ = v;
    site_.property_changed("ZubDate");
}

Variant KelDateMask::MaxDate() const { return max_date_; }
void KelDateMask::MaxDate(const Variant& v) {
    // Only a date is a bound; anything else is ignored, so a bound cannot be cleared again.
    if (!is_date(v)) return;
    max_date_ = v;
    site_.property_changed("MaxDate");
}

Variant KelDateMask::MinDate() const { return min_date_; }
void KelDateMask::MinDate(const Variant& v) {
    if (!is_date(v)) return;
    min_date_ = v;
    site_.property_changed("MinDate");
}

bool KelDateMask::TriggerError() const { return trigger_error_; }
void KelDateMask::TriggerError(bool v) {
    trigger_error_ = v;
    site_.property_changed("TriggerError");
}

Colour KelDateMask::BackColor() const { return MskDate.BackColor(); }
void KelDateMask::BackColor(Colour v) {
    MskDate.BackColor(v);
    site_.surface().BackColor(v);
    site_.property_changed("BackColor");
}

Colour KelDateMask::ForeColor() const { return fore_color_; }
void KelDateMask::ForeColor(Colour v) {
    MskDate.ForeColor(v);
    site_.surface().ForeColor(v);
    fore_color_ = v;
    site_.property_changed("ForeColor");
}

std::shared_ptr<kel::Font> KelDateMask::Font() const { return site_.surface().Font(); }
void KelDateMask::Font(std::shared_ptr<kel::Font> f) {
    if (!f) raise_error(kTypeMismatch);
    site_.surface().Font(f);
    MskDate.Font(f);
    site_.property_changed("Font");
}

bool KelDateMask::Locked() const { return locked_; }
void KelDateMask::Locked(bool v) {
    locked_ = v;
    site_.surface().Enabled(!v);
    site_.property_changed("Locked");
}

bool KelDateMask::AllowBlankDate() const { return allow_blank_date_; }
void KelDateMask::AllowBlankDate(bool v) {
    allow_blank_date_ = v;
    site_.property_changed("AllowBlankDate");
}

bool KelDateMask::AllowLostFocus() const { return allow_lost_focus_; }

Variant KelDateMask::Text() {
    if (!validated_) ValidateOnExit();
    validated_ = true;
    switch (date_style_) {
        case ddMMyyyy: {
            std::string t = MskDate.Text();
            if (is_date(Variant(t))) return Variant(std::move(t));
            return Variant();
        }
        case mmyyA:
            return Variant(PromptToBlank(MskDate.Text(), date_style_));
        default:
            return Variant();
    }
}

void KelDateMask::Text(const Variant& v) {
    if (date_style_ == ddMMyyyy) {
        const bool empty_text = v.is_empty() || (v.is_string() && v.str().empty());
        const auto date = recognize_date(v);
        if (!date && !empty_text) {
            // Refused: the field keeps its text.
            if (trigger_error_) raise_date_error();
        } else {
            // 11 November 1111 is the date that stands for "no date".
            const bool blank = empty_text || *date == make_date(1111, 11, 11);
            write_unmasked(blank ? std::string(kBlankDateText) : date_text(*date), std::string(kDateMask));
        }
    } else if (date_style_ == mmyyA) {
        MskDate.Mask("");
        // An object has no text: nothing is written, and the field gets its mask back.
        if (!v.is_object()) {
            std::string t = text_of(v);
            if (t.size() < 6) t += ' ';
            if (t.size() < 6) t.insert(0, 6 - t.size(), ' ');
            MskDate.Text(t);
        }
        MskDate.Mask(std::string(kMonthYearTextMask));
    }
    site_.property_changed("Text");
}

int32_t KelDateMask::DateStyle() const { return date_style_; }
void KelDateMask::DateStyle(int32_t v) {
    date_style_ = v;
    if (v == ddMMyyyy) MskDate.Mask(std::string(kDateMask));
    if (v == mmyyA) MskDate.Mask(std::string(kMonthYearTypingMask));
    site_.property_changed("DateStyle");
}

void KelDateMask::Refresh() { site_.surface().Refresh(); }

bool KelDateMask::Enabled() const { return enabled_; }
void KelDateMask::Enabled(bool v) {
    enabled_ = v;
    MskDate.ForeColor(v ? fore_color_ : kGreyText);
    site_.surface().Enabled(v);
    site_.property_changed("Enabled");
}

bool KelDateMask::ShowCalendar() const { return ImgButton.Visible(); }
void KelDateMask::ShowCalendar(bool v) {
    ImgButton.Visible(v);
    fit_width_to_button();
    site_.property_changed("ShowCalendar");
}

int32_t KelDateMask::CalendarPosition() const { return calendar_position_; }
void KelDateMask::CalendarPosition(int32_t v) {
    calendar_position_ = to_byte(static_cast<double>(v));  // error 6 outside 0..255
    site_.property_changed("CalendarPosition");
}

Variant KelDateMask::hWnd() const { return Variant(site_.surface().hWnd()); }

Variant KelDateMask::SelStart() const { return Variant(MskDate.SelStart()); }
void KelDateMask::SelStart(const Variant& v) {
    // The field refuses a negative position; like a value that is no number, it is ignored.
    if (const auto n = int32_value(v); n && *n >= 0) MskDate.SelStart(*n);
}

Variant KelDateMask::Sellength() const { return Variant(MskDate.SelLength()); }
void KelDateMask::Sellength(const Variant& v) {
    if (const auto n = int32_value(v); n && *n >= 0) MskDate.SelLength(*n);
}

Variant KelDateMask::SelText() const { return Variant(MskDate.SelText()); }

// ---- Start-up, persistence, layout ----------------------------------------------------------

void KelDateMask::Initialize() { allow_lost_focus_ = true; }

void KelDateMask::InitProperties() {
    Surface& surface = site_.surface();
    date_style_ = ddMMyyyy;
    MskDate.ForeColor(kDefaultForeColor);
    surface.ForeColor(kDefaultForeColor);
    MskDate.BackColor(kDefaultBackColor);
    surface.BackColor(kDefaultBackColor);
    allow_blank_date_ = false;
    if (auto f = surface.Font()) MskDate.Font(f);
    surface.Enabled(true);
    enabled_ = true;
    locked_ = false;
    fore_color_ = kDefaultForeColor;
    trigger_error_ = false;
    zub_date_ = true;
    surface.Width(kDefaultWidth);
    surface.Height(kHeight);
    calendar_position_ = KelDtBottomLeft;
}

void KelDateMask::ReadProperties(PropertyBag& bag) {
    if (const auto c = int32_value(bag.read("Forecolor", Variant(kDefaultForeColor)))) ForeColor(*c);
    if (const auto c = int32_value(bag.read("BackColor", Variant(kDefaultBackColor)))) MskDate.BackColor(*c);
    if (const auto b = bool_value(bag.read("Enabled", Variant(true)))) Enabled(*b);
    if (const auto b = bool_value(bag.read("Locked", Variant(false)))) Locked(*b);
    if (auto f = font_of(bag.read("Font", Variant()))) Font(std::move(f));
    if (const auto s = int32_value(bag.read("DateStyle", Variant(int32_t{ddMMyyyy})))) DateStyle(*s);
    if (const auto b = bool_value(bag.read("TriggerError", Variant(false)))) TriggerError(*b);
    if (const auto b = bool_value(bag.read("ZubDate", Variant(true)))) zub_date_ = *b;
    if (const auto b = bool_value(bag.read("AllowBlankDate", Variant(false)))) allow_blank_date_ = *b;
    if (const auto b = bool_value(bag.read("Showcalendar", Variant(true)))) {
        ImgButton.Visible(*b);
        fit_width_to_button();
    }
    if (const auto p = int32_value(bag.read("CalendarPosition", Variant(uint8_t{KelDtBottomLeft})));
        p && *p >= 0 && *p <= 255)
        calendar_position_ = static_cast<uint8_t>(*p);
}

void KelDateMask::WriteProperties(PropertyBag& bag) {
    bag.write("DateStyle", Variant(date_style_), Variant(int32_t{ddMMyyyy}));
    bag.write("Forecolor", Variant(fore_color_), Variant(kDefaultForeColor));
    bag.write("Backcolor", Variant(MskDate.BackColor()), Variant(kDefaultBackColor));
    bag.write("Font", Variant(site_.surface().Font()), Variant());
    bag.write("ShowCalendar", Variant(ImgButton.Visible()), Variant(true));
    bag.write("Enabled", Variant(enabled_), Variant(true));
    bag.write("Locked", Variant(locked_), Variant(false));
    bag.write("TriggerError", Variant(trigger_error_), Variant(false));
    bag.write("ZubDate", Variant(zub_date_), Variant(true));
    bag.write("AllowBlankDate", Variant(allow_blank_date_), Variant(false));
    bag.write("CalendarPosition", Variant(calendar_position_), Variant(uint8_t{KelDtBottomLeft}));
}

void KelDateMask::Resize() {
    Surface& surface = site_.surface();
    MskDate.Top(1);
    MskDate.Left(1);
    const float width = surface.Width();
    if (ImgButton.Visible()) {
        // A control narrower than the button gets an empty field rather than a negative width.
        MskDate.Width(std::max(0.0f, width - kButtonRoom));
        ImgButton.Left(width - kButtonFromRight);
    } else {
        MskDate.Width(width);
    }
    surface.Height(kHeight);  // a new height comes back here at once and lays out again
    MskDate.Height(kHeight);
    ImgButton.Top(1);
}

void KelDateMask::fit_width_to_button() {
    site_.surface().Width(MskDate.Width() + (ImgButton.Visible() ? kButtonRoom : 0));
}

// ---- Focus and validation -------------------------------------------------------------------

void KelDateMask::EnterFocus() {
    forget_typing();
    caret_after_key_ = -1;
    const auto n = static_cast<int32_t>(MskDate.Text().size());
    if (n > 0) {
        MskDate.SelStart(0);
        MskDate.SelLength(n);
    }
    allow_lost_focus_ = true;
}

void KelDateMask::ExitFocus() {
    forget_typing();
    ValidateOnExit();
}

void KelDateMask::MskDate_LostFocus() {
    forget_typing();
    ValidateOnExit();
}

void KelDateMask::ValidateOnExit() {
    if (validated_) return;
    validated_ = true;
    std::string t = PromptToBlank(MskDate.Text(), date_style_);
    const std::string date_mask(kDateMask);

    if (date_style_ == ddMMyyyy) {
        if (is_date(Variant(t))) {
            MskDate.Mask("");
            t = NormalizeDateText(t, zub_date_, trigger_error_);
            if (zub_date_ && trigger_error_ && leading_value(std::string_view(t).substr(0, 2)) > 28) {
                // A real date past the 28th in 28-day mode: reported, and written back as it is.
                allow_lost_focus_ = false;
                raise_date_error();
            } else if (!is_date(Variant(t))) {
                if (trigger_error_) raise_date_error();
                MskDate.Mask(date_mask);
                allow_lost_focus_ = false;
                return;
            }
            if (is_date(Variant(t))) MskDate.Text(ClampToDateRange(t, min_date_, max_date_));
            MskDate.Mask(date_mask);
            return;
        }
        if (t == kBlankDateText && allow_blank_date_) return;
        if (trigger_error_) {
            allow_lost_focus_ = false;
            raise_date_error();
            return;
        }
        MskDate.Mask("");
        t = NormalizeDateText(t, zub_date_, false);
        if (is_date(Variant(t))) MskDate.Text(ClampToDateRange(t, min_date_, max_date_));
        MskDate.Mask(date_mask);
        return;
    }

    if (date_style_ == mmyyA) {
        if (!CheckMonthYear(t)) allow_lost_focus_ = false;
        if (trigger_error_ && !allow_lost_focus_) raise_date_error();
        MskDate.Mask(std::string(kMonthYearCheckedMask));
    }
}

void KelDateMask::raise_date_error() { site_.raise_event(kDateError, "DateError", {}); }

void KelDateMask::write_unmasked(const std::string& text, const std::string& mask) {
    MskDate.Mask("");
    MskDate.Text(text);
    MskDate.Mask(mask);
}

// ---- Keystrokes -----------------------------------------------------------------------------

void KelDateMask::MskDate_KeyDown(int16_t& key_code, int16_t& shift) {
    validated_ = false;
    typed_at_ = -1;
    raise_key_event(site_, kKeyDown, "KeyDown", key_code, shift);
    ctrl_down_ = (shift & kCtrlMask) != 0;
    if (ctrl_down_) return;
    if (key_code == kVkUp) site_.keyboard().send_keys(kKeysBackTab);
    if (key_code == kVkDown) site_.keyboard().send_keys(kKeysTab);
}

void KelDateMask::MskDate_KeyPress(int16_t& key_ascii) {
    validated_ = false;
    raise_key_press(site_, kKeyPress, key_ascii);

    const bool person = !site_.keyboard().delivering_sent_keys();
    // A caret the person moved, or a selection they made, since their last keystroke starts
    // the typing afresh.
    if (person && (MskDate.SelStart() != caret_after_key_ || MskDate.SelLength() != 0)) forget_typing();

    if (key_ascii == kCharEnter) {
        key_ascii = 0;
        return;
    }
    const bool slash = key_ascii == kCharSlash && !ctrl_down_ && date_style_ == ddMMyyyy;
    if (slash && person && confirm_pending_) {
        // The digit before it already filled the field and carried the caret on: this "/" is
        // the clerk's separator, and the field is complete as typed.
        confirm_pending_ = false;
        key_ascii = 0;
        return;
    }
    // Typing always overwrites: the character at the caret is selected to be replaced.
    if (key_ascii != kCharBackspace) {
        prepare_overwrite(key_ascii);
        MskDate.SelLength(1);
    }
    if (ctrl_down_) return;

    if (date_style_ == ddMMyyyy) {
        if (key_ascii == kCharSlash) {
            complete_field(person && typed_field_ != DateField::none &&
                           typed_field_ == DateFieldAt(MskDate.SelStart()));
            forget_typing();
            key_ascii = 0;  // the separators are the mask's own
        }
    } else if (date_style_ == mmyyA) {
        if (key_ascii >= 'a' && key_ascii <= 'z') key_ascii = static_cast<int16_t>(key_ascii - ('a' - 'A'));
    }
    if (person && inserts_character(key_ascii)) {
        typed_at_ = first_input_position(MskDate.Mask(), MskDate.SelStart());
        typed_char_ = static_cast<char>(static_cast<uint8_t>(key_ascii));
    }
}

void KelDateMask::prepare_overwrite(int16_t key_ascii) {
    const int32_t start = MskDate.SelStart();
    if (MskDate.SelLength() <= 1) return;
    if (key_ascii == kCharSlash) {
        // Over a selection "/" completes the field where the selection starts.
        MskDate.SelStart(start);
        return;
    }
    // Only a key that will type a character clears the selection: a dropped key, Escape or a
    // Ctrl combination leaves the text as it was.
    if (!inserts_character(key_ascii) || ctrl_down_) return;
    const std::string mask = MskDate.Mask();
    const int32_t at = first_input_position(mask, start);
    if (at < 0 || !mask_fits(static_cast<char>(static_cast<uint8_t>(key_ascii)), mask[static_cast<std::size_t>(at)]))
        return;
    MskDate.Text(BlankSelection(MskDate.Text(), mask, start, MskDate.SelLength()));
    MskDate.SelStart(start);
}

void KelDateMask::complete_field(bool typed_here) {
    const int32_t caret = MskDate.SelStart();
    std::string t = PromptToBlank(MskDate.Text(), date_style_);
    if (typed_here) t = BlankFieldFromCaret(t, caret);
    Keyboard& keys = site_.keyboard();
    if (caret >= 0 && caret <= 2) {
        // The day is cleared and typed again in full by the queued keystrokes, which carry
        // the caret past the separator into the month.
        const std::string day = FormatDayPart(t);
        keys.send_keys("{HOME}{DEL}{DEL}");
        if (!day.empty()) {
            keys.send_keys(day);
            MskDate.SelStart(3);
        }
    } else if (caret >= 3 && caret <= 5) {
        const std::string month = FormatMonthPart(t);
        MskDate.SelStart(3);
        keys.send_keys("{DEL}{DEL}");
        if (!month.empty()) keys.send_keys(month);
    } else {
        MskDate.SelStart(0);
    }
}

void KelDateMask::MskDate_KeyUp(int16_t& key_code, int16_t& shift) {
    raise_key_event(site_, kKeyUp, "KeyUp", key_code, shift);
    validated_ = false;
    if (!site_.keyboard().delivering_sent_keys()) note_typing();
    caret_after_key_ = MskDate.SelLength() == 0 ? MskDate.SelStart() : -1;
    typed_at_ = -1;
}

void KelDateMask::note_typing() {
    const std::string text = MskDate.Text();
    const int32_t caret = MskDate.SelStart();
    const bool landed = typed_at_ >= 0 && typed_at_ < static_cast<int32_t>(text.size()) &&
                        text[static_cast<std::size_t>(typed_at_)] == typed_char_ && caret > typed_at_;
    if (!landed || date_style_ != ddMMyyyy) {
        // Any key that typed nothing (a caret key, Backspace, a refused or dropped key)
        // leaves nothing for "/" to confirm or complete from.
        forget_typing();
        return;
    }
    // The last digit of the day or month carries the caret past the separator: the field is
    // full, and the caret has entered the next one with nothing typed there yet.
    confirm_pending_ = (typed_at_ == 1 || typed_at_ == 4) && caret == typed_at_ + 2;
    typed_field_ = confirm_pending_ ? DateField::none : DateFieldAt(typed_at_);
}

void KelDateMask::forget_typing() {
    typed_field_ = DateField::none;
    confirm_pending_ = false;
}

void KelDateMask::MskDate_Change() {
    if (enabled_ && !locked_) site_.raise_event(kChange, "Change", {});
}

void KelDateMask::ImgButton_Click() {
    if (enabled_ && !locked_) site_.raise_event(kButtonClick, "ButtonClick", {});
}

}  // namespace kel
