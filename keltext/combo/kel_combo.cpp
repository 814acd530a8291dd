#include "keltext/combo/kel_combo.h"

#include <algorithm>
#include <array>

#include "keltext/combo/list_string.h"
#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/keys.h"

namespace kel {
namespace {

constexpr Colour kDesignBackColor = 0xFFECC8;
constexpr Colour kStoredBackColor = 0xFFEFD0;  // the default the saved settings are read with
constexpr Colour kForeColor = 0xC00000;
constexpr float kMinWidth = 540;
constexpr float kHeight = 353;

bool holds_int16(const Variant& v) { return v.kind() == VarKind::Int16; }

int16_t to_int16_saturated(int32_t v) {
    return static_cast<int16_t>(std::clamp<int32_t>(v, INT16_MIN, INT16_MAX));
}

}  // namespace

KelCombo::KelCombo(Site& site) : site_(site), cboCustom(site.create_combo_box("cboCustom")) {
    cboCustom.BackColor(kDesignBackColor);
    cboCustom.ForeColor(kForeColor);
    cboCustom.Left(0);
    cboCustom.Top(0);

    WidgetEvents events;
    events.click = [this] { raise(kClick, "Click"); };
    events.dbl_click = [this] { raise(kDblClick, "DblClick"); };
    events.drop_down = [this] { raise(kDropDown, "DropDown"); };
    events.change = [this] { on_change(); };
    events.key_down = [this](int16_t& k, int16_t& s) { on_key_down(k, s); };
    events.key_press = [this](int16_t& k) { on_key_press(k); };
    events.key_up = [this](int16_t& k, int16_t& s) { on_key_up(k, s); };
    events.scroll = [this] { raise(kScroll, "Scroll"); };
    events.got_focus = [this] { on_got_focus(); };
    cboCustom.set_events(std::move(events));
}

// --- Events to the form ----------------------------------------------------------------------

void KelCombo::raise(Event number, std::string_view name) { site_.raise_event(number, name, {}); }

// --- Container events --------------------------------------------------------------------------

void KelCombo::InitProperties() {
    cboCustom.Top(0);
    site_.surface().Height(320);
    m_Enabled = true;
    m_Locked = false;
    m_AutoSearch = true;
    cboCustom.Text("");
}

void KelCombo::ReadProperties(PropertyBag& bag) {
    // A stored value that cannot be read skips its own step only: the list and the text must
    // load whatever else the saved settings hold, or the next save writes the combo back empty.
    if (const Variant v = bag.read("FillList", Variant("")); !v.is_object()) m_FillList = text_of(v);
    if (const auto c = stored_int32(bag.read("Forecolor", Variant(kForeColor)))) cboCustom.ForeColor(*c);
    if (const auto c = stored_int32(bag.read("BackColor", Variant(kStoredBackColor)))) cboCustom.BackColor(*c);
    Font(font_of(bag.read("Font", Variant(cboCustom.Font()))));
    if (const auto m = stored_int16(bag.read("MaxLength", Variant(int16_t{0})))) m_MaxLength = *m;
    if (const auto b = stored_bool(bag.read("AutoSearch", Variant(false)))) m_AutoSearch = *b;
    if (const auto b = stored_bool(bag.read("Enabled", Variant(true)))) Enabled(*b);
    if (const auto b = stored_bool(bag.read("Locked", Variant(false)))) Locked(*b);
    if (const auto t = stored_int32(bag.read("TextType", Variant(int32_t{KelCboTitleCase})))) m_TextType = *t;
    // The visible list is rebuilt from the saved list string, and only here. A string of more
    // entries than the list holds loads the first ones; m_FillList keeps it whole, so that an
    // unedited combo saves all of it again.
    DecodeFillList(cboCustom, m_FillList);
    if (const Variant t = bag.read("Text", Variant("")); !t.is_object()) {
        const std::string text = text_of(t);
        cboCustom.Text(text);
        m_Text = text;
    }
}

void KelCombo::WriteProperties(PropertyBag& bag) {
    bag.write("TextType", Variant(m_TextType), Variant(int32_t{KelCboTitleCase}));
    bag.write("Forecolor", Variant(cboCustom.ForeColor()), Variant(kForeColor));
    bag.write("Backcolor", Variant(cboCustom.BackColor()), Variant(kStoredBackColor));
    bag.write("Font", Variant(cboCustom.Font()), Variant());
    bag.write("MaxLength", Variant(m_MaxLength), Variant(int16_t{0}));
    bag.write("Text", Variant(m_Text), Variant(""));
    bag.write("AutoSearch", Variant(m_AutoSearch), Variant(false));
    bag.write("Locked", Variant(m_Locked), Variant(false));
    bag.write("Enabled", Variant(m_Enabled), Variant(true));
    bag.write("FillList", Variant(m_FillList), Variant(""));
}

void KelCombo::Resize() {
    Surface& surface = site_.surface();
    if (surface.Width() <= kMinWidth) surface.Width(kMinWidth);
    cboCustom.Width(surface.Width());
    surface.Height(kHeight);
    site_.keyboard().process_pending();
}

// --- Handlers of cboCustom ---------------------------------------------------------------------

void KelCombo::on_key_down(int16_t& key_code, int16_t& shift) {
    raise_key_event(site_, kKeyDown, "KeyDown", key_code, shift);
    CtrlDown = (shift & kCtrlMask) != 0;
    if (CtrlDown) return;
    // Up on the first entry and Down on the last wrap around the list; the key is consumed
    // even where there is nothing to wrap to (Down in an empty list).
    const int32_t count = cboCustom.ListCount();
    if (key_code == kVkUp) {
        if (cboCustom.ListIndex() == 0) {
            if (count > 0) cboCustom.ListIndex(count - 1);
            key_code = 0;
        }
    } else if (key_code == kVkDown) {
        if (cboCustom.ListIndex() == count - 1) {
            if (count > 0) cboCustom.ListIndex(0);
            key_code = 0;
        }
    }
}

void KelCombo::on_key_press(int16_t& key_ascii) {
    const bool edit_key = key_ascii == kCharBackspace || key_ascii == kCharTab || key_ascii == kCharLineFeed ||
                          key_ascii == kCharEnter;
    if (m_MaxLength > 0 && !edit_key && cboCustom.SelLength() == 0 &&
        cboCustom.Text().size() == static_cast<std::size_t>(m_MaxLength)) {
        key_ascii = 0;
        return;
    }
    if (CtrlDown) return;

    raise_key_press(site_, kKeyPress, key_ascii);

    // A key the form dropped stays dropped: the filter must not make a character of code 0.
    if (key_ascii == 0) return;
    if (key_ascii == kCharBackspace || key_ascii == kCharTab || key_ascii == kCharLineFeed) return;
    if (key_ascii == kCharEnter) {
        key_ascii = 0;
        return;
    }
    SavedSelStart = to_int16_saturated(cboCustom.SelStart());
    key_ascii = FilterKey(key_ascii);
}

int16_t KelCombo::FilterKey(int16_t code) {
    OverwriteMode = site_.keyboard().key_state(kVkInsert) == 1;
    const std::string text = cboCustom.Text();
    ComboEdit edit;
    edit.text = text;
    edit.sel_start = cboCustom.SelStart();
    edit.sel_length = cboCustom.SelLength();
    edit.saved_sel_start = SavedSelStart;
    edit.overwrite = OverwriteMode;
    const ComboDecision d = filter_combo_key(m_TextType, edit, code);
    if (d.select_one) cboCustom.SelLength(1);
    if (d.text) cboCustom.Text(*d.text);
    // The field refuses a caret before the start; the rule never asks for one.
    if (d.sel_start && *d.sel_start >= 0) cboCustom.SelStart(*d.sel_start);
    return d.key;
}

void KelCombo::on_key_up(int16_t& key_code, int16_t& shift) {
    raise_key_event(site_, kKeyUp, "KeyUp", key_code, shift);
    if (m_AutoSearch) d_ComboSearch(key_code);
}

void KelCombo::on_change() {
    raise(kChange, "Change");
    if (m_MaxLength > 0) {
        const std::string text = cboCustom.Text();
        if (text.size() > static_cast<std::size_t>(m_MaxLength)) cboCustom.Text(text.substr(0, m_MaxLength));
    }
}

void KelCombo::on_got_focus() {
    // The text is selected for overtyping, all but its trailing spaces.
    if (cboCustom.SelLength() != 0) return;
    cboCustom.SelStart(0);
    cboCustom.SelLength(length_without_trailing_spaces(cboCustom.Text()));
}

// --- Methods -------------------------------------------------------------------------------

void KelCombo::d_ComboSearch(int16_t& PKeyCode) {
    if (cboCustom.Style() == 2) return;  // a drop-down list has no text to complete
    const bool sorted = cboCustom.Sorted();
    if (search_ignores_key(PKeyCode)) return;
    const std::string typed = cboCustom.Text();
    const int32_t found = find_completion(typed, cboCustom.ListCount(), sorted,
                                          [this](int32_t i) { return cboCustom.list_text(i, search_buffer_); });
    if (found < 0) return;
    const std::string completed = cboCustom.List(found);
    const auto n = static_cast<int32_t>(typed.size());
    cboCustom.Text(completed);
    cboCustom.SelStart(n);
    // One more than the completed tail: the widget cuts the selection at the end of the text.
    cboCustom.SelLength(std::max<int32_t>(static_cast<int32_t>(completed.size()) - n + 1, 0));
}

void KelCombo::AddItem(const std::string& sItem, std::optional<int16_t> iIndex) {
    if (m_MaxLength < 0 || cboCustom.ListCount() >= kMaxListEntries) raise_error(kInvalidProcedureCall);
    const std::string item = m_MaxLength >= 1 ? sItem.substr(0, static_cast<std::size_t>(m_MaxLength)) : sItem;
    if (iIndex)
        cboCustom.AddItem(item, *iIndex);
    else
        cboCustom.AddItem(item);
}

void KelCombo::RemoveItem(int16_t iIndex) { cboCustom.RemoveItem(iIndex); }
void KelCombo::Clear() { cboCustom.Clear(); }
void KelCombo::Refresh() { site_.surface().Refresh(); }

// --- Properties ----------------------------------------------------------------------------

Variant KelCombo::Text() const {
    // At design time the widget may show an entry chosen since; the saved text is m_Text.
    if (site_.user_mode()) return Variant(cboCustom.Text());
    return Variant(m_Text);
}

void KelCombo::Text(const Variant& v) {
    const std::string text = text_of(v);
    cboCustom.Text(text);
    m_Text = text;
    site_.property_changed("Text");
}

Variant KelCombo::ListIndex() const { return Variant(to_int16(static_cast<double>(cboCustom.ListIndex()))); }

void KelCombo::ListIndex(const Variant& v) {
    cboCustom.ListIndex(to_int16(v));
    site_.property_changed("ListIndex");
}

int16_t KelCombo::ListCount() const { return to_int16(static_cast<double>(cboCustom.ListCount())); }
int16_t KelCombo::NewIndex() const { return to_int16(static_cast<double>(cboCustom.NewIndex())); }

Variant KelCombo::List(const Variant& iIndex) const {
    if (!holds_int16(iIndex)) return Variant();
    return Variant(cboCustom.List(*iIndex.get_if<int16_t>()));
}

void KelCombo::List(const Variant& iIndex, const Variant& v) {
    if (!holds_int16(iIndex)) return;
    cboCustom.List(*iIndex.get_if<int16_t>(), text_of(v));
    site_.property_changed("List");
}

Variant KelCombo::ItemData(const Variant& iIndex) const {
    if (!holds_int16(iIndex)) return Variant();
    return Variant(static_cast<double>(cboCustom.ItemData(*iIndex.get_if<int16_t>())));
}

void KelCombo::ItemData(const Variant& iIndex, const Variant& v) {
    if (!holds_int16(iIndex)) return;
    const int32_t data = to_int32(leading_value(text_of(v)));
    cboCustom.ItemData(*iIndex.get_if<int16_t>(), data);
    site_.property_changed("ItemData");
}

std::string KelCombo::FillList() const { return m_FillList; }

void KelCombo::FillList(const std::string& v) {
    m_FillList = v;
    site_.property_changed("FillList");
}

Variant KelCombo::MaxLength() const { return Variant(m_MaxLength); }

void KelCombo::MaxLength(const Variant& v) {
    if (!numeric_test(v)) {
        site_.property_changed("MaxLength");
        return;
    }
    // A value beyond 16 bits leaves the limit as it was.
    const double r = round_half_even(leading_value(text_of(v)));
    if (r >= INT16_MIN && r <= INT16_MAX) m_MaxLength = static_cast<int16_t>(r);
    // At design time a small font sizes the control to the text it can hold: 120 a character
    // plus the box's border and its button. A width below 0 is one the surface would refuse.
    if (!site_.user_mode() && cboCustom.FontSize() < 10 && m_MaxLength < 61) {
        const int width = m_MaxLength * 120 + 270;
        if (width >= 0) site_.surface().Width(static_cast<float>(width));
    }
    site_.property_changed("MaxLength");
}

KelCboType KelCombo::TextType() const { return static_cast<KelCboType>(m_TextType); }

void KelCombo::TextType(KelCboType v) {
    m_TextType = v;
    site_.property_changed("TextType");
}

bool KelCombo::AutoSearch() const { return m_AutoSearch; }

void KelCombo::AutoSearch(bool v) {
    m_AutoSearch = v;
    site_.property_changed("AutoSearch");
}

bool KelCombo::Enabled() const { return m_Enabled; }

void KelCombo::Enabled(bool v) {
    m_Enabled = v;
    cboCustom.Enabled(v);
    site_.surface().Enabled(v);
    site_.property_changed("Enabled");
}

bool KelCombo::Locked() const { return m_Locked; }

void KelCombo::Locked(bool v) {
    // Only the surface: a locked combo takes no focus, while the widget keeps its own state.
    m_Locked = v;
    site_.surface().Enabled(!v);
    site_.property_changed("Locked");
}

Colour KelCombo::BackColor() const { return cboCustom.BackColor(); }

void KelCombo::BackColor(Colour c) {
    cboCustom.BackColor(c);
    site_.property_changed("BackColor");
}

Colour KelCombo::ForeColor() const { return cboCustom.ForeColor(); }

void KelCombo::ForeColor(Colour c) {
    cboCustom.ForeColor(c);
    site_.property_changed("ForeColor");
}

std::shared_ptr<kel::Font> KelCombo::Font() const { return cboCustom.Font(); }

void KelCombo::Font(std::shared_ptr<kel::Font> f) {
    if (f) cboCustom.Font(std::move(f));
    site_.property_changed("Font");
}

Variant KelCombo::SelStart() const { return Variant(cboCustom.SelStart()); }

void KelCombo::SelStart(const Variant& v) {
    if (!numeric_test(v)) return;
    cboCustom.SelStart(to_int32(v));
}

Variant KelCombo::Sellength() const { return Variant(cboCustom.SelLength()); }

void KelCombo::Sellength(const Variant& v) {
    if (!numeric_test(v)) return;
    cboCustom.SelLength(to_int32(v));
}

Variant KelCombo::SelText() const { return Variant(cboCustom.SelText()); }

Variant KelCombo::hWnd() const { return Variant(site_.surface().hWnd()); }

}  // namespace kel
