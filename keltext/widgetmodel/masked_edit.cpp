#include "keltext/widgetmodel/masked_edit.h"

#include "keltext/host/mask.h"

namespace kel::model {
bool MaskedEditModel::is_input(char m) { return mask_is_input(m); }

bool MaskedEditModel::fits(char ch, char m) { return mask_fits(ch, m); }

std::vector<std::string> MaskedEditModel::notifications() const {
    return {"KeyDown", "KeyPress", "KeyUp", "Change", "GotFocus", "LostFocus"};
}

void MaskedEditModel::Text(const std::string& t) {
    if (!mask_.empty()) {
        bool shows = t.size() == mask_.size();
        for (std::size_t i = 0; shows && i < t.size(); ++i) {
            char m = mask_[i];
            shows = is_input(m) ? (t[i] == kPrompt || fits(t[i], m)) : t[i] == m;
        }
        if (!shows) raise_error(kInvalidPropertyValue);
    }
    EditFieldModel::Text(t);
}

void MaskedEditModel::Mask(const std::string& mask) {
    mask_ = mask;
    if (mask_.empty()) return;  // a plain edit box keeps the text as it stands
    std::string laid(mask_.size(), kPrompt);
    for (std::size_t i = 0; i < mask_.size(); ++i) {
        char m = mask_[i];
        if (!is_input(m))
            laid[i] = m;
        else if (i < text_.size() && fits(text_[i], m))
            laid[i] = text_[i];
    }
    text_ = std::move(laid);
    sel_start_ = std::min(sel_start_, length());
    sel_length_ = 0;
}

bool MaskedEditModel::put_char(char c) {
    int32_t pos = sel_start_;
    while (pos < length() && !input_at(pos)) ++pos;
    if (pos >= length() || !fits(c, mask_[static_cast<std::size_t>(pos)])) return false;
    text_[static_cast<std::size_t>(pos)] = c;
    ++pos;
    while (pos < length() && !input_at(pos)) ++pos;
    sel_start_ = pos;
    sel_length_ = 0;
    return true;
}

void MaskedEditModel::remove_at(int32_t pos) {
    int32_t end = pos;
    while (end < length() && input_at(end)) ++end;
    // The rest of the field moves one place left, but only as far as each character fits the
    // position it moves into: a letter never lands on a digit position. Where the move stops,
    // the gap shows the prompt and the characters after it stay where they are.
    int32_t i = pos;
    for (; i + 1 < end; ++i) {
        const char next = text_[static_cast<std::size_t>(i + 1)];
        if (next != kPrompt && !fits(next, mask_[static_cast<std::size_t>(i)])) break;
        text_[static_cast<std::size_t>(i)] = next;
    }
    text_[static_cast<std::size_t>(i)] = kPrompt;
}

void MaskedEditModel::remove_selection() {
    // From the end backwards, so that each removal leaves the positions before it in place.
    for (int32_t p = sel_start_ + sel_length_ - 1; p >= sel_start_; --p)
        if (input_at(p)) remove_at(p);
    sel_length_ = 0;
}

void MaskedEditModel::type_run(std::string_view text) {
    std::string before = text_;
    if (sel_length_ > 0) remove_selection();
    for (char c : text) put_char(c);
    if (text_ != before) fire_change();
}

void MaskedEditModel::user_paste(std::string_view text) {
    if (mask_.empty()) return EditFieldModel::user_paste(text);
    type_run(text);
}

void MaskedEditModel::set_sel_text(const std::string& t) {
    if (mask_.empty()) return EditFieldModel::set_sel_text(t);
    type_run(t);
}

void MaskedEditModel::own_key_down(int16_t key_code, int16_t shift) {
    if (mask_.empty() || key_code != kVkDelete) return EditFieldModel::own_key_down(key_code, shift);
    std::string before = text_;
    if (sel_length_ > 0) {
        remove_selection();
    } else {
        int32_t pos = sel_start_;
        while (pos < length() && !input_at(pos)) ++pos;
        if (pos >= length()) return;
        remove_at(pos);
        sel_start_ = pos;
    }
    if (text_ != before) fire_change();
}

void MaskedEditModel::own_key_press(int16_t char_code) {
    if (mask_.empty()) return EditFieldModel::own_key_press(char_code);
    std::string before = text_;
    if (char_code == kCharBackspace) {
        if (sel_length_ > 0) {
            remove_selection();
        } else {
            int32_t pos = sel_start_ - 1;
            while (pos >= 0 && !input_at(pos)) --pos;
            if (pos < 0) return;
            remove_at(pos);
            sel_start_ = pos;
        }
    } else if (inserts_character(char_code)) {
        // Typing overwrites the position; a selection only says where typing starts.
        if (!put_char(static_cast<char>(static_cast<uint8_t>(char_code)))) return;
    } else {
        return;
    }
    if (text_ != before) fire_change();
}

void MaskedEditModel::list_members(std::vector<std::string>& m) const {
    EditFieldModel::list_members(m);
    m.push_back("Mask");
}

std::optional<Variant> MaskedEditModel::peek_member(std::string_view m, std::optional<int32_t> index) const {
    if (same_name(m, "Mask")) return Variant(mask_);
    return EditFieldModel::peek_member(m, index);
}

bool MaskedEditModel::poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) {
    if (same_name(m, "Mask")) { Mask(text_of(v)); return true; }
    return EditFieldModel::poke_member(m, v, index);
}

}  // namespace kel::model
