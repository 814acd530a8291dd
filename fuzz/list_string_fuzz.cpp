// The list string (FillList) on any bytes: decoding never crashes and leaves a sound list;
// encoding a list and decoding the result gives the list back, entry for entry, whatever its
// texts hold (separators, leading spaces).
#include <fuzzer/FuzzedDataProvider.h>

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "fuzz/fuzz_check.h"
#include "keltext/combo/list_string.h"
#include "keltext/widgetmodel/list_widgets.h"

namespace {

class NoHandlers final : public kel::model::WidgetContext {
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
// are two or more, nothing selected otherwise. Decoding never fails: an item data beyond 32
// bits reads as 0.
void decode(kel::ListWidget& list, std::string_view s) {
    kel::DecodeFillList(list, s);
    KEL_FUZZ_CHECK(list.ListIndex() == (list.ListCount() > 1 ? 0 : -1));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider in(data, size);
    NoHandlers context;
    kel::model::ListBoxModel list(context, "lstList", 1, 1200, 2000);

    if (in.ConsumeBool()) {
        // Any bytes; then the decoded list must survive an encode and decode.
        const std::string s = in.ConsumeRemainingBytesAsString();
        decode(list, s);
        const Entries first = entries_of(list);
        const std::string encoded = kel::EncodeFillList(list);
        decode(list, encoded);
        KEL_FUZZ_CHECK(entries_of(list) == first);
        // Encoding is a function of the list alone.
        KEL_FUZZ_CHECK(kel::EncodeFillList(list) == encoded);
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
    decode(list, encoded);
    KEL_FUZZ_CHECK(entries_of(list) == entries);
    return 0;
}
