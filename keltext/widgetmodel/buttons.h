#pragma once
// The minimal host's simpler widgets: spin buttons, image, check box, push button, label, frame.
#include <string>

#include "keltext/widgetmodel/widget_base.h"

namespace kel::model {

class SpinButtonModel final : public WidgetModel<SpinButton> {
public:
    using WidgetModel<SpinButton>::WidgetModel;
    std::string_view widget_type() const override { return "SpinButton"; }
    std::vector<std::string> notifications() const override { return {"UpClick", "DownClick"}; }
};

class ImageModel final : public WidgetModel<Image> {
public:
    using WidgetModel<Image>::WidgetModel;
    std::string_view widget_type() const override { return "Image"; }
    std::vector<std::string> notifications() const override { return {"Click"}; }
};

// Widgets whose member is a caption.
template <class Iface>
class CaptionModel : public WidgetModel<Iface> {
    using Base = WidgetModel<Iface>;

public:
    using Base::Base;
    std::string Caption() const override { return caption_; }
    void Caption(const std::string& c) override { set_caption(c); }

protected:
    virtual void set_caption(const std::string& c) { caption_ = c; }
    void list_members(std::vector<std::string>& m) const override {
        Base::list_members(m);
        m.push_back("Caption");
    }
    std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> index) const override {
        if (same_name(m, "Caption")) return Variant(caption_);
        return Base::peek_member(m, index);
    }
    bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) override {
        if (same_name(m, "Caption")) { Caption(text_of(v)); return true; }
        return Base::poke_member(m, v, index);
    }

    std::string caption_;
};

class CheckBoxModel final : public CaptionModel<CheckBox> {
public:
    using CaptionModel<CheckBox>::CaptionModel;
    std::string_view widget_type() const override { return "CheckBox"; }
    std::vector<std::string> notifications() const override { return {"Click"}; }

    int16_t Value() const override { return value_; }
    // 0 unchecked, 1 checked, 2 greyed; anything else 380. A new value raises Click.
    void Value(int16_t v) override;
    // A person's click checks an unchecked box and unchecks a checked or greyed one.
    void user_click() override { Value(value_ == 0 ? 1 : 0); }

protected:
    void list_members(std::vector<std::string>& m) const override;
    std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> index) const override;
    bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) override;

private:
    int16_t value_ = 0;
};

class PushButtonModel final : public CaptionModel<PushButton> {
public:
    using CaptionModel<PushButton>::CaptionModel;
    std::string_view widget_type() const override { return "PushButton"; }
    std::vector<std::string> notifications() const override { return {"Click"}; }
};

class LabelModel final : public CaptionModel<Label> {
public:
    using CaptionModel<Label>::CaptionModel;
    std::string_view widget_type() const override { return "Label"; }
    std::vector<std::string> notifications() const override { return {"Click", "Change"}; }

protected:
    void set_caption(const std::string& c) override;  // a new caption raises Change
};

class FrameModel final : public CaptionModel<Frame> {
public:
    using CaptionModel<Frame>::CaptionModel;
    std::string_view widget_type() const override { return "Frame"; }
    std::vector<std::string> notifications() const override { return {"Click"}; }
};

}  // namespace kel::model
