#pragma once
// Text with a caret and a selection, edited by typing, Backspace, Delete, the caret keys and
// pastes: the part the edit box, the combo's edit field and the masked edit box share.
#include <algorithm>
#include <cstdint>
#include <string>
#include <string_view>

#include "keltext/widgetmodel/keyboard.h"
#include "keltext/widgetmodel/widget_base.h"

namespace kel::model {

template <class Iface>
class EditFieldModel : public TextWidgetModel<Iface> {
    using Base = TextWidgetModel<Iface>;

public:
    using Base::Base;

    std::string Text() const override { return text_; }
    // A different text puts the caret at the start and raises Change; the same text does nothing.
    void Text(const std::string& t) override {
        if (t == text_) return;
        text_ = t;
        sel_start_ = 0;
        sel_length_ = 0;
        text_changed();
        this->fire_change();
    }
    int32_t SelStart() const override { return sel_start_; }
    void SelStart(int32_t v) override {
        if (v < 0) raise_error(kInvalidPropertyValue);
        sel_start_ = std::min(v, length());
        sel_length_ = 0;
    }
    int32_t SelLength() const override { return sel_length_; }
    void SelLength(int32_t v) override {
        if (v < 0) raise_error(kInvalidPropertyValue);
        sel_length_ = std::min(v, length() - sel_start_);
    }
    std::string SelText() const override {
        return text_.substr(static_cast<std::size_t>(sel_start_), static_cast<std::size_t>(sel_length_));
    }

    bool is_edit_field() const override { return true; }

    void user_key_down(int16_t key_code, int16_t shift) override {
        this->fire_key("KeyDown", this->events_.key_down, key_code, shift);
        if (key_code != 0 && !clipboard_key_down(key_code, shift)) own_key_down(key_code, shift);
    }
    void user_key_press(int16_t char_code) override {
        if (this->events_.key_press)
            this->guarded("KeyPress", [&] { this->events_.key_press(char_code); });
        if (char_code != 0) own_key_press(char_code);
    }
    void user_key_up(int16_t key_code, int16_t shift) override {
        this->fire_key("KeyUp", this->events_.key_up, key_code, shift);
    }
    void user_paste(std::string_view text) override {
        if (!editable() || text.empty()) return;
        std::string piece(text);
        if (int32_t lim = limit(); lim > 0) {
            int32_t room = lim - (length() - sel_length_);
            piece.resize(static_cast<std::size_t>(std::clamp<int32_t>(room, 0, static_cast<int32_t>(piece.size()))));
        }
        replace_selection(piece);
    }
    void user_select(int32_t start, int32_t length) override {
        SelStart(start);
        SelLength(length);
    }
    void user_mouse(bool down, int16_t button, int16_t shift, float x, float y) override {
        this->fire_mouse(down, button, shift, x, y);
    }

protected:
    int32_t length() const { return static_cast<int32_t>(text_.size()); }
    // The most characters a person may type; 0 for no limit.
    virtual int32_t limit() const { return 0; }
    // False where the field takes no typing (a drop-down list).
    virtual bool editable() const { return true; }
    // The text has just changed, before Change is raised, so that the form's Change handler
    // already sees whatever the widget derives from the text.
    virtual void text_changed() {}

    // The widget's own part of a key down, after the owner's handler.
    virtual void own_key_down(int16_t key_code, int16_t /*shift*/) {
        switch (key_code) {
        case kVkDelete: delete_forward(); break;
        case kVkLeft: move_caret(sel_length_ > 0 ? sel_start_ : sel_start_ - 1); break;
        case kVkRight: move_caret(sel_length_ > 0 ? sel_start_ + sel_length_ : sel_start_ + 1); break;
        case kVkHome: move_caret(0); break;
        case kVkEnd: move_caret(length()); break;
        default: break;
        }
    }
    // The widget's own part of a key press: Backspace, or a typed character (other control
    // codes insert nothing).
    virtual void own_key_press(int16_t char_code) {
        if (char_code == kCharBackspace) {
            delete_backward();
        } else if (inserts_character(char_code)) {
            type_char(static_cast<char>(static_cast<uint8_t>(char_code)));
        }
    }

    // The clipboard keys act as the key goes down, before the owner's key press sees the
    // control code they also make (a control that narrows the selection on a key press would
    // otherwise copy the narrowed one). True when the key was one of them.
    bool clipboard_key_down(int16_t key_code, int16_t shift) {
        const ClipboardKey key = clipboard_key(key_code, shift);
        Clipboard* board = key == ClipboardKey::none ? nullptr : this->context_.clipboard();
        if (!board) return false;
        switch (key) {
        case ClipboardKey::copy:
            if (sel_length_ > 0) board->set_text(SelText());
            break;
        case ClipboardKey::cut:
            if (sel_length_ == 0) break;
            board->set_text(SelText());
            if (editable()) own_key_down(kVkDelete, 0);  // the widget's own Delete of a selection
            break;
        case ClipboardKey::paste: user_paste(board->text()); break;
        case ClipboardKey::none: break;
        }
        return true;
    }

    void move_caret(int32_t pos) {
        sel_start_ = std::clamp(pos, 0, length());
        sel_length_ = 0;
    }

    // Replaces the selection by `piece`, caret after it, and raises Change when the text changed.
    void replace_selection(const std::string& piece) {
        const auto start = static_cast<std::size_t>(sel_start_);
        const auto count = static_cast<std::size_t>(sel_length_);
        const bool changed = text_.compare(start, count, piece) != 0;
        text_.replace(start, count, piece);
        sel_start_ += static_cast<int32_t>(piece.size());
        sel_length_ = 0;
        if (!changed) return;
        text_changed();
        this->fire_change();
    }

    virtual void type_char(char c) {
        if (!editable()) return;
        int32_t lim = limit();
        if (lim > 0 && length() - sel_length_ + 1 > lim) return;  // refused: over the limit
        replace_selection(std::string(1, c));
    }
    virtual void delete_forward() {
        if (!editable()) return;
        if (sel_length_ == 0) {
            if (sel_start_ >= length()) return;
            sel_length_ = 1;
        }
        replace_selection({});
    }
    virtual void delete_backward() {
        if (!editable()) return;
        if (sel_length_ == 0) {
            if (sel_start_ == 0) return;
            --sel_start_;
            sel_length_ = 1;
        }
        replace_selection({});
    }

    void list_members(std::vector<std::string>& m) const override {
        Base::list_members(m);
        m.insert(m.end(), {"Text", "SelStart", "SelLength", "SelText"});
    }
    std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> index) const override {
        if (same_name(m, "Text")) return Variant(Text());
        if (same_name(m, "SelStart")) return Variant(sel_start_);
        if (same_name(m, "SelLength")) return Variant(sel_length_);
        if (same_name(m, "SelText")) return Variant(SelText());
        return Base::peek_member(m, index);
    }
    bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) override {
        if (same_name(m, "Text")) { Text(text_of(v)); return true; }
        if (same_name(m, "SelStart")) { SelStart(to_int32(v)); return true; }
        if (same_name(m, "SelLength")) { SelLength(to_int32(v)); return true; }
        if (same_name(m, "SelText")) {
            // As a program's SelText assignment: the selection is replaced, unfiltered.
            set_sel_text(text_of(v));
            return true;
        }
        return Base::poke_member(m, v, index);
    }
    virtual void set_sel_text(const std::string& t) { replace_selection(t); }

    std::string text_;
    int32_t sel_start_ = 0;
    int32_t sel_length_ = 0;
};

}  // namespace kel::model
