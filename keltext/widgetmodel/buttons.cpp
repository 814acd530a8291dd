#include "keltext/widgetmodel/buttons.h"

namespace kel::model {

void CheckBoxModel::Value(int16_t v) {
    if (v < 0 || v > 2) raise_error(kInvalidPropertyValue);
    if (v == value_) return;
    value_ = v;
    fire_click();
}

void CheckBoxModel::list_members(std::vector<std::string>& m) const {
    CaptionModel::list_members(m);
    m.push_back("Value");
}

std::optional<Variant> CheckBoxModel::peek_member(std::string_view m, std::optional<int32_t> index) const {
    if (same_name(m, "Value")) return Variant(value_);
    return CaptionModel::peek_member(m, index);
}

bool CheckBoxModel::poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) {
    if (same_name(m, "Value")) { Value(to_int16(v)); return true; }
    return CaptionModel::poke_member(m, v, index);
}

void LabelModel::set_caption(const std::string& c) {
    if (c == caption_) return;
    caption_ = c;
    fire_change();
}

}  // namespace kel::model
