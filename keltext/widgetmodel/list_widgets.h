#pragma once
// The minimal host's combo box and list box, and the list they share.
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/widgetmodel/edit_field.h"

namespace kel::model {

// Entries with item data, the selected entry and the one added last. Index errors are 381.
class ListCore {
public:
    // Inserts at `index` (0 to count), or appends; a sorted list without an index inserts in
    // order of the upper-cased text, after entries that compare equal. Returns the position.
    int32_t add(const std::string& item, std::optional<int32_t> index, bool sorted);
    void remove(int32_t index);
    void clear();
    const std::string& text(int32_t index) const;
    void set_text(int32_t index, const std::string& text);
    int32_t data(int32_t index) const;
    void set_data(int32_t index, int32_t value);
    // Raises 381 unless `index` is -1 or an entry.
    void check_selectable(int32_t index) const;
    // The first entry whose text equals `text` upper-cased as the combo's search compares,
    // or -1 (always for the empty text).
    int32_t find_exact(std::string_view text) const;
    void sort();  // stable, by upper-cased text; the selected entry stays selected

    int32_t count() const { return static_cast<int32_t>(entries_.size()); }
    int32_t list_index = -1;
    int32_t new_index = -1;

private:
    struct Entry {
        std::string text;
        int32_t data = 0;
    };
    const Entry& at(int32_t index) const;
    std::vector<Entry> entries_;
};

class ComboBoxModel final : public EditFieldModel<ComboBox> {
public:
    using EditFieldModel<ComboBox>::EditFieldModel;

    std::string_view widget_type() const override { return "ComboBox"; }
    std::vector<std::string> notifications() const override;

    void AddItem(const std::string& item, std::optional<int32_t> index = std::nullopt) override;
    void RemoveItem(int32_t index) override { list_.remove(index); }
    void Clear() override { list_.clear(); }
    std::string List(int32_t index) const override { return list_.text(index); }
    std::string_view list_text(int32_t index, std::string&) const override { return list_.text(index); }
    void List(int32_t index, const std::string& text) override { list_.set_text(index, text); }
    int32_t ItemData(int32_t index) const override { return list_.data(index); }
    void ItemData(int32_t index, int32_t value) override { list_.set_data(index, value); }
    int32_t ListIndex() const override { return list_.list_index; }
    // An entry puts its text into the edit field (without Change), selected whole, and
    // raises Click; -1 selects nothing and leaves the text.
    void ListIndex(int32_t index) override;
    int32_t ListCount() const override { return list_.count(); }
    int32_t NewIndex() const override { return list_.new_index; }

    int16_t Style() const override { return style_; }
    void Style(int16_t v);  // 0 drop-down combo, 1 simple combo, 2 drop-down list; else 380
    bool Sorted() const override { return sorted_; }
    void Sorted(bool v);    // turning it on sorts the entries already there

protected:
    bool editable() const override { return style_ != 2; }
    // The selected entry follows the edit text, so that the entry a form reads through
    // ListIndex (and its ItemData) is always the one whose text the person sees.
    void text_changed() override { list_.list_index = list_.find_exact(text_); }
    void own_key_down(int16_t key_code, int16_t shift) override;
    void list_members(std::vector<std::string>& m) const override;
    std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> index) const override;
    bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) override;

private:
    ListCore list_;
    int16_t style_ = 0;
    bool sorted_ = false;
};

class ListBoxModel final : public WidgetModel<ListBox> {
public:
    using WidgetModel<ListBox>::WidgetModel;

    std::string_view widget_type() const override { return "ListBox"; }
    std::vector<std::string> notifications() const override { return {"Click", "GotFocus", "Scroll"}; }

    void AddItem(const std::string& item, std::optional<int32_t> index = std::nullopt) override {
        list_.add(item, index, false);
    }
    void RemoveItem(int32_t index) override { list_.remove(index); }
    void Clear() override { list_.clear(); }
    std::string List(int32_t index) const override { return list_.text(index); }
    std::string_view list_text(int32_t index, std::string&) const override { return list_.text(index); }
    void List(int32_t index, const std::string& text) override { list_.set_text(index, text); }
    int32_t ItemData(int32_t index) const override { return list_.data(index); }
    void ItemData(int32_t index, int32_t value) override { list_.set_data(index, value); }
    int32_t ListIndex() const override { return list_.list_index; }
    void ListIndex(int32_t index) override;  // an entry raises Click
    int32_t ListCount() const override { return list_.count(); }
    int32_t NewIndex() const override { return list_.new_index; }

protected:
    void list_members(std::vector<std::string>& m) const override;
    std::optional<Variant> peek_member(std::string_view m, std::optional<int32_t> index) const override;
    bool poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) override;

private:
    ListCore list_;
};

}  // namespace kel::model
