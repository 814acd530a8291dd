#pragma once
// The control's own surface in the minimal host, also reached as the part "surface".
#include <functional>
#include <memory>

#include "keltext/host/container.h"
#include "keltext/widgetmodel/part.h"

namespace kel::model {

class SurfaceModel final : public Surface, public Part {
public:
    // `resize` runs the control's Resize; it is called at once for every change of width or
    // height made after construction.
    SurfaceModel(int32_t handle, float width, float height, std::function<void()> resize);

    float Width() const override { return width_; }
    void Width(float v) override;
    float Height() const override { return height_; }
    void Height(float v) override;
    bool Enabled() const override { return enabled_; }
    void Enabled(bool v) override { enabled_ = v; }
    Colour BackColor() const override { return back_; }
    void BackColor(Colour c) override { back_ = c; }
    Colour ForeColor() const override { return fore_; }
    void ForeColor(Colour c) override { fore_ = c; }
    int16_t BorderStyle() const override { return border_; }
    void BorderStyle(int16_t v) override;
    std::shared_ptr<kel::Font> Font() const override { return font_; }
    void Font(std::shared_ptr<kel::Font> f) override;
    int32_t hWnd() const override { return handle_; }
    void Refresh() override { ++refresh_count_; }
    int32_t RefreshCount() const { return refresh_count_; }

    // Width and height together, with one Resize when either changed (the form's resize).
    void set_size(float width, float height);

    std::string_view widget_type() const override { return "Surface"; }
    std::vector<std::string> members() const override;
    std::vector<std::string> notifications() const override { return {}; }
    Variant peek(std::string_view member, std::optional<int32_t> index = std::nullopt) const override;
    void poke(std::string_view member, const Variant& value, std::optional<int32_t> index = std::nullopt) override;

    // How deep Resize may run inside Resize: a control whose Resize keeps setting other sizes
    // would otherwise never return. Beyond it the size is kept without a further Resize.
    static constexpr int kMaxResizeDepth = 8;

private:
    void resized();

    int32_t handle_;
    float width_, height_;
    std::function<void()> resize_;
    int resize_depth_ = 0;
    bool enabled_ = true;
    Colour back_ = system_colour(0x0F);  // button face, until the control sets its own
    Colour fore_ = system_colour(0x12);  // button text
    int16_t border_ = 0;
    std::shared_ptr<kel::Font> font_ = default_font();
    int32_t refresh_count_ = 0;
};

}  // namespace kel::model
