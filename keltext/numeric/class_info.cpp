#include "keltext/numeric/class_info.h"

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/font.h"
#include "keltext/numeric/kel_numeric.h"

namespace kel {
namespace {

using T = KelNumeric;

// Late-bound values arrive as variants and are converted as the published parameter types
// take them: a value that does not convert is the caller's error (13 or 6).
}  // namespace

ClassInfo kel_numeric_class() {
    // The description texts are the ones the property browser has always shown, blanks and all.
    return ClassBuilder<T>("KelNumeric",
                           "Box for a decimal number with fixed decimals, Indian digit grouping and spin buttons")
        .property("Locked", "Boolean", [](T& c) { return Variant(c.Locked()); },
                  [](T& c, const Variant& v) { c.Locked(to_bool(v)); }, "Determines whether a control can be edited")
        .property("TriggerError", "Boolean", [](T& c) { return Variant(c.TriggerError()); },
                  [](T& c, const Variant& v) { c.TriggerError(to_bool(v)); },
                  "(True/False) Option for raising error at run time")
        .property("Mask", "String", [](T& c) { return Variant(c.Mask()); },
                  [](T& c, const Variant& v) { c.Mask(text_of(v)); }, "", kHidden)
        .property("TxtFormat", "Boolean", [](T& c) { return Variant(c.TxtFormat()); },
                  [](T& c, const Variant& v) { c.TxtFormat(to_bool(v)); },
                  "Output will be displayed as formatted  in Indian Currency Style")
        .property("Borderstyle", "KelNBorderStyle", [](T& c) { return Variant(int32_t{c.Borderstyle()}); },
                  [](T& c, const Variant& v) { c.Borderstyle(static_cast<KelNBorderStyle>(to_int32(v))); }, "")
        .property("Text", "Variant", [](T& c) { return c.Text(); }, [](T& c, const Variant& v) { c.Text(v); },
                  "Returns/Sets the text", kDefaultMember | kHidden)
        .property("MaxValue", "Variant", [](T& c) { return c.MaxValue(); },
                  [](T& c, const Variant& v) { c.MaxValue(v); },
                  "Returns/sets maximum value the control can accomodate")
        .property("MinValue", "Variant", [](T& c) { return c.MinValue(); },
                  [](T& c, const Variant& v) { c.MinValue(v); },
                  "Returns/sets  minimum value the control can accomodate")
        .property("BackColor", "OLE_COLOR", [](T& c) { return Variant(c.BackColor()); },
                  [](T& c, const Variant& v) { c.BackColor(to_int32(v)); },
                  "Returns/Sets  the Background color used to ")
        .property("ForeColor", "OLE_COLOR", [](T& c) { return Variant(c.ForeColor()); },
                  [](T& c, const Variant& v) { c.ForeColor(to_int32(v)); },
                  "Returns/Sets  the Foreground color used to ")
        .property("Font", "Font", [](T& c) { return c.Font() ? Variant(c.Font()) : Variant(); },
                  [](T& c, const Variant& v) { c.Font(require_font(v)); }, "Returns a  Font Object")
        .property("MaxLength", "Integer", [](T& c) { return Variant(c.MaxLength()); },
                  [](T& c, const Variant& v) { c.MaxLength(to_int16(v)); },
                  "Returns/Sets Maximum Length includes the decimal point and decimal part")
        .property("NoOfDecimals", "Integer", [](T& c) { return Variant(c.NoOfDecimals()); },
                  [](T& c, const Variant& v) { c.NoOfDecimals(to_int16(v)); }, "No of Decimals in the Numeric Value")
        .method("Refresh", {},
                [](T& c, std::span<const Variant>) {
                    c.Refresh();
                    return Variant();
                },
                "")
        .property("Enabled", "Boolean", [](T& c) { return Variant(c.Enabled()); },
                  [](T& c, const Variant& v) { c.Enabled(to_bool(v)); },
                  "Returns/Sets a value that determines whether an object can respond to user generated events")
        .property("UpDownScroll", "Boolean", [](T& c) { return Variant(c.UpDownScroll()); },
                  [](T& c, const Variant& v) { c.UpDownScroll(to_bool(v)); },
                  "Returns/Sets a Value indicating whether an object has a vertical or horizontal scroll bars")
        .property("Increment", "Variant", [](T& c) { return c.Increment(); },
                  [](T& c, const Variant& v) { c.Increment(v); },
                  "Get/Set the amount by which the position changes on each disk")
        .property("hWnd", "Variant", [](T& c) { return c.hWnd(); }, {}, "")
        .event(T::kClick, "Click")
        .event(T::kDblClick, "DblClick")
        .event(T::kChange, "Change")
        .event(T::kKeyDown, "KeyDown", key_event_args())
        .event(T::kKeyPress, "KeyPress", {{"KeyAscii", "Integer"}})
        .event(T::kKeyUp, "KeyUp", key_event_args())
        .event(T::kMouseDown, "MouseDown", mouse_event_args())
        .event(T::kMouseMove, "MouseMove", mouse_event_args())
        .event(T::kMouseUp, "MouseUp", mouse_event_args())
        .event(T::kControlError, "ControlError")
        .enumeration("KelNBorderStyle", {{"KelNPlain", KelNPlain}, {"KelNFixedSingle", KelNFixedSingle}})
        .build();
}

}  // namespace kel
