#include "keltext/datemask/class_info.h"

#include "keltext/datemask/kel_date_mask.h"
#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"

namespace kel {

ClassInfo kel_date_mask_class() {
    using C = KelDateMask;
    const std::vector<ArgInfo> key_args = key_event_args();
    const std::vector<ArgInfo> mouse_args = mouse_event_args();
    return ClassBuilder<C>("KelDateMask", "Masked date box with a calendar button")
        .property("ZubDate", "Boolean", [](C& c) { return Variant(c.ZubDate()); },
                  [](C& c, const Variant& v) { c.ZubDate(to_bool(v)); },
                  "True/False sets No. of days in a month to 28 ")
        .property("MaxDate", "Variant", [](C& c) { return c.MaxDate(); },
                  [](C& c, const Variant& v) { c.MaxDate(v); }, "")
        .property("MinDate", "Variant", [](C& c) { return c.MinDate(); },
                  [](C& c, const Variant& v) { c.MinDate(v); }, "")
        .property("TriggerError", "Boolean", [](C& c) { return Variant(c.TriggerError()); },
                  [](C& c, const Variant& v) { c.TriggerError(to_bool(v)); },
                  "True Sets No Validation Mode.Triggers DateError Event.")
        .property("BackColor", "OLE_COLOR", [](C& c) { return Variant(c.BackColor()); },
                  [](C& c, const Variant& v) { c.BackColor(to_int32(v)); }, "")
        .property("ForeColor", "OLE_COLOR", [](C& c) { return Variant(c.ForeColor()); },
                  [](C& c, const Variant& v) { c.ForeColor(to_int32(v)); },
                  "Returns/Sets  the Foreground color used to ")
        .property("Font", "Font", [](C& c) { return c.Font() ? Variant(c.Font()) : Variant(); },
                  [](C& c, const Variant& v) { c.Font(font_of(v)); }, "Returns a Font  Object")
        .property("Locked", "Boolean", [](C& c) { return Variant(c.Locked()); },
                  [](C& c, const Variant& v) { c.Locked(to_bool(v)); }, "")
        .property("AllowBlankDate", "Boolean", [](C& c) { return Variant(c.AllowBlankDate()); },
                  [](C& c, const Variant& v) { c.AllowBlankDate(to_bool(v)); }, "Sets to accept Blank Date Value")
        .property("AllowLostFocus", "Boolean", [](C& c) { return Variant(c.AllowLostFocus()); }, {},
                  "True/False,Combined with TriggerError  Sets false when error Occurs")
        .property("Text", "Variant", [](C& c) { return c.Text(); }, [](C& c, const Variant& v) { c.Text(v); },
                  "Returns the Text in the Control.", kDefaultMember)
        .property("DateStyle", "KelDtStyle", [](C& c) { return Variant(c.DateStyle()); },
                  [](C& c, const Variant& v) { c.DateStyle(to_int32(v)); }, "")
        .method("Refresh", {},
                [](C& c, std::span<const Variant>) {
                    c.Refresh();
                    return Variant();
                },
                "")
        .property("Enabled", "Boolean", [](C& c) { return Variant(c.Enabled()); },
                  [](C& c, const Variant& v) { c.Enabled(to_bool(v)); },
                  "Returns/Sets a value that determines whether an object can respond to user generated events")
        .property("ShowCalendar", "Boolean", [](C& c) { return Variant(c.ShowCalendar()); },
                  [](C& c, const Variant& v) { c.ShowCalendar(to_bool(v)); }, "")
        .property("CalendarPosition", "KelDtCalpos", [](C& c) { return Variant(c.CalendarPosition()); },
                  [](C& c, const Variant& v) { c.CalendarPosition(to_int32(v)); }, "")
        .property("hWnd", "Variant", [](C& c) { return c.hWnd(); }, {}, "")
        .property("SelStart", "Variant", [](C& c) { return c.SelStart(); },
                  [](C& c, const Variant& v) { c.SelStart(v); }, "")
        .property("Sellength", "Variant", [](C& c) { return c.Sellength(); },
                  [](C& c, const Variant& v) { c.Sellength(v); }, "")
        .property("SelText", "Variant", [](C& c) { return c.SelText(); }, {}, "")
        .event(KelDateMask::kClick, "Click")
        .event(KelDateMask::kDblClick, "DblClick")
        .event(KelDateMask::kChange, "Change")
        .event(KelDateMask::kKeyDown, "KeyDown", key_args)
        .event(KelDateMask::kKeyPress, "KeyPress", {{"KeyAscii", "Integer"}})
        .event(KelDateMask::kKeyUp, "KeyUp", key_args)
        .event(KelDateMask::kMouseDown, "MouseDown", mouse_args)
        .event(KelDateMask::kMouseMove, "MouseMove", mouse_args)
        .event(KelDateMask::kMouseUp, "MouseUp", mouse_args)
        .event(KelDateMask::kButtonClick, "ButtonClick")
        .event(KelDateMask::kDateError, "DateError")
        .enumeration("KelDtStyle", {{"ddMMyyyy", ddMMyyyy}, {"mmyyA", mmyyA}})
        .enumeration("KelDtCalpos", {{"KelDtTopLeft", KelDtTopLeft},
                                     {"KelDtTopRight", KelDtTopRight},
                                     {"KelDtBottomLeft", KelDtBottomLeft},
                                     {"KelDtBottomRight", KelDtBottomRight}})
        .build();
}

}  // namespace kel
