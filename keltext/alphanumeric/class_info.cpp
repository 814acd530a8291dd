#include "keltext/alphanumeric/class_info.h"

#include "keltext/alphanumeric/kel_alpha_numeric.h"
#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/font.h"

namespace kel {
namespace {

using T = KelAlphaNumeric;

// Late-bound values arrive as variants and are converted as the published parameter types
// take them: a value that does not convert is the caller's error (13 or 6).
KelANTxtType as_text_type(const Variant& v) { return static_cast<KelANTxtType>(to_int32(v)); }
KelANBorderStyle as_border_style(const Variant& v) { return static_cast<KelANBorderStyle>(to_int32(v)); }

}  // namespace

ClassInfo kel_alpha_numeric_class() {
    return ClassBuilder<T>("KelAlphaNumeric",
                           "One-line text box that accepts one class of characters and shapes their case")
        .property("TextType", "KelANTxtType", [](T& c) { return Variant(int32_t{c.TextType()}); },
                  [](T& c, const Variant& v) { c.TextType(as_text_type(v)); },
                  "Returns/sets the class of characters the box accepts and how their case is shaped")
        .property("Locked", "Boolean", [](T& c) { return Variant(c.Locked()); },
                  [](T& c, const Variant& v) { c.Locked(to_bool(v)); },
                  "Determines whether the control can take focus and input")
        .property("Borderstyle", "KelANBorderStyle", [](T& c) { return Variant(int32_t{c.Borderstyle()}); },
                  [](T& c, const Variant& v) { c.Borderstyle(as_border_style(v)); },
                  "Returns/sets the border style of the control")
        .property("Text", "Variant", [](T& c) { return c.Text(); }, [](T& c, const Variant& v) { c.Text(v); },
                  "Returns/sets the text in the box", kDefaultMember)
        .property("BackColor", "OLE_COLOR", [](T& c) { return Variant(c.BackColor()); },
                  [](T& c, const Variant& v) { c.BackColor(to_int32(v)); },
                  "Returns/sets the background color")
        .property("ForeColor", "OLE_COLOR", [](T& c) { return Variant(c.ForeColor()); },
                  [](T& c, const Variant& v) { c.ForeColor(to_int32(v)); },
                  "Returns/sets the text color")
        .property("Font", "Font", [](T& c) { return c.Font() ? Variant(c.Font()) : Variant(); },
                  [](T& c, const Variant& v) { c.Font(require_font(v)); }, "Returns/sets the font of the text")
        .property("MaxLength", "Variant", [](T& c) { return c.MaxLength(); },
                  [](T& c, const Variant& v) { c.MaxLength(v); },
                  "Returns/sets the most characters the box takes from the keyboard (0: no limit)")
        .property("MaxValue", "Variant", [](T& c) { return c.MaxValue(); },
                  [](T& c, const Variant& v) { c.MaxValue(v); },
                  "Returns/sets the largest value a digits box keeps when focus leaves it (0: none)", kHidden)
        .property("MinValue", "Variant", [](T& c) { return c.MinValue(); },
                  [](T& c, const Variant& v) { c.MinValue(v); },
                  "Returns/sets the smallest value a digits box keeps when focus leaves it", kHidden)
        .property("Enabled", "Boolean", [](T& c) { return Variant(c.Enabled()); },
                  [](T& c, const Variant& v) { c.Enabled(to_bool(v)); },
                  "Returns/sets whether the control responds to the user")
        .method("Refresh", {},
                [](T& c, std::span<const Variant>) {
                    c.Refresh();
                    return Variant();
                },
                "Repaints the control")
        .property("SelStart", "Variant", [](T& c) { return c.SelStart(); },
                  [](T& c, const Variant& v) { c.SelStart(v); },
                  "Returns/sets the caret position, the start of the selection", kHidden)
        .property("Sellength", "Variant", [](T& c) { return c.Sellength(); },
                  [](T& c, const Variant& v) { c.Sellength(v); }, "Returns/sets the length of the selection",
                  kHidden)
        .property("SelText", "Variant", [](T& c) { return c.SelText(); }, {}, "Returns the selected text",
                  kHidden)
        .property("TextSelect", "Boolean", [](T& c) { return Variant(c.TextSelect()); },
                  [](T& c, const Variant& v) { c.TextSelect(to_bool(v)); },
                  "Determines whether the whole text is selected when focus enters the control")
        .property("hWnd", "Variant", [](T& c) { return c.hWnd(); }, {}, "Returns the window handle of the control")
        .event(T::kClick, "Click", {}, "Occurs when the user clicks the box")
        .event(T::kDblClick, "DblClick", {}, "Occurs when the user double-clicks the box")
        .event(T::kChange, "Change", {}, "Occurs when the text has changed")
        .event(T::kKeyDown, "KeyDown", key_event_args(), "Occurs when the user presses a key")
        .event(T::kKeyPress, "KeyPress", {{"KeyAscii", "Integer"}},
               "Occurs when the user types a character, before the box filters it")
        .event(T::kKeyUp, "KeyUp", key_event_args(), "Occurs when the user releases a key")
        .event(T::kMouseDown, "MouseDown", mouse_event_args(), "Occurs when the user presses a mouse button")
        .event(T::kMouseMove, "MouseMove", mouse_event_args(), "Occurs when the user moves the mouse")
        .event(T::kMouseUp, "MouseUp", mouse_event_args(), "Occurs when the user releases a mouse button")
        .enumeration("KelANTxtType", {{"KelANTitleCase", KelANTitleCase},
                                      {"KelANUpperCase", KelANUpperCase},
                                      {"KelANCommStyle", KelANCommStyle},
                                      {"KelANUAlphaNumeric", KelANUAlphaNumeric},
                                      {"KelANDigits", KelANDigits},
                                      {"KelANUserKeys", KelANUserKeys},
                                      {"KelANSentence", KelANSentence}})
        .enumeration("KelANBorderStyle", {{"KelANPlain", KelANPlain}, {"KelANFixedSingle", KelANFixedSingle}})
        .build();
}

}  // namespace kel
