#include "keltext/combo/class_info.h"

#include <optional>

#include "keltext/combo/kel_combo.h"
#include "keltext/combo/pag_combo.h"
#include "keltext/host/conversions.h"

namespace kel {
namespace {

// A colour given as a number: 32-bit as it stands, and an unsigned 32-bit value (a system
// colour written as 2147483665) as its bit pattern.
Colour colour_of(const Variant& v) {
    const double d = to_double(v);
    if (d >= 2147483648.0 && d < 4294967296.0) return static_cast<Colour>(static_cast<int64_t>(d) - 4294967296LL);
    return to_int32(v);
}

}  // namespace

ClassInfo kel_combo_class() {
    using C = KelCombo;
    return ClassBuilder<C>("KelCombo", "Combo box with a character filter, incremental search and a saved list")
        .property("Text", "Variant", [](C& c) { return c.Text(); }, [](C& c, const Variant& v) { c.Text(v); },
                  "Returns/sets the text in the edit field.", kDefaultMember)
        .property("ListIndex", "Variant", [](C& c) { return c.ListIndex(); },
                  [](C& c, const Variant& v) { c.ListIndex(v); }, "Returns/sets the index of the selected entry.")
        .property("ListCount", "Integer", [](C& c) { return Variant(c.ListCount()); }, nullptr,
                  "Returns the number of entries in the list.")
        .property("NewIndex", "Integer", [](C& c) { return Variant(c.NewIndex()); }, nullptr,
                  "Returns the index of the entry added last.")
        .indexed_property("List", "Variant", [](C& c, const Variant& i) { return c.List(i); },
                          [](C& c, const Variant& i, const Variant& v) { c.List(i, v); },
                          "Returns/sets the text of an entry.")
        .indexed_property("ItemData", "Variant", [](C& c, const Variant& i) { return c.ItemData(i); },
                          [](C& c, const Variant& i, const Variant& v) { c.ItemData(i, v); },
                          "Returns/sets the number stored with an entry.")
        .property("FillList", "String", [](C& c) { return Variant(c.FillList()); },
                  [](C& c, const Variant& v) { c.FillList(text_of(v)); },
                  "Returns/sets the whole list as one string, used when the form is loaded.")
        .property("MaxLength", "Variant", [](C& c) { return c.MaxLength(); },
                  [](C& c, const Variant& v) { c.MaxLength(v); },
                  "Returns/sets the maximum number of characters in the edit field (0: no limit).")
        .property("TextType", "KelCboType", [](C& c) { return Variant(static_cast<int32_t>(c.TextType())); },
                  [](C& c, const Variant& v) { c.TextType(static_cast<KelCboType>(to_int32(v))); },
                  "Returns/sets the class of characters the edit field takes.")
        .property("AutoSearch", "Boolean", [](C& c) { return Variant(c.AutoSearch()); },
                  [](C& c, const Variant& v) { c.AutoSearch(to_bool(v)); },
                  "Returns/sets whether typed text is completed from the list.")
        .property("Enabled", "Boolean", [](C& c) { return Variant(c.Enabled()); },
                  [](C& c, const Variant& v) { c.Enabled(to_bool(v)); },
                  "Returns/sets whether the control responds to the user.")
        .property("Locked", "Boolean", [](C& c) { return Variant(c.Locked()); },
                  [](C& c, const Variant& v) { c.Locked(to_bool(v)); },
                  "Returns/sets whether the control can be edited.")
        .property("BackColor", "OLE_COLOR", [](C& c) { return Variant(c.BackColor()); },
                  [](C& c, const Variant& v) { c.BackColor(colour_of(v)); },
                  "Returns/sets the background colour.")
        .property("ForeColor", "OLE_COLOR", [](C& c) { return Variant(c.ForeColor()); },
                  [](C& c, const Variant& v) { c.ForeColor(colour_of(v)); }, "Returns/sets the text colour.")
        .property("Font", "Font", [](C& c) { return Variant(c.Font()); },
                  [](C& c, const Variant& v) { c.Font(font_of(v)); }, "Returns/sets the font of the text.")
        .property("SelStart", "Variant", [](C& c) { return c.SelStart(); },
                  [](C& c, const Variant& v) { c.SelStart(v); },
                  "Returns/sets the start of the selected text.")
        .property("Sellength", "Variant", [](C& c) { return c.Sellength(); },
                  [](C& c, const Variant& v) { c.Sellength(v); },
                  "Returns/sets the length of the selected text.")
        .property("SelText", "Variant", [](C& c) { return c.SelText(); }, nullptr,
                  "Returns the selected text.")
        .property("hWnd", "Variant", [](C& c) { return c.hWnd(); }, nullptr,
                  "Returns the window handle of the control.")
        .method("AddItem", {{"sItem", "String"}, {"iIndex", "Variant", true}},
                [](C& c, std::span<const Variant> a) {
                    std::optional<int16_t> index;
                    if (a.size() > 1) index = to_int16(a[1]);
                    c.AddItem(text_of(a[0]), index);
                    return Variant();
                },
                "Adds an entry to the list, at the index given or at the end.")
        .method("RemoveItem", {{"iIndex", "Integer"}},
                [](C& c, std::span<const Variant> a) {
                    c.RemoveItem(to_int16(a[0]));
                    return Variant();
                },
                "Removes an entry from the list.")
        .method("Clear", {},
                [](C& c, std::span<const Variant>) {
                    c.Clear();
                    return Variant();
                },
                "Removes every entry from the list.")
        .method("Refresh", {},
                [](C& c, std::span<const Variant>) {
                    c.Refresh();
                    return Variant();
                },
                "Redraws the control.")
        .method("d_ComboSearch", {{"PKeyCode", "Integer"}},
                [](C& c, std::span<const Variant> a) {
                    int16_t key = to_int16(a[0]);
                    c.d_ComboSearch(key);
                    return Variant();
                },
                "Completes the text from the first list entry that begins with it.")
        .event(KelCombo::kClick, "Click")
        .event(KelCombo::kDblClick, "DblClick")
        .event(KelCombo::kDropDown, "DropDown")
        .event(KelCombo::kChange, "Change")
        .event(KelCombo::kKeyDown, "KeyDown", key_event_args())
        .event(KelCombo::kKeyPress, "KeyPress", {{"KeyAscii", "Integer"}})
        .event(KelCombo::kKeyUp, "KeyUp", key_event_args())
        .event(KelCombo::kScroll, "Scroll")
        .enumeration("KelCboType", {{"KelCboTitleCase", KelCboTitleCase},
                                    {"KelCboUserKeys", KelCboUserKeys},
                                    {"KelCboUpperCase", KelCboUpperCase},
                                    {"KelCboUAlphaNumeric", KelCboUAlphaNumeric},
                                    {"KelCboSentence", KelCboSentence},
                                    {"KelCboDigits", KelCboDigits}})
        .build();
}

ClassInfo pag_combo_class() { return ClassBuilder<pagCombo>("pagCombo", "Settings", true).build(); }

}  // namespace kel
