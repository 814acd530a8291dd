#include "keltext/widgetmodel/edit_box.h"

namespace kel::model {

std::vector<std::string> EditBoxModel::notifications() const {
    return {"Change", "KeyDown", "KeyPress", "KeyUp", "Click", "DblClick", "GotFocus", "LostFocus", "MouseDown", "MouseUp"};
}

void EditBoxModel::MaxLength(int32_t v) {
    if (v < 0) raise_error(kInvalidPropertyValue);
    // A text already longer stays: the limit holds for what is typed from now on.
    max_length_ = v;
}

void EditBoxModel::list_members(std::vector<std::string>& m) const {
    EditFieldModel::list_members(m);
    m.push_back("MaxLength");
}

std::optional<Variant> EditBoxModel::peek_member(std::string_view m, std::optional<int32_t> index) const {
    if (same_name(m, "MaxLength")) return Variant(max_length_);
    return EditFieldModel::peek_member(m, index);
}

bool EditBoxModel::poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) {
    if (same_name(m, "MaxLength")) { MaxLength(to_int32(v)); return true; }
    return EditFieldModel::poke_member(m, v, index);
}

}  // namespace kel::model
