#pragma once
// What every widget of the minimal host shares: handle, geometry, enabled and visible state,
// the owner's handlers, member access by name, and the person's input as the form delivers it.
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <exception>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/font.h"
#include "keltext/host/widgets.h"
#include "keltext/widgetmodel/part.h"

namespace kel::model {

// Error number for a write to a member that can only be read.
inline constexpr int kReadOnlyProperty = 383;
// "Out of stack space": handlers that notify each other without end are stopped with it.
inline constexpr int kOutOfStackSpace = 28;

// Handlers that notify each other without end (a Click handler that selects an entry, which
// clicks again) are cut once they run too deep (the form sets the depth). The cut is not a
// run-time error: a handler on the way that took it for one of its own would report it and go
// on, and with two handlers a level the work would double with every level. It unwinds the
// whole chain instead, and the outermost handler (the one the form's driver started) reports
// error 28 once, naming the widget's notification where the chain was cut.
class HandlerOverflow : public std::exception {
public:
    const char* what() const noexcept override { return "handlers nested too deep"; }
    std::string where;  // "NAME.part.Notification"; empty until a widget's handler sees it
};

// The host's clipboard, holding text in the widgets' character set (Windows-1252).
class Clipboard {
public:
    virtual ~Clipboard() = default;
    virtual std::string text() const = 0;
    virtual void set_text(std::string_view text) = 0;
};

// What a widget needs of the site that owns it.
class WidgetContext {
public:
    virtual ~WidgetContext() = default;
    // Null when the host has none: the clipboard keys are then ordinary keys.
    virtual Clipboard* clipboard() { return nullptr; }
    // A handler of the owner failed with a run-time error while the widget notified it.
    virtual void handler_error(std::string_view part, std::string_view notification, int number) = 0;
    // Brackets each handler call. False when handlers already run too deep inside one
    // another: the handler is then not called, and the chain unwinds (HandlerOverflow).
    virtual bool enter_handler() { return true; }
    virtual void leave_handler() {}
    // True while some handler runs: a HandlerOverflow goes on unwinding.
    virtual bool handlers_running() const { return false; }
    // The chain that was cut at `where` has unwound: report error 28 there, once.
    virtual void handler_overflow(std::string_view /*where*/) {}
    // "NAME.part.Notification" for this owner's part.
    virtual std::string handler_where(std::string_view part, std::string_view notification) const {
        return std::string(part) + "." + std::string(notification);
    }
};

// Runs one of the owner's handlers for a notification of `part`. A run-time error it passes
// back is the owner's failure while handling it: reported, and the caller goes on.
template <class F>
void run_handler(WidgetContext& context, std::string_view part, std::string_view notification, F&& f) {
    try {
        if (!context.enter_handler()) throw HandlerOverflow{};
        struct Leave {
            WidgetContext& context;
            ~Leave() { context.leave_handler(); }
        } leave{context};
        f();
    } catch (const RuntimeError& e) {
        context.handler_error(part, notification, e.number());
    } catch (HandlerOverflow& overflow) {
        if (overflow.where.empty()) overflow.where = context.handler_where(part, notification);
        if (context.handlers_running()) throw;
        context.handler_overflow(overflow.where);
    }
}

// A part the form can deliver a person's input to.
class InputPart : public Part {
public:
    virtual const std::string& part_name() const = 0;
    virtual bool input_enabled() const = 0;  // the widget's own Enabled
    virtual bool is_edit_field() const { return false; }
    // Each notification goes to the owner's handler first; then the widget does its own part
    // with the arguments as the handler left them.
    virtual void user_key_down(int16_t /*key_code*/, int16_t /*shift*/) {}
    virtual void user_key_press(int16_t /*char_code*/) {}
    virtual void user_key_up(int16_t /*key_code*/, int16_t /*shift*/) {}
    virtual void user_paste(std::string_view /*text*/) {}
    // Sets the caret and selection as a person would (run-time error 380 below 0).
    virtual void user_select(int32_t /*start*/, int32_t /*length*/) {}
    // A person's click: the widget's own reaction, then (or through it) the Click notification.
    virtual void user_click() { user_notify("Click"); }
    // An argument-less notification by its own spelling; ignored when the widget lacks it.
    virtual void user_notify(std::string_view notification) = 0;
    virtual void user_mouse(bool /*down*/, int16_t /*button*/, int16_t /*shift*/, float /*x*/, float /*y*/) {}
};

// Member access helpers for peek and poke.
inline void no_index(const std::optional<int32_t>& index) {
    if (index) raise_error(kInvalidPropertyIndex);
}
inline int32_t need_index(const std::optional<int32_t>& index) {
    if (!index) raise_error(kInvalidPropertyIndex);
    return *index;
}
[[noreturn]] inline void read_only_member() { raise_error(kReadOnlyProperty); }

inline float checked_extent(float v) {
    if (!std::isfinite(v) || v < 0) raise_error(kInvalidPropertyValue);
    return v;
}
inline float checked_position(float v) {
    if (!std::isfinite(v)) raise_error(kInvalidPropertyValue);
    return v;
}

// Base of every minimal-host widget: `Iface` is the host widget interface it implements.
template <class Iface>
class WidgetModel : public Iface, public InputPart {
public:
    WidgetModel(WidgetContext& context, std::string name, int32_t handle, float width, float height)
        : context_(context), name_(std::move(name)), handle_(handle), width_(width), height_(height) {}

