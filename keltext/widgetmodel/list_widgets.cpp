#include "keltext/widgetmodel/list_widgets.h"

#include <algorithm>

#include "keltext/host/charset.h"

namespace kel::model {
namespace {

// Ordinal order of the upper-cased texts, without building them.
bool upper_less(const std::string& a, const std::string& b) {
    std::size_t n = std::min(a.size(), b.size());
    for (std::size_t i = 0; i < n; ++i) {
        uint8_t x = upper_case(static_cast<uint8_t>(a[i]));
        uint8_t y = upper_case(static_cast<uint8_t>(b[i]));
        if (x != y) return x < y;
    }
    return a.size() < b.size();
}

void list_member_names(std::vector<std::string>& m) {
    m.insert(m.end(), {"List", "ItemData", "ListIndex", "ListCount", "NewIndex"});
}

std::optional<Variant> peek_list(const ListWidget& w, std::string_view m, std::optional<int32_t> index) {
    if (same_name(m, "List")) return Variant(w.List(need_index(index)));
    if (same_name(m, "ItemData")) return Variant(w.ItemData(need_index(index)));
    if (same_name(m, "ListIndex")) return Variant(w.ListIndex());
    if (same_name(m, "ListCount")) return Variant(w.ListCount());
    if (same_name(m, "NewIndex")) return Variant(w.NewIndex());
    return std::nullopt;
}

bool poke_list(ListWidget& w, std::string_view m, const Variant& v, std::optional<int32_t> index) {
    if (same_name(m, "List")) { w.List(need_index(index), text_of(v)); return true; }
    if (same_name(m, "ItemData")) { w.ItemData(need_index(index), to_int32(v)); return true; }
    if (same_name(m, "ListIndex")) { w.ListIndex(to_int32(v)); return true; }
    if (same_name(m, "ListCount") || same_name(m, "NewIndex")) read_only_member();
    return false;
}

}  // namespace

const ListCore::Entry& ListCore::at(int32_t index) const {
    if (index < 0 || index >= count()) raise_error(kInvalidPropertyIndex);
    return entries_[static_cast<std::size_t>(index)];
}

int32_t ListCore::add(const std::string& item, std::optional<int32_t> index, bool sorted) {
    int32_t pos = count();
    if (index) {
        if (*index < 0 || *index > count()) raise_error(kInvalidPropertyIndex);
        pos = *index;
    } else if (sorted) {
        auto it = std::upper_bound(entries_.begin(), entries_.end(), item,
                                   [](const std::string& t, const Entry& e) { return upper_less(t, e.text); });
        pos = static_cast<int32_t>(it - entries_.begin());
    }
    entries_.insert(entries_.begin() + pos, Entry{item, 0});
    if (list_index >= pos) ++list_index;  // the selected entry stays selected
    new_index = pos;
    return pos;
}

void ListCore::remove(int32_t index) {
    at(index);
    entries_.erase(entries_.begin() + index);
    if (list_index == index)
        list_index = -1;
    else if (list_index > index)
        --list_index;
    new_index = -1;
}

void ListCore::clear() {
    entries_.clear();
    list_index = -1;
    new_index = -1;
}

const std::string& ListCore::text(int32_t index) const { return at(index).text; }
void ListCore::set_text(int32_t index, const std::string& text) {
    at(index);
    entries_[static_cast<std::size_t>(index)].text = text;
}
int32_t ListCore::data(int32_t index) const { return at(index).data; }
void ListCore::set_data(int32_t index, int32_t value) {
    at(index);
    entries_[static_cast<std::size_t>(index)].data = value;
}

void ListCore::check_selectable(int32_t index) const {
    if (index < -1 || index >= count()) raise_error(kInvalidPropertyIndex);
}

int32_t ListCore::find_exact(std::string_view text) const {
    // An empty field is no choice, even where the list holds an entry without text.
    if (text.empty()) return -1;
    const auto same = [&](const Entry& e) {
        if (e.text.size() != text.size()) return false;
        for (std::size_t i = 0; i < text.size(); ++i)
            if (upper_case(e.text[i]) != upper_case(text[i])) return false;
        return true;
    };
    const auto it = std::find_if(entries_.begin(), entries_.end(), same);
    return it == entries_.end() ? -1 : static_cast<int32_t>(it - entries_.begin());
}

void ListCore::sort() {
    std::vector<std::pair<Entry, bool>> tagged;
    tagged.reserve(entries_.size());
    for (int32_t i = 0; i < count(); ++i) tagged.emplace_back(entries_[static_cast<std::size_t>(i)], i == list_index);
    std::stable_sort(tagged.begin(), tagged.end(),
                     [](const auto& a, const auto& b) { return upper_less(a.first.text, b.first.text); });
    entries_.clear();
    list_index = -1;
    for (auto& [e, selected] : tagged) {
        if (selected) list_index = count();
        entries_.push_back(std::move(e));
    }
    new_index = -1;
}

// ---- combo box

std::vector<std::string> ComboBoxModel::notifications() const {
    return {"Change", "Click", "DblClick", "DropDown", "GotFocus", "KeyDown", "KeyPress", "KeyUp", "Scroll"};
}

void ComboBoxModel::AddItem(const std::string& item, std::optional<int32_t> index) { list_.add(item, index, sorted_); }

void ComboBoxModel::ListIndex(int32_t index) {
    list_.check_selectable(index);
    list_.list_index = index;
    if (index < 0) return;
    text_ = list_.text(index);
    sel_start_ = 0;
    sel_length_ = length();
    fire_click();
}

void ComboBoxModel::Style(int16_t v) {
    if (v < 0 || v > 2) raise_error(kInvalidPropertyValue);
    style_ = v;
}

void ComboBoxModel::Sorted(bool v) {
    if (v && !sorted_) list_.sort();
    sorted_ = v;
}

void ComboBoxModel::own_key_down(int16_t key_code, int16_t shift) {
    // Up and Down step through the list, stopping at its ends.
    if (key_code == kVkUp) {
        if (list_.list_index > 0) ListIndex(list_.list_index - 1);
        return;
    }
    if (key_code == kVkDown) {
        if (list_.list_index + 1 < list_.count()) ListIndex(list_.list_index + 1);
        return;
    }
    EditFieldModel::own_key_down(key_code, shift);
}

void ComboBoxModel::list_members(std::vector<std::string>& m) const {
    EditFieldModel::list_members(m);
    list_member_names(m);
    m.insert(m.end(), {"Style", "Sorted"});
}

std::optional<Variant> ComboBoxModel::peek_member(std::string_view m, std::optional<int32_t> index) const {
    if (auto v = peek_list(*this, m, index)) return v;
    if (same_name(m, "Style")) return Variant(style_);
    if (same_name(m, "Sorted")) return Variant(sorted_);
    return EditFieldModel::peek_member(m, index);
}

bool ComboBoxModel::poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) {
    if (poke_list(*this, m, v, index)) return true;
    if (same_name(m, "Style")) { Style(to_int16(v)); return true; }
    if (same_name(m, "Sorted")) { Sorted(to_bool(v)); return true; }
    return EditFieldModel::poke_member(m, v, index);
}

// ---- list box

void ListBoxModel::ListIndex(int32_t index) {
    list_.check_selectable(index);
    list_.list_index = index;
    if (index >= 0) fire_click();
}

void ListBoxModel::list_members(std::vector<std::string>& m) const {
    WidgetModel::list_members(m);
    list_member_names(m);
}

std::optional<Variant> ListBoxModel::peek_member(std::string_view m, std::optional<int32_t> index) const {
    if (auto v = peek_list(*this, m, index)) return v;
    return WidgetModel::peek_member(m, index);
}

bool ListBoxModel::poke_member(std::string_view m, const Variant& v, std::optional<int32_t> index) {
    if (poke_list(*this, m, v, index)) return true;
    return WidgetModel::poke_member(m, v, index);
}

}  // namespace kel::model
