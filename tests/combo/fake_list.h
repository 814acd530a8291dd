#pragma once
// A plain list for the codec's tests: the list part of a widget, with every call counted.
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "keltext/host/errors.h"
#include "keltext/host/widgets.h"

namespace kel::test {

class FakeList : public ListWidget {
public:
    void AddItem(const std::string& item, std::optional<int32_t> index = std::nullopt) override {
        const int32_t at = index.value_or(ListCount());
        if (at < 0 || at > ListCount()) raise_error(kInvalidPropertyIndex);
        entries.insert(entries.begin() + at, {item, 0});
        new_index = at;
    }
    void RemoveItem(int32_t index) override {
        check(index);
        entries.erase(entries.begin() + index);
    }
    void Clear() override {
        entries.clear();
        list_index = -1;
        ++clears;
    }
    std::string List(int32_t index) const override { return entries[check(index)].first; }
    void List(int32_t index, const std::string& text) override { entries[check(index)].first = text; }
    int32_t ItemData(int32_t index) const override { return entries[check(index)].second; }
    void ItemData(int32_t index, int32_t value) override { entries[check(index)].second = value; }
    int32_t ListIndex() const override { return list_index; }
    void ListIndex(int32_t index) override {
        if (index != -1) check(index);
        list_index = index;
    }
    int32_t ListCount() const override { return static_cast<int32_t>(entries.size()); }
    int32_t NewIndex() const override { return new_index; }

    std::vector<std::pair<std::string, int32_t>> entries;
    int32_t list_index = -1;
    int32_t new_index = -1;
    int clears = 0;

private:
    std::size_t check(int32_t index) const {
        if (index < 0 || index >= ListCount()) raise_error(kInvalidPropertyIndex);
        return static_cast<std::size_t>(index);
    }
};

// Writes the list string's separators as [200] and [201] in the tests' strings.
inline std::string L(std::string s) {
    for (auto [mark, code] : {std::pair{"[200]", '\xC8'}, std::pair{"[201]", '\xC9'}})
        for (std::size_t p = s.find(mark); p != std::string::npos; p = s.find(mark, p + 1)) s.replace(p, 5, 1, code);
    return s;
}

}  // namespace kel::test
