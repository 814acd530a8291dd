#include "keltext/combo/list_string.h"

#include <cstddef>
#include <cstdint>

#include "keltext/host/conversions.h"

namespace kel {
namespace {

// <201><201> followed by a separator code stands for that code as a letter of the text.
bool is_escaped_letter(std::string_view s, std::size_t i) {
    return i + 2 < s.size() && s[i] == kDataSeparator && s[i + 1] == kDataSeparator &&
           (s[i + 2] == kDataSeparator || s[i + 2] == kEntrySeparator);
}

// Where the text part that starts at `from` ends: at its data separator, at an entry
// separator when `stop_at_entry` is set, or at the end of the string.
std::size_t text_part_end(std::string_view s, std::size_t from, bool stop_at_entry) {
    std::size_t i = from;
    while (i < s.size()) {
        const char c = s[i];
        if (c == kDataSeparator) {
            if (!is_escaped_letter(s, i)) return i;
            i += 3;
        } else if (c == kEntrySeparator && stop_at_entry) {
            return i;
        } else {
            ++i;
        }
    }
    return s.size();
}

std::string unescape_text(std::string_view s) {
    std::string text;
    text.reserve(s.size());
    for (std::size_t i = 0; i < s.size(); ++i) {
        if (is_escaped_letter(s, i)) i += 2;
        text += s[i];
    }
    return text;
}

// Item data that cannot be held in 32 bits reads as 0, like data that is no number: one odd
// entry must not cost the rest of a saved list.
int32_t item_data_of(double value) {
    const double r = round_half_even(value);
    if (r >= -2147483648.0 && r <= 2147483647.0) return static_cast<int32_t>(r);
    return 0;
}

}  // namespace

std::string EncodeFillList(const ListWidget& list) {
    std::string out;
    std::string scratch;
    const int32_t count = list.ListCount();
    // Size the string once: a million entries would otherwise grow it by doubling many times.
    std::size_t size = 0;
    for (int32_t i = 0; i < count; ++i) size += list.list_text(i, scratch).size() + 14;
    out.reserve(size);
    for (int32_t i = 0; i < count; ++i) {
        const std::string_view text = list.list_text(i, scratch);
        // Spaces at the start of a list string are dropped when it is read; an empty entry in
        // front keeps the first text's leading spaces (and reads as nothing).
        if (i == 0 && !text.empty() && text.front() == ' ') out += kEntrySeparator;
        for (const char c : text) {
            if (c == kDataSeparator || c == kEntrySeparator) {
                out += kDataSeparator;
                out += kDataSeparator;
            }
            out += c;
        }
        out += kDataSeparator;
        out += std::to_string(list.ItemData(i));
        out += kEntrySeparator;
    }
    return out;
}

void DecodeFillList(ListWidget& list, std::string_view list_string) {
    list.Clear();
    std::string_view s = list_string;
    const std::size_t first = s.find_first_not_of(' ');
    if (first == std::string_view::npos) return;
    s = s.substr(first, s.find_last_not_of(' ') - first + 1);

    // One pass from left to right: each entry is handed over as a view, never cut off a copy
    // of the string, so a long list reads in linear time.
    std::size_t i = 0;
    while (i < s.size()) {
        std::size_t end = text_part_end(s, i, true);
        if (end < s.size() && s[end] == kDataSeparator) {
            end = s.find(kEntrySeparator, end + 1);
            if (end == std::string_view::npos) end = s.size();
        }
        if (end > i) {
            if (list.ListCount() >= kMaxListEntries) break;
            AddFillEntry(list, s.substr(i, end - i));
        }
        i = end + 1;
    }
    if (list.ListCount() > 1) list.ListIndex(0);
}

void AddFillEntry(ListWidget& list, std::string_view entry) {
    if (entry.empty() || list.ListCount() >= kMaxListEntries) return;
    const std::size_t q = text_part_end(entry, 0, false);
    if (q == entry.size()) return;
    const double value = leading_value(entry.substr(q + 1));
    list.AddItem(unescape_text(entry.substr(0, q)));
    list.ItemData(list.NewIndex(), item_data_of(value));
}

}  // namespace kel
