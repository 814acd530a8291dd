#include "keltext/minihost/property_store.h"

#include <algorithm>

#include "keltext/host/conversions.h"
#include "keltext/host/font.h"

namespace kel::mini {
namespace {

bool counts_as_number(const Variant& v) {
    return v.is_number() || v.kind() == VarKind::Boolean || v.is_empty();
}

// A font is kept as a value: a copy of the object, never the control's own.
Variant detached(const Variant& v) {
    if (auto f = font_of(v)) return Variant(std::make_shared<Font>(*f));
    return v;
}

}  // namespace

bool stored_equal(const Variant& a, const Variant& b) {
    if (a.is_empty() && b.is_string()) return b.str().empty();
    if (b.is_empty() && a.is_string()) return a.str().empty();
    if (counts_as_number(a) && counts_as_number(b)) return a.number() == b.number();
    if (a.is_string() && b.is_string()) return a.str() == b.str();
    if (a.kind() == VarKind::Date && b.kind() == VarKind::Date) return a == b;
    if (a.is_object() && b.is_object()) return a.object() == b.object();
    return false;
}

PropertyStore::PropertyStore(const StoredValues& values) {
    for (const auto& entry : values) {
        const std::string& key = entry.first;
        auto it = std::find_if(values_.begin(), values_.end(), [&](const auto& kv) { return same_name(kv.first, key); });
        if (it != values_.end())
            it->second = detached(entry.second);  // a repeated key: the last one wins
        else
            values_.emplace_back(key, detached(entry.second));
    }
}

Variant PropertyStore::read(std::string_view key, const Variant& default_value) {
    for (const auto& [k, v] : values_)
        if (same_name(k, key)) return detached(v);
    return default_value;
}

void PropertyStore::write(std::string_view key, const Variant& value, const Variant& default_value) {
    auto it = std::find_if(values_.begin(), values_.end(), [&](const auto& kv) { return same_name(kv.first, key); });
    bool keep = font_of(value) != nullptr || !stored_equal(value, default_value);
    if (!keep) {
        // Writing the default again takes an earlier value out: the store holds what differs.
        if (it != values_.end()) values_.erase(it);
        return;
    }
    if (it != values_.end())
        it->second = detached(value);
    else
        values_.emplace_back(std::string(key), detached(value));
}

}  // namespace kel::mini
