#include "keltext/qt/property_bag.h"

#include <unordered_set>

#include "keltext/host/conversions.h"
#include "keltext/host/value_literal.h"

namespace kel::qt {

std::string store_text(const model::StoredValues& values) {
    std::string out;
    for (const auto& [key, value] : values) out += "store " + key + " " + value_literal(value, key) + "\n";
    return out;
}

model::StoredValues parse_store_text(std::string_view text) {
    model::StoredValues out;
    std::unordered_set<std::string> keys;
    int line_no = 0;
    std::size_t pos = 0;
    while (pos <= text.size()) {
        const std::size_t nl = text.find('\n', pos);
        std::string_view line = text.substr(pos, nl == std::string_view::npos ? std::string_view::npos : nl - pos);
        pos = nl == std::string_view::npos ? text.size() + 1 : nl + 1;
        ++line_no;
        if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
        const auto fail = [&](const std::string& message) {
            throw StoreTextError("kelSettings line " + std::to_string(line_no) + ": " + message);
        };
        try {
            const auto words = split_words(line);
            if (words.empty()) continue;
            if (words[0] != "store") fail("expected 'store KEY VALUE', got '" + shown_word(words[0]) + "'");
            if (words.size() != 3) fail("'store' takes a key and a value");
            const std::string key(words[1]);
            if (!keys.insert(name_key(key)).second) fail("'" + shown_word(key) + "' is stored twice");
            out.emplace_back(key, parse_value(words[2]));
        } catch (const ValueLiteralError& e) {
            fail(e.what());
        }
    }
    return out;
}

}  // namespace kel::qt