    // Widget
    void set_events(WidgetEvents events) override { events_ = std::move(events); }
    int32_t hWnd() const override { return handle_; }
    bool Enabled() const override { return enabled_; }
    void Enabled(bool v) override { enabled_ = v; }
    bool Visible() const override { return visible_; }
    void Visible(bool v) override { visible_ = v; }
    float Left() const override { return left_; }
    void Left(float v) override { left_ = checked_position(v); }
    float Top() const override { return top_; }
    void Top(float v) override { top_ = checked_position(v); }
    float Width() const override { return width_; }
    void Width(float v) override { width_ = checked_extent(v); }
    float Height() const override { return height_; }
    void Height(float v) override { height_ = checked_extent(v); }

    // Part
    std::vector<std::string> members() const override { return member_names(); }
    // An unknown member is error 438; an index given to a plain member, or missing for an
    // indexed one (List, ItemData), is 381. The members below see a checked index.
    Variant peek(std::string_view member, std::optional<int32_t> index = std::nullopt) const override {
        check_member(member, index);
        auto v = peek_member(member, index);
        if (!v) raise_error(kNoSuchMember);
        return *v;
    }
    void poke(std::string_view member, const Variant& value, std::optional<int32_t> index = std::nullopt) override {
        check_member(member, index);
        if (!poke_member(member, value, index)) raise_error(kNoSuchMember);
    }

    // InputPart
    const std::string& part_name() const override { return name_; }
    bool input_enabled() const override { return enabled_; }
    void user_notify(std::string_view notification) override {
        if (const Notify* h = notify_slot(notification)) fire(notification, *h);
    }

protected:
    void check_member(std::string_view member, const std::optional<int32_t>& index) const {
        const auto& names = member_names();
        if (std::none_of(names.begin(), names.end(), [&](const std::string& n) { return same_name(n, member); }))
            raise_error(kNoSuchMember);
        const bool indexed = same_name(member, "List") || same_name(member, "ItemData");
        if (indexed != index.has_value()) raise_error(kInvalidPropertyIndex);
    }

