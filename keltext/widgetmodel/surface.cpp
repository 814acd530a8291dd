#include "keltext/widgetmodel/surface.h"

#include <cmath>

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/widgetmodel/widget_base.h"

namespace kel::model {

SurfaceModel::SurfaceModel(int32_t handle, float width, float height, std::function<void()> resize)
    : handle_(handle), width_(checked_extent(width)), height_(checked_extent(height)), resize_(std::move(resize)) {}

void SurfaceModel::resized() {
    if (!resize_ || resize_depth_ >= kMaxResizeDepth) return;
    ++resize_depth_;
    struct Leave {
        int& depth;
        ~Leave() { --depth; }
    } leave{resize_depth_};
    resize_();
}

void SurfaceModel::Width(float v) {
    checked_extent(v);
    if (v == width_) return;
    width_ = v;
    resized();
}

void SurfaceModel::Height(float v) {
    checked_extent(v);
    if (v == height_) return;
    height_ = v;
    resized();
}

void SurfaceModel::set_size(float width, float height) {
    checked_extent(width);
    checked_extent(height);
    if (width == width_ && height == height_) return;
    width_ = width;
    height_ = height;
    resized();
}

void SurfaceModel::BorderStyle(int16_t v) {
    if (v != 0 && v != 1) raise_error(kInvalidPropertyValue);
    border_ = v;
}

void SurfaceModel::Font(std::shared_ptr<kel::Font> f) {
    if (!f) raise_error(kInvalidPropertyValue);
    font_ = std::move(f);
}

std::vector<std::string> SurfaceModel::members() const {
    return {"Width", "Height", "Enabled", "BackColor", "ForeColor", "BorderStyle", "Font", "hWnd", "RefreshCount"};
}

Variant SurfaceModel::peek(std::string_view m, std::optional<int32_t> index) const {
    no_index(index);
    if (same_name(m, "Width")) return width_;
    if (same_name(m, "Height")) return height_;
    if (same_name(m, "Enabled")) return enabled_;
    if (same_name(m, "BackColor")) return back_;
    if (same_name(m, "ForeColor")) return fore_;
    if (same_name(m, "BorderStyle")) return border_;
    if (same_name(m, "Font")) return Variant(font_);
    if (same_name(m, "hWnd")) return handle_;
    if (same_name(m, "RefreshCount")) return refresh_count_;
    raise_error(kNoSuchMember);
}

void SurfaceModel::poke(std::string_view m, const Variant& v, std::optional<int32_t> index) {
    no_index(index);
    if (same_name(m, "Width")) return Width(to_single(v));
    if (same_name(m, "Height")) return Height(to_single(v));
    if (same_name(m, "Enabled")) return Enabled(to_bool(v));
    if (same_name(m, "BackColor")) return BackColor(to_int32(v));
    if (same_name(m, "ForeColor")) return ForeColor(to_int32(v));
    if (same_name(m, "BorderStyle")) return BorderStyle(to_int16(v));
    if (same_name(m, "Font")) {
        auto f = font_of(v);
        if (!f) raise_error(kTypeMismatch);
        return Font(std::move(f));
    }
    if (same_name(m, "hWnd") || same_name(m, "RefreshCount")) read_only_member();
    raise_error(kNoSuchMember);
}

}  // namespace kel::model
