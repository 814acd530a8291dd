#include "keltext/widgetmodel/property_store.h"

#include <cstddef>

#include "keltext/host/conversions.h"
#include "keltext/host/font.h"

namespace kel::model {
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
    for (const auto& [key, value] : values) {
        const auto [it, added] = index_.try_emplace(name_key(key), values_.size());
        if (added)
            values_.emplace_back(key, detached(value));
        else
            values_[it->second].second = detached(value);  // a repeated key: the last one wins
    }
}

Variant PropertyStore::read(std::string_view key, const Variant& default_value) {
    const auto it = index_.find(name_key(key));
    return it == index_.end() ? default_value : detached(values_[it->second].second);
}

void PropertyStore::write(std::string_view key, const Variant& value, const Variant& default_value) {
    std::string k = name_key(key);
    const auto it = index_.find(k);
    bool keep = font_of(value) != nullptr || !stored_equal(value, default_value);
    if (!keep) {
        // Writing the default again takes an earlier value out: the store holds what differs.
        if (it != index_.end()) {
            const std::size_t gone = it->second;
            values_.erase(values_.begin() + static_cast<std::ptrdiff_t>(gone));
            index_.erase(it);
            for (auto& [name, place] : index_)
                if (place > gone) --place;
        }
        return;
    }
    if (it != index_.end()) {
        values_[it->second].second = detached(value);
    } else {
        index_.emplace(std::move(k), values_.size());
        values_.emplace_back(std::string(key), detached(value));
    }
}

}  // namespace kel::model
