#pragma once
// The minimal host's single-line edit box.
#include "keltext/widgetmodel/edit_field.h"

namespace kel::model {

class EditBoxModel final : public EditFieldModel<EditBox> {
public:
    using EditFieldModel<EditBox>::EditFieldModel;

    std::string_view widget_type() const override { return "EditBox"; }
    std::vector<std::string> notifications() const override;

    int32_t MaxLength() const override { return max_length_; }
    void MaxLength(int32_t v) override;

protected:
    int32_t limit() const override { return max_length_; }
    void list_members(std::vector<std::string>& m) const override;
    std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> index) const override;
    bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) override;

private:
    int32_t max_length_ = 0;
};

}  // namespace kel::model
