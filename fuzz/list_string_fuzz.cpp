// The list string (FillList) on any bytes: decoding never crashes and leaves a sound list;
// encoding a list and decoding the result gives the list back, entry for entry.
#include <fuzzer/FuzzedDataProvider.h>

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "fuzz/fuzz_check.h"
#include "keltext/combo/list_string.h"
#include "keltext/minihost/list_widgets.h"

namespace {

class NoHandlers final : public kel::mini::WidgetContext {
public:
    void handler_error(std::string_view, std::string_view, int) override {}
};

using Entries = std::vector<std::pair<std::string, int32_t>>;

Entries entries_of(const kel::ListWidget& list) {
    Entries e;
    for (int32_t i = 0; i < list.ListCount(); ++i) e.emplace_back(list.List(i), list.ItemData(i));
    return e;
}

void fill(kel::ListWidget& list, const Entries& entries) {
    list.Clear();
    for (const auto& [text, data] : entries) {
        list.AddItem(text);
        list.ItemData(list.NewIndex(), data);
    }
}

// Decodes, and checks what every decoded list must be: the first entry selected when there
// are two or more, nothing selected otherwise.
bool decode(kel::ListWidget& list, std::string_view s) {
    try {
        kel::DecodeFillList(list, s);
    } catch (const kel::RuntimeError& e) {
        // An item data beyond 32 bits may be reported as an overflow; nothing else.
        KEL_FUZZ_CHECK(e.number() == kel::kOverflow);
        return false;
    }
    KEL_FUZZ_CHECK(list.ListIndex() == (list.ListCount() > 1 ? 0 : -1));
    return true;
}

// Spaces in front of the whole string are not part of the list: a first text that starts with
// one cannot come back. Every other list must.
bool representable(const Entries& entries) { return entries.empty() || entries[0].first.rfind(' ', 0) != 0; }

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider in(data, size);
    NoHandlers context;
    kel::mini::MiniListBox list(context, "lstList", 1, 1200, 2000);

    if (in.ConsumeBool()) {
        // Any bytes; then the decoded list must survive an encode and decode.
        const std::string s = in.ConsumeRemainingBytesAsString();
        if (!decode(list, s)) return 0;
        const Entries first = entries_of(list);
        const std::string encoded = kel::EncodeFillList(list);
        KEL_FUZZ_CHECK(decode(list, encoded));
        if (representable(first)) KEL_FUZZ_CHECK(entries_of(list) == first);
        // Encoding is a function of the list alone.
        if (representable(first)) KEL_FUZZ_CHECK(kel::EncodeFillList(list) == encoded);
        return 0;
    }

    // A generated list: texts of any bytes (the separators too: the codec writes a letter of
    // either code so that it reads back), any 32-bit item data.
    Entries entries;
    const bool plain = in.ConsumeBool();  // texts that hold neither separator
    while (in.remaining_bytes() > 0 && entries.size() < 200) {
        std::string text = in.ConsumeRandomLengthString(40);
        if (plain)
            for (char& c : text)
                if (c == kel::kEntrySeparator || c == kel::kDataSeparator) c = 'x';
        entries.emplace_back(std::move(text), in.ConsumeIntegral<int32_t>());
    }
    fill(list, entries);
    const std::string encoded = kel::EncodeFillList(list);
    KEL_FUZZ_CHECK(decode(list, encoded));
    if (representable(entries)) KEL_FUZZ_CHECK(entries_of(list) == entries);
    return 0;
}