    virtual void list_members(std::vector<std::string>& m) const {
        m.insert(m.end(), {"hWnd", "Enabled", "Visible", "Left", "Top", "Width", "Height"});
    }
    virtual std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> /*index*/) const {
        if (same_name(m, "hWnd")) return Variant(handle_);
        if (same_name(m, "Enabled")) return Variant(enabled_);
        if (same_name(m, "Visible")) return Variant(visible_);
        if (same_name(m, "Left")) return Variant(left_);
        if (same_name(m, "Top")) return Variant(top_);
        if (same_name(m, "Width")) return Variant(width_);
        if (same_name(m, "Height")) return Variant(height_);
        return std::nullopt;
    }
    virtual bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> /*index*/) {
        if (same_name(m, "hWnd")) read_only_member();
        if (same_name(m, "Enabled")) { Enabled(to_bool(v)); return true; }
        if (same_name(m, "Visible")) { Visible(to_bool(v)); return true; }
        if (same_name(m, "Left")) { Left(to_single(v)); return true; }
        if (same_name(m, "Top")) { Top(to_single(v)); return true; }
        if (same_name(m, "Width")) { Width(to_single(v)); return true; }
        if (same_name(m, "Height")) { Height(to_single(v)); return true; }
        return false;
    }

    // The handler slot of an argument-less notification this widget raises, or null.
    const Notify* notify_slot(std::string_view n) const {
        if (!find_notification(*this, n)) return nullptr;
        if (same_name(n, "Change")) return &events_.change;
        if (same_name(n, "Click")) return &events_.click;
        if (same_name(n, "DblClick")) return &events_.dbl_click;
        if (same_name(n, "DropDown")) return &events_.drop_down;
        if (same_name(n, "Scroll")) return &events_.scroll;
        if (same_name(n, "GotFocus")) return &events_.got_focus;
        if (same_name(n, "LostFocus")) return &events_.lost_focus;
        if (same_name(n, "UpClick")) return &events_.up_click;
        if (same_name(n, "DownClick")) return &events_.down_click;
        return nullptr;
    }

    template <class F>
    void guarded(std::string_view notification, F&& f) {
        run_handler(context_, name_, notification, std::forward<F>(f));
    }
    void fire(std::string_view notification, const Notify& handler) {
        if (handler) guarded(notification, [&] { handler(); });
    }
    void fire_change() { fire("Change", events_.change); }
    void fire_click() { fire("Click", events_.click); }
    void fire_key(std::string_view notification, const KeyNotify& handler, int16_t& key_code, int16_t& shift) {
        if (handler) guarded(notification, [&] { handler(key_code, shift); });
    }
    void fire_mouse(bool down, int16_t button, int16_t shift, float x, float y) {
        const MouseNotify& h = down ? events_.mouse_down : events_.mouse_up;
        if (h) guarded(down ? "MouseDown" : "MouseUp", [&] { h(button, shift, x, y); });
    }

    // A widget's members never change: listed once, at the first read or write by name, since
    // a redraw reads a dozen members of every field on the screen.
    const std::vector<std::string>& member_names() const {
        if (member_names_.empty()) list_members(member_names_);
        return member_names_;
    }

    WidgetContext& context_;
    std::string name_;
    mutable std::vector<std::string> member_names_;
    WidgetEvents events_;
    int32_t handle_;
    bool enabled_ = true;
    bool visible_ = true;
    float left_ = 0, top_ = 0, width_, height_;
};

// A widget that shows text: colours and a shared font.
template <class Iface>
class TextWidgetModel : public WidgetModel<Iface> {
    using Base = WidgetModel<Iface>;

public:
    using Base::Base;

    Colour ForeColor() const override { return fore_; }
    void ForeColor(Colour c) override { fore_ = c; }
    Colour BackColor() const override { return back_; }
    void BackColor(Colour c) override { back_ = c; }
    std::shared_ptr<kel::Font> Font() const override { return font_; }
    void Font(std::shared_ptr<kel::Font> f) override {
        if (!f) raise_error(kInvalidPropertyValue);
        font_ = std::move(f);
    }
    double FontSize() const override { return font_->size; }

protected:
    void list_members(std::vector<std::string>& m) const override {
        Base::list_members(m);
        m.insert(m.end(), {"ForeColor", "BackColor", "Font"});
    }
    std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> index) const override {
        if (same_name(m, "ForeColor")) return Variant(fore_);
        if (same_name(m, "BackColor")) return Variant(back_);
        if (same_name(m, "Font")) return Variant(font_);
        return Base::peek_member(m, index);
    }
    bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) override {
        if (same_name(m, "ForeColor")) { ForeColor(to_int32(v)); return true; }
        if (same_name(m, "BackColor")) { BackColor(to_int32(v)); return true; }
        if (same_name(m, "Font")) {
            auto f = font_of(v);
            if (!f) raise_error(kTypeMismatch);
            Font(std::move(f));
            return true;
        }
        return Base::poke_member(m, v, index);
    }

    // The host's usual window colours until the owner sets its own.
    Colour fore_ = system_colour(0x08);
    Colour back_ = system_colour(0x05);
    std::shared_ptr<kel::Font> font_ = default_font();
};

}  // namespace kel::model
