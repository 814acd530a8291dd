#pragma once
// The minimal host's masked edit box.
//
// Mask characters: "#" a digit, "?" a letter, "a" a letter or digit, "&" any character (a
// blank included); every other character of the mask is a literal shown in place. The text
// always holds one character per mask position: the literal, or the prompt "_" where nothing
// is filled. Typing overwrites: a character goes to the first input position at or after the
// selection start when it fits that position, and the caret then passes it and the literals
// after it. With the empty mask the box is a plain edit box without a length limit.
//
// Setting Text while a mask is set takes a text that the mask could show as it stands: one
// character per position, each literal in its place, each input position filled with a
// character that fits or the prompt. Anything else is error 380 and the text stays, so a
// program cannot leave the box holding a text its mask does not describe.
#include <string>

#include "keltext/host/mask.h"
#include "keltext/widgetmodel/edit_field.h"

namespace kel::model {

class MaskedEditModel final : public EditFieldModel<MaskedEdit> {
public:
    using EditFieldModel<MaskedEdit>::EditFieldModel;

    static constexpr char kPrompt = kMaskPrompt;
    static bool is_input(char mask_char);
    static bool fits(char c, char mask_char);

    std::string_view widget_type() const override { return "MaskedEdit"; }
    std::vector<std::string> notifications() const override;

    using EditFieldModel<MaskedEdit>::Text;
    void Text(const std::string& t) override;
    std::string Mask() const override { return mask_; }
    // Lays the current text into the new mask position by position (literals from the mask,
    // a fitting character kept, anything else the prompt). Raises no Change.
    void Mask(const std::string& mask) override;

    void user_paste(std::string_view text) override;

protected:
    void own_key_down(int16_t key_code, int16_t shift) override;
    void own_key_press(int16_t char_code) override;
    void set_sel_text(const std::string& t) override;
    void list_members(std::vector<std::string>& m) const override;
    std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> index) const override;
    bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) override;

private:
    bool input_at(int32_t pos) const { return is_input(mask_[static_cast<std::size_t>(pos)]); }
    // Puts one character at the first input position at or after the caret; false if refused.
    bool put_char(char c);
    // Removes the input character at `pos`; the rest of its field moves one place left.
    void remove_at(int32_t pos);
    // Removes every input character of the selection, the fields closing up.
    void remove_selection();
    void type_run(std::string_view text);  // puts each character in turn, then one Change

    std::string mask_;
};

}  // namespace kel::model
